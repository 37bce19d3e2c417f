"""Test the manual pages as a reader sees them."""

import itertools
import os
import re
import subprocess
import unittest

from installed import Case, examples, program, run, tree
from understood import options, options_of_cdgen, subcommands, values


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


class Copied(Case):
    """A class that is copied from the page as a terminal shows it is a valid source."""

    def compile(self, shown):
        chapter = re.search(r"^A WHOLE CLASS\n(.*?)^LINES$", shown, re.M | re.S).group(1)
        (self.here / "Printer.cdefsrc").write_text(chapter[re.search(r"^#", chapter, re.M).start():])
        run(program("cdgen"), "Printer.cdefsrc", "Printer.cdef", cwd=self.here)
        self.assertIn("PrintTestPage", run(program("cdef"), "dump", "Printer.cdef", cwd=self.here))

    def test_from_man(self):
        page = tree() / "share/man/man5/cdefsrc.5"
        self.compile(run("man", "--local-file", page, env={**os.environ, "MANWIDTH": "80"}))

    def test_from_mandoc(self):
        page = tree() / "share/man/man5/cdefsrc.5"
        self.compile(re.sub(".\x08", "", run("mandoc", "-T", "ascii", page)))


class Options(unittest.TestCase):
    """The handwritten pages list the options that the programs accept."""

    def page(self, name):
        return (tree() / f"share/man/man1/{name}.1").read_text()

    def test_of_cdgen(self):
        said = set(re.findall(r"^\.It Fl (\w)", self.page("cdgen"), re.M))
        self.assertEqual({f"-{letter}" for letter in said}, options_of_cdgen())

    def test_of_cdef(self):
        described, further = self.page("cdef").split("Further options:")
        parts = re.split(r"^\.It Cm ", described, flags=re.M)[1:]
        said = {part.split()[0]: self.options_in(part) for part in parts}
        shared = self.options_in(further)
        self.assertEqual(shared, options())
        for subcommand in subcommands():
            self.assertEqual(said[subcommand] | {"-h", "--help"}, options(subcommand), subcommand)

    def test_names_of_warnings(self):
        said = self.page("cdef").split("The names are\n")[1].split(".It ")[0]
        codes = {value for value in values("check")["--warn"] if re.fullmatch(r"S\d+", value)}
        self.assertEqual(set(re.findall(r"^\.Cm (\S+)", said, re.M)) | {"all"}, values("check")["--warn"] - codes)
        accepted = [word for name in values("check")["--warn"] for word in ("--warn", name)]
        run(program("cdef"), "check", *accepted, examples() / "Process.cdefsrc")

    def options_in(self, text):
        return {f"-{name}" for line in re.findall(r"^\.It Fl (.*)", text, re.M) for name in line.split(" , ")}


if __name__ == "__main__":
    unittest.main()
