"""Test cdgen with too little memory and with streams that fail.

Every test is a function below, named for what it shows. If there is enough memory for the program to start, it ends
either with a database or with the message and the status for lack of memory. If a stream cannot be written to, only
its text is lost. A case that the machine does not allow (limiting the memory of a sanitizer) is skipped with the
reason.
"""

import errno
import os
import re
import resource
import shlex
import subprocess

import pytest

from cases import ATTRIBUTE, BEFORE, BLOCK, HEAD, OUT, SOURCE, TIMEOUT
from cases import attributes, check, expect, limit, only_zeros

OUT_OF_MEMORY = re.compile(
    rb"(cfg_malloc malloc failure: |\w+: alloc_tble (malloc|realloc) failure: |strdup failed: )Cannot allocate memory\n"
)
# While it checks a source, its own words or the compiler's.
CDEF_OUT_OF_MEMORY = re.compile(rb"cdef: (out of memory\n|class\.cdefsrc: " + OUT_OF_MEMORY.pattern + rb")")
WRONG = HEAD + b"\tNoSuchAttribute=1\n"
WRONG_MESSAGE = b"16: Attribute name not defined in table (name/table): NoSuchAttributeClassToManagerMapping\n"

def closed(*descriptors):
    """In the child: descriptors closed; for preexec_fn."""
    return lambda: [os.close(descriptor) for descriptor in descriptors]


# ---- Memory ------------------------------------------------------------------


def limited(world, option, kilobytes, *command):
    """A command with a memory limit. Option v is the address space, d the data, s the stack."""
    script = f"ulimit -{option} {kilobytes} && exec {shlex.join(map(str, command))}"
    return subprocess.run(["sh", "-c", script], capture_output=True, timeout=TIMEOUT, **world.options())


def least_memory(world, option, *command):
    """The least memory, in KB, in which a command does the same as in 1 GB."""
    enough = 1 << 20
    usual = subprocess.run(command, capture_output=True, timeout=TIMEOUT, **world.options())

    def starts(kilobytes):
        result = limited(world, option, kilobytes, *command)
        return (result.returncode, result.stdout, result.stderr) == (usual.returncode, usual.stdout, usual.stderr)

    low, high = 0, enough
    if not starts(high):
        pytest.skip("the program needs more than 1 GB to start: a sanitizer")
    while high - low > 4:
        middle = (low + high) // 8 * 4
        low, high = (low, middle) if starts(middle) else (middle, high)
    return high


def every_level(least, steps, enough):
    """Calls a function with more and more memory, in growing steps, until it is enough. Returns how often it was not.
    """
    level = 0
    failures = 0
    while not enough(least + level):
        failures += 1
        level += max(4, level // steps // 4 * 4)
    return failures


def last_line(text):
    """The text before the last line, and the last line."""
    at = text.rfind(b"\n", 0, -1) + 1
    return text[:at], text[at:]


def compiles_in(world, option, kilobytes, good, traces, *options):
    """Whether this memory is enough. If not, checks message, status and output, and the traces up to that point."""
    world.write(OUT, BEFORE)
    result = limited(world, option, kilobytes, world.program, *options, SOURCE, OUT)
    trace, message = last_line(result.stderr)
    what = (f"{kilobytes} KB:", result.returncode, message)
    if result.returncode == 0:
        check((result.stdout, result.stderr) == traces and world.read() == good, *what)
        return True
    check(traces[0].startswith(result.stdout) and traces[1].startswith(trace), *what, "other traces")
    if result.returncode == errno.ENOMEM:
        check(OUT_OF_MEMORY.fullmatch(message) and world.read() == BEFORE, *what)
    else:
        check(result.returncode == 1 and message == b"Cannot map CDB file: Cannot allocate memory\n", *what)
        only_zeros(world)
    return False


def compiled_in_all(world, source, option, steps, *options):
    """Compiles a source with less memory than it needs, and then with more and more."""
    good = world.good(source, *options)
    result = world.run(*options, SOURCE, OUT)
    traces = (result.stdout, result.stderr)
    least = least_memory(world, option, world.program)
    return every_level(least, steps, lambda level: compiles_in(world, option, level, good, traces, *options))


def test_memory_for_a_small_source(world):
    """Address space in steps of a page."""
    failures = compiled_in_all(world, HEAD + attributes(1000), "v", 1 << 30)
    check(failures > 0, "every level was enough")


def test_memory_for_a_large_source(world):
    """Address space for 20,000 attributes, from a page more than the program needs to start."""
    failures = compiled_in_all(world, HEAD + attributes(20000), "v", 30)
    check(failures > 20, "only", failures, "levels were too low")


def test_memory_for_the_other_byte_order(world):
    """The same with option s."""
    failures = compiled_in_all(world, HEAD + attributes(20000), "v", 30, "-s")
    check(failures > 20, "only", failures, "levels were too low")


def test_memory_for_traces(world):
    """With all traces, which end where memory ran out."""
    failures = compiled_in_all(world, HEAD + attributes(5000), "v", 30, "-d", "3")
    check(failures > 20, "only", failures, "levels were too low")


LONG_LIST = ATTRIBUTE.replace(b"DataType=String", b"DataType=StringArray") % (1, 1, 1) + b"".join(
    b"\tValidValue=value %d,value %d\n" % (i, i + 1) for i in range(30000)
)


def test_memory_for_long_lists(world):
    """Address space for one attribute with many values, which are stored in growing tables."""
    failures = compiled_in_all(world, HEAD + LONG_LIST, "v", 30)
    check(failures > 20, "only", failures, "levels were too low")


def test_memory_of_data(world):
    """The other limit, which applies to data only."""
    failures = compiled_in_all(world, HEAD + attributes(20000), "d", 30)
    check(failures > 20, "only", failures, "levels were too low")


# ---- Memory of cdef ----------------------------------------------------------


def inspects_in(world, kilobytes, whole, *arguments):
    """Whether this memory is enough for cdef. If not, cdef must say so, and its output must be the first part of the whole."""
    result = limited(world, "v", kilobytes, world.cdef, *arguments)
    what = (*arguments, f"in {kilobytes} KB:", result.returncode, result.stderr)
    if result.returncode == 0:
        check((result.stdout, result.stderr) == (whole, b""), *what)
    else:
        check(result.returncode == 2 and CDEF_OUT_OF_MEMORY.fullmatch(result.stderr), *what)
        check(whole.startswith(result.stdout), *what, "another output")
    return result.returncode == 0


def inspected_in_all(world, *arguments):
    """The same for cdef, with less memory than it needs, and then with more and more."""
    world.write(OUT, world.good(HEAD + attributes(3000)))
    result = world.inspect(*arguments)
    expect(result, 0, stdout=result.stdout)
    least = least_memory(world, "v", world.cdef, "--version")
    failures = every_level(least, 20, lambda level: inspects_in(world, level, result.stdout, *arguments))
    check(failures > 20, "only", failures, "levels were too low")


def test_memory_for_verifying(world):
    """A database of 3,000 attributes."""
    inspected_in_all(world, "verify", OUT)


def test_memory_for_dumping(world):
    """As text."""
    inspected_in_all(world, "dump", OUT)


def test_memory_for_dumping_json(world):
    """As JSON."""
    inspected_in_all(world, "dump", "--json", OUT)


def test_memory_for_checking(world):
    """A source of 3,000 attributes."""
    inspected_in_all(world, "check", SOURCE)


# ---- Stack -------------------------------------------------------------------

STACK = 128  # KB


def on_small_stack(world, *command):
    """Checks that a command has the same result with a small stack."""
    usual = subprocess.run(command, capture_output=True, timeout=TIMEOUT, **world.options())
    result = limited(world, "s", STACK, *command)
    expect(result, 0, usual.stderr, usual.stdout)


def test_stack_does_not_grow_with_the_source(world):
    """With many attributes, with one attribute of many values, in either byte order, and with traces."""
    least_memory(world, "v", world.program)
    for source in (attributes(20000), LONG_LIST):
        for options in ((), ("-s",), ("-d", "3")):
            good = world.good(HEAD + source, *options)
            on_small_stack(world, world.program, *options, SOURCE, OUT)
            check(world.read() == good, *options, "another database")


def test_stack_of_cdef_does_not_grow(world):
    """With databases of the same sources."""
    least_memory(world, "v", world.cdef, "--version")
    for source in (attributes(5000), LONG_LIST):
        world.write(OUT, world.good(HEAD + source))
        for arguments in (("verify",), ("dump",), ("dump", "--json"), ("source",)):
            on_small_stack(world, world.cdef, *arguments, OUT)
        on_small_stack(world, world.cdef, "check", SOURCE)


# ---- Streams -----------------------------------------------------------------


def unheard(world, **more):
    """Checks, with all traces, that the database and the status do not change, for a good and for a wrong source."""
    good = world.good(HEAD + attributes(300))
    check(world.run("-d", "3", SOURCE, OUT, **more).returncode == 0, "a good source does not compile")
    check(world.read() == good, "another database")
    world.write(SOURCE, WRONG)
    check(world.run("-d", "3", SOURCE, OUT, **more).returncode == 1, "another status")
    check(world.read() == good, "the output was touched")


def test_standard_output_closed(world):
    """Traces are lost. Above all, they are not written to the database."""
    unheard(world, preexec_fn=closed(1))


def test_standard_error_closed(world):
    """Messages are lost."""
    unheard(world, preexec_fn=closed(2))


def test_all_standard_streams_closed(world):
    """Source and output do not take the places of the streams."""
    unheard(world, preexec_fn=closed(0, 1, 2))


def test_standard_output_closed_leaves_the_message(world):
    """Messages are still written although traces cannot be."""
    world.write(SOURCE, WRONG)
    expect(world.run("-d", "3", SOURCE, OUT, preexec_fn=closed(1)), 1, WRONG_MESSAGE)


def test_standard_output_full(world):
    """A full device."""
    with open("/dev/full", "wb") as full:
        unheard(world, stdout=full)


def test_standard_error_full(world):
    """A full device."""
    with open("/dev/full", "wb") as full:
        unheard(world, stderr=full)


def test_standard_output_on_a_full_file(world):
    """A file that may not grow: traces end, but the database is complete."""
    good = world.good()
    with open(world.path("trace"), "wb") as trace:
        limits = limit(resource.RLIMIT_FSIZE, BLOCK)
        expect_status = world.run("-d", "3", SOURCE, OUT, stdout=trace, preexec_fn=limits).returncode
    check(expect_status == 0 and world.read() == good, "status", expect_status)
    check(len(world.read("trace")) <= BLOCK, "the limit has no effect")


def without_reader(world, **streams):
    """The same with a pipe that nobody reads. In the child process, SIGPIPE has its default effect."""
    reader, writer = os.pipe()
    os.close(reader)
    try:
        unheard(world, restore_signals=True, **{stream: writer for stream in streams})
    finally:
        os.close(writer)


def test_standard_output_without_reader(world):
    """SIGPIPE does not end the program."""
    without_reader(world, stdout=True)


def test_standard_error_without_reader(world):
    """SIGPIPE does not end the program."""
    without_reader(world, stderr=True)


def test_no_stream_has_a_reader(world):
    """SIGPIPE does not end the program."""
    without_reader(world, stdout=True, stderr=True)
