"""Golden cases: one source, one expectation beside it.

A case is NAME.cdefsrc with NAME.expect (the expectation alone when the case
needs no source), in the notation of expectation.py.  Its keys:

    args:      options put before the operands
    out:       name of the output file (default out.cdef)
    operands:  the operands instead of 'NAME.cdefsrc out'
    status:    exit status (default 0)
    setup:     mkdir NAME | file NAME TEXT | symlink TARGET NAME | hardlink TARGET NAME
    message:   free: one line on stderr whose wording no rule fixes

and its blocks, stdout: and stderr:.  A stream without a block must stay empty.
'image:' starts the description of the file (see cdb_image.py); 'image-little:'
and 'image-big:' state the file's bytes in hexadecimal.

Every case runs in a fresh directory, with the program reached as ./cdgen, so
that messages that name the program or a file are the same everywhere.  A
failing run must leave the directory's files as they were.  CDGEN_RUNNER in the
environment is a command that runs the program, valgrind or an emulator.
"""

import os
import pathlib
import shlex
import subprocess
import tempfile

import cdb_image
import compare
import programs
import reverse_cdb
from expectation import Expectation

KEYS = {"args", "out", "operands", "status", "setup", "message"}
STREAMS = {"stdout", "stderr"}
IMAGES = {"image", "image-little", "image-big"}
TIMEOUT = 60
REPORT_LINES = 25


class Case:
    """One parsed expectation."""

    def __init__(self, path):
        self.expect = path.with_suffix(".expect")
        self.source = path.with_suffix(".cdefsrc")
        said = Expectation(self.expect, KEYS, STREAMS, IMAGES)
        self.keys = {key: said.get(key) for key in KEYS - {"setup"} if said.has(key)}
        self.setup = [shlex.split(text) for _, text in said.all("setup")]
        self.streams = {stream: said.octets(stream) for stream in STREAMS}
        self.images = {key: said.get(key) for key in IMAGES if said.has(key)}

    @property
    def status(self):
        """The expected exit status."""
        return int(self.keys.get("status", "0"))

    @property
    def out(self):
        """The output file's name."""
        return self.keys.get("out", "out.cdef")

    def expected_image(self, order, native):
        """The expected bytes and their labels, or None when none are stated."""
        if f"image-{order}" in self.images:
            return cdb_image.raw_hex(self.images[f"image-{order}"]), []
        if "image" in self.images:
            return cdb_image.assemble_labelled(self.images["image"], order, native, self.expect.parent)
        return None


class Source(Case):
    """A source without an expectation."""

    def __init__(self, path):
        self.expect, self.source = path, path.with_suffix(".cdefsrc")
        self.keys, self.setup, self.images = {}, [], {}


def set_up(case, directory):
    """Prepares the directory of a case: the source, and the files of its key setup."""
    if case.source.exists():
        (directory / case.source.name).write_bytes(case.source.read_bytes())
    for action, *names in case.setup:
        if action == "mkdir":
            (directory / names[0]).mkdir()
        elif action == "file":
            (directory / names[0]).write_text(names[1] if len(names) > 1 else "")
        elif action == "symlink":
            (directory / names[1]).symlink_to(names[0])
        elif action == "hardlink":
            os.link(directory / names[0], directory / names[1])
        else:
            raise ValueError(f"{case.expect}: unknown set-up {action}")


def snapshot(directory):
    """Every file below a directory with its contents."""
    return {
        path.relative_to(directory).as_posix(): path.read_bytes() if path.is_file() else None
        for path in sorted(directory.rglob("*"))
        if path.name != "cdgen"
    }


def run(case, program, extra):
    """Run one case; the result, the files before and the files after."""
    if "operands" in case.keys:
        operands = shlex.split(case.keys["operands"])
    else:
        operands = [case.source.name, case.out]
    command = programs.runner()
    command += ["./cdgen", *extra, *shlex.split(case.keys.get("args", "")), *operands]
    with tempfile.TemporaryDirectory() as name:
        directory = pathlib.Path(name)
        (directory / "cdgen").symlink_to(program)
        set_up(case, directory)
        before = snapshot(directory)
        result = subprocess.run(
            command, cwd=directory, env=programs.environment(), stdin=subprocess.DEVNULL, capture_output=True,
            timeout=TIMEOUT,
        )
        return result, before, snapshot(directory)


def compare_stream(name, expected, actual):
    """The difference of one output stream, as report lines."""
    return [f"{name} differs:", *compare.difference(actual, expected)] if expected != actual else []


def compare_stderr(case, actual):
    """The difference of the error stream. If the text is free, only its form is compared."""
    if case.keys.get("message") == "free":
        good = actual.endswith(b"\n") and actual.count(b"\n") == 1 and len(actual) > 1
        return [] if good else [f"stderr is not one line: {actual!r}"]
    return compare_stream("stderr", case.streams["stderr"], actual)


def compare_image(expected, labels, actual):
    """The difference of two files as hex lines, with the field's name."""
    if expected == actual:
        return []
    pairs = zip(expected, actual)
    at = next((i for i, (a, b) in enumerate(pairs) if a != b and not 4 <= i < 8), None)
    if at is None:
        at = 4 if len(expected) == len(actual) else min(len(expected), len(actual))
    label = next((text for start, length, text in labels if start <= at < start + length), "no named field")
    report = [f"file differs: {len(expected)} bytes expected, {len(actual)} written; first at {at:#x}, in {label}"]
    left, right = cdb_image.hex_lines(expected), cdb_image.hex_lines(actual)
    for index in range(max(len(left), len(right))):
        one = left[index] if index < len(left) else ""
        two = right[index] if index < len(right) else ""
        if one != two:
            report += [f"  expected {one}", f"  actual   {two}"]
    return report[:REPORT_LINES]


def compare_files(case, before, after):
    """Checks the files after a run: one new file, or on failure none."""
    after = dict(after)
    before = dict(before)
    if case.status == 0:
        before.pop(case.out, None)
        if after.pop(case.out, None) is None:
            return [f"no output file {case.out}"]
    if before != after:
        changed = sorted(name for name in before.keys() | after.keys() if before.get(name, 0) != after.get(name, 0))
        return [f"files changed or left behind: {', '.join(changed)}"]
    return []


def check_run(case, program, extra, order, native):
    """Compares one run of a case with its expectation. Returns the problems and the file."""
    result, before, after = run(case, program, extra)
    problems = []
    if result.returncode != case.status:
        problems.append(f"exit status {result.returncode}, expected {case.status}")
    problems += compare_stream("stdout", case.streams["stdout"], result.stdout)
    problems += compare_stderr(case, result.stderr)
    problems += compare_files(case, before, after)
    written = after.get(case.out) if case.status == 0 else None
    expected = case.expected_image(order, native)
    if written is not None and expected:
        problems += compare_image(*expected, written)
    return problems, written


def check_case(case, program, native):
    """Runs a case, also with -s if it compiles. Returns the problems."""
    problems, written = check_run(case, program, [], native, native)
    if case.status == 0 and written is not None:
        more, reversed_file = check_run(case, program, ["-s"], cdb_image.other(native), native)
        problems += [f"with -s: {line}" for line in more]
        turned = reverse_cdb.reverse(written)
        if reversed_file is not None and turned != reversed_file:
            problems += [f"with -s, against reverse_cdb: {line}" for line in compare_image(turned, [], reversed_file)]
    return problems


def check_notation(case):
    """Assembles a case's image in every order, and reverses each."""
    problems = []
    if bool(case.images) and case.status != 0:
        problems.append("an image for a run that fails")
    if "operands" not in case.keys and not case.source.exists():
        problems.append("no source and no operands")
    for native in ("little", "big"):
        try:
            plain = case.expected_image(native, native)
            turned = case.expected_image(cdb_image.other(native), native)
        except cdb_image.NotationError as problem:
            return problems + [str(problem)]
        if plain and turned:
            problems += compare_image(turned[0], turned[1], reverse_cdb.reverse(plain[0]))
    return problems


def cases_below(directory):
    """The paths of all cases below a directory."""
    found = {item.with_suffix(".expect") for item in directory.rglob("*") if item.suffix in (".expect", ".cdefsrc")}
    return sorted(found)
