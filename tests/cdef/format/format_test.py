"""Test `cdef format`: which files it writes, and which it leaves alone. Unit tests show how it changes sources."""

import os
import stat
import subprocess

import pytest

from compare import same
from programs import EXAMPLES, PROGRAMS, TESTS

LOOSE = (TESTS / "cdef/format/loose.cdefsrc").read_bytes()
FORMATTED = (TESTS / "cdef/format/formatted.cdefsrc").read_bytes()
REORDERED = (TESTS / "cdef/format/reordered.cdefsrc").read_bytes()
WRONG = LOOSE.replace(b"DisplayName", b"DispalyName", 1)
COMPLAINT = "x.cdefsrc:11:5: error: Attribute name not defined in table (name/table): DispalyNameResourceClass [S106]\n"


def cdef(*operands, cwd, stdin=b"", **more):
    """Status, output and messages of `cdef format`."""
    result = subprocess.run([PROGRAMS.cdef, "format", *operands], cwd=cwd, input=stdin, capture_output=True, timeout=60,
                            check=False, **more)
    return result.returncode, result.stdout, result.stderr.decode()


@pytest.fixture
def source(directory):
    """A source that is not formatted."""
    path = directory / "x.cdefsrc"
    path.write_bytes(LOOSE)
    return path


def test_output(source):
    """Without an option the formatted source goes to standard output."""
    same(cdef("x.cdefsrc", cwd=source.parent), (0, FORMATTED, ""), "result")
    same(source.read_bytes(), LOOSE, "source")


def test_input(source):
    """Standard input is formatted to standard output, with -i too."""
    same(cdef("-", cwd=source.parent, stdin=LOOSE), (0, FORMATTED, ""), "result")
    same(cdef("-i", "-", cwd=source.parent, stdin=LOOSE), (0, FORMATTED, ""), "result")
    same(cdef("--check", "-", cwd=source.parent, stdin=LOOSE), (1, b"-\n", ""), "result")


def test_in_place(source):
    """The source is replaced and keeps its mode, and no other file is left beside it."""
    source.chmod(0o640)
    same(cdef("-i", "x.cdefsrc", cwd=source.parent), (0, b"", ""), "result")
    same(source.read_bytes(), FORMATTED, "source")
    same(stat.S_IMODE(source.stat().st_mode), 0o640, "mode")
    same(os.listdir(source.parent), ["x.cdefsrc"], "files")


def test_again(source):
    """A formatted source is not written again."""
    source.write_bytes(FORMATTED)
    before = source.stat()
    same(cdef("-i", "x.cdefsrc", cwd=source.parent), (0, b"", ""), "result")
    same((source.stat().st_ino, source.stat().st_mtime_ns), (before.st_ino, before.st_mtime_ns), "file")


def test_link(source):
    """A symbolic link stays, and the file that it points to is replaced."""
    (source.parent / "link.cdefsrc").symlink_to("x.cdefsrc")
    same(cdef("-i", "link.cdefsrc", cwd=source.parent), (0, b"", ""), "result")
    assert (source.parent / "link.cdefsrc").is_symlink()
    same(source.read_bytes(), FORMATTED, "source")


def test_check(source):
    """The sources that would change are listed, and nothing is written."""
    (source.parent / "good.cdefsrc").write_bytes(FORMATTED)
    same(cdef("--check", "good.cdefsrc", cwd=source.parent), (0, b"", ""), "result")
    same(cdef("--check", "good.cdefsrc", "x.cdefsrc", cwd=source.parent), (1, b"x.cdefsrc\n", ""), "result")
    same(source.read_bytes(), LOOSE, "source")


def test_diff(source):
    """The diff can be applied by patch."""
    status, diff, errors = cdef("--diff", "x.cdefsrc", cwd=source.parent)
    same((status, errors), (1, ""), "result")
    assert diff.startswith(b"--- a/x.cdefsrc\n+++ b/x.cdefsrc\n@@ ")
    same(source.read_bytes(), LOOSE, "source")
    subprocess.run(["patch", "-s", "-p1"], cwd=source.parent, input=diff, check=True)
    same(source.read_bytes(), FORMATTED, "source")
    same(cdef("--diff", "x.cdefsrc", cwd=source.parent), (0, b"", ""), "result")


def test_diff_of_a_source_with_an_odd_name(source):
    """The name is quoted, as patch reads it."""
    odd = source.rename(source.with_name("a\tb\nc.cdefsrc"))
    status, diff, errors = cdef("--diff", odd.name, cwd=odd.parent)
    same((status, errors), (1, ""), "result")
    assert diff.startswith(b'--- "a/a\\tb\\nc.cdefsrc"\n+++ "b/a\\tb\\nc.cdefsrc"\n@@ ')
    subprocess.run(["patch", "-s", "-p1"], cwd=odd.parent, input=diff, check=True)
    same(odd.read_bytes(), FORMATTED, "source")


def test_reorder(source):
    """Attributes are in their usual order."""
    same(cdef("--reorder", "x.cdefsrc", cwd=source.parent), (0, REORDERED, ""), "result")


@pytest.mark.parametrize("options", ([], ["-i"], ["--check"], ["--diff"]))
def test_errors(source, options):
    """A source with errors is left alone; the others are formatted."""
    source.write_bytes(WRONG)
    (source.parent / "other.cdefsrc").write_bytes(LOOSE)
    status, output, errors = cdef(*options, "x.cdefsrc", "other.cdefsrc", cwd=source.parent)
    same(status, 2, "status")
    assert errors.startswith(COMPLAINT), errors
    assert errors.endswith("\ncdef: x.cdefsrc: not formatted, because it has errors\n"), errors
    same(source.read_bytes(), WRONG, "source")
    if options == ["-i"]:
        same((source.parent / "other.cdefsrc").read_bytes(), FORMATTED, "other source")
    elif not options:
        same(output, FORMATTED, "output")


def test_unreadable(source):
    """Files that cannot be read, and databases, are reported; the other sources are formatted."""
    (source.parent / "x.cdef").write_bytes(b"\0" * 8 + b"1tmf" + b"\0" * 60)
    status, output, errors = cdef("none.cdefsrc", "x.cdef", "x.cdefsrc", cwd=source.parent)
    same((status, output), (2, FORMATTED), "result")
    same(errors, "cdef: none.cdefsrc: No such file or directory\n"
                 "cdef: x.cdef: a database, not a source; 'cdef verify' checks databases\n", "messages")


def test_full(source):
    """Output that cannot be written is a failure."""
    with open("/dev/full", "wb") as full:
        result = subprocess.run([PROGRAMS.cdef, "format", "x.cdefsrc"], cwd=source.parent, stdout=full,
                                stderr=subprocess.PIPE, timeout=60, check=False)
    same((result.returncode, result.stderr), (2, b"cdef: standard output: No space left on device\n"), "result")


@pytest.mark.parametrize("one, other", (("-i", "--check"), ("--diff", "-i"), ("--check", "--diff")))
def test_one_of_them(source, one, other):
    """Options that exclude each other."""
    assert cdef(one, other, "x.cdefsrc", cwd=source.parent)[0] == 2


@pytest.mark.parametrize("example", sorted(EXAMPLES.glob("**/*.cdefsrc")), ids=lambda path: path.stem)
def test_examples(example):
    """The examples are formatted."""
    same(cdef("--check", str(example), cwd=example.parent), (0, b"", ""), "result")
