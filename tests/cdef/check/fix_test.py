"""Test `cdef check --fix`: which files it writes, and which it leaves alone. Unit tests show what it corrects."""

import os
import pty
import stat
import subprocess
import tty

import pytest

from compare import same
from programs import PROGRAMS, TESTS

SOUND = (TESTS / "cdef/check/sound.cdefsrc").read_bytes()
WRONG = SOUND.replace(b"DisplayName", b"DispalyName", 1)
MESSAGE = "1 mistake corrected\n"


def check(*operands, cwd, stdin=b"", **more):
    """Status, output and messages of `cdef check`."""
    result = subprocess.run([PROGRAMS.cdef, "check", *operands], cwd=cwd, input=stdin, capture_output=True, timeout=60,
                            check=False, **more)
    return result.returncode, result.stdout.decode(), result.stderr.decode()


@pytest.fixture
def source(directory):
    """A source with one mistake."""
    path = directory / "x.cdefsrc"
    path.write_bytes(WRONG)
    return path


def alone(path):
    """Checks that nothing else is left in the source's directory."""
    same([each.name for each in path.parent.iterdir()], [path.name], "files")


def test_file(source):
    """The file is corrected and keeps its mode, and no other file is left beside it."""
    source.chmod(0o640)
    status, output, errors = check("--fix", source.name, cwd=source.parent)
    same((status, output), (0, ""), "status")
    assert errors.startswith("x.cdefsrc: " + MESSAGE) and "error:" not in errors
    same(source.read_bytes(), SOUND, "source")
    same(stat.S_IMODE(source.stat().st_mode), 0o640, "mode")
    alone(source)


def test_again(source):
    """A corrected file is not written again."""
    check("--fix", source.name, cwd=source.parent)
    before = source.stat()
    status, _, errors = check("--fix", source.name, cwd=source.parent)
    assert status == 0 and "corrected" not in errors
    same((source.stat().st_ino, source.stat().st_mtime_ns), (before.st_ino, before.st_mtime_ns), "file")


def test_what_is_left(source):
    """The remaining findings are reported with their lines after the correction."""
    source.write_bytes(b"\xef\xbb\xbf" + WRONG.replace(b"FileVersion=", b"Colour="))
    status, _, errors = check("--fix", source.name, cwd=source.parent)
    same(status, 1, "status")
    assert "x.cdefsrc: 2 mistakes corrected\n" in errors and "x.cdefsrc:2:2: error:" in errors


def test_symbolic_link(source):
    """The file that the link points to is replaced."""
    link = source.parent / "link"
    link.symlink_to(source.name)
    status, _, _ = check("--fix", "link", cwd=source.parent)
    assert status == 0 and link.is_symlink()
    same(source.read_bytes(), SOUND, "source")


def test_dry_run(source):
    """The output is a diff that patch understands. The file, its findings and the status do not change."""
    status, output, errors = check("--fix", "--dry-run", source.name, cwd=source.parent)
    same(status, 1, "status")
    assert output.startswith("--- a/x.cdefsrc\n+++ b/x.cdefsrc\n@@ -")
    same([line for line in output.splitlines()[3:] if line[0] != " "],
         ["-\tDispalyName=2", "+\tDisplayName=2"], "changes")
    assert "x.cdefsrc: 1 mistake would be corrected\n" in errors and "error:" in errors
    same(source.read_bytes(), WRONG, "source")
    alone(source)
    subprocess.run(["patch", "-p1"], input=output.encode(), cwd=source.parent, check=True, capture_output=True)
    same(source.read_bytes(), SOUND, "patched source")


def test_dry_run_on_a_terminal(source):
    """What could control the terminal is replaced."""
    source.write_bytes(b"# \x1b[31m \xc3\xa4 \xff\r\n" + WRONG)
    master, slave = pty.openpty()
    tty.setraw(slave)
    with os.fdopen(master, "rb") as screen:
        subprocess.run([PROGRAMS.cdef, "check", "-q", "--fix", "--dry-run", source.name], cwd=source.parent,
                       stdout=slave, stderr=subprocess.DEVNULL, timeout=60, check=False)
        shown = screen.read1()
        os.close(slave)
    same(shown.splitlines()[3:5], [b"-# ?[31m \xc3\xa4 ??", b"+# ?[31m \xc3\xa4 ?"], "changed lines")


def test_standard_input(directory):
    """The corrected source, or the diff, goes to standard output."""
    status, output, errors = check("--fix", "-", cwd=directory, stdin=WRONG)
    same((status, output.encode()), (0, SOUND), "source")
    assert errors.startswith("-: " + MESSAGE)
    same(check("--fix", "-", cwd=directory, stdin=SOUND)[1].encode(), SOUND, "sound source")
    status, output, _ = check("--fix", "--dry-run", "-", cwd=directory, stdin=WRONG)
    assert status == 1 and output.startswith("--- a/stdin\n+++ b/stdin\n")


def test_other_forms(source):
    """The remaining findings, unless standard output is needed for the source."""
    for form in ("json", "sarif"):
        source.write_bytes(WRONG)
        status, output, errors = check("--fix", "--format", form, source.name, cwd=source.parent)
        assert status == 0 and output[0] == "{" and "Dispaly" not in output
        same(errors, "x.cdefsrc: " + MESSAGE, form)
        for operands in (("--dry-run", source.name), ("-",)):
            status, output, errors = check("--fix", "--format", form, *operands, cwd=source.parent, stdin=WRONG)
            same((status, output, errors), (2, "", f"cdef: --fix writes to standard output here, and so does --format {form}\n"), form)


def test_dropped_correction(source):
    """A correction that would cause more errors is not made, with a message."""
    source.write_bytes(SOUND.replace(b"ClassToManagerMapping", b"ClassToManagerMaping")
                       .replace(b"\tResourceManager=M\n", b"").replace(b"FirstKey=1", b"FirstKey=9"))
    before = source.read_bytes()
    status, _, errors = check("--fix", source.name, cwd=source.parent)
    same(status, 1, "status")
    assert "x.cdefsrc: 1 correction not made: more errors would be found with it\n" in errors
    same(source.read_bytes(), before, "source")


def test_several_sources(source):
    """If one cannot be read, the others are still corrected."""
    status, _, errors = check("--fix", "missing", source.name, cwd=source.parent)
    same(status, 2, "status")
    assert "missing: No such file or directory" in errors
    same(source.read_bytes(), SOUND, "source")


def test_what_is_not_a_file(directory):
    """Directories and devices are refused."""
    status, _, errors = check("--fix", ".", cwd=directory)
    assert status == 2 and ".: Is a directory" in errors


def test_temporary_file_of_a_killed_program(source):
    """The next correction removes it."""
    (source.parent / ".x.cdefsrc.cdef-new").write_bytes(SOUND[:20])
    check("--fix", source.name, cwd=source.parent)
    same(source.read_bytes(), SOUND, "source")
    alone(source)


def test_full_disk(source):
    """The old file stays if the new one cannot be written."""
    limit = max(len(SOUND) // 2, 1)
    code = f"import os,resource,signal,sys; signal.signal(signal.SIGXFSZ, signal.SIG_IGN); " \
           f"resource.setrlimit(resource.RLIMIT_FSIZE, ({limit}, {limit})); os.execv(sys.argv[1], sys.argv[1:])"
    result = subprocess.run(["python3", "-c", code, PROGRAMS.cdef, "check", "--fix", source.name], cwd=source.parent,
                            capture_output=True, timeout=60, check=False)
    same(result.returncode, 2, "status")
    assert b"File too large" in result.stderr
    same(source.read_bytes(), WRONG, "source")
    alone(source)


@pytest.mark.skipif(os.geteuid() != 0, reason="needs another user")
def test_file_that_may_not_be_written(source):
    """It is not replaced, although its directory would allow it."""
    source.parent.chmod(0o777)
    source.chmod(0o444)
    status, _, errors = check("--fix", source.name, cwd=source.parent, user=65534)
    assert status == 2 and "Permission denied" in errors
    same(source.read_bytes(), WRONG, "source")
    alone(source)


def test_directory_that_may_not_be_written(source):
    """The file stays."""
    if os.geteuid() == 0:
        os.chown(source, 65534, 65534)
    source.parent.chmod(0o555)
    more = {"user": 65534} if os.geteuid() == 0 else {}
    status, _, errors = check("--fix", source.name, cwd=source.parent, **more)
    source.parent.chmod(0o755)
    assert status == 2 and "Permission denied" in errors
    same(source.read_bytes(), WRONG, "source")


def test_usage(source):
    """--dry-run is for --fix."""
    status, _, errors = check("--dry-run", source.name, cwd=source.parent)
    assert status == 2 and "--fix" in errors
