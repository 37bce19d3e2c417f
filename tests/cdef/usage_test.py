"""Test what cdef says of a wrong command line, in all subcommands alike. Their options are taken from their help."""

import re
import subprocess

import pytest

from programs import PROGRAMS

SUBCOMMANDS = ("verify", "dump", "diff", "source", "check", "format", "build", "gate", "new", "explain", "lsp")
OPTION = re.compile(r"^  (?:(-\w),)?(--[a-z-]+)(?: (\[=)?([A-Z]+)(?::\{([a-z,]+)\})?\]?(?= |$))?", re.M)


def cdef(*words):
    """Status, output and messages."""
    done = subprocess.run([PROGRAMS.cdef, *words], stdin=subprocess.DEVNULL, capture_output=True, text=True, timeout=60,
                          check=False)
    return done.returncode, done.stdout, done.stderr


def options_of(subcommand):
    """Short name, long name, "[=" if a value is optional, what help calls the value, and the list of possible values."""
    return OPTION.findall(cdef(subcommand, "--help")[1])


def refused(message, subcommand=None):
    """The result of a wrong command line."""
    command = f"cdef {subcommand}" if subcommand else "cdef"
    return 2, "", f"cdef: {message}\nRun '{command} --help' for more.\n"


def listed(words):
    """a,b,c as "a, b or c"."""
    return " or ".join(words.replace(",", ", ").rsplit(", ", 1))


def test_options_are_found():
    """So that the following tests test something. Every subcommand has a line in the help of the program."""
    assert tuple(re.findall(r"^  ([a-z]+) ", cdef("--help")[1].partition("Subcommands:")[2], re.M)) == SUBCOMMANDS
    assert options_of("source") == [("-h", "--help", "", "", "")]
    assert options_of("new") == [("-h", "--help", "", "", ""), ("-o", "--output", "", "FILE", "")]
    assert ("-j", "--jobs", "", "N", "") in options_of("build")
    assert ("", "--level", "", "LEVEL", "readers,clients,stored") in options_of("gate")
    assert ("", "--compat", "[=", "LEVEL", "readers,clients,stored") in options_of("diff")
    assert ("-q", "--quiet", "", "", "") in options_of("check")


@pytest.mark.parametrize("subcommand", SUBCOMMANDS)
def test_option_without_its_value(subcommand):
    """The message lists the values, or names the kind of value as help does."""
    for short, name, optional, kind, values in options_of(subcommand):
        if not kind:
            continue
        why = "needs a value: " + (listed(values) if values else kind)
        assert cdef(subcommand, f"{name}=", "X") == refused(f"{name} {why}", subcommand)
        if not optional:
            assert cdef(subcommand, name) == refused(f"{name} {why}", subcommand)
        if short:
            assert cdef(subcommand, short) == refused(f"{short} {why}", subcommand)


@pytest.mark.parametrize("subcommand", SUBCOMMANDS)
def test_value_that_is_not_in_the_list(subcommand):
    """Or not a number."""
    for _, name, _, kind, values in options_of(subcommand):
        if values:
            assert cdef(subcommand, f"{name}=x y") == refused(f"{name}: 'x y' is not {listed(values)}", subcommand)
        if kind == "N":
            most = " to 1024" if name == "--jobs" else ""
            for wrong in ("-1", "abc", "1x", "0x1", "1.5", " 1", "+1", "", "18446744073709551616"):
                message = f"{name}: '{wrong}' is not a number from {'1' if most else '0'}{most}"
                assert cdef(subcommand, name, wrong) == refused(message, subcommand)


@pytest.mark.parametrize("subcommand", SUBCOMMANDS)
def test_flag_with_a_value(subcommand):
    """Any value, even one that would change nothing, and none after the equals sign."""
    for short, name, _, kind, _ in options_of(subcommand):
        for value in ("3", "false", "true", "", "{}"):
            if not kind:
                assert cdef(subcommand, f"{name}={value}", "X") == refused(f"{name} takes no value", subcommand)
            if short and not kind and short != "-h":
                assert cdef(subcommand, f"{short}={value}", "X") == refused(f"{short} takes no value", subcommand)


@pytest.mark.parametrize("subcommand", SUBCOMMANDS)
def test_option_given_twice(subcommand):
    """If it has one value. Names of warnings add up, and a flag may be repeated."""
    for short, name, optional, kind, values in options_of(subcommand):
        if not kind or optional or name in ("--warn", "--no-warn"):
            continue
        value = values.partition(",")[0] or "1"
        result = cdef(subcommand, name, value, short or name, value)
        assert result == refused(f"{name} is given more than once", subcommand)


@pytest.mark.parametrize("subcommand", SUBCOMMANDS)
def test_unknown_option(subcommand):
    """A name that is similar to one option is followed by that option."""
    for words in (("--nothing",), ("--nothing=3",), ("X", "--nothing"), ("--nothing", "--help")):
        message = "X: one operand too many" if subcommand == "lsp" and "X" in words else "--nothing: unknown option"
        assert cdef(subcommand, *words) == refused(message, subcommand)
    assert cdef(subcommand, "--hepl") == refused("--hepl: unknown option; did you mean --help?", subcommand)
    assert cdef(subcommand, "-Z") == refused("-Z: unknown option", subcommand)


@pytest.mark.parametrize("subcommand", SUBCOMMANDS)
def test_help_that_was_asked_for_before_a_mistake(subcommand):
    """It is shown."""
    expected = cdef(subcommand, "--help")
    assert expected[0] == 0 and expected[1].startswith(expected[1].partition("\n")[0] + f"\nUsage: cdef {subcommand} ")
    for words in (("--nothing",), ("--quiet=3",), ("-o",), ("A", "B", "C"), ("A", "--", "-x")):
        assert cdef(subcommand, "-h", *words) == expected


MESSAGES = {
    (): "A subcommand is required",
    ("dmp", "FILE"): "dmp: unknown subcommand; did you mean dump?",
    ("dmp", "--json", "-"): "dmp: unknown subcommand; did you mean dump?",
    ("[dump]",): "[dump]: unknown subcommand; did you mean dump?",
    ("nothing",): "nothing: unknown subcommand",
    ("--nothing", "dump", "FILE"): "--nothing: unknown option",
    ("--version=3",): "--version takes no value",
    ("--help=3",): "--help takes no value",
    ("dump",): "FILE is required",
    ("dump", "--"): "FILE is required",
    ("dump", "-x"): "-x: unknown option",
    ("dump", "--", "-x", "-y"): "-y: one operand too many",
    ("verify", "-q3", "X"): "-3: unknown option",
    ("source", "A", "B", "C"): "B: one operand too many",
    ("diff", "A"): "B is required",
    ("diff", "A", "[B]", "[C]"): "[C]: one operand too many",
    ("diff", "--compat=x", "A", "B"): "--compat: 'x' is not readers, clients or stored",
    ("new", "class"): "NAME is required",
    ("new", "x", "y"): "KIND: 'x' is not class",
    ("lsp", "X"): "X: one operand too many",
    ("check", "--jsn"): "--jsn: unknown option; did you mean --json?",
    ("check", "--dry-run", "X"): "--dry-run needs --fix",
    ("check", "--json", "--format", "json", "X"): "--json and --format exclude each other",
    ("check", "--config", "X", "--no-config"): "--config and --no-config exclude each other",
    ("build", "-o", "A", "-d", "B", "X"): "--output and --directory exclude each other",
    ("format", "--check", "--diff", "-i", "X"): "--check and --diff exclude each other",
    ("check", "--warn", "nope", "X"): "--warn: unknown warning `nope`; 'cdef explain' lists all",
    ("check", "--warn", "al", "X"): "--warn: unknown warning `al`; did you mean `all`? 'cdef explain' lists all",
    ("build", "--no-warn", "alll", "X"):
        "--no-warn: unknown warning `alll`; did you mean `all`? 'cdef explain' lists all",
}


@pytest.mark.parametrize("words", MESSAGES)
def test_messages(words):
    """Unknown options are reported before missing operands, because they are often the reason."""
    subcommand = words[0] if words and words[0] in SUBCOMMANDS else None
    assert cdef(*words) == refused(MESSAGES[words], subcommand)


def test_operands_that_look_like_something_else(directory):
    """Names in brackets, dashes after "--" and what the reading library takes for a mark."""
    for words in (("verify", "[x,y]", "++", "dump", "--", "-x", "--"), ("verify", "[x,y]", "--", "++", "dump", "-x", "--")):
        done = subprocess.run([PROGRAMS.cdef, *words], cwd=directory, capture_output=True, text=True, timeout=60,
                              check=False, stdin=subprocess.DEVNULL)
        expected = "".join(f"cdef: {name}: No such file or directory\n" for name in ("[x,y]", "++", "dump", "-x", "--"))
        assert (done.returncode, done.stdout, done.stderr) == (2, "", expected)
