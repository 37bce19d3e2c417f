"""Each project of examples/projects, built from the installed tree in a copy of its own."""

import os
import sys
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
        self.words_of_make()
        self.every_mistake_is_shown(lambda: run("make", cwd=self.project, env=pkg_config_environment()),
                                    self.project / "Disk.cdefsrc")
        self.no_package()

    def words_of_make(self):
        """WERROR, BYTE_ORDER and GATE."""
        source = self.project / "Disk.cdefsrc"

        def make(*words):
            return run("make", *words, cwd=self.project, env=pkg_config_environment())

        self.words(source, lambda: make("BYTE_ORDER=big"), self.project / "Disk.cdef",
                   lambda: make("BYTE_ORDER=both"), make, lambda: make("WERROR="),
                   lambda older: make("WERROR=", f"GATE={older}"))

    def words(self, source, big, database, both, strict, lenient, gate):
        """The same words in each project: functions that build with them."""
        sound = source.read_bytes()
        big()
        self.assertEqual(database.read_bytes()[8:12], b"fmt1")
        both()
        self.assertEqual([(database.parent / f"Disk.{order}.cdef").read_bytes()[8:12] for order in ("le", "be")],
                         [b"1tmf", b"fmt1"])
        strict()
        self.assertEqual(database.read_bytes()[8:12], b"1tmf" if sys.byteorder == "little" else b"fmt1")
        source.write_bytes(sound.replace(b"Id=1\n", b"Id=010\n"))
        later(source)
        with self.assertRaises(AssertionError) as failed:
            strict()
        self.assertIn("[S509 octal]", str(failed.exception))
        self.assertIn("[S509 octal]", lenient())
        older = self.here / "older.cdefsrc"
        older.write_bytes(sound.replace(b"Id=1\n", b"Id=77\n"))
        source.write_bytes(sound.replace(b"4096", b"8192"))
        later(source)
        before = database.read_bytes()
        with self.assertRaises(AssertionError) as failed:
            gate(older)
        self.assertIn("[CMP102]", str(failed.exception))
        self.assertEqual(database.read_bytes(), before)
        older.write_bytes(sound)
        gate(older)
        self.assertNotEqual(database.read_bytes(), before)
        older.write_bytes(sound.replace(b"Id=1\n", b"Id=77\n"))
        self.assertRaises(AssertionError, gate, older)
        source.write_bytes(sound)
        later(source)

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
        run("meson", "setup", "build", cwd=self.project, env=environment)
        run("ninja", "-C", "build", cwd=self.project, env=environment)
        self.assertEqual(run("build/show", "build/Disk.cdef", cwd=self.project), SHOWN)

        def built(werror="true", order="native", gate=""):
            run("meson", "configure", "build", f"-Dcdef_werror={werror}", f"-Dbyte_order={order}", f"-Dgate={gate}",
                cwd=self.project, env=environment)
            return run("ninja", "-C", "build", cwd=self.project, env=environment)

        self.words(self.project / "Disk.cdefsrc", lambda: built(order="big"), self.project / "build/Disk.cdef",
                   lambda: built(order="both"), built, lambda: built("false"), lambda older: built("false", gate=older))
        built()
        self.every_mistake_is_shown(lambda: run("ninja", "-C", "build", cwd=self.project, env=environment),
                                    self.project / "Disk.cdefsrc")


if __name__ == "__main__":
    unittest.main()
