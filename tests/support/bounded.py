"""Run a program with as much memory as its inputs allow, 8 times their size plus 16 MB, or with limited processor time.

The limit of memory is one of the address space. So nothing depends on what else the machine does.
"""

import resource
import signal
import subprocess
import sys

import pytest

from programs import PROGRAMS, TESTS, runner

MEGABYTES = 1 << 20


def run_bounded(directory, command, *inputs):
    """The status, and the output on both streams."""
    return run_within(directory, 8 * sum(path.stat().st_size for path in inputs) + 16 * MEGABYTES, command, *inputs)


def run_within(directory, bound, command, *inputs):
    """The same with a bound of its own, in bytes."""
    if PROGRAMS.sanitizers or not PROGRAMS.is_on("CDGEN_STATIC"):
        pytest.skip("a sanitizer or a shared library takes address space of its own")
    with (directory / "out").open("wb") as out, (directory / "err").open("wb") as err:
        result = subprocess.run([*command, *inputs], stdout=out, stderr=err, timeout=3600, check=False,
                                preexec_fn=lambda: resource.setrlimit(resource.RLIMIT_AS, (bound, bound)))
    errors = (directory / "err").read_bytes()
    assert b"memory" not in errors, f"in {bound} bytes"
    return result.returncode, directory / "out", errors


def require_own_memory():
    """Skips the test if not all of the program's memory is its own."""
    if PROGRAMS.sanitizers or runner():
        pytest.skip("a sanitizer or an emulator takes memory of its own")


def peak_of(directory, command, **options):
    """A program's status, and the most memory that it has had, in bytes. What it says is not shown."""
    require_own_memory()
    note = directory / "peak"
    small = [sys.executable, "-S", "-B", TESTS / "support/peak.py", note]
    done = subprocess.run([*small, *command], stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL, check=False, **options)
    return done.returncode, int(note.read_text(encoding="ascii"))


def run_for(seconds, command, **options):
    """A program's status, if it takes no more processor time than this, which is many times what it needs: only if the
    time grows with the square of the input is it stopped. What it says is not shown."""
    limit = (seconds, seconds + 1)
    done = subprocess.run(command, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL, check=False,
                          preexec_fn=lambda: resource.setrlimit(resource.RLIMIT_CPU, limit), **options)
    assert done.returncode != -signal.SIGXCPU, f"not done in {seconds} seconds"
    return done.returncode
