"""What the documented cures of S520 store: the source is compiled, and its database shown."""

import json
import subprocess

import pytest

from programs import PROGRAMS, TESTS

SOURCE = (TESTS / "cdef/check/text-after-quote.cdefsrc").read_text()
WRITTEN = 'Expression="x" == "A"'


@pytest.mark.parametrize("line, stored", [
    ('Expression=user == "root"', 'user == "root"'),
    ('Expression="user == "root""', 'user == "root"'),
    ('Expression=""x" == "A""', '"x" == "A"'),
    ('Expression="user == root"', "user == root"),
])
def test_cure(directory, line, stored):
    """What the line stores, and that it is not warned of."""
    source, database = directory / "a.cdefsrc", directory / "a.cdef"
    source.write_text(SOURCE.replace(WRITTEN, line))
    checked = subprocess.run([PROGRAMS.cdef, "check", source], capture_output=True, text=True, timeout=60)
    assert (checked.returncode, checked.stderr) == (0, "")
    subprocess.run([PROGRAMS.cdgen, source, database], check=True, timeout=60)
    shown = subprocess.run([PROGRAMS.cdef, "dump", "--json", database], capture_output=True, check=True, timeout=60)
    assert stored in texts_of(json.loads(shown.stdout))


def texts_of(value):
    """All texts in JSON."""
    if isinstance(value, str):
        return [value]
    parts = value.values() if isinstance(value, dict) else value if isinstance(value, list) else []
    return [text for part in parts for text in texts_of(part)]
