"""Convert the JSON of `cdef dump` to its listing, following the description of both in docs/dump.md.

The listings of the cases were written by hand. If the conversion gives the same text, the JSON has the same facts in
the same order.
"""

import unicodedata

import cdb_image

HEXADECIMAL = {"rc_perm_temp", "rc_perm_tempC", "re_props"}
TITLES = {
    "persistent_class_attributes": "persistent class attribute",
    "dynamic_class_attributes": "dynamic class attribute",
    "persistent_resource_attributes": "persistent resource attribute",
    "dynamic_resource_attributes": "dynamic resource attribute",
    "class_actions": "class action",
    "resource_actions": "resource action",
    "errors": "error",
    "dependencies": "dependency",
    "sections": "section",
    "vl_values": "variety",
    "vv_values": "valid value",
    "sd_fields": "element",
    "variable_class": "variable class",
}
NAMES = ("u_rc_name", "u_ra_name", "u_ac_name", "u_re_name", "u_sd_field_name", "u_rm_RMname", "u_rvc_name")
VALUES = {"ra_dflt_value", "ra_init_value", "ra_min_value", "ra_max_value", "vv_low_val", "vv_high_val"}
ELEMENTS = {name: name[:-5] for name in cdb_image.TYPE_NAMES if name.endswith("Array")}
ESCAPES = {"\t": "\\t", "\n": "\\n", "\r": "\\r", '"': '\\"', "\\": "\\\\"}


def quoted(text):
    """Text in the quotes of a listing; bytes that are not UTF-8 are given as {'bytes': hex}."""
    if isinstance(text, dict):
        text = bytes.fromhex(text["bytes"]).decode("utf-8", "surrogateescape")
    shown = ""
    for c in text:
        hidden = unicodedata.category(c) in ("Cc", "Cf", "Cs", "Zl", "Zp")
        octets = c.encode("utf-8", "surrogateescape") if hidden else b""
        shown += ESCAPES.get(c) or "".join(f"\\x{octet:02x}" for octet in octets) or c
    return f'"{shown}"'


def real(number):
    """The digits of a float, as C++ writes them."""
    return number if isinstance(number, str) else repr(number).removesuffix(".0")


class Listing:
    """Converts JSON to a listing, following docs/dump.md."""

    def __init__(self):
        self.lines = []

    def line(self, depth, text):
        """One fact or heading."""
        self.lines.append("  " * depth + text)

    def fact(self, depth, key, value, title=None):
        """A member that is a fact or a value."""
        title = title or key
        if value is None:
            shown = "none"
        elif key in HEXADECIMAL:
            shown = hex(value)
        elif isinstance(value, list):
            shown = ", ".join(value) or "none"
        elif isinstance(value, dict) and "correct" in value:
            shown = "correct" if value["correct"] else f"wrong, {value['found']} in the place of {value['expected']}"
        elif isinstance(value, dict) and "number" in value:
            known = f"{value['kind']} {quoted(value['name'])}" if value["kind"] else "unknown"
            shown = f"{value['number']}, {known}"
        elif key.startswith("u_") and not isinstance(value, int):
            shown = quoted(value)
        elif isinstance(value, dict):
            shown = "0x" + value["bytes"]
        else:
            shown = str(value)
        self.line(depth, f"{title}: {shown}")

    def value(self, depth, title, value, kind):
        """A typed value."""
        if value is None:
            return self.line(depth, f"{title}: none")
        if kind in ELEMENTS or kind == "SD":
            heading = kind if title == kind else f"{title}: {kind}"
            self.line(depth, heading + ("" if value else ", empty"))
            for element in value:
                of = element["data_type"] if kind == "SD" else ELEMENTS[kind]
                self.value(depth + 1, of, element["value"] if kind == "SD" else element, of)
            return None
        if kind == "String":
            shown = quoted(value)
        elif kind == "Binary":
            shown = "0x" + value["bytes"]
        elif kind == "RH":
            shown = " ".join(map(hex, [value["header"], *value["id"]]))
        else:
            shown = real(value) if kind.startswith("Float") else str(value)
        return self.line(depth, f"{title}: {shown}")

    def record(self, depth, title, record, kind):
        """A group under a heading."""
        name = next((" " + quoted(record[key]) for key in NAMES if key in record), "")
        self.line(depth, title + name)
        self.members(depth + 1, record, kind)

    def members(self, depth, record, kind=None):
        """All members of a group. kind: the data type of its values, if the group does not contain it."""
        kind = record.get("ra_data_type", record.get("sd_field_type", kind))
        for key, value in record.items():
            if key in VALUES:
                self.value(depth, key, value, kind)
            elif key == "variables":
                for member in value:
                    self.fact(depth, key, member, "variable")
            elif key in TITLES and isinstance(value, list):
                for member in value:
                    self.record(depth, TITLES[key], member, ELEMENTS.get(kind, kind))
            elif isinstance(value, dict) and not value.keys() & {"correct", "number", "bytes"}:
                self.record(depth, TITLES.get(key, key), value, kind)
            else:
                self.fact(depth, key, value, key.replace("_", " ") if key == "byte_order" else None)
