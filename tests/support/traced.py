"""Runs of cdgen under strace, which lets a signal arrive at one system call on a file, so that nothing depends on time.

Where processes may not be traced, a test that uses this is skipped and says why.
"""

import os
import shutil
import signal
import subprocess
import time

import pytest

from cases import OUT, SOURCE, TIMEOUT, check

TRACE = "trace"


def traced(world, calls, injections, file=OUT, source=SOURCE, **more):
    """Starts the program under strace, which injects faults or signals at the calls that name or use a file."""
    tracer = shutil.which("strace")
    if tracer is None:
        pytest.skip("no strace(1) here")
    probe = subprocess.run([tracer, "-qq", "-o", "/dev/null", "true"], capture_output=True, check=False)
    if probe.returncode != 0:
        pytest.skip("tracing is not allowed here: " + probe.stderr.decode())
    world.write(TRACE, b"")
    options = ["-o", world.path(TRACE), "-P", world.path(file), "-e", f"trace={calls}"]
    for injection in injections:
        options += ["-e", f"inject={injection}"]
    started = world.options(**more)
    started["env"]["ASAN_OPTIONS"] = "detect_leaks=0"  # which looks for them by tracing, too
    command = [tracer, *options, world.program, world.path(source), world.path(OUT)]
    return subprocess.Popen(command, stdout=subprocess.PIPE, stderr=subprocess.PIPE, **started)


def struck(world, call, number, **more):
    """Starts the program so that it gets a signal at the first such system call on a file. The signal has its default
    effect, even if the test runner ignores it."""
    disposition = more.pop("disposition", signal.SIG_DFL)
    change = None if number in (signal.SIGSTOP, signal.SIGKILL) else lambda: signal.signal(number, disposition)
    return traced(world, call, [f"{call}:signal={int(number)}:when=1"], preexec_fn=change, **more)


def ended(process):
    """Status, standard output and standard error."""
    streams = process.communicate(timeout=TIMEOUT)
    return (process.returncode, *streams)


def ended_by(process, number):
    """Checks that the signal itself ended the program, without output."""
    actual = ended(process)
    check(actual == (-number, b"", b""), "expected", -number, "actual", actual)


def only_child(process):
    """The process that a tracer has started."""
    with open(f"/proc/{process.pid}/task/{process.pid}/children", encoding="ascii") as children:
        return int(children.read().split()[0])


def wait_until_stopped(world, process):
    """The process number of the traced program, when the tracer reports that it has stopped."""
    while b"stopped by SIGSTOP" not in world.read(TRACE):
        check(process.poll() is None, "ended before it was stopped:", process.returncode)
        time.sleep(0.001)
    return only_child(process)


def stopped(world, call, **more):
    """The program and its process number, stopped just after the first such system call on the output."""
    process = struck(world, call, signal.SIGSTOP, **more)
    return process, wait_until_stopped(world, process)


def continued(process, child):
    """The status and output of the program after it is continued."""
    os.kill(child, signal.SIGCONT)
    return ended(process)
