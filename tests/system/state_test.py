"""Test that all state is in contexts: the libraries have no variables except those that are listed here."""

import pathlib
import re
import subprocess

import pytest

from programs import PROGRAMS

PROJECT = pathlib.Path(__file__).parents[2]
FOLDERS = sorted(path.parent.name for path in PROJECT.glob("src/*/CMakeLists.txt"))  # each with one library

# Patterns of what is in writable memory all the same, by folder, with the reason.
ALLOWED = {
    "compiler": {
        r"\(anonymous namespace\)::unfinished": "signal handlers reach no context",
        r"give_back\(.*\)::page": "the size of a page, found out once",
    },
    "report": {
        r"report::all_rules\(\)::all": "put together once, then constant",
    },
    "cdef": {
        r"cdef::\(anonymous namespace\)::all_work": "signals end all work of the process",
        r"cdef::gate_command::git\(.*\)::environment": "put together once, then constant",
        r"cdef::source::\(anonymous namespace\)::require_plain<.*>\(.*\)::constants": "put together once, then constant",
        r"cdef::source::lines_of\(stanza_id\)::all": "put together once, then constant",
        r"CLI::.*": "of the library for command lines: constants that it makes when they are needed",
        r"std::__ioinit": "of the standard library",
    },
}

WRITABLE = re.compile(r" \.t?(?:data|bss)(?!\.rel\.ro)(?:\.\S+)?\t\S+ +(.*)$", re.M)


def writable(archive):
    """The names of all variables in writable sections of object files, except those that the compiler itself adds."""
    command = ["objdump", "--syms", "--demangle", archive]
    listed = subprocess.run(command, capture_output=True, text=True, check=True).stdout
    names = {name for name in WRITABLE.findall(listed) if not name.startswith(".")}
    return {name.removeprefix("guard variable for ").removesuffix("[abi:cxx11]") for name in names}


def library(folder):
    """The library of a folder; none if it consists of headers."""
    return next(iter((PROGRAMS.build / "src" / folder).glob("lib*.a")), None)


@pytest.fixture(autouse=True)
def without_sanitizers():
    """Sanitizers add variables of their own."""
    if PROGRAMS.sanitizers:
        pytest.skip("sanitizers have state of their own")


@pytest.mark.parametrize("folder", FOLDERS)
def test_no_state_outside_of_contexts(folder):
    """A variable that this test finds must be moved into a context, or be listed above with a reason."""
    archive = library(folder)
    if archive is None:
        assert list(PROJECT.glob(f"src/{folder}/**/*.cpp")) == []
        return
    allowed = "|".join(ALLOWED.get(folder, ["(?!)"]))
    assert [each for each in sorted(writable(archive)) if not re.fullmatch(allowed, each)] == []


def test_a_variable_is_seen(directory):
    """Variables of every kind are found: with and without a value, in a function, for each thread. Constants are not.
    """
    text = """
    #include <string>
    int with_value = 1;
    static int without;
    thread_local int for_thread = 2;
    const char *const names[] = {"a", "b"};
    int count() { static int calls; return ++calls + ++without + ++for_thread + names[with_value][0]; }
    """
    (directory / "seen.cpp").write_text(text)
    subprocess.run(["c++", "-fdata-sections", "-c", "-o", "seen.o", "seen.cpp"], cwd=directory, check=True)
    assert writable(directory / "seen.o") == {"with_value", "without", "for_thread", "count()::calls"}


def test_the_reader_ends_no_process():
    """And it handles no signals."""
    command = ["nm", "--undefined-only", "--demangle", library("reader")]
    needed = subprocess.run(command, capture_output=True, text=True, check=True).stdout.split()
    assert not {"exit", "_exit", "quick_exit", "abort", "raise", "kill", "signal", "sigaction"} & set(needed)
