// SPDX-License-Identifier: MIT
// Starts `quimbel lsp` for the VB6 modules VS Code opens; everything else is the server's.
const vscode = require('vscode');
const { LanguageClient } = require('vscode-languageclient/node');

let client;

function activate() {
  const command = vscode.workspace.getConfiguration('quimbel').get('path', 'quimbel');
  client = new LanguageClient('quimbel', 'Quimbel', { command, args: ['lsp'] }, {
    documentSelector: [{ scheme: 'file', language: 'vb6' }],
  });
  return client.start();
}

function deactivate() {
  return client ? client.stop() : undefined;
}

module.exports = { activate, deactivate };
