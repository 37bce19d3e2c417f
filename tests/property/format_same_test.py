"""Format many sources: each compiles to the same database, keeps its comments, and does not change when formatted
again.

The sources are the golden cases, the examples, and those of generate_sources.py, which are written untidily first.
"""

import os
import subprocess

import pytest

import generate_sources
from check_sound_test import compiled
from compare import none
from programs import EXAMPLES, PROGRAMS, TESTS, environment
from untidy import LINE, comments, untidy

BATCH = 100
GROUPS = 4
COUNT = 2000  # generated sources that all groups make together; script/proof asks for more
SANITIZED_COUNT = 160


class Batch:
    """Some sources by name, in one directory for each form."""

    def __init__(self, directory, sources):
        self.directory = directory
        self.names = list(sources)
        self.write("given", sources)

    def write(self, form, sources):
        """Writes one form of the sources."""
        (self.directory / form).mkdir(parents=True)
        for name, text in sources.items():
            (self.directory / form / f"{name}.cdefsrc").write_bytes(text)

    def read(self, form):
        """Reads that form."""
        return {name: (self.directory / form / f"{name}.cdefsrc").read_bytes() for name in self.names}

    def databases(self, form):
        """The database of each source; None if it does not compile."""
        place = self.directory / form
        paths = [f"{name}.cdefsrc" for name in self.names]
        outputs = [f"{name}.cdef" for name in self.names]
        said = compiled(PROGRAMS.compile_many, paths, place, outputs)
        return {name: (place / output).read_bytes() if text is None else None
                for name, output, text in zip(self.names, outputs, said)}

    def format(self, form, *options):
        """Runs cdef format on all sources. Returns the names on standard output, and the status."""
        paths = [f"{name}.cdefsrc" for name in self.names]
        result = subprocess.run([PROGRAMS.cdef, "format", *options, *paths], cwd=self.directory / form,
                                capture_output=True, timeout=600, check=False, env=environment())
        return os.fsdecode(result.stdout).split(), result.returncode


def longest(text):
    """The lines that the compiler reads in pieces."""
    return [line for line in text.split(b"\n") if len(line) > LINE]


def differences(batch, form, *options):
    """Formats the sources in a directory, and returns what is wrong with the results."""
    given, before = batch.read("given"), batch.databases("given")
    batch.write(form, given)
    listed, status = batch.format(form, "-i", *options)
    assert not listed and status == (2 if None in before.values() else 0), (listed, status)
    made, after = batch.read(form), batch.databases(form)
    for name in batch.names:
        if before[name] is None and made[name] != given[name]:
            yield f"{name}: has errors and was changed"
        if before[name] != after[name]:
            yield f"{name}: another database with {options}"
        one, other = comments(given[name]), comments(made[name])
        if one != other if not options else sorted(one) != sorted(other):
            yield f"{name}: other comments with {options}"
        if longest(given[name]) != longest(made[name]):
            yield f"{name}: other long lines"
    again, _ = batch.format(form, "--check", *options)
    yield from (f"{name}: changed again with {options}" for name in again)


def generated(group):
    """The sources of a group in this round, tidy and untidy."""
    count = PROGRAMS.cases or (SANITIZED_COUNT if PROGRAMS.sanitizers else COUNT)
    share = count // GROUPS
    first = (PROGRAMS.round * GROUPS + group) * share
    for number in range(first, first + share):
        text, _ = generate_sources.source(number)
        yield str(number), text, untidy(number, text)


@pytest.mark.slow(3)
@pytest.mark.parametrize("group", range(GROUPS))
def test_generated(group, directory):
    """Untidy sources that compile."""
    problems, sources = [], list(generated(group))
    for start in range(0, len(sources), BATCH):
        some = sources[start:start + BATCH]
        batch = Batch(directory / str(start), {name: text for name, _, text in some})
        tidy = Batch(directory / f"tidy{start}", {name: text for name, text, _ in some}).databases("given")
        problems += [f"{name}: written untidily, it is another class"
                     for name, database in batch.databases("given").items() if database != tidy[name] or not database]
        problems += differences(batch, "formatted")
        problems += differences(batch, "reordered", "--reorder")
    none(problems)


def test_golden(directory):
    """All golden cases and examples. Those that do not compile are not changed."""
    paths = [*sorted((TESTS / "golden").glob("**/*.cdefsrc")), *sorted(EXAMPLES.glob("**/*.cdefsrc"))]
    sources = {f"{number}-{path.stem}": path.read_bytes() for number, path in enumerate(paths)}
    batch = Batch(directory, sources)
    none([*differences(batch, "formatted"), *differences(batch, "reordered", "--reorder")])
