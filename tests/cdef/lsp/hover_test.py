"""Test what `cdef lsp` shows for a place of a class."""

import re

import pytest

from compare import none, same
from lsp_pump import PUMP, at, compiled, hover, show, opened  # noqa: F401 (a fixture)
from programs import PROGRAMS


def test_hover_shows_an_attribute(pump):
    image = compiled(PUMP)
    text, name = hover(pump, "\tI|d=7")
    assert name == "Id"
    head, *points = text.splitlines()
    assert head == "`Id` of `DynamicResourceAttribute`: attribute number, see Numbers and who checks them"
    (database,) = [line for line in points if line.startswith("- in the database")]
    said = re.fullmatch(r"- in the database: `ra_attr_id` at offset 0x([0-9a-f]+), bytes `07 00 00 00`", database)
    begin = int(said.group(1), 16)
    assert image[begin:begin + 4] == b"\7\0\0\0"
    same([line for line in points if line and line != database], [
        "- given: required, once",
        "- value: number32: an integer, of which the low 32 bits are kept",
        "- range: 0 to 2147483647",
        "- field: `ra_attr_id` of `rsrc_dattr_t`, 4 bytes from offset 120",
    ], "points")


@pytest.mark.parametrize("words, number", [
    ("\tDescripti|on=1", 1), ("\tDescripti|on=3", 3), ("\tDescripti|on=5", 5), ("\tDescripti|on=7", 7),
    ("\tDescripti|on=9", 9), ("\tDescripti|on=11", 11), ("\tLastK|ey=2", 2), ("\tReportingInt|erval=60", 60),
])
def test_hover_shows_the_bytes_of_every_kind_of_record(pump, words, number):
    text, _ = hover(pump, words)
    begin, shown = re.search(r"at offset 0x([0-9a-f]+), bytes `([0-9a-f ]+)`", text).groups()
    raw = number.to_bytes(2, PROGRAMS.native)
    assert bytes.fromhex(shown) == raw
    assert compiled(PUMP)[int(begin, 16):int(begin, 16) + 2] == raw


@pytest.mark.parametrize("words, field, stored", [
    ("\tNa|me=Pump", "u_rc_name", b"Pump\0"), ("\tNa|me=Host", "u_ra_name", b"Host\0"),
    ("\tNa|me=Speed", "u_ra_name", b"Speed\0"), ("\tNa|me=Stop", "u_ac_name", b"Stop\0"),
    ("\tElementNa|me=Turns", "u_sd_field_name", b"Turns\0"), ("\tElementNa|me=When", "u_sd_field_name", b"When\0"),
    ("\tVariableCl|ass=Flow\n\tObs", "u_rvc_name", b"Flow\0"), ("\tMessageCat|alog=m", "u_rcm_msg_file", b"m.cat\0"),
    ("\tReArmExpr|ession", "u_ra_rearm_expr", b"Host == 'Host'\0"), ("\tDefaultVa|lue=", "ra_dflt_value", b"vier\0"),
    ("\tInitialVal|ue=", "ra_init_value", b"\0\0\0\1\0\0\0\0\0\0\0\5\0\0\0\0"),
    ("\tExpr|ession=", "u_ra_express", b"Speed.Turns > 9 && Speed.Turns < 99\0"),
])
def test_hover_shows_the_bytes_that_a_record_refers_to(pump, words, field, stored):
    """Of a long text the first ones."""
    text = PUMP.replace("\tProperties=Public,", "\tDefaultValue=vier\n\tProperties=Public,").replace(
        "ResourceAction", "DynamicClassAttribute\n\tName=Total\n\tDescription=5\n\tDisplayName=6\n\tId=1\n"
        "\tDataType=UInt32Array\n\tVarietyRange=1,1\n\tVariableType=Quantity\n\tInitialValue=5\nResourceAction")
    show(pump, text)
    about, _ = hover(pump, words, text)
    found = re.search(f"`{field}` refers to offset 0x([0-9a-f]+), bytes `([0-9a-f ]+)( \\.\\.\\.)?`", about)
    begin, shown = found.groups()[:2]
    if field == "ra_init_value" and PROGRAMS.native == "little":
        stored = b"".join(stored[at:at + 4][::-1] for at in range(0, len(stored), 4))
    assert bytes.fromhex(shown) == stored[:16]
    assert compiled(text)[int(begin, 16):int(begin, 16) + len(stored)] == stored


def test_hover_on_the_index_of_an_element_shows_its_record(pump):
    """The index is not stored."""
    about, _ = hover(pump, "\tElementInd|ex=0\n\tDataType=UInt32\nResource")
    assert "- field: none: it is the place of the element's `sd_field_t` in `sd_fields` of `sd_def_t`" in about
    begin, size = re.search(r"- in the database: at offset 0x([0-9a-f]+), (\d+) bytes", about).groups()
    name, _ = hover(pump, "\tElementNa|me=Turns")
    assert f"`u_sd_field_name` at offset 0x{begin}," in name and size == "32"


def test_hover_without_a_database_has_no_bytes(pump):
    show(pump, PUMP.replace("FirstKey", "FirstKy"))
    text, _ = hover(pump, "\tI|d=7", PUMP.replace("FirstKey", "FirstKy"))
    assert "field: `ra_attr_id`" in text and "in the database" not in text


def test_hover_shows_values(pump):
    assert hover(pump, "DataType=Str|ing")[0].startswith("data type `String`\n\n- text of a value: any text, not empty")
    assert hover(pump, "VariableType=St|ate")[0].startswith("variable type `State`: One of several values")
    text, name = hover(pump, "Public,Reqd|ForDefine")
    assert name == "ReqdForDefine" and text.startswith("property `ReqdForDefine`\n\n- bit: 0x2\n- meaning: A client")
    assert hover(pump, "=Pub|lic,Reqd")[1] == "Public"


def test_hover_shows_names_where_they_are_used(pump):
    text, name = hover(pump, "Locator=H|ost")
    assert name == "Host" and text.startswith("`Host`: `PersistentResourceAttribute`, Id 4, DataType String\n")
    text, name = hover(pump, "> 9 && Speed.Tu|rns")
    assert name == "Turns" and text.startswith("`Turns`: `DAttrSDDefinition`, ElementIndex 0, DataType UInt32\n")


def test_hover_shows_a_stanza(pump):
    text, name = hover(pump, "Resource|Action")
    assert name == "ResourceAction" and text.startswith("`ResourceAction`: what a resource can be told to do\n")
    assert "- required: `Name`, `Description`, `DisplayName`, `Id` and `VarietyRange`" in text


@pytest.mark.parametrize("words, shown", [
    ('Expression=|"Speed.Turns > 9', '"Speed.Turns > 9 && Speed.Turns < 99"'),
    ('Turns < 99"|', '"Speed.Turns > 9 && Speed.Turns < 99"'), ("Expr|ession=\"Speed.", "Expression"),
])
def test_range_of_a_hover_contains_the_place(pump, words, shown):
    assert hover(pump, words)[1] == shown


PLACES = (PUMP.replace("=Flow", '="Flow" # c', 1).replace("Locator=", "Locator= ").replace("Public,Reqd", '"Public,Reqd')
          .replace("ForDefine\n", 'ForDefine"\n', 1).replace("FirstKey=1", " FirstKey = 1 ").replace("Name=Stop", "Name=")
          + "Nonsense\n\tName=\u03b1\U0001d50a\n\n  \nResourceAction \n\t\n\tN\n")


def test_ranges_contain_the_place_everywhere(pump):
    """Those of hovers and, as the protocol demands, in one line, those of completion."""
    show(pump, PLACES)
    wrong = []
    for number, line in enumerate(PLACES.split("\n")):
        for character in range(len(line.encode("utf-16-le")) // 2 + 1):
            where = {"line": number, "character": character}
            ranges = [each["textEdit"]["range"] for each in at(pump, "textDocument/completion", where)]
            found = at(pump, "textDocument/hover", where)
            for each in [*ranges, *([found["range"]] if found else [])]:
                begin, end = each["start"], each["end"]
                if not begin["line"] == number == end["line"] or not begin["character"] <= character <= end["character"]:
                    wrong.append((line, character, each))
    none(wrong)


def test_hover_is_silent_in_comments_and_unknown_lines(pump):
    assert hover(pump, "# A p|ump") is None
    show(pump, "Nonsense\n\tName=a\n")
    assert hover(pump, "Non|sense", "Nonsense\n\tName=a\n") is None
    assert hover(pump, "Na|me", "Nonsense\n\tName=a\n") is None
