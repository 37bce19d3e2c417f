"""Compares the completions that a shell offers with the options and values that the programs accept."""

import os
import pty
import re
import select
import time
import unittest

from installed import TIMEOUT, Case, only, program, run, tree
from understood import options, options_of_cdgen, subcommands, values


class Shell(Case):
    """A directory with some files, and the installed programs on the path."""

    def setUp(self):
        super().setUp()
        for name in ("Disk.cdefsrc", "Disk.cdef", "Tape Drive.cdef", "notes.txt"):
            (self.here / name).write_text("")
        self.environment = {**os.environ, "PATH": f"{program('cdgen').parent}:{os.environ['PATH']}",
                            "HOME": str(self.here), "XDG_DATA_DIRS": str(tree() / "share"), "LC_ALL": "C.UTF-8",
                            "TERM": "dumb"}

    def shell(self, *command):
        return run(*command, cwd=self.here, env=self.environment)


class Offers:
    """Tests for shells that can list all that they offer; offers() has it in the shell's order."""

    def offered(self, line):
        return set(self.offers(line))

    def test_options_of_cdgen(self):
        self.assertEqual(self.offered("cdgen -"), options_of_cdgen())

    def test_level_follows_its_option(self):
        self.assertEqual(self.offered("cdgen -d "), {"1", "2", "3"})

    def test_source_then_database(self):
        self.assertEqual(self.offers("cdgen -s D")[0], "Disk.cdefsrc")
        self.assertEqual(self.offers("cdgen -d 2 D")[0], "Disk.cdefsrc")
        self.assertEqual(self.offers("cdgen Disk.cdefsrc D")[0], "Disk.cdef")
        self.assertEqual(self.offers("cdgen Disk.cdefsrc Disk.cdef "), [])

    def test_subcommands_of_cdef(self):
        self.assertEqual(self.offered("cdef "), subcommands())

    def test_options_of_cdef(self):
        self.assertEqual(self.offered("cdef -"), options())

    def test_options_of_each_subcommand(self):
        for subcommand in subcommands():
            with self.subTest(subcommand):
                self.assertEqual(self.offered(f"cdef {subcommand} -"), options(subcommand))

    def test_values_of_options(self):
        self.assertEqual(set(values("check")), {"--format", "--color", "--warn", "--no-warn"})
        for subcommand in subcommands():
            for option, known in values(subcommand).items():
                with self.subTest(subcommand, option=option):
                    self.assertEqual(self.offered(f"cdef {subcommand} {option} "), known)

    def test_codes_for_explain(self):
        self.assertEqual(self.offered("cdef explain S50"), {f"S50{number}" for number in range(1, 10)})

    def test_values_that_are_optional(self):
        for typed, known in (("", {"readers", "clients", "stored"}), ("c", {"clients"})):
            with self.subTest(typed):
                self.assertEqual(self.offered_after("cdef diff", "--compat", typed), known)

    def test_databases_for_a_subcommand(self):
        offered = self.offered("cdef verify ")
        self.assertLessEqual({"Disk.cdef", "Tape Drive.cdef"}, offered)
        self.assertNotIn("verify", offered)


class Bash(Offers, Shell):
    def offers(self, line):
        name = line.split()[0]
        words = line.split(" ")
        script = f'''source "{tree()}/share/bash-completion/completions/{name}"
            COMP_WORDS=({' '.join(f"'{word}'" for word in words)}) COMP_CWORD={len(words) - 1}
            function=$(complete -p {name} | sed 's/.*-F \\([^ ]*\\) .*/\\1/')
            "$function" {name} '{words[-1]}' '{words[-2]}'
            printf '%s\\n' "${{COMPREPLY[@]}}"'''
        return list(filter(None, self.shell("bash", "--norc", "-c", script).splitlines()))

    def offered_after(self, line, option, typed):
        """The shell takes "=" for a word of its own."""
        return self.offered(f"{line} {option} = {typed}" if typed else f"{line} {option} =")

    def test_bash_completion_finds_them(self):
        script = ("source /usr/share/bash-completion/bash_completion && for name in cdgen cdef; do "
                  "__load_completion $name && complete -p $name; done")
        said = self.shell("bash", "--norc", "-c", script)
        self.assertEqual(said, "complete -F _cdgen cdgen\ncomplete -F _cdef cdef\n")


class Fish(Offers, Shell):
    def offers(self, line):
        place = tree() / "share/fish/vendor_completions.d"
        name = line.split()[0]
        said = self.shell("fish", "--no-config", "-c", f"source '{place}/{name}.fish'; complete -C '{line}'")
        return [offer.split("\t")[0].replace("\\ ", " ") for offer in said.splitlines()]

    def offered_after(self, line, option, typed):
        return {offer.removeprefix(f"{option}=") for offer in self.offered(f"{line} {option}={typed}")}


class Zsh(Shell):
    """zsh completes only at a terminal: the test types lines, and a function in the place of the program prints its
    arguments."""

    def completed(self, line):
        """The words after a tab."""
        setup = ("autoload -Uz compinit; compinit -u -D; PS1= PS2=; unsetopt zle_bracketed_paste automenu; "
                 "LISTMAX=1000; "
                 f"fake() {{ print -r -- \"GOT${{(j:|:)@}}END\" }}; {line.split()[0]}() {{ fake \"$@\" }}")
        place = only("share/zsh/*/_cdef").parent
        (self.here / ".zshrc").write_text(f"fpath=('{place}' $fpath)\n{setup}\nprint READY\n")
        pid, terminal = pty.fork()
        if pid == 0:
            os.chdir(self.here)
            os.execvpe("zsh", ["zsh", "-i"], {**self.environment, "ZDOTDIR": str(self.here)})
        try:
            self.read_until(terminal, "READY")
            os.write(terminal, f"{line}\t\n".encode())
            self.said = self.read_until(terminal, "END")
            return re.findall(r"GOT(.*?)END", self.said)[-1].split("|")
        finally:
            os.close(terminal)
            os.waitpid(pid, 0)

    def read_until(self, terminal, mark):
        said, end = "", time.monotonic() + TIMEOUT
        while mark not in said:
            self.assertLess(time.monotonic(), end, said)
            if select.select([terminal], [], [], 1)[0]:
                said += os.read(terminal, 65536).decode(errors="replace")
        return said

    def test_subcommand(self):
        for subcommand in sorted(subcommands()):
            with self.subTest(subcommand):
                self.assertEqual(self.completed(f"cdef {subcommand[:-1]}"), [subcommand])

    def test_options_of_each_subcommand(self):
        for subcommand in sorted(subcommands()):
            long = {option for option in options(subcommand) if option.startswith("--")}
            for option in sorted(long):
                with self.subTest(subcommand, option=option):
                    words = self.completed(f"cdef {subcommand} {option[:-1]}")
                    if any(other.startswith(option[:-1]) for other in long - {option}):
                        self.assertRegex(self.said, rf"\n{option}\s")  # in the list of what it could be
                    else:
                        self.assertEqual(words, [subcommand, option])

    def test_source_then_database(self):
        self.assertEqual(self.completed("cdgen -s D"), ["-s", "Disk.cdefsrc"])
        self.assertEqual(self.completed("cdgen Disk.cdefsrc T"), ["Disk.cdefsrc", "Tape Drive.cdef"])

    def test_values_of_options(self):
        self.assertEqual(self.completed("cdef check --format j"), ["check", "--format", "json"])
        for option, known in values("check").items():
            with self.subTest(option):
                self.completed(f"cdef check {option} ")
                self.assertLessEqual(known, set(self.said.split()))

    def test_options_of_cdgen(self):
        self.completed("cdgen -")
        self.assertEqual(set(re.findall(r"^(-\w) +-- ", self.said.replace("\r", ""), re.M)), options_of_cdgen())


if __name__ == "__main__":
    unittest.main()
