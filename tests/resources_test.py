"""Memory and streams that fail cdgen.

Every case is a function below, named for what it shows.  In whatever memory
the program starts, it ends with a database or with the message and the status
of memory that ran out; and a stream that cannot be written to changes nothing
but what is seen.  A case that the machine does not allow (limiting the memory
of a sanitizer) exits with 77 and says why.
"""

import errno
import os
import re
import resource
import shlex
import subprocess
import sys

from cases import ATTRIBUTE, BEFORE, BLOCK, HEAD, OUT, SOURCE, TIMEOUT, Cases, Skip
from cases import attributes, check, expect, limit, only_zeros

OUT_OF_MEMORY = re.compile(
    rb"(cfg_malloc malloc failure: |\w+: alloc_tble (malloc|realloc) failure: |strdup failed: )Cannot allocate memory\n"
)
WRONG = HEAD + b"\tNoSuchAttribute=1\n"
WRONG_MESSAGE = b"16: Attribute name not defined in table (name/table): NoSuchAttributeClassToManagerMapping\n"

case = Cases()


def closed(*descriptors):
    """In the child: descriptors closed; for preexec_fn."""
    return lambda: [os.close(descriptor) for descriptor in descriptors]


# ---- Memory ------------------------------------------------------------------


def limited(world, option, kilobytes, *arguments):
    """A run in so much memory: option v is the address space, d the data."""
    command = shlex.join([str(world.program), *arguments])
    script = f"ulimit -{option} {kilobytes} && exec {command}"
    return subprocess.run(["sh", "-c", script], capture_output=True, timeout=TIMEOUT, **world.options())


def least_memory(world, option):
    """The least memory, in KB, in which the program starts and prints its usage."""

    def starts(kilobytes):
        result = limited(world, option, kilobytes)
        return result.returncode == 1 and result.stderr.startswith(b"Usage: ")

    low, high = 0, 1 << 20
    if not starts(high):
        raise Skip("the program needs more than 1 GB to start: a sanitizer")
    while high - low > 4:
        middle = (low + high) // 8 * 4
        low, high = (low, middle) if starts(middle) else (middle, high)
    return high


def in_memory(world, option, kilobytes, good):
    """Whether so much memory is enough; if not, message, status and output have to be right."""
    world.write(OUT, BEFORE)
    result = limited(world, option, kilobytes, SOURCE, OUT)
    what = (f"{kilobytes} KB:", result.returncode, result.stderr)
    check(result.stdout == b"", *what)
    if result.returncode == 0:
        check(world.read() == good and result.stderr == b"", *what)
    elif result.returncode == errno.ENOMEM:
        check(OUT_OF_MEMORY.fullmatch(result.stderr) and world.read() == BEFORE, *what)
    else:
        expect(result, 1, b"Cannot map CDB file: Cannot allocate memory\n")
        only_zeros(world)
    return result.returncode == 0


def every_level(world, source, option, steps):
    """From the least memory up, in coarser and coarser steps, until it is enough."""
    good = world.good(source)
    least = least_memory(world, option)
    level = 0
    failures = 0
    while not in_memory(world, option, least + level, good):
        failures += 1
        level += max(4, level // steps // 4 * 4)
    return failures


@case
def memory_for_a_small_source(world):
    """Address space in steps of a page."""
    failures = every_level(world, HEAD + attributes(1000), "v", 1 << 30)
    check(failures > 0, "every level was enough")


@case
def memory_for_a_large_source(world):
    """Address space for 20,000 attributes, from a page more than the program needs to start."""
    failures = every_level(world, HEAD + attributes(20000), "v", 30)
    check(failures > 20, "only", failures, "levels were too low")


@case
def memory_for_long_lists(world):
    """Address space for one attribute with many values, which stand in tables that grow."""
    values = b"".join(b"\tValidValue=value %d,value %d\n" % (i, i + 1) for i in range(30000))
    array = ATTRIBUTE.replace(b"DataType=String", b"DataType=StringArray")
    failures = every_level(world, HEAD + array % (1, 1, 1) + values, "v", 30)
    check(failures > 20, "only", failures, "levels were too low")


@case
def memory_of_data(world):
    """The other limit, on the data alone."""
    every_level(world, HEAD + attributes(20000), "d", 30)


# ---- Streams -----------------------------------------------------------------


def unheard(world, **more):
    """With every trace on, the same database, and the same status for a good and for a wrong source."""
    good = world.good(HEAD + attributes(300))
    check(world.run("-d", "3", SOURCE, OUT, **more).returncode == 0, "a good source does not compile")
    check(world.read() == good, "another database")
    world.write(SOURCE, WRONG)
    check(world.run("-d", "3", SOURCE, OUT, **more).returncode == 1, "another status")
    check(world.read() == good, "the output was touched")


@case
def standard_output_closed(world):
    """Traces go nowhere, least of all into the database."""
    unheard(world, preexec_fn=closed(1))


@case
def standard_error_closed(world):
    """Messages go nowhere."""
    unheard(world, preexec_fn=closed(2))


@case
def all_standard_streams_closed(world):
    """Source and output do not take their places."""
    unheard(world, preexec_fn=closed(0, 1, 2))


@case
def standard_output_closed_leaves_the_message(world):
    """What cannot be traced is still said."""
    world.write(SOURCE, WRONG)
    expect(world.run("-d", "3", SOURCE, OUT, preexec_fn=closed(1)), 1, WRONG_MESSAGE)


@case
def standard_output_full(world):
    """A device without room."""
    with open("/dev/full", "wb") as full:
        unheard(world, stdout=full)


@case
def standard_error_full(world):
    """A device without room."""
    with open("/dev/full", "wb") as full:
        unheard(world, stderr=full)


@case
def standard_output_on_a_full_file(world):
    """A file that may not grow: the traces stop, the database does not."""
    good = world.good()
    with open(world.path("trace"), "wb") as trace:
        limits = limit(resource.RLIMIT_FSIZE, BLOCK)
        expect_status = world.run("-d", "3", SOURCE, OUT, stdout=trace, preexec_fn=limits).returncode
    check(expect_status == 0 and world.read() == good, "status", expect_status)
    check(len(world.read("trace")) <= BLOCK, "the limit has no effect")


def without_reader(world, **streams):
    """The same into a pipe that nobody reads; the signal has its default effect in the child."""
    reader, writer = os.pipe()
    os.close(reader)
    try:
        unheard(world, restore_signals=True, **{stream: writer for stream in streams})
    finally:
        os.close(writer)


@case
def standard_output_without_reader(world):
    """No end by SIGPIPE."""
    without_reader(world, stdout=True)


@case
def standard_error_without_reader(world):
    """No end by SIGPIPE."""
    without_reader(world, stderr=True)


@case
def no_stream_has_a_reader(world):
    """No end by SIGPIPE."""
    without_reader(world, stdout=True, stderr=True)


if __name__ == "__main__":
    sys.exit(case.main(__doc__))
