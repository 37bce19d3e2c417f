"""Runs a command and writes the most memory that it has had, in bytes, to a file.

    peak.py FILE COMMAND...

What the system counts for a program includes what the process had that started it. So this one is small, and starts the
command instead of a test, which may be large.
"""

import os
import pathlib
import sys


def main():
    """Exits with the command's status."""
    file, *command = sys.argv[1:]
    process = os.posix_spawn(command[0], command, os.environ)
    _, status, used = os.wait4(process, 0)
    pathlib.Path(file).write_text(str(used.ru_maxrss * 1024), encoding="ascii")
    return os.waitstatus_to_exitcode(status)


if __name__ == "__main__":
    sys.exit(main())
