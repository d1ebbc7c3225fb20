// Digests of all functions of the library in this browser, beside those that are recorded.

import recorded from '../examples/digest/expected.txt';
import { $, element } from './dom.js';

const kRecorded = new Map(recorded.trim().split('\n').map((line) => {
  const space = line.indexOf(' ');
  return [line.slice(space + 1), line.slice(0, space)];
}));

// An area at a time, so that the page goes on meanwhile.
export async function compare(viewer) {
  $('run').disabled = true;
  $('digests').replaceChildren();
  let same = 0, libm = 0, other = 0;
  for (let area = 0; ; ++area) {
    $('verdict').textContent = `Area ${area + 1} …`;
    await new Promise((resolve) => { setTimeout(resolve); });
    const text = viewer.digests(area);
    if (text === '') break;
    for (const line of text.trim().split('\n')) {
      const [, digest, name, usesLibm] = /^(\S+) (.*?)( libm)?$/.exec(line);
      const expected = kRecorded.get(name);
      const isSame = digest === expected;
      same += isSame;
      libm += !isSame && Boolean(usesLibm);
      other += !isSame && !usesLibm;
      $('digests').append(element('tr', { class: isSame ? '' : usesLibm ? 'libm' : 'differs' },
        element('td', {}, name), element('td', {}, digest),
        element('td', {}, isSame ? 'the same' : usesLibm ? `${expected} (other sines)` : String(expected))));
    }
  }
  $('verdict').textContent = `${same} functions give the recorded bits, ${libm} pass through other sines, ` +
    `${other} ${other === 1 ? 'differs' : 'differ'}.`;
  $('run').disabled = false;
}
