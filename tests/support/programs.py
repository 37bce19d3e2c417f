"""The programs that tests use, from the build that conftest.py selects."""

import os
import pathlib
import re
import shlex

TESTS = pathlib.Path(__file__).resolve().parents[1]
PROJECT = TESTS.parent
EXAMPLES = PROJECT / "examples"


class Programs:
    """The programs to be tested, the programs that help to test them, and how they were built."""

    def use(self, build, cdgen=None, native="little"):
        """Selects the programs of a build directory, and optionally cdgen from another place."""
        self.build = pathlib.Path(build).resolve()
        self.cdgen = pathlib.Path(cdgen).resolve() if cdgen else self.build / "cdgen"
        self.native = native  # the byte order of the machine that cdgen is for
        self.cdef = self.build / "cdef"
        self.compile_many = self.build / "tests/compile_many"
        self.list_names = self.build / "tests/list_names"
        self.unit = self.build / "tests/cdgen_unit"
        self.images = self.build / "tests/image"
        self.locales = self.build / "tests/locales"
        cache = self.build / "CMakeCache.txt"
        lines = re.findall(r"^(\w+):\w+=(.*)$", cache.read_text() if cache.exists() else "", re.M)
        self.cache = dict(lines)
        return self

    @property
    def sanitizers(self):
        """The sanitizers of the build, as -fsanitize= takes them."""
        return self.cache.get("CDGEN_SANITIZE", "")

    def is_on(self, option):
        """Whether an option of the build is on."""
        return self.cache.get(option, "OFF").upper() in ("ON", "1", "TRUE", "YES")


def runner():
    """The words in front of a program that needs another machine, such as an emulator."""
    return shlex.split(os.environ.get("CDGEN_RUNNER", ""))


def environment(**more):
    """The environment of runs whose output must be the same everywhere."""
    return {**os.environ, "LC_ALL": "C", "VX_CDB_FORCE_EMPTY_TIMESTAMP": "", **more}


PROGRAMS = Programs()
