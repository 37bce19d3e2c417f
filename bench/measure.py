"""Measure the cost of running a program: time and memory, user instructions, system calls."""

import os
import pathlib
import re
import statistics
import subprocess
import typing

# The C library chooses its string functions by the processor. Without these properties every x86-64 processor gets the
# plainest ones. Thresholds that it takes from the sizes of caches are fixed too.
PROCESSOR_PROPERTIES = ("AVX", "AVX2", "AVX512F", "AVX512BW", "AVX512VL", "BMI1", "BMI2", "ERMS", "FMA", "FMA4", "FSRM",
                        "LZCNT", "MOVBE", "POPCNT", "RTM", "SSSE3", "SSE4_1", "SSE4_2", "AVX_Fast_Unaligned_Load",
                        "Fast_Copy_Backward", "Fast_Rep_String", "Fast_Unaligned_Copy", "Fast_Unaligned_Load",
                        "Slow_BSF")
THRESHOLDS = ("x86_non_temporal_threshold", "x86_rep_movsb_threshold", "x86_rep_stosb_threshold")
# The simulator counts a repeated string instruction once for each byte, the processor once: for a count that stands for
# the processor's, the C library is asked not to use any.
NO_REPEATS = ":".join(f"glibc.cpu.{name}=0x7fffffff" for name in THRESHOLDS[1:])
PLAINEST = ":".join(["glibc.cpu.hwcaps=" + ",".join(f"-{name}" for name in PROCESSOR_PROPERTIES)]
                    + [f"glibc.cpu.{name}=0x1000000" for name in THRESHOLDS])


class Job(typing.NamedTuple):
    """A command and its surroundings; what it makes anew is removed before each run.

    repeat: runs in a row when it is its turn; the shorter a program runs, the more it takes to tell.
    """

    command: list
    directory: pathlib.Path
    fresh: str = "none"
    stdin: str = "/dev/null"
    stdout: str = "/dev/null"
    repeat: int = 1


class Cost(typing.NamedTuple):
    """Medians of several runs: seconds, and bytes at the peak."""

    cpu: float
    wall: float
    peak: float


class Failure(Exception):
    """A program that was to be measured has failed."""


def check(result, command):
    """Raises Failure if a run has failed."""
    if result.returncode != 0:
        detail = result.stderr.decode(errors="replace").strip()[-500:]
        raise Failure(f"{' '.join(map(str, command))}: status {result.returncode}: {detail}")
    return result


class Launcher:
    """Runs jobs with the helper program that measures them."""

    def __init__(self, program):
        self.program = program

    def runs(self, job):
        """The costs of its runs in a row."""
        command = [self.program, str(job.repeat), job.stdin, job.stdout, job.fresh, *job.command]
        result = subprocess.run(command, cwd=job.directory, capture_output=True, check=False)
        lines = check(result, job.command).stdout.decode().splitlines()
        numbers = (map(int, line.split()) for line in lines)
        return [Cost(cpu / 1e9, wall / 1e9, peak * 1024) for cpu, wall, peak in numbers]

    def rounds(self, jobs, rounds):
        """All costs of each job, the jobs taking turns so that a busy spell hits all of them."""
        costs = {name: [] for name in jobs}
        for _ in range(rounds):
            for name, job in jobs.items():
                costs[name] += self.runs(job)
        return costs


def median(costs):
    """The middle of each figure of a list of costs."""
    return Cost(*map(statistics.median, zip(*costs)))


def quiet_run(command, job, environment=None):
    """One run of a job under another program, with the job's streams; in an environment of its own, if one is given."""
    (job.directory / job.fresh).unlink(missing_ok=True)
    with open(job.directory / job.stdin, "rb") as stdin, open(job.directory / job.stdout, "wb") as stdout:
        result = subprocess.run([*command, *job.command], cwd=job.directory, stdin=stdin, stdout=stdout,
                                stderr=subprocess.PIPE, env=environment, check=False)
    return check(result, job.command)


def counted_by_processor(job):
    """User instructions as the processor counts them; None where it is not allowed to, or is a virtual one."""
    try:
        result = quiet_run(["perf", "stat", "-x", ",", "-e", "instructions:u"], job)
    except (Failure, FileNotFoundError):
        return None
    found = re.search(rb"^(\d+),.*instructions:u", result.stderr, re.MULTILINE)
    return int(found[1]) if found else None


def counted_by_simulator(job, environment=None):
    """User instructions as valgrind's simulated processor counts them; in an environment of its own, if one is given."""
    path = job.directory / "callgrind.out"
    quiet_run(["valgrind", "--tool=callgrind", f"--callgrind-out-file={path}"], job,
              environment or {**os.environ, "GLIBC_TUNABLES": NO_REPEATS})
    found = re.search(r"^totals: (\d+)$", path.read_text(encoding="ascii", errors="replace"), re.MULTILINE)
    path.unlink()
    if not found:
        raise Failure("valgrind wrote no total")
    return int(found[1])


def system_calls(job):
    """The number of system calls of a run, its start included."""
    path = job.directory / "strace.out"
    quiet_run(["strace", "-f", "-qq", "-e", "signal=none", "-o", path], job)
    calls = re.findall(r"^\d+ +\w+\(", path.read_text(encoding="ascii", errors="replace"), re.MULTILINE)
    path.unlink()
    return len(calls)
