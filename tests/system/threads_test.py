"""Several compilations, checks and readings at once in one process give what each gives alone."""

import subprocess

from programs import EXAMPLES, PROGRAMS, TESTS, environment


def test_at_once(directory):
    """Two sources that compile, and two of which the compiler has something to say."""
    sources = [EXAMPLES / "FileSystem.cdefsrc", EXAMPLES / "ClusterNode.cdefsrc", TESTS / "cdef/check/overridden.cdefsrc",
               TESTS / "cdef/check/unknown-attribute.cdefsrc"]
    command = [PROGRAMS.build / "tests/two_at_once", directory, *sources]
    done = subprocess.run(command, env=environment(), capture_output=True, text=True, timeout=600, check=False)
    assert (done.returncode, done.stdout, done.stderr) == (0, "", "")
