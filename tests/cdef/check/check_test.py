"""Test what `cdef check` says of a source: one source, one expectation beside it, in the notation of expectation.py.

A case is NAME.cdefsrc with NAME.expect, whose keys and blocks are

    args:      options
    status:    exit status (default 0)
    stdin:     yes: the source is also checked as standard input
    stdout:    what is printed there, and
    stderr:    there
"""

import re
import shlex
import subprocess

import pytest

from compare import none, same
from expectation import Expectation
from programs import PROGRAMS, PROJECT, TESTS

CASES = TESTS / "cdef/check"
TABLE = "src/check/warnings/registry.cpp"
WARNING_ROW = re.compile(r'\{[A-Z_]+, "(S\d{3})", "([a-z-]+)",\s*"((?:[^"\\]|\\.)+)"\}')


def expected_of(path):
    """An expectation of `cdef check`."""
    return Expectation(path, ("args", "status", "stdin"), ("stdout", "stderr"))


def run(args, source, stdin=None):
    """Status and both streams of a check."""
    command = [PROGRAMS.cdef, "check", *args, source.name if stdin is None else "-"]
    result = subprocess.run(command, cwd=source.parent, input=stdin or b"", capture_output=True, timeout=60)
    return result.returncode, result.stdout.decode(), result.stderr.decode()


@pytest.mark.parametrize("name", sorted(path.stem for path in CASES.glob("*.expect")))
def test_case(name):
    """What is said of a source, by its name and as standard input."""
    said = expected_of(CASES / f"{name}.expect")
    args, source = shlex.split(said.get("args")), CASES / f"{name}.cdefsrc"
    expected = (int(said.get("status", "0")), said.get("stdout"), said.get("stderr"))
    same(run(args, source), expected, "status, standard output, standard error")
    if said.has("stdin"):
        named = tuple(each.replace(f"{source.name}:", "-:") if isinstance(each, str) else each for each in expected)
        same(run(args, source, source.read_bytes()), named, "as standard input: status, output, error")


def table_rows(root):
    """Codes, names and titles of the table of warnings."""
    return WARNING_ROW.findall((root / TABLE).read_text())


def check_tables(root):
    """What the document and the table of warnings do not agree on."""
    warnings = table_rows(root)
    document = (root / "docs/messages.md").read_text()
    sections = {part[:4]: part for part in re.split(r"^### ", document, flags=re.M)}
    problems = []
    for code, text, *_ in warnings:
        section = sections.get(code, "")
        if f"`{text.strip()}" not in section:
            problems.append(f"docs/messages.md: {code} does not show {text!r}")
        if "**Cause**" not in section or "**Cure**" not in section:
            problems.append(f"docs/messages.md: {code} has no cause or no cure")
    for code in sections.keys() - {row[0] for row in warnings}:
        if re.match(r"S5", code):
            problems.append(f"docs/messages.md: {code} is in no table")
    codes = [row[0] for row in warnings]
    problems += [f"{code} is given twice" for code in set(codes) if codes.count(code) > 1]
    example = expected_of(CASES / "disk.expect").get("stderr")
    if f"```\n{example}```\n" not in (root / "docs/check.md").read_text():
        problems.append("docs/check.md: the example is not what tests/cdef/check/disk.expect says")
    if len(warnings) < 20:
        problems.append("the table has not been found")
    return problems


def test_messages():
    """docs/messages.md explains each warning; a unit test compares it with the table of errors."""
    none(check_tables(PROJECT))
