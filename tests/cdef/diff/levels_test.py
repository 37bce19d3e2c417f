"""Test what cdef diff --compat finds at each level: each rule has a pair of sources that breaks it, and a similar pair
that does not. Both change base.cdefsrc. The rules are those of the table in docs/diff.md.
"""

import json
import re

import pytest

from compare import same
from diff_test import base, programs, replaced  # pylint: disable=unused-import
from levels import LEVELS, RULES, SERIAL
from programs import PROJECT


def documented():
    """The rules in the document: code, level, reason."""
    text = (PROJECT / "docs/diff.md").read_text()
    return re.findall(r"^\| `(CMP\d+)` \| `(\w+)` \| .* \| (.*) \|$", text, re.M)


def compared(programs, changes, *options):  # noqa: F811
    """The output of a comparison of the base with a changed source."""
    source = base()
    for old, new in changes:
        source = replaced(source, old, new)
    one, two = programs.compile(base(), "one.cdef"), programs.compile(source, "two.cdef")
    return programs.diff(*options, one, two)


def codes_of(text):
    """The codes of all rules that differences in JSON break."""
    found = json.loads(text)
    differences = found["differences"] if isinstance(found, dict) else found
    return {rule["code"] for each in differences for rule in each.get("breaks", ())}


@pytest.mark.parametrize("code,breaking,line,similar", RULES, ids=[rule[0] for rule in RULES])
def test_rule(programs, code, breaking, line, similar):  # noqa: F811
    """One change breaks the rule, a similar one does not. The difference is shown at the rule's level and at those
    after it."""
    level = {known: level for known, level, _ in documented()}[code]
    status, text, _ = compared(programs, breaking, f"--compat={level}")
    same((status, line in [each[2:] for each in text.splitlines()]), (1, True), text)
    same(code in codes_of(compared(programs, breaking, "--json")[1]), True, "breaking")
    status, text, _ = compared(programs, similar, "--json")
    same((status, code in codes_of(text)), (1, False), "similar")
    for lower in LEVELS[: LEVELS.index(level)]:
        same(code in codes_of(compared(programs, breaking, "--json", f"--compat={lower}")[1]), False, lower)


PERSISTENT = "\tDataType=Int32\n\tVarietyRange=1,1\n"
DYNAMIC = "\tDataType=Int32\n\tVarietyRange=1,1\n\tVariableType=State\n"
ACTION = "\tVarietyRange=1,1\n"


@pytest.mark.parametrize("kind,more", [
    ("PersistentResourceAttribute", PERSISTENT), ("PersistentClassAttribute", PERSISTENT),
    ("DynamicResourceAttribute", DYNAMIC), ("DynamicClassAttribute", DYNAMIC), ("ResourceAction", ACTION), ("ClassAction", ACTION),
])
def test_readers_miss_what_is_gone(programs, kind, more):  # noqa: F811
    stanza = f"{kind}\n\tName=Gone\n\tDescription=1\n\tDisplayName=2\n\tId=700\n{more}"
    one = programs.compile(replaced(base(), "ClassToManagerMapping\n", stanza + "ClassToManagerMapping\n"), "one.cdef")
    two = programs.compile(base(), "two.cdef")
    status, text, _ = programs.diff("--compat=readers", one, two)
    same((status, [line for line in text.splitlines() if "Gone" in line] != []), (1, True), text)


def test_every_rule_has_its_pairs():
    """For all rules in the document."""
    same(sorted(rule[0] for rule in RULES), [code for code, _, _ in documented()])


def test_range_of_an_array_becomes_narrower(programs):  # noqa: F811
    """Each of its bounds is an array of one element."""
    source = base()
    for old, new in (("\tDataType=Float32\n\tVariableType=Quantity\n", "\tDataType=Int32Array\n\tVariableType=Quantity\n"),
                     ("\tInitialValue=0.5\n", "\tInitialValue=5\n")):
        source = replaced(source, old, new)
    one = programs.compile(source, "one.cdef")
    narrower, wider = (programs.compile(replaced(source, "\tRange=1,31\n", f"\tRange={bounds}\n"), f"{name}.cdef")
                       for name, bounds in (("narrower", "1,30"), ("wider", "0,32")))
    same(codes_of(programs.diff("--json", one, narrower)[1]), {"CMP208"}, "narrower")
    same(codes_of(programs.diff("--json", one, wider)[1]), set(), "wider")


def test_levels_include_those_before(programs):  # noqa: F811
    """A difference that breaks readers is shown at every level."""
    change = [("\tId=10\n", "\tId=61\n"), ("\tPermission=x\n", "\tPermission=a\n")]
    number = f"~ {SERIAL}: Id 10 -> 61 (readers know it by its number)\n"
    permission = "~ ResourceAction 'Check': permission x -> a (clients may lack the permission)\n"
    for option, text in (("--compat", number), ("--compat=readers", number), ("--compat=clients", number + permission),
                         ("--compat=stored", number + permission)):
        same(compared(programs, change, option), (1, text, ""), option)


def test_unknown_level(programs):  # noqa: F811
    """Status 2, and nothing on standard output."""
    status, text, message = compared(programs, [], "--compat=others")
    same((status, text, "others" in message), (2, "", True))


def test_lower_version_is_mentioned(programs):  # noqa: F811
    """On standard error, whatever the level. A higher version is not mentioned."""
    lower, higher = [("\tFileVersion=1.2.3.4\n", "\tFileVersion=1.2.3.3\n")], [("\tFileVersion=1.2.3.4\n", "\tFileVersion=1.10.3.4\n")]
    mention = "cdef: two.cdef: a lower version than one.cdef: 1.2.3.4 -> 1.2.3.3\n"
    same(compared(programs, lower, "--compat"), (0, "", mention), "--compat")
    same(compared(programs, lower)[2], mention, "all")
    same(compared(programs, higher, "--compat=stored"), (0, "", ""), "higher")


def test_renamed_in_json(programs):  # noqa: F811
    """The path has the old name; the new one is beside it."""
    status, text, _ = compared(programs, [("\tName=List\n", "\tName=Lister\n")], "--json")
    found = json.loads(text)["differences"]
    reason = {"code": "CMP101", "level": "readers", "reason": "readers miss it"}
    path = [{"kind": "ResourceClass", "name": "Disk"}, {"kind": "ClassAction", "name": "List"}]
    same((status, found), (1, [{"change": "renamed", "path": path, "name": "Lister", "breaks": [reason]}]))
