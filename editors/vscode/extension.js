// Starts `vtsym lsp` for C, C++ and JSON files, and again when its path changes.
const vscode = require("vscode");
const { LanguageClient } = require("vscode-languageclient/node");

let client;

async function start() {
  const command = vscode.workspace.getConfiguration("vtsym").get("program");
  const server = { command, args: ["lsp"] };
  const languages = ["c", "cpp", "objective-c", "objective-cpp", "cuda-cpp", "json"];
  client = new LanguageClient("vtsym", "vtsym", server, {
    documentSelector: languages.map((language) => ({ language })),
    synchronize: { fileEvents: vscode.workspace.createFileSystemWatcher("**/.vtsym.toml") },
  });
  await client.start();
}

exports.activate = async (context) => {
  context.subscriptions.push(
    vscode.workspace.onDidChangeConfiguration(async (event) => {
      if (!event.affectsConfiguration("vtsym.program")) return;
      await client.stop();
      await start();
    }),
  );
  await start();
};

exports.deactivate = () => client?.stop();
