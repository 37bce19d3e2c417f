"""Test that nothing that `cdef lsp` offers makes a source worse: every code action of every line, every stanza that is
completed where a stanza may be, and values that are completed.

The sources are the class of `docs/language.md`, the examples, the cases of `golden` and of `cdef/check`, and generated
ones. "Worse" means: more errors or, with as many errors, more warnings.
"""

import pathlib
import random
import re

import pytest

import generate_sources
from compare import none
from lsp_client import CAPABILITIES, Client, edited, edits_in
from programs import PROGRAMS

GROUPS = 4
COUNT = 24  # sources that all groups look at
SANITIZED_COUNT = 12
LINES_MAX = 400
# Nothing can use a variable class that has just been added, a class after an attribute always cuts it short, and if all
# dynamic attributes of the class have a Range, each one of resources gets in its way.
UNAVOIDABLE = ("S530", "S514", "S503")
# After a number has overflowed, each 0 in a new stanza is an error. In the other two, a new stanza completes one whose error
# nothing reports as long as it is the last.
BRITTLE = ("negative-float-overflow-accepted.cdefsrc", "values-narrowed.cdefsrc", "control-definition-only.cdefsrc",
           "sbs-attributes-flushed.cdefsrc")
# ReqdForDefine saves the attribute from a default that is not allowed.
SAVED = "invalid-default.cdefsrc"
# Another value may contradict other lines. It must not break its own, nor be a name that nothing has.
BROKEN_LINE = ("S101", "S103", "S104", "S106", "S504", "S505", "S520", "S522", "S533")
ROOT = pathlib.Path(__file__).parents[2]
FOLDERS = ("examples", "tests/golden", "tests/cdef/check")
PLAIN = {key: value for key, value in CAPABILITIES.items() if key != "textDocument"}
PLAIN["textDocument"] = {"codeAction": CAPABILITIES["textDocument"]["codeAction"]}


def texts():
    """name -> text: all files, in an order that looks random, and as many generated sources."""
    paths = sorted(path for folder in FOLDERS for path in (ROOT / folder).rglob("*.cdefsrc"))
    random.Random(1).shuffle(paths)
    manual = (ROOT / "docs/language.md").read_bytes()
    yield "language.md", re.search(rb"## A whole class.*?```\n(.*?)```", manual, re.S).group(1)
    for number, path in enumerate(paths):
        yield path.name, path.read_bytes()
        if number % 4 == 0:
            yield f"generated {number}", generate_sources.source(number)[0]


def sources(group):
    """The texts of a group. Those that are not UTF-8, are very long or have carriage returns are left out."""
    count = PROGRAMS.cases or (SANITIZED_COUNT if PROGRAMS.sanitizers else COUNT)
    taken = 0
    for number, (name, raw) in enumerate(texts()):
        if number % GROUPS != group or b"\0" in raw or b"\r" in raw or raw.count(b"\n") > LINES_MAX:
            continue
        try:
            yield name, raw.decode()
        except UnicodeDecodeError:
            continue
        taken += GROUPS
        if taken >= count:
            return


class Judge:
    """Compares texts by their findings."""

    def __init__(self, client, unavoidable=(), counted=None):
        self.client, self.unavoidable, self.counted, self.known, self.number = client, unavoidable, counted, {}, 0

    def badness(self, text):
        """(errors, warnings)"""
        if text not in self.known:
            self.number += 1
            uri = f"file:///judged/{self.number}.cdefsrc"
            self.client.open(uri, text)
            severities = [each["severity"] for each in self.client.diagnostics(uri)
                          if each["code"] not in self.unavoidable and each["code"] in (self.counted or each["code"])]
            self.client.notify("textDocument/didClose", textDocument={"uri": uri})
            self.known[text] = (severities.count(1), severities.count(2))
        return self.known[text]


@pytest.mark.slow(20)
@pytest.mark.parametrize("group", range(GROUPS))
def test_actions_make_nothing_worse(group):
    worse = []
    with Client() as client:
        judge = Judge(client)
        for name, text in sources(group):
            uri = "file:///offers.cdefsrc"
            client.open(uri, text)
            for line in range(len(text.split("\n"))):
                where = {"line": line, "character": 0}
                offered = client.about("textDocument/codeAction", uri, range={"start": where, "end": where},
                                       context={"diagnostics": []})
                for action in offered:
                    if "diagnostics" not in action:
                        after = edited(text, edits_in(action["edit"])[uri])
                        if judge.badness(after) > judge.badness(text):
                            worse.append((name, line, action["title"], judge.badness(text), judge.badness(after)))
            client.notify("textDocument/didClose", textDocument={"uri": uri})
    none(worse)


@pytest.mark.slow(20)
@pytest.mark.parametrize("group", range(GROUPS))
def test_stanzas_make_nothing_worse(group):
    """On a new line in front of each line, and on each header. In a source with errors, a new stanza may bring other
    errors to light."""
    worse = []
    with Client(capabilities=PLAIN) as client:
        judge = Judge(client, UNAVOIDABLE)
        for name, text in sources(group):
            uri = "file:///offers.cdefsrc"
            lines = text.split("\n")
            places = [(at, "\n".join([*lines[:at], "", *lines[at:]])) for at in range(len(lines))]
            places += [(at, text) for at, line in enumerate(lines) if line[:1].isalpha()]
            if judge.badness(text)[0] > 0 or name in BRITTLE:
                continue
            client.open(uri, text)
            for at, (line, here) in enumerate(places, 2):
                client.change(uri, at, here)
                for item in client.at("textDocument/completion", uri, line, 0):
                    after = edited(here, [item["textEdit"]])
                    if judge.badness(after) > judge.badness(here):
                        worse.append((name, line, item["label"], judge.badness(here), judge.badness(after)))
            client.notify("textDocument/didClose", textDocument={"uri": uri})
    none(worse)


def value_places(line):
    """The line, and columns in it: its beginning, and in and around its value; also with a comment after it."""
    begin = line.index("=") + 1
    for text in (line, line + "  # c"):
        columns = {begin, (begin + len(line)) // 2, len(line), max(begin, len(text) - 3)}
        yield text, [0, *sorted(columns)]


@pytest.mark.slow(20)
@pytest.mark.parametrize("group", range(GROUPS))
def test_values_break_no_line(group):
    """The first and the last item at each place of each attribute line."""
    worse = []
    with Client(capabilities=PLAIN) as client:
        judge = Judge(client, counted=BROKEN_LINE)
        for name, text in sources(group):
            uri, version, lines = "file:///offers.cdefsrc", 1, text.split("\n")
            if judge.badness(text)[0] > 0 or name in (*BRITTLE, SAVED):
                continue
            client.open(uri, text)
            for at, line in enumerate(lines):
                if not line[:1].isspace() or "=" not in line or "#" in line or not line.isascii():
                    continue
                for changed, columns in value_places(line):
                    version += 1
                    here = "\n".join([*lines[:at], changed, *lines[at + 1:]])
                    client.change(uri, version, here)
                    for column in columns:
                        items = client.at("textDocument/completion", uri, at, column)
                        for item in [*items[:1], *items[1:][-1:]]:
                            after = edited(here, [item["textEdit"]])
                            if judge.badness(after) > judge.badness(here):
                                worse.append((name, changed, column, item["label"]))
            client.notify("textDocument/didClose", textDocument={"uri": uri})
    none(worse)
