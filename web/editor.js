// The file as text, with a mark where it is wrong.

import { $, element } from './dom.js';

const kMost = 2_000_000; // Of a file in the pane.

export class Editor {
  // `changed(text)` is called a moment after the last key.
  constructor(changed) {
    this.area = $('source');
    this.mark = $('mark');
    let timer;
    this.area.addEventListener('input', () => {
      clearTimeout(timer);
      timer = setTimeout(() => {
        this.shown = this.area.value;
        changed(this.shown);
      }, 150);
    });
    this.area.addEventListener('scroll', () => this.follow());
  }

  follow() {
    this.mark.firstChild?.style?.setProperty('transform', `translate(${-this.area.scrollLeft}px, ${-this.area.scrollTop}px)`);
  }

  set text(text) {
    this.shown = text;
    this.area.value = text.length <= kMost ? text : '';
    this.area.disabled = text.length > kMost;
    this.show(null);
  }
  get text() { return this.shown; }

  // Where, from 1, and what; or null for nothing. Columns count characters.
  show(error, isNew = false) {
    const isTooLarge = this.area.disabled;
    $('place').textContent = isTooLarge ? 'The file is too large for this pane.' : '';
    this.mark.replaceChildren();
    if (!error) return;
    const where = error.line ? `Line ${error.line}, column ${error.column}: ` : '';
    $('place').textContent = `${where}${error.error.slice(0, 500)} ${isTooLarge ? $('place').textContent : ''}`;
    if (!error.line || isTooLarge) return;
    const lines = this.area.value.split('\n');
    const characters = [...(lines[error.line - 1] ?? '')];
    const before = characters.slice(0, error.column - 1).join(''), rest = characters.slice(error.column - 1).join('') || ' ';
    this.mark.append(element('div', {}, '\n'.repeat(error.line - 1),
      element('span', { class: 'line' }, before, element('mark', {}, rest)), '\n'));
    if (isNew) {
      const height = this.area.scrollHeight / Math.max(1, lines.length);
      this.area.scrollTop = Math.max(0, (error.line - 5) * height);
    }
    this.follow();
  }
}
