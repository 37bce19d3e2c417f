"""Each project of examples/projects, built from the installed tree in a copy of its own."""

import os
import unittest

from installed import Case, examples, later, pkg_config_environment, run, tree

SHOWN = "Disk\n  BlockSize\n  SerialNumber\n"


class Project(Case):
    def setUp(self):
        super().setUp()
        self.project = self.copy_of(examples() / "projects" / self.id().rpartition("_")[2])

    def test_cmake(self):
        build = self.project / "build"
        run("cmake", "-S", self.project, "-B", build, f"-DCMAKE_PREFIX_PATH={tree()}")
        run("cmake", "--build", build)
        for database in ("Disk.cdef", "big/Disk.cdef"):
            self.assertEqual(run(build / "show", build / "classes" / database), SHOWN)
        self.every_mistake_is_shown(lambda: run("cmake", "--build", build), self.project / "classes/Disk.cdefsrc")

    def test_make(self):
        run("make", cwd=self.project, env=pkg_config_environment())
        self.assertEqual(run("./show", "Disk.cdef", cwd=self.project), SHOWN)
        self.no_half_of_a_database()
        run("make", "gate", "BASELINE=Disk.cdefsrc", cwd=self.project, env=pkg_config_environment())
        self.every_mistake_is_shown(lambda: run("make", cwd=self.project, env=pkg_config_environment()),
                                    self.project / "Disk.cdefsrc")
        self.no_package()

    def no_half_of_a_database(self):
        """A failed build leaves the old database, and is tried again."""
        before = (self.project / "Disk.cdef").read_bytes()
        source = self.project / "Disk.cdefsrc"
        source.write_bytes(source.read_bytes().replace(b"4096", b"8192"))
        later(source)
        for _ in range(2):
            with self.assertRaises(AssertionError) as failed:
                run("sh", "-c", "ulimit -f 0; exec make Disk.cdef", cwd=self.project, env=pkg_config_environment())
            self.assertIn("cdef: Disk.cdef: cannot write: File too large", str(failed.exception))
            self.assertEqual((self.project / "Disk.cdef").read_bytes(), before)

    def every_mistake_is_shown(self, build, source):
        """Each with its file and line."""
        source.write_bytes(source.read_bytes().replace(b"UInt32", b"Uint32").replace(b"Id=1\n", b"Id=01\n"))
        later(source)
        with self.assertRaises(AssertionError) as failed:
            build()
        self.assertRegex(str(failed.exception), r"Disk\.cdefsrc:18:11: error: Invalid data type")

    def no_package(self):
        with self.assertRaises(AssertionError) as failed:
            run("make", cwd=self.project, env={**os.environ, "PKG_CONFIG_LIBDIR": str(self.here)})
        self.assertIn("pkg-config finds no cdgen with cdef", str(failed.exception))

    def test_meson(self):
        environment = pkg_config_environment()
        run("meson", "setup", "build", f"-Dbaseline={self.project}/Disk.cdefsrc", cwd=self.project, env=environment)
        run("ninja", "-C", "build", cwd=self.project, env=environment)
        self.assertEqual(run("build/show", "build/Disk.cdef", cwd=self.project), SHOWN)
        run("meson", "test", "-C", "build", cwd=self.project, env=environment)
        self.every_mistake_is_shown(lambda: run("ninja", "-C", "build", cwd=self.project, env=environment),
                                    self.project / "Disk.cdefsrc")


if __name__ == "__main__":
    unittest.main()
