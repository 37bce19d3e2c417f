"""Test the first source that `cdef new class` writes."""

import os
import resource

import pytest

from cases import check, expect

NAMES = ["Fan", "a b", "a#b", "a // b", "/* a", "\"a\"", "a\"b", "'", "Name=Fan", "K\u00fchler", "[a,b]", "{}", "1", "0x1", "-",
         "--", "a\\", "$(a)", "a%b", "%s%n", "~", "x" * 200, "ResourceClass", "Disk.cdef"]


@pytest.mark.parametrize("name", NAMES)
def test_compiles_without_a_warning(world, name):
    """Whatever the name is. The class has that name."""
    expect(world.inspect("new", "class", "-o", "x.cdefsrc", "--", name), 0)
    expect(world.inspect("build", "--werror", "-o", "x.cdef", "x.cdefsrc"), 0)
    check(name.encode() + b"\0" in world.read("x.cdef"), "another name")


def test_calls_the_source_after_the_class(world):
    """In the working directory."""
    expect(world.inspect("new", "class", "Fan"), 0)
    check(b"\tName=Fan\n" in world.read("Fan.cdefsrc"), world.read("Fan.cdefsrc"))
    for name in ("a/Fan", "../Fan", ".Fan", "-x"):
        result = world.inspect("new", "class", "--", name)
        expect(result, 2, b"cdef: %s: no file can have this name: choose another one with -o\n" % name.encode())


def test_writes_to_standard_output(world):
    """The same text."""
    expect(world.inspect("new", "class", "Fan"), 0)
    expect(world.inspect("new", "class", "Fan", "-o", "-"), 0, stdout=world.read("Fan.cdefsrc"))


def test_never_overwrites(world):
    """Neither a file nor the target of a link."""
    world.write("Fan.cdefsrc", b"mine")
    world.path("link").symlink_to("Fan.cdefsrc")
    world.path("nowhere").symlink_to("missing")
    expect(world.inspect("new", "class", "Fan"), 2, b"cdef: Fan.cdefsrc: File exists\n")
    for name in ("link", "nowhere"):
        expect(world.inspect("new", "class", "Fan", "-o", name), 2, b"cdef: %s: File exists\n" % name.encode())
    check(world.read("Fan.cdefsrc") == b"mine" and not world.path("missing").exists(), "overwritten")


def test_without_standard_input(world):
    """The file then has the lowest number that a file can have."""
    expect(world.inspect("new", "class", "Fan", preexec_fn=lambda: os.close(0)), 0)
    check(b"\tName=Fan\n" in world.read("Fan.cdefsrc"), world.read("Fan.cdefsrc"))


def test_leaves_no_part_of_a_source(world):
    """If the file cannot be written completely."""
    result = world.inspect("new", "class", "Fan",
                           preexec_fn=lambda: resource.setrlimit(resource.RLIMIT_FSIZE, (100, 100)))
    check(result.returncode == 2 and result.stderr.startswith(b"cdef: Fan.cdefsrc: "), result)
    check(not world.path("Fan.cdefsrc").exists(), os.listdir(world.path(".")))


@pytest.mark.parametrize("name", [b"", b"a\nb", b"a\rb", b"x" * 300])
def test_refuses_names_that_no_source_gives(world, name):
    """Nothing is written."""
    result = world.inspect("new", "class", "-o", "x.cdefsrc", name)
    check(result.returncode == 2 and result.stderr.endswith(b": no source can give a class this name\n"), result)
    check(not world.path("x.cdefsrc").exists(), "written")


def test_knows_no_other_kinds(world):
    """There is only the kind class so far."""
    check(world.inspect("new", "action", "Fan").returncode == 2, "status")
