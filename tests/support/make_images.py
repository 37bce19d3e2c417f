"""Make the images for the reader's tests, in both byte orders.

This does not use the compiler or the reader. The images are described by hand (NAME.image, in the notation of
cdb_image.py). The description of a broken image (broken/NAME.broken) names a sound image and the changes to it. The
results are NAME.little.cdef and NAME.big.cdef, and the same in broken/.

In addition to the items of cdb_image.py, a description may contain

    section 7                     a section of any type, by its number
    u16 N ..., u32 N ...          numbers without padding
    zeros N                       this number of zero bytes
    text "text"                   a text with its NUL, without padding

A broken image has 'key: value' lines; '//' begins a comment:

    base: NAME                    the sound image
    put: u8|u16|u32|cell AT VALUE writes a number at the offset AT; a cell is TYPE:VALUE
    hex: AT BYTES                 writes bytes, the same in both orders
    cut: SIZE                     cuts the file to this size
    append: BYTES                 appends bytes
    keep: length|checksum         does not correct the length or the checksum, because the case is about it
    order: native                 for the tests: only this machine's byte order
    finding...:                   for the tests, which compare it with the reader's findings

Length and checksum are corrected after the changes.

The worked example of docs/format.md is an image too, byte by byte: document. document.rows lists its fields.
"""

import argparse
import json
import pathlib
import re
import struct

import cdb_image

HERE = pathlib.Path(__file__).resolve().parents[1] / "image"
ORDERS = ("little", "big")
WIDTHS = {"u8": 1, "u16": 2, "u32": 4}
DOCUMENT = HERE.parent.parent / "docs" / "format.md"
DOCUMENT_ROW = re.compile(r"\| (\d+) \| `([0-9a-f ]+)` \| ?(.*) \|")


def numbers(width, texts, order):
    """Numbers of a width, in a byte order."""
    return b"".join((int(text, 0) % (1 << 8 * width)).to_bytes(width, order) for text in texts)


def put_line(image, line, groups):
    """Appends what one line of a description means."""
    word, _, rest = line.partition(" ")
    if word == "section" and rest.strip().isdigit():
        image.sections.append((int(rest), len(image.body)))
    elif word in WIDTHS:
        image.put(numbers(WIDTHS[word], rest.split(), image.order), word)
    elif word == "zeros":
        image.put(bytes(int(rest)), word)
    elif word == "text":
        image.put(json.loads(rest).encode("latin-1") + b"\0", word)
    else:
        cdb_image.put_line(image, line, groups)


def assemble(path, order):
    """The bytes of a description in one byte order, as a machine of that order would write them."""
    image = cdb_image.Image(order, order)
    groups = {}
    for line in cdb_image.logical_lines(path.read_text(), path.parent):
        try:
            put_line(image, line, groups)
        except (cdb_image.NotationError, ValueError, KeyError, IndexError) as problem:
            raise SystemExit(f"{path}: {line}: {problem!r}") from problem
    return image.finish()[0]


def document_rows():
    """Offset, bytes and content of each row of the worked example."""
    for line in DOCUMENT.read_text().splitlines():
        row = DOCUMENT_ROW.fullmatch(line)
        if row:
            yield int(row[1]), bytes.fromhex(row[2]), row[3]


def document():
    """The worked example, in little-endian order as it is printed."""
    data = bytearray()
    for at, content, _ in document_rows():
        assert at == len(data), at
        data += content
    return bytes(data)


def document_regions():
    """Offset, size and content of each region in the worked example. Two rows of one region are joined."""
    regions = []
    for at, content, text in document_rows():
        if text:
            regions.append([at, len(content), text])
        else:
            regions[-1][1] += len(content)
    return "".join(f"{at} {size} {text}\n" for at, size, text in regions)


def change(data, key, value, order):
    """Makes the change of one line of a broken image's description."""
    if key == "put":
        width, at, number = value.split()
        at = int(at)
        new = cdb_image.cell(number, order, order) if width == "cell" else numbers(WIDTHS[width], [number], order)
        assert at + len(new) <= len(data), value
        data[at:at + len(new)] = new
    elif key == "hex":
        at, _, text = value.partition(" ")
        new = bytes.fromhex(text)
        assert int(at) + len(new) <= len(data), value
        data[int(at):int(at) + len(new)] = new
    elif key == "cut":
        assert int(value) < len(data), value
        del data[int(value):]
    elif key == "append":
        data += bytes.fromhex(value)


def settle(data, order, kept):
    """Corrects length and checksum, except for the one that is to be kept."""
    prefix = cdb_image.mark(order)
    if "length" not in kept and len(data) >= 4:
        struct.pack_into(prefix + "I", data, 0, len(data) - 4)
    if "checksum" not in kept and len(data) >= 8:
        struct.pack_into(prefix + "I", data, 4, cdb_image.checksum(data, order))


def broken(path, bases, order):
    """The bytes of a broken image in one byte order."""
    lines = [line.split("//", 1)[0].strip() for line in path.read_text().splitlines()]
    items = [tuple(part.strip() for part in line.split(":", 1)) for line in lines if line]
    keys = [key for key, _ in items]
    if keys.count("base") != 1 or not all(len(item) == 2 for item in items):
        raise SystemExit(f"{path}: no base, or a line that is not 'key: value'")
    data = bytearray(bases[dict(items)["base"], order])
    for key, value in items:
        if key not in ("base", "put", "hex", "cut", "append", "keep", "order") and not key.startswith("finding"):
            raise SystemExit(f"{path}: unknown key {key}")
        change(data, key, value, order)
    settle(data, order, [value for key, value in items if key == "keep"])
    return bytes(data)


def main():
    """Write all images."""
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--out", type=pathlib.Path, required=True, help="the directory to write to")
    options = parser.parse_args()
    (options.out / "broken").mkdir(parents=True, exist_ok=True)
    bases = {(path.stem, order): assemble(path, order) for path in sorted(HERE.glob("*.image")) for order in ORDERS}
    bases["document", "little"] = document()
    (options.out / "document.rows").write_text(document_regions())
    for (name, order), data in bases.items():
        (options.out / f"{name}.{order}.cdef").write_bytes(data)
    for path in sorted((HERE / "broken").glob("*.broken")):
        for order in ORDERS:
            (options.out / "broken" / f"{path.stem}.{order}.cdef").write_bytes(broken(path, bases, order))


if __name__ == "__main__":
    main()
