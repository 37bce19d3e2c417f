"""Test what `cdef lsp` does with the folders of the client, with project files, and for clients that ask for findings."""

import json
import shutil

import pytest

from lsp_client import CAPABILITIES, Client, ServerError, edited, part, uri_of
from lsp_pump import PUMP
from programs import EXAMPLES

ABLE = {**CAPABILITIES, "window": {"workDoneProgress": True},
        "workspace": {**CAPABILITIES["workspace"], "didChangeWatchedFiles": {"dynamicRegistration": True}}}


def settle(client):
    """Wait until nothing is left to do, which an answer alone does not show."""
    client.notify("$/nothing")
    while True:
        before = len(client.notes), dict(client.published)
        client.request("workspace/symbol", query="no such name")
        if (len(client.notes), client.published) == before and ended(client):
            return


def ended(client):
    """Whether the progress that has begun has ended."""
    kinds = [note["params"]["value"]["kind"] for note in client.notes if note["method"] == "$/progress"]
    return not kinds or kinds[-1] == "end"


def codes(client, path):
    return [each["code"] for each in client.published.get(uri_of(path), {"diagnostics": []})["diagnostics"]]


def wait_for(client, path, expected):
    """Until a file has these findings."""
    while codes(client, path) != expected:
        client.next()


@pytest.fixture(name="folder")
def two_classes(directory):
    """Two classes without findings of their own that have one name, and a folder that is hidden."""
    (directory / "deep").mkdir()
    (directory / ".hidden").mkdir()
    (directory / "a.cdefsrc").write_text(PUMP)
    (directory / "deep/b.cdefsrc").write_text(PUMP.replace("m.cat", "n.cat").replace("Flow", "Stream"))
    (directory / ".hidden/c.cdefsrc").write_text("nonsense\n")
    return directory


def test_all_sources_are_checked_and_compared(folder):
    (folder / "z.cdefsrc").write_text("nonsense\n")
    with Client(root=folder) as client:
        wait_for(client, folder / "z.cdefsrc", ["S101", "S301"][:1])
        wait_for(client, folder / "deep/b.cdefsrc", ["S611"])
        assert codes(client, folder / "a.cdefsrc") == []
        assert uri_of(folder / ".hidden/c.cdefsrc") not in client.published


def related(client, path):
    """Where else the only finding of a file points to."""
    (found,) = client.published[uri_of(path)]["diagnostics"]
    return [(each["location"]["uri"], each["location"]["range"], each["message"]) for each in found["relatedInformation"]]


def test_findings_across_classes_show_the_other_class(folder):
    """Its place is that in the editor if it is open there; columns are those of the protocol."""
    a, b = folder / "a.cdefsrc", folder / "deep/b.cdefsrc"
    header = PUMP.split("\n").index("ResourceClass")
    with Client(root=folder) as client:
        wait_for(client, b, ["S611"])
        start, end = {"line": header, "character": 0}, {"line": header, "character": len("ResourceClass")}
        assert related(client, b) == [(uri_of(a), {"start": start, "end": end}, "the other class `Pump`")]
        client.open(uri_of(a), "# \u03b1\n" + PUMP)
        start, end = ({**each, "line": header + 1} for each in (start, end))
        while related(client, b)[0][1] != {"start": start, "end": end}:
            client.next()


def test_related_columns_of_other_classes_count_code_units(folder):
    a, b = folder / "a.cdefsrc", folder / "b.cdefsrc"
    a.write_text(PUMP.replace("ResourceManager=M", 'ResourceManager="\u03b1\U0001d50a"'))
    b.write_text(PUMP.replace("Name=Pump", "Name=Fan").replace("FirstKey=1", "FirstKey=3").replace("LastKey=2", "LastKey=4"))
    (folder / "deep/b.cdefsrc").unlink()
    with Client(root=folder) as client:
        wait_for(client, b, ["S613"])
        (uri, place, message), = related(client, b)
        assert (uri, part(a.read_text(), place), message) == (
            uri_of(a), "\u03b1\U0001d50a", "the manager `\u03b1\U0001d50a`")


def test_links_are_not_other_classes(folder):
    """Not even those that the editor opens, nor two to one file outside of the folder."""
    (folder / "0.cdefsrc").symlink_to(folder / "a.cdefsrc")
    (folder / "deep/b.cdefsrc").unlink()
    outside = folder / ".hidden/c.cdefsrc"
    outside.write_text(PUMP.replace("Name=Pump", "Name=Fan").replace("ResourceManager=M", "ResourceManager=N")
                       .replace("Flow", "Stream").replace("m.cat", "n.cat"))
    for name in ("x.cdefsrc", "y.cdefsrc"):
        (folder / name).symlink_to(outside)
    (folder / "z.cdefsrc").write_text(PUMP.replace("m.cat", "o.cat").replace("Flow", "Surge"))
    with Client(root=folder) as client:
        client.open(uri_of(folder / "0.cdefsrc"), PUMP)
        wait_for(client, folder / "z.cdefsrc", ["S611"])
        settle(client)
        assert [related[0] for related in related(client, folder / "z.cdefsrc")] == [uri_of(folder / "a.cdefsrc")]
        for name in ("0", "a", "x", "y"):
            assert codes(client, folder / f"{name}.cdefsrc") == []


def test_open_document_counts_in_the_place_of_its_file(folder):
    path = folder / "deep/b.cdefsrc"
    with Client(root=folder) as client:
        wait_for(client, path, ["S611"])
        client.open(uri_of(path), path.read_text().replace("Name=Pump", "Name=Fan"))
        wait_for(client, path, [])
        client.notify("textDocument/didClose", textDocument={"uri": uri_of(path)})
        wait_for(client, path, ["S611"])


def test_hidden_sources_are_not_of_the_folder(folder):
    """Even if the editor mentions or opens them. `cdef build` leaves them out, too."""
    (folder / ".a.cdefsrc").write_text(PUMP)
    with Client(root=folder, capabilities=ABLE) as client:
        wait_for(client, folder / "deep/b.cdefsrc", ["S611"])
        client.notify("workspace/didChangeWatchedFiles", changes=[
            {"uri": uri_of(folder / name), "type": 2} for name in (".a.cdefsrc", ".hidden/c.cdefsrc")])
        client.open(uri_of(folder / ".hidden/c.cdefsrc"), "nonsense\n")
        wait_for(client, folder / ".hidden/c.cdefsrc", ["S101"])
        client.notify("textDocument/didClose", textDocument={"uri": uri_of(folder / ".hidden/c.cdefsrc")})
        wait_for(client, folder / ".hidden/c.cdefsrc", [])
        settle(client)
        assert uri_of(folder / ".a.cdefsrc") not in client.published
        assert [uri for uri, _, _ in related(client, folder / "deep/b.cdefsrc")] == [uri_of(folder / "a.cdefsrc")]


def test_findings_stay_under_no_other_spelling_of_a_uri(folder):
    """Editors escape other characters than the server."""
    path = folder / "a@+(1).cdefsrc"
    path.write_text("nonsense\n")
    other, own = "file://" + str(path), "file://" + str(folder) + "/a%40%2B%281%29.cdefsrc"
    with Client(root=folder) as client:
        def wait(uri, expected):
            while [each["code"] for each in client.published.get(uri, {"diagnostics": []})["diagnostics"]] != expected:
                client.next()

        wait(own, ["S101"])
        client.open(other, "nonsense\n")
        wait(other, ["S101"])
        assert client.published[own]["diagnostics"] == []
        client.notify("textDocument/didClose", textDocument={"uri": other})
        wait(own, ["S101"])
        assert client.published[other]["diagnostics"] == []


def test_document_in_a_folder_that_is_not_a_source_loses_its_findings(folder):
    path = folder / "a.txt"
    with Client(root=folder) as client:
        client.open(uri_of(path), "nonsense\n")
        wait_for(client, path, ["S101"])
        client.notify("textDocument/didClose", textDocument={"uri": uri_of(path)})
        wait_for(client, path, [])


def test_watched_files(folder):
    """The client says what has changed on the disk."""
    path = folder / "deep/b.cdefsrc"
    with Client(root=folder, capabilities=ABLE) as client:
        wait_for(client, path, ["S611"])
        (registered,) = [each for each in client.requests if each["method"] == "client/registerCapability"]
        (watch,) = registered["params"]["registrations"]
        assert [each["globPattern"] for each in watch["registerOptions"]["watchers"]] == ["**/*.cdefsrc", "**/cdef.toml"]
        path.write_text("nonsense\n")
        client.notify("workspace/didChangeWatchedFiles", changes=[{"uri": uri_of(path), "type": 2}])
        wait_for(client, path, ["S101"])
        path.unlink()
        client.notify("workspace/didChangeWatchedFiles", changes=[{"uri": uri_of(path), "type": 3}])
        wait_for(client, path, [])


def test_folders_come_and_go(folder):
    with Client() as client:
        client.notify("workspace/didChangeWorkspaceFolders",
                      event={"added": [{"uri": uri_of(folder), "name": "x"}], "removed": []})
        wait_for(client, folder / "deep/b.cdefsrc", ["S611"])
        client.notify("workspace/didChangeWorkspaceFolders",
                      event={"added": [], "removed": [{"uri": uri_of(folder), "name": "x"}]})
        wait_for(client, folder / "deep/b.cdefsrc", [])


def test_progress(folder):
    with Client(root=folder, capabilities=ABLE) as client:
        wait_for(client, folder / "deep/b.cdefsrc", ["S611"])
        settle(client)
        assert "window/workDoneProgress/create" in [each["method"] for each in client.requests]
        kinds = [each["params"]["value"]["kind"] for each in client.notes if each["method"] == "$/progress"]
        assert (kinds[0], kinds[-1]) == ("begin", "end")


def test_symbols_of_all_sources(folder):
    with Client(root=folder) as client:
        client.open(uri_of(folder / "a.cdefsrc"), PUMP.replace("=Host", "=Unsaved"))
        found = client.request("workspace/symbol", query="un")
        assert [each["name"] for each in found] == ["Unsaved"]
        found = client.request("workspace/symbol", query="STREAM")
        assert [(each["name"], each["containerName"]) for each in found] == [("Stream", "ResourceVariableClass")]
        assert part((folder / "deep/b.cdefsrc").read_text(), found[0]["location"]["range"]) == "Stream"


# ---- Project files ---------------------------------------------------------------------------------------------------


def test_project_file_switches_warnings_off(folder):
    (folder / "cdef.toml").write_text('[warnings]\noff = ["shared-name", "octal"]\n')
    with Client(root=folder) as client:
        client.open(uri_of(folder / "a.cdefsrc"), PUMP.replace("LastKey=2", "LastKey=010"))
        assert client.diagnostics(uri_of(folder / "a.cdefsrc")) == []
        (folder / "cdef.toml").write_text("")
        client.notify("workspace/didChangeWatchedFiles", changes=[{"uri": uri_of(folder / "cdef.toml"), "type": 2}])
        wait_for(client, folder / "a.cdefsrc", ["S509"])
        wait_for(client, folder / "deep/b.cdefsrc", ["S611"])


def test_errors_of_a_project_file_are_shown_in_it(folder):
    (folder / "cdef.toml").write_text('[warnings]\noff = ["\u03b1\U0001d50a", "ocatl"]\n')
    with Client() as client:
        client.open(uri_of(folder / "a.cdefsrc"), PUMP.replace("LastKey=2", "LastKey=010"))
        wait_for(client, folder / "a.cdefsrc", ["S509"])
        while uri_of(folder / "cdef.toml") not in client.published:
            client.next()
        shown = client.published[uri_of(folder / "cdef.toml")]["diagnostics"]
        assert [each["message"] for each in shown][1] == "unknown warning `ocatl`; did you mean `octal`?"
        assert shown[1]["range"]["start"] == {"line": 1, "character": 14}


def test_options_choose_the_project_file(folder):
    (folder / "cdef.toml").write_text('[warnings]\noff = ["octal"]\n')
    text = PUMP.replace("LastKey=2", "LastKey=010")
    for options, expected in (((), []), (("--no-config",), ["S509"]), (("--config", folder / "cdef.toml"), [])):
        with Client(*options) as client:
            client.open(uri_of(folder / "a.cdefsrc"), text)
            assert [each["code"] for each in client.diagnostics(uri_of(folder / "a.cdefsrc"))] == expected


# ---- Findings on request ---------------------------------------------------------------------------------------------


PULLING = {**CAPABILITIES, "textDocument": {**CAPABILITIES["textDocument"], "diagnostic": {}},
           "workspace": {**CAPABILITIES["workspace"], "diagnostics": {"refreshSupport": True}}}


def test_client_asks_for_findings(folder):
    path = folder / "deep/b.cdefsrc"
    with Client(root=folder, capabilities=PULLING) as client:
        assert client.offers["diagnosticProvider"] == {"identifier": "cdef", "interFileDependencies": True,
                                                       "workspaceDiagnostics": True}
        client.open(uri_of(folder / "a.cdefsrc"), "nonsense\n")
        report = client.about("textDocument/diagnostic", uri_of(folder / "a.cdefsrc"))
        assert (report["kind"], [each["code"] for each in report["items"]][:1]) == ("full", ["S101"])
        again = client.about("textDocument/diagnostic", uri_of(folder / "a.cdefsrc"), previousResultId=report["resultId"])
        assert again == {"kind": "unchanged", "resultId": report["resultId"]}
        client.change(uri_of(folder / "a.cdefsrc"), 2, PUMP)
        report = client.about("textDocument/diagnostic", uri_of(folder / "a.cdefsrc"), previousResultId=report["resultId"])
        assert report["items"] == []
        everything = client.request("workspace/diagnostic", previousResultIds=[])["items"]
        assert {each["uri"]: (each["version"], [found["code"] for found in each["items"]]) for each in everything} == {
            uri_of(folder / "a.cdefsrc"): (2, []), uri_of(path): (None, ["S611"])}
        known = [{"uri": each["uri"], "value": each["resultId"]} for each in everything]
        everything = client.request("workspace/diagnostic", previousResultIds=known)["items"]
        assert [each["kind"] for each in everything] == ["unchanged", "unchanged"]
        assert client.published == {}


def test_client_that_asks_is_told_to_ask_again(folder):
    with Client(root=folder, capabilities=PULLING) as client:
        while "workspace/diagnostic/refresh" not in [each["method"] for each in client.requests]:
            client.next()


def test_file_that_is_not_open_is_read(folder):
    with Client(capabilities=PULLING) as client:
        (folder / "z.cdefsrc").write_text("nonsense\n")
        report = client.about("textDocument/diagnostic", uri_of(folder / "z.cdefsrc"))
        assert report["items"][0]["code"] == "S101"
        assert client.about("textDocument/diagnostic", uri_of(folder / "none.cdefsrc"))["items"] == []


# ---- Formatting ------------------------------------------------------------------------------------------------------


URI = "file:///classes/Pump.cdefsrc"
OPTIONS = {"tabSize": 4, "insertSpaces": True}


def test_document_is_formatted():
    text = PUMP.replace("\tId=", "    Id=")
    with Client() as client:
        client.open(URI, text)
        after = edited(text, client.about("textDocument/formatting", URI, options=OPTIONS))
        assert "\tId=4\n" in after and "    Id" not in after
        client.change(URI, 2, after)
        assert client.about("textDocument/formatting", URI, options=OPTIONS) == []


def test_range_is_formatted():
    text = PUMP.replace("\tId=", "    Id=")
    line = text[:text.index("    Id=7")].count("\n")
    with Client() as client:
        client.open(URI, text)
        edits = client.about("textDocument/rangeFormatting", URI, options=OPTIONS, range={
            "start": {"line": line, "character": 0}, "end": {"line": line + 1, "character": 0}})
        assert edited(text, edits) == text.replace("    Id=7", "\tId=7")


def test_document_with_errors_is_left_alone():
    with Client() as client:
        client.open(URI, PUMP.replace("FirstKey", "FirstKy"))
        with pytest.raises(ServerError) as refused:
            client.about("textDocument/formatting", URI, options=OPTIONS)
        assert refused.value.code == -32803


def test_examples_stay_as_they_are(directory):
    for path in EXAMPLES.glob("*.cdefsrc"):
        shutil.copy(path, directory)
    with Client(root=directory) as client:
        assert json.dumps(client.request("workspace/symbol", query="FileSystem"))
        settle(client)
        assert all(each["diagnostics"] == [] for each in client.published.values())
