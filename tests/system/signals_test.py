"""Signals and other programs: what ends cdgen, or cuts its output, leaves no half database.

Every test is a function below, named for what it shows.  strace lets a signal
arrive at one system call on the output, so that nothing depends on time.  Where
processes may not be traced, a test is skipped and says why.
"""

import os
import shutil
import signal
import subprocess
import time

import pytest

from cases import BEFORE, HEAD, OUT, SOURCE, TIMEOUT, attributes, check, expect

ENDING = (signal.SIGHUP, signal.SIGINT, signal.SIGQUIT, signal.SIGTERM)
TRACE = "trace"
STAGES = ("ftruncate", "writev", "mmap")  # emptying what was there, filling, mapping


def struck(world, call, number, file=OUT, disposition=signal.SIG_DFL):
    """The program, started to get a signal at a system call on a file; whoever runs the tests may ignore it."""
    tracer = shutil.which("strace")
    if tracer is None:
        pytest.skip("no strace(1) here")
    world.write(TRACE, b"")
    options = ["-o", world.path(TRACE), "-P", world.path(file), "-e", f"trace={call}", "-e", f"inject={call}:signal={number}:when=1"]
    probe = subprocess.run([tracer, "-qq", "-o", "/dev/null", "true"], capture_output=True, check=False)
    if probe.returncode != 0:
        pytest.skip("tracing is not allowed here: " + probe.stderr.decode())
    command = [tracer, *options, world.program, world.path(SOURCE), world.path(OUT)]
    started = world.options(preexec_fn=lambda: number in ENDING and signal.signal(number, disposition))
    started["env"]["ASAN_OPTIONS"] = "detect_leaks=0"  # which looks for them by tracing, too
    return subprocess.Popen(command, stdout=subprocess.PIPE, stderr=subprocess.PIPE, **started)


def ended_by(process, number):
    """Ended by the signal itself, in silence."""
    streams = process.communicate(timeout=TIMEOUT)
    check((process.returncode, *streams) == (-number, b"", b""), "expected", -number, "actual", process.returncode, streams)


def test_before_the_output_is_opened(world):
    """What was there stays."""
    for number in ENDING:
        world.write(OUT, BEFORE)
        ended_by(struck(world, "read", number, SOURCE), number)
        check(world.read() == BEFORE, "the output was touched")


def test_while_the_output_is_written(world):
    """The output goes, and the program ends as the signal wants it."""
    for number in ENDING:
        for stage in STAGES:
            world.write(OUT, BEFORE)
            ended_by(struck(world, stage, number), number)
            check(not world.path(OUT).exists(), "an output is left at", stage)


def test_ignored_ones_stay_ignored(world):
    """As for what goes on in the background when its terminal is closed."""
    good = world.good()
    for number in ENDING:
        process = struck(world, "mmap", number, disposition=signal.SIG_IGN)
        streams = process.communicate(timeout=TIMEOUT)
        expect(subprocess.CompletedProcess([], process.returncode, *streams), 0)
        check(world.read() == good, "another database")


def only_child(process):
    """The process that a tracer has started."""
    with open(f"/proc/{process.pid}/task/{process.pid}/children", encoding="ascii") as children:
        return int(children.read().split()[0])


def wait_until_stopped(world, process):
    """The traced program's number, once the tracer says that it has stopped."""
    while b"stopped by SIGSTOP" not in world.read(TRACE):
        check(process.poll() is None, "ended before it was stopped:", process.returncode)
        time.sleep(0.001)
    return only_child(process)


def test_output_cut_by_another_program(world):
    """A message and a status; the file is the other program's."""
    world.write(SOURCE, HEAD + attributes(1000))
    process = struck(world, "mmap", signal.SIGSTOP)
    child = wait_until_stopped(world, process)
    world.path(OUT).write_bytes(b"other")
    os.kill(child, signal.SIGCONT)
    streams = process.communicate(timeout=TIMEOUT)
    expect(subprocess.CompletedProcess([], process.returncode, *streams), 1,
           b"Cannot map CDB file: it was cut while it was written\n")
    check(world.path(OUT).stat().st_size < 8192, "the output was written")
