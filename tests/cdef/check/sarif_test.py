"""Test that `cdef check --format sarif` writes SARIF 2.1.0: each log is like
cdef/sarif_schema.json, whatever is found and wherever it is, and says what
`--format json` says.
"""

import copy
import json
import pathlib
import subprocess
import tempfile
import unittest

import jsonschema

from programs import PROGRAMS, TESTS

CASES = TESTS / "cdef/check"
SCHEMA = jsonschema.Draft7Validator(json.loads((CASES.parent / "sarif_schema.json").read_text()))


def check(form, *sources):
    """The findings in the sources, in a form."""
    command = [PROGRAMS.cdef, "check", "--format", form, *sources]
    result = subprocess.run(command, cwd=CASES, capture_output=True, check=False, timeout=60)
    return json.loads(result.stdout)


class Logs(unittest.TestCase):
    """Logs about sources of all kinds."""

    def sarif(self, *sources):
        """A log, checked against the schema."""
        log = check("sarif", *sources)
        self.assertEqual([f"{error.json_path}: {error.message}" for error in SCHEMA.iter_errors(log)], [])
        (run,) = log["runs"]
        rules = {rule["id"] for rule in run["tool"]["driver"]["rules"]}
        self.assertLessEqual({result["ruleId"] for result in run["results"]}, rules)
        for place in (each for result in run["results"] for each in result["locations"] + result.get("relatedLocations", [])):
            region = place["physicalLocation"].get("region", {})
            self.assertLessEqual(region.get("startColumn", 1), region.get("endColumn", 1))
        return run["results"]

    def test_nothing_found(self):
        self.assertEqual(self.sarif("sound.cdefsrc"), [])

    def test_of_the_source_as_a_whole(self):
        """Consumers want a line."""
        results = self.sarif("empty.cdefsrc")
        self.assertEqual([result["ruleId"] for result in results], ["S301", "S302"])
        for result in results:
            self.assertEqual(result["locations"][0]["physicalLocation"]["region"], {"startLine": 1})

    def test_without_a_column(self):
        region = self.sarif("keys.cdefsrc")[1]["locations"][0]["physicalLocation"]["region"]
        self.assertEqual(region, {"startLine": 13})

    def test_all_cases(self):
        sources = sorted(path.name for path in CASES.glob("*.cdefsrc"))
        found = [(each["file"], one) for each in check("json", *sources)["sources"] for one in each["findings"]]
        results = self.sarif(*sources)
        self.assertGreater(len(results), len(sources))
        self.assertEqual(len(results), len(found))
        for result, (file, one) in zip(results, found):
            place = result["locations"][0]["physicalLocation"]
            said = (result["ruleId"], result["level"], result["message"]["text"], place["artifactLocation"]["uri"])
            self.assertEqual(said, (one["code"], one["severity"], one["message"], file))
            self.assertEqual(place["region"]["startLine"], one.get("physical_line", one["line"] or 1))
            notes = [note["message"]["text"] for note in result.get("relatedLocations", [])]
            self.assertEqual(notes, [note["message"] for note in one["notes"]])

    def test_names_that_are_no_uri(self):
        with tempfile.TemporaryDirectory() as directory:
            source = pathlib.Path(directory) / "a b:%\u00e4#?.cdefsrc"
            source.write_bytes((CASES / "keys.cdefsrc").read_bytes())
            place = self.sarif(source)[0]["locations"][0]["physicalLocation"]
        self.assertTrue(place["artifactLocation"]["uri"].endswith("/a%20b%3A%25%C3%A4%23%3F.cdefsrc"))


class Properties(unittest.TestCase):
    """Properties that consumers of a log rely on."""

    def run_on(self, text, name="a.cdefsrc"):
        """The run of a log about a text, and the directory's name in it."""
        with tempfile.TemporaryDirectory() as directory:
            source = pathlib.Path(directory) / name
            source.write_bytes(text)
            (run,) = check("sarif", source)["runs"]
        return run, directory

    def test_absolute_and_relative_paths(self):
        run, directory = self.run_on(b"Nonsense\n")
        uri = run["results"][0]["locations"][0]["physicalLocation"]["artifactLocation"]["uri"]
        self.assertEqual(uri, f"file://{directory}/a.cdefsrc")
        (run,) = check("sarif", "keys.cdefsrc")["runs"]
        uri = run["results"][0]["locations"][0]["physicalLocation"]["artifactLocation"]["uri"]
        self.assertEqual(uri, "keys.cdefsrc")

    def test_rules_explain_themselves(self):
        rules = check("sarif", "sound.cdefsrc")["runs"][0]["tool"]["driver"]["rules"]
        (octal,) = (rule for rule in rules if rule["id"] == "S509")
        self.assertEqual(octal["name"], "octal")
        self.assertIn("A leading 0 makes a number octal", octal["fullDescription"]["text"])
        self.assertIn("Remove the 0", octal["help"]["text"])
        self.assertEqual(octal["defaultConfiguration"], {"level": "warning"})
        self.assertEqual(len({rule["id"] for rule in rules}), len(rules))

    def test_results_know_their_rules(self):
        (run,) = check("sarif", "numbers.cdefsrc", "keys.cdefsrc")["runs"]
        rules = [rule["id"] for rule in run["tool"]["driver"]["rules"]]
        self.assertEqual([rules[result["ruleIndex"]] for result in run["results"]],
                         [result["ruleId"] for result in run["results"]])

    def test_fixes_cure(self):
        text = (CASES / "disk.cdefsrc").read_bytes()
        run, _ = self.run_on(text)
        lines = text.decode().splitlines(keepends=True)
        for result in run["results"]:
            (change,) = result["fixes"][0]["artifactChanges"]
            (replacement,) = change["replacements"]
            region = replacement["deletedRegion"]
            self.assertEqual(region["startLine"], region["endLine"])
            line = lines[region["startLine"] - 1]
            lines[region["startLine"] - 1] = (
                line[:region["startColumn"] - 1] + replacement["insertedContent"]["text"] + line[region["endColumn"] - 1:])
        self.assertEqual(len(run["results"]), 2)
        run, _ = self.run_on("".join(lines).encode())
        self.assertEqual(run["results"], [])

    def test_fingerprints_survive_moved_lines(self):
        text = (CASES / "disk.cdefsrc").read_bytes() + b"Nonsense\nNonsense\n"
        before, after = ([result["partialFingerprints"]["primaryLocationLineHash"] for result in self.run_on(each)[0]["results"]]
                         for each in (text, b"# a comment\n\n" + text))
        self.assertEqual(before, after)
        self.assertEqual(len(set(before)), len(before))

    def test_sources_that_cannot_be_read(self):
        (invocation,) = check("sarif", "keys.cdefsrc", "missing", ".")["runs"][0]["invocations"]
        self.assertFalse(invocation["executionSuccessful"])
        said = [(each["message"]["text"], each["locations"][0]["physicalLocation"]["artifactLocation"]["uri"])
                for each in invocation["toolExecutionNotifications"]]
        self.assertEqual(said, [("missing: cannot open because: No such file or directory", "missing"),
                                (".: cannot read because: Is a directory", ".")])
        self.assertEqual(check("sarif", "keys.cdefsrc")["runs"][0]["invocations"], [{"executionSuccessful": True}])


class Schema(unittest.TestCase):
    """The schema refuses wrong logs."""

    def test_changed_logs(self):
        good = check("sarif", "unknown-attribute.cdefsrc")
        changes = (
            lambda log: log.update(version="2.0.0"),
            lambda log: log.pop("runs"),
            lambda log: log["runs"][0]["tool"].pop("driver"),
            lambda log: log["runs"][0]["results"][0].pop("message"),
            lambda log: log["runs"][0]["results"][0].update(level="fatal"),
            lambda log: log["runs"][0]["results"][0].update(line=1),
            lambda log: log["runs"][0]["results"][0]["locations"][0]["physicalLocation"]["region"].update(startLine=0),
        )
        self.assertTrue(SCHEMA.is_valid(good))
        for change in changes:
            bad = copy.deepcopy(good)
            change(bad)
            self.assertFalse(SCHEMA.is_valid(bad))
