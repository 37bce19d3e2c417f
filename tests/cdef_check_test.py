"""Run the cases of "cdef check": one source, one expectation beside it.

A case is NAME.cdefsrc with NAME.expect.  The expectation holds 'args:' with
options and 'status:' with the exit status (default 1), then, behind a line
'---', what is printed: on standard error, and for --format on standard output.
The source is also checked as standard input if the expectation says 'stdin: yes'.
With --tables the script checks instead that docs/messages.md explains each
warning; a unit test compares it with the table of errors.
"""

import argparse
import pathlib
import re
import shlex
import subprocess
import sys

TABLE = "src/check/messages.cpp"
WARNING_ROW = re.compile(r'\{[A-Z_]+, "(S\d{3})", "([a-z-]+)",\s*"((?:[^"\\]|\\.)+)"\}')


def read_case(path):
    """The options, the status, whether standard input is tried, and the expected text."""
    head, _, text = path.read_text().partition("---\n")
    keys = dict(line.split(":", 1) for line in head.splitlines() if line.strip())
    return shlex.split(keys.get("args", "")), int(keys.get("status", "1")), "stdin" in keys, text


def difference(title, expected, actual):
    """Report lines for two texts that should be equal."""
    if expected == actual:
        return []
    return [f"{title} differs; expected:", expected, "actual:", actual]


def run(cdef, args, source, stdin=None):
    """Status and both streams of a check."""
    command = [cdef, "check", *args, source.name if stdin is None else "-"]
    result = subprocess.run(command, cwd=source.parent, input=stdin or b"", capture_output=True, timeout=60)
    return result.returncode, result.stdout.decode(), result.stderr.decode()


def check_case(cdef, expectation):
    """The problems of one case."""
    args, status, from_stdin, text = read_case(expectation)
    source = expectation.with_suffix(".cdefsrc")
    expected = (status, text, "") if "--format" in args else (status, "", text)
    problems = difference("the result", repr(expected), repr(run(cdef, args, source)))
    if from_stdin:
        named = tuple(each.replace(f"{source.name}:", "-:") if isinstance(each, str) else each for each in expected)
        problems += difference("standard input", repr(named), repr(run(cdef, args, source, source.read_bytes())))
    return problems


def table_rows(root):
    """Codes, names and titles of the table of warnings."""
    return WARNING_ROW.findall((root / TABLE).read_text())


def check_tables(root):
    """What the document and the table of warnings do not agree on."""
    warnings = table_rows(root)
    document = (root / "docs/messages.md").read_text()
    sections = {part[:4]: part for part in re.split(r"^### ", document, flags=re.M)}
    problems = []
    for code, text, *_ in warnings:
        section = sections.get(code, "")
        if f"`{text.strip()}" not in section:
            problems.append(f"docs/messages.md: {code} does not show {text!r}")
        if "**Cause**" not in section or "**Cure**" not in section:
            problems.append(f"docs/messages.md: {code} has no cause or no cure")
    for code in sections.keys() - {row[0] for row in warnings}:
        if re.match(r"S5", code):
            problems.append(f"docs/messages.md: {code} is in no table")
    codes = [row[0] for row in warnings]
    problems += [f"{code} is given twice" for code in set(codes) if codes.count(code) > 1]
    example = (root / "tests/cdef/check/disk.expect").read_text().partition("---\n")[2]
    if f"```\n{example}```\n" not in (root / "README.md").read_text():
        problems.append("README.md: the example is not what tests/cdef/check/disk.expect says")
    if len(warnings) < 20:
        problems.append("the table has not been found")
    return problems


def main():
    """Run the cases, or check the table."""
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--cdef", type=lambda text: pathlib.Path(text).resolve())
    parser.add_argument("--tables", action="store_true")
    parser.add_argument("cases", nargs="*", type=lambda text: pathlib.Path(text).resolve())
    options = parser.parse_args()
    root = pathlib.Path(__file__).resolve().parent.parent
    problems = check_tables(root) if options.tables else []
    for case in options.cases:
        problems += [f"FAIL {case}", *found] if (found := check_case(options.cdef, case)) else []
    print(*problems, sep="\n")
    return 1 if problems else 0


if __name__ == "__main__":
    sys.exit(main())
