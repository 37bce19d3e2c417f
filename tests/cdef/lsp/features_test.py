"""Test what `cdef lsp` offers at a place of a class."""

import json
import re
import subprocess

import pytest

from compare import none, same
from lsp_client import CAPABILITIES, Client, ServerError, edited, edits_in, offset, part, position
from programs import PROGRAMS, environment

URI = "file:///classes/Pump.cdefsrc"
PUMP = """# A pump.
ControlDefinition
\tFileVersion=1.0.0.0
ResourceClass
\tDescription=1
\tDisplayName=2
\tProperties=HasResources,CanDefine
\tClassPermTemplate=0
\tResourcePermTemplate=0
\tName=Pump
\tLocator=Host
ResourceVariableClass
\tVariableClass=Flow
\tObservationInterval=10
\tReportingInterval=60
PersistentResourceAttribute
\tName=Host
\tDescription=3
\tDisplayName=4
\tId=4
\tDataType=String
\tVarietyRange=1,1
\tProperties=Public,ReqdForDefine
DynamicResourceAttribute
\tName=Speed
\tDescription=5
\tDisplayName=6
\tId=7
\tDataType=SD
\tVarietyRange=1,1
\tVariableType=State
\tVariableClass=Flow
\tExpression="Speed.Turns > 9 && Speed.Turns < 99"
\tReArmExpression="Host == 'Host'"
DAttrSDDefinition
\tElementName=Turns
\tDescription=7
\tDisplayName=8
\tElementIndex=0
\tDataType=UInt32
ResourceAction
\tName=Stop
\tDescription=9
\tDisplayName=10
\tId=0
\tVarietyRange=1,1
ActionInSDDefinition
\tElementName=When
\tDescription=11
\tDisplayName=12
\tElementIndex=0
\tDataType=UInt32
ClassToManagerMapping
\tResourceManager=M
\tFirstKey=1
\tLastKey=2
\tMessageCatalog=m.cat
\tDescriptiveMessageSet=1
"""


@pytest.fixture(name="pump")
def opened():
    """A client with the class."""
    with Client() as client:
        client.open(URI, PUMP)
        assert client.diagnostics(URI) == []
        client.version = 1
        yield client


def show(client, text):
    """Replace the document."""
    client.version += 1
    client.change(URI, client.version, text)
    client.diagnostics(URI, client.version)


def marked(text):
    """The text without its mark |, and the mark's position."""
    at = text.index("|")
    text = text.replace("|", "", 1)
    return text, position(text, at)


def place(text, words):
    """The position of the mark | in words of the text."""
    at = text.index(words.replace("|", "")) + words.index("|")
    return position(text, at)


def at(client, method, where, **params):
    return client.about(method, URI, position=where, **params)


def labels(items):
    return [each["label"] for each in items]


# ---- Hover -----------------------------------------------------------------------------------------------------------


def hover(client, words, text=PUMP):
    found = at(client, "textDocument/hover", place(text, words))
    return found and (found["contents"]["value"], part(text, found["range"]))


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


def compiled(text):
    """The database that the compiler makes."""
    import pathlib
    import tempfile
    with tempfile.TemporaryDirectory() as directory:
        source, output = pathlib.Path(directory, "Pump.cdefsrc"), pathlib.Path(directory, "Pump.cdef")
        source.write_text(text)
        subprocess.run([PROGRAMS.cdgen, source, output], check=True, capture_output=True, env=environment())
        return output.read_bytes()


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


# ---- Completion ------------------------------------------------------------------------------------------------------


def complete(client, text):
    """The items at the mark, and what the text becomes with the one of a label."""
    text, where = marked(text)
    show(client, text)
    items = at(client, "textDocument/completion", where)

    def taken(label):
        (item,) = [each for each in items if each["label"] == label]
        return edited(text, [item["textEdit"]])

    return items, taken


CLASS = PUMP[:PUMP.index("ResourceVariableClass")]


def test_first_stanza(pump):
    items, taken = complete(pump, "|")
    assert labels(items) == ["ControlDefinition", "ClassToManagerMapping", "ResourceVariableClass"]
    assert taken("ControlDefinition") == "ControlDefinition\n\tFileVersion=${1:1.0.0.0}$0"


def test_stanza_brings_its_required_lines_in_order(pump):
    items, taken = complete(pump, PUMP + "Resou|")
    assert taken("ResourceAction")[len(PUMP):] == (
        "ResourceAction\n\tName=${1:NewName}\n\tDescription=${2:0}\n\tDisplayName=${3:0}\n\tId=${4:1}\n"
        "\tVarietyRange=${5:1,1}$0")
    assert all(each["documentation"]["kind"] == "markdown" for each in items)
    assert "ClassToManagerMapping" not in labels(items) and "ControlDefinition" not in labels(items)


@pytest.mark.parametrize("kind, lines", [
    ("ResourceClass", "Description DisplayName Properties ClassPermTemplate ResourcePermTemplate"),
    ("ResourceVariableClass", "VariableClass ObservationInterval ReportingInterval"),
])
def test_required_lines_are_in_their_usual_order(pump, kind, lines):
    """In snippets and hovers, and where attributes are completed, the order is that of `cdef format --reorder`."""
    names = lines.split()
    head = PUMP[:PUMP.index("ResourceClass")]
    _, taken = complete(pump, head + "|")
    assert re.findall(r"\t(\w+)=", taken(kind)[len(head):]) == names
    show(pump, head + kind)
    text, _ = hover(pump, kind[:5] + "|" + kind[5:], head + kind)
    assert re.findall(r"`(\w+)`", text[text.index("required"):text.index("optional")]) == names
    assert labels(complete(pump, head + kind + "\n\t|")[0]) == names
    text = head + kind + "\n"
    show(pump, text)
    (after,) = actions(pump, kind[:5] + "|" + kind[5:], text, only=["quickfix"])[0].values()
    assert re.findall(r"\t(\w+)=", after[len(head):]) == names


def test_stanza_of_a_client_without_snippets_compiles(directory):
    with Client(capabilities={}) as client:
        client.version = 1
        client.open(URI, PUMP)
        head = PUMP[:PUMP.index("ClassToManagerMapping")]
        for label in ("PersistentResourceAttribute", "DynamicClassAttribute", "ClassAction", "OnlineSDDefinition",
                      "ResourceVariableClass", "ActionInSDDefinition", "ActionOutSDDefinition"):
            _, taken = complete(client, head + "|\n" + PUMP[len(head):])
            source = directory / "class.cdefsrc"
            source.write_text(taken(label))
            subprocess.run([PROGRAMS.cdgen, source, directory / "class.cdef"], check=True)


def test_elements_only_where_they_belong(pump):
    items, _ = complete(pump, CLASS + "|")
    assert "PAttrSDDefinition" not in labels(items) and "ActionInSDDefinition" not in labels(items)
    assert "OnlineSDDefinition" in labels(items)
    until = PUMP.index("ResourceAction")
    assert "DAttrSDDefinition" in labels(complete(pump, PUMP[:until] + "|\n" + PUMP[until:])[0])
    assert "ActionOutSDDefinition" in labels(complete(pump, PUMP[:PUMP.index("ClassToM")] + "|")[0])


def test_missing_attributes_come_before_optional_ones(pump):
    text = CLASS + "PersistentResourceAttribute\n\tName=A\n\tDescription=1\n\tDisplayName=1\n"
    items, taken = complete(pump, text + "\tI|")
    assert labels(items) == ["Id", "DataType", "VarietyRange"]
    assert taken("Id") == text + "\tId=0"
    assert "- field: `ra_attr_id`" in items[0]["documentation"]["value"]
    complete_stanza = text + "\tId=0\n\tDataType=Int32\n\tVarietyRange=1,1\n"
    items, _ = complete(pump, complete_stanza + "\tGroupID=1\n\t|")
    assert labels(items) == ["VarietyRange", "GroupName", "Properties", "ValidValue", "ValueDisplayName",
                             "DefaultValue", "ListActionRsrc", "ListActionClass"]


def test_optional_attributes_are_not_offered_above_required_ones(pump):
    items, _ = complete(pump, CLASS + "ResourceAction\n\tName=A\n\t|\n\tDescription=1\n\tDisplayName=1\n\tId=0\n")
    assert labels(items) == ["VarietyRange"]


def test_name_before_an_equals_sign_keeps_it(pump):
    text = CLASS + "ResourceAction\n\tN|=A\n"
    _, taken = complete(pump, text)
    assert taken("Name").endswith("\tName=A\n")


@pytest.mark.parametrize("line, expected", [
    ("\tVariableType=|", ["Counter", "Quantity", "State", "Quantum"]),
    ("\tVariableClass=F|", ["Flow"]),
    ("\tProperties=Public,|", ["QryReqsMonitoring"]),
    ("\tId=|", ["8"]),
    ("\tExpression=\"Speed.|", ["Turns"]),
    ("\tExpression=\"Sp|", ["Speed", "Host"]),
    ("\tExpression=\"Speed == '|", []),
    ("\tExpression=\"Speed == '|'\"", []),
    ("\tExpression=\"Speed == 'a' && |\"", ["Speed", "Host"]),
    ("\tName=|", []),
    ("\t# |", []),
])
def test_values(pump, line, expected):
    until = PUMP.index("ClassToManagerMapping")
    items, _ = complete(pump, PUMP[:until] + "DynamicResourceAttribute\n" + line + "\n" + PUMP[until:])
    assert labels(items) == expected
    assert all(each["documentation"]["value"] for each in items)


@pytest.mark.parametrize("words, label", [
    ("Locator=Ho|st", "Host"), ("Resource|Action", "ResourceAction"), ("\tProperties=Pub|lic,Reqd", "Public"),
    ("\tFirst|Key=1", "FirstKey"), ("\tDataType=|String", "String"), ("Speed.Tu|rns >", "Turns"),
])
def test_an_item_replaces_the_whole_word(pump, words, label):
    """At a header whose lines follow, it is only the header."""
    at_mark = PUMP.index(words.replace("|", "")) + words.index("|")
    items, taken = complete(pump, PUMP[:at_mark] + "|" + PUMP[at_mark:])
    assert label in labels(items) and taken(label) == PUMP


@pytest.mark.parametrize("before, wrong", [
    ("ControlDefinition", "ClassToManagerMapping"), ("ControlDefinition", "ControlDefinition"),
    ("ResourceClass", "ResourceClass"), ("DAttrSDDefinition", "ResourceAction"),
    ("DAttrSDDefinition", "DAttrSDDefinition"), ("ActionInSDDefinition", "ActionInSDDefinition"),
    ("ResourceAction", "OnlineSDDefinition"),
])
def test_stanzas_that_may_not_come_here_are_not_offered(pump, before, wrong):
    """In front of a stanza: a second one of its kind, or one that divides a run or follows a run of another kind."""
    at_mark = PUMP.index("\n" + before) + 1
    items, _ = complete(pump, PUMP[:at_mark] + "|\n" + PUMP[at_mark:])
    assert wrong not in labels(items)


def test_elements_of_an_action_need_one(pump):
    """A run that belongs to no action is not continued by one of the other kind."""
    stray = PUMP[:PUMP.index("ResourceAction")] + PUMP[PUMP.index("ActionIn"):PUMP.index("ClassTo")]
    assert "ActionOutSDDefinition" not in labels(complete(pump, stray + "|")[0])


def test_dynamic_attributes_are_offered_where_their_ranges_are_kept(pump):
    """Those of the class come before one of resources that has a Range."""
    text = PUMP.replace("ResourceAction", "DynamicResourceAttribute\n\tName=Heat\n\tRange=1,2\nResourceAction")
    after = text.index("ResourceAction\n")
    assert "DynamicClassAttribute" not in labels(complete(pump, text[:after] + "|\n" + text[after:])[0])
    before = text.index("PersistentResourceAttribute")
    assert "DynamicClassAttribute" in labels(complete(pump, text[:before] + "|\n" + text[before:])[0])


def test_no_stanza_is_offered_between_attributes(pump):
    items, _ = complete(pump, PUMP.replace("\tLocator", "|\n\tLocator"))
    assert items == []


@pytest.mark.parametrize("words", ["|\tLocator", "|\tReArmExpression", "|# A pump", "|\tDescriptiveMessageSet"])
def test_no_stanza_is_offered_on_a_line_with_a_text(pump, words):
    """The text would become the last line's."""
    assert at(pump, "textDocument/completion", place(PUMP, words)) == []


@pytest.mark.parametrize("line", ["  |  Locator=Host", "\t|# x", "|  # x", "\tLocator=Ho\rs|t", "\tLo\rc|ator=Host",
                                  "\tLocator=Host |# x", "\tLocator=Host  | // x", '\tLocator="Host"|', '\tLocator=|"Host"',
                                  '\tLocator="Host" |', "\tLocator= | /* x"])
def test_nothing_is_offered_outside_of_a_word(pump, line):
    """An item would run into what follows, or take away what comes before. A carriage return divides a line for the
    client, but not for the compiler."""
    assert complete(pump, PUMP.replace("\tLocator=Host", line))[0] == []


@pytest.mark.parametrize("line, label, after", [
    ("\tLocator=H| # x", "Host", "\tLocator=Host # x"), ("\tLocator= |", "Host", "\tLocator=Host"),
    ("\tLocator=Ho|st\r", "Host", "\tLocator=Host\r"), ("\tLoc|ator=Host\r", "Locator", "\tLocator=Host\r"),
    ('\tLocator="H|', "Host", '\tLocator="Host'), ('\tLocator="|" # x', "Host", '\tLocator="Host" # x'),
])
def test_an_item_leaves_the_rest_of_its_line(pump, line, label, after):
    _, taken = complete(pump, PUMP.replace("\tLocator=Host", line))
    assert taken(label) == PUMP.replace("\tLocator=Host", after)


@pytest.mark.parametrize("line", ["\tExpression=\"Speed > 9\"|", "\tExpression=|\"Speed > 9\"",
                                  "\tExpression=\"Speed > 9\"  |", "\tExpression=Speed > 9 |# x",
                                  '\tExpression="Host == \\"Sp|eed\\""'])
def test_names_are_offered_only_within_an_expression(pump, line):
    """And outside of its quotes: one after a backslash is a quote like any other."""
    assert complete(pump, PUMP.replace('\tExpression="Speed.Turns > 9 && Speed.Turns < 99"', line))[0] == []


def test_names_that_are_not_one_word_are_not_offered_in_expressions(pump):
    text = PUMP.replace("Name=Speed", 'Name="Speed # 1"').replace("Host == ", "| == ")
    assert labels(complete(pump, text)[0]) == ["Host"]


ODD = ["Printer # Status", "Host // Name", "/* A", "A #", '"A4', '"A4"']


@pytest.mark.parametrize("name", ODD)
@pytest.mark.parametrize("line", ["\tLocator=|", "\tLocator=| # x", '\tLocator="|"', "\tVariableClass=|", "\tDefaultValue=|"])
def test_items_have_quotes_where_the_value_needs_them(pump, line, name):
    """The result means the name and has no finding, as if the author had written it."""
    text = (PUMP.replace("Locator=Host", f'Locator="{name}"').replace("Name=Host", f'Name="{name}"')
            .replace("Class=Flow", f'Class="{name}"').replace("Host == 'Host'", "Speed")
            .replace("\tProperties=Public,ReqdForDefine\n",
                     f'\tProperties=Public,ReqdForDefine\n\tValidValue="{name}"\n\tDefaultValue="{name}"\n'))
    attribute = line[:line.index("=") + 1]
    begin = text.rindex(attribute)
    before, after = text[:begin], text[text.index("\n", begin):]
    show(pump, text)
    findings = [each["code"] for each in pump.diagnostics(URI, pump.version)]
    items, taken = complete(pump, before + line + after)
    if name == '"A4' and line.endswith("# x"):
        assert name not in labels(items)  # with a lone quote before it, the comment would be part of the value
        return
    comment = " # x" if line.endswith("# x") else ""
    same(taken(name), before + attribute + f'"{name}"' + comment + after, "the text")
    show(pump, taken(name))
    assert [each["code"] for each in pump.diagnostics(URI, pump.version)] == findings


def test_types_are_those_of_the_stanza(pump):
    items, taken = complete(pump, CLASS + "PersistentResourceAttribute\n\tDataType=In|")
    assert "SDArray" in labels(items) and "SBS" not in labels(items)
    assert items[0]["documentation"]["value"].startswith("data type")
    assert taken("Int32").endswith("\tDataType=Int32")
    items, _ = complete(pump, CLASS + "OnlineSDDefinition\n\tDataType=|")
    assert "SDArray" not in labels(items)


def test_locators_are_attributes(pump):
    text = PUMP.replace("Locator=Host", "Locator=|")
    assert labels(complete(pump, text)[0]) == ["Host"]


def test_valid_values_are_defaults(pump):
    items, _ = complete(pump, CLASS + "PersistentResourceAttribute\n\tValidValue=a\n\tValidValue=b\n\tDefaultValue=|")
    assert labels(items) == ["a", "b"]


# ---- Names -----------------------------------------------------------------------------------------------------------


def lines(places):
    return [each["range"]["start"]["line"] + 1 for each in places]


def line_of(words, text=PUMP):
    return text[:text.index(words)].count("\n") + 1


def test_definitions(pump):
    for words, definition in (("Locator=H|ost", "Name=Host"), ("VariableClass=Fl|ow\n\tEx", "VariableClass=Flow"),
                              ("99 && Speed.", None), ("> 9 && Sp|eed", "Name=Speed"), ("\"|Host ==", "Name=Host"),
                              ("> 9 && Speed.T|urns", "ElementName=Turns")):
        if definition:
            found = at(pump, "textDocument/definition", place(PUMP, words))
            assert lines(found) == [line_of(definition)], words


def test_references(pump):
    where = place(PUMP, "Name=Ho|st")
    uses = at(pump, "textDocument/references", where, context={"includeDeclaration": False})
    assert lines(uses) == [line_of("Locator="), line_of("ReArmExpression=")]
    assert {part(PUMP, each["range"]) for each in uses} == {"Host"}
    everywhere = at(pump, "textDocument/references", where, context={"includeDeclaration": True})
    assert len(everywhere) == 3


def test_highlights(pump):
    found = at(pump, "textDocument/documentHighlight", place(PUMP, "ElementName=Tur|ns"))
    assert [(each["kind"], part(PUMP, each["range"])) for each in found] == [(2, "Turns"), (2, "Turns"), (3, "Turns")]


def test_places_without_a_name(pump):
    where = place(PUMP, "Descripti|on=1")
    assert at(pump, "textDocument/definition", where) == []
    assert at(pump, "textDocument/prepareRename", where) is None
    with pytest.raises(ServerError):
        at(pump, "textDocument/rename", where, newName="a")


def rename(client, words, name, text=PUMP):
    change = edits_in(at(client, "textDocument/rename", place(text, words), newName=name))
    return edited(text, change[URI])


@pytest.mark.parametrize("words, old, new, count", [
    ("Name=Ho|st", "Host", "Node", 3), ("Locator=H|ost", "Host", "\u039a\u03cc\u03bc\u03b2\u03bf\u03c2", 3),
    ("Speed.Tu|rns >", "Turns", "Rounds", 3), ("VariableClass=Fl|ow", "Flow", "Water flow", 2),
    ("Name=St|op", "Stop", "Halt #1", 1), ("Name=Spe|ed", "Speed", "Tempo", 3), ("Name=Whe|n", "When", "At", 1),
])
def test_rename_changes_nothing_else(pump, directory, words, old, new, count):
    """`check` stays clean, and `diff` shows the new name."""
    prepared = at(pump, "textDocument/prepareRename", place(PUMP, words))
    assert (prepared["placeholder"], part(PUMP, prepared["range"])) == (old, old)
    after = rename(pump, words, new)
    assert after.count(new) == PUMP.count(new) + count
    show(pump, after)
    assert pump.published[URI]["diagnostics"] == []
    for name, text in (("a", PUMP), ("b", after)):
        (directory / f"{name}.cdefsrc").write_text(text)
        subprocess.run([PROGRAMS.cdgen, directory / f"{name}.cdefsrc", directory / f"{name}.cdef"], check=True)
    shown = subprocess.run([PROGRAMS.cdef, "diff", directory / "a.cdef", directory / "b.cdef"], capture_output=True,
                           check=False)
    changed = shown.stdout.decode().splitlines()
    assert changed and all(old in line or new in line for line in changed if not line.startswith("~")), changed


@pytest.mark.parametrize("words, old, new", [
    ("VariableClass=Fl|ow", "Flow", "Tide"), ("Speed.Tu|rns >", "Turns", "Flips"), ("Name=Whe|n", "When", "Hour"),
    ("Name=Spe|ed", "Speed", "Tempo"), ("Name=St|op", "Stop", "Halt"),
])
def test_rename_changes_only_the_name_in_the_database(pump, words, old, new):
    """And the checksum, the second word of the file; here, nothing moves, because both names have the same length."""
    before, after = compiled(PUMP), compiled(rename(pump, words, new))
    assert before[:4] + before[8:] != after[:4] + after[8:]
    same(after[:4] + after[8:], (before[:4] + before[8:]).replace(old.encode(), new.encode()), "the database")


@pytest.mark.parametrize("words, new, lines_shown", [
    ("VariableClass=Fl|ow", "Tide", ["- ResourceVariableClass 'Flow'", "+ ResourceVariableClass 'Tide'"]),
    ("Speed.Tu|rns >", "Flips", [
        "~ DynamicResourceAttribute 'Speed': expression 'Speed.Turns > 9 && Speed.Turns < 99' -> "
        "'Speed.Flips > 9 && Speed.Flips < 99'",
        "- DynamicResourceAttribute 'Speed', element 'Turns'", "+ DynamicResourceAttribute 'Speed', element 'Flips'"]),
])
def test_rename_as_a_difference(pump, directory, words, new, lines_shown):
    """What `cdef diff` finds by its name is shown as removed and added."""
    for name, text in (("a", PUMP), ("b", rename(pump, words, new))):
        (directory / f"{name}.cdef").write_bytes(compiled(text))
    shown = subprocess.run([PROGRAMS.cdef, "diff", "a.cdef", "b.cdef"], cwd=directory, capture_output=True, check=False)
    same(shown.stdout.decode().splitlines(), lines_shown, "lines")


@pytest.mark.parametrize("words, new, why", [
    ("Name=Ho|st", "Speed", "S"), ("Name=Ho|st", "a b", "an expression uses the name"),
    ("Name=Ho|st", "", "no name"), ("Name=St|op", "a\nb", "no name"), ("Name=Ho|st", "Speed ", "expression"),
    ("Name=St|op", "a\\", "cannot have"), ("Name=St|op", " a", "S"),
])
def test_rename_that_would_harm_is_refused(pump, words, new, why):
    with pytest.raises(ServerError) as refused:
        rename(pump, words, new)
    assert refused.value.code == -32803
    assert why in str(refused.value)


def test_name_of_a_class_is_for_others(pump):
    assert at(pump, "textDocument/prepareRename", place(PUMP, "Name=Pu|mp")) is None


# ---- Outline, folding, tokens ----------------------------------------------------------------------------------------


def tree(symbols):
    return [(each["name"], each["detail"], tree(each.get("children", []))) for each in symbols]


def test_outline(pump):
    symbols = pump.about("textDocument/documentSymbol", URI)
    same(tree(symbols), [
        ("ControlDefinition", "ControlDefinition", []), ("Pump", "ResourceClass", []),
        ("Flow", "ResourceVariableClass", []), ("Host", "PersistentResourceAttribute", []),
        ("Speed", "DynamicResourceAttribute", [("Turns", "DAttrSDDefinition", [])]),
        ("Stop", "ResourceAction", [("When", "ActionInSDDefinition", [])]), ("M", "ClassToManagerMapping", []),
    ], "outline")
    speed = symbols[4]
    assert part(PUMP, speed["selectionRange"]) == "Speed"
    assert part(PUMP, speed["range"]).startswith("DynamicResourceAttribute\n")
    assert part(PUMP, speed["range"]).endswith("\tElementIndex=0\n\tDataType=UInt32")


def test_outline_of_a_client_without_trees():
    with Client(capabilities={}) as client:
        client.open(URI, PUMP)
        names = [(each["name"], each.get("containerName")) for each in client.about("textDocument/documentSymbol", URI)]
    assert ("Turns", "Speed") in names and ("Speed", None) in names


def test_folding(pump):
    text = "# a\n# b\n\nResourceClass\n\tName=A\n\n\tLocator=B\n\n# c\nResourceAction\n"
    show(pump, text)
    found = {(each["startLine"], each["endLine"], each["kind"])
             for each in pump.about("textDocument/foldingRange", URI)}
    assert found == {(0, 1, "comment"), (3, 6, "region")}


def tokens(client, text, method="textDocument/semanticTokens/full", **params):
    """(text, type, modifiers) of each token."""
    legend = client.offers["semanticTokensProvider"]["legend"]
    data, found, line, character = client.about(method, URI, **params)["data"], [], 0, 0
    for down, right, length, kind, modifiers in zip(*[iter(data)] * 5):
        line, character = line + down, (0 if down else character) + right
        begin = offset(text, {"line": line, "character": character})
        end = offset(text, {"line": line, "character": character + length})
        found.append((text[begin:end], legend["tokenTypes"][kind], modifiers))
    return found


def test_tokens(pump):
    text = ("ResourceClass # \U0001d50a\n\tProperties=CanDefine\nDynamicResourceAttribute\n\tName=Sp\u00e4\n"
            "\tId=7 // x\n\tDataType=Int32\n\tNonsense=1\n\tExpression=\"Sp\u00e4 > 1\"\n")
    show(pump, text)
    expected = [
        ("ResourceClass", "class", 0), ("# \U0001d50a", "comment", 0), ("Properties", "property", 0),
        ("CanDefine", "enumMember", 0), ("DynamicResourceAttribute", "class", 0), ("Name", "property", 0),
        ("Sp\u00e4", "variable", 1), ("Id", "property", 0), ("7", "number", 0), ("// x", "comment", 0),
        ("DataType", "property", 0), ("Int32", "type", 0), ("1", "string", 0), ("Expression", "property", 0),
        ("Sp\u00e4", "variable", 0),
    ]
    same(tokens(pump, text), expected, "tokens")
    second = {"start": {"line": 1, "character": 3}, "end": {"line": 1, "character": 4}}
    assert tokens(pump, text, "textDocument/semanticTokens/range", range=second) == expected[2:4]


# ---- Actions ---------------------------------------------------------------------------------------------------------


def actions(client, words, text, **context):
    """title -> the text afterwards."""
    where = place(text, words)
    found = client.about("textDocument/codeAction", URI, range={"start": where, "end": where},
                         context={"diagnostics": [], **context})
    return {each["title"]: edited(text, edits_in(each["edit"])[URI]) for each in found}, found


def test_corrections_of_findings(pump):
    text = PUMP.replace("FirstKey", "FirstKy")
    show(pump, text)
    made, (action, *_) = actions(pump, "First|Ky", text, only=["quickfix"])
    assert made["Replace `FirstKy` with `FirstKey`"] == PUMP
    assert action["isPreferred"] and [each["code"] for each in action["diagnostics"]] == ["S106"]
    assert action["edit"]["documentChanges"][0]["textDocument"] == {"uri": URI, "version": pump.version}


def test_correction_of_carriage_returns_is_one_that_the_protocol_can_say(pump):
    text = PUMP.replace("\n", "\r\n")
    show(pump, text)
    everything = {"start": {"line": 0, "character": 0}, "end": position(text, len(text))}
    found = pump.about("textDocument/codeAction", URI, range=everything, context={"diagnostics": []})
    assert PUMP in [edited(text, edits_in(each["edit"])[URI]) for each in found]


def test_all_that_is_certain(pump):
    """Each run of wrong lines is one edit. The editor has to ask for it."""
    text = PUMP.replace("FirstKey", "FirstKy").replace("LastKey", "LastKy").replace("\tLocator", "\tLocater")
    show(pump, text)
    made, (action,) = actions(pump, "# A| pump", text, only=["source.fixAll"])
    assert made == {"Correct all that is certain": PUMP}
    same([each["newText"] for each in action["edit"]["documentChanges"][0]["edits"]],
         ["\tLocator=Host\n", "\tFirstKey=1\n\tLastKey=2\n"], "edits")
    for context in ({}, {"only": []}, {"only": [""]}, {"only": ["quickfix"]}):
        assert "Correct all that is certain" not in actions(pump, "# A| pump", text, **context)[0]


@pytest.mark.parametrize("line, title", [
    ("\ufeff# A pump.", "Remove `\\xef\\xbb\\xbf`"),
    ("\tFirst\u200bKey=1", "Replace `First\\xe2\\x80\\x8bKey` with `FirstKey`"),
])
def test_titles_show_what_is_invisible(pump, line, title):
    plain = line.replace("\ufeff", "").replace("\u200b", "")
    text = PUMP.replace(plain, line)
    show(pump, text)
    assert actions(pump, line[:1] + "|" + line[1:], text, only=["quickfix"])[0][title] == PUMP


def test_missing_lines_are_added_where_they_may_be(pump):
    text = PUMP.replace("\tDescription=9\n", "").replace("\tId=0\n", "").replace("VarietyRange=1,1\nActionIn",
                                                                                "VarietyRange=1,1\n\tTimeOut=5\nActionIn")
    show(pump, text)
    made, _ = actions(pump, "Resource|Action", text, only=["quickfix"])
    after = made["Add `Description` and `Id`"]
    assert "\tVarietyRange=1,1\n\tDescription=0\n\tId=0\n\tTimeOut=5\n" in after
    show(pump, after)
    assert pump.published[URI]["diagnostics"] == []


def test_next_free_number(pump):
    text = PUMP.replace("Id=7", "Id=4")
    show(pump, text)
    where = "\tId=|4\n\tDataType=SD"
    made, _ = actions(pump, where, text, only=["quickfix"])
    assert made["Use the next free number, 5"] == PUMP.replace("Id=7", "Id=5")


@pytest.mark.parametrize("number", [2147483646, 2147483647, "0x7fffffff", 4294967295, "0x80000000"])
def test_large_numbers_that_are_free_stay(pump, number):
    text = PUMP.replace("Id=7", f"Id={number}")
    show(pump, text)
    assert actions(pump, f"\tId=|{number}", text, only=["quickfix"])[0] == {}


def test_actions_for_a_selection(pump):
    """Of all stanzas and numbers in it, wherever it begins."""
    text = (PUMP.replace("\tId=7", "\tId=4").replace("\tDescription=9\n", "").replace("\tLastKey=2\n", "")
            .replace("\tDescription=11\n", ""))
    show(pump, text)
    begin, end = position(text, text.index("DynamicResource")), position(text, text.index("\tDisplayName=12") + 4)
    found = pump.about("textDocument/codeAction", URI, range={"start": begin, "end": end},
                       context={"diagnostics": [], "only": ["quickfix"]})
    made = [(each["title"], edited(text, edits_in(each["edit"])[URI])) for each in found if "diagnostics" not in each]
    with_description = "\tVarietyRange=1,1\n\tDescription=0\nActionIn"
    same(made, [
        ("Use the next free number, 5", text.replace("\tId=4\n\tDataType=SD", "\tId=5\n\tDataType=SD")),
        ("Add `Description`", text.replace("\tVarietyRange=1,1\nActionIn", with_description)),
        ("Add `Description`", text.replace("UInt32\nClass", "UInt32\n\tDescription=0\nClass")),
    ], "actions")


@pytest.mark.parametrize("words", ["\tId=|7", "\tElementIndex=|0\n\tDataType=UInt32\nResourceAction"])
def test_numbers_that_are_right_stay(pump, words):
    assert actions(pump, words, PUMP, only=["quickfix"])[0] == {}


TWO = "DAttrSDDefinition\n\tElementName=Hours\n\tDescription=7\n\tDisplayName=8\n\tElementIndex=%s\n\tDataType=UInt32\n"


def test_index_of_an_element_is_its_place(pump):
    text = PUMP.replace("ResourceAction\n", TWO % 7 + "ResourceAction\n")
    show(pump, text)
    made, _ = actions(pump, "\tElementIndex=|7", text, only=["quickfix"])
    assert made["Use the element's place, 1"] == text.replace("=7\n\tDataType=UInt32", "=1\n\tDataType=UInt32")
    short = text.replace("\tElementIndex=0\n\tDataType=UInt32\nDAttr", "\tDataType=UInt32\nDAttr")
    show(pump, short)
    made, _ = actions(pump, "ElementName=Tu|rns", short, only=["quickfix"])
    assert "\tDataType=UInt32\n\tElementIndex=0\nDAttr" in made["Add `ElementIndex`"]


def test_the_first_wrong_index_of_a_run_is_corrected_first(pump):
    """Another one alone would be one more error."""
    text = PUMP.replace("ResourceAction\n", TWO % 2 + TWO.replace("Hours", "Days") % 3 + "ResourceAction\n")
    show(pump, text)
    made, _ = actions(pump, "\tElementIndex=|2", text, only=["quickfix"])
    assert "Use the element's place, 1" in made
    made, _ = actions(pump, "\tElementIndex=|3", text, only=["quickfix"])
    assert not [each for each in made if each.startswith("Use")]


@pytest.mark.parametrize("value", ['a"b"c', "Host\r"])
def test_values_that_quotes_would_change_get_none(pump, value):
    text = PUMP.replace("\tName=Host\n", f"\tName={value}\n")
    show(pump, text)
    made, _ = actions(pump, "\tName=" + value[0] + "|" + value[1:3], text, only=["refactor"])
    assert made == {}


def test_lines_that_begin_in_column_1_are_not_added_again(pump):
    text = PUMP.replace("\tName=Stop", "Name=Stop")
    show(pump, text)
    assert not [each for each in actions(pump, "Resource|Action", text)[0] if each.startswith("Add")]


def test_lines_that_may_be_misspelt_are_not_added_again(pump):
    text = PUMP.replace("\tName=Stop", "\tNmae=Stop")
    show(pump, text)
    assert not [each for each in actions(pump, "Resource|Action", text)[0] if each.startswith("Add")]


def test_added_variable_class_is_the_one_in_use(pump):
    text = PUMP.replace("\tVariableClass=Flow\n\tObs", "\tObs")
    show(pump, text)
    made, _ = actions(pump, "Resource|Variable", text, only=["quickfix"])
    assert made["Add `VariableClass`"] == text.replace("Interval=60\n", "Interval=60\n\tVariableClass=Flow\n")


def test_no_lines_are_added_within_a_long_line(pump):
    """The compiler reads its rest as a header."""
    text = PUMP.replace("\tName=Stop\n\tDescription=9\n", "\tName=Stop" + 300 * "x" + "\n")
    show(pump, text)
    assert actions(pump, "Resource|Action", text, only=["quickfix"])[0] == {}


def test_added_values_fit_the_others(pump):
    text = PUMP.replace("\tReportingInterval=60\n", "")
    show(pump, text)
    made, _ = actions(pump, "Resource|Variable", text, only=["quickfix"])
    assert made["Add `ReportingInterval`"] == PUMP.replace("ReportingInterval=60", "ReportingInterval=10")
    text = PUMP.replace("Name=Stop", "Name=NewName") + "ResourceAction\n"
    show(pump, text)
    where = position(text, len(text) - 2)
    (action,) = pump.about("textDocument/codeAction", URI, range={"start": where, "end": where},
                           context={"diagnostics": [], "only": ["quickfix"]})
    assert "\tName=NewName2\n" in action["edit"]["documentChanges"][0]["edits"][0]["newText"]


def test_added_variable_class_has_quotes_if_it_needs_them(pump):
    text = PUMP.replace("\tVariableClass=Flow\n\tObs", "\tObs").replace("=Flow", '="Flow # 1"')
    show(pump, text)
    made, _ = actions(pump, "Resource|Variable", text, only=["quickfix"])
    assert made["Add `VariableClass`"] == text.replace("Interval=60\n", 'Interval=60\n\tVariableClass="Flow # 1"\n')


def test_quotes(pump):
    made, _ = actions(pump, "\tName=Ho|st", PUMP, only=["refactor"])
    assert made["Put the value in quotes"] == PUMP.replace("Name=Host", 'Name="Host"')
    text = PUMP.replace("Name=Host", "Name=Ho\\")
    show(pump, text)
    assert actions(pump, "\tName=H|o", text, only=["refactor"])[0] == {}


def test_client_without_literal_actions_gets_none():
    with Client(capabilities={}) as client:
        client.open(URI, PUMP.replace("FirstKey", "FirstKy"))
        assert client.about("textDocument/codeAction", URI, context={"diagnostics": []}, range={
            "start": {"line": 0, "character": 0}, "end": {"line": 99, "character": 0}}) == []


def corrected(text, edits):
    """The text after edits as `cdef check --format json` has them, which count bytes."""
    begins = [0]
    for line in text.split("\n"):
        begins.append(begins[-1] + len(line) + 1)
    for each in sorted(edits, key=lambda one: (one["line"], one["column"]), reverse=True):
        begin = begins[each["line"] - 1] + each["column"] - 1
        assert text[begin:].startswith(each["removed"])
        text = text[:begin] + each["inserted"] + text[begin + len(each["removed"]):]
    return text


def test_every_edit_of_every_finding_is_offered(pump, directory):
    """And no other: those of `cdef check --format json`."""
    text = (PUMP.replace("FirstKey", "FirstKy").replace("=String", "=Strin").replace("\tName=Stop", "    \tName =Stop")
            .replace("LastKey=2", "LastKey=2\r").replace("\tId=7", "Id=7"))
    (directory / "a.cdefsrc").write_bytes(text.encode())
    done = subprocess.run([PROGRAMS.cdef, "check", "--format", "json", "a.cdefsrc"], cwd=directory, capture_output=True,
                          check=False)
    findings = [each for each in json.loads(done.stdout)["sources"][0]["findings"] if each["fix"]]
    show(pump, text)
    found = pump.about("textDocument/codeAction", URI, context={"diagnostics": [], "only": ["quickfix"]}, range={
        "start": {"line": 0, "character": 0}, "end": {"line": 999, "character": 0}})
    offered = [(each["diagnostics"][0]["code"], edited(text, edits_in(each["edit"])[URI]), each.get("isPreferred", False))
               for each in found if "diagnostics" in each]
    assert len(findings) >= 5
    same(offered, [(each["code"], corrected(text, each["fix"]["edits"]), each["fix"]["certainty"] == "certain")
                   for each in findings], "offers")


def test_utf_8_edits():
    capabilities = {**CAPABILITIES, "general": {"positionEncodings": ["utf-8"]}}
    text = PUMP.replace("Name=Host", "Name=\u03b1\U0001d50a").replace("Locator=Host", "Locator=\u03b1\U0001d50a")
    with Client(capabilities=capabilities) as client:
        client.open(URI, text)
        where = position(text, text.index("\u03b1"), "utf-8")
        change = at(client, "textDocument/rename", where, newName="Node")
        assert edited(text, edits_in(change)[URI], "utf-8") == PUMP.replace("=Host", "=Node")
