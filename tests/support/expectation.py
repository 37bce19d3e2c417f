"""The one notation of .expect files: what a test expects, beside the source that it is about.

    # a line of comment; empty lines count as little
    key: value            a word, a number, a command line
    name:                 a block, that is, the lines that begin with '|' after it
    |its first line
    |its second line
    name-no-newline:      a block whose last line has no newline
    |text
    image:                a block that runs to the next 'image...:' line or to the end, as it is

A block without lines is empty text.  Which keys and blocks there may be, and
how often, each kind of test says; anything else is an error in the file, so
that no expectation is overlooked.  Bytes that are no UTF-8 are kept.
"""

NO_NEWLINE = "-no-newline"


class Error(ValueError):
    """A file does not follow the notation."""


class Expectation:
    """The entries of one file, keys and blocks, in their order."""

    def __init__(self, path, keys=(), blocks=(), images=()):
        self.path = path
        self.entries = []  # (name, text) of keys and of blocks
        self._allowed = set(keys), set(blocks), set(images)
        self._read(path.read_bytes().decode("utf-8", "surrogateescape"))

    def _read(self, text):
        keys, blocks, images = self._allowed
        block, image = None, None
        for number, line in enumerate(text.split("\n"), 1):
            name, colon, value = line.partition(":")
            plain = name.removesuffix(NO_NEWLINE)
            if colon and name in images and not value.strip():
                block, image = None, []
                self.entries.append((name, image))
            elif image is not None:
                image.append(line)
            elif line.startswith("|") and block is not None:
                block.append(line[1:])
            elif colon and plain in blocks and not value:
                block = []
                self.entries.append((name, block))
            elif colon and name in keys:
                block = None
                self.entries.append((name, value.strip()))
            elif line.strip() and not line.startswith("#"):
                raise Error(f"{self.path}:{number}: neither a key nor a line of a block (each begins with '|'): {line!r}")
        self.entries = [(name, self._text(name, value)) for name, value in self.entries]

    def _text(self, name, value):
        if isinstance(value, str):
            return value
        ends = name not in self._allowed[2] and not name.endswith(NO_NEWLINE)
        return "\n".join(value) + ("\n" if ends and value else "")

    def all(self, *names):
        """The entries with these names, in their order, without the mark of a missing newline."""
        found = [(name.removesuffix(NO_NEWLINE), text) for name, text in self.entries]
        return [(name, text) for name, text in found if name in names]

    def get(self, name, default=""):
        """The entry with this name, of which there may be only one."""
        found = self.all(name)
        if len(found) > 1:
            raise Error(f"{self.path}: {name} comes twice")
        return found[0][1] if found else default

    def has(self, name):
        """Whether there is such an entry."""
        return bool(self.all(name))

    def octets(self, name):
        """The bytes of a block."""
        return self.get(name).encode("utf-8", "surrogateescape")
