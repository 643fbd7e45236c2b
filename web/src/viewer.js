// What of the photo is seen: zoom, place, the divider. Canvases are drawn by the worker; here they are
// only moved, which costs it nothing.

const clamp = (x, low, high) => Math.min(Math.max(x, low), high);

export class Viewer extends EventTarget {
  constructor(stage) {
    super();
    this.stage = stage;
    this.before = stage.querySelector("#before");
    this.after = stage.querySelector("#after");
    this.detailBefore = stage.querySelector("#detail-before");
    this.detailAfter = stage.querySelector("#detail-after");
    this.overlay = stage.querySelector("#faces");
    this.divider = stage.querySelector("#divider");
    this.seen = stage.querySelector("#seen");
    Object.assign(this, { width: 0, height: 0, zoom: 1, x: 0, y: 0, share: 0.5, fitted: true });
    this.pointers = new Map();
    this.listen();
    new ResizeObserver(() => this.fitted ? this.fit() : this.place()).observe(stage);
  }

  /** Shows a photo of this size whole. */
  show(width, height, preview) {
    Object.assign(this, { width, height, preview });
    this.hideDetail();
    this.fit();
  }

  get ratio() {
    return devicePixelRatio || 1;
  }
  get fitZoom() {
    const { clientWidth, clientHeight } = this.stage;
    return Math.min(clientWidth / this.width, clientHeight / this.height, 1 / this.ratio) || 1;
  }
  get atFullSize() {
    return this.zoom * this.ratio >= 1 - 1e-9;
  }

  fit() {
    if (this.width === 0) return;
    this.zoom = this.fitZoom;
    this.fitted = true;
    this.place();
  }

  /** @param x, y  the point of the stage that stays where it is; its middle unless given. */
  zoomTo(zoom, x = this.stage.clientWidth / 2, y = this.stage.clientHeight / 2) {
    const wanted = clamp(zoom, this.fitZoom, 8 / this.ratio);
    const factor = wanted / this.zoom;
    this.x = x - (x - this.x) * factor;
    this.y = y - (y - this.y) * factor;
    this.zoom = wanted;
    this.fitted = wanted === this.fitZoom;
    this.place();
  }

  toFullSize() {
    this.zoomTo(1 / this.ratio);
  }

  move(dx, dy) {
    this.x += dx;
    this.y += dy;
    this.place();
  }

  place() {
    const { clientWidth, clientHeight } = this.stage;
    const width = this.width * this.zoom;
    const height = this.height * this.zoom;
    // Smaller than the stage it stands in the middle, larger it has no gap.
    // On whole pixels of the screen, since others would be mixed of two of the photo's.
    const whole = (at) => Math.round(at * this.ratio) / this.ratio;
    const within = (at, size, room) => whole(size <= room ? (room - size) / 2 : clamp(at, room - size, 0));
    this.x = within(this.x, width, clientWidth);
    this.y = within(this.y, height, clientHeight);
    for (const canvas of [this.before, this.after]) {
      canvas.style.width = `${width}px`;
      canvas.style.height = `${height}px`;
      canvas.style.transform = `translate(${this.x}px, ${this.y}px)`;
      canvas.classList.toggle("exact", this.zoom * this.ratio >= 4);
    }
    Object.assign(this.overlay.style, {
      width: `${width}px`, height: `${height}px`, transform: `translate(${this.x}px, ${this.y}px)`,
    });
    this.placeDetail();
    this.placeDivider();
    this.dispatchEvent(new Event("placed"));
  }

  /** The part of the photo that is visible, in its pixels. */
  get part() {
    const { clientWidth, clientHeight } = this.stage;
    const x = Math.max(0, Math.floor(-this.x / this.zoom));
    const y = Math.max(0, Math.floor(-this.y / this.zoom));
    return {
      x, y,
      width: Math.max(1, Math.min(this.width - x, Math.ceil(clientWidth / this.zoom) + 1)),
      height: Math.max(1, Math.min(this.height - y, Math.ceil(clientHeight / this.zoom) + 1)),
    };
  }

  /** The worker has drawn a part at 1:1; null: it has not any more. */
  showDetail(part) {
    this.detail = part;
    for (const canvas of [this.detailBefore, this.detailAfter]) canvas.hidden = part === null;
    this.placeDetail();
    this.placeDivider();
  }
  hideDetail() {
    this.showDetail(null);
  }
  placeDetail() {
    if (!this.detail) return;
    for (const canvas of [this.detailBefore, this.detailAfter]) {
      canvas.style.width = `${this.detail.width * this.zoom}px`;
      canvas.style.height = `${this.detail.height * this.zoom}px`;
      canvas.style.transform =
        `translate(${this.x + this.detail.x * this.zoom}px, ${this.y + this.detail.y * this.zoom}px)`;
      canvas.classList.toggle("exact", this.zoom * this.ratio >= 2);
    }
  }

  get comparing() {
    return this.stage.classList.contains("comparing");
  }
  set comparing(value) {
    this.stage.classList.toggle("comparing", value);
    this.placeDivider();
  }
  divide(share) {
    this.share = clamp(share, 0, 1);
    this.placeDivider();
  }
  // From the photo's left edge or the stage's, whichever is further right, and likewise at the right.
  get dividable() {
    const left = Math.max(0, this.x);
    return [left, Math.min(this.stage.clientWidth, this.x + this.width * this.zoom) - left];
  }
  placeDivider() {
    const [left, room] = this.dividable;
    const at = left + this.share * room;
    this.divider.style.left = `${at}px`;
    this.divider.setAttribute("aria-valuenow", Math.round(100 * this.share));
    this.divider.setAttribute("aria-valuetext", `${Math.round(100 * this.share)} % before`);
    const cut = (canvas, x) => {
      canvas.style.clipPath = this.comparing ? `inset(0 0 0 ${Math.max(0, at - x)}px)` : "";
    };
    cut(this.after, this.x);
    if (this.detail) cut(this.detailAfter, this.x + this.detail.x * this.zoom);
  }

  listen() {
    const { stage, divider } = this;
    const at = (event) => {
      const box = stage.getBoundingClientRect();
      return [event.clientX - box.left, event.clientY - box.top];
    };
    stage.addEventListener("wheel", (event) => {
      event.preventDefault();
      this.zoomTo(this.zoom * Math.exp(-event.deltaY * (event.ctrlKey ? 0.01 : 0.002)), ...at(event));
    }, { passive: false });
    stage.addEventListener("dblclick", (event) => {
      if (event.target.closest(".face, #divider")) return;
      if (this.atFullSize) this.fit();
      else this.zoomTo(1 / this.ratio, ...at(event));
    });
    stage.addEventListener("pointerdown", (event) => {
      if (event.target.closest(".face, #divider") || event.button > 0) return;
      stage.setPointerCapture(event.pointerId);
      this.pointers.set(event.pointerId, at(event));
      stage.classList.add("moving");
    });
    stage.addEventListener("pointermove", (event) => {
      const last = this.pointers.get(event.pointerId);
      if (last === undefined) return;
      const now = at(event);
      const others = [...this.pointers].filter(([id]) => id !== event.pointerId);
      if (others.length === 0) {
        this.move(now[0] - last[0], now[1] - last[1]);
      } else { // two fingers: what lies between them grows with their distance
        const [other] = others[0].slice(1);
        const far = (point) => Math.hypot(point[0] - other[0], point[1] - other[1]) || 1;
        this.zoomTo(this.zoom * (far(now) / far(last)), (now[0] + other[0]) / 2, (now[1] + other[1]) / 2);
        this.move((now[0] - last[0]) / 2, (now[1] - last[1]) / 2);
      }
      this.pointers.set(event.pointerId, now);
    });
    for (const end of ["pointerup", "pointercancel"]) {
      stage.addEventListener(end, (event) => {
        this.pointers.delete(event.pointerId);
        if (this.pointers.size === 0) stage.classList.remove("moving");
      });
    }
    stage.addEventListener("keydown", (event) => {
      if (event.target !== stage || event.ctrlKey || event.metaKey || event.altKey) return;
      const steps = { ArrowLeft: [60, 0], ArrowRight: [-60, 0], ArrowUp: [0, 60], ArrowDown: [0, -60] };
      if (!(event.key in steps)) return;
      event.preventDefault();
      this.move(...steps[event.key]);
    });

    const divideAt = (event) => {
      const [left, room] = this.dividable;
      this.divide((at(event)[0] - left) / room);
    };
    divider.addEventListener("pointerdown", (event) => {
      divider.setPointerCapture(event.pointerId);
      divider.focus({ preventScroll: true });
      divideAt(event);
    });
    divider.addEventListener("pointermove", (event) => {
      if (divider.hasPointerCapture(event.pointerId)) divideAt(event);
    });
    divider.addEventListener("keydown", (event) => {
      const step = event.shiftKey ? 0.1 : 0.02;
      const to = {
        ArrowLeft: this.share - step, ArrowDown: this.share - step, ArrowRight: this.share + step,
        ArrowUp: this.share + step, Home: 0, End: 1,
      }[event.key];
      if (to === undefined) return;
      event.preventDefault();
      this.divide(to);
    });
  }
}
