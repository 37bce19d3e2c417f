"""Test that the programs read and write the same in a locale whose numbers have commas. Every test is a function below,
named for what is read or written.

Every test is a function below, named for what is read or written.
"""

import subprocess

import german
from cases import HEAD, OUT, SOURCE, TIMEOUT, check, expect

NUMBERS = b"""\
PersistentResourceAttribute
	Name=Number%d
	Description=3
	DisplayName=4
	Id=%d
	DataType=%s
	VarietyRange=1,2
	DefaultValue=0.5
	ValidValue=-2.5e-3,1.25
DynamicResourceAttribute
	Name=Measured%d
	Description=5
	DisplayName=6
	Id=%d
	DataType=%s
	VariableType=Quantity
	VarietyRange=3,4
	InitialValue=1.5
	Range=0.75,99.5
	ValidStateValue=0x1.8p1
"""
SOURCE_OF_NUMBERS = HEAD + b"".join(
    NUMBERS % (i, i, name, i, i + 10, name) for i, name in enumerate((b"Float32", b"Float64", b"Float32Array", b"Float64Array"))
)

def elsewhere(world):
    """The options with which a process is started in that locale."""
    options = world.options()
    return {**options, "env": {**options["env"], **german.environment(world.locales)}}


def test_databases(world):
    """Databases with floating-point values."""
    good = world.good(SOURCE_OF_NUMBERS)
    command = [world.program, SOURCE, OUT]
    expect(subprocess.run(command, capture_output=True, timeout=TIMEOUT, **elsewhere(world)), 0)
    check(world.read() == good, "another database")


def inspected(world, *arguments):
    """The output of cdef about such a database."""
    world.write(OUT, world.good(SOURCE_OF_NUMBERS))
    usual = world.inspect(*arguments)
    result = subprocess.run([world.cdef, *arguments], capture_output=True, timeout=TIMEOUT, **elsewhere(world))
    expect(usual, 0, usual.stderr, usual.stdout)
    expect(result, 0, usual.stderr, usual.stdout)
    return result


def test_text(world):
    """All numbers of the listing."""
    check(b"99.5" in inspected(world, "dump", OUT).stdout, "the number is not in it")


def test_json(world):
    """All numbers in JSON."""
    check(b"99.5" in inspected(world, "dump", "--json", OUT).stdout, "the number is not in it")


def test_sources(world):
    """Sources made from a database."""
    check(b"Range=0.75,99.5" in inspected(world, "source", OUT).stdout, "the number is not in it")


def test_findings(world):
    """A database and a source without findings."""
    inspected(world, "verify", OUT)
    inspected(world, "check", SOURCE)
