"""The manual pages as a reader gets them."""

import itertools
import os
import subprocess
import unittest

from installed import run, tree


class Pages(unittest.TestCase):
    def setUp(self):
        self.pages = sorted((tree() / "share/man").glob("man*/*"))

    def test_man_has_nothing_to_warn_of(self):
        for page, width in itertools.product(self.pages, ("80", "132")):
            with self.subTest(page.name, width=width):
                done = subprocess.run(["man", "--warnings", "--local-file", page], capture_output=True, check=True,
                                      env={**os.environ, "MANWIDTH": width})
                self.assertEqual(done.stderr.decode(), "")
                self.assertIn(b"NAME", done.stdout)

    def test_mandoc_has_nothing_to_warn_of(self):
        for page in self.pages:
            self.assertEqual(run("mandoc", "-Tlint", "-W", "warning", page), "")

    def test_man_finds_each_by_its_name(self):
        for page in self.pages:
            name, section = page.name.split(".")
            shown = run("man", "--manpath", tree() / "share/man", section, name)
            self.assertIn(f"{name.upper()}({section})", shown)


if __name__ == "__main__":
    unittest.main()
