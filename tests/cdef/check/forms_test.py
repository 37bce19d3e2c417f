"""Test the forms in which `cdef check` shows findings: what the text omits, its colours, and what the other forms
contain. The cases of check_test.py test which findings there are; sarif_test.py also tests SARIF."""

import json
import os
import pty
import subprocess

import pytest

from compare import same
from programs import PROGRAMS, TESTS
from summaries import FINDING

CASES = TESTS / "cdef/check"
SOUND = """\
ControlDefinition
	FileVersion=1.0.0.0
ResourceClass
	Description=1
	DisplayName=2
	Properties=HasResources
	ClassPermTemplate=0
	ResourcePermTemplate=0
	Name=Pump
ClassToManagerMapping
	ResourceManager=M
	FirstKey=1
	LastKey=2
	MessageCatalog=m
	DescriptiveMessageSet=1
"""
ATTRIBUTE = """\
PersistentResourceAttribute
	Name={0}
	Description=1
	DisplayName=1
	Id={1}
	DataType=Int32
	VarietyRange=1,1
"""


@pytest.fixture
def check(directory):
    """Runs a check of a text; the status, standard output and the lines of standard error."""

    def run(text, *options, name="a.cdefsrc"):
        (directory / name).write_text(text)
        command = [PROGRAMS.cdef, "check", *options, name]
        result = subprocess.run(command, cwd=directory, capture_output=True, text=True, timeout=60)
        return result.returncode, result.stdout, result.stderr

    return run


def kinds(text):
    """E for each error and W for each warning, in their order."""
    return "".join(kind[0].upper() for _, kind in FINDING.findall(text))


WARNINGS = SOUND + "".join(ATTRIBUTE.format(f"Name{number}", f"0{number:o}") for number in range(100, 210))
ERRORS = "".join(f"Nonsense{number}\n" for number in range(30))


def test_most(check):
    """At most a hundred findings are shown, warnings only if there are fewer errors. All findings are counted."""
    status, _, text = check(WARNINGS)
    same((status, kinds(text)), (0, 100 * "W"), "status and kinds")
    assert text.endswith("\n0 errors and 110 warnings; 10 not shown (--max 0 shows all)\n")
    status, _, text = check(WARNINGS + ERRORS)
    same((status, kinds(text)), (1, 70 * "W" + 30 * "E"), "with errors")
    assert text.endswith("\n30 errors and 110 warnings; 40 not shown (--max 0 shows all)\n")


def test_max(check):
    """Another number, or all. The status depends on hidden findings too."""
    same(kinds(check(WARNINGS + ERRORS, "--max", "20")[2]), 20 * "E", "20")
    same(kinds(check(WARNINGS + ERRORS, "--max", "0")[2]), 110 * "W" + 30 * "E", "all")
    warnings = check(WARNINGS, "--max", "1", "--werror")
    same((warnings[0], kinds(warnings[2])), (1, "W"), "--werror")
    same(check(SOUND, "--max", "-1")[0], 2, "less than none")


def test_quiet(check):
    """Errors only, without a summary; warnings still count."""
    status, _, text = check(WARNINGS + ERRORS, "-q", "--max=0")
    same((status, kinds(text)), (1, 30 * "E"), "errors")
    assert "errors and" not in text
    same(check(WARNINGS, "--quiet"), (0, "", ""), "warnings")
    same(check(WARNINGS, "--quiet", "--werror"), (1, "", ""), "--werror")


def test_others_are_complete(check):
    """--max and -q affect text only."""
    for options in ((), ("--max", "1"), ("-q",)):
        for form, count in (("json", lambda text: len(json.loads(text)["sources"][0]["findings"])),
                            ("sarif", lambda text: len(json.loads(text)["runs"][0]["results"])),
                            ("gitlab", lambda text: len(json.loads(text))),
                            ("github", lambda text: text.count("\n"))):
            status, text, messages = check(WARNINGS + ERRORS, "--format", form, *options)
            same((status, count(text), messages), (1, 140, ""), f"{form} {options}")


def test_short_form(check):
    """--json is --format json."""
    same(check(WARNINGS, "--json"), check(WARNINGS, "--format", "json"), "output")
    same(check(WARNINGS, "--json", "--format", "sarif")[0], 2, "both")


def on_terminal(source, *options, **environment):
    """What a check writes to a terminal."""
    master, slave = pty.openpty()
    settings = {key: value for key, value in os.environ.items() if key not in ("NO_COLOR", "TERM")} | environment
    with os.fdopen(master, "rb", buffering=0) as screen:
        with subprocess.Popen([PROGRAMS.cdef, "check", *options, source], cwd=CASES, stderr=slave, env=settings):
            os.close(slave)
            shown = b""
            try:
                while part := screen.read(65536):
                    shown += part
            except OSError:  # how a terminal ends
                pass
    return shown.decode().replace("\r\n", "\n")


def test_colours():
    """Only on a terminal, unless an option, NO_COLOR or TERM decides otherwise."""
    source = "data-type.cdefsrc"
    plain = subprocess.run([PROGRAMS.cdef, "check", source], cwd=CASES, stderr=subprocess.PIPE).stderr.decode()
    coloured = on_terminal(source)
    assert "\x1b[1;31merror: \x1b[0m" in coloured
    assert "\x1b" not in plain
    for expected, options, environment in (
        (coloured, (), {"NO_COLOR": ""}), (coloured, (), {"TERM": "xterm"}), (plain, (), {"NO_COLOR": "1"}),
        (plain, (), {"TERM": "dumb"}), (plain, ("--color", "never"), {}),
        (coloured, ("--color=always",), {"NO_COLOR": "1", "TERM": "dumb"}),
        (coloured, ("--color", "auto"), {}),
    ):
        same(on_terminal(source, *options, **environment), expected, f"{options} {environment}")
    always = subprocess.run([PROGRAMS.cdef, "check", "--color=always", source], cwd=CASES, stderr=subprocess.PIPE)
    same(always.stderr.decode(), coloured, "not a terminal")


def test_names_are_listed_once(check):
    """Once for each list, not for each error."""
    status, _, text = check(SOUND + ATTRIBUTE.format("A", 1) + 5 * "\tZzzzzzzz=1\n" + 3 * "Zzzzzzzzz\n")
    same((status, kinds(text)), (1, 8 * "E"), "errors")
    lists = [line for line in text.splitlines() if "note: known are" in line]
    same((len(lists), len(set(lists))), (2, 2), "lists")


def test_lines_of_the_file(check):
    """If the compiler counts a long line twice, JSON has both line numbers, and the other forms have that of the file.
    """
    long_comment = 300 * "#" + "\n"
    text = long_comment + SOUND.replace("Name=Pump", "Nmae=Pump")
    line = text.splitlines().index("\tNmae=Pump") + 1
    status, shown, _ = check(text, "--json")
    warning, error = json.loads(shown)["sources"][0]["findings"]
    same((status, error["code"]), (1, "S106"), "status and code")
    same((error["line"], error["physical_line"], error["physical_column"]), (line + 1, line, 2), "lines")
    same((error["notes"][0]["line"], error["notes"][0]["physical_line"]), (line + 1, line), "lines of the note")
    same((warning["code"], warning["line"], "physical_line" in warning), ("S516", 1, False), "of the comment")
    same(error["fix"]["edits"][0]["line"], line, "line of the edit")
    assert f"::error file=a.cdefsrc,line={line},col=2," in check(text, "--format", "github")[1]
    same(json.loads(check(text, "--format", "gitlab")[1])[1]["location"]["lines"]["begin"], line, "GitLab")
    (_, result) = json.loads(check(text, "--format", "sarif")[1])["runs"][0]["results"]
    same(result["locations"][0]["physicalLocation"]["region"]["startLine"], line, "SARIF")


def test_github():
    """There is nothing but commands."""
    shown = subprocess.run([PROGRAMS.cdef, "check", "--format", "github", "disk.cdefsrc", "missing"], cwd=CASES,
                           capture_output=True, text=True)
    expected = (
        "::error file=disk.cdefsrc,line=13,col=2,endColumn=12,title=S106::"
        "Attribute name not defined in table (name/table): DispalyNamePersistentResourceAttribute"
        "%0Adid you mean `DisplayName`?\n"
        "::error file=disk.cdefsrc,line=15,col=11,endColumn=16,title=S202::Invalid data type%0Adid you mean `UInt32`?\n"
        "::error file=missing::missing: cannot open because: No such file or directory\n")
    same((shown.returncode, shown.stdout), (2, expected), "status and commands")


def test_gitlab(check):
    """The report has all required members; fingerprints differ and stay the same."""
    text = SOUND + 3 * "Nonsense\n"
    entries = json.loads(check(text, "--format", "gitlab")[1])
    for entry in entries:
        same(sorted(entry), ["check_name", "description", "fingerprint", "location", "severity"], "members")
    same([entry["severity"] for entry in entries], 3 * ["major"], "severities")
    prints = [entry["fingerprint"] for entry in entries]
    same(len(set(prints)), 3, "different ones")
    moved = json.loads(check("\n\n" + text, "--format", "gitlab")[1])
    same([entry["fingerprint"] for entry in moved], prints, "after lines have moved")
    assert [entry["location"]["lines"]["begin"] for entry in moved] != [
        entry["location"]["lines"]["begin"] for entry in entries]
