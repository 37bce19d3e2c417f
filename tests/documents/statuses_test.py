"""Test that the exit statuses are the same in the document, on the manual page and in each subcommand's help."""

import re
import subprocess

from compare import same
from programs import PROGRAMS, PROJECT


def rows():
    """The rows of the document: subcommand and meanings, as plain text."""
    table = (PROJECT / "docs/cdef.md").read_text().partition("## Exit statuses\n")[2]
    lines = [line for line in table.splitlines() if line.startswith("| `")]
    return [[cell.strip().replace("`", "") for cell in line.strip("|").split("|")] for line in lines]


def subcommands():
    """The subcommands that the program has."""
    said = subprocess.run([PROGRAMS.cdef, "--help"], capture_output=True, text=True, check=True).stdout
    return re.findall(r"^  ([a-z]\S*)", said.split("Subcommands:\n")[1], re.M)


def test_every_subcommand_has_a_row():
    """And there are no other rows."""
    same(sorted(row[0] for row in rows()), sorted(subcommands()), "subcommands")


def test_help():
    """The statuses are the last line of each subcommand's help."""
    for name, *meanings in rows():
        said = subprocess.run([PROGRAMS.cdef, name, "--help"], capture_output=True, text=True, check=True).stdout
        expected = "; ".join(f"{status}: {meaning}" for status, meaning in enumerate(meanings) if meaning)
        same(" ".join(said.partition("Exit status: ")[2].split()), expected, name)


def test_manual_page():
    """The statuses are in the section with that name."""
    section = (PROJECT / "man/cdef.1").read_text().partition(".Sh EXIT STATUS\n")[2].partition(".Sh ")[0]
    entries = dict(re.findall(r"^\.It Cm (\w+)\n((?:\d: .*\n)+)", section, re.M))
    expected = {name: "".join(f"{status}: {meaning}.\n" for status, meaning in enumerate(meanings) if meaning)
                for name, *meanings in rows()}
    same(entries, expected, "entries")
