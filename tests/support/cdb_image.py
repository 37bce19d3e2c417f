"""Assemble an expected database image from a hand-written description.

The golden cases state what a compiled file must hold, record by record.  This
module turns such a description into bytes for either byte order.  It shares
nothing with the compiler: its record tables were typed in from the format
documentation a second time, so a slip in one of the two shows as a difference.

Notation, one item a line ('//' starts a comment, a line that begins with '+'
continues the line before it):

    let NAME field=value ...      a named group of fields, used as $NAME
    include FILE                  another description, beside the case
    section class|manager|map|varclass
    rsrc_pattr_t:9 $GROUP field=value ...
                                  a record; ':9' sets its identifier to 'CDB9';
                                  fields left out are zero, later ones win
    variety_list_t:g 0,10 20,30   a list with its entries (count follows)
    valid_values_t:5 Int32:1,Int32:2,12 ...
                                  low, high and display message of each entry
    sd_def_t:f sd_count=2         a definition header; sd_field lines follow
    string "text"                 text with its NUL, padded to eight bytes
    array TYPE v v v              count, pad word and eight-byte cells
    sd TYPE:v TYPE:v              structured data with its elements
    sd-empty                      structured data without elements (24 bytes)
    binary-length N               the length word of a Binary, padded
    bytes 41 42                   data bytes, padded to eight
    handle                        an all-zero resource handle, padded
    var_ids 0x8005 5              variable IDs, padded
    hex 43 44 42 31               bytes as they stand, no padding

A value cell is TYPE:value; for a type kept out of line the value is its offset
in the string table, 'none' sets only the first word to ones, 'ones' all eight
bytes.  STORED@TURNED:value is a cell written as one type and reversed as
another.  A line that begins with 'still' describes something that nothing
refers to, so a reversal leaves it in the native order.

Anchors, section offsets and lengths, counts in the header, the maximum IDs and
the checksum are worked out; every other number is the case's own.
"""

import json
import pathlib
import struct
import sys

HEADER_SIZE = 80
ANCHOR_SIZE = 16
FORMAT_WORD = 0x666D7431
RECORD_SIZES = (224, 60, 24, 40, 72, 136, 56, 48, 8)
SECTION_TYPES = {"class": 5, "manager": 3, "map": 6, "varclass": 4}
NONE = 0xFFFFFFFF

# Source name of each data type, in code order.
TYPE_NAMES = (
    "UNKNOWN None Int32 UInt32 Int64 UInt64 Float32 Float64 String Binary RH SD SBS "
    "Int32Array UInt32Array Int64Array UInt64Array Float32Array Float64Array "
    "StringArray BinaryArray RHArray SDArray"
).split()

# How the first bytes of a cell of each type are written.  A cell kept out of
# line is an unsigned 32-bit offset; the remaining types have no cell to write.
CELL_CODES = dict(
    Int32="i", UInt32="I", Int64="q", UInt64="Q", Float32="f", Float64="d", String="I", Binary="I", RH="I", SD="I"
)

# name:kind; 2 and 4 are numbers that a reversal turns, 's2' is a 16-bit field
# that stays as it is, 'ref' an eight-byte reference of which the first word
# turns, 'refs' a reference that stays, 'val' a value cell.
LAYOUTS_TEXT = {
    "rsrc_class_t": """
        rc_cb_ID:4 rc_props:4 u_rc_name:ref u_rc_alias:ref u_rc_pattrsC:ref u_rc_dattrsC:ref
        u_rc_pattrs:ref u_rc_dattrs:ref u_rc_def_input:ref u_rc_undef_input:ref
        u_rc_online_input:ref u_rc_offline_input:ref u_rc_reset_input:ref u_rc_actionsC:ref
        u_rc_actions:ref u_rc_errors:ref u_rc_depends:ref u_rc_variety_lists:ref
        u_rc_sbs_defs:ref u_rc_sd_defs:ref u_rc_valid_vals:ref u_rc_strings:ref
        rc_num_pattrsC:2 rc_num_dattrsC:2 rc_num_pattrs:2 rc_num_dattrs:2
        rc_num_actionsC:2 rc_num_actions:2 rc_num_errors:2 rc_num_depends:2
        rc_varlist_size:4 rc_sbs_size:4 rc_sd_size:4 rc_valval_size:4
        rc_perm_temp:4 rc_perm_tempC:4 rc_class_id:2 rc_dscr_msgid:2 rc_disp_msgid:2
        rc_locator:2 rc_version:4 rc_spare0:s2 rc_spare1:s2""",
    "rsrc_pattr_t": """
        ra_cb_ID:4 ra_props:4 u_ra_name:ref ra_dscr_msgid:2 ra_disp_msgid:2
        ra_group_msgid:2 ra_group_id:2 ra_dflt_value:val ra_attr_id:4 ra_data_type:4
        u_ra_variety_list:ref u_ra_valid_vals:ref u_ra_sd:ref ra_max_sd_idx:2
        ra_reserved2_0:s2 ra_reserved2_1:s2 ra_reserved2_2:s2""",
    "rsrc_dattr_t": """
        ra_cb_ID:4 ra_props:4 u_ra_name:ref u_ra_vclass:ref u_ra_next_in_vclass:ref
        ra_init_value:val ra_min_value:val ra_max_value:val u_ra_variety_list:ref
        u_ra_valid_vals:ref u_ra_sd:ref u_ra_express:ref u_ra_rearm_expr:ref
        u_ra_ZAV_name:ref ra_data_type:4 ra_var_type:4 ra_dscr_msgid:2 ra_disp_msgid:2
        ra_group_msgid:2 ra_group_id:2 ra_attr_id:4 ra_max_sd_idx:2 ra_expr_desc:2
        ra_rearm_desc:2 ra_range_desc:2 ra_report_interval:s2 ra_reserved:s2""",
    "rsrc_action_t": """
        ac_cb_ID:4 ac_action_id:4 ac_props:4 ac_dscr_msgid:2 ac_disp_msgid:2
        ac_confirm_msgid:2 ac_timeout:2 ac_perms:4 u_ac_name:ref u_ac_variety_list:ref
        u_ac_sd_input:ref u_ac_sd_resp:ref""",
    "variety_list_t": "vl_cb_ID:4 vl_count:4",
    "vl_entry": "vl_low_val:4 vl_high_val:4",
    "valid_values_t": "vv_cb_ID:4 vv_count:4",
    "vv_entry": "vv_low_val:val vv_high_val:val vv_disp_msgid:2 vv_reserved0:s2 vv_reserved1:s2 vv_reserved2:s2",
    "sd_def_t": "sd_cb_ID:4 sd_count:4",
    "sd_field": """
        u_sd_field_name:ref sd_field_type:4 sd_disp_msgid:2 sd_dscr_msgid:2
        u_sd_valid_vals:ref sd_action_id:4 sd_valid_type:2 sd_reserved:s2""",
    "rsrc_mgr_t": "rm_cb_ID:4 rm_id:2 rm_spare:2 u_rm_RMname:ref u_rm_strings_table:refs",
    "rsrc_cmmap_t": """
        rcm_cb_ID:4 rcm_class_ID:2 rcm_rm_ID:2 u_rcm_msg_file:ref u_rcm_strings:ref
        rcm_dscr_msg_set:2 rcm_first_key:2 rcm_last_key:2 rcm_asnno_start:2
        rcm_num_sctx:2 rcm_num_vctx:2 rcm_num_stats:2 rcm_num_ctx_tmplts:2
        rcm_static_contexts:4 rcm_volatile_contexts:4 rcm_stats:4 rcm_ctx_tmplts:4
        rcm_reserved0:s2 rcm_reserved1:s2""",
    "rsrc_variable_class_t": """
        rvc_cb_ID:4 rvc_obsv_interval:2 rvc_report_interval:2 u_rvc_name:ref
        u_rvc_compat_name:ref rvc_var_count:4 u_rvc_string_tbl:ref
        rvc_reserved0:s2 rvc_reserved1:s2""",
}
LAYOUTS = {
    record: [tuple(item.split(":")) for item in fields.split()] for record, fields in LAYOUTS_TEXT.items()
}
WIDTHS = {"2": 2, "4": 4, "s2": 2, "ref": 8, "refs": 8, "val": 8}
EXPECTED_SIZES = dict(
    rsrc_class_t=224, rsrc_pattr_t=72, rsrc_dattr_t=136, rsrc_action_t=56, rsrc_mgr_t=24, rsrc_cmmap_t=60,
    rsrc_variable_class_t=40, variety_list_t=8, vl_entry=8, valid_values_t=8, vv_entry=24, sd_def_t=8, sd_field=32,
)
for _record, _fields in LAYOUTS.items():
    assert sum(WIDTHS[kind] for _, kind in _fields) == EXPECTED_SIZES[_record], _record


class NotationError(Exception):
    """A description that cannot be assembled; the text names the line."""


def mark(order):
    """The prefix for struct of a byte order."""
    return {"little": "<", "big": ">"}[order]


def other(order):
    """The opposite byte order."""
    return "big" if order == "little" else "little"


def number(text):
    """A number as a case writes it: decimal, 0x hexadecimal, or 'none'."""
    return NONE if text == "none" else int(text, 0)


def type_code(name):
    """The code of a data type given by name or number."""
    return TYPE_NAMES.index(name) if name in TYPE_NAMES else int(name, 0)


def element_type(name):
    """The element type of an array type; any other type unchanged."""
    return name[:-5] if name.endswith("Array") else name


def pad8(data):
    """Data followed by zero bytes up to a multiple of eight."""
    return data + bytes(-len(data) % 8)


def cell_width(name):
    """The number of bytes of a cell of this type that a reversal reverses."""
    if name in ("UNKNOWN", "None", "SBS"):
        return 0
    return 8 if name in ("Int64", "UInt64", "Float64") else 4


def cell(text, order, native):
    """An eight-byte value cell: written in native order, then reversed according to its type."""
    if text == "none":
        return struct.pack("<II", NONE, 0)
    if text == "ones":
        return b"\xff" * 8
    if text == "0":
        return bytes(8)
    types, value = text.split(":", 1)
    stored, _, turned = types.partition("@")
    turned = turned or stored
    if value == "none":
        data = struct.pack("<II", NONE, 0)
    elif value == "ones":
        data = b"\xff" * 8
    else:
        name = "UInt32" if stored.endswith("Array") else stored
        code = CELL_CODES.get(name)
        if code is None:
            data = bytes.fromhex(value).ljust(8, b"\0") if value != "0" else bytes(8)
        else:
            parsed = float(value) if code in "fd" else number(value)
            data = struct.pack(mark(native) + code, parsed).ljust(8, b"\0")
    width = cell_width(turned) if order != native else 0
    return data[:width][::-1] + data[width:]


class Image:
    """The image under construction: its bytes, their labels, and the starts of its sections."""

    def __init__(self, order, native):
        self.order = order
        self.native = native
        self.body = bytearray()
        self.labels = []  # (offset in body, length, label)
        self.sections = []  # (type, offset in body)
        self.max_ids = {"rm_id": 0, "rc_class_id": 0}

    def put(self, data, label):
        """Appends bytes with a label for the report of a failure."""
        self.labels.append((len(self.body), len(data), label))
        self.body += data

    def number(self, width, value, order):
        """An unsigned field; negative numbers are taken modulo its width."""
        return (value % (1 << (8 * width))).to_bytes(width, order)

    def record(self, name, cb_char, fields, still=False):
        """Append one record, field by field."""
        order = self.native if still else self.order
        layout = LAYOUTS[name]
        known = {field for field, _ in layout}
        for field in fields:
            if field not in known:
                raise NotationError(f"{name} has no field {field}")
        if cb_char:
            first = layout[0][0]
            fields = {first: str(0x43444200 + ord(cb_char)), **fields}
        for field, kind in layout:
            text = fields.get(field, "0")
            if field in self.max_ids:
                self.max_ids[field] = max(self.max_ids[field], number(text))
            if kind == "val":
                data = cell(text, order, self.native)
            elif kind in ("ref", "refs"):
                data = self.number(4, number(text), self.native if kind == "refs" else order) + bytes(4)
            elif kind == "s2":
                data = self.number(2, number(text), self.native)
            elif field.endswith("_type") and kind == "4" and field != "ra_var_type":
                data = self.number(4, type_code(text), order)
            else:
                data = self.number(int(kind), number(text), order)
            self.put(data, f"{name}.{field}")

    def variety_list(self, cb_char, entries, still):
        """Append a variety list and its entries."""
        self.record("variety_list_t", cb_char, {"vl_count": str(len(entries))}, still)
        for entry in entries:
            low, high = entry.split(",")
            self.record("vl_entry", None, {"vl_low_val": low, "vl_high_val": high}, still)

    def valid_values(self, cb_char, entries, still):
        """Append a valid-values list and its entries."""
        self.record("valid_values_t", cb_char, {"vv_count": str(len(entries))}, still)
        for entry in entries:
            low, high, *disp = entry.split(",")
            fields = {"vv_low_val": low, "vv_high_val": high, "vv_disp_msgid": disp[0] if disp else "0"}
            self.record("vv_entry", None, fields, still)

    def array(self, name, values, still):
        """Append an array value: count, pad word and cells."""
        order = self.native if still else self.order
        self.put(self.number(4, len(values), order) + bytes(4), "array.element_count")
        for index, value in enumerate(values):
            self.put(cell(f"{name}:{value}", order, self.native), f"array.elements[{index}]")

    def structured(self, elements, still):
        """Append a structured-data value; each element names its type."""
        order = self.native if still else self.order
        self.put(self.number(4, len(elements), order) + bytes(4), "sd.element_count")
        for index, element in enumerate(elements):
            code = type_code(element.split(":", 1)[0].split("@")[0])
            self.put(self.number(4, code, order) + bytes(4), f"sd.elements[{index}].data_type")
            self.put(cell(element, order, self.native), f"sd.elements[{index}].value")

    def finish(self):
        """The whole file: header, anchors, sections and the checksum."""
        base = HEADER_SIZE + ANCHOR_SIZE * len(self.sections)
        total = base + len(self.body)
        prefix = mark(self.order)
        header = struct.pack(
            prefix + "7I", total - 4, 0, FORMAT_WORD, 0, 0, 0, len(self.sections)
        )
        header += struct.pack(prefix + "2H", self.max_ids["rm_id"], self.max_ids["rc_class_id"])
        header += struct.pack(prefix + "9H", *RECORD_SIZES) + bytes(30)
        ends = [start for _, start in self.sections[1:]] + [len(self.body)]
        anchors = b"".join(
            struct.pack(prefix + "4I", kind, base + start, end - start, 0)
            for (kind, start), end in zip(self.sections, ends)
        )
        data = bytearray(header + anchors + self.body)
        struct.pack_into(prefix + "I", data, 4, checksum(data, self.order))
        labels = [(0, HEADER_SIZE, "header"), (HEADER_SIZE, base - HEADER_SIZE, "anchors")]
        labels += [(base + at, length, label) for at, length, label in self.labels]
        return bytes(data), labels


def checksum(data, order):
    """The header's checksum: the length word and every word from offset 8."""
    words = struct.unpack(mark(order) + f"{len(data) // 4}I", bytes(data[: len(data) // 4 * 4]))
    value = words[0]
    for word in words[2:]:
        value ^= word
    return value


def logical_lines(text, base_dir):
    """Lines without comments, continuations joined, includes replaced."""
    joined = []
    for line in text.splitlines():
        line = line.split("//", 1)[0].strip()
        if line.startswith("+") and joined:
            joined[-1] += " " + line[1:].strip()
        elif line:
            joined.append(line)
    for line in joined:
        if line.startswith("include "):
            path = pathlib.Path(base_dir) / line.split(None, 1)[1]
            yield from logical_lines(path.read_text(), path.parent)
        else:
            yield line


def fields_of(tokens, groups):
    """The fields of a record line, with $GROUP tokens replaced."""
    fields = {}
    for token in tokens:
        if token.startswith("$"):
            fields.update(groups[token[1:]])
        else:
            name, _, value = token.partition("=")
            fields[name] = value
    return fields


def put_line(image, line, groups):
    """Appends what one line of the description means."""
    still = line.startswith("still ")
    if still:
        line = line[len("still "):].strip()
    word, _, rest = line.partition(" ")
    order = image.native if still else image.order
    record, _, cb_char = word.partition(":")
    tokens = rest.split()
    if word == "let":
        groups[tokens[0]] = fields_of(tokens[1:], groups)
    elif word == "section":
        image.sections.append((SECTION_TYPES[rest.strip()], len(image.body)))
    elif record == "variety_list_t" and not any("=" in token for token in tokens):
        image.variety_list(cb_char, tokens, still)
    elif record == "valid_values_t" and not any("=" in token for token in tokens):
        image.valid_values(cb_char, tokens, still)
    elif record in LAYOUTS:
        image.record(record, cb_char, fields_of(tokens, groups), still)
    elif word == "string":
        image.put(pad8(json.loads(rest).encode("latin-1") + b"\0"), f"string {rest}")
    elif word == "array":
        image.array(tokens[0], tokens[1:], still)
    elif word == "sd":
        image.structured(tokens, still)
    elif word == "sd-empty":
        image.put(bytes(24), "sd-empty")
    elif word == "binary-length":
        image.put(pad8(image.number(4, number(rest), order)), "binary-length")
    elif word == "bytes":
        image.put(pad8(bytes.fromhex(rest)), "bytes")
    elif word == "handle":
        image.put(bytes(24), "handle")
    elif word == "var_ids":
        image.put(pad8(b"".join(image.number(4, number(token), order) for token in tokens)), "var_ids")
    elif word == "hex":
        image.put(bytes.fromhex(rest), "hex")
    else:
        raise NotationError(f"unknown item {word}")


def assemble_labelled(text, order="little", native="little", base_dir="."):
    """The bytes of a description and the (offset, length, label) of its parts."""
    image = Image(order, native)
    groups = {}
    for line in logical_lines(text, base_dir):
        try:
            put_line(image, line, groups)
        except (NotationError, ValueError, KeyError, IndexError, struct.error) as problem:
            raise NotationError(f"{line}: {problem!r}") from problem
    return image.finish()


def assemble(text, order="little", native="little", base_dir="."):
    """The bytes of a description in one byte order."""
    return assemble_labelled(text, order, native, base_dir)[0]


def raw_hex(text):
    """A whole file, given as hexadecimal bytes with comments."""
    return bytes.fromhex(" ".join(line.split("//", 1)[0] for line in text.splitlines()))


def hex_lines(data):
    """Lines of sixteen bytes, as the report of a failure shows them."""
    return [f"{at:06x}  {data[at:at + 16].hex(' ')}" for at in range(0, len(data), 16)]


if __name__ == "__main__":
    source = pathlib.Path(sys.argv[1])
    print("\n".join(hex_lines(assemble(source.read_text(), *sys.argv[2:4], base_dir=source.parent))))
