"""Test which changes script/mutate makes."""

import json
import os
import pathlib
import signal
import subprocess
import sys
import time

import pytest

from programs import PROJECT, TESTS

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
    (["killed"] * 19 + ["survived"] + ["same"] * 5, "95", 0),
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


def test_tests_exist():
    """Tests, folders and unit tests that the script names."""
    names = {*MUTATE.FIRST, *MUTATE.SLOW, *(name for names, _ in MUTATE.SHOWN_BY.values() for name in names.split())}
    assert [name for name in names if not (TESTS / name).exists()] == []
    assert [folder for folder in MUTATE.SHOWN_BY if not (PROJECT / folder).is_dir()] == []


@pytest.mark.parametrize("file, folder", [
    ("src/cdef/source/range.cpp", "src/cdef/source"), ("src/check/warnings/unknown.cpp", "src/check"),
    ("src/cdef/usage.cpp", "src/cdef"), ("src/text/hex.h", "src/text"),
])
def test_folder(file, folder):
    """A library or a subcommand, whatever folders it has."""
    assert MUTATE.folder_of(file) == folder


def test_all_tests_are_run():
    """A change that all subcommands may meet is tried with all tests; one that only some meet, without the slow tests of
    the others."""
    everything = {path.relative_to(PROJECT).as_posix() for area in MUTATE.AREAS for path in (TESTS / area).rglob("*_test.py")}
    first, others, slow = MUTATE.tests_for("src/text/hex.h")
    assert {*first, *others, *slow} == everything - {"tests/golden/cross_endian_test.py"}
    likely, rest, only = MUTATE.tests_for("src/cdef/source/range.cpp")
    assert (sorted(likely), rest, only) == (sorted(first), others, ["tests/cdef/source/source_test.py"])


@pytest.mark.parametrize("file, names", [
    ("src/text/hex.h", ["first", "unit", "others", "slow"]),
    ("src/text/number.cpp", ["unit", "first", "others", "slow"]),
])
def test_order_of_stages(file, names):
    """The unit tests come first, unless much of them is compiled again."""
    assert [stage.name for stage in MUTATE.stages_for(file)] == names


@pytest.fixture
def tree(directory, monkeypatch):
    """A tree with programs that have been built, and the commands that are run in it. A command fails if it has the
    word that the test puts into the set."""
    failing, commands = set(), []
    for place in ("kept", "test"):
        for program in (*MUTATE.PROGRAMS, *MUTATE.UNIT, *MUTATE.HELPERS):
            path = directory / "build" / place / program
            path.parent.mkdir(parents=True, exist_ok=True)
            path.write_text("the same")

    def run(command, tree, *_, **variables):
        assert tree == directory
        commands.append(command.split()[0])
        return int(any(word in command for word in failing)), "FAILED tests/x_test.py::test_it - because"

    monkeypatch.setattr(MUTATE, "run", run)
    return directory, failing, commands


UNIT_COMMAND = "build/test/tests/cdgen_unit"


@pytest.mark.parametrize("renewed, fails, result, commands", [
    ([], "", ("same", ""), ["ninja"] * 3),
    (["cdef"], "", ("survived", ""), ["ninja", "ninja", "/usr/bin/python3", "ninja", "/usr/bin/python3", "/usr/bin/python3"]),
    (["cdef"], "golden", ("killed", "tests/x_test.py::test_it"), ["ninja", "ninja", "/usr/bin/python3"]),
    (["tests/cdgen_unit"], "gtest", ("killed", "tests/x_test.py::test_it"), ["ninja", UNIT_COMMAND]),
    (["tests/list_names"], "names_test", ("survived", ""), ["ninja"] * 3 + ["/usr/bin/python3"] * 2),
    ([], "ninja", ("not compiling", ""), ["ninja"]),
])
def test_verdict(tree, renewed, fails, result, commands):
    """Tests of programs that stay the same are not run, and after the change everything is as before."""
    place, failing, ran = tree
    if fails:
        failing.add(fails)
    for name in renewed:
        (place / "build/test" / name).write_text("another one")
    (place / "x.cpp").write_text("a == b;\n")
    before = (place / "x.cpp").stat().st_mtime_ns
    (mutant,) = MUTATE.mutants_of("x.cpp", "a == b;\n")
    assert MUTATE.verdict(place, mutant) == result
    assert ran == commands
    assert ((place / "x.cpp").read_text(), (place / "x.cpp").stat().st_mtime_ns) == ("a == b;\n", before)
    assert [name for name in renewed if (place / "build/test" / name).read_text() != "the same"] == []


def test_quick_verdict(tree):
    """Tests that take long are left out."""
    place, failing, ran = tree
    failing.update(["use_test", "memory_test"])
    (place / "x.cpp").write_text("a == b;\n")
    (mutant,) = MUTATE.mutants_of("x.cpp", "a == b;\n")
    for quick, expected in ((True, ("survived", "")), (False, ("killed", "tests/x_test.py::test_it"))):
        (place / "build/test/cdef").write_text("another one")
        assert MUTATE.verdict(place, mutant, quick) == expected


def test_renew(directory):
    """Files that are new, missing, or of another time or size; not those that are the same."""
    source, target = directory / "source", directory / "target"
    for place, names in ((source, ["same", "changed", "missing", "in/missing"]), (target, ["same", "changed", "new", "far/new"])):
        for name in names:
            (place / name).parent.mkdir(parents=True, exist_ok=True)
            (place / name).write_text(f"{place.name}\n")
            os.utime(place / name, (1, 1))
        (place / "link").symlink_to(place.name)
    os.utime(target / "changed", (2, 2))
    os.utime(target / "link", (2, 2), follow_symlinks=False)
    MUTATE.renew(source, target)
    found = {path.relative_to(target).as_posix(): path.read_text() for path in target.rglob("*") if path.is_file()}
    # "same" is as long and as old in both places, so its text is still the other one.
    assert found == {"same": "target\n", "changed": "source\n", "missing": "source\n", "in/missing": "source\n"}
    assert (target / "changed").stat().st_mtime == 1
    assert (target / "link").readlink() == pathlib.Path("source")
    assert not (target / "far").exists()


# Tries a change in a lane. The test of the change starts processes, two of them in sessions of their own, and writes
# down their ids.
LANE = """
import pathlib, signal, sys
from scripts import script
signal.signal(signal.SIGINT, signal.default_int_handler)  # what runs in the background may have been told to ignore it
mutate = script("mutate")
tree = pathlib.Path(sys.argv[1])
START = 'for i in 1 2; do setsid sleep 1000 & echo $! >> ids; done; sleep 1000 & echo $! >> ids; echo $$ >> ids; ' + sys.argv[2]
if sys.argv[2].startswith("read"):
    mutate.LOOK_SECONDS = mutate.IDLE_SECONDS = 0.1
def verdict(tree, mutant, quick):
    return "killed", str(mutate.run(START, tree, 1 if sys.argv[2].startswith("sleep") else 1000, 1)[0])
mutate.verdict = verdict
mutate.RESULTS = tree / "results.jsonl"
mutate.become_responsible(with_parent=False)
mutate.try_in([tree], list(mutate.mutants_of("x.cpp", "a == b;")))
"""


def alive(number):
    """Whether a process is there and has not ended."""
    try:
        return pathlib.Path(f"/proc/{number}/stat").read_text().rpartition(")")[2].split()[0] != "Z"
    except FileNotFoundError:
        return False


def begin(directory, end):
    """A script that tries a change whose test has begun: the script, and the processes of the test."""
    (directory / "build").mkdir()
    process = subprocess.Popen([sys.executable, "-B", "-c", LANE, directory, end],
                               env={**os.environ, "PYTHONPATH": str(TESTS / "support")})
    ids = directory / "ids"
    while not ids.exists() or len(ids.read_text().splitlines()) < 4:
        assert process.poll() is None
        time.sleep(0.01)
    return process, [int(line) for line in ids.read_text().splitlines()]


@pytest.mark.parametrize("end, status", [("exit 3", "3"), ("sleep 1000", "None"), ("read x < pipe", "None"),
                                         ("while :; do :; done", "-9")],
                         ids=["ended", "too-slow", "waiting", "endless"])
def test_what_a_test_started_ends(directory, end, status):
    """With the test, when its time is over, or when it only waits."""
    os.mkfifo(directory / "pipe")
    process, numbers = begin(directory, end)
    assert process.wait(60) == 0
    assert [each for each in numbers if alive(each)] == []
    assert json.loads((directory / "results.jsonl").read_text())["by"] == status


@pytest.mark.parametrize("number", [signal.SIGKILL, signal.SIGTERM, signal.SIGINT])
def test_what_the_script_started_ends(directory, number):
    """However the script ends."""
    process, numbers = begin(directory, "wait")
    process.send_signal(number)
    assert process.wait(60) != 0
    deadline = time.monotonic() + 60
    while any(map(alive, numbers)) and time.monotonic() < deadline:
        time.sleep(0.01)
    assert [each for each in numbers if alive(each)] == []
