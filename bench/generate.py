#!/usr/bin/env python3
"""Write class definition sources of any size: the same numbers give the same bytes.

Every dimension of a source has an option of its own.  Numbers in the source
keep their width while a dimension grows, so that only the count changes.
"""

import argparse
import re
import sys
import typing

WORDS = ("BlockSize", "MountPoint", "Capacity", "FreeSpace", "OpState", "ReadRate", "Owner", "Threshold", "RetryLimit")
STRING_LENGTH = 24  # of generated texts, unless an option says otherwise
STRING_LENGTH_MAX = 239  # what a line leaves for a default value
LISTED_CLASSES_MAX = 100  # variable classes that attributes may name

HEAD = """\
ControlDefinition
\tFileVersion=1.0.0.0
ResourceClass
\tDescription=1
\tDisplayName=2
\tProperties=HasResources,CanDefine
\tClassPermTemplate=0
\tResourcePermTemplate=0
\tName={name}
"""
TAIL = """\
ClassToManagerMapping
\tResourceManager=Mgr1
\tFirstKey=1
\tLastKey=100
\tMessageCatalog=mgr1.cat
\tDescriptiveMessageSet=1
"""


class Definition(typing.NamedTuple):
    """One attribute, in terms that other compilers' inputs can hold too."""

    name: str
    description: int
    display: int
    number: int
    data_type: str
    varieties: tuple
    group: int
    group_name: int
    properties: tuple
    low: str
    high: str
    default: str


def scatter(index, limit):
    """A number below limit that looks random and is the same for the same index."""
    return (index * 2654435761 % (1 << 32)) * limit >> 32


def message(index):
    """A message number: five digits, 16 bits."""
    return 10000 + scatter(index, 50000)


def integers(index):
    """Low, high and default of an integer type, the default between the others."""
    return str(scatter(index, 90)), str(100000 + scatter(index, 900000)), str(100 + scatter(index + 7, 99900))


def floats(index):
    """The same of a floating point type."""
    low, high, default = integers(index)
    return low + ".25", high + ".5", default + ".125"


def texts(index):
    """The same of a string type, in alphabetical order."""
    return f"a{message(index)}", f"z{message(index + 1)}", f"text {message(index + 2)} of the default"


def binaries(index):
    """The same of the binary type, in the hexadecimal form."""
    return tuple(f"0x{message(index + i):08x}" for i in range(3))


VALUES = {
    "UInt32": integers, "Int32": integers, "String": texts, "UInt64": integers, "Float64": floats, "Int64": integers,
    "UInt32Array": integers, "Binary": binaries, "Float32": floats, "StringArray": texts, "Int64Array": integers,
}
TYPES = tuple(VALUES)


def definitions(count):
    """The attributes of a mixed source. The inputs of other compilers are made from the same definitions."""
    for index in range(count):
        data_type = TYPES[index % len(TYPES)]
        low, high, default = VALUES[data_type](index)
        yield Definition(
            name=f"{WORDS[index % len(WORDS)]}_{100000 + index}", description=message(index),
            display=message(index + 1), number=100000 + index, data_type=data_type,
            varieties=(1 + scatter(index, 9), 100 + scatter(index, 900)), group=100 + scatter(index, 100),
            group_name=message(index + 2), properties=("ReqdForDefine", "Public")[:1 + index % 2],
            low=low, high=high, default=default)


def required(definition, variable_type=""):
    """The required lines of all four attribute kinds; the dynamic ones have a variable type too."""
    return (f"\tName={definition.name}\n\tDescription={definition.description}\n"
            f"\tDisplayName={definition.display}\n\tId={definition.number}\n\tDataType={definition.data_type}\n"
            + variable_type +
            f"\tVarietyRange={definition.varieties[0]},{definition.varieties[1]}\n"
            f"\tGroupID={definition.group}\n\tGroupName={definition.group_name}\n")


def persistent(kind, definition):
    """A persistent attribute with a range of valid values and a default."""
    return (f"{kind}\n{required(definition)}\tProperties={','.join(definition.properties)}\n"
            f"\tValidValue={definition.low},{definition.high}\n\tValueDisplayName={definition.display}\n"
            f"\tDefaultValue={definition.default}\n")


def dynamic(kind, definition):
    """A dynamic attribute with a range and an initial value."""
    text = f"{kind}\n" + required(definition, "\tVariableType=Quantity\n")
    return text + (f"\tProperties={definition.properties[-1].replace('ReqdForDefine', 'QryReqsMonitoring')}\n"
                   f"\tRange={definition.low},{definition.high}\n\tInitialValue={definition.default}\n")


# Dynamic class attributes come first; otherwise their ranges would go to dynamic resource attributes that are open.
KINDS = (("DynamicClassAttribute", dynamic), ("DynamicResourceAttribute", dynamic),
         ("PersistentClassAttribute", persistent), ("PersistentResourceAttribute", persistent))


def attributes(count, _length):
    """Attributes of many types, a quarter of each kind."""
    for index, definition in enumerate(definitions(count)):
        kind, write = KINDS[index * len(KINDS) // count]
        yield write(kind, definition)


def actions(count, _length):
    """Actions of both kinds, alternating."""
    for index in range(count):
        yield (f"{('ResourceAction', 'ClassAction')[index % 2]}\n\tName=Action_{100000 + index}\n"
               f"\tDescription={message(index)}\n\tDisplayName={message(index + 1)}\n\tId={100000 + index}\n"
               f"\tVarietyRange=1,{100 + scatter(index, 900)}\n\tProperties=LongRun,Public\n"
               f"\tTimeOut={message(index)}\n\tPermission={'qlevdcsoax'[index % 10]}\n"
               f"\tConfirmationMsg={message(index + 2)}\n")


def elements(count, _length):
    """One run of structured data; element numbers are checked, so their width has to grow."""
    for index in range(count):
        yield (f"OnlineSDDefinition\n\tElementName=Element_{100000 + index}\n\tDescription={message(index)}\n"
               f"\tDisplayName={message(index + 1)}\n\tElementIndex={index}\n\tDataType=UInt32\n"
               f"\tValidValue={scatter(index, 90)},{message(index)}\n\tValueDisplayName={message(index + 2)}\n")


def listing(name, data_type, lines):
    """One persistent attribute with more lines; nothing if there are none."""
    first = next(lines, None)
    if first is None:
        return
    yield (f"PersistentResourceAttribute\n\tName={name}\n\tDescription=3\n\tDisplayName=4\n\tId=5\n"
           f"\tDataType={data_type}\n\tVarietyRange=1,9\n" + first)
    yield from lines


def valid_values(count, _length):
    """One attribute's list of valid values."""
    return listing("Listed", "UInt32", (f"\tValidValue={100000 + index},{200000 + index}\n"
                                        f"\tValueDisplayName={message(index)}\n" for index in range(count)))


def varieties(count, _length):
    """One attribute's list of varieties."""
    return listing("Varied", "UInt32", (f"\tVarietyRange={100000 + index},{200000 + index}\n"
                                        for index in range(count)))


def array_defaults(count, _length):
    """One attribute's array of default numbers."""
    return listing("Filled", "UInt32Array", (f"\tDefaultValue={100000 + index}\n" for index in range(count)))


def strings(count, length):
    """One attribute's array of default texts, each of a given length."""
    return listing("Told", "StringArray", (f"\tDefaultValue={str(100000 + index).ljust(length, '.')}\n"
                                           for index in range(count)))


def variable_classes(count, _length):
    """Variable classes, with an alias."""
    for index in range(count):
        yield (f"ResourceVariableClass\n\tVariableClass=Group_{100000 + index}\n"
               f"\tObservationInterval={message(index)}\n\tReportingInterval={message(index + 1)}\n"
               f"\tAlias=Alias_{100000 + index}\n")


def members(count, classes):
    """Dynamic attributes that name the last variable classes in turn."""
    for index, definition in enumerate(definitions(count)):
        group = 100000 + classes - 1 - index % min(classes, LISTED_CLASSES_MAX)
        yield dynamic("DynamicResourceAttribute", definition) + f"\tVariableClass=Group_{group}\n"


# In the order of the source: varieties come with a stanza's required lines, so each list has a stanza of its own.
DIMENSIONS = {
    "attributes": attributes, "actions": actions, "elements": elements, "valid_values": valid_values,
    "varieties": varieties, "array_defaults": array_defaults, "strings": strings, "variable_classes": variable_classes,
}


def commented(pieces):
    """The same definitions as people write them: a comment in front of each, texts in quotes, notes behind values."""
    for piece in pieces:
        name = re.search(r"\tName=(.*)\n", piece)
        piece = re.sub(r"\t(Name|Properties)=(.*)\n", r'\t\1="\2"\n', piece)
        piece = re.sub(r"\t(DataType|GroupID)=(.*)\n", r"\t\1=\2  # as agreed\n", piece)
        yield (f"\n// {name[1]}, see \"Attributes\" in the catalogue\n" if name else "") + piece


def large_source(classes, each):
    """Classes with so many mixed attributes each."""
    for index in range(classes):
        yield HEAD.format(name=f"Class_{100000 + index}")
        yield from attributes(each, None)
    yield TAIL


def source(classes=1, members_count=0, string_length=STRING_LENGTH, **counts):
    """The parts of a source. Everything except the heads of the classes belongs to the last class."""
    for index in range(classes):
        yield HEAD.format(name=f"Class_{100000 + index}")
    for name, write in DIMENSIONS.items():
        yield from write(counts.get(name, 0), string_length)
    if members_count:
        yield from members(members_count, counts["variable_classes"])
    yield TAIL


def number(text):
    """Parses a count from the command line."""
    value = int(text)
    if value < 0:
        raise argparse.ArgumentTypeError("must not be negative")
    return value


def parse():
    """Parses the command line."""
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    for name in DIMENSIONS:
        parser.add_argument(f"--{name.replace('_', '-')}", type=number, default=0, metavar="N")
    parser.add_argument("--members", dest="members_count", type=number, default=0, metavar="N",
                        help="dynamic attributes that name variable classes")
    parser.add_argument("--classes", type=number, default=1, metavar="N", help="at least 1")
    parser.add_argument("--comments", action="store_true", help="comments and quotes in all definitions")
    parser.add_argument("--string-length", type=number, default=STRING_LENGTH, metavar="N",
                        help=f"of the texts that --strings makes: 6 to {STRING_LENGTH_MAX}")
    options = parser.parse_args()
    if options.classes < 1 or not 6 <= options.string_length <= STRING_LENGTH_MAX:
        parser.error("no class, or strings too short or too long for a line")
    if options.members_count and not options.variable_classes:
        parser.error("--members needs --variable-classes")
    return options


if __name__ == "__main__":
    wanted = vars(parse())
    with_comments = wanted.pop("comments")
    sys.stdout.writelines(commented(source(**wanted)) if with_comments else source(**wanted))
