// The packed extension for Visual Studio Code, and the server that it starts, by the client of the protocol that npm has.
// The editor itself is not there: what the extension asks of it is noted instead.
//     node --test vscode.test.js, with EXTENSION (an unpacked package), CDEF (a program) and SOURCES (this directory),
//     beside node_modules
"use strict";

const assert = require("node:assert");
const Module = require("node:module");
const path = require("node:path");
const test = require("node:test");
const { createRequire } = Module;

const { Client, edited, editsOf, source } = require("./client.js");

const { EXTENSION, CDEF } = process.env;
const BEFORE = source("before.cdefsrc");
const AFTER = source("after.cdefsrc");
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

test("the server shows, completes, renames and formats", async () => {
  const [{ server }] = await activation;
  const client = new Client(server);
  assert.ok((await client.begin()).documentFormattingProvider);

  const textDocument = { uri: URI };
  assert.deepStrictEqual((await client.open(URI, BEFORE)).map(({ code, range }) => [code, range.start]),
    [["S106", { line: 3, character: 1 }]]);

  let text = BEFORE;
  const change = (edits) => {
    text = edited(text, edits);
    return client.change(URI, { text });
  };

  const answer = await client.request("textDocument/completion", {
    textDocument, position: { line: 3, character: 6 },
  });
  const items = Array.isArray(answer) ? answer : answer.items;
  assert.deepStrictEqual(items.filter(({ label }) => label.startsWith("Descr")).map(({ label }) => label), ["Description"]);
  assert.deepStrictEqual(await change([items.find(({ label }) => label === "Description").textEdit]), []);

  const renamed = await client.request("textDocument/rename", {
    textDocument, position: { line: 18, character: 7 }, newName: "HostName",
  });
  assert.deepStrictEqual(await change(editsOf(URI, renamed)), []);

  const options = { tabSize: 8, insertSpaces: false };
  assert.deepStrictEqual(
    await change(await client.request("textDocument/formatting", { textDocument, options })), []);
  assert.strictEqual(text, AFTER);

  assert.strictEqual(await client.end(), 0);
});
