"""Test the hooks with Debian's pre-commit and the installed programs."""

import os
import shutil
import subprocess
import unittest

from installed import Case, PROJECT, examples, run, tree


class Hooks(Case):
    def setUp(self):
        super().setUp()
        self.hooks, self.project = self.here / "hooks", self.here / "project"
        who = {f"GIT_{role}_{what}": "someone@example.com" for role in ("AUTHOR", "COMMITTER") for what in ("NAME", "EMAIL")}
        self.environment = {**os.environ, **who, "PATH": f"{tree() / 'bin'}:{os.environ['PATH']}",
                            "PRE_COMMIT_HOME": str(self.here / "home"), "GIT_CONFIG_GLOBAL": "/dev/null"}
        for place in (self.hooks, self.project):
            place.mkdir()
            self.git(place, "init", "-q", ".")
        (self.hooks / ".pre-commit-hooks.yaml").write_bytes((PROJECT / ".pre-commit-hooks.yaml").read_bytes())
        self.commit(self.hooks)
        revision = self.git(self.hooks, "rev-parse", "HEAD").strip()
        (self.project / ".pre-commit-config.yaml").write_text(
            f"repos:\n  - repo: '{self.hooks}'\n    rev: {revision}\n    hooks:\n"
            "      - id: cdef-check\n      - id: cdef-gate\n")
        self.source = self.project / "a b.cdefsrc"
        self.source.write_bytes((examples() / "projects/make/Disk.cdefsrc").read_bytes())
        self.commit(self.project)

    def git(self, place, *arguments):
        return run("git", *arguments, cwd=place, env=self.environment)

    def commit(self, place):
        self.git(place, "add", "-A")
        self.git(place, "commit", "-qm", "a commit")

    def run_hooks(self):
        """The status and the output of the hooks for a staged change."""
        self.git(self.project, "add", "-A")
        done = subprocess.run(["pre-commit", "run", "--color=never"], cwd=self.project, env=self.environment, text=True,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False)
        return done.returncode, done.stdout

    def change(self, old, new):
        text = self.source.read_bytes()
        self.assertIn(old, text)
        self.source.write_bytes(text.replace(old, new, 1))

    def test_pass_what_is_sound(self):
        self.change(b"BlockSize", b"BlockSize")
        (self.project / "other.txt").write_text("nothing of theirs")
        status, said = self.run_hooks()
        self.assertEqual(status, 0, said)
        self.source.write_bytes(self.source.read_bytes() + b"# a comment\n")
        status, said = self.run_hooks()
        self.assertEqual(status, 0, said)
        self.assertEqual(said.count("Passed"), 2, said)

    def test_stop_mistakes(self):
        self.change(b"UInt32", b"Uint32")
        status, said = self.run_hooks()
        self.assertEqual(status, 1, said)
        self.assertIn("a b.cdefsrc:18:11: error: Invalid data type", said)

    def test_stop_what_breaks_others(self):
        self.change(b"Id=1\n", b"Id=77\n")
        status, said = self.run_hooks()
        self.assertEqual(status, 1, said)
        self.assertIn("Id 1 -> 77 (readers know it by its number) [CMP102]", said)

    def test_stop_what_breaks_others_in_a_renamed_source(self):
        self.git(self.project, "mv", "--", self.source.name, "-new.cdefsrc")
        self.source = self.project / "-new.cdefsrc"
        status, said = self.run_hooks()
        self.assertEqual(status, 0, said)
        self.change(b"Id=1\n", b"Id=77\n")
        status, said = self.run_hooks()
        self.assertEqual(status, 1, said)
        self.assertIn("Id 1 -> 77 (readers know it by its number) [CMP102]", said)

    def test_pass_the_first_commit(self):
        """Its classes are new. Warnings still stop it."""
        shutil.rmtree(self.project / ".git")
        self.git(self.project, "init", "-q", ".")
        status, said = self.run_hooks()
        self.assertEqual(status, 0, said)
        self.assertEqual(said.count("Passed"), 2, said)
        self.change(b"Public,", b"Public,Public,")
        status, said = self.run_hooks()
        self.assertEqual(status, 1, said)
        self.assertIn("[S532 properties]", said)

    def commit_all(self):
        """The status and the output of a commit with the installed hooks."""
        done = subprocess.run(["git", "commit", "-qam", "a change"], cwd=self.project, env=self.environment, text=True,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False)
        return done.returncode, done.stdout

    def test_commit_with_installed_hooks(self):
        """A sound change is committed, and one that breaks others or has a mistake is not."""
        run("pre-commit", "install", cwd=self.project, env=self.environment)
        first = self.git(self.project, "rev-parse", "HEAD")
        self.source.write_bytes(self.source.read_bytes() + b"# a comment\n")
        status, said = self.commit_all()
        self.assertEqual(status, 0, said)
        second = self.git(self.project, "rev-parse", "HEAD")
        self.assertNotEqual(first, second)
        for old, new, why in ((b"Id=1\n", b"Id=77\n", "[CMP102]"), (b"UInt32", b"Uint32", "Invalid data type")):
            self.change(old, new)
            status, said = self.commit_all()
            self.assertNotEqual(status, 0, said)
            self.assertIn(why, said)
            self.assertEqual(self.git(self.project, "rev-parse", "HEAD"), second)
            self.git(self.project, "checkout", "-q", "HEAD", "--", ".")

    def test_stop_a_commit_in_a_linked_worktree(self):
        run("pre-commit", "install", cwd=self.project, env=self.environment)
        linked = self.here / "linked"
        self.git(self.project, "worktree", "add", "-q", linked)
        self.source = linked / self.source.name
        self.change(b"Id=1\n", b"Id=77\n")
        done = subprocess.run(["git", "commit", "-qam", "a change"], cwd=linked, env=self.environment, text=True,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False)
        self.assertNotEqual(done.returncode, 0, done.stdout)
        self.assertIn("Id 1 -> 77 (readers know it by its number) [CMP102]", done.stdout)


if __name__ == "__main__":
    unittest.main()
