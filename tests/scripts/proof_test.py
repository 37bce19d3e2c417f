"""Test what script/proof records."""

import json

from scripts import script

PROOF = script("proof")


def test_what_is_done_counts_for_its_sources_only(directory, monkeypatch):
    """Portions of other sources, and of steps that no longer exist, are not counted."""
    monkeypatch.setattr(PROOF, "DONE", directory / "done.jsonl")
    assert PROOF.recorded("now")["sources"] == {}
    records = [{"step": step, "portion": portion, "sources": sources}
               for step, portion, sources in (("sources", 3, "now"), ("sources", 4, "before"), ("gone", 0, "now"))]
    PROOF.DONE.write_text("".join(json.dumps(record) + "\n" for record in records))
    done = PROOF.recorded("now")
    assert [list(done[name]) for name in ("sources", "check")] == [[3], []]


def test_portions_add_up():
    """Every step has whole portions. If it has several, its command contains the number of the portion."""
    for name, step in PROOF.STEPS.items():
        assert step.portions * step.portion == step.total, name
        assert step.portions == 1 or "{portion}" in step.command or name == "mutants", name


def test_failure_is_not_recorded(directory, monkeypatch, capsys):
    """The next run tries it again. The output is shown."""
    monkeypatch.setattr(PROOF, "PLACE", directory)
    monkeypatch.setattr(PROOF, "DONE", directory / "done.jsonl")
    steps = {"good": PROOF.Step("", "", 2, 1, "echo {portion} passed"), "bad": PROOF.Step("", "", 1, 1, "echo broken; false")}
    monkeypatch.setattr(PROOF, "STEPS", steps)
    assert not PROOF.run("bad", 0, "now")
    assert "failed with status 1: broken" in capsys.readouterr().out
    assert PROOF.run("good", 1, "now")
    assert PROOF.recorded("now")["good"][1]["said"] == "1 passed"
    assert PROOF.recorded("now")["bad"] == {}
