"""Test that `cdef gate` takes no time out of proportion to its sources, neither for many findings nor for many runs."""

import pytest

from bounded import run_for
from cases import SOURCE, check
from gate_test import ACTION, ATTRIBUTE, with_class, write
from programs import PROGRAMS

MANY = 60_000
THE_ACTION = ACTION.format("Act", 1)


def element(name, number, kind="ActionIn", datatype="Int32"):
    """An element of an action's input or output."""
    return (f"{kind}SDDefinition\n\tElementName={name}\n\tDescription=3\n\tDisplayName=4\n\tElementIndex={number}\n"
            f"\tDataType={datatype}\n")


def with_many(what, is_new):
    """A class with many parts, all of which are about something else in the new version."""
    numbers = range(MANY)
    datatype = "Int64" if is_new else "Int32"
    if what == "attributes":
        return with_class(*(ATTRIBUTE.format(f"A{i}", i, datatype) for i in numbers))
    if what == "elements":
        return with_class(THE_ACTION, *(element(f"E{i}", i, datatype=datatype) for i in numbers))
    varieties = "".join(f"\tVarietyRange={i},{i}\n" for i in numbers)
    values = "".join(f"\tValidValue={2 * i + is_new}\n" for i in numbers)
    return with_class(ATTRIBUTE.format("A", 1, "Int32"), varieties, values)


@pytest.mark.parametrize("what", ["attributes", "elements", "values"])
def test_many_findings(world, what):
    """For each of them, the source is not searched from its beginning."""
    write(world, "old.cdefsrc", with_many(what, False))
    write(world, SOURCE, with_many(what, True))
    command = [PROGRAMS.cdef, "gate", "--no-config", "-q", "--level=stored", "--against=old.cdefsrc", SOURCE]
    check(run_for(30, command, cwd=world.path(".")) == 1, "no findings")


def test_many_runs_of_one_action(world):
    """Runs of input and output that replace each other. Not all those before are read to see whose the next one is."""
    runs = (element("E", 0) + element("E", 0, "ActionOut")) * 200_000
    write(world, SOURCE, with_class(THE_ACTION, runs))
    write(world, "ids.lock", "")
    command = [PROGRAMS.cdef, "gate", "--no-config", "-q", "--ids=ids.lock", SOURCE]
    check(run_for(30, command, cwd=world.path(".")) == 0, "findings")
