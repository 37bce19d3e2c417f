#!/usr/bin/env python3
"""Measure cdgen against other compilers, lower limits and its own targets; print one table.

Medians and ratios hold within one run only: machines are busy in different ways at different times.
"""

import argparse
import functools
import math
import os
import pathlib
import platform
import statistics
import sys
import tempfile
import typing

import generate
import measure
import peers

MIXED = "attributes, mixed"
# What grows, alone: a source for a count.
GROWTH = {
    MIXED: lambda n: generate.source(attributes=n),
    "actions": lambda n: generate.source(actions=n),
    "SD elements of one run": lambda n: generate.source(elements=n),
    "valid values of one list": lambda n: generate.source(valid_values=n),
    "varieties of one list": lambda n: generate.source(varieties=n),
    "defaults of one array": lambda n: generate.source(array_defaults=n),
    "variable classes, unused": lambda n: generate.source(variable_classes=n),
    "variable classes, used": lambda n: generate.source(variable_classes=n, members_count=n),
    "classes": lambda n: generate.source(classes=n),
    "strings of 230 characters": lambda n: generate.source(strings=n, string_length=230),
}
COMMENTED = "attributes, mixed, with comments and quotes"
SOURCES = {**GROWTH, COMMENTED: lambda n: generate.commented(generate.source(attributes=n))}
LIMIT = "bare loop"
MB = 1e6


class Plan(typing.NamedTuple):
    """The sizes and repetitions of a measurement."""

    small: int  # the two sizes between which growth is measured
    large: int
    rounds: int
    start_rounds: int
    start_runs: int  # in each round
    largest: int  # classes of a source that has as many mixed attributes in each: 1 GB


FULL = Plan(10000, 60000, 7, 20, 200, 64)
QUICK = Plan(1000, 6000, 3, 5, 100, 4)


class Verdict(typing.NamedTuple):
    """A measured figure, its target, and whether it meets the target."""

    finding: str = ""
    target: str = ""
    met: typing.Optional[bool] = None


class Row(typing.NamedTuple):
    """A row of the table; a cell that does not apply is None."""

    name: str
    size: typing.Optional[int] = None  # bytes of source
    cost: typing.Optional[measure.Cost] = None
    instructions: typing.Optional[int] = None
    verdict: Verdict = Verdict()
    definitions: typing.Optional[int] = None  # in the source


class Bench:
    """The programs, the directory of their inputs, and the rows so far."""

    def __init__(self, build, example, directory, plan):
        self.cdgen, self.cdef = build / "cdgen", build / "cdef"
        self.empty, self.reader = build / "bench" / "bench_empty", build / "bench" / "bench_read"
        self.limit = build / "bench" / "bench_limit"
        self.launcher = measure.Launcher(build / "bench" / "bench_launch")
        self.example, self.directory, self.plan = example, directory, plan
        self.rows = []

    def add(self, *args, **kwargs):
        """Adds a row to the table."""
        self.rows.append(Row(*args, **kwargs))

    def job(self, source, *options):
        """A run of cdgen on a source."""
        return self.here([self.cdgen, *options, source, "out.cdef"], fresh="out.cdef")

    def here(self, command, **more):
        """A command of the directory that takes little time."""
        return measure.Job(command, self.directory, repeat=self.plan.rounds, **more)

    @functools.lru_cache(maxsize=None)
    def source(self, dimension, count):
        """The name of a generated source, which is written when it is first asked for."""
        path = self.directory / f"{list(SOURCES).index(dimension)}-{count}.cdefsrc"
        with open(path, "w", encoding="ascii") as file:
            file.writelines(SOURCES[dimension](count))
        return path

    @functools.lru_cache(maxsize=None)
    def instructions(self, source, *options):
        """User instructions of a compilation."""
        return self.counted(self.job(source, *options))

    def counted(self, job):
        """The user instructions of a run."""
        counted = measure.counted_by_processor(job) if self.processor_counts() else None
        return counted or measure.counted_by_simulator(job)

    @functools.lru_cache(maxsize=None)
    def processor_counts(self):
        """Whether the processor can count instructions on this machine."""
        return measure.counted_by_processor(self.here([self.empty])) is not None

    def output_size(self, source, *options):
        """Bytes of the database."""
        self.launcher.runs(self.job(source, *options)._replace(repeat=1))
        return (self.directory / "out.cdef").stat().st_size


def say(text):
    """Shows progress on standard error, outside of the table."""
    print(text, file=sys.stderr, flush=True)


def peer_job(bench, peer):
    """A peer with its input, in a directory of its own; and the size of its input."""
    directory = bench.directory / peer.out
    directory.mkdir()
    peers.prepare(peer, directory, bench.plan.large)
    job = measure.Job(peers.arguments(peer), directory, peer.out, peer.stdin, peer.stdout)
    return job, (directory / peer.source).stat().st_size


def throughput(bench):
    """cdgen, its peers and the limits on the same definitions; returns the costs that other rows refer to."""
    source = bench.source(MIXED, bench.plan.large)
    jobs = {"cdgen": bench.job(source), "cdgen -s": bench.job(source, "-s"),
            LIMIT: bench.here([bench.limit, source, "limit.out"], fresh="limit.out"),
            "wc -l": bench.here(["wc", "-l", source]), "cp": bench.here(["cp", source, "copy"], fresh="copy")}
    sizes = dict.fromkeys(jobs, source.stat().st_size)
    for peer in peers.PEERS:
        say(f"input for {peer.name}")
        jobs[peer.name], sizes[peer.name] = peer_job(bench, peer)
    say("cdgen and its peers")
    runs = bench.launcher.rounds(jobs, bench.plan.rounds)
    costs = {name: measure.median(each) for name, each in runs.items()}
    say("instructions")
    for name, cost in costs.items():
        options = ["-s"] if name == "cdgen -s" else []
        counted = bench.instructions(source, *options) if name.startswith("cdgen") else None
        defined = None if name in ("wc -l", "cp") else bench.plan.large
        bench.add(name, sizes[name], cost, counted, definitions=defined)
    return costs, sizes, runs


def paired(bench, runs, others):
    """The ratio of the CPU times of two groups of runs, round by round: its minimum and its median."""
    def by_round(costs):
        each = len(costs) // bench.plan.rounds
        return [statistics.median(cost.cpu for cost in costs[at:at + each]) for at in range(0, len(costs), each)]

    ratios = [mine / other for mine, other in zip(by_round(runs), by_round(others))]
    return min(ratios), statistics.median(ratios)


def judge_throughput(bench, costs, sizes, runs):
    """Adds the targets for the mixed source."""
    source, count = bench.source(MIXED, bench.plan.large), f"{bench.plan.large:,} mixed attributes"
    per_byte = bench.instructions(source) / sizes["cdgen"]
    bench.add(f"instructions a byte, {count}", verdict=at_most(per_byte, 14, "{:.1f}"))
    noted = bench.source(COMMENTED, bench.plan.large)
    per_byte = bench.instructions(noted) / noted.stat().st_size
    bench.add("the same with comments and quotes", verdict=at_most(per_byte, 18, "{:.1f}"))
    least, middle = paired(bench, runs["cdgen"], runs[LIMIT])
    bench.add(f"CPU time against {LIMIT}, median", verdict=at_most(middle, 1.8, "{:.2f} x"))
    bench.add(f"CPU time against {LIMIT}, least", verdict=at_most(least, 1.8, "{:.2f} x"))
    fastest = min((peer.name for peer in peers.PEERS), key=lambda name: costs[name].cpu)
    least, middle = paired(bench, runs[fastest], runs["cdgen"])
    bench.add(f"definitions a second against {fastest}, median", verdict=at_least(middle, 2.5, "{:.2f} x"))
    bench.add(f"definitions a second against {fastest}, least", verdict=at_least(least, 2.5, "{:.2f} x"))
    bench.add("CPU time against wc -l", verdict=at_most(costs["cdgen"].cpu / costs["wc -l"].cpu, 15, "{:.1f} x"))
    for name in ("cdgen", "cdgen -s"):
        bench.add(f"peak memory of {name} for a byte of source, {count}",
                  verdict=at_most(costs[name].peak / sizes[name], 1.1, "{:.2f} bytes"))
    more = bench.instructions(source, "-s") / bench.instructions(source) - 1
    bench.add("instructions that -s adds", verdict=at_most(100 * more, 25, "{:+.1f} %"))
    more = costs["cdgen -s"].cpu / costs["cdgen"].cpu - 1
    bench.add("CPU time that -s adds", verdict=at_most(100 * more, 25, "{:+.1f} %"))


def judge_largest(bench):
    """Adds the memory target for a source of 1 GB, which is removed afterwards."""
    say("a large source")
    path = bench.directory / "largest.cdefsrc"
    with open(path, "w", encoding="ascii") as file:
        file.writelines(generate.large_source(bench.plan.largest, bench.plan.large))
    size = path.stat().st_size
    cost = measure.median(bench.launcher.runs(bench.job(path)._replace(repeat=3)))
    output = (bench.directory / "out.cdef").stat().st_size
    path.unlink()
    bench.add(f"{bench.plan.largest} classes of as many mixed attributes", size, cost,
              definitions=bench.plan.largest * bench.plan.large,
              verdict=at_most(cost.peak / output, 1.6, "{:.2f} x database"))


def at_most(figure, limit, form):
    """A verdict for a figure that must not exceed its target."""
    return Verdict(form.format(figure), f"<= {limit}", figure <= limit)


def at_least(figure, limit, form):
    """A verdict for a figure that must reach its target."""
    return Verdict(form.format(figure), f">= {limit}", figure >= limit)


def memory(peak, output):
    """A verdict for peak memory compared with the size of the output."""
    finding = f"{peak / MB:.1f} MB for {output / MB:.1f} MB"
    return Verdict(finding, "<= 1.6 x output + 2 MB", peak <= 1.6 * output + 2 * MB)


def readers(bench):
    """Measures the programs that read databases; the target is less than a nanosecond for each byte."""
    say("verifying and reading")
    source = bench.source(MIXED, bench.plan.large)
    size = bench.output_size(source)
    (bench.directory / "out.cdef").rename(bench.directory / "read.cdef")
    jobs = {"cdef verify": bench.here([bench.cdef, "verify", "-q", "read.cdef"]),
            "reading all of it": bench.here([bench.reader, "read.cdef"])}
    for name, runs in bench.launcher.rounds(jobs, bench.plan.rounds).items():
        cost = measure.median(runs)
        bench.add(f"{name}, a database of {bench.plan.large:,} attributes", size, cost,
                  verdict=at_least(size / cost.cpu / 1e9, 1, "{:.2f} GB/s"))


# The subcommands that show databases: how many times faster than recorded each is meant to be.
INSPECTED = {"dump": 1.6, "dump --json": 2.5, "dump --hex": 3, "source": 2, "diff": 2.5}
EARLIER = pathlib.Path(__file__).with_name("inspector.txt")


def earlier_instructions():
    """User instructions for a byte of database, as recorded, by subcommand."""
    lines = EARLIER.read_text(encoding="ascii").splitlines()
    recorded = (line.rsplit(maxsplit=1) for line in lines if not line.startswith("#"))
    return {name: float(figure) for name, figure in recorded}


def inspector(bench):
    """Compares the subcommands that show databases with their recorded figures: instructions, and memory for each byte.
    """
    say("showing")
    size, earlier = (bench.directory / "read.cdef").stat().st_size, earlier_instructions()
    databases = {name: ["read.cdef"] * (2 if name == "diff" else 1) for name in INSPECTED}
    jobs = {name: bench.here([bench.cdef, *name.split(), *databases[name]]) for name in INSPECTED}
    for name, runs in bench.launcher.rounds(jobs, bench.plan.rounds).items():
        cost, counted = measure.median(runs), bench.counted(jobs[name])
        bench.add(f"cdef {name}, a database of {bench.plan.large:,} attributes", size, cost, counted,
                  at_least(earlier[name] * size / counted, INSPECTED[name], "{:.1f} x as fast as before"))
        bench.add(f"peak memory of cdef {name}", verdict=at_most(cost.peak / size, 3, "{:.2f} x database"))


def checks(bench):
    """Compares cdef check with compiling, for each dimension."""
    say("checking")
    for dimension in (MIXED, "actions", "SD elements of one run"):
        source = bench.source(dimension, bench.plan.large)
        jobs = {"compile": bench.job(source),
                "check": bench.here([bench.cdef, "check", "--no-warn", "all", source])}
        compiled, checked = (measure.median(runs)
                             for runs in bench.launcher.rounds(jobs, bench.plan.rounds).values())
        bench.add(f"cdef check, {bench.plan.large:,} {dimension}", source.stat().st_size, checked,
                  verdict=at_most(checked.cpu / compiled.cpu, 1.6, "{:.2f} x compiling"))


def start_up(bench):
    """Compares a small compilation with a program that does nothing."""
    say("start-up")
    jobs = [job._replace(repeat=bench.plan.start_runs) for job in (bench.here([bench.empty]), bench.job(bench.example))]
    costs = bench.launcher.rounds(dict(enumerate(jobs)), bench.plan.start_rounds)
    empty, small = costs.values()
    size = bench.example.stat().st_size
    bench.add("empty static program", None, measure.median(empty))
    bench.add("cdgen, the example", size, measure.median(small), bench.instructions(bench.example))
    middle = measure.median(small).cpu / measure.median(empty).cpu
    least = min(small).cpu / min(empty).cpu
    bench.add("start-up against the empty program, median", verdict=at_most(middle, 1.8, "{:.2f} x"))
    bench.add("start-up against the empty program, minimum", verdict=at_most(least, 1.8, "{:.2f} x"))
    calls = measure.system_calls(bench.job(bench.example))
    bench.add("system calls for the example", verdict=Verdict(str(calls), "< 40", calls < 40))


def exponent(bench, dimension, *options):
    """The exponent with which instructions grow between the two sizes, without the cost of a source with only one."""
    base, small, large = (bench.instructions(bench.source(dimension, count), *options)
                          for count in (1, bench.plan.small, bench.plan.large))
    return math.log((large - base) / (small - base)) / math.log(bench.plan.large / bench.plan.small)


def grow(bench, dimension):
    """Measures one dimension: its cost at the larger size, and its growth. Returns the verdict about its memory."""
    say(f"growth: {dimension}")
    source = bench.source(dimension, bench.plan.large)
    runs = bench.launcher.runs(bench.job(source))
    plain, reversed_order = exponent(bench, dimension), exponent(bench, dimension, "-s")
    cost = measure.median(runs)
    bench.add(f"{bench.plan.large:,} {dimension}", source.stat().st_size, cost, bench.instructions(source),
              Verdict(f"grows by {plain:.3f}, with -s by {reversed_order:.3f}", "<= 1.02",
                      max(plain, reversed_order) <= 1.02))
    return memory(cost.peak, bench.output_size(source))


def growth(bench):
    """Measures all dimensions. Their memory has a target and therefore rows of its own."""
    verdicts = {dimension: grow(bench, dimension) for dimension in GROWTH}
    for dimension, verdict in verdicts.items():
        bench.add(f"peak memory, {bench.plan.large:,} {dimension}", verdict=verdict)


def cells(row, wc_cpu, cdgen_cpu):
    """The texts of a row."""
    cost, size = row.cost, row.size
    timed = [f"{cost.cpu * 1e3:.2f}", f"{cost.wall * 1e3:.2f}"] if cost else ["", ""]
    rate = f"{size / cost.cpu / MB:.1f}" if cost and size else ""
    defined = f"{row.definitions / cost.cpu / 1e3:,.0f}" if row.definitions else ""
    per_byte = f"{row.instructions / size:.1f}" if row.instructions and size else ""
    peak = f"{cost.peak / MB:.1f}" if cost else ""
    ratios = [f"{cost.cpu / wc_cpu:.2f}", f"{cost.cpu / cdgen_cpu:.2f}"] if cost else ["", ""]
    verdict = {None: "", True: "met", False: "MISSED"}[row.verdict.met]
    return [row.name, f"{size / MB:.2f}" if size else "", *timed, rate, defined, per_byte, peak, *ratios,
            row.verdict.finding, row.verdict.target, verdict]


TITLES = ["what", "source MB", "CPU ms", "wall ms", "MB/s", "1000 definitions/s", "instr/byte", "peak MB", "x wc -l", "x cdgen", "finding",
          "target", "verdict"]


def table(rows, costs):
    """The table, in Markdown, its columns aligned."""
    lines = [TITLES] + [cells(row, costs["wc -l"].cpu, costs["cdgen"].cpu) for row in rows]
    widths = [max(map(len, column)) for column in zip(*lines)]
    lines.insert(1, ["-" * width for width in widths])
    return "\n".join("| " + " | ".join(map(str.ljust, line, widths)) + " |" for line in lines)


def machine():
    """A description of the machine."""
    try:
        text = pathlib.Path("/proc/cpuinfo").read_text(encoding="ascii", errors="replace")
        model = next(line.split(":")[1].strip() for line in text.splitlines() if line.startswith("model name"))
    except (OSError, StopIteration):
        model = platform.machine()
    return f"{model}, {os.cpu_count()} processors, Linux {platform.release().split('-')[0]}"


BEGIN, END = "<!-- what script/bench --record wrote -->\n", "<!-- end -->\n"


def record(path, text):
    """Replaces the table in a document."""
    document = path.read_text(encoding="utf-8")
    before, rest = document.split(BEGIN)
    path.write_text(before + BEGIN + text + "\n" + END + rest.split(END)[1], encoding="utf-8")


def report(bench, costs, quick):
    """The description of the machine, and the table."""
    counter = "the processor" if bench.processor_counts() else "valgrind"
    head = f"{machine()}; instructions counted by {counter}; {bench.plan.large:,} definitions"
    return head + ("; QUICK: rough figures" if quick else "") + "\n\n" + table(bench.rows, costs)


def run(bench):
    """Runs everything. Returns the costs that the ratios refer to."""
    costs, sizes, runs = throughput(bench)
    judge_throughput(bench, costs, sizes, runs)
    judge_largest(bench)
    readers(bench)
    inspector(bench)
    checks(bench)
    start_up(bench)
    growth(bench)
    return costs


def parse():
    """Parses the command line."""
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--quick", action="store_true", help="small inputs and few runs: only to try it out")
    parser.add_argument("--record", action="store_true", help="put the table into the document too")
    parser.add_argument("--document", type=pathlib.Path, required=True)
    parser.add_argument("--build", type=pathlib.Path, required=True, help="the build directory, with CDGEN_BENCH on")
    parser.add_argument("--example", type=pathlib.Path, required=True, help="the source that start-up compiles")
    return parser.parse_args()


def main():
    """Measure and print."""
    options = parse()
    os.environ["LC_ALL"] = "C"
    with tempfile.TemporaryDirectory(prefix="cdgen-bench-") as directory:
        bench = Bench(options.build.resolve(), options.example.resolve(), pathlib.Path(directory),
                      QUICK if options.quick else FULL)
        text = report(bench, run(bench), options.quick)
    print(text)
    if options.record:
        record(options.document, text)
    return 0


if __name__ == "__main__":
    try:
        sys.exit(main())
    except measure.Failure as failure:
        sys.exit(f"bench: {failure}")
