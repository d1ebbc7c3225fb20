// Time: a lane for each layer or track, with the playhead. Only what is in view is drawn.

import { colorOf } from './stage.js';

const kLane = 20, kHead = 18, kLabel = 110;
const kKinds = { clip: '#7fa8d6', gap: null, transition: '#e7a1c4', stack: '#e3b466' };

export class Lanes {
  // `on` has seeked(frame), selected(lane, item).
  constructor(canvas, on) {
    this.canvas = canvas;
    this.on = on;
    this.lanes = [];
    this.top = 0;
    canvas.addEventListener('wheel', (e) => {
      if (this.scroll(this.top + e.deltaY)) e.preventDefault();
    }, { passive: false });
    // A finger that goes up or down scrolls; all else seeks.
    let grip = null;
    canvas.addEventListener('pointerdown', (e) => {
      if (e.button !== 0) return;
      canvas.setPointerCapture(e.pointerId);
      canvas.focus();
      grip = { x: e.offsetX, y: e.offsetY, top: this.top, isFinger: e.pointerType === 'touch', way: '' };
      if (!grip.isFinger) this.press(e);
    });
    canvas.addEventListener('pointermove', (e) => {
      if (!grip) return;
      const dx = e.offsetX - grip.x, dy = e.offsetY - grip.y;
      if (grip.isFinger && !grip.way && Math.hypot(dx, dy) > 8) grip.way = Math.abs(dy) > Math.abs(dx) ? 'scrolls' : 'seeks';
      if (grip.way === 'scrolls') this.scroll(grip.top - dy);
      else if (e.offsetX >= kLabel && (grip.way || !grip.isFinger)) on.seeked(this.frameAt(e.offsetX));
    });
    canvas.addEventListener('pointerup', (e) => {
      if (grip?.isFinger && !grip.way) this.press(e);
      grip = null;
    });
    canvas.addEventListener('pointercancel', () => { grip = null; });
  }

  press(event) {
    if (event.offsetY >= kHead) this.pick(Math.floor((event.offsetY - kHead + this.top) / kLane), event.offsetX);
    if (event.offsetX >= kLabel) this.on.seeked(this.frameAt(event.offsetX));
  }

  // Each lane: {name, items: [{name, kind, in, out}], markers: [{in}]}, in frames from the start.
  open(lanes, duration) {
    this.lanes = lanes;
    this.duration = Math.max(1, duration);
    this.scroll(0);
  }

  // Whether there was anything to scroll.
  scroll(top) {
    const most = Math.max(0, this.lanes.length * kLane - this.canvas.clientHeight + kHead);
    const before = this.top;
    this.top = Math.max(0, Math.min(most, top));
    this.on.scrolled();
    return this.top !== before;
  }

  show(lane) {
    const y = lane * kLane, room = this.canvas.clientHeight - kHead - kLane;
    if (y < this.top) this.scroll(y);
    else if (y > this.top + room) this.scroll(y - room);
  }

  pick(lane, x) {
    if (lane >= this.lanes.length) return;
    const at = this.frameAt(x), { items } = this.lanes[lane];
    const holds = (i) => i.in <= at && at < i.out;
    const joined = items.findIndex((i) => i.kind === 'transition' && holds(i));
    this.on.selected(lane, x < kLabel ? -1 : joined >= 0 ? joined : items.findLastIndex(holds));
  }

  get room() { return Math.max(1, this.canvas.clientWidth - kLabel - 8); }
  frameAt(x) { return Math.floor(((x - kLabel) / this.room) * this.duration); }

  draw(frame, selected, timecode) {
    const ratio = window.devicePixelRatio || 1;
    const { clientWidth: width, clientHeight: height } = this.canvas;
    Object.assign(this.canvas, { width: Math.round(width * ratio), height: Math.round(height * ratio) });
    const context = this.canvas.getContext('2d');
    const style = getComputedStyle(document.documentElement);
    const color = (name) => style.getPropertyValue(name);
    context.scale(ratio, ratio);
    const x = (f) => kLabel + Math.max(0, Math.min(1, f / this.duration)) * this.room;
    context.font = '11px sans-serif';
    context.fillStyle = color('--quiet');
    const marks = Math.max(1, Math.floor(this.room / 110));
    for (let i = 0; i <= marks; ++i) {
      const at = Math.floor((this.duration * i) / marks);
      context.fillRect(x(at), 0, 1, kHead - 4);
      if (i < marks) context.fillText(timecode(at), x(at) + 3, 11);
    }
    context.save();
    context.beginPath();
    context.rect(0, kHead, width, height - kHead);
    context.clip();
    const first = Math.floor(this.top / kLane), last = Math.min(this.lanes.length, first + Math.ceil(height / kLane) + 1);
    for (let lane = first; lane < last; ++lane) {
      const y = kHead + lane * kLane - this.top;
      if (lane === selected) {
        context.fillStyle = color('--panel');
        context.fillRect(0, y, width, kLane);
      }
      context.fillStyle = color('--text');
      context.fillText(this.lanes[lane].name.slice(0, 40), 4, y + 14, kLabel - 10);
      const { items, markers } = this.lanes[lane];
      // Transitions lie on what they join.
      for (const areJoints of [false, true]) {
        let covered = -1;
        for (const item of items) {
          if ((item.kind === 'transition') !== areJoints) continue;
          const left = x(item.in), right = x(item.out);
          if (right < covered + 0.5) continue;
          covered = Math.max(right, left + 1);
          const fill = item.kind === 'layer' ? colorOf(lane) : kKinds[item.kind];
          context.strokeStyle = color('--line');
          context.fillStyle = fill;
          if (fill) context.fillRect(left, y + 2, Math.max(1, right - left - 1), kLane - 4);
          else context.strokeRect(left + 0.5, y + 2.5, Math.max(1, right - left - 2), kLane - 5);
          if (item.kind !== 'layer' && item.kind !== 'gap' && right - left > 30) {
            context.fillStyle = '#111';
            context.fillText(item.name.slice(0, Math.floor((right - left) / 6)), left + 3, y + 14);
          }
        }
      }
      context.fillStyle = color('--bad');
      for (const marker of markers) {
        context.beginPath();
        for (const [dx, dy] of [[-4, 0], [4, 0], [0, 7]]) context.lineTo(x(marker.in) + dx, y + dy);
        context.fill();
      }
    }
    context.restore();
    context.fillStyle = color('--bad');
    context.fillRect(x(frame) - 1, 0, 2, height);
  }
}
