"""The options and values that the programs accept, as the programs themselves report them."""

import os
import re
import string
import subprocess

from installed import program, run


def options_of_cdgen():
    """The options that cdgen does not call invalid; it has no help."""
    found = set()
    for letter in string.ascii_letters + string.digits:
        said = subprocess.run([program("cdgen"), f"-{letter}"], stderr=subprocess.PIPE, text=True, check=False,
                              env={**os.environ, "LC_ALL": "C"}).stderr
        if f"invalid option -- '{letter}'" not in said:
            found.add(f"-{letter}")
    return found


def help_of(*words):
    return run(program("cdef"), *words, "--help")


def subcommands():
    return set(re.findall(r"^  ([a-z]\S*)", help_of().split("Subcommands:\n")[1], re.M))


def warnings():
    """All codes and names of warnings about sources, which are too many for a help text."""
    listed = re.findall(r"^(S\d+) .* \[(\S+)\]$", run(program("cdef"), "explain"), re.M)
    return {word for pair in listed for word in pair}


def values(*words):
    """For each option that takes certain words, or the name of a warning: these words."""
    text = help_of(*words)
    known = {option: set(found.split(",")) for option, found in re.findall(r"^  (-\S+) [A-Z]+:\{([^}]*)\}", text, re.M)}
    for option in re.findall(r"^  (--(?:no-)?warn) NAME", text, re.M):
        known[option] = {"all"} | warnings()
    return known


def options(*words):
    """All spellings of the options in a help text."""
    return {spelling for line in re.findall(r"^  (-\S+)", help_of(*words), re.M) for spelling in line.split(",")}
