"""The Debian package: what Debian's checker says, and installing, running and removing it in a root of its own."""

import os
import pathlib
import shutil
import subprocess
import tempfile
import unittest

from installed import BUILD, PROJECT, Case, run
from documents import broken_links


class Package(Case):
    @classmethod
    def setUpClass(cls):
        place = tempfile.TemporaryDirectory(prefix="cdgen-package-")
        cls.addClassCleanup(place.cleanup)
        run("cpack", "-G", "DEB", "-B", place.name, cwd=BUILD)
        (cls.package,) = pathlib.Path(place.name).glob("*.deb")

    def test_lintian_finds_no_error(self):
        run("lintian", "--no-cfg", "--allow-root", "--fail-on", "error", self.package)

    def test_installs_runs_and_goes_away_again(self):
        for directory in ("updates", "info"):
            (self.here / "var/lib/dpkg" / directory).mkdir(parents=True)
        for file in ("status", "available"):
            (self.here / "var/lib/dpkg" / file).write_text("")
        # Who is not root cannot give files to root; all else is the same.
        dpkg = ["dpkg", f"--root={self.here}", "--force-depends", "--force-not-root", "--force-bad-path",
                "--log=/dev/null"]
        run(*dpkg, "--install", self.package)
        example = self.here / "usr/share/doc/cdgen/examples/FileSystem.cdefsrc"
        run(self.here / "usr/bin/cdgen", example, self.here / "a.cdef")
        self.assertEqual(run(self.here / "usr/bin/cdef", "verify", self.here / "a.cdef"), "")
        for document in (self.here / "usr/share/doc/cdgen").rglob("*.md"):
            self.assertEqual(broken_links(document), [], document.name)
        run(*dpkg, "--remove", "cdgen")
        self.assertFalse(list((self.here / "usr").rglob("*")) if (self.here / "usr").exists() else [])

    def test_names_who_made_it(self):
        """SECURITY.md sends reports there."""
        maintainer = "A Packager <packager@packages.example>"
        run("cpack", "-G", "DEB", "-B", self.here, "-D", f"CPACK_PACKAGE_CONTACT={maintainer}", cwd=BUILD)
        (package,) = self.here.glob("*.deb")
        self.assertEqual(run("dpkg-deb", "--field", package, "Maintainer").strip(), maintainer)
        run("dpkg-deb", "--extract", package, self.here / "root")
        changes = run("zcat", self.here / "root/usr/share/doc/cdgen/changelog.Debian.gz")
        self.assertIn(f"\n -- {maintainer}  ", changes)

    def test_says_what_its_programs_need(self):
        self.assertIn("libstdc++6", run("dpkg-deb", "--field", self.package, "Depends"))


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
        run("cmake", "--preset", "package", "-S", copy, "-B", build, cwd=copy)
        run("cmake", "--build", build)
        for name in ("cdgen", "cdef", "libcdb_view.a"):
            self.assertTrue((build / name).read_bytes() == (BUILD / name).read_bytes(), name)
        for generator, pattern in (("DEB", "*.deb"), ("TGZ", "*.tar.gz")):
            here, there = (self.package(place, generator, pattern) for place in (BUILD, build))
            self.assertTrue(here == there, pattern)

    def package(self, build, generator, pattern):
        """The bytes of the package, without what the environment says of the time."""
        environment = {name: value for name, value in os.environ.items() if name != "SOURCE_DATE_EPOCH"}
        with tempfile.TemporaryDirectory(dir=self.here) as place:
            run("cpack", "-G", generator, "-B", place, cwd=build, env=environment)
            (made,) = pathlib.Path(place).glob(pattern)
            return made.read_bytes()


if __name__ == "__main__":
    unittest.main()
