"""Test builds of several sources, with threads, both byte orders, a directory and a file of dependencies, and the file of
numbers, under faults of the system and kills. Each file is either the complete old one or the complete new one. No
temporary file is left, except by a kill: then at most one for each thread, which the next run removes.

Every test is a function below, named for what it shows. Each tries a fixed sample of the system calls; script/proof runs
them with --cases=20000, so that each tries all of them.
"""

import random
import re
import signal
import subprocess
import time

import pytest

from builds_test import PIPE_OF_SANITIZERS, ended, full, tracer
from cases import HEAD, attributes, check, expect
from programs import PROGRAMS

NAMES = ("a", "b", "c")
SAMPLE = 40
# These calls are about files; faults of others, in a program with threads, may end the program in the library.
ABOUT_FILES = ("openat", "read", "pread64", "write", "close", "newfstatat", "fstat", "readlink", "flock", "fchmod", "fchown",
               "fsync", "dup", "rename", "unlink", "mkdir", "access", "faccessat2", "lseek", "getcwd")


def of_its_own(number, more=b""):
    """The source of a class with a name and a catalog of its own."""
    return HEAD.replace(b"Name=Disk", b"Name=Disk%d" % number).replace(b"mgr1.cat", b"mgr%d.cat" % number) + more


def temporaries(world):
    """The names of all temporary files."""
    return sorted(path.name for path in world.directory.rglob(".*.cdef-new"))


class Job:
    """A command that makes several files, of which some have an older version."""

    def __init__(self, world, command):
        """Runs the command undisturbed, and takes what it has made for the new files."""
        self.world, self.command = world, command
        before = {path for path in world.directory.rglob("*") if path.is_file()}
        expect(world.inspect(*command), 0)
        made = {path for path in world.directory.rglob("*") if path.is_file()} - before
        self.new = {path: path.read_bytes() for path in made}
        self.old = {}

    def reset(self):
        """Puts the old files in place."""
        for path in self.new:
            path.unlink(missing_ok=True)
        for path, contents in self.old.items():
            path.write_bytes(contents)

    def calls(self):
        """The file system calls of an undisturbed run, each with its number among the calls of that name of a thread.
        Those before the first source are the loader's. Sanitizers have calls of their own, so with them only those are tried
        that name a file of the test, and none of a name with which they ask through a pipe whether memory is there."""
        self.reset()
        process = self.traced("-f", "-y")
        check(process[0] == 0, "a good run fails", process)
        counted, known, of_sanitizers, of_loader = {}, set(), set(), None
        for line in self.world.path("trace").read_text().splitlines():
            thread, _, call = line.partition(" ")
            name = call.strip().partition("(")[0]
            number = counted[thread, name] = counted.get((thread, name), 0) + 1
            if of_loader is None and "cdefsrc" in call and name != "execve":
                of_loader = {each: count - (each == name) for (_, each), count in counted.items()}
            is_own = not PROGRAMS.sanitizers or re.search(r"\.cdef|\bdeps\b|ids\.lock", call)
            if of_loader is not None and name in ABOUT_FILES and is_own and number > of_loader.get(name, 0):
                known.add((name, number))
            if PROGRAMS.sanitizers and PIPE_OF_SANITIZERS.match(call.strip()):
                of_sanitizers.add(name)
        calls = sorted(call for call in known if call[0] not in of_sanitizers)
        return calls if full() else random.Random(19).sample(calls, min(SAMPLE, len(calls)))

    def traced(self, *options):
        """Status and messages of a run under the tracer."""
        started = self.world.options()
        started["env"]["ASAN_OPTIONS"] = "detect_leaks=0"
        command = [tracer(), "-qq", "-o", self.world.path("trace"), *options, self.world.cdef, *self.command]
        return ended(subprocess.Popen(command, stdout=subprocess.PIPE, stderr=subprocess.PIPE, **started))

    def require_whole(self, *where):
        """Checks that each file is the old or the new one."""
        for path, new in self.new.items():
            now = path.read_bytes() if path.exists() else None
            check(now in (new, self.old.get(path)), "half a file", path.name, "after", *where)

    def is_made(self):
        """Whether all files are the new ones."""
        return all(path.exists() and path.read_bytes() == new for path, new in self.new.items())

    def require_recovery(self, *where):
        """Checks that the next run makes everything and removes all temporary files."""
        result = self.world.inspect(*self.command)
        check(result.returncode == 0 and self.is_made(), "not made after", *where, result)
        check(not temporaries(self.world), "left for ever after", *where, temporaries(self.world))


def build_of(world, jobs):
    """A build of two byte orders of three sources. One source has older databases, one has present ones, and one none."""
    for number, name in enumerate(NAMES):
        world.write(f"{name}.cdefsrc", of_its_own(number, attributes(number)))
    command = ("build", f"-j{jobs}", "-q", "--byte-order=both", "--depfile=deps", "-d", "o", *(f"{name}.cdefsrc" for name in NAMES))
    job = Job(world, command)
    check(len(job.new) == 7, job.new)
    for path, contents in job.new.items():
        if path.name.startswith("a."):
            job.old[path] = contents[:-1] + b"?"
        elif path.name.startswith("b.") or path.name == "deps":
            job.old[path] = contents
    job.old[world.path("deps")] = b"old"
    return job


def update_of(world):
    """A file of numbers that is changed."""
    world.write("a.cdefsrc", of_its_own(0, attributes(3)))
    job = Job(world, ("gate", "--update", "a.cdefsrc"))
    comments = b"".join(line for line in world.read("ids.lock").splitlines(True) if line.startswith(b"#"))
    job.old[world.path("ids.lock")] = comments + b"Former\tResourceAction\t1\t-\tCheck\n"
    job.reset()
    expect(world.inspect(*job.command), 0)
    job.new[world.path("ids.lock")] = world.read("ids.lock")
    check(b"Former" in world.read("ids.lock") and b"Disk0" in world.read("ids.lock"), "not merged")
    return job


def job_of(world, kind):
    """A build without threads, one with four, or an update."""
    return update_of(world) if kind == "numbers" else build_of(world, {"one": 1, "four": 4}[kind])


@pytest.mark.slow(9)
@pytest.mark.parametrize("kind", ["one", "four", "numbers"])
def test_fault_at_each_call_about_files(world, kind):
    """The run either fails with a status and a message, or has made everything. It leaves no temporary file."""
    job = job_of(world, kind)
    for name, number in job.calls():
        job.reset()
        status, stderr = job.traced("-f", "-e", f"inject={name}:error=EIO:when={number}")
        check(status in (0, 2), "status", status, stderr, "after", name, number)
        job.require_whole(name, number)
        check(status != 0 or job.is_made(), "status 0 although not everything is made after", name, number)
        check(status == 0 or b"cdef: " in stderr, "no message after", name, number, stderr)
        check(name == "unlink" or not temporaries(world), "left behind after", name, number, temporaries(world))
        job.require_recovery(name, number)


@pytest.mark.slow(6)
@pytest.mark.parametrize("kind, threads", [("one", 1), ("four", 4), ("numbers", 1)])
def test_killed_at_each_call_about_files(world, kind, threads):
    """The run cannot clean up."""
    job = job_of(world, kind)
    for name, number in job.calls():
        job.reset()
        status, _ = job.traced("-f", "-e", f"inject={name}:signal=KILL:when={number}")
        check(status == -signal.SIGKILL or kind == "four", "not killed at", name, number)
        job.require_whole(name, number)
        check(len(temporaries(world)) <= threads, "more than one for each thread after", name, number, temporaries(world))
        job.require_recovery(name, number)


@pytest.mark.slow(4)
@pytest.mark.parametrize("kind, threads", [("one", 1), ("four", 4), ("numbers", 1)])
def test_killed_at_random(world, kind, threads):
    """200 times in a full run."""
    job = job_of(world, kind)
    rng = random.Random(20)
    for _ in range(200 if full() else 20):
        job.reset()
        process = subprocess.Popen([world.cdef, *job.command], stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL,
                                   **world.options())
        time.sleep(rng.uniform(0, 0.008))
        process.kill()
        process.wait()
        job.require_whole("a random kill")
        check(len(temporaries(world)) <= threads, "more than one for each thread", temporaries(world))
        job.require_recovery("a random kill")


def test_size_limit_of_the_file_of_numbers(world):
    """Exceeding it is reported, and no temporary file is left."""
    world.write("a.cdefsrc", of_its_own(0, attributes(3)))
    result = subprocess.run(["sh", "-c", 'ulimit -f 0; exec "$@"', "sh", world.cdef, "gate", "--update", "a.cdefsrc"],
                            capture_output=True, check=False, **world.options())
    expect(result, 2, b"cdef: ids.lock: cannot write: File too large\n")
    check(not temporaries(world) and not world.path("ids.lock").exists(), "left behind")


@pytest.mark.slow(3)
def test_first_updates_of_one_file_of_numbers_at_once(world):
    """Those that succeed are all recorded; the others say that the file has been made."""
    for number in range(6):
        world.write(f"{number}.cdefsrc", of_its_own(number, attributes(2)))
    for _ in range(100 if full() else 10):
        world.path("ids.lock").unlink(missing_ok=True)
        updates = [subprocess.Popen([world.cdef, "gate", "--update", f"{number}.cdefsrc"], stderr=subprocess.PIPE,
                                    **world.options()) for number in range(6)]
        results = [ended(each) for each in updates]
        recorded = world.read("ids.lock")
        for number, (status, stderr) in enumerate(results):
            check(status in (0, 2), status, stderr)
            check((status == 0) == (b"Disk%d\t" % number in recorded), "status", status, stderr, recorded)
            check(status == 0 or stderr.startswith(b"cdef: ids.lock: cannot write: it has been "), stderr)
        check(not temporaries(world), "left behind")
