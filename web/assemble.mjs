// Puts the page and the npm package together: assemble.mjs ENGINE VERSION OUTPUT
//
// The page is one file: style, scripts, engine and example model go into index.html in place of their @marks@.  The
// WebAssembly goes in deflated and then in base64: the other way round, compression finds little in it.
import { cpSync, mkdirSync, readFileSync, writeFileSync } from 'node:fs';
import { dirname, join } from 'node:path';
import { fileURLToPath } from 'node:url';
import { deflateSync } from 'node:zlib';

const here = dirname(fileURLToPath(import.meta.url));
const [enginePath, version, output] = process.argv.slice(2);
const read = (name) => readFileSync(join(here, name), 'utf8');
const engine = readFileSync(enginePath, 'utf8');
const packed = deflateSync(readFileSync(enginePath.replace(/js$/, 'wasm')), { level: 9 }).toString('base64');
const packedScript = `export const packed = '${packed}';\n`;

// A classic script has no exports, and the end tag of a script ends it wherever it is.
const asScript = (text) => text.replace(/^export /gm, '').replace(/<\/script/gi, '<\\/script');

const parts = {
    'style.css': read('page/style.css'),
    VERSION: version,
    ENGINE: asScript([engine, packedScript, read('npm/vtsym.mjs'), read('page/worker.js')].join('\n')),
    MODEL: readFileSync(join(here, '../examples/model.json'), 'utf8'),
    SCRIPTS: asScript(['steps', 'map', 'engine', 'page'].map((name) => read(`page/${name}.js`)).join('\n')),
};
const page = read('page/index.html').replace(/@([A-Za-z.]+)@/g, (mark, name) => parts[name] ?? mark);
mkdirSync(join(output, 'npm'), { recursive: true });
writeFileSync(join(output, 'index.html'), page);

for (const name of ['vtsym.mjs', 'index.mjs', 'index.d.ts', 'README.md'])
    cpSync(join(here, 'npm', name), join(output, 'npm', name));
writeFileSync(join(output, 'npm', 'engine.cjs'), engine);
writeFileSync(join(output, 'npm', 'packed.mjs'), packedScript);
writeFileSync(join(output, 'npm', 'package.json'), read('npm/package.json.in').replace('@VERSION@', version));
