"""Compile and run the programs in docs/reader.md.

Every C++ block must compile by itself without a warning. The first block is a short program. Its output for the
example's database must be the one in the document, in both byte orders; for a file that is not a database, it must
print nothing.
"""

import re
import subprocess

import pytest

from compare import same
from programs import EXAMPLES, PROGRAMS, PROJECT

BLOCK = re.compile(r"^```(\w*)\n(.*?)^```$", re.MULTILINE | re.DOTALL)
PROGRAM_LINES = 30
LIBRARY = "src/reader/libcdb_view.a"
WARNINGS = ["-Wall", "-Wextra", "-Werror"]
EXAMPLE = EXAMPLES / "FileSystem.cdefsrc"


def blocks(document, language):
    """The blocks of a language, in the order of the document."""
    return [text for marked, text in BLOCK.findall(document) if marked == language]


def compile_blocks(sources, directory):
    """Compile each source; the first one is linked. The program's path."""
    sanitizers = PROGRAMS.sanitizers
    flags = [f"-fsanitize={sanitizers}", "-fno-sanitize-recover=all"] if sanitizers else []
    for index, text in enumerate(sources):
        source = directory / f"block{index}.cpp"
        source.write_text(text)
        command = [PROGRAMS.cache["CMAKE_CXX_COMPILER"], "-std=c++20", *WARNINGS, *flags, f"-I{PROJECT / 'include'}", source]
        command += [PROGRAMS.build / LIBRARY, "-o", directory / "program"] if index == 0 else ["-fsyntax-only"]
        subprocess.run(command, check=True)
    return directory / "program"


def run(program, operand):
    """Status and output of the program."""
    result = subprocess.run([program, operand], stdout=subprocess.PIPE, text=True, check=False, timeout=60)
    return result.returncode, result.stdout


@pytest.mark.slow(6)
def test_reader_document(directory):
    """The document's program prints what the document says."""
    document = (PROJECT / "docs/reader.md").read_text()
    sources, expected = blocks(document, "cpp"), blocks(document, "")
    assert len(sources) >= 2 and len(expected) == 1, "blocks are missing in the document"
    assert len(sources[0].splitlines()) <= PROGRAM_LINES, "the program has grown"
    program = compile_blocks(sources, directory)
    for extra in ([], ["-s"]):
        database = directory / "example.cdef"
        subprocess.run([PROGRAMS.cdgen, *extra, EXAMPLE, database], check=True)
        same(run(program, database), (0, expected[0]), *extra)
    same(run(program, EXAMPLE), (1, ""), "of a file that is no database")
    same(run(program, directory / "none"), (1, ""), "of a file that is missing")
