// The vtsym program as a module: conditions over integers simplified, compared, converted and checked.
//
// Every function runs a command of the program in WebAssembly and returns what it answers with --json.  Calls run one
// after another; an engine keeps its memory, so that open one and keep it.

const encoder = new TextEncoder();
const decoder = new TextDecoder();

/** What the program refused to answer. */
export class VtsymError extends Error {
    /** @param {string} message  @param {number} [offset] byte of the text where reading stopped  @param {string} [id] */
    constructor(message, offset, id) {
        super(message);
        this.name = 'VtsymError';
        this.offset = offset;
        this.id = id;
    }
}

function joined(chunks) {
    const bytes = new Uint8Array(chunks.reduce((sum, chunk) => sum + chunk.length, 0));
    let at = 0;
    for (const chunk of chunks) {
        bytes.set(chunk, at);
        at += chunk.length;
    }
    return bytes;
}

/** Collects what the program writes to one of its streams. */
function collect(stream) {
    const chunks = [];
    stream.tty = undefined;
    stream.stream_ops = {
        write(_stream, heap, begin, length) {
            chunks.push(heap.slice(begin, begin + length));
            return length;
        },
    };
    return () => decoder.decode(joined(chunks.splice(0)));
}

/** Lets the program read a text from its standard input. */
function feed(stream) {
    let bytes = new Uint8Array(0);
    let at = 0;
    stream.tty = undefined;
    stream.stream_ops = {
        read(_stream, heap, begin, length) {
            const count = Math.min(length, bytes.length - at);
            heap.set(bytes.subarray(at, at + count), begin);
            at += count;
            return count;
        },
    };
    return (text) => {
        bytes = encoder.encode(text);
        at = 0;
    };
}

function languageOptions({ from, to, assume = [], bits } = {}) {
    const options = [];
    if (from) options.push('--from', from);
    if (to) options.push('--to', to);
    for (const condition of [].concat(assume)) options.push('--assume', condition);
    if (bits) options.push('--bits', String(bits));
    return options;
}

const problemIn = (err) => err.trim().replace(/^vtsym: /, '').replaceAll('/model.json', 'the model');

/** The findings of a model, unless it could not be read. */
function findingsOf({ out, err, status }) {
    if (status === 2 && !out) throw new VtsymError(problemIn(err));
    return out;
}

/** The object in the only line of an answer. */
function objectOf({ out, err }) {
    const line = out.split('\n', 1)[0];
    if (!line) throw new VtsymError(problemIn(err) || 'the program ended without an answer');
    const answer = JSON.parse(line);
    if (answer.error) throw new VtsymError(answer.error.message, answer.error.offset, answer.error.id);
    return answer;
}

/** The bytes of a text in base64 that were deflated. */
async function unpack(text) {
    const bytes = Uint8Array.from(atob(text), (character) => character.charCodeAt(0));
    const reader = new Blob([bytes]).stream().pipeThrough(new DecompressionStream('deflate')).getReader();
    const chunks = [];
    for (let part = await reader.read(); !part.done; part = await reader.read()) chunks.push(part.value);
    return joined(chunks);
}

/**
 * Starts an engine.
 * @param {(settings: object) => Promise<object>} createModule the function that the compiled script exports
 * @param {string} packed its WebAssembly, deflated, in base64
 */
export async function openWith(createModule, packed) {
    const module = await createModule({ wasmBinary: await unpack(packed), print() {}, printErr() {} });
    const write = feed(module.FS.streams[0]);
    const readOut = collect(module.FS.streams[1]);
    const readErr = collect(module.FS.streams[2]);

    /** Runs a command line with a standard input. */
    function run(args, input = '') {
        write(input);
        try {
            const status = module.callMain(args);
            return { status, out: readOut(), err: readErr() };
        } catch (failure) {
            readOut();
            readErr();
            throw failure;
        }
    }

    const answer = (command, options, ...texts) => objectOf(run([command, '--json', ...options, '--', ...texts]));

    /** Runs `check` on a model, with an option that may name a second file.  Files live in memory. */
    function checked(model, options) {
        const text = typeof model === 'string' ? model : JSON.stringify(model, null, 1);
        module.FS.writeFile('/model.json', text);
        try {
            return run(['check', ...options, '/model.json']);
        } finally {
            module.FS.unlink('/model.json');
        }
    }

    return {
        run,
        version: run(['--version']).out.trim().replace(/^vtsym /, ''),
        simplify: (text, options = {}) =>
            answer('simplify', [...languageOptions(options), ...(options.normalForm ? ['--normal-form'] : []),
                ...(options.explain ? ['--explain'] : [])], text),
        compare: (a, b, options) => answer('compare', ['--why', ...languageOptions(options)], a, b),
        given: (known, condition, options) => answer('given', languageOptions(options), known, condition),
        convert: (text, options) => answer('convert', languageOptions(options), text).result,
        tree: (text, options) => answer('tree', languageOptions(options), text).tree,
        symbols: (text, options) => answer('symbols', languageOptions(options), text).symbols,
        evaluate(text, values = {}, options = {}) {
            const definitions = Object.entries(values).flatMap(([name, value]) => ['-D', `${name}=${value}`]);
            return answer('eval', [...definitions, ...languageOptions(options)], text).value;
        },
        check: (model) => findingsOf(checked(model, ['--json', '--why'])).split('\n').filter(Boolean).map((line) => JSON.parse(line)),
        checkText: (model) => findingsOf(checked(model, ['--why'])).split('\n').filter(Boolean),
        checkPage(model) {
            checked(model, ['--html', '/page.html']);
            try {
                return module.FS.readFile('/page.html', { encoding: 'utf8' });
            } finally {
                module.FS.unlink('/page.html');
            }
        },
    };
}
