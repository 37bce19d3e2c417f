"""Validates the SARIF logs of all sources and images that tests have, the sources alone and together, and says how
many logs there were.

The first argument is where npm has put the validator, the second the program cdef, beside which the images are built.
"""

import json
import os
import pathlib
import subprocess
import sys
import tempfile

import jsonschema

PROJECT = pathlib.Path(__file__).resolve().parents[2]
CASES = PROJECT / "tests/cdef/check"
TOOL = "node_modules/@microsoft/sarif-multitool-linux"


def logs(cdef, directory):
    """Write the logs; their paths."""
    images = cdef.parent / "tests/image"
    sources, broken = (sorted(str(path.relative_to(place)) for path in place.rglob(pattern))
                       for place, pattern in ((CASES, "*.cdefsrc"), (images, "*.cdef")))
    groups = [("check", CASES, group) for group in
              [[source] for source in sources] + [sources, [*sources[:3], "missing"], [str(CASES / sources[0])]]]
    groups += [("verify", images, group) for group in (broken, [broken[0], "missing"], [str(images / broken[0])])]
    paths = []
    for number, (subcommand, place, group) in enumerate(groups):
        paths.append(directory / f"{number}.sarif")
        with paths[-1].open("wb") as log:
            subprocess.run([cdef, subcommand, "--format", "sarif", *group], cwd=place, stdout=log,
                           stderr=subprocess.DEVNULL, check=False, timeout=60)
    return paths


def main():
    """Returns whether all logs are valid."""
    place, cdef = pathlib.Path(sys.argv[1]).resolve() / TOOL, pathlib.Path(sys.argv[2]).resolve()
    schema = json.loads((place / "sarif-2.1.0.json").read_text("utf-8-sig"))
    validator = jsonschema.validators.validator_for(schema)(schema)
    tool = place / "Sarif.Multitool"
    tool.chmod(0o755)
    with tempfile.TemporaryDirectory() as name:
        paths = logs(cdef, pathlib.Path(name))
        wrong = [f"{path}: {error.json_path}: {error.message}" for path in paths
                 for error in validator.iter_errors(json.loads(path.read_text()))]
        said = subprocess.run([tool, "validate", *paths], stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True,
                              env={**os.environ, "DOTNET_SYSTEM_GLOBALIZATION_INVARIANT": "1"}, timeout=600)
    wrong += [line for line in said.stdout.splitlines() if ": error " in line or ": warning " in line]
    if said.returncode != 0 or f"{len(paths)} files scanned" not in said.stdout:
        wrong.append(f"the validator ends with {said.returncode}: {said.stdout[-500:]}")
    print("\n".join(wrong) or f"{len(paths)} logs are valid")
    return int(bool(wrong))


if __name__ == "__main__":
    sys.exit(main())
