// The packed extension for Visual Studio Code, and the server that it starts, by the client of the protocol that npm has.
// The editor itself is not there: what the extension asks of it is noted instead.
//     node --test vscode.test.js, with EXTENSION (an unpacked package) and CDEF (a program), beside node_modules
"use strict";

const assert = require("node:assert");
const { spawn } = require("node:child_process");
const fs = require("node:fs");
const Module = require("node:module");
const path = require("node:path");
const test = require("node:test");
const { createRequire } = Module;

const { EXTENSION, CDEF, SOURCES } = process.env;
const {
  createProtocolConnection, StreamMessageReader, StreamMessageWriter,
} = createRequire(path.join(process.cwd(), "x.js"))("vscode-languageserver-protocol/node");
const BEFORE = fs.readFileSync(path.join(SOURCES, "before.cdefsrc"), "utf8");
const AFTER = fs.readFileSync(path.join(SOURCES, "after.cdefsrc"), "utf8");
const URI = "file:///pump.cdefsrc";

// What stands for the editor: each class and function that is not named here is an empty one.
const anything = (known) => new Proxy(known, { get: (all, name) => (name in all ? all[name] : class {}) });

// The extension, activated; what it starts, and for which documents.
const activated = async () => {
  const started = [];
  class LanguageClient {
    constructor(id, name, server, client) {
      started.push({ server, client });
    }
    start() {}
    stop() {
      started.push("stopped");
    }
  }
  const editor = anything({
    workspace: {
      getConfiguration: () => ({ get: (name) => ({ path: CDEF })[name] }),
      createFileSystemWatcher: (pattern) => pattern,
    },
  });
  const load = Module._load;
  Module._load = (name, ...rest) => {
    if (name === "vscode") return editor;
    if (name === "vscode-languageclient/node") return { LanguageClient, TransportKind: { stdio: 0 } };
    return load(name, ...rest);
  };
  const extension = require(path.join(EXTENSION, "extension.js"));
  await extension.activate();
  await extension.deactivate();
  Module._load = load;
  return started;
};
const activation = activated();

test("the package has the client that the extension uses", () => {
  const load = Module._load;
  Module._load = (name, ...rest) => (name === "vscode" ? anything({ version: "1.82.0" }) : load(name, ...rest));
  const client = createRequire(path.join(EXTENSION, "extension.js"))("vscode-languageclient/node");
  Module._load = load;
  assert.strictEqual(typeof client.LanguageClient, "function");
});

test("the extension starts the server for class definitions, and stops it", async () => {
  const [{ server, client }, stopped] = await activation;
  assert.deepStrictEqual(server, { command: CDEF, args: ["lsp"], transport: 0 });
  assert.deepStrictEqual(client.documentSelector, [{ language: "cdefsrc" }]);
  assert.strictEqual(stopped, "stopped");
});

const offset = (text, { line, character }) =>
  text.split("\n").slice(0, line).reduce((sum, each) => sum + each.length + 1, 0) + character;

const edited = (text, edits) =>
  [...edits].sort((a, b) => offset(text, b.range.start) - offset(text, a.range.start)).reduce(
    (all, { range, newText }) => all.slice(0, offset(text, range.start)) + newText + all.slice(offset(text, range.end)),
    text);

test("the server shows, completes, renames and formats", async () => {
  const [{ server }] = await activation;
  const child = spawn(server.command, server.args, { stdio: ["pipe", "pipe", "inherit"] });
  const ended = new Promise((resolve) => child.on("exit", resolve));
  const connection = createProtocolConnection(new StreamMessageReader(child.stdout), new StreamMessageWriter(child.stdin));
  const shown = [];
  let told = () => {};
  connection.onNotification("textDocument/publishDiagnostics", (each) => {
    shown.push(each);
    told();
  });
  const diagnostics = async () => {
    while (shown.length === 0) await new Promise((resolve) => (told = resolve));
    return shown.shift().diagnostics;
  };
  connection.listen();
  const { capabilities } = await connection.sendRequest("initialize", {
    processId: process.pid, rootUri: null, capabilities: {},
  });
  assert.ok(capabilities.documentFormattingProvider);
  await connection.sendNotification("initialized", {});

  const textDocument = { uri: URI };
  await connection.sendNotification("textDocument/didOpen", {
    textDocument: { uri: URI, languageId: "cdefsrc", version: 1, text: BEFORE },
  });
  assert.deepStrictEqual((await diagnostics()).map(({ code, range }) => [code, range.start]),
    [["S106", { line: 3, character: 1 }]]);

  let text = BEFORE;
  let version = 1;
  const change = async (edits) => {
    text = edited(text, edits);
    version += 1;
    await connection.sendNotification("textDocument/didChange", {
      textDocument: { uri: URI, version }, contentChanges: [{ text }],
    });
    return diagnostics();
  };

  const answer = await connection.sendRequest("textDocument/completion", {
    textDocument, position: { line: 3, character: 6 },
  });
  const items = Array.isArray(answer) ? answer : answer.items;
  assert.deepStrictEqual(items.filter(({ label }) => label.startsWith("Descr")).map(({ label }) => label), ["Description"]);
  assert.deepStrictEqual(await change([items.find(({ label }) => label === "Description").textEdit]), []);

  const renamed = await connection.sendRequest("textDocument/rename", {
    textDocument, position: { line: 18, character: 7 }, newName: "HostName",
  });
  const edits = renamed.changes ? renamed.changes[URI] : renamed.documentChanges[0].edits;
  assert.deepStrictEqual(await change(edits), []);

  const options = { tabSize: 8, insertSpaces: false };
  assert.deepStrictEqual(
    await change(await connection.sendRequest("textDocument/formatting", { textDocument, options })), []);
  assert.strictEqual(text, AFTER);

  await connection.sendRequest("shutdown");
  await connection.sendNotification("exit");
  assert.strictEqual(await ended, 0);
});
