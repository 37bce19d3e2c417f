"""Mistakes in a source or in the operands: they leave an output that was there before as it was.

The cases are those of faults_test.py.
"""

import pathlib
import shlex

import golden
from cases import BEFORE, OUT, SOURCE, Cases, check

GOLDEN = pathlib.Path(__file__).resolve().parent / "golden"

case = Cases()


def refused_cases(area):
    """The golden cases of an area whose run fails for another reason than its output; their source and output."""
    for path in golden.cases_of([GOLDEN / area]):
        expected = golden.Case(path)
        operands = shlex.split(expected.keys.get("operands", f"{expected.source.name} {expected.out}"))
        at_output = expected.streams["stderr"].startswith(b"Cannot ") or "message" in expected.keys
        if expected.status != 0 and len(operands) == 2 and not at_output:
            yield expected, operands


def stays(world, out, status, *arguments):
    """A run that ends so, with traces and without, leaves a database as it was, to the inode and the time."""
    world.path(out).parent.mkdir(parents=True, exist_ok=True)
    world.write(out, BEFORE)
    for more in ((), ("-d", "3")):
        with world.left_alone(out):
            result = world.run(*more, *arguments)
        check(result.returncode == status, *more, *arguments, "status", result.returncode)


def untouched(world, area):
    """Every golden case of an area that fails leaves the output."""
    count = 0
    for expected, operands in refused_cases(area):
        golden.set_up(expected, world.directory)
        stays(world, operands[-1], expected.status, *shlex.split(expected.keys.get("args", "")), *operands)
        count += 1
    check(count > 0, "no cases")


@case
def mistakes_of_lines_leave_the_output(world):
    """Golden cases of the reader."""
    untouched(world, "reader")


@case
def mistakes_of_attributes_leave_the_output(world):
    """Golden cases of the parser."""
    untouched(world, "parser")


@case
def mistakes_of_values_leave_the_output(world):
    """Golden cases of the handlers."""
    untouched(world, "handlers")


@case
def mistakes_of_stanzas_leave_the_output(world):
    """Golden cases of the assembly."""
    untouched(world, "assembly")


@case
def settled_mistakes_leave_the_output(world):
    """Golden cases of what was settled."""
    untouched(world, "settled")


@case
def traced_mistakes_leave_the_output(world):
    """Golden cases of traces."""
    untouched(world, "trace")


@case
def mistakes_of_operands_leave_the_output(world):
    """Golden cases of options and of sources that cannot be read."""
    untouched(world, "usage")


@case
def mistakes_at_the_end_leave_the_output(world):
    """Whatever the source has made by then: golden cases that compile, and one header more."""
    count = 0
    for path in golden.cases_of([GOLDEN / "image"]):
        expected = golden.Case(path)
        world.write(SOURCE, expected.source.read_bytes() + b"\nNoSuchStanza\n")
        stays(world, OUT, 1, *shlex.split(expected.keys.get("args", "")), SOURCE, OUT)
        count += 1
    check(count > 0, "no cases")
