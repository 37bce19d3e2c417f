"""What the tests of the installed tree share: the tree, a directory of their own, and running programs."""

import os
import pathlib
import shutil
import subprocess
import tempfile
import time
import unittest

from programs import PROGRAMS, PROJECT

BUILD = PROGRAMS.build
TIMEOUT = 600
MOVED = "moved elsewhere"  # a blank in a path is what build systems stumble over

_installed = None


def run(*command, **options):
    """Text of standard output; a failure is one of the test, with all that the program said."""
    done = subprocess.run([str(word) for word in command], text=True, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                          timeout=TIMEOUT, **options)
    if done.returncode != 0:
        raise AssertionError(f"{' '.join(map(str, command))}: exit status {done.returncode}\n{done.stdout}")
    return done.stdout


def tree():
    """The root of a tree that was installed elsewhere and then moved: whatever holds the prefix does not work there."""
    global _installed
    if _installed is None:
        _installed = tempfile.TemporaryDirectory(prefix="cdgen-install-")
        stage = pathlib.Path(_installed.name)
        run("cmake", "--install", BUILD, "--prefix", stage / "before")
        (stage / "before").rename(stage / MOVED)
    return pathlib.Path(_installed.name) / MOVED


def only(pattern):
    """The one path in the tree that the pattern finds."""
    found = sorted(tree().glob(pattern))
    if len(found) != 1:
        raise AssertionError(f"{pattern}: found {found}")
    return found[0]


def documents():
    """Where the documents and the examples are."""
    return tree() / "share/doc/cdgen"


def examples():
    return documents() / "examples"


def program(name):
    return tree() / "bin" / name


def pkg_config_environment():
    """Finds the tree's cdgen.pc, and no other."""
    return {**os.environ, "PKG_CONFIG_LIBDIR": str(only("lib*/**/cdgen.pc").parent)}


def later(path):
    """Makes a file newer than whatever was built."""
    soon = time.time() + 5
    os.utime(path, (soon, soon))


class Case(unittest.TestCase):
    """Has an empty directory, self.here."""

    def setUp(self):
        directory = tempfile.TemporaryDirectory(prefix="cdgen test ")
        self.addCleanup(directory.cleanup)
        self.here = pathlib.Path(directory.name)

    def copy_of(self, path):
        """A copy of a file or a directory to work in."""
        to = self.here / path.name
        (shutil.copytree if path.is_dir() else shutil.copy)(path, to)
        return to
