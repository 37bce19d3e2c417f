"""Test `cdef build`: which databases it makes from which sources, what it reports, and which requests it refuses.

Every test is a function, named for what it shows. tests/system/builds_test.py tests faults of the system, and
tests/property/build_same_test.py compares the databases with those of cdgen.
"""

import json
import os
import struct
import time

import pytest

from cases import BEFORE, HEAD, OUT, SOURCE, attributes, check, expect

NAMELESS = HEAD.replace(b"\tName=Disk\n", b"")
WRONG = HEAD.replace(b"Description=1", b"Descripton=1", 1)
ODD = HEAD.replace(b"Description=1", b"Description=010", 1)
TIME = slice(16, 24)


def build(world, *arguments, **more):
    """Runs cdef build without the environment variables that set the time."""
    environment = {**os.environ, "LC_ALL": "C", **more.pop("env", {})}
    for name in ("VX_CDB_FORCE_EMPTY_TIMESTAMP", "SOURCE_DATE_EPOCH"):
        if name not in more.get("keep", ()):
            environment.pop(name, None)
    environment.update(more.pop("set", {}))
    return world.inspect("build", *arguments, env=environment, **more)


def made(world, *arguments, **more):
    """Runs cdef build, which must succeed and print nothing."""
    expect(build(world, *arguments, **more), 0)


def of_its_own(number, text=HEAD):
    """A class with a name and a message catalog of its own."""
    return text.replace(b"Name=Disk", b"Name=Disk%d" % number).replace(b"mgr1.cat", b"mgr%d.cat" % number)


def sources(world, *names, text=HEAD):
    """Sources of different classes, and their directories."""
    for number, name in enumerate(names):
        world.path(name).parent.mkdir(parents=True, exist_ok=True)
        world.write(name, of_its_own(number, text))


def files(world, place="."):
    """All names below a directory, sorted."""
    top = world.path(place)
    return sorted(str(path.relative_to(top)) for path in top.rglob("*") if not path.is_dir())


# ---- What is made ----------------------------------------------------------------------------------------------------


def test_makes_what_cdgen_makes(world):
    """The same bytes. A class without a Name is named after the output as given."""
    for text in (HEAD + attributes(30), NAMELESS):
        good = world.good(text)
        for out in (OUT, "./d.cdef/x", "d.cdef/x.cdef"):
            world.path(out).parent.mkdir(exist_ok=True)
            expect(world.run(SOURCE, out), 0)
            expected = world.read(out)
            world.path(out).unlink()
            result = build(world, "--no-warn=no-name", "-o", out, SOURCE)
            expect(result, 0)
            check(world.read(out) == expected, "another database", out)
        check(len(good) > 0, "nothing compiled")


def test_makes_each_byte_order(world):
    """One of the two is what cdgen -s writes on this machine."""
    native, other = world.good(HEAD + attributes(3)), world.good(None, "-s")
    little, big = (native, other) if native[8:12] == b"1tmf" else (other, native)
    for order, expected in (("native", native), ("little", little), ("big", big)):
        made(world, "--byte-order", order, "-o", OUT, SOURCE)
        check(world.read() == expected, "another database in order", order)
    made(world, "--byte-order=both", "-o", OUT, SOURCE)
    check(world.read("out.le.cdef") == little and world.read("out.be.cdef") == big, "another pair")


def test_calls_a_class_of_both_byte_orders_after_the_name_without_them(world):
    """So both databases contain the same class."""
    world.write(SOURCE, NAMELESS)
    made(world, "--no-warn=no-name", "--byte-order=both", "-o", "Disk.cdef", SOURCE)
    for name in ("Disk.le.cdef", "Disk.be.cdef"):
        check(b"Disk\0" in world.read(name), "called otherwise in", name)


def test_puts_databases_beside_their_sources(world):
    """This is the default, without -o and -d."""
    sources(world, "d/a.cdefsrc", "b.txt")
    result = build(world, "d/a.cdefsrc", "b.txt")
    expect(result, 0, b"cdef: 2 databases: 2 written, 0 unchanged, 0 not made\n")
    check(world.path("d/a.cdef").exists() and world.path("b.txt.cdef").exists(), files(world))


def test_takes_directories_for_the_sources_below_them(world):
    """In the order of their names, without hidden files and directories. The output directory is created."""
    sources(world, "in/b.cdefsrc", "in/d/a.cdefsrc", "in/.hidden/c.cdefsrc", "in/.d.cdefsrc", "in/e.txt")
    expect(build(world, "--list", "-d", "out/more", "in"), 0, stdout=b"out/more/b.cdef\nout/more/a.cdef\n")
    expect(build(world, "-d", "out/more", "in"), 0, b"cdef: 2 databases: 2 written, 0 unchanged, 0 not made\n")
    check(files(world, "out") == ["more/a.cdef", "more/b.cdef"], files(world, "out"))


def test_lists_databases_and_makes_none(world):
    """For build systems."""
    before = files(world)
    expect(build(world, "--list", "--byte-order=both", "-d", "o", SOURCE), 0, stdout=b"o/class.le.cdef\no/class.be.cdef\n")
    check(files(world) == before, files(world))


def test_reads_standard_input_and_writes_standard_output(world):
    """Each alone, and both together."""
    good = world.good()
    with open(world.path(SOURCE), "rb") as source:
        made(world, "-o", OUT, "-", stdin=source)
    check(world.read() == good, "another database")
    expect(build(world, "-o", "-", SOURCE), 0, stdout=good)


# ---- What is left alone ----------------------------------------------------------------------------------------------


def test_leaves_the_same_database_alone(world):
    """It keeps its inode and its modification time, whatever time it contains."""
    for first, second in ((("--timestamp=none",), ("--timestamp=now",)), (("--timestamp=7",), ()), ((), ())):
        made(world, *first, "-o", OUT, SOURCE)
        os.utime(world.path(OUT), (5, 5))
        with world.left_alone():
            made(world, *second, "-o", OUT, SOURCE)
        world.path(OUT).unlink()


def test_replaces_another_database(world):
    """By a new file: programs that have the old file open keep it."""
    made(world, "-o", OUT, SOURCE)
    old = open(world.path(OUT), "rb")
    world.write(SOURCE, HEAD + attributes(1))
    made(world, "-o", OUT, SOURCE)
    check(old.read() != world.read() and os.fstat(old.fileno()).st_ino != os.stat(world.path(OUT)).st_ino, "in place")


def test_mends_a_damaged_database(world):
    """Even if the size is right, or only the checksum shows the damage."""
    made(world, "-o", OUT, SOURCE)
    good = world.read()
    for place in (4, 100, len(good) - 1):
        world.write(OUT, good[:place] + bytes([good[place] ^ 1]) + good[place + 1:])
        made(world, "-o", OUT, SOURCE)
        check(world.read() == good, "not mended at", place)


def test_keeps_the_mode_and_follows_links(world):
    """The link is not replaced."""
    world.write("target", BEFORE)
    os.chmod(world.path("target"), 0o640)
    world.path(OUT).symlink_to("target")
    made(world, "-o", OUT, SOURCE)
    check(world.path(OUT).is_symlink() and world.read("target") == world.good(), "not written through the link")
    check(os.stat(world.path("target")).st_mode & 0o777 == 0o640, "another mode")


def test_leaves_the_database_of_a_wrong_source(world):
    """Also that of a source with warnings, if warnings count as errors. The database of another source is made."""
    sources(world, "a.cdefsrc", text=WRONG)
    sources(world, "b.cdefsrc", text=ODD)
    sources(world, "c.cdefsrc")
    for name in "ab":
        world.write(f"{name}.cdef", BEFORE)
    result = build(world, "--werror", *(f"{name}.cdefsrc" for name in "abc"))
    check(result.returncode == 1, "status", result.returncode)
    check(result.stderr.endswith(b"cdef: 3 databases: 1 written, 0 unchanged, 2 not made\n"), result.stderr)
    check(world.read("a.cdef") == world.read("b.cdef") == BEFORE and world.path("c.cdef").exists(), files(world))


# ---- What is said ----------------------------------------------------------------------------------------------------


@pytest.mark.parametrize("options", [(), ("--werror",), ("--no-warn=octal",), ("--format=json",), ("--format=sarif",)])
@pytest.mark.parametrize("text", [WRONG, ODD, HEAD])
def test_says_what_check_says(world, options, text):
    """The findings, their form and the exit status are those of cdef check."""
    world.write(SOURCE, text)
    checked = world.inspect("check", *options, SOURCE)
    expect(build(world, *options, SOURCE), checked.returncode, checked.stderr, checked.stdout)


def test_says_the_same_however_many_at_once(world):
    """The findings are in the order of the sources."""
    names = [f"{number:02}.cdefsrc" for number in range(40)]
    for number, name in enumerate(names):
        world.write(name, of_its_own(number // 2, (HEAD + attributes(60), WRONG, ODD)[number % 3]))
    one, four = (build(world, "-j", jobs, "-d", f"by{jobs}", *names, "missing") for jobs in "14")
    expect(four, one.returncode, one.stderr, one.stdout)
    check(one.returncode == 2 and files(world, "by1") == files(world, "by4"), files(world))
    for name in files(world, "by1"):
        check(world.read(f"by1/{name}") == world.read(f"by4/{name}"), "another database", name)


def test_warns_of_a_class_that_is_called_after_the_database(world):
    """But not of a class with a Name. cdef check does not know the database and does not warn of either."""
    world.write(SOURCE, NAMELESS)
    warning = (b"class.cdefsrc:3:1: warning: the class has no `Name`: it is called `d/x`, after the database [S601 no-name]\n"
               b"    3 | ResourceClass\n"
               b"      | ^~~~~~~~~~~~~\n")
    expect(build(world, "-d", "d", "--list", SOURCE), 0, stdout=b"d/class.cdef\n")
    world.path("d").mkdir()
    result = build(world, "-o", "d/x.cdef", SOURCE)
    check(result.returncode == 0 and result.stderr.startswith(warning), result.stderr)
    check(b"d/x\0" in world.read("d/x.cdef"), "called otherwise")
    check(world.inspect("check", "--werror", SOURCE).returncode == 0, "cdef check warns")


def test_writes_no_nameless_class_to_standard_output(world):
    """Standard output has no name after which the class could be called."""
    world.write(SOURCE, NAMELESS)
    result = build(world, "-o", "-", SOURCE)
    check(result.returncode == 1 and result.stdout == b"", result)
    check(b"error: Invalid cdef out file name (must end in .cdef) [S308]\n" in result.stderr, result.stderr)
    check(b"class.cdefsrc:3:1: note: this class has no `Name`, and is called after its database\n" in result.stderr,
          result.stderr)


def all_of(terminal):
    """Everything that has been written to a terminal that is no longer open."""
    said = b""
    try:
        while more := os.read(terminal, 10000):
            said += more
    except OSError:  # how a terminal ends
        os.close(terminal)
    return said


def test_warns_of_classes_that_contradict_each_other(world):
    """Each is correct by itself. Both databases are made; with --werror, the exit status is 1."""
    world.write("a.cdefsrc", HEAD)
    world.write("b.cdefsrc", HEAD.replace(b"FirstKey=1\n", b"FirstKey=50\n"))
    said = (b"b.cdefsrc:3: warning: the class `Disk` is also in a.cdefsrc:3 [S611 shared-name]\n"
            b"b.cdefsrc:12:11: warning: the keys 50 to 100 overlap 1 to 100 in a.cdefsrc:12, which has the message catalog "
            b"`mgr1.cat` too [S612 shared-keys]\n"
            b"   12 | \tFirstKey=50\n"
            b"      | \t         ^~\n"
            b"0 errors and 2 warnings in 1 of 2 sources\n")
    expect(build(world, "a.cdefsrc", "b.cdefsrc"), 0, said + b"cdef: 2 databases: 2 written, 0 unchanged, 0 not made\n")
    strict = build(world, "--werror", "--no-warn=S611", "a.cdefsrc", "b.cdefsrc")
    check(strict.returncode == 1 and b"S611" not in strict.stderr and b"S612" in strict.stderr, strict)
    expect(build(world, "--werror", "--no-warn=shared-name", "--no-warn=shared-keys", "a.cdefsrc", "b.cdefsrc"), 0,
           b"cdef: 2 databases: 0 written, 2 unchanged, 0 not made\n")
    for source in ("a.cdefsrc", "b.cdefsrc"):
        expect(world.inspect("check", "--werror", source), 0)


def test_warns_of_managers_and_variable_classes_that_contradict_each_other(world):
    """With the place in each source."""
    variables = b"ResourceVariableClass\n\tVariableClass=V\n\tObservationInterval=%d\n\tReportingInterval=60\n"
    world.write("a.cdefsrc", HEAD + variables % 5)
    other = HEAD.replace(b"Name=Disk", b"Name=Tape").replace(b"=Mgr1", b"=Mgr2").replace(b"FirstKey=1\n", b"FirstKey=101\n")
    world.write("b.cdefsrc", other.replace(b"LastKey=100", b"LastKey=200") + variables % 6)
    expect(build(world, "--no-warn=unused-variable-class", "a.cdefsrc", "b.cdefsrc"), 0,
           b"b.cdefsrc:11:18: warning: classes with the message catalog `mgr1.cat` have the manager `Mgr2` here and `Mgr1` in "
           b"a.cdefsrc:11 [S613 other-manager]\n"
           b"   11 | \tResourceManager=Mgr2\n"
           b"      | \t                ^~~~\n"
           b"b.cdefsrc:17:16: warning: the variable class `V` has other intervals or another alias than in a.cdefsrc:17 "
           b"[S614 other-variable-class]\n"
           b"   17 | \tVariableClass=V\n"
           b"      | \t              ^\n"
           b"0 errors and 2 warnings in 1 of 2 sources\n"
           b"cdef: 2 databases: 2 written, 0 unchanged, 0 not made\n")


def test_compares_no_numbers_of_different_classes(world):
    """The Id of an attribute belongs to its class."""
    sources(world, "a.cdefsrc", "b.cdefsrc", text=HEAD + attributes(2))
    expect(build(world, "--werror", "a.cdefsrc", "b.cdefsrc"), 0, b"cdef: 2 databases: 2 written, 0 unchanged, 0 not made\n")


def test_sarif_has_the_place_of_the_other_class(world):
    world.write("a.cdefsrc", HEAD)
    world.write("b.cdefsrc", HEAD.replace(b"Name=Disk", b"Name=Tape"))
    (result,) = json.loads(build(world, "--format=sarif", "a.cdefsrc", "b.cdefsrc").stdout)["runs"][0]["results"]
    (other,) = result["relatedLocations"]
    check(other["message"]["text"] == "the keys 1 to 100", other)
    check(other["physicalLocation"]["artifactLocation"]["uri"] == "a.cdefsrc", other)
    check(other["physicalLocation"]["region"] == {"startLine": 12, "startColumn": 11, "endColumn": 12}, other)


def test_shows_how_far_it_is_on_a_terminal_only(world):
    """The progress line is removed at the end. A terminal that cannot remove a line does not get one."""
    sources(world, "a.cdefsrc", "b.cdefsrc")
    for terminal, shown in (("xterm", True), ("dumb", False)):
        master, slave = os.openpty()
        result = build(world, "a.cdefsrc", "b.cdefsrc", stderr=slave, set={"TERM": terminal})
        os.close(slave)
        said = all_of(master)
        check(result.returncode == 0, said)
        check((b"\r\x1b[K[1/2] a.cdefsrc" in said) == shown, said)
        check(said.endswith(b"unchanged, 0 not made\r\n"), said)
    result = build(world, "a.cdefsrc", "b.cdefsrc")
    expect(result, 0, b"cdef: 2 databases: 0 written, 2 unchanged, 0 not made\n")


# ---- The time --------------------------------------------------------------------------------------------------------


def time_of(world):
    """Seconds and microseconds in a little- or big-endian database of this machine."""
    return struct.unpack("=II", world.read()[TIME])


@pytest.mark.parametrize("options, environment, expected", [
    ((), {}, (0, 0)),
    ((), {"SOURCE_DATE_EPOCH": "77"}, (77, 0)),
    (("--timestamp=none",), {"SOURCE_DATE_EPOCH": "77"}, (0, 0)),
    (("--timestamp=4294967295",), {"SOURCE_DATE_EPOCH": "77"}, (4294967295, 0)),
    (("--timestamp=5",), {"VX_CDB_FORCE_EMPTY_TIMESTAMP": ""}, (0, 0)),
])
def test_writes_the_time_that_is_asked_for(world, options, environment, expected):
    """The option overrides SOURCE_DATE_EPOCH, and VX_CDB_FORCE_EMPTY_TIMESTAMP overrides both."""
    made(world, *options, "-o", OUT, SOURCE, set=environment)
    check(time_of(world) == expected, time_of(world))
    world.verified()


def test_writes_the_time_of_the_build(world):
    """In seconds and microseconds."""
    before = int(time.time())
    made(world, "--timestamp=now", "-o", OUT, SOURCE)
    check(before <= time_of(world)[0] <= time.time(), time_of(world))
    world.verified()


def test_refuses_times_that_are_none(world):
    """From the option and from the environment."""
    wanted = b" is not none, now or seconds from 0 to 4294967295\n"
    expect(build(world, "--timestamp=soon", SOURCE), 2, b"cdef: --timestamp: 'soon'" + wanted)
    expect(build(world, SOURCE, set={"SOURCE_DATE_EPOCH": "4294967296"}), 2,
           b"cdef: SOURCE_DATE_EPOCH: '4294967296' is not seconds from 0 to 4294967295\n")


# ---- What is refused -------------------------------------------------------------------------------------------------


@pytest.mark.parametrize("arguments, message", [
    (("-o", "x", SOURCE, SOURCE), b"-o names one database, and there are 2 sources: use -d"),
    (("-d", "d", "a/x.cdefsrc", "b/x.cdefsrc"), b"d/x.cdef: it would be built from a/x.cdefsrc and from b/x.cdefsrc"),
    (("-d", "d", "-"), b"standard input has no name: name the database with -o"),
    (("-o", "-", "--format=json", SOURCE), b"-o - and --format json: both would be written to standard output"),
    (("-o", "-", "--depfile=x", SOURCE), b"-o - and --depfile: standard output has no name for which dependencies could be written"),
    (("-o", "x", "--byte-order=both", SOURCE), b"x: with --byte-order both, the database's name must end in .cdef"),
    (("empty",), b"empty: no sources in it (*.cdefsrc)"),
    (("-o", SOURCE, SOURCE), b"class.cdefsrc: cannot write: it is the source"),
    (("-o", "link", SOURCE), b"link: cannot write: it is the source"),
    (("-o", "empty", SOURCE), b"empty: cannot write: Is a directory"),
    (("-o", "/dev/null", SOURCE), b"/dev/null: cannot write: not a regular file"),
    (("-o", "no/x.cdef", SOURCE), b"no/x.cdef: cannot write: No such file or directory"),
    (("missing",), b"missing: cannot open because: No such file or directory"),
    (("good.cdef",), b"good.cdef: a database, not a source; 'cdef verify' checks databases"),
    (("-d", SOURCE, SOURCE), b"class.cdefsrc: Not a directory"),
])
def test_refuses(world, arguments, message):
    """With a reason and status 2; nothing is written."""
    world.good()
    world.path("empty").mkdir()
    world.path("link").symlink_to(SOURCE)
    before = files(world)
    expect(build(world, *arguments), 2, b"cdef: " + message + b"\n")
    check(files(world) == before, files(world))


@pytest.mark.parametrize("arguments, message", [
    (("--depfile", SOURCE, SOURCE), b"class.cdefsrc: cannot write: it is the source class.cdefsrc"),
    (("--depfile", "class.cdef", SOURCE), b"class.cdef: cannot write dependencies: it is a database"),
    (("--depfile", "here/class.cdef", SOURCE), b"here/class.cdef: cannot write dependencies: it is a database"),
    (("-o", "cdef.toml", SOURCE), b"cdef.toml: cannot write: it is the project file cdef.toml"),
    (("--depfile", "cdef.toml", SOURCE), b"cdef.toml: cannot write: it is the project file cdef.toml"),
    (("-j1", "-d", "p", "a/Disk.cdefsrc", "p/Disk.cdef"), b"p/Disk.cdef: cannot write: it is the source p/Disk.cdef"),
    (("-d", "p", "a/Disk.cdefsrc", "here/hard"), b"p/Disk.cdef: cannot write: it is the source here/hard"),
    (("one/x.cdefsrc", "two/x.cdefsrc"),
     b"two/../here/out/x.cdef: it would be built from one/x.cdefsrc and from two/x.cdefsrc"),
    ((".Disk.cdef.cdef-new", "Disk.cdefsrc"), b".Disk.cdef.cdef-new: cannot write: it is the source .Disk.cdef.cdef-new"),
    (("-o", ".d.cdef-new", "--depfile", "d", SOURCE), b".d.cdef-new: cannot write: it is the temporary file of d"),
    (("-o", "d", "--depfile", "here/.d.cdef-new", SOURCE), b".d.cdef-new: cannot write: it is the temporary file of d"),
    (("--list", "one/x.cdefsrc", "two/x.cdefsrc"),
     b"two/../here/out/x.cdef: it would be built from one/x.cdefsrc and from two/x.cdefsrc"),
])
def test_writes_to_no_file_that_it_reads_and_to_none_twice(world, arguments, message):
    """Whatever the files' names are."""
    sources(world, "a/Disk.cdefsrc", "p/Disk.cdef", "one/x.cdefsrc", "two/x.cdefsrc", ".Disk.cdef.cdef-new", "Disk.cdefsrc")
    world.path("hard").hardlink_to(world.path("p/Disk.cdef"))
    world.path("here").symlink_to(".")
    for name, text in (("cdef.toml", ""), ("one/cdef.toml", "[build]\ndirectory = '../out'\n"),
                       ("two/cdef.toml", "[build]\ndirectory = '../here/out'\n")):
        world.write(name, text.encode())
    before = {name: world.read(name) for name in files(world)}
    expect(build(world, *arguments), 2, b"cdef: " + message + b"\n")
    check({name: world.read(name) for name in files(world)} == before, files(world))


def test_builds_a_source_once_however_often_it_is_given(world):
    """But under each of its names, and replaces databases that have several names."""
    sources(world, "classes/a.cdefsrc", "classes/b.cdefsrc")
    world.path("linked").symlink_to("classes")
    said = b"cdef: 2 databases: 2 written, 0 unchanged, 0 not made\n"
    expect(build(world, "classes", "classes/a.cdefsrc", world.path("classes/b.cdefsrc"), "linked"), 0, said)
    world.path("classes/b.cdef").unlink()
    world.path("classes/b.cdef").hardlink_to(world.path("classes/a.cdef"))
    expect(build(world, "classes"), 0, said.replace(b"2 written, 0", b"1 written, 1"))
    world.path("classes/b.cdefsrc").unlink()
    world.path("classes/b.cdefsrc").symlink_to("a.cdefsrc")
    check(build(world, "-d", "both", "classes").returncode == 0 and len(files(world, "both")) == 2, files(world))


def test_takes_names_as_they_are(world):
    """Even names that the command line's library would change."""
    for name in ("[a,b]", "a b", "-o", "\xe4\n"):
        sources(world, f"./{name}.cdefsrc")
        made(world, "-o", f"./{name}", f"./{name}.cdefsrc")
        check(world.path(name).exists(), files(world))
    made(world, "-o", "[a]", SOURCE)
    check(world.path("[a]").exists(), files(world))


def test_says_what_is_wrong_in_json_too(world):
    """Including a source that cannot be read."""
    result = build(world, "--format=json", "missing", SOURCE)
    check(result.returncode == 2 and b"missing: cannot open" in result.stderr, result)
    json.loads(result.stdout)


def test_says_in_each_form_which_database_could_not_be_written(world):
    """A directory is in its place."""
    world.path(OUT).mkdir()
    why = f"{OUT}: cannot write: Is a directory"
    for form, found in (("json", lambda said: said["sources"][0]["unwritten"]),
                        ("gitlab", lambda said: [each["description"] for each in said]),
                        ("sarif", lambda said: [each["message"]["text"] for each in
                                                said["runs"][0]["invocations"][0]["toolExecutionNotifications"]])):
        result = build(world, "--format", form, "-o", OUT, SOURCE)
        expect(result, 2, f"cdef: {why}\n".encode(), result.stdout)
        check(found(json.loads(result.stdout)) == [why], result.stdout)
    result = build(world, "--format=github", "-o", OUT, SOURCE)
    check(f"::error file={SOURCE}::{why}\n".encode() in result.stdout, result.stdout)


# ---- Odd files -------------------------------------------------------------------------------------------------------


def test_names_a_link_that_leads_nowhere(world):
    """Each such link in a directory is reported; the other sources are built."""
    sources(world, "in/a.cdefsrc")
    world.path("in/b.cdefsrc").symlink_to("b.cdefsrc")
    world.path("in/c.cdefsrc").symlink_to("nowhere")
    world.path("in/d").symlink_to("d")
    expect(build(world, "in"), 2, b"cdef: in/b.cdefsrc: cannot open because: Too many levels of symbolic links\n"
           b"cdef: in/c.cdefsrc: cannot open because: No such file or directory\n"
           b"cdef: 3 databases: 1 written, 0 unchanged, 2 not made\n")
    check(files(world, "in") == ["a.cdef", "a.cdefsrc", "b.cdefsrc", "c.cdefsrc", "d"], files(world, "in"))


def test_names_a_directory_that_cannot_be_read(world):
    """Not the operand above it."""
    if os.geteuid() == 0:
        pytest.skip("root may read all directories")
    sources(world, "in/a.cdefsrc", "in/no/b.cdefsrc")
    world.path("in/no").chmod(0)
    expect(build(world, "in"), 2, b"cdef: in/no: Permission denied\n")
    world.path("in/no").chmod(0o700)


def test_names_the_temporary_file_that_cannot_be_made(world):
    """What is in its place is not a file of an earlier build, and stays."""
    temporary = world.path(".out.cdef.cdef-new")
    for make, remove, why in ((lambda: os.mkfifo(temporary), temporary.unlink, b"File exists"),
                              (temporary.mkdir, temporary.rmdir, b"File exists"),
                              (lambda: temporary.symlink_to("x"), temporary.unlink, b"Too many levels of symbolic links")):
        make()
        expect(build(world, "-o", OUT, SOURCE), 2, b"cdef: out.cdef: cannot write: .out.cdef.cdef-new: " + why + b"\n")
        remove()


def test_lists_no_name_with_a_newline(world):
    """The list would be ambiguous."""
    expect(build(world, "--list", "a", "b\nc.cdefsrc"), 2, b"cdef: --list: b\\nc.cdef: the name has a newline\n")
