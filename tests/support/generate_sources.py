"""Random sources that are correct, and mutations of them, most of which are not.

source(seed) is a source that compiles, together with the expected contents of its database. The sources contain
every stanza kind, attribute, data type, property and permission letter. mutation(seed, text) is a text with a few
random changes. Both follow from the seed alone.

Run as a program, it writes sources: generate_sources.py DIRECTORY COUNT [SEED].
"""

import dataclasses
import pathlib
import random
import sys

STANZAS = (
    "ControlDefinition", "ResourceClass", "ClassToManagerMapping", "ResourceVariableClass",
    "PersistentResourceAttribute", "PersistentClassAttribute", "DynamicResourceAttribute", "DynamicClassAttribute",
    "ClassAction", "ResourceAction", "PAttrSDDefinition", "DAttrSDDefinition", "DefineSDDefinition",
    "UndefineSDDefinition", "OnlineSDDefinition", "OfflineSDDefinition", "ResetSDDefinition",
    "ActionInSDDefinition", "ActionOutSDDefinition",
)
INPUTS = STANZAS[12:17]
# Each data type's code.
TYPES = {
    "None": 1, "Int32": 2, "UInt32": 3, "Int64": 4, "UInt64": 5, "Float32": 6, "Float64": 7, "String": 8, "Binary": 9,
    "RH": 10, "SD": 11, "Int32Array": 13, "UInt32Array": 14, "Int64Array": 15, "UInt64Array": 16, "Float32Array": 17,
    "Float64Array": 18, "StringArray": 19, "BinaryArray": 20, "RHArray": 21, "SDArray": 22,
}
STRUCTURED = ("SD", "SDArray")
ELEMENT_TYPES = tuple(name for name in TYPES if name not in STRUCTURED)
INPUT_TYPES = (*ELEMENT_TYPES, "SBS")  # of inputs and responses
WITHOUT_TEXT = ("None", "RH", "RHArray", "SBS", *STRUCTURED)
VARIABLES = ("Counter", "Quantity", "State", "Quantum")
CLASS_PROPERTIES = (
    "HasIWAccess", "HasResources", "CanControl", "CanDefine", "JoinPhase0", "JoinPhase1", "HasConstraints",
    "ORBElectCoord", "SupportsMove", "CanBatchDefine", "CanBatchUndefine", "CanBatchSetAttr", "MtypDivided",
    "MtypCentral", "MtypGlobal", "QryReqsMonitoring", "CanLiveUpdate",
)
PERSISTENT_PROPERTIES = ("ReadOnly", "ReqdForDefine", "InvalForDefine", "OptForDefine", "Select", "Public")
DYNAMIC_PROPERTIES = ("Public", "QryReqsMonitoring")
ACTION_PROPERTIES = ("LongRun", "Public")
PERMISSIONS = "qlevdcsoax"

INTEGERS = {
    "Int32": (-(2**31), 2**31 - 1),
    "UInt32": (0, 2**32 - 1),
    "Int64": (-(2**63), 2**63 - 1),
    "UInt64": (0, 2**64 - 1),
}
# None of them overflows or loses digits, which would leave its mark on what follows.
FLOATS = ("0", "-0.0", "1", "100", "-2.5", "0.1", "1e30", "0x1.8p3", "inf", "-infinity", "nan", "+3.25e-7")
# The first character of a text may be none that a header or a value could take for its own.
LETTERS = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789"
INNER = LETTERS + "   ..__--::;;()[]$%&'*+!?@^~|<>=\x01\x7f\xe4\xff\t"
QUOTED = INNER + "###"  # only inside quotes
LINE = 253


@dataclasses.dataclass
class Truth:
    """The expected contents of a source's database."""

    name: bytes = None  # None: the output file's
    version: int = 0
    # Of each kind of record in each class: name, ID and, of attributes, the type's code.
    records: dict = dataclasses.field(default_factory=lambda: {kind: [] for kind in STANZAS[4:10]})
    groups: list = dataclasses.field(default_factory=list)  # names of the variable classes
    manager: bytes = b""
    catalog: bytes = b""


class Writer:
    """Writes one source."""

    def __init__(self, seed):
        self.random = random.Random(seed)
        self.lines = []
        self.truth = Truth()
        self.input_before = None

    # -- choices --

    def chance(self, probability):
        """True with this probability."""
        return self.random.random() < probability

    def some(self, choices):
        """One or more of several words, separated by commas."""
        return ",".join(self.random.sample(choices, self.random.randint(1, len(choices))))

    def characters(self, alphabet, least, most):
        """A text of characters from that alphabet."""
        return "".join(self.random.choices(alphabet, k=self.random.randint(least, most)))

    def text(self):
        """A text that begins and ends with a letter or digit."""
        if self.chance(0.7):
            return self.characters(LETTERS, 1, 12)
        most = self.random.choice((3, 8, 200))
        return self.characters(LETTERS, 1, 1) + self.characters(INNER, 0, most) + self.characters(LETTERS, 1, 1)

    def number16(self):
        """A number of 16 bits, in any base."""
        number = self.random.choice((0, 1, 255, 65535, self.random.randint(0, 65535)))
        return self.random.choice((str(number), hex(number), f"0{number:o}"))

    # -- lines --

    def raw(self, text):
        """A line, sometimes with a comment or an empty line before it."""
        if self.chance(0.04):
            self.lines.append(self.random.choice(("", "# comment", "\t// comment", "  /* comment */", ' "" \t', "#")))
        self.lines.append(text)

    def header(self, kind):
        """A stanza's header."""
        self.raw(kind + self.random.choice(("", "", "", " ", "\t# comment", " // comment")))

    def attribute(self, name, value, quotable=True):
        """An attribute line, sometimes with quotes, which do not change the value."""
        indent = self.random.choice(("\t", "\t", " ", "    ", " \t "))
        comment = self.random.choice((" # comment", "\t// comment", " /* comment")) if self.chance(0.05) else ""
        if quotable and self.chance(0.1):
            value = f'"{value}"'
        elif value != value.strip(" \t"):
            value = f'"{value}"'
        line = f"{indent}{name}={value}"
        self.raw(line if len(line) + len(comment) > LINE else line + comment)

    def text_attribute(self, name, text=None):
        """An attribute line with a text; returns the text."""
        text = self.text() if text is None else text
        self.attribute(name, text)
        return text.encode("latin-1")

    def shuffled(self, *writers):
        """Calls functions in any order."""
        writers = list(writers)
        self.random.shuffle(writers)
        for writer in writers:
            writer()

    def required(self, kind, record, *more):
        """The attributes that all records of a class require, and those that the kind requires, in any order."""

        def name():
            record["name"] = self.text_attribute("Name")

        def identifier():
            number = self.random.choice((0, 1, 7, 32767, 65535, 2**31 - 1, self.random.randint(0, 2**31 - 1)))
            record["id"] = number
            self.attribute("Id", self.random.choice((str(number), hex(number))))

        self.truth.records[kind].append(record)
        messages = [lambda n=n: self.attribute(n, self.number16()) for n in ("Description", "DisplayName")]
        self.shuffled(name, identifier, self.variety, *messages, *more)

    def variety(self):
        """A line of varieties."""
        low, high = sorted((self.random.randint(0, 9), self.random.choice((9, 10, 2**32 - 1))))
        self.attribute("VarietyRange", f"{low},{high}")

    # -- values --

    def value(self, data_type, separable=False):
        """The text of a value of a type, or of an array's element. separable: the text must not contain a comma."""
        element = data_type.removesuffix("Array")
        if element in INTEGERS:
            low, high = INTEGERS[element]
            return str(self.random.choice((low, high, 0, 1, self.random.randint(low, high))))
        if element in ("Float32", "Float64"):
            return self.random.choice(FLOATS)
        if element == "String":
            return self.text().replace(",", ".") if separable else self.text()
        if self.chance(0.15):
            return self.random.choice(("text", "te\\101xt", "\\7\\\\text", "\\377\\0\\12x"))
        return "0x" + self.random.randbytes(self.random.choice((0, 1, 7, 8, 9, 40))).hex()

    def values(self, name, data_type):
        """Values or ranges that are valid, with or without message numbers."""
        for _ in range(self.random.choice((1, 1, 2, 5))):
            low = self.value(data_type, True)
            both = len(low) < 100 and self.chance(0.5)
            self.attribute(name, f"{low},{self.value(data_type, True)[:100]}" if both else low)
            for _ in range(self.random.choice((0, 0, 1, 2))):
                self.attribute("ValueDisplayName", self.number16())

    def optional(self, *writers):
        """Some of these lines, in any order, with varieties between them."""
        self.shuffled(*(writer for writer in (*writers, self.variety) if self.chance(0.4)))

    def number_of(self, name):
        """Writes a message number, or another number of 16 bits."""
        return lambda: self.attribute(name, self.number16())

    # -- attributes --

    def data_type(self, record, name):
        """Writes the data type."""

        def line():
            record["type"] = TYPES[name]
            self.attribute("DataType", name)

        return line

    def of_any_attribute(self):
        """The optional lines of both kinds of attributes, except for values."""
        return [
            self.number_of("GroupID"),
            self.number_of("GroupName"),
            lambda: self.attribute("ListActionRsrc", self.text()),
            lambda: self.attribute("ListActionClass", self.text()),
        ]

    def persistent(self, kind):
        """A persistent attribute, and the run of elements of a structured one."""
        name = self.random.choice(list(TYPES))
        record = {}
        self.header(kind)
        self.required(kind, record, self.data_type(record, name))
        more = [lambda: self.attribute("Properties", self.some(PERSISTENT_PROPERTIES))]
        if name not in WITHOUT_TEXT:
            more.append(lambda: self.values("ValidValue", name))
            more.append(lambda: self.defaults(name))
        self.optional(*self.of_any_attribute(), *more)
        self.structure("PAttrSDDefinition", name)

    def defaults(self, data_type):
        """Default values: the elements of an array, or one or more values of which the last one is used."""
        for _ in range(self.random.choice((1, 1, 3))):
            self.attribute("DefaultValue", self.value(data_type))

    def dynamic(self, kind):
        """A dynamic attribute, and the run of elements of a structured one."""
        name = self.random.choice(list(TYPES))
        record = {}
        self.header(kind)
        variable = lambda: self.attribute("VariableType", self.random.choice(VARIABLES))
        self.required(kind, record, self.data_type(record, name), variable)
        more = [
            lambda: self.attribute("Properties", self.some(DYNAMIC_PROPERTIES)),
            lambda: self.attribute("VariableClass", self.random.choice(("Fast", "Slow", "Unknown"))),
            lambda: self.text_attribute("Expression"),
            lambda: self.text_attribute("ReArmExpression"),
            self.number_of("ExpressionDescription"),
            self.number_of("ReArmDescription"),
        ]
        if name not in WITHOUT_TEXT:
            more.append(lambda: self.attribute("InitialValue", self.value(name)))
            more.append(lambda: self.values("ValidStateValue", name))
        if name != "None":
            more.append(lambda: self.range(name))
        self.optional(*self.of_any_attribute(), *more)
        self.structure("DAttrSDDefinition", name)

    def range(self, data_type):
        """A range, which is ignored for types that are not numbers."""
        numeric = data_type.removesuffix("Array") in (*INTEGERS, "Float32", "Float64")
        self.attribute("Range", ",".join(self.value(data_type) if numeric else str(i) for i in (1, 2)))

    # -- structured data --

    def run(self, kind, bare=False, types=ELEMENT_TYPES):
        """A run of elements. bare: without optional attributes."""
        for index in range(self.random.choice((1, 1, 2, 4))):
            name = self.random.choice(types)
            self.header(kind)
            self.shuffled(
                lambda: self.text_attribute("ElementName"),
                self.number_of("Description"),
                self.number_of("DisplayName"),
                lambda index=index: self.attribute("ElementIndex", str(index)),
                lambda name=name: self.attribute("DataType", name),
            )
            if not bare and name not in WITHOUT_TEXT and self.chance(0.4):
                self.values("ValidValue", name)

    def structure(self, kind, data_type):
        """The elements of a structured attribute, which may have none."""
        if data_type in STRUCTURED and self.chance(0.9):
            self.run(kind)

    def class_input(self):
        """One of the class's inputs, but not the previous one, whose run would continue."""
        kind = self.random.choice([kind for kind in INPUTS if kind != self.input_before])
        self.run(kind, types=INPUT_TYPES)
        self.input_before = kind

    # -- actions and groups --

    def action(self, kind):
        """An action with or without input and response."""
        self.header(kind)
        self.required(kind, {})
        self.optional(
            lambda: self.attribute("Properties", self.some(ACTION_PROPERTIES)),
            lambda: self.attribute("Permission", self.random.choice(PERMISSIONS)),
            self.number_of("ConfirmationMsg"),
            self.number_of("TimeOut"),
        )
        if self.chance(0.5):
            self.run("ActionInSDDefinition", types=INPUT_TYPES)
        if self.chance(0.5):
            self.run("ActionOutSDDefinition", bare=True, types=INPUT_TYPES)

    def group(self):
        """A variable class."""
        name = self.random.choice(("Fast", "Slow", "Fast", self.text()))
        self.truth.groups.append(name.encode("latin-1"))
        self.header("ResourceVariableClass")
        self.shuffled(
            lambda: self.text_attribute("VariableClass", name),
            self.number_of("ObservationInterval"),
            self.number_of("ReportingInterval"),
        )
        if self.chance(0.4):
            self.text_attribute("Alias")

    # -- the whole --

    def control(self):
        """The first stanza."""
        parts = [self.random.randint(0, 255) for _ in range(self.random.randint(1, 4))]
        self.truth.version = int.from_bytes(bytes((*parts, 0, 0, 0)[:4]), "big")
        self.header("ControlDefinition")
        self.attribute("FileVersion", ".".join(map(str, parts)))

    def resource_class(self):
        """The class's own stanza."""
        self.header("ResourceClass")
        self.shuffled(
            self.number_of("Description"),
            self.number_of("DisplayName"),
            lambda: self.attribute("Properties", self.some(CLASS_PROPERTIES)),
            lambda: self.attribute("ClassPermTemplate", self.text()),
            lambda: self.attribute("ResourcePermTemplate", self.text()),
        )
        if self.chance(0.7):
            self.truth.name = self.text_attribute("Name")
        if self.chance(0.4):
            names = [record["name"] for record in self.truth.records["PersistentResourceAttribute"]]
            known = self.random.choice(names).decode("latin-1") if names else "nothing"
            self.attribute("Locator", known)

    def mapping(self):
        """The one map."""
        first, last = sorted((self.random.randint(0, 65535), self.random.randint(0, 65535)))

        def manager():
            self.truth.manager = self.text_attribute("ResourceManager")

        def catalog():
            self.truth.catalog = self.text_attribute("MessageCatalog")

        self.header("ClassToManagerMapping")
        keys = lambda: (self.attribute("FirstKey", str(first)), self.attribute("LastKey", str(last)))
        self.shuffled(manager, catalog, keys, self.number_of("DescriptiveMessageSet"))

    def body(self):
        """One stanza, with what belongs to it."""
        level = self.random.choice(("Resource", "Class"))
        self.random.choices(
            (lambda: self.persistent(f"Persistent{level}Attribute"), lambda: self.dynamic(f"Dynamic{level}Attribute"),
             lambda: self.action(f"{level}Action"), self.group, self.class_input),
            (4, 4, 2, 1, 1),
        )[0]()

    def whole(self):
        """The source and its truth."""
        stanzas = [self.body] * self.random.choice((0, 1, 3, 6, 6, 12))
        for once in (self.mapping, self.resource_class):
            stanzas.insert(self.random.randint(0, len(stanzas)), once)
        self.control()
        for stanza in stanzas:
            stanza()
        text = "\n".join(self.lines).encode("latin-1")
        return text if self.chance(0.05) else text + b"\n", self.truth


def source(seed):
    """The source of a seed, and what its database must contain."""
    return Writer(seed).whole()


# ---- Mutations -----------------------------------------------------------------

NASTY = (
    b"", b"0", b"-1", b"99999999999999999999", b"1,2", b",", b"1,2,3", b"0x", b"0x0", b"\\400", b"\\", b'"', b'""', b'"x',
    b"nan", b"1e999", b"1e-999", b"SD", b"SDArray", b"SBS", b"UNKNOWN", b"None", b"x" * 300, b"\0", b"\xff", b" ", b"#",
    b"Public", b"Public,Public", b"1.2.3.4.5", b"256.256.256.999999",
)


def other_value(chooser, line):
    """An attribute line with a value that no attribute accepts, or with another line's form of value."""
    name, equals, _ = line.partition(b"=")
    return name + equals + chooser.choice(NASTY)


def changed_byte(chooser, line):
    """A line with one byte replaced."""
    at = chooser.randrange(len(line) + 1)
    return line[:at] + bytes([chooser.randrange(256)]) + line[at + 1 :]


def other_stanza(chooser, _):
    """A header instead of the line."""
    return chooser.choice(STANZAS).encode()


def other_type(chooser, line):
    """A data type instead of the line, or in it."""
    return b"\tDataType=" + chooser.choice([*TYPES, "SBS", "UNKNOWN"]).encode()


def no_line(_chooser, _line):
    """Removes the line."""
    return None


LINE_CHANGES = (other_value, other_value, changed_byte, other_stanza, other_type, no_line, no_line)


def change_lines(chooser, lines):
    """Makes one change of the number or the order of lines."""
    at, to = chooser.randrange(len(lines)), chooser.randrange(len(lines))
    what = chooser.randrange(4)
    if what == 0:
        lines.insert(to, lines[at])
    elif what == 1:
        lines[at], lines[to] = lines[to], lines[at]
    elif what == 2:
        del lines[min(at, to) : min(at, to) + chooser.randint(1, 8)]
    else:
        lines[to:to] = lines[at : at + chooser.randint(1, 20)]


def mutation(seed, text):
    """A text with one to four changes."""
    chooser = random.Random(seed)
    lines = text.split(b"\n")
    for _ in range(chooser.randint(1, 4)):
        if lines and chooser.random() < 0.7:
            at = chooser.randrange(len(lines))
            changed = chooser.choice(LINE_CHANGES)(chooser, lines[at])
            lines[at : at + 1] = [] if changed is None else [changed]
        elif lines:
            change_lines(chooser, lines)
    text = b"\n".join(lines)
    return text[: chooser.randrange(len(text) + 1)] if chooser.random() < 0.05 else text


def main():
    """Write sources into a directory."""
    directory, count = pathlib.Path(sys.argv[1]), int(sys.argv[2])
    first = int(sys.argv[3]) if len(sys.argv) > 3 else 0
    directory.mkdir(parents=True, exist_ok=True)
    for seed in range(first, first + count):
        (directory / f"{seed}.cdefsrc").write_bytes(source(seed)[0])


if __name__ == "__main__":
    main()
