"""Compiles the sources in documents, manual pages and examples, and checks that generated files are up to date."""

import datetime
import pathlib
import re
import subprocess
import sys
import tempfile
import unittest

from programs import PROGRAMS, EXAMPLES
from documents import DOCUMENTS, PAGES, PROJECT, broken_links, sources, tables, text_of

WITH_SOURCES = {"README.md", "language.md", "format.md", "cdgen.1", "cdefsrc.5", "cdef.5"}


def made_by(script, *arguments):
    """The files that a script writes to an empty directory: name -> contents."""
    with tempfile.TemporaryDirectory() as place:
        for directory in ("vim/syntax", "vscode/syntaxes"):
            (pathlib.Path(place) / directory).mkdir(parents=True)
        subprocess.run([sys.executable, "-B", PROJECT / script, *arguments, place], check=True)
        return {str(path.relative_to(place)): path.read_text() for path in pathlib.Path(place).rglob("*")
                if path.is_file()}


class Sources(unittest.TestCase):
    def compile(self, source):
        with tempfile.TemporaryDirectory() as place:
            (pathlib.Path(place) / "a.cdefsrc").write_text(source)
            done = subprocess.run([PROGRAMS.cdgen, "a.cdefsrc", "a.cdef"], cwd=place, capture_output=True, text=True)
            self.assertEqual((done.returncode, done.stderr), (0, ""), source)
            return (pathlib.Path(place) / "a.cdef").read_bytes()

    def test_of_documents_and_pages_compile(self):
        found = set()
        for path in (*DOCUMENTS, *PAGES):
            for source in sources(path):
                with self.subTest(path.name):
                    self.compile(source)
                    found.add(path.name)
        self.assertLessEqual(WITH_SOURCES, found)

    def test_pages_show_the_same_classes_as_documents(self):
        for document, page in (("language.md", "cdefsrc.5"), ("format.md", "cdef.5")):
            shown = [self.compile(re.sub(r"(?m)^ {8}", "\t", source)) for source in sources(PROJECT / "man" / page)]
            meant = [self.compile(source) for source in sources(PROJECT / "docs" / document)]
            self.assertEqual([len(image) for image in shown], [len(image) for image in meant], page)

    def test_of_examples_compile(self):
        for path in sorted(EXAMPLES.glob("*.cdefsrc")):
            with self.subTest(path.name):
                self.compile(path.read_text())

    def expect_no_warning(self, *files, shown=()):
        """Except for the codes that the page itself shows."""
        excused = [word for code in shown for word in ("--no-warn", code)]
        done = subprocess.run([PROGRAMS.cdef, "check", "--no-config", "--werror", *excused, *files],
                              capture_output=True, text=True)
        self.assertEqual((done.returncode, done.stdout, done.stderr), (0, "", ""))

    def test_of_examples_have_no_warnings(self):
        found = sorted((PROJECT / "examples").rglob("*.cdefsrc"))
        self.assertGreater({path.parent for path in found}, {PROJECT / "examples"})
        self.expect_no_warning(*found)

    def test_of_documents_and_pages_have_no_warnings(self):
        with tempfile.TemporaryDirectory() as place:
            for path in (*DOCUMENTS, *PAGES):
                shown = set(re.findall(r": warning: .* \[(S\d+) ", path.read_text()))
                for number, source in enumerate(sources(path)):
                    file = pathlib.Path(place) / f"{path.name}-{number}.cdefsrc"
                    file.write_text(source)
                    with self.subTest(path.name):
                        self.expect_no_warning(file, shown=shown)

    def test_of_example_projects_compile(self):
        for path in sorted((PROJECT / "examples/projects").rglob("*.cdefsrc")):
            with self.subTest(path.name):
                self.compile(path.read_text())


class Tables(unittest.TestCase):
    """The tables of a document on its manual page."""

    def shown(self, cell):
        """A cell as the page has it, without fonts."""
        return re.escape(re.sub(r"\[([^\]]*)\]\([^)]*\)", r"\1", cell).replace("`", "").replace(r"\|", "|"))

    def test_each_has_its_headings_on_the_page(self):
        for document, page in (("language.md", "cdefsrc.5"), ("format.md", "cdef.5")):
            text, at = text_of(PROJECT / "man" / page), 0
            for head, *rows in tables((PROJECT / "docs" / document).read_text()):
                if len(head) > 1:
                    heads = [self.shown(cell) for cell in head]
                    found = re.compile(rf"^(?:{heads[0]}\n{heads[-1]}|{chr(9).join(heads)})$", re.M).search(text, at)
                    self.assertIsNotNone(found, f"{page}: {head}")
                    at = found.end()

    def test_no_cell_is_named_that_is_empty(self):
        for page in PAGES:
            self.assertNotRegex(page.read_text(), r"(?m)\\fI[^\n]*\\fR: *$", page.name)


class Links(unittest.TestCase):
    def test_of_documents_lead_to_files(self):
        for path in DOCUMENTS:
            self.assertEqual(broken_links(path), [], path.name)

    def test_every_document_is_in_the_index(self):
        index = (PROJECT / "docs/README.md").read_text()
        for path in DOCUMENTS:
            self.assertIn(f"{path.name})", index, path.name)


class Release(unittest.TestCase):
    def found(self, name, expression):
        """The text that the expression's group matches in a file, exactly once."""
        (value,) = re.findall(expression, (PROJECT / name).read_text(), re.M)
        return value

    def test_version_is_the_same_everywhere(self):
        version = self.found("CMakeLists.txt", r"^project\(cdgen VERSION (\S+)")
        self.assertEqual(self.found("editors/vscode/package.json", r'^  "version": "(.*)"'), version)
        self.assertRegex((PROJECT / "CHANGELOG.md").read_text(), rf"(?m)^## {re.escape(version)},")

    def test_nothing_else_asks_for_a_version(self):
        for path in (*DOCUMENTS, *(PROJECT / "examples").rglob("CMakeLists.txt")):
            self.assertNotRegex(path.read_text(), r"find_package\(cdgen \d", path)

    def test_date_is_the_same_everywhere(self):
        seconds = int(self.found("cmake/package.cmake", r"^set\(CPACK_CDGEN_RELEASED (\d+)\)"))
        day = datetime.datetime.fromtimestamp(seconds, datetime.timezone.utc)
        self.assertEqual(self.found("man/from_markdown.py", r'^DATE = "(.*?)"'), f"{day:%Y-%m-%d}")
        for page in ("man/cdgen.1", "man/cdef.1"):
            self.assertEqual(self.found(page, r"^\.Dd (.*)"), f"{day:%B} {day.day}, {day.year}")


class Made(unittest.TestCase):
    def test_pages_are_up_to_date(self):
        made = made_by("man/from_markdown.py")
        self.assertEqual(sorted(made), ["cdef.5", "cdefsrc.5"])
        for name, text in made.items():
            self.assertTrue((PROJECT / "man" / name).read_text() == text, f"{name}: run man/from_markdown.py")

    def test_editor_files_are_up_to_date(self):
        for name, text in made_by("editors/generate.py", PROGRAMS.list_names).items():
            self.assertTrue((PROJECT / "editors" / name).read_text() == text, f"{name}: run editors/generate.py")
