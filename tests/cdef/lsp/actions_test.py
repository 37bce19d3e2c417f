"""Test what `cdef lsp` corrects."""

import json
import subprocess

import pytest

from compare import same
from lsp_client import CAPABILITIES, Client, edited, edits_in, position
from lsp_pump import PUMP, URI, actions, at, show, opened  # noqa: F401 (a fixture)
from programs import PROGRAMS


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


@pytest.mark.parametrize("words, offered", [
    ("6\n|\tId=4", True), ("\tId=4|\n\tDataType=SD", True), ("6|\n\tId=4", False), ("|\tDataType=SD", False)])
def test_numbers_are_offered_from_the_beginning_to_the_end_of_their_line(pump, words, offered):
    text = PUMP.replace("Id=7", "Id=4")
    show(pump, text)
    made, _ = actions(pump, words, text, only=["quickfix"])
    assert ("Use the next free number, 5" in made) == offered


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
