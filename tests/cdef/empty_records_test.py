"""Test that reading databases takes at most 8 times the files and 16 MB, and compiling many classes little more than
their records.

EMPTY_RECORDS is how many records the databases have that say nothing: 30,000 by default, 10,000,000 in script/proof.
"""

import os
import re
import struct
import subprocess

import pytest

from bounded import MEGABYTES, run_bounded, run_within
from programs import PROGRAMS, environment

RECORDS = int(os.environ.get("EMPTY_RECORDS", "30000"))
MAP = """ClassToManagerMapping
	ResourceManager=Mgr1
	FirstKey=1
	LastKey=100
	MessageCatalog=mgr1.cat
	DescriptiveMessageSet=1
"""
HEADER, ANCHOR, CLASS = 80, 16, 224  # sizes in bytes
SECTION_COUNT = 24  # its offset in the header


def write_source(directory):
    """Writes a source of empty classes."""
    source = directory / "source"
    with source.open("w") as file:
        file.writelines("ControlDefinition\n" for _ in range(RECORDS))
        file.write(MAP)
    return source


def empty_classes(directory, name):
    """A database of classes that have nothing but the name of the file."""
    path = directory / f"{name}.cdef"
    subprocess.run([PROGRAMS.cdgen, write_source(directory), f"{name}.cdef"], cwd=directory, env=environment(), check=True)
    return path


def run_on(directory, command, *paths):
    """Runs a program on databases within the memory limit. With few records, only the program, their files and 4 MB:
    what is kept of each record would be hidden in the 16 MB."""
    if RECORDS > 1_000_000:
        return run_bounded(directory, command, *paths)
    files = sum(path.stat().st_size for path in (command[0], *paths))
    return run_within(directory, files + 4 * MEGABYTES, command, *paths)


def empty_anchors(directory):
    """A file in which the header is followed by anchors of zeros, each of which is wrong."""
    path = directory / "anchors.cdef"
    header = bytearray((PROGRAMS.images / "small.little.cdef").read_bytes()[:HEADER])
    header[SECTION_COUNT:SECTION_COUNT + 4] = struct.pack("<I", RECORDS)
    with path.open("wb") as file:
        file.write(header)
        file.write(bytes(ANCHOR * RECORDS))
    return path


@pytest.mark.slow(10)
def test_compile(directory):
    """For each class, little more than its record is kept. There is no map, so no image is made."""
    classes = max(RECORDS, 300_000)  # so many that the interpreter, which the program is forked from, is smaller
    source = directory / "source"
    source.write_text("ControlDefinition\n" * classes)
    if PROGRAMS.sanitizers:
        pytest.skip("a sanitizer takes memory of its own")
    with subprocess.Popen([PROGRAMS.cdgen, source, "out.cdef"], cwd=directory, stderr=subprocess.PIPE) as process:
        assert process.stderr.read() == b"No class-to-manager maps defined\n"
        _, status, used = os.wait4(process.pid, 0)
        process.returncode = os.waitstatus_to_exitcode(status)
    assert process.returncode == 1
    assert used.ru_maxrss * 1024 <= 2 * CLASS * classes + 8 * MEGABYTES


@pytest.mark.slow(10)
@pytest.mark.parametrize(("form", "mark"), [("text", b"too many to say which follow"), ("json", b'"diagnosed": false')])
def test_verify_many_findings(directory, form, mark):
    """Each anchor places its section at 0. With so many findings, no causes are shown."""
    path = empty_anchors(directory)
    status, out, errors = run_on(directory, [PROGRAMS.cdef, "verify", "--format", form], path)
    assert (status, errors) == (1, b"")
    found = marks = 0
    with out.open("rb") as lines:
        for line in lines:
            found += line.count(b"CDB203")
            marks += line.count(mark)
    assert (found, marks) == (RECORDS, 1)


@pytest.mark.slow(10)
@pytest.mark.parametrize(("form", "mark"), [
    ("sarif", b'"ruleId":"CDB203"'), ("github", b",title=CDB203::"), ("gitlab", b'"check_name": "CDB203"')])
def test_verify_many_findings_for_services(directory, form, mark):
    """Each finding is separate, with its own fingerprint if the form has fingerprints."""
    path = empty_anchors(directory)
    status, out, errors = run_on(directory, [PROGRAMS.cdef, "verify", "--format", form], path)
    assert (status, errors) == (1, b"")
    with out.open("rb") as lines:
        assert sum(mark in line for line in lines) == RECORDS
    text = out.read_bytes()
    prints = re.findall(rb'"(?:fingerprint|codeAndField/v1)": ?"(\w+)"', text)
    assert len(set(prints)) == len(prints)
    assert (len(prints) >= RECORDS) == (form != "github")


@pytest.mark.slow(10)
@pytest.mark.parametrize("form", ["text", "json", "hex"])
def test_dump(directory, form):
    """All classes are shown."""
    path = empty_classes(directory, "classes")
    status, out, errors = run_on(directory, [PROGRAMS.cdef, "dump", "--format", form], path)
    assert (status, errors) == (0, b"")
    assert out.stat().st_size > path.stat().st_size


@pytest.mark.slow(10)
def test_dump_damaged(directory):
    """hex also shows a file that is not sound."""
    path = empty_anchors(directory)
    assert run_on(directory, [PROGRAMS.cdef, "dump", "--format=hex"], path)[0] == 0


@pytest.mark.slow(10)
def test_verify_sound(directory):
    """There are no findings."""
    path = empty_classes(directory, "classes")
    status, out, errors = run_on(directory, [PROGRAMS.cdef, "verify"], path)
    assert (status, out.read_bytes(), errors) == (0, b"", b"")


@pytest.mark.slow(10)
@pytest.mark.parametrize("form", ["text", "json"])
def test_diff(directory, form):
    """All classes have different names."""
    before, after = empty_classes(directory, "before"), empty_classes(directory, "after")
    status, out, errors = run_on(directory, [PROGRAMS.cdef, "diff", "--format", form], before, after)
    assert (status, errors) == (1, b"")
    with out.open("rb") as lines:
        assert sum(line.count(b"ResourceClass") for line in lines) >= 2 * RECORDS
