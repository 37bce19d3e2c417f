"""Test the Debian packages: with Debian's checker, for conflicts with files of other packages, and by installing,
running and removing them in a root of their own."""

import os
import pathlib
import shutil
import subprocess
import tempfile
import unittest

from installed import BUILD, PROJECT, Case, run
from programs import PROGRAMS
from documents import broken_links


class Package(Case):
    @classmethod
    def setUpClass(cls):
        place = tempfile.TemporaryDirectory(prefix="cdgen-package-")
        cls.addClassCleanup(place.cleanup)
        run("cpack", "-G", "DEB", "-B", place.name, cwd=BUILD)
        cls.packages = {path.name.split("_")[0]: path for path in pathlib.Path(place.name).glob("*.deb")}

    def files(self, package):
        """The files that a package installs."""
        listed = run("dpkg-deb", "--contents", self.packages[package]).splitlines()
        return {line.split(" ./", 1)[1].split(" -> ")[0] for line in listed if not line.startswith("d")}

    def test_are_the_program_the_library_and_the_documents(self):
        self.assertEqual(set(self.packages), {"cdgen", "cdgen-dev", "cdgen-doc"})
        for package, file in (("cdgen", "usr/bin/cdef"), ("cdgen", "usr/share/man/man5/cdef.5.gz"),
                              ("cdgen-dev", "usr/include/cdgen/cdb_view.h"),
                              ("cdgen-doc", "usr/share/doc/cdgen/docs/tutorial.md")):
            self.assertIn(file, self.files(package))

    def test_share_no_file(self):
        files = [file for package in self.packages for file in self.files(package)]
        self.assertEqual(len(files), len(set(files)))

    def test_overwrite_no_file_of_other_packages(self):
        """According to the index of all Debian packages, if it can be fetched."""
        if not run("apt-file", "list", "--fixed-string", "base-files"):
            fetched = subprocess.run(["apt-file", "update"], capture_output=True, check=False)
            if fetched.returncode != 0 or not run("apt-file", "list", "--fixed-string", "base-files"):
                self.skipTest("the index cannot be fetched")
        ours = sorted("/" + file for package in self.packages for file in self.files(package))
        (self.here / "ours").write_text("\n".join([*ours, "/usr/share/man/man5/passwd.5.gz", ""]))
        found = subprocess.run(["apt-file", "search", "--fixed-string", "--from-file", self.here / "ours"], text=True,
                               stdout=subprocess.PIPE, check=False).stdout
        others = [line for line in found.splitlines() if not line.startswith(("cdgen", "passwd:"))]
        self.assertIn("/usr/share/man/man5/passwd.5.gz", found, "the index has not been searched")
        self.assertEqual(others, [])

    def test_lintian_finds_no_error(self):
        run("lintian", "--no-cfg", "--allow-root", "--fail-on", "error", *self.packages.values())

    def test_installs_runs_and_goes_away_again(self):
        for directory in ("updates", "info"):
            (self.here / "var/lib/dpkg" / directory).mkdir(parents=True)
        for file in ("status", "available"):
            (self.here / "var/lib/dpkg" / file).write_text("")
        # Who is not root cannot give files to root; all else is the same.
        dpkg = ["dpkg", f"--root={self.here}", "--force-depends", "--force-not-root", "--force-bad-path",
                "--log=/dev/null"]
        run(*dpkg, "--install", *self.packages.values())
        example = self.here / "usr/share/doc/cdgen/examples/FileSystem.cdefsrc"
        run(self.here / "usr/bin/cdgen", example, self.here / "a.cdef")
        self.assertEqual(run(self.here / "usr/bin/cdef", "verify", self.here / "a.cdef"), "")
        for document in (self.here / "usr/share/doc/cdgen").rglob("*.md"):
            self.assertEqual(broken_links(document), [], document.name)
        run(*dpkg, "--remove", *self.packages)
        self.assertFalse(list((self.here / "usr").rglob("*")) if (self.here / "usr").exists() else [])

    def test_names_who_made_it(self):
        """SECURITY.md tells users to report there."""
        maintainer = "A Packager <packager@packages.example>"
        run("cpack", "-G", "DEB", "-B", self.here, "-D", f"CPACK_PACKAGE_CONTACT={maintainer}", cwd=BUILD)
        (package,) = self.here.glob("cdgen_*.deb")
        self.assertEqual(run("dpkg-deb", "--field", package, "Maintainer").strip(), maintainer)
        run("dpkg-deb", "--extract", package, self.here / "root")
        changes = run("zcat", self.here / "root/usr/share/doc/cdgen/changelog.Debian.gz")
        self.assertIn(f"\n -- {maintainer}  ", changes)

    def test_says_what_its_programs_need(self):
        self.assertIn("libstdc++6", run("dpkg-deb", "--field", self.packages["cdgen"], "Depends"))


class Reproducible(Case):
    def test_place_and_time_of_the_build_do_not_matter(self):
        """Another source directory and another build directory give the same packages, byte for byte."""
        copy = self.here / "another place for the sources"
        files = subprocess.run(["git", "ls-files", "-z", "--cached", "--others", "--exclude-standard"], cwd=PROJECT,
                               check=True, capture_output=True, text=True).stdout
        for name in filter(None, files.split("\0")):
            (copy / name).parent.mkdir(parents=True, exist_ok=True)
            shutil.copy(PROJECT / name, copy / name)
        build = self.here / "b"
        names = ("CDGEN_LTO", "CDGEN_TOGETHER", "CMAKE_CXX_FLAGS_RELEASE")
        options = [f"-D{name}={PROGRAMS.cache[name]}" for name in names]
        run("cmake", "--preset", "package", *options, "-S", copy, "-B", build, cwd=copy)
        run("cmake", "--build", build)
        for name in ("cdgen", "cdef", "src/reader/libcdb_view.a"):
            self.assertTrue((build / name).read_bytes() == (BUILD / name).read_bytes(), name)
        for generator, pattern in (("DEB", "*.deb"), ("TGZ", "*.tar.gz")):
            here, there = (self.made(place, generator, pattern) for place in (BUILD, build))
            self.assertTrue(here == there, pattern)

    def made(self, build, generator, pattern):
        """The bytes of the packages by name, built without an environment variable for the time."""
        environment = {name: value for name, value in os.environ.items() if name != "SOURCE_DATE_EPOCH"}
        with tempfile.TemporaryDirectory(dir=self.here) as place:
            run("cpack", "-G", generator, "-B", place, cwd=build, env=environment)
            return {path.name: path.read_bytes() for path in pathlib.Path(place).glob(pattern)}


if __name__ == "__main__":
    unittest.main()
