"""Compare `cdef gate` with `cdef diff --compat` on many pairs of sources: at each level, both find the same differences
for the same reasons, and the gate reports nothing about a class that has not changed.

The first source of a pair comes from generate_sources.py. The second one is the first with a few changes such as
people make: other numbers, names, types, properties and ranges, and stanzas that are removed or added. A pair is not
used if one of its sources does not compile. Everything follows from a group's number.
"""

import json
import random
import subprocess

import pytest

import generate_sources
from check_sound_test import BATCH, compiled
from compare import none
from programs import PROGRAMS, environment

GROUPS = 8
COUNT = 160  # pairs that all groups make together
TRIES = 4    # for each pair
HEADERS = (b"PersistentResourceAttribute", b"PersistentClassAttribute", b"DynamicResourceAttribute",
           b"DynamicClassAttribute", b"ResourceAction", b"ClassAction")
VALUES = {
    b"Id": [b"0", b"1", b"2", b"7", b"300"],
    b"DataType": [b"Int32", b"UInt32", b"Float64", b"String"],
    b"Properties": [b"Public", b"ReqdForDefine", b"Public,OptForDefine", b"ReadOnly", b"Select"],
    b"VarietyRange": [b"1,1", b"1,9", b"2,3"],
    b"ValidValue": [b"1", b"0,3", b"5,9"],
    b"Range": [b"0,1", b"-5,100"],
    b"Permission": [b"r", b"a", b"x"],
    b"Name": [b"Other", b"Another"],
    b"ElementName": [b"Other"],
}


def is_header(line):
    """Whether a stanza begins with the line."""
    return line[:1].isalpha()


def without_stanza(chooser, lines):
    """The source without one attribute or action, and without the lines up to the next header."""
    places = [at for at, line in enumerate(lines) if line in HEADERS]
    if not places:
        return lines
    begin = chooser.choice(places)
    end = next((at for at in range(begin + 1, len(lines)) if is_header(lines[at])), len(lines))
    return lines[:begin] + lines[end:]


def with_other_value(chooser, lines):
    """The source with another value of one attribute, or without that line."""
    places = [at for at, line in enumerate(lines) if line.strip().partition(b"=")[0] in VALUES]
    if not places:
        return lines
    at = chooser.choice(places)
    name = lines[at].strip().partition(b"=")[0]
    if chooser.random() < 0.2:
        return lines[:at] + lines[at + 1:]
    return lines[:at] + [b"\t" + name + b"=" + chooser.choice(VALUES[name])] + lines[at + 1:]


def with_new_stanza(chooser, lines):
    """The source with a new attribute at the end."""
    kind = chooser.choice(HEADERS[:2])
    number = chooser.choice([b"0", b"3", b"900"])
    return lines + [kind, b"\tName=Added", b"\tDescription=1", b"\tDisplayName=2", b"\tId=" + number, b"\tDataType=Int32",
                    b"\tVarietyRange=1,1", b"\tProperties=" + chooser.choice(VALUES[b"Properties"])]


def changed(chooser, text):
    """The second source of a pair."""
    lines = text.split(b"\n")
    for _ in range(chooser.randint(1, 4)):
        change = chooser.choice((without_stanza, with_other_value, with_other_value, with_other_value, with_new_stanza))
        lines = change(chooser, lines)
    return b"\n".join(lines)


def run(*command, place):
    """The standard output of a run that may have findings."""
    result = subprocess.run([PROGRAMS.cdef, *command], cwd=place, capture_output=True, timeout=600, env=environment())
    if result.returncode not in (0, 1):
        raise RuntimeError(f"{command[0]}: status {result.returncode}: {result.stderr!r}")
    return result.stdout.decode()


def as_line(finding):
    """A finding in the form of cdef diff: further reasons are in notes, followed by their codes."""
    more = "".join("; " + note["message"].rpartition(" [")[0] for note in finding["notes"])
    return finding["message"][:-1] + more + ")"


def differences(names, level, place):
    """The pairs about which the two subcommands disagree."""
    document = json.loads(run("gate", "--format=json", f"--level={level}", "--against=old", *names, place=place))
    problems = []
    for name, source in zip(names, document["sources"]):
        database = name.replace("cdefsrc", "cdef")
        shown = run("diff", f"--compat={level}", f"old/{database}", f"new/{database}", place=place).splitlines()
        found = [as_line(each) for each in source["findings"]]
        if sorted(shown) != sorted(found):
            problems.append(f"{place / name}: {level}: diff {sorted(shown)}, gate {sorted(found)}")
    return problems


def pairs(place, count, seed):
    """The names of at most so many pairs: NAME.cdefsrc, old/NAME.cdef and new/NAME.cdef."""
    chooser = random.Random(seed)
    texts = []
    for number in range(count * TRIES):
        before = generate_sources.source(seed * 1_000_003 + number)[0]
        texts.append((before, changed(chooser, before)))
    good = []
    for side in ("old", "new"):
        (place / side).mkdir()
        paths = [place / side / f"{number}.cdefsrc" for number in range(len(texts))]
        for path, text in zip(paths, texts):
            path.write_bytes(text[side == "new"])
        said = compiled(PROGRAMS.compile_many, paths, place / side, [f"{path.stem}.cdef" for path in paths])
        good.append({path.name for path, error in zip(paths, said) if error is None})
    names = sorted(good[0] & good[1], key=lambda name: int(name.partition(".")[0]))[:count]
    for name in names:
        (place / "new" / name).rename(place / name)
        (place / "old" / name).rename(place / "old" / f"{name}.text")
    return names


@pytest.mark.slow(6)
@pytest.mark.parametrize("group", range(GROUPS))
def test_finds_what_diff_finds(group, directory):
    """At each level in turn. A source compared with itself has no findings."""
    count = (PROGRAMS.cases or COUNT) // GROUPS
    names = pairs(directory, count, PROGRAMS.round * GROUPS + group)
    assert len(names) >= count // 2, f"{len(names)} pairs compile"
    problems = []
    for start in range(0, len(names), BATCH):
        some = names[start:start + BATCH]
        for level in ("readers", "clients", "stored"):
            problems += differences(some, level, directory)
        itself = json.loads(run("gate", "--format=json", "--level=stored", "--against=.", *some, place=directory))
        problems += [f"{each['file']}: against itself: {each['findings']}" for each in itself["sources"] if each["findings"]]
    none(problems)
