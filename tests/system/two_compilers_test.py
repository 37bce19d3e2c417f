"""Test two compilers that write the same output: the file is always the complete database of one of them.

The first compiler is stopped just after one system call on the output, then the second one runs, and then the first
one continues; support/traced.py does that. Finally, many pairs run at the same time without being stopped.
"""

import os
import random
import signal
import time

import pytest

from cases import BEFORE, HEAD, OUT, SOURCE, TIMEOUT, attributes, check
from traced import TRACE, continued, ended, stopped, traced

OTHER = "other.cdefsrc"
SUCCESS = (0, b"", b"")
REFUSED = (1, b"", b"Cannot create CDB file: another program has locked it\n")
LOCKED = ("flock", "ftruncate", "writev", "mmap")  # the stages from which on the first has the output


def two_sources(world):
    """The databases of both sources."""
    other = world.good(HEAD + attributes(300))
    world.path(SOURCE).rename(world.path(OTHER))
    return world.good(HEAD), other


def second(world):
    """The result of the second compiler."""
    result = world.run(OTHER, OUT)
    return result.returncode, result.stdout, result.stderr


def test_second_comes_before_the_first_has_locked(world):
    """Both succeed, and the file is that of the first, which wrote last."""
    mine, other = two_sources(world)
    for before in (None, BEFORE):
        if before is None:
            world.path(OUT).unlink(missing_ok=True)
        else:
            world.write(OUT, before)
        process, child = stopped(world, "openat")
        check(second(world) == SUCCESS and world.read() == other, "the second failed")
        check(continued(process, child) == SUCCESS and world.read() == mine, "the first failed")


def test_second_comes_after_the_first_has_locked(world):
    """The second is refused and touches nothing."""
    mine, _ = two_sources(world)
    for stage in LOCKED:
        world.write(OUT, BEFORE)
        process, child = stopped(world, stage)
        with world.left_alone():
            check(second(world) == REFUSED, "the second was not refused at", stage)
        check(continued(process, child) == SUCCESS and world.read() == mine, "the first failed at", stage)


def test_output_vanishes_before_it_is_locked(world):
    """As when another compiler fails and removes it. The file is created again."""
    mine, _ = two_sources(world)
    world.write(OUT, BEFORE)
    process, child = stopped(world, "openat")
    world.path(OUT).unlink()
    check(continued(process, child) == SUCCESS and world.read() == mine, "the first failed")


def test_output_is_replaced_before_it_is_locked(world):
    """By the other compiler, after a third program has removed it. The first writes to the new file."""
    mine, other = two_sources(world)
    world.write(OUT, BEFORE)
    process, child = stopped(world, "openat")
    world.path(OUT).rename(world.path("moved"))
    check(second(world) == SUCCESS and world.read() == other, "the second failed")
    check(continued(process, child) == SUCCESS and world.read() == mine, "the first failed")
    check(world.read("moved") == BEFORE, "a file that was moved away was touched")


def test_output_turns_into_the_source_before_it_is_locked(world):
    """When the output is opened again, it is checked again."""
    world.write(OUT, BEFORE)
    process, child = stopped(world, "openat")
    world.path(OUT).unlink()
    world.path(OUT).symlink_to(SOURCE)
    check(continued(process, child) == (1, b"", b"Cannot create CDB file: it is the source file\n"), "not refused")
    check(world.read(SOURCE) == HEAD, "the source was touched")


def test_signal_removes_no_file_of_another(world):
    """The name now refers to the second compiler's file, which is not removed."""
    _, other = two_sources(world)
    for number in (signal.SIGTERM, signal.SIGUSR1):
        process, child = stopped(world, "mmap")
        world.path(OUT).unlink()
        check(second(world) == SUCCESS, "the second failed")
        os.kill(child, number)
        check(continued(process, child) == (-number, b"", b""), "not ended by the signal")
        check(world.read() == other, "the second's database is gone")


def test_output_that_never_keeps_its_name(world):
    """The compiler gives up after 16 attempts."""
    world.write(OUT, BEFORE)
    stats = "%%stat"
    check(ended(traced(world, f"{stats},ftruncate", [])) == SUCCESS, "the program cannot be traced")
    looks = world.read(TRACE).split(b"ftruncate(")[0].count(b"\n")  # the last of them is whether it has its name
    check(ended(traced(world, f"{stats},flock", [f"{stats}:error=ENOENT:when={looks}+{looks}"])) ==
          (1, b"", b"Cannot create CDB file: other programs keep replacing it\n"), "not given up")
    check(world.read(TRACE).count(b"flock(") == 16, "other attempts")


def test_file_system_without_locks(world):
    """The output is written without a lock. Any other failure to lock is reported."""
    good = world.good()
    for error in ("EOPNOTSUPP", "ENOSYS", "ENOLCK", "EINVAL"):
        world.write(OUT, BEFORE)
        check(ended(traced(world, "flock", [f"flock:error={error}"])) == SUCCESS and world.read() == good, error)
    world.write(OUT, BEFORE)
    with world.left_alone():
        check(ended(traced(world, "flock", ["flock:error=EIO"])) ==
              (1, b"", b"Cannot create CDB file: Input/output error\n"), "not reported")


def test_output_that_is_no_file_is_not_locked(world):
    """Two compilers may write to the null device at once."""
    world.path(OUT).symlink_to("/dev/null")
    status = ended(traced(world, "flock", ["flock:error=EIO"], file="/dev/null"))
    check(status == (1, b"", b"Cannot map CDB file: Invalid argument\n"), status)


@pytest.mark.slow(10)
def test_many_pairs(world):
    """The file is that of a compiler that ended with status 0. If one did not, it was refused."""
    mine, other = two_sources(world)
    random.seed(1)
    for _ in range(300):
        if random.random() < 0.5:
            world.path(OUT).unlink(missing_ok=True)
        pair = [world.start(name, OUT) for name in random.sample((SOURCE, OTHER), 2)]
        by_name = {process.args[1]: ended(process) for process in pair}
        check(set(by_name.values()) <= {SUCCESS, REFUSED}, by_name)
        allowed = [good for name, good in ((SOURCE, mine), (OTHER, other)) if by_name[name] == SUCCESS]
        check(world.read() in allowed, "the file is neither's", by_name)


@pytest.mark.slow(10)
def test_many_pairs_of_which_one_is_ended(world):
    """The file is complete or does not exist, because the victim may have begun after its rival had ended."""
    mine, other = two_sources(world)
    random.seed(2)
    for _ in range(300):
        world.path(OUT).unlink(missing_ok=True)
        victim = world.start(SOURCE, OUT)
        rival = world.start(OTHER, OUT)
        time.sleep(random.random() * 0.004)
        victim.send_signal(random.choice((signal.SIGTERM, signal.SIGALRM, signal.SIGUSR1)))
        victim.communicate(timeout=TIMEOUT)
        rivals = ended(rival)
        check(rivals in (SUCCESS, REFUSED), rivals)
        if world.path(OUT).exists():
            # The victim's, too, if the signal came between its last byte and its end.
            allowed = [mine] + [other] * (rivals == SUCCESS)
            check(world.read() in allowed, "the file is neither's", victim.returncode, rivals)
