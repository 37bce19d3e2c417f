"""Test what `cdef lsp` completes."""

import re
import subprocess

import pytest

from compare import same
from lsp_client import Client, edited
from lsp_pump import PUMP, URI, actions, at, hover, labels, marked, place, show, opened  # noqa: F401 (a fixture)
from programs import PROGRAMS


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


@pytest.mark.parametrize("header", ["ClassToManagerMapping", "ResourceVariableClass", "ControlDefinition"])
def test_an_unfinished_header_becomes_one_that_takes_the_lines_below(pump, header):
    items, taken = complete(pump, PUMP.replace(header, header[:3] + "|"))
    assert labels(items) == [header] and taken(header) == PUMP


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


def test_no_stanza_is_offered_before_a_line_that_has_none(pump):
    assert complete(pump, "|\tName=x\n")[0] == []


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
                                  '\tExpression="Host == \\"Sp|eed\\""', "\tExpression=(Host == 'x'|) || Speed > 9"])
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
