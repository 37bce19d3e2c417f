"""What the drivers of cdef's cases share: the command line, the loop, the count."""

import argparse
import pathlib


def main(title, names, run):
    """Run the named cases, or all, and print the count; without programs, print the names.

    names() are all of them; run(name, options) is the problems of one, where
    options.cdgen and options.cdef are the programs.  Returns the exit status.
    """
    parser = argparse.ArgumentParser(description=title)
    parser.add_argument("--cdgen", type=pathlib.Path)
    parser.add_argument("--cdef", type=pathlib.Path)
    parser.add_argument("names", nargs="*")
    options = parser.parse_args()
    if options.cdgen is None or options.cdef is None:
        print("\n".join(names()))
        return 0
    options.cdgen, options.cdef = options.cdgen.resolve(), options.cdef.resolve()
    chosen = options.names or names()
    failed = 0
    for name in chosen:
        problems = run(name, options)
        failed += bool(problems)
        if problems:
            print(f"FAIL {name}", *problems, sep="\n    ")
    print(f"{len(chosen) - failed} passed, {failed} failed")
    return 1 if failed else 0
