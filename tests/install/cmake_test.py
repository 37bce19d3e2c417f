"""The CMake package: finding it, linking the reader, and cdgen_compile, with each of the generators."""

import os
import shutil
import unittest

from installed import Case, examples, later, only, pkg_config_environment, run, tree

HEAD = """cmake_minimum_required(VERSION 3.25)
project(trial LANGUAGES NONE)
find_package(cdgen REQUIRED)
"""
LITTLE, BIG = b"1tmf", b"fmt1"


def found_in(root=None):
    """For a project without a language, CMake does not search directories that are named after a machine."""
    place = only("lib*/**/cdgenConfig.cmake").parent
    return f"-Dcdgen_DIR={(root or tree()) / place.relative_to(tree())}"


def disk():
    return examples() / "projects/cmake/classes/Disk.cdefsrc"


class Trial(Case):
    """A project made for the test. Its subclasses add the generator."""

    def project(self, text, **files):
        (self.here / "CMakeLists.txt").write_text(HEAD + text)
        for name, source in files.items():
            (self.here / f"{name}.cdefsrc").write_bytes(source)
        run("cmake", "-G", self.GENERATOR, "-S", self.here, "-B", self.here / "b", found_in())

    def build(self, *options, **environment):
        return run("cmake", "--build", self.here / "b", *options, env={**os.environ, **environment})

    def made(self, name):
        return (self.here / "b" / name).read_bytes()

    def newest(self, name):
        """Gives a file of the project a later time than all that has been built has. It must not be later than now: Ninja
        would run CMake again and again, and give up after a hundred times."""
        built = max(path.lstat().st_mtime_ns for path in (self.here / "b").rglob("*"))
        while (self.here / name).stat().st_mtime_ns <= built:
            os.utime(self.here / name)

    def leftovers(self):
        return [str(path) for path in (self.here / "b").rglob(".*cdef-new")]


class Compile:
    """Tests that apply to every generator."""

    def test_class_without_name_is_called_after_the_bare_output(self):
        self.project("cdgen_compile(disk a.cdefsrc deep/er/Tape.cdef)", a=disk().read_bytes().replace(b"\tName=Disk\n", b""))
        self.build()
        self.assertIn(b"\0Tape\0", self.made("deep/er/Tape.cdef"))
        self.assertEqual(self.leftovers(), [])

    def test_changed_source_is_compiled_again(self):
        self.project("cdgen_compile(disk a.cdefsrc a.cdef)", a=disk().read_bytes())
        self.build()
        (self.here / "a.cdefsrc").write_bytes(disk().read_bytes().replace(b"BlockSize", b"SectorLen"))
        later(self.here / "a.cdefsrc")
        self.build()
        self.assertIn(b"SectorLen", self.made("a.cdef"))

    def test_nothing_changed_nothing_done(self):
        self.project("cdgen_compile(disk a.cdefsrc a.cdef)", a=disk().read_bytes())
        self.build()
        before = (self.here / "b/a.cdef").stat()
        self.build()
        self.assertEqual((self.here / "b/a.cdef").stat().st_ino, before.st_ino)

    def project_with_a_tree_of_its_own(self):
        """A project that uses a copy of the installed tree; returns the program in it that makes databases."""
        copy = self.here / "tree"
        shutil.copytree(tree(), copy, symlinks=True)
        (self.here / "a.cdefsrc").write_bytes(disk().read_bytes())
        (self.here / "CMakeLists.txt").write_text(HEAD + "cdgen_compile(disk a.cdefsrc a.cdef)")
        run("cmake", "-G", self.GENERATOR, "-S", self.here, "-B", self.here / "b", found_in(copy))
        return copy / "bin/cdef"

    def test_changed_compiler_compiles_again(self):
        compiler = self.project_with_a_tree_of_its_own()
        self.build()
        real = compiler.rename(compiler.with_name("real"))
        compiler.write_text(f'#!/bin/sh\necho run >>"{self.here}/log"\nexec "{real}" "$@"\n')
        compiler.chmod(0o755)
        later(compiler)
        self.build()
        self.assertEqual((self.here / "log").read_text(), "run\n")

    def test_failure_leaves_no_target(self):
        self.project("cdgen_compile(disk a.cdefsrc a.cdef)", a=b"ControlDefinition\n\tFileVersoin=1\n")
        with self.assertRaises(AssertionError) as failed:
            self.build()
        self.assertIn(f"{self.here}/a.cdefsrc:2:2: error: Attribute name not defined in table", str(failed.exception))
        self.assertFalse((self.here / "b/a.cdef").exists())
        self.assertEqual(self.leftovers(), [])

    def test_every_error_and_warning_is_shown(self):
        wrong = disk().read_bytes().replace(b"Id=0", b"Id=010").replace(b"FirstKey", b"FistKey")
        self.project("cdgen_compile(disk a.cdefsrc a.cdef)", a=wrong.replace(b"UInt32", b"Uint32"))
        with self.assertRaises(AssertionError) as failed:
            self.build()
        for said in (r":17:5: warning: .*octal", r":18:11: error: Invalid data type", r":34:2: error: Attribute name not"):
            self.assertRegex(str(failed.exception), f"{self.here}/a.cdefsrc{said}")

    def test_warnings_are_shown_and_counted_on_request(self):
        odd = disk().read_bytes().replace(b"Id=0", b"Id=010")
        self.project("cdgen_compile(odd a.cdefsrc a.cdef)", a=odd)
        self.assertIn(f"{self.here}/a.cdefsrc:17:5: warning: ", self.build())
        self.project("cdgen_compile(odd a.cdefsrc strict.cdef WERROR)", a=odd)
        self.assertRaises(AssertionError, self.build)
        self.assertFalse((self.here / "b/strict.cdef").exists())

    def test_gate_keeps_the_old_database(self):
        old, new = disk().read_bytes(), disk().read_bytes().replace(b"Id=1\n", b"Id=77\n")
        self.project("cdgen_compile(disk a.cdefsrc a.cdef GATE released)\ncdgen_compile(b b.cdefsrc b.cdef GATE released)",
                     a=old, b=old.replace(b"Name=Disk", b"Name=Other").replace(b"disk.cat", b"b.cat"))
        (self.here / "released").mkdir()
        (self.here / "released/a.cdefsrc").write_bytes(old)
        self.build()
        before = self.made("a.cdef")
        (self.here / "a.cdefsrc").write_bytes(new)
        later(self.here / "a.cdefsrc")
        with self.assertRaises(AssertionError) as failed:
            self.build()
        self.assertRegex(str(failed.exception), r"a\.cdefsrc:\d+:\d+: error: .*Id 1 -> 77 .*\[CMP102\]")
        self.assertEqual(self.made("a.cdef"), before)
        (self.here / "released/a.cdefsrc").write_bytes(new)
        self.build()
        self.assertNotEqual(self.made("a.cdef"), before)

    def test_gate_reads_the_numbers_beside_the_source(self):
        """Not those of the build directory, where it runs."""
        ids = self.here / "ids.lock"
        ids.write_text("Disk\tPersistentResourceAttribute\t1\tString\tOther\n")
        self.project("cdgen_compile(disk a.cdefsrc a.cdef GATE a.cdefsrc)", a=disk().read_bytes())
        with self.assertRaises(AssertionError) as failed:
            self.build()
        self.assertRegex(str(failed.exception), r"a\.cdefsrc:\d+:\d+: error: .*\[CMP401\]")
        ids.write_text(ids.read_text().replace("Other", "SerialNumber"))
        self.build()
        ids.write_text(ids.read_text().replace("SerialNumber", "Other"))
        later(ids)
        with self.assertRaises(AssertionError):
            self.build()

    def test_gate_is_checked_in_each_build(self):
        """A file in the directory of older versions and a file of numbers that did not exist are noticed."""
        released = self.here / "released"
        released.mkdir()
        self.project("cdgen_compile(disk a.cdefsrc a.cdef GATE released)", a=disk().read_bytes())
        self.build()
        self.assertNotIn("Building class definition", self.build())
        (released / "a.cdefsrc").write_bytes(disk().read_bytes().replace(b"Id=1\n", b"Id=77\n"))
        with self.assertRaises(AssertionError) as failed:
            self.build()
        self.assertIn("[CMP102]", str(failed.exception))
        (released / "a.cdefsrc").unlink()
        self.build()
        (self.here / "ids.lock").write_text("Disk\tPersistentResourceAttribute\t1\tString\tOther\n")
        with self.assertRaises(AssertionError) as failed:
            self.build()
        self.assertIn("[CMP401]", str(failed.exception))

    def test_gate_waits_for_a_source_that_is_made(self):
        """It is compared as it has become, the first time and later."""
        self.project("add_custom_command(OUTPUT made.cdefsrc DEPENDS a.cdefsrc VERBATIM\n"
                     "  COMMAND ${CMAKE_COMMAND} -E copy ${CMAKE_CURRENT_SOURCE_DIR}/a.cdefsrc made.cdefsrc)\n"
                     "cdgen_compile(disk ${CMAKE_CURRENT_BINARY_DIR}/made.cdefsrc a.cdef GATE old.cdefsrc)",
                     a=disk().read_bytes(), old=disk().read_bytes())
        self.build("--parallel", "4")
        before = self.made("a.cdef")
        (self.here / "a.cdefsrc").write_bytes(disk().read_bytes().replace(b"Id=1\n", b"Id=77\n"))
        later(self.here / "a.cdefsrc")
        with self.assertRaises(AssertionError) as failed:
            self.build("--parallel", "4")
        self.assertIn("[CMP102]", str(failed.exception))
        self.assertEqual(self.made("a.cdef"), before)

    def test_empty_words_are_refused(self):
        """A variable that is not set does not switch a check off."""
        for word in ("GATE", "BYTE_ORDER"):
            with self.assertRaises(AssertionError) as failed:
                self.project(f"cdgen_compile(disk a.cdefsrc a.cdef NO_TIMESTAMP {word} \"${{NEVER_SET}}\")", a=disk().read_bytes())
            self.assertIn(f"cdgen_compile: {word} has no value", str(failed.exception))

    def git(self, *arguments):
        who = {f"GIT_{role}_{what}": "someone@example.com" for role in ("AUTHOR", "COMMITTER") for what in ("NAME", "EMAIL")}
        run("git", *arguments, cwd=self.here, env={**os.environ, **who, "GIT_CONFIG_GLOBAL": "/dev/null"})

    def test_gate_notices_a_commit(self):
        """What is compared with the last commit passes as soon as it is that commit."""
        self.project("cdgen_compile(disk a.cdefsrc a.cdef GATE git:HEAD)", a=disk().read_bytes())
        self.git("init", "-q", ".")
        self.git("add", "a.cdefsrc")
        self.git("commit", "-qm", "the first version")
        self.build()
        (self.here / "a.cdefsrc").write_bytes(disk().read_bytes().replace(b"Id=1\n", b"Id=77\n"))
        later(self.here / "a.cdefsrc")
        with self.assertRaises(AssertionError) as failed:
            self.build()
        self.assertIn("[CMP102]", str(failed.exception))
        self.git("commit", "-qam", "the second version")
        self.build()
        self.git("checkout", "-q", "HEAD^", "--", ".")
        self.git("commit", "-qm", "as before")
        (self.here / "a.cdefsrc").write_bytes(disk().read_bytes().replace(b"Id=1\n", b"Id=77\n"))
        with self.assertRaises(AssertionError):
            self.build()

    def test_project_file_builds_again(self):
        (self.here / "cdef.toml").write_text("")
        odd = disk().read_bytes().replace(b"Id=1\n", b"Id=010\n")
        self.project("cdgen_compile(disk a.cdefsrc a.cdef)", a=odd)
        self.assertIn("S509", self.build())
        (self.here / "cdef.toml").write_text("[warnings]\nwerror = true\n")
        self.newest("cdef.toml")
        with self.assertRaises(AssertionError) as failed:
            self.build()
        self.assertIn("S509", str(failed.exception))

    def order_of(self, name):
        return self.made(name)[8:12]

    def test_project_file_that_is_made_after_configuring(self):
        """In a directory above the source, with a time that is older than the database. It is noticed too if it is
        removed."""
        sub = self.here / "sub [1]"
        sub.mkdir()
        (sub / "a.cdefsrc").write_bytes(disk().read_bytes())
        self.project('cdgen_compile(disk "sub [1]/a.cdefsrc" a.cdef)')
        self.build()
        native = self.order_of("a.cdef")
        other = BIG if native == LITTLE else LITTLE
        file = self.here / "cdef.toml"
        file.write_text(f"[build]\nbyte-order = '{'big' if other == BIG else 'little'}'\n")
        os.utime(file, (5, 5))
        self.build()
        self.assertEqual(self.order_of("a.cdef"), other)
        (sub / "cdef.toml").write_text("[build]\nbyte-order = 'native'\n")
        self.build()
        self.assertEqual(self.order_of("a.cdef"), native)
        (sub / "cdef.toml").unlink()
        self.build()
        self.assertEqual(self.order_of("a.cdef"), other)
        file.unlink()
        self.build()
        self.assertEqual(self.order_of("a.cdef"), native)
        self.assertNotIn("Building class definition", self.build())

    def test_project_file_chooses_both_byte_orders(self):
        """A word overrides it. A change of the file takes effect in the next build."""
        (self.here / "cdef.toml").write_text("[build]\nbyte-order = 'both'\n")
        self.project("cdgen_compile(disk a.cdefsrc a.cdef)\ncdgen_compile(one a.cdefsrc one.cdef BYTE_ORDER big)",
                     a=disk().read_bytes())
        self.build()
        self.assertEqual((self.order_of("a.le.cdef"), self.order_of("a.be.cdef")), (LITTLE, BIG))
        self.assertEqual(self.order_of("one.cdef"), BIG)
        self.assertNotIn("Building class definition", self.build())
        (self.here / "cdef.toml").write_text("[build]\nbyte-order = 'little'\n")
        self.newest("cdef.toml")
        self.build()
        self.assertEqual(self.order_of("a.cdef"), LITTLE)

    def test_mistake_in_a_project_file_is_reported_when_building(self):
        (self.here / "cdef.toml").write_text("[build]\nbyte-oder = 'both'\n")
        self.project("cdgen_compile(disk a.cdefsrc a.cdef)", a=disk().read_bytes())
        with self.assertRaises(AssertionError) as failed:
            self.build()
        self.assertIn(f"{self.here}/cdef.toml:2:1: unknown key of [build]: `byte-oder`", str(failed.exception))
        (self.here / "cdef.toml").write_text("[build]\nbyte-order = 'both'\n")
        self.newest("cdef.toml")
        self.build()
        self.assertEqual(self.order_of("a.be.cdef"), BIG)

    def test_project_file_of_a_linked_directory(self):
        """It is that of the real directory, as for cdef."""
        real = self.here / "elsewhere/real"
        real.mkdir(parents=True)
        (real / "a.cdefsrc").write_bytes(disk().read_bytes())
        (self.here / "elsewhere/cdef.toml").write_text("[build]\nbyte-order = 'big'\n")
        (self.here / "linked").symlink_to("elsewhere/real")
        (self.here / "cdef.toml").write_text("[build]\nbyte-order = 'little'\n")
        self.project("cdgen_compile(disk linked/a.cdefsrc a.cdef)")
        self.build()
        self.assertEqual(self.order_of("a.cdef"), BIG)

    def test_changed_words_build_again(self):
        for order, magic in (("little", LITTLE), ("big", BIG)):
            self.project(f"cdgen_compile(disk a.cdefsrc a.cdef BYTE_ORDER {order})", a=disk().read_bytes())
            os.utime(self.here / "a.cdefsrc", (5, 5))
            self.build()
            self.assertEqual(self.order_of("a.cdef"), magic)

    def test_what_a_killed_build_left_behind_is_cleared(self):
        self.project("cdgen_compile(disk a.cdefsrc a.cdef)", a=disk().read_bytes())
        (self.here / "b/.a.cdef.cdef-new").write_bytes(b"half")
        self.build()
        self.assertEqual(self.leftovers(), [])
        self.assertIn(b"BlockSize", self.made("a.cdef"))

    def test_touched_source_is_compiled_once(self):
        """The database keeps its inode, and the build system then has nothing to do."""
        self.project_with_a_tree_of_its_own()
        self.build()
        before = (self.here / "b/a.cdef").stat()
        self.newest("a.cdefsrc")
        said = [self.build() for _ in range(2)]
        self.assertEqual(["Building class definition" in each for each in said], [True, False])
        self.assertEqual((self.here / "b/a.cdef").stat().st_ino, before.st_ino)

    def test_names_that_a_target_cannot_tell_apart(self):
        names = ("a-b.cdef", "a_b.cdef", "a b.cdef", "a/b.cdef")
        self.project("\n".join(f'cdgen_compile(all_db a.cdefsrc "{name}")' for name in names), a=disk().read_bytes())
        self.build()
        for name in names:
            self.assertIn(b"BlockSize", self.made(name))

    def test_failure_is_tried_again(self):
        self.project("cdgen_compile(disk a.cdefsrc a.cdef)", a=disk().read_bytes())
        self.build()
        (self.here / "a.cdefsrc").write_bytes(b"no such stanza\n")
        later(self.here / "a.cdefsrc")
        for _ in range(2):
            self.assertRaises(AssertionError, self.build)

    def test_no_output_without_the_map(self):
        """An error that cdgen finds at the end of a source leaves no output."""
        self.project("cdgen_compile(disk a.cdefsrc a.cdef)", a=disk().read_bytes().split(b"ClassToManagerMapping")[0])
        with self.assertRaises(AssertionError) as failed:
            self.build()
        self.assertRegex(str(failed.exception), f"{self.here}/a.cdefsrc:[0-9]+: error: No class-to-manager maps defined")
        self.assertFalse((self.here / "b/a.cdef").exists())

    def test_byte_order_is_the_one_asked_for(self):
        self.project("cdgen_compile(both a.cdefsrc little.cdef BYTE_ORDER little)\n"
                     "cdgen_compile(both a.cdefsrc big.cdef BYTE_ORDER big)", a=disk().read_bytes())
        self.build()
        self.assertEqual((self.made("little.cdef")[8:12], self.made("big.cdef")[8:12]), (LITTLE, BIG))

    def test_both_byte_orders_are_of_one_class(self):
        self.project("cdgen_compile(disk a.cdefsrc deep/Tape.cdef BYTE_ORDER both)",
                     a=disk().read_bytes().replace(b"\tName=Disk\n", b""))
        self.build()
        for name, order in (("deep/Tape.le.cdef", LITTLE), ("deep/Tape.be.cdef", BIG)):
            self.assertEqual(self.made(name)[8:12], order)
            self.assertIn(b"Tape\0", self.made(name))

    def test_time_of_building_is_left_out_on_request(self):
        self.project("cdgen_compile(with a.cdefsrc with.cdef BYTE_ORDER little)\n"
                     "cdgen_compile(without a.cdefsrc without.cdef BYTE_ORDER little NO_TIMESTAMP)",
                     a=disk().read_bytes())
        environment = {name: value for name, value in os.environ.items() if name != "VX_CDB_FORCE_EMPTY_TIMESTAMP"}
        run("cmake", "--build", self.here / "b", env=environment)
        self.assertNotEqual(self.made("with.cdef")[16:20], bytes(4))
        self.assertEqual(self.made("without.cdef")[16:24], bytes(8))

    def test_time_of_the_environment(self):
        """When the project is built. NO_TIMESTAMP overrides it."""
        self.project("cdgen_compile(with a.cdefsrc with.cdef BYTE_ORDER little)\n"
                     "cdgen_compile(without a.cdefsrc without.cdef BYTE_ORDER little NO_TIMESTAMP)",
                     a=disk().read_bytes())
        environment = {name: value for name, value in os.environ.items() if name != "VX_CDB_FORCE_EMPTY_TIMESTAMP"}
        run("cmake", "--build", self.here / "b", env={**environment, "SOURCE_DATE_EPOCH": "77"})
        self.assertEqual(self.made("with.cdef")[16:24], bytes([77, 0, 0, 0, 0, 0, 0, 0]))
        self.assertEqual(self.made("without.cdef")[16:24], bytes(8))

    def test_several_targets_from_a_subdirectory_in_parallel(self):
        sub = self.here / "classes"
        sub.mkdir()
        names = [f"c{i}" for i in range(12)]
        for name in names:
            (sub / f"{name}.cdefsrc").write_bytes(disk().read_bytes().replace(b"BlockSize", name.encode()))
        (sub / "CMakeLists.txt").write_text(
            "\n".join(f"cdgen_compile(all_of_them {name}.cdefsrc {name}.cdef)" for name in names))
        self.project("add_subdirectory(classes)\n"
                     "add_custom_target(uses ALL COMMAND ${CMAKE_COMMAND} -E copy classes/c11.cdef taken.cdef)\n"
                     "add_dependencies(uses all_of_them)")
        self.build("--parallel", "4")
        for name in names:
            self.assertIn(name.encode() + b"\0", self.made(f"classes/{name}.cdef"))
        self.assertEqual(self.made("taken.cdef"), self.made("classes/c11.cdef"))

    def test_absolute_paths_are_taken_as_they_are(self):
        self.project(f'cdgen_compile(disk "{disk()}" "{self.here}/elsewhere/Disk.cdef")')
        self.build()
        self.assertTrue((self.here / "elsewhere/Disk.cdef").exists())

    def test_quarrels_with_what_it_does_not_know(self):
        for words in ("NO_TIME", "BYTE_ORDER middle", "BYTE_ORDER"):
            with self.subTest(words), self.assertRaises(AssertionError) as failed:
                self.project(f"cdgen_compile(disk a.cdefsrc a.cdef {words})", a=disk().read_bytes())
            self.assertIn("cdgen_compile:", str(failed.exception))
        with self.assertRaises(AssertionError) as failed:
            self.project("cdgen_compile(disk a.cdefsrc a.db BYTE_ORDER both)", a=disk().read_bytes())
        self.assertIn("the database's name must end in .cdef", " ".join(str(failed.exception).split()))


class Ninja(Compile, Trial):
    GENERATOR = "Ninja"


class Make(Compile, Trial):
    GENERATOR = "Unix Makefiles"


class Package(Case):
    def test_wants_a_version_of_the_same_minor_number(self):
        here = run("pkg-config", "--modversion", "cdgen", env=pkg_config_environment()).strip()
        major, minor, _ = map(int, here.split("."))
        asked = ((f"{major}.{minor}", True), (here, True), (f"{major}.{minor + 1}", False), (f"{major + 1}.0", False))
        for version, found in asked:
            (self.here / "CMakeLists.txt").write_text(HEAD.replace("cdgen REQUIRED", f"cdgen {version}") +
                                                      'message(STATUS "found: ${cdgen_FOUND}")')
            said = run("cmake", "-S", self.here, "-B", self.here / version, found_in())
            self.assertIn(f"found: {int(found)}", said, version)

    def test_offers_the_inspector(self):
        (self.here / "CMakeLists.txt").write_text(
            HEAD + "add_custom_target(version ALL COMMAND cdgen::cdef --version VERBATIM)")
        run("cmake", "-S", self.here, "-B", self.here / "b", found_in())
        self.assertRegex(run("cmake", "--build", self.here / "b"), r"cdef \d+\.\d+\.\d+")


if __name__ == "__main__":
    unittest.main()
