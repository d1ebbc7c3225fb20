// The file as text, with a mark where it is wrong.

import { $, element } from './dom.js';

export class Editor {
  // `changed(text)` is called a moment after the last key.
  constructor(changed) {
    this.area = $('source');
    this.mark = $('mark');
    let timer;
    this.area.addEventListener('input', () => {
      clearTimeout(timer);
      timer = setTimeout(() => changed(this.area.value), 150);
    });
    this.area.addEventListener('scroll', () => this.follow());
  }

  follow() {
    this.mark.scrollTop = this.area.scrollTop;
    this.mark.scrollLeft = this.area.scrollLeft;
  }

  set text(text) {
    this.area.value = text;
    this.show(null);
  }
  get text() { return this.area.value; }

  // Where, from 1; or null for nowhere. Columns count bytes, as the library does.
  show(error) {
    $('place').textContent = error ? error.error : '';
    this.mark.replaceChildren();
    if (!error || !error.line) return;
    const lines = this.area.value.split('\n');
    const line = lines[error.line - 1] ?? '';
    const bytes = new TextEncoder().encode(line);
    const before = new TextDecoder().decode(bytes.subarray(0, error.column - 1));
    const rest = line.slice(before.length) || ' ';
    this.mark.append(`${'\n'.repeat(error.line - 1)}`,
      element('span', { class: 'line' }, before, element('mark', {}, rest)),
      '\n'.repeat(Math.max(0, lines.length - error.line)));
    $('place').textContent = `Line ${error.line}, column ${before.length + 1}: ${error.error}`;
    this.follow();
  }
}
