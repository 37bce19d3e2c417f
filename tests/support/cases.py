"""A directory to run the programs in, and what is expected of a run."""

import contextlib
import os
import pathlib
import resource
import shutil
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
    """Fail the case unless the condition holds."""
    __tracebackhide__ = True
    if not holds:
        raise AssertionError(" ".join(map(str, what)))


def attributes(count):
    """So many persistent attributes."""
    return b"".join(ATTRIBUTE % (i, i, i) for i in range(count))


class World:
    """A directory of its own with the program, a source, and what runs there."""

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
        """A file that everybody may read and write."""
        self.path(name).write_bytes(contents)
        os.chmod(self.path(name), 0o666)

    def read(self, name=OUT):
        """The contents of a file."""
        return self.path(name).read_bytes()

    def options(self, **more):
        """How every process of the case is started."""
        environment = {**os.environ, "LC_ALL": "C", "VX_CDB_FORCE_EMPTY_TIMESTAMP": ""}
        return {"cwd": self.directory, "env": environment, "stdin": subprocess.DEVNULL, **more}

    def start(self, *arguments, **more):
        """The program, running, with pipes for its streams."""
        streams = {"stdout": subprocess.PIPE, "stderr": subprocess.PIPE, **more}
        return subprocess.Popen([self.program, *arguments], **self.options(**streams))

    def run(self, *arguments, **more):
        """A whole run of the program; by default of the source into the output."""
        streams = {"stdout": subprocess.PIPE, "stderr": subprocess.PIPE, **more}
        command = [self.program, *(arguments or (SOURCE, OUT))]
        return subprocess.run(command, timeout=TIMEOUT, **self.options(**streams))

    def inspect(self, *arguments, **more):
        """A run of cdef."""
        streams = {"stdout": subprocess.PIPE, "stderr": subprocess.PIPE, **more}
        return subprocess.run([self.cdef, *arguments], timeout=TIMEOUT, **self.options(**streams))

    def verified(self, name=OUT):
        """A database in which cdef finds no error."""
        expect(self.inspect("verify", "-q", name), 0)

    @contextlib.contextmanager
    def left_alone(self, name=OUT):
        """Whatever runs meanwhile, a file stays what it is, to the inode and the time."""

        def identity():
            status = os.stat(self.path(name))
            return status.st_ino, status.st_mtime_ns, self.read(name)

        before = identity()
        yield
        check(identity() == before, name, "was touched")

    def good(self, source=None, *options):
        """The database of a source, made without any fault."""
        if source is not None:
            self.write(SOURCE, source)
        result = self.run(*options, SOURCE, "good.cdef")
        check(result.returncode == 0, "a good source does not compile:", result.stderr)
        return self.read("good.cdef")


def expect(result, status, stderr=b"", stdout=b""):
    """Status and streams of a run, exactly."""
    __tracebackhide__ = True
    actual = (result.returncode, result.stderr, result.stdout)
    compare.same(actual, (status, stderr, stdout), "status, standard error, standard output")


def as_nobody():
    """In the child: another user, if this one is root."""
    if os.geteuid() == 0:
        os.setgroups([])
        os.setgid(NOBODY)
        os.setuid(NOBODY)


def limit(what, value):
    """In the child: a limit; for preexec_fn."""
    return lambda: resource.setrlimit(what, (value, value))


def only_zeros(world):
    """A file that could not be filled contains only zeros, not half a database."""
    check(not world.read().strip(b"\0"), "the file is not empty of data")
