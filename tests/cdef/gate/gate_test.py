"""Test what `cdef gate` finds, the lines of its findings, and what it compares with what. tests/cdef/diff tests the
rules of `cdef diff --compat` themselves; the rules about recorded numbers are tested here.

The rules and their pairs are those of `cdef diff --compat`, which tests/cdef/diff tests; those about recorded numbers are
tested here."""

import json
import os
import subprocess

import pytest

from cases import HEAD, SOURCE, check, expect
from levels import LEVELS, RULES
from programs import PROJECT, TESTS

BASE = (TESTS / "cdef/diff/base.cdefsrc").read_text()

# The line of the changed source that a finding is about.
LINES = {
    "CMP101": "\tName=Lister", "CMP102": "\tId=61", "CMP103": "PersistentResourceAttribute",
    "CMP104": "\tDataType=UInt64", "CMP105": "ResourceAction", "CMP201": "PersistentResourceAttribute",
    "CMP202": "\tProperties=ReqdForDefine", "CMP203": "\tValidValue=0", "CMP204": "\tValidValue=7",
    "CMP205": "\tVarietyRange=1,1", "CMP206": "\tProperties=ReqdForDefine",
    "CMP207": "\tProperties=Public,ReqdForDefine,ReadOnly", "CMP208": "\tRange=1,30", "CMP209": "\tPermission=a",
    "CMP301": "\tName=Border", "CMP302": "DynamicResourceAttribute", "CMP303": "\tDataType=Float64",
}
ATTRIBUTE = ("PersistentResourceAttribute\n\tName={}\n\tDescription=3\n\tDisplayName=4\n\tId={}\n\tDataType={}\n"
             "\tVarietyRange=1,2\n")
DYNAMIC = ATTRIBUTE.replace("Persistent", "Dynamic") + "\tVariableType=State\n"
ACTION = "ResourceAction\n\tName={}\n\tDescription=5\n\tDisplayName=6\n\tId={}\n\tVarietyRange=1,2\n"


def changed(changes):
    """The base with some lines replaced."""
    text = "\n" + BASE
    for old, new in changes:
        check(text.count("\n" + old) == 1, "not once in the base:", old)
        text = text.replace("\n" + old, "\n" + new)
    return text[1:]


def write(world, name, text):
    """Writes a text file."""
    world.path(name).parent.mkdir(parents=True, exist_ok=True)
    world.write(name, text if isinstance(text, bytes) else text.encode())


def found(world, *arguments, **more):
    """The status, and the findings of all sources."""
    result = world.inspect("gate", "--format=json", *arguments, **more)
    check(result.returncode < 2, result.stderr)
    return result.returncode, [each for source in json.loads(result.stdout)["sources"] for each in source["findings"]]


def codes(findings):
    """The codes of findings, including those in notes."""
    return ({each["code"] for each in findings} |
            {note["message"][-7:-1] for each in findings for note in each["notes"] if note["message"].endswith("]")})


def with_class(*stanzas):
    """A class with these stanzas."""
    return HEAD.decode() + "".join(stanzas)


# ---- Rules -----------------------------------------------------------------------------------------------------------


@pytest.mark.parametrize("code,breaking,line,similar", RULES, ids=[rule[0] for rule in RULES])
def test_rule(world, code, breaking, line, similar):
    """At its level and those after it, with the line of the source. A similar change does not break it."""
    levels = {"1": "readers", "2": "clients", "3": "stored"}
    level = levels[code[3]]
    write(world, "old.cdefsrc", BASE)
    write(world, "new.cdefsrc", changed(breaking))
    status, findings = found(world, f"--level={level}", "--against=old.cdefsrc", "new.cdefsrc")
    check(status == 1 and code in codes(findings), findings)
    here = [each for each in findings if each["message"][2:].split(" (")[0] == line.split(" (")[0]]
    check(len(here) == 1 and here[0]["source"] == LINES[code], findings)
    lines = changed(breaking).split("\n")
    check(lines[here[0]["line"] - 1] == LINES[code], "line", here[0]["line"])
    for lower in LEVELS[: LEVELS.index(level)]:
        check(code not in codes(found(world, f"--level={lower}", "--against=old.cdefsrc", "new.cdefsrc")[1]), lower)
    write(world, "new.cdefsrc", changed(similar))
    _, findings = found(world, "--level=stored", "--against=old.cdefsrc", "new.cdefsrc")
    check(code not in codes(findings), findings)


def test_every_rule_has_its_line():
    """For all rules."""
    check([rule[0] for rule in RULES] == list(LINES), "rules")


@pytest.mark.parametrize("level", LEVELS)
def test_is_silent_against_itself(world, level):
    """As a source, as a database of either byte order, and in a directory."""
    write(world, "new/class.cdefsrc", BASE)
    for order in ("little", "big"):
        expect(world.inspect("build", "--no-warn=all", "--byte-order", order, "-o", f"{order}.cdef", "new/class.cdefsrc"), 0)
        expect(world.inspect("gate", "--level", level, "--against", f"{order}.cdef", "new/class.cdefsrc"), 0)
    expect(world.inspect("gate", "--level", level, "--against", "big.cdef", "little.cdef"), 0)
    expect(world.inspect("gate", "--level", level, "--against", "new", "new"), 0)


def test_shows_what_breaks(world):
    """As text. By default, only changes that break readers."""
    write(world, "old.cdefsrc", with_class(ATTRIBUTE.format("Size", 1, "Int32")))
    write(world, "new.cdefsrc", with_class(ATTRIBUTE.format("Size", 2, "Int32")))
    line = HEAD.count(b"\n") + 5
    expect(world.inspect("gate", "--against=old.cdefsrc", "new.cdefsrc"), 1,
           b"new.cdefsrc:%d:5: error: ~ PersistentResourceAttribute 'Size': Id 1 -> 2 "
           b"(readers know it by its number) [CMP102]\n"
           b"   %d | \tId=2\n      | \t   ^\n1 error and 0 warnings\n" % (line, line))


def test_shows_databases_without_lines(world):
    """A database has no lines."""
    for number in (1, 2):
        write(world, SOURCE, with_class(ATTRIBUTE.format("Size", number, "Int32")))
        expect(world.inspect("build", "-o", f"{number}.cdef", SOURCE), 0)
    expect(world.inspect("gate", "--against=1.cdef", "2.cdef"), 1,
           b"2.cdef: error: ~ PersistentResourceAttribute 'Size': Id 1 -> 2 (readers know it by its number) [CMP102]\n"
           b"1 error and 0 warnings\n")


@pytest.mark.parametrize("form", ["sarif", "github", "gitlab"])
def test_has_the_forms_of_check(world, form):
    """Each finding has its code and its line."""
    write(world, "old.cdefsrc", with_class(ATTRIBUTE.format("Size", 1, "Int32")))
    write(world, "new.cdefsrc", with_class(ATTRIBUTE.format("Size", 2, "Int32")))
    result = world.inspect("gate", "--format", form, "--against=old.cdefsrc", "new.cdefsrc")
    check(result.returncode == 1 and b"CMP102" in result.stdout, result)
    if form == "sarif":
        run = json.loads(result.stdout)["runs"][0]
        rules = run["tool"]["driver"]["rules"]
        check([rules[each["ruleIndex"]]["id"] for each in run["results"]] == ["CMP102"], "rule")


def test_names_a_nameless_class_after_the_older_one(world):
    """The older version is called after its own database."""
    nameless = HEAD.replace(b"\tName=Disk\n", b"")
    write(world, "new.cdefsrc", nameless)
    world.path("old").mkdir()
    expect(world.inspect("build", "-q", "-o", "old/place.cdef", "new.cdefsrc"), 0)
    expect(world.inspect("gate", "--against=old/place.cdef", "new.cdefsrc"), 0)
    write(world, "old.cdefsrc", HEAD)
    check(codes(found(world, "--against=old.cdefsrc", "new.cdefsrc")[1]) == {"CMP101"}, "a name that is gone")


# ---- Older versions --------------------------------------------------------------------------------------------------


def test_looks_for_the_file_in_a_directory(world):
    """A database is preferred to a source. A new class has no older version, which is not an error."""
    old, new = with_class(ATTRIBUTE.format("Size", 1, "Int32")), with_class(ATTRIBUTE.format("Size", 2, "Int32"))
    write(world, "new/a.cdefsrc", new)
    write(world, "old/b.cdefsrc", B)
    write(world, "new/b.cdefsrc", B)
    expect(world.inspect("gate", "--against=old", "new/a.cdefsrc", "new/b.cdefsrc"), 0)
    write(world, "old/a.cdefsrc", old)
    check(codes(found(world, "--against=old", "new")[1]) == {"CMP102"}, "source")
    for name in ("a.cdef", "a.be.cdef"):
        expect(world.inspect("build", "-o", f"old/{name}", "new/a.cdefsrc"), 0)
        expect(world.inspect("gate", "--against=old", "new"), 0)
        world.path(f"old/{name}").unlink()


def test_mentions_a_directory_that_has_none_of_the_classes(world):
    """It may be empty by mistake. A first release still passes; classes that are gone are reported themselves."""
    committed(world, "r", {"new/a.cdefsrc": A, "none/notes.txt": ""})
    said = b": has no older version of any of the classes, which all count as new\n"
    for against in ("none", "git:HEAD:none"):
        for operand in ("new", "new/a.cdefsrc"):
            expect(world.inspect("gate", "--against", against, operand, cwd=world.path("r")), 0,
                   b"cdef: " + against.encode() + said)
        expect(world.inspect("gate", "-q", "--against", against, "new", cwd=world.path("r")), 0)
    write(world, "r/new/b.cdefsrc", B)
    write(world, "r/none/b.cdefsrc", B)
    expect(world.inspect("gate", "--against=none", "new", cwd=world.path("r")), 0)
    expect(world.inspect("gate", "--against=git:HEAD", "new", cwd=world.path("r")), 0)


def test_finds_the_older_version_of_a_database_of_one_byte_order(world):
    """In a directory of databases that have plain names or those of the other byte order."""
    write(world, "old.cdefsrc", with_class(ATTRIBUTE.format("Size", 1, "Int32")))
    write(world, "Disk.cdefsrc", with_class(ATTRIBUTE.format("Size", 2, "Int32")))
    expect(world.inspect("build", "-q", "--byte-order=both", "-d", "new", "Disk.cdefsrc"), 0)
    for name in ("Disk.cdef", "Disk.be.cdef"):
        world.path("old").mkdir()
        expect(world.inspect("build", "-q", "-o", f"old/{name}", "old.cdefsrc"), 0)
        for database in ("new/Disk.le.cdef", "new/Disk.be.cdef"):
            check(codes(found(world, "--against=old", database)[1]) == {"CMP102"}, name, database)
        world.path(f"old/{name}").unlink()
        world.path("old").rmdir()


def git(world, *arguments, cwd=None):
    """Runs git independently of the user's settings."""
    who = {f"GIT_{role}_{what}": "someone@example.com" for role in ("AUTHOR", "COMMITTER") for what in ("NAME", "EMAIL")}
    subprocess.run(["git", *arguments], cwd=cwd or world.path("."), check=True, stdout=subprocess.DEVNULL,
                   env={**os.environ, **who, "GIT_CONFIG_GLOBAL": "/dev/null", "GIT_CONFIG_NOSYSTEM": "1"})


def test_takes_older_versions_from_git(world):
    """The same file at a revision, or a file or directory at that revision."""
    old, new = with_class(ATTRIBUTE.format("Size", 1, "Int32")), with_class(ATTRIBUTE.format("Size", 2, "Int32"))
    write(world, "classes/a.cdefsrc", old)
    git(world, "init", "-q", ".")
    git(world, "add", "-A")
    git(world, "commit", "-qm", "old")
    write(world, "classes/a.cdefsrc", new)
    write(world, "classes/b.cdefsrc", new.replace("Name=Disk", "Name=New").replace("mgr1.cat", "b.cat"))
    for against in ("git:HEAD", "git:HEAD:classes", "git:HEAD:./"):
        status, findings = found(world, "--against", against, "classes")
        check((status, codes(findings)) == (1, {"CMP102"}), against, findings)
    check(codes(found(world, "--against=git:HEAD:classes/a.cdefsrc", "classes/a.cdefsrc")[1]) == {"CMP102"}, "file")
    git(world, "commit", "-qam", "new")
    expect(world.inspect("gate", "--against=git:HEAD", "classes/a.cdefsrc"), 0)
    check(codes(found(world, "--against=git:HEAD~1", "a.cdefsrc", cwd=world.path("classes"))[1]) == {"CMP102"}, "elsewhere")


def test_finds_the_repository_of_the_class_whatever_git_has_set(world):
    """Git sets GIT_DIR for hooks and aliases, and in a linked worktree also without them."""
    old, new = with_class(ATTRIBUTE.format("Size", 1, "Int32")), with_class(ATTRIBUTE.format("Size", 2, "Int32"))
    write(world, "r/classes/a.cdefsrc", old)
    write(world, "r/classes/other/b.cdefsrc", with_class().replace("Name=Disk", "Name=New").replace("mgr1.cat", "b.cat"))
    repository = world.path("r")
    git(world, "init", "-q", ".", cwd=repository)
    git(world, "add", "-A", cwd=repository)
    git(world, "commit", "-qm", "old", cwd=repository)
    git(world, "worktree", "add", "-q", "../w", cwd=repository)
    git(world, "init", "-q", "elsewhere")
    for place, inside in (("r", ".git"), ("w", "../r/.git/worktrees/w"), ("r", "../elsewhere/.git")):
        write(world, f"{place}/classes/a.cdefsrc", new)
        where = world.path(place)
        environment = {**os.environ, "GIT_DIR": str((where / inside).resolve()), "GIT_WORK_TREE": str(where)}
        for operand in ("classes/a.cdefsrc", "classes"):
            status, findings = found(world, "--against=git:HEAD", operand, cwd=where, env=environment)
            check((status, codes(findings)) == (1, {"CMP102"}), inside, operand, findings)


def test_stops_a_commit_as_a_hook(world):
    """In a linked worktree, where git names the repository to hooks."""
    write(world, "r/classes/a.cdefsrc", with_class(ATTRIBUTE.format("Size", 1, "Int32")))
    write(world, "r/.git-hooks/pre-commit", f"#!/bin/sh\nexec '{world.cdef}' gate --against=git:HEAD classes/a.cdefsrc\n")
    world.path("r/.git-hooks/pre-commit").chmod(0o755)
    git(world, "init", "-q", "r")
    git(world, "add", "-A", cwd=world.path("r"))
    git(world, "commit", "-qm", "old", cwd=world.path("r"))
    git(world, "worktree", "add", "-q", "../w", cwd=world.path("r"))
    commit = ("-c", "core.hooksPath=.git-hooks", "commit", "-qam", "new")
    write(world, "w/classes/a.cdefsrc", with_class(ATTRIBUTE.format("Size", 2, "Int32")))
    with pytest.raises(subprocess.CalledProcessError):
        git(world, *commit, cwd=world.path("w"))
    write(world, "w/classes/a.cdefsrc", with_class(ATTRIBUTE.format("Size", 1, "Int32")) + "# a comment\n")
    git(world, *commit, cwd=world.path("w"))


def committed(world, place, files):
    """A repository with these files, or links to (...,), in its last commit."""
    for name, text in files.items():
        if isinstance(text, tuple):
            world.path(f"{place}/{name}").parent.mkdir(parents=True, exist_ok=True)
            world.path(f"{place}/{name}").symlink_to(text[0])
        else:
            write(world, f"{place}/{name}", text)
    for arguments in (("init", "-q", "."), ("add", "-A"), ("commit", "-qm", "old")):
        git(world, *arguments, cwd=world.path(place))


def test_refuses_an_older_version_that_git_cannot_read(world):
    """It does not mistake it for a new class. Damaged file, listing, and a clone whose server is gone."""
    old = with_class(ATTRIBUTE.format("Size", 1, "Int32"))
    committed(world, "r", {"classes/a.cdefsrc": old, "c/b.cdefsrc": with_class()})
    git(world, "config", "uploadpack.allowFilter", "true", cwd=world.path("r"))
    git(world, "clone", "-q", "--filter=blob:none", "--no-checkout", f"file://{world.path('r')}", "clone")
    for place in ("r", "clone"):
        write(world, f"{place}/classes/a.cdefsrc", old.replace("Id=1", "Id=2"))
    for kind, revision in (("blob", "HEAD:classes/a.cdefsrc"), ("tree", "HEAD:classes")):
        name = subprocess.run(["git", "rev-parse", revision], cwd=world.path("r"), check=True, stdout=subprocess.PIPE,
                              text=True).stdout.strip()
        world.path(f"r/.git/objects/{name[:2]}/{name[2:]}").rename(world.path("gone"))
        for against, path in (("git:HEAD", "./a.cdefsrc"), ("git:HEAD:classes/a.cdefsrc", "classes/a.cdefsrc")):
            refused = (2, f"cdef: git:HEAD:{path}: git cannot read it\n".encode())
            arguments = ("gate", "--against", against, "classes/a.cdefsrc")
            expect(world.inspect(*arguments, cwd=world.path("r")), *refused)
            if kind == "blob":
                world.path("r").rename(world.path("moved"))
                expect(world.inspect(*arguments, cwd=world.path("clone")), *refused)
                world.path("moved").rename(world.path("r"))
        for against, path in (("git:HEAD", "./"), ("git:HEAD:classes", "classes")) if kind == "tree" else ():
            expect(world.inspect("gate", "--against", against, "classes", cwd=world.path("r")), 2,
                   f"cdef: git:HEAD:{path}: git cannot read it\n".encode())
        world.path("gone").rename(world.path(f"r/.git/objects/{name[:2]}/{name[2:]}"))


def test_follows_links_at_a_revision(world):
    """Of files and of directories, as the system does; not out of the repository."""
    old, new = with_class(ATTRIBUTE.format("Size", 1, "Int32")), with_class(ATTRIBUTE.format("Size", 2, "Int32"))
    committed(world, "r", {"shared/real.cdefsrc": old, "classes/second.cdefsrc": ("../shared/real.cdefsrc",),
                           "classes/a.cdefsrc": ("second.cdefsrc",), "linked": ("shared",), "out.cdefsrc": ("../x",),
                           "absolute.cdefsrc": ("/x",), "dangling.cdefsrc": ("x",), "circle.cdefsrc": ("circle.cdefsrc",)})
    write(world, "r/shared/real.cdefsrc", new)
    repository = world.path("r")
    for against, operand in (("git:HEAD", "classes/a.cdefsrc"), ("git:HEAD", "linked/real.cdefsrc"),
                             ("git:HEAD:linked", "shared/real.cdefsrc"), ("git:HEAD:linked/", "shared")):
        status, findings = found(world, "--against", against, operand, cwd=repository)
        check((status, codes(findings)) == (1, {"CMP102"}), against, operand, findings)
    for name, why in (("out", "a symbolic link that leads out of the repository"),
                      ("absolute", "a symbolic link that leads out of the repository"),
                      ("dangling", "a symbolic link that leads nowhere at that revision"),
                      ("circle", "too many symbolic links")):
        world.path(f"r/{name}.cdefsrc").unlink()
        write(world, f"r/{name}.cdefsrc", new)
        expect(world.inspect("gate", "--against=git:HEAD", f"{name}.cdefsrc", cwd=repository), 2,
               f"cdef: git:HEAD:./{name}.cdefsrc: {why}\n".encode())


# ---- Classes that are gone -------------------------------------------------------------------------------------------

A, B = (HEAD.replace(b"Name=Disk", name).replace(b"mgr1.cat", cat) for name, cat in
        ((b"Name=A", b"a.cat"), (b"Name=B", b"b.cat")))


def test_reports_a_class_that_is_gone(world):
    """Once, on each level, if its directory is given; from a source or from a database, which has no suffix then."""
    write(world, "new/a.cdefsrc", A)
    write(world, "old/a.cdefsrc", A)
    write(world, "old/b.cdefsrc", B)
    write(world, "old/.hidden.cdefsrc", B)
    write(world, "old/notes.txt", b"B")
    for level in LEVELS:
        expect(world.inspect("gate", "--level", level, "--against=old", "new"), 1,
               b"old/b.cdefsrc: error: - ResourceClass 'B' (readers miss it) [CMP101]\n1 error and 0 warnings in 1 of 2 sources\n")
    expect(world.inspect("gate", "--against=old", "new/a.cdefsrc"), 0)
    expect(world.inspect("build", "-q", "--byte-order=both", "-d", "old", "old/b.cdefsrc"), 0)
    world.path("old/b.cdefsrc").unlink()
    world.path("old/b.le.cdef").unlink()
    expect(world.inspect("gate", "--against=old", "new"), 1,
           b"old/b.be.cdef: error: - ResourceClass 'B' (readers miss it) [CMP101]\n1 error and 0 warnings in 1 of 2 sources\n")
    write(world, "other/b.cdefsrc", B)
    expect(world.inspect("gate", "--against=old", "new", "other"), 0)
    expect(world.inspect("gate", "--against=old", "new", "other/b.cdefsrc"), 0)


@pytest.mark.parametrize("form", ["json", "sarif", "github", "gitlab"])
def test_reports_a_class_that_is_gone_in_each_form(world, form):
    """With its file and its rule."""
    write(world, "new/a.cdefsrc", A)
    write(world, "old/b.cdefsrc", B)
    result = world.inspect("gate", "--format", form, "--against=old", "new")
    check(result.returncode == 1 and b"CMP101" in result.stdout and b"old/b.cdefsrc" in result.stdout, result)


def test_compares_a_class_that_is_in_another_file(world):
    """With its former file. It is not gone."""
    old, new = with_class(ATTRIBUTE.format("Size", 1, "Int32")), with_class(ATTRIBUTE.format("Size", 2, "Int32"))
    write(world, "old/a.cdefsrc", old)
    write(world, "new/b.cdefsrc", old)
    expect(world.inspect("gate", "--against=old", "new"), 0)
    write(world, "new/b.cdefsrc", new)
    status, findings = found(world, "--against=old", "new")
    check((status, [each["code"] for each in findings]) == (1, ["CMP102"]), findings)
    write(world, "new/b.cdefsrc", new.replace("Name=Disk", "Name=Drive"))
    status, findings = found(world, "--against=old", "new")
    check((status, [each["message"] for each in findings]) == (1, ["- ResourceClass 'Disk' (readers miss it)"]), findings)


def test_compares_a_class_whose_file_was_renamed(world):
    """If only its new file is given, with the file of its name that is gone: in its directory or anywhere in the
    repository. A file that is still there, or that cannot be compiled, is not its older version."""
    old, new = with_class(ATTRIBUTE.format("Size", 1, "Int32")), with_class(ATTRIBUTE.format("Size", 2, "Int32"))
    committed(world, "r", {"p/Disk.cdefsrc": old, "old/Disk.cdefsrc": old, "Wrong.cdefsrc": "wrong"})
    world.path("r/Wrong.cdefsrc").unlink()
    repository = world.path("r")
    for place in ("p", "q", "q/below"):
        write(world, f"r/{place}/Drive.cdefsrc", new)

    def compared(against, place, expected):
        at = {"cwd": repository if place == "p" else world.path(f"r/{place}")}
        operand = "p/Drive.cdefsrc" if place == "p" else "Drive.cdefsrc"
        status, findings = found(world, "--against", against, operand, **at)
        check((status, [each["code"] for each in findings]) == expected, against, place, findings)
    against = {"p": ("git:HEAD", "git:HEAD:old", "git:HEAD:./", "old"), "q": ("git:HEAD",), "q/below": ("git:HEAD",)}
    compared("git:HEAD", "p", (0, []))
    compared("git:HEAD:old", "p", (0, []))
    world.path("r/p/Disk.cdefsrc").unlink()
    for place, each in ((place, each) for place in against for each in against[place]):
        compared(each, place, (1, ["CMP102"]))
    status, findings = found(world, "--against=git:HEAD", "q", cwd=repository)
    check((status, [each["code"] for each in findings]) == (1, ["CMP102", "CMP102"]), findings)


def test_takes_all_classes_as_new_before_the_first_commit(world):
    """Only for HEAD. A damaged HEAD is not one without a commit."""
    write(world, "r/p/a.cdefsrc", A)
    git(world, "init", "-q", "r")
    repository = world.path("r")
    for against, operand in (("git:HEAD", "p/a.cdefsrc"), ("git:HEAD", "p")):
        expect(world.inspect("gate", "--against", against, operand, cwd=repository), 0)
    refused = b"cdef: p/a.cdefsrc: not in a git repository, or the repository has no revision "
    expect(world.inspect("gate", "--against=git:v1", "p/a.cdefsrc", cwd=repository), 2, refused + b"v1\n")
    git(world, "commit", "-qm", "nothing", "--allow-empty", cwd=repository)
    for each in world.path("r/.git/objects").glob("??/*"):
        each.unlink()
    expect(world.inspect("gate", "--against=git:HEAD", "p/a.cdefsrc", cwd=repository), 2, refused + b"HEAD\n")


def test_reports_a_class_that_is_gone_from_git(world):
    """From the directory that was given and those below it, or from the directory that is named; not from others."""
    for name, source in (("p/a", A), ("p/below/b", B), ("elsewhere/c", HEAD), ("p/.hidden/d", HEAD)):
        write(world, f"{name}.cdefsrc", source)
    git(world, "init", "-q", ".")
    git(world, "add", "-A")
    git(world, "commit", "-qm", "old")
    expect(world.inspect("gate", "--against=git:HEAD", "p"), 0)
    world.path("p/below/b.cdefsrc").unlink()
    gone = b"p/below/b.cdefsrc: error: - ResourceClass 'B' (readers miss it) [CMP101]\n1 error and 0 warnings in 1 of 2 sources\n"
    for directory in ("p", "./p/", "p/../p"):
        expect(world.inspect("gate", "--against=git:HEAD", directory), 1, gone)
    expect(world.inspect("gate", "--against=git:HEAD", "."), 1, gone.replace(b"of 2", b"of 4"))
    expect(world.inspect("gate", "--against=git:HEAD", ".", cwd=world.path("p")), 1, gone.replace(b"p/below", b"below", 1))
    expect(world.inspect("gate", "--against=git:HEAD", "p/a.cdefsrc"), 0)
    expect(world.inspect("gate", "--against=git:HEAD:p/below", "p"), 1, gone.replace(b"p/below", b"p", 1))
    write(world, "p/below/e.cdefsrc", B.replace(b"Name=B", b"Name=E"))
    expect(world.inspect("gate", "--against=git:HEAD:./", "p"), 1, gone.replace(b"of 2", b"of 3"))
    git(world, "add", "-A")
    git(world, "commit", "-qm", "new")
    expect(world.inspect("gate", "--against=git:HEAD", "p"), 0)


def test_does_not_know_what_a_damaged_older_version_had(world):
    """The other classes are compared."""
    write(world, "new/a.cdefsrc", A)
    write(world, "old/a.cdefsrc", A)
    write(world, "old/b.cdefsrc", B.replace(b"Description", b"Descripton", 1))
    write(world, "old/c.cdef", world.good(HEAD)[:100])
    expect(world.inspect("gate", "--against=old", "new"), 2,
           b"cdef: old/b.cdefsrc: not a source that compiles; 'cdef check' says why\n"
           b"cdef: old/c.cdef: not a sound database; 'cdef verify' says why\n")


def test_refuses_links_to_no_older_version(world):
    """A class is not new because of them. Such a link beside a new source does no harm."""
    write(world, "new/a.cdefsrc", A)
    write(world, "old/b.cdefsrc", B)
    world.path("new/circle.cdefsrc").symlink_to("circle.cdefsrc")
    expect(world.inspect("gate", "-q", "--against=old", "new/a.cdefsrc"), 0)
    for link, why in (("nowhere", b"No such file or directory"), ("a.cdef", b"Too many levels of symbolic links")):
        world.path("old/a.cdef").symlink_to(link)
        expect(world.inspect("gate", "--against=old", "new/a.cdefsrc"), 2, b"cdef: old/a.cdef: " + why + b"\n")
        world.path("old/a.cdef").unlink()


def test_refuses_older_versions_that_are_not_there(world):
    """Missing files, missing revisions, and no git."""
    write(world, "a.cdefsrc", HEAD)
    expect(world.inspect("gate", "--against=none", "a.cdefsrc"), 2, b"cdef: none: No such file or directory\n")
    expect(world.inspect("gate", "a.cdefsrc"), 2,
           b"cdef: a.cdefsrc: nothing to compare it with: name an older version with --against\n")
    expect(world.inspect("gate", "--against=git:-x", "a.cdefsrc"), 2, b"cdef: --against git:-x: not a revision\n")
    expect(world.inspect("gate", "--against=git:HEAD:", "a.cdefsrc"), 2, b"cdef: --against git:HEAD:: expected a path after "
           b"the second colon; ./ is the class's directory\n")
    missing = b"cdef: a.cdefsrc: not in a git repository, or the repository has no revision HEAD\n"
    expect(world.inspect("gate", "--against=git:HEAD", "a.cdefsrc"), 2, missing)
    without_git = world.inspect("gate", "--against=git:HEAD", "a.cdefsrc", env={"PATH": "/nowhere"})
    check(without_git.returncode == 2 and b"cdef: git: cannot run: " in without_git.stderr, without_git)
    git(world, "init", "-q", ".")
    git(world, "commit", "-qm", "nothing", "--allow-empty")
    expect(world.inspect("gate", "--against=git:HEAD:none", "a.cdefsrc"), 2,
           b"cdef: git:HEAD:none: no such file or directory at that revision\n")


def test_compares_one_file_with_one_class(world):
    """A file at a revision is refused for several classes as a plain file is."""
    committed(world, "r", {"a.cdefsrc": A, "p/a.cdefsrc": A, "p/b.cdefsrc": B})
    several = (2, b"cdef: --against names one file, and there are 2 classes\n")
    for against in ("p/a.cdefsrc", "git:HEAD:p/a.cdefsrc", "git:HEAD:./a.cdefsrc"):
        expect(world.inspect("gate", "--against", against, "p", cwd=world.path("r")), *several)
        expect(world.inspect("gate", "--against", against, "p/b.cdefsrc", "p/a.cdefsrc", cwd=world.path("r")), *several)
        expect(world.inspect("gate", "--against", against, "p/a.cdefsrc", cwd=world.path("r")), 0)


def test_compares_each_source_once(world):
    """However often and however it is given. The directory still says what is gone."""
    old, new = with_class(ATTRIBUTE.format("Size", 1, "Int32")), with_class(ATTRIBUTE.format("Size", 2, "Int32"))
    write(world, "old/a.cdefsrc", old)
    write(world, "old/b.cdefsrc", B)
    write(world, "new/a.cdefsrc", new)
    for operands in (("new", "new/a.cdefsrc"), ("./new/../new/a.cdefsrc", "new/"),
                     (str(world.path("new").absolute()), "new/a.cdefsrc", "new")):
        status, findings = found(world, "--against=old", *operands)
        check((status, [each["message"] for each in findings]) == (1, [
            "~ PersistentResourceAttribute 'Size': Id 1 -> 2 (readers know it by its number)",
            "- ResourceClass 'B' (readers miss it)"]), operands, findings)
    expect(world.inspect("gate", "--against=old/a.cdefsrc", "old/a.cdefsrc", "old/./a.cdefsrc"), 0)


def test_compares_standard_input_with_a_file_only(world):
    """It has no name that could be looked for in a directory or at a revision."""
    old, new = with_class(ATTRIBUTE.format("Size", 1, "Int32")), with_class(ATTRIBUTE.format("Size", 2, "Int32"))
    committed(world, "r", {"a.cdefsrc": old})
    write(world, "new", new)
    for against in ("git:HEAD", "git:HEAD:a.cdefsrc", "."):
        with open(world.path("new"), "rb") as stdin:
            expect(world.inspect("gate", "--against", against, "-", stdin=stdin, cwd=world.path("r")), 2,
                   b"cdef: standard input has no file name by which to find its older version: compare it with a file\n")
    with open(world.path("new"), "rb") as stdin:
        status, findings = found(world, "--against=r/a.cdefsrc", "-", stdin=stdin)
    check((status, codes(findings)) == (1, {"CMP102"}), findings)


def test_refuses_what_cannot_be_compared(world):
    """Errors in sources are shown as by cdef check. An older version with errors is refused."""
    wrong = HEAD.replace(b"Description=1", b"Descripton=1", 1)
    write(world, "good.cdefsrc", HEAD)
    write(world, "wrong.cdefsrc", wrong)
    write(world, "damaged.cdef", world.good(HEAD)[:100])
    checked = world.inspect("check", "wrong.cdefsrc")
    expect(world.inspect("gate", "--against=good.cdefsrc", "wrong.cdefsrc"), 1, checked.stderr)
    for old, why in (("wrong.cdefsrc", b"not a source that compiles; 'cdef check' says why"),
                     ("damaged.cdef", b"not a sound database; 'cdef verify' says why")):
        expect(world.inspect("gate", f"--against={old}", "good.cdefsrc"), 2, b"cdef: %s: %s\n" % (old.encode(), why))
    expect(world.inspect("gate", "--against=good.cdefsrc", "none.cdefsrc"), 2,
           b"cdef: none.cdefsrc: No such file or directory\n")


# ---- Numbers ---------------------------------------------------------------------------------------------------------


def recorded(world, *stanzas, name="ids.lock"):
    """The file of numbers after an update with a class of these stanzas."""
    write(world, "a.cdefsrc", with_class(*stanzas))
    expect(world.inspect("gate", "--update", "--ids", name, "a.cdefsrc"), 0)
    return world.read(name).decode().split("\n")[1:-1]


def test_records_numbers_forever(world):
    """In a fixed order, each once. Numbers that are no longer used stay."""
    size, mode = "Disk\tPersistentResourceAttribute\t1\tInt32\tSize", "Disk\tDynamicResourceAttribute\t2\tString\tMode"
    check_action = "Disk\tResourceAction\t1\t-\tCheck"
    stanzas = (DYNAMIC.format("Mode", 2, "String"), ATTRIBUTE.format("Size", 1, "Int32"), ACTION.format("Check", 1))
    check(recorded(world, *stanzas) == [size, mode, check_action], "all")
    check(recorded(world, *stanzas[:1]) == [size, mode, check_action], "gone")
    with world.left_alone("ids.lock"):
        recorded(world, *stanzas)


def test_records_numbers_beside_the_source(world):
    """Wherever the command runs; with a project file, beside that, so that a project has one file."""
    write(world, "p/a.cdefsrc", A)
    write(world, "p/sub/b.cdefsrc", B)
    expect(world.inspect("gate", "--update", "p"), 0)
    check(not world.path("ids.lock").exists(), "in the working directory")
    check(world.path("p/ids.lock").exists() and world.path("p/sub/ids.lock").exists(), "not beside the sources")
    for name in ("p/ids.lock", "p/sub/ids.lock"):
        world.path(name).unlink()
    one = with_class(ATTRIBUTE.format("Size", 1, "Int32"))
    write(world, "p/a.cdefsrc", one.replace("Name=Disk", "Name=A"))
    write(world, "p/sub/b.cdefsrc", one.replace("Name=Disk", "Name=B"))
    write(world, "p/cdef.toml", "")
    expect(world.inspect("gate", "--update", "./p/a.cdefsrc", "p/sub/../sub/b.cdefsrc"), 0)
    lines = world.read("p/ids.lock").decode().split("\n")[1:-1]
    check([each.split("\t")[0] for each in lines] == ["A", "B"] and not world.path("p/sub/ids.lock").exists(), lines)
    expect(world.inspect("gate", "a.cdefsrc", cwd=world.path("p")), 0)
    expect(world.inspect("gate", "b.cdefsrc", cwd=world.path("p/sub")), 0)
    expect(world.inspect("gate", "--no-config", "p/sub/b.cdefsrc"), 2,
           b"cdef: p/sub/b.cdefsrc: nothing to compare it with: name an older version with --against\n")


@pytest.mark.parametrize("code,first,second,similar", [
    ("CMP401", ATTRIBUTE.format("Size", 1, "Int32"), ATTRIBUTE.format("Room", 1, "Int32"), ACTION.format("Room", 1)),
    ("CMP401", ACTION.format("Check", 1), ACTION.format("Repair", 1), ACTION.format("Repair", 2)),
    ("CMP402", ATTRIBUTE.format("Size", 1, "Int32"), DYNAMIC.format("Size", 1, "Int32"), DYNAMIC.format("Size", 2, "Int32")),
    ("CMP403", ATTRIBUTE.format("Size", 1, "Int32"), ATTRIBUTE.format("Size", 1, "UInt32"),
     ATTRIBUTE.format("Size", 2, "UInt32")),
])
def test_refuses_a_number_that_was_something_else(world, code, first, second, similar):
    """Unless --update accepts it. Another number, or the same number of another kind of object, is new."""
    recorded(world, first)
    recorded(world)
    write(world, "a.cdefsrc", with_class(second))
    status, findings = found(world, "a.cdefsrc")
    check((status, codes(findings)) == (1, {code}), findings)
    check(findings[0]["source"] in ("\tId=1", "\tDataType=UInt32"), findings)
    write(world, "a.cdefsrc", with_class(similar))
    status, findings = found(world, "a.cdefsrc")
    check((status, codes(findings)) == (0, {"CMP404"}), findings)
    recorded(world, second)
    expect(world.inspect("gate", "a.cdefsrc"), 0)


def test_warns_of_numbers_that_are_not_recorded(world):
    """With --werror, this is an error."""
    recorded(world)
    write(world, "a.cdefsrc", with_class(ATTRIBUTE.format("Size", 1, "Int32")))
    line = HEAD.count(b"\n") + 5
    said = (b"a.cdefsrc:%d:5: warning: the number 1 of the `PersistentResourceAttribute` `Size` of type `Int32` is not "
            b"recorded [CMP404 unrecorded-number]\n   %d | \tId=1\n      | \t   ^\n0 errors and 1 warning\n" % (line, line))
    expect(world.inspect("gate", "a.cdefsrc"), 0, said)
    expect(world.inspect("gate", "--werror", "a.cdefsrc"), 1, said)


def test_refuses_files_of_numbers_that_say_something_else(world):
    """Invalid and contradictory files are refused, with the line."""
    write(world, "a.cdefsrc", HEAD)
    line = "Disk\tPersistentResourceAttribute\t1\tInt32\tSize\n"
    expect(world.inspect("gate", "--ids=none", "a.cdefsrc"), 2, b"cdef: none: No such file or directory\n")
    for text in (line.replace("\t1\t", "\tx\t"), line.replace("Persistent", "Persisten"), line.replace("\tSize", ""),
                 line.replace("Size", "Size\tx"), line.replace("Size", "Si\\qze"), "<<<<<<< ours\n"):
        write(world, "ids.lock", "# comment\n\n" + text)
        expect(world.inspect("gate", "a.cdefsrc"), 2,
               b"cdef: ids.lock:3: expected class, kind, number, type and name, with tabs between\n")
    write(world, "ids.lock", line + line.replace("Persistent", "Dynamic").replace("Size", "Room"))
    expect(world.inspect("gate", "a.cdefsrc"), 2, b"cdef: ids.lock:2: the number is also that of the "
           b"`PersistentResourceAttribute` `Size` of type `Int32`\n")
    write(world, "ids.lock", line + line)
    expect(world.inspect("gate", "a.cdefsrc"), 0)


def test_records_a_nameless_class_under_the_name_of_its_file(world):
    """Not under the name that its database has, which begins with a directory."""
    nameless = with_class(ATTRIBUTE.format("Size", 1, "Int32")).replace("\tName=Disk\n", "")
    write(world, "Disk.cdefsrc", nameless)
    expect(world.inspect("build", "-q", "-o", "old/Disk.cdef", "--no-warn=all", "Disk.cdefsrc"), 2,
           b"cdef: old/Disk.cdef: cannot write: No such file or directory\n")
    world.path("old").mkdir()
    check(world.inspect("build", "-q", "-o", "old/Disk.cdef", "Disk.cdefsrc").returncode == 0, "not built")
    for against in ((), ("--against=old",)):
        expect(world.inspect("gate", "--update", *against, "Disk.cdefsrc"), 0)
        check(world.read("ids.lock").decode().split("\n")[1:] ==
              ["Disk\tPersistentResourceAttribute\t1\tInt32\tSize", ""], against)


def test_records_no_two_meanings_at_once(world):
    """Two sources of one class, of which only one can be right."""
    write(world, "a.cdefsrc", with_class(ATTRIBUTE.format("Size", 1, "Int32")))
    write(world, "b.cdefsrc", with_class(ATTRIBUTE.format("Room", 1, "Int32")))
    write(world, "c.cdefsrc", with_class(ATTRIBUTE.format("Size", 1, "Int32")))
    status, findings = found(world, "--update", "a.cdefsrc", "b.cdefsrc", "c.cdefsrc")
    check((status, [each["code"] for each in findings]) == (1, ["CMP401"]), findings)
    check(world.read("ids.lock").decode().split("\n")[1:] ==
          ["Disk\tPersistentResourceAttribute\t1\tInt32\tSize", ""], "recorded")


def test_records_no_numbers_of_a_class_that_breaks_an_older_version(world):
    """The numbers of the other classes are recorded. Without the older version, all are, and if
    the classes are compared with themselves."""
    one = ATTRIBUTE.format("Size", 1, "Int32")
    write(world, "old/a.cdefsrc", with_class(one))
    write(world, "new/a.cdefsrc", with_class(one.replace("Id=1", "Id=2")))
    write(world, "new/b.cdefsrc", with_class(one).replace("Name=Disk", "Name=Tape"))
    arguments = ("--update", "--ids=ids.lock", "new/a.cdefsrc", "new/b.cdefsrc")
    status, findings = found(world, "--against=old", *arguments)
    check((status, [each["code"] for each in findings]) == (1, ["CMP102"]), findings)
    size = "PersistentResourceAttribute\t{}\tInt32\tSize"
    check(world.read("ids.lock").decode().split("\n")[1:] == ["Tape\t" + size.format(1), ""], "with")
    for intended in ((), ("--against=new",)):
        expect(world.inspect("gate", *arguments, *intended), 0)
        check(world.read("ids.lock").decode().split("\n")[1:] ==
              ["Disk\t" + size.format(2), "Tape\t" + size.format(1), ""], intended)
        world.path("ids.lock").unlink()


def test_refuses_lines_that_end_with_a_carriage_return(world):
    """With a reason."""
    write(world, "a.cdefsrc", HEAD)
    write(world, "ids.lock", "# comment\n\r\n")
    expect(world.inspect("gate", "a.cdefsrc"), 2,
           b"cdef: ids.lock:2: the line ends with a carriage return before the newline\n")


@pytest.mark.parametrize("arguments, message", [
    (("--update", "--ids=/dev/full"), b"/dev/full: not a regular file"),
    (("--ids=/dev/zero",), b"/dev/zero: not a regular file"),
    (("--against=/dev/zero",), b"/dev/zero: not a regular file"),
    (("--against=pipe",), b"pipe: not a regular file"),
    (("--ids=pipe",), b"pipe: not a regular file"),
    (("--ids=link",), b"link: No such file or directory"),
    (("--update", "--ids=link"), b"link: No such file or directory"),
    (("--against", ""), b"--against: expected a file, a directory, or git:REVISION"),
    (("--ids", ""), b"--ids: expected a file"),
    (("--config", ""), b"--config: expected a file"),
])
def test_refuses_names_of_no_file(world, arguments, message):
    """Even if the numbers could be checked. Nobody writes to the pipe, and the link leads nowhere."""
    write(world, "a.cdefsrc", HEAD)
    write(world, "ids.lock", "")
    os.mkfifo(world.path("pipe"))
    world.path("link").symlink_to("nowhere")
    expect(world.inspect("gate", *arguments, "a.cdefsrc"), 2, b"cdef: " + message + b"\n")


def test_refuses_a_default_file_of_numbers_that_is_no_file(world):
    """A link that leads nowhere is not a missing file, and a pipe is not waited for."""
    write(world, "old.cdefsrc", HEAD)
    write(world, "a.cdefsrc", HEAD)
    for make, why in ((lambda path: path.symlink_to("nowhere"), b"No such file or directory"),
                      (os.mkfifo, b"not a regular file")):
        make(world.path("ids.lock"))
        for arguments in (("--against=old.cdefsrc",), ("--update",)):
            expect(world.inspect("gate", *arguments, "a.cdefsrc"), 2, b"cdef: ids.lock: " + why + b"\n")
        world.path("ids.lock").unlink()


# ---- Project files ---------------------------------------------------------------------------------------------------


def test_reads_the_project_file(world):
    """Level, older version, numbers and --werror; options override them."""
    change = RULES[13]
    check(change[0] == "CMP209", change)
    write(world, "p/old/a.cdefsrc", BASE)
    write(world, "p/a.cdefsrc", changed(change[1]))
    write(world, "p/cdef.toml", "[gate]\nlevel = 'clients'\nbaseline = 'old'\n")
    check(codes(found(world, "p/a.cdefsrc")[1]) == {"CMP209"}, "not read")
    check(found(world, "--level=readers", "p/a.cdefsrc") == (0, []), "level")
    check(found(world, "--against=p/a.cdefsrc", "p/a.cdefsrc") == (0, []), "baseline")
    write(world, "p/cdef.toml", "[warnings]\nwerror = true\n[gate]\nbaseline = 'old'\nids = 'numbers'\n")
    expect(world.inspect("gate", "p/a.cdefsrc"), 2, b"cdef: p/numbers: No such file or directory\n")
    expect(world.inspect("gate", "--update", "p/a.cdefsrc"), 0)
    check(world.path("p/numbers").exists() and found(world, "p/a.cdefsrc") == (0, []), "numbers")
    write(world, "p/numbers", "")
    check(found(world, "p/a.cdefsrc")[0] == 1 and found(world, "--no-werror", "p/a.cdefsrc")[0] == 0, "werror")


def test_document_has_the_rules():
    """The rules about numbers."""
    text = (PROJECT / "docs/gate.md").read_text()
    check(all(f"| `CMP40{number}` |" in text for number in range(1, 5)), "rules")


def test_says_that_an_older_version_is_empty(world):
    """It is neither a source nor a damaged database."""
    write(world, "old/class.cdef", b"")
    write(world, SOURCE, BASE)
    for against in ("old", "old/class.cdef"):
        expect(world.inspect("gate", "--against", against, SOURCE), 2, b"cdef: old/class.cdef: the file is empty\n")
