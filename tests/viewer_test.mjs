// The viewer in a real browser, as a user has it, beside the native program.
// viewer_test.mjs PAGE PROGRAM SAMPLES FOLDER: FOLDER holds node_modules and gets pictures.

import assert from 'node:assert/strict';
import { execFileSync } from 'node:child_process';
import { readFileSync } from 'node:fs';
import { createRequire } from 'node:module';
import { join, resolve } from 'node:path';

const [page, program, samples, folder] = process.argv.slice(2).map((path) => resolve(path));
const require = createRequire(join(folder, 'x'));
const { chromium } = require('playwright-core');
const comp = (...args) => execFileSync(program, args, { env: { LC_ALL: 'C' }, stdio: ['ignore', 'pipe', 'ignore'], encoding: 'utf8', maxBuffer: 1 << 28 });

const browser = await chromium.launch({ executablePath: '/usr/bin/chromium', args: ['--no-sandbox'] });
const context = await browser.newContext({ viewport: { width: 1280, height: 900 }, permissions: ['clipboard-read', 'clipboard-write'] });
const tab = await context.newPage();
const complaints = [];
tab.on('console', (m) => ['error', 'warning'].includes(m.type()) && complaints.push(m.text().slice(0, 300)));
tab.on('pageerror', (e) => complaints.push(e.message));
tab.on('dialog', (d) => complaints.push(`a dialog: ${d.message()}`));
await tab.goto(`file://${page}`);
await tab.waitForFunction(() => document.getElementById('time').textContent);
console.log(`first picture after ${await tab.evaluate(() => Math.round(performance.now()))} ms`);

const text = (id) => tab.locator(`#${id}`).textContent();
const painted = () => tab.evaluate(() => new Promise((r) => { requestAnimationFrame(() => requestAnimationFrame(r)); }));
const set = async (id, value, type = 'input') => {
  await tab.locator(`#${id}`).evaluate((e, [v, t]) => {
    e.value = v;
    e.dispatchEvent(new Event(t, { bubbles: true }));
  }, [String(value), type]);
  await painted();
};
const saved = async (id) => {
  const [download] = await Promise.all([tab.waitForEvent('download'), tab.click(`#${id}`)]);
  return readFileSync(await download.path(), 'utf8');
};
const open = async (name, content) => {
  await tab.setInputFiles('#file', { name, mimeType: 'application/json', buffer: Buffer.from(content) });
  await tab.waitForTimeout(50);
  await painted();
};
// Where a point of the frame is on the page.
const onPage = (x, y) => tab.locator('#stage').evaluate((c, [fx, fy]) => {
  const box = c.getBoundingClientRect(), scale = Math.min(c.clientWidth / 1920, c.clientHeight / 1080) / 1.4;
  return [box.left + c.clientLeft + (c.clientWidth - 1920 * scale) / 2 + fx * scale,
    box.top + c.clientTop + (c.clientHeight - 1080 * scale) / 2 + fy * scale];
}, [x, y]);
const exact = (name) => tab.evaluate((n) => {
  const dt = [...document.querySelectorAll('#details dt')].find((e) => e.textContent === n);
  return dt && [...dt.nextElementSibling.querySelectorAll('button')].map((b) => b.dataset.exact);
}, name);
// Numbers that pass through sines may differ in their last digits, nothing else.
const alike = (a, b) => {
  if (typeof a === 'number' && typeof b === 'number') return Math.abs(a - b) <= 1e-9 * Math.max(1, Math.abs(a));
  if (a === null || typeof a !== 'object') return a === b;
  return Object.keys({ ...a, ...b }).every((key) => alike(a[key], b?.[key]));
};

// What it saves is what the program prints and draws.
for (const name of ['film.json', 'broadcast.json', 'sound.json', 'harbour.otio', 'stage.json', 'space.json']) {
  await tab.selectOption('#sample', name);
  const [here, there] = [await saved('sheet'), comp('--json', join(samples, name))];
  if (['stage.json', 'space.json'].includes(name)) assert.ok(alike(JSON.parse(here), JSON.parse(there)), name);
  else assert.equal(here, there, name);
  if (!['harbour.otio', 'stage.json', 'space.json'].includes(name)) continue;
  const time = name === 'harbour.otio' ? [] : ['--time', '0'];
  comp('--svg', join(folder, 'native.svg'), ...time, join(samples, name));
  assert.equal(await saved('export'), readFileSync(join(folder, 'native.svg'), 'utf8'), name);
}

// Its clock is the rate: every frame has its exact second, and playing stays within.
await tab.selectOption('#sample', 'broadcast.json');
for (const frame of [0, 1, 1799, 1800, 17982, 53945]) {
  await set('scrub', frame);
  const [, label, seconds] = /frame (\d+) · (\d+\/\d+) s/.exec(await text('time'));
  const [num, den] = seconds.split('/').map(BigInt);
  assert.equal(Number(label), frame);
  assert.equal(num * 30000n, BigInt(frame) * 1001n * den);
}
await tab.check('#drop');
await set('scrub', 1800);
assert.match(await text('time'), /^00:01:00;02 /);
await tab.uncheck('#drop');
await tab.click('#stop');
await tab.click('#play');
await tab.waitForFunction(() => Number(document.getElementById('scrub').value) > 3);
await tab.click('#play');
await tab.click('#forward');
assert.match(await text('time'), new RegExp(`frame ${await tab.inputValue('#scrub')} `));

// What is under the pointer, and what is selected, is what the program tells.
await tab.selectOption('#sample', 'space.json');
const sheet = JSON.parse(comp('--json', join(samples, 'space.json')));
for (const [x, y] of [[960, 540], [500, 540], [960, 900], [30, 30], [-100, 1000], [1, 500], [-1, 500]]) {
  await tab.mouse.move(...await onPage(x, y));
  await painted();
  const there = comp('--svg', join(folder, 'native.svg'), '--time', '0', '--hit', `${x},${y}`, join(samples, 'space.json'));
  const names = there.trim().split('\n').map((line) => line.split(',')[0]).filter((n) => n !== 'nothing');
  assert.deepEqual(await tab.locator('#hits button:first-child').allTextContents(), names, `${x},${y}`);
}
await tab.mouse.click(...await onPage(700, 900));
await painted();
assert.equal(await tab.inputValue('#number'), '3');
await tab.screenshot({ path: join(folder, 'layers.png') });
const floor = sheet.space.layers.find((l) => l.name === 'Floor');
assert.ok(alike((await exact('Corners from the eye')).map(Number), floor.cornersFromEye.flat()));
assert.deepEqual((await exact('In'))[1], `${sheet.layers[2].in.seconds.ratio} s`);
await tab.locator('#details dd button').nth(1).click();
assert.equal(await tab.evaluate(() => navigator.clipboard.readText()), (await exact('In'))[0]);

// The camera goes and comes back; a link keeps what is seen.
const before = await exact('Corners from the eye');
const [x, y] = await onPage(960, 540);
await tab.mouse.move(x, y);
await tab.mouse.down();
await tab.mouse.move(x + 80, y + 30, { steps: 4 });
await tab.mouse.up();
await tab.mouse.wheel(0, 100);
await painted();
const moved = await exact('Corners from the eye');
assert.notDeepEqual(moved, before);
await set('scrub', 40);
await tab.click('#link');
const link = tab.url();
await tab.focus('#stage');
await tab.keyboard.press('0');
await set('scrub', 0);
assert.deepEqual(await exact('Corners from the eye'), before);
await tab.goto('about:blank');
await tab.goto(link);
await painted();
assert.deepEqual([await tab.inputValue('#scrub'), await exact('Corners from the eye')], ['40', moved]);

// A file that is wrong is marked where it is wrong, and the picture stays.
await tab.click('#tabText');
const source = await tab.inputValue('#source');
for (const [from, to, place] of [['"zoom": 1800', '"zoom": -1', 'Line 3, column 65: '], ['"in": 0,', '"in": 0,,', 'Line 5, column 48: '],
  ['"size": [400, 300]', '"size": [400, "ü"]', 'Line 5, column 60: ']]) {
  assert.ok(source.includes(from));
  await set('source', source.replace(from, to));
  await tab.waitForFunction((p) => document.getElementById('place').textContent.startsWith(p), place);
  assert.equal(await tab.locator('#message').isVisible(), true);
  assert.equal(await tab.locator('#mark mark').count(), 1);
}
await tab.screenshot({ path: join(folder, 'text.png') });
await set('source', source.replace('"Card"', '"Karte"'));
await tab.waitForFunction(() => document.getElementById('message').hidden);

// What was there before is gone with its file; links that somebody made are no worse than none.
await tab.click('#tabLayer');
await tab.fill('#pointX', '960');
await tab.fill('#pointY', '900');
await painted();
assert.deepEqual(await tab.locator('#hits button:first-child').allTextContents(), ['Floor', 'Backdrop']);
await set('source', JSON.stringify({ ...JSON.parse(source), layers: [] }));
await painted();
await tab.selectOption('#sample', 'film.json');
await set('number', 1, 'change');
assert.deepEqual([await tab.locator('#hits li').count(), await exact('Corners on screen')], [0, undefined]);
for (const hash of ['null', '7', '{"name":{},"text":"{}","tolerance":{},"lane":"length"}', '{"name":"constructor"}', '%']) {
  await tab.goto('about:blank');
  await tab.goto(`file://${page}#${hash}`);
  await painted();
  assert.match(await tab.title(), /^Space/);
}

// Nothing in a file runs, or breaks the page.
const markup = '<img src=x onerror="alert(1)"></textarea><script>alert(2)</script>';
const layers = Array.from({ length: 100000 }, (_, i) => ({ name: `${i}`, timeBase: '1/600', in: i, out: i + 600, size: [9, 9], position: [i % 99, i % 77] }));
const composition = (name, list) => JSON.stringify({ name, frameRate: 24, start: 0, duration: 9, size: [100, 100], layers: list });
for (const [name, content, expected] of [
  ['markup.json', composition(markup, [{ ...layers[0], name: markup }]), null], ['long.json', composition('x'.repeat(1e6), []), null],
  ['many.json', composition('many', layers), null], ['broken.json', '{"name": ', /not JSON, or ends too soon/],
  ['nan.otio', '{"OTIO_SCHEMA": "Timeline.1", "name": "n", "metadata": NaN, "tracks": NaN}', null], [`${markup}.json`, '\xff\0', /not JSON/]]) {
  await open(name, content);
  if (expected) assert.match(await text('message'), expected);
  else await tab.waitForFunction((t) => document.title.startsWith(t), JSON.parse(content.replaceAll('NaN', '0')).name.slice(0, 100));
  assert.equal(await tab.locator('img, #right script').count(), 0);
}
await tab.evaluate(([name, content]) => {
  const dataTransfer = new DataTransfer();
  dataTransfer.items.add(new File([content], name));
  document.body.dispatchEvent(new DragEvent('drop', { dataTransfer, bubbles: true }));
}, ['dropped.otio', readFileSync(join(samples, 'harbour.otio'), 'utf8')]);
await tab.waitForFunction(() => document.title.startsWith('Harbour'));
await tab.focus('#lanes');
await tab.keyboard.press('ArrowDown');
await tab.keyboard.press('ArrowRight');
await tab.keyboard.press('ArrowRight');
await tab.click('#tabLayer');
assert.deepEqual((await exact('Name')), ['Gulls']);
await open('two.json', `{"OTIO_SCHEMA": "SerializableCollection.1", "children": [${['A', 'B'].map((n) => `{"OTIO_SCHEMA": "Timeline.1", "name": "${n}"}`)}]}`);
await tab.selectOption('#timeline', '1');
await tab.waitForFunction(() => document.title.startsWith('B '));

// Figures to be read, which decide nothing.
const inSpace = (count) => Array.from({ length: count }, (_, i) => ({
  name: `${i}`, sourceRate: 24, in: 0, out: 2400, size: [200, 150], position: [i * 97 % 1920, i * 61 % 1080, i * 37 % 1500],
  keys: [{ frame: 0, angles: [0, i * 7 % 360, 0] }, { frame: 2399, angles: [i * 11 % 360, 90, 20] }] }));
for (const count of [1000, 10000]) {
  await open('space.json', composition(`space ${count}`, inSpace(count)).replace('[100,100]', '[1920,1080]').replace(':9,', ':2400,'));
  console.log(count, 'layers:', await tab.evaluate(async () => {
    const stage = document.getElementById('stage'), box = stage.getBoundingClientRect();
    const frames = [], hits = [];
    document.getElementById('play').click();
    for (let i = 0, last = performance.now(); i < 60; ++i) {
      await new Promise((r) => { requestAnimationFrame(r); });
      frames.push(-last + (last = performance.now()));
    }
    document.getElementById('play').click();
    for (let i = 0; i < 60; ++i) {
      const event = new PointerEvent('pointermove', { clientX: box.left + 100 + 8 * i, clientY: box.top + 80 + 5 * i });
      const start = performance.now();
      stage.dispatchEvent(event);
      hits.push(performance.now() - start);
    }
    const median = (times) => `${times.sort((a, b) => a - b)[30].toFixed(1)} ms`;
    return `a frame in ${median(frames)}, a hit in ${median(hits)}`;
  }));
}

// Reports in other languages.
await tab.selectOption('#sample', 'sound.json');
await tab.click('#tabReports');
for (const [language, part] of [['de', 'Überlauf bei der'], ['ja', 'オーバーフロー: '], ['en', 'overflow in ratio']]) {
  await tab.selectOption('#language', language);
  await painted();
  assert.ok((await text('reports')).includes(part), language);
}
await tab.selectOption('#language', 'de');
await open('falsch.json', '{"name": 1}');
assert.match(await text('message'), /ist kein Text/);
await tab.selectOption('#language', 'en');
await tab.selectOption('#sample', 'space.json');

// The same bits.
await tab.click('#tabBits');
await tab.click('#run');
await tab.waitForFunction(() => document.getElementById('verdict').textContent.includes('0 differ.'), null, { timeout: 60000 });
assert.ok(Number.parseInt(await text('verdict'), 10) > 190);
await tab.screenshot({ path: join(folder, 'bits.png') });

// For all: names and roles, contrast in light and dark, and a narrow screen.
for (const [colorScheme, width] of [['light', 1280], ['dark', 400]]) {
  await tab.emulateMedia({ colorScheme });
  await tab.setViewportSize({ width, height: 800 });
  for (const id of ['tabLayer', 'tabText', 'tabReports', 'tabBits']) {
    await tab.click(`#${id}`);
    await tab.evaluate(readFileSync(require.resolve('axe-core/axe.min.js'), 'utf8'));
    const { violations } = await tab.evaluate(() => axe.run({ runOnly: ['wcag2a', 'wcag2aa', 'wcag21aa'] }));
    assert.deepEqual(violations.map((v) => [v.id, v.nodes.map((n) => n.html)]), []);
  }
  assert.ok(await tab.evaluate(() => document.documentElement.scrollWidth <= innerWidth), `wider than ${width}`);
}
assert.deepEqual(complaints, []);
await browser.close();
console.log('The viewer is as it should be.');
