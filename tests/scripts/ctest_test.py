"""Test that CTest runs the same tests as script/test."""

import configparser
import re

from programs import PROJECT

TESTS = PROJECT / "tests"


def test_each_test_file_is_run_once():
    """Each is in one of the directories that tests/CMakeLists.txt lists, except those that have a script of their own."""
    settings = configparser.ConfigParser()
    settings.read(TESTS / "pytest.ini")
    apart = set(settings["pytest"]["norecursedirs"].split())
    files = [path.relative_to(TESTS) for path in TESTS.rglob("*_test.py")]
    files = [path for path in files if not apart & set(path.parts)]
    listed = re.findall(r"^add_pytest\(\S+ \d+ (\S+)\)$", (TESTS / "CMakeLists.txt").read_text(), re.MULTILINE)
    times = {str(path): sum(path.is_relative_to(place) for place in listed) for path in files}
    assert {name: count for name, count in times.items() if count != 1} == {}
    assert "cdef/schema_test.py" in times
