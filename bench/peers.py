"""Other programs that compile text to a binary form, and what they get to compile.

Each input holds the same definitions as the mixed source that cdgen gets: name,
message numbers, number, type, varieties, group, properties, range and default,
written as is usual in that program's language.
"""

import shlex
import struct
import typing
import xml.sax.saxutils

from generate import TYPES, definitions

INTEGER_TYPES = ("Int32", "UInt32", "Int64", "UInt64")
FLOAT_TYPES = ("Float32", "Float64")
ROW_BYTES = 4  # of a glyph
GROUP = 100  # definitions in a group, for programs whose time grows with the square of the length of a list


class Peer(typing.NamedTuple):
    """A program, its input, and how it is called in the directory of its input."""

    name: str
    files: dict  # file name: function of the count of definitions, to pieces of text
    source: str  # the file whose bytes count
    command: str  # @OUT@ is the file to make, which is removed before each run
    out: str
    stdin: str = "/dev/null"
    stdout: str = "/dev/null"


def scalar(definition):
    """The type of one value."""
    return definition.data_type.removesuffix("Array")


def is_number(definition):
    """Whether range and default are numbers."""
    return scalar(definition) in INTEGER_TYPES + FLOAT_TYPES


def quoted(text):
    """A string literal, as most languages write it."""
    return f'"{text}"'


def begin_group(index, end, begin):
    """The text in front of a definition in an input that is divided into groups."""
    if index % GROUP == 0:
        yield end if index else ""
        yield begin


def dts_value(definition, text):
    """One property value of a device tree, which has no floating point numbers."""
    kind = scalar(definition)
    if kind in ("Int32", "UInt32"):
        return f"<{text}>"
    if kind in ("Int64", "UInt64"):
        return f"/bits/ 64 <{text}>"
    if kind == "Binary":
        return f"[{text[2:]}]"
    return quoted(text)


def dts(count):
    """A device tree with a node for each definition, in groups of some: dtc takes no 10,000 nodes in one."""
    yield "/dts-v1/;\n/ {\n"
    for index, d in enumerate(definitions(count)):
        yield from begin_group(index, "};\n", f"group-{index} {{\n")
        low, high, default = (dts_value(d, text) for text in (d.low, d.high, d.default))
        yield (f"\tattribute-{d.number} {{\n\t\tname-text = \"{d.name}\";\n\t\tdescription = <{d.description}>;\n"
               f"\t\tdisplay-name = <{d.display}>;\n\t\tid = <{d.number}>;\n\t\tdata-type = \"{d.data_type}\";\n"
               f"\t\tvariety-range = <{d.varieties[0]} {d.varieties[1]}>;\n\t\tgroup-id = <{d.group}>;\n"
               f"\t\tgroup-name = <{d.group_name}>;\n\t\tproperties = {', '.join(map(quoted, d.properties))};\n"
               f"\t\tvalid-low = {low};\n\t\tvalid-high = {high};\n\t\tdefault-value = {default};\n\t}};\n")
    yield "};\n};\n"


def po(count):
    """A message catalog with an entry for each definition, whose fields are the lines of its text."""
    yield 'msgid ""\nmsgstr "Content-Type: text/plain; charset=UTF-8\\n"\n\n'
    for d in definitions(count):
        fields = (("Description", d.description), ("DisplayName", d.display), ("Id", d.number),
                  ("DataType", d.data_type), ("VarietyRange", "{},{}".format(*d.varieties)), ("GroupID", d.group),
                  ("GroupName", d.group_name), ("Properties", ",".join(d.properties)),
                  ("ValidValue", f"{d.low},{d.high}"), ("DefaultValue", d.default))
        lines = "".join(f'"{name}={value} "\n' for name, value in fields)
        yield f'msgid "{d.name}"\nmsgstr ""\n{lines}\n'


FBS = """\
table Definition {
  name: string; description: ushort; display_name: ushort; id: uint; data_type: string;
  variety_low: uint; variety_high: uint; group_id: ushort; group_name: ushort; properties: [string];
  low: ulong; high: ulong; default_value: ulong;
  float_low: double; float_high: double; float_default: double;
  text_low: string; text_high: string; text_default: string;
}
table Definitions { attributes: [Definition]; }
root_type Definitions;
"""


def range_fields(d):
    """The names of the three value fields for a definition's type, and how their values are written."""
    if scalar(d) in INTEGER_TYPES:
        return ("low", "high", "default_value"), str
    if scalar(d) in FLOAT_TYPES:
        return ("float_low", "float_high", "float_default"), str
    return ("text_low", "text_high", "text_default"), quoted


def value_fields(d):
    """Range and default as pairs of field name and literal."""
    names, write = range_fields(d)
    return zip(names, map(write, (d.low, d.high, d.default)))


def number_fields(d):
    """The plain numbers as pairs of field name and literal."""
    return (("description", d.description), ("display_name", d.display), ("id", d.number),
            ("variety_low", d.varieties[0]), ("variety_high", d.varieties[1]), ("group_id", d.group),
            ("group_name", d.group_name))


def json(count):
    """Structured text for a schema."""
    separator = "["
    yield '{ "attributes": '
    for d in definitions(count):
        numbers = "".join(f'  "{name}": {value},\n' for name, value in number_fields(d))
        values = ",\n".join(f'  "{name}": {value}' for name, value in value_fields(d))
        yield (f'{separator}{{\n  "name": "{d.name}",\n{numbers}  "data_type": "{d.data_type}",\n'
               f'  "properties": [{", ".join(map(quoted, d.properties))}],\n{values}\n}}')
        separator = ",\n"
    yield "]}\n"


PROTO = """\
syntax = "proto3";
message Definition {
  string name = 1; uint32 description = 2; uint32 display_name = 3; uint32 id = 4; string data_type = 5;
  uint32 variety_low = 6; uint32 variety_high = 7; uint32 group_id = 8; uint32 group_name = 9;
  repeated string properties = 10;
  uint64 low = 11; uint64 high = 12; uint64 default_value = 13;
  double float_low = 14; double float_high = 15; double float_default = 16;
  string text_low = 17; string text_high = 18; string text_default = 19;
}
message Definitions { repeated Definition attributes = 1; }
"""


def textproto(count):
    """The text form of a message."""
    for d in definitions(count):
        numbers = "".join(f"  {name}: {value}\n" for name, value in number_fields(d))
        properties = "".join(f"  properties: {quoted(name)}\n" for name in d.properties)
        values = "".join(f"  {name}: {value}\n" for name, value in value_fields(d))
        yield (f'attributes {{\n  name: "{d.name}"\n{numbers}  data_type: "{d.data_type}"\n{properties}{values}}}\n')


DIRECTIVES = {"Int32": ".long", "UInt32": ".long", "Int64": ".quad", "UInt64": ".quad", "Float32": ".float",
              "Float64": ".double"}


def assembly(count):
    """Data directives of an assembler."""
    yield "\t.data\n"
    for d in definitions(count):
        directive = DIRECTIVES.get(scalar(d), ".asciz")
        write = str if is_number(d) else quoted
        values = "".join(f"\t{directive} {write(text)}\n" for text in (d.low, d.high, d.default))
        yield (f"attribute_{d.number}:\n\t.asciz \"{d.name}\"\n\t.short {d.description}\n\t.short {d.display}\n"
               f"\t.long {d.number}\n\t.asciz \"{d.data_type}\"\n\t.long {d.varieties[0]}, {d.varieties[1]}\n"
               f"\t.short {d.group}\n\t.short {d.group_name}\n\t.asciz {', '.join(map(quoted, d.properties))}\n"
               f"{values}")


BDF_HEAD = """\
STARTFONT 2.1
FONT -bench-definitions-medium-r-normal--8-80-75-75-c-80-iso10646-1
SIZE 8 75 75
FONTBOUNDINGBOX 32 32 0 0
STARTPROPERTIES 2
FONT_ASCENT 32
FONT_DESCENT 0
ENDPROPERTIES
CHARS {count}
"""


PROPERTIES = ("ReqdForDefine", "Public")
BINARY_FORMS = {"Int32": ">i", "UInt32": ">I", "Int64": ">q", "UInt64": ">Q", "Float32": ">f", "Float64": ">d"}


def value_bytes(definition, text):
    """A value in binary form; a text by its characters."""
    form = BINARY_FORMS.get(scalar(definition))
    if form is None:
        return text.encode("ascii")
    return struct.pack(form, float(text) if scalar(definition) in FLOAT_TYPES else int(text))


def bitmap(d):
    """What a definition has besides its name, as rows of 32 bits. Properties have a bit each."""
    properties = sum(1 << PROPERTIES.index(name) for name in d.properties)
    numbers = (d.description, d.display, d.number, TYPES.index(d.data_type), *d.varieties, d.group, d.group_name,
               properties)
    values = b"".join(value_bytes(d, text) for text in (d.low, d.high, d.default))
    bits = struct.pack(">9I", *numbers) + values + bytes(-len(values) % ROW_BYTES)
    return [bits[at:at + ROW_BYTES].hex().upper() for at in range(0, len(bits), ROW_BYTES)]


def bdf(count):
    """A bitmap font with a glyph for each definition."""
    yield BDF_HEAD.format(count=count)
    for index, d in enumerate(definitions(count)):
        rows = bitmap(d)
        lines = "".join(f"{row}\n" for row in rows)
        yield (f"STARTCHAR {d.name}\nENCODING {index}\n"
               f"SWIDTH {d.description % 1000} 0\nDWIDTH {1 + d.display % 100} 0\n"
               f"BBX 32 {len(rows)} 0 0\nBITMAP\n{lines}ENDCHAR\n")
    yield "ENDFONT\n"


GLIB_TYPES = {"Int32": "i", "UInt32": "u", "Int64": "x", "UInt64": "t", "Float32": "d", "Float64": "d"}


def gschema(count):
    """Settings schemas with a key for each definition."""
    yield "<schemalist>\n"
    for index, d in enumerate(definitions(count)):
        yield from begin_group(index, "</schema>\n",
                               f'<schema id="org.example.group{index}" path="/org/example/group{index}/">\n')
        number = is_number(d)
        kind = GLIB_TYPES.get(scalar(d), "s")
        bounds = f'    <range min="{d.low}" max="{d.high}"/>\n' if number else ""
        default = d.default if number else xml.sax.saxutils.escape(f"'{d.default}'")
        key = d.name.lower().replace("_", "-")
        yield (f'  <key name="{key}" type="{kind}">\n{bounds}    <default>{default}</default>\n'
               f"    <summary>{d.description} {d.display} {d.number} {d.group} {d.group_name}</summary>\n"
               f"    <description>{d.data_type} {d.varieties[0]},{d.varieties[1]} {','.join(d.properties)}"
               f"</description>\n  </key>\n")
    yield "</schema>\n</schemalist>\n"


PEERS = (
    Peer("dtc", {"in.dts": dts}, "in.dts", "dtc -q -q -I dts -O dtb -o out.dtb in.dts", "out.dtb"),
    Peer("msgfmt", {"in.po": po}, "in.po", "msgfmt -o out.mo in.po", "out.mo"),
    Peer("flatc", {"in.json": json, "in.fbs": lambda _: [FBS]}, "in.json", "flatc -b in.fbs in.json", "in.bin"),
    Peer("as", {"in.s": assembly}, "in.s", "as -o out.o in.s", "out.o"),
    Peer("bdftopcf", {"in.bdf": bdf}, "in.bdf", "bdftopcf -o out.pcf in.bdf", "out.pcf"),
    Peer("glib-compile-schemas", {"in.gschema.xml": gschema}, "in.gschema.xml", "glib-compile-schemas --strict .",
         "gschemas.compiled"),
    Peer("protoc --encode", {"in.txt": textproto, "in.proto": lambda _: [PROTO]}, "in.txt",
         "protoc --encode=Definitions in.proto", "out.pb", "in.txt", "out.pb"),
)


def prepare(peer, directory, count):
    """Writes a peer's input files."""
    for name, pieces in peer.files.items():
        with open(directory / name, "w", encoding="ascii") as file:
            file.writelines(pieces(count))


def arguments(peer):
    """A peer's command line, as a list."""
    return shlex.split(peer.command)
