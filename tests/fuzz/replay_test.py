"""Replays the seeds of the fuzzers, and all inputs with which they have found defects."""

import subprocess

import pytest

from programs import PROGRAMS, TESTS, runner

FUZZERS = ("source", "image", "cdef", "format", "lsp")
SEEDS = {"format": "source"}  # of another fuzzer
FOUND = [what for what in FUZZERS if any((TESTS / "fuzz/found" / what).glob("*"))]


def replay(what, directory):
    """Passes all files of a directory to a fuzz target."""
    assert any(directory.iterdir()), f"nothing in {directory}"
    command = [*runner(), PROGRAMS.build / "tests/fuzz" / f"{what}_fuzz", directory]
    done = subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, timeout=1800, check=False)
    assert done.returncode == 0, done.stdout.decode(errors="replace")[-5000:]


@pytest.mark.slow(5)
@pytest.mark.parametrize("what", FUZZERS)
def test_seeds(what):
    """Golden sources, their databases, pairs of these, and generated ones."""
    replay(what, PROGRAMS.build / "tests/fuzz/seeds" / SEEDS.get(what, what))


@pytest.mark.parametrize("what", FOUND)
def test_found(what):
    """Inputs that once showed a defect."""
    replay(what, TESTS / "fuzz/found" / what)
