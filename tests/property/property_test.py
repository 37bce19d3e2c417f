"""Test properties of all sources with generated ones.

A correct source compiles without output, and its database contains what the source says. Its size and checksum are
correct. A second compilation gives the same database: in another directory, with other settings of language and time
zone, and with options n and d. Option s gives the result of support/reverse_cdb.py, and reversing that gives the
first database again. cdef verify finds no error in either database, and the source that cdef source writes compiles
to the same database.

A mutation compiles with status 0 or 1. If the status is 1, there is a message and no output. If it is 0, there is no
message, and the database has all of the properties above, except that its expected contents are not known.

Each group is a test of its own. Everything follows from the seeds, and a failure names the seed that shows it:
generate_sources.py DIRECTORY 1 SEED writes that source again.
"""

import functools
import operator
import os
import pathlib
import re
import struct
import subprocess
import sys
import tempfile

import pytest

import generate_sources
import german
import reverse_cdb
from compare import none
from programs import PROGRAMS

GROUPS = 40
CASES = 10000  # sources that all groups have together
SANITIZED_CASES = 1000
MUTATIONS = 2  # of each source
CATALOGUED = 2000  # sources that have everything between them
SAMPLE = 100  # one of so many is compiled by the program itself too
TIMEOUT = 1800
SHARED_MEMORY = pathlib.Path("/dev/shm")
MARK = "<" if sys.byteorder == "little" else ">"
ELSEWHERE = {"TZ": "Asia/Kathmandu", "POSIXLY_CORRECT": ""}

# A section's type; of each kind of record its table's field, its count's, its size, and its name's, ID's and type's fields.
CLASS, MANAGER, MAP, GROUP = 5, 3, 6, 4
TABLES = {
    "PersistentClassAttribute": (24, 168, 72, 8, 32, 36),
    "DynamicClassAttribute": (32, 170, 136, 8, 120, 104),
    "PersistentResourceAttribute": (40, 172, 72, 8, 32, 36),
    "DynamicResourceAttribute": (48, 174, 136, 8, 120, 104),
    "ClassAction": (96, 176, 56, 24, 4, None),
    "ResourceAction": (104, 178, 56, 24, 4, None),
}


class Problem(Exception):
    """A property that does not hold."""


def require(holds, *what):
    """Raise the problem unless the condition holds."""
    if not holds:
        raise Problem(" ".join(map(str, what)))


# ---- One database --------------------------------------------------------------


def is_whole(image, mark):
    """Checks size and checksum, in a byte order."""
    require(len(image) >= 80 and len(image) % 4 == 0, "size", len(image))
    words = struct.unpack(f"{mark}{len(image) // 4}I", image)
    require(words[0] == len(image) - 4, "length", words[0], "in a file of", len(image))
    require(functools.reduce(operator.xor, words[2:], words[0]) == words[1], "wrong checksum")


class Reading:
    """The parts of a database that the expected contents are compared with."""

    def __init__(self, image):
        self.image = image
        self.sections = [self.get(80 + 16 * i, "3I") for i in range(self.get(24, "I")[0])]
        self.at = self.of_type(CLASS)[0]
        self.strings = self.at + self.get(self.at + 160, "I")[0]

    def get(self, at, form):
        """Numbers at an offset."""
        return struct.unpack_from(MARK + form, self.image, at)

    def of_type(self, kind):
        """Where the sections of a type begin."""
        return [at for found, at, _ in self.sections if found == kind]

    def text(self, strings, field):
        """The text that a field refers to."""
        at = strings + self.get(field, "I")[0]
        return self.image[at : self.image.index(b"\0", at)]

    def records(self, kind):
        """Names, IDs and types of a kind of record."""
        table, count, size, name, identifier, data_type = TABLES[kind]
        first = self.at + self.get(self.at + table, "I")[0]
        for at in range(first, first + size * self.get(self.at + count, "H")[0], size):
            record = {"name": self.text(self.strings, at + name), "id": self.get(at + identifier, "i")[0]}
            if data_type is not None:
                record["type"] = self.get(at + data_type, "I")[0]
            yield record


def same(what, found, expected):
    """Raises Problem unless two things are equal."""
    require(found == expected, what, "is", found, "and not", expected)


def says_the_truth(image, truth, out):
    """Compares the database with the expected contents of its source."""
    reading = Reading(image)
    same("class", reading.text(reading.strings, reading.at + 8), truth.name or out.partition(".cdef")[0].encode())
    same("version", reading.get(reading.at + 216, "I")[0], truth.version)
    for kind, records in truth.records.items():
        same(kind, list(reading.records(kind)), records)
    same("variable classes", [reading.text(at + 40, at + 8) for at in reading.of_type(GROUP)], truth.groups)
    same("managers", [reading.text(at + 24, at + 8) for at in reading.of_type(MANAGER)], [truth.manager])
    same("maps", [reading.text(at + 60, at + 8) for at in reading.of_type(MAP)], [truth.catalog])


def may_misplace_a_range(text, arrays_count=True):
    """A class attribute's range may have landed in a resource attribute.

    No image shows that a number leads nowhere.  An array is a value of its own, wherever it landed.
    """
    kind, resource_open = b"", False
    data_type = b""
    for line in text.split(b"\n"):
        word = line.split(b" ")[0].split(b"\t")[0]
        if word.decode("latin-1") in generate_sources.STANZAS:
            kind = word
            resource_open = kind == b"DynamicResourceAttribute" or (resource_open and kind != b"ControlDefinition")
            data_type = b""
        elif line.strip().startswith(b"DataType="):
            data_type = line
        elif kind == b"DynamicClassAttribute" and resource_open and line.strip().startswith(b"Range="):
            if arrays_count or b"Array" not in data_type:
                return True
    return False


def may_cut_attributes_short(text):
    """A second class may have ended an attribute without valid values; no image shows that it has none."""
    return text.count(b"ControlDefinition") > 1


# ---- A group of sources --------------------------------------------------------


class Batch:
    """Sources that are compiled together, each in several ways."""

    def __init__(self, programs, directory):
        self.programs = programs
        self.directory = directory
        self.elsewhere = {**ELSEWHERE, **german.environment(programs.locales)}
        self.sources = {}  # by name: the text
        self.problems = []
        for place in ("sources", "first", "second place/of another depth", "turned", "back", "alone"):
            (directory / place).mkdir(parents=True)

    def add(self, name, text):
        """A source."""
        self.sources[name] = text
        (self.directory / "sources" / name).write_bytes(text)

    def path(self, name, place="sources"):
        """A source or a database."""
        return self.directory / place / (name if place == "sources" else name + ".cdef")

    def read(self, name, place):
        """A database, or None."""
        try:
            return self.path(name, place).read_bytes()
        except FileNotFoundError:
            return None

    def environment(self, more):
        """Variables of the programs."""
        return {**os.environ, "LC_ALL": "C", "VX_CDB_FORCE_EMPTY_TIMESTAMP": "", **more}

    def compile(self, place, names, options=lambda name: (), sources=None, more=None):
        """Compiles sources in a directory; status and message by name."""
        source = sources or self.path
        jobs = ["\t".join((*options(name), str(source(name)), name + ".cdef")) for name in names]
        result = subprocess.run(
            [self.programs.compile_many], cwd=self.directory / place, env=self.environment(more or {}),
            input="".join(job + "\n" for job in jobs).encode(), capture_output=True, timeout=TIMEOUT,
        )
        answers = [line.split("\t", 1) for line in result.stdout.decode("latin-1").split("\n")[:-1]]
        if result.returncode != 0 or len(answers) != len(jobs):
            culprit = jobs[len(answers)] if len(answers) < len(jobs) else "the end"
            raise Problem(f"ended with {result.returncode} at {culprit}: {result.stderr}")
        return {name: (int(status), message) for name, (status, message) in zip(names, answers)}

    def holds(self, name, *check):
        """Records a problem of a source and continues."""
        try:
            check[0](*check[1:])
        except (Problem, struct.error, IndexError, ValueError) as problem:
            self.problems.append(f"{name}: {problem!r}")

    # -- properties --

    def same_again(self, names):
        """Compiles in another place, under other settings, and with options that do not change the database."""
        level = lambda name: len(self.sources[name]) % 5
        options = lambda name: ("-n", "-d", str(level(name)))
        place = "second place/of another depth"
        answers = self.compile(place, names, options, more=self.elsewhere)
        for name in names:
            status, message = answers[name]
            self.holds(name, require, status == 0, "status elsewhere", status, message)
            self.holds(name, require, level(name) > 2 or message == "", "message elsewhere", message)
            self.holds(name, require, self.read(name, place) == self.read(name, "first"), "another database elsewhere")

    def turned(self, names):
        """Compares option s with the second implementation of the reversal, in both directions."""
        answers = self.compile("turned", names, lambda name: ("-s",))
        for name in names:
            first, turned = self.read(name, "first"), self.read(name, "turned")
            self.holds(name, same, "outcome with -s", answers[name], (0, ""))
            self.holds(name, is_whole, turned, ">" if MARK == "<" else "<")
            if may_misplace_a_range(self.sources[name], arrays_count=False) or may_cut_attributes_short(self.sources[name]):
                continue
            self.holds(name, require, reverse_cdb.reverse(first) == turned, "not what reverse_cdb makes of it")
            self.holds(name, require, reverse_cdb.reverse(turned) == first, "turned twice, another database")

    def alone(self, names):
        """Runs the program itself, which starts a new process for each source."""
        for name in names:
            command = [self.programs.cdgen, f"../sources/{name}", f"{name}.cdef"]
            result = subprocess.run(
                command, cwd=self.directory / "alone", env=self.environment(self.elsewhere), capture_output=True, timeout=TIMEOUT
            )
            outcome = (result.returncode, result.stdout, result.stderr)
            self.holds(name, same, "outcome of the program", outcome, (0, b"", b""))
            self.holds(name, require, self.read(name, "alone") == self.read(name, "first"), "another database alone")

    def cdef(self, *arguments):
        """A run of cdef."""
        return subprocess.run(
            [self.programs.cdef, *arguments], cwd=self.directory, env=self.environment({}), capture_output=True, timeout=TIMEOUT
        )

    def sound(self, names):
        """Checks that verification finds no errors in either order."""
        if not names:
            return
        files = [str(self.path(name, place)) for name in names for place in ("first", "turned")]
        result = self.cdef("verify", "-q", *files)
        self.holds("cdef verify", same, "outcome", (result.returncode, result.stdout + result.stderr), (0, b""))

    def back(self, names):
        """Checks that the source made from a database compiles to the same database."""
        script = 'for i; do "$CDEF" source "first/$i.cdef" >"back/$i" || echo "$i"; done'
        environment = self.environment({"CDEF": str(self.programs.cdef)})
        result = subprocess.run(
            ["sh", "-c", script, "sh", *names], cwd=self.directory, env=environment, capture_output=True, timeout=TIMEOUT
        )
        self.holds("cdef source", same, "outcome", result.stdout + result.stderr, b"")
        answers = self.compile("back", names, sources=lambda name: self.directory / "back" / name)
        for name in names:
            self.holds(name, same, "outcome of its own source", answers[name], (0, ""))
            if answers[name][0] == 0 and self.read(name, "back") != self.read(name, "first"):
                result = self.cdef("diff", self.path(name, "first"), self.path(name, "back"))
                self.holds(name, same, "difference", (result.returncode, result.stdout + result.stderr), (0, b""))

    def check(self, compiled):
        """Checks all properties of a database."""
        for name in compiled:
            self.holds(name, is_whole, self.read(name, "first"), MARK)
        self.same_again(compiled)
        self.turned(compiled)
        self.alone(compiled[::SAMPLE])
        self.sound(compiled)
        self.back([name for name in compiled if not may_misplace_a_range(self.sources[name])])


def check_mutation(batch, name, answer):
    """Checks that a mutation either compiles or is refused properly."""
    status, message = answer
    batch.holds(name, require, status in (0, 1), "status", status)
    batch.holds(name, require, (status == 0) == (message == ""), "status", status, "with the message", message)
    batch.holds(name, require, (status == 0) == (batch.read(name, "first") is not None), "status", status, "and its file")


def check_group(programs, seeds):
    """All properties for the sources of some seeds and their mutations; the problems."""
    memory = SHARED_MEMORY if os.access(SHARED_MEMORY, os.W_OK) else None
    with tempfile.TemporaryDirectory(prefix="cdgen-property-", dir=memory) as directory:
        batch = Batch(programs, pathlib.Path(directory))
        truths, mutations = {}, []
        for seed in seeds:
            text, truths[str(seed)] = generate_sources.source(seed)
            batch.add(str(seed), text)
            for i in range(MUTATIONS):
                mutations.append(f"{seed}-{i}")
                batch.add(mutations[-1], generate_sources.mutation(f"{seed}-{i}", text))
        try:
            answers = batch.compile("first", [*truths, *mutations])
            for name, truth in truths.items():
                batch.holds(name, same, "outcome", answers[name], (0, ""))
                if answers[name][0] == 0:
                    batch.holds(name, says_the_truth, batch.read(name, "first"), truth, f"{name}.cdef")
            for name in mutations:
                check_mutation(batch, name, answers[name])
            batch.check([name for name, (status, _) in answers.items() if status == 0])
        except (Problem, subprocess.SubprocessError) as problem:
            batch.problems.append(str(problem))
        return batch.problems


# ---- The generator ---------------------------------------------------------------


class Catalogue:
    """The stanzas, their attributes, and the words that an attribute with certain words takes."""

    # Whose table the properties of a stanza are in.
    TABLES = {
        "ResourceClass": "class",
        "PersistentResourceAttribute": "persistent",
        "PersistentClassAttribute": "persistent",
        "DynamicResourceAttribute": "dynamic",
        "DynamicClassAttribute": "dynamic",
        "ResourceAction": "action",
        "ClassAction": "action",
    }
    ATTRIBUTES = generate_sources.STANZAS[4:8]
    ELEMENTS = generate_sources.STANZAS[10:]
    # What is refused, so that no source that is right has it.
    REFUSED = {
        "an element has no default of its own": {(kind, "DefaultValue") for kind in ELEMENTS},
        "an action's response takes required attributes only": {
            ("ActionOutSDDefinition", name) for name in ("ValidValue", "ValueDisplayName")
        },
        "no attribute, nor an element of one, is a structured byte string": {
            (kind, "DataType", "SBS") for kind in (*ATTRIBUTES, *ELEMENTS[:2])
        },
        "no element is a structure": {(kind, "DataType", name) for kind in ELEMENTS for name in ("SD", "SDArray")},
    }

    def __init__(self, listing):
        self.rows = [line.split() for line in listing.splitlines()]

    def of(self, what):
        """The rows of a kind of name."""
        return [row[1:] for row in self.rows if row[0] == what]

    def words(self, stanza, form):
        """What a value of that form may be, if that is certain words."""
        if form == "names":
            return [name for table, name, _ in self.of("property") if table == self.TABLES[stanza]]
        lists = {"type": "type", "a letter": "permission", "Counter, Quantity, State or Quantum": "variable"}
        return [row[0] for row in self.of(lists[form])] if form in lists else []

    def all(self):
        """Everything that the language has, as tuples of one to three names."""
        known = {tuple(row) for row in self.of("stanza")}
        for stanza, name, _, _, *form in self.of("attribute"):
            known.add((stanza, name))
            known.update((stanza, name, word) for word in self.words(stanza, " ".join(form)))
        return known

    @staticmethod
    def used_in(text):
        """The parts of the language that a source uses, and the words in other values."""
        used, stanza = set(), None
        for line in text.split("\n"):
            word = re.split("[ \t]", line)[0]
            if word in generate_sources.STANZAS:
                stanza = word
                used.add((stanza,))
            elif word == "":
                name, _, value = line.strip(" \t").partition("=")
                used.add((stanza, name))
                used.update((stanza, name, one) for one in re.split("[ \t]", value)[0].strip('"').split(","))
        return used


def check_catalogue(programs):
    """Checks that the first sources use everything that the language has, where it belongs."""
    listing = subprocess.run([programs.list_names], capture_output=True, text=True, check=True).stdout
    known = Catalogue(listing).all()
    refused = set().union(*Catalogue.REFUSED.values())
    used = set()
    for seed in range(CATALOGUED):
        used |= Catalogue.used_in(generate_sources.source(seed)[0].decode("latin-1"))
    problems = [f"{' '.join(names)} never comes up" for names in sorted(known - refused - used)]
    problems += [f"{' '.join(names)} comes up and should be refused" for names in sorted(refused & used)]
    return problems + [f"{' '.join(names)} is refused and not in the language" for names in sorted(refused - known)]


def check_determined(seeds):
    """Checks that a seed always gives the same source, and that another seed gives another."""
    texts = [generate_sources.source(seed)[0] for seed in seeds]
    again = [generate_sources.source(seed)[0] for seed in seeds]
    problems = [] if texts == again else ["another source the second time"]
    return problems if len(set(texts)) == len(texts) else [*problems, "two seeds have one source"]


# ---- Tests -----------------------------------------------------------------------


def seeds_of(group):
    """The seeds of a group in this round; a sanitizer gets fewer."""
    cases = PROGRAMS.cases or (SANITIZED_CASES if PROGRAMS.sanitizers else CASES)
    each = -(-cases // GROUPS)
    first = (PROGRAMS.round * GROUPS + group) * each
    return range(first, first + each)


@pytest.mark.slow(3)
def test_catalogue():
    """The first sources use everything that the language has, where it belongs."""
    none(check_catalogue(PROGRAMS))


def test_determined():
    """The same seed always gives the same source, and another seed another."""
    none(check_determined(range(len(seeds_of(0)))))


@pytest.mark.slow(5)
@pytest.mark.parametrize("group", range(GROUPS))
def test_sources(group):
    """All properties, for the sources of some seeds and their mutations."""
    problems = check_group(PROGRAMS, seeds_of(group))
    none(problems[:10] + [f"{len(problems)} problems"] * bool(problems))
