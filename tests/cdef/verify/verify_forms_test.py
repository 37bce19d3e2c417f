"""Test the forms of `cdef verify` that other programs read: SARIF, GitHub's commands, GitLab's report.

small.image says what is where: its class record is at 144, and the number of its persistent attributes 172 bytes further.
"""

import json
import subprocess

import jsonschema
import pytest

from compare import same
from programs import PROGRAMS, TESTS

WRONG = "broken/CDB301-class.little.cdef"
WRONG_TEXT = "section 0, rsrc_class_t 0, rc_cb_ID at offset 144: wrong record identifier: found 0x43444230, expected 0x43444231"
CARELESS = "cut_short.little.cdef"
CARELESS_TEXT = (
    "section 0, rsrc_pattr_t 0, u_ra_valid_vals at offset 384: "
    "attribute cut short by a new class: the valid values are not its own: found 0, expected in 0 bytes"
)
COUNT_TEXT = "section 0, rsrc_class_t 0, rc_num_pattrs at offset 316: contradicts the rest of the file: found 3, expected 2"
SCHEMA = jsonschema.Draft7Validator(json.loads((TESTS / "cdef/sarif_schema.json").read_text()))


def verify(form, *operands):
    """Status and output of `cdef verify`, run among the images."""
    result = subprocess.run([PROGRAMS.cdef, "verify", "--format", form, *operands], cwd=PROGRAMS.images,
                            capture_output=True, timeout=60)
    return result.returncode, result.stdout.decode()


def sarif(*operands):
    """The run of a log, which follows the schema."""
    log = json.loads(verify("sarif", *operands)[1])
    same([f"{each.json_path}: {each.message}" for each in SCHEMA.iter_errors(log)], [], "against the schema")
    return log["runs"][0]


@pytest.fixture(name="count")
def wrong_count(tmp_path):
    """A count that is too large by one displaces everything after it."""
    data = bytearray((PROGRAMS.images / "small.little.cdef").read_bytes())
    data[316] = 3
    (tmp_path / "count.cdef").write_bytes(data)
    return tmp_path / "count.cdef"


def consequences(path):
    """How many findings follow from the first one."""
    data = subprocess.run([PROGRAMS.cdef, "verify", "--json", path], capture_output=True, timeout=60).stdout
    return len(json.loads(data)["files"][0]["findings"]) - 1


def test_github(count):
    """A line for each cause, and for each file that cannot be read."""
    wrong = f"::error file={WRONG},title=CDB301::{WRONG_TEXT}\n"
    careless = f"::warning file={CARELESS},title=CDB353::{CARELESS_TEXT}\n"
    same(verify("github", WRONG, CARELESS, "small.little.cdef"), (1, wrong + careless), "two")
    same(verify("github", "-q", CARELESS), (0, ""), "quiet")
    same(verify("github", "none.cdef"), (2, "::error file=none.cdef::none.cdef: No such file or directory\n"), "unread")
    follow = f"{consequences(count)} findings follow from this one"
    same(verify("github", count)[1], f"::error file={count},title=CDB108::{COUNT_TEXT}%0A{follow}\n", "cause")


def test_github_with_all(count):
    """A line for each finding."""
    lines = verify("github", "--all", count)[1].splitlines()
    same((len(lines), lines[0]), (consequences(count) + 1, f"::error file={count},title=CDB108::{COUNT_TEXT}"), "all")


def test_gitlab(count):
    """An entry for each cause, at line 1, because a database has no lines."""
    status, text = verify("gitlab", WRONG, CARELESS, count, "none.cdef")
    entries = json.loads(text)
    wrong = {"description": WRONG_TEXT, "check_name": "CDB301", "fingerprint": entries[0]["fingerprint"], "severity": "major",
             "location": {"path": WRONG, "lines": {"begin": 1}}}
    same((status, entries[0]), (2, wrong), "first")
    same([each["severity"] for each in entries], ["major", "minor", "major", "blocker"], "severities")
    assert entries[2]["description"].endswith(f"; {consequences(count)} findings follow from this one")
    same(verify("gitlab", "small.little.cdef"), (0, "[]\n"), "sound")


def test_fingerprints(count):
    """They differ from each other, and stay the same for the same mistake."""
    made = [each["fingerprint"] for each in json.loads(verify("gitlab", "--all", count)[1])]
    same(len(set(made)), len(made), "different")
    same(json.loads(verify("gitlab", "--all", count, WRONG)[1])[: len(made)], json.loads(verify("gitlab", "--all", count)[1]), "same")


def test_sarif():
    """It has offsets instead of lines, and explains the rules."""
    run = sarif(WRONG, CARELESS)
    rules = run["tool"]["driver"]["rules"]
    same(run["tool"]["driver"]["name"], "cdef verify", "tool")
    one, other = run["results"]
    place = {"physicalLocation": {"artifactLocation": {"uri": WRONG}, "region": {"byteOffset": 144}}}
    same((one["ruleId"], one["level"], one["message"], one["locations"]), ("CDB301", "error", {"text": WRONG_TEXT}, [place]))
    same((other["ruleId"], other["level"]), ("CDB353", "warning"), "warning")
    for result in run["results"]:
        rule = rules[result["ruleIndex"]]
        same((rule["id"], rule["defaultConfiguration"]["level"]), (result["ruleId"], result["level"]), "rule")
        assert rule["fullDescription"]["text"] in rule["help"]["text"] != ""
    same(len({rule["id"] for rule in rules}), len(rules), "rules")


def test_sarif_folds_consequences(count):
    """They are related locations, not results."""
    (result,) = sarif(count)["results"]
    same((result["ruleId"], result["message"]["text"]), ("CDB108", COUNT_TEXT), "cause")
    same(len(result["relatedLocations"]), consequences(count), "consequences")


def test_sarif_of_files_that_cannot_be_read():
    """They are not reported as results."""
    run = sarif(WRONG, "none.cdef")
    (invocation,) = run["invocations"]
    same((len(run["results"]), invocation["executionSuccessful"]), (1, False), "invocation")
    same([each["message"]["text"] for each in invocation["toolExecutionNotifications"]],
         ["none.cdef: No such file or directory"], "notifications")


def test_sarif_of_all_images():
    """The log follows the schema whatever is wrong."""
    images = sorted(str(path.relative_to(PROGRAMS.images)) for path in PROGRAMS.images.rglob("*.cdef"))
    assert len(sarif(*images)["results"]) > 50
