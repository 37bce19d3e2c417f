#!/usr/bin/env python3
"""Measure how long "cdef lsp" takes from a change of a document to its findings, and to answer; print a table.

The source is generated, of so many lines. Each change is one letter at a random place, and the findings of the
version are awaited before the next one: the time includes both pipes.
"""

import argparse
import json
import pathlib
import random
import subprocess
import sys
import time

import generate

TARGETS = {9_000: 20, 90_000: 100}  # milliseconds, by lines
LINES_OF_ATTRIBUTE = 12  # about


class Server:
    """A server with one document."""

    def __init__(self, program, text):
        self.process = subprocess.Popen([program, "lsp"], stdin=subprocess.PIPE, stdout=subprocess.PIPE)
        self.version = self.number = 0
        self.request("initialize", capabilities={})
        self.send("initialized", {})
        self.version += 1
        self.send("textDocument/didOpen", {"textDocument": {"uri": "file:///no/a.cdefsrc", "languageId": "cdefsrc",
                                                            "version": self.version, "text": text}})
        self.await_findings()

    def send(self, method, params, **more):
        body = json.dumps({"jsonrpc": "2.0", "method": method, "params": params, **more}).encode()
        self.process.stdin.write(b"Content-Length: %d\r\n\r\n%s" % (len(body), body))
        self.process.stdin.flush()

    def read(self):
        size = int(self.process.stdout.readline().split(b":")[1])
        self.process.stdout.readline()
        return self.process.stdout.read(size)

    def await_findings(self):
        """Waits for the findings of the latest version. Reads only the version, because there may be many findings."""
        wanted = b'"version":%d}' % self.version
        while wanted not in self.read()[-40:]:
            pass

    def request(self, method, **params):
        self.number += 1
        self.send(method, params, id=self.number)
        while b'"id":%d,' % self.number not in self.read()[:40]:
            pass

    def change(self, line, character):
        """Inserts a letter, or removes it again in the next call, and waits for the findings."""
        self.version += 1
        self.send("textDocument/didChange", {"textDocument": {"uri": "file:///no/a.cdefsrc", "version": self.version},
                                             "contentChanges": [{"range": {
                                                 "start": {"line": line, "character": character},
                                                 "end": {"line": line, "character": character + self.version % 2}},
                                                 "text": "" if self.version % 2 else "x"}]})
        self.await_findings()


def milliseconds(act):
    """The time that a function takes."""
    begun = time.perf_counter()
    act()
    return (time.perf_counter() - begun) * 1000


def percentile(times, share):
    """The time that this share of all measurements does not exceed."""
    return sorted(times)[min(len(times) - 1, int(len(times) * share))]


def main():
    """Measures and prints. Returns 1 if the target is missed."""
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("--build", type=pathlib.Path, required=True)
    parser.add_argument("--changes", type=int, default=1000)
    options = parser.parse_args()
    missed = False
    print(f"{options.changes} changes\n\n| lines | what | median | 99th percentile | target |\n|---|---|---|---|---|")
    for size, target in TARGETS.items():
        lines = "".join(generate.source(attributes=size // LINES_OF_ATTRIBUTE)).splitlines()[:size]
        text = "\n".join(lines) + "\n"
        server, chooser = Server(options.build.resolve() / "cdef", text), random.Random(size)
        places = [chooser.randrange(10, len(lines)) for _ in range(options.changes // 2)]
        about = {"textDocument": {"uri": "file:///no/a.cdefsrc"}}
        acts = {"findings": [(lambda line=line: server.change(line, 1)) for line in places for _ in range(2)],
                "hover": [(lambda line=line: server.request("textDocument/hover", **about, position={
                    "line": line, "character": 3})) for line in places]}
        for name, each in acts.items():
            times = [milliseconds(act) for act in each]
            late = name == "findings" and percentile(times, 0.99) > target
            missed = missed or late
            print(f"| {len(lines):,} | {name} | {percentile(times, 0.5):.1f} ms | {percentile(times, 0.99):.1f} ms | "
                  f"{f'{target} ms' if name == 'findings' else ''}{', missed' if late else ''} |", flush=True)
        server.process.kill()
    return int(missed)


if __name__ == "__main__":
    sys.exit(main())
