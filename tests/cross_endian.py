"""Hold this machine's cdgen and one of the other byte order against each other.

For every source: the same exit status, messages and traces, with and without
option s; and the file that one machine writes is, byte for byte, the file that
the other writes with option s, both ways round.

What the reversal leaves alone (see docs/format.md) stays in the order of the
machine that compiled.  A case whose image marks such places may differ there
and in the checksum, and nowhere else; no other source may differ at all.
"""

import argparse
import os
import pathlib
import sys

import cdb_image
import golden

CHECKSUM = range(4, 8)


class Source(golden.Case):
    """A plain source, which has no expectation beside it."""

    def parse(self, text):
        """Nothing is expected but what the other machine does."""


def load(path):
    """The case of an expectation, or of a source alone."""
    if path.with_suffix(".expect").exists():
        return golden.Case(path)
    case = Source.__new__(Source)
    case.expect, case.source, case.name = path, path.with_suffix(".cdefsrc"), path.as_posix()
    case.keys, case.setup, case.images = {}, [], {}
    return case


def run(case, program, runner, extra):
    """Status, both streams and the output file of one run."""
    os.environ["CDGEN_RUNNER"] = runner
    result, _, after = golden.run(case, program, extra)
    return (result.returncode, result.stdout, result.stderr), after.get(case.out)


def left_alone(case, order):
    """The bytes of a case's image that depend on the machine."""
    ours = case.expected_image(order, "little")
    theirs = case.expected_image(order, "big")
    if not ours or ours[0] == theirs[0]:
        return set()
    return {at for at, (a, b) in enumerate(zip(ours[0], theirs[0])) if a != b} | set(CHECKSUM)


def compare(case, options, here, there):
    """The differences between a run on each machine that ought to be alike."""
    outcome, written = run(case, options.here, "", here)
    other_outcome, other_written = run(case, options.there, options.runner, there)
    problems = []
    if outcome != other_outcome:
        problems.append(f"outcome differs:\n      here  {outcome!r}\n      there {other_outcome!r}")
    if (written is None) != (other_written is None):
        problems.append("only one machine wrote a file")
    elif written is not None and outcome[0] == 0:
        order = "big" if here else "little"
        allowed = left_alone(case, order)
        differing = [at for at, (a, b) in enumerate(zip(written, other_written)) if a != b and at not in allowed]
        if len(written) != len(other_written) or differing:
            problems.append(f"files differ, first at {differing[:1]}, sizes {len(written)} and {len(other_written)}")
    return problems


def main():
    """Compare all sources and print the count."""
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--here", type=pathlib.Path, required=True, help="cdgen of this machine, little-endian")
    parser.add_argument("--there", type=pathlib.Path, required=True, help="cdgen of the big-endian machine")
    parser.add_argument("--runner", default="", help="the command that runs programs of that machine")
    parser.add_argument("cases", nargs="+")
    options = parser.parse_args()
    options.here, options.there = options.here.resolve(), options.there.resolve()
    passed = failed = 0
    for path in golden.cases_of(options.cases):
        case = load(path)
        problems = []
        for here, there in (([], ["-s"]), (["-s"], [])):
            problems += compare(case, options, here, there)
        passed, failed = passed + (not problems), failed + bool(problems)
        if problems:
            print(f"FAIL {path}", *problems, sep="\n    ")
    print(f"{passed} passed, {failed} failed")
    return 1 if failed else 0


if __name__ == "__main__":
    sys.exit(main())
