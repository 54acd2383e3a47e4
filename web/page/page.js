// The page: asks the engine while somebody types, shows the answers, and keeps the state in the address.

const $ = (id) => document.getElementById(id);
const engine = new Engine();
const pause = 120; // milliseconds without a key before the engine is asked

const examples = [
    { name: 'Bounds that meet', first: 'x > 2 && x != 3 && x < 5' },
    { name: 'Two ways to ask for odd', first: 'x % 2 == 1', second: 'x % 2 != 0' },
    { name: 'Linear arithmetic', first: 'A*2 > B && B > A*2 - 2' },
    { name: 'What is known goes', first: 'Mode != 2 && (Mode > 2 || Sport)', assume: 'Mode == 1 || Mode == 2' },
    { name: 'Chained comparisons', first: 'A<B && B<C', second: 'A<C' },
    { name: 'Bits', first: 'F & 4', second: 'F & 6' },
    { name: 'A region', first: 'x >= 0 && y >= 0 && x + 2*y <= 12 && x != y' },
    { name: 'In Quill', first: 'mode == 1 && ~(gear > 2 || rem(gear, 2) == 1)', language: 'quill' },
];

const fields = ['language', 'first', 'assume', 'second', 'across', 'up'];
let version = '';
let latest = 0;

function stateText() {
    const state = new URLSearchParams({ v: version });
    for (const name of fields) if ($(name).value) state.set(name, $(name).value);
    if (!$('model').hidden) {
        state.set('tab', 'model');
        if ($('source').value !== sampleModel) state.set('source', $('source').value);
    }
    return `#${state}`;
}

/** The number of the example that is in the fields. */
function exampleShown() {
    const isShown = (example) => example.first === $('first').value && (example.language ?? 'c') === $('language').value &&
        (example.second ?? '') === $('second').value && (example.assume ?? '') === $('assume').value;
    const found = examples.findIndex(isShown);
    return found < 0 ? '' : String(found);
}

function keepState() {
    $('example').value = exampleShown();
    history.replaceState(null, '', stateText());
}

const sampleModel = $('sample-model').textContent.trim();

function readState() {
    const state = new URLSearchParams(location.hash.slice(1));
    const chosen = state.has('first') ? {} : examples[0];
    for (const name of fields)
        if (!['across', 'up'].includes(name)) $(name).value = state.get(name) ?? chosen[name] ?? (name === 'language' ? 'c' : '');
    setAxes([state.get('across'), state.get('up')].filter(Boolean));
    $('source').value = state.get('source') ?? sampleModel;
    choose(state.get('tab') === 'model' ? 'model' : 'condition');
}

function setAxes(names) {
    const [across, up] = [$('across').value, $('up').value];
    const options = names.map((name) => `<option>${escaped(name)}</option>`).join('');
    $('across').innerHTML = options;
    $('up').innerHTML = options;
    $('across').value = names.includes(across) ? across : names[0] ?? '';
    const rest = names.filter((name) => name !== $('across').value);
    $('up').value = rest.includes(up) ? up : rest[0] ?? '';
    $('axes').hidden = names.length < 2;
}

function show(id, text) {
    $(id).textContent = text;
}

/** Answers what is in the fields, unless newer keys make the answer stale. */
async function answer() {
    const turn = ++latest;
    const isStale = () => turn !== latest;
    const first = $('first').value.trim();
    const second = $('second').value.trim();
    const options = { from: $('language').value, assume: $('assume').value.trim() || undefined };
    if (!options.assume) delete options.assume;
    keepState();
    if (!first) return;
    engine.renew();
    $('answers').classList.add('stale');
    let asked = first;
    try {
        const short = await engine.ask('simplify', first, { ...options, explain: true });
        if (isStale()) return;
        $('problem').hidden = true;
        show('shortest', short.result);
        show('steps', stepsText(short.steps));
        const normal = await engine.ask('simplify', first, { from: options.from, normalForm: true }); // of the text alone
        show('normal', normal.result);
        const other = options.from === 'c' ? 'quill' : 'c';
        show('other-name', other === 'c' ? 'In C' : 'In Quill');
        show('other', await engine.ask('convert', first, { from: options.from, to: other }));
        show('directive', await engine.ask('convert', first, { from: options.from, to: 'pp' }).then((text) => `#if ${text}`, (e) => e.message));
        if (isStale()) return;
        for (const part of document.querySelectorAll('.relation')) part.hidden = !second;
        if (second) {
            asked = second;
            show('relation', relationText(await engine.ask('compare', first, second, options)));
            asked = first;
        }
        show('tree', (await engine.ask('run', ['tree', '--from', options.from, '--', first])).out);
        if (isStale()) return;
        $('answers').classList.remove('stale');
        setAxes(await engine.ask('symbols', first, { from: options.from }));
        await drawWhere(first, options.from, isStale);
        keepState();
    } catch (problem) {
        if (isStale()) return;
        show('problem', problemText(asked, problem));
        $('problem').hidden = false;
    }
}

async function drawWhere(condition, language, isStale) {
    const across = $('across').value;
    const up = $('up').value;
    if (!across) {
        show('map', 'It has no names.');
        return;
    }
    const axis = axisOf(numbersIn(await engine.ask('tree', condition, { from: language })));
    const lines = questionsOf(condition.replace(/\s+/g, ' '), across, up === across ? '' : up, axis);
    const { out } = await engine.ask('run', ['given', '--from', language], lines.join('\n'));
    if (!isStale()) drawMap($('map'), out.split('\n').slice(0, lines.length), across, up === across ? '' : up, axis);
}

async function checkModel() {
    const turn = ++latest;
    const text = $('source').value;
    keepState();
    engine.renew();
    try {
        const findings = await engine.ask('checkText', text);
        const page = await engine.ask('checkPage', text);
        if (turn !== latest) return;
        $('model-problem').hidden = true;
        const sentences = findings.map((finding) => finding.replace(/^\/model\.json:(\d+): /, 'line $1: '));
        $('findings').innerHTML = sentences.map((sentence) => `<li>${escaped(sentence)}</li>`).join('') || '<li>none</li>';
        $('matrix').srcdoc = page;
    } catch (problem) {
        if (turn !== latest) return;
        show('model-problem', problem.message);
        $('model-problem').hidden = false;
    }
}

function choose(name) {
    for (const each of ['condition', 'model']) {
        const chosen = each === name;
        $(each).hidden = !chosen;
        $(`tab-${each}`).setAttribute('aria-selected', chosen);
        $(`tab-${each}`).tabIndex = chosen ? 0 : -1;
    }
    if (name === 'model') checkModel();
    else answer();
}

function after(action) {
    let timer;
    return () => {
        clearTimeout(timer);
        timer = setTimeout(action, pause);
    };
}

async function start() {
    $('example').innerHTML = '<option value="">(yours)</option>' + examples.map(({ name }, i) => `<option value="${i}">${escaped(name)}</option>`).join('');
    $('example').onchange = () => {
        const example = examples[$('example').value];
        if (!example) return;
        for (const name of ['first', 'second', 'assume']) $(name).value = example[name] ?? '';
        $('language').value = example.language ?? 'c';
        answer();
    };
    const soon = after(answer);
    for (const name of ['first', 'second', 'assume']) $(name).oninput = soon;
    for (const name of ['language', 'across', 'up']) $(name).onchange = answer;
    $('question').onsubmit = (event) => event.preventDefault();
    $('source').oninput = after(checkModel);
    const tabs = ['condition', 'model'];
    for (const name of tabs) {
        $(`tab-${name}`).onclick = () => choose(name);
        $(`tab-${name}`).onkeydown = (event) => {
            if (!['ArrowLeft', 'ArrowRight'].includes(event.key)) return;
            const next = tabs[(tabs.indexOf(name) + 1) % tabs.length];
            choose(next);
            $(`tab-${next}`).focus();
        };
    }
    window.onhashchange = () => location.hash !== stateText() && readState();
    version = await engine.ask('version');
    show('version', version);
    readState();
}

start().catch((failure) => {
    show('problem', `The engine does not start: ${failure.message}. A browser of 2023 or later is needed.`);
    $('problem').hidden = false;
});
