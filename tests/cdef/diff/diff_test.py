"""Test cdef diff: its output for pairs of databases, and which differences it calls compatible.

A case is a file in tests/cdef/diff in the notation of expectation.py, with these blocks:

    replace:    lines that occur once in base.cdefsrc
    with:       the lines that replace them in the second source; none removes them
    diff:       the output of cdef diff for both databases; empty if they are the same
    compat:     the output of cdef diff --compat
    clients:    the output of cdef diff --compat=clients, if the case is about this level
    stored:     the output of cdef diff --compat=stored, if the case is about this level

There may be several pairs of replace and with. Each comparison runs in all four combinations of byte orders. cdef
diff also runs in the reverse direction, in which added and removed objects change places.

Everything else is a test in this file.
"""

import itertools
import json
import os
import pathlib
import subprocess
import sys

import jsonschema
import pytest

import cdb_image
import make_images
from bounded import MEGABYTES, run_bounded, run_for
from compare import same
from expectation import Expectation
from programs import PROGRAMS, PROJECT, TESTS

CASES = TESTS / "cdef" / "diff"
BLOCKS = ("replace", "with", "diff", "compat", "clients", "stored")
SCHEMA = jsonschema.Draft7Validator(json.loads((PROJECT / "schema/cdef-diff.schema.json").read_text()))
TIMEOUT = 60
TURNED = {"-": "+", "+": "-"}


class Programs:
    """The two programs, and a directory to run them in."""

    def __init__(self, directory):
        self.cdgen, self.cdef, self.directory = PROGRAMS.cdgen, PROGRAMS.cdef, pathlib.Path(directory)

    def compile(self, source, name, *options, stamp=False):
        """Compiles a text. Returns the database's name."""
        environment = dict(os.environ)
        environment.pop("VX_CDB_FORCE_EMPTY_TIMESTAMP", None)
        if not stamp:
            environment["VX_CDB_FORCE_EMPTY_TIMESTAMP"] = ""
        (self.directory / "source").write_text(source)
        subprocess.run(
            [self.cdgen, *options, "source", name], cwd=self.directory, env=environment, check=True, timeout=TIMEOUT
        )
        return name

    def diff(self, *arguments, stdin=b""):
        """Status, standard output and standard error of one comparison."""
        result = subprocess.run(
            [self.cdef, "diff", *arguments], cwd=self.directory, input=stdin, capture_output=True, timeout=TIMEOUT
        )
        return result.returncode, result.stdout.decode(), result.stderr.decode()

    def image(self, name, order, *changes):
        """Writes an image with some numbers changed and a correct checksum. Returns the database's name."""
        data = bytearray(make_images.assemble(TESTS / "image" / f"{name}.image", order))
        for change in changes:
            make_images.change(data, "put", change, order)
        make_images.settle(data, order, [])
        path = self.directory / f"{name}-{order}-{len(changes)}.cdef"
        path.write_bytes(data)
        return path.name

    def patch(self, name, offset, data):
        """Overwrites bytes of a database."""
        contents = bytearray((self.directory / name).read_bytes())
        contents[offset : offset + len(data)] = data
        (self.directory / name).write_bytes(contents)


def base():
    """The source that all cases change."""
    return (CASES / "base.cdefsrc").read_text()


def replaced(source, old, new):
    """The source with a run of whole lines replaced by another."""
    whole, lines = "\n" + source, "\n" + old
    if whole.count(lines) != 1:
        raise ValueError(f"stands {whole.count(lines)} times in the base: {old}")
    return whole.replace(lines, "\n" + new)[1:]


def read_case(path):
    """The second source, and the expected outputs by the options of the comparison."""
    said = Expectation(path, (), BLOCKS)
    changes = said.all("replace", "with")
    if [name for name, _ in changes] != ["replace", "with"] * (len(changes) // 2):
        raise ValueError(f"{path}: replace without with")
    source = base()
    for (_, old), (_, new) in zip(changes[::2], changes[1::2]):
        source = replaced(source, old, new)
    if not (said.has("diff") and said.has("compat")):
        raise ValueError(f"{path}: diff or compat is missing")
    compared = {"--compat": "compat", "--compat=readers": "compat", "--compat=clients": "clients", "--compat=stored": "stored"}
    texts = {option: said.get(block) for option, block in compared.items() if said.has(block)}
    return source, said.get("diff"), texts


def turned(text):
    """The expected output of the reverse comparison, with its lines in any order."""
    lines = []
    for line in text.splitlines():
        words, _, values = line.partition(": ")
        if values.startswith("renamed to "):
            front, _, name = words.rpartition(" ")
            line = f"{front} {values.removeprefix('renamed to ')}: renamed to {name}"
        elif line[0] == "~":
            label = next(label for label in LABELS if values.startswith(label + " "))
            before, after = values[len(label) + 1 :].split(" -> ")
            line = f"{words}: {label} {after} -> {before}"
        lines.append(TURNED.get(line[0], line[0]) + line[1:])
    return sorted(lines)


LABELS = (
    "alias",
    "class permission template",
    "confirmation",
    "default",
    "description",
    "display name",
    "expression description",
    "expression",
    "first key",
    "group name",
    "group",
    "highest element index",
    "index",
    "Id",
    "initial value",
    "last key",
    "locator",
    "lower bound",
    "message catalog",
    "message set",
    "observation interval",
    "permission",
    "properties",
    "re-arm description",
    "re-arm expression",
    "reporting interval",
    "resource permission template",
    "time-out",
    "type",
    "upper bound",
    "variable type",
    "version",
)


@pytest.fixture
def programs(directory):
    """The programs, with a directory of their own."""
    return Programs(directory)


def mentioned(a, b, source):
    """The messages on standard error for a comparison of the base with another source, by the names of both."""
    version = "\tFileVersion="
    before, after = (text.partition(version)[2].partition("\n")[0] for text in (base(), source))
    parts = [[int(part) for part in text.split(".")] for text in (before, after)]
    lower = f"cdef: {b}: a lower version than {a}: {before} -> {after}\n" if parts[1] < parts[0] else ""
    return lower + (f"cdef: {b}: the other byte order than {a}\n" if a[1:] != b[1:] else "")


@pytest.mark.parametrize("name", sorted(path.stem for path in CASES.glob("*.expect")))
def test_case(programs, name):
    """All comparisons of a case."""
    source, difference, compared = read_case(CASES / f"{name}.expect")
    databases = [
        (programs.compile(base(), f"a{order}.cdef", *order.split()), programs.compile(source, f"b{order}.cdef", *order.split()))
        for order in ("", "-s")
    ]
    for a, b in itertools.product((a for a, _ in databases), (b for _, b in databases)):
        mentions = mentioned(a, b, source)
        same(programs.diff(a, b), (1 if difference else 0, difference, mentions), a, b)
        for option, breaches in compared.items():
            same(programs.diff(option, a, b), (1 if breaches else 0, breaches, mentions), option, a, b)
        status, back, _ = programs.diff(b, a)
        same((status, sorted(back.splitlines())), (1 if difference else 0, turned(difference)), b, a)


# ---- What no case shows ----------------------------------------------------------------

WRONG_CHECKSUM = "cdef: {}: wrong checksum\n"
NOT_ZERO = "cdef: {}: reserved bytes or padding not zero\n"
OTHER_ORDER = "cdef: {}: the other byte order than {}\n"
MAP = base().partition("ClassToManagerMapping\n")[2]


def class_source(*stanzas, head="", control="ControlDefinition\n\tFileVersion=1.0.0.0\n"):
    """A small source with the given stanzas."""
    resource = "\tDescription=1\n\tDisplayName=2\n\tProperties=CanDefine\n\tClassPermTemplate=0\n\tResourcePermTemplate=0\n"
    return control + "ResourceClass\n" + resource + head + "".join(stanzas) + "ClassToManagerMapping\n" + MAP


def attribute(name, number, *lines, kind="PersistentResourceAttribute", datatype="Int32"):
    """The stanza of an attribute."""
    given = [f"Name={name}", "Description=3", "DisplayName=4", f"Id={number}", f"DataType={datatype}", "VarietyRange=0,1"]
    if kind.startswith("Dynamic"):
        given.append("VariableType=State")
    return kind + "\n" + "".join(f"\t{line}\n" for line in [*given, *lines])


def test_layout_is_not_compared(programs):
    """Neither the order of stanzas, of lines and of the contents of sections, nor checksum, time, and bytes that
    nothing refers to."""
    a, b = attribute("A", 1, "DefaultValue=5"), attribute("B", 2, "DefaultValue=x", "DefaultValue=y", datatype="String")
    d = attribute("D", 3, kind="DynamicClassAttribute")
    first = programs.compile(class_source(a, b, d, head="\tName=C\n"), "first.cdef")
    moved = class_source(d, b.replace("\tDefaultValue=x\n", ""), a, head="\tName=C\n")
    second = programs.compile(moved, "second.cdef", "-s", stamp=True)
    programs.patch(second, 4, b"wrong sum"[:4])
    same(programs.diff(first, second), (0, "", WRONG_CHECKSUM.format(second) + OTHER_ORDER.format(second, first)), "diff")


def test_classes_are_named_where_there_are_several(programs):
    """If one of the databases has two classes, each line names the class."""
    control = "ControlDefinition\n\tFileVersion=1.0.0.0\n"
    resource = "ResourceClass\n\tDescription=1\n\tDisplayName=2\n\tProperties=CanDefine\n\tClassPermTemplate=0\n\tResourcePermTemplate=0\n"
    second = control + resource + "\tName=Second\n"
    one = programs.compile(class_source(attribute("A", 1), head="\tName=First\n"), "one.cdef")
    two = programs.compile(class_source(attribute("A", 2), second, head="\tName=First\n"), "two.cdef")
    status, text, _ = programs.diff("--compat", one, two)
    line = "~ ResourceClass 'First', PersistentResourceAttribute 'A': Id 1 -> 2 (readers know it by its number)\n"
    same((status, text), (1, line), "changed")
    status, text, _ = programs.diff("--compat", two, one)
    same((status, "- ResourceClass 'Second' (readers miss it)\n" in text), (1, True), "removed")


def test_equal_names_pair_by_position(programs):
    """Two attributes with the same name are two; if there is one too many, it is the last."""
    one = programs.compile(class_source(attribute("A", 1), attribute("A", 2), head="\tName=C\n"), "one.cdef")
    two = programs.compile(class_source(*(attribute("A", i) for i in (1, 3, 4)), head="\tName=C\n"), "two.cdef")
    text = "~ PersistentResourceAttribute 'A': Id 2 -> 3\n+ PersistentResourceAttribute 'A'\n"
    same(programs.diff(one, two), (1, text, ""), "diff")


def test_texts_are_escaped(programs):
    """No name can control a terminal."""
    one = programs.compile(class_source(head="\tName=C\n"), "one.cdef")
    two = programs.compile(class_source(attribute("a\x1b[2J'\\\x7fü", 1), head="\tName=C\n"), "two.cdef")
    text = "+ PersistentResourceAttribute 'a\\x1b[2J\\'\\\\\\x7f\\xc3\\xbc'\n"
    same(programs.diff(one, two), (1, text, ""), "diff")


def test_values_of_every_type(programs):
    """How values are shown."""
    values = {
        "Int32": ("-1", "-1"),
        "UInt64": ("18446744073709551615", "18446744073709551615"),
        "Float32": ("0.1", "0.1"),
        "Float64": ("-inf", "-inf"),
        "String": ("it's", "'it\\'s'"),
        "Binary": ("0x00fF", "0x00ff"),
        "Int64Array": ("7", "[7]"),
        "StringArray": ("x", "['x']"),
    }
    nothing = {"String": "''", "Binary": "0x", "Int64Array": "[0]", "StringArray": "['']"}
    one = programs.compile(class_source(*(attribute(t, 1, datatype=t) for t in values), head="\tName=C\n"), "one.cdef")
    stanzas = (attribute(t, 1, f"DefaultValue={v[0]}", datatype=t) for t, v in values.items())
    two = programs.compile(class_source(*stanzas, head="\tName=C\n"), "two.cdef", "-s")
    lines = [f"~ PersistentResourceAttribute '{t}': default {nothing.get(t, 0)} -> {v[1]}\n" for t, v in values.items()]
    same(programs.diff(one, two), (1, "".join(lines), OTHER_ORDER.format(two, one)), "diff")


def test_missing_values_are_nothing(programs):
    """An attribute of type SD without a run has no value; one with a run has elements and a value."""
    run = "PAttrSDDefinition\n\tElementName=E\n\tDescription=1\n\tDisplayName=2\n\tElementIndex=0\n\tDataType=Int32\n"
    one = programs.compile(class_source(attribute("A", 1, datatype="SD"), head="\tName=C\n"), "one.cdef")
    two = programs.compile(class_source(attribute("A", 1, datatype="SD"), run, head="\tName=C\n"), "two.cdef")
    lines = [
        "~ PersistentResourceAttribute 'A': default nothing -> {Int32 0}\n",
        "~ PersistentResourceAttribute 'A': highest element index none -> 0\n",
        "+ PersistentResourceAttribute 'A', element 'E'\n",
    ]
    same(programs.diff(one, two), (1, "".join(lines), ""), "diff")


def test_fields_without_a_line_are_compared(programs):
    """Fields that no source sets, in the header, an anchor, the class, the manager and the map."""
    name = programs.compile(class_source(head="\tName=C\n"), "one.cdef")
    # Anchors start at 80. The class at 128 has 224 bytes and strings of 8, the manager 24 and 16; then comes the map.
    places = {12: 1, 92: 2, 128 + 208: 3, 128 + 232 + 4: 4, 128 + 232 + 40 + 30: 5}
    # The manager's table of strings is at its end. A reversal does not change it, so both byte orders read the same.
    places[128 + 232 + 16] = 6
    programs.compile(class_source(head="\tName=C\n"), "two.cdef")
    for offset, value in places.items():
        programs.patch("two.cdef", offset, bytes([value]))
    lines = [
        "~ database: sequence number 0 -> 1\n",
        "~ ResourceClass 'C': class number 0 -> 3\n",
        "~ ResourceClass 'C': revision 0 -> 2\n",
        "~ ResourceManager 'DiskManager': number 0 -> 4\n",
        f"~ ResourceManager 'DiskManager': u_rm_strings_table 0 -> {int.from_bytes([6, 0, 0, 0], sys.byteorder)}\n",
        "~ ClassToManagerMapping: rcm_asnno_start 0 -> 5\n",
    ]
    # The largest numbers in the header follow those of the class and the manager.
    programs.patch("two.cdef", 28, bytes([4, 0, 3, 0]))
    same(programs.diff(name, "two.cdef"), (1, "".join(lines), WRONG_CHECKSUM.format("two.cdef")), "diff")


# What one changed number of an image makes of it: the image, the number, and what there is to say.
CHANGED_NUMBERS = [
    ("errors", "u32 320 9", "~ error 'err': re_cb_ID 1 -> 9\n"),
    ("errors", "u32 324 -2", "~ error 'err': Id 2 -> -2\n"),
    ("errors", "u32 328 16", "~ error 'err': properties 0x3 -> 0x10\n"),
    ("errors", "u16 332 9", "~ error 'err': description 4 -> 9\n"),
    ("errors", "u16 334 9", "~ error 'err': display name 5 -> 9\n"),
    ("errors", "u32 336 0", "- error 'err'\n+ error 'E'\n"),
    ("errors", "u32 360 1", "~ error 'err': permission 0x6 -> q\n"),
    ("errors", "u32 388 5", "- error 'err', variety 1 to 1\n+ error 'err', variety 1 to 5\n"),
    ("errors", "u32 400 0", "- error 'err', input element 'el'\n+ error 'err', input element 'E'\n"),
    ("errors", "u32 368 9", "~ dependency 8: rd_cb_ID 7 -> 9\n"),
    ("errors", "u16 372 9", "- dependency 8\n+ dependency 9\n"),
    ("hash", "u32 96 9", "~ class hash: rch_cb_ID 1 -> 9\n"),
    ("hash", "u32 8304 9", "~ class hash, block 4: hash value 3 -> 9\n"),
    ("hash", "u32 8308 9", "- class hash, block 4\n+ class hash, block 9\n"),
]


def test_records_that_are_never_written_are_compared(programs):
    """Errors, dependencies and a class hash. The compiler writes none, but a file may contain some."""
    for name, number, text in CHANGED_NUMBERS:
        for a, b in itertools.product(make_images.ORDERS, repeat=2):
            one, two = programs.image(name, a), programs.image(name, b, number)
            mention = OTHER_ORDER.format(two, one) if a != b else ""
            same(programs.diff(one, two), (1, text, mention), f"{name} {number} {a} {b}")


def test_places_in_a_class_hash_are_not_compared(programs):
    """The head of a chain, a block's link, and its class."""
    for order in make_images.ORDERS:
        one, two = programs.image("hash", order), programs.image("hash", order, "u32 100 8", "u32 8296 9", "u32 8312 9")
        same(programs.diff(one, two), (0, "", ""), order)


def differences_in(text):
    """The differences in a JSON document."""
    data = json.loads(text)
    same([f"{each.json_path}: {each.message}" for each in SCHEMA.iter_errors(data)], [], "against the schema")
    same(list(data), ["schema", "version", "before", "after", "differences", "mentions"], "members")
    same((data["schema"], data["version"]), ("cdef-diff.schema.json", 2), "schema")
    return data["differences"]


def test_json_says_the_same(programs):
    """There is one object for each difference."""
    one = programs.compile(class_source(attribute("A", 1), attribute("B", 2), head="\tName=C\n"), "one.cdef")
    two = programs.compile(class_source(attribute("A", 3), head="\tName=C\n"), "two.cdef")
    status, text, _ = programs.diff("--json", one, two)
    path = [{"kind": "ResourceClass", "name": "C"}]
    changed = {
        "change": "changed",
        "path": [*path, {"kind": "PersistentResourceAttribute", "name": "A"}],
        "field": "ra_attr_id",
        "before": 1,
        "after": 3,
        "breaks": [{"code": "CMP102", "level": "readers", "reason": "readers know it by its number"}],
    }
    removed = {
        "change": "removed",
        "path": [*path, {"kind": "PersistentResourceAttribute", "name": "B"}],
        "breaks": [{"code": "CMP101", "level": "readers", "reason": "readers miss it"}],
    }
    same((status, differences_in(text)), (1, [changed, removed]), "different")
    status, text, _ = programs.diff("--json", one, one)
    same((status, differences_in(text)), (0, []), "same")
    same(json.loads(text)["after"], str(one), "name of the file")


def test_json_of_what_is_new_and_of_the_database(programs):
    """A new object has a path, the database an empty one. A difference that breaks nothing has no reason."""
    one = programs.compile(class_source(head="\tName=C\n"), "one.cdef")
    two = programs.compile(class_source(attribute("A", 1), head="\tName=C\n"), "two.cdef")
    programs.patch(two, 12, b"\7")
    path = [{"kind": "ResourceClass", "name": "C"}, {"kind": "PersistentResourceAttribute", "name": "A"}]
    status, text, _ = programs.diff("--json", one, two)
    sequence = int.from_bytes([7, 0, 0, 0], sys.byteorder)
    changed = {"change": "changed", "path": [], "field": "cdb_hdr_seqno", "before": 0, "after": sequence}
    same((status, differences_in(text)), (1, [changed, {"change": "added", "path": path}]), "diff")


def changed_values(programs, before, after):
    """The values of fields before and after a change of the source: for each field, both values and their types, if
    any."""
    head = "\tName=C\n"
    one, two = (programs.compile(class_source(attribute("A", 1, *lines[1:], datatype=lines[0]), head=head), name)
                for lines, name in ((before, "one.cdef"), (after, "two.cdef")))
    found = differences_in(programs.diff("--json", one, two)[1])
    return {each["field"]: [each.get(key) for key in ("before_type", "before", "after_type", "after")] for each in found}


# Lines before and after, a field, and its values: a type and a value each.
TYPED = [
    (["Int32", "DefaultValue=-5"], ["Int32", "DefaultValue=7"], "ra_dflt_value", ["Int32", -5, "Int32", 7]),
    (["UInt64", "DefaultValue=18446744073709551615"], ["UInt64", "DefaultValue=1"], "ra_dflt_value",
     ["UInt64", 18446744073709551615, "UInt64", 1]),
    (["Float32", "DefaultValue=0.1"], ["Float32", "DefaultValue=inf"], "ra_dflt_value", ["Float32", 0.1, "Float32", "inf"]),
    (["String"], ["String", "DefaultValue=it's"], "ra_dflt_value", ["String", "", "String", "it's"]),
    (["String", "DefaultValue=0x41"], ["Binary", "DefaultValue=0x41"], "ra_dflt_value",
     ["String", "0x41", "Binary", {"bytes": "41"}]),
    (["Int32Array", "DefaultValue=1", "DefaultValue=2"], ["Int32Array", "DefaultValue=1"], "ra_dflt_value",
     ["Int32Array", [1, 2], "Int32Array", [1]]),
    (["Int32", "Properties=Public"], ["Int32", "Properties=Public,OptForDefine"], "ra_props",
     [None, ["InvalForDefine", "Public"], None, ["OptForDefine", "Public"]]),
    (["Int32"], ["Int32", "GroupID=4", "GroupName=9"], "ra_group_id", [None, None, None, 4]),
    (["Int32"], ["UInt32"], "ra_data_type", [None, "Int32", None, "UInt32"]),
]


@pytest.mark.parametrize("before, after, field, values", TYPED)
def test_values_in_json_have_types(programs, before, after, field, values):
    """A number is a number, and so on; no value is null."""
    same(changed_values(programs, before, after)[field], values, field)


def test_entries_in_json_are_values_or_intervals(programs):
    """Valid values have the type of the attribute; varieties are numbers."""
    gone = class_source(attribute("A", 1), head="\tName=C\n")
    given = attribute("A", 1, "VarietyRange=4,5", "ValidValue=-3", "ValidValue=7,9")
    one = programs.compile(gone, "one.cdef")
    two = programs.compile(class_source(given, head="\tName=C\n"), "two.cdef")
    found = [each["path"][-1] for each in differences_in(programs.diff("--json", one, two)[1])]
    same(found, [{"kind": "variety", "name": {"low": 4, "high": 5}}, {"kind": "valid value", "name": -3},
                 {"kind": "valid value", "name": {"low": 7, "high": 9}}], "entries")


def test_structures_in_json(programs):
    """Each element has its type."""
    element = "PAttrSDDefinition\n\tElementName={}\n\tDescription=1\n\tDisplayName=2\n\tElementIndex={}\n\tDataType={}\n"
    given = [attribute("A", 1, datatype="SD") + element.format("E", 0, "Int32") + more
             for more in ("", element.format("F", 1, "String"))]
    one, two = (programs.compile(class_source(text, head="\tName=C\n"), name)
                for text, name in zip(given, ("one.cdef", "two.cdef")))
    found = [each for each in differences_in(programs.diff("--json", one, two)[1]) if each.get("field") == "ra_dflt_value"]
    number = {"data_type": "Int32", "value": 0}
    same([found[0]["before"], found[0]["after"]], [[number], [number, {"data_type": "String", "value": ""}]], "values")


def test_json_has_all_differences(programs):
    """As many as the text has lines."""
    for path in sorted(CASES.glob("*.expect")):
        source, text, _ = read_case(path)
        one, two = programs.compile(base(), "one.cdef"), programs.compile(source, "two.cdef")
        found = differences_in(programs.diff("--json", one, two)[1])
        same(len(found), len(text.splitlines()), path.stem)


def test_mentions_in_json(programs):
    """The same as on standard error, whatever the level."""
    for level in ((), ("--compat",)):
        old, new = (class_source(head="\tName=C\n", control=f"ControlDefinition\n\tFileVersion=1.{minor}.0.0\n")
                    for minor in (10, 2))
        one, two = programs.compile(old, "one.cdef"), programs.compile(new, "two.cdef", "-s")
        orders = ["little-endian", "big-endian"]
        if sys.byteorder == "big":
            orders.reverse()
        said = json.loads(programs.diff("--json", *level, one, two)[1])["mentions"]
        same(said, [{"mention": "lower_version", "class": "C", "before": "1.10.0.0", "after": "1.2.0.0"},
                    {"mention": "byte_order", "before": orders[0], "after": orders[1]}], "mentions")


def test_references_that_are_never_set_may_be_none(programs):
    """"None" is equal to 0, which the compiler writes."""
    for order in make_images.ORDERS:
        # Of a dynamic attribute of the class, which is at 368, and of the manager, at 1328.
        one, two = programs.image("small", order), programs.image("small", order, "u32 392 -1", "u32 1344 -1")
        same(programs.diff(one, two), (0, "", ""), order)
        three = programs.image("small", order, "u32 392 24")
        text = "~ DynamicClassAttribute 'dc': u_ra_next_in_vclass 0 -> 24\n"
        same(programs.diff(two, three), (1, text, ""), f"{order}, another place")


def test_sections_of_unused_types_pair_by_type(programs):
    """Their contents are not compared, only whether they exist."""
    for order in make_images.ORDERS:
        one = programs.image("sections", order)
        two = programs.image("sections", order, "u32 112 2", "u32 192 9")  # the third anchor's type, and contents
        text = "- section of type 1\n+ section of type 2\n"
        same(programs.diff(one, two), (1, text, ""), order)


# The last attribute of a class that another one cuts short seems to have the valid values of the first one, which are
# numbers; read as texts all of them would lead to its name.
NOT_ITS_VALUES = """
include common.inc
section class
rsrc_class_t:1 $CLASS rc_locator=0 u_rc_pattrsC=224 u_rc_dattrsC=224 u_rc_pattrs=224 u_rc_dattrs=368
+ u_rc_actionsC=368 u_rc_actions=368 u_rc_variety_lists=368 u_rc_sd_defs=400 u_rc_valid_vals=400
+ u_rc_strings={strings} rc_num_pattrs=2 rc_varlist_size=32 rc_valval_size={size}
rsrc_pattr_t:9 $PATTR u_ra_name=8 ra_data_type=UInt32 u_ra_valid_vals=0
rsrc_pattr_t:9 $PATTR u_ra_name={second} ra_data_type=String u_ra_variety_list=16 u_ra_valid_vals=0
variety_list_t:g 0,1
variety_list_t:g 0,2
valid_values_t:5{values}
string "C"
string "{name}"
string "Cut"
section class
rsrc_class_t:1 $CLASS $EMPTY
string "D"
include tail.inc
"""

# Expressions at 0, where the class's name is stored: an expression that was not given may have this reference.
SAME_TEXT = """
include common.inc
section class
rsrc_class_t:1 $CLASS u_rc_pattrsC=224 u_rc_dattrsC=224 u_rc_pattrs=224 u_rc_dattrs=224
+ u_rc_actionsC={after} u_rc_actions={after} u_rc_variety_lists={after} u_rc_sd_defs={strings}
+ u_rc_valid_vals={strings} u_rc_strings={strings} rc_num_dattrs={count} rc_varlist_size={size}
{attributes}
{varieties}
string "{name}"
{names}
include tail.inc
"""


def assembled(image):
    """The database that an image describes, in this machine's byte order."""
    return cdb_image.assemble(image, sys.byteorder, sys.byteorder, TESTS / "golden")


def values_of_another(count, length):
    """A database in which so many values of another attribute, read as texts, lead to so many characters."""
    size = 8 + 24 * count
    places = {"strings": 400 + size, "size": size, "second": 8 + length + 1}
    return assembled(NOT_ITS_VALUES.format(values=" UInt32:8,UInt32:8" * count, name="n" * length, **places))


def same_text(count, length):
    """A database in which so many attributes have the same text of so many characters; with its NUL it takes a
    multiple of 8."""
    numbers = range(count)
    lines = {
        "attributes": "".join(
            f"rsrc_dattr_t:a $DATTR u_ra_name={length + 1 + 8 * i} u_ra_variety_list={16 * i} u_ra_express=0 "
            "u_ra_rearm_expr=0\n" for i in numbers
        ),
        "varieties": "variety_list_t:g 0,1\n" * count,
        "names": "".join(f'string "A{i}"\n' for i in numbers),
    }
    after = 224 + 136 * count
    return assembled(
        SAME_TEXT.format(count=count, after=after, size=16 * count, strings=after + 16 * count, name="n" * length,
                         **lines)
    )


def test_values_of_another_record_are_not_written(programs):
    """However many there are, the output stays in proportion to the file."""
    (programs.directory / "many.cdef").write_bytes(values_of_another(100, 32767))
    same(programs.diff("many.cdef", "many.cdef"), (0, "", ""))


def test_values_that_lead_to_one_text_too_often_are_refused(programs):
    """If the output would be out of proportion to the files. Databases that are alike are never refused."""
    (programs.directory / "few.cdef").write_bytes(same_text(10, 32767))
    (programs.directory / "many.cdef").write_bytes(same_text(1000, 32767))
    same(programs.diff("many.cdef", "many.cdef"), (0, "", ""), "the same")
    lines = "".join(f"+ DynamicResourceAttribute 'A{i}'\n" for i in range(10, 1000))
    same(programs.diff("few.cdef", "many.cdef"), (1, lines, ""), "short names")
    # In JSON each path begins with the class's name.
    message = "cdef: few.cdef, many.cdef: too many references lead to the same values or texts\n"
    same(programs.diff("--json", "few.cdef", "many.cdef"), (2, "", message), "a long name")


@pytest.mark.parametrize("form", ["text", "json"])
def test_forged_databases_take_no_more_memory(programs, form):
    """Than 8 times the files and 16 MB, although thousands of values and names lead to the same 32,767 characters."""
    few, many = programs.directory / "few.cdef", programs.directory / "many.cdef"
    for forged in same_text, values_of_another:
        few.write_bytes(forged(10, 32767))
        many.write_bytes(forged(2000, 32767))
        status, out, _ = run_bounded(programs.directory, [PROGRAMS.cdef, "diff", "--format", form], few, many)
        assert status in (1, 2)
        assert out.stat().st_size <= MEGABYTES + 16 * (few.stat().st_size + many.stat().st_size)


def test_many_parts_may_have_one_number(programs):
    """Not all parts with a number are looked at for each new part with it: those would be 25 thousand million."""
    names = [f"A{i}" for i in range(65_000)]
    actions = [f"{kind}\n\tName={name}\n\tDescription=3\n\tDisplayName=4\n\tId=1\n\tVarietyRange=1,1\n"
               for kind in ("ClassAction", "ResourceAction") for name in names]
    class_attributes, *attributes = [[attribute(name, 1, kind=kind) for name in names] for kind in (
        "PersistentClassAttribute", "PersistentResourceAttribute", "DynamicResourceAttribute")]
    one = programs.compile(class_source(*actions, *class_attributes, head="\tName=C\n"), "one.cdef")
    two = programs.compile(class_source(*itertools.chain(*attributes), head="\tName=C\n"), "two.cdef")
    same(run_for(30, [programs.cdef, "diff", one, two], cwd=programs.directory), 1, "status")


def test_one_may_be_standard_input(programs):
    """Either of the two, but not both."""
    one = programs.compile(class_source(attribute("A", 1), head="\tName=C\n"), "one.cdef")
    two = programs.compile(class_source(head="\tName=C\n"), "two.cdef")
    contents = (programs.directory / one).read_bytes()
    same(programs.diff("-", two, stdin=contents), (1, "- PersistentResourceAttribute 'A'\n", ""), "A")
    same(programs.diff(two, "-", stdin=contents), (1, "+ PersistentResourceAttribute 'A'\n", ""), "B")
    same(programs.diff("-", "-", stdin=contents)[:2], (2, ""), "both")


def test_tolerated_errors_are_reported(programs):
    """A wrong checksum, and reserved bytes that are not 0: one line for each kind of error and each database, whatever
    the status."""
    one = programs.compile(class_source(head="\tName=C\n"), "one.cdef")
    two = programs.compile(class_source(attribute("A", 1), head="\tName=C\n"), "two.cdef")
    programs.patch(two, 60, b"\1")  # two of the header's spare bytes, which cancel out in the checksum
    programs.patch(two, 64, b"\1")
    added, gone = "+ PersistentResourceAttribute 'A'\n", "- PersistentResourceAttribute 'A' (readers miss it)\n"
    same(programs.diff(one, two), (1, added, NOT_ZERO.format(two)), "reserved")
    programs.patch(two, 68, b"\1")
    said = WRONG_CHECKSUM.format(two) + NOT_ZERO.format(two)
    same(programs.diff(one, two), (1, added, said), "both")
    same(programs.diff("--compat", two, one), (1, gone, said), "--compat")
    same(programs.diff("--compat", one, two), (0, "", said), "same")


def test_unreadable_and_unsound_files_are_status_2(programs):
    """A file that does not exist, that is not a database, or that is broken."""
    one = programs.compile(class_source(head="\tName=C\n"), "one.cdef")
    (programs.directory / "text").write_text("no database\n")
    programs.compile(class_source(head="\tName=C\n"), "broken.cdef")
    programs.patch("broken.cdef", 128, b"XXXX")
    for other in ("missing", "text", "broken.cdef"):
        for arguments in ((one, other), (other, one), ("--compat", one, other)):
            status, text, message = programs.diff(*arguments)
            same((status, text, message.startswith(f"cdef: {other}: ")), (2, "", True), str(arguments))
