"""What cdef diff --compat finds at each level: each rule with a pair of sources that breaks it, and a similar pair that
does not.

Both change base.cdefsrc.  The rules are those of the table in docs/diff.md.
"""

import json
import re

import pytest

from compare import same
from diff_test import base, programs, replaced  # pylint: disable=unused-import
from programs import PROJECT

LEVELS = ("readers", "clients", "stored")
SERIAL = "PersistentResourceAttribute 'Serial'"

NEW = "PersistentResourceAttribute\n\tName=New\n\tDescription=3\n\tDisplayName=4\n\tId={}\n\tDataType={}\n\tVarietyRange=1,2\n"
OPTIONAL = "\tProperties=OptForDefine\n"
BEFORE_ACTION = "ResourceAction\n"
DYNAMIC = NEW.replace("PersistentResource", "DynamicResource") + "\tVariableType=State\n"


def added(stanza, lines=""):
    """A new stanza in front of the action's."""
    return [(BEFORE_ACTION, stanza + lines + BEFORE_ACTION)]


# A rule's code; what changes in the source; the line that --compat shows of it without its sign; and the similar change
# that does not break the rule.
RULES = [
    ("CMP101", [("\tName=List\n", "\tName=Lister\n")], "ClassAction 'List': renamed to 'Lister' (readers miss it)",
     added(NEW.format(60, "Int32"))),
    ("CMP102", [("\tId=10\n", "\tId=61\n")], f"{SERIAL}: Id 10 -> 61 (readers know it by its number)",
     [("\tDescription=8\n", "\tDescription=61\n")]),
    ("CMP103", added(NEW.format(10, "Int32")),
     "PersistentResourceAttribute 'New' (readers know another one by its number)", added(NEW.format(27, "Int32"))),
    ("CMP104", [("\tDataType=UInt32\n\tValidValue=19\n", "\tDataType=UInt64\n\tValidValue=19\n")],
     "PersistentResourceAttribute 'Times', element 'Mount': type UInt32 -> UInt64 (values of another type)",
     [("\tValidValue=19\n", "\tValidValue=19\n\tValidValue=20\n")]),
    ("CMP105", [("\tElementName=Repair\n", "\tElementName=Mend\n")],
     "ResourceAction 'Check', input element 'Repair' (another layout of the structure)",
     [("\tDescription=41\n", "\tDescription=64\n")]),
    ("CMP201", added(NEW.format(60, "Int32"), "\tProperties=ReqdForDefine\n"),
     "PersistentResourceAttribute 'New' (clients do not give it)", added(NEW.format(60, "Int32"), OPTIONAL)),
    ("CMP202", [("\tVarietyRange=1,2\nDynamicClassAttribute\n",
                 "\tVarietyRange=1,2\n\tProperties=ReqdForDefine\nDynamicClassAttribute\n")],
     "PersistentClassAttribute 'Limit': properties InvalForDefine -> ReqdForDefine (clients may leave it out)",
     [("\tProperties=Public,ReqdForDefine\n", "\tProperties=Public,OptForDefine\n")]),
    ("CMP203", [("\tValidValue=0,1\n", "\tValidValue=0\n")],
     "define input element 'Force', valid value 0 to 1 (clients may use the value)",
     [("\tValidValue=0,1\n", "\tValidValue=-5,0\n\tValidValue=1,9\n")]),
    ("CMP204", [("\tId=24\n\tDataType=UInt32\n\tVarietyRange=1,2\n",
                 "\tId=24\n\tDataType=UInt32\n\tVarietyRange=1,2\n\tValidValue=7\n")],
     "PersistentClassAttribute 'Limit', valid value 7 (clients may use other values)",
     [("\tValidValue=19\n", "")]),
    ("CMP205", [("\tId=38\n\tVarietyRange=1,2\n", "\tId=38\n\tVarietyRange=1,1\n")],
     "ResourceAction 'Check', variety 1 to 2 (clients may use the variety)",
     [("\tId=38\n\tVarietyRange=1,2\n", "\tId=38\n\tVarietyRange=2,3\n\tVarietyRange=0,1\n")]),
    ("CMP206", [("\tProperties=Public,ReqdForDefine\n", "\tProperties=ReqdForDefine\n")],
     f"{SERIAL}: properties Public+ReqdForDefine -> ReqdForDefine (clients may rely on the property)",
     [("\tProperties=Public,ReqdForDefine\n", "\tProperties=Public,Select,OptForDefine\n")]),
    ("CMP207", [("\tProperties=Public,ReqdForDefine\n", "\tProperties=Public,ReqdForDefine,ReadOnly\n")],
     f"{SERIAL}: properties Public+ReqdForDefine -> Public+ReqdForDefine+ReadOnly (clients may set it)",
     [("\tProperties=Public,ReqdForDefine\n", "\tProperties=Public,Select,ReqdForDefine\n")]),
    ("CMP208", [("\tRange=1,31\n", "\tRange=1,30\n")],
     "DynamicResourceAttribute 'Load': upper bound 31 -> 30 (clients may use values outside)",
     [("\tRange=1,31\n", "\tRange=-1,32\n")]),
    ("CMP209", [("\tPermission=x\n", "\tPermission=a\n")],
     "ResourceAction 'Check': permission x -> a (clients may lack the permission)",
     [("\tTimeOut=40\n", "\tTimeOut=41\n")]),
    ("CMP301", [("\tName=Limit\n", "\tName=Border\n")],
     "PersistentClassAttribute 'Limit': renamed to 'Border' (readers miss it; stored values are those of another name)",
     [("\tName=Limit\n", "\tName=Border\n"), ("\tId=24\n", "\tId=62\n")]),
    ("CMP302", added(DYNAMIC.format(16, "SD")),
     "DynamicResourceAttribute 'New' (stored values are those of another kind; stored values are those of another name)",
     added(DYNAMIC.format(24, "UInt32"))),
    ("CMP303", [("\tDataType=Float32\n", "\tDataType=Float64\n")],
     "DynamicResourceAttribute 'Load': type Float32 -> Float64 "
     "(values of another type; stored values are those of another type)",
     [("\tDataType=Float32\n", "\tDataType=Float64\n"), ("\tId=30\n", "\tId=63\n")]),
]

def documented():
    """The rules of the document: code, level, reason."""
    text = (PROJECT / "docs/diff.md").read_text()
    return re.findall(r"^\| `(CMP\d+)` \| `(\w+)` \| .* \| (.*) \|$", text, re.M)


def compared(programs, changes, *options):  # noqa: F811
    """What the comparison of the base with a changed one says."""
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
    """A rule is broken by one change and not by a similar one, and is shown from its own level on."""
    level = {known: level for known, level, _ in documented()}[code]
    status, text, _ = compared(programs, breaking, f"--compat={level}")
    same((status, line in [each[2:] for each in text.splitlines()]), (1, True), text)
    same(code in codes_of(compared(programs, breaking, "--json")[1]), True, "breaking")
    status, text, _ = compared(programs, similar, "--json")
    same((status, code in codes_of(text)), (1, False), "similar")
    for lower in LEVELS[: LEVELS.index(level)]:
        same(code in codes_of(compared(programs, breaking, "--json", f"--compat={lower}")[1]), False, lower)


def test_every_rule_has_its_pairs():
    """No rule of the document is left out."""
    same(sorted(rule[0] for rule in RULES), [code for code, _, _ in documented()])


def test_levels_include_those_before(programs):  # noqa: F811
    """What breaks readers is shown to all."""
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
    """On standard error, whatever the level; a higher one is not."""
    lower, higher = [("\tFileVersion=1.2.3.4\n", "\tFileVersion=1.2.3.3\n")], [("\tFileVersion=1.2.3.4\n", "\tFileVersion=1.10.3.4\n")]
    mention = "cdef: two.cdef: a lower version than one.cdef: 1.2.3.4 -> 1.2.3.3\n"
    same(compared(programs, lower, "--compat"), (0, "", mention), "--compat")
    same(compared(programs, lower)[2], mention, "all")
    same(compared(programs, higher, "--compat=stored"), (0, "", ""), "higher")


def test_renamed_in_json(programs):  # noqa: F811
    """The path has the old name, beside it is the new one."""
    status, text, _ = compared(programs, [("\tName=List\n", "\tName=Lister\n")], "--json")
    found = json.loads(text)["differences"]
    reason = {"code": "CMP101", "level": "readers", "reason": "readers miss it"}
    path = [{"kind": "ResourceClass", "name": "Disk"}, {"kind": "ClassAction", "name": "List"}]
    same((status, found), (1, [{"change": "renamed", "path": path, "name": "Lister", "breaks": [reason]}]))
