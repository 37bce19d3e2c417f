"""Test that warnings are errors only in the presets for developers: another compiler has other warnings."""

import json

import pytest
from programs import PROJECT

PRESETS = {row["name"]: row for row in json.loads((PROJECT / "CMakePresets.json").read_text())["configurePresets"]}
DEVELOPERS = {"test", "clang", "debug", "sanitize", "threads", "i686", "armhf"}


def variables(name):
    """A preset's cache variables, including those that it inherits."""
    preset = PRESETS[name]
    inherited = variables(preset["inherits"]) if "inherits" in preset else {}
    return {**inherited, **preset.get("cacheVariables", {})}


@pytest.mark.parametrize("name", sorted(PRESETS))
def test_only_developers_presets_make_warnings_errors(name):
    makes_errors = variables(name).get("CMAKE_COMPILE_WARNING_AS_ERROR", "OFF") == "ON"
    assert makes_errors == (name in DEVELOPERS)


def test_build_itself_makes_no_warning_an_error():
    for path in [PROJECT / "CMakeLists.txt", *(PROJECT / "src").rglob("CMakeLists.txt")]:
        assert "-Werror" not in path.read_text()
