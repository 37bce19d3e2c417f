"""Test what script/proof records."""

import json
import subprocess

from scripts import script

PROOF = script("proof")


def recorded(sources):
    """What is recorded for these sources."""
    return PROOF.recorded(dict.fromkeys(PROOF.STEPS, sources))


def test_what_is_done_counts_for_its_sources_only(directory, monkeypatch):
    """Portions of other sources, and of steps that no longer exist, are not counted."""
    monkeypatch.setattr(PROOF, "DONE", directory / "done.jsonl")
    assert recorded("now")["sources"] == {}
    records = [{"step": step, "portion": portion, "sources": sources}
               for step, portion, sources in (("sources", 3, "now"), ("sources", 4, "before"), ("gone", 0, "now"))]
    PROOF.DONE.write_text("".join(json.dumps(record) + "\n" for record in records))
    done = recorded("now")
    assert [list(done[name]) for name in ("sources", "check")] == [[3], []]


def test_only_the_sources_of_a_step_count(directory, monkeypatch):
    """Other changes do not: what was run remains."""
    def git(*words):
        subprocess.run(["git", "-c", "user.name=x", "-c", "user.email=x", *words], cwd=directory, check=True,
                       stdout=subprocess.DEVNULL)

    monkeypatch.setattr(PROOF, "PROJECT", directory)
    (directory / "mine.cpp").write_text("1")
    (directory / "other.cpp").write_text("1")
    git("init", "-q")
    git("add", ".")
    git("commit", "-q", "-m", "x")
    step = PROOF.Step("", "", 1, 1, "", ("mine.cpp",))
    before = PROOF.version(step)
    (directory / "other.cpp").write_text("2")
    assert PROOF.version(step) == before
    (directory / "mine.cpp").write_text("2")
    changed = PROOF.version(step)
    git("commit", "-q", "-a", "-m", "y")
    assert len({before, changed, PROOF.version(step)}) == 3


def test_every_directory_exists():
    """Otherwise changes would go unnoticed."""
    for step in PROOF.STEPS.values():
        assert all((PROOF.PROJECT / each).is_dir() for each in step.sources)


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
    assert recorded("now")["good"][1]["said"] == "1 passed"
    assert recorded("now")["bad"] == {}


def test_verdict_is_given_with_the_last_portion(directory, monkeypatch, capsys):
    """Earlier portions are too few to be judged. A step whose verdict is bad is not complete."""
    monkeypatch.setattr(PROOF, "PLACE", directory)
    monkeypatch.setattr(PROOF, "DONE", directory / "done.jsonl")
    monkeypatch.setattr(PROOF, "STEPS", {"step": PROOF.Step("", "", 2, 1, "echo tried", verdict="echo too few; false")})
    assert PROOF.run("step", 0, "now")
    assert not PROOF.run("step", 1, "now")
    assert "failed with status 1: too few" in capsys.readouterr().out
    assert list(recorded("now")["step"]) == [0]
