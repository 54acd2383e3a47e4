// The steps of a simplification, and a tree, as text.

const escaped = (text) => String(text).replace(/[&<>"]/g, (c) => ({ '&': '&amp;', '<': '&lt;', '>': '&gt;', '"': '&quot;' })[c]);

function stepsText(steps) {
    let pass = 0;
    return steps.map((step) => {
        if (step.form !== undefined)
            return `${step.chosen ? '=' : ' '} ${step.form}   ${step.way}, ${step.comparisons} comparison${step.comparisons === 1 ? '' : 's'}`;
        const head = step.pass === pass ? '' : `pass ${pass = step.pass}\n`;
        return `${head}  ${step.rule}: ${step.before}  =>  ${step.after}`;
    }).join('\n');
}

const valuesText = (assignment) => Object.entries(assignment).map(([name, value]) => `${name}=${value}`).join(', ') || 'any values';

function relationText({ relation, witness = {}, because = [] }) {
    const parts = [relation];
    if (witness.only_a) parts.push(`first alone: ${valuesText(witness.only_a)}`);
    if (witness.only_b) parts.push(`second alone: ${valuesText(witness.only_b)}`);
    if (witness.both && relation === 'overlaps') parts.push(`both: ${valuesText(witness.both)}`);
    if (because.length > 0) parts.push(`because: ${because.join(', ')}`);
    return parts.join('; ');
}

const encoder = new TextEncoder();

/** A message with the line that it is about and a caret under the byte where reading stopped. */
function problemText(text, { message, offset }) {
    if (offset === undefined) return message;
    const before = new TextDecoder().decode(encoder.encode(text).slice(0, offset));
    const line = before.slice(before.lastIndexOf('\n') + 1);
    const rest = text.slice(before.length).split('\n', 1)[0];
    return `${message}\n  ${line}${rest}\n  ${' '.repeat([...line].length)}^`;
}
