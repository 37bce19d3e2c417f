#!/usr/bin/env python3
"""Measure how long "cdef lsp" takes from a change of a document to its findings, and to answer; print a table.

The sources are generated. Each change is one letter at a random place; the findings of the new version are awaited
before the next change. The time includes both pipes. The last column is the server's processor time, which depends less on
what else the machine is doing.
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
        self.findings = len(json.loads(self.await_findings())["params"]["diagnostics"])

    def processor_time(self):
        """Milliseconds so far. The server has one thread."""
        return int(pathlib.Path(f"/proc/{self.process.pid}/schedstat").read_text().split()[0]) / 1e6

    def send(self, method, params, **more):
        body = json.dumps({"jsonrpc": "2.0", "method": method, "params": params, **more}).encode()
        self.process.stdin.write(b"Content-Length: %d\r\n\r\n%s" % (len(body), body))
        self.process.stdin.flush()

    def read(self):
        size = int(self.process.stdout.readline().split(b":")[1])
        self.process.stdout.readline()
        return self.process.stdout.read(size)

    def await_findings(self):
        """Wait for the message with the findings of the latest version. Looks only at the end, because it may be long."""
        wanted = b'"version":%d}' % self.version
        while wanted not in (message := self.read())[-40:]:
            pass
        return message

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


def milliseconds(act, server):
    """The time that a function takes, and the processor time that the server uses."""
    begun, used = time.perf_counter(), server.processor_time()
    act()
    return (time.perf_counter() - begun) * 1000, server.processor_time() - used


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
    print(f"{options.changes} changes\n\n| lines | findings | what | median | 99th percentile | target | processor, 99th |\n"
          "|---|---|---|---|---|---|---|")
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
            times, processor = zip(*(milliseconds(act, server) for act in each))
            late = name == "findings" and percentile(times, 0.99) > target
            missed = missed or late
            print(f"| {len(lines):,} | {server.findings:,} | {name} | {percentile(times, 0.5):.1f} ms | "
                  f"{percentile(times, 0.99):.1f} ms | {f'{target} ms' if name == 'findings' else ''}"
                  f"{', missed' if late else ''} | {percentile(processor, 0.99):.1f} ms |", flush=True)
        server.process.kill()
    return int(missed)


if __name__ == "__main__":
    sys.exit(main())
