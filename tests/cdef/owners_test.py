"""Test that all subcommands agree about the owner of a list of valid values or of a bound, if the reference does not
show it.

An attribute that a following class cuts short refers to the first list of valid values, whether it has a list or
not. Each case is a class that another one cuts short, with the expected owner of each list. All four subcommands
must agree:

    verify    warns of each attribute that refers to a list that is not its own
    dump      shows valid values with their owner only; with --hex, as values of the owner's type
    source    writes them in their owner's stanza
    diff      shows them as added to their owner, compared with the class without them

A bound may be a number of another type that looks like a reference. The images in tests/image/broken that change
small.image have such bounds.
"""

import dataclasses
import json
import re
import subprocess

import pytest

from compare import same
from programs import PROGRAMS

TIMEOUT = 60
ATTRIBUTES = ("persistent_class_attributes", "dynamic_class_attributes", "persistent_resource_attributes",
              "dynamic_resource_attributes")
NOT_ITS_OWN = "CDB353"

CLASS = """ControlDefinition
	FileVersion=1.0.0.0
ResourceClass
	Description=1
	DisplayName=2
	Properties=HasResources,CanDefine
	ClassPermTemplate=0
	ResourcePermTemplate=0
	Name={}
"""
MAP = """ClassToManagerMapping
	ResourceManager=Mgr1
	FirstKey=1
	LastKey=100
	MessageCatalog=mgr1.cat
	DescriptiveMessageSet=1
"""


def stanza(kind, *lines):
    """A stanza of these lines."""
    return "\n\t".join((kind, *lines)) + "\n"


def persistent(level, name, data_type, *more):
    """The stanza of a persistent attribute."""
    return stanza(f"Persistent{level}Attribute", f"Name={name}", "Description=3", "DisplayName=4", "Id=7",
                  f"DataType={data_type}", "VarietyRange=1,1", *more)


def dynamic(level, name, data_type, *more):
    """The stanza of a dynamic attribute."""
    return stanza(f"Dynamic{level}Attribute", f"Name={name}", "Description=3", "DisplayName=4", "Id=8",
                  f"DataType={data_type}", "VariableType=State", "VarietyRange=1,1", *more)


def element(kind, name, data_type, *more):
    """The stanza of the first element of a structure."""
    return stanza(f"{kind}SDDefinition", f"ElementName={name}", "Description=5", "DisplayName=6", "ElementIndex=0",
                  f"DataType={data_type}", *more)


@dataclasses.dataclass
class Case:
    """A class, and the expected owners of its valid values."""

    stanzas: list
    values: dict  # name of an attribute or element: its valid values, as dump and source have them
    warned: set  # names of the attributes that refer to a list that is not theirs
    diff: list  # what the valid values add to the class


CASES = {
    "numbers-of-the-first-of-two-kinds": Case(
        [dynamic("Resource", "D", "Int32", "ValidStateValue=7,8"), persistent("Resource", "P", "Int32")],
        {"D": [(7, 8)]},
        {"P"},
        ["DynamicResourceAttribute 'D', valid value 7 to 8"],
    ),
    "numbers-of-the-table-that-comes-first": Case(
        [persistent("Resource", "P", "Int32", "ValidValue=7,8"), dynamic("Resource", "D", "Int32")],
        {"P": [(7, 8)]},
        {"D"},
        ["PersistentResourceAttribute 'P', valid value 7 to 8"],
    ),
    "class-before-resource": Case(
        [dynamic("Class", "C", "UInt32", "ValidStateValue=1,2", "ValidStateValue=5,6"),
         dynamic("Resource", "D", "UInt32"), persistent("Resource", "P", "UInt32")],
        {"C": [(1, 2), (5, 6)]},
        {"D", "P"},
        ["DynamicClassAttribute 'C', valid value 1 to 2", "DynamicClassAttribute 'C', valid value 5 to 6"],
    ),
    "resource-before-class": Case(
        [dynamic("Resource", "D", "UInt32", "ValidStateValue=1,2"), dynamic("Class", "C", "UInt32")],
        {"D": [(1, 2)]},
        {"C"},
        ["DynamicResourceAttribute 'D', valid value 1 to 2"],
    ),
    "persistent-class-attribute-has-it": Case(
        [dynamic("Class", "C", "Int32"), persistent("Resource", "P", "Int32"),
         persistent("Class", "A", "Int32", "ValidValue=3,4")],
        {"A": [(3, 4)]},
        {"C", "P"},
        ["PersistentClassAttribute 'A', valid value 3 to 4"],
    ),
    "persistent-class-attribute-says-that-it-has-none": Case(
        [persistent("Class", "A", "Int32"), dynamic("Class", "C", "Int32", "ValidStateValue=3,4")],
        {"C": [(3, 4)]},
        set(),
        ["DynamicClassAttribute 'C', valid value 3 to 4"],
    ),
    "attribute-that-was-completed-has-it": Case(
        [persistent("Resource", "A", "Int32", "ValidValue=3,4"), persistent("Resource", "B", "Int32"),
         dynamic("Resource", "D", "Int32")],
        {"A": [(3, 4)]},
        {"B", "D"},
        ["PersistentResourceAttribute 'A', valid value 3 to 4"],
    ),
    "attribute-cut-short-has-it-and-one-that-was-completed-the-second": Case(
        [dynamic("Resource", "D", "Int32", "ValidStateValue=1,2"),
         persistent("Resource", "A", "Int32", "ValidValue=3,4"), persistent("Resource", "B", "Int32")],
        {"D": [(1, 2)], "A": [(3, 4)]},
        {"B"},
        ["PersistentResourceAttribute 'A', valid value 3 to 4", "DynamicResourceAttribute 'D', valid value 1 to 2"],
    ),
    "both-cut-short-have-lists": Case(
        [persistent("Resource", "P", "Int32", "ValidValue=1,2"),
         dynamic("Resource", "D", "Int32", "ValidStateValue=3,4")],
        {"P": [(1, 2)], "D": [(3, 4)]},
        set(),
        ["PersistentResourceAttribute 'P', valid value 1 to 2", "DynamicResourceAttribute 'D', valid value 3 to 4"],
    ),
    "element-of-an-input-has-it": Case(
        [persistent("Resource", "P", "Int32"), element("Define", "E", "Int32", "ValidValue=7,8")],
        {"E": [(7, 8)]},
        {"P"},
        ["define input element 'E', valid value 7 to 8"],
    ),
    "element-of-an-attribute-cut-short-has-it": Case(
        [persistent("Resource", "S", "SD"), element("PAttr", "E", "Int32", "ValidValue=7,8"),
         dynamic("Resource", "D", "Int32")],
        {"E": [(7, 8)]},
        {"S", "D"},
        ["PersistentResourceAttribute 'S', element 'E', valid value 7 to 8"],
    ),
    "text-of-the-second": Case(
        [dynamic("Class", "C", "String"), dynamic("Resource", "D", "String", "ValidStateValue=low,high")],
        {"D": [("low", "high")]},
        {"C"},
        ["DynamicResourceAttribute 'D', valid value 'low' to 'high'"],
    ),
    "text-of-the-first": Case(
        [dynamic("Class", "C", "String", "ValidStateValue=low,high"), dynamic("Resource", "D", "String")],
        {"C": [("low", "high")]},
        {"D"},
        ["DynamicClassAttribute 'C', valid value 'low' to 'high'"],
    ),
    "text-that-would-be-numbers-of-the-first": Case(
        [persistent("Resource", "P", "UInt32"), dynamic("Resource", "D", "String", "ValidStateValue=low,high")],
        {"D": [("low", "high")]},
        {"P"},
        ["DynamicResourceAttribute 'D', valid value 'low' to 'high'"],
    ),
    "numbers-after-an-attribute-without-a-type": Case(
        [stanza("PersistentResourceAttribute", "Name=P"),
         dynamic("Resource", "D", "Int32", "ValidStateValue=7,8")],
        {"D": [(7, 8)]},
        {"P"},
        ["DynamicResourceAttribute 'D', valid value 7 to 8"],
    ),
    "numbers-after-an-attribute-without-varieties": Case(
        [stanza("PersistentResourceAttribute", "Name=P", "Description=3", "DisplayName=4", "Id=7", "DataType=Int32"),
         dynamic("Resource", "D", "Int32", "ValidStateValue=7,8")],
        {"D": [(7, 8)]},
        {"P"},
        ["DynamicResourceAttribute 'D', valid value 7 to 8"],
    ),
    "numbers-after-an-attribute-that-has-no-numbers": Case(
        [persistent("Resource", "P", "String"), dynamic("Resource", "D", "Int32", "ValidStateValue=7,8")],
        {"D": [(7, 8)]},
        {"P"},
        ["DynamicResourceAttribute 'D', valid value 7 to 8"],
    ),
    "no-lists-at-all": Case(
        [persistent("Resource", "P", "Int32"), dynamic("Resource", "D", "Int32"), dynamic("Class", "C", "Int32")],
        {},
        {"P", "D", "C"},
        [],
    ),
}


class Programs:
    """The two programs, and a directory to run them in."""

    def __init__(self, directory):
        self.directory = directory

    def compile(self, stanzas, name, *options, following=CLASS.format("Second")):
        """Compiles the stanzas as the first of two classes, or as the only class."""
        text = CLASS.format("First") + "".join(stanzas) + following + MAP
        (self.directory / "source").write_text(text)
        command = [PROGRAMS.cdgen, *options, "source", name]
        subprocess.run(command, cwd=self.directory, check=True, capture_output=True, timeout=TIMEOUT)

    def cdef(self, *arguments):
        """The output of a subcommand."""
        command = [PROGRAMS.cdef, *arguments]
        result = subprocess.run(command, cwd=self.directory, check=False, capture_output=True, timeout=TIMEOUT)
        same(result.stderr, b"", *arguments)
        return result.stdout.decode()


def pairs_of(reference):
    """The valid values that dump shows at a reference."""
    entries = reference["vv_values"] if reference is not None else []
    return [(entry["vv_low_val"], entry["vv_high_val"]) for entry in entries]


def records_of(shown):
    """(name, offset, valid values) of the attributes and elements of the first class that dump shows."""
    first = shown["sections"][0]["class"]
    structures = [first["u_rc_def_input"]]
    for table in ATTRIBUTES:
        for record in first[table]:
            yield record["u_ra_name"], record["at"], pairs_of(record["u_ra_valid_vals"])
            structures.append(record["u_ra_sd"])
    for structure in structures:
        for record in structure["sd_fields"] if structure is not None else []:
            yield record["u_sd_field_name"], record["at"], pairs_of(record["u_sd_valid_vals"])


def values_in(annotated):
    """The valid values that annotated bytes show: (low, high), in the order of the file."""
    lows, highs = (re.findall(rf"vv_entry_t \d+, vv_{bound}_val: (?:\d+ at [0-9a-f]{{8}} )?(.*)", annotated)
                   for bound in ("low", "high"))
    return list(zip(lows, highs))


def owners_in(source):
    """The valid values in each stanza of a source, by name."""
    owners, name = {}, None
    for key, value in re.findall(r"^\t(\w+)=(.*)$", source, re.MULTILINE):
        if key in ("Name", "ElementName"):
            name = value
        elif key in ("ValidValue", "ValidStateValue"):
            owners.setdefault(name, []).append(value)
    return owners


@pytest.mark.parametrize("options", ([], ["-s"]), ids=("native", "reversed"))
@pytest.mark.parametrize("name", CASES)
def test_all_subcommands_name_the_owner(name, options, directory):
    """For each list, in both byte orders."""
    case, programs = CASES[name], Programs(directory)
    programs.compile(case.stanzas, "made.cdef", *options)
    records = list(records_of(json.loads(programs.cdef("dump", "--json", "--offsets", "made.cdef"))))
    same({name: values for name, _, values in records if values}, case.values, "dump")
    shown = [(json.dumps(low), json.dumps(high)) for values in case.values.values() for low, high in values]
    same(values_in(programs.cdef("dump", "--hex", "made.cdef")), shown, "dump --hex")
    findings = json.loads(programs.cdef("verify", "--json", "made.cdef"))["files"][0]["findings"]
    places = [finding["offset"] for finding in findings if finding["code"] == NOT_ITS_OWN]
    same({max((at, name) for name, at, _ in records if at <= place)[1] for place in places}, case.warned, "verify")
    lines = {name: [f"{low},{high}" for low, high in values] for name, values in case.values.items()}
    same(owners_in(programs.cdef("source", "made.cdef")), lines, "source")
    programs.compile([re.sub(r"\tValid\w*Value=.*\n", "", text) for text in case.stanzas], "without.cdef", *options)
    added = "".join(f"+ ResourceClass 'First', {line}\n" for line in case.diff)
    same(programs.cdef("diff", "without.cdef", "made.cdef"), added, "diff")


# The bounds of d0, an array of texts, as dump shows them in small.image: an array with one text each, which is none.
ONE_NONE = ["StringArray", "String: none"]

# By the name of an image: the bounds that dump shows, and what diff says of the change.
BOUNDS = {
    "CDB452-bound-of-another-owner": ([*ONE_NONE, "none"], "upper bound [nothing] -> misplaced 192"),
    "CDB452-lower-bound": (["none", *ONE_NONE], "lower bound [nothing] -> misplaced 193"),
    "CDB452-text-in-a-bound": ([*ONE_NONE, *ONE_NONE], "lower bound [nothing] -> [misplaced 24]"),
}


def bounds_in(listing):
    """The bounds of d0 in a listing."""
    start = listing.index('dynamic resource attribute "d0"')
    found = re.search(r"ra_min_value: (.*?)\n *u_ra_variety_list", listing[start:], re.DOTALL)
    return re.sub(r"ra_max_value: ", "", found[1]).split("\n")


@pytest.mark.parametrize("order", ("little", "big"))
@pytest.mark.parametrize("name", BOUNDS)
def test_dump_and_diff_take_a_bound_for_none(name, order, directory):
    """If verify reports that the bound is not the attribute's own."""
    shown, changed = BOUNDS[name]
    programs = Programs(directory)
    before, after = PROGRAMS.images / f"small.{order}.cdef", PROGRAMS.images / f"broken/{name}.{order}.cdef"
    same([line.strip() for line in bounds_in(programs.cdef("dump", after))], shown, "dump")
    same(programs.cdef("diff", before, after), f"~ DynamicResourceAttribute 'd0': {changed}\n", "diff")


@pytest.mark.parametrize("options", ([], ["-s"]), ids=("native", "reversed"))
def test_annotated_elements_are_of_the_owners_type(options, directory):
    """And not of an earlier attribute's, which has a range of another type that leads to the array as well.

    88 is where E's initial value is in the strings: the four names take 32 bytes, D's initial value, an array with an
    empty text, 24, and each of E's default bounds 16.
    """
    programs = Programs(directory)
    programs.compile([
        dynamic("Resource", "D", "StringArray"),
        dynamic("Class", "C", "Int32", "Range=88,88"),
        dynamic("Resource", "E", "Int32Array", "InitialValue=5"),
    ], "made.cdef", *options, following="")
    shown = re.sub(r"\d+ at [0-9a-f]{8} ", "", programs.cdef("dump", "--hex", "made.cdef"))
    same(re.findall(r"vx_value_t 0: (.*)", shown), ['""', "0", "100", "5"], "elements")
