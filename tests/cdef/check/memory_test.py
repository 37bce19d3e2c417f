"""Test that `cdef check` takes at most 8 times the source and 16 MB, however much is wrong, in every form.

WRONG_LINES is how many lines are wrong: 100,000 where nothing is said, 10,000,000 in script/proof. The limit is one of
the address space, so that nothing depends on what else the machine does.
"""

import os

import pytest

from bounded import run_bounded
from compare import same
from programs import PROGRAMS

LINES = int(os.environ.get("WRONG_LINES", "100000"))

SOURCES = {
    "unknown-headers": ("", "x\n"),
    "different-headers": ("", "{:x}\n"),
    "lines-without-equals": ("ControlDefinition\n", " x\n"),
    "unknown-attributes": ("ControlDefinition\n", " x=1\n"),
    "misspelt-attributes": ("ControlDefinition\n", " FileVersoin=1\n"),
    "elements-of-nothing": ("", "PAttrSDDefinition\n"),
    "maps": ("", "ClassToManagerMapping\n"),
}

# Each of these stanzas is allowed; the source as a whole lacks a map.
CLASSES = {
    "classes": ("", "ControlDefinition\n"),
    "classes-with-attributes": ("", "ControlDefinition\nPersistentResourceAttribute\n"),
    "classes-with-dynamic-attributes": ("", "ControlDefinition\nDynamicResourceAttribute\n"),
}


FORMS = ("text", "json", "sarif", "github", "gitlab")
CASES = [("different-headers", form) for form in FORMS] + [("unknown-attributes", form) for form in FORMS[1:3]]
CASES += [(name, "text") for name in SOURCES if name != "different-headers"]


def check(directory, head, line, form="text"):
    """Checks a source of such lines within the memory limit. Returns what standard error contains."""
    source = directory / "wrong"
    with source.open("w") as file:
        file.write(head)
        file.writelines(line.format(number) for number in range(LINES))
    status, _, messages = run_bounded(directory, [PROGRAMS.cdef, "check", "--format", form], source)
    same(status, 1, "status")
    return messages


@pytest.mark.slow(30)
@pytest.mark.parametrize(("name", "form"), CASES)
def test_bound(directory, name, form):
    """Every finding is either written or counted."""
    messages = check(directory, *SOURCES[name], form)
    if form == "text":
        same(messages.count(b": error: "), 100, "errors shown")
        assert int(messages.splitlines()[-1].split()[0]) >= LINES


@pytest.mark.slow(30)
@pytest.mark.parametrize("name", CLASSES)
def test_classes(directory, name):
    """Nothing that only a database would need is kept about a class without errors."""
    messages = check(directory, *CLASSES[name])
    same(messages.count(b": error: No class-to-manager maps defined"), 1, "errors shown")
    assert int(messages.splitlines()[-1].split()[3]) >= LINES, "warnings counted"
