"""Test that all state is in contexts: the libraries have no variables except those that are listed here."""

import re
import subprocess

import pytest

from programs import PROGRAMS

LIBRARIES = {
    "text": "src/text/libcdgen_text.a",
    "reader": "src/reader/libcdb_view.a",
    "language": "src/language/libcdgen_language.a",
    "compiler": "src/compiler/libcdgen_compiler.a",
    "check": "src/check/libcdgen_check.a",
    "compare": "src/compare/libcdgen_compare.a",
    "report": "src/report/libcdgen_report.a",
}

# Patterns of what is in writable memory all the same, by library, with the reason.
ALLOWED = {
    "compiler": {
        r"\(anonymous namespace\)::unfinished": "signal handlers reach no context",
        r"(guard variable for )?give_back\(.*\)::page": "the size of a page, found out once",
    },
    "check": {
        r"check::\(anonymous namespace\)::(\w+::types|DYNAMIC)": "constexpr; gcc 12 puts arrays there all the same",
    },
    "report": {
        r"(guard variable for )?report::all_rules\(\)::all": "put together once, then constant",
    },
}

WRITABLE = re.compile(r" \.t?(?:data|bss)(?!\.rel\.ro)(?:\.\S+)?\t\S+ +(.*)$", re.M)


def writable(archive):
    """The names of all variables in writable sections of object files, except those that the compiler itself adds."""
    command = ["objdump", "--syms", "--demangle", archive]
    listed = subprocess.run(command, capture_output=True, text=True, check=True).stdout
    return {name for name in WRITABLE.findall(listed) if not name.startswith(".")}


@pytest.fixture(autouse=True)
def without_sanitizers():
    """Sanitizers add variables of their own."""
    if PROGRAMS.sanitizers:
        pytest.skip("sanitizers have state of their own")


@pytest.mark.parametrize("name", LIBRARIES)
def test_no_state_outside_of_contexts(name):
    """A variable that this test finds must be moved into a context, or be listed above with a reason."""
    allowed = "|".join(ALLOWED.get(name, ["(?!)"]))
    assert [each for each in sorted(writable(PROGRAMS.build / LIBRARIES[name])) if not re.fullmatch(allowed, each)] == []


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
    command = ["nm", "--undefined-only", "--demangle", PROGRAMS.build / LIBRARIES["reader"]]
    needed = subprocess.run(command, capture_output=True, text=True, check=True).stdout.split()
    assert not {"exit", "_exit", "quick_exit", "abort", "raise", "kill", "signal", "sigaction"} & set(needed)
