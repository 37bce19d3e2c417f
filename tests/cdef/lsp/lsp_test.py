"""Test `cdef lsp`: its life, documents, and the findings in them."""

import itertools
import json
import subprocess

import pytest

from compare import same
from lsp_client import CAPABILITIES, Client, ServerError, frame, part, talk, uri_of
from programs import EXAMPLES, PROGRAMS

EXAMPLE = (EXAMPLES / "FileSystem.cdefsrc").read_text()
URI = "file:///classes/Pump.cdefsrc"
# Each line is known by its number in the messages.
PUMP = """ControlDefinition
\tFileVersion=1.0.0.0
ResourceClass
\tDescription=1
\tDisplayName=2
\tProperties=HasResources
\tClassPermTemplate=0
\tResourcePermTemplate=0
\tName=Pump
ClassToManagerMapping
\tResourceManager=M
\tFirstKey=1
\tLastKey=2
\tMessageCatalog=m
\tDescriptiveMessageSet=1
"""
INITIALIZE = {"jsonrpc": "2.0", "id": 1, "method": "initialize", "params": {"capabilities": {}}}
SHUTDOWN = {"jsonrpc": "2.0", "id": 2, "method": "shutdown"}
EXIT = {"jsonrpc": "2.0", "method": "exit"}


def codes(answers):
    """(id, error's code, or None for a result) of each answer."""
    return [(each["id"], each["error"]["code"] if "error" in each else None) for each in answers if "id" in each]


def check(text, directory):
    """The findings of `cdef check --format json`."""
    path = directory / "class.cdefsrc"
    path.write_bytes(text.encode())
    done = subprocess.run([PROGRAMS.cdef, "check", "--format", "json", path], capture_output=True, check=False)
    return json.loads(done.stdout)["sources"][0]["findings"]


# ---- Life ------------------------------------------------------------------------------------------------------------


def test_ends_with_0_only_after_shutdown():
    answers, status, errors = talk(frame(INITIALIZE) + frame(SHUTDOWN) + frame(EXIT))
    assert (codes(answers), status, errors) == ([(1, None), (2, None)], 0, "")
    assert talk(frame(INITIALIZE) + frame(EXIT))[1] == 1
    assert talk(frame(EXIT))[1] == 1
    assert talk(frame(INITIALIZE))[1] == 1  # the input ends
    assert talk(b"")[1] == 1


def test_initialize_says_who_answers():
    answers, _, _ = talk(frame(INITIALIZE))
    version = subprocess.run([PROGRAMS.cdef, "--version"], capture_output=True, check=True).stdout.decode().split()[1]
    assert answers[0]["result"]["serverInfo"] == {"name": "cdef", "version": version}


def test_requests_outside_of_its_life_are_refused():
    hover = {"jsonrpc": "2.0", "id": 3, "method": "textDocument/hover", "params": {}}
    assert codes(talk(frame(hover))[0]) == [(3, -32002)]
    assert codes(talk(frame(INITIALIZE) + frame({**INITIALIZE, "id": 9}))[0]) == [(1, None), (9, -32600)]
    assert codes(talk(frame(INITIALIZE) + frame(SHUTDOWN) + frame(hover))[0]) == [(1, None), (2, None), (3, -32600)]


def test_notifications_outside_of_its_life_are_ignored():
    opened = {"jsonrpc": "2.0", "method": "textDocument/didOpen",
              "params": {"textDocument": {"uri": URI, "languageId": "cdefsrc", "version": 1, "text": "x\n"}}}
    assert talk(frame(opened))[0] == []
    assert len(talk(frame(INITIALIZE) + frame(SHUTDOWN) + frame(opened))[0]) == 2


def test_unknown_methods():
    unknown = {"jsonrpc": "2.0", "id": "a", "method": "no/such", "params": {}}
    optional = {"jsonrpc": "2.0", "method": "$/some", "params": {}}
    answers, _, _ = talk(frame(INITIALIZE) + frame(unknown) + frame(optional))
    assert codes(answers) == [(1, None), ("a", -32601)]


def test_server_ends_with_its_client():
    """A client that died cannot shut the server down; its input may stay open in another process."""
    dead = subprocess.Popen(["true"])
    dead.wait()
    with Client(initialize=False) as client:
        client.request("initialize", processId=dead.pid, capabilities={})
        assert client.process.wait(timeout=60) == 1


# ---- Frames ----------------------------------------------------------------------------------------------------------


@pytest.mark.parametrize("header", [
    b"Content-Length: x\r\n\r\n", b"Content-Length: -1\r\n\r\n", b"\r\n\r\n", b"Content-Type: a\r\n\r\n",
    b"Content-Length: 1\r\nContent-Length: 1\r\n\r\n", b"nonsense\r\n\r\n", b"A: b" * 2000,
], ids=itertools.count())
def test_bad_header_ends_the_server(header):
    answers, status, _ = talk(header + frame(INITIALIZE))
    assert (codes(answers), status) == ([(None, -32700)], 1)


def test_other_header_fields_are_passed_over():
    body = json.dumps(INITIALIZE).encode()
    for header in (b"content-length: %d\r\nX: y\r\n\r\n",
                   b"Content-Type: application/vscode-jsonrpc; charset=utf8\r\nContent-Length:%d \r\n\r\n"):
        assert codes(talk(header % len(body) + body)[0]) == [(1, None)]


def test_frame_in_another_charset_is_refused_alone():
    body = json.dumps(INITIALIZE).encode()
    other = b"Content-Length: %d\r\nContent-Type: x; charset=utf-16\r\n\r\n" % len(body) + body
    assert codes(talk(other + frame(INITIALIZE))[0]) == [(None, -32600), (1, None)]


def test_frame_that_is_too_large_is_refused_alone():
    large = 32 * 1024 * 1024 + 1
    assert codes(talk(frame(b" " * large) + frame(INITIALIZE))[0]) == [(None, -32600), (1, None)]


@pytest.mark.parametrize("body, code", [
    (b"", -32700), (b"{", -32700), (b'"\xff"', -32700), (b"[]", -32600), (b"1", -32600), (b"{}", -32600),
    (b"[" * 200 + b"]" * 200, -32600), (b"{" * 200000, -32600), (b'{"jsonrpc": "2.0", "method": 1}', -32600),
    (b'{"jsonrpc": "2.0", "id": null, "method": "a"}', -32600), (b'{"jsonrpc": "2.0", "id": [], "method": "a"}', -32600),
    (b'{"method": "$/cancelRequest"}', -32600), (b'{"jsonrpc": "1.0", "method": "exit"}', -32600),
    (b'{"jsonrpc": 2.0, "id": 7, "result": null}', -32600),
    (frame(SHUTDOWN).split(b"\r\n\r\n")[1] + b"\0", -32700), (frame(SHUTDOWN).split(b"\r\n\r\n")[1] + b"\0{", -32700),
], ids=itertools.count())
def test_what_is_no_message_is_refused_alone(body, code):
    assert codes(talk(frame(body) + frame(INITIALIZE))[0]) == [(None, code), (1, None)]


@pytest.mark.parametrize("version", [{}, {"jsonrpc": "1.0"}, {"jsonrpc": None}])
def test_request_of_another_version_is_refused(version):
    assert codes(talk(frame({**version, "id": 7, "method": "shutdown"}) + frame(INITIALIZE))[0]) == [(7, -32600), (1, None)]


def test_responses_are_not_answered():
    assert codes(talk(frame({"jsonrpc": "2.0", "id": 7, "result": None}) + frame(INITIALIZE))[0]) == [(1, None)]


def test_cut_frame_ends_the_server():
    assert talk(frame(INITIALIZE)[:-1])[:2] == ([], 1)


# ---- Documents and their findings ------------------------------------------------------------------------------------


def test_example_has_no_findings():
    with Client() as client:
        client.open(URI, EXAMPLE)
        assert client.diagnostics(URI) == []
        assert client.end() == 0


def test_finding_has_all_that_check_says(directory):
    text = PUMP.replace("FirstKey=1", "FirstKy=1")
    with Client("--explanations", "https://example.org/codes") as client:
        client.open(URI, text)
        (shown,) = client.diagnostics(URI)
    (found,) = check(text, directory)
    same(shown, {
        "range": {"start": {"line": 11, "character": 1}, "end": {"line": 11, "character": 8}},
        "severity": 1, "code": "S106", "source": "cdef", "message": found["message"], "data": {"name": "error"},
        "codeDescription": {"href": "https://example.org/codes#s106"},
        "relatedInformation": [{"location": {"uri": URI, "range": {"start": {"line": 11, "character": 1},
                                                                   "end": {"line": 11, "character": 8}}},
                                "message": "did you mean `FirstKey`?"}],
    }, "a finding")


def test_client_without_related_places_gets_the_notes_in_the_message():
    with Client(capabilities={}) as client:
        client.open(URI, PUMP.replace("FirstKey=1", "FirstKy=1"))
        (shown,) = client.diagnostics(URI)
    assert shown["message"].endswith("\ndid you mean `FirstKey`?")
    assert "relatedInformation" not in shown and "codeDescription" not in shown


def test_warning_is_one():
    with Client() as client:
        client.open(URI, PUMP.replace("LastKey=2", "LastKey=010"))
        (shown,) = client.diagnostics(URI)
    assert (shown["severity"], shown["code"], shown["data"]) == (2, "S509", {"name": "octal"})


def test_changes_are_checked():
    with Client() as client:
        client.open(URI, PUMP)
        assert client.diagnostics(URI) == []
        client.change(URI, 2, {"range": {"start": {"line": 8, "character": 1}, "end": {"line": 8, "character": 5}},
                               "text": "Nme"})
        assert [each["code"] for each in client.diagnostics(URI, 2)] == ["S106"]
        client.change(URI, 3, {"range": {"start": {"line": 8, "character": 2}, "end": {"line": 8, "character": 2}},
                               "text": "a"})
        assert client.diagnostics(URI, 3) == []
        client.change(URI, 4, "nonsense\n", PUMP, {"range": {"start": {"line": 0, "character": 0},
                                                             "end": {"line": 1, "character": 0}}, "text": ""})
        assert [each["code"] for each in client.diagnostics(URI, 4)] == ["S102"]


def test_closing_takes_the_findings_back():
    with Client() as client:
        client.open(URI, "nonsense\n")
        assert client.diagnostics(URI)
        client.notify("textDocument/didClose", textDocument={"uri": URI})
        client.request("shutdown")
        assert client.published[URI]["diagnostics"] == []


def test_escapes_in_a_uri_do_not_matter():
    with Client() as client:
        client.open("file:///a%20b/%41.cdefsrc", PUMP)
        client.change("file:///a%20b/A.cdefsrc", 2, "nonsense\n")
        assert client.diagnostics("file:///a%20b/%41.cdefsrc", 2)


@pytest.mark.parametrize("wrong", [
    {"range": {"start": {"line": 0, "character": 0}, "end": {"line": -1, "character": 0}}, "text": ""}, {"text": 1}, {}, 1,
    {"range": {"start": {"line": 1, "character": 0}, "end": {"line": 0, "character": 3}}, "text": ""},
    {"range": {"start": {"line": 0, "character": 3}, "end": {"line": 0, "character": 2}}, "text": ""},
], ids=itertools.count())
def test_of_a_malformed_message_no_change_is_applied(wrong):
    with Client() as client:
        client.open(URI, PUMP)
        assert client.diagnostics(URI) == []
        client.change(URI, 2, "nonsense\n", wrong)
        client.change(URI, 3, {"range": {"start": {"line": 0, "character": 0}, "end": {"line": 0, "character": 0}},
                               "text": "# x\n"})
        assert [each["code"] for each in client.diagnostics(URI, 3)] == []
        assert [each["method"] for each in client.notes] == ["window/logMessage"]


def test_change_of_an_unknown_document_is_logged():
    with Client() as client:
        client.change(URI, 2, "x")
        client.request("shutdown")
        assert [each["method"] for each in client.notes] == ["window/logMessage"]


@pytest.mark.parametrize("encoding", ["utf-16", "utf-8"])
def test_positions_count_code_units(encoding):
    """Greek takes two bytes and one unit, a combining character likewise, an astral one four bytes and two units."""
    text = PUMP.replace("Name=Pump", "Name=P # x").replace("FirstKey=1", "\u03b1e\u0301\U0001d50aKey=1")
    capabilities = {**CAPABILITIES, "general": {"positionEncodings": ["utf-32", encoding]}}
    with Client(capabilities=capabilities) as client:
        assert client.offers["positionEncoding"] == encoding
        client.open(URI, text)
        (shown,) = client.diagnostics(URI)
        assert part(text, shown["range"], encoding) == "\u03b1e\u0301\U0001d50aKey"
        end = {"utf-16": 9, "utf-8": 13}[encoding]
        assert shown["range"]["end"] == {"line": 11, "character": end}
        client.change(URI, 2, {"range": shown["range"], "text": "FirstKey"})
        assert client.diagnostics(URI, 2) == []


def test_carriage_returns_end_lines_too():
    """The compiler knows newlines only; the protocol also takes a carriage return for the end of a line."""
    text = PUMP.replace("\tFirstKey=1\n", "\tFirstKey=1\r\n").replace("Description=1\n", "Description=1\rx\n", 1)
    with Client() as client:
        client.open(URI, text)
        shown = client.diagnostics(URI)
        places = {each["code"]: each["range"] for each in shown}
        client.change(URI, 2, {"range": {"start": {"line": 3, "character": 14}, "end": {"line": 4, "character": 1}},
                               "text": ""})
        client.change(URI, 3, {"range": {"start": {"line": 11, "character": 11}, "end": {"line": 12, "character": 0}},
                               "text": "\n"})
        assert client.diagnostics(URI, 3) == []
    assert places, shown


def test_cancelled_request_is_answered_so():
    """Both are there before the server comes to the first one."""
    wait = b"".join(frame({"jsonrpc": "2.0", "method": "textDocument/didOpen", "params": {"textDocument": {
        "uri": URI, "languageId": "cdefsrc", "version": n, "text": "x\n" * 1000}}}) for n in range(3))
    asked = frame({"jsonrpc": "2.0", "id": 5, "method": "no/such"})
    cancelled = frame({"jsonrpc": "2.0", "method": "$/cancelRequest", "params": {"id": 5}})
    answers, _, _ = talk(frame(INITIALIZE) + wait + asked + cancelled + frame(SHUTDOWN) + frame(EXIT))
    assert codes(answers) == [(1, None), (5, -32800), (2, None)]


def test_unknown_document_is_refused():
    with Client() as client:
        with pytest.raises(ServerError) as refused:
            client.at("textDocument/hover", uri_of("/none"), 0, 0)
        assert refused.value.code in (-32601, -32602)
