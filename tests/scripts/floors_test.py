"""Test that the libraries of src/ use only those below them, and that script/floors finds what breaks this rule."""

import importlib.machinery
import importlib.util
import subprocess
import sys

import pytest
from programs import PROGRAMS, PROJECT

SCRIPT = PROJECT / "script/floors"


@pytest.fixture(scope="module")
def floors():
    """The script as a module."""
    loader = importlib.machinery.SourceFileLoader("floors", str(SCRIPT))
    module = importlib.util.module_from_spec(importlib.util.spec_from_loader("floors", loader))
    loader.exec_module(module)
    return module


def library(directory, folder, **sources):
    """A static library as a build leaves it: in src/FOLDER, with its object files beside it."""
    place = directory / "src" / folder
    objects = place / "CMakeFiles" / f"{folder}.dir"
    objects.mkdir(parents=True)
    for name, text in sources.items():
        (place / f"{name}.cpp").write_text(text)
        subprocess.run(["c++", "-c", "-o", objects / f"{name}.cpp.o", place / f"{name}.cpp"], check=True)
    made = place / f"lib{folder}.a"
    subprocess.run(["ar", "rc", made, *objects.glob("*.o")], check=True)
    return made


def test_floors_are_as_they_should_be():
    if PROGRAMS.sanitizers:
        pytest.skip("everything needs the sanitizer's library there")
    less = ["--no-circles"] if PROGRAMS.is_on("CDGEN_TOGETHER") else []  # script/lint looks for them in another build
    command = [sys.executable, "-B", SCRIPT, PROGRAMS.build, *less]
    run = subprocess.run(command, capture_output=True, text=True, check=False)
    assert (run.returncode, run.stdout, run.stderr) == (0, "", "")


def test_circle_is_found(floors):
    arrows = {"a": {"b"}, "b": {"c"}, "c": {"a"}, "alone": {"a"}}
    assert floors.circles_in(arrows) == [["a", "b", "c"]]


def test_chain_is_no_circle(floors):
    assert floors.circles_in({"a": {"b"}, "b": {"c"}, "c": set()}) == []


def test_arrows_follow_symbols(floors, directory, monkeypatch):
    monkeypatch.setattr(floors, "ROOT", directory)
    made = library(directory, "low", up="int down(); int up() { return down(); }", down="int down() { return 1; }")
    assert floors.arrows_of(made) == {"up.cpp": {"down.cpp"}, "down.cpp": set()}


def test_object_of_a_removed_source_counts_no_more(floors, directory, monkeypatch):
    monkeypatch.setattr(floors, "ROOT", directory)
    made = library(directory, "low", up="int down(); int up() { return down(); }", down="int down() { return 1; }")
    (directory / "src/low/up.cpp").unlink()
    assert floors.arrows_of(made) == {"down.cpp": set()}


def test_sources_with_one_object_file_are_refused(floors, directory, monkeypatch):
    monkeypatch.setattr(floors, "ROOT", directory)
    made = library(directory, "low", unity_0="int down() { return 1; } int up() { return down(); }")
    with pytest.raises(SystemExit, match="several sources have one object file"):
        floors.arrows_of(made)


def test_missing_symbol_is_found(floors, directory):
    made = library(directory, "low", user="int upstairs(); int low() { return upstairs(); }")
    problems = floors.link_problems(directory, "low", [], {"low": made})
    assert problems == ["low/ needs upstairs(), which no floor below it has"]


def test_symbol_of_a_lower_floor_is_found(floors, directory):
    low = library(directory, "low", low="int low() { return 1; }")
    high = library(directory, "high", high="int low(); int high() { return low(); }")
    assert floors.link_problems(directory, "high", ["low"], {"low": low, "high": high}) == []


def test_include_of_a_higher_floor_is_found(floors, monkeypatch, directory):
    (directory / "src/text").mkdir(parents=True)
    (directory / "src/text/low.h").write_text('#include "cdef/high.h"\n#include "text/other.h"\n')
    monkeypatch.setattr(floors, "ROOT", directory)
    assert list(floors.wrong_includes("text", [])) == [
        "src/text/low.h includes cdef/, which is no floor below text/"
    ]


def test_subcommand_that_knows_another_is_found(floors, monkeypatch, directory):
    (directory / "src/cdef/dump").mkdir(parents=True)
    (directory / "src/cdef/dump/a.cpp").write_text('#include "cdef/dump/a.h"\n#include "cdef/support/b.h"\n')
    (directory / "src/cdef/dump/c.cpp").write_text('#include "cdef/source/d.h"\n')
    monkeypatch.setattr(floors, "ROOT", directory)
    assert list(floors.acquainted_subcommands()) == [
        "src/cdef/dump/c.cpp includes cdef/source/: subcommands do not know each other"
    ]
