"""Plant mistakes that "cdef check --fix" corrects in sound sources, and compare the corrected sources with the sound
ones.

Whatever is planted, a correction never adds errors, and correcting again changes nothing. A source with a single
mistake must become the sound source again, unless a misspelled name is equally similar to two names. A source that
several mistakes have made ambiguous need not.
"""

import json
import random
import re
import subprocess

import pytest

import generate_sources
from compare import none
from programs import PROGRAMS

GROUPS = 4
COUNT = 2000  # sources of all groups
SANITIZED_COUNT = 160
AMBIGUOUS = 0.03  # of the misspelled names

ATTRIBUTE = "Name Description DisplayName Id DataType VarietyRange"
REQUIRED = {
    "PersistentResourceAttribute": ATTRIBUTE,
    "PersistentClassAttribute": ATTRIBUTE,
    "DynamicResourceAttribute": ATTRIBUTE + " VariableType",
    "DynamicClassAttribute": ATTRIBUTE + " VariableType",
    "ResourceClass": "Properties ClassPermTemplate ResourcePermTemplate Description DisplayName",
    "ResourceAction": "Name Description DisplayName Id VarietyRange",
    "ClassAction": "Name Description DisplayName Id VarietyRange",
}
BYTE_ORDER_MARK = "\xef\xbb\xbf"  # sources are read as Latin-1
NAME = re.compile(r"^([ \t]*)([A-Za-z]+)(=|$)")
HEADER = re.compile(r"^[A-Z][A-Za-z]+$")


def misspelled(rng, name):
    """A word with one letter added, dropped, replaced or swapped with its neighbour."""
    at = rng.randrange(len(name))
    letter = rng.choice("abcdefghijklmnopqrstuvwxyz")
    return rng.choice((
        name[:at] + letter + name[at:],
        name[:at] + name[at + 1:],
        name[:at] + letter + name[at + 1:],
        name[:at] + name[at + 1:at + 2] + name[at:at + 1] + name[at + 2:],
    ))


def with_misspelling(rng, lines):
    """Misspells the name of a stanza or of an attribute."""
    at = rng.choice([at for at, line in enumerate(lines) if NAME.match(line)])
    lines[at] = NAME.sub(lambda m: m[1] + misspelled(rng, m[2]) + m[3], lines[at])


def with_misspelled_value(rng, lines):
    """Misspells a data type or a property."""
    places = [at for at, line in enumerate(lines) if re.match(r"^[ \t]+(DataType|Properties|VariableType)=\w+$", line)]
    at = rng.choice(places)
    name, value = lines[at].split("=")
    lines[at] = f"{name}={misspelled(rng, value)}"


def with_blank(rng, lines):
    """Puts a blank in front of an equals sign."""
    at = rng.choice([at for at, line in enumerate(lines) if re.match(r"^[ \t]+\w+=", line)])
    lines[at] = lines[at].replace("=", rng.choice((" =", "\t=", "  =")), 1)


def with_indented_header(rng, lines):
    """Puts a blank in front of a header."""
    at = rng.choice([at for at, line in enumerate(lines) if HEADER.match(line)])
    lines[at] = rng.choice((" ", "\t", "  ")) + lines[at]


def with_outdented_attribute(rng, lines):
    """Moves an attribute to column 1. The correction inserts a tab, so the line must have had one."""
    at = rng.choice([at for at, line in enumerate(lines) if re.match(r"^\t\w+=", line)])
    lines[at] = lines[at][1:]


def with_early_optional(rng, lines):
    """Moves the optional attribute after the last required one to an earlier place."""
    places = []
    for at, line in enumerate(lines):
        missing = set(REQUIRED.get(line, "").split())
        end = at + 1
        while missing and end < len(lines) and NAME.match(lines[end]) and not HEADER.match(lines[end]):
            missing.discard(NAME.match(lines[end])[2])
            end += 1
        optional = NAME.match(lines[end]) if end < len(lines) else None
        if line in REQUIRED and not missing and optional and optional[3] and optional[2] not in REQUIRED[line].split():
            places.append((at + 1, end))
    if places:
        first, after = rng.choice(places)
        lines.insert(rng.randrange(first, after), lines.pop(after))


PLANTS = [with_misspelling, with_misspelling, with_misspelled_value, with_blank, with_indented_header,
          with_outdented_attribute, with_early_optional]


def planted(rng, text):
    """The text with a mistake, and whether a name in it may be ambiguous."""
    kind = rng.randrange(len(PLANTS) + 2)
    if kind == len(PLANTS):
        return text.replace("\n", "\r\n"), False
    if kind > len(PLANTS):
        return BYTE_ORDER_MARK + text, False
    lines = text.split("\n")
    try:
        PLANTS[kind](rng, lines)
    except IndexError:  # there is no place for it
        pass
    return "\n".join(lines), kind < 3


def run(*arguments):
    """Runs `cdef check` on sources."""
    result = subprocess.run([PROGRAMS.cdef, "check", *arguments], capture_output=True, timeout=600, check=False)
    assert result.returncode in (0, 1), result.stderr[-1000:]
    return result


def errors_in(paths):
    """The number of errors in each source."""
    return [each["errors"] for each in json.loads(run("--json", *paths).stdout)["sources"]]


def fixed(paths):
    """Corrects the sources and returns the results."""
    run("--fix", *paths)
    return [path.read_bytes() for path in paths]


@pytest.fixture(name="sound", params=range(GROUPS))
def sound_sources(request, directory):
    """Correct sources in which nothing is corrected, each in a file, and a random generator."""
    share = (PROGRAMS.cases or (SANITIZED_COUNT if PROGRAMS.sanitizers else COUNT)) // GROUPS
    number = PROGRAMS.round * GROUPS + request.param
    paths = []
    for seed in range(number * share, (number + 1) * share):
        paths.append(directory / f"{seed}.cdefsrc")
        paths[-1].write_bytes(generate_sources.source(seed)[0])
    before = [path.read_bytes() for path in paths]
    kept = [(path, text) for path, text, after in zip(paths, before, fixed(paths)) if text == after]
    assert len(kept) > share * 0.9
    return kept, random.Random(number)


@pytest.mark.slow(5)
def test_one_mistake(sound):
    """The correction restores the sound source."""
    sources, rng = sound
    wrong, ambiguous = [], 0
    for path, text in sources:
        source, may_be = planted(rng, text.decode("latin-1"))
        path.write_bytes(source.encode("latin-1"))
        wrong.append((source.encode("latin-1"), may_be))
    paths = [path for path, _ in sources]
    before = errors_in(paths)
    problems = []
    for (path, text), (source, may_be), errors, result in zip(sources, wrong, before, fixed(paths)):
        if result == text or (errors == 0 and result == source):
            continue
        if may_be and result == source:
            ambiguous += 1
        else:
            problems.append(f"{path}: {source!r} became {result!r}")
    assert ambiguous <= AMBIGUOUS * len(sources)
    none(problems)


@pytest.mark.slow(5)
def test_many_mistakes(sound):
    """A correction never adds errors, and a second one changes nothing."""
    sources, rng = sound
    for path, text in sources:
        source = text.decode("latin-1")
        for _ in range(rng.randrange(2, 6)):
            source, _ = planted(rng, source)
        path.write_bytes(source.encode("latin-1"))
    paths = [path for path, _ in sources]
    before = errors_in(paths)
    once = fixed(paths)
    more = [f"{path}: {old} errors, then {new}" for path, old, new in zip(paths, before, errors_in(paths)) if new > old]
    none(more)
    none([f"{path} is corrected again" for path, one, two in zip(paths, once, fixed(paths)) if one != two])
