"""Test what `cdef lsp` finds and renames."""

import subprocess

import pytest

from compare import same
from lsp_client import ServerError, edited, edits_in, part
from lsp_pump import PUMP, URI, at, compiled, place, show, opened  # noqa: F401 (a fixture)
from programs import PROGRAMS


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
    ("Name=Ho|st", "", "not a name"), ("Name=St|op", "a\nb", "not a name"), ("Name=Ho|st", "Speed ", "expression"),
    ("Name=St|op", "a\\", "cannot have"), ("Name=St|op", " a", "S"),
])
def test_rename_that_would_harm_is_refused(pump, words, new, why):
    with pytest.raises(ServerError) as refused:
        rename(pump, words, new)
    assert refused.value.code == -32803
    assert why in str(refused.value)


def test_name_of_a_class_is_for_others(pump):
    assert at(pump, "textDocument/prepareRename", place(PUMP, "Name=Pu|mp")) is None
