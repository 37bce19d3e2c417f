"""Reverse the byte order of a finished database, field by field.

This is a second, small implementation of the rules of reversal, with which tests compare the compiler's option -s:
reading the native file and reversing it here must give the same bytes. References are followed before anything is
reversed. A list, a definition or a value that is reached twice is reversed once. These are not followed: a reference
to an object that is not completely inside its table or not at a multiple of four, a value cell that was never
filled, and an element of an array that is a bound.
"""

import struct
import sys

NONE = 0xFFFFFFFF
NESTING_MAX = 64  # values inside values; only a hand-made file goes deeper
CLASS, MANAGER, MAP, VARCLASS, HASH = 5, 3, 6, 4, 7


class Reverser:
    """One reversal: the native bytes, which are read, and the copy, which is reversed."""

    def __init__(self, image):
        self.native = image
        self.out = bytearray(image)
        self.mark = "<" if image[8:12] == b"1tmf" else ">"
        self.seen = set()
        self.depth = 0
        self.depth_max = NESTING_MAX

    def get(self, at, width=4):
        """A number in native order."""
        return struct.unpack_from(self.mark + {2: "H", 4: "I"}[width], self.native, at)[0]

    def turn(self, width, *places):
        """Reverses the bytes of fields of one width."""
        for at in places:
            self.out[at:at + width] = self.native[at:at + width][::-1]

    def table(self, record, offset, size):
        """Start and end of a side table."""
        start = record + self.get(record + offset)
        return start, start + size

    def target(self, table, offset, header, entry, count_at=4):
        """Where a reference leads, and how many entries stand there.

        Once only, and if the item fits its table; otherwise None.  The count
        is the word at byte 4 of a list and at byte 0 of a value.
        """
        at = table[0] + offset
        if offset == NONE or offset % 4 or at + header > table[1]:
            return None
        count = self.get(at + count_at)
        if at + header + entry * count > table[1] or at in self.seen:
            return None
        self.seen.add(at)
        return at, count

    def value(self, at, kind, strings):
        """A value cell and what it refers to."""
        if kind in (2, 3, 6, 8, 10):
            self.turn(4, at)
        elif kind in (4, 5, 7):
            self.turn(8, at)
        elif kind in (9, 11) or 13 <= kind <= 22:
            offset = self.get(at)
            if offset != 0 and self.depth < self.depth_max:  # 0 is the first name's place: the cell was never filled
                self.depth += 1
                self.out_of_line(offset, kind, strings)
                self.depth -= 1
            self.turn(4, at)

    def out_of_line(self, offset, kind, strings):
        """The target of a Binary, SD or array cell. The bytes of a Binary are not reversed."""
        header, entry = {9: (4, 0), 11: (8, 16)}.get(kind, (8, 8))
        found = self.target(strings, offset, header, entry, count_at=0)
        if not found:
            return
        at, count = found
        for element in range(at + header, at + header + entry * count, entry or 1):
            if kind == 11:
                self.value(element + 8, self.get(element), strings)
                self.turn(4, element)
            else:
                self.value(element, kind - 11, strings)
        self.turn(4, at)

    def variety(self, offset, tables):
        """A variety list."""
        found = self.target(tables["vl"], offset, 8, 8)
        if found:
            at, count = found
            self.turn(4, *range(at, at + 8 + 8 * count, 4))

    def valid(self, offset, kind, tables):
        """A list of valid values, whose bounds are reversed as the element type."""
        found = self.target(tables["vv"], offset, 8, 24)
        if found:
            at, count = found
            kind = kind - 11 if 13 <= kind <= 22 else kind
            for entry in range(at + 8, at + 8 + 24 * count, 24):
                self.value(entry, kind, tables["strings"])
                self.value(entry + 8, kind, tables["strings"])
                self.turn(2, entry + 16)
            self.turn(4, at, at + 4)

    def definition(self, offset, tables):
        """A structured-data definition and the valid values of its fields."""
        found = self.target(tables["sd"], offset, 8, 32)
        if found:
            at, count = found
            for field in range(at + 8, at + 8 + 32 * count, 32):
                self.valid(self.get(field + 16), self.get(field + 8), tables)
                self.turn(4, field, field + 8, field + 16, field + 24)
                self.turn(2, field + 12, field + 14, field + 28)
            self.turn(4, at, at + 4)

    def pattr(self, at, tables):
        """A persistent attribute."""
        kind = self.get(at + 36)
        self.variety(self.get(at + 40), tables)
        self.valid(self.get(at + 48), kind, tables)
        self.definition(self.get(at + 56), tables)
        self.value(at + 24, kind, tables["strings"])
        self.turn(4, at, at + 4, at + 8, at + 32, at + 36, at + 40, at + 48, at + 56)
        self.turn(2, at + 16, at + 18, at + 20, at + 22, at + 64)

    def dattr(self, at, tables):
        """A dynamic attribute; its reporting interval stays as it is."""
        kind = self.get(at + 104)
        self.variety(self.get(at + 56), tables)
        self.valid(self.get(at + 64), kind, tables)
        self.definition(self.get(at + 72), tables)
        self.value(at + 32, kind, tables["strings"])
        self.depth_max = 1  # elements of a bound may be numbers of another attribute's range
        for place in (40, 48):
            self.value(at + place, kind, tables["strings"])
        self.depth_max = NESTING_MAX
        self.turn(4, at, at + 4, *(at + place for place in (8, 16, 24, 56, 64, 72, 80, 88, 96, 104, 108, 120)))
        self.turn(2, *(at + place for place in (112, 114, 116, 118, 124, 126, 128, 130)))

    def action(self, at, tables):
        """An action with its input and response definitions."""
        self.variety(self.get(at + 32), tables)
        self.definition(self.get(at + 40), tables)
        self.definition(self.get(at + 48), tables)
        self.turn(4, at, at + 4, at + 8, at + 20, at + 24, at + 32, at + 40, at + 48)
        self.turn(2, at + 12, at + 14, at + 16, at + 18)

    def error(self, at, tables):
        """An error record."""
        self.variety(self.get(at + 24), tables)
        self.definition(self.get(at + 32), tables)
        self.turn(4, at, at + 4, at + 8, at + 16, at + 24, at + 32, at + 40)
        self.turn(2, at + 12, at + 14)

    def depend(self, at, _tables):
        """A dependency record."""
        self.turn(4, at)
        self.turn(2, at + 4)

    def records(self, at, offset, count, size, routine, tables):
        """Every record of one of a class's tables."""
        start = self.get(at + offset)
        if start != NONE:
            for index in range(self.get(at + count, 2)):
                routine(at + start + index * size, tables)

    def class_section(self, at, length):
        """A class: its tables in walking order, then its own record."""
        tables = {
            "strings": (at + self.get(at + 160), at + length),
            "vv": self.table(at, 152, self.get(at + 196)),
            "vl": self.table(at, 128, self.get(at + 184)),
            "sd": self.table(at, 144, self.get(at + 192)),
        }
        self.records(at, 24, 168, 72, self.pattr, tables)
        self.records(at, 32, 170, 136, self.dattr, tables)
        self.records(at, 40, 172, 72, self.pattr, tables)
        self.records(at, 48, 174, 136, self.dattr, tables)
        for place in (56, 64, 72, 80, 88):
            self.definition(self.get(at + place), tables)
        self.records(at, 96, 176, 56, self.action, tables)
        self.records(at, 104, 178, 56, self.action, tables)
        self.records(at, 112, 180, 48, self.error, tables)
        self.records(at, 120, 182, 8, self.depend, tables)
        self.turn(4, at, at + 4, *range(at + 8, at + 168, 8), *range(at + 184, at + 208, 4), at + 216)
        self.turn(2, *range(at + 168, at + 184, 2), *range(at + 208, at + 216, 2))

    def section(self, kind, at, length):
        """One data section."""
        if kind == CLASS:
            self.class_section(at, length)
        elif kind == MANAGER:
            self.turn(4, at, at + 8)
            self.turn(2, at + 4, at + 6)
        elif kind == VARCLASS:
            ids = at + 40 + self.get(at + 28)
            self.turn(4, *range(ids, ids + 4 * self.get(at + 24), 4))
            self.turn(4, at, at + 8, at + 16, at + 24, at + 28)
            self.turn(2, at + 4, at + 6)
        elif kind == MAP:
            self.turn(4, at, at + 8, at + 16, *range(at + 40, at + 56, 4))
            self.turn(2, at + 4, at + 6, *range(at + 24, at + 40, 2))
        elif kind == HASH:
            for block in range(at + 8200, at + 8200 + 24 * self.get(at + 8196), 24):
                self.turn(4, block, block + 8, block + 12, block + 16)
            self.turn(4, at, at + 8196)

    def whole(self):
        """The whole file: sections, anchors, header, a fresh checksum."""
        for anchor in range(80, 80 + 16 * self.get(24), 16):
            kind, at, length = (self.get(anchor + place) for place in (0, 4, 8))
            self.section(kind, at, length)
            self.turn(4, *range(anchor, anchor + 16, 4))
        self.turn(4, 0, 8, 12, 16, 20, 24)
        self.turn(2, *range(28, 50, 2))
        turned = ">" if self.mark == "<" else "<"
        words = (self.get(0) - 4) // 4
        value = struct.unpack_from(turned + "I", self.out, 0)[0]
        for word in struct.unpack_from(turned + f"{words}I", self.out, 8):
            value ^= word
        struct.pack_into(turned + "I", self.out, 4, value)
        return bytes(self.out)


def reverse(image):
    """A native image in the other byte order."""
    return Reverser(image).whole()


if __name__ == "__main__":
    with open(sys.argv[1], "rb") as source:
        result = reverse(source.read())
    with open(sys.argv[2], "wb") as target:
        target.write(result)
