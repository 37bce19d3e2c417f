"""Test how `cdef check` and `cdef build` use project files, cdef.toml. What such a file may say, and what is reported of
one with errors, tests/unit/config shows."""

import os
import subprocess

import pytest

from cases import HEAD, SOURCE, check, expect

ODD = HEAD.replace(b"Description=1", b"Description=010", 1)
OCTAL = b"[S509 octal]"
COMMANDS = (("check",), ("build", "-o", "x.cdef"))


def project(world, text, place="."):
    """A project file."""
    world.path(place).mkdir(parents=True, exist_ok=True)
    world.write(f"{place}/cdef.toml", text)


def status_and_octal(world, *arguments, **more):
    """The exit status, and whether the octal number was reported."""
    result = world.inspect(*arguments, **more)
    return result.returncode, OCTAL in result.stderr


@pytest.mark.parametrize("command", COMMANDS)
@pytest.mark.parametrize("name", [b"octal", b"S509", b"all"])
def test_turns_warnings_off(world, command, name):
    """By name, by code, or all of them; the command line can turn one on again."""
    world.write(SOURCE, ODD)
    project(world, b"[warnings]\noff = ['%s']\n" % name)
    check(status_and_octal(world, *command, SOURCE) == (0, False), "reported")
    check(status_and_octal(world, *command, "--warn=octal", SOURCE) == (0, True), "not on again")
    check(status_and_octal(world, *command, "--no-config", SOURCE) == (0, True), "read all the same")


@pytest.mark.parametrize("command", COMMANDS)
def test_turns_a_warning_on_that_it_turns_off_too(world, command):
    """Unless the command line turns it off."""
    world.write(SOURCE, ODD)
    project(world, b"[warnings]\noff = ['all']\non = ['octal']\n")
    check(status_and_octal(world, *command, SOURCE) == (0, True), "not reported")
    check(status_and_octal(world, *command, "--no-warn=S509", SOURCE) == (0, False), "reported")


@pytest.mark.parametrize("command", COMMANDS)
def test_counts_warnings_as_errors(world, command):
    """Options override the file and exclude each other."""
    world.write(SOURCE, ODD)
    project(world, b"warnings.werror = true\n")
    check(status_and_octal(world, *command, SOURCE) == (1, True), "does not count")
    check(status_and_octal(world, *command, "--no-werror", SOURCE) == (0, True), "counts all the same")
    project(world, b"warnings.werror = false\n")
    check(status_and_octal(world, *command, "--werror", SOURCE) == (1, True), "the file wins")
    check(world.inspect(*command, "--werror", "--no-werror", SOURCE).returncode == 2, "not refused")


@pytest.mark.parametrize("command", (("check",), ("build", "-d", "out")))
def test_belongs_to_each_source_alone(world, command):
    """Only the nearest file above the source is used."""
    for place, text in (("a", b"warnings.off = ['octal']\n"), ("a/b", b"warnings.werror = true\n")):
        project(world, text, place)
    for number, place in enumerate(("a/b", "a", ".")):
        world.write(f"{place}/{number}.cdefsrc", ODD.replace(b"mgr1.cat", b"%d.cat" % number)
                    .replace(b"Name=Disk", b"Name=Disk%d" % number))
    result = world.inspect(*command, "a/b/0.cdefsrc", "a/1.cdefsrc", "2.cdefsrc")
    lines = [line.split(b":")[0] for line in result.stderr.splitlines() if OCTAL in line]
    check(lines == [b"a/b/0.cdefsrc", b"2.cdefsrc"], result.stderr)
    check(result.returncode == 1, "status", result.returncode)


def test_takes_another_file_or_none(world):
    """The option applies to all sources."""
    world.write(SOURCE, ODD)
    project(world, b"warnings.werror = true\n")
    world.write("other.toml", b"warnings.off = ['octal']\n")
    check(status_and_octal(world, "check", "--config=other.toml", SOURCE) == (0, False), "not read")
    check(status_and_octal(world, "check", "--no-config", SOURCE) == (0, True), "read")
    check(world.inspect("check", "--no-config", "--config=other.toml", SOURCE).returncode == 2, "not refused")
    expect(world.inspect("check", "--config=none.toml", SOURCE), 2, b"cdef: none.toml: No such file or directory\n")


def test_counts_for_standard_input(world):
    """The search begins in the working directory."""
    world.write(SOURCE, ODD)
    project(world, b"warnings.off = ['octal']\n")
    with open(world.path(SOURCE), "rb") as source:
        check(status_and_octal(world, "check", "-", stdin=source) == (0, False), "reported")


def test_chooses_directory_and_byte_order(world):
    """Relative to the file; -d and --byte-order override it, and with -o the directory is not needed."""
    project(world, b"[build]\ndirectory = 'made/here'\nbyte-order = 'both'\n", "p")
    world.write("p/a.cdefsrc", HEAD)
    expect(world.inspect("build", "--list", "p/a.cdefsrc"), 0, stdout=b"p/made/here/a.le.cdef\np/made/here/a.be.cdef\n")
    check(not world.path("p/made").exists(), "--list makes a directory")
    expect(world.inspect("build", "p/a.cdefsrc"), 0)
    check(world.path("p/made/here/a.be.cdef").exists(), "not made")
    expect(world.inspect("build", "--list", "--byte-order=big", "p/a.cdefsrc"), 0, stdout=b"p/made/here/a.cdef\n")
    expect(world.inspect("build", "--list", "-d", "d", "p/a.cdefsrc"), 0, stdout=b"d/a.le.cdef\nd/a.be.cdef\n")
    expect(world.inspect("build", "--list", "-o", "x.cdef", "p/a.cdefsrc"), 0, stdout=b"x.le.cdef\nx.be.cdef\n")


def test_makes_no_directory_for_a_missing_source(world):
    """Only a directory that a project file names is created."""
    check(world.inspect("build", "missing/a.cdefsrc").returncode == 2, "status")
    check(not world.path("missing").exists(), "made")


def test_is_a_dependency_of_databases(world):
    """With --depfile."""
    project(world, b"[build]\ndirectory = 'o'\n", "p")
    world.write("p/a.cdefsrc", HEAD)
    expect(world.inspect("build", "--depfile=d", "p/a.cdefsrc"), 0)
    check(world.read("d") == b"p/o/a.cdef: p/a.cdefsrc p/cdef.toml\n", world.read("d"))


@pytest.mark.parametrize("command", COMMANDS)
def test_is_refused_with_errors(world, command):
    """All of them, before anything is checked or made."""
    world.write(SOURCE, ODD)
    project(world, b"[warnings]\noff = ['ocatl']\n[biuld]\ndirectory = 'x'\n")
    expect(world.inspect(*command, SOURCE), 2,
           b"cdef: cdef.toml:2:8: unknown warning `ocatl`; did you mean `octal`?\n"
           b"cdef: cdef.toml:3:2: unknown table `biuld`; did you mean `build`?\n")
    check(not world.path("x.cdef").exists(), "made")


@pytest.mark.parametrize("command", COMMANDS)
def test_refuses_what_is_not_a_regular_file(world, command):
    """It is not ignored, and no program waits for what another may write to it."""
    world.path("a").mkdir()
    world.write("a/x.cdefsrc", HEAD)
    file = world.path("a/cdef.toml")
    for make, remove, why in ((lambda: os.mkfifo(file), file.unlink, b"not a regular file"),
                              (lambda: file.symlink_to("nowhere"), file.unlink, b"No such file or directory")):
        make()
        expect(world.inspect(*command, "a/x.cdefsrc"), 2, b"cdef: a/cdef.toml: " + why + b"\n")
        remove()


def test_is_found_without_a_working_directory(world):
    """If the working directory has been removed, the file has its absolute name."""
    world.write(SOURCE, ODD)
    project(world, b"[warnings]\noff = ['octal']\n")
    world.path("gone").mkdir()
    script = 'cd gone && rmdir ../gone && exec "$@"'
    result = subprocess.run(["sh", "-c", script, "sh", world.cdef, "check", world.path(SOURCE)], capture_output=True,
                            check=False, **world.options())
    expect(result, 0)
