// The picture: what the library puts on the screen, drawn, and the camera by mouse, touch and keys.

const kColors = ['#4e79a7', '#f28e2b', '#e15759', '#76b7b2', '#59a14f', '#edc948', '#b07aa1', '#9c755f'];
export const colorOf = (number) => kColors[number % kColors.length];

const kMostNames = 300; // Names and edges of more layers than that are no help.

// The flat list of Viewer.shapes() as records.
function parse(numbers) {
  const shapes = [];
  for (let i = 0; i < numbers.length;) {
    const [number, flags, count] = numbers.subarray(i, i + 3);
    i += 3;
    const shape = { number, isEdgeOn: (flags & 1) !== 0, points: numbers.slice(i, i + 2 * count), cut: null };
    i += 2 * count;
    if (flags & 2) {
      shape.cut = numbers.slice(i, i + 4);
      i += 4;
    }
    shapes.push(shape);
  }
  return shapes;
}

function trace(context, points, isClosed = true) {
  context.beginPath();
  for (let i = 0; i < points.length; i += 2) context.lineTo(points[i], points[i + 1]);
  if (isClosed) context.closePath();
}

export class Stage {
  // `on` has pointed(x, y), left(), picked(), moved().
  constructor(canvas, viewer, on) {
    this.canvas = canvas;
    this.viewer = viewer;
    this.on = on;
    this.shapes = [];
    this.options = { hull: false, bounds: false, names: true };
    this.size = null;
    this.pointers = new Map();
    for (const [type, handler] of Object.entries({
      pointerdown: (e) => this.down(e), pointermove: (e) => this.move(e), pointerup: (e) => this.up(e),
      pointercancel: (e) => this.up(e), pointerleave: () => on.left(), keydown: (e) => this.key(e),
    })) canvas.addEventListener(type, handler);
    canvas.addEventListener('wheel', (e) => {
      if (e.ctrlKey) return;
      e.preventDefault();
      this.camera(() => viewer.dolly(Math.exp(Math.max(-500, Math.min(500, e.deltaY)) / 500)));
    }, { passive: false });
  }

  open(file) {
    this.names = file.names;
    this.size = file.size;
    this.shapes = [];
  }

  camera(change) {
    if (!this.size) return;
    change();
    this.on.moved();
  }

  // Pixels of the screen a pixel of the frame, and where the frame's corner is.
  layout() {
    const ratio = window.devicePixelRatio || 1;
    const { clientWidth, clientHeight } = this.canvas;
    const width = Math.round(clientWidth * ratio), height = Math.round(clientHeight * ratio);
    if (this.canvas.width !== width || this.canvas.height !== height) Object.assign(this.canvas, { width, height });
    if (!this.size) return null;
    const [w, h] = this.size;
    const scale = Math.min(width / w, height / h) / 1.4;
    return { ratio, width, height, scale, x: (width - w * scale) / 2, y: (height - h * scale) / 2 };
  }

  update(frame) {
    this.shapes = this.size ? parse(this.viewer.shapes(frame)) : [];
    this.hull = this.options.hull && this.size ? this.viewer.hull().slice() : [];
  }

  draw(selected, hit, tolerance) {
    const place = this.layout();
    const context = this.canvas.getContext('2d', { alpha: false });
    const style = getComputedStyle(document.documentElement);
    const color = (name) => style.getPropertyValue(name);
    context.setTransform(1, 0, 0, 1, 0, 0);
    context.fillStyle = color('--back');
    context.fillRect(0, 0, this.canvas.width, this.canvas.height);
    if (!place) {
      context.fillStyle = color('--quiet');
      context.font = `${16 * (window.devicePixelRatio || 1)}px sans-serif`;
      context.fillText('Without a size there is nothing to be seen.', 20, 40);
      return;
    }
    const [w, h] = this.size;
    const line = place.ratio / place.scale;
    context.setTransform(place.scale, 0, 0, place.scale, place.x, place.y);
    context.lineJoin = 'round';
    context.fillStyle = color('--frame');
    context.fillRect(0, 0, w, h);
    for (const shape of this.shapes) {
      context.strokeStyle = context.fillStyle = colorOf(shape.number);
      trace(context, shape.points, !shape.isEdgeOn);
      context.lineWidth = (shape.isEdgeOn ? 2.5 : 1) * line;
      if (!shape.isEdgeOn) {
        context.globalAlpha = 0.6;
        context.fill();
        context.globalAlpha = 1;
      }
      if (shape.isEdgeOn || this.shapes.length <= kMostNames) context.stroke();
      if (shape.cut) {
        context.strokeStyle = color('--bad');
        context.lineWidth = 3 * line;
        trace(context, shape.cut, false);
        context.stroke();
      }
    }
    // What is outside the frame is dimmed.
    context.fillStyle = color('--veil');
    context.beginPath();
    const around = 2 * Math.max(w, h);
    context.rect(-around, -around, w + 2 * around, h + 2 * around);
    context.rect(0, 0, w, h);
    context.fill('evenodd');
    context.strokeStyle = color('--text');
    context.lineWidth = 1.5 * line;
    context.strokeRect(0, 0, w, h);
    if (this.options.bounds) this.drawBounds(context, line, color);
    if (this.hull.length) {
      context.lineWidth = 2 * line;
      context.strokeStyle = color('--quiet');
      trace(context, this.hull);
      context.stroke();
    }
    for (const [number, width] of [[selected, 3], [hit, 2]]) {
      const shape = this.shapes.find((s) => s.number === number);
      if (!shape) continue;
      context.strokeStyle = color('--text');
      context.lineWidth = width * line;
      context.setLineDash(width === 2 ? [6 * line, 4 * line] : []);
      trace(context, shape.points, !shape.isEdgeOn);
      context.stroke();
      context.setLineDash([]);
      if (number !== hit || tolerance === 0) continue;
      // How far beside it a hit may be.
      context.globalAlpha = 0.25;
      context.lineWidth = 2 * tolerance;
      context.stroke();
      context.globalAlpha = 1;
    }
    if (this.options.names && this.shapes.length <= kMostNames) this.drawNames(context, place, color);
  }

  drawBounds(context, line, color) {
    context.strokeStyle = color('--accent');
    context.lineWidth = line;
    for (const { points } of this.shapes) {
      const xs = points.filter((_, i) => i % 2 === 0), ys = points.filter((_, i) => i % 2 === 1);
      const left = Math.min(...xs), top = Math.min(...ys);
      context.strokeRect(left, top, Math.max(...xs) - left, Math.max(...ys) - top);
    }
  }

  // None on another: the ones in front first.
  drawNames(context, place, color) {
    context.setTransform(1, 0, 0, 1, 0, 0);
    const size = 12 * place.ratio;
    context.font = `${size}px sans-serif`;
    context.textAlign = 'center';
    context.lineWidth = 3 * place.ratio;
    context.strokeStyle = color('--frame');
    context.fillStyle = color('--text');
    const taken = [];
    for (const { number, points } of [...this.shapes].reverse()) {
      if (points.length === 0) continue;
      let x = 0, y = 0;
      for (let i = 0; i < points.length; i += 2) x += points[i], y += points[i + 1];
      x = place.x + (2 * x / points.length) * place.scale;
      y = place.y + (2 * y / points.length) * place.scale;
      const given = this.names[number].slice(0, 40);
      const name = given.length > 24 ? `${given.slice(0, 23)}…` : given;
      const half = context.measureText(name).width / 2;
      for (const step of [0, 1, -1, 2, -2]) {
        const box = [x - half, y + (step - 1) * size * 1.2, x + half, y + step * size * 1.2];
        if (taken.some((b) => b[0] < box[2] && box[0] < b[2] && b[1] < box[3] && box[1] < b[3])) continue;
        taken.push(box);
        context.strokeText(name, x, box[3] - 0.2 * size);
        context.fillText(name, x, box[3] - 0.2 * size);
        break;
      }
    }
    context.textAlign = 'start';
  }

  // A point of the page as a point of the frame.
  toFrame(event) {
    const place = this.layout();
    if (!place) return null;
    return [(event.offsetX * place.ratio - place.x) / place.scale, (event.offsetY * place.ratio - place.y) / place.scale];
  }

  down(event) {
    if (event.button > 1) return;
    this.canvas.setPointerCapture(event.pointerId);
    this.pointers.set(event.pointerId, [event.clientX, event.clientY]);
    this.distance = 0;
    this.canvas.focus();
  }

  move(event) {
    const last = this.pointers.get(event.pointerId);
    const at = this.toFrame(event);
    if (at) this.on.pointed(...at);
    if (!last) return;
    const dx = event.clientX - last[0], dy = event.clientY - last[1];
    const others = [...this.pointers].filter(([id]) => id !== event.pointerId).map(([, point]) => point);
    this.pointers.set(event.pointerId, [event.clientX, event.clientY]);
    this.distance += Math.hypot(dx, dy);
    const place = this.layout();
    const unit = place ? place.ratio / place.scale : 1;
    this.camera(() => {
      if (others.length > 0) {
        const away = (x, y) => Math.max(1, Math.hypot(x - others[0][0], y - others[0][1]));
        this.viewer.dolly(away(...last) / away(event.clientX, event.clientY));
        this.viewer.pan(-dx * unit / 2, -dy * unit / 2);
      } else if (event.shiftKey || event.buttons === 4) {
        this.viewer.pan(-dx * unit, -dy * unit);
      } else {
        this.viewer.orbit(dx / 4, dy / 4);
      }
    });
  }

  up(event) {
    if (!this.pointers.delete(event.pointerId)) return;
    const at = this.toFrame(event);
    if (this.distance < 4 && at && event.type === 'pointerup') this.on.picked(...at);
  }

  key(event) {
    if (event.ctrlKey || event.altKey || event.metaKey) return;
    const arrows = { ArrowLeft: [-1, 0], ArrowRight: [1, 0], ArrowUp: [0, -1], ArrowDown: [0, 1] };
    const arrow = arrows[event.key];
    const changes = { '+': () => this.viewer.dolly(0.9), '=': () => this.viewer.dolly(0.9), '-': () => this.viewer.dolly(1 / 0.9),
      0: () => this.viewer.resetCamera() };
    const change = arrow
      ? () => (event.shiftKey ? this.viewer.pan(20 * arrow[0], 20 * arrow[1]) : this.viewer.orbit(5 * arrow[0], 5 * arrow[1]))
      : changes[event.key];
    if (!change) return;
    event.preventDefault();
    this.camera(change);
  }
}
