"""Compare this machine's cdgen with one for the other byte order.

For every source, both have the same exit status, messages and traces, with and without option s. The file that one of
them writes is, byte for byte, the file that the other one writes with option s, in both directions. Options --there and
--runner of pytest name the other machine's compiler and the program that runs it on this machine.

Bytes that the reversal does not change (see docs/format.md) stay in the order of the machine that compiled. If the
image of a case marks such bytes, the files may differ there and in the checksum. Otherwise they must not differ.
"""

import os

import pytest

import golden
from compare import none
from programs import EXAMPLES, PROGRAMS, TESTS

CHECKSUM = range(4, 8)
SOURCES = [path for directory in (TESTS / "golden", TESTS / "twins", EXAMPLES) for path in golden.cases_below(directory)]


def load(path):
    """The case of an expectation, or of a source without one."""
    return golden.Case(path) if path.exists() else golden.Source(path)


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


def differences(case, here, there):
    """The differences between runs on the two machines that must have equal results."""
    outcome, written = run(case, PROGRAMS.cdgen, "", here)
    other_outcome, other_written = run(case, PROGRAMS.there, PROGRAMS.runner, there)
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


@pytest.mark.parametrize("path", SOURCES, ids=lambda path: path.stem)
def test_same_on_both(path):
    """The results for a source on each machine, with option s on one of them."""
    case = load(path)
    none([line for here, there in (([], ["-s"]), (["-s"], [])) for line in differences(case, here, there)])
