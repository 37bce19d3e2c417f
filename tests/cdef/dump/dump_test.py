"""Test `cdef dump`: listings, JSON, annotated bytes.

The cases in tests/cdef/dump are

    listing/NAME    the listing of NAME.cdefsrc (or NAME.image, in the notation of cdb_image.py) is NAME.txt, in both
                    byte orders, except for the line with the byte order
    facts/NAME      the JSON of the same database, converted to a listing, is NAME.txt too
    json/NAME       the JSON of listing/NAME is NAME.json
    offsets/NAME    with --offsets, the listing is NAME.txt
    hex/NAME        the annotated bytes of listing/NAME are NAME.txt
    regions/NAME    the annotated bytes contain every byte of the file once, whether it is damaged or not

The other tests are functions below. A source is compiled to out.cdef. If a case has no source, it uses
examples/NAME.cdefsrc.
"""

import json
import os
import pathlib
import pty
import re
import struct
import subprocess
import sys
import tempfile
import unicodedata

import pytest

import cdb_image
import cdef_dump_listing
import compare
from programs import EXAMPLES, PROGRAMS, TESTS

CASES = TESTS / "cdef" / "dump"
TIMEOUT = 60
OK, TROUBLE = 0, 2
OTHER = {"little": "big", "big": "little"}


class Failure(AssertionError):
    """A problem that a case has found."""


def expect(actual, expected, what):
    """Fails with the difference, unless the two are equal."""
    __tracebackhide__ = True
    compare.same(actual, expected, what)


# ---- Databases ------------------------------------------------------------------------------------------------------


def compile_source(source, *options):
    """The database of a source."""
    with tempfile.TemporaryDirectory() as name:
        (pathlib.Path(name) / "source").write_bytes(source)
        environment = {**os.environ, "VX_CDB_FORCE_EMPTY_TIMESTAMP": ""}
        command = [PROGRAMS.cdgen, *options, "source", "out.cdef"]
        subprocess.run(command, cwd=name, env=environment, check=True, timeout=TIMEOUT)
        return (pathlib.Path(name) / "out.cdef").read_bytes()


def database(name, order="little"):
    """The database of a listing's case, in a byte order."""
    image = CASES / "listing" / f"{name}.image"
    if image.exists():
        return cdb_image.assemble(image.read_text(), order)
    source = CASES / "listing" / f"{name}.cdefsrc"
    source = source if source.exists() else EXAMPLES / source.name
    return compile_source(source.read_bytes(), *([] if order == sys.byteorder else ["-s"]))


def orders_of(name):
    """The byte orders in which a case exists. A hand-made image has hand-made bytes, so it has only one."""
    return ["little"] if (CASES / "listing" / f"{name}.image").exists() else ["little", "big"]


def patched(data, offset, new):
    """Data with some bytes replaced."""
    return data[:offset] + new + data[offset + len(new) :]


def with_checksum(data):
    """A little-endian database with a correct checksum."""
    return patched(data, 4, struct.pack("<I", cdb_image.checksum(data, "little")))


# ---- Running --------------------------------------------------------------------------------------------------------


def dump(data, *options, status=OK, **settings):
    """The output of cdef dump for a database on standard input."""
    command = [PROGRAMS.cdef, "dump", *options, "-"]
    result = subprocess.run(command, input=data, capture_output=True, timeout=TIMEOUT, **settings)
    expect(result.returncode, status, f"status of {' '.join(command[1:])}; {result.stderr!r}")
    if status == OK:
        expect(result.stderr, b"", "standard error")
        return result.stdout.decode("utf-8")
    expect(result.stdout, b"", "standard output")
    return result.stderr.decode("utf-8")


def expected_text(kind, name, order="little"):
    """A case's expected text; its first line is the byte order."""
    return (CASES / kind / f"{name}.txt").read_text("utf-8").replace("little-endian", f"{order}-endian", 1)


# ---- JSON -----------------------------------------------------------------------------------------------------------


def no_constant(text):
    """JSON has no NaN."""
    raise Failure(f"{text} is not JSON")


def parsed(text):
    """Parses JSON strictly: a member that is given twice is an error."""

    def pairs(members):
        expect(len(dict(members)), len(members), f"distinct keys of {[key for key, _ in members]}")
        return dict(members)

    return json.loads(text, object_pairs_hook=pairs, parse_constant=no_constant)


# ---- Cases by file --------------------------------------------------------------------------------------------------

LISTINGS = sorted(path.stem for path in CASES.glob("listing/*.txt"))
JSONS = sorted(path.stem for path in CASES.glob("json/*.json"))
OFFSETS = sorted(path.stem for path in CASES.glob("offsets/*.txt"))
HEXES = sorted(path.stem for path in CASES.glob("hex/*.txt"))



@pytest.mark.parametrize("name", LISTINGS)
def test_listing(name):
    """The listing in both byte orders."""
    for order in orders_of(name):
        expect(dump(database(name, order)), expected_text("listing", name, order), f"listing, {order}-endian")


@pytest.mark.parametrize("name", LISTINGS)
def test_facts(name):
    """The JSON has the listing's facts, in the listing's order."""
    for order in orders_of(name):
        listing = cdef_dump_listing.Listing()
        data = parsed(dump(database(name, order), "--json"))
        expect((data.pop("schema"), data.pop("version")), ("cdef-dump.schema.json", 1), "schema")
        listing.members(0, data)
        expect("\n".join(listing.lines) + "\n", expected_text("listing", name, order), f"JSON, {order}-endian")


@pytest.mark.parametrize("name", JSONS)
def test_json(name):
    """The JSON, compared as text."""
    expected = json.loads((CASES / "json" / f"{name}.json").read_text("utf-8"))
    actual = parsed(dump(database(name), "--json"))
    expect(actual, expected, "JSON")
    expect(json.dumps(actual), json.dumps(expected), "order of the members")


@pytest.mark.parametrize("name", OFFSETS)
def test_offsets(name):
    """The listing with offsets."""
    expect(dump(database(name), "--offsets"), expected_text("offsets", name), "listing with offsets")


@pytest.mark.parametrize("name", HEXES)
def test_hex(name):
    """The annotated bytes."""
    expect(dump(database(name), "--hex"), expected_text("hex", name), "annotated bytes")


HEX_LINE = re.compile(r"([0-9a-f]{8})  ((?:[0-9a-f]{2} ){0,15}[0-9a-f]{2})(?: {2,}(\S.*))?")


def regions_of(text):
    """(offset, bytes, name) of each region. Before a line that continues a region, there are lines of 16 bytes."""
    regions = []
    for line in text.splitlines():
        match = HEX_LINE.fullmatch(line)
        if not match:
            raise Failure(f"no line of annotated bytes: {line!r}")
        offset, octets, name = int(match[1], 16), bytes.fromhex(match[2]), match[3]
        if name:
            expect(line.index(name), 59, f"column of the name in {line!r}")
            regions.append((offset, octets, name))
        else:
            start, before, name = regions.pop()
            expect((offset, len(before) % 16), (start + len(before), 0), f"offset, and bytes before {line!r}")
            regions.append((start, before + octets, name))
    return regions


def check_bytes(data, what):
    """Checks that the annotated bytes are those of the file, without gap or overlap. Returns the regions."""
    regions = regions_of(dump(data, "--hex"))
    end = 0
    for offset, octets, name in regions:
        expect(offset, end, f"{what}: offset of {name}")
        end += len(octets)
    expect(b"".join(octets for _, octets, _ in regions), data, f"{what}: bytes")
    return regions


# What the compiler leaves in the strings without a reference: the names of attributes' variable classes.
UNREACHED = {
    "FileSystem": [b"FSStatus".ljust(16, b"\0")] * 3
    + [b"FSUsage\0"] * 4
    + [b"FSStatus".ljust(16, b"\0")] * 2,
}


@pytest.mark.parametrize("name", LISTINGS)
def test_regions(name):
    """The annotated bytes of a file, of its beginnings, and of the file with one byte inverted."""
    for order in orders_of(name):
        data = database(name, order)
        whole = check_bytes(data, f"{order}-endian")
        unreached = [octets for _, octets, region in whole if region == "unreached"]
        expect(unreached, UNREACHED.get(name, []), "unreached bytes of a whole file")
    for size in range(0, len(data), len(data) // 30):
        check_bytes(data[:size], f"the first {size} bytes")
    for offset in range(0, len(data), len(data) // 60 + 1):
        check_bytes(patched(data, offset, bytes([data[offset] ^ 0xFF])), f"turned over at {offset}")


# ---- Other tests ----------------------------------------------------------------------------------------------------


def test_broken_structure_is_refused():
    """A section's offset is outside of the file, so only the bytes can be shown."""
    data = patched(database("minimal"), 84, b"\xff\xff\xff\x7f")
    for options in ([], ["--json"], ["--offsets"]):
        expect(
            dump(data, *options, status=TROUBLE),
            "cdef: -: not a sound database; 'cdef verify' says why\n",
            f"message with {options}",
        )
    dump(data, "--hex")


def test_no_database_is_refused():
    """An empty file, and one that is not a database."""
    for data in (b"", b"#!/bin/sh\n" * 20):
        dump(data, status=TROUBLE)
    expect(dump(b"", "--hex"), "", "bytes of an empty file")
    regions = regions_of(dump(b"something else", "--hex"))
    expect(regions, [(0, b"something else", "unreached")], "bytes of something else")


def test_wrong_checksum_is_shown():
    """The display message number 2 is changed to 3; 3 ^ 2 = 1 is the change of the word's upper half."""
    data = patched(database("minimal"), 340, b"\x03")
    listing = expected_text("listing", "minimal").replace("rc_disp_msgid: 2", "rc_disp_msgid: 3")
    verdict = "cdb_hdr_checksum: wrong, 0xaf6f2186 in the place of 0xaf6f2187"
    expect(dump(data), listing.replace("cdb_hdr_checksum: correct", verdict), "listing")
    expect(
        parsed(dump(data, "--json"))["header"]["cdb_hdr_checksum"],
        {"correct": False, "found": 0xaf6f2186, "expected": 0xaf6f2187},
        "checksum in JSON",
    )


def test_locator_of_no_attribute():
    """The class has no attribute with the number 7."""
    data = patched(database("minimal"), 342, b"\x07\x00")
    expect(re.findall("rc_locator.*", dump(data)), ["rc_locator: 7, unknown"], "listing")
    locator = parsed(dump(data, "--json"))["sections"][0]["class"]["rc_locator"]
    expect(locator, {"number": 7, "kind": None, "name": None}, "JSON")


def test_time_is_utc():
    """1700000000 seconds after 1970, whatever the time zone."""
    data = with_checksum(patched(database("minimal"), 16, struct.pack("<II", 1700000000, 42)))
    lines = dump(data, env={**os.environ, "TZ": "Asia/Tokyo"}).splitlines()
    expect(lines[7:9], ["  cdb_hdr_timestamp.tv_sec: 2023-11-14T22:13:20Z", "  cdb_hdr_timestamp.tv_usec: 42"], "time")
    data = with_checksum(patched(data, 16, b"\xff\xff\xff\xff"))
    header = parsed(dump(data, "--json"))["header"]
    expect(header["cdb_hdr_timestamp.tv_sec"], "2106-02-07T06:28:15Z", "last time")


def test_offsets_in_json():
    """Each record has its offset, and its references are numbers."""
    data = parsed(dump(database("minimal"), "--json", "--offsets"))
    expect(list(data["header"].items())[0], ("at", 0), "first member of the header")
    first = data["sections"][0]
    expect((first["cda_offset"], first["class"]["at"]), (128, 128), "places of the section and its class")
    expect((first["class"]["u_rc_strings"], first["class"]["u_rc_errors"]), (224, 0), "references")


def test_offsets_of_lists():
    """The places of lists and their entries follow from the sizes of everything before them."""
    text = dump(database("odd"), "--offsets")
    # The class is at 160. Its lists of varieties begin 616 bytes further, with 16 bytes each, and the values at 736.
    for line in (
        '    persistent resource attribute "Handle" at 456',
        "      u_ra_variety_list at 792",
        "        variety at 800",
        "      u_ra_valid_vals at 896",
        "        valid value at 904",
        '        element "arg" at 864',
        "    dependency at 768",
    ):
        expect(text.count(line + "\n"), 1, f"lines {line!r}")


def test_file_and_standard_input_alike():
    """The file is given by name, and as -."""
    data = database("minimal")
    with tempfile.NamedTemporaryFile() as file:
        file.write(data)
        file.flush()
        result = subprocess.run([PROGRAMS.cdef, "dump", file.name], capture_output=True, timeout=TIMEOUT, check=True)
    expect(result.stdout.decode(), dump(data), "listing")


def run(*arguments, **settings):
    """Status and standard error of a run."""
    result = subprocess.run([PROGRAMS.cdef, "dump", *arguments], stderr=subprocess.PIPE, timeout=TIMEOUT, **settings)
    return result.returncode, result.stderr.decode()


def test_missing_file():
    """The file does not exist."""
    expected = (TROUBLE, "cdef: /nonexistent.cdef: No such file or directory\n")
    expect(run("/nonexistent.cdef"), expected, "status and message")


def test_wrong_usage():
    """No file, two files, two forms."""
    for arguments in ([], ["a", "b"], ["--json", "--hex", "a"], ["--offsets", "--hex", "a"], ["--what", "a"]):
        status, message = run(*arguments)
        expect((status, bool(message)), (TROUBLE, True), f"status and message of {arguments}")


def test_output_that_cannot_be_written():
    """A full device."""
    data = database("FileSystem")
    for options in ([], ["--json"], ["--hex"]):
        with open("/dev/full", "wb") as full:
            status = run(*options, "-", input=data, stdout=full)
        expect(status, (TROUBLE, "cdef: standard output: No space left on device\n"), f"status with {options}")


def on_terminal(data, **environment):
    """The output of cdef dump on a terminal."""
    master, slave = pty.openpty()
    with tempfile.TemporaryFile() as file, os.fdopen(master, "rb", buffering=0) as screen:
        file.write(data)
        file.seek(0)
        settings = {key: value for key, value in os.environ.items() if key != "NO_COLOR"} | environment
        with subprocess.Popen([PROGRAMS.cdef, "dump", "-"], stdin=file, stdout=slave, env=settings) as process:
            os.close(slave)
            shown = b""
            try:
                while part := screen.read(65536):
                    shown += part
            except OSError:  # how a terminal ends
                pass
            expect(process.wait(TIMEOUT), OK, "status")
    return shown.decode().replace("\r\n", "\n")


def test_colour_on_a_terminal_only():
    """Only headings are bold, and nothing is if NO_COLOR is set."""
    data = database("minimal")
    plain = expected_text("listing", "minimal")
    headings = re.compile(r"^( *)((?:header|section|class|manager|map)[^:\n]*)$", re.MULTILINE)
    expect(on_terminal(data), headings.sub("\\1\x1b[1m\\2\x1b[0m", plain), "on a terminal")
    expect(on_terminal(data, NO_COLOR="1"), plain, "with NO_COLOR")
    expect(on_terminal(data, NO_COLOR=""), on_terminal(data), "with an empty NO_COLOR")


TEXTS = [
    (b"plain", '"plain"', "plain"),
    (b"tab\tand\rreturn", '"tab\\tand\\rreturn"', "tab\tand\rreturn"),
    (b"\x01\x1f\x7f", '"\\x01\\x1f\\x7f"', "\x01\x1f\x7f"),
    (b"back\\slash", '"back\\\\slash"', "back\\slash"),
    (b'a "quote"', '"a \\"quote\\""', 'a "quote"'),
    ("é €\U0001f600".encode(), '"é €\U0001f600"', "é €\U0001f600"),
    (b"\xc2\x80\xc2\x9f\xc2\xa0", '"\\xc2\\x80\\xc2\\x9f\u00a0"', "\x80\x9f\xa0"),
    ("\u202e\u200b\u2028\ufeff\u2066".encode(),
     '"\\xe2\\x80\\xae\\xe2\\x80\\x8b\\xe2\\x80\\xa8\\xef\\xbb\\xbf\\xe2\\x81\\xa6"',
     "\u202e\u200b\u2028\ufeff\u2066"),
    ("\u034f\u3164\ufe0f\u115f\u180f".encode(),
     '"\\xcd\\x8f\\xe3\\x85\\xa4\\xef\\xb8\\x8f\\xe1\\x85\\x9f\\xe1\\xa0\\x8f"', "\u034f\u3164\ufe0f\u115f\u180f"),
    ("\U0001bca0\U0001d173\uffa0\ufff0\u17b4".encode(),
     '"\\xf0\\x9b\\xb2\\xa0\\xf0\\x9d\\x85\\xb3\\xef\\xbe\\xa0\\xef\\xbf\\xb0\\xe1\\x9e\\xb4"',
     "\U0001bca0\U0001d173\uffa0\ufff0\u17b4"),
    ("e\u0301".encode(), '"e\u0301"', "e\u0301"),
    ("\u0800\u0939".encode(), '"\u0800\u0939"', "\u0800\u0939"),
    (b"\xff", '"\\xff"', {"bytes": "ff"}),
    (b"cut \xe2\x82", '"cut \\xe2\\x82"', {"bytes": "63757420e282"}),
    (b"long \xc0\xaf \xe0\x80\xaf \xf0\x80\x80\xaf", '"long \\xc0\\xaf \\xe0\\x80\\xaf \\xf0\\x80\\x80\\xaf"',
     {"bytes": "6c6f6e6720c0af20e080af20f08080af"}),
    (b"half \xed\xa0\x80", '"half \\xed\\xa0\\x80"', {"bytes": "68616c6620eda080"}),
    (b"far \xf4\x90\x80\x80 \xf5\x80\x80\x80", '"far \\xf4\\x90\\x80\\x80 \\xf5\\x80\\x80\\x80"',
     {"bytes": "66617220f490808020f5808080"}),
    (b"last \xf4\x8f\xbf\xbd \xed\x9f\xbf", '"last \U0010fffd \ud7ff"', "last \U0010fffd \ud7ff"),
]


def test_texts_are_escaped():
    """Texts of any bytes, as default values, in the three forms."""
    source = (CASES / "listing" / "minimal.cdefsrc").read_bytes()
    for number, (octets, _, _) in enumerate(TEXTS):
        source += b"PersistentResourceAttribute\n\tName=A%d\n\tDescription=3\n\tDisplayName=4\n\tId=7\n" % number
        source += b'\tDataType=String\n\tVarietyRange=0,10\n\tDefaultValue="%s"\n' % octets
    data = compile_source(source)
    text = dump(data)
    expect(re.findall(r"ra_dflt_value: (.*)", text), [shown for _, shown, _ in TEXTS], "listing")
    parts = parsed(dump(data, "--json"))["sections"][0]["class"]["persistent_resource_attributes"]
    expect([part["ra_dflt_value"] for part in parts], [shown for _, _, shown in TEXTS], "JSON")
    for form in (text, dump(data, "--json"), dump(data, "--hex")):
        hidden = [c for c in form if c != "\n" and unicodedata.category(c) in ("Cc", "Cf", "Zl", "Zp")]
        expect(hidden, [], "characters that a terminal would act upon")


def test_texts_of_several_lines():
    """No source gives such a text, but a file may contain one."""
    source = (CASES / "listing" / "minimal.cdefsrc").read_bytes()
    source += b"PersistentResourceAttribute\n\tName=A\n\tDescription=3\n\tDisplayName=4\n\tId=7\n"
    source += b'\tDataType=String\n\tVarietyRange=0,10\n\tDefaultValue="one?two"\n'
    data = with_checksum(compile_source(source).replace(b"one?two", b"one\ntwo"))
    expect(re.findall(r"ra_dflt_value: (.*)", dump(data)), [r'"one\ntwo"'], "listing")
    expect(parsed(dump(data, "--json"))["sections"][0]["class"]["persistent_resource_attributes"][0]["ra_dflt_value"],
           "one\ntwo", "JSON")


def test_numbers_in_json():
    """Integers are exact, floats have all their digits, and numbers that JSON cannot express are strings."""
    text = dump(database("types"), "--json")
    for number in ("-9223372036854775808", "18446744073709551615", "9007199254740993", "-9007199254740993"):
        if not re.search(rf"(?<![\d.-]){number}(?![\d.])", text):
            raise Failure(f"{number} is not in the JSON")
    attributes = parsed(text)["sections"][0]["class"]["persistent_resource_attributes"]
    by_name = {attribute["u_ra_name"]: attribute for attribute in attributes}
    expect(by_name["AFloat32"]["ra_dflt_value"], 0.1, "Float32 0.1")
    reals = [
        (entry["vv_low_val"], entry["vv_high_val"])
        for name in ("AFloat32", "AFloat64")
        for entry in by_name[name]["u_ra_valid_vals"]["vv_values"]
    ]
    expect(repr(reals), repr([
        ("-inf", "inf"), (16777216.0, 1.1754944e-38), (-0.0, "nan"),
        (-1e300, 1e22), (2.2250738585072014e-308, "-nan"), ("nan(0x123)", 0.30000000000000004),
    ]), "floats")


def test_class_hash():
    """A section that the compiler never writes, with two blocks."""
    image = cdb_image.Image("little", "little")
    image.sections.append((7, 0))
    image.put(struct.pack("<I", 0x43444268) + bytes(8 * 1024) + struct.pack("<I", 2), "hash")
    image.put(struct.pack("<6I", 1, 0, 2, 3, 4, 0) + struct.pack("<6I", 5, 0, 6, 7, 8, 0), "blocks")
    text = dump(image.finish()[0])
    expect(text[text.index("section") :], """section
  cda_type: CDB_DSECT_CLASS_HASH
  cda_length: 8248
  cda_revision: 0
  class hash
    rch_cb_ID: CDBh
    rch_num_hash_blocks: 2
    block
      rch_prim_hash_value: 2
      rch_class_id: 3
    block
      rch_prim_hash_value: 6
      rch_class_id: 7
""", "class hash")
    data = parsed(dump(image.finish()[0], "--json", "--offsets"))["sections"][0]["class_hash"]
    expect(data["u_rch_table"], [0] * 1024, "buckets")
    expect([block["u_rch_next_hash"] for block in data["rc_hash_blocks"]], [1, 5], "references")
    names = [name for _, _, name in regions_of(dump(image.finish()[0], "--hex"))]
    for name in (
        "section 0, rsrc_class_hash_t 0, u_rch_table",
        "section 0, rc_hash_block_t 0, u_rch_next_hash: 1",
        "section 0, rc_hash_block_t 1, u_rch_rsrc_class: 8",
        "section 0, rc_hash_block_t 1, rch_class_id: 7",
    ):
        expect(names.count(name), 1, f"annotations {name!r} in {names[-8:]}")


def test_sections_of_unused_types():
    """Their contents have no known meaning, so only the anchor is shown."""
    image = cdb_image.Image("little", "little")
    for kind in (0, 1, 2):
        image.sections.append((kind, len(image.body)))
        image.put(bytes(8), "unused")
    text = dump(image.finish()[0])
    expect(text[text.index("section") :], "".join(
        f"section\n  cda_type: CDB_DSECT_{name}\n  cda_length: 8\n  cda_revision: 0\n"
        for name in ("UNUSED", "EMPTY", "TBL_CNTRS")
    ), "sections")


def test_annotated_values():
    """Values, references and pieces of odd; its class is at 160 and the class's strings are 768 behind, at 3a0."""
    names = [name for _, _, name in regions_of(dump(database("odd"), "--hex"))]
    for name in (
        "rsrc_class_t 0, u_rc_actionsC: 504 at 00000298",
        "rsrc_class_t 0, rc_locator: 9",
        "rsrc_pattr_t 0, ra_dflt_value: 56 at 000003d8 \"\\x1b[1m\\xffé\"",
        "rsrc_pattr_t 0, u_ra_variety_list: 0 at 00000308",
        "rsrc_pattr_t 0, u_ra_valid_vals: 0 at 00000380",
        "rsrc_pattr_t 1, ra_dflt_value: 80 at 000003f0",
        "rsrc_pattr_t 1, u_ra_valid_vals: none",
        "rsrc_dattr_t 0, ra_min_value: -5",
        "rsrc_dattr_t 0, u_ra_vclass: 104",
        "rsrc_action_t 0, ac_perms: q, l, 0x400",
        "vv_entry_t 0, vv_low_val: 64 at 000003e0 \"\\xe2\\x80\\xae\"",
        "vv_entry_t 0, vv_disp_msgid: 37",
        "handle: 0x1 0x2 0x3 0x4 0xffffffff",
    ):
        expect(names.count("section 0, " + name), 1, f"regions {name!r}")
    expect(names.count("section 4, var_id_t 1: 5"), 1, "variable IDs")


def test_annotated_elements():
    """Elements of arrays and of lists of valid values have the types of their owners."""
    names = re.sub(r"(?m)^.{59}|\d+ at [0-9a-f]{8} ", "", dump(database("FileSystem"), "--hex"))
    for some in (
        ("vx_array_t 0, element_count: 2", "vx_array_t 0, pad", 'vx_value_t 0: "rw"', 'vx_value_t 1: "noatime"'),
        ("vx_array_t 0, pad", "vx_value_t 0: 0", "vx_value_t 1: 8", "vx_value_t 2: 16"),
        ("vv_entry_t 0, vv_low_val: 0", "vv_entry_t 0, vv_high_val: 50", "vv_entry_t 0, vv_disp_msgid: none"),
        ('vv_entry_t 2, vv_low_val: "memory"', 'vv_entry_t 2, vv_high_val: "memory"'),
        ("vx_structured_data_t 0, element_count: 2", "vx_structured_data_t 0, pad",
         "vx_structured_data_element_t 0, data_type: Int64", "vx_structured_data_element_t 0, pad",
         "vx_structured_data_element_t 0, value: 0", "vx_structured_data_element_t 1, data_type: String"),
        ("length: 12", "filling", "binary"),
    ):
        lines = "".join(f"section 0, {line}\n" for line in some)
        expect(names.count(lines), 1, f"lines {lines}")


def test_annotated_bytes_are_in_proportion():
    """A thousand names refer to the same long text, and each reference shows only its beginning."""
    name = "x" * 200
    lists = "".join(f"variety_list_t:g {i},{i}\n" for i in range(1000))
    actions = "".join(f"rsrc_action_t:b u_ac_name=0 u_ac_variety_list={16 * i} u_ac_sd_input=none u_ac_sd_resp=none\n"
                      for i in range(1000))
    tables = 224 + 56 * 1000
    data = cdb_image.assemble(f"""section class
rsrc_class_t:1 u_rc_alias=none u_rc_pattrsC=224 u_rc_dattrsC=224 u_rc_pattrs=224 u_rc_dattrs=224 u_rc_def_input=none
+ u_rc_undef_input=none u_rc_online_input=none u_rc_offline_input=none u_rc_reset_input=none u_rc_actionsC=224
+ u_rc_actions=224 u_rc_variety_lists={tables} u_rc_sd_defs={tables + 16000} u_rc_valid_vals={tables + 16000}
+ u_rc_strings={tables + 16000} rc_num_actions=1000 rc_varlist_size=16000 rc_locator=65535
{actions}{lists}string "{name}"
""")
    regions = check_bytes(data, "many names")
    expect({text for _, _, text in regions if ", u_ac_name" in text}, {
        f'section 0, rsrc_action_t {i}, u_ac_name: 0 at {96 + tables + 16000:08x} "{"x" * 32}"...' for i in range(1000)
    }, "references")
    expect(dump(data, status=TROUBLE), "cdef: -: not a sound database; 'cdef verify' says why\n", "listing")


def test_value_of_another_type():
    """A range that a class attribute's stanza has stored in a resource attribute: its numbers are not references."""
    source = (CASES / "listing" / "minimal.cdefsrc").read_bytes()
    source += b"DynamicResourceAttribute\n\tName=Text\n\tDescription=3\n\tDisplayName=4\n\tId=7\n"
    source += b"\tDataType=StringArray\n\tVariableType=State\n\tVarietyRange=0,10\n"
    source += b"DynamicClassAttribute\n\tName=Number\n\tDescription=3\n\tDisplayName=4\n\tId=8\n\tDataType=Int32\n"
    source += b"\tVariableType=State\n\tVarietyRange=0,10\n\tRange=9,12345\n"
    text = dump(compile_source(source))
    resource = text[text.index("dynamic resource attribute") :]
    expect(re.findall(r"ra_m.._value: .*", resource), ["ra_min_value: none", "ra_max_value: none"], "range")


def test_shared_values_are_shown_once():
    """Structures in such a range, each with the next one twice: 2 ** 40 of them, if one followed every reference."""
    levels = 40
    strings = 224 + 136 + 16
    image = f"""section class
rsrc_class_t:1 u_rc_alias=none u_rc_pattrsC=224 u_rc_dattrsC=224 u_rc_pattrs=224 u_rc_dattrs=224 u_rc_def_input=none
+ u_rc_undef_input=none u_rc_online_input=none u_rc_offline_input=none u_rc_reset_input=none
+ u_rc_actionsC=360 u_rc_actions=360 u_rc_variety_lists=360 u_rc_sd_defs=376 u_rc_valid_vals=376
+ u_rc_strings={strings} rc_num_dattrs=1 rc_varlist_size=16 rc_locator=65535
rsrc_dattr_t:a u_ra_name=0 ra_init_value=none ra_min_value=SDArray:8 ra_max_value=none u_ra_variety_list=0
+ u_ra_valid_vals=none u_ra_sd=none u_ra_express=none u_ra_rearm_expr=none ra_data_type=SDArray ra_max_sd_idx=65535
variety_list_t:g 0,1
string "C"
array SD 24
"""
    for level in range(1, levels + 1):
        image += f"sd SD:{24 + 40 * level} SD:{24 + 40 * level}\n"
    lines = dump(cdb_image.assemble(image + "sd-empty\n")).splitlines()
    start = lines.index("      ra_min_value: SDArray")
    nested = ["  " * (4 + level) + "SD" for level in range(levels)] + ["  " * (4 + levels) + "SD, empty"]
    again = ["  " * (4 + level) + "SD: none" for level in range(levels, 0, -1)]
    expect(lines[start + 1 : start + 2 + 2 * levels], nested + again, "lines of the value")


def test_attribute_cut_short():
    """A second class finds a String attribute open; its reference to valid values is 0, where another's numbers are."""
    attribute = b"PersistentResourceAttribute\n\tName=%s\n\tDescription=3\n\tDisplayName=4\n\tId=7\n\tDataType=%s\n"
    source = (CASES / "listing" / "minimal.cdefsrc").read_bytes()
    tail = source.index(b"ClassToManagerMapping")
    first, mapping = source[:tail], source[tail:]
    numbers = attribute % (b"Number", b"UInt32") + b"\tVarietyRange=0,10\n\tValidValue=8,16\n"
    text = attribute % (b"Text", b"String") + b"\tVarietyRange=0,10\n"
    shown = dump(compile_source(first + numbers + text + first + mapping))
    expect(re.findall(r"u_ra_valid_vals.*|vv_low_val.*|vv_high_val.*|ra_dflt_value.*", shown), [
        "ra_dflt_value: 0", "u_ra_valid_vals", "vv_low_val: 8", "vv_high_val: 16",
        "ra_dflt_value: none", "u_ra_valid_vals: none",
    ], "values")
