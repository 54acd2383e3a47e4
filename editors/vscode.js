// Tries the extension for VS Code without the editor: node vscode.js FOLDER-OF-THE-EXTENSION.  VTSYM is the program.
//
// A stand-in takes the place of the module `vscode`: what the client of the protocol needs of it does what the editor's does,
// everything else exists and does nothing.  The extension, its client and the server are the real ones.
const assert = require("node:assert");
const Module = require("node:module");
const path = require("node:path");

const disposable = () => ({ dispose() {} });
const listeners = {};
const collected = new Map(); // diagnostics by file
let configured = process.env.VTSYM;

class Plain {
  constructor(...values) {
    this.values = values;
  }
  dispose() {}
}

class Position {
  constructor(line, character) {
    Object.assign(this, { line, character });
  }
}

class Kind {
  constructor(value) {
    this.value = value;
  }
  append(part) {
    return new Kind(this.value ? `${this.value}.${part}` : part);
  }
}

class EventEmitter {
  listeners = [];
  event = (listener) => {
    this.listeners.push(listener);
    return disposable();
  };
  fire(value) {
    this.listeners.forEach((each) => each(value));
  }
  dispose() {}
}

const uriOf = (text) => ({ scheme: "file", path: text.slice(7), fsPath: text.slice(7), toString: () => text });
const given = {
  "vscode.version": "1.75.0",
  "vscode.env.appName": "stand-in",
  "vscode.env.language": "en",
  "vscode.EventEmitter": EventEmitter,
  "vscode.CancellationTokenSource": class extends Plain {
    token = { isCancellationRequested: false, onCancellationRequested: disposable };
    cancel() {}
  },
  "vscode.CodeActionKind.Empty": new Kind(""),
  "vscode.Position": Position,
  "vscode.Uri.parse": uriOf,
  "vscode.languages.match": (selector, document) =>
    selector.some?.((each) => each.language === document.languageId) || selector.language === document.languageId ? 10 : 0,
  "vscode.languages.createDiagnosticCollection": () => ({
    set: (uri, diagnostics) => collected.set(uri.toString(), diagnostics),
    delete: (uri) => collected.delete(uri.toString()),
    clear: () => collected.clear(),
    dispose: () => collected.clear(),
  }),
  "vscode.window.createOutputChannel": () => ({ append() {}, appendLine() {}, show() {}, dispose() {} }),
  "vscode.window.showErrorMessage": async (message) => assert.fail(message),
  "vscode.window.visibleTextEditors": [],
  "vscode.workspace.createFileSystemWatcher": (pattern) => {
    assert.strictEqual(pattern, "**/.vtsym.toml");
    return { onDidCreate: disposable, onDidChange: disposable, onDidDelete: disposable, dispose() {} };
  },
  "vscode.workspace.getConfiguration": (section) => ({
    get: (name, otherwise) => (section === "vtsym" && name === "program" ? configured : otherwise),
  }),
  "vscode.workspace.textDocuments": [],
  "vscode.workspace.workspaceFolders": undefined,
};
for (const name of [
  "CallHierarchyItem", "CancellationError", "CodeAction", "CodeLens", "CompletionItem", "Diagnostic",
  "DocumentLink", "InlayHint", "Range", "RelativePattern", "SymbolInformation", "TypeHierarchyItem", "WorkspaceSymbol",
])
  given["vscode." + name] = class extends Plain {};

/** A part of the module: what is given, events that can be fired, and names that do nothing. */
function part(of) {
  const made = {};
  return new Proxy(() => {}, {
    get(_, name) {
      const whole = `${of}.${String(name)}`;
      if (whole in given) return given[whole];
      if (typeof name === "symbol" || name === "then") return undefined;
      if (/^on[A-Z]/.test(name))
        return (listener) => {
          (listeners[name] ??= []).push(listener);
          return disposable();
        };
      return (made[name] ??= /^(register|create)/.test(name) ? disposable : part(whole));
    },
  });
}

const vscode = part("vscode");
const load = Module._load;
Module._load = (request, ...rest) => (request === "vscode" ? vscode : load(request, ...rest));

async function until(holds, what) {
  for (const end = Date.now() + 60000; !holds(); ) {
    assert(Date.now() < end, `waited for ${what} in vain`);
    await new Promise((resolve) => setTimeout(resolve, 20));
  }
}

function fire(event, value) {
  assert(listeners[event]?.length, `nothing listens to ${event}`);
  return Promise.all(listeners[event].map((each) => each(value)));
}

async function run() {
  const extension = require(path.join(path.resolve(process.argv[2]), "extension.js"));
  const context = { subscriptions: [] };
  await extension.activate(context);
  assert.strictEqual(context.subscriptions.length, 1);

  const shown = () => (collected.get("file:///a.c") ?? []).map((each) => each.values[1]).join("\n");
  const text = "#if A && !A\n#endif\n";
  const document = { uri: uriOf("file:///a.c"), languageId: "c", version: 1, getText: () => text, isClosed: false };
  await fire("onDidOpenTextDocument", document);
  await until(() => shown().includes("'#if A && !A' is dead"), "a finding");
  await fire("onDidOpenTextDocument", { ...document, uri: uriOf("file:///b.txt"), languageId: "plaintext" });

  // Another path of the program: the server starts again.
  collected.clear();
  await fire("onDidChangeConfiguration", { affectsConfiguration: (name) => name === "editor.fontSize" });
  await fire("onDidChangeConfiguration", { affectsConfiguration: (name) => name === "vtsym.program" });
  await fire("onDidOpenTextDocument", document);
  await until(() => shown().includes("'#if A && !A' is dead"), "a finding of the second server");
  assert(!collected.has("file:///b.txt"));
  await extension.deactivate();
  assert.strictEqual(collected.size, 0);
}

run().then(
  () => process.exit(0),
  (problem) => {
    console.error(`editors/vscode.js: ${problem.stack}`);
    process.exit(1);
  },
);
