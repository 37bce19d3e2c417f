"""Test what the headers of the reader report if the compiler is not set to C++20."""

import subprocess

import pytest

from programs import PROGRAMS, PROJECT


def compiled(directory, header, standard):
    """Status and messages of a compiler for a source that only includes the header."""
    (directory / "source.cpp").write_text(f'#include "{header}"\n')
    command = [PROGRAMS.cache["CMAKE_CXX_COMPILER"], f"-std={standard}", f"-I{PROJECT / 'include'}", "-fsyntax-only",
               directory / "source.cpp"]
    done = subprocess.run(command, stderr=subprocess.PIPE, text=True, check=False)
    return done.returncode, done.stderr


@pytest.mark.parametrize("header", ["cdb_fields.h", "cdb_values.h", "cdb_sections.h", "cdb_view.h"])
def test_asks_for_the_standard_that_it_needs(header, directory):
    """One message that names it, and not many about words that the compiler does not know."""
    status, said = compiled(directory, header, "c++17")
    assert status != 0
    assert said.count("error:") == 1
    assert f"{header} needs C++20" in said
    assert compiled(directory, header, "c++20")[0] == 0
