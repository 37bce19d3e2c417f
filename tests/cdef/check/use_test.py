"""Test how `cdef check` is used: many sources, ones that cannot be read, standard
input of all kinds, and its exit statuses.  What it says of a source, the cases
of check_test.py test.
"""

import json
import os
import pathlib
import re
import shlex
import socket
import subprocess
import sys
import tempfile
import unittest

from expectation import Expectation
from programs import PROGRAMS, PROJECT, TESTS
from summaries import with_summary

EDITORS = PROJECT / "editors"
CASES = TESTS / "cdef/check"

WRONG = "data-type.cdefsrc"
ODD = "permission.cdefsrc"
RIGHT = "sound.cdefsrc"
MISSING = "cdef: missing: cannot open because: No such file or directory\n"
DIRECTORY = "cdef: .: cannot read because: Is a directory\n"


def check(*operands, stdin=subprocess.DEVNULL):
    """Status, output and messages of `cdef check`, run among the cases."""
    result = subprocess.run(
        [PROGRAMS.cdef, "check", *operands], cwd=CASES, stdin=stdin, capture_output=True, check=False, timeout=60)
    return result.returncode, result.stdout.decode(), result.stderr.decode()


def expected(source, shown=None):
    """The expected output for a case's source, under its own or another name."""
    text = Expectation((CASES / source).with_suffix(".expect"), ("status",), ("stderr",)).get("stderr")
    return text.replace(f"{source}:", f"{shown or source}:")


class Sources(unittest.TestCase):
    """One or many, and which of them cannot be read."""

    def test_the_worst_decides(self):
        self.assertEqual(check(RIGHT, ODD), (0, "", with_summary(expected(ODD), 2)))
        self.assertEqual(check(ODD, WRONG, RIGHT), (1, "", with_summary(expected(ODD) + expected(WRONG), 3)))
        self.assertEqual(check("--werror", RIGHT, ODD), (1, "", with_summary(expected(ODD), 2)))

    def test_missing(self):
        self.assertEqual(check("missing"), (2, "", MISSING))

    def test_directory(self):
        self.assertEqual(check("."), (2, "", DIRECTORY))

    def test_name_that_commands_a_terminal(self):
        self.assertEqual(check("\x1b[m\u009b\u202emissing"), (2, "", MISSING.replace("missing", r"\x1b[m\xc2\x9b\xe2\x80\xaemissing", 1)))
        with tempfile.TemporaryDirectory() as directory:
            source = pathlib.Path(directory) / "\x1b[31m.cdefsrc"
            source.write_bytes((CASES / WRONG).read_bytes())
            self.assertEqual(check(source), (1, "", with_summary(expected(WRONG, f"{directory}/?[31m.cdefsrc"))))

    def test_the_others_are_shown_where_they_stand(self):
        text = expected(ODD) + MISSING + expected(WRONG) + DIRECTORY
        self.assertEqual(check(ODD, "missing", WRONG, "."), (2, "", with_summary(text, 4)))

    def test_the_others_are_shown_to_programs(self):
        status, text, messages = check("--format", "json", WRONG, "missing", RIGHT)
        self.assertEqual((status, messages), (2, MISSING))
        wrong, missing, right = json.loads(text)["sources"]
        self.assertEqual([(each["file"], each["errors"] > 0) for each in (wrong, right)], [(WRONG, True), (RIGHT, False)])
        self.assertEqual(missing, {"file": "missing", "findings": [], "unreadable": MISSING[len("cdef: "):-1]})
        status, text, messages = check("--format", "sarif", "missing", WRONG)
        self.assertEqual((status, messages), (2, MISSING))
        self.assertTrue(json.loads(text)["runs"][0]["results"])

    def test_wrong_usage(self):
        for operands in ((), ("--nothing", RIGHT), ("--format", "xml", RIGHT), ("--warn", "nothing", RIGHT)):
            status, text, messages = check(*operands)
            self.assertEqual((status, text), (2, ""))
            self.assertTrue(messages.startswith("cdef: "), messages)


class ManyElements(unittest.TestCase):
    """More elements than the attribute's highest index can count: 65535 means none."""

    def findings_with(self, elements):
        head, _, tail = (CASES / "index-narrowed.cdefsrc").read_text().partition("PAttrSDDefinition\n")
        tail = tail[tail.index("ClassToManagerMapping"):]
        element = "PAttrSDDefinition\n\tElementName={0}\n\tDescription=1\n\tDisplayName=1\n\tElementIndex={0}\n\tDataType=None\n"
        with tempfile.NamedTemporaryFile("w", suffix=".cdefsrc") as source:
            source.write(head + "".join(element.format(index) for index in range(elements)) + tail)
            source.flush()
            status, text, _ = check("--format", "json", source.name)
        self.assertEqual(status, 0)
        return [(each["code"], each["source"]) for each in json.loads(text)["sources"][0]["findings"]]

    def test_index_that_is_too_high_is_reported_once(self):
        self.assertEqual(self.findings_with(65538), [("S508", "\tElementIndex=65535")])

    def test_highest_index_is_not_reported(self):
        self.assertEqual(self.findings_with(65535), [])


class ManyNames(unittest.TestCase):
    """The search for similar names is bounded, because otherwise the work would be quadratic."""

    def test_searches_end(self):
        head, _, tail = (CASES / "variable-class-once.cdefsrc").read_text().partition("ResourceVariableClass\n")
        classes = "ResourceVariableClass\n\tVariableClass=Class{}\n\tObservationInterval=1\n\tReportingInterval=1\n"
        attribute = tail[tail.index("DynamicResourceAttribute"):].partition("DynamicResourceAttribute\n")[2]
        attribute = "DynamicResourceAttribute\n" + attribute.partition("DynamicResourceAttribute\n")[0]
        tail = tail[tail.index("ClassToManagerMapping"):]
        body = "".join(classes.format(10000 + number) for number in range(1000))
        for number in range(1200):
            name = f"Clas{10000 + number}" if number < 1000 else f"Other{number}"
            body += attribute.replace("Vv", name).replace("Name=A", f"Name={number}").replace("Id=0", f"Id={number}")
        with tempfile.NamedTemporaryFile("w", suffix=".cdefsrc") as source:
            source.write(head + body + tail)
            source.flush()
            status, text, _ = check("--format", "json", "--no-warn", "narrowed", source.name)
        findings = json.loads(text)["sources"][0]["findings"]
        self.assertEqual((status, len(findings), {each["code"] for each in findings}), (0, 1200, {"S505"}))
        self.assertEqual(findings[999]["notes"][0]["message"], "did you mean `Class10999`?")
        cures = {note["message"] for each in findings[1000:] for note in each["notes"]}
        self.assertEqual(cures, {"define it, or correct the name"})


class TooMany(unittest.TestCase):
    """Findings that only the end of the source shows are reported at the last line."""

    def test_variable_classes(self):
        head, _, tail = (CASES / "variable-class-once.cdefsrc").read_text().partition("ResourceVariableClass\n")
        attribute, _, tail = tail[tail.index("DynamicResourceAttribute"):].partition("\nDynamicResourceAttribute\n")
        tail = tail[tail.index("ClassToManagerMapping"):]
        named = "ResourceVariableClass\n\tVariableClass=V{0}\n\tObservationInterval=1\n\tReportingInterval=1\n"
        body = ""
        for number in range(101):
            unique = attribute.replace("=Vv", f"=V{number}").replace("=A", f"=A{number}").replace("Id=0", f"Id={number}")
            body += named.format(number) + unique + "\n"
        message = "error: Too many variable classes with dynamic attributes (100 at most) [S305]\n"
        with tempfile.TemporaryDirectory() as directory:
            source, text = pathlib.Path(directory) / "too-many", head + body + tail
            source.write_text(text)
            self.assertEqual(check(source), (1, "", with_summary(f"{source}:{text.count(chr(10))}: {message}")))
            source.write_text(text.replace(named.format(100), "").replace("=V100\n", "=V99\n"))
            self.assertEqual(check(source), (0, "", ""))

    def test_records_of_one_kind(self):
        head, _, tail = (CASES / "unused-default.cdefsrc").read_text().partition("PersistentClassAttribute\n")
        attribute, _, tail = tail.partition("ClassToManagerMapping\n")
        message = "error: Too many records of one kind in a class (65535 at most): ClassPattrsC [S306]\n"
        with tempfile.TemporaryDirectory() as directory:
            source = pathlib.Path(directory) / "too-many"
            text = head + 65536 * ("PersistentClassAttribute\n" + attribute) + "ClassToManagerMapping\n" + tail
            source.write_text(text)
            expected_line = f"{source}:{text.count(chr(10))}: {message}"
            self.assertEqual(check("--no-warn", "all", source), (1, "", with_summary(expected_line)))


class Surroundings(unittest.TestCase):
    """Errors that are not caused by the source: streams and memory."""

    def test_standard_error_that_is_full(self):
        for source, status in ((ODD, 2), (WRONG, 2), (RIGHT, 0)):
            with open("/dev/full", "wb") as full:
                result = subprocess.run([PROGRAMS.cdef, "check", source], cwd=CASES, stdout=subprocess.PIPE, stderr=full)
            self.assertEqual((result.returncode, result.stdout), (status, b""), source)

    def limited(self, kilobytes, *operands):
        """A run in so much address space."""
        command = shlex.join([str(PROGRAMS.cdef), *map(str, operands)])
        return subprocess.run(
            ["sh", "-c", f"ulimit -v {kilobytes} && exec {command}"], capture_output=True, text=True, timeout=60
        )

    def least_memory(self):
        """The least address space, in KB, in which the program starts."""
        low, high = 0, 1 << 20
        if self.limited(high, "--version").returncode != 0:
            self.skipTest("the program needs more than 1 GB to start: a sanitizer")
        while high - low > 64:
            middle = (low + high) // 2
            low, high = (low, middle) if self.limited(middle, "--version").returncode == 0 else (middle, high)
        return high

    def test_memory_that_runs_out(self):
        """At every level the findings are complete, or there are a message and status 2. What was written until then is
        the beginning of the findings, or a document that says that the source was not read to its end."""
        head, _, tail = (CASES / "unused-default.cdefsrc").read_text().partition("PersistentClassAttribute\n")
        attribute, _, tail = tail.partition("ClassToManagerMapping\n")
        body = "".join("PersistentClassAttribute\n" + attribute.replace("Id=", f"Id={i}") for i in range(10, 4010))
        ran_out = re.compile(
            r"cdef: (out of memory|\S+: (\w+: alloc_tble (malloc|realloc) failure|strdup failed|"
            r"cfg_malloc malloc failure): Cannot allocate memory|\S+: cannot read because: Cannot allocate memory)\n")
        with tempfile.TemporaryDirectory() as directory:
            source = pathlib.Path(directory) / "large"
            source.write_text(head + body + "ClassToManagerMapping\n" + tail)
            command = ("check", "--format", "json", source)
            kilobytes, failures, step = self.least_memory(), 0, 128
            good = subprocess.run([PROGRAMS.cdef, *command], capture_output=True, text=True, timeout=60)
            self.assertIn(good.returncode, (0, 1), good.stderr)
            while (result := self.limited(kilobytes, *command)).returncode == 2:
                if not good.stdout.startswith(result.stdout):  # the document has an end
                    (source_read,) = json.loads(result.stdout)["sources"]
                    self.assertEqual(f"cdef: {source_read['unreadable']}\n", result.stderr, kilobytes)
                self.assertRegex(result.stderr, ran_out, kilobytes)
                kilobytes, failures, step = kilobytes + step, failures + 1, step + step // 4
        self.assertGreater(failures, 5)
        self.assertEqual((result.returncode, result.stdout), (good.returncode, good.stdout))


FOR_EDITORS = ("keys.cdefsrc", "long-line.cdefsrc", "unknown-attribute.cdefsrc", "numbers.cdefsrc", "repeated.cdefsrc")


def findings_and_messages(test):
    """Findings with their files, and the output about them, for tests of editors."""
    status, text, messages = check("--format", "json", *FOR_EDITORS)
    test.assertEqual((status, messages), (1, ""))
    findings = [(each["file"], found) for each in json.loads(text)["sources"] for found in each["findings"]]
    test.assertIn(None, [found["column"] for _, found in findings if found["severity"] == "warning"])
    return findings, check(*FOR_EDITORS)[2]


class Editors(unittest.TestCase):
    """How the files for editors read messages with and without a column; vim_test.py does the same for Vim."""

    def setUp(self):
        self.findings, self.messages = findings_and_messages(self)

    def test_vscode(self):
        package = json.loads((EDITORS / "vscode/package.json").read_text())
        (matcher,) = package["contributes"]["problemMatchers"]
        pattern = matcher["pattern"]
        matches = [match for line in self.messages.splitlines() if (match := re.match(pattern["regexp"], line))]
        keys = ("file", "line", "column", "severity")
        found = [tuple(match[pattern[key]] for key in keys) for match in matches]
        wanted = [
            (file, str(each["line"]), each["column"] and str(each["column"]), each["severity"])
            for file, each in self.findings
        ]
        self.assertEqual(found, wanted)


class StandardInput(unittest.TestCase):
    """Standard input is read from its current position, whatever kind of file it is."""

    def test_file(self):
        with open(CASES / WRONG, "rb") as file:
            self.assertEqual(check("-", stdin=file), (1, "", with_summary(expected(WRONG, "-"))))

    def test_file_that_has_been_read_in_part(self):
        with tempfile.TemporaryFile() as file:
            file.write(b"Nonsense\n" + (CASES / WRONG).read_bytes())
            file.flush()
            os.lseek(file.fileno(), len(b"Nonsense\n"), os.SEEK_SET)
            self.assertEqual(check("-", stdin=file), (1, "", with_summary(expected(WRONG, "-"))))

    def test_socket(self):
        ours, theirs = socket.socketpair()
        with ours, theirs:
            ours.sendall((CASES / WRONG).read_bytes())
            ours.shutdown(socket.SHUT_WR)
            self.assertEqual(check("-", stdin=theirs), (1, "", with_summary(expected(WRONG, "-"))))

    def test_directory(self):
        directory = os.open(CASES, os.O_RDONLY)
        self.addCleanup(os.close, directory)
        self.assertEqual(check("-", stdin=directory), (2, "", DIRECTORY.replace(".:", "-:")))
