#pragma once

#include <string_view>

// Style and behaviour of the report's page. Everything can be read without the script; that adds searching,
// zooming and folding.
namespace zr::tool {

inline constexpr std::string_view kReportStyle = R"css(
:root { color-scheme: light; --back: #fff; --text: #1c1e21; --soft: #5c6370; --line: #d5d9e0; --box: #f5f6f8;
  --link: #0550ae; --bad: #a40e26; --query: #ddebff; --table: #e3f4e1; --hit: #ffe89a;
  --select: #0550ae; --from: #116329; --where: #8a2be2; --group: #8a4600; --having: #a40e26; --order: #00686e;
  --union: #6e5600; --limit: #5c6370; }
:root.dark { color-scheme: dark; --back: #16181c; --text: #e6e6e6; --soft: #a0a8b5; --line: #3a3f48;
  --box: #1f2228; --link: #79b8ff; --bad: #ff8a8a; --query: #1d3553; --table: #1e3d24; --hit: #6b5900;
  --select: #79b8ff; --from: #7ee787; --where: #d2a8ff; --group: #ffb870; --having: #ff9d9d; --order: #76e3ea;
  --union: #e3c964; --limit: #a0a8b5; }
body { margin: 0 auto; padding: 1rem; max-width: 80rem; font: 15px/1.45 system-ui, sans-serif;
  background: var(--back); color: var(--text); }
a { color: var(--link); }
:focus-visible { outline: 2px solid var(--link); outline-offset: 2px; }
.skip { position: absolute; left: -99rem; } .skip:focus { left: 1rem; background: var(--back); }
header.bar { position: sticky; top: 0; z-index: 1; background: var(--back); padding: .4rem 0; display: flex;
  gap: .5rem; align-items: center; flex-wrap: wrap; border-bottom: 1px solid var(--line); }
input[type=search] { flex: 1 1 16rem; padding: .4rem; font: inherit; color: inherit; background: var(--box);
  border: 1px solid var(--line); border-radius: 5px; }
::placeholder { color: var(--soft); opacity: 1; }
button { font: inherit; color: inherit; background: var(--box); border: 1px solid var(--line);
  border-radius: 5px; padding: .3rem .7rem; cursor: pointer; }
.counts { display: flex; flex-wrap: wrap; gap: .6rem; padding: 0; list-style: none; }
.counts li { background: var(--box); border: 1px solid var(--line); border-radius: 6px; padding: .5rem .9rem; }
.counts b { display: block; font-size: 1.4rem; }
table { border-collapse: collapse; width: 100%; margin: .5rem 0; }
th, td { text-align: left; vertical-align: top; padding: .25rem .6rem; border-bottom: 1px solid var(--line);
  overflow-wrap: anywhere; }
th { color: var(--soft); font-weight: 600; overflow-wrap: normal; }
td:first-child { min-width: 6rem; }
h2 { scroll-margin-top: 4rem; }
pre { background: var(--box); padding: .7rem; border-radius: 6px; overflow: auto; white-space: pre-wrap;
  max-height: 40rem; font: 13px/1.45 ui-monospace, monospace; tab-size: 4; }
section details.object { border: 1px solid var(--line); border-radius: 6px; margin: .4rem 0; padding: .3rem .8rem;
  content-visibility: auto; contain-intrinsic-size: auto 2.2rem; scroll-margin-top: 4rem; }
summary { cursor: pointer; overflow-wrap: anywhere; } summary .soft, .soft { color: var(--soft); }
.bad { color: var(--bad); } [hidden] { display: none; }
.c-select { color: var(--select); } .c-from { color: var(--from); } .c-where { color: var(--where); }
.c-group { color: var(--group); } .c-having { color: var(--having); } .c-order { color: var(--order); }
.c-union { color: var(--union); } .c-limit { color: var(--limit); }
.unread { text-decoration: underline wavy var(--bad); opacity: .75; }
#graph { box-sizing: border-box; width: 100%; height: 32rem; border: 1px solid var(--line); border-radius: 6px; background: var(--box);
  cursor: grab; touch-action: none; }
#graph rect { stroke: var(--line); } #graph a.query rect { fill: var(--query); }
#graph a.table rect { fill: var(--table); } #graph text { font: 12px system-ui, sans-serif; fill: var(--text); }
#graph path { fill: none; stroke: var(--soft); opacity: .45; }
#graph.some a, #graph.some path { opacity: .12; }
#graph.some a.near, #graph.some path.near { opacity: 1; }
#graph a.hit rect { fill: var(--hit); stroke: var(--text); }
#graph a:focus rect { stroke: var(--link); stroke-width: 3; }
.tree ul { list-style: none; margin: 0; padding-left: 1.2rem; border-left: 1px solid var(--line); }
.tree { font: 13px/1.5 ui-monospace, monospace; }
)css";

inline constexpr std::string_view kReportScript = R"js(
'use strict';
const root = document.documentElement;
const byId = id => document.getElementById(id);
const dark = matchMedia('(prefers-color-scheme: dark)');
root.classList.toggle('dark', dark.matches);
dark.addEventListener('change', () => root.classList.toggle('dark', dark.matches));
byId('theme').addEventListener('click', () => root.classList.toggle('dark'));

// The place in the address is opened.
function openTarget() {
  const target = byId(decodeURIComponent(location.hash.slice(1)));
  if (!target) return;
  target.hidden = false;
  if (target.tagName.toLowerCase() === 'details') {
    target.open = true;
    target.scrollIntoView();
    target.querySelector('summary').focus({preventScroll: true});
    showNear(target.id);
  }
}
addEventListener('hashchange', openTarget);

// Search: names, columns and texts of queries and tables, but not who reads them.
const objects = [...document.querySelectorAll('details.object')];
const texts = new Map();
const textOf = object => {
  if (!texts.has(object)) {
    const parts = [...object.children].filter(part => !part.matches('.tree, .readers, :has(> .look)'));
    texts.set(object, parts.map(part => part.textContent).join(' ').toLowerCase());
  }
  return texts.get(object);
};
const nameOf = object => object.querySelector('summary b').textContent.toLowerCase();
const search = byId('search');
let hits = [];
let hitAt = -1;
let timer = 0;
function find() {
  clearTimeout(timer);  // a search that comes late would hide what was opened since
  const wanted = search.value.trim().toLowerCase();
  hits = [];
  hitAt = -1;
  for (const object of objects) {
    const isHit = textOf(object).includes(wanted);
    object.hidden = !isHit;
    const node = nodes.get(object.id);
    if (node) node.classList.toggle('hit', wanted !== '' && isHit);
    if (wanted !== '' && isHit) hits.push(object);
  }
  byId('found').textContent = wanted === '' ? '' : hits.length + ' found';
}
search.addEventListener('input', () => { clearTimeout(timer); timer = setTimeout(find, 150); });
search.addEventListener('keydown', event => {
  if (event.key !== 'Enter' || search.value.trim() === '') return;
  find();
  if (hits.length === 0) return;
  const wanted = search.value.trim().toLowerCase();
  location.hash = (hits.find(hit => nameOf(hit) === wanted) || hits[0]).id;
});
byId('next').addEventListener('click', () => {
  if (hits.length === 0) return;
  hitAt = (hitAt + 1) % hits.length;
  lookAt(hits[hitAt].id);
});
addEventListener('keydown', event => {
  if (event.key === '/' && document.activeElement !== search) { event.preventDefault(); search.focus(); }
});

// The graph: wheel, buttons or keys zoom; dragging or arrows move.
const graph = byId('graph');
const nodes = new Map([...graph.querySelectorAll('a')].map(node => [node.dataset.node, node]));
const lines = [...graph.querySelectorAll('path')];
const whole = [0, 0, +graph.dataset.width, +graph.dataset.height];
let view = [...whole];
const show = () => graph.setAttribute('viewBox', view.join(' '));
function zoom(factor, x = 0.5, y = 0.5) {
  view = [view[0] + view[2] * x * (1 - factor), view[1] + view[3] * y * (1 - factor), view[2] * factor,
          view[3] * factor];
  show();
}
function move(x, y) { view[0] += view[2] * x; view[1] += view[3] * y; show(); }
function fit() { view = [...whole]; graph.classList.remove('some'); show(); }
function showNear(id) {
  if (!nodes.has(id)) return;
  const near = new Set();
  // Everything that it is made of, and everything made of it.
  for (const [end, other] of [['from', 'to'], ['to', 'from']]) {
    const next = new Map();
    for (const line of lines) {
      const key = line.dataset[end];
      if (!next.has(key)) next.set(key, []);
      next.get(key).push(line);
    }
    const seen = new Set([id]);
    const todo = [id];
    while (todo.length) {
      const at = todo.pop();
      near.add(nodes.get(at));
      for (const line of next.get(at) || []) {
        near.add(line);
        if (!seen.has(line.dataset[other])) { seen.add(line.dataset[other]); todo.push(line.dataset[other]); }
      }
    }
  }
  graph.classList.add('some');
  for (const each of [...nodes.values(), ...lines]) each.classList.toggle('near', near.has(each));
}
function lookAt(id) {
  const node = nodes.get(id);
  if (!node) return;
  const box = node.querySelector('rect');
  // In the middle and as large as the rest of the page.
  const width = graph.clientWidth;
  const height = graph.clientHeight;
  view = [+box.getAttribute('x') + (+box.getAttribute('width') - width) / 2,
          +box.getAttribute('y') + (+box.getAttribute('height') - height) / 2, width, height];
  show();
  showNear(id);
  node.focus();
}
byId('in').addEventListener('click', () => zoom(0.7));
byId('out').addEventListener('click', () => zoom(1.4));
byId('fit').addEventListener('click', fit);
graph.addEventListener('wheel', event => {
  event.preventDefault();
  const box = graph.getBoundingClientRect();
  zoom(event.deltaY > 0 ? 1.2 : 0.83, (event.clientX - box.left) / box.width, (event.clientY - box.top) / box.height);
}, {passive: false});
let drag = null;
let way = 0;  // that was dragged; a click behind a drag goes nowhere
graph.addEventListener('pointerdown', event => { drag = [event.clientX, event.clientY]; way = 0; });
graph.addEventListener('click', event => { if (way > 6) event.preventDefault(); });
addEventListener('pointermove', event => {
  if (!drag) return;
  const box = graph.getBoundingClientRect();
  way += Math.abs(event.clientX - drag[0]) + Math.abs(event.clientY - drag[1]);
  move((drag[0] - event.clientX) / box.width, (drag[1] - event.clientY) / box.height);
  drag = [event.clientX, event.clientY];
});
addEventListener('pointerup', () => { drag = null; });
graph.addEventListener('dragstart', event => event.preventDefault());
graph.addEventListener('keydown', event => {
  const keys = {ArrowLeft: () => move(-0.1, 0), ArrowRight: () => move(0.1, 0), ArrowUp: () => move(0, -0.1),
                ArrowDown: () => move(0, 0.1), '+': () => zoom(0.7), '-': () => zoom(1.4), '0': fit, Escape: fit};
  if (!keys[event.key]) return;
  event.preventDefault();
  keys[event.key]();
});
document.querySelectorAll('button.look').forEach(button =>
  button.addEventListener('click', () => { graph.scrollIntoView({block: 'center'}); lookAt(button.value); }));

// A tree is made foldable when it is first opened.
document.addEventListener('toggle', event => {
  const tree = event.target;
  if (!tree.classList.contains('tree') || !tree.open) return;
  const text = tree.querySelector('pre');
  if (!text) return;
  const rows = text.textContent.split('\n').filter(row => row.trim() !== '')
    .map(row => ({depth: row.search(/\S/), text: row.trim()}));
  if (rows.length > 5000) return;
  const top = document.createElement('ul');
  const stack = [{depth: -1, list: top}];
  rows.forEach((row, at) => {
    while (stack[stack.length - 1].depth >= row.depth) stack.pop();
    const item = document.createElement('li');
    const hasMore = at + 1 !== rows.length && rows[at + 1].depth > row.depth;
    if (hasMore) {
      const fold = document.createElement('details');
      fold.open = row.depth < 8;
      const head = document.createElement('summary');
      head.textContent = row.text;
      const list = document.createElement('ul');
      fold.append(head, list);
      item.append(fold);
      stack[stack.length - 1].list.append(item);
      stack.push({depth: row.depth, list});
    } else {
      item.textContent = row.text;
      stack[stack.length - 1].list.append(item);
    }
  });
  text.replaceWith(top);
}, true);
openTarget();
)js";

}  // namespace zr::tool
