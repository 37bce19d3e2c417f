"""Compare "cdef build" with cdgen on many sources: from the same source, it makes the same database, byte for byte, and
its first error is the one that cdgen prints.

The sources and their groups are those of check_sound_test.py; half of them are compiled for the other byte order.
Both programs are given the same names of databases, so that classes without a Name get the same name.
"""

import json
import subprocess

import pytest

from check_sound_test import BATCH, EXAMPLES, GROUPS, TESTS, compiled, keep, made, same
from compare import none
from programs import PROGRAMS, environment

LITTLE = b"1tmf"


def native_order(directory):
    """The option for the byte order that cdgen writes without -s."""
    (directory / "probe.cdefsrc").write_bytes((EXAMPLES / "Process.cdefsrc").read_bytes())
    subprocess.run([PROGRAMS.cdgen, "probe.cdefsrc", "probe.cdef"], cwd=directory, check=True)
    return "little" if (directory / "probe.cdef").read_bytes()[8:12] == LITTLE else "big"


def built(paths, order, place):
    """The findings of cdef build for each source. The databases are in "out" in a directory."""
    command = [PROGRAMS.cdef, "build", "-d", "out", "-j2", f"--byte-order={order}", "--format=json", *paths]
    result = subprocess.run(command, cwd=place, capture_output=True, timeout=600, env=environment())
    if result.returncode not in (0, 1) or result.stderr:
        raise RuntimeError(f"status {result.returncode}: {result.stderr!r}")
    return json.loads(result.stdout)


def by_source(document):
    """The findings of each source, in their order."""
    sources = document if isinstance(document, list) else document["sources"]
    return [each["findings"] for each in sources]


def differences(paths, swap, native, directory):
    """The differences for some sources, and the number of sources that compile."""
    places = [directory / name for name in ("cdgen", "cdef")]
    for place in places:
        (place / "out").mkdir(parents=True, exist_ok=True)
        for old in (place / "out").iterdir():
            old.unlink()
    other = {"little": "big", "big": "little"}[native]
    jobs = [f"out/{path.stem}.cdef" for path in paths]
    said = compiled(PROGRAMS.compile_many, paths, places[0], jobs, ["-s"] if swap else [])
    found = by_source(built(paths, other if swap else native, places[1]))
    problems = []
    for path, database, expected, findings in zip(paths, jobs, said, found):
        errors = [each for each in findings if each["severity"] == "error"]
        if not same(expected, errors):
            problems.append(f"{path}: cdgen says {expected!r}, cdef build {errors[:1]}")
        images = [place / database for place in places]
        if [image.exists() for image in images] != [expected is None] * 2:
            problems.append(f"{path}: databases of cdgen and cdef: {[image.exists() for image in images]}")
        elif expected is None and images[0].read_bytes() != images[1].read_bytes():
            problems.append(f"{path}: another database")
    return problems, said.count(None)


@pytest.mark.slow(9)
@pytest.mark.parametrize("group", range(GROUPS))
def test_same_databases(group, directory):
    """Half the sources of a group if --cases is given, as by script/proof; otherwise an eighth."""
    every = 2 if PROGRAMS.cases else 8
    golden = sorted((TESTS / "golden").glob("**/*.cdefsrc"))
    seeds = [path.read_bytes().decode("utf-8", "replace") for path in golden + sorted(EXAMPLES.glob("*.cdefsrc"))]
    native, paths, problems, good = native_order(directory), [], [], 0
    for number, text in enumerate(made([text for text in seeds if len(text) < 50000], group)):
        if number % every == 0:
            paths.append(directory / f"{number}.cdefsrc")
            paths[-1].write_bytes(text)
    for start in range(0, len(paths), BATCH):
        more, compile = differences(paths[start:start + BATCH], start // BATCH % 2 == 1, native, directory)
        problems += more
        good += compile
    keep(problems)
    none(problems)
    assert good > 0 or len(paths) < BATCH, "nothing compiles"
