"""Compare the warnings of "cdef check" on generated sources with those of a second implementation.

The second implementation is as simple as possible, without regard to speed: it looks at every pair of values and
every pair of names. Both a missing and an additional warning are failures. The sources are those of
generate_sources.py, which are correct, so that no error hides a warning. They are random, so that some contain the
cause of each warning, and many contain something similar.
"""

import dataclasses
import json
import math
import struct
import subprocess

import pytest

import generate_sources
from compare import none
from programs import PROGRAMS

GROUPS = 4
COUNT = 2000  # sources that all groups have together
SANITIZED_COUNT = 160
BATCH = 100
PERSISTENT = ("PersistentResourceAttribute", "PersistentClassAttribute")
DYNAMIC = ("DynamicResourceAttribute", "DynamicClassAttribute")
ATTRIBUTES = PERSISTENT + DYNAMIC
PARTNERS = dict(zip(ATTRIBUTES, DYNAMIC + PERSISTENT))
BITS = {"Int32": 32, "UInt32": 32, "Int64": 64, "UInt64": 64}
ATTRIBUTE_RUNS = {"PAttrSDDefinition": PERSISTENT, "DAttrSDDefinition": DYNAMIC}


@dataclasses.dataclass
class Stanza:
    """A header and its attributes, each with line, name and value."""

    line: int
    kind: str
    attributes: list = dataclasses.field(default_factory=list)

    def all(self, *names):
        """Lines and values of attributes."""
        return [(line, value) for line, name, value in self.attributes if name in names]

    def value(self, name):
        """The one value of an attribute, or None."""
        return next((value for _, value in self.all(name)), None)

    def line_of(self, name):
        """The line of an attribute, or None."""
        return next((line for line, _ in self.all(name)), None)


def stanzas_of(source):
    """The stanzas of a correct source."""
    stanzas = []
    for number, line in enumerate(source.decode("latin-1").split("\n"), 1):
        text = line
        for sign in ("#", "//", "/*"):
            text = text.partition(sign)[0]
        text = text.rstrip(" \t")
        if not text.strip(' \t"'):
            continue
        if text[0] not in " \t":
            stanzas.append(Stanza(number, text))
            continue
        name, _, value = text.lstrip(" \t").partition("=")
        if value.lstrip(" \t").startswith('"'):
            value = value.lstrip(" \t")[1:-1]
        stanzas[-1].attributes.append((number, name, value))
    return stanzas


# ---- Values --------------------------------------------------------------------


def integer(text):
    """A number in any base; a leading 0 means octal."""
    text = text.strip()
    return int(text, 8) if text.startswith("0") and text.isdigit() else int(text, 0)


def key(data_type, text):
    """The part of a value that can be compared, or None."""
    element = data_type.removesuffix("Array")
    if element in BITS:
        number = int(text) % 2 ** BITS[element]
        return number - 2 ** BITS[element] if element[0] == "I" and number >= 2 ** (BITS[element] - 1) else number
    if element in ("Float32", "Float64"):
        number = float.fromhex(text) if "0x" in text else float(text)
        if element == "Float32" and math.isfinite(number):
            number = struct.unpack("f", struct.pack("f", number))[0]
        return None if math.isnan(number) else number
    if element == "String":
        return text.encode("latin-1")
    return bytes.fromhex(text[2:]) if text.startswith("0x") else None


def own_default(data_type):
    """The default of a type."""
    element = data_type.removesuffix("Array")
    return 0 if element in (*BITS, "Float32", "Float64") else b""


def ranges(data_type, lines):
    """The lines and bounds of ranges of values; a bound may be None."""
    for line, value in lines:
        low, comma, high = value.partition(",")
        yield line, key(data_type, low), key(data_type, high if comma else low)


def is_allowed(value, data_type, lines):
    """Whether some line allows a value; also true if that cannot be known."""
    allowed = list(ranges(data_type, lines))
    strange = any(low is None or high is None or low > high for _, low, high in allowed)
    commas = data_type.startswith("String") and any(text.count(",") > 1 for _, text in lines)
    return not lines or value is None or strange or commas or any(low <= value <= high for _, low, high in allowed)


def invalid_defaults(stanzas):
    """S533"""
    for stanza in (each for each in stanzas if each.kind in ATTRIBUTES):
        data_type = stanza.value("DataType")
        valid = stanza.all("ValidValue", "ValidStateValue")
        numeric = data_type.removesuffix("Array") in (*BITS, "Float32", "Float64")
        limits = stanza.all("Range") if numeric else []
        given = stanza.all("DefaultValue", "InitialValue")
        if stanza.kind == "PersistentClassAttribute":
            given = []
        required = "ReqdForDefine" in (stanza.value("Properties") or "").split(",")
        values = [(line, key(data_type, text)) for line, text in given]
        if not given and not required and (valid or limits):
            values = [(stanza.line, own_default(data_type))]
        if not data_type.endswith("Array"):
            values = values[-1:]
        for line, value in values:
            if not is_allowed(value, data_type, valid) or not is_allowed(value, data_type, limits):
                yield "S533", line


def overlaps(stanzas):
    """S535"""
    for stanza in stanzas:
        varieties = [(line, *map(integer, value.split(","))) for line, value in stanza.all("VarietyRange")]
        data_type = stanza.value("DataType")
        values = ranges(data_type, stanza.all("ValidValue", "ValidStateValue"))
        for given in (varieties, list(values)):
            given = [each for each in given if None not in each and each[1] <= each[2]]
            for position, (line, low, high) in enumerate(given):
                if any(low <= other[2] and other[1] <= high for other in given[:position]):
                    yield "S535", line


# ---- Names and numbers ---------------------------------------------------------


def scopes(stanzas):
    """Line, stanza kind, name and scope of each name. The names of the kinds in a scope must differ."""
    run, before = 0, None
    for stanza in stanzas:
        run += stanza.kind != before
        before = stanza.kind
        for line, name, value in stanza.attributes:
            if name == "ElementName":
                yield line, stanza.kind, value, (stanza.kind, run)
            elif name == "VariableClass" and stanza.kind == "ResourceVariableClass":
                yield line, stanza.kind, value, stanza.kind
            elif name == "Name" and stanza.kind != "ResourceClass":
                yield line, stanza.kind, value, min(stanza.kind, PARTNERS.get(stanza.kind, stanza.kind))


def same_names(stanzas):
    """S506"""
    seen = set()
    for line, _, name, scope in scopes(stanzas):
        lower = name.encode("latin-1").lower()  # only ASCII
        if (scope, lower) in seen:
            yield "S506", line
        seen.add((scope, lower))


def same_ids(stanzas):
    """S507, and S534"""
    seen = set()
    for stanza in stanzas:
        if stanza.value("Id") is None:
            continue
        number, line = integer(stanza.value("Id")), stanza.line_of("Id")
        scope = min(stanza.kind, PARTNERS.get(stanza.kind, stanza.kind))
        if (scope, number) in seen:
            yield "S507", line
        seen.add((scope, number))
        if stanza.value("VariableClass") is not None and number & 0x8000:
            yield "S534", line


def unknown_names(stanzas):
    """S504, S505 and S530"""
    locators = [each for stanza in stanzas for each in stanza.all("Locator")]
    persistent = {stanza.value("Name") for stanza in stanzas if stanza.kind == PERSISTENT[0]}
    yield from (("S504", line) for line, name in locators if name not in persistent)
    defined, used = {}, {}
    for stanza in stanzas:
        for line, name in stanza.all("VariableClass"):
            (defined if stanza.kind == "ResourceVariableClass" else used).setdefault(name, line)
    yield from (("S505", line) for name, line in used.items() if name not in defined)
    if used.keys() <= defined.keys():
        yield from (("S530", line) for name, line in defined.items() if name not in used)


# ---- What belongs together -----------------------------------------------------


def lone(stanzas):
    """S528"""
    for stanza in stanzas:
        if stanza.value("Expression") is None:
            yield from (("S528", line) for line, _ in stanza.all("ReArmExpression", "ExpressionDescription"))
        if stanza.value("ReArmExpression") is None:
            yield from (("S528", line) for line, _ in stanza.all("ReArmDescription"))


def groups(stanzas):
    """S529"""
    names = {}
    for stanza in stanzas:
        number, name = stanza.value("GroupID"), stanza.value("GroupName")
        if number is not None and integer(number) == 255:
            yield "S529", stanza.line_of("GroupID")
        if name is None:
            continue
        if number is None:
            yield "S529", stanza.line_of("GroupName")
        elif integer(name) != 0 and names.setdefault(integer(number), integer(name)) != integer(name):
            yield "S529", stanza.line_of("GroupName")


def is_balanced(text):
    """Whether all parentheses and quotes come in pairs."""
    depth, quote, escaped = 0, "", False
    for letter in text:
        if quote:
            quote = "" if letter == quote else quote
        elif letter not in "\"'" and (escaped or letter == "\\"):
            escaped = not escaped
            continue
        elif letter in "\"'":
            quote = letter
        elif letter in "()":
            depth += 1 if letter == "(" else -1
            if depth < 0:
                return False
        escaped = False
    return depth == 0 and not quote


def unbalanced(stanzas):
    """S537"""
    for stanza in stanzas:
        yield from (("S537", line) for line, text in stanza.all("Expression", "ReArmExpression")
                    if not is_balanced(text))


def runs(stanzas):
    """S502 and S518"""
    for before, stanza, after in zip([None, *stanzas], stanzas, [*stanzas[1:], None]):
        follows = after.kind if after else None
        if stanza.kind in ATTRIBUTES and stanza.value("DataType") in ("SD", "SDArray"):
            if follows not in ATTRIBUTE_RUNS:
                yield "S502", stanza.line
        if before and before.kind in ATTRIBUTE_RUNS and stanza.kind.endswith("SDDefinition"):
            if stanza.kind != before.kind:
                yield "S518", stanza.line
        if before and stanza.kind in ATTRIBUTE_RUNS and before.kind in ATTRIBUTES:
            if before.kind not in ATTRIBUTE_RUNS[stanza.kind]:
                yield "S518", stanza.line


RULES = (invalid_defaults, overlaps, same_names, same_ids, unknown_names, lone, groups, unbalanced, runs)
CODES = {"S502", "S504", "S505", "S506", "S507", "S518", "S528", "S529", "S530", "S533", "S534", "S535", "S536", "S537"}


# ---- Comparing -----------------------------------------------------------------


def differences(paths):
    """The differences for some sources."""
    result = subprocess.run([PROGRAMS.cdef, "check", "--format", "json", *paths], capture_output=True, timeout=600)
    if result.returncode != 0 or result.stderr:
        return [f"status {result.returncode}: {result.stderr!r} for {paths}"]
    problems = []
    for path, checked in zip(paths, json.loads(result.stdout)["sources"]):
        stanzas = stanzas_of(path.read_bytes())
        expected = sorted({each for rule in RULES for each in rule(stanzas)})
        found = sorted((each["code"], each["line"]) for each in checked["findings"] if each["code"] in CODES)
        if found != expected:
            problems.append(f"{path}: missing {set(expected) - set(found)}, too many {set(found) - set(expected)}")
    return problems


@pytest.mark.slow(2)
@pytest.mark.parametrize("group", range(GROUPS))
def test_warnings(group, directory):
    """The sources of a group."""
    count = PROGRAMS.cases or (SANITIZED_COUNT if PROGRAMS.sanitizers else COUNT)
    share = -(-count // GROUPS)
    first = (PROGRAMS.round * GROUPS + group) * share
    paths = [directory / f"{seed}.cdefsrc" for seed in range(first, first + share)]
    problems = []
    for start in range(0, len(paths), BATCH):
        batch = paths[start:start + BATCH]
        for path in batch:
            path.write_bytes(generate_sources.source(int(path.stem))[0])
        problems += differences(batch)
    none(problems)
