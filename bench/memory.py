#!/usr/bin/env python3
"""Measure the most memory that cdgen and cdef source take, in databases, for sources in which one dimension is large.
Print a table. The figures depend little on what else the machine does."""

import argparse
import pathlib
import tempfile

import bench
import generate
import measure

ATTRIBUTES = 10  # of each class
SOURCES = {**{f"60,000 {what}": lambda make=make: make(60000) for what, make in bench.GROWTH.items()},
           f"20,000 classes of {ATTRIBUTES} mixed attributes": lambda: generate.large_source(20000, ATTRIBUTES)}
TARGETS = (1.6, 1.6, 3)
PROGRAM = 2e6  # bytes of the program itself: they are more than a small database has


def peaks(launcher, build, directory, source):
    """The size of the database, and the peaks of cdgen, cdgen -s and cdef source, in bytes."""
    with (directory / "source").open("w", encoding="ascii") as file:
        file.writelines(source)
    commands = [[build / "cdgen", "-s", "source", "out.cdef"], [build / "cdgen", "source", "out.cdef"],
                [build / "cdef", "source", "out.cdef"]]
    reverse, plain, back = (measure.median(launcher.runs(measure.Job(command, directory))).peak for command in commands)
    return (directory / "out.cdef").stat().st_size, plain, reverse, back


def cell(peak, size, target):
    """A peak in bytes and in databases, and whether it meets the target."""
    verdict = "met" if peak <= target * size + PROGRAM else "MISSED"
    return f"{peak / 1e6:.1f} MB, {peak / size:.2f} x, {verdict}"


def main():
    """Measure all dimensions."""
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--build", type=pathlib.Path, required=True, help="the build directory, with CDGEN_BENCH on")
    build = parser.parse_args().build.resolve()
    launcher = measure.Launcher(build / "bench" / "bench_launch")
    print("| source | database | `cdgen` | `cdgen -s` | `cdef source` |\n|---|---|---|---|---|")
    for name, source in SOURCES.items():
        with tempfile.TemporaryDirectory() as directory:
            size, *found = peaks(launcher, build, pathlib.Path(directory), source())
        cells = " | ".join(cell(peak, size, target) for peak, target in zip(found, TARGETS))
        print(f"| {name} | {size / 1e6:.1f} MB | {cells} |", flush=True)


if __name__ == "__main__":
    main()
