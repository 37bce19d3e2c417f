#!/usr/bin/env python3
"""Measure "cdef build" of many classes against make, which starts a cdgen for each; print a table.

Each round builds everything anew, in turn, so that a machine that is busy for a while is so for both. It builds into a
new directory, and nothing is removed before the end: for minutes ext4 does not use the inodes of removed files again,
and searching among a thousand of them takes half a millisecond for each new file, ten times what making it takes.
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
    (directory / "Makefile").write_text("SUFFIXES :=\nall: $(patsubst %.cdefsrc,$(TO)/%.cdef,$(wildcard *.cdefsrc))\n"
                                        "$(TO)/%.cdef: %.cdefsrc\n\t$(CDGEN) $< $@\n")


def seconds(directory, to, *command):
    """The time of a command that makes all databases in a new directory."""
    to.mkdir()
    begun = time.perf_counter()
    subprocess.run(command, cwd=directory, check=True, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
    taken = time.perf_counter() - begun
    missing = len(list(directory.glob("*.cdefsrc"))) - len(list(to.glob("*.cdef")))
    if missing:
        raise RuntimeError(f"{command[0]} leaves {missing} databases out")
    return taken


def medians(place, cdgen, cdef, attributes, options):
    """The median times of make and of cdef build for classes with so many attributes."""
    directory = place / f"classes-{attributes}"
    directory.mkdir()
    classes(directory, options.classes, attributes)
    made, built = [], []
    for number in range(options.rounds):
        to = place / f"made-{attributes}-{number}"
        made.append(seconds(directory, to, "make", f"-j{options.jobs}", "-s", f"CDGEN={cdgen}", f"TO={to}"))
        to = place / f"built-{attributes}-{number}"
        built.append(seconds(directory, to, cdef, "build", f"-j{options.jobs}", "-d", to, "."))
    return statistics.median(made), statistics.median(built)


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
    with tempfile.TemporaryDirectory() as name:
        for attributes in (3, 30):
            make, build = medians(pathlib.Path(name), cdgen, cdef, attributes, options)
            missed |= make < TARGET * build
            print(f"| {attributes} | {make:.3f} s | {build:.3f} s | {make / build:.1f} |", flush=True)
    print(f"\ntarget: at least {TARGET} times as fast: {'missed' if missed else 'met'}")
    return int(missed)


if __name__ == "__main__":
    sys.exit(main())
