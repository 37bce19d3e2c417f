"""Test how the programs are linked."""

import re
import subprocess

import pytest

from programs import PROGRAMS


@pytest.mark.parametrize("program", ["cdgen", "cdef"])
def test_static(program):
    """With CDGEN_STATIC, a program needs no shared library and no dynamic loader."""
    if not PROGRAMS.is_on("CDGEN_STATIC") or PROGRAMS.sanitizers:
        pytest.skip("not linked statically in this build")
    command = [PROGRAMS.cache["CMAKE_READELF"], "--program-headers", "--wide", PROGRAMS.build / program]
    headers = subprocess.run(command, capture_output=True, text=True, check=True).stdout
    assert " LOAD " in headers
    assert not re.search("INTERP|DYNAMIC", headers), headers
