"""Test `cdef verify`: its output, its exit statuses, and that it finds no error in any database that the compiler
makes.

The images are those that support/make_images.py makes.
"""

import json
import os
import pathlib
import re
import socket
import subprocess
import tempfile
import unittest

import documents
import golden
from programs import PROGRAMS, TESTS


WRONG = "broken/CDB301-class.little.cdef"
WRONG_LINE = (
    "{}: error: section 0, rsrc_class_t 0, rc_cb_ID at offset 144: wrong record identifier: "
    "found 0x43444230, expected 0x43444231 [CDB301]\n"
)
CARELESS = "cut_short.little.cdef"
CARELESS_LINE = (
    "{}: warning: section 0, rsrc_pattr_t 0, u_ra_valid_vals at offset 384: "
    "attribute cut short by a new class: the valid values are not its own: "
    "found 0, expected in 0 bytes [CDB353]\n"
)
OF_THE_FILE = "broken/CDB102-one-less.little.cdef"
OF_THE_FILE_LINE = (
    "{}: error: file, orb_cdb_header_t 0, cdb_hdr_length at offset 0: "
    "length in the header is not the file's size minus 4: found 1487, expected 1488 [CDB102]\n"
)
SOUND = "small.little.cdef"
WRONG_FINDING = {
    "code": "CDB301",
    "severity": "error",
    "title": "wrong record identifier",
    "section": 0,
    "record": "rsrc_class_t",
    "index": 0,
    "field": "rc_cb_ID",
    "offset": 144,
    "found": 0x43444230,
    "expected": 0x43444231,
    "cause": None,
}
CARELESS_FINDING = {
    "code": "CDB353",
    "severity": "warning",
    "title": "attribute cut short by a new class: the valid values are not its own",
    "section": 0,
    "record": "rsrc_pattr_t",
    "index": 0,
    "field": "u_ra_valid_vals",
    "offset": 384,
    "found": 0,
    "expected": "in 0 bytes",
    "cause": None,
}


def verify(*operands, stdin=subprocess.DEVNULL, stdout=subprocess.PIPE, data=None):
    """Status, output and messages of `cdef verify`, run among the images."""
    given = {"input": data} if data is not None else {"stdin": stdin}
    result = subprocess.run(
        [PROGRAMS.cdef, "verify", *operands], cwd=PROGRAMS.images, stdout=stdout, stderr=subprocess.PIPE, check=False,
        timeout=60, **given,
    )
    return result.returncode, (result.stdout or b"").decode(), result.stderr.decode()


class Output(unittest.TestCase):
    """The output and the statuses."""

    def test_nothing_of_a_sound_database(self):
        for order in ("little", "big"):
            self.assertEqual(verify(f"whole.{order}.cdef"), (0, "", ""))

    def test_a_line_for_an_error(self):
        self.assertEqual(verify(WRONG), (1, WRONG_LINE.format(WRONG), ""))

    def test_a_line_for_the_file_as_a_whole(self):
        self.assertEqual(verify(OF_THE_FILE), (1, OF_THE_FILE_LINE.format(OF_THE_FILE), ""))

    def test_a_warning_is_no_failure(self):
        self.assertEqual(verify(CARELESS), (0, CARELESS_LINE.format(CARELESS), ""))

    def test_werror_makes_it_one(self):
        self.assertEqual(verify("--werror", CARELESS), (1, CARELESS_LINE.format(CARELESS), ""))

    def test_werror_finds_nothing_in_a_sound_database(self):
        self.assertEqual(verify("--werror", SOUND), (0, "", ""))

    def test_quiet_shows_no_warnings(self):
        for option in ("-q", "--quiet"):
            self.assertEqual(verify(option, CARELESS), (0, "", ""))

    def test_quiet_shows_errors(self):
        self.assertEqual(verify("-q", WRONG), (1, WRONG_LINE.format(WRONG), ""))

    def test_quiet_and_werror(self):
        self.assertEqual(verify("-q", "--werror", CARELESS), (1, "", ""))

    def test_several_files_in_their_order(self):
        lines = CARELESS_LINE.format(CARELESS) + WRONG_LINE.format(WRONG)
        self.assertEqual(verify(CARELESS, WRONG, SOUND), (1, lines, ""))
        self.assertEqual(verify(SOUND, CARELESS), (0, CARELESS_LINE.format(CARELESS), ""))

    def test_help(self):
        status, text, messages = verify("--help")
        self.assertEqual((status, messages), (0, ""))
        for option in ("--format", "--json", "--all", "--werror", "-q,--quiet", "FILE"):
            self.assertIn(option, text)


class Json(unittest.TestCase):
    """The form of --json."""

    def parsed(self, expected_status, *operands):
        status, text, messages = verify("--json", *operands)
        self.assertEqual((status, messages), (expected_status, ""))
        self.assertTrue(text.endswith("}\n"))
        data = json.loads(text)
        self.assertEqual(list(data), ["schema", "version", "files"])
        self.assertEqual((data["schema"], data["version"]), ("cdef-verify.schema.json", 1))
        return data["files"]

    def test_sound(self):
        self.assertEqual(self.parsed(0, SOUND), [{"file": SOUND, "sound": True, "findings": []}])

    def test_errors_and_warnings(self):
        expected = [
            {"file": WRONG, "sound": False, "findings": [WRONG_FINDING]},
            {"file": CARELESS, "sound": True, "findings": [CARELESS_FINDING]},
        ]
        self.assertEqual(self.parsed(1, WRONG, CARELESS), expected)

    def test_keys_in_their_order(self):
        self.assertEqual(list(self.parsed(1, WRONG)[0]), ["file", "sound", "findings"])
        self.assertEqual(list(self.parsed(1, WRONG)[0]["findings"][0]), list(WRONG_FINDING))

    def test_document_names_the_keys(self):
        """In their order; a row may name several."""
        chapter = dict(documents.chapters(TESTS.parent / "docs" / "reader.md", 2))["cdef verify"]
        of_file, of_finding = documents.tables(chapter)[-2:]
        for table, expected in ((of_file, self.parsed(0, SOUND)[0]), (of_finding, WRONG_FINDING)):
            self.assertEqual([key for row in table[1:] for key in documents.spans(row[0])], list(expected))

    def test_of_the_file_as_a_whole(self):
        self.assertIsNone(self.parsed(1, OF_THE_FILE)[0]["findings"][0]["section"])

    def test_quiet(self):
        self.assertEqual(self.parsed(0, "-q", CARELESS), [{"file": CARELESS, "sound": True, "findings": []}])

    def test_werror(self):
        expected = [{"file": CARELESS, "sound": False, "findings": [CARELESS_FINDING]}]
        self.assertEqual(self.parsed(1, "--werror", CARELESS), expected)

    def test_file_name_that_is_no_text(self):
        with tempfile.TemporaryDirectory() as directory:
            path = os.fsencode(directory) + b"/\xff.cdef"
            pathlib.Path(os.fsdecode(path)).write_bytes((PROGRAMS.images / SOUND).read_bytes())
            status, text, messages = verify("--json", path)
            self.assertEqual((status, messages), (0, ""))
            self.assertIs(json.loads(text)["files"][0]["sound"], True)


class Causes(unittest.TestCase):
    """A count that is too large by one displaces everything after it. small.image says what is where: the class record is
    at 144, and the number of its persistent attributes 172 bytes further."""

    COUNT = (
        "{}: error: section 0, rsrc_class_t 0, rc_num_pattrs at offset 316: contradicts the rest of the file: "
        "found 3, expected 2 [CDB108]\n"
    )

    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.path = pathlib.Path(directory.name) / "count.cdef"
        data = bytearray((PROGRAMS.images / SOUND).read_bytes())
        data[316] = 3
        self.path.write_bytes(data)

    def test_the_cause_and_how_many_follow(self):
        status, text, messages = verify(self.path)
        cause, note = text.splitlines(True)
        self.assertEqual((status, cause, messages), (1, self.COUNT.format(self.path), ""))
        self.assertRegex(note, r"^.*: note: \d+ findings follow from this one; --all shows them\n$")

    def test_all(self):
        status, text, messages = verify("--all", self.path)
        cause, *others = text.splitlines(True)
        self.assertEqual((status, cause, messages), (1, self.COUNT.format(self.path), ""))
        self.assertGreater(len(others), 5)
        for line in others:
            self.assertTrue(line.startswith(f"  {self.path}: "), line)
        self.assertIn(f": note: {len(others)} findings ", verify(self.path)[1])

    def test_json_has_all_findings_and_their_cause(self):
        status, text, _ = verify("--json", self.path)
        findings = json.loads(text)["files"][0]["findings"]
        self.assertEqual((status, findings[0]["code"], findings[0]["field"]), (1, "CDB108", "rc_num_pattrs"))
        self.assertEqual([each["cause"] for each in findings], [None] + [0] * (len(findings) - 1))
        self.assertEqual(text, verify("--json", "--all", self.path)[1])


class Input(unittest.TestCase):
    """Standard input, and files that cannot be read."""

    def test_standard_input(self):
        with open(PROGRAMS.images / WRONG, "rb") as file:
            self.assertEqual(verify("-", stdin=file), (1, WRONG_LINE.format("-"), ""))

    def test_standard_input_that_is_a_pipe(self):
        data = (PROGRAMS.images / WRONG).read_bytes()
        self.assertEqual(verify("-", data=data), (1, WRONG_LINE.format("-"), ""))
        self.assertEqual(verify("-", data=(PROGRAMS.images / SOUND).read_bytes()), (0, "", ""))

    def test_missing_file(self):
        self.assertEqual(verify("none.cdef"), (2, "", "cdef: none.cdef: No such file or directory\n"))

    def test_standard_input_that_is_a_socket(self):
        ours, theirs = socket.socketpair()
        with ours, theirs:
            ours.sendall((PROGRAMS.images / WRONG).read_bytes())
            ours.shutdown(socket.SHUT_WR)
            self.assertEqual(verify("-", stdin=theirs), (1, WRONG_LINE.format("-"), ""))

    def test_standard_input_from_its_present_offset(self):
        with tempfile.TemporaryFile() as file:
            file.write(b"front" + (PROGRAMS.images / WRONG).read_bytes())
            file.flush()
            os.lseek(file.fileno(), len(b"front"), os.SEEK_SET)
            self.assertEqual(verify("-", stdin=file), (1, WRONG_LINE.format("-"), ""))

    def test_missing_file_outweighs_an_error_and_hides_none(self):
        missing = "cdef: none.cdef: No such file or directory\n"
        lines = WRONG_LINE.format(WRONG) + CARELESS_LINE.format(CARELESS)
        self.assertEqual(verify(WRONG, "none.cdef", CARELESS), (2, lines, missing))
        status, text, messages = verify("--json", "none.cdef", WRONG, "broken")
        self.assertEqual((status, messages), (2, missing + "cdef: broken: Is a directory\n"))
        unread, wrong, directory = json.loads(text)["files"]
        self.assertEqual(unread, {"file": "none.cdef", "unreadable": missing[len("cdef: "):-1]})
        self.assertEqual((wrong["file"], wrong["sound"]), (WRONG, False))
        self.assertEqual(directory, {"file": "broken", "unreadable": "broken: Is a directory"})

    def test_a_source_belongs_to_check(self):
        for text, shown in (("ControlDefinition\n\tFileVersion=1\n", True), ("x", True), ("", False), ("x\0", False)):
            with tempfile.TemporaryDirectory() as directory:
                source = pathlib.Path(directory) / "a.cdefsrc"
                source.write_text(text)
                status, output, messages = verify(source)
            expected = f"cdef: {source}: a text, not a database; 'cdef check' checks sources\n"
            if shown:
                self.assertEqual((status, output, messages), (2, "", expected))
            else:
                self.assertEqual((status, messages), (1, ""))
                self.assertIn("[CDB101]", output)

    def test_a_source_belongs_to_check_in_all_subcommands_that_read_databases(self):
        expected = "cdef: a.cdefsrc: a text, not a database; 'cdef check' checks sources\n"
        with tempfile.TemporaryDirectory() as directory:
            (pathlib.Path(directory) / "a.cdefsrc").write_text("ControlDefinition\n\tFileVersion=1\n")
            sound = PROGRAMS.images / SOUND
            for words in (("verify", "a.cdefsrc"), ("dump", "a.cdefsrc"), ("dump", "--json", "a.cdefsrc"),
                          ("source", "a.cdefsrc"), ("diff", "a.cdefsrc", sound), ("diff", sound, "a.cdefsrc")):
                with self.subTest(words):
                    result = subprocess.run([PROGRAMS.cdef, *words], cwd=directory, capture_output=True, text=True,
                                            check=False, timeout=60)
                    self.assertEqual((result.returncode, result.stdout, result.stderr), (2, "", expected))

    def test_a_database_given_to_check_belongs_to_verify(self):
        message = "cdef: {}: a database, not a source; 'cdef verify' checks databases\n"
        for name in (SOUND, SOUND.replace("little", "big"), WRONG):
            result = subprocess.run(
                [PROGRAMS.cdef, "check", name], cwd=PROGRAMS.images, capture_output=True, text=True, check=False, timeout=60
            )
            self.assertEqual((result.returncode, result.stdout, result.stderr), (2, "", message.format(name)))
        with open(PROGRAMS.images / SOUND, "rb") as file:
            result = subprocess.run(
                [PROGRAMS.cdef, "check", "-"], stdin=file, capture_output=True, text=True, check=False, timeout=60
            )
        self.assertEqual((result.returncode, result.stdout, result.stderr), (2, "", message.format("-")))

    def test_directory(self):
        self.assertEqual(verify("broken"), (2, "", "cdef: broken: Is a directory\n"))

    def test_standard_input_that_is_a_directory(self):
        directory = os.open(PROGRAMS.images, os.O_RDONLY)
        self.addCleanup(os.close, directory)
        self.assertEqual(verify("-", stdin=directory), (2, "", "cdef: -: Is a directory\n"))

    def test_empty_name(self):
        self.assertEqual(verify(""), (2, "", "cdef: : No such file or directory\n"))

    def test_no_file_named(self):
        status, text, messages = verify()
        self.assertEqual((status, text), (2, ""))
        self.assertTrue(messages.startswith("cdef: "), messages)

    def test_unknown_option(self):
        status, text, messages = verify("--nothing", SOUND)
        self.assertEqual((status, text), (2, ""))
        self.assertIn("--nothing", messages)

    def test_name_that_looks_like_an_option(self):
        with tempfile.TemporaryDirectory() as directory:
            path = pathlib.Path(directory) / "-x.cdef"
            path.write_bytes((PROGRAMS.images / WRONG).read_bytes())
            result = subprocess.run(
                [PROGRAMS.cdef, "verify", "--", "-x.cdef"], cwd=directory, capture_output=True, check=False, timeout=60
            )
            self.assertEqual((result.returncode, result.stdout.decode()), (1, WRONG_LINE.format("-x.cdef")))

    def test_names_that_a_terminal_would_act_on(self):
        name, shown = "a\x1b[2J\\\u202eé", "a\\x1b[2J\\\\xe2\\x80\\xaeé"
        self.assertEqual(verify(name), (2, "", f"cdef: {shown}: No such file or directory\n"))
        self.assertEqual(verify("-q", f"-{name}")[2], f"cdef: -{shown}: unknown option\nRun 'cdef verify --help' for more.\n")
        with tempfile.TemporaryDirectory() as directory:
            path = pathlib.Path(directory) / name
            path.write_bytes((PROGRAMS.images / WRONG).read_bytes())
            self.assertEqual(verify(path), (1, WRONG_LINE.format(f"{directory}/{shown}"), ""))
            data = bytearray((PROGRAMS.images / SOUND).read_bytes())
            data[4] ^= 1
            path.write_bytes(data)
            result = subprocess.run([PROGRAMS.cdef, "diff", path, path], capture_output=True, check=False, timeout=60)
        self.assertEqual(result.stderr.decode(), f"cdef: {directory}/{shown}: wrong checksum\n" * 2)

    def test_names_in_brackets(self):
        names = ["[x]", "[x,y]", "[]", "[[x]]", "[x", "x]", "./x]", "./x"]
        with tempfile.TemporaryDirectory() as directory:
            for name in names:
                (pathlib.Path(directory) / name).write_bytes((PROGRAMS.images / WRONG).read_bytes())
            result = subprocess.run(
                [PROGRAMS.cdef, "verify", *names], cwd=directory, capture_output=True, text=True, check=False, timeout=60
            )
        expected = "".join(WRONG_LINE.format(name) for name in names)
        self.assertEqual((result.returncode, result.stdout, result.stderr), (1, expected, ""))


class Usage(unittest.TestCase):
    """The help. The messages about wrong command lines are in tests/cdef/usage_test.py."""

    def test_help_ends_in_the_exit_statuses(self):
        for subcommand, statuses in {"verify": "012", "dump": "02", "diff": "012", "source": "02"}.items():
            result = subprocess.run(
                [PROGRAMS.cdef, subcommand, "--help"], capture_output=True, text=True, check=True, timeout=60
            )
            last = result.stdout.rstrip().rpartition("\n")[2]
            self.assertEqual(last[:13] + "".join(re.findall(r"\d", last)), "Exit status: " + statuses, result.stdout)


class FullDevice(unittest.TestCase):
    """Output that cannot be written."""

    MESSAGE = "cdef: standard output: No space left on device\n"

    def on_full(self, *operands):
        with open("/dev/full", "wb") as full:
            status, _, messages = verify(*operands, stdout=full)
        return status, messages

    def test_findings(self):
        for operands in ([WRONG], [CARELESS], ["--json", SOUND]):
            self.assertEqual(self.on_full(*operands), (2, self.MESSAGE))

    def test_nothing_to_say(self):
        self.assertEqual(self.on_full(SOUND), (0, ""))

    def test_help(self):
        self.assertEqual(self.on_full("--help")[0], 2)


CLASS = """ControlDefinition
	FileVersion=1.0.0.0
ResourceClass
	Description=1
	DisplayName=2
	Properties=HasResources,CanDefine
	ClassPermTemplate=0
	ResourcePermTemplate=0
	Name=C
"""
MAP = """ClassToManagerMapping
	ResourceManager=Mgr1
	FirstKey=1
	LastKey=100
	MessageCatalog=mgr1.cat
	DescriptiveMessageSet=1
"""


def persistent(name, data_type, *more):
    """The stanza of a persistent attribute."""
    lines = [f"Name={name}", "Description=3", "DisplayName=4", "Id=7", f"DataType={data_type}", "VarietyRange=1,1", *more]
    return "PersistentResourceAttribute\n" + "".join(f"\t{line}\n" for line in lines)


def dynamic(level, name, data_type, *more):
    """The stanza of a dynamic attribute."""
    lines = [f"Name={name}", "Description=3", "DisplayName=4", "Id=7", f"DataType={data_type}"]
    lines += ["VariableType=Quantity", "VarietyRange=1,1", *more]
    return f"Dynamic{level}Attribute\n" + "".join(f"\t{line}\n" for line in lines)


# A class attribute's Range that an open resource attribute of another type
# takes, and that happens to look like a place in the strings there.
STRAY_RANGES = {
    "a name read as an array": CLASS
    + persistent("A", "Int32")
    + "".join(persistent(f"LongName{number:060}", "Int32") for number in range(20))
    + dynamic("Resource", "AB", "Int32Array")
    + dynamic("Class", "CD", "UInt32", "Range=8,8")
    + MAP,
    "a binary read as text, in an attribute cut short": CLASS
    + persistent("P", "Binary", "DefaultValue=0x00112233445566778899")
    + persistent("Q", "Int32")
    + dynamic("Resource", "AB", "String")
    + dynamic("Class", "CD", "UInt32", "Range=24,32")
    + CLASS
    + MAP,
    "the middle of a name read as text, in an attribute cut short": CLASS
    + persistent("LongNameLongNameLongNameLongName", "Int32")
    + dynamic("Resource", "AB", "String")
    + dynamic("Class", "CD", "UInt32", "Range=16,24")
    + CLASS
    + MAP,
}


def expected_warnings():
    """The codes of the warnings about each careless golden source, by case."""
    lines = (TESTS / "cdef" / "verify" / "golden-warnings.txt").read_text().splitlines()
    cases = [line.split(": ") for line in lines if line and not line.startswith("#")]
    return {name: codes.split() for name, codes in cases}


class Compiled(unittest.TestCase):
    """Databases that the compiler makes have no errors, and only those of careless sources have warnings."""

    def expect_sound(self, database, what):
        self.assertEqual(verify("-q", database), (0, "", ""), what)

    def codes_of(self, database):
        status, text, messages = verify("--json", database)
        self.assertEqual((status, messages), (0, ""), text)
        return [finding["code"] for finding in json.loads(text)["files"][0]["findings"]]

    def test_golden_sources_in_both_orders(self):
        expected = expected_warnings()
        sound = set()
        with tempfile.TemporaryDirectory() as directory:
            database = pathlib.Path(directory) / "made.cdef"
            for path in golden.cases_below(TESTS / "golden"):
                case = golden.Case(path)
                for extra in ([], ["-s"]) if case.status == 0 else ():
                    _, _, after = golden.run(case, PROGRAMS.cdgen, extra)
                    database.write_bytes(after[case.out])
                    name = path.with_suffix("").relative_to(TESTS / "golden").as_posix()
                    self.assertEqual(self.codes_of(database), expected.get(name, []), f"{name} {extra}")
                    sound.add(name)
        self.assertGreater(len(sound), 100)
        self.assertLessEqual(set(expected), sound, "cases that are no more")

    def compile(self, source, directory, extra):
        path = pathlib.Path(directory) / "made.cdefsrc"
        path.write_text(source)
        database = path.with_suffix(".cdef")
        subprocess.run([PROGRAMS.cdgen, *extra, path, database], check=True, stdout=subprocess.DEVNULL)
        return database

    def test_examples_in_both_orders(self):
        with tempfile.TemporaryDirectory() as directory:
            for source in sorted((TESTS.parent / "examples").glob("*.cdefsrc")):
                for extra in ([], ["-s"]):
                    database = self.compile(source.read_text(), directory, extra)
                    self.assertEqual(verify("--werror", database), (0, "", ""), source)

    def test_ranges_that_have_gone_astray(self):
        with tempfile.TemporaryDirectory() as directory:
            for name, source in STRAY_RANGES.items():
                for extra in ([], ["-s"]):
                    with self.subTest(name, extra=extra):
                        self.expect_sound(self.compile(source, directory, extra), name)
