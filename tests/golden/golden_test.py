"""The golden cases: the results of compiling a source, or of a command line; see golden.py."""

import golden
import pytest
from compare import none
from programs import PROGRAMS, TESTS

CASES = {path.relative_to(TESTS / "golden").with_suffix("").as_posix(): path
         for path in golden.cases_below(TESTS / "golden")}


@pytest.mark.parametrize("name", CASES)
def test_case(name):
    """Streams, status, files, and the bytes, native and with -s."""
    none(golden.check_case(golden.Case(CASES[name]), PROGRAMS.cdgen, PROGRAMS.native))


@pytest.mark.parametrize("name", CASES)
def test_notation(name):
    """The image that a case describes can be assembled in every order, and reversing it gives the image of the other
    order."""
    none(golden.check_notation(golden.Case(CASES[name])))
