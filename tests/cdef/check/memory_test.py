"""Test that `cdef check` takes at most 8 times the source and 16 MB, however much is wrong, in every form.

WRONG_LINES is how many lines are wrong: 100,000 where nothing is said, 10,000,000 in script/proof. The limit is one of
the address space, so that nothing depends on what else the machine does.
"""

import itertools
import os

import pytest

from bounded import MEGABYTES, peak_of, require_own_memory, run_bounded, run_within
from compare import same
from programs import PROGRAMS

LINES = int(os.environ.get("WRONG_LINES", "100000"))

SOURCES = {
    "unknown-headers": ("", "x\n"),
    "different-headers": ("", "{:x}\n"),
    "lines-without-equals": ("ControlDefinition\n", " x\n"),
    "unknown-attributes": ("ControlDefinition\n", " x=1\n"),
    "misspelt-attributes": ("ControlDefinition\n", " FileVersoin=1\n"),
    "elements-of-nothing": ("", "PAttrSDDefinition\n"),
    "maps": ("", "ClassToManagerMapping\n"),
}

# Each of these stanzas is allowed; the source as a whole lacks a map.
CLASSES = {
    "classes": ("", "ControlDefinition\n"),
    "classes-with-attributes": ("", "ControlDefinition\nPersistentResourceAttribute\n"),
    "classes-with-dynamic-attributes": ("", "ControlDefinition\nDynamicResourceAttribute\n"),
}


CLASS = """ControlDefinition
ResourceClass
 Description=1
 DisplayName=2
 Properties=HasResources,CanDefine
 ClassPermTemplate=0
 ResourcePermTemplate=0
 Name=C
"""
PERSISTENT = "PersistentResourceAttribute\n Name=A\n Description=3\n DisplayName=4\n Id=5\n DataType={}\n"
INCOMPLETE = "ControlDefinition\nResourceClass\nDynamicResourceAttribute\n"

# What is kept of each line, in bytes: first what the compiler keeps of a value, then what the warnings keep. The
# room that tables have to grow is in BASE.
KEPT = {
    # An array's value: a cell (8) and its text (8); the line (15) and its place (16).
    "defaults": (CLASS + PERSISTENT.format("StringArray") + " VarietyRange=1,9\n", " DefaultValue=a\n", 8 + 8 + 31),
    # A valid value: an entry (24); a range of 24 bytes in each of two sets.
    "valid-values": (CLASS + PERSISTENT.format("Int32") + " VarietyRange=1,9\n", " ValidValue={}\n", 24 + 2 * 24),
    "same-valid-values": (CLASS + PERSISTENT.format("Int32") + " VarietyRange=1,9\n", " ValidValue=1\n", 24),
    # An early line: its text and its number. The value as above; the warnings keep its line and place.
    "early-defaults": ("ControlDefinition\nResourceClass\n" + PERSISTENT.format("StringArray"), " DefaultValue=a\n",
                       8 + 8 + 31 + 16 + 4),
    "early-expressions": (INCOMPLETE, " Expression=(a\n", 8 + 15 + 4),
}


# A class with an attribute that the next class ends: at most the list of varieties (8 bytes) and its table (40).
CLASS_KEPT = 48

FORMS = ("text", "json", "sarif", "github", "gitlab")
CASES = [("different-headers", form) for form in FORMS] + [("unknown-attributes", form) for form in FORMS[1:3]]
CASES += [(name, "text") for name in SOURCES if name != "different-headers"]


# The program itself, the findings that wait, and the output that is not yet written take 7 MB. 10 MB leave so little
# that 100,000 lines are noticed if each leaks 72 bytes.
BASE = 10 * MEGABYTES


def write_source(directory, head, line, count=LINES):
    """Writes a source of such lines."""
    source = directory / "wrong"
    with source.open("w", newline="") as file:
        file.write(head)
        file.writelines(line.format(number) for number in range(100_000, 100_000 + count))
    return source


def check(directory, head, line, form="text", kept=0):
    """Checks a source of such lines within the memory limit, also if it may only keep so many bytes of each line.
    Returns what standard error contains."""
    source = write_source(directory, head, line)
    command = [PROGRAMS.cdef, "check", "--format", form]
    if LINES > 1_000_000:
        status, _, messages = run_bounded(directory, command, source)
    else:
        status, _, messages = run_within(directory, BASE + kept * LINES, command, source)
    same(status, 1, "status")
    return messages


@pytest.mark.slow(30)
@pytest.mark.parametrize(("name", "form"), CASES)
def test_bound(directory, name, form):
    """Every finding is either written or counted."""
    messages = check(directory, *SOURCES[name], form)
    if form == "text":
        same(messages.count(b": error: "), 100, "errors shown")
        assert int(messages.splitlines()[-1].split()[0]) >= LINES


@pytest.mark.slow(30)
@pytest.mark.parametrize("name", KEPT)
def test_kept(directory, name):
    """Of each line that is accepted, only its value and its place are kept."""
    head, line, kept = KEPT[name]
    check(directory, head, line, kept=kept)


@pytest.mark.slow(30)
@pytest.mark.parametrize("form", ["text", "sarif"])
def test_variable_classes(directory, form):
    """Their names are kept by four warnings, as they are and in lower case."""
    source = write_source(directory, "ControlDefinition\nResourceClass\n", "ResourceVariableClass\n VariableClass={}\n")
    assert run_bounded(directory, [PROGRAMS.cdef, "check", "--format", form], source)[0] == 1


@pytest.mark.slow(10)
@pytest.mark.parametrize("form", ["json", "sarif", "gitlab"])
def test_carriage_returns(directory, form):
    """Not all of them are in the correction of the first one."""
    source = write_source(directory, "", "\r\n", min(LINES, 1_000_000))
    assert run_bounded(directory, [PROGRAMS.cdef, "check", "--format", form], source)[0] == 1


FIXED = {
    "blanks": ("", "ControlDefinition\n FileVersion =1\n", 40_000),
    "returns": ("", "\r\n", 100_000),
}


@pytest.mark.slow(30)
@pytest.mark.parametrize("options", [["--fix"], ["--fix", "--dry-run"]])
@pytest.mark.parametrize("name", FIXED)
def test_fix(directory, name, options):
    """Corrections are made in rounds, and all are made."""
    source = write_source(directory, *FIXED[name])
    status, out, _ = run_bounded(directory, [PROGRAMS.cdef, "check", "-q", "--max=1", *options], source)
    same(status, 1, "status")
    after = source.read_bytes() if len(options) == 1 else out.read_bytes()
    assert (b" =" in after or b"\r" in after) == (len(options) == 2)


DIFFS = {
    "many-changes": ("ControlDefinition\r\n", "\r\n\n", 300_000),
    "many-corrections": ("ControlDefinition\nPersistentResourceAttribute\n", "\tId =1\n", 150_000),
    "no-change": ("", "\n", 10_000_000),
}


@pytest.mark.slow(10)
@pytest.mark.parametrize("name", DIFFS)
def test_diff(directory, name):
    """Neither the lines of a source nor its changes are kept to show them as a diff, nor all corrections at once."""
    require_own_memory()
    source = write_source(directory, *DIFFS[name])
    bound = 8 * source.stat().st_size + 16 * MEGABYTES
    status, peak = peak_of(directory, [PROGRAMS.cdef, "check", "-q", "--max=1", "--fix", "--dry-run", source])
    same(status, 1, "status")
    assert peak <= bound


@pytest.mark.slow(10)
def test_many_shown(directory):
    """However many findings are to be shown, few wait until it is certain that they are."""
    head, line, _ = KEPT["same-valid-values"]
    source = write_source(directory, head, line, 100_000)
    status, _, messages = run_bounded(directory, [PROGRAMS.cdef, "check", "--max=100000"], source)
    same(status, 1, "status")
    same(messages.count(b": warning: "), 99_999, "warnings shown")


@pytest.mark.slow(10)
def test_many_edits(directory):
    """Corrections of many edits do not wait as long as others: here, 60 that each move 4,096 lines."""
    attribute = PERSISTENT.format("StringArray").replace("\n", "\n" + " DefaultValue=a\n" * 4096, 1)
    source = write_source(directory, CLASS, attribute + " VarietyRange=1,9\n", 60)
    options = ["--no-warn=all", "--format=json"]
    status, out, _ = run_within(directory, BASE + 6 * MEGABYTES, [PROGRAMS.cdef, "check", *options], source)
    same(status, 1, "status")
    same(out.read_bytes().count(b'"certain"'), 60, "corrections")


@pytest.mark.slow(10)
def test_wide_ids(directory):
    """Ids that a locator could not have are kept until the class has named its locator. Just after a table has grown, it
    takes the most memory."""
    require_own_memory()
    source = write_source(directory, CLASS, "PersistentResourceAttribute\n Id=70000\n Name={:x}\n", (1 << 18) + 6)
    bound = 8 * source.stat().st_size + 16 * MEGABYTES
    status, peak = peak_of(directory, [PROGRAMS.cdef, "check", "-q", "--max=1", source])
    same(status, 1, "status")
    assert peak <= bound


# Headers as short as they can be for their kind still to be guessed, and attributes that are kept.
ABBREVIATED = {
    "variable-classes": b"Var\n VariableClass=%(name)b\n",
    "attributes": b"PeR\n Name=%(name)b\n",
    "wide-ids": b"PeR\n Id=%(number)d\n Name=%(name)b\n",
    "used-variable-classes": b"DyR\n Name=%(name)b\n VariableClass=%(name)b\n",
}


def abbreviated(directory, stanza, count, header=b"ControlDefinition\n"):
    """Writes a source of such stanzas, each with a name of three bytes. Returns the most memory that its check may
    take: nine tenths of what is promised."""
    source = directory / "wrong"
    names = itertools.product(range(0x80, 0x100), repeat=3)
    with source.open("wb") as file:
        file.write(header + b"ResourceClass\n")
        file.writelines(stanza % {b"number": number, b"name": bytes(name)}
                        for number, name in zip(range(70_000, 70_000 + count), names, strict=False))
    return (8 * source.stat().st_size + 16 * MEGABYTES) * 9 // 10


@pytest.mark.slow(10)
@pytest.mark.parametrize("name", ABBREVIATED)
def test_abbreviated_headers(directory, name):
    """Names are kept in little more memory than they need, also just after a table has grown."""
    require_own_memory()
    bound = abbreviated(directory, ABBREVIATED[name], (1 << 18) + 6)
    status, peak = peak_of(directory, [PROGRAMS.cdef, "check", "-q", "--max=1", directory / "wrong"])
    same(status, 1, "status")
    assert peak <= bound


@pytest.mark.slow(20)
def test_fix_of_abbreviated_headers(directory):
    """Corrections of some headers do not add to the names."""
    require_own_memory()
    bound = abbreviated(directory, ABBREVIATED["variable-classes"], (1 << 17) + 6, header=b"ControlDefinitio\n")
    status, peak = peak_of(directory, [PROGRAMS.cdef, "check", "-q", "--max=1", "--fix", directory / "wrong"])
    same(status, 1, "status")
    assert peak <= bound


@pytest.mark.slow(30)
@pytest.mark.parametrize("equals", ["=", " ="])
def test_fix_of_variable_classes(directory, equals):
    """Their names are kept in each round, whether there is something to correct or not."""
    require_own_memory()
    source = write_source(directory, "ControlDefinition\nResourceClass\n",
                          f"ResourceVariableClass\n VariableClass{equals}{{}}\n", 60_000)
    bound = 8 * source.stat().st_size + 16 * MEGABYTES
    status, peak = peak_of(directory, [PROGRAMS.cdef, "check", "-q", "--max=1", "--fix", source])
    same(status, 1, "status")
    assert peak <= bound
    assert b" =" not in source.read_bytes()


@pytest.mark.slow(30)
@pytest.mark.parametrize("name", CLASSES)
def test_classes(directory, name):
    """Nothing that only a database would need is kept about a class without errors."""
    messages = check(directory, *CLASSES[name], kept=0 if name == "classes" else CLASS_KEPT)
    same(messages.count(b": error: No class-to-manager maps defined"), 1, "errors shown")
    assert int(messages.splitlines()[-1].split()[3]) >= LINES, "warnings counted"
