"""Plants one mistake in a source that is right.

plant(chooser, text) gives the text with one mistake of a kind, the kind, and
the lines in which a report of it is at the right place: the line that is
wrong; or, of what is missing, the stanza that lacks it and the header after
it.  Everything follows from the chooser, which is a random.Random.
"""

import dataclasses
import re

ATTRIBUTE = ("Name", "Description", "DisplayName", "Id", "VarietyRange", "DataType")
ELEMENT = ("ElementName", "Description", "DisplayName", "ElementIndex", "DataType")
# What each kind of stanza has to have.
REQUIRED = {
    "ControlDefinition": ("FileVersion",),
    "ResourceClass": ("Description", "DisplayName", "Properties", "ClassPermTemplate", "ResourcePermTemplate"),
    "ClassToManagerMapping": ("ResourceManager", "FirstKey", "LastKey", "MessageCatalog", "DescriptiveMessageSet"),
    "ResourceVariableClass": ("VariableClass", "ObservationInterval", "ReportingInterval"),
    "PersistentResourceAttribute": ATTRIBUTE,
    "PersistentClassAttribute": ATTRIBUTE,
    "DynamicResourceAttribute": (*ATTRIBUTE, "VariableType"),
    "DynamicClassAttribute": (*ATTRIBUTE, "VariableType"),
    "ResourceAction": ATTRIBUTE[:-1],
    "ClassAction": ATTRIBUTE[:-1],
}
REPEATABLE = ("VarietyRange", "ValidValue", "ValidStateValue", "ValueDisplayName", "DefaultValue")
NUMBERS = (
    "Description", "DisplayName", "Id", "GroupID", "GroupName", "ElementIndex", "ValueDisplayName", "FirstKey", "LastKey",
    "DescriptiveMessageSet", "ObservationInterval", "ReportingInterval", "ExpressionDescription", "ReArmDescription",
    "ConfirmationMsg", "TimeOut",
)
TYPED = ("DefaultValue", "InitialValue", "ValidValue", "ValidStateValue", "Range")
NUMERIC = re.compile(r"(Int|UInt|Float)(32|64)(Array)?")
LETTERS = "abcdefghijklmnopqrstuvwxyz"


@dataclasses.dataclass
class Stanza:
    """A header's line and those of its attributes, as positions in the lines; what follows them is at `end`."""

    kind: str
    header: int
    end: int
    attributes: list  # (position, name) of each

    def positions(self, name):
        """The lines of an attribute."""
        return [at for at, each in self.attributes if each == name]

    @property
    def is_element(self):
        """Whether the stanza is an element of structured data."""
        return self.kind.endswith("SDDefinition")

    @property
    def required(self):
        """The names of the stanza's required attributes."""
        return ELEMENT if self.is_element else REQUIRED[self.kind]


def stanzas_of(lines):
    """The stanzas of a source."""
    found = []
    for at, line in enumerate(lines):
        header = re.match(r"[A-Z]\w+", line)
        attribute = re.match(r"[ \t]+(\w+)=", line)
        if header:
            found.append(Stanza(header[0], at, at, []))
        elif attribute and found:
            found[-1].attributes.append((at, attribute[1]))
    for one, following in zip(found, [each.header for each in found[1:]] + [len(lines)]):
        one.end = following
    return found


def parts(line):
    """Blanks, name, value and comment of an attribute line without quotes; None for any other line."""
    match = re.fullmatch(r'([ \t]+)(\w+)=([^"#]*?)((?:[ \t]+(?:#|//|/\*)[^"]*)?)', line)
    return match and match.groups()


def misspelt(chooser, word):
    """A word with one letter dropped, added, replaced or swapped with the next one."""
    at = chooser.randrange(len(word))
    letter = chooser.choice(LETTERS)
    return chooser.choice((
        word[:at] + word[at + 1:],
        word[:at] + letter + word[at:],
        word[:at] + letter + word[at + 1:],
        word[:at] + word[at:at + 2][::-1] + word[at + 2:],
    ))


class Planter:
    """A source's lines, in which one mistake is planted. A kind's function returns the lines where a report of its
    mistake is right, as positions in the changed lines; None if the source has no place for it."""

    def __init__(self, chooser, text):
        self.chooser = chooser
        self.lines = text.split("\n")
        self.stanzas = stanzas_of(self.lines)

    # -- choices --

    def lines_with(self, *names):
        """The attribute lines with one of these names and a plain value."""
        return [(one, at) for one in self.stanzas for at, name in one.attributes
                if (not names or name in names) and parts(self.lines[at])]

    def choose(self, choices):
        """One of them, or None."""
        return self.chooser.choice(choices) if choices else None

    def replace(self, at, name=None, value=None):
        """Changes an attribute line. Returns None if that makes no difference."""
        blanks, old_name, old_value, comment = parts(self.lines[at])
        line = f"{blanks}{old_name if name is None else name}={old_value if value is None else value}{comment}"
        return self.put(at, line)

    def put(self, at, line):
        """Changes a line. Returns None if that makes no difference."""
        if line == self.lines[at]:
            return None
        self.lines[at] = line
        return [at]

    def drop(self, at):
        """Removes a line."""
        del self.lines[at]

    def move(self, at, to):
        """Moves a line up to another place."""
        self.lines.insert(to, self.lines.pop(at))

    def move_down(self, at, to):
        """Moves a line down."""
        self.lines.insert(to, self.lines.pop(at))

    def new_value(self, names, value):
        """Gives an attribute of one of these names another value."""
        chosen = self.choose(self.lines_with(*names))
        return chosen and self.replace(chosen[1], value=value)

    def wrong_word(self, names):
        """Misspells the value of an attribute; if it is a list, one of its words."""
        chosen = self.choose(self.lines_with(*names))
        if chosen is None:
            return None
        words = parts(self.lines[chosen[1]])[2].split(",")
        at = self.chooser.randrange(len(words))
        words[at] = misspelt(self.chooser, words[at]) if words[at] else "x"
        return self.replace(chosen[1], value=",".join(words))

    def numeric_type(self, one):
        """Whether the values of a stanza are numbers."""
        found = [parts(self.lines[at]) for at in one.positions("DataType")]
        return bool(found and found[0] and NUMERIC.fullmatch(found[0][2]))

    # -- names --

    def misspelt_attribute(self):
        """A letter of an attribute's name is wrong."""
        chosen = self.choose(self.lines_with())
        return chosen and self.replace(chosen[1], name=misspelt(self.chooser, parts(self.lines[chosen[1]])[1]))

    def misspelt_header(self):
        """A letter of a header is wrong."""
        one = self.choose(self.stanzas)
        word = misspelt(self.chooser, one.kind)
        return self.put(one.header, word + self.lines[one.header][len(one.kind):])

    def misspelt_data_type(self):
        """A letter of a data type is wrong."""
        return self.wrong_word(("DataType",))

    def misspelt_variable_type(self):
        """A letter of a variable type is wrong."""
        return self.wrong_word(("VariableType",))

    def misspelt_property(self):
        """A letter of a property is wrong."""
        return self.wrong_word(("Properties",))

    def foreign_attribute(self):
        """An attribute of another kind of stanza."""
        one = self.choose([one for one in self.stanzas if not one.is_element and one.attributes])
        at = self.chooser.choice(one.attributes)[0] + 1
        self.lines.insert(at, "\tElementName=Extra")
        return [at]

    # -- lines --

    def missing_line(self):
        """A required attribute is not given."""
        one = self.choose(self.stanzas)
        name = self.chooser.choice(one.required)
        if len(one.positions(name)) != 1:
            return None
        self.drop(one.positions(name)[0])
        return list(range(one.header, one.end))

    def missing_index(self):
        """An element has no ElementIndex."""
        one = self.choose([one for one in self.stanzas if one.positions("ElementIndex")])
        if one is None:
            return None
        self.drop(one.positions("ElementIndex")[0])
        return list(range(one.header, one.end - 1))

    def lost_header(self):
        """A header is missing."""
        one = self.choose(self.stanzas)
        self.drop(one.header)
        return list(range(one.header, one.end))

    def header_alone(self):
        """A header is given twice."""
        one = self.choose([one for one in self.stanzas if one.kind in REQUIRED])
        self.lines.insert(one.header, one.kind)
        return [one.header, one.header + 1]

    def repeated_line(self):
        """An attribute is given twice."""
        chosen = self.choose([(one, at, name) for one in self.stanzas for at, name in one.attributes
                              if name not in REPEATABLE])
        one, at, _ = chosen
        to = self.chooser.choice([to + 1 for to, _ in one.attributes if to >= at])
        self.lines.insert(to, self.lines[at])
        return [to]

    def optional_first(self):
        """An optional attribute comes before the required ones."""
        chosen = self.choose([(one, at) for one in self.stanzas for at, name in one.attributes
                              if name not in one.required and one.kind in REQUIRED])
        if chosen is None:
            return None
        one, at = chosen
        self.move(at, one.attributes[0][0])
        return [one.attributes[0][0]]

    def indented_header(self):
        """A header begins with a blank."""
        one = self.choose(self.stanzas)
        return self.put(one.header, self.chooser.choice((" ", "\t")) + self.lines[one.header])

    def attribute_in_column_1(self):
        """An attribute line begins without a blank."""
        chosen = self.choose(self.lines_with())
        return self.put(chosen[1], self.lines[chosen[1]].lstrip(" \t"))

    def stray_elements(self):
        """Elements do not follow the attribute that they belong to."""
        runs = [(one, other) for one, other in zip(self.stanzas, self.stanzas[1:])
                if one.kind.endswith("Attribute") and other.kind in ("PAttrSDDefinition", "DAttrSDDefinition")]
        chosen = self.choose(runs)
        if chosen is None:
            return None
        owner, first = chosen
        at = owner.positions("DataType")[0]
        found = parts(self.lines[at])
        return found and self.replace(at, value="Int32") and [at, *range(first.header, first.end)]

    def second_map(self):
        """There is a second ClassToManagerMapping."""
        chosen = [one for one in self.stanzas if one.kind == "ClassToManagerMapping"][0]
        at = self.chooser.choice(self.stanzas[self.stanzas.index(chosen):]).end
        self.lines[at:at] = [line for line in self.lines[chosen.header:chosen.end]]
        return [at]

    def missing_stanza(self):
        """A stanza is missing without which there is no class or no manager."""
        one = self.choose([one for one in self.stanzas if one.kind in ("ControlDefinition", "ClassToManagerMapping")])
        del self.lines[one.header:one.end]
        return list(range(len(self.lines)))

    def repeated_stanza(self):
        """An attribute or an element is defined twice."""
        one = self.choose([one for one in self.stanzas if one.kind.endswith("Attribute") or one.is_element])
        if one is None:
            return None
        self.lines[one.end:one.end] = self.lines[one.header:one.end]
        return list(range(one.end, 2 * one.end - one.header))

    def swapped_elements(self):
        """Elements are in the wrong order."""
        pair = self.choose([pair for pair in zip(self.stanzas, self.stanzas[1:])
                            if pair[0].is_element and pair[0].kind == pair[1].kind])
        if pair is None:
            return None
        one, two = pair
        first, second = self.lines[one.header:one.end], self.lines[two.header:two.end]
        self.lines[one.header:two.end] = second + first
        return list(range(one.header, two.end))

    def line_in_next_stanza(self):
        """A required line is at the end of the next stanza of the same kind."""
        pair = self.choose([pair for pair in zip(self.stanzas, self.stanzas[1:])
                            if pair[0].kind == pair[1].kind and pair[0].kind in REQUIRED])
        if pair is None:
            return None
        one, two = pair
        name = self.chooser.choice([each for each in one.required if each != "VarietyRange"])
        self.move_down(one.positions(name)[0], two.attributes[-1][0])
        return list(range(one.header, two.end))

    def line_in_previous_stanza(self):
        """A required line is at the end of the previous stanza of the same kind."""
        pair = self.choose([pair for pair in zip(self.stanzas, self.stanzas[1:])
                            if pair[0].kind == pair[1].kind and pair[0].kind in REQUIRED])
        if pair is None:
            return None
        one, two = pair
        name = self.chooser.choice([each for each in one.required if each != "VarietyRange"])
        self.move(two.positions(name)[0], one.attributes[-1][0] + 1)
        return list(range(one.header, two.end))

    def stray_words(self):
        """A line of words that should be a comment."""
        at = self.chooser.choice(self.stanzas).header + self.chooser.randrange(2)
        self.lines.insert(at, self.chooser.choice(("see below", "\tsee below", "  TODO", "----")))
        return [at]

    def joined_lines(self):
        """Two lines of a stanza are joined to one."""
        pair = self.choose([(one.header, one.attributes[0][0]) for one in self.stanzas if one.attributes])
        if "#" in self.lines[pair[0]] or "//" in self.lines[pair[0]]:
            return None
        self.lines[pair[0]] += " " + self.lines[pair[1]].strip(" \t")
        self.drop(pair[1])
        return [pair[0]]

    # -- the form of a line --

    def no_equals(self):
        """An attribute line has another character for the equals sign."""
        chosen = self.choose(self.lines_with())
        blanks, name, value, comment = parts(self.lines[chosen[1]])
        if "=" in value + comment:
            return None
        return self.put(chosen[1], blanks + name + self.chooser.choice((" ", ": ", ":", "")) + value + comment)

    def no_value(self):
        """Nothing follows the equals sign."""
        chosen = self.choose([(one, at) for one, at in self.lines_with() if parts(self.lines[at])[1] in one.required])
        return chosen and self.replace(chosen[1], value="")

    def blank_before_equals(self):
        """A blank separates the name and the equals sign."""
        chosen = self.choose(self.lines_with())
        return chosen and self.replace(chosen[1], name=parts(self.lines[chosen[1]])[1] + " ")

    def open_quote(self):
        """A value has a quote only at its beginning."""
        chosen = self.choose([(one, at) for one, at in self.lines_with() if not parts(self.lines[at])[3]])
        return chosen and self.replace(chosen[1], value='"' + parts(self.lines[chosen[1]])[2])

    def junk_after_header(self):
        """The line of a header contains something else too."""
        one = self.choose(self.stanzas)
        return self.put(one.header, one.kind + self.chooser.choice((":", "=", " {", " x", ";")))

    # -- values --

    def text_for_number(self):
        """There is a text in the place of a number."""
        return self.new_value(NUMBERS, self.chooser.choice(("none", "x", "one")))

    def letter_in_number(self):
        """A number ends with a letter that is not a digit."""
        chosen = self.choose(self.lines_with(*NUMBERS))
        return chosen and self.replace(chosen[1], value=parts(self.lines[chosen[1]])[2] + "O")

    def large_number(self):
        """A message number has more than 16 bits."""
        return self.new_value(("Description", "DisplayName", "GroupName", "DescriptiveMessageSet"),
                              str(self.chooser.randint(65536, 10**6)))

    def text_for_typed(self):
        """There is a text in the place of a number of the attribute's data type."""
        chosen = self.choose([(one, at) for one, at in self.lines_with(*TYPED) if self.numeric_type(one)])
        return chosen and self.replace(chosen[1], value="12x")

    def one_bound(self):
        """A range has only one bound."""
        return self.new_value(("VarietyRange", "Range"), "1")

    def three_bounds(self):
        """Varieties have three bounds."""
        return self.new_value(("VarietyRange",), "1,2,3")

    def low_above_high(self):
        """A lower bound is greater than the upper one."""
        return self.new_value(("VarietyRange",), "9,1")

    def blank_in_list(self):
        """A blank follows a comma of a list."""
        chosen = self.choose([(one, at) for one, at in self.lines_with("Properties") if "," in self.lines[at]])
        return chosen and self.replace(chosen[1], value=parts(self.lines[chosen[1]])[2].replace(",", ", ", 1))

    def wrong_index(self):
        """An ElementIndex is not the next one."""
        chosen = self.choose(self.lines_with("ElementIndex"))
        if chosen is None:
            return None
        index = int(parts(self.lines[chosen[1]])[2])
        return self.replace(chosen[1], value=str(self.chooser.choice((index + 1, index + 2, max(index - 1, 0)))))

    def keys_swapped(self):
        """FirstKey is greater than LastKey."""
        one = [one for one in self.stanzas if one.kind == "ClassToManagerMapping"][0]
        first, last = one.positions("FirstKey")[0], one.positions("LastKey")[0]
        keys = [parts(self.lines[at]) for at in (first, last)]
        if None in keys or int(keys[0][2]) == int(keys[1][2]):
            return None
        self.replace(first, value=keys[1][2])
        self.replace(last, value=keys[0][2])
        return list(range(one.header, one.end))

    def structure_in_structure(self):
        """An element is structured data."""
        chosen = self.choose([(one, at) for one, at in self.lines_with("DataType") if one.is_element])
        return chosen and self.replace(chosen[1], value=self.chooser.choice(("SD", "SDArray")))

    def default_of_structure(self):
        """An attribute of structured data has a value."""
        structured = [one for one in self.stanzas if one.kind.startswith("Persistent")
                      if any((parts(self.lines[at]) or " " * 4)[2] in ("SD", "SDArray") for at in one.positions("DataType"))]
        one = self.choose(structured)
        if one is None:
            return None
        at = one.attributes[-1][0] + 1
        self.lines.insert(at, "\tDefaultValue=1")
        return [at]

    def display_without_value(self):
        """A ValueDisplayName has no valid value."""
        kinds = ("PersistentResourceAttribute", "PersistentClassAttribute", "DynamicResourceAttribute", "DynamicClassAttribute")
        one = self.choose([one for one in self.stanzas if one.kind in kinds
                           and not one.positions("ValidValue") + one.positions("ValidStateValue")])
        if one is None:
            return None
        at = one.attributes[-1][0] + 1
        self.lines.insert(at, "\tValueDisplayName=7")
        return [at]

    def misspelt_locator(self):
        """No attribute has the Locator's name."""
        return self.wrong_word(("Locator",))


    # -- what compiles, but loses something --

    def value_of(self, one, name):
        """The plain value that a stanza gives an attribute, or None."""
        found = [parts(self.lines[at]) for at in one.positions(name)]
        return found[0][2] if found and found[0] else None

    def insert(self, at, line):
        """Adds a line."""
        self.lines.insert(at, line)
        return [at]

    def invalid_default(self):
        """A default is not the only valid value."""
        fit = [(one, at) for one, at in self.lines_with("DefaultValue", "InitialValue") if self.numeric_type(one)
               and one.kind != "PersistentClassAttribute" and len(one.positions("DefaultValue")) < 2
               and not one.positions("ValidValue") + one.positions("ValidStateValue")
               and re.fullmatch("[1-9][0-9]{0,8}", parts(self.lines[at])[2])]
        chosen = self.choose(fit)
        if chosen is None:
            return None
        one, at = chosen
        name = "ValidValue" if one.kind.startswith("P") else "ValidStateValue"
        return [at, *self.insert(at + 1, f"\t{name}={int(parts(self.lines[at])[2]) + 1}")]

    def invalid_own_default(self):
        """An attribute without a default has valid values, but not the default of its type."""
        one = self.choose([one for one in self.stanzas if one.kind == "PersistentResourceAttribute" and self.numeric_type(one)
                           and not one.positions("DefaultValue") + one.positions("ValidValue") + one.positions("Properties")])
        if one is None:
            return None
        return [one.header, *self.insert(one.attributes[-1][0] + 1, "\tValidValue=1,9")]

    def repeated_varieties(self):
        """Varieties are given twice."""
        chosen = self.choose(self.lines_with("VarietyRange"))
        return chosen and [chosen[1], *self.insert(chosen[1] + 1, self.lines[chosen[1]])]

    def same_in_both(self, attribute, change=str):
        """A dynamic attribute has a value of a persistent one. The mistake may be reported at the later of the two."""
        level = self.chooser.choice(("Resource", "Class"))
        lines = self.lines_with(attribute)
        given = self.choose([at for one, at in lines if one.kind == f"Persistent{level}Attribute"])
        chosen = self.choose([at for one, at in lines if one.kind == f"Dynamic{level}Attribute"])
        if given is None or chosen is None:
            return None
        changed = self.replace(chosen, value=change(parts(self.lines[given])[2]))
        return changed and [chosen, given]

    def name_of_other_kind(self):
        """A dynamic attribute has the name of a persistent one."""
        return self.same_in_both("Name")

    def name_in_other_case(self):
        """A dynamic attribute has the name of a persistent one, in another case."""
        letters = LETTERS + LETTERS.upper()
        return self.same_in_both("Name", lambda name: "".join(c.swapcase() if c in letters else c for c in name))

    def id_of_other_kind(self):
        """A dynamic attribute has the Id of a persistent one."""
        return self.same_in_both("Id")

    def blank_in_front(self):
        """A blank is in front of a name."""
        chosen = self.choose([(one, at) for one, at in self.lines_with("Name", "ElementName", "MessageCatalog", "Alias")])
        return chosen and self.replace(chosen[1], value=" " + parts(self.lines[chosen[1]])[2])

    def lone_parenthesis(self):
        """An expression has a parenthesis that is not closed."""
        fit = [(one, at) for one, at in self.lines_with("Expression", "ReArmExpression")
               if not set(parts(self.lines[at])[2]) & set("()\"'\\")]
        chosen = self.choose(fit)
        return chosen and self.replace(chosen[1], value="(" + parts(self.lines[chosen[1]])[2])

    def class_bit(self):
        """The Id of an attribute in a variable class has the bit that marks class attributes."""
        fit = [(one, at) for one, at in self.lines_with("Id") if one.kind.startswith("Dynamic") and one.positions("VariableClass")]
        chosen = self.choose(fit)
        return chosen and self.replace(chosen[1], value=str(32768 + self.chooser.randrange(32768)))

    def large_locator(self):
        """The Id of the Locator's attribute has more than 16 bits."""
        names = [parts(self.lines[at])[2] for _, at in self.lines_with("Locator")]
        fit = [(one, at) for one, at in self.lines_with("Id") if one.kind == "PersistentResourceAttribute"
               and self.value_of(one, "Name") in names]
        return self.replace(fit[0][1], value=str(self.chooser.randint(65536, 10**6))) if fit else None

    def elements_of_other_kind(self):
        """The only element of an attribute is of the other kind."""
        kinds = {"PAttrSDDefinition": "DAttrSDDefinition", "DAttrSDDefinition": "PAttrSDDefinition"}
        single = [one for before, one, after in zip(self.stanzas, self.stanzas[1:], self.stanzas[2:])
                  if one.kind in kinds and one.kind not in (before.kind, after.kind) and after.kind not in kinds]
        one = self.choose(single)
        return one and self.put(one.header, kinds[one.kind])

    def elements_without_stanza_between(self):
        """Elements of the class directly follow those of an attribute."""
        last = [after for one, after in zip(self.stanzas, self.stanzas[1:])
                if one.kind in ("PAttrSDDefinition", "DAttrSDDefinition") and not after.is_element]
        one = self.choose(last)
        if one is None:
            return None
        self.lines[one.header:one.header] = ["ResetSDDefinition", "\tElementName=E", "\tDescription=1", "\tDisplayName=2",
                                             "\tElementIndex=0", "\tDataType=Int32"]
        return [one.header]


KINDS = tuple(name for name, member in vars(Planter).items()
              if callable(member) and name not in
              ("__init__", "lines_with", "choose", "replace", "put", "drop", "move", "move_down", "new_value", "wrong_word", "numeric_type",
               "value_of", "insert", "same_in_both"))


def plant(chooser, text, kind):
    """The text with a mistake of a kind, and the numbers of the lines where it may be reported; None if the text has no
    place for it."""
    planter = Planter(chooser, text)
    places = getattr(planter, kind)()
    if not places:
        return None
    return "\n".join(planter.lines), [at + 1 for at in places]
