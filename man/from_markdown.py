#!/usr/bin/env python3
"""Writes the manual pages that have the same text as a document, so that the text is written only once.

    from_markdown.py [DIRECTORY]

writes them to the directory, this one unless given; a test writes to another and compares.

Knows the Markdown that the documents use: headings, paragraphs, tables, fenced code, links, code spans and lists.  A
table of one column becomes a list, one of two a list of terms, a wider one a table if it fits the line.  The headings
of a table are the first entry of its list: without them "may" and "may not" would look alike.  A whole class definition
begins in the first column, so that a copy of what a terminal shows compiles.
"""

import pathlib
import re
import sys

HERE = pathlib.Path(__file__).resolve().parent
SECTION = 5
MADE = [
    ("language.md", "cdefsrc", "source language of resource class definitions"),
    ("format.md", "cdef", "class definition database, byte by byte"),
]
FILES = """## Files

This page names the documents, the examples and the headers by their paths in the project. They are installed in these \
directories below the prefix, such as `/usr`:

| directory | contains |
|---|---|
| `share/doc/cdgen/docs` | documents, such as `language.md` |
| `share/doc/cdgen/examples` | examples, such as `FileSystem.cdefsrc` |
| `include/cdgen` | headers, such as `cdb.h` |
"""
ALL_PAGES = (("cdgen", 1), ("cdef", 1), ("cdefsrc", 5), ("cdef", 5))
DATE = "2026-11-21"  # of the release
LINE = 72  # characters that a table may take
PAGES = {document: f"`{name}`({SECTION})" for document, name, what in MADE}
PLAIN_HEADINGS = ("meaning", "content", "rule")  # of a last column that explains itself
WIDE_COLUMN = 24  # characters that each of the columns needs which share the remaining room


def escape(text):
    """For roff, anywhere in a line."""
    return text.replace("\\", "\\e").replace("-", "\\-").replace("'", "\\(aq").replace("`", "\\(ga")


def link(match):
    """The text of a link. A document that is also a page is called by the name of the page."""
    text, target = match.groups()
    return PAGES.get(target, text) if text == target else text


def inline(text):
    """Code in bold, emphasis in italics, links as their text."""
    text = re.sub(r"\[([^\]]*)\]\(([^)]*)\)", link, text)
    parts = re.split(r"(`[^`]+`)", text.replace(r"\|", "|"))
    return "".join(f"\\%\\fB{escape(part[1:-1])}\\fR" if part.startswith("`") and len(part) > 2 else
                   re.sub(r"\*(\w+)\*", r"\\fI\1\\fR", escape(part)) for part in parts)


def at_line_start(text):
    """A line of text must not look like a request."""
    return "\\&" + text if text.startswith((".", "'")) else text


def sentences(text):
    """One to a line, as roff likes it."""
    return [at_line_start(part) for part in re.sub(r"([a-z0-9)\"][.:?!]) (?=[A-Z])", r"\1\n", text).split("\n")]


def cells(line):
    return [cell.strip() for cell in re.split(r"(?<!\\)\|", line.strip().strip("|"))]


def named(name, cell):
    return f"\\fI{inline(name)}\\fR: {inline(cell)}" if cell else ""


def headings(first, last):
    """As the first entry of a list."""
    return [".TP", f"\\fI{inline(first)}\\fR", f"\\fI{inline(last)}\\fR"]


def list_of_columns(head, rows):
    """A table that is too wide: below the first column the middle ones with their headings, then the last."""
    out = headings(head[0], head[-1])
    for row in rows:
        middle = re.sub(r"\.;", ";", "; ".join(filter(None, map(named, head[1:-1], row[1:-1]))))
        last = inline(row[-1]) if head[-1] in PLAIN_HEADINGS else named(head[-1], row[-1])
        out += [".TP", at_line_start(inline(row[0])) or "\\&", *([at_line_start(middle), ".br"] if middle else []),
                *sentences(last or "\\&")]
    return out


def list_of_terms(head, rows):
    out = headings(*head)
    for term, meaning in rows:
        out += [".TP", at_line_start(inline(term)) or "\\&", *sentences(inline(meaning) or "\\&")]
    return out


def plain_list(rows):
    out = []
    for (item,) in rows:
        out += [".IP \\(bu 2", *sentences(inline(item))]
    return out


def wide_columns(widths):
    """Which columns have to share the room: the widest, as many as it takes."""
    wide = [False] * len(widths)
    for i in sorted(range(len(widths)), key=lambda i: -widths[i]):
        if sum(WIDE_COLUMN if w else width for w, width in zip(wide, widths)) + 3 * len(widths) > LINE:
            wide[i] = True
    return wide


def room(widths, wide):
    """What the columns that are not wide leave of the line."""
    return LINE - sum(width + 3 for w, width in zip(wide, widths) if not w) - 3


def longest_word(rows, column):
    return max(len(word.replace("`", "")) for row in rows for word in row[column].split() or [""])


def wide_table(head, rows):
    """Narrow columns keep their width; the others share the rest of the line."""
    widths = [max(len(row[i].replace("`", "")) for row in [head, *rows]) for i in range(len(head))]
    wide = wide_columns(widths)
    if sum(wide) > 1 or any(wide) and longest_word(rows, wide.index(True)) > room(widths, wide):
        return list_of_columns(head, rows)
    layout = " ".join("lx" if w else "l" for w in wide)
    out = [".TS", "tab(\t);", " ".join("lB" for _ in head), layout + ".", "\t".join(inline(cell) for cell in head)]
    for row in rows:
        texts = [f"T{{\n.na\n{at_line_start(inline(cell)) or chr(92) + '&'}\nT}}" if w else inline(cell)
                 for cell, w in zip(row, wide)]
        out.append("\t".join(texts))
    return out + [".TE"]


def table(lines):
    head, rows = cells(lines[0]), [cells(line) for line in lines[2:]]
    if len(head) == 1:
        return plain_list(rows)
    if len(head) == 2:
        return list_of_terms(head, rows)
    return wide_table(head, rows)


def code(lines):
    """Tabs stand for eight columns, as in a source."""
    body = [at_line_start(escape(line.expandtabs(8))) for line in lines]
    if "ControlDefinition" in lines:
        return [".PP", ".in 0", ".nf", *body, ".fi", ".in"]
    return [".PP", ".RS 4", ".nf", *body, ".fi", ".RE"]


def see_also(name):
    """The pages beside this one."""
    return "## See also\n\n" + ", ".join(f"`{other}`({section})" for other, section in ALL_PAGES if (other, section) != (name, SECTION))


def heading(line):
    depth, title = re.match(r"(#+) (.*)", line).groups()
    title = inline(title)
    return f'.SH "{title.upper()}"' if len(depth) == 2 else f'.SS "{title}"'


class Page:
    """The lines of a page, and whether a paragraph would be empty here."""

    def __init__(self, name, what):
        self.out = ['.\\" Made by man/from_markdown.py; do not edit.', f'.TH {name.upper()} {SECTION} {DATE} "cdgen"',
                    ".SH NAME", f"{name} \\- {escape(what)}"]
        self.fresh = False

    def block(self, lines):
        if lines[0] == ".PP" and self.fresh:
            lines = lines[1:]
        self.out += lines
        self.fresh = False

    def heading(self, line):
        self.out.append(heading(line))
        self.fresh = True

    def add(self, text):
        """A whole document; its title is not repeated."""
        lines = text.split("\n")
        at = 0
        if lines[0].startswith("# "):
            lines[0] = "## Description"
        while at < len(lines):
            at = self.add_block(lines, at)

    def add_block(self, lines, at):
        """One block from a line on; returns where the next one begins."""
        line = lines[at]
        end = at + 1
        if line.startswith("#"):
            self.heading(line)
        elif line.startswith("```"):
            while not lines[end].startswith("```"):
                end += 1
            self.block(code(lines[at + 1:end]))
            end += 1
        elif line.startswith("|"):
            while end < len(lines) and lines[end].startswith("|"):
                end += 1
            self.block(table(lines[at:end]))
        elif line.startswith("- "):
            while end < len(lines) and lines[end].startswith("- "):
                end += 1
            self.block(plain_list([[item[2:]] for item in lines[at:end]]))
        elif line.strip():
            while end < len(lines) and re.match(r"[^#|`\-\s]|`[^`]|-[^ ]", lines[end]):
                end += 1
            self.block([".PP", *(part for text in lines[at:end] for part in sentences(inline(text)))])
        return end


def main():
    target = pathlib.Path(sys.argv[1]) if len(sys.argv) > 1 else HERE
    for document, name, what in MADE:
        page = Page(name, what)
        page.add((HERE.parent / "docs" / document).read_text())
        page.add(FILES)
        page.add(see_also(name))
        text = "\n".join(page.out) + "\n"
        has_tables = ".TS\n" in text
        (target / f"{name}.{SECTION}").write_text(("'\\\" t\n" if has_tables else "") + text)


if __name__ == "__main__":
    main()
