"""Random class definition sources, including careless ones.

Every source follows from its seed. Most sources compile; some do not, because texts or numbers do not go together.
The sources deliberately use the language in unusual ways: they mix kinds, let a second class cut stanzas short, and
contain ranges that take effect elsewhere, runs that are replaced, that end the file or that lack indices, names and
numbers that are used twice, and texts full of quotes and comment characters.
"""

import random

NUMBERS = ("Int32", "UInt32", "Int64", "UInt64", "Float32", "Float64")
ARRAYS = tuple(f"{name}Array" for name in (*NUMBERS, "String", "Binary"))
WITHOUT_TEXT = ("None", "RH", "RHArray")
STRUCTURED = ("SD", "SDArray")
TYPES = (*NUMBERS, "String", "Binary", *ARRAYS, *WITHOUT_TEXT, *STRUCTURED)
LIMITS = {
    "Int32": ("-2147483648", "2147483647", "-1", "0"),
    "UInt32": ("4294967295", "1", "0"),
    "Int64": ("-9223372036854775808", "9223372036854775807", "-5", "0"),
    "UInt64": ("18446744073709551615", "7", "0"),
    "Float32": ("0.1", "-0.0", "inf", "-inf", "nan", "-nan(0x12)", "0x1p-149", "1e38", "100"),
    "Float64": ("0.1", "-0", "inf", "nan(7)", "0x1p-1074", "1e308", "2.5e-10", "100"),
}
WORDS = ("Size", "Load", "State", "Owner", "Path", "Mode")
TRICKY = "ab #\"/*\\',=\t%\x01\x7f\xe4."
CLASSES = ("Fast", "Slow", "Rare", "Gone")
CLASS_PROPERTIES = ("HasResources", "CanDefine", "MtypGlobal", "CanLiveUpdate", "JoinPhase0")
PERSISTENT_PROPERTIES = ("Public", "Select", "ReqdForDefine", "OptForDefine", "InvalForDefine", "ReadOnly")
DYNAMIC_PROPERTIES = ("Public", "QryReqsMonitoring")
INPUTS = ("Define", "Undefine", "Online", "Offline", "Reset")
LINE = 253


class Writer:
    """Writes one source."""

    def __init__(self, seed):
        self.random = random.Random(seed)
        self.lines = []
        self.names = []
        self.tricky = self.chance(0.3)
        self.open_dynamic = None  # data type of the resource attribute that a class attribute's Range goes to

    def chance(self, probability):
        """True with this probability."""
        return self.random.random() < probability

    def some(self, choices):
        """A choice of several, joined by commas."""
        return ",".join(self.random.sample(choices, self.random.randint(1, len(choices))))

    def line(self, name, value):
        """One attribute line."""
        blank = "\t" if self.chance(0.9) else "  "
        self.lines.append(f"{blank}{name}={value}"[:LINE])

    def text(self):
        """A text as it is written after the '='."""
        if not self.tricky or self.chance(0.8):
            return f"{self.random.choice(WORDS)}{self.random.randint(0, 3)}"
        size = self.random.choice((1, 2, 5, 9, 16, 240))
        text = "".join(self.random.choice(TRICKY) for _ in range(size))
        return f'"{text}"' if self.chance(0.5) else "x" + text.strip() + "x"

    def number16(self):
        """A message number."""
        return self.random.choice((0, 1, 2, 77, 255, 65535))

    def identifier(self):
        """A number that may be used several times."""
        return self.random.choice((0, 1, 2, 3, 4, 5, 6, 32773, -1, 65536))

    def value(self, datatype):
        """The text of a value of a type whose values have texts."""
        element = datatype.removesuffix("Array")
        if element in LIMITS:
            return self.random.choice((*LIMITS[element], str(self.random.randint(0, 1000))))
        if element == "String":
            return self.text().replace(",", ";")
        if self.chance(0.2):
            return "text" + "z" * self.random.randint(0, 200)
        return "0x" + self.random.randbytes(self.random.choice((0, 1, 7, 8, 9, 60))).hex()

    def varieties(self):
        """One or more variety lines."""
        for _ in range(self.random.choice((1, 1, 1, 2, 3))):
            self.line("VarietyRange", f"{self.random.randint(0, 9)},{self.random.choice((9, 12, 4294967295))}")

    def required(self):
        """The lines with which every attribute and action begins."""
        name = self.text()
        self.names.append(name)
        self.line("Name", name)
        self.line("Description", self.number16())
        self.line("DisplayName", self.number16())
        self.line("Id", self.identifier())

    def valid_values(self, name, datatype):
        """Valid values of a type whose values have texts."""
        for _ in range(self.random.choice((0, 0, 1, 2))):
            low = self.value(datatype)
            self.line(name, low if self.chance(0.5) or '"' in low else f"{low},{self.value(datatype).strip(chr(34))}")
            if self.chance(0.5):
                self.line("ValueDisplayName", self.number16())

    # -- stanzas --

    def persistent(self, kind, cut_short):
        """A persistent attribute and the run that belongs to it."""
        datatype = self.random.choice(TYPES)
        self.lines.append(kind)
        self.required()
        if cut_short and self.chance(0.3):
            return
        self.line("DataType", datatype)
        if not (cut_short and self.chance(0.2)):
            self.varieties()
            self.persistent_options(datatype)
        self.attribute_runs(datatype)

    def persistent_options(self, datatype):
        """Optional lines of a persistent attribute."""
        if self.chance(0.3):
            self.line("GroupID", self.number16())
        if self.chance(0.3):
            self.line("GroupName", self.number16())
        if self.chance(0.5):
            self.line("Properties", self.some(PERSISTENT_PROPERTIES))
        if datatype in (*WITHOUT_TEXT, *STRUCTURED):
            return
        self.valid_values("ValidValue", datatype)
        for _ in range(self.random.choice((0, 1, 1, 3))):
            self.line("DefaultValue", self.value(datatype))

    def dynamic(self, kind, cut_short):
        """A dynamic attribute and the run that belongs to it."""
        datatype = self.random.choice(TYPES)
        if kind == "DynamicResourceAttribute":
            self.open_dynamic = datatype
        self.lines.append(kind)
        self.required()
        if cut_short and self.chance(0.3):
            return
        self.line("DataType", datatype)
        self.line("VariableType", self.random.choice(("Counter", "Quantity", "State", "Quantum")))
        if not (cut_short and self.chance(0.2)):
            self.varieties()
            self.dynamic_options(datatype)
        self.attribute_runs(datatype)

    def dynamic_options(self, datatype):
        """Optional lines of a dynamic attribute."""
        if self.chance(0.6):
            self.line("VariableClass", self.random.choice(CLASSES))
        if self.chance(0.3):
            self.line("GroupID", self.number16())
        if self.chance(0.3):
            self.line("Properties", self.some(DYNAMIC_PROPERTIES))
        # An array's place is no number that another attribute could be given.
        lands = not datatype.endswith("Array") or self.open_dynamic in (None, datatype)
        if datatype.removesuffix("Array") in NUMBERS and lands and self.chance(0.5):
            self.line("Range", f"{self.value(datatype)},{self.value(datatype)}")
        if datatype not in (*WITHOUT_TEXT, *STRUCTURED):
            self.valid_values("ValidStateValue", datatype)
            if self.chance(0.5):
                self.line("InitialValue", self.value(datatype))
        for name in ("Expression", "ReArmExpression"):
            if self.chance(0.2):
                self.line(name, self.text())
        if self.chance(0.2):
            self.line("ReArmDescription", self.number16())

    def attribute_runs(self, datatype):
        """Up to two runs of SD stanzas, of which the last one is used."""
        if datatype not in STRUCTURED:
            return
        kinds = self.random.sample(("PAttrSDDefinition", "DAttrSDDefinition"), self.random.choice((0, 1, 1, 1, 2)))
        for kind in kinds:
            self.run(kind, ("None", "RH", "RHArray"))

    def run(self, kind, more_types):
        """A run of SD stanzas. Directly after another run of its kind it would be part of that run."""
        if next(line for line in reversed(self.lines) if line[0] not in "\t ") == kind:
            return
        index = 0
        careless = self.chance(0.2)
        for _ in range(self.random.randint(1, 3)):
            datatype = self.random.choice((*NUMBERS, "String", "Binary", *ARRAYS, *more_types))
            self.lines.append(kind)
            self.line("ElementName", self.text())
            self.line("Description", self.number16())
            self.line("DisplayName", self.number16())
            indexed = not careless or self.chance(0.5)
            if indexed:
                self.line("ElementIndex", index)
                index += 1
            self.line("DataType", datatype)
            if indexed and kind != "ActionOutSDDefinition" and datatype not in more_types:
                self.valid_values("ValidValue", datatype)

    def action(self, kind):
        """An action with its input and response, in any order, any number of times."""
        self.lines.append(kind)
        self.required()
        self.varieties()
        if self.chance(0.4):
            self.line("Properties", self.some(("LongRun", "Public")))
        if self.chance(0.4):
            self.line("Permission", self.random.choice("qlevdcsoax-"))
        if self.chance(0.4):
            self.line("TimeOut", self.number16())
        if self.chance(0.3):
            self.line("ConfirmationMsg", self.number16())
        for _ in range(self.random.choice((0, 1, 2, 3))):
            self.run(self.random.choice(("ActionInSDDefinition", "ActionOutSDDefinition")), ("None", "SBS", "Unheard"))

    def variable_class(self):
        """A variable class, of which some lines may be missing."""
        self.lines.append("ResourceVariableClass")
        if self.chance(0.1):
            return
        self.line("VariableClass", self.random.choice(CLASSES[:3]))
        self.line("ObservationInterval", self.number16())
        self.line("ReportingInterval", self.number16())
        if self.chance(0.3):
            self.line("Alias", self.text())

    def mapping(self):
        """The one map."""
        self.lines.append("ClassToManagerMapping")
        self.line("ResourceManager", self.text())
        self.line("FirstKey", self.random.randint(0, 5))
        self.line("LastKey", self.random.randint(5, 65535))
        if self.chance(0.9):
            self.line("MessageCatalog", self.text())
        self.line("DescriptiveMessageSet", self.number16())

    # -- the source --

    def begin_class(self):
        """The first stanzas of every class; some lines of the first one may be missing."""
        self.names = []
        self.open_dynamic = None
        self.lines.append("ControlDefinition")
        if self.chance(0.9):
            self.line("FileVersion", f"{self.random.randint(0, 255)}.2.{self.random.randint(0, 300)}")
        if self.chance(0.1):
            return
        self.lines.append("ResourceClass")
        self.line("Description", self.number16())
        self.line("DisplayName", self.number16())
        self.line("Properties", self.some(CLASS_PROPERTIES) if self.chance(0.9) else ",")
        self.line("ClassPermTemplate", 0)
        if self.chance(0.1):
            return
        self.line("ResourcePermTemplate", 0)
        if self.chance(0.8):
            self.line("Name", self.text())

    def stanza(self, cut_short):
        """Any stanza but the map, with the runs that follow it."""
        level = self.random.choice(("Resource", "Class"))
        what = self.random.random()
        if what < 0.3:
            self.persistent(f"Persistent{level}Attribute", cut_short)
        elif what < 0.7:
            self.dynamic(f"Dynamic{level}Attribute", cut_short)
        elif what < 0.8:
            self.action(f"{level}Action")
        elif what < 0.9:
            self.variable_class()
        else:
            self.run(f"{self.random.choice(INPUTS)}SDDefinition", ("None", "SBS", "Unheard"))

    def locator(self):
        """A later ResourceClass stanza with a Locator, which may name no attribute."""
        self.lines.append("ResourceClass")
        for name in ("Description", "DisplayName", "ClassPermTemplate", "ResourcePermTemplate"):
            self.line(name, 1)
        self.line("Properties", self.random.choice(CLASS_PROPERTIES))
        self.line("Locator", self.random.choice(self.names or ["Nothing"]))

    def whole(self):
        """The whole source."""
        classes = self.random.choice((1, 1, 1, 2, 3))
        map_at = self.random.random()
        for number in range(classes):
            last = number + 1 == classes
            self.begin_class()
            stanzas = self.random.randint(0, 9)
            for left in range(stanzas, 0, -1):
                if last and map_at is not None and (map_at < 0.3 or left == 1 and map_at < 0.6):
                    self.mapping()
                    map_at = None
                self.stanza(not last and left == 1)
            if self.chance(0.3):
                self.locator()
        if map_at is not None:
            self.mapping()
        return "\n".join(self.lines).encode("latin-1") + b"\n"


def source(seed):
    """The source for a seed."""
    return Writer(seed).whole()
