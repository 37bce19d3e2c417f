"""Compile and run what docs/reader.md shows.

Every C++ block has to compile by itself, without a warning.  The first one is a
program, short enough to be read at a glance: what it prints of the example's
database has to be what the document says, in both byte orders; and of a file
that is no database nothing.
"""

import argparse
import pathlib
import re
import subprocess
import sys
import tempfile

BLOCK = re.compile(r"^```(\w*)\n(.*?)^```$", re.MULTILINE | re.DOTALL)
PROGRAM_LINES = 30
WARNINGS = ["-Wall", "-Wextra", "-Werror"]


def blocks(document, language):
    """The blocks of a language, in the order of the document."""
    return [text for marked, text in BLOCK.findall(document) if marked == language]


def compile_blocks(sources, options, directory):
    """Compile each source; the first one is linked. The program's path."""
    for index, text in enumerate(sources):
        source = directory / f"block{index}.cpp"
        source.write_text(text)
        command = [options.cxx, "-std=c++20", *WARNINGS, *options.flags.split(), f"-I{options.include}", str(source)]
        command += [str(options.library), "-o", str(directory / "program")] if index == 0 else ["-fsyntax-only"]
        subprocess.run(command, check=True)
    return directory / "program"


def run(program, operand):
    """Status and output of the program."""
    result = subprocess.run([program, operand], stdout=subprocess.PIPE, text=True, check=False, timeout=60)
    return result.returncode, result.stdout


def main():
    """Compare the document with the program that it shows."""
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--document", type=pathlib.Path, required=True)
    parser.add_argument("--example", type=pathlib.Path, required=True, help="the source whose database is printed")
    parser.add_argument("--cdgen", type=pathlib.Path, required=True)
    parser.add_argument("--cxx", required=True)
    parser.add_argument("--flags", default="", help="more flags for the compiler")
    parser.add_argument("--include", type=pathlib.Path, required=True)
    parser.add_argument("--library", type=pathlib.Path, required=True)
    options = parser.parse_args()
    document = options.document.read_text()
    sources, expected = blocks(document, "cpp"), blocks(document, "")
    assert len(sources) >= 2 and len(expected) == 1, "blocks are missing in the document"
    assert len(sources[0].splitlines()) <= PROGRAM_LINES, "the program has grown"
    with tempfile.TemporaryDirectory() as name:
        directory = pathlib.Path(name)
        program = compile_blocks(sources, options, directory)
        for extra in ([], ["-s"]):
            database = directory / "example.cdef"
            subprocess.run([options.cdgen, *extra, options.example, database], check=True)
            assert run(program, database) == (0, expected[0]), run(program, database)
        assert run(program, options.example) == (1, "")
        assert run(program, directory / "none") == (1, "")


if __name__ == "__main__":
    sys.exit(main())
