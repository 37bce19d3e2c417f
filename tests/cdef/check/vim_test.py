"""Test how Vim, with the files that are installed for it, reads the messages of `cdef check`. Skipped if Vim is not
installed.

Where there is no vim, it is skipped and says so.
"""

import json
import pathlib
import shutil
import subprocess
import tempfile
import unittest

import use_test as use


@unittest.skipIf(shutil.which("vim") is None, "there is no vim")
class Vim(unittest.TestCase):
    """Vim's list of errors, with and without a column."""

    def test_list(self):
        findings, messages = use.findings_and_messages(self)
        with tempfile.TemporaryDirectory() as name:
            directory = pathlib.Path(name)
            (directory / "messages").write_text(messages + "empty.cdefsrc: error: No classes defined [S301]\n")
            list_all = "map(getqflist(), {_, each -> [bufname(each.bufnr), each.lnum, each.col, each.type, each.valid]})"
            commands = (f"set rtp^={use.EDITORS}/vim", "compiler cdef", f"cgetfile {directory}/messages",
                        f"call writefile([json_encode({list_all})], '{directory}/list')", "qa!")
            subprocess.run(["vim", "-Nu", "NONE", "-i", "NONE", "-es", *(f"-c{each}" for each in commands)],
                           stdin=subprocess.DEVNULL, check=True, timeout=60, cwd=use.CASES)
            listed = json.loads((directory / "list").read_text())
        kinds = {"E": "error", "e": "error", "W": "warning", "w": "warning"}
        found = [(file, line, column, kinds[kind]) for file, line, column, kind, valid in listed if valid and kind in kinds]
        wanted = [(file, each["line"], each["column"] or 0, each["severity"]) for file, each in findings]
        self.assertEqual(found, wanted + [("empty.cdefsrc", 0, 0, "error")])
        self.assertEqual(sum(kind in "Nn" and valid for *_, kind, valid in listed), messages.count(": note: "))
