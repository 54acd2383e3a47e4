// Starts each server of settings for Kate, as its client does: node kate.js SETTINGS.  The program is on the PATH.
const assert = require("node:assert");
const { spawnSync } = require("node:child_process");
const { readFileSync } = require("node:fs");

const framed = (message) => {
  const content = JSON.stringify({ jsonrpc: "2.0", ...message });
  return `Content-Length: ${Buffer.byteLength(content)}\r\n\r\n${content}`;
};

const { servers } = JSON.parse(readFileSync(process.argv[2], "utf8"));
assert.deepStrictEqual(Object.keys(servers), ["c", "cpp", "json"]);
for (const [language, settings] of Object.entries(servers)) {
  const { command } = settings.use ? servers[settings.use] : settings;
  const uri = `file:///a.${language}`;
  const text = language === "json" ? '{"blocks": [{"name": "B", "condition": "A && !A"}]}' : "#if A && !A\n#endif\n";
  const input = [
    { id: 1, method: "initialize", params: { processId: process.pid, rootUri: "file:///", capabilities: {} } },
    { method: "initialized", params: {} },
    { method: "textDocument/didOpen", params: { textDocument: { uri, languageId: language, version: 0, text } } },
    { id: 2, method: "textDocument/hover", params: { textDocument: { uri }, position: { line: 0, character: 0 } } },
  ];
  const served = spawnSync(command[0], command.slice(1), { input: input.map(framed).join(""), encoding: "utf8", timeout: 60000 });
  assert.strictEqual(served.error, undefined);
  assert.strictEqual(served.stderr, "");
  const messages = served.stdout.split(/Content-Length: \d+\r\n\r\n/).filter(Boolean).map((each) => JSON.parse(each));
  assert.strictEqual(messages[0].result.serverInfo.name, "vtsym", language);
  assert(messages[0].result.capabilities.hoverProvider);
  assert.strictEqual(messages[1].id, 2);
  const [finding] = messages[2].params.diagnostics;
  assert.strictEqual(finding.code, "dead", language);
}
