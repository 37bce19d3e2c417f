"""Test that the documents of the installed program name the installed schemas and follow them."""

import json
import subprocess

import jsonschema

from installed import Case, examples, program, tree


class Schemas(Case):
    def document(self, *arguments):
        """A subcommand's JSON document, checked against the installed schema that it names."""
        done = subprocess.run([program("cdef"), *arguments, "--format", "json"], cwd=self.here, capture_output=True,
                              timeout=60)
        data = json.loads(done.stdout)
        schema = json.loads((tree() / "share/cdgen/schema" / data["schema"]).read_text())
        self.assertEqual(data["version"], schema["properties"]["version"]["const"])
        self.assertEqual([each.message for each in jsonschema.Draft7Validator(schema).iter_errors(data)], [], arguments)
        return data["schema"]

    def test_what_each_subcommand_writes_follows_its_schema(self):
        source, other = (examples() / f"{name}.cdefsrc" for name in ("Process", "FileSystem"))
        shown = {self.document("build", "-d", ".", source, other)}
        (self.here / "wrong.cdefsrc").write_text("Nonsense\n")
        shown |= {self.document("check", source, "wrong.cdefsrc", "missing"), self.document("explain"),
                  self.document("verify", "Process.cdef", "wrong.cdefsrc"), self.document("dump", "Process.cdef"),
                  self.document("diff", "Process.cdef", "FileSystem.cdef")}
        self.assertEqual(sorted(shown), sorted(path.name for path in (tree() / "share/cdgen/schema").iterdir()))
