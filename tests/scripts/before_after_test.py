"""Test how script/before-after judges runs with too little memory."""

import pytest

from scripts import script

COMPARISON = script("before-after")
WITHOUT = {"s-large.out": b"one two", "s-large.err": b"three four", "s-large.status": b"0\n", "s-large.cdef": b"image"}
NO_MEMORY = b"cfg_malloc malloc failure: Cannot allocate memory"
NO_MAP = b"Cannot map CDB file: Cannot allocate memory"


def limited(out, err, status, image=None):
    """The files of a source whose run with a limit made these."""
    files = {**WITHOUT, "s-limited.out": out, "s-limited.err": err, "s-limited.status": status}
    return files if image is None else {**files, "s-limited.cdef": image}


@pytest.mark.parametrize(("files", "expected"), [
    (limited(b"one", b"three" + NO_MEMORY, b"12\n"), True),
    (limited(b"one two", NO_MAP, b"1\n", b"\0\0"), True),
    (limited(b"two", NO_MEMORY, b"12\n"), False),  # other traces
    (limited(b"one", b"four" + NO_MEMORY, b"12\n"), False),
    (limited(b"one", NO_MEMORY, b"0\n"), False),
    (limited(b"one", NO_MEMORY, b"12\n", b"im"), False),  # half an output
    (limited(b"one", b"", b"139\n"), False),  # no message
])
def test_ran_out(files, expected):
    assert COMPARISON.ran_out(files, "s") == expected
    assert not COMPARISON.is_unlimited(files, "s")


def test_unlimited():
    files = limited(b"one two", b"three four", b"0\n", b"image")
    assert COMPARISON.is_unlimited(files, "s")
    assert not COMPARISON.ran_out(files, "s")
