"""Test script/bootstrap on a system that has no apt-get."""

import os
import shutil
import subprocess

import pytest

from programs import PROJECT

SHELL = ("sh", "dirname", "cat", "id", "mktemp", "rm", "sed")
PROGRAMS_FOR_BUILDING = ("c++", "cmake", "ninja")
COMPILER_PARTS = ("as", "ld")


def bootstrap(directory, *programs, script="bootstrap", toolchain=""):
    """Status and output of the script on a system that has only these programs, and those that a shell script needs.
    toolchain: what CMake reads first."""
    for name in (*SHELL, *programs):
        (directory / name).symlink_to(shutil.which(name))
    (directory / "toolchain.cmake").write_text(toolchain)
    environment = {name: value for name, value in os.environ.items() if not name.startswith("CMAKE_")}
    environment.update(PATH=str(directory), CMAKE_TOOLCHAIN_FILE=str(directory / "toolchain.cmake"))
    done = subprocess.run([PROJECT / "script" / script, "demo"], env=environment, text=True, check=False,
                          stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
    return done.returncode, done.stdout


def test_says_what_is_needed_and_what_is_missing(directory):
    """Nothing is installed, and the status is not 0."""
    status, said = bootstrap(directory, "cmake")
    assert status == 1
    assert "has no apt-get, so nothing is installed. Not found: c++ ninja\n" in said
    for needed in ("C++20 compiler", "CMake", "Ninja", "CLI11", "nlohmann_json", "libcli11-dev"):
        assert needed in said


LIBRARIES = {
    "CLI11": "set(CMAKE_DISABLE_FIND_PACKAGE_CLI11 ON)",
    "nlohmann_json": "set(CMAKE_DISABLE_FIND_PACKAGE_nlohmann_json ON)",
    "toml++": "set(TOMLPLUSPLUS_INCLUDE_DIR OFF)",
}


@pytest.mark.parametrize("script", ("bootstrap", "demo"))
@pytest.mark.parametrize("library", LIBRARIES)
def test_says_which_library_is_missing(directory, library, script):
    """Before anything is built: the demonstration ends with the list, and without having called ninja."""
    status, said = bootstrap(directory, *PROGRAMS_FOR_BUILDING, *COMPILER_PARTS, script=script,
                             toolchain=LIBRARIES[library])
    assert status == 1
    assert said.startswith("script/bootstrap: this system has no apt-get")
    assert f"Not found: {library}\n" in said
    assert said.endswith("libcli11-dev libtomlplusplus-dev nlohmann-json3-dev\n")


def test_says_that_the_compiler_does_not_work(directory):
    """CMake says why."""
    status, said = bootstrap(directory, *PROGRAMS_FOR_BUILDING, *COMPILER_PARTS,
                             toolchain='set(CMAKE_CXX_COMPILER "/nothing/c++")')
    assert status == 1
    assert "/nothing/c++" in said
    assert "Not found: a compiler that CMake can use\n" in said


def test_is_quiet_where_programs_and_libraries_are(directory):
    """The status is 0."""
    assert bootstrap(directory, *PROGRAMS_FOR_BUILDING, *COMPILER_PARTS) == (0, "")
