"""Test which changes script/mutate makes."""

import json

import pytest

from scripts import script

MUTATE = script("mutate")


def changes(text):
    """Every version of a text with one token changed."""
    return [MUTATE.changed(text, mutant) for mutant in MUTATE.mutants_of("x.cpp", text)]


@pytest.mark.parametrize("text, expected", [
    ("if (a == b)", ["if (a != b)"]),
    ("a <= b && c", ["a < b && c", "a <= b || c"]),
    ("f(!done)", ["f(done)"]),
    ("x = 0x0F;", ["x = 0x10;"]),
    ("x = 010;", ["x = 9;"]),
    ("i++;\nreturn true;", ["i--;\nreturn true;", "i++;\nreturn false;"]),
    ("a - b", ["a + b"]),
])
def test_changes(text, expected):
    """Operators, steps, words and numbers, one at a time."""
    assert changes(text) == expected


@pytest.mark.parametrize("text", [
    'say("a == 1")', "c = '1';", "// a == 1", "/* a\n == 1 */", "#define A 1", "std::vector<int> a;", "int *a; int &b;",
    "uint32_t a1;", "1.5f", "1'000", "static_assert(a == 1);",
])
def test_leaves_alone(text):
    """Texts, comments, types, names, and code that only the compiler evaluates."""
    assert changes(text) == []


def test_an_id_moves_with_its_line():
    """The same line further down has the same ids; a second equal line has others."""
    (one,) = MUTATE.mutants_of("x.cpp", "a == b;\n")
    moved, second = MUTATE.mutants_of("x.cpp", "\n\na == b;\na == b;\n")
    assert (moved.id, moved.line) == (one.id, 3)
    assert second.id != one.id


@pytest.mark.parametrize("verdicts, at_least, status", [
    (["killed"] * 19 + ["survived"], "95", 0),
    (["killed"] * 18 + ["survived"] * 2, "95", 1),
    (["killed"] * 18 + ["survived"] * 2, None, 0),
    (["not compiling"], "95", 0),
    ([], "95", 0),
])
def test_status(verdicts, at_least, status, directory, monkeypatch):
    """It is a failure only if a share is asked for and the tests noticed less. Before a change has been judged, there is
    no share."""
    every = list(MUTATE.mutants_of("x.cpp", "a == b;\n" * 20))
    monkeypatch.setattr(MUTATE, "mutants", lambda seed, only: every)
    monkeypatch.setattr(MUTATE, "RESULTS", directory / "results.jsonl")
    MUTATE.RESULTS.write_text("".join(json.dumps({"id": each.id, "verdict": verdict}) + "\n"
                                      for each, verdict in zip(every, verdicts)))
    monkeypatch.setattr("sys.argv", ["mutate", "--report"] + ([f"--at-least={at_least}"] if at_least else []))
    assert MUTATE.main() == status
