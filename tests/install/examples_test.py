"""Each project of examples/projects, built from the installed tree in a copy of its own."""

import unittest

from installed import EXAMPLES, Case, pkg_config_environment, run, tree

SHOWN = "Disk\n  BlockSize\n  SerialNumber\n"


class Project(Case):
    def setUp(self):
        super().setUp()
        self.project = self.copy_of(EXAMPLES / "projects" / self.id().rpartition("_")[2])

    def test_cmake(self):
        build = self.project / "build"
        run("cmake", "-S", self.project, "-B", build, f"-DCMAKE_PREFIX_PATH={tree()}")
        run("cmake", "--build", build)
        for database in ("Disk.cdef", "big/Disk.cdef"):
            self.assertEqual(run(build / "show", build / "classes" / database), SHOWN)

    def test_make(self):
        run("make", cwd=self.project, env=pkg_config_environment())
        self.assertEqual(run("./show", "Disk.cdef", cwd=self.project), SHOWN)

    def test_meson(self):
        environment = pkg_config_environment()
        run("meson", "setup", "build", cwd=self.project, env=environment)
        run("ninja", "-C", "build", cwd=self.project, env=environment)
        self.assertEqual(run("build/show", "build/Disk.cdef", cwd=self.project), SHOWN)


if __name__ == "__main__":
    unittest.main()
