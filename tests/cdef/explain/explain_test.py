"""Test `cdef explain`. A unit test shows that each example has its code."""

import json
import re
import subprocess

from compare import same
from programs import PROGRAMS, PROJECT


def explain(*operands):
    """Status, output and messages of `cdef explain`."""
    result = subprocess.run([PROGRAMS.cdef, "explain", *operands], capture_output=True, timeout=60, check=False)
    return result.returncode, result.stdout.decode(), result.stderr.decode()


S206 = """S206: error: Range requires two values

Cause:
  A `Range` has no comma.

Cure:
  Write `low,high`.

Example:
    DynamicResourceAttribute
    \t...
    \tDataType=Int32
    \tRange=100

Cured:
    DynamicResourceAttribute
    \t...
    \tDataType=Int32
    \tRange=0,100
"""

CDB104 = """CDB104: error: wrong checksum

Cause:
  Something was changed after the file was made.

Cure:
  Compile the source again, or take another copy of the file: this one is
  damaged.
"""


def test_code():
    """Cause, cure and example, for codes in any case."""
    same(explain("S206"), (0, S206, ""), "S206")
    same(explain("s206"), (0, S206, ""), "s206")
    same(explain("CDB104"), (0, CDB104, ""), "CDB104")


def test_several_codes():
    """Each after the other."""
    same(explain("S206", "CDB104"), (0, S206 + "\n" + CDB104, ""), "two codes")


def test_name_of_a_warning():
    """It gives the same explanation as the code, which is shown."""
    same(explain("octal"), explain("S509"), "octal")
    assert explain("octal")[1].startswith("S509: warning: a leading 0 makes a number octal [octal]\n\nCause:\n")


def test_example_that_cannot_be_cured_alone():
    """It is shown without a cured source."""
    assert "\nExample:\n" in explain("S118")[1] and "\nCured:\n" not in explain("S118")[1]


def test_list():
    """All codes with their titles."""
    status, output, errors = explain()
    lines = output.splitlines()
    same((status, errors, lines[0]), (0, "", "S101    Invalid table name"), "list")
    assert "S509    a leading 0 makes a number octal [octal]" in lines
    assert "CDB104  wrong checksum" in lines
    assert len(lines) == len(set(lines)) > 100


def test_number_that_contradicts_the_file():
    """The library never reports this code, but cdef verify does."""
    assert explain("CDB108")[1].startswith("CDB108: error: contradicts the rest of the file\n\nCause:\n")
    codes = [line.split()[0] for line in explain()[1].splitlines()]
    same(codes, sorted(codes, key=lambda code: (code.startswith("C"), code)), "order")


CMP206 = """CMP206: error: a property is gone

Cause:
  The change breaks programs or data that rely on the older version: clients may
  rely on the property. The rule applies at the level `clients` and those after
  it.

Cure:
  Undo the change, or add something new and keep the old. If nobody relies on
  the older version in this way, the change is harmless.
"""


def test_codes_of_comparisons():
    """The codes of `cdef diff --compat` and of `cdef gate`."""
    same(explain("CMP206"), (0, CMP206, ""), "CMP206")
    same(explain("unrecorded-number"), explain("CMP404"), "CMP404")
    table = (PROJECT / "docs/diff.md").read_text()
    listed = {line.split()[0] for line in explain()[1].splitlines()}
    assert set(re.findall(r"^\| `(CMP\d+)`", table, re.M)) <= listed


def test_unknown_code():
    """Codes that are one edit away are suggested, unless there are many."""
    near = (("octl", "octal"), ("unbalance", "unbalanced"), ("S502x", "S502"), ("s5O9", "S509, S519 or S529"))
    for given, meant in near:
        same(explain(given), (2, "", f"cdef: {given}: no such code; did you mean {meant}?\n"), given)
    for given in ("S10", "CDB801", "CMP999", "S5555", "S9999", "S700", "cdb999", "spam", ""):
        same(explain("S101", given), (2, "", f"cdef: {given}: no such code; 'cdef explain' lists all\n"), given)


def test_json():
    """Examples are whole sources."""
    status, output, errors = explain("--format", "json", "S302", "S901")
    one, other = json.loads(output)["codes"]
    same((status, errors), (0, ""), "status")
    same(one["title"], "No class-to-manager maps defined", "title")
    assert one["example"].startswith("ControlDefinition\n") and one["cured"].startswith(one["example"])
    same((other["code"], other["name"], other["example"], other["cured"]), ("S901", None, None, None), "S901")
