// A server and the protocol's own client, from npm, that is connected with it.
"use strict";

const { spawn } = require("node:child_process");
const fs = require("node:fs");
const { createRequire } = require("node:module");
const path = require("node:path");

const protocol = createRequire(path.join(process.cwd(), "x.js"))("vscode-languageserver-protocol/node");
const source = (name) => fs.readFileSync(path.join(process.env.SOURCES, name), "utf8");

const offset = (text, { line, character }) =>
  text.split("\n").slice(0, line).reduce((sum, each) => sum + each.length + 1, 0) + character;

// The text in a range.
const part = (text, { start, end }) => text.slice(offset(text, start), offset(text, end));

// The text after edits.
const edited = (text, edits) =>
  [...edits].sort((a, b) => offset(text, b.range.start) - offset(text, a.range.start)).reduce(
    (all, { range, newText }) => all.slice(0, offset(text, range.start)) + newText + all.slice(offset(text, range.end)),
    text);

// The edits of one document in a workspace edit.
const editsOf = (uri, { changes, documentChanges }) => (changes ? changes[uri] : documentChanges[0].edits);

class Client {
  constructor({ command, args }) {
    const child = spawn(command, args, { stdio: ["pipe", "pipe", "inherit"] });
    this.ended = new Promise((resolve) => child.on("exit", resolve));
    this.connection = protocol.createProtocolConnection(
      new protocol.StreamMessageReader(child.stdout), new protocol.StreamMessageWriter(child.stdin));
    this.shown = [];
    this.told = () => {};
    this.connection.onNotification("textDocument/publishDiagnostics", (each) => {
      this.shown.push(each);
      this.told();
    });
    this.connection.listen();
  }

  // Its capabilities, after the beginning of the conversation.
  async begin(capabilities = {}) {
    const answer = await this.request("initialize", { processId: process.pid, rootUri: null, capabilities });
    await this.notify("initialized", {});
    return answer.capabilities;
  }

  request(method, params) {
    return this.connection.sendRequest(method, params);
  }

  notify(method, params) {
    return this.connection.sendNotification(method, params);
  }

  // The diagnostics that are shown next.
  async diagnostics() {
    while (this.shown.length === 0) await new Promise((resolve) => (this.told = resolve));
    return this.shown.shift().diagnostics;
  }

  // Opens a document. Its diagnostics.
  async open(uri, text) {
    this.version = 1;
    await this.notify("textDocument/didOpen", {
      textDocument: { uri, languageId: "cdefsrc", version: this.version, text },
    });
    return this.diagnostics();
  }

  // Changes it: a range, or the whole text. Its diagnostics.
  async change(uri, ...contentChanges) {
    this.version += 1;
    await this.notify("textDocument/didChange", { textDocument: { uri, version: this.version }, contentChanges });
    return this.diagnostics();
  }

  // The status of the server, which ends.
  async end() {
    await this.request("shutdown");
    await this.notify("exit");
    return this.ended;
  }
}

module.exports = { Client, edited, editsOf, part, protocol, source };
