"""Test the files for editors in the editors themselves, as far as these run without a screen."""

import json
import re
import subprocess
import unittest

from installed import PROJECT, Case, examples, program, run, tree

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


# Every one of these lines compiles.
RIGHT = """"" # a comment
ControlDefinition// x
	FileVersion=1.0.0.0
	Wrong=""	// not looked at
" " /* a comment
ResourceClass/* y */
	Description=1
"" // a comment
	DisplayName=2//x
 	/* a comment
"
	Properties=HasResources
	ClassPermTemplate=0
	ResourcePermTemplate=0
	 "" # a comment
	Name="a = b # c"
ClassToManagerMapping # z
	ResourceManager=Mgr1
	FirstKey=1
	LastKey=100
	MessageCatalog=mgr1.cat
	DescriptiveMessageSet=1
"""
# None of these does, put in front of the last stanza; each with the kind of mistake that it is.
WRONG = [
    ("/ResourceClass", "stanza"), ("ResourceClass/", "stanza"), ("ResourceClas", "stanza"),
    ('"" ResourceClass', "stanza"), ('" // x', "stanza"), ("\tNam # a=b", "no value"),
    ("\tNam // a=b", "no value"), ("\tName", "no value"), ("\tNam=1", "attribute"), ("\tName =1", "attribute"),
    ("\t/Name=1", "attribute"), ("\tFirstKey=1", "attribute"), ('\tNam="" x', "attribute"),
]


def compiles(place, source):
    (place / "tried.cdefsrc").write_bytes(source)
    return subprocess.run([program("cdgen"), "tried.cdefsrc", "tried.cdef"], cwd=place, check=False,
                          capture_output=True).returncode == 0


def right_sources(place):
    """Sources that compile: the examples, and the golden cases that do."""
    golden = (PROJECT / "tests/golden").rglob("*.cdefsrc")
    found = {path.stem: path.read_bytes() for path in (*golden, *examples().rglob("*.cdefsrc"))}
    return {name: text.decode("latin-1") for name, text in found.items() if compiles(place, text)}


def wrong_sources():
    """Sources with the mistake that an editor must mark: the number of the line, and the kind."""
    before, header, after = RIGHT.partition("ClassToManagerMapping")
    at = before.count("\n") + 1
    return [(f"{before}{line}\n{header}{after}", (at, kind)) for line, kind in WRONG]


class Vim(Case):
    def ask(self, file, script):
        """The items that the script appends to the list 'said' with the file open."""
        (self.here / "ask.vim").write_text(script)
        out = self.here / "said"
        run("vim", "-u", "NONE", "-N", "-i", "NONE", "-es",
            "--cmd", f"let &runtimepath = '{tree()}/share/vim/vimfiles,' . &runtimepath",
            "-c", "filetype plugin on", "-c", "syntax on", "-c", f"edit {file}",
            "-c", "let said = []", "-S", self.here / "ask.vim",
            "-c", f"call writefile(said, '{out}')", "-c", "qall!", cwd=self.here)
        return out.read_text().splitlines()

    def groups(self, source):
        """The syntax groups of each line, in the order in which they appear."""
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

    MISTAKES = {"cdefUnknownStanza": "stanza", "cdefUnknownAttribute": "attribute", "cdefNoAttribute": "no value"}

    def mistakes(self, sources):
        """Of each source: the numbers of the lines that have one, and what it is. Mistakes are marked from the first
        character on that is no blank."""
        for i, source in enumerate(sources):
            (self.here / f"{i}.cdefsrc").write_bytes(source.encode("latin-1"))
        said = self.ask("0.cdefsrc", f"""
            for i in range({len(sources)})
              execute 'edit!' i . '.cdefsrc'
              for line in range(1, line('$'))
                let name = synIDattr(synID(line, match(getline(line), '[^ \t]') + 1, 1), 'name')
                if has_key({self.MISTAKES}, name)
                  call add(said, join([i, line, name]))
                endif
              endfor
            endfor
            """)
        found = [[] for _ in sources]
        for i, line, name in map(str.split, said):
            found[int(i)].append((int(line), self.MISTAKES[name]))
        return found

    def test_shows_no_mistake_in_what_compiles(self):
        sources = right_sources(self.here)
        self.assertGreater(len(sources), 100)
        for name, mistakes in zip(sources, self.mistakes(list(sources.values()))):
            self.assertEqual(mistakes, [], name)

    def test_shows_no_mistake_in_odd_lines_that_compile(self):
        self.assertTrue(compiles(self.here, RIGHT.encode()))
        self.assertEqual(self.mistakes([RIGHT]), [[]])

    def test_shows_each_mistake(self):
        sources = wrong_sources()
        for (source, mistake), found in zip(sources, self.mistakes([source for source, _ in sources])):
            self.assertFalse(compiles(self.here, source.encode()), source)
            self.assertEqual(found, [mistake], source)

    def test_resumes_in_the_middle_of_a_stanza(self):
        """Lines that are asked for first, far from the top: as if the editor jumps there."""
        stanza = ("PersistentResourceAttribute // x\n\tName=A\n\tDescription=1\n# comment\n\tReportingInterval=3\n"
                  "\"\" # comment\n\tDataType=UInt32\n" + "\t# comment\n" * 100)
        source = "ControlDefinition\n\tFileVersion=1.0.0.0\n" + stanza * 50 + "Unknown\n\tName=B\n" + "# c\n" * 300 + stanza
        (self.here / "a.cdefsrc").write_text(source)
        end, unknown = source.count("\n"), 2 + 107 * 50
        said = self.ask("a.cdefsrc", f"""
            for line in [{end}, {end - 100}, {end - 102}, {end - 104}, {end - 105}, {end - 106}, {unknown + 2},
                \\ {unknown - 100}, {unknown - 102}]
              call add(said, synIDattr(synID(line, 2, 1), 'name'))
            endfor
            """)
        same = ["cdefAttributePersistentResourceAttribute", "cdefUnknownAttribute"]
        self.assertEqual(said, ["cdefComment", *same, "cdefAttributePersistentResourceAttribute",
                                "cdefAttributePersistentResourceAttribute", "cdefStanza", "", *same])

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


class TextMate(Case):
    def setUp(self):
        super().setUp()
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
        """Uses jq, which has the same regular expressions as the editors that use grammars."""
        said = run("jq", "-n", "--arg", "re", expression, "--arg", "text", text, "$text | test($re)")
        return json.loads(said)

    def test_expressions_compile(self):
        found = set(self.expressions(self.grammar))
        self.assertGreater(len(found), len(self.grammar["repository"]))
        for expression in found:
            self.matches(expression, "")

    def begun(self, lines):
        """For each line, the expressions of the grammar that match at its beginning."""
        used = sorted({text for text in self.expressions(self.grammar) if text.startswith("^")})
        (self.here / "asked.json").write_text(json.dumps([used, lines]))
        said = run("jq", "-c", ".[0] as $used | .[1] | map(. as $line | $used | map(. as $one | $line | test($one)))",
                   self.here / "asked.json")
        return [{text for text, matches in zip(used, found) if matches} for found in json.loads(said)]

    def rule_at(self, patterns, begun):
        """The first rule that matches at the beginning of a line; included rules are looked up."""
        for rule in patterns:
            rule = self.grammar["repository"][rule["include"][1:]] if "include" in rule else rule
            if rule.get("match", rule.get("begin")) in begun:
                return rule
        return None

    def mistakes(self, source):
        """The numbers of the lines that have one, and what it is; as an editor goes through them."""
        found, stanza, lines = [], None, source.split("\n")
        kinds = {"stanza": "stanza", "attribute": "attribute", "line": "no value"}
        for number, begun in enumerate(self.begun(lines), 1):
            if stanza and stanza["end"] in begun:
                stanza = None
            rule = self.rule_at((stanza or self.grammar)["patterns"], begun)
            if rule and "begin" in rule:
                stanza = rule
            said = re.search(r"invalid\.illegal\.(\w+)", json.dumps(rule.get("captures", rule)) if rule else "")
            if said and "begin" not in rule:
                found.append((number, kinds[said.group(1)]))
        return found

    def test_shows_no_mistake_in_what_compiles(self):
        sources = right_sources(self.here)
        self.assertGreater(len(sources), 100)
        for name, source in sources.items():
            self.assertEqual(self.mistakes(source), [], name)

    def test_shows_no_mistake_in_odd_lines_that_compile(self):
        self.assertEqual(self.mistakes(RIGHT), [])

    def test_shows_each_mistake(self):
        for source, mistake in wrong_sources():
            self.assertEqual(self.mistakes(source), [mistake], source)

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
