// Starts "cdef lsp" for class definition sources, and shows in the editor what it answers.
"use strict";

const vscode = require("vscode");
const { LanguageClient, TransportKind } = require("vscode-languageclient/node");

let client;

exports.activate = async () => {
  const command = vscode.workspace.getConfiguration("cdef").get("path");
  const server = { command, args: ["lsp"], transport: TransportKind.stdio };
  client = new LanguageClient("cdef", "Class definitions", server, {
    documentSelector: [{ language: "cdefsrc" }],
    synchronize: { fileEvents: vscode.workspace.createFileSystemWatcher("**/{*.cdefsrc,cdef.toml}") },
  });
  await client.start();
};

exports.deactivate = () => client?.stop();
