"""Test what `cdef lsp` says of the structure of a class: outline, folding, tokens."""

from compare import same
from lsp_client import Client, offset, part
from lsp_pump import PUMP, URI, show, opened  # noqa: F401 (a fixture)


def tree(symbols):
    return [(each["name"], each["detail"], tree(each.get("children", []))) for each in symbols]


def test_outline(pump):
    symbols = pump.about("textDocument/documentSymbol", URI)
    same(tree(symbols), [
        ("ControlDefinition", "ControlDefinition", []), ("Pump", "ResourceClass", []),
        ("Flow", "ResourceVariableClass", []), ("Host", "PersistentResourceAttribute", []),
        ("Speed", "DynamicResourceAttribute", [("Turns", "DAttrSDDefinition", [])]),
        ("Stop", "ResourceAction", [("When", "ActionInSDDefinition", [])]), ("M", "ClassToManagerMapping", []),
    ], "outline")
    speed = symbols[4]
    assert part(PUMP, speed["selectionRange"]) == "Speed"
    assert part(PUMP, speed["range"]).startswith("DynamicResourceAttribute\n")
    assert part(PUMP, speed["range"]).endswith("\tElementIndex=0\n\tDataType=UInt32")


def test_kinds_of_symbols(pump):
    """The numbers are those of the protocol: 5 is a class, 6 a method, 7 a property, 8 a field, 11 an interface, 13 a
    variable, 23 a structure."""
    symbols = pump.about("textDocument/documentSymbol", URI)
    same([(each["name"], each["kind"]) for one in symbols for each in (one, *one.get("children", []))], [
        ("ControlDefinition", 5), ("Pump", 5), ("Flow", 23), ("Host", 7), ("Speed", 13), ("Turns", 8), ("Stop", 6),
        ("When", 8), ("M", 11)], "kinds")


def test_outline_of_a_client_without_trees():
    with Client(capabilities={}) as client:
        client.open(URI, PUMP)
        names = [(each["name"], each.get("containerName")) for each in client.about("textDocument/documentSymbol", URI)]
    assert ("Turns", "Speed") in names and ("Speed", None) in names


def test_folding(pump):
    text = "# a\n# b\n\nResourceClass\n\tName=A\n\n\tLocator=B\n\n# c\nResourceAction\n"
    show(pump, text)
    found = {(each["startLine"], each["endLine"], each["kind"])
             for each in pump.about("textDocument/foldingRange", URI)}
    assert found == {(0, 1, "comment"), (3, 6, "region")}


def tokens(client, text, method="textDocument/semanticTokens/full", **params):
    """(text, type, modifiers) of each token."""
    legend = client.offers["semanticTokensProvider"]["legend"]
    data, found, line, character = client.about(method, URI, **params)["data"], [], 0, 0
    for down, right, length, kind, modifiers in zip(*[iter(data)] * 5):
        line, character = line + down, (0 if down else character) + right
        begin = offset(text, {"line": line, "character": character})
        end = offset(text, {"line": line, "character": character + length})
        found.append((text[begin:end], legend["tokenTypes"][kind], modifiers))
    return found


def test_tokens(pump):
    text = ("ResourceClass # \U0001d50a\n\tProperties=CanDefine\nDynamicResourceAttribute\n\tName=Sp\u00e4\n"
            "\tId=7 // x\n\tDataType=Int32\n\tNonsense=1\n\tExpression=\"Sp\u00e4 > 1\"\n")
    show(pump, text)
    expected = [
        ("ResourceClass", "class", 0), ("# \U0001d50a", "comment", 0), ("Properties", "property", 0),
        ("CanDefine", "enumMember", 0), ("DynamicResourceAttribute", "class", 0), ("Name", "property", 0),
        ("Sp\u00e4", "variable", 1), ("Id", "property", 0), ("7", "number", 0), ("// x", "comment", 0),
        ("DataType", "property", 0), ("Int32", "type", 0), ("1", "string", 0), ("Expression", "property", 0),
        ("Sp\u00e4", "variable", 0),
    ]
    same(tokens(pump, text), expected, "tokens")
    second = {"start": {"line": 1, "character": 3}, "end": {"line": 1, "character": 4}}
    assert tokens(pump, text, "textDocument/semanticTokens/range", range=second) == expected[2:4]
