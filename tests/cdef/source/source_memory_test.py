"""Test that cdef source takes at most three times the memory of the database, which is less than the source has.

The program writes only when the source has been proven, and then waits until somebody reads. Its peak is read there.
"""

import pathlib
import re
import subprocess

import pytest

from programs import PROGRAMS, environment, runner

COUNT = 60_000
PROGRAM = 2 << 20  # bytes of the program itself and of what does not depend on the database
HEAD = "ControlDefinition\n\tFileVersion=1\nResourceClass\n\tDescription=1\n\tDisplayName=2\n\tProperties=HasResources\n"
VARIABLE_CLASS = ("ResourceVariableClass\n\tVariableClass=Group_{0}\n\tObservationInterval=1\n\tReportingInterval=2\n"
                  "\tAlias=Alias_{0}\n")
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


SOURCES = {
    "attributes": lambda: HEAD + "".join(map(attribute, range(COUNT))),
    "classes": lambda: "".join(f"{HEAD}\tClassPermTemplate=0\n\tResourcePermTemplate=0\n\tName=Class_{number}\n"
                               for number in range(COUNT)),
    "variable classes": lambda: HEAD + "".join(map(VARIABLE_CLASS.format, range(COUNT))),
    "values of a list": lambda: HEAD + (
        "PersistentResourceAttribute\n\tName=A\n\tDescription=1\n\tDisplayName=2\n\tId=1\n\tDataType=StringArray\n"
        "\tVarietyRange=1,9\n" + "".join(f"\tDefaultValue={number:0200}\n" for number in range(COUNT))),
}


@pytest.mark.skipif(not pathlib.Path("/proc/self/status").exists(), reason="only Linux shows a program's peak")
@pytest.mark.parametrize("what", SOURCES)
def test_memory(directory, what):
    if PROGRAMS.sanitizers or runner():
        pytest.skip("a sanitizer or an emulator takes memory of its own")
    (directory / "source").write_text(SOURCES[what]() + MAP)
    subprocess.run([PROGRAMS.cdgen, "source", "c.cdef"], cwd=directory, env=environment(), check=True)
    database = directory / "c.cdef"
    assert peak_of(database) <= 3 * database.stat().st_size + PROGRAM
