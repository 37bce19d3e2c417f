"""Comparisons that show where two things differ."""

import difflib

LINES = 60  # of a difference that are shown


def lines_of(value):
    """A value as lines, with all unusual characters made visible."""
    if isinstance(value, bytes):
        value = value.decode("utf-8", "backslashreplace")
    if isinstance(value, str):
        return [ascii(line)[1:-1] if not line.isprintable() and "\t" not in line else line for line in value.split("\n")]
    return [repr(value)]


def difference(actual, expected):
    """The lines in which two values differ: '-' is expected, '+' was found; empty if the values are equal."""
    if actual == expected:
        return []
    if isinstance(actual, tuple) and isinstance(expected, tuple) and len(actual) == len(expected):
        parts = [difference(one, two) for one, two in zip(actual, expected)]
        return [f"[{at}] {line}" for at, part in enumerate(parts) for line in part]
    if isinstance(actual, (str, bytes)) and type(actual) is type(expected) and lines_of(actual) != lines_of(expected):
        found = difflib.unified_diff(lines_of(expected), lines_of(actual), "expected", "actual", lineterm="", n=2)
        shown = list(found)
        return shown[:LINES] + [f"... and {len(shown) - LINES} lines more"] * (len(shown) > LINES)
    return [f"- {expected!r}", f"+ {actual!r}"]


def same(actual, expected, *what):
    """Fails and shows the difference unless two values are equal."""
    __tracebackhide__ = True  # pytest leaves this frame out
    if actual != expected:
        title = " ".join(map(str, what)) or "the result"
        raise AssertionError("\n".join([f"{title} differs:", *difference(actual, expected)]))


def none(problems):
    """Fails and shows the problems if there are any."""
    __tracebackhide__ = True
    if problems:
        raise AssertionError("\n".join(map(str, problems)))
