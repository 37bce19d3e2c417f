"""The files for editors, in the editors themselves as far as they run without a screen."""

import json
import unittest

from installed import Case, examples, run, tree

SOURCE = """ControlDefinition
	FileVersion=1.0.0.0
ResourceClass
	Descripton=1
	DisplayName=2
	FirstKey=1
	Properties=HasResources
	DataType
ResorceClass
# a comment
PersistentResourceAttribute
	DataType=UInt32
	Name="x # y"
"""


class Vim(Case):
    def ask(self, file, script):
        """What the script appends to the list 'said', with the file open."""
        (self.here / "ask.vim").write_text(script)
        out = self.here / "said"
        run("vim", "-u", "NONE", "-N", "-i", "NONE", "-es",
            "--cmd", f"set runtimepath^={tree()}/share/cdgen/editors/vim", "-c", "filetype plugin on",
            "-c", "syntax on", "-c", f"edit {file}", "-c", "let said = []", "-S", self.here / "ask.vim",
            "-c", f"call writefile(said, '{out}')", "-c", "qall!", cwd=self.here)
        return out.read_text().splitlines()

    def groups(self, source):
        """Of each line: syntax groups, in the order in which they appear."""
        (self.here / "a.cdefsrc").write_text(source)
        said = self.ask("a.cdefsrc", """
            for line in range(1, line('$'))
              let names = []
              for column in range(1, col([line, '$']) - 1)
                let name = synIDattr(synID(line, column, 1), 'name')
                if name != '' && name !~ '^cdefIn[A-Z]' && get(names, -1, '') != name
                  call add(names, name)
                endif
              endfor
              call add(said, join(names))
            endfor
            """)
        return [line.split() for line in said]

    def test_shows_what_is_known_and_what_is_not(self):
        self.assertEqual(self.groups(SOURCE), [
            ["cdefStanza"],
            ["cdefAttributeControlDefinition", "cdefNumber"],
            ["cdefStanza"],
            ["cdefUnknownAttribute", "cdefNumber"],
            ["cdefAttributeResourceClass", "cdefNumber"],
            ["cdefUnknownAttribute", "cdefNumber"],  # of another stanza
            ["cdefAttributeResourceClass", "cdefProperty"],
            ["cdefNoAttribute"],
            ["cdefUnknownStanza"],
            ["cdefComment"],
            ["cdefStanza"],
            ["cdefAttributePersistentResourceAttribute", "cdefType"],
            ["cdefAttributePersistentResourceAttribute", "cdefString"],
        ])

    def test_shows_no_mistake_in_the_examples(self):
        for example in sorted(examples().glob("*.cdefsrc")):
            groups = {name for line in self.groups(example.read_text()) for name in line}
            self.assertIn("cdefStanza", groups)
            self.assertFalse({"cdefUnknownStanza", "cdefUnknownAttribute", "cdefNoAttribute"} & groups, example.name)

    def test_make_checks_the_file(self):
        (self.here / "a.cdefsrc").write_text(SOURCE)
        self.assertEqual(self.ask("a.cdefsrc", "call add(said, &makeprg)"), ["cdef check %:S"])

    def test_mistakes_go_to_the_quickfix_list(self):
        (self.here / "a.cdefsrc").write_text(SOURCE)
        (self.here / "told").write_text("a.cdefsrc:4:2: error: no such attribute [C101]\n"
                                        "a.cdefsrc:9:1: warning: odd [C7]\n")
        said = self.ask("a.cdefsrc", """
            cgetfile told
            for e in getqflist()
              call add(said, join([bufname(e.bufnr), e.lnum, e.col, e.type, e.text], '|'))
            endfor
            """)
        self.assertEqual(said, ["a.cdefsrc|4|2|e|no such attribute [C101]", "a.cdefsrc|9|1|w|odd [C7]"])


class TextMate(unittest.TestCase):
    def setUp(self):
        self.root = tree() / "share/cdgen/editors/vscode"
        self.grammar = json.loads((self.root / "syntaxes/cdefsrc.tmLanguage.json").read_text())

    def expressions(self, part):
        """Every regular expression in a part of the grammar."""
        if isinstance(part, list):
            return [found for item in part for found in self.expressions(item)]
        if not isinstance(part, dict):
            return []
        return [value for key, item in part.items()
                for value in ([item] if key in ("match", "begin", "end") else self.expressions(item))]

    def matches(self, expression, text):
        """jq has the regular expressions that editors use for grammars."""
        said = run("jq", "-n", "--arg", "re", expression, "--arg", "text", text, "$text | test($re)")
        return json.loads(said)

    def test_expressions_compile(self):
        found = set(self.expressions(self.grammar))
        self.assertGreater(len(found), len(self.grammar["repository"]))
        for expression in found:
            self.matches(expression, "")

    def test_known_attribute_is_one_of_its_stanza(self):
        known, unknown = [rule["match"] for rule in self.grammar["repository"]["ResourceClass"]["patterns"]
                          if "match" in rule]
        for line, is_known in (("\tLocator=x", True), ("\tLocater=x", False), ("\tFirstKey=1", False)):
            self.assertEqual(self.matches(known, line), is_known, line)
            self.assertTrue(self.matches(unknown, line), line)  # which comes second

    def test_every_rule_that_is_included_exists(self):
        included = [name for name in json.dumps(self.grammar).split('"') if name.startswith("#")]
        for name in set(included):
            self.assertIn(name[1:], self.grammar["repository"])

    def test_extension_names_files_that_exist(self):
        package = json.loads((self.root / "package.json").read_text())
        contributes = package["contributes"]
        for path in (*[grammar["path"] for grammar in contributes["grammars"]],
                     *[language["configuration"] for language in contributes["languages"]]):
            json.loads((self.root / path).read_text())
        self.assertEqual({grammar["scopeName"] for grammar in contributes["grammars"]}, {self.grammar["scopeName"]})


if __name__ == "__main__":
    unittest.main()
