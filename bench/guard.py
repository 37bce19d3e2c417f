#!/usr/bin/env python3
"""Count the instructions of some compilations and compare them with the recorded counts.

The counts do not depend on how busy the machine is, and hardly on the machine itself: the program is static, the
simulated processor is set to the simplest model, and the environment is empty. What remains are the compiler and the
C library, whose versions are recorded with the counts.

More than 5 % above a recorded count fails. More than 5 % below asks for new records.
"""

import argparse
import os
import pathlib
import platform
import subprocess
import sys
import tempfile

import generate
import measure

TOLERANCE = 0.05
SOURCES = {
    "attributes": {"attributes": 4000, "actions": 2000},
    "lists": {"elements": 4000, "valid_values": 4000, "varieties": 4000, "array_defaults": 4000, "strings": 4000},
    "classes": {"classes": 400, "variable_classes": 400, "members_count": 2000},
}
ENVIRONMENT = {"GLIBC_TUNABLES": measure.PLAINEST, "VX_CDB_FORCE_EMPTY_TIMESTAMP": "", "LC_ALL": "C",
               "PATH": os.environ.get("PATH", os.defpath)}
HEADING = """\
# User instructions of compilations, counted by script/bench-guard and written by script/bench-guard --renew.
# Sources are bench/generate.py's; "-s": the other byte order. "example" is examples/FileSystem.cdefsrc.
"""


def toolchain():
    """The versions of the compiler and the C library, which the counts depend on."""
    compiler = subprocess.run(["c++", "-dumpfullversion"], capture_output=True, text=True, check=True).stdout.strip()
    return f"{platform.machine()}, c++ {compiler}, {' '.join(platform.libc_ver())}"


def sources(directory, example):
    """The sources by name; generated ones are written first."""
    paths = {"example": example}
    for name, counts in SOURCES.items():
        paths[name] = directory / f"{name}.cdefsrc"
        with open(paths[name], "w", encoding="ascii") as file:
            file.writelines(generate.source(**counts))
    return paths


def count(cdgen, example):
    """The instructions by the name of the source, for both byte orders."""
    figures = {}
    with tempfile.TemporaryDirectory(prefix="cdgen-guard-") as name:
        directory = pathlib.Path(name)
        for source, path in sources(directory, example).items():
            for option in ([], ["-s"]):
                job = measure.Job([cdgen, *option, path, "out.cdef"], directory, "out.cdef")
                figures[" ".join([source, *option])] = measure.counted_by_simulator(job, ENVIRONMENT)
    return figures


def write(path, figures):
    """Writes the record."""
    lines = [f"{name:<14}{figure:>12}\n" for name, figure in figures.items()]
    path.write_text(f"{HEADING}# {toolchain()}\n{''.join(lines)}", encoding="ascii")


def read(path):
    """Reads the record: the counts, and the versions that they were made with."""
    lines = path.read_text(encoding="ascii").splitlines()
    recorded = (line.rsplit(maxsplit=1) for line in lines if not line.startswith("#"))
    comments = [line[2:] for line in lines if line.startswith("#")]
    return {name: int(figure) for name, figure in recorded}, comments[-1]


def compare(recorded, figures):
    """Prints all counts. Returns whether none has grown too much."""
    good = True
    for name, figure in figures.items():
        change = figure / recorded[name] - 1
        word = "TOO MANY" if change > TOLERANCE else "fewer: renew the record" if change < -TOLERANCE else "as recorded"
        good = good and change <= TOLERANCE
        print(f"{name:<14}{figure:>12}  {change:+7.2%}  {word}")
    return good


def parse():
    """Parses the command line."""
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--renew", action="store_true", help="record the counts instead of comparing them")
    parser.add_argument("--cdgen", type=pathlib.Path, required=True)
    parser.add_argument("--example", type=pathlib.Path, required=True)
    parser.add_argument("--record", type=pathlib.Path, required=True)
    return parser.parse_args()


def main():
    """Counts, then compares with the record or replaces it."""
    options = parse()
    figures = count(options.cdgen.resolve(), options.example.resolve())
    if options.renew:
        write(options.record, figures)
        return 0
    recorded, recorded_with = read(options.record)
    if recorded.keys() != figures.keys():
        print("the record is of other sources: renew it", file=sys.stderr)
        return 1
    if recorded_with != toolchain():
        print(f"note: recorded with {recorded_with}; this is {toolchain()}")
    return 0 if compare(recorded, figures) else 1


if __name__ == "__main__":
    try:
        sys.exit(main())
    except measure.Failure as failure:
        sys.exit(f"bench-guard: {failure}")
