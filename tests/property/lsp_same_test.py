"""Test that `cdef lsp` shows the findings of `cdef check` for many sources, at the right positions, whatever edits led
to the text.

The sources are generated, correct and mutated, with letters of several scripts and all kinds of ends of lines added.
Positions are computed independently here, from the protocol and from the bytes that `cdef check --format json`
reports.
"""

import json
import random
import subprocess

import pytest

import generate_sources
from compare import none
from lsp_client import CAPABILITIES, Client, position, units
from programs import PROGRAMS

COUNT = 400  # sources that all groups make together; script/proof asks for more
SANITIZED_COUNT = 100
GROUPS = 4
LETTERS = ("\u03b1\u03b2", "e\u0301", "\U0001d50a", "\u00e4", "\u4e2d", "\u200b", "\U0001f600")
ENDS = ("\r\n", "\r")


def numbers(group):
    """The numbers of a group's sources."""
    count = PROGRAMS.cases or (SANITIZED_COUNT if PROGRAMS.sanitizers else COUNT)
    return range(PROGRAMS.round * count + group, (PROGRAMS.round + 1) * count, GROUPS)


def source(seed):
    """A generated text with letters of other scripts and other ends of lines."""
    chooser = random.Random(seed)
    text = generate_sources.source(seed)[0]
    if seed % 2:
        text = generate_sources.mutation(seed, text)
    text = text.decode(errors="replace").replace("\0", "?")
    for _ in range(chooser.randrange(6)):
        at = chooser.randrange(len(text) + 1)
        text = text[:at] + chooser.choice(LETTERS + ENDS) + text[at:]
    return text.replace("\n", "\r\n") if seed % 7 == 0 else text


def characters(text, found):
    """The begin and end, in characters of the text, of a finding of cdef check."""
    raw, line = text.encode(), found.get("physical_line") or found["line"] or 0
    if line == 0:
        return 0, 0
    lines = raw.split(b"\n")
    begin = sum(len(each) + 1 for each in lines[:line - 1])
    column = found.get("physical_column") or found["column"]
    if column is None:
        bare = lines[line - 1].lstrip(b" \t")
        begin += len(lines[line - 1]) - len(bare)
        end = begin + len(bare.rstrip(b" \t\r"))
    else:
        begin += column - 1
        end = begin + found["length"]
    return len(raw[:begin].decode(errors="ignore")), len(raw[:end].decode(errors="ignore"))


def within_end(text, at):
    """If a place is between a carriage return and its newline, the place before both; otherwise the place itself."""
    return at - 1 if text[at - 1:at + 1] == "\r\n" else at


def expected(text, found, encoding):
    """The diagnostic that corresponds to a finding."""
    start, end = (position(text, within_end(text, at), encoding) for at in characters(text, found))
    return {"range": {"start": start, "end": end}, "severity": 1 if found["severity"] == "error" else 2,
            "code": found["code"], "source": "cdef", "message": found["message"], "data": {"name": found["name"]}}


def checked(directory, texts):
    """The findings of cdef check for each text."""
    paths = []
    for seed, text in texts.items():
        (directory / f"{seed}.cdefsrc").write_bytes(text.encode())
        paths.append(f"{seed}.cdefsrc")
    done = subprocess.run([PROGRAMS.cdef, "check", "--format", "json", *paths], cwd=directory, capture_output=True,
                          timeout=600, check=False)
    return {seed: each["findings"] for seed, each in zip(texts, json.loads(done.stdout)["sources"])}


def shown(client, uri, version):
    """Diagnostics without the members that refer to notes."""
    return [{key: value for key, value in each.items() if key != "relatedInformation"}
            for each in client.diagnostics(uri, version)]


@pytest.mark.slow(20)
@pytest.mark.parametrize("group", range(GROUPS))
def test_findings_are_those_of_check(directory, group):
    """The same findings in the same order. Notes are related places."""
    encoding = ("utf-16", "utf-8")[group % 2]
    texts, wrong = {seed: source(seed) for seed in numbers(group)}, []
    with Client(capabilities={**CAPABILITIES, "general": {"positionEncodings": [encoding]}}) as client:
        for seed, findings in checked(directory, texts).items():
            uri = f"file:///no/{seed}.cdefsrc"
            client.open(uri, texts[seed])
            found = client.diagnostics(uri)
            if shown(client, uri, 1) != [expected(texts[seed], each, encoding) for each in findings]:
                wrong.append(seed)
            notes = [[note["message"] for note in each.get("relatedInformation", [])] for each in found]
            if notes != [[note["message"] for note in each["notes"]] for each in findings]:
                wrong.append(seed)
            client.notify("textDocument/didClose", textDocument={"uri": uri})
    none(wrong)


def place_of(chooser, text, at, encoding):
    """A position that means this place. Often it is one that does not exist: after the end of the line or of the text, or
    inside the character that begins here."""
    where = position(text, at, encoding)
    next_one = text[at:at + 1]
    if chooser.randrange(3):
        return where
    if not next_one and chooser.randrange(2):
        return {"line": where["line"] + chooser.randrange(1, 9), "character": chooser.randrange(9)}
    if next_one in ("", "\r", "\n"):
        return {**where, "character": where["character"] + chooser.choice((1, 9, 2**31 - 1 - where["character"]))}
    inside = units(next_one, encoding) - 1
    return {**where, "character": where["character"] + chooser.randrange(inside + 1)}


# Nothing of a message with such a change is applied.
REVERSED = {"range": {"start": {"line": 1, "character": 0}, "end": {"line": 0, "character": 9}}, "text": "x"}


def edit(chooser, text, encoding):
    """A change, and the text that results from it. Its range never ends before it begins, which would be malformed. No
    position is between a carriage return and its newline, but a change may bring the two together."""
    begin, end = sorted(within_end(text, chooser.randrange(len(text) + 1)) for _ in range(2))
    end = within_end(text, min(end, begin + chooser.randrange(40)))
    end = max(begin, end)
    newlines = [at for at, letter in enumerate(text) if letter == "\n"]
    if newlines and chooser.randrange(8) == 0:
        begin = end = within_end(text, chooser.choice(newlines))
    new = chooser.choice(("", "\n", "\r", "\r\n", "\t", "=", "\"", "Id", *LETTERS, text[begin:end] * 2, text[:30]))
    places = (place_of(chooser, text, begin, encoding), place_of(chooser, text, end, encoding))
    start, stop = sorted(places, key=lambda place: (place["line"], place["character"]))
    change = {"range": {"start": start, "end": stop}, "text": new}
    return change, text[:begin] + new + text[end:]


@pytest.mark.slow(20)
@pytest.mark.parametrize("group", range(GROUPS))
def test_edits_end_in_the_state_of_a_fresh_open(group):
    """After many changes, the findings are those of the resulting text."""
    encoding, wrong = ("utf-16", "utf-8")[group % 2], []
    sequences = [seed for count, seed in enumerate(numbers(group)) if count % 5 < 2]
    with Client(capabilities={**CAPABILITIES, "general": {"positionEncodings": [encoding]}}) as client:
        for seed in sequences:
            chooser, text = random.Random(seed), source(seed)[:1500]
            edited, fresh = f"file:///no/{seed}.cdefsrc", f"file:///no/{seed}-fresh.cdefsrc"
            client.open(edited, text)
            for version in range(2, chooser.randrange(4, 12)):
                changes = []
                for _ in range(chooser.randrange(1, 4)):
                    change, text = edit(chooser, text, encoding)
                    changes.append(change)
                if chooser.randrange(4) == 0:
                    client.change(edited, version, changes[0], REVERSED)
                client.change(edited, version, *changes)
            client.open(fresh, text)
            same = shown(client, edited, version) == shown(client, fresh, 1)
            for method in ("semanticTokens/full", "documentSymbol", "foldingRange"):
                same = same and client.about(f"textDocument/{method}", edited) == client.about(
                    f"textDocument/{method}", fresh)
            if not same:
                wrong.append(seed)
            for uri in (edited, fresh):
                client.notify("textDocument/didClose", textDocument={"uri": uri})
    none(wrong)
