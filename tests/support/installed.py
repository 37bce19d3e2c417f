"""Shared by the tests of the installed tree: the tree, a directory for each test, and running programs."""

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
    """The standard output of a program. If it fails, the test fails and shows all its output."""
    done = subprocess.run([str(word) for word in command], text=True, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                          timeout=TIMEOUT, **options)
    if done.returncode != 0:
        raise AssertionError(f"{' '.join(map(str, command))}: exit status {done.returncode}\n{done.stdout}")
    return done.stdout


def tree():
    """The root of a tree that was installed elsewhere and then moved: a file that contains the prefix would not work.
    """
    global _installed
    if _installed is None:
        _installed = tempfile.TemporaryDirectory(prefix="cdgen-install-")
        stage = pathlib.Path(_installed.name)
        run("cmake", "--install", BUILD, "--prefix", stage / "before")
        (stage / "before").rename(stage / MOVED)
    return pathlib.Path(_installed.name) / MOVED


def only(pattern):
    """The only path in the tree that matches the pattern."""
    found = sorted(tree().glob(pattern))
    if len(found) != 1:
        raise AssertionError(f"{pattern}: found {found}")
    return found[0]


def documents():
    """The directory of the documents and the examples."""
    return tree() / "share/doc/cdgen"


def examples():
    return documents() / "examples"


def program(name):
    return tree() / "bin" / name


def pkg_config_environment():
    """An environment in which pkg-config finds only the tree's cdgen.pc."""
    return {**os.environ, "PKG_CONFIG_LIBDIR": str(only("lib*/**/cdgen.pc").parent)}


def later(path):
    """Makes a file newer than everything that has been built."""
    soon = time.time() + 5
    os.utime(path, (soon, soon))


class Case(unittest.TestCase):
    """A test with an empty directory, self.here."""

    def setUp(self):
        directory = tempfile.TemporaryDirectory(prefix="cdgen test ")
        self.addCleanup(directory.cleanup)
        self.here = pathlib.Path(directory.name)

    def copy_of(self, path):
        """A copy of a file or a directory to work in."""
        to = self.here / path.name
        (shutil.copytree if path.is_dir() else shutil.copy)(path, to)
        return to
