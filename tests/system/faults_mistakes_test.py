"""Test that mistakes in a source or in the operands leave an existing output unchanged."""

import shlex

import golden
from cases import BEFORE, OUT, SOURCE, check
from programs import TESTS

GOLDEN = TESTS / "golden"


def refused_cases(area):
    """The golden cases of an area that fail for a reason other than their output, with source and output."""
    for path in golden.cases_below(GOLDEN / area):
        expected = golden.Case(path)
        operands = shlex.split(expected.keys.get("operands", f"{expected.source.name} {expected.out}"))
        at_output = expected.streams["stderr"].startswith(b"Cannot ") or "message" in expected.keys
        if expected.status != 0 and len(operands) == 2 and not at_output:
            yield expected, operands


def stays(world, out, status, *arguments):
    """Checks that a failing run, with traces and without, leaves a database unchanged, including inode and time."""
    world.path(out).parent.mkdir(parents=True, exist_ok=True)
    world.write(out, BEFORE)
    for more in ((), ("-d", "3")):
        with world.left_alone(out):
            result = world.run(*more, *arguments)
        check(result.returncode == status, *more, *arguments, "status", result.returncode)


def untouched(world, area):
    """Checks that every failing golden case of an area leaves the output unchanged."""
    count = 0
    for expected, operands in refused_cases(area):
        golden.set_up(expected, world.directory)
        stays(world, operands[-1], expected.status, *shlex.split(expected.keys.get("args", "")), *operands)
        count += 1
    check(count > 0, "no cases")


def test_mistakes_of_lines_leave_the_output(world):
    """Golden cases of the reader."""
    untouched(world, "reader")


def test_mistakes_of_attributes_leave_the_output(world):
    """Golden cases of the parser."""
    untouched(world, "parser")


def test_mistakes_of_values_leave_the_output(world):
    """Golden cases of the handlers."""
    untouched(world, "handlers")


def test_mistakes_of_stanzas_leave_the_output(world):
    """Golden cases of the assembly."""
    untouched(world, "assembly")


def test_settled_mistakes_leave_the_output(world):
    """Golden cases of the area settled."""
    untouched(world, "settled")


def test_traced_mistakes_leave_the_output(world):
    """Golden cases of traces."""
    untouched(world, "trace")


def test_mistakes_of_operands_leave_the_output(world):
    """Golden cases of options and of sources that cannot be read."""
    untouched(world, "usage")


def test_mistakes_at_the_end_leave_the_output(world):
    """Golden cases that compile, with one more header at the end: everything before it has been compiled."""
    count = 0
    for path in golden.cases_below(GOLDEN / "image"):
        expected = golden.Case(path)
        world.write(SOURCE, expected.source.read_bytes() + b"\nNoSuchStanza\n")
        stays(world, OUT, 1, *shlex.split(expected.keys.get("args", "")), SOURCE, OUT)
        count += 1
    check(count > 0, "no cases")
