// A picture of where a condition holds: one cell for each pair of values of two names.
//
// The values around the numbers of the condition show every change; all of them where they are few.  The engine decides
// each cell, so that a cell whose answer depends on other names says how.

const mostCells = 41; // of an axis

/** The integers in a tree of the engine. */
function numbersIn(tree) {
    const found = new Set([0]);
    const open = [tree];
    while (open.length > 0) {
        const node = open.pop();
        if (Number.isInteger(node.value) && Math.abs(node.value) < 2 ** 40) found.add(node.value);
        for (const input of node.inputs ?? []) if (typeof input === 'object') open.push(input);
    }
    return [...found].sort((a, b) => a - b);
}

/** The values of an axis, ascending. */
function axisOf(numbers) {
    const least = numbers[0] - 2;
    const most = numbers[numbers.length - 1] + 2;
    if (most - least < mostCells) return Array.from({ length: most - least + 1 }, (_, i) => least + i);
    const around = [...new Set(numbers.flatMap((n) => [n - 1, n, n + 1]))].sort((a, b) => a - b);
    if (around.length <= mostCells) return around;
    return around.filter((_, i) => i % Math.ceil(around.length / mostCells) === 0);
}

/** The line of `given` for each cell, row by row from the top. */
function questionsOf(condition, across, up, axis) {
    const rows = up ? [...axis].reverse() : [0];
    return rows.flatMap((y) => axis.map((x) => `${across}==(${x})${up ? ` && ${up}==(${y})` : ''}\t${condition}`));
}

const cellKinds = { true: 'yes', 1: 'yes', false: 'no', 0: 'no' };
const cellWords = { yes: 'holds', no: 'does not hold' };

/** Draws the answers of the cells. */
function drawMap(target, answers, across, up, axis) {
    const size = 14;
    const left = up ? 46 : 8;
    const rows = up ? [...axis].reverse() : [undefined];
    const width = left + axis.length * size + 20;
    const height = rows.length * size + 34;
    const counts = { yes: 0, no: 0, maybe: 0 };
    const parts = [];
    answers.forEach((answer, i) => {
        const x = axis[i % axis.length];
        const y = rows[Math.floor(i / axis.length)];
        const kind = cellKinds[answer] ?? 'maybe';
        ++counts[kind];
        const place = `${across}=${x}${up ? `, ${up}=${y}` : ''}`;
        parts.push(`<rect class="cell-${kind}" x="${left + (i % axis.length) * size}" y="${Math.floor(i / axis.length) * size + 4}"` +
            ` width="${size - 1}" height="${size - 1}"><title>${escaped(`${place}: ${cellWords[kind] ?? answer}`)}</title></rect>`);
    });
    const each = Math.ceil(axis.length / 11);
    const bottom = rows.length * size + 16;
    axis.forEach((value, i) => {
        if (i % each === 0) parts.push(`<text x="${left + i * size + size / 2}" y="${bottom}" text-anchor="middle">${value}</text>`);
    });
    parts.push(`<text x="${left + axis.length * size / 2}" y="${bottom + 14}" text-anchor="middle">${escaped(across)}</text>`);
    if (up) {
        rows.forEach((value, i) => {
            if (i % each === 0) parts.push(`<text x="${left - 5}" y="${i * size + size}" text-anchor="end">${value}</text>`);
        });
        parts.push(`<text x="10" y="${rows.length * size / 2}" transform="rotate(-90 10 ${rows.length * size / 2})" text-anchor="middle">${escaped(up)}</text>`);
    }
    const said = `Holds for ${counts.yes} of ${answers.length} values shown` +
        (counts.maybe ? `, depends on other names for ${counts.maybe}.` : '.');
    target.innerHTML = `<svg viewBox="0 0 ${width} ${height}" role="img" aria-label="${escaped(said)}">${parts.join('')}</svg>` +
        `<p class="soft">${escaped(said)}</p>`;
}
