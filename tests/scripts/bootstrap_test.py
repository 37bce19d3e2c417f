"""Test script/bootstrap on a system that has no apt-get."""

import os
import shutil
import subprocess

from programs import PROJECT


def bootstrap(directory, *programs):
    """Status and output of script/bootstrap on a system that has only these programs, and those that a shell script
    needs."""
    for name in ("sh", "dirname", "cat", "id"):
        (directory / name).symlink_to(shutil.which(name))
    for name in programs:
        (directory / name).symlink_to(shutil.which("true"))
    done = subprocess.run([PROJECT / "script/bootstrap", "demo"], env={**os.environ, "PATH": str(directory)}, text=True,
                          stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False)
    return done.returncode, done.stdout


def test_says_what_is_needed_and_what_is_missing(directory):
    """Nothing is installed, and the status is not 0."""
    status, said = bootstrap(directory, "cmake")
    assert status == 1
    assert "has no apt-get, so nothing is installed. Not found: c++ ninja\n" in said
    for needed in ("C++20 compiler", "CMake", "Ninja", "CLI11", "nlohmann_json", "libcli11-dev"):
        assert needed in said


def test_is_quiet_where_the_programs_are(directory):
    """The status is 0."""
    assert bootstrap(directory, "c++", "cmake", "ninja") == (0, "")
