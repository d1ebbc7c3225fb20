// A viewer of compositions and timelines. What it shows, the library has worked out.

import broadcast from '../comp/samples/broadcast.json';
import film from '../comp/samples/film.json';
import harbour from '../comp/samples/harbour.otio';
import sound from '../comp/samples/sound.json';
import space from '../comp/samples/space.json';
import stageSample from '../comp/samples/stage.json';
import makeViewer from 'viewer';
import { compare } from './bits.js';
import { $, element } from './dom.js';
import { Editor } from './editor.js';
import { copyable, showItem, showLayer } from './inspector.js';
import { Lanes } from './lanes.js';
import { colorOf, Stage } from './stage.js';

const kSamples = {
  'space.json': space, 'stage.json': stageSample, 'film.json': film, 'broadcast.json': broadcast, 'sound.json': sound,
  'harbour.otio': harbour,
};
const kMostShared = 50_000; // Of a file in a link.

const viewer = new (await makeViewer()).Viewer();
let file = null; // What Viewer.open() told.
let name = ''; // Of the file.
let given = ''; // Its text.
let frame = 0; // From the start.
let selected = { lane: -1, item: -1 };
let hit = -1;
let pointer = null; // In the frame.
let pinned = null; // The point that was picked last.
let timeline = 0; // Of several in a file.
let pane = { name: '', text: '' }; // What is in the pane, be it right or wrong.
let playing = null; // When, and from which frame.
let hits = { count: 0, layers: [] };
let isStale = { shapes: true, details: true, hits: true };
let isAsked = false;

function say(sentence) {
  $('message').textContent = sentence.slice(0, 500);
  $('message').hidden = sentence === '';
}

// One picture for all that changes before the next is due.
function refresh(what = {}) {
  Object.assign(isStale, what);
  if (isAsked) return;
  isAsked = true;
  requestAnimationFrame(() => {
    isAsked = false;
    paint();
  });
}

const atFrame = () => file.start + frame;
const timeOf = (f) => JSON.parse(viewer.timeOf(f));

function paint() {
  if (playing) {
    const next = (playing.frame + viewer.framesIn(Math.round(performance.now() - playing.since))) % Math.max(1, file.duration);
    if (next !== frame) setFrame(next);
  }
  if (isStale.shapes) {
    stage.update(atFrame());
    look();
    if (!playing) showReports();
  }
  stage.draw(isComposition() ? selected.lane : -1, hit, Number($('tolerance').value));
  lanes.draw(frame, selected.lane, (f) => timeOf(file.start + f).timecode);
  if (isStale.hits) showHits();
  if (isStale.details && !playing) details();
  isStale = { shapes: false, details: isStale.details && Boolean(playing), hits: false };
  if (playing) refresh();
}

const isComposition = () => file.kind === 'composition';

function setFrame(next) {
  frame = Math.max(0, Math.min(Math.max(1, file.duration) - 1, next));
  $('scrub').value = String(frame);
  const time = timeOf(atFrame());
  $('scrub').setAttribute('aria-valuetext', time.timecode);
  $('time').textContent = `${time.timecode} · frame ${atFrame()} · ${time.seconds ?? '?'} s`;
  refresh({ shapes: true, details: true });
}

function play(isOn) {
  playing = isOn ? { since: performance.now(), frame } : null;
  $('play').textContent = isOn ? 'Pause' : 'Play';
  refresh({ details: true });
}

// The layers under the pointer.
function look() {
  const isOver = pointer && isComposition();
  hits = isOver ? JSON.parse(viewer.hits(...pointer, Number($('tolerance').value))) : { count: 0, layers: [] };
  hit = hits.count > 0 ? hits.layers[0].number : -1;
  isStale.hits = true;
}

// The same, and their list with the next picture.
function point() {
  look();
  refresh();
}

function showHits() {
  for (const [id, value] of [['pointX', pointer?.[0]], ['pointY', pointer?.[1]]]) {
    if (document.activeElement !== $(id)) $(id).value = value === undefined ? '' : String(Math.round(value * 100) / 100);
  }
  const more = hits.count - hits.layers.length;
  $('hits').replaceChildren(...hits.layers.map((h) => {
    const b = element('button', { type: 'button' }, h.name.slice(0, 80));
    b.style.borderLeft = `0.6em solid ${colorOf(h.number)}`;
    b.addEventListener('click', () => select(h.number));
    return element('li', {}, b, copyable(h.distance, 'px from its nearest edge'));
  }), ...(more > 0 ? [element('li', {}, `and ${more} more`)] : []));
}

function details() {
  const { lane, item } = selected;
  $('number').value = lane < 0 ? '' : String(lane + 1);
  if (lane < 0) return $('details').replaceChildren();
  if (isComposition()) return showLayer($('details'), JSON.parse(viewer.layer(lane, atFrame())));
  const found = file.tracks[lane]?.items[item];
  if (found) showItem($('details'), found);
  else $('details').replaceChildren(`Track "${(file.tracks[lane]?.name ?? '').slice(0, 80)}"`);
}

function select(lane, item = -1) {
  selected = { lane, item };
  if (lane >= 0) lanes.show(lane);
  details();
  refresh();
}

function showReports() {
  const list = isComposition()
    ? [...file.reports, ...JSON.parse(viewer.reports())].map((r) => `[${r.id}] ${r.text}${r.layer ? ` ("${r.layer.slice(0, 80)}")` : ''}`)
    : file.remarks;
  const sentences = [...new Set(list)];
  $('tabReports').textContent = sentences.length ? `Reports (${sentences.length})` : 'Reports';
  $('reports').replaceChildren(...(sentences.length ? sentences.slice(0, 1000) : ['Nothing.']).map((s) => element('li', {}, s)));
}

function lanesOf(opened) {
  if (opened.kind === 'composition') {
    return opened.names.map((n, i) => ({
      name: n,
      markers: [],
      items: opened.ins[i] === null || opened.outs[i] === null ? []
        : [{ name: n, kind: 'layer', in: opened.ins[i] - opened.start, out: opened.outs[i] - opened.start }],
    }));
  }
  return opened.tracks.map((track, i) => ({
    name: track.name || `${track.kind} ${i + 1}`,
    markers: track.markers.map((marker) => ({ in: marker.in.frame })),
    items: track.items.map((item) => ({ name: item.name, kind: item.kind, in: item.recordIn.frame, out: item.recordOut.frame })),
  }));
}

const count = () => (isComposition() ? file.names.length : file.tracks.length);

function show(opened) {
  file = opened;
  say('');
  editor.show(null);
  $('title').textContent = document.title = `${file.name.slice(0, 200)} · ${file.rate} frames a second`;
  $('scrub').max = String(Math.max(1, file.duration) - 1);
  $('number').max = String(count());
  const timelines = file.timelines ?? [];
  $('timelines').hidden = timelines.length < 2;
  $('timeline').replaceChildren(...timelines.map((t, i) => element('option', { value: i }, `${i + 1}. ${t.slice(0, 60)}`)));
  $('timeline').value = String(timeline);
  if (selected.lane >= count()) selected = { lane: -1, item: -1 };
  if (!file.size) pointer = pinned = null;
  document.body.dataset.shows = isComposition() ? 'layers' : 'tracks';
  stage.open(isComposition() ? file : { names: [], size: null });
  lanes.open(lanesOf(file), file.duration);
  setFrame(frame);
}

// Opens a text, or the bytes of one; false, with everything as it was, where it cannot be used.
function open(text, fileName, isEdited = false, bytes = text) {
  let opened;
  try {
    opened = JSON.parse(viewer.open(bytes, fileName, isEdited));
  } catch {
    opened = { error: `${fileName}: is too large for this page.`, line: 0 };
  }
  pane = { name: fileName, text };
  if (!isEdited) editor.text = text;
  if (kSamples[fileName] !== text) $('sample').value = '';
  if (opened.error) {
    say(opened.error);
    editor.show(opened, !isEdited);
    return false;
  }
  [name, given] = [fileName, text];
  if (!isEdited) {
    play(false);
    selected = { lane: -1, item: -1 };
    pointer = pinned = null;
    frame = timeline = 0;
  } else if (opened.timelines?.length > timeline) {
    opened = JSON.parse(viewer.choose(timeline));
  } else {
    timeline = 0;
  }
  show(opened);
  return true;
}

// The same again, after a change of what does not stand in it.
const reopen = () => open(pane.text, pane.name, true);

let opening = 0;
async function openFile(chosen) {
  const turn = ++opening;
  try {
    const bytes = new Uint8Array(await chosen.arrayBuffer());
    // Lines as the pane has them. What is not UTF-8 the library refuses.
    const text = new TextDecoder().decode(bytes).replace(/\r(?!\n)/g, '\n');
    const isText = new TextEncoder().encode(text).length === bytes.length;
    if (turn === opening) open(text, chosen.name, false, isText ? text : bytes);
  } catch {
    say(`${chosen.name}: cannot be read.`);
  }
}

function save(text, fileName, type) {
  const url = URL.createObjectURL(new Blob([text], { type }));
  const a = element('a', { href: url, download: fileName });
  a.click();
  setTimeout(() => URL.revokeObjectURL(url), 1000);
}

async function copy(text) {
  try {
    await navigator.clipboard.writeText(text);
  } catch {
    const area = element('textarea');
    area.value = text;
    document.body.append(area);
    area.select();
    document.execCommand('copy');
    area.remove();
  }
}

// What a link keeps.
function state() {
  const isSample = kSamples[name] === given;
  const { hull, bounds, names } = stage.options;
  return {
    name, text: isSample || given.length > kMostShared ? undefined : given, frame, lane: selected.lane, item: selected.item,
    camera: viewer.camera(), language: $('language').value, drop: $('drop').checked, tolerance: Number($('tolerance').value), timeline, hull, bounds, names,
  };
}

function restore() {
  let kept = {};
  try {
    kept = Object(JSON.parse(decodeURIComponent(location.hash.slice(1))));
  } catch {
    // A link that was cut shows the first sample.
  }
  const keptName = typeof kept.name === 'string' ? kept.name : 'space.json';
  const isSample = Object.hasOwn(kSamples, keptName);
  const text = typeof kept.text === 'string' ? kept.text : isSample ? kSamples[keptName] : null;
  if (['en', 'de', 'fr', 'ja'].includes(kept.language)) $('language').value = kept.language;
  setLanguage();
  $('drop').checked = kept.drop === true;
  viewer.setDropFrame($('drop').checked);
  setTolerance(typeof kept.tolerance === 'number' ? kept.tolerance : 0);
  for (const option of kOptions) {
    stage.options[option] = typeof kept[option] === 'boolean' ? kept[option] : option === 'names';
    $(option).checked = stage.options[option];
  }
  if (text === null || !open(text, keptName)) {
    const sentence = text === null ? `${keptName.slice(0, 200)}: was too large for the link.` : $('message').textContent;
    open(space, 'space.json');
    say(sentence);
    kept = {};
  }
  $('sample').value = Object.hasOwn(kSamples, name) && kSamples[name] === given ? name : '';
  if (Number.isInteger(kept.timeline) && kept.timeline > 0 && kept.timeline < (file.timelines?.length ?? 0)) choose(kept.timeline);
  if (typeof kept.camera === 'string') viewer.setCamera(kept.camera);
  if (Number.isSafeInteger(kept.frame)) setFrame(kept.frame);
  if (Number.isInteger(kept.lane) && kept.lane >= 0 && kept.lane < count()) {
    select(kept.lane, Number.isInteger(kept.item) ? kept.item : -1);
  }
  refresh({ shapes: true, details: true });
}

function setLanguage() {
  viewer.setLanguage($('language').value);
  for (const id of ['message', 'place', 'reports']) $(id).lang = $('language').value;
}

function choose(chosen) {
  timeline = chosen;
  selected = { lane: -1, item: -1 };
  frame = 0;
  show(JSON.parse(viewer.choose(chosen)));
}

function setTolerance(value) {
  const tolerance = Number(value);
  $('tolerance').value = String(tolerance >= 0 ? tolerance : 0);
  $('toleranceValue').textContent = $('tolerance').value;
}

const stage = new Stage($('stage'), viewer, {
  pointed(x, y) {
    pointer = [x, y];
    point();
  },
  left() {
    pointer = pinned;
    point();
  },
  picked(x, y) {
    pointer = pinned = [x, y];
    point();
    if (hit >= 0) select(hit);
  },
  moved() {
    refresh({ shapes: true, details: true });
  },
});
const lanes = new Lanes($('lanes'), {
  seeked(f) {
    play(false);
    setFrame(f);
  },
  selected: select,
  scrolled: () => file && refresh(),
});
const editor = new Editor((text) => open(text, pane.name, true));
const kOptions = ['hull', 'bounds', 'names'];

$('sample').append(element('option', { value: '' }, '—'), ...Object.keys(kSamples).map((s) => element('option', { value: s }, s)));
$('sample').addEventListener('change', (e) => e.target.value && open(kSamples[e.target.value], e.target.value));
$('file').addEventListener('change', (e) => {
  if (e.target.files[0]) openFile(e.target.files[0]);
  e.target.value = '';
});
$('language').addEventListener('change', () => {
  setLanguage();
  reopen();
});
$('drop').addEventListener('change', (e) => {
  viewer.setDropFrame(e.target.checked);
  reopen();
});
$('timeline').addEventListener('change', (e) => choose(Number(e.target.value)));
for (const id of ['pointX', 'pointY']) {
  $(id).addEventListener('input', () => {
    const [x, y] = ['pointX', 'pointY'].map((i) => $(i).valueAsNumber);
    if (Number.isFinite(x) && Number.isFinite(y)) pointer = pinned = [x, y];
    point();
  });
}
$('play').addEventListener('click', () => play(!playing));
$('stop').addEventListener('click', () => {
  play(false);
  setFrame(0);
});
function step(frames) {
  play(false);
  setFrame(frame + frames);
}
$('back').addEventListener('click', () => step(-1));
$('forward').addEventListener('click', () => step(1));
$('scrub').addEventListener('input', (e) => {
  play(false);
  setFrame(Number(e.target.value));
});
$('reset').addEventListener('click', () => {
  viewer.resetCamera();
  refresh({ shapes: true, details: true });
});
for (const option of kOptions) {
  $(option).addEventListener('change', (e) => {
    stage.options[option] = e.target.checked;
    refresh({ shapes: true });
  });
}
$('tolerance').addEventListener('input', (e) => {
  setTolerance(e.target.value);
  point();
});
$('number').addEventListener('change', (e) => {
  const lane = Number(e.target.value) - 1;
  if (lane >= 0 && lane < Number(e.target.max)) select(lane, isComposition() ? -1 : 0);
});
$('export').addEventListener('click', () => {
  const svg = viewer.svg(atFrame());
  if (svg) save(svg, `${name}.svg`, 'image/svg+xml');
  else say(`${name}: without a size there is no picture.`);
});
$('sheet').addEventListener('click', () => save(viewer.sheet(), `${name}.sheet.json`, 'application/json'));
$('link').addEventListener('click', () => {
  history.replaceState(null, '', `#${encodeURIComponent(JSON.stringify(state()))}`);
  copy(location.href);
  if (given.length > kMostShared && kSamples[name] !== given) say('The file is too large for a link: it keeps all but the file.');
});
$('run').addEventListener('click', () => compare(viewer));
for (const id of ['details', 'hits']) {
  $(id).addEventListener('click', (e) => e.target.dataset?.exact !== undefined && copy(e.target.dataset.exact));
}
window.addEventListener('hashchange', () => location.hash.length > 1 && restore());
window.addEventListener('resize', () => refresh());
matchMedia('(prefers-color-scheme: dark)').addEventListener('change', () => refresh());

const tabs = [...document.querySelectorAll('[role=tab]')];
function showTab(tab) {
  for (const t of tabs) {
    const isShown = t === tab;
    t.setAttribute('aria-selected', String(isShown));
    t.tabIndex = isShown ? 0 : -1;
    $(t.getAttribute('aria-controls')).hidden = !isShown;
  }
}
for (const tab of tabs) {
  tab.addEventListener('click', () => showTab(tab));
  tab.addEventListener('keydown', (e) => {
    const step = { ArrowLeft: -1, ArrowRight: 1 }[e.key];
    if (!step) return;
    const next = tabs[(tabs.indexOf(tab) + step + tabs.length) % tabs.length];
    showTab(next);
    next.focus();
  });
}
$('lanes').addEventListener('keydown', (e) => {
  if (count() === 0 || e.ctrlKey || e.altKey || e.metaKey) return;
  const items = lanes.lanes[selected.lane]?.items ?? [];
  if (e.key === 'ArrowDown' || e.key === 'ArrowUp') {
    select(Math.max(0, Math.min(count() - 1, selected.lane + (e.key === 'ArrowDown' ? 1 : -1))), isComposition() ? -1 : 0);
  } else if (e.key === 'ArrowLeft' || e.key === 'ArrowRight') {
    const way = e.key === 'ArrowRight' ? 1 : -1;
    if (isComposition()) step(way);
    else if (selected.lane >= 0) select(selected.lane, Math.max(0, Math.min(items.length - 1, selected.item + way)));
  } else if (e.key === 'Enter' && items.length > 0) {
    play(false);
    setFrame(items[Math.max(0, selected.item)].in);
  } else {
    return;
  }
  e.preventDefault();
});
document.addEventListener('keydown', (e) => {
  const isPressed = e.key === ' ' && e.target.closest?.('button, summary, [role=tab]');
  if (isPressed || e.ctrlKey || e.altKey || e.metaKey || e.target.closest?.('input, textarea, select')) return;
  if (e.key === ' ') play(!playing);
  else if (e.key === ',') step(-1);
  else if (e.key === '.') step(1);
  else return;
  e.preventDefault();
});
document.addEventListener('dragover', (e) => {
  e.preventDefault();
  document.body.classList.add('dropping');
});
document.addEventListener('dragleave', () => document.body.classList.remove('dropping'));
document.addEventListener('drop', (e) => {
  e.preventDefault();
  document.body.classList.remove('dropping');
  if (e.dataTransfer.files[0]) openFile(e.dataTransfer.files[0]);
});

restore();
