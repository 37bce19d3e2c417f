"""Test that no half database is left when a signal ends cdgen, or another program shortens its output. Every test is a
function below, named for what it shows. support/traced.py makes a signal arrive at one system call on the output.
"""

import os
import shutil
import signal
import subprocess

import pytest

from cases import BEFORE, ENDING, HEAD, OUT, SOURCE, TIMEOUT, attributes, check
from traced import TRACE, continued, ended, ended_by, stopped, struck, traced, wait_until_stopped

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


def test_while_a_large_output_is_filled(world):
    """The signal takes effect before the next block of zeros is written."""
    world.write(SOURCE, HEAD + attributes(5000))
    for number in (signal.SIGINT, signal.SIGRTMIN):
        ended_by(struck(world, "writev", number), number)
        check(world.read(TRACE).count(b"writev(") == 1, "filled after the signal")
        check(not world.path(OUT).exists(), "an output is left")


def test_when_the_output_cannot_be_filled(world):
    """The signal ends the program, without a message, and the output is removed."""
    injections = ["writev:error=ENOSPC:signal=TERM:when=1"]
    ended_by(traced(world, "writev", injections), signal.SIGTERM)
    check(not world.path(OUT).exists(), "an output is left")


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


def stopped_at_last_look(world):
    """The program and its process number, stopped after its last look at the size before it cuts the output to its final
    size."""
    world.path(OUT).unlink(missing_ok=True)
    check(ended(traced(world, "%%stat,ftruncate", [])) == (0, b"", b""), "the program cannot be traced")
    looks = world.read(TRACE).split(b"ftruncate(")[0].count(b"\n")
    world.path(OUT).unlink()
    process = traced(world, "%%stat", [f"%%stat:signal=STOP:when={looks}"])
    return process, wait_until_stopped(world, process)


def test_output_cut_just_before_it_gets_its_final_size(world):
    """The final size then extends the file with zeros, which is noticed."""
    for source in (HEAD, HEAD + attributes(1000)):
        world.write(SOURCE, source)
        good = world.good(source)
        filled = len(good.rstrip(b"\0"))  # cutting the zeros after that changes nothing
        for contents in (b"", b"other", b"other" * 150, good[:80], good[: filled - 1]):
            process, child = stopped_at_last_look(world)
            world.path(OUT).write_bytes(contents)
            check(continued(process, child) == CUT, "not refused")
            check(world.read() == contents.ljust(len(good), b"\0")[: len(good)], "the output was written")


def test_output_replaced_by_a_longer_one_just_before_it_gets_its_final_size(world):
    """It would be cut in the middle, which is noticed."""
    good = world.good()
    process, child = stopped_at_last_look(world)
    world.path(OUT).write_bytes(b"other" * len(good))
    check(continued(process, child) == CUT, "not refused")


def test_output_cut_just_after_it_has_got_its_final_size(world):
    """The file is left as the other program made it."""
    good = world.good(HEAD + attributes(1000))
    world.path(OUT).unlink(missing_ok=True)
    for contents in (b"", b"other", good[:-1]):
        world.path(OUT).unlink(missing_ok=True)
        check(cut_at(world, "ftruncate", contents) == contents, "the output was written")


# In a name space of its own: compiles to a file system of 200 KB. When the output is mapped, its blocks are given back,
# and other files take them.
FULL_DISK = """
mount -t tmpfs -o size=200k none small || exit 77
strace -qq -o trace -P $PWD/small/out.cdef -e inject=mmap:signal=STOP:when=1 "$@" &
until grep -q 'stopped by SIGSTOP' trace 2>/dev/null; do kill -0 $! || exit 78; done
fallocate -p -o 0 -l $(stat -c %s small/out.cdef) small/out.cdef
cat /dev/zero >small/more 2>/dev/null
kill -CONT $(cat /proc/$!/task/$!/children)
wait $!
status=$?
test -e small/out.cdef && echo left
exit $status
"""


def test_bus_error_without_a_cut(world):
    """As on a file system that needs new blocks for changed ones. The reason is a true one, and the output is removed."""
    world.write(SOURCE, HEAD + attributes(500))
    world.path("small").mkdir()
    for tool in ("unshare", "fallocate", "strace"):
        if shutil.which(tool) is None:
            pytest.skip(f"no {tool}(1) here")
    user = [] if os.geteuid() == 0 else ["-r"]
    options = world.options()
    options["env"]["ASAN_OPTIONS"] = "detect_leaks=0"
    command = ["unshare", *user, "-m", "sh", "-c", FULL_DISK, "sh", world.program, SOURCE, "small/" + OUT]
    result = subprocess.run(command, capture_output=True, timeout=TIMEOUT, check=False, **options)
    if result.returncode in (77, 78) or b"unshare:" in result.stderr:
        pytest.skip("mounting or tracing is not allowed here: " + result.stderr.decode())
    actual = (result.returncode, result.stdout, result.stderr)
    check(actual == (1, b"", b"Cannot map CDB file: the system could not store it\n"), "actual", actual)


def test_output_grown_before_it_is_mapped(world):
    """The file is cut to its correct size."""
    good = world.good(HEAD + attributes(100))
    process, child = stopped(world, "writev")
    os.truncate(world.path(OUT), 100000)
    check(continued(process, child) == (0, b"", b""), "not compiled")
    check(world.read() == good, "another database")
