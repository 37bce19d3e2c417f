"""Compare "cdef check" with cdgen on many sources.

cdef check finds no error in a source exactly if cdgen compiles it. Its first error is the one that cdgen prints: the
same text and, if cdgen prints one, the same line. If an error is reported at its cause, a note has cdgen's line. The
sources are the golden cases, golden cases and examples with a few changes, and those of generate_sources.py,
unchanged and with its mutations.

The generated sources are divided into groups, each of which is a test of its own. Everything follows from a group's
number. Option --keep of pytest names a directory for sources about which the two programs differ.
"""

import json
import os
import pathlib
import random
import re
import subprocess
import tempfile

import pytest

import generate_sources
from compare import none
from programs import EXAMPLES, PROGRAMS, TESTS, environment

BATCH = 100
GROUPS = 8
COUNT = 20000  # sources that all groups make together
SANITIZED_COUNT = 1000
MUTATIONS = 3  # of each source of generate_sources.py
WORDS = [
    "0", "-1", "1,2", "2,1", "4294967296", "99999999999999999999", "010", "0x", "0xAb", "abc", "", '""', '"', '"a" b',
    "Int32", "UInt64Array", "SD", "SDArray", "SBS", "RH", "None", "Float32", "String", "Binary", "Public", "Public,",
    "NoSuch", "Counter", "x", "1.5,0.5", "1e39", "a\\377b", "#", "//", "\r", "\t",
]
HEADERS = [
    "ControlDefinition", "ResourceClass", "ClassToManagerMapping", "ResourceVariableClass",
    "PersistentResourceAttribute", "PersistentClassAttribute", "DynamicResourceAttribute", "DynamicClassAttribute",
    "ClassAction", "ResourceAction", "PAttrSDDefinition", "DAttrSDDefinition", "DefineSDDefinition",
    "OnlineSDDefinition", "ActionInSDDefinition", "ActionOutSDDefinition",
]


def stanzas_of(lines):
    """The lines, cut in front of each header."""
    groups = [[]]
    for line in lines:
        if line[:1] not in ("", " ", "\t", "#", "/"):
            groups.append([])
        groups[-1].append(line)
    return groups


def change_lines(rng, lines, pool):
    """Makes one change of a line or of a stanza."""
    at = rng.randrange(len(lines)) if lines else 0
    kind = rng.randrange(12)
    if kind == 0 and lines:
        del lines[at]
    elif kind == 1 and lines:
        lines.insert(at, lines[at])
    elif kind == 2:
        lines.insert(at, rng.choice(pool))
    elif kind == 3 and lines:
        other = rng.randrange(len(lines))
        lines[at], lines[other] = lines[other], lines[at]
    elif kind == 4 and lines:
        name = lines[at].split("=")[0]
        lines[at] = f"{name}={rng.choice(WORDS)}"
    elif kind == 5 and lines and lines[at]:
        place = rng.randrange(len(lines[at]))
        lines[at] = lines[at][:place] + rng.choice("a= \t\"#/,0Z") + lines[at][place + rng.randrange(2):]
    elif kind == 6 and lines:
        lines[at] = lines[at].lstrip()
    elif kind == 7:
        lines.insert(at, rng.choice(HEADERS))
    elif kind == 8 and lines:
        lines[at] += rng.choice([" " * 300, "x" * 250, "#", "\r", '"'])
    elif kind == 9:
        groups = stanzas_of(lines)
        one, two = rng.randrange(len(groups)), rng.randrange(len(groups))
        groups[one], groups[two] = groups[two], groups[one]
        lines[:] = sum(groups, [])
    elif kind == 10:
        groups = stanzas_of(lines)
        groups.insert(rng.randrange(len(groups)), rng.choice(groups))
        lines[:] = sum(groups, [])
    elif kind == 11:
        groups = stanzas_of(lines)
        del groups[rng.randrange(len(groups))]
        lines[:] = sum(groups, [])


def generated(seeds, count, seed):
    """Changed sources."""
    rng = random.Random(seed)
    pool = [line for text in seeds for line in text.split("\n")]
    for _ in range(count):
        lines = rng.choice(seeds).split("\n")
        if len(lines) > 150:
            start = rng.randrange(len(lines) - 100)
            lines = lines[:20] + lines[start:start + 80] + lines[-8:]
        for _ in range(rng.choice((1, 1, 2, 3, 6))):
            change_lines(rng, lines, pool)
        yield "\n".join(lines)


def mutated(count, seed):
    """Correct sources, each with its mutations."""
    for number in range(seed * COUNT, seed * COUNT + -(-count // (1 + MUTATIONS))):
        text, _ = generate_sources.source(number)
        yield text
        for mutation in range(MUTATIONS):
            yield generate_sources.mutation(number * MUTATIONS + mutation, text)


def plain(text):
    """A message in which each run of replacement characters is one, because programs replace invalid bytes differently.
    """
    return re.sub("\ufffd+", "\ufffd", text.replace("\t", " "))


def compiled(program, paths, directory, outputs=None, options=()):
    """What cdgen, run by its driver, reports about each source; None if the source compiles."""
    outputs = outputs or ["out.cdef"] * len(paths)
    jobs = "".join("\t".join([*options, str(path), out]) + "\n" for path, out in zip(paths, outputs))
    result = subprocess.run([program], input=os.fsencode(jobs), cwd=directory, stdout=subprocess.PIPE, check=True,
                            timeout=600, env=environment())
    answers = [line.split(b"\t", 1) for line in result.stdout.split(b"\n")[:-1]]
    texts = [None if status == b"0" else text.removesuffix(b"\t").decode("utf-8", "replace") for status, text in answers]
    if len(texts) != len(paths):
        raise RuntimeError(f"{program} answers {len(texts)} of {len(paths)}")
    return texts


def same(expected, errors):
    """Whether the errors begin with the one that cdgen reports."""
    if expected is None or not errors:
        return expected is None and not errors
    message = plain(errors[0]["message"])
    lines = [note["line"] for note in errors[0]["notes"] if note["message"].startswith("the compiler stops here")]
    line = lines[0] if lines else errors[0]["line"]
    return plain(expected) in (f"{line}: {message}", message)


def differences(paths, directory):
    """The differences for some sources."""
    result = subprocess.run([PROGRAMS.cdef, "check", "--format", "json", *paths], capture_output=True, timeout=600)
    if result.returncode not in (0, 1) or result.stderr:
        return [f"status {result.returncode}: {result.stderr!r} for {paths}"]
    problems = []
    said = compiled(PROGRAMS.compile_many, paths, directory)
    for path, checked, expected in zip(paths, json.loads(result.stdout)["sources"], said):
        errors = [each for each in checked["findings"] if each["severity"] == "error"]
        if not same(expected, errors):
            problems.append(f"{path}: cdgen says {expected!r}, cdef check {errors[:1]}")
    return problems


def count():
    """The number of sources in all groups; smaller under a sanitizer."""
    return PROGRAMS.cases or (SANITIZED_COUNT if PROGRAMS.sanitizers else COUNT)


def made(seeds, group):
    """The sources of a group in this round, half of each kind."""
    share = count() // GROUPS
    number = PROGRAMS.round * GROUPS + group
    for text in generated(seeds, share // 2, number):
        yield text.encode()
    yield from mutated(share - share // 2, number)


@pytest.mark.slow(8)
@pytest.mark.parametrize("group", range(GROUPS))
def test_same_errors(group, directory):
    """The golden cases, in the first group, and the sources of a group."""
    golden = sorted((TESTS / "golden").glob("**/*.cdefsrc"))
    examples = sorted(EXAMPLES.glob("*.cdefsrc"))
    seeds = [path.read_bytes().decode("utf-8", "replace") for path in golden + examples]
    paths = golden if group == 0 else []
    for number, text in enumerate(made([text for text in seeds if len(text) < 50000], group)):
        paths.append(directory / f"{number}.cdefsrc")
        paths[-1].write_bytes(text)
    problems = []
    for start in range(0, len(paths), BATCH):
        problems += differences(paths[start:start + BATCH], directory)
    keep(problems)
    none(problems)


def keep(problems):
    """Copies the sources that differ to the directory of --keep."""
    for problem in problems if PROGRAMS.keep else ():
        source = pathlib.Path(problem.split(":")[0])
        (PROGRAMS.keep / source.name).write_bytes(source.read_bytes())
