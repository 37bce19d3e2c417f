"""Shared by the tests of what `cdef lsp` offers at a place of a class: a class, an editor that has opened it, places."""

import pathlib
import subprocess
import tempfile

import pytest

from lsp_client import Client, edited, edits_in, part, position
from programs import PROGRAMS, environment

URI = "file:///classes/Pump.cdefsrc"
PUMP = """# A pump.
ControlDefinition
\tFileVersion=1.0.0.0
ResourceClass
\tDescription=1
\tDisplayName=2
\tProperties=HasResources,CanDefine
\tClassPermTemplate=0
\tResourcePermTemplate=0
\tName=Pump
\tLocator=Host
ResourceVariableClass
\tVariableClass=Flow
\tObservationInterval=10
\tReportingInterval=60
PersistentResourceAttribute
\tName=Host
\tDescription=3
\tDisplayName=4
\tId=4
\tDataType=String
\tVarietyRange=1,1
\tProperties=Public,ReqdForDefine
DynamicResourceAttribute
\tName=Speed
\tDescription=5
\tDisplayName=6
\tId=7
\tDataType=SD
\tVarietyRange=1,1
\tVariableType=State
\tVariableClass=Flow
\tExpression="Speed.Turns > 9 && Speed.Turns < 99"
\tReArmExpression="Host == 'Host'"
DAttrSDDefinition
\tElementName=Turns
\tDescription=7
\tDisplayName=8
\tElementIndex=0
\tDataType=UInt32
ResourceAction
\tName=Stop
\tDescription=9
\tDisplayName=10
\tId=0
\tVarietyRange=1,1
ActionInSDDefinition
\tElementName=When
\tDescription=11
\tDisplayName=12
\tElementIndex=0
\tDataType=UInt32
ClassToManagerMapping
\tResourceManager=M
\tFirstKey=1
\tLastKey=2
\tMessageCatalog=m.cat
\tDescriptiveMessageSet=1
"""


@pytest.fixture(name="pump")
def opened():
    """A client with the class."""
    with Client() as client:
        client.open(URI, PUMP)
        assert client.diagnostics(URI) == []
        client.version = 1
        yield client


def show(client, text):
    """Replace the document."""
    client.version += 1
    client.change(URI, client.version, text)
    client.diagnostics(URI, client.version)


def marked(text):
    """The text without its mark |, and the mark's position."""
    at = text.index("|")
    text = text.replace("|", "", 1)
    return text, position(text, at)


def place(text, words):
    """The position of the mark | in words of the text."""
    at = text.index(words.replace("|", "")) + words.index("|")
    return position(text, at)


def at(client, method, where, **params):
    return client.about(method, URI, position=where, **params)


def labels(items):
    return [each["label"] for each in items]


def hover(client, words, text=PUMP):
    found = at(client, "textDocument/hover", place(text, words))
    return found and (found["contents"]["value"], part(text, found["range"]))


def compiled(text):
    """The database that the compiler makes."""
    with tempfile.TemporaryDirectory() as directory:
        source, output = pathlib.Path(directory, "Pump.cdefsrc"), pathlib.Path(directory, "Pump.cdef")
        source.write_text(text)
        subprocess.run([PROGRAMS.cdgen, source, output], check=True, capture_output=True, env=environment())
        return output.read_bytes()


def actions(client, words, text, **context):
    """title -> the text afterwards."""
    where = place(text, words)
    found = client.about("textDocument/codeAction", URI, range={"start": where, "end": where},
                         context={"diagnostics": [], **context})
    return {each["title"]: edited(text, edits_in(each["edit"])[URI]) for each in found}, found
