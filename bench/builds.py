#!/usr/bin/env python3
"""Measure "cdef build" of many classes against make, which starts a cdgen for each; print a table.

Each round builds everything anew, in turn, so that a machine that is busy for a while is so for both.
"""

import argparse
import pathlib
import statistics
import subprocess
import sys
import tempfile
import time

import generate

TARGET = 3  # times as fast


def classes(directory, count, attributes):
    """So many sources, each with so many attributes, and a Makefile for them."""
    text = "".join(generate.source(attributes=attributes))
    for number in range(count):
        own = text.replace("Class_100000", f"Class_{100000 + number}").replace("mgr1.cat", f"mgr{number}.cat")
        (directory / f"c{number}.cdefsrc").write_text(own)
    (directory / "Makefile").write_text("SUFFIXES :=\nall: $(patsubst %.cdefsrc,%.cdef,$(wildcard *.cdefsrc))\n"
                                        "%.cdef: %.cdefsrc\n\t$(CDGEN) $< $@\n")


def seconds(directory, *command):
    """The time of a command that makes all databases, none of which exists before."""
    for old in directory.glob("*.cdef"):
        old.unlink()
    begun = time.perf_counter()
    subprocess.run(command, cwd=directory, check=True, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
    taken = time.perf_counter() - begun
    missing = len(list(directory.glob("*.cdefsrc"))) - len(list(directory.glob("*.cdef")))
    if missing:
        raise RuntimeError(f"{command[0]} leaves {missing} databases out")
    return taken


def main():
    """Measures and prints. Returns 1 if the target is missed."""
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("--build", type=pathlib.Path, required=True)
    parser.add_argument("--classes", type=int, default=1000)
    parser.add_argument("--jobs", type=int, default=4)
    parser.add_argument("--rounds", type=int, default=7)
    options = parser.parse_args()
    cdgen, cdef = (options.build.resolve() / name for name in ("cdgen", "cdef"))
    print(f"{options.classes} classes, {options.jobs} at once, median of {options.rounds} rounds\n")
    print("| attributes of each class | make, cdgen | cdef build | times as fast |\n|---|---|---|---|")
    missed = False
    for attributes in (3, 30):
        with tempfile.TemporaryDirectory() as name:
            directory = pathlib.Path(name)
            classes(directory, options.classes, attributes)
            made, built = [], []
            for _ in range(options.rounds):
                made.append(seconds(directory, "make", f"-j{options.jobs}", "-s", f"CDGEN={cdgen}"))
                built.append(seconds(directory, cdef, "build", f"-j{options.jobs}", "."))
        make, build = statistics.median(made), statistics.median(built)
        missed |= make < TARGET * build
        print(f"| {attributes} | {make:.3f} s | {build:.3f} s | {make / build:.1f} |")
    print(f"\ntarget: at least {TARGET} times as fast: {'missed' if missed else 'met'}")
    return int(missed)


if __name__ == "__main__":
    sys.exit(main())
