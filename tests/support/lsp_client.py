"""A small client of `cdef lsp`, written from the protocol alone. It shares no code with the server."""

import contextlib
import json
import os
import pathlib
import queue
import re
import subprocess
import threading
import urllib.parse

from programs import PROGRAMS

TIMEOUT = 60  # seconds, for any answer
ERROR, WARNING = 1, 2
CAPABILITIES = {
    "general": {"positionEncodings": ["utf-16"]},
    "textDocument": {
        "publishDiagnostics": {"relatedInformation": True, "codeDescriptionSupport": True},
        "completion": {"completionItem": {"snippetSupport": True}},
        "documentSymbol": {"hierarchicalDocumentSymbolSupport": True},
        "codeAction": {"codeActionLiteralSupport": {"codeActionKind": {"valueSet": ["quickfix", "refactor"]}}},
    },
    "workspace": {"workspaceEdit": {"documentChanges": True}},
}


def frame(message):
    """A message with its header. Bytes are used as the body unchanged."""
    body = message if isinstance(message, bytes) else json.dumps(message, ensure_ascii=False).encode()
    return b"Content-Length: %d\r\n\r\n" % len(body) + body


def frames(data):
    """All messages in the bytes that a server has written."""
    found = []
    while data:
        header, _, rest = data.partition(b"\r\n\r\n")
        size = int(re.fullmatch(rb"Content-Length: (\d+)", header).group(1))
        found.append(json.loads(rest[:size]))
        data = rest[size:]
    return found


def talk(data, *options):
    """The server's answers to these bytes, and its status."""
    done = subprocess.run([PROGRAMS.cdef, "lsp", *options], input=data, capture_output=True, timeout=TIMEOUT,
                          check=False)
    return frames(done.stdout), done.returncode, done.stderr.decode()


def uri_of(path):
    """The URI of a file."""
    return "file://" + urllib.parse.quote(str(path))


class ServerError(Exception):
    """The server answered with an error."""

    def __init__(self, error):
        super().__init__(error["message"])
        self.code = error["code"]


class Client:
    """A server, and the client's side of the conversation."""

    def __init__(self, *options, capabilities=None, root=None, initialize=True, **more):
        self.process = subprocess.Popen([PROGRAMS.cdef, "lsp", *options], stdin=subprocess.PIPE, stdout=subprocess.PIPE)
        self.arrived, self.latest, self.requests = queue.Queue(), 0, []
        self.published = {}  # uri -> the latest parameters of publishDiagnostics
        self.notes = []  # other notifications
        self.reader = threading.Thread(target=self.read, daemon=True)
        self.reader.start()
        if initialize:
            folders = root and [{"uri": uri_of(root), "name": "folder"}]
            able = CAPABILITIES if capabilities is None else capabilities
            self.offers = self.request("initialize", processId=os.getpid(), rootUri=root and uri_of(root),
                                       workspaceFolders=folders, capabilities=able, **more)["capabilities"]
            self.notify("initialized")

    def __enter__(self):
        return self

    def __exit__(self, *failure):
        """The server ends with its input. Killed, it would not write its counts of a coverage build."""
        with contextlib.suppress(BrokenPipeError):
            self.process.stdin.close()
        try:
            self.process.wait(TIMEOUT)
        finally:
            self.process.kill()
            self.process.wait()
        self.reader.join()
        self.process.stdout.close()

    def read(self):
        """Take messages from the server until it ends."""
        out = self.process.stdout
        while True:
            header = b""
            while not header.endswith(b"\r\n\r\n"):
                byte = out.read(1)
                if not byte:
                    self.arrived.put(None)
                    return
                header += byte
            size = int(re.search(rb"Content-Length: (\d+)\r\n", header).group(1))
            self.arrived.put(json.loads(out.read(size)))

    def send(self, message):
        self.process.stdin.write(frame(message))
        self.process.stdin.flush()

    def notify(self, method, **params):
        self.send({"jsonrpc": "2.0", "method": method, "params": params})

    def ask(self, method, **params):
        """Sends a request. Returns its number."""
        self.latest += 1
        self.send({"jsonrpc": "2.0", "id": self.latest, "method": method, "params": params})
        return self.latest

    def next(self):
        """The next message, which is recorded too."""
        message = self.arrived.get(timeout=TIMEOUT)
        assert message is not None, f"the server has ended, status {self.process.wait()}"
        if message.get("method") == "textDocument/publishDiagnostics":
            self.published[message["params"]["uri"]] = message["params"]
        elif "method" in message and "id" in message:
            self.requests.append(message)
            self.send({"jsonrpc": "2.0", "id": message["id"], "result": None})
        elif "method" in message:
            self.notes.append(message)
        return message

    def answer(self, number):
        """The answer to a request."""
        while (message := self.next()).get("id") != number or "method" in message:
            pass
        if "error" in message:
            raise ServerError(message["error"])
        return message["result"]

    def request(self, method, **params):
        return self.answer(self.ask(method, **params))

    def about(self, method, uri, **params):
        """A request about a document."""
        return self.request(method, textDocument={"uri": uri}, **params)

    def at(self, method, uri, line, character, **params):
        """A request about a place in a document."""
        return self.about(method, uri, position={"line": line, "character": character}, **params)

    def open(self, uri, text, version=1):
        self.notify("textDocument/didOpen", textDocument={"uri": uri, "languageId": "cdefsrc", "version": version,
                                                          "text": text})

    def change(self, uri, version, *changes):
        self.notify("textDocument/didChange", textDocument={"uri": uri, "version": version},
                    contentChanges=[{"text": each} if isinstance(each, str) else each for each in changes])

    def diagnostics(self, uri, version=1):
        """The findings for a version of a document."""
        while self.published.get(uri, {}).get("version") != version:
            self.next()
        return self.published[uri]["diagnostics"]

    def end(self):
        """Shuts the server down. Returns its status."""
        self.request("shutdown")
        self.notify("exit")
        return self.process.wait(timeout=TIMEOUT)


# ---- Positions, counted again ------------------------------------------------------------------------------------


def lines_of(text):
    """The lines of a text with their ends; the last one may be empty."""
    return re.findall(r"[^\r\n]*(?:\r\n|\r|\n)", text) + [re.search(r"[^\r\n]*\Z", text).group()]


def units(text, encoding="utf-16"):
    """The number of code units of a text."""
    return len(text.encode("utf-16-le")) // 2 if encoding == "utf-16" else len(text.encode())


def offset(text, position, encoding="utf-16"):
    """The number of characters of the text before a position in it."""
    lines = lines_of(text)
    before = "".join(lines[:position["line"]])
    line, character = lines[position["line"]].rstrip("\r\n"), 0
    while units(line[:character], encoding) < position["character"]:
        character += 1
    assert units(line[:character], encoding) == position["character"], "in the middle of a character, or past the end"
    return len(before) + character


def part(text, place, encoding="utf-16"):
    """The text of a range."""
    return text[offset(text, place["start"], encoding):offset(text, place["end"], encoding)]


def position(text, at, encoding="utf-16"):
    """The position of a character of the text, which is not within an end of a line."""
    lines, line = lines_of(text), 0
    while line + 1 < len(lines) and at >= len(lines[line]):
        at -= len(lines[line])
        line += 1
    return {"line": line, "character": units(lines[line][:at], encoding)}


def edited(text, edits, encoding="utf-16"):
    """The text after edits whose places all refer to the text before."""
    def place(edit):
        return (offset(text, edit["range"]["start"], encoding), offset(text, edit["range"]["end"], encoding),
                edit["newText"])

    places = sorted(map(place, edits), key=lambda each: each[:2])
    made, done = "", 0
    for begin, end, new in places:
        assert begin >= done, "edits overlap"
        made += text[done:begin] + new
        done = end
    return made + text[done:]


def edits_in(workspace_edit):
    """uri -> edits."""
    if "documentChanges" in workspace_edit:
        return {each["textDocument"]["uri"]: each["edits"] for each in workspace_edit["documentChanges"]}
    return workspace_edit["changes"]
