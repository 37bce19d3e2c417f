"""Test `cdef build` under faults of the system, signals and other builds. Whatever happens, its target is either the
complete old database or the complete new one. At most one temporary file is left, which the next build removes.

Every test is a function below, named for what it shows. script/proof runs them with --cases=20000, so that each
makes its full number of attempts.
"""

import os
import random
import re
import resource
import shutil
import signal
import stat
import subprocess
import sys
import time

import pytest

from cases import ENDING, HEAD, OUT, SOURCE, TIMEOUT, attributes, check, expect, limit
from programs import PROGRAMS
from traced import only_child

TEMPORARY = ".out.cdef.cdef-new"
BUILD = ("build", "-o", OUT, SOURCE)
MOUNT_REFUSED = 77
# A build's first call is about its source. The calls before it are the loader's and the library's, which do not survive
# every fault.
FIRST_CALL = f'"{SOURCE}"'
# The system's brk returns an address, never an error's number, for which the library takes it then.
NEVER_FAILS = ("brk", "exit_group")
# A sanitizer ends the program when it gets no memory of its own, or cannot ask through a pipe whether memory is there.
OF_SANITIZERS = ("mmap", "munmap", "madvise", "pipe", "pipe2")
PIPE_OF_SANITIZERS = re.compile(r"\w+\(([3-9]|\d\d+)<pipe:")


def full():
    """Whether to make as many attempts as docs/testing.md states."""
    return (PROGRAMS.cases or 0) >= 20000


def two_databases(world):
    """The database of the source, and the one of an older source, which is in the target's place."""
    old = world.good(HEAD + attributes(5))
    new = world.good(HEAD + attributes(40))
    world.write(OUT, old)
    return old, new


def tracer():
    """The path of strace, if processes may be traced."""
    found = shutil.which("strace")
    if found is None:
        pytest.skip("no strace(1) here")
    probe = subprocess.run([found, "-qq", "-o", "/dev/null", "true"], capture_output=True, check=False)
    if probe.returncode != 0:
        pytest.skip("tracing is not allowed here: " + probe.stderr.decode())
    return found


def traced(world, options, *arguments, **more):
    """Starts a build under the tracer."""
    started = world.options(**more)
    started["env"]["ASAN_OPTIONS"] = "detect_leaks=0:handle_sigbus=0"  # SIGBUS ends the program as without a sanitizer
    command = [tracer(), "-qq", "-o", world.path("trace"), *options, world.cdef, *(arguments or BUILD)]
    return subprocess.Popen(command, stdout=subprocess.PIPE, stderr=subprocess.PIPE, **started)


def at_temporary(world, call, signal_name):
    """The tracer's options for a signal at the first such call on the temporary file: a sanitizer writes to pipes of its
    own."""
    return ["-P", TEMPORARY, "-P", world.path(TEMPORARY), "-e", f"inject={call}:signal={signal_name}:when=1"]


def ended(process):
    """Status and messages."""
    _, stderr = process.communicate(timeout=TIMEOUT)
    return process.returncode, stderr


def calls_of(world, *arguments):
    """All system calls of an undisturbed build, each with its number among the calls of that name."""
    process = traced(world, ["-y"], *arguments)
    check(ended(process) == (0, b""), "a good build fails")
    excluded = (*NEVER_FAILS, *(OF_SANITIZERS if PROGRAMS.sanitizers else ()))
    counted, begun = {}, False
    for line in world.path("trace").read_text().splitlines():
        name = line.partition("(")[0]
        counted[name] = counted.get(name, 0) + 1
        begun = begun or (FIRST_CALL in line and name != "execve")
        if begun and name.isidentifier() and name not in excluded and not PIPE_OF_SANITIZERS.match(line):
            yield name, counted[name]


def whole(world, old, new, *where):
    """Checks that the target is one of the two databases, and that only the temporary file is beside it."""
    check(world.read() in (old, new), "half a database after", *where)
    others = {path.name for path in world.directory.iterdir()} - {OUT, SOURCE, "good.cdef", "cdgen", "trace", TEMPORARY}
    check(not others, "left behind after", *where, others)


def recovers(world, new, *where):
    """Checks that the next build makes the database and removes the temporary file."""
    expect(world.inspect(*BUILD), 0)
    check(world.read() == new, "not made after", *where)
    check(not world.path(TEMPORARY).exists(), "left for ever after", *where)


def test_fault_when_it_looks_for_a_project_file(world):
    """The file is read nevertheless."""
    world.good()
    world.write("cdef.toml", b"[build]\nbyte-order = 'big'\n")
    name = world.path("cdef.toml")
    status, stderr = ended(traced(world, ["-P", name, "-e", "inject=%%stat:error=EIO:when=1"]))
    check((status, stderr) == (0, b"") and world.read()[0] == 0, "the file has no effect", status, stderr)


@pytest.mark.slow(9)
@pytest.mark.parametrize("options", [(), ("--sync",)])
def test_fault_at_each_system_call(world, options):
    """The build either fails with a status and a message, or succeeds. It leaves no temporary file."""
    old, new = two_databases(world)
    build = (BUILD[0], *options, *BUILD[1:])
    for name, number in list(calls_of(world, *build)):
        world.write(OUT, old)
        status, stderr = ended(traced(world, ["-e", f"inject={name}:error=EIO:when={number}"], *build))
        check(status in (0, 2), "status", status, stderr, "after", name, number)
        whole(world, old, new, name, number)
        check(status != 0 or world.read() == new, "status 0 without a database after", name, number)
        check(status == 0 or stderr.startswith(b"cdef: "), "no message after", name, number, stderr)
        check(name == "unlink" or not world.path(TEMPORARY).exists(), "left behind after", name, number)
        recovers(world, new, name, number)


def synced(world, *arguments):
    """The files for which a build with --sync waits, in order."""
    check(ended(traced(world, ["-y", "-e", "trace=fsync"], "build", "--sync", *arguments)) == (0, b""), "not made")
    here = str(world.directory.resolve())
    return [os.path.relpath(name, here) for name in re.findall(r"fsync\(\d+<(.*?)>\)", world.path("trace").read_text())]


def test_sync_waits_for_all_that_a_database_needs(world):
    """Its contents, its name, and the directories that are made for it. A database that has not changed may have been
    written by a build that has not waited."""
    check(synced(world, "-d", "a/b/", SOURCE) == ["a/b", "a/b", "a/b", "a", "a", ".", "a/b/.class.cdef.cdef-new", "a/b"],
          "of new directories")
    check(synced(world, "-d", "a/b/", SOURCE) == ["a/b/class.cdef", "a/b"], "of an unchanged database")


@pytest.mark.slow(6)
def test_killed_at_each_system_call(world):
    """The build cannot clean up."""
    old, new = two_databases(world)
    for name, number in list(calls_of(world)):
        world.write(OUT, old)
        status, _ = ended(traced(world, ["-e", f"inject={name}:signal=KILL:when={number}"]))
        check(status == -signal.SIGKILL, "not killed at", name, number)
        whole(world, old, new, name, number)
        recovers(world, new, name, number)


@pytest.mark.slow(4)
def test_killed_at_random(world):
    """500 times in a full run."""
    old, new = two_databases(world)
    rng = random.Random(17)
    for _ in range(500 if full() else 40):
        world.write(OUT, old)
        process = subprocess.Popen([world.cdef, *BUILD], stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL, **world.options())
        time.sleep(rng.uniform(0, 0.006))
        process.kill()
        process.wait()
        whole(world, old, new, "a random kill")
        recovers(world, new, "a random kill")


def test_signals_wait_for_the_new_name(world):
    """A signal that arrives while there is a temporary file ends the program only after that file is gone."""
    old, new = two_databases(world)
    for number in (*ENDING, signal.SIGBUS):
        for call in ("write", "flock", "fchmod", "rename"):
            world.write(OUT, old)
            process = traced(world, at_temporary(world, call, int(number)),
                             preexec_fn=lambda n=number: signal.signal(n, signal.SIG_DFL))
            status, _ = ended(process)
            check(status == -number, "not ended by", number, "at", call, "but by", status)
            check(world.read() == new and not world.path(TEMPORARY).exists(), "not finished at", call)


def test_ignored_signals_stay_ignored(world):
    """As under nohup."""
    _, new = two_databases(world)
    process = traced(world, at_temporary(world, "write", "HUP"),
                     preexec_fn=lambda: signal.signal(signal.SIGHUP, signal.SIG_IGN))
    check(ended(process) == (0, b"") and world.read() == new, "not made")


@pytest.mark.slow(3)
def test_signals_end_many_builds_at_once_cleanly(world):
    """Each database is the old or the new one, and no temporary file is left, whatever the number of threads."""
    names = [f"{number}.cdefsrc" for number in range(60)]
    old, new = two_databases(world)
    text = world.read(SOURCE)
    for name in names:
        world.write(name, text)
        world.write(name[:-3], old)
    rng = random.Random(18)
    for _ in range(100 if full() else 15):
        process = subprocess.Popen([world.cdef, "build", "-j4", *names], stderr=subprocess.DEVNULL, **world.options())
        time.sleep(rng.uniform(0, 0.03))
        number = rng.choice(ENDING)
        process.send_signal(number)
        check(process.wait(timeout=TIMEOUT) in (0, -number), "status", process.returncode)
        for name in names:
            check(world.read(name[:-3]) in (old, new), "half a database")
            world.write(name[:-3], old)
        check(not list(world.directory.glob(".*.cdef-new")), "left behind")


@pytest.mark.parametrize("failing", ["1", "1+", "2", "2+", "3", "3+"])
def test_builds_with_the_threads_that_can_be_started(world, failing):
    """The first thread waits for signals; the others build. Without any, the program itself builds."""
    names = [f"{number}.cdefsrc" for number in range(6)]
    for name in names:
        world.write(name, HEAD.replace(b"Name=Disk", b"Name=Disk" + name[:1].encode()))
    status, stderr = ended(traced(world, ["-f", "-e", f"inject=clone3,clone:error=EAGAIN:when={failing}"], "build", "-q",
                                  "-j4", "-d", "made", *names))
    check(status == 0 and stderr == b"", status, stderr)
    check(len(list(world.path("made").iterdir())) == len(names), "not all")


def test_file_size_limit(world):
    """Exceeding the limit is reported as an error."""
    old, new = two_databases(world)
    for size in (0, 1, len(new) - 1):
        result = world.inspect(*BUILD, preexec_fn=limit(resource.RLIMIT_FSIZE, size))
        expect(result, 2, b"cdef: out.cdef: cannot write: File too large\n")
        whole(world, old, old, "a limit")
        check(not world.path(TEMPORARY).exists(), "left behind")
    expect(world.inspect(*BUILD, preexec_fn=limit(resource.RLIMIT_FSIZE, len(new))), 0)
    check(world.read() == new, "not made")


def test_file_system_full(world):
    """The old database does not change, and no file is left beside it."""
    world.write(OUT, world.good())
    old = len(world.read())
    world.write(SOURCE, HEAD + attributes(500))
    world.path("small").mkdir()
    script = (f"mount -t tmpfs -o size=16k none small || exit {MOUNT_REFUSED}; cp out.cdef small; "
              '"$@"; status=$?; ls -A small; stat -c %s small/out.cdef; exit $status')
    user = [] if os.geteuid() == 0 else ["-r"]
    if shutil.which("unshare") is None:
        pytest.skip("no unshare(1) here")
    command = ["unshare", *user, "-m", "sh", "-c", script, "sh", world.cdef, "build", "-o", "small/out.cdef", SOURCE]
    result = subprocess.run(command, capture_output=True, timeout=TIMEOUT, **world.options())
    if result.returncode == MOUNT_REFUSED or b"unshare:" in result.stderr:
        pytest.skip("mounting is not allowed here: " + result.stderr.decode())
    expect(result, 2, b"cdef: small/out.cdef: cannot write: No space left on device\n", b"out.cdef\n%d\n" % old)


def test_full_device(world):
    """Standard output that is full, and one that nobody reads."""
    with open("/dev/full", "wb") as device:
        expect(world.inspect("build", "-o", "-", SOURCE, stdout=device), 2,
               b"cdef: standard output: No space left on device\n", None)
    read, write = os.pipe()
    os.close(read)
    expect(world.inspect("build", "-o", "-", SOURCE, stdout=write), 2, b"cdef: standard output: Broken pipe\n", None)
    os.close(write)


READER = """
import mmap, os, sys
known = {open(name, "rb").read() for name in sys.argv[2:]}
kept = []
while not os.path.exists("stop"):
    with open(sys.argv[1], "rb") as file:
        mapped = mmap.mmap(file.fileno(), 0, prot=mmap.PROT_READ)
    kept = [*kept[-9:], mapped]
    for one in kept:
        if one[:] not in known:
            sys.exit("neither of the two")
"""


@pytest.mark.slow(6)
def test_reader_that_maps_the_target_while_it_is_rebuilt(world):
    """A thousand times in a full run. Each snapshot is one of two databases, and both are sound."""
    old, _ = two_databases(world)
    world.write("old.cdef", old)
    world.verified("old.cdef")
    world.verified("good.cdef")
    texts = [HEAD + attributes(5), HEAD + attributes(40)]
    reader = subprocess.Popen([sys.executable, "-c", READER, OUT, "old.cdef", "good.cdef"], stderr=subprocess.PIPE,
                              **world.options())
    for number in range(1000 if full() else 100):
        world.write(SOURCE, texts[number % 2])
        expect(world.inspect(*BUILD), 0)
        check(reader.poll() is None, "the reader died")
    world.write("stop", b"")
    _, stderr = reader.communicate(timeout=TIMEOUT)
    check(reader.returncode == 0, stderr)


def stopped_build(world, call):
    """A build that has stopped at such a call, and its process number."""
    process = traced(world, at_temporary(world, call, "STOP"))
    while b"stopped by SIGSTOP" not in world.read("trace") if world.path("trace").exists() else True:
        check(process.poll() is None, "ended before it was stopped:", process.returncode)
        time.sleep(0.001)
    return process, only_child(process)


def test_second_build_waits_for_the_first(world):
    """Both succeed. If the source is the same, the second one changes nothing."""
    _, new = two_databases(world)
    for call in ("write", "fchmod", "rename"):
        world.path(OUT).unlink(missing_ok=True)
        world.write(OUT, b"")
        process, child = stopped_build(world, call)
        second = subprocess.Popen([world.cdef, *BUILD], stderr=subprocess.PIPE, **world.options())
        time.sleep(0.02)
        os.kill(child, signal.SIGCONT)
        check(ended(process) == (0, b""), "the first failed at", call)
        check(ended(second) == (0, b""), "the second failed at", call)
        check(world.read() == new and not world.path(TEMPORARY).exists(), "not made at", call)
        world.path("trace").unlink()


@pytest.mark.slow(3)
def test_many_builds_of_one_target_at_once(world):
    """The result is one complete database."""
    databases = set()
    for number in range(6):
        databases.add(world.good(HEAD + attributes(number * 20)))
        world.path(SOURCE).rename(world.path(f"{number}.cdefsrc"))
    for _ in range(100 if full() else 10):
        builds = [subprocess.Popen([world.cdef, "build", "-o", OUT, f"{number}.cdefsrc"], stderr=subprocess.PIPE,
                                   **world.options()) for number in range(6)]
        for each in builds:
            check(ended(each) == (0, b""), "a build failed")
        check(world.read() in databases and not world.path(TEMPORARY).exists(), "not one whole database")


def test_nobody_else_sees_a_private_database_grow(world):
    """Only its owner may read it until its contents are complete."""
    two_databases(world)
    os.chmod(world.path(OUT), 0o644)
    process, child = stopped_build(world, "write")
    check(stat.S_IMODE(os.stat(world.path(TEMPORARY)).st_mode) == 0o600, "another mode")
    os.kill(child, signal.SIGCONT)
    check(ended(process) == (0, b""), "not made")
    check(stat.S_IMODE(os.stat(world.path(OUT)).st_mode) == 0o644, "another mode")
