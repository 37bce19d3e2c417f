"""Test what the programs do when files fail.

Every test is a function below, named for what it shows. Whatever happens, the program ends with an exit status,
never by a signal, and a fault before the output is opened leaves the output unchanged.

If the tests run as root, cases about permissions run the program as another user. A case that the machine does not
allow (mounting a file system) is skipped with the reason.
"""

import errno
import fcntl
import os
import re
import resource
import shutil
import signal
import socket
import stat
import subprocess
import sys
import termios

import pytest

from cases import ATTRIBUTE, BEFORE, BLOCK, HEAD, OUT, SOURCE, TIMEOUT
from cases import as_nobody, attributes, check, expect, limit, only_zeros
from traced import TRACE, ended, traced



MOUNT_REFUSED = 77  # a status that the program never has


def of_errno(number):
    """The system's message for an error number, in the locale C."""
    return os.strerror(number).encode()


# ---- The source --------------------------------------------------------------


def cannot_open(world, source, number, **more):
    """Checks that the source cannot be opened: the message and number of the system, and an unchanged output."""
    world.write(OUT, BEFORE)
    message = os.fsencode(source) + b": cannot open because: " + of_errno(number) + b"\n"
    with world.left_alone():
        expect(world.run(source, OUT, **more), number, message)


def test_source_unreadable(world):
    """Nobody may read it."""
    os.chmod(world.path(SOURCE), 0)
    cannot_open(world, SOURCE, errno.EACCES, preexec_fn=as_nobody)


def test_source_directory_unreadable(world):
    """Nobody may look into its directory."""
    world.path("closed").mkdir(mode=0)
    cannot_open(world, "closed/" + SOURCE, errno.EACCES, preexec_fn=as_nobody)


def test_source_below_a_file(world):
    """Its directory is a file."""
    cannot_open(world, SOURCE + "/more", errno.ENOTDIR)


def test_source_behind_a_loop_of_links(world):
    """A symbolic link that leads to itself."""
    world.path("loop").symlink_to("loop")
    cannot_open(world, "loop", errno.ELOOP)


def test_source_name_too_long(world):
    """No file can be called so."""
    cannot_open(world, "x" * 5000, errno.ENAMETOOLONG)


def test_source_is_a_socket(world):
    """A socket cannot be opened."""
    with socket.socket(socket.AF_UNIX) as listener:
        here = os.getcwd()
        os.chdir(world.directory)
        listener.bind("socket")
        os.chdir(here)
        cannot_open(world, "socket", errno.ENXIO)


def needs_no_descriptors(world):
    """Skips the test if the program needs shared libraries, which have to be opened."""
    usage = world.run("-n", preexec_fn=limit(resource.RLIMIT_NOFILE, 3)).stderr
    if not usage.startswith(b"Usage: "):
        pytest.skip("the program needs descriptors to start: it is not static")


def test_source_when_no_descriptor_is_free(world):
    """Only the three standard streams may be open."""
    needs_no_descriptors(world)
    cannot_open(world, SOURCE, errno.EMFILE, preexec_fn=limit(resource.RLIMIT_NOFILE, 3))


def test_source_when_only_a_standard_descriptor_is_free(world):
    """The source does not take the place of a standard stream."""
    needs_no_descriptors(world)
    script = f"exec 0<&- 3>&1; ulimit -n 4; exec ./cdgen {SOURCE} {OUT}"
    result = subprocess.run(["sh", "-c", script], capture_output=True, timeout=TIMEOUT, **world.options())
    expect(result, errno.EMFILE, os.fsencode(SOURCE) + b": cannot open because: " + of_errno(errno.EMFILE) + b"\n")


def test_two_free_descriptors_are_enough(world):
    """One for the source, one for the output."""
    good = world.good()
    expect(world.run(preexec_fn=limit(resource.RLIMIT_NOFILE, 5)), 0)
    check(world.read() == good, "another database")


def test_source_cannot_be_read(world):
    """It can be opened, but reading fails."""
    world.write(OUT, BEFORE)
    message = b"/proc/self/mem: cannot read because: " + of_errno(errno.EIO) + b"\n"
    with world.left_alone():
        expect(world.run("/proc/self/mem", OUT), errno.EIO, message)


def test_source_cannot_be_read_n(world):
    """The same without a newline."""
    expect(world.run("-n", "/proc/self/mem", OUT), errno.EIO, b"/proc/self/mem: cannot read because: " + of_errno(errno.EIO))


def test_source_is_a_directory(world):
    """A directory opens, but cannot be read."""
    expect(world.run(".", OUT), errno.EISDIR, b".: cannot read because: " + of_errno(errno.EISDIR) + b"\n")
    check(not world.path(OUT).exists(), "there is an output")


def test_source_is_the_null_device(world):
    """It is empty."""
    expect(world.run("/dev/null", OUT), 1, b"No classes defined\n")


def through_pipe(world, feed):
    """The run of a source that is a named pipe, which feed(descriptor, process) fills."""
    os.mkfifo(world.path("pipe"))
    process = world.start("pipe", OUT)
    descriptor = os.open(world.path("pipe"), os.O_WRONLY)
    feed(descriptor, process)
    os.close(descriptor)
    stdout, stderr = process.communicate(timeout=TIMEOUT)
    return subprocess.CompletedProcess((), process.returncode, stdout, stderr)


def test_source_is_a_pipe_that_closes_at_once(world):
    """It is empty."""
    expect(through_pipe(world, lambda descriptor, process: None), 1, b"No classes defined\n")
    check(not world.path(OUT).exists(), "there is an output")


def test_source_is_a_pipe_that_closes_too_early(world):
    """Only half of the source arrives, up to the middle of a line."""
    half = HEAD[: HEAD.index(b"\tMessageCatalog") - 2]
    good = world.good(half)
    expect(through_pipe(world, lambda descriptor, process: os.write(descriptor, half)), 0)
    check(world.read() == good, "not what the same half in a file gives")


def test_source_comes_byte_by_byte(world):
    """Each read returns less than was requested."""
    good = world.good()

    def feed(descriptor, _):
        for byte in HEAD:
            os.write(descriptor, bytes([byte]))

    expect(through_pipe(world, feed), 0)
    check(world.read() == good, "another database")


def test_source_vanishes_while_the_program_sleeps(world):
    """The program is stopped and continued while it reads a pipe that has been removed."""
    good = world.good()

    def feed(descriptor, process):
        os.write(descriptor, HEAD[:50])
        process.send_signal(signal.SIGSTOP)
        os.unlink(world.path("pipe"))
        os.write(descriptor, HEAD[50:])
        process.send_signal(signal.SIGCONT)

    expect(through_pipe(world, feed), 0)
    check(world.read() == good, "another database")


def while_read(world, source, change):
    """Changes the source while the program reads it, and returns status and messages.

    The trace goes to a pipe that is full long before the source is read to
    its end: when there is something in the pipe, the program is in the middle.
    """
    world.write(SOURCE, source)
    process = world.start("-d", "2", SOURCE, OUT)
    waiting = bytearray(4)
    while int.from_bytes(waiting, sys.byteorder) == 0 and process.poll() is None:
        fcntl.ioctl(process.stdout, termios.FIONREAD, waiting)
    check(process.poll() is None, "over before the change")
    change(world.path(SOURCE))
    _, stderr = process.communicate(timeout=TIMEOUT)
    return process.returncode, stderr


def test_source_deleted_while_read(world):
    """The file exists as long as it is open."""
    source = HEAD + attributes(5000)
    good = world.good(source)
    check(while_read(world, source, os.unlink) == (0, b""), "it does not compile")
    check(world.read() == good, "another database")


def test_source_grows_while_read(world):
    """Lines that are added in time belong to the source."""
    source = HEAD + attributes(5000)
    more = ATTRIBUTE % (9999, 9999, 9999)
    good = world.good(source + more)

    def grow(path):
        with open(path, "ab") as file:
            file.write(more)

    check(while_read(world, source, grow) == (0, b""), "it does not compile")
    check(world.read() == good, "another database")


def test_source_shortened_while_read(world):
    """Only the part that has been read counts. If it ends in the middle of an attribute, it is refused."""
    world.write(OUT, BEFORE)
    status, stderr = while_read(world, HEAD + attributes(5000), lambda path: os.truncate(path, 0))
    if status == 0:
        check(stderr == b"", stderr)
        world.verified()
    else:
        check(status == 1 and re.fullmatch(rb"\d+: [^\n]+\n", stderr), "status", status, stderr)
        check(world.read() == BEFORE, "the output was touched")


def test_source_shortened_to_whole_stanzas_while_read(world):
    """The remaining part is a complete source."""
    left = HEAD + attributes(2000)
    good = world.good(left)
    status, stderr = while_read(world, HEAD + attributes(5000), lambda path: os.truncate(path, len(left)))
    check((status, stderr) == (0, b""), "status", status, stderr)
    check(world.read() == good, "another database")
    world.verified()


def test_database_unreadable(world):
    """Nobody may read the database that cdef is to verify."""
    world.write(OUT, world.good())
    os.chmod(world.path(OUT), 0)
    world.cdef = shutil.copy(world.cdef, world.directory)  # where any user can reach it
    result = world.inspect("verify", OUT, preexec_fn=as_nobody)
    expect(result, 2, os.fsencode(f"cdef: {OUT}: ") + of_errno(errno.EACCES) + b"\n")


# ---- The output --------------------------------------------------------------


def cannot_create(world, out, number, **more):
    """The output cannot be created or filled."""
    expect(world.run(SOURCE, out, **more), 1, b"Cannot create CDB file: " + of_errno(number) + b"\n")


def test_output_directory_read_only(world):
    """Nobody may create files there."""
    world.path("closed").mkdir(mode=0o555)
    cannot_create(world, "closed/" + OUT, errno.EACCES, preexec_fn=as_nobody)
    check(not list(world.path("closed").iterdir()), "something was created")


def test_output_directory_missing(world):
    """There is no such directory."""
    cannot_create(world, "missing/" + OUT, errno.ENOENT)


def test_output_below_a_file(world):
    """Its directory is a file."""
    cannot_create(world, SOURCE + "/" + OUT, errno.ENOTDIR)


def test_output_name_empty(world):
    """The name is empty."""
    cannot_create(world, "", errno.ENOENT)


def test_output_name_too_long(world):
    """No file can be called so."""
    cannot_create(world, "x" * 300, errno.ENAMETOOLONG)


def test_output_read_only(world):
    """A read-only database is not changed."""
    world.write(OUT, BEFORE)
    os.chmod(world.path(OUT), 0o444)
    with world.left_alone():
        cannot_create(world, OUT, errno.EACCES, preexec_fn=as_nobody)


def test_output_is_a_directory(world):
    """A directory is refused as output and not changed."""
    world.path(OUT).mkdir()
    cannot_create(world, OUT, errno.EISDIR)
    check(world.path(OUT).is_dir(), "the directory is gone")


def test_output_behind_a_loop_of_links(world):
    """A symbolic link that leads to itself."""
    world.path(OUT).symlink_to(OUT)
    cannot_create(world, OUT, errno.ELOOP)


def test_output_is_a_full_device(world):
    """Nothing can be written."""
    cannot_create(world, "/dev/full", errno.ENOSPC)


@pytest.mark.parametrize("number", ["EOPNOTSUPP", "ENOSYS", "ENOLCK", "EINVAL"])
def test_output_where_nothing_can_be_locked(world, number):
    """The file system has no locks: the database is made without."""
    good = world.good()
    world.write(OUT, BEFORE)
    check(ended(traced(world, "flock", [f"flock:error={number}"])) == (0, b"", b""), "it fails")
    check(b"INJECTED" in world.read(TRACE), "no lock was refused")
    check(world.read() == good, "another database")


def test_output_that_cannot_be_locked(world):
    """The file system has locks, but locking fails: the output is unchanged."""
    world.write(OUT, BEFORE)
    message = b"Cannot create CDB file: " + of_errno(errno.EIO) + b"\n"
    with world.left_alone():
        check(ended(traced(world, "flock", ["flock:error=EIO"])) == (1, b"", message), "expected", message)


def cannot_map(world, out):
    """Checks that an output is refused because it cannot be mapped."""
    result = world.run(SOURCE, out)
    check(result.returncode == 1 and result.stdout == b"", "status", result.returncode, result.stdout)
    check(re.fullmatch(rb"Cannot map CDB file: [^\n]+\n", result.stderr), result.stderr)


def test_output_is_a_pipe(world):
    """The program must not wait for a reader. The pipe is not removed."""
    os.mkfifo(world.path(OUT))
    cannot_map(world, OUT)
    check(stat.S_ISFIFO(os.stat(world.path(OUT)).st_mode), "the pipe is gone")


def test_output_is_the_null_device(world):
    """The device is not removed."""
    cannot_map(world, "/dev/null")
    check(stat.S_ISCHR(os.stat("/dev/null").st_mode), "the device is gone")


def test_output_is_a_link(world):
    """A symbolic link is followed and not replaced."""
    good = world.good()
    world.write("target", BEFORE * 1000)
    world.path(OUT).symlink_to("target")
    expect(world.run(), 0)
    check(world.path(OUT).is_symlink() and world.read("target") == good, "not written through the link")


def test_output_is_a_link_to_nothing(world):
    """The target of the link is created."""
    good = world.good()
    world.path(OUT).symlink_to("target")
    expect(world.run(), 0)
    check(world.path(OUT).is_symlink() and world.read("target") == good, "not written through the link")


def test_output_is_a_link_to_the_source(world):
    """The source is never overwritten."""
    world.path(OUT).symlink_to(SOURCE)
    expect(world.run(), 1, b"Cannot create CDB file: it is the source file\n")
    check(world.read(SOURCE) == HEAD, "the source was touched")


def test_output_takes_the_traces(world):
    """Traces would damage the database, so they are refused. Without traces, the program writes nothing to the streams.
    """
    for stream in ("stdout", "stderr"):
        world.write(OUT, BEFORE)
        with open(world.path(OUT), "ab") as file:
            refused = world.run("-d", "3", SOURCE, OUT, **{stream: file})
            check(refused.returncode == 1, "expected 1, actual", refused.returncode)
            check(world.read().startswith(BEFORE), "the output was touched")
            check(stream == "stderr" or refused.stderr == b"Cannot create CDB file: traces go there\n", refused.stderr)
            expect(world.run(SOURCE, OUT, **{stream: file}), 0, **{stream: None})
        check(world.read() == world.good(), "another database")


def test_new_output_has_its_mode(world):
    """0644, reduced by the umask."""
    expect(world.run(preexec_fn=lambda: os.umask(0o026)), 0)
    check(stat.S_IMODE(os.stat(world.path(OUT)).st_mode) == 0o640, oct(os.stat(world.path(OUT)).st_mode))


def test_replaced_output_keeps_its_mode_and_links(world):
    """Because it is overwritten in place."""
    good = world.good()
    world.write(OUT, BEFORE)
    os.chmod(world.path(OUT), 0o600)
    os.link(world.path(OUT), world.path("other"))
    expect(world.run(), 0)
    check(world.read("other") == good, "another file")
    check(stat.S_IMODE(os.stat(world.path(OUT)).st_mode) == 0o600, "another mode")


# How many attributes; the larger database is filled with more blocks than one call writes.
@pytest.mark.parametrize("count", [50, 5000])
def test_file_size_limit(world, count):
    """Exceeding the limit is reported as an error, not by a signal. The test finds the lowest limit that is enough."""
    good = world.good(HEAD + attributes(count))
    gross = -(-len(good) // BLOCK) * BLOCK
    check(gross > 4 * BLOCK, "the database is too small for the case")
    for size in (0, 1, BLOCK - 1, BLOCK, BLOCK + 1, gross - BLOCK, gross - 1):
        cannot_create(world, OUT, errno.EFBIG, preexec_fn=limit(resource.RLIMIT_FSIZE, size))
        only_zeros(world)
    expect(world.run(preexec_fn=limit(resource.RLIMIT_FSIZE, gross)), 0)
    check(world.read() == good, "another database")


@pytest.mark.parametrize("count", [50, 5000])
def test_output_is_filled_with_whole_blocks(world, count):
    """The size is the smallest multiple of a block that holds the database."""
    good = world.good(HEAD + attributes(count))
    status, *_ = ended(traced(world, "write,writev", []))
    check(status == 0, "the program cannot be traced")
    written = sum(int(count) for count in re.findall(rb"^(?:\d+ )?writev?\(.* = (\d+)$", world.read(TRACE), re.M))
    check(written == -(-len(good) // BLOCK) * BLOCK, "filled with", written, "bytes for", len(good))


def test_file_system_full(world):
    """The file system has 16 KB, and the database is larger."""
    world.write(SOURCE, HEAD + attributes(500))
    world.path("small").mkdir()
    script = 'mount -t tmpfs -o size=16k none small || exit %d; "$@"; status=$?; tr -d "\\0" <small/out.cdef; exit $status' % MOUNT_REFUSED
    user = [] if os.geteuid() == 0 else ["-r"]
    command = ["unshare", *user, "-m", "sh", "-c", script, "sh", world.program, SOURCE, "small/" + OUT]
    if shutil.which("unshare") is None:
        pytest.skip("no unshare(1) here")
    result = subprocess.run(command, capture_output=True, timeout=TIMEOUT, **world.options())
    if result.returncode == MOUNT_REFUSED or b"unshare:" in result.stderr:
        pytest.skip("mounting is not allowed here: " + result.stderr.decode())
    expect(result, 1, b"Cannot create CDB file: " + of_errno(errno.ENOSPC) + b"\n")
