// The server, by the client of the protocol that npm has: the types of this client's library say whether the answers are
// well formed.
//     node --test server.test.js, with CDEF (a program) and SOURCES (this directory), beside node_modules
"use strict";

const assert = require("node:assert");
const test = require("node:test");
const { Client, edited, editsOf, part, protocol, source } = require("./client.js");

const BEFORE = source("before.cdefsrc");
const AFTER = source("after.cdefsrc");
const URI = "file:///pump.cdefsrc";
const textDocument = { uri: URI };
const CAPABILITIES = {
  general: { positionEncodings: ["utf-16"] },
  textDocument: {
    publishDiagnostics: { relatedInformation: true, codeDescriptionSupport: true },
    completion: { completionItem: { snippetSupport: true } },
    codeAction: { codeActionLiteralSupport: { codeActionKind: { valueSet: [] } } },
    documentSymbol: { hierarchicalDocumentSymbolSupport: true },
  },
  workspace: { workspaceEdit: { documentChanges: true } },
};

// The place of a text, or a character of it.
const at = (text, wanted, character = 0) => {
  const lines = text.slice(0, text.indexOf(wanted) + character).split("\n");
  return { line: lines.length - 1, character: lines[lines.length - 1].length };
};

const all = (type, values) => {
  assert.ok(Array.isArray(values) && values.length > 0);
  values.forEach((each) => assert.ok(type.is(each), JSON.stringify(each)));
  return values;
};

// A test with a document, whose diagnostics it gets, too.
const conversation = (name, text, act) =>
  test(name, async () => {
    const client = new Client({ command: process.env.CDEF, args: ["lsp", "--explanations", "file:///codes"] });
    const capabilities = await client.begin(CAPABILITIES);
    await act(client, await client.open(URI, text), capabilities);
    assert.strictEqual(await client.end(), 0);
  });

conversation("a diagnostic has a range, a severity, a code and its link", BEFORE, async (client, shown) => {
  const [found] = all(protocol.Diagnostic, shown);
  assert.strictEqual(part(BEFORE, found.range), "Descr");
  assert.strictEqual(found.severity, protocol.DiagnosticSeverity.Error);
  assert.deepStrictEqual([found.source, found.code, found.codeDescription.href], ["cdef", "S106", "file:///codes#s106"]);
  all(protocol.DiagnosticRelatedInformation, found.relatedInformation);
  const range = { start: found.range.end, end: found.range.end };
  assert.deepStrictEqual(await client.change(URI, { range, text: "iption" }), []);
});

conversation("a completion is a text edit, with documentation", BEFORE, async (client) => {
  const answer = await client.request("textDocument/completion", { textDocument, position: at(BEFORE, "Descr", 5) });
  const items = answer.items ?? answer;
  all(protocol.TextEdit, items.map(({ textEdit }) => textEdit));
  const item = items.find(({ label }) => label === "Description");
  assert.match(item.documentation.value, /^`Description` of `ResourceClass`: /);
  assert.match(edited(BEFORE, [item.textEdit]), /\n\tDescription=1\n/);
});

conversation("a hover has Markdown and a range", AFTER, async (client) => {
  const hover = await client.request("textDocument/hover", { textDocument, position: at(AFTER, "DataType", 2) });
  assert.ok(protocol.Hover.is(hover));
  assert.strictEqual(hover.contents.kind, protocol.MarkupKind.Markdown);
  assert.strictEqual(part(AFTER, hover.range), "DataType");
  assert.match(hover.contents.value, /in the database: `ra_data_type` at offset 0x/);
});

conversation("a name has a definition, references and highlights, and gets another name", AFTER, async (client) => {
  const name = { textDocument, position: at(AFTER, "Locator=", 9) };
  const [definition] = all(protocol.Location, await client.request("textDocument/definition", name));
  assert.deepStrictEqual(definition.range.start, at(AFTER, "Name=HostName", 5));
  const context = { includeDeclaration: true };
  assert.strictEqual(all(protocol.Location, await client.request("textDocument/references", { ...name, context })).length, 2);
  const highlights = await client.request("textDocument/documentHighlight", name);
  assert.deepStrictEqual(highlights.map(({ range }) => part(AFTER, range)), ["HostName", "HostName"]);
  const prepared = await client.request("textDocument/prepareRename", name);
  assert.deepStrictEqual([part(AFTER, prepared.range), prepared.placeholder], ["HostName", "HostName"]);
  const edit = await client.request("textDocument/rename", { ...name, newName: "Node" });
  assert.ok(protocol.WorkspaceEdit.is(edit));
  assert.strictEqual(edited(AFTER, editsOf(URI, edit)), AFTER.replaceAll("HostName", "Node"));
  await assert.rejects(client.request("textDocument/rename", { ...name, newName: "a\nb" }), { code: -32803 });
});

conversation("a code action corrects its diagnostic", BEFORE, async (client, shown) => {
  const context = { diagnostics: shown, only: [protocol.CodeActionKind.QuickFix] };
  const actions = all(protocol.CodeAction,
    await client.request("textDocument/codeAction", { textDocument, range: shown[0].range, context }));
  const action = actions.find(({ diagnostics }) => diagnostics);
  assert.deepStrictEqual(action.diagnostics, shown);
  assert.deepStrictEqual(await client.change(URI, { text: edited(BEFORE, editsOf(URI, action.edit)) }), []);
});

// Each token as its text, type and modifiers.
const decoded = (text, { data }, { tokenTypes }) => {
  const tokens = [];
  let line = 0;
  let character = 0;
  for (let i = 0; i < data.length; i += 5) {
    character = data[i] > 0 ? data[i + 1] : character + data[i + 1];
    line += data[i];
    const range = { start: { line, character }, end: { line, character: character + data[i + 2] } };
    tokens.push(`${part(text, range)} ${tokenTypes[data[i + 3]]} ${data[i + 4]}`);
  }
  return tokens;
};

conversation("semantic tokens are those of the legend", AFTER, async (client, shown, { semanticTokensProvider }) => {
  const tokens = await client.request("textDocument/semanticTokens/full", { textDocument });
  assert.ok(protocol.SemanticTokens.is(tokens));
  assert.deepStrictEqual(decoded(AFTER, tokens, semanticTokensProvider.legend).slice(0, 3),
    ["ControlDefinition class 0", "FileVersion property 0", "1.0.0.0 number 0"]);
  const line = at(AFTER, "Locator=").line;
  const range = { start: { line, character: 0 }, end: { line: line, character: 20 } };
  assert.deepStrictEqual(
    decoded(AFTER, await client.request("textDocument/semanticTokens/range", { textDocument, range }),
      semanticTokensProvider.legend),
    ["Locator property 0", "HostName variable 0"]);
});

conversation("there are an outline, folds and symbols", AFTER, async (client) => {
  const outline = all(protocol.DocumentSymbol, await client.request("textDocument/documentSymbol", { textDocument }));
  assert.deepStrictEqual(outline.map(({ name }) => name), ["ControlDefinition", "ResourceClass", "M", "HostName"]);
  assert.strictEqual(all(protocol.FoldingRange, await client.request("textDocument/foldingRange", { textDocument })).length, 4);
  const [symbol] = await client.request("workspace/symbol", { query: "hostn" });
  assert.ok(protocol.Location.is(symbol.location));
  assert.strictEqual(part(AFTER, symbol.location.range), "HostName");
});

conversation("a document and a range are formatted", AFTER.replaceAll("\t", "  "), async (client) => {
  const options = protocol.FormattingOptions.create(8, false);
  const loose = AFTER.replaceAll("\t", "  ");
  const edits = all(protocol.TextEdit, await client.request("textDocument/formatting", { textDocument, options }));
  assert.strictEqual(edited(loose, edits), AFTER);
  const position = at(loose, "FileVersion");
  const range = { start: position, end: position };
  const some = all(protocol.TextEdit, await client.request("textDocument/rangeFormatting", { textDocument, range, options }));
  assert.strictEqual(edited(loose, some), loose.replace("  FileVersion", "\tFileVersion"));
});

conversation("unknown requests are refused, and the server continues", AFTER, async (client) => {
  await assert.rejects(client.request("textDocument/noSuchRequest", {}), { code: -32601 });
  await assert.rejects(client.request("textDocument/hover", { textDocument }), { code: -32602 });
});
