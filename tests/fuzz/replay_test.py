"""Replays the seeds of the fuzzers, and all inputs with which they have found defects."""

import os
import subprocess

import pytest

from programs import PROGRAMS, TESTS, runner

FUZZERS = ("source", "image", "cdef", "format", "lsp")
SEEDS = {"format": "source"}  # of another fuzzer
FOUND = [what for what in FUZZERS if any((TESTS / "fuzz/found" / what).glob("*"))]


def replay(what, directory, env=None):
    """Passes the files of a directory to a fuzz target: all of them, or the share that the environment asks for."""
    assert any(directory.iterdir()), f"nothing in {directory}"
    command = [*runner(), PROGRAMS.build / "tests/fuzz" / f"{what}_fuzz", directory]
    done = subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, timeout=1800, env=env,
                          check=False)
    assert done.returncode == 0, done.stdout.decode(errors="replace")[-5000:]


@pytest.mark.slow(5)
@pytest.mark.parametrize("what", FUZZERS)
def test_seeds(what):
    """Golden sources, their databases, pairs of these, and generated ones."""
    replay(what, PROGRAMS.build / "tests/fuzz/seeds" / SEEDS.get(what, what))


def test_share(directory):
    """One file in seven, from the one that the seed chooses."""
    for number in range(15):
        (directory / f"{number:02}").write_text("")
    env = {**os.environ, "CDGEN_SHARE": "7", "SEED": "5"}
    command = [*runner(), PROGRAMS.build / "tests/fuzz/source_fuzz", directory]
    done = subprocess.run(command, env=env, stderr=subprocess.PIPE, text=True, check=True)
    assert done.stderr == f"{directory}/02\n{directory}/09\n"


@pytest.mark.parametrize("what", FOUND)
def test_found(what):
    """Inputs that once showed a defect; all of them in each run."""
    replay(what, TESTS / "fuzz/found" / what, {**os.environ, "CDGEN_SHARE": "1"})
