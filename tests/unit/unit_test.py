"""Runs the C++ unit tests: each test of GoogleTest is one test here, and each test suite is one run of the program."""

import collections
import functools
import json
import subprocess
import tempfile

import pytest

from programs import PROGRAMS, runner

TIMEOUT = 600


def listed():
    """The names of all tests: suite -> tests."""
    command = [*runner(), PROGRAMS.unit, "--gtest_list_tests"]
    text = subprocess.run(command, stdout=subprocess.PIPE, text=True, check=True, timeout=TIMEOUT).stdout
    found, suite = collections.defaultdict(list), None
    for line in text.splitlines():
        word = line.split("#")[0].strip()
        if not line.startswith(" "):
            suite = word.removesuffix(".")
        else:
            found[suite].append(word)
    return found


def run(chosen):
    """The reports of the tests that a filter selects: name -> report; and the output of a run that ended early."""
    with tempfile.NamedTemporaryFile(suffix=".json") as report:
        command = [*runner(), PROGRAMS.unit, f"--gtest_filter={chosen}", f"--gtest_output=json:{report.name}"]
        done = subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, timeout=TIMEOUT, check=False)
        text = report.read()
    suites = json.loads(text)["testsuites"] if text else []
    cases = {f"{case['classname']}.{case['name']}": case for suite in suites for case in suite["testsuite"]}
    return cases, f"ended with status {done.returncode}:\n{done.stdout.decode(errors='replace')[-5000:]}"


@functools.cache
def run_suite(suite):
    """Runs a whole suite, once."""
    return run(f"{suite}.*")


@pytest.mark.parametrize(
    "suite, test",
    [pytest.param(suite, test, id=f"{suite}.{test}", marks=pytest.mark.xdist_group(suite))
     for suite, tests in listed().items() for test in tests],
)
def test_unit(suite, test):
    """One test of the program."""
    name = f"{suite}.{test}"
    cases, end = run_suite(suite)
    if name not in cases:
        cases, end = run(name)  # another one of its suite has ended the program
    assert name in cases, end
    case = cases[name]
    if case.get("result") == "SKIPPED" or case["status"] != "RUN":
        pytest.skip("; ".join(each["message"] for each in case.get("skipped", ())) or "not run")
    failures = "\n".join(each["failure"] for each in case.get("failures", ()))
    if failures:
        pytest.fail(failures, pytrace=False)
