"""Compare "cdef check" with cdgen on many sources.

A source has no error exactly when cdgen compiles it, and the first error is
the one that cdgen prints: the same text and, where cdgen tells one, the same
line.  The sources are the golden cases, and ones that a small generator makes
by changing golden cases and examples; the seed is fixed.
"""

import argparse
import json
import os
import pathlib
import random
import re
import subprocess
import sys
import tempfile

BATCH = 100
NO_SOURCE = "Invalid cdef out file name (must end in .cdef)"
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
    """One change of a line or of a stanza."""
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


def compile_one(program, path, directory):
    """What cdgen says about a source: None when it compiles it."""
    command = [program, path, directory / "out.cdef"]
    result = subprocess.run(command, capture_output=True, timeout=60)
    if result.returncode == 0:
        return None
    return result.stderr.decode("utf-8", "replace").removesuffix("\n")


def same(expected, errors):
    """Whether the errors begin with what cdgen said."""
    if expected is None or not errors:
        return expected is None and not errors
    first = errors[0]
    if not re.match(r"\d+: ", expected):
        return first["message"] == expected
    return expected in (f"{first['line']}: {first['message']}", first["message"])


def compare(options, paths, directory):
    """The differences for some sources."""
    result = subprocess.run([options.cdef, "check", "--format", "json", *paths], capture_output=True, timeout=600)
    if result.returncode not in (0, 1) or result.stderr:
        return [f"status {result.returncode}: {result.stderr!r} for {paths}"]
    problems = []
    for path, checked in zip(paths, json.loads(result.stdout)):
        expected = compile_one(options.cdgen, path, directory)
        errors = [each for each in checked["findings"] if each["severity"] == "error"]
        if expected is not None and NO_SOURCE in expected:
            continue
        if not same(expected, errors):
            problems.append(f"{path}: cdgen says {expected!r}, cdef check {errors[:1]}")
    return problems


def main():
    """Compare all and print the count."""
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--cdgen", required=True, type=lambda text: pathlib.Path(text).resolve())
    parser.add_argument("--cdef", required=True, type=lambda text: pathlib.Path(text).resolve())
    parser.add_argument("--count", type=int, default=0, help="how many sources to generate")
    parser.add_argument("--seed", type=int, default=1)
    parser.add_argument("--keep", type=pathlib.Path, help="where to leave sources that differ")
    options = parser.parse_args()
    here = pathlib.Path(__file__).resolve().parent
    golden = sorted(here.glob("golden/**/*.cdefsrc"))
    seeds = [path.read_bytes().decode("utf-8", "replace") for path in golden + sorted(here.glob("../examples/*.cdefsrc"))]
    seeds = [text for text in seeds if len(text) < 50000]
    checked, problems = 0, []
    with tempfile.TemporaryDirectory() as name:
        directory = pathlib.Path(name)
        os.chdir(directory)
        paths = list(golden)
        for number, text in enumerate(generated(seeds, options.count, options.seed)):
            paths.append(directory / f"{number}.cdefsrc")
            paths[-1].write_bytes(text.encode())
        for start in range(0, len(paths), BATCH):
            batch = paths[start:start + BATCH]
            problems += compare(options, batch, directory)
            checked += len(batch)
        for problem in problems:
            print(problem)
            if options.keep:
                source = pathlib.Path(problem.split(":")[0])
                (options.keep / source.name).write_bytes(source.read_bytes())
    print(f"{checked} sources, {len(problems)} differences")
    return 1 if problems else 0


if __name__ == "__main__":
    sys.exit(main())
