"""A directory in which tests run the programs, and the expected results of a run."""

import contextlib
import os
import pathlib
import resource
import shutil
import signal
import subprocess

import compare

TIMEOUT = 300
SKIPPED = 77
SOURCE = "class.cdefsrc"
OUT = "out.cdef"
BEFORE = b"what stood here before"
BLOCK = 1024  # the output is filled by blocks of that size
NOBODY = 65534
LINE = 253  # characters of the longest line, without its newline
# Signals that end a program, and that neither cdgen nor cdef build survives. Neither leaves anything unfinished.
ENDING = (signal.SIGHUP, signal.SIGINT, signal.SIGQUIT, signal.SIGTERM, signal.SIGXCPU, signal.SIGALRM,
          signal.SIGVTALRM, signal.SIGPROF, signal.SIGUSR1, signal.SIGUSR2, signal.SIGABRT, signal.SIGIO,
          signal.SIGPWR, signal.SIGSTKFLT, signal.SIGRTMIN, signal.SIGRTMAX)

HEAD = b"""\
ControlDefinition
	FileVersion=1.2.3.4
ResourceClass
	Description=1
	DisplayName=2
	Properties=HasResources,CanDefine
	ClassPermTemplate=0
	ResourcePermTemplate=0
	Name=Disk
ClassToManagerMapping
	ResourceManager=Mgr1
	FirstKey=1
	LastKey=100
	MessageCatalog=mgr1.cat
	DescriptiveMessageSet=1
"""
ATTRIBUTE = b"""\
PersistentResourceAttribute
	Name=Attribute%d
	Description=3
	DisplayName=4
	Id=%d
	DataType=String
	VarietyRange=1,2
	DefaultValue=The default of attribute %d
"""


def check(holds, *what):
    """Fails the case unless the condition holds."""
    __tracebackhide__ = True
    if not holds:
        raise AssertionError(" ".join(map(str, what)))


def attributes(count):
    """A source part with so many persistent attributes."""
    return b"".join(ATTRIBUTE % (i, i, i) for i in range(count))


class World:
    """A directory with the program and a source, in which a test runs the programs."""

    def __init__(self, programs, directory):
        self.directory = directory
        self.locales = programs.locales
        self.cdef = programs.cdef
        self.program = directory / "cdgen"
        shutil.copy(programs.cdgen, self.program)  # where any user can reach it
        os.chmod(directory, 0o777)
        self.write(SOURCE, HEAD)

    def path(self, name):
        """A file of the directory."""
        return self.directory / name

    def write(self, name, contents):
        """Writes a file that everybody may read and write."""
        self.path(name).write_bytes(contents)
        os.chmod(self.path(name), 0o666)

    def read(self, name=OUT):
        """The contents of a file."""
        return self.path(name).read_bytes()

    def options(self, **more):
        """The options with which every process of the case is started."""
        environment = {**os.environ, "LC_ALL": "C", "VX_CDB_FORCE_EMPTY_TIMESTAMP": ""}
        return {"cwd": self.directory, "env": environment, "stdin": subprocess.DEVNULL, **more}

    def start(self, *arguments, **more):
        """Starts the program, with pipes for its streams."""
        streams = {"stdout": subprocess.PIPE, "stderr": subprocess.PIPE, **more}
        return subprocess.Popen([self.program, *arguments], **self.options(**streams))

    def run(self, *arguments, **more):
        """Runs the program to its end; by default it compiles the source to the output."""
        streams = {"stdout": subprocess.PIPE, "stderr": subprocess.PIPE, **more}
        command = [self.program, *(arguments or (SOURCE, OUT))]
        return subprocess.run(command, timeout=TIMEOUT, **self.options(**streams))

    def inspect(self, *arguments, **more):
        """Runs cdef."""
        streams = {"stdout": subprocess.PIPE, "stderr": subprocess.PIPE, **more}
        return subprocess.run([self.cdef, *arguments], timeout=TIMEOUT, **self.options(**streams))

    def verified(self, name=OUT):
        """Checks that cdef finds no error in a database."""
        expect(self.inspect("verify", "-q", name), 0)

    @contextlib.contextmanager
    def left_alone(self, name=OUT):
        """Checks that a file does not change while the block runs, not even its inode and time."""

        def identity():
            status = os.stat(self.path(name))
            return status.st_ino, status.st_mtime_ns, self.read(name)

        before = identity()
        yield
        check(identity() == before, name, "was touched")

    def good(self, source=None, *options):
        """The database of a source, compiled without any fault."""
        if source is not None:
            self.write(SOURCE, source)
        result = self.run(*options, SOURCE, "good.cdef")
        check(result.returncode == 0, "a good source does not compile:", result.stderr)
        return self.read("good.cdef")


def expect(result, status, stderr=b"", stdout=b""):
    """Checks the status and the streams of a run exactly."""
    __tracebackhide__ = True
    actual = (result.returncode, result.stderr, result.stdout)
    compare.same(actual, (status, stderr, stdout), "status, standard error, standard output")


def as_nobody():
    """For the child process: another user, if this one is root."""
    if os.geteuid() == 0:
        os.setgroups([])
        os.setgid(NOBODY)
        os.setuid(NOBODY)


def limit(what, value):
    """For the child process: a limit; for preexec_fn."""
    return lambda: resource.setrlimit(what, (value, value))


def only_zeros(world):
    """Whether a file that could not be filled contains only zeros, not half a database."""
    check(not world.read().strip(b"\0"), "the file is not empty of data")
