"""Test limits: the highest number that is allowed, and what happens one beyond it. Every test is a function below, or a
row of a table, named for the limit.

Every test is a function below, or a row of a table, named for the limit.
"""

import struct
import sys

import pytest

from cases import HEAD, LINE, OUT, SOURCE, attributes, check, expect

MARK = "<" if sys.byteorder == "little" else ">"
COUNT_MAX = 65535
GROUPS_MAX = 100
LARGE = 100 << 20
CLASS = 5  # a section's type
VARIABLE_CLASS = 4
TURNED = "turned.cdef"
NONE = "none.cdef"  # what never comes to be
ROWS = {}  # tests that tables give, by name

class Image:
    """The parts of a database that the cases need."""

    def __init__(self, contents):
        self.contents = contents
        self.sections = [self.get(80 + 16 * i, "3I") for i in range(self.get(24, "I")[0])]

    def get(self, at, form):
        """Numbers at an offset of the file."""
        return struct.unpack_from(MARK + form, self.contents, at)

    def of_type(self, kind):
        """The starts of the sections of a type."""
        return [at for found, at, _ in self.sections if found == kind]

    def in_class(self, at, form):
        """Numbers in the class record."""
        return self.get(self.of_type(CLASS)[0] + at, form)

    def in_table(self, field, at, form):
        """Numbers in the table that a field of the class record refers to."""
        return self.in_class(self.in_class(field, "I")[0] + at, form)


# Fields of the class record that lead to tables, and of its counts.
PATTRS_C, DATTRS_C, PATTRS, DATTRS, ACTIONS_C, ACTIONS = 24, 32, 40, 48, 96, 104
VARIETIES, SD_DEFS, VALID_VALUES, STRINGS = 128, 144, 152, 160
COUNTS = 168  # persistent and dynamic class attributes, the resource's, class and resource actions


def compiled(world, source):
    """The database of a source that must compile without output and be sound in both byte orders."""
    world.write(SOURCE, source)
    expect(world.run("-s", SOURCE, TURNED), 0)
    expect(world.run(), 0)
    world.verified(TURNED)
    world.verified()
    image = world.read()
    check(len(world.read(TURNED)) == len(image), "another size with -s")
    check(struct.unpack_from(MARK + "I", image, 0)[0] == len(image) - 4, "the size is not the header's")
    return Image(image)


def refused(world, source, message):
    """Checks that the source is refused with the message, that no output is created, and that an existing one is
    unchanged."""
    world.write(OUT, world.good(HEAD))
    world.write(SOURCE, source)
    with world.left_alone():
        expect(world.run(), 1, message)
    expect(world.run(SOURCE, NONE), 1, message)
    check(not world.path(NONE).exists(), "there is an output")


def named(name, function):
    """Registers a row of a table as a test."""
    check(name not in ROWS, "two rows are called", name)
    ROWS[name] = function


# ---- Records of a kind -------------------------------------------------------

REQUIRED = "\tName=n\n\tDescription=1\n\tDisplayName=2\n\tId=%d\n"
VARIETY = "\tVarietyRange=1,1\n"
KINDS = {
    "PersistentClassAttribute": ("ClassPattrsC", 0, REQUIRED + "\tDataType=Int32\n" + VARIETY),
    "DynamicClassAttribute": ("ClassDattrsC", 1, REQUIRED + "\tDataType=Int32\n\tVariableType=State\n" + VARIETY),
    "PersistentResourceAttribute": ("ClassPattrs", 2, REQUIRED + "\tDataType=Int32\n" + VARIETY),
    "DynamicResourceAttribute": ("ClassDattrs", 3, REQUIRED + "\tDataType=Int32\n\tVariableType=State\n" + VARIETY),
    "ClassAction": ("ClassActionsC", 4, REQUIRED + VARIETY),
    "ResourceAction": ("ClassActions", 5, REQUIRED + VARIETY),
}


def records(kind, count):
    """A source with this many records of a kind."""
    body = kind + "\n" + KINDS[kind][2]
    return HEAD + "".join(body % i for i in range(count)).encode()


def most_records(kind):
    """65,535 records of a kind are allowed."""

    def function(world):
        expected = [0] * 6
        expected[KINDS[kind][1]] = COUNT_MAX
        counts = compiled(world, records(kind, COUNT_MAX)).in_class(COUNTS, "6H")
        check(list(counts) == expected, "counts", counts)

    return function


def too_many_records(kind):
    """65,536 of a kind are refused."""
    message = f"Too many records of one kind in a class (65535 at most): {KINDS[kind][0]}\n".encode()
    return lambda world: refused(world, records(kind, COUNT_MAX + 1), message)


for a_kind in KINDS:
    named(f"records-65535-{a_kind}", most_records(a_kind))
    named(f"records-65536-{a_kind}", too_many_records(a_kind))


# ---- Lists, which have no such limit ------------------------------------------

ONE = b"PersistentResourceAttribute\n" + REQUIRED.encode() % 1 + b"\tDataType=%s\n" + VARIETY.encode()


def test_varieties_65537_in_a_list(world):
    """Their number has 32 bits."""
    lines = b"".join(b"\tVarietyRange=%d,%d\n" % (i, i) for i in range(2, COUNT_MAX + 3))
    image = compiled(world, HEAD + ONE % b"Int32" + lines)
    check(image.in_table(VARIETIES, 4, "3I") == (COUNT_MAX + 2, 1, 1), image.in_table(VARIETIES, 4, "3I"))
    last = image.in_table(VARIETIES, 8 + 8 * (COUNT_MAX + 1), "2I")
    check(last == (COUNT_MAX + 2, COUNT_MAX + 2), last)


def test_valid_values_65537_in_a_list(world):
    """Their number has 32 bits."""
    lines = b"".join(b"\tValidValue=%d\n" % i for i in range(COUNT_MAX + 2))
    image = compiled(world, HEAD + ONE % b"UInt64" + lines)
    check(image.in_table(VALID_VALUES, 4, "I") == (COUNT_MAX + 2,), image.in_table(VALID_VALUES, 4, "I"))
    last = image.in_table(VALID_VALUES, 8 + 24 * (COUNT_MAX + 1), "2Q")
    check(last == (COUNT_MAX + 1, COUNT_MAX + 1), last)


def test_elements_65537_in_an_array(world):
    """Their number has 32 bits, in front of the elements."""
    lines = b"".join(b"\tDefaultValue=%d\n" % i for i in range(COUNT_MAX + 2))
    image = compiled(world, HEAD + ONE % b"UInt32Array" + lines)
    place = image.in_table(PATTRS, 24, "I")[0]
    check(image.in_table(STRINGS, place, "I") == (COUNT_MAX + 2,), image.in_table(STRINGS, place, "I"))
    check(image.in_table(STRINGS, place + 8 + 8 * (COUNT_MAX + 1), "I") == (COUNT_MAX + 1,), "the last element")


def test_elements_65537_in_a_structure(world):
    """Their number has 32 bits; the attribute has the low 16 bits of the highest index."""
    element = "PAttrSDDefinition\n\tElementName=e\n\tDescription=1\n\tDisplayName=2\n\tElementIndex=%d\n\tDataType=UInt32\n"
    run = "".join(element % i for i in range(COUNT_MAX + 2)).encode()
    image = compiled(world, HEAD + ONE % b"SD" + run + HEAD[HEAD.index(b"ResourceClass") : HEAD.index(b"ClassTo")])
    check(image.in_table(SD_DEFS, 4, "I") == (COUNT_MAX + 2,), image.in_table(SD_DEFS, 4, "I"))
    check(image.in_table(PATTRS, 64, "H") == (0,), "highest index", image.in_table(PATTRS, 64, "H"))
    place = image.in_table(PATTRS, 24, "I")[0]
    check(image.in_table(STRINGS, place, "I") == (COUNT_MAX + 2,), image.in_table(STRINGS, place, "I"))


def test_classes_1000_in_a_file(world):
    """Each is a section of its own."""
    image = compiled(world, b"ControlDefinition\n\tFileVersion=1\n" * 999 + HEAD)
    check(len(image.of_type(CLASS)) == 1000, len(image.of_type(CLASS)))


# ---- Variable classes ----------------------------------------------------------


def groups(count, with_ids):
    """A source with so many variable classes, of which so many get IDs."""
    group = "ResourceVariableClass\n\tVariableClass=group%d\n\tObservationInterval=1\n\tReportingInterval=2\n"
    member = "DynamicResourceAttribute\n" + KINDS["DynamicResourceAttribute"][2] + "\tVariableClass=group%d\n"
    text = "".join(group % i for i in range(count)) + "".join(member % (i + 7, i) for i in range(with_ids))
    return HEAD + text.encode()


def ids_of(image):
    """The variable IDs of each variable class."""
    for at in image.of_type(VARIABLE_CLASS):
        count, strings = image.get(at + 24, "2I")
        yield image.get(at + 40 + strings, f"{count}I")


def test_variable_classes_100_with_ids(world):
    """The highest number of variable classes with IDs."""
    found = list(ids_of(compiled(world, groups(GROUPS_MAX, GROUPS_MAX))))
    check(found == [(i + 7,) for i in range(GROUPS_MAX)], found)


def test_variable_classes_101_with_ids(world):
    """One more than allowed."""
    message = b"Too many variable classes with dynamic attributes (100 at most)\n"
    refused(world, groups(GROUPS_MAX + 1, GROUPS_MAX + 1), message)


def test_variable_classes_1000_of_which_100_have_ids(world):
    """Variable classes without IDs are not limited."""
    found = list(ids_of(compiled(world, groups(1000, GROUPS_MAX))))
    check(found == [(i + 7,) for i in range(GROUPS_MAX)] + [()] * 900, found)


# ---- Values --------------------------------------------------------------------

# Type, text, and how its cell is read and what it then is; None: the text is refused.
VALUES = (
    ("Int32", "2147483647", "i", 2147483647),
    ("Int32", "-2147483648", "i", -2147483648),
    ("Int32", "2147483648", "i", -2147483648),
    ("Int32", "4294967297", "i", 1),
    ("UInt32", "4294967295", "I", 4294967295),
    ("UInt32", "4294967296", "I", 0),
    ("UInt32", "-1", "I", 4294967295),
    ("Int64", "9223372036854775807", "q", 9223372036854775807),
    ("Int64", "-9223372036854775808", "q", -9223372036854775808),
    ("Int64", "9223372036854775808", "q", None),
    ("Int64", "-9223372036854775809", "q", None),
    ("UInt64", "18446744073709551615", "Q", 18446744073709551615),
    ("UInt64", "-1", "Q", 18446744073709551615),
    ("UInt64", "18446744073709551616", "Q", None),
    ("Float32", "3.40282346638528859811704183484516925440e+38", "I", 0x7F7FFFFF),
    ("Float32", "3.4028236e38", "I", None),
    ("Float32", "-1e39", "I", 0xFF800000),
    ("Float32", "1.17549435e-38", "I", 0x00800000),
    ("Float32", "0x1p-149", "I", 0x00000001),
    ("Float32", "1e-46", "I", None),
    ("Float32", "inf", "I", 0x7F800000),
    ("Float64", "1.7976931348623157e308", "Q", 0x7FEFFFFFFFFFFFFF),
    ("Float64", "1e309", "Q", None),
    ("Float64", "-1e309", "Q", 0xFFF0000000000000),
    ("Float64", "2.2250738585072014e-308", "Q", 0x0010000000000000),
    ("Float64", "0x1p-1074", "Q", 0x0000000000000001),
    ("Float64", "1e-325", "Q", None),
    ("Float64", "-infinity", "Q", 0xFFF0000000000000),
)


def value(data_type, text, form, expected):
    """A default value at a limit of its type, and its cell."""
    source = HEAD + ONE % data_type.encode() + f"\tDefaultValue={text}\n".encode()
    if expected is None:
        return lambda world: refused(world, source, b"%d: str_to_vx: Invalid data\n" % source.count(b"\n"))

    def function(world):
        found = compiled(world, source).in_table(PATTRS, 24, form)[0]
        check(found == expected, "the cell is", found)

    return function


for a_row in VALUES:
    named(f"value-{a_row[0]}-{a_row[1]}", value(*a_row))

# Text of an Id and of a message number, and what is stored.
NUMBERS = (
    ("65535", 65535, 65535),
    ("65536", 65536, 0),
    ("0xFFFFFFFF", 0xFFFFFFFF, 0xFFFF),
    ("037777777777", 0xFFFFFFFF, 0xFFFF),
    ("4294967296", 0, 0),
    ("-1", 0xFFFFFFFF, 0xFFFF),
    ("-2147483648", 0x80000000, 0),
    ("9223372036854775807", 0xFFFFFFFF, 0xFFFF),
)


def number(text, full, half):
    """A plain number in a field of 32 bits and in one of 16."""

    def function(world):
        source = HEAD + ONE.replace(b"Id=1\n", b"Id=%s\n" % text) % b"Int32" + b"\tGroupID=%s\n" % text
        image = compiled(world, source)
        found = image.in_table(PATTRS, 32, "I") + image.in_table(PATTRS, 22, "H")
        check(found == (full, half), "stored", found)

    return function


for a_row in NUMBERS:
    named(f"number-{a_row[0]}", number(a_row[0].encode(), *a_row[1:]))


# ---- Lines ---------------------------------------------------------------------


def with_name(length, after=b""):
    """A source with a line of so many characters that names an attribute, and that name."""
    name = b"N" * (length - len("\tName="))
    return HEAD + ONE.replace(b"Name=n", b"Name=" + name + after) % b"Int32", name


def stored_name(image):
    """The name of the first attribute."""
    at = image.of_type(CLASS)[0] + image.in_class(STRINGS, "I")[0] + image.in_table(PATTRS, 8, "I")[0]
    return image.contents[at : image.contents.index(b"\0", at)]


def test_line_of_253_characters(world):
    """It is read in one piece."""
    source, name = with_name(LINE)
    check(stored_name(compiled(world, source)) == name, "another name")
    refused(world, source + b"X\n", b"%d: Invalid table name: X\n" % (source.count(b"\n") + 1))


def test_line_of_254_characters(world):
    """Its newline is read as a line of its own."""
    source, name = with_name(LINE + 1)
    check(stored_name(compiled(world, source)) == name, "another name")
    refused(world, source + b"X\n", b"%d: Invalid table name: X\n" % (source.count(b"\n") + 2))


def test_line_of_255_characters(world):
    """Its last character is read as a header."""
    refused(world, with_name(LINE + 2)[0], b"18: Invalid table name: N\n")


def test_line_of_256_characters(world):
    """Its last two characters are read as a header."""
    refused(world, with_name(LINE + 3)[0], b"18: Invalid table name: NN\n")


def test_line_whose_rest_is_an_attribute(world):
    """The rest begins with a blank."""
    source, name = with_name(LINE + 1, b" Description=9")
    source = source.replace(b"\tDescription=1\n\tDisplayName=2\n\tId", b"\tDisplayName=2\n\tId")
    image = compiled(world, source)
    check(stored_name(image) == name and image.in_table(PATTRS, 16, "H") == (9,), "another attribute")


def test_header_of_254_characters(world):
    """It ends with blanks, which are ignored."""
    header = b"ClassToManagerMapping"
    compiled(world, HEAD.replace(header, header.ljust(LINE + 1)))


def test_no_final_newline(world):
    """The last line is read too."""
    image = compiled(world, HEAD).contents
    check(compiled(world, HEAD[:-1]).contents == image, "another database")


def test_empty_file(world):
    """A source without a class is refused."""
    refused(world, b"", b"No classes defined\n")


def test_one_newline(world):
    """It is an empty source."""
    refused(world, b"\n", b"No classes defined\n")


def test_only_nuls(world):
    """Each line ends at its first NUL, so it is empty."""
    for count in (1, LINE + 1, LINE + 2, 100000):
        refused(world, bytes(count), b"No classes defined\n")


def test_carriage_returns(world):
    """They belong to the text."""
    refused(world, HEAD.replace(b"\n", b"\r\n"), b"1: Invalid table name: ControlDefinition\r\n")


# ---- Size ----------------------------------------------------------------------


def filled(line):
    """As many copies of a line as fill 100 MB."""
    return line * (LARGE // len(line))


def test_large_of_comments(world):
    """100 MB of comments have no effect."""
    good = compiled(world, HEAD).contents
    check(compiled(world, filled(b"# nothing of interest\n") + HEAD).contents == good, "another database")


def test_large_of_newlines(world):
    """The line number is correct after 100 MB."""
    refused(world, b"\n" * LARGE + b"X", b"%d: Invalid table name: X\n" % (LARGE + 1))


def test_large_of_one_line(world):
    """A comment of 100 MB, whose second piece is read as a header."""
    refused(world, b"#" + b"x" * LARGE, b"2: Invalid table name: %s\n" % (b"x" * (LINE + 1)))


def test_large_of_blanks(world):
    """A line of 100 MB that contains only blanks."""
    refused(world, b" " * LARGE, b"No classes defined\n")


def test_large_of_nuls(world):
    """100 MB of NULs, like a file that was never written."""
    refused(world, bytes(LARGE), b"No classes defined\n")


def test_large_of_values(world):
    """100 MB of valid values of one attribute, all of them stored."""
    line = b"\tValidValue=1000000000000000000,2000000000000000000\n"
    image = compiled(world, HEAD + ONE % b"UInt64" + filled(line))
    check(image.in_table(VALID_VALUES, 4, "I") == (LARGE // len(line),), image.in_table(VALID_VALUES, 4, "I"))


def test_large_of_attributes(world):
    """The highest number of attributes, with long texts."""
    source = HEAD + attributes(COUNT_MAX).replace(b"The default", b"The default" + b"t" * 150)
    check(compiled(world, source).in_class(COUNTS, "6H") == (0, 0, COUNT_MAX, 0, 0, 0), "counts")


@pytest.mark.parametrize("row", ROWS)
def test_row(row, world):
    """A row of a table above."""
    ROWS[row](world)
