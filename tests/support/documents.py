"""Reads the parts of documents and manual pages that tests need."""

import pathlib
import re

PROJECT = pathlib.Path(__file__).resolve().parents[2]
DOCUMENTS = sorted([*PROJECT.glob("*.md"), *(PROJECT / "docs").glob("*.md")])
PAGES = sorted((PROJECT / "man").glob("*.[15]"))


def plain(text):
    """The text of roff without fonts and escapes, as far as the pages use them."""
    for written, shown in ((r"\\f[BIR]", ""), (r"\\%", ""), (r"\\&", ""), (r"\\-", "-"), (r"\\\(aq", "'"),
                           (r"\\\(ga", "`"), (r"\\e", r"\\")):
        text = re.sub(written, shown, text)
    return text


def text_of(path):
    return path.read_text() if path.suffix == ".md" else plain(path.read_text())


def blocks(path):
    """The examples of a document or a page."""
    if path.suffix == ".md":
        return re.findall(r"^```\w*\n(.*?)^```", path.read_text(), re.M | re.S)
    return re.findall(r"^\.(?:nf|Bd.*?)\n(.*?)^\.(?:fi|Ed)", plain(path.read_text()), re.M | re.S)


def sources(path):
    """The whole class definitions among the examples."""
    return [block for block in blocks(path) if re.search(r"^ClassToManagerMapping$", block, re.M)]


def broken_links(path):
    """The links of a document whose targets do not exist."""
    targets = re.findall(r"\]\(([^)#]+)[^)]*\)", path.read_text())
    return [target for target in targets if "://" not in target and not (path.parent / target).exists()]


def chapters(path, depth):
    """Each heading of a level with the text below it, up to the next heading of this or a higher level."""
    parts = re.split(rf"^(#{{2,{depth}}}) (.*)\n", path.read_text(), flags=re.M)[1:]
    return [(title, text) for marks, title, text in zip(*[iter(parts)] * 3) if len(marks) == depth]


def tables(text):
    """The tables in a text: lists of rows of cells, the headings first."""
    found = []
    for block in re.findall(r"(?:^\|.*\n)+", text, re.M):
        rows = [[cell.strip() for cell in re.split(r"(?<!\\)\|", line.strip()[1:-1])] for line in block.splitlines()]
        found.append([rows[0], *rows[2:]])
    return found


def spans(text):
    """Code spans outside of examples."""
    return re.findall(r"(?<!`)`([^`\n]+)`(?!`)", text)
