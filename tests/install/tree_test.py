"""Test which files are installed, and where."""

import ctypes
import os
import pathlib
import re
import shlex
import unittest

from installed import BUILD, PROJECT, Case, documents, examples, only, pkg_config_environment, program, run, tree
from documents import broken_links, text_of


class Tree(Case):
    def test_programs_run(self):
        run(program("cdgen"), examples() / "FileSystem.cdefsrc", self.here / "a.cdef")
        self.assertEqual(run(program("cdef"), "verify", self.here / "a.cdef"), "")

    def test_has_these_headers_and_no_others(self):
        headers = sorted(path.name for path in (tree() / "include").rglob("*.h"))
        self.assertEqual(headers, ["cdb.h", "cdb_fields.h", "cdb_sections.h", "cdb_values.h", "cdb_view.h", "vx.h"])

    def test_library_holds_machine_code(self):
        """Objects of another compiler's link-time optimisation could not be linked."""
        self.assertNotIn("gnu.lto", run("readelf", "--section-headers", "--wide", only("lib*/**/libcdb_view.a")))

    def test_each_page_is_in_its_section(self):
        pages = sorted(path.name for path in (tree() / "share/man").glob("man*/*"))
        self.assertEqual(pages, ["cdef.1", "cdef.5", "cdefsrc.5", "cdgen.1"])

    def test_nothing_holds_the_prefix(self):
        prefix = str(tree().parent / "before").encode()
        for path in tree().rglob("*"):
            if path.is_file():
                self.assertNotIn(prefix, path.read_bytes(), path)

    def test_nothing_holds_the_place_of_the_build(self):
        for path in tree().rglob("*"):
            if path.is_file():
                self.assertNotIn(str(BUILD).encode(), path.read_bytes(), path)

    def test_destdir_is_put_in_front_of_the_prefix(self):
        run("cmake", "--install", BUILD, "--prefix", "/some/prefix", env={**os.environ, "DESTDIR": str(self.here)})
        self.assertTrue((self.here / "some/prefix/bin/cdgen").is_file())
        self.assertEqual([path.name for path in self.here.iterdir()], ["some"])


class Documents(unittest.TestCase):
    def test_links_lead_to_files(self):
        found = sorted(documents().rglob("*.md"))
        self.assertIn("CONTRIBUTING.md", [path.name for path in found])
        for path in found:
            self.assertEqual(broken_links(path), [], path.name)

    def test_files_that_pages_name_are_where_the_pages_say(self):
        places = {"docs": "share/doc/cdgen/docs", "examples": "share/doc/cdgen/examples", "include": "include/cdgen"}
        for page in sorted((tree() / "share/man").rglob("*.[15]")):
            text = text_of(page)
            for directory, name in re.findall(r"\b(?:(docs|examples|include)/)?(\w+\.(?:md|h|cdefsrc))\b", text):
                suffix = name.rpartition(".")[2]
                place = places[directory or {"md": "docs", "h": "include", "cdefsrc": "examples"}[suffix]]
                if not directory and suffix == "cdefsrc" and not (tree() / place / name).exists():
                    continue  # the reader's own source
                self.assertTrue((tree() / place / name).is_file(), f"{page.name}: {name}")
                self.assertIn(place, text, page.name)


class WithoutTheInspector(Case):
    def test_nothing_of_it_is_installed(self):
        """Its libraries are missing where it is built."""
        build, prefix = self.here / "b", self.here / "p"
        missing = [f"-DCMAKE_DISABLE_FIND_PACKAGE_{library}=ON" for library in ("CLI11", "nlohmann_json")]
        quick = ["-DCMAKE_CXX_FLAGS_RELEASE=-O0", "-DCDGEN_LTO=OFF", "-DCDGEN_TOGETHER=ON"]
        said = run("cmake", "--preset", "package", "-B", build, *missing, *quick, cwd=PROJECT)
        self.assertIn("cdef is left out", said)
        run("cmake", "--build", build)
        run("cmake", "--install", build, "--prefix", prefix)
        ours = {path.relative_to(tree()) for path in tree().rglob("*") if path.stem.lstrip("_") == "cdef"}
        self.assertEqual({path.parts[0] for path in ours}, {"bin", "share"})
        ours.remove(pathlib.Path("share/vim/vimfiles/compiler/cdef.vim"))  # which only runs it
        ours.remove(pathlib.Path("share/man/man5/cdef.5"))  # the file's format, not the program
        for name in ("editors/neovim/cdef.lua", "editors/emacs/cdef.el"):
            ours.remove(pathlib.Path("share/cdgen", name))  # which only run it
        ours.remove(pathlib.Path("share/doc/cdgen/examples/projects/bazel/cdef.bzl"))  # examples are installed whole
        ours.remove(pathlib.Path("share/doc/cdgen/docs/cdef.md"))  # documents are installed whole
        here = {path.relative_to(prefix) for path in prefix.rglob("*")}
        self.assertEqual(ours & here, set())
        (config,) = prefix.rglob("cdgen.pc")
        self.assertNotIn("cdef", config.read_text())
        self.assertTrue((prefix / "bin/cdgen").is_file())


PLUGIN = r"""
#include "cdb_view.h"
extern "C" int is_sound(const char *name) {
    std::error_code error;
    std::vector<std::byte> file = cdb::read_file(name, error);
    return !error && cdb::is_sound(cdb::verify(cdb::database(file)));
}
"""


class Shared(Case):
    def test_library_can_be_part_of_a_shared_one(self):
        """Such as a plug-in for an interpreter."""
        (self.here / "plugin.cpp").write_text(PLUGIN)
        flags = shlex.split(run("pkg-config", "--cflags", "--libs", "cdgen", env=pkg_config_environment()))
        run("c++", "-std=c++20", "-fPIC", "-shared", "-Wl,--no-undefined", "plugin.cpp", "-o", "plugin.so", *flags,
            cwd=self.here)
        run(program("cdgen"), examples() / "FileSystem.cdefsrc", self.here / "a.cdef")
        plugin = ctypes.CDLL(str(self.here / "plugin.so"))
        self.assertEqual([plugin.is_sound(os.fsencode(self.here / name)) for name in ("a.cdef", "plugin.cpp")], [1, 0])


class PkgConfig(unittest.TestCase):
    def asked(self, *what):
        return run("pkg-config", *what, "cdgen", env=pkg_config_environment()).strip().replace("\\ ", " ")

    def test_names_the_programs(self):
        for name in ("cdgen", "cdef"):
            said = self.asked(f"--variable={name}")
            self.assertTrue(os.path.samefile(said, program(name)), said)

    def test_has_the_version_of_the_program(self):
        self.assertEqual("cdef " + self.asked("--modversion"), run(program("cdef"), "--version").strip())

    def test_has_what_compiling_and_linking_take(self):
        self.assertTrue(os.path.samefile(self.asked("--cflags").removeprefix("-I"), tree() / "include/cdgen"))
        place, name = self.asked("--libs").split(" -l")
        self.assertEqual(name, "cdb_view")
        self.assertTrue(os.path.samefile(place.removeprefix("-L"), only("lib*/**/libcdb_view.a").parent))


if __name__ == "__main__":
    unittest.main()
