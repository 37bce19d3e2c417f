"""Test that what the subcommands write as JSON follows the schemas that are installed, and that these are strict.

Each document names its schema. Sources, images and databases of other tests are shown, and pairs of them compared.
"""

import copy
import json
import subprocess
import sys

import jsonschema
import pytest

from compare import same
from programs import EXAMPLES, PROGRAMS, PROJECT, TESTS, environment

SCHEMAS = {path.name: json.loads(path.read_text()) for path in (PROJECT / "schema").glob("*.schema.json")}
CASES = TESTS / "cdef/check"

sys.setrecursionlimit(20_000)  # for values within values


def document(*arguments):
    """What a subcommand writes as JSON; it follows its schema."""
    result = subprocess.run([PROGRAMS.cdef, *arguments], cwd=PROGRAMS.images, capture_output=True, timeout=60)
    data = json.loads(result.stdout)
    validator = jsonschema.Draft7Validator(SCHEMAS[data["schema"]])
    same([f"{each.json_path}: {each.message}" for each in validator.iter_errors(data)], [], f"{arguments}")
    return data


def compiled(name, directory):
    """The database of an example, by its path."""
    path = directory / f"{name}.cdef"
    subprocess.run([PROGRAMS.cdgen, EXAMPLES / f"{name}.cdefsrc", path], env=environment(), check=True, timeout=60)
    return path


def images():
    """The names of sound and broken images, below the directory that has them."""
    return sorted(str(path.relative_to(PROGRAMS.images)) for path in PROGRAMS.images.rglob("*.cdef"))


def test_schemas():
    """They are valid schemas, and each subcommand that writes JSON has one."""
    same(sorted(SCHEMAS), [f"cdef-{name}.schema.json" for name in ("check", "diff", "dump", "explain", "verify")], "names")
    for schema in SCHEMAS.values():
        jsonschema.Draft7Validator.check_schema(schema)


def test_check():
    """The sources of all cases, and names of files that do not exist."""
    sources = sorted(CASES.glob("*.cdefsrc"))
    data = document("check", "--format", "json", *sources, "none.cdefsrc", ".")
    same((data["schema"], len(data["sources"])), ("cdef-check.schema.json", len(sources) + 2), "schema, sources")


def test_verify():
    """All images, sound or not, and names of files that do not exist."""
    data = document("verify", "--format", "json", *images(), "none.cdef", CASES / "disk.cdefsrc")
    same((data["schema"], len(data["files"])), ("cdef-verify.schema.json", len(images()) + 2), "schema, files")


def test_explain():
    """All codes, and some of them."""
    data = document("explain", "--format", "json")
    same((data["schema"], data["codes"][0]["code"]), ("cdef-explain.schema.json", "S101"), "schema, first code")
    data = document("explain", "--json", "CDB104", "octal")
    same([each["code"] for each in data["codes"]], ["CDB104", "S509"], "codes")


@pytest.mark.parametrize("options", [(), ("--offsets",)])
def test_dump(options):
    """All sound images."""
    shown = 0
    for name in images():
        if subprocess.run([PROGRAMS.cdef, "verify", name], cwd=PROGRAMS.images, capture_output=True).returncode == 0:
            data = document("dump", "--format", "json", *options, name)
            shown += data["schema"] == "cdef-dump.schema.json"
    assert shown > 10


def test_diff(tmp_path):
    """Two of the examples, which differ completely, and two images that differ in one field."""
    one, two = (compiled(name, tmp_path) for name in ("Process", "ClusterNode"))
    for options in ((), ("--compat",)):
        data = document("diff", "--format", "json", *options, one, two)
        same(data["schema"], "cdef-diff.schema.json", "schema")
        assert {each["change"] for each in data["differences"]} >= {"removed"}
    data = document("diff", "--json", "small.little.cdef", "small.big.cdef")
    same((data["before"], data["after"]), ("small.little.cdef", "small.big.cdef"), "names")


@pytest.mark.parametrize("change", [
    lambda data: data.pop("version"),
    lambda data: data.update(version=2),
    lambda data: data["sources"][0].pop("errors"),
    lambda data: data["sources"][0].update(unreadable="x"),
    lambda data: data["sources"][0]["findings"][0].update(code="X1"),
    lambda data: data["sources"][0]["findings"][0].update(line="13"),
    lambda data: data["sources"][0]["findings"][0].update(more=1),
    lambda data: data["sources"][0]["findings"][0].pop("notes"),
])
def test_strict(change):
    """The schemas refuse documents that do not follow them."""
    data = copy.deepcopy(document("check", "--json", CASES / "json.cdefsrc"))
    change(data)
    assert not jsonschema.Draft7Validator(SCHEMAS["cdef-check.schema.json"]).is_valid(data)
