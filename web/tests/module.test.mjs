// The npm module against the native program: the same bytes for the same command lines.
//
// Numbers are the part that another C library reads and writes, so there are many of them.  Run by node --test with
// VTSYM_PROGRAM and VTSYM_ROOT in the environment, beside a node_modules that holds the package.
import assert from 'node:assert/strict';
import { spawnSync } from 'node:child_process';
import { readFileSync } from 'node:fs';
import { join } from 'node:path';
import { test } from 'node:test';
import { open, VtsymError } from 'vtsym';

const root = process.env.VTSYM_ROOT;
const vtsym = await open();

function native(args, input) {
    const { stdout, stderr, status } = spawnSync(process.env.VTSYM_PROGRAM, args, { input, encoding: 'utf8', maxBuffer: 1 << 28 });
    return { status, out: stdout, err: stderr };
}

/** A generator with a state of 32 bits (Marsaglia's xorshift), so that a failure can be repeated. */
function randomBits(seed) {
    let state = seed;
    return () => {
        state ^= state << 13;
        state ^= state >>> 17;
        state ^= state << 5;
        return state >>> 0;
    };
}

function randomDoubles(count) {
    const next = randomBits(20231);
    const view = new DataView(new ArrayBuffer(8));
    return Array.from({ length: count }, () => {
        view.setUint32(0, next());
        view.setUint32(4, next());
        return view.getFloat64(0);
    }).filter(Number.isFinite).map(Math.abs);
}

function randomConditions(count) {
    const next = randomBits(77);
    const one = (list) => list[next() % list.length];
    const operand = () => one(['A', 'B', 'C.x', 'f(A)', 'A+B', 'A*2', 'B%3', 'A&6', 'C.x<<1', String(next() % 5), '2147483648', '0x1F', '1.5e3']);
    const comparison = () => `${operand()} ${one(['==', '!=', '<', '<=', '>', '>='])} ${operand()}`;
    const condition = (depth) => depth === 0 ? comparison()
        : `${one(['', '!'])}(${condition(depth - 1)} ${one(['&&', '||'])} ${condition(depth - 1)})`;
    return Array.from({ length: count }, () => condition(next() % 4));
}

const numbers = [...randomDoubles(4000).map(String), '0.1', '1e22', '1e23', '5e-324', '1.7976931348623157e308', '123456789012345680000',
    '0.30000000000000004', '2147483647', '2147483648', '1e300*1e300', '0.1+0.2', '9007199254740993', '0x7fffffff'];
const readme = [...readFileSync(join(root, 'docs/commands.md'), 'utf8').matchAll(/^\$ \.\/run .*?'(.*?)'$/gm)].map((match) => match[1]);

for (const [name, args, lines] of [
    ['numbers are read and written', ['eval'], numbers],
    ['numbers in Quill', ['convert', '--from', 'quill', '--to', 'c'], numbers.map((n) => `x == ${n}`)],
    ['numbers in C', ['convert', '--to', 'quill'], numbers.map((n) => `x == ${n}`)],
    ['conditions are simplified', ['simplify', '--json'], [...randomConditions(1500), ...readme]],
    ['conditions are compared', ['compare', '--json', '--why'], randomConditions(800).map((text, i, all) => `${text}\t${all[(i * 7 + 1) % all.length]}`)],
    ['trees', ['tree', '--json'], randomConditions(300)],
    ['errors', ['simplify', '--json'], ['A =', '((', 'é == 1', 'A\0B', '1e999', '"', '', 'A '.repeat(5000), '('.repeat(5000)]],
]) {
    test(name, () => {
        const input = lines.join('\n') + '\n';
        const expected = native(args, input);
        const got = vtsym.run(args, input);
        expected.out.split('\n').forEach((line, i) => assert.equal(got.out.split('\n', i + 1)[i], line, `line ${i + 1}: ${lines[i]}`));
        assert.deepEqual(got, expected);
    });
}

test('a model is checked as natively, again and again', () => {
    const path = join(root, 'examples/model.json');
    const text = readFileSync(path, 'utf8');
    const expected = native(['check', '--json', '--why', path]).out.split('\n').filter(Boolean).map((line) => ({ ...JSON.parse(line), file: '/model.json' }));
    for (let i = 0; i < 3; ++i) assert.deepEqual(vtsym.check(text), expected);
    assert.deepEqual(vtsym.checkText(text).map((line) => line.replace('/model.json', path)), native(['check', '--why', path]).out.trim().split('\n'));
    assert.match(vtsym.checkPage(text), /^<!DOCTYPE html>[^]*<\/html>\s*$/);
    assert.throws(() => vtsym.check('{'), VtsymError);
});

test('functions answer, and errors say where', () => {
    assert.equal(vtsym.simplify('x > 2 && x != 3 && x < 5').result, 'x==4');
    assert.equal(vtsym.compare('A<B && B<C', 'A<C').relation, 'implies');
    assert.equal(vtsym.given('Mode == 1', 'Mode != 2 && Sport').result, 'Sport');
    assert.equal(vtsym.convert('F & 4', { to: 'quill' }), 'bitand(F,4)');
    assert.equal(vtsym.convert('-1 < x', { to: 'c' }), '-1<x');
    assert.deepEqual(vtsym.symbols('A>2 && P.gear'), ['A', 'P.gear']);
    assert.equal(vtsym.evaluate('A+1', { A: 2 }), 3);
    assert.equal(vtsym.simplify('Size > 0', { assume: ['Size >= 1'] }).result, 'true');
    assert.throws(() => vtsym.simplify('A = 1'), (error) => error instanceof VtsymError && error.offset === 2);
});

test('memory stays bounded over many calls', () => {
    for (let i = 0; i < 3000; ++i) vtsym.simplify(`A${i} > 1 && A${i} > ${i}`);
    const before = process.memoryUsage().rss;
    for (let i = 0; i < 3000; ++i) vtsym.simplify(`B${i} > 1 && B${i} > ${i}`);
    assert.ok(process.memoryUsage().rss - before < 64 << 20);
});
