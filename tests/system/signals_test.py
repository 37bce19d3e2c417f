"""Test that no half database is left when a signal ends cdgen, or another program shortens its output. Every test is a
function below, named for what it shows. support/traced.py makes a signal arrive at one system call on the output.

Every test is a function below, named for what it shows.  support/traced.py lets
a signal arrive at one system call on the output.
"""

import os
import signal

from cases import BEFORE, HEAD, OUT, SOURCE, attributes, check
from traced import TRACE, continued, ended, ended_by, stopped, struck, traced

ENDING = (signal.SIGHUP, signal.SIGINT, signal.SIGQUIT, signal.SIGTERM, signal.SIGXCPU, signal.SIGALRM,
          signal.SIGVTALRM, signal.SIGPROF, signal.SIGUSR1, signal.SIGUSR2, signal.SIGABRT)
STAGES = ("ftruncate", "writev", "mmap")  # emptying what was there, filling, mapping
CUT = (1, b"", b"Cannot map CDB file: it was cut while it was written\n")


def test_before_the_output_is_opened(world):
    """An existing output is unchanged."""
    for number in ENDING:
        world.write(OUT, BEFORE)
        ended_by(struck(world, "read", number, file=SOURCE), number)
        check(world.read() == BEFORE, "the output was touched")


def test_before_the_output_is_emptied(world):
    """An existing output is unchanged; otherwise no empty file is left."""
    for number in ENDING:
        for stage in ("openat", "flock"):
            world.write(OUT, BEFORE)
            ended_by(struck(world, stage, number), number)
            check(world.read() == BEFORE, "the output was touched at", stage)
            world.path(OUT).unlink()
            ended_by(struck(world, stage, number), number)
            check(not world.path(OUT).exists(), "an output is left at", stage)


def test_while_the_output_is_written(world):
    """The output is removed, and the signal ends the program."""
    for number in (*ENDING, signal.SIGBUS):
        for stage in STAGES:
            world.write(OUT, BEFORE)
            ended_by(struck(world, stage, number), number)
            check(not world.path(OUT).exists(), "an output is left at", stage)


def test_two_signals_at_once(world):
    """The second one does not prevent the removal of the output after the first."""
    world.write(OUT, BEFORE)
    stats = "%%stat"
    ended(traced(world, f"{stats},mmap", []))
    before = world.read(TRACE).split(b"mmap(")[0].count(b"\n")  # calls that look at the output before it is mapped
    injections = [f"mmap:signal={int(signal.SIGINT)}:when=1", f"{stats}:signal={int(signal.SIGTERM)}:when={before + 1}"]
    status, *streams = ended(traced(world, f"{stats},mmap", injections))
    check(status in (-signal.SIGINT, -signal.SIGTERM) and streams == [b"", b""], status, streams)
    check(b"out.cdef" in world.read(TRACE).split(b"mmap(")[1], "the handler does not look at the output")
    check(not world.path(OUT).exists(), "an output is left")


def test_ignored_ones_stay_ignored(world):
    """As for a background program whose terminal is closed."""
    good = world.good()
    for number in ENDING:
        actual = ended(struck(world, "mmap", number, disposition=signal.SIG_IGN))
        check(actual == (0, b"", b""), "expected success, actual", actual)
        check(world.read() == good, "another database")


def test_bus_error_from_another_program(world):
    """It is not mistaken for an output that was shortened, with or without an output."""
    for call, file in (("mmap", OUT), ("read", SOURCE)):
        process, child = stopped(world, call, file=file)
        os.kill(child, signal.SIGBUS)
        actual = continued(process, child)
        check(actual == (-signal.SIGBUS, b"", b""), "expected", -signal.SIGBUS, "actual", actual)
        check(not world.path(OUT).exists(), "an output is left")


def test_uncatchable_signal_leaves_no_lock(world):
    """The next compilation replaces the unfinished output."""
    good = world.good()
    ended_by(struck(world, "mmap", signal.SIGKILL), signal.SIGKILL)
    check(world.path(OUT).exists(), "the case is void")
    check(world.run().returncode == 0 and world.read() == good, "another database")


def cut_at(world, call, contents):
    """The result when another program rewrites the output just after a system call."""
    process, child = stopped(world, call)
    world.path(OUT).write_bytes(contents)
    check(continued(process, child) == CUT, "not refused")
    return world.read()


def test_output_cut_before_it_is_mapped(world):
    """By a page or by a few bytes. The file is left as the other program made it."""
    for source in (HEAD, HEAD + attributes(1000)):
        world.write(SOURCE, source)
        for contents in (b"", b"other", b"other" * 150):
            check(cut_at(world, "writev", contents) == contents, "the output was written")


def test_output_cut_after_it_is_mapped(world):
    """The compilation fails with a message, and the file keeps its size."""
    for source in (HEAD, HEAD + attributes(1000)):
        world.write(SOURCE, source)
        for contents in (b"", b"other"):
            check(len(cut_at(world, "mmap", contents)) == len(contents), "the output was written")


def test_output_grown_before_it_is_mapped(world):
    """The file is cut to its correct size."""
    good = world.good(HEAD + attributes(100))
    process, child = stopped(world, "writev")
    os.truncate(world.path(OUT), 100000)
    check(continued(process, child) == (0, b"", b""), "not compiled")
    check(world.read() == good, "another database")
