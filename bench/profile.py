"""Where the compiler's instructions go: by the function that they were written in, inlined or not.

Reads what callgrind wrote of a program with debug information, and prints a
table of instructions per byte of the source.  The C library stands by its own
functions, and repeated string instructions count once for each byte.
"""

import argparse
import collections
import pathlib
import re

ROOT = pathlib.Path(__file__).resolve().parent.parent
POSITION = re.compile(r"(?:[-+]?\d+|\*) (\d+)$")
NAME = re.compile(r"(fl|fi|fe|fn)=\((\d+)\)(?: (.*))?$")
HEADER = re.compile(r"^(?!namespace|struct|enum|using|static_assert|#|//|/\*|\})\S.*?([\w:~]+)\(")
MEMBER = re.compile(r"^    (?!return|if|for|while|switch|else|static_assert)\S.*?([\w~]+)\([^;]*$")


def functions_of(path):
    """For each line of a source, the function that contains it: the last one whose first line is above it."""
    names, current = [""], "data"
    pattern = MEMBER if path.suffix == ".h" else HEADER
    for line in path.read_text().splitlines():
        begun = pattern.match(line)
        current = begun.group(1) if begun else current
        names.append(current)
    return names


class Profile:
    """Instructions by file and function."""

    def __init__(self, path):
        self.names = {"file": {}, "function": {}}
        self.sources = {}
        self.counts = collections.Counter()
        self.read(path)

    def named(self, kind, number, name):
        """A name is written out once and later identified by its number."""
        if name is not None:
            self.names[kind][number] = name
        return self.names[kind][number]

    def key(self, file, function, line):
        """Our sources by their functions; everything else by its symbol."""
        if "/./" in file:
            source = file.split("/./")[1]
            if source not in self.sources:
                self.sources[source] = functions_of(ROOT / source)
            return f"`{self.sources[source][line]}` in {pathlib.Path(source).name}"
        return "the C++ library's headers" if "/c++/" in file else f"`{function.split('(')[0].strip('_').split('_avx2')[0]}`"

    def read(self, path):
        """The costs of calls belong to the called functions and are counted there."""
        file = function = ""
        line, called = 0, False
        for text in pathlib.Path(path).read_text().splitlines():
            if name := NAME.match(text):
                if name[1] == "fn":
                    function = self.named("function", name[2], name[3])
                else:
                    file = self.named("file", name[2], name[3])
            elif text.startswith("calls="):
                called = True
            elif cost := POSITION.match(text):
                position = text.split()[0]
                line = line if position == "*" else line + int(position) if position[0] in "+-" else int(position)
                if not called:
                    self.counts[self.key(file, function, line)] += int(cost[1])
                called = False
            elif text.startswith(("cfi=", "cfl=", "cfn=", "cob=")):
                self.note_called(text)

    def note_called(self, text):
        """Names may first be written where they are called."""
        if name := re.match(r"c(fi|fl|fn)=\((\d+)\) (.*)$", text):
            self.named("function" if name[1] == "fn" else "file", name[2], name[3])


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("profile", help="what callgrind wrote")
    parser.add_argument("source", type=pathlib.Path, help="what was compiled")
    parser.add_argument("--rows", type=int, default=30)
    options = parser.parse_args()
    size = options.source.stat().st_size
    counts = Profile(options.profile).counts
    total = sum(counts.values())
    print(f"{total / size:.2f} instructions a byte\n\n| instr/byte | share | where |\n|---|---|---|")
    for where, count in counts.most_common(options.rows):
        print(f"| {count / size:.2f} | {100 * count / total:.1f} % | {where} |")
    rest = total - sum(count for _, count in counts.most_common(options.rows))
    print(f"| {rest / size:.2f} | {100 * rest / total:.1f} % | all else |")


if __name__ == "__main__":
    main()
