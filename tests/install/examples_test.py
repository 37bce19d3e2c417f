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

    def test_make(self):
        run("make", cwd=self.project, env=pkg_config_environment())
        self.assertEqual(run("./show", "Disk.cdef", cwd=self.project), SHOWN)
        self.no_half_of_a_database()
        self.no_package()

    def no_half_of_a_database(self):
        """What cannot be filled does not stay, or it would look new to the next run."""
        later(self.project / "Disk.cdefsrc")
        with self.assertRaises(AssertionError):
            run("sh", "-c", "ulimit -f 0; exec make Disk.cdef", cwd=self.project, env=pkg_config_environment())
        self.assertFalse((self.project / "Disk.cdef").exists())

    def no_package(self):
        with self.assertRaises(AssertionError) as failed:
            run("make", cwd=self.project, env={**os.environ, "PKG_CONFIG_LIBDIR": str(self.here)})
        self.assertIn("pkg-config finds no cdgen", str(failed.exception))

    def test_meson(self):
        environment = pkg_config_environment()
        run("meson", "setup", "build", cwd=self.project, env=environment)
        run("ninja", "-C", "build", cwd=self.project, env=environment)
        self.assertEqual(run("build/show", "build/Disk.cdef", cwd=self.project), SHOWN)


if __name__ == "__main__":
    unittest.main()
