"""Sources with an untidy layout: other blanks, comments and empty lines, which have no meaning to the compiler.

untidy(seed, source) is a source that compiles to the same database and follows from the seed. comments(source) are
the comments of a source. Both split lines themselves, without the formatter that they test.
"""

import random

LINE = 253  # characters of the longest line, without its newline
BLANKS = b" \t"
SIGNS = (b"#", b"//", b"/*")


def comment_at(line):
    """The position of a line's comment, by the rules of the language; the length of the line if there is none."""
    quoted, text = False, False
    for at in range(len(line)):
        if not text and line[at:at + 1] == b"#":
            return at
        if line.startswith(SIGNS, at) and not quoted:
            return at
        quoted ^= line[at:at + 1] == b'"'
        text = text or line[at:at + 1] not in (b" ", b"\t", b'"')
    return len(line)


def is_plain(line):
    """Whether a line is read in one piece."""
    return len(line) <= LINE and b"\0" not in line


def comments(source):
    """The comments of the lines that are read in one piece, without blanks at their ends."""
    found = [line[comment_at(line):].rstrip(BLANKS) for line in source.split(b"\n") if is_plain(line)]
    return [comment for comment in found if comment]


class Untidy:
    """One source to be made untidy."""

    def __init__(self, seed):
        self.random = random.Random(seed)
        self.column = 0  # of the latest comment after a text

    def blanks(self, least, most):
        """So many blanks and tabs."""
        return bytes(self.random.choices(BLANKS, k=self.random.randint(least, most)))

    def comment(self):
        """Its sign, and some text."""
        text = self.random.choice((b"", b" ", b" one", b"two", b" a \"b # c // d", b" Name=x ", b" caf\xc3\xa9", b" end \r"))
        return self.random.choice(SIGNS) + text

    def after(self, line):
        """A comment after the text of a line, or nothing."""
        if comment_at(line) < len(line) or line.count(b'"') % 2 or self.random.random() < 0.8:
            return b""
        gap = self.random.choice((b"", b" ", b"\t", b"\t\t", b"      ", self.blanks(1, 12)))
        comment = self.comment()
        return gap + (comment if gap else b"#" + comment)

    def text_line(self, line):
        """A header or an attribute line."""
        changed = line
        if line[:1] in (b" ", b"\t"):
            name, equals, value = line.lstrip(BLANKS).partition(b"=")
            if value.startswith(b'"') and not value.startswith(b'""'):
                value = self.blanks(0, 3) + value
            changed = self.random.choice((b"\t", b"    ", b"  ", self.blanks(1, 20))) + name + equals + value
        front = changed
        changed += self.after(changed)
        self.column = len(front) + 1 if len(changed) > len(front) else 0
        changed += self.blanks(0, 3) if self.random.random() < 0.2 else b""
        return changed if len(changed) <= LINE else line

    def between(self):
        """Lines without text."""
        lines = []
        while self.random.random() < 0.2:
            long = b"#" + b"-" * self.random.choice((LINE - 2, LINE - 1))
            aligned = b" " * self.column + self.comment()
            lines.append(self.random.choice((b"", b"", self.blanks(0, 5), self.comment(), self.blanks(1, 20) + self.comment(),
                                             aligned, long, b' ""')))
        return lines

    def lines(self, source):
        """The lines of the whole source."""
        lines = self.between()
        for line in source.split(b"\n"):
            if not is_plain(line):
                lines.append(line)  # what follows may be a part of it
                continue
            has_text = line[:comment_at(line)].strip(b' \t"') != b""
            lines.append(self.text_line(line) if has_text else line)
            lines += self.between()
        return lines


def untidy(seed, source):
    """The same source with another layout. Sometimes its last line has no newline."""
    made = Untidy(seed)
    text = b"\n".join(made.lines(source))
    return text.rstrip(b"\n") if made.random.random() < 0.3 else text
