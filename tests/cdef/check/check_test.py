"""Test what `cdef check` says of a source: one source, one expectation beside it, in the notation of expectation.py.

A case is NAME.cdefsrc with NAME.expect, whose keys and blocks are

    args:      options
    status:    exit status (default 0)
    stdin:     yes: the source is also checked as standard input
    stdout:    what is printed there, and
    stderr:    there, without the summary that follows findings
"""

import shlex
import subprocess

import pytest

from compare import same
from expectation import Expectation
from programs import PROGRAMS, PROJECT, TESTS
from summaries import with_summary

CASES = TESTS / "cdef/check"


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
    """The findings in a source, given by name and as standard input."""
    said = expected_of(CASES / f"{name}.expect")
    args, source = shlex.split(said.get("args")), CASES / f"{name}.cdefsrc"
    expected = (int(said.get("status", "0")), said.get("stdout"), with_summary(said.get("stderr")))
    same(run(args, source), expected, "status, standard output, standard error")
    if said.has("stdin"):
        named = tuple(each.replace(f"{source.name}:", "-:") if isinstance(each, str) else each for each in expected)
        same(run(args, source, source.read_bytes()), named, "as standard input: status, output, error")


def test_document():
    """The example in docs/check.md. (Unit tests compare docs/messages.md with the tables.)"""
    example = with_summary(expected_of(CASES / "disk.expect").get("stderr"))
    assert f"```\n{example}```\n" in (PROJECT / "docs/check.md").read_text()
