"""Test that a compilation takes at most 1.6 times the memory of the database: each staging table is given back as soon
as it is in the image."""

import itertools

import pytest

from bounded import peak_of, require_own_memory
from programs import PROGRAMS, environment

PROGRAM = 2 << 20  # bytes of the program itself and of what does not depend on the database
HEAD = ("ControlDefinition\nResourceClass\n\tDescription=1\n\tDisplayName=2\n\tProperties=HasResources\n"
        "\tClassPermTemplate=0\n\tResourcePermTemplate=0\n\tName=C{}\n")
VALUES = ("PersistentResourceAttribute\n\tName=A\n\tDescription=1\n\tDisplayName=2\n\tId=1\n\tDataType=Int32\n"
          "\tVarietyRange=1,9\n" + "".join(f"\tValidValue={value},{value}\n" for value in range(200)))
VARIABLE_CLASS = "ResourceVariableClass\n\tVariableClass=Group_{}\n\tObservationInterval=1\n"
MAP = "ClassToManagerMapping\n\tResourceManager=M\n\tFirstKey=1\n\tLastKey=9\n\tDescriptiveMessageSet=1\n"

SOURCES = {
    "records": lambda: itertools.repeat("ControlDefinition\n", 300_000),
    "small contents": lambda: map(HEAD.format, range(300_000)),
    "contents": lambda: (HEAD.format(number) + VALUES for number in range(14_000)),
    "variable classes": lambda: itertools.chain([HEAD], map(VARIABLE_CLASS.format, range(1_000_000))),
}


@pytest.mark.slow(5)
@pytest.mark.parametrize("option", ["-n", "-s"])
@pytest.mark.parametrize("what", SOURCES)
def test_peak(directory, what, option):
    require_own_memory()
    with (directory / "source").open("w") as source:
        source.writelines(SOURCES[what]())
        source.write(MAP)
    status, peak = peak_of(directory, [PROGRAMS.cdgen, option, "source", "c.cdef"], cwd=directory, env=environment())
    assert status == 0
    size = (directory / "c.cdef").stat().st_size
    assert size > 64 << 20
    assert peak <= 1.6 * size + PROGRAM
