"""Test that release builds are optimised at link time, with or without a preset, and that the installed library is not."""

import json
import subprocess

import pytest
from programs import PROJECT


def optimised(directory, *settings):
    """The source folders that a build with these settings compiles for optimisation at link time."""
    subprocess.run(["cmake", "-S", PROJECT, "-B", directory, *settings], stdout=subprocess.DEVNULL, check=True)
    commands = json.loads((directory / "compile_commands.json").read_text())
    sources = {row["file"]: row["command"] for row in commands}
    return {file.split("/src/")[1].split("/")[0] for file, command in sources.items() if "-flto" in command}


@pytest.mark.parametrize("kind", ["Release", "RelWithDebInfo"])
def test_a_plain_build_is_optimised_except_for_the_installed_library(directory, kind):
    folders = optimised(directory, f"-DCMAKE_BUILD_TYPE={kind}")
    assert {"compiler", "language"} <= folders
    assert "reader" not in folders


@pytest.mark.parametrize("setting", ["-DCDGEN_LTO=OFF", "-DCMAKE_INTERPROCEDURAL_OPTIMIZATION=OFF",
                                     "-DCDGEN_SANITIZE=address", "-DCMAKE_BUILD_TYPE=Debug"])
def test_it_can_be_switched_off_and_is_for_no_other_build(directory, setting):
    assert not optimised(directory, "-DCMAKE_BUILD_TYPE=Release", setting)
