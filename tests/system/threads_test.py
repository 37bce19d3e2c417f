"""Test that several compilations, checks and readings at once in one process have the same results as each alone."""

import shutil
import subprocess

import pytest

from programs import EXAMPLES, PROGRAMS, TESTS, environment

# Two sources that compile, and two of which the compiler has something to say.
SOURCES = (EXAMPLES / "FileSystem.cdefsrc", EXAMPLES / "ClusterNode.cdefsrc", TESTS / "cdef/check/overridden.cdefsrc",
           TESTS / "cdef/check/unknown-attribute.cdefsrc")
COPIES = 8


def test_at_once(directory):
    """With the functions of the libraries."""
    command = [PROGRAMS.build / "tests/two_at_once", directory, *SOURCES]
    done = subprocess.run(command, env=environment(), capture_output=True, text=True, timeout=600, check=False)
    assert (done.returncode, done.stdout, done.stderr) == (0, "", "")


@pytest.mark.parametrize("form", ["text", "json"])
def test_build(directory, form):
    """With `cdef build`, which replaces existing databases and has a thread that waits for signals."""
    names = [f"{number}-{source.name}" for number in range(COPIES) for source in SOURCES]
    for name in names:
        shutil.copy(next(source for source in SOURCES if name.endswith(source.name)), directory / name)
    said, made = [], []
    for jobs in ("1", "8", "8"):
        command = [PROGRAMS.cdef, "build", "--jobs", jobs, "--format", form, "--directory", "made", *names]
        done = subprocess.run(command, cwd=directory, env=environment(), capture_output=True, text=True, timeout=600,
                              check=False)
        assert done.returncode == 1, done.stderr
        said.append(done.stdout + done.stderr)
        made.append({path.name: path.read_bytes() for path in (directory / "made").iterdir()})
        if len(said) == 1:
            shutil.rmtree(directory / "made")
    assert made[0] == made[1] == made[2] and len(made[0]) >= 2 * COPIES
    assert said[0] == said[1]
    assert "ThreadSanitizer" not in said[2]
