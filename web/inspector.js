// All about the selected layer or item, with numbers that can be copied to the last digit.

import { element } from './dom.js';

// Six digits to be read; all of them to be copied.
const short = (number) => (Number.isInteger(number) ? String(number) : String(Number(number.toPrecision(7))));

function button(text, exact) {
  const b = element('button', { type: 'button', title: `Copy ${exact}` }, text);
  b.dataset.exact = exact;
  return b;
}

const exactly = (number) => (Object.is(number, -0) ? '-0' : String(number));
const one = (value) => (typeof value === 'number' ? button(short(value), exactly(value)) : button(value, value));

// Numbers in rows. JSON has no infinite ones.
function cells(value) {
  if (value === null) return ['not finite'];
  if (!Array.isArray(value)) return [one(value)];
  if (value.every((v) => !Array.isArray(v) && v !== null)) return value.map(one);
  return value.map((row) => element('div', {}, ...cells(row)));
}

function row(list, name, value) {
  list.append(element('dt', {}, name), element('dd', {}, ...cells(value)));
}

function timeRows(list, name, time) {
  if (time.overflow || time.seconds === null) return row(list, name, 'overflow');
  const mark = (time.isExact ?? time.exact) ? '' : '~';
  row(list, name, [time.timecode, `${mark}${time.seconds} s`,
    `frame ${(time.isWholeFrame ?? time.wholeFrame) ? '' : '~'}${time.frame}`]);
}

const kLayerRows = [
  ['size', 'Size'], ['matrix', 'Matrix'], ['translate', 'Moved by'], ['scale', 'Scaled by'], ['shear', 'Sheared by xy, xz, yz'],
  ['anglesXYZ', 'Turned x, y, z (°)'], ['anglesZYX', 'in the other order (°)'], ['quaternion', 'Quaternion x, y, z, w'],
  ['eye', 'Corners from the eye'], ['crossings', 'Cut at'], ['screen', 'Corners on screen'],
];

// A number with its button, for lists elsewhere.
export const copyable = (number, unit) => button(`${short(number)} ${unit}`, exactly(number));

export function showLayer(parent, layer) {
  const list = element('dl');
  row(list, 'Name', layer.name.slice(0, 200));
  for (const [key, name] of [['in', 'In'], ['out', 'Out'], ['duration', 'Duration']]) timeRows(list, name, layer[key]);
  for (const [key, name] of kLayerRows) {
    const value = layer[key];
    if (value !== undefined && !(Array.isArray(value) && value.length === 0)) row(list, name, value);
  }
  if (layer.eye && !layer.translate) row(list, 'Parts', 'The matrix cannot be taken apart.');
  parent.replaceChildren(list);
}

export function showItem(parent, item) {
  const list = element('dl');
  row(list, 'Name', item.name.slice(0, 200));
  row(list, 'Kind', item.kind);
  for (const [key, name] of [['recordIn', 'Record in'], ['recordOut', 'Record out'], ['sourceIn', 'Source in'], ['sourceOut', 'Source out']]) {
    timeRows(list, name, item[key]);
  }
  row(list, 'Speed', item.speed ?? 'unknown');
  if (item.size) row(list, 'Size', item.size);
  parent.replaceChildren(list);
}
