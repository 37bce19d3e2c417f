"""What the drivers of single cases share: the registry, and a directory to run the programs in.

A case is a function that takes a World and raises Failure when it does not
hold, or Skip when the machine does not allow it.  A driver without a program
prints the names of its cases, so that each can be a test of its own.
"""

import argparse
import contextlib
import os
import pathlib
import resource
import shutil
import subprocess
import sys
import tempfile

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


class Skip(Exception):
    """The machine does not allow the case."""


class Failure(Exception):
    """The case does not hold."""


def check(holds, *what):
    """Fail the case unless the condition holds."""
    if not holds:
        raise Failure(" ".join(map(str, what)))


def attributes(count):
    """So many persistent attributes."""
    return b"".join(ATTRIBUTE % (i, i, i) for i in range(count))


class World:
    """A directory of its own with the program, a source, and what runs there."""

    def __init__(self, options, directory):
        self.directory = directory
        self.locales = options.locales
        self.cdef = options.cdef
        self.program = directory / "cdgen"
        shutil.copy(options.cdgen, self.program)  # where any user can reach it
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
    actual = (result.returncode, result.stderr, result.stdout)
    check(actual == (status, stderr, stdout), "expected", (status, stderr, stdout), "actual", actual)


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
    """What a failed filling leaves is no half database."""
    check(not world.read().strip(b"\0"), "the file is not empty of data")


class Cases:
    """The cases of one driver, by their names."""

    def __init__(self):
        self.functions = {}

    def __call__(self, function):
        """Registers a function as a case; a decorator."""
        self.functions[function.__name__.replace("_", "-")] = function
        return function

    def run(self, name, options):
        """One case in a directory of its own; "", "skipped" or what does not hold."""
        with tempfile.TemporaryDirectory(prefix="cdgen-case-") as directory:
            try:
                self.functions[name](World(options, pathlib.Path(directory)))
            except Skip as reason:
                print(f"SKIP {name}\n    {reason}")
                return SKIPPED
            except (Failure, OSError, subprocess.SubprocessError) as problem:
                print(f"FAIL {name}\n    {problem}")
                return 1
        return 0

    def main(self, description):
        """Runs the named cases, or all, and prints the count; without a program, prints the names."""
        parser = argparse.ArgumentParser(description=description.splitlines()[0])
        for given in ("cdgen", "cdef", "locales"):
            parser.add_argument(f"--{given}", type=lambda text: pathlib.Path(text).resolve())
        parser.add_argument("names", nargs="*")
        options = parser.parse_args()
        if options.cdgen is None:
            print("\n".join(self.functions))
            return 0
        names = options.names or list(self.functions)
        results = [self.run(name, options) for name in names]
        print(f"{results.count(0)} passed, {results.count(1)} failed, {results.count(SKIPPED)} skipped")
        if any(result == 1 for result in results):
            return 1
        return SKIPPED if results == [SKIPPED] else 0
