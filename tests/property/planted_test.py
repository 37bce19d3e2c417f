"""Plant mistakes in correct sources, and measure how "cdef check" reports them.

A mistake is found if there is a finding that the correct source does not have, at a line where the mistake should be
reported: the line of the finding itself, not that of a note. All errors but one are counted as errors that follow
from the mistake. At least 99 of 100 mistakes are found, with fewer than one error in 100 that follows from another.

Option --cases of pytest is the number of mistakes, at least 1,600. --keep names a directory for the sources of
mistakes that are not found or that cause further errors.
"""

import collections
import json
import random
import subprocess

import pytest

import generate_sources
import plant_mistakes
from programs import EXAMPLES, PROGRAMS

COUNT = 2400
LEAST = 1600  # with fewer, a single mistake may be one of a hundred
GROUPS = 4
BATCH = 100
FOUND = 0.99
FOLLOWING = 0.01


def sound_source(number):
    """A correct source; one in four is an example."""
    examples = sorted(EXAMPLES.glob("*.cdefsrc"))
    if number % 4 == 0:
        return examples[number // 4 % len(examples)].read_text()
    return generate_sources.source(number)[0].decode("latin-1")


def planted(count, first):
    """So many mistakes, their kinds in turn: (kind, sound source, source with the mistake, lines)."""
    number = first * 1000003
    for at in range(count):
        kind = plant_mistakes.KINDS[at % len(plant_mistakes.KINDS)]
        made = None
        while made is None:
            number += 1
            sound = sound_source(number)
            made = plant_mistakes.plant(random.Random(number), sound, kind)
        yield kind, sound, *made


def findings(sources, directory):
    """The findings for each of the sources."""
    paths = [directory / f"{number}.cdefsrc" for number in range(len(sources))]
    for path, source in zip(paths, sources):
        path.write_bytes(source.encode("latin-1"))
    result = subprocess.run([PROGRAMS.cdef, "check", "--format", "json", *paths], capture_output=True, timeout=600)
    return [each["findings"] for each in json.loads(result.stdout)["sources"]]


def added(before, after):
    """The findings that are new compared with the sound source; lines may have moved."""

    def known(finding):
        return finding["code"], finding["message"], finding["source"]

    left = collections.Counter(map(known, before))
    new = []
    for finding in after:
        if left[known(finding)] > 0:
            left[known(finding)] -= 1
        else:
            new.append(finding)
    return new


def measured(group, count, directory):
    """For each mistake of a group: its kind, its source, the lines, the findings, and the number of errors that follow
    from it."""
    mistakes = list(planted(count, PROGRAMS.round * GROUPS + group))
    for start in range(0, len(mistakes), BATCH):
        batch = mistakes[start:start + BATCH]
        before = findings([sound for _, sound, _, _ in batch], directory)
        after = findings([source for _, _, source, _ in batch], directory)
        for (kind, _, source, lines), one, other in zip(batch, before, after):
            new = added(one, other)
            found = any(finding["line"] in lines for finding in new)
            errors = sum(finding["severity"] == "error" for finding in new)
            yield kind, source, lines, new, found, max(errors - 1, 0)


@pytest.mark.slow(20)
@pytest.mark.parametrize("group", range(GROUPS))
def test_planted(group, directory):
    """At least 99 of 100 mistakes are found, with fewer than one consequential error in 100."""
    count = max(PROGRAMS.cases or (LEAST if PROGRAMS.sanitizers else COUNT), LEAST) // GROUPS
    lost, following = collections.Counter(), collections.Counter()
    for number, (kind, source, lines, new, found, errors) in enumerate(measured(group, count, directory)):
        lost[kind] += not found
        following[kind] += errors
        if PROGRAMS.keep and (errors or not found):
            shown = [f"{each['code']} {each['line']}" for each in new]
            name = f"{group}-{number}-{kind}-{'lost' if not found else 'following'}"
            (PROGRAMS.keep / f"{name}.cdefsrc").write_bytes(source.encode("latin-1"))
            (PROGRAMS.keep / f"{name}.txt").write_text(f"{lines}\n{shown}\n")
    assert lost.total() <= count * (1 - FOUND), f"of {count} mistakes not found: {+lost}"
    assert following.total() < count * FOLLOWING, f"errors that follow {count} mistakes: {+following}"
