"""Run the commands of a document in their order, and compare the output with that in the document.

Three kinds of blocks are used:

- A block whose first line is a comment that names a file, `# Disk.cdefsrc` or `// show.cpp`, is written to that file.
- A block whose first line is `# Add to Fan.cdefsrc` is appended to that file.
- In a `console` block, lines that begin with `$ ` are commands, and the lines below each command are its output. A line
  `...` stands for any number of lines.

The programs are on the PATH, and `pkg-config` finds the library of this build.
"""

import os
import re
import subprocess

import pytest

from programs import PROGRAMS, PROJECT

BLOCK = re.compile(r"^```(\w*)\n(.*?)^```$", re.MULTILINE | re.DOTALL)
FILE = re.compile(r"(?:#|//) (Add to )?(\w+\.(?:cdefsrc|cpp))\n")
LIBRARY = "src/reader/libcdb_view.a"
WARNINGS = "-Wall -Wextra -Werror"


def programs(directory):
    """Makes a directory of the programs that the commands use and the system does not have."""
    directory.mkdir()
    for program in (PROGRAMS.cdgen, PROGRAMS.cdef):
        (directory / program.name).symlink_to(program)
    flags = f"-fsanitize={PROGRAMS.sanitizers} -fno-sanitize-recover=all" if PROGRAMS.sanitizers else ""
    compiler = PROGRAMS.cache["CMAKE_CXX_COMPILER"]
    scripts = {"c++": f'exec {compiler} {WARNINGS} {flags} "$@"',
               "pkg-config": f"echo -I{PROJECT / 'include'} {PROGRAMS.build / LIBRARY}"}
    for name, command in scripts.items():
        (directory / name).write_text(f"#!/bin/sh\n{command}\n")
        (directory / name).chmod(0o755)
    return directory


def commands(block):
    """Each command of a console block, with its expected output."""
    found = []
    for line in block.splitlines():
        if line.startswith("$ "):
            found.append((line[2:], []))
        else:
            found[-1][1].append(line)
    return found


def agrees(expected, printed):
    """True if the output matches the lines of the document; `...` matches any lines."""
    pattern = "".join(r"(?:.*\n)*?" if line == "..." else re.escape(line + "\n") for line in expected)
    return re.fullmatch(pattern, printed) is not None


def run(command, place, environment):
    """The output of a command, on both streams."""
    return subprocess.run(["sh", "-c", command], cwd=place, env=environment, text=True, check=False,
                          stdout=subprocess.PIPE, stderr=subprocess.STDOUT, timeout=60).stdout


@pytest.mark.slow(3)
@pytest.mark.parametrize("name", ["README.md", "docs/tutorial.md"])
def test_document(name, directory):
    """Every command prints what the document says."""
    path = f"{programs(directory / 'bin')}{os.pathsep}{os.environ['PATH']}"
    environment = {**os.environ, "PATH": path, "LC_ALL": "C"}
    place = directory / "work"
    place.mkdir()
    done = 0
    for language, block in BLOCK.findall((PROJECT / name).read_text()):
        file = FILE.match(block)
        if file:
            with open(place / file.group(2), "a" if file.group(1) else "w", encoding="utf-8") as target:
                target.write(block)
        for command, expected in commands(block) if language == "console" else ():
            printed = run(command, place, environment)
            assert agrees(expected, printed), "\n".join([f"$ {command}", "expected:", *expected, "printed:", printed])
            done += 1
    assert done > 10, "the commands have not been found"
