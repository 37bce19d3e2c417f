"""Test that cdef source takes at most three times the memory of the database, which is less than the source has.

The program writes only when the source has been proven, and then waits until somebody reads. Its peak is read there.
"""

import pathlib
import re
import subprocess

import pytest

from programs import PROGRAMS, environment, runner

ATTRIBUTES = 60_000
PROGRAM = 2 << 20  # bytes of the program itself and of what does not depend on the database
HEAD = "ControlDefinition\n\tFileVersion=1\nResourceClass\n\tDescription=1\n\tDisplayName=2\n\tProperties=HasResources\n"
MAP = "ClassToManagerMapping\n\tResourceManager=M\n\tFirstKey=1\n\tLastKey=9\n\tDescriptiveMessageSet=1\n"


def attribute(number):
    """An attribute with a range and an initial value, of the resource or of the class."""
    level = "Resource" if number % 2 else "Class"
    return (f"Dynamic{level}Attribute\n\tName=Attribute_{number}\n\tDescription=1\n\tDisplayName=2\n\tId={number}\n"
            "\tDataType=String\n\tVariableType=Quantity\n\tVarietyRange=1,9\n\tGroupID=3\n\tGroupName=4\n"
            f"\tRange=a{number},z\n\tInitialValue=the initial value of {number}\n")


def peak_of(path):
    """The most memory that cdef source takes for a database, in bytes."""
    with subprocess.Popen([PROGRAMS.cdef, "source", path], stdout=subprocess.PIPE) as process:
        assert process.stdout.read(1) == b"#"
        status = pathlib.Path(f"/proc/{process.pid}/status").read_text()
        process.stdout.read()
    assert process.returncode == 0
    return int(re.search(r"VmHWM:\s+(\d+) kB", status)[1]) << 10


@pytest.mark.skipif(not pathlib.Path("/proc/self/status").exists(), reason="only Linux shows a program's peak")
def test_memory(directory):
    if PROGRAMS.sanitizers or runner():
        pytest.skip("a sanitizer or an emulator takes memory of its own")
    text = HEAD + "".join(map(attribute, range(ATTRIBUTES))) + MAP
    (directory / "source").write_text(text)
    subprocess.run([PROGRAMS.cdgen, "source", "c.cdef"], cwd=directory, env=environment(), check=True)
    database = directory / "c.cdef"
    assert peak_of(database) <= 3 * database.stat().st_size + PROGRAM
