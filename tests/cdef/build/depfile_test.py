"""Test that Make and Ninja understand what `cdef build --depfile` writes, whatever the names of the files are.

The rule of the build system in these tests does not name the source. So only if the dependencies are understood does
a change of the source's time rebuild the database, and then exactly once.
"""

import json
import os
import shutil
import subprocess

import pytest

from cases import HEAD, check

ODD_NAMES = ["plain", "two words", "cash$", "hash#", "a:b", "back\\slash", "comma,", "~tilde", "(b)", "[a]", "\u00e4",
             "@at", "{b}", "!", "end\\", "back\\ slash"]
# One of the two cannot read these, or reads them in another way.
FOR_NINJA_ONLY = ["per%cent", "a=b"]
FOR_MAKE_ONLY = ["slash\\#", "a*", "a?", "<>", "^", "quote'", 'double"', "&"]


def tool(name):
    """The path of a build system."""
    found = shutil.which(name)
    if found is None:
        pytest.skip(f"no {name} here")
    return found


def outdate(world, *names):
    """Makes files older than all others."""
    for name in names:
        os.utime(world.path(name), (5, 5))


def touch(path):
    """Sets a modification time that is later than all others."""
    newest = max(os.stat(other).st_mtime_ns for other in path.parent.iterdir())
    os.utime(path, ns=(newest + 1, newest + 1))


def run(world, *command):
    """Runs a build system and returns its output."""
    result = subprocess.run(command, capture_output=True, text=True, timeout=60, **world.options())
    check(result.returncode == 0, *command, "says", result.stdout, result.stderr)
    return result.stdout


def counted(world):
    """The number of times that the rule's command has been run."""
    return len(world.path("log").read_text().splitlines())


def project(world, name):
    """A script that builds the class and counts its runs, and the source."""
    script = world.path("build.sh")
    script.write_text(f'#!/bin/sh\necho run >>log\nexec {world.cdef} build -q --depfile=deps -o "$(cat target)" "$(cat source)"\n')
    script.chmod(0o755)
    source = world.path(f"{name}.cdefsrc")
    source.write_bytes(HEAD)
    world.path("target").write_text(f"{name}.cdef")
    world.path("source").write_text(source.name)
    return source


@pytest.mark.parametrize("name", ODD_NAMES + FOR_NINJA_ONLY)
def test_ninja_rebuilds_exactly_once_after_a_touch(world, name):
    """The database does not change, and Ninja then has nothing to do."""
    source, database = project(world, name), world.path(f"{name}.cdef")
    target = database.name.replace("$", "$$").replace(" ", "$ ").replace(":", "$:")
    world.path("build.ninja").write_text(
        f"rule cdef\n  command = ./build.sh\n  restat = 1\n  depfile = deps\n  deps = gcc\nbuild {target}: cdef\n")

    def built():
        run(world, tool("ninja"), "--quiet")
        return counted(world)

    check(built() == 1 and built() == 1, "not built once")
    before = os.stat(database)
    touch(source)
    check(built() == 2, "not built again after a touch")
    check(built() == 2, "built again and again after a touch")
    after = os.stat(database)
    check((after.st_ino, after.st_mtime_ns) == (before.st_ino, before.st_mtime_ns), "the same database was replaced")
    source.write_bytes(HEAD.replace(b"LastKey=100", b"LastKey=101"))
    touch(source)
    check(built() == 3, "not built again after a change")
    check(os.stat(database).st_ino != before.st_ino, "another database was not written")


@pytest.mark.parametrize("name", ODD_NAMES + FOR_MAKE_ONLY)
def test_make_rebuilds_exactly_once_after_a_change(world, name):
    """The target is the database, and the prerequisite the source."""
    source, database = project(world, name), world.path(f"{name}.cdef")
    run(world, "./build.sh")
    rule = world.path("deps").read_text().rstrip("\n")
    world.path("Makefile").write_text(f'{rule}\n\t@echo run >>log; touch "$$(cat target)"\n')

    def built():
        run(world, tool("make"), "-s", "-r")
        return counted(world)

    outdate(world, source.name)
    check(built() == 1, "made although the source is older")
    outdate(world, database.name)
    touch(source)
    check(built() == 2 and built() == 2, "not made once although the source is newer")
    source.unlink()
    failed = subprocess.run([tool("make"), "-r"], capture_output=True, text=True, timeout=60, **world.options())
    check(failed.returncode == 2 and f"No rule to make target '{source.name}'" in failed.stderr, failed.stderr)


def misread(world, *names):
    """The program that is said to misread each of these sources, or None."""
    result = world.inspect("build", "--depfile=deps", "-d", "made", "--format=json", *names)
    said = {}
    for source in json.loads(result.stdout)["sources"]:
        found = [each["message"] for each in source["findings"] if each["code"] == "S615"]
        said[source["file"]] = found[0].partition(" ")[0] if found else None
    return [said[name] for name in names]


def test_warns_of_names_that_one_of_the_two_reads_differently(world):
    """And only of those."""
    for names, expected in ((ODD_NAMES, None), (FOR_NINJA_ONLY, "Make"), (FOR_MAKE_ONLY, "Ninja")):
        sources = [f"{name}.cdefsrc" for name in names]
        for name in sources:
            world.write(name, HEAD)
        check(misread(world, *sources) == [expected] * len(names), names, misread(world, *sources))


def read_by_ninja(world, rules):
    """The names that Ninja reads in each of these rules."""
    text = "rule touch\n  command = touch $out\n"
    for number, rule in enumerate(rules):
        world.write(f"rule{number}", rule + b"\n")
        text += f"build out{number}: touch\n  depfile = rule{number}\n  deps = gcc\n"
    world.write("build.ninja", text.encode())
    subprocess.run([tool("ninja"), "--quiet", "-k", "0"], capture_output=True, timeout=60, check=False, **world.options())
    known = subprocess.run([tool("ninja"), "-t", "deps"], capture_output=True, timeout=60, check=True, **world.options())
    names = {}
    for line in known.stdout.split(b"\n"):
        if line.startswith(b"out"):
            names[line.partition(b":")[0]] = read = []
        elif line:
            read.append(line.removeprefix(b"    "))
    return [names.get(b"out%d" % number, []) for number in range(len(rules))]


def test_ninja_reads_the_names_of_which_nobody_is_warned(world):
    """And no others. Each character is tried within a name, at its end, and after a backslash."""
    characters = "".join(map(chr, (*range(1, 48), *range(57, 66), *range(90, 98), *range(122, 128), 228)))
    names = [before + each + after for each in characters if each not in "\n;|/" for before, after in ("12", ("3", ""), "\\4")]
    for name in names:
        world.write(name, HEAD)
    said = misread(world, *names)
    rules = [line.partition(b".cdef: ")[2] for line in world.path("deps").read_bytes().split(b"\n")[:-1]]
    check(len(rules) == len(names), rules)
    for name, program, read in zip(names, said, read_by_ninja(world, [b"out: " + rule for rule in rules])):
        check((program == "Ninja") == (read != [name.encode()]), name, program, read)


def test_has_a_rule_for_each_source(world):
    """The rule names both databases of a source."""
    for name in "ab":
        world.write(f"{name}.cdefsrc", HEAD)
    result = world.inspect("build", "--depfile=deps", "--byte-order=both", "-d", "o", "a.cdefsrc", "b.cdefsrc")
    check(result.returncode == 0, result)
    check(world.path("deps").read_text() ==
          "o/a.le.cdef o/a.be.cdef: a.cdefsrc\no/b.le.cdef o/b.be.cdef: b.cdefsrc\n", world.path("deps").read_text())


def test_is_not_written_if_a_database_is_not_made(world):
    """Otherwise a build system would take the failed database for a finished one."""
    world.write("deps", b"old")
    world.write("a.cdefsrc", b"ControlDefinition\n")
    check(world.inspect("build", "--depfile=deps", "a.cdefsrc").returncode == 1, "no error")
    check(world.read("deps") == b"old", "written")


@pytest.mark.parametrize("name", ["a\nb", "a;b", "a|b"])
def test_refuses_names_that_no_rule_can_have(world, name):
    """Before any database is made."""
    world.write(f"{name}.cdefsrc", HEAD)
    result = world.inspect("build", "--depfile=deps", f"{name}.cdefsrc")
    message = b"cdef: --depfile: Make cannot read a name with a newline, a semicolon or a bar\n"
    check((result.returncode, result.stderr) == (2, message), result)
    check(not world.path(f"{name}.cdef").exists(), "made")
