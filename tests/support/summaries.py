"""The last line of `cdef check` as text, which counts the findings."""

import re

FINDING = re.compile(r"^(\S.*?):(?:\d+:){0,2} (error|warning): .* \[S\d+[^\]]*\]$", re.M)


def counted(number, what):
    """"1 error", "2 errors"."""
    return f"{number} {what}{'' if number == 1 else 's'}"


def with_summary(text, sources=1):
    """A text of findings with its last line; unchanged if there are no findings."""
    found = FINDING.findall(text)
    if not found:
        return text
    errors = sum(kind == "error" for _, kind in found)
    line = f"{counted(errors, 'error')} and {counted(len(found) - errors, 'warning')}"
    if sources > 1:
        line += f" in {len({file for file, _ in found})} of {counted(sources, 'source')}"
    return f"{text}{line}\n"
