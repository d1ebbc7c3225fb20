// Time: a lane for each layer or track, with the playhead. Only what is in view is drawn.

import { colorOf } from './stage.js';

const kLane = 20, kHead = 18, kLabel = 110;
const kKinds = { clip: '#7fa8d6', gap: null, transition: '#b04070', stack: '#e3b466' };

export class Lanes {
  // `on` has seeked(frame), selected(lane, item).
  constructor(canvas, on) {
    this.canvas = canvas;
    this.on = on;
    this.lanes = [];
    this.top = 0;
    canvas.addEventListener('wheel', (e) => {
      e.preventDefault();
      this.scroll(this.top + e.deltaY);
    }, { passive: false });
    let isSeeking = false;
    const seek = (e) => on.seeked(this.frameAt(e.clientX - canvas.getBoundingClientRect().left));
    canvas.addEventListener('pointerdown', (e) => {
      canvas.setPointerCapture(e.pointerId);
      canvas.focus();
      const y = e.clientY - canvas.getBoundingClientRect().top;
      if (y >= kHead) this.pick(Math.floor((y - kHead + this.top) / kLane), e);
      isSeeking = true;
      seek(e);
    });
    canvas.addEventListener('pointermove', (e) => isSeeking && seek(e));
    for (const type of ['pointerup', 'pointercancel']) canvas.addEventListener(type, () => { isSeeking = false; });
  }

  // Each lane: {name, items: [{name, kind, in, out}]}, in frames from the start.
  open(lanes, duration) {
    this.lanes = lanes;
    this.duration = Math.max(1, duration);
    this.scroll(0);
  }

  scroll(top) {
    const most = Math.max(0, this.lanes.length * kLane - this.canvas.clientHeight + kHead);
    this.top = Math.max(0, Math.min(most, top));
    this.on.scrolled();
  }

  show(lane) {
    const y = lane * kLane, room = this.canvas.clientHeight - kHead - kLane;
    if (y < this.top) this.scroll(y);
    else if (y > this.top + room) this.scroll(y - room);
  }

  pick(lane, event) {
    if (lane >= this.lanes.length) return;
    const at = this.frameAt(event.clientX - this.canvas.getBoundingClientRect().left);
    const item = this.lanes[lane].items.findLastIndex((i) => i.in <= at && at < i.out);
    this.on.selected(lane, item);
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
      for (const item of this.lanes[lane].items) {
        const left = x(item.in), right = x(item.out);
        const fill = item.kind === 'layer' ? colorOf(lane) : kKinds[item.kind];
        context.strokeStyle = color('--line');
        context.globalAlpha = item.kind === 'transition' ? 0.6 : 1;
        if (fill) {
          context.fillStyle = fill;
          context.fillRect(left, y + 2, Math.max(1, right - left - 1), kLane - 4);
        } else {
          context.strokeRect(left + 0.5, y + 2.5, Math.max(1, right - left - 2), kLane - 5);
        }
        context.globalAlpha = 1;
        if (item.kind !== 'layer' && item.kind !== 'gap' && right - left > 30) {
          context.fillStyle = '#111';
          context.fillText(item.name.slice(0, Math.floor((right - left) / 6)), left + 3, y + 14);
        }
      }
    }
    context.restore();
    context.fillStyle = color('--bad');
    context.fillRect(x(frame) - 1, 0, 2, height);
  }
}
