"""A locale whose numbers have decimal commas, for programs that must not depend on the locale. The tests build it from
the sources in Debian's package locales, because machines for tests usually have none.

The tests build it themselves, from the sources in Debian's package locales:
a machine for tests has none.
"""

import os
import subprocess

NAME = "de_DE.UTF-8"


def environment(locales):
    """The variables that select the locale in the directory where it was built. Checks that they take effect."""
    chosen = {"LOCPATH": str(locales), "LC_ALL": NAME}
    result = subprocess.run(
        ["locale", "decimal_point"], env={**os.environ, **chosen}, capture_output=True, text=True, check=True, timeout=60
    )
    if (result.stdout, result.stderr) != (",\n", ""):
        raise OSError(f"the locale {NAME} in {locales} has no effect: {result.stdout}{result.stderr}")
    return chosen
