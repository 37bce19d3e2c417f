"""Test cdef source: what its sources look like, and that they compile to the same database.

A case is tests/cdef/source/NAME.cdefsrc, which is compiled, or NAME.image, a database in the notation of
cdb_image.py. Beside it, NAME.expect has the expected result in the notation of expectation.py: the status (default
0), and the expected source as stdout: or the message of a refusal as stderr:.

In addition, the source of a database must compile to a database that cdef diff calls identical; the source of that
database must be the same source, and cdef format must not change it. This is tested with every golden source, the
twins, the examples, and generated sources, in both byte orders.
"""

import os
import pathlib
import pty
import subprocess
import tempfile

import pytest

import cdb_image
import cdef_sources
import golden
import make_images
from bounded import MEGABYTES, peak_of
from compare import none, same
from expectation import Expectation
from programs import PROGRAMS, TESTS, environment

CASES = TESTS / "cdef" / "source"
GENERATED_GROUPS = 6
GENERATED_EACH, SANITIZED_EACH = 50, 10
PARTS = 2  # that run side by side
TIMEOUT = 60
TROUBLE = 2

# Names in the directory that a test runs in.
DATABASE = "database"
SOURCE = "source"


class Programs:
    """The two programs."""

    def __init__(self):
        self.cdgen, self.cdef = PROGRAMS.cdgen, PROGRAMS.cdef

    def run(self, directory, *command):
        """One run of a program."""
        return subprocess.run(
            command, cwd=directory, env=environment(), stdin=subprocess.DEVNULL, capture_output=True, timeout=TIMEOUT
        )

    def compile(self, directory, source, out, swap):
        """The bytes of a compiled source, or None, and the message."""
        (directory / SOURCE).write_bytes(source)
        (directory / out).parent.mkdir(parents=True, exist_ok=True)
        result = self.run(directory, self.cdgen, *(["-s"] if swap else []), SOURCE, out)
        return (directory / out).read_bytes() if result.returncode == 0 else None, result.stderr.decode()

    def source(self, directory, database):
        """The run that writes the source of a database."""
        (directory / DATABASE).write_bytes(database)
        return self.run(directory, self.cdef, "source", DATABASE)


def round_trip(programs, source, out="out.cdef", swap=False):
    """The problems of a source that is compiled and turned back into a source; None if it does not compile."""
    with tempfile.TemporaryDirectory() as name:
        directory = pathlib.Path(name)
        first, _ = programs.compile(directory, source, out, swap)
        if first is None:
            return None
        (directory / "first").write_bytes(first)
        written = programs.source(directory, first)
        if written.returncode != 0:
            return [f"no source: {written.stderr.decode()}"]
        second, message = programs.compile(directory, written.stdout, out, swap)
        if second is None:
            return [f"does not compile: {message}", written.stdout.decode(errors="replace")]
        problems = []
        difference = programs.run(directory, programs.cdef, "diff", "first", out)
        if difference.returncode != 0:
            problems.append(f"differs: {(difference.stdout + difference.stderr).decode()}")
        tidy = programs.run(directory, programs.cdef, "format", "--check", SOURCE)
        if tidy.returncode != 0:
            problems.append(f"cdef format changes it: {(tidy.stdout + tidy.stderr).decode()}")
        again = programs.source(directory, second)
        if again.stdout != written.stdout:
            problems.append(f"another source the second time: {again.stderr.decode()}")
        return problems + ([written.stdout.decode(errors="replace")] if problems else [])


def both_orders(programs, source, out="out.cdef"):
    """The problems in both byte orders; None if the source does not compile."""
    native = round_trip(programs, source, out)
    return None if native is None else native + round_trip(programs, source, out, swap=True)


# ---- Properties ------------------------------------------------------------


def golden_sources():
    """(name, text, output file) of all golden sources that compile."""
    for path in golden.cases_below(TESTS / "golden"):
        case = golden.Case(path)
        if case.status == 0:
            yield path.stem, case.source.read_bytes(), case.out


def plain_sources():
    """The same for sources without an expectation."""
    for directory in (TESTS / "twins", TESTS.parent / "examples", TESTS / "cdef" / "diff", CASES):
        for path in sorted(directory.glob("*.cdefsrc")):
            yield path.stem, path.read_bytes(), "out.cdef"


def check_sources(programs, sources):
    """Checks that each source compiles and can be turned back into a source."""
    problems = []
    count = 0
    for name, text, out in sources:
        found = both_orders(programs, text, out)
        problems += [f"{name}: does not compile"] if found is None else [f"{name}: {line}" for line in found]
        count += 1
    return problems if count else ["no sources"]


def check_generated(programs, group):
    """Checks the same of generated sources, most of which must compile."""
    problems = []
    compiled = 0
    each = SANITIZED_EACH if PROGRAMS.sanitizers else GENERATED_EACH
    for seed in range(group * each, (group + 1) * each):
        text = cdef_sources.source(seed)
        found = both_orders(programs, text)
        compiled += found is not None
        if found:
            problems += [f"seed {seed}: {line}" for line in found]
    if compiled < each * 3 // 4:
        problems.append(f"only {compiled} of {each} compile")
    return problems


# ---- What is no case --------------------------------------------------------


def check_tolerated(programs):
    """A database with a wrong checksum is accepted with a message, and its source is the same."""
    with tempfile.TemporaryDirectory() as name:
        directory = pathlib.Path(name)
        text = (CASES / "canonical.cdefsrc").read_bytes()
        database = bytearray(programs.compile(directory, text, "out.cdef", swap=False)[0])
        expected = programs.source(directory, database).stdout
        database[4] ^= 1
        result = programs.source(directory, database)
    message = f"cdef: {DATABASE}: wrong checksum\n".encode()
    actual = (result.returncode, result.stdout, result.stderr)
    return [] if actual == (0, expected, message) and expected else [f"{actual}"]


def on_terminal(programs, directory):
    """Status, what is seen and the message of the source of the database in a directory, written to a terminal."""
    master, slave = pty.openpty()
    with os.fdopen(master, "rb", buffering=0) as screen:
        command = [programs.cdef, "source", DATABASE]
        with subprocess.Popen(command, cwd=directory, stdout=slave, stderr=subprocess.PIPE) as process:
            os.close(slave)
            shown = b""
            try:
                while part := screen.read(65536):
                    shown += part
            except OSError:  # how a terminal ends
                pass
            return process.wait(TIMEOUT), shown.replace(b"\r\n", b"\n"), process.stderr.read()


def check_terminal(programs):
    """A source is written to a terminal only if it contains nothing that could control the terminal or would be
    invisible."""
    text = (CASES / "canonical.cdefsrc").read_bytes()
    refusal = f"cdef: {DATABASE}: the source contains characters that could control a terminal: write it to a file\n".encode()
    shown = [text.encode() for text in ("plain", "é €\U0001f600", "e\u0301")]
    hidden = [b"\xe9", *(text.encode() for text in ("\x1b[1m", "\u202e", "\ufe0f"))]
    problems = []
    for name in shown + hidden:
        with tempfile.TemporaryDirectory() as place:
            directory = pathlib.Path(place)
            database, message = programs.compile(directory, text.replace(b"mgr1.cat", name), "out.cdef", swap=False)
            written = programs.source(directory, database).stdout
            expected = (0, written, b"") if name in shown else (TROUBLE, b"", refusal)
            if name not in written or on_terminal(programs, directory) != expected:
                problems.append(f"{name}: {message}{on_terminal(programs, directory)}")
    return problems


def refusals(programs, what, database, why):
    """The problems of a database that must be refused for this reason."""
    with tempfile.TemporaryDirectory() as name:
        result = programs.source(pathlib.Path(name), database)
    actual = (result.returncode, result.stdout, result.stderr.decode())
    return [] if actual == (TROUBLE, b"", f"cdef: {DATABASE}: no source: {why}\n") else [f"{what}: {actual}"]


def check_sections(programs):
    """Sections of a type that the compiler does not write, or with a revision, are refused."""
    problems = []
    for order in make_images.ORDERS:
        plain = make_images.assemble(TESTS / "image" / "hash.image", order)
        problems += refusals(programs, order, plain, "section 0: no source compiles to a section of type 7")
        unused = make_images.assemble(TESTS / "image" / "sections.image", order)
        problems += refusals(programs, order, unused, "section 1: no source compiles to a section of type 0")
        revised = bytearray(make_images.assemble(TESTS / "image" / "small.image", order))
        make_images.change(revised, "put", "u32 92 3", order)  # the first anchor's
        make_images.settle(revised, order, [])
        problems += refusals(programs, order, revised, "section 0: it has a revision, which no source can set")
    return problems


# A class that another one cuts short, with an attribute that has no type.
CUT_SHORT = """
include common.inc
section class
rsrc_class_t:1 $CLASS u_rc_pattrsC=224 u_rc_dattrsC=224 u_rc_pattrs=224 u_rc_dattrs={dynamic}
+ u_rc_actionsC={end} u_rc_actions={end} u_rc_variety_lists={end} u_rc_sd_defs={lists} u_rc_valid_vals={lists}
+ u_rc_strings={lists} {count}=1 rc_varlist_size=16 rc_locator=0
{record} u_ra_name=8 ra_props=0 ra_group_id=0 {field}
variety_list_t:g 0,10
string "C"
string "A"
string "Text"
section class
rsrc_class_t:1 $CLASS $EMPTY
string "D"
include tail.inc
"""
PERSISTENT = {"record": "rsrc_pattr_t:9 $PATTR", "count": "rc_num_pattrs", "dynamic": 296, "end": 296, "lists": 312}
DYNAMIC = {"record": "rsrc_dattr_t:a $DATTR", "count": "rc_num_dattrs", "dynamic": 224, "end": 360, "lists": 376}
OPTIONAL = ("ra_props=0x20", "ra_group_id=1", "ra_group_msgid=2")
CONDITIONS = ("u_ra_express=16", "u_ra_rearm_expr=16", "ra_expr_desc=3", "ra_rearm_desc=4")


def check_optional_fields(programs):
    """Optional lines can follow only if there are a type and a variety."""
    problems = []
    for kind, fields in ((PERSISTENT, OPTIONAL), (DYNAMIC, OPTIONAL + CONDITIONS)):
        stanza = "Persistent" if kind is PERSISTENT else "Dynamic"
        why = f"{stanza}ResourceAttribute 'A': it has optional attributes, which can only follow a data type and varieties"
        for order in make_images.ORDERS:
            database = cdb_image.assemble(CUT_SHORT.format(field="", **kind), order, base_dir=TESTS / "golden")
            with tempfile.TemporaryDirectory() as name:
                result = programs.source(pathlib.Path(name), database)
            if (result.returncode, result.stderr) != (0, b"") or b"DataType" in result.stdout:
                problems.append(f"{stanza}: {result}")
            for field in fields:
                text = CUT_SHORT.format(field=field, **kind)
                database = cdb_image.assemble(text, order, base_dir=TESTS / "golden")
                problems += refusals(programs, field, database, why)
    return problems


def dynamic_class(fields, of_class=()):
    """The description of a class with dynamic attributes of the resource, behind some of the class, each with the
    fields given. An empty text is stored at 8 in the strings, an array of it at 16."""
    own = 224 + 136 * len(of_class)
    end = own + 136 * len(fields)
    lists = end + 16 * (len(of_class) + len(fields))
    lines = [
        "include common.inc",
        "section class",
        f"rsrc_class_t:1 $CLASS u_rc_pattrsC=224 u_rc_dattrsC=224 u_rc_pattrs={own} u_rc_dattrs={own}",
        f"+ u_rc_actionsC={end} u_rc_actions={end} u_rc_variety_lists={end} u_rc_sd_defs={lists}",
        f"+ u_rc_valid_vals={lists} u_rc_strings={lists} rc_num_dattrsC={len(of_class)} rc_num_dattrs={len(fields)}",
        f"+ rc_varlist_size={lists - end}",
    ]
    marks = "8" * len(of_class) + "a" * len(fields)
    for i, given in enumerate([*of_class, *fields]):
        lines.append(f"rsrc_dattr_t:{marks[i]} $DATTR u_ra_name={32 + 8 * i} u_ra_variety_list={16 * i}")
        lines.append(f"+ ra_data_type=Int32 ra_max_value=Int32:100 {given}")
    lines += ["variety_list_t:g 0,1"] * len(marks) + ['string "C"', 'string ""', "array String 8"]
    return "\n".join([*lines, *(f'string "A{i}"' for i in range(len(marks))), "include tail.inc", ""])


def with_lists(ids, lists):
    """A database with a dynamic attribute for each ID, and a variable class for each list of IDs."""
    text = dynamic_class([f"ra_attr_id={number}" for number in ids])
    for i, numbers in enumerate(lists):
        text += f"section varclass\nrsrc_variable_class_t:4 rvc_var_count={len(numbers)} u_rvc_string_tbl=8"
        text += f' u_rvc_compat_name=none\nstring "V{i}"\nvar_ids {" ".join(map(str, numbers))}\n'
    return cdb_image.assemble(text, base_dir=TESTS / "golden")


def check_choices_that_never_end(programs):
    """Each ID is in two lists, and no choice completes the last list. The search ends nevertheless."""
    ids = [*range(1, 31), *range(1, 31), 40, 41]
    lists = [[number] for number in range(1, 31)] * 2 + [[41, 40]]
    why = "variable classes: their lists of IDs are not those that the dynamic attributes give"
    return refusals(programs, "choices", with_lists(ids, lists), why)


def check_too_many_lists(programs):
    """The compiler fills no more than 100 lists, so nothing is said about how more of them are filled."""
    why = "variable classes: their lists of IDs are not those that the dynamic attributes give"
    most = refusals(programs, "100", with_lists([5], [[5]] * 100), why)
    why = "database: its source would not compile: Too many variable classes with dynamic attributes (100 at most)"
    return most + refusals(programs, "101", with_lists([5], [[5]] * 101), why)


def check_too_many_mixtures(programs):
    """If there are many attributes of both kinds, not all orders of the two are tried; if there are few, they are."""
    problems = []
    astray = (
        "ra_data_type=StringArray ra_init_value=StringArray:16 ra_min_value=StringArray:5 ra_max_value=StringArray:6"
    )
    few, many = (
        cdb_image.assemble(dynamic_class([astray] + [""] * (count - 1), [""] * count), base_dir=TESTS / "golden")
        for count in (3, 200)
    )
    with tempfile.TemporaryDirectory() as name:
        result = programs.source(pathlib.Path(name), few)
    if (result.returncode, result.stdout.count(b"\tRange=5,6\n"), result.stderr) != (0, 1, b""):
        problems.append(f"few: {result}")
    why = "dynamic attributes: no combination of Range lines gives all of them their bounds"
    return problems + refusals(programs, "many", many, why)


@pytest.fixture
def programs():
    """The two programs."""
    return Programs()


def test_choices_that_never_end(programs):
    none(check_choices_that_never_end(programs))


def test_too_many_lists(programs):
    none(check_too_many_lists(programs))


def test_memory_for_too_many_lists(programs, directory):
    """Where each attribute could be in each list, memory does not grow with the product of both."""
    path = directory / DATABASE
    path.write_bytes(with_lists([5] * 4000, [[5]] * 4000))
    status, peak = peak_of(directory, [programs.cdef, "source", path])
    assert status == TROUBLE
    assert peak <= 8 * path.stat().st_size + 16 * MEGABYTES


def test_too_many_mixtures(programs):
    none(check_too_many_mixtures(programs))


def test_sections_that_are_not_made(programs):
    none(check_sections(programs))


def test_optional_fields_of_an_attribute_without_a_type(programs):
    none(check_optional_fields(programs))


def test_on_a_terminal(programs):
    none(check_terminal(programs))


def test_tolerated_errors_are_reported(programs):
    none(check_tolerated(programs))


@pytest.mark.slow(4)
@pytest.mark.parametrize("part", range(PARTS))
def test_all_golden_sources(programs, part):
    none(check_sources(programs, list(golden_sources())[part::PARTS]))


@pytest.mark.slow(4)
@pytest.mark.parametrize("part", range(PARTS))
def test_all_other_sources(programs, part):
    none(check_sources(programs, list(plain_sources())[part::PARTS]))


@pytest.mark.slow(2)
@pytest.mark.parametrize("group", range(GENERATED_GROUPS))
def test_generated_sources(programs, group):
    none(check_generated(programs, group))


# ---- Cases -----------------------------------------------------------------


def databases_of(programs, path):
    """A case's database in both byte orders."""
    if path.with_suffix(".image").exists():
        text = path.with_suffix(".image").read_text()
        return [cdb_image.assemble(text, order, base_dir=TESTS / "golden" / "image") for order in ("little", "big")]
    with tempfile.TemporaryDirectory() as name:
        text = path.with_suffix(".cdefsrc").read_bytes()
        return [programs.compile(pathlib.Path(name), text, "out.cdef", swap)[0] for swap in (False, True)]


@pytest.mark.parametrize("name", sorted(path.stem for path in CASES.glob("*.expect")))
def test_case(programs, name):
    """The source or the message, for both byte orders."""
    said = Expectation(CASES / f"{name}.expect", ("status",), ("stdout", "stderr"))
    expected = (int(said.get("status", "0")), said.octets("stdout"), said.octets("stderr"))
    for database in databases_of(programs, said.path):
        with tempfile.TemporaryDirectory() as place:
            result = programs.source(pathlib.Path(place), database)
        same((result.returncode, result.stdout, result.stderr), expected, "status, output, message")
