// The constant parts of every page: its style, and the script that shows the tip under the pointer or the focus.
// Colours follow the scheme of the reader's system; without the script the tips remain plain titles.
#pragma once

namespace vtsym {

inline constexpr const char* pageStyle = R"css(
:root { --ink: #1d2430; --soft: #5b6676; --line: #d9dee6; --faint: #a3adba; --paper: #ffffff; --band: #f4f6f9; --overlap: #d9480f;
  --covered: #c2255c; --dead: #868e96; --always: #6741d9; --open: #b08900; --good: #2b8a3e; --tip: #1d2430; --tipInk: #ffffff; }
@media (prefers-color-scheme: dark) { :root { --ink: #e6e9ef; --soft: #9aa5b5; --line: #364050; --faint: #5b6676; --paper: #151a22;
  --band: #1d2430; --overlap: #ff922b; --covered: #f783ac; --dead: #868e96; --always: #b197fc; --open: #ffd43b;
  --good: #69db7c; --tip: #e6e9ef; --tipInk: #151a22; } }
* { box-sizing: border-box; }
body { margin: 0 auto; max-width: 76rem; padding: 2rem 1.25rem 6rem; color: var(--ink); background: var(--paper);
  font: 1rem/1.5 system-ui, -apple-system, "Segoe UI", "DejaVu Sans", sans-serif; }
h1 { font-size: 1.6rem; line-height: 1.25; margin: 0 0 .25rem; overflow-wrap: anywhere; }
h2 { font-size: 1.2rem; line-height: 1.3; margin: 0; overflow-wrap: anywhere; }
p { margin: .25rem 0 .75rem; max-width: 46rem; }
code { font: .875em/1.45 ui-monospace, "DejaVu Sans Mono", Menlo, Consolas, monospace; overflow-wrap: anywhere; }
a { color: inherit; }
.soft { color: var(--soft); }
.sum { margin: 0 0 1.5rem; }
section { margin: 2.5rem 0 0; padding-top: 1.25rem; border-top: 1px solid var(--line); }
.scroll { overflow-x: auto; margin: 1rem 0 .75rem; }
table { border-collapse: separate; border-spacing: 0; }
th { font-weight: normal; text-align: left; vertical-align: middle; }
thead th { height: 2rem; text-align: center; color: var(--soft); font-size: .8rem; font-variant-numeric: tabular-nums; }
tbody th { position: sticky; left: 0; z-index: 1; background: var(--paper); width: min(26rem, 46vw);
  min-width: min(15rem, 46vw); max-width: min(26rem, 46vw); padding: .3rem .75rem .3rem 0; border-top: 1px solid var(--line); }
tbody th .who { display: flex; gap: .6em; }
tbody th .no { color: var(--soft); font-size: .8rem; min-width: 1.4em; text-align: right; line-height: 1.9;
  font-variant-numeric: tabular-nums; }
tbody th b { overflow-wrap: anywhere; font-weight: 600; }
tbody th code { display: -webkit-box; -webkit-box-orient: vertical; -webkit-line-clamp: 2; overflow: hidden;
  color: var(--soft); margin-left: 2em; }
thead td { border: 0 !important; }
td { padding: 0; border: 1px solid transparent; border-top-color: var(--line); width: 2rem; min-width: 2rem; height: 2rem; }
.cell { display: flex; align-items: center; justify-content: center; width: 2rem; height: 2rem; margin: auto;
  border-radius: .3rem; font-size: .95rem; line-height: 1; cursor: default; }
.dense td, .dense td .cell { width: 1.6rem; min-width: 1.6rem; }
.none { color: var(--faint); }
.redundant { border: 2px dashed var(--overlap); color: var(--soft); font-size: .75rem; }
.self { background: var(--band); color: var(--soft); font-size: .75rem; }
.overlap { background: var(--overlap); color: var(--paper); font-weight: 700; }
.covered { background: var(--covered); color: var(--paper); font-weight: 700; }
.dead { background: var(--dead); color: var(--paper); }
.always { background: var(--always); color: var(--paper); }
.open { background: var(--open); color: var(--paper); font-weight: 700; }
.cell:focus-visible, code:focus-visible, a:focus-visible { outline: 3px solid var(--ink); outline-offset: 1px; position: relative;
  z-index: 2; }
.lit { background: var(--band); }
.key { display: flex; flex-wrap: wrap; gap: .25rem 1.25rem; margin: 0 0 1rem; padding: 0; list-style: none; color: var(--soft);
  font-size: .875rem; }
.key li { display: flex; align-items: center; gap: .45rem; }
.key .cell { width: 1.4rem; height: 1.4rem; font-size: .8rem; margin: 0; }
ul.found { margin: .5rem 0 0; padding: 0; list-style: none; max-width: 58rem; }
ul.found li { padding: .35rem 0; overflow-wrap: anywhere; display: grid; grid-template-columns: 7.5rem 1fr; gap: .25rem .75rem; }
ul.found li + li { border-top: 1px solid var(--line); }
.kind { color: var(--overlap); font-weight: 600; font-size: .875rem; line-height: 1.7; }
.fine { color: var(--good); }
nav ul { columns: 18rem; padding: 0; margin: .5rem 0 0; list-style: none; }
nav li { break-inside: avoid; overflow-wrap: anywhere; padding: .1rem 0; }
#tip { position: fixed; z-index: 9; max-width: min(34rem, calc(100vw - 2rem)); padding: .5rem .75rem; border-radius: .4rem;
  background: var(--tip); color: var(--tipInk); font-size: .875rem; line-height: 1.45; pointer-events: none;
  overflow-wrap: anywhere; box-shadow: 0 4px 16px rgb(0 0 0 / 30%); white-space: pre-line; }
#tip[hidden] { display: none; }
@media (max-width: 36rem) { body { padding: 1.25rem .75rem 5rem; } ul.found li { grid-template-columns: 1fr; gap: 0; }
  tbody th code { margin-left: 0; } }
@media print { .scroll { overflow: visible; } section { break-inside: avoid; } }
)css";

inline constexpr const char* pageScript = R"js(
(() => {
  const tip = document.getElementById('tip');
  let lit = [];
  const hide = () => { tip.hidden = true; lit.forEach(e => e.classList.remove('lit')); lit = []; };
  const show = target => {
    hide();
    tip.textContent = target.dataset.tip;
    tip.hidden = false;
    const at = target.getBoundingClientRect(), size = tip.getBoundingClientRect();
    const below = at.bottom + 6 + size.height < innerHeight;
    tip.style.top = (below ? at.bottom + 6 : Math.max(8, at.top - 6 - size.height)) + 'px';
    tip.style.left = Math.max(8, Math.min(at.left, document.documentElement.clientWidth - size.width - 8)) + 'px';
    const cell = target.closest('td'), row = target.closest('tr');
    if (!cell || !row) return;
    const head = cell.closest('table').tHead.rows[0].cells[cell.cellIndex];
    lit = [row.cells[0], head];
    lit.forEach(e => e.classList.add('lit'));
  };
  document.querySelectorAll('[title]').forEach(e => {
    e.dataset.tip = e.title;
    e.setAttribute('aria-label', e.title);
    e.removeAttribute('title');
    for (const on of ['mouseenter', 'focus']) e.addEventListener(on, () => show(e));
    for (const off of ['mouseleave', 'blur']) e.addEventListener(off, hide);
  });
  addEventListener('keydown', e => { if (e.key === 'Escape') hide(); });
  addEventListener('scroll', hide, true);
})();
)js";

} // namespace vtsym
