"""Options and fixtures of all tests: the build to test, a directory for each case, and the order of slow tests."""

import pathlib
import tempfile

import pytest

pytest.register_assert_rewrite("cases")

from programs import PROGRAMS, PROJECT  # noqa: E402  (after the registration)


def pytest_addoption(parser):
    """Adds the options of this project."""
    group = parser.getgroup("cdgen")
    group.addoption("--build", default=PROJECT / "build/test", help="the build directory whose programs are tested")
    group.addoption("--cdgen", help="another compiler to test than the build's")
    group.addoption("--native", choices=("little", "big"), default="little", help="byte order of the machine it is for")
    group.addoption("--there", type=pathlib.Path, help="a compiler for the other byte order, for cross_endian_test.py")
    group.addoption("--runner", default="", help="the command that runs it")
    group.addoption("--cases", type=int, help="how many generated sources; by default 20000, under sanitizers fewer")
    group.addoption("--keep", type=pathlib.Path, help="where to leave generated sources that fail")
    group.addoption("--round", type=int, default=0, help="other generated sources: each round has its own")


def pytest_configure(config):
    """Finds the programs before any test is collected."""
    PROGRAMS.use(config.getoption("build"), config.getoption("cdgen"), config.getoption("native"))
    PROGRAMS.cases, PROGRAMS.round = config.getoption("cases"), config.getoption("round")
    there = config.getoption("there")
    PROGRAMS.there, PROGRAMS.runner = there and there.resolve(), config.getoption("runner")
    PROGRAMS.keep = config.getoption("keep")
    if not PROGRAMS.cdgen.exists():
        raise pytest.UsageError(f"there is no {PROGRAMS.cdgen}: build it, or name another directory by --build")


def pytest_ignore_collect(collection_path):
    """Ignores tests that need a compiler for another machine."""
    return True if collection_path.name == "cross_endian_test.py" and PROGRAMS.there is None else None


def pytest_collection_modifyitems(items):
    """Puts slow tests first, so that the last ones to finish are quick."""

    def seconds(item):
        mark = item.get_closest_marker("slow")
        return mark.args[0] if mark else 0

    items.sort(key=seconds, reverse=True)


@pytest.fixture
def directory():
    """A directory that any user can reach."""
    with tempfile.TemporaryDirectory(prefix="cdgen-case-") as name:
        yield pathlib.Path(name)


@pytest.fixture
def world(directory):
    """A directory with the program and a source; see cases.py."""
    from cases import World

    return World(PROGRAMS, directory)
