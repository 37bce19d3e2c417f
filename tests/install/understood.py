"""What the programs understand, from themselves."""

import re

from installed import PROJECT, program, run


def options_of_cdgen():
    """From where the compiler has them."""
    (letters,) = re.findall(r'getopt\(argc, argv, "([^"]*)"\)', (PROJECT / "src/cdgen.cpp").read_text())
    return {f"-{letter}" for letter in letters if letter != ":"}


def help_of(*words):
    return run(program("cdef"), *words, "--help")


def subcommands():
    return set(re.findall(r"^  ([a-z]\S*)", help_of().split("Subcommands:\n")[1], re.M))


def options(*words):
    """All spellings of the options in a help text."""
    return {spelling for line in re.findall(r"^  (-\S+)", help_of(*words), re.M) for spelling in line.split(",")}
