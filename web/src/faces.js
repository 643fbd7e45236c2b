// Boxes of faces over the photo: shown, moved, sized, added and removed, by pointer and by keys.

export class FaceBoxes {
  /** @param changed  called with the faces and whether the change is complete. */
  constructor(overlay, changed) {
    this.overlay = overlay;
    this.changed = changed;
    this.faces = [];
  }

  /** @param faces  sides as fractions of the upright photo. */
  show(faces) {
    const focused = [...this.overlay.children].indexOf(document.activeElement);
    this.faces = faces.map((face) => ({ ...face }));
    this.overlay.replaceChildren(...this.faces.map((face, i) => this.boxOf(face, i)));
    if (focused >= 0) this.overlay.children[Math.min(focused, this.faces.length - 1)]?.focus();
  }

  add() {
    this.show([...this.faces, { left: 0.4, top: 0.3, right: 0.6, bottom: 0.6, name: "" }]);
    this.overlay.lastElementChild.focus();
    this.changed(this.faces, true);
  }

  place(box, face) {
    Object.assign(box.style, {
      left: `${100 * face.left}%`, top: `${100 * face.top}%`,
      width: `${100 * (face.right - face.left)}%`, height: `${100 * (face.bottom - face.top)}%`,
    });
  }

  boxOf(face, i) {
    const box = document.createElement("div");
    const label = document.createElement("span");
    label.textContent = face.name || `Face ${i + 1}`;
    const corner = document.createElement("i");
    box.className = "face";
    box.tabIndex = 0;
    box.setAttribute("role", "group");
    box.setAttribute("aria-label",
      `${label.textContent}: arrow keys move the box, with Shift they size it, Delete removes it`);
    box.append(label, corner);
    this.place(box, face);

    const change = (dx, dy, sizing) => {
      if (sizing) {
        face.right = Math.max(face.left + 0.01, face.right + dx);
        face.bottom = Math.max(face.top + 0.01, face.bottom + dy);
      } else {
        const x = Math.min(Math.max(dx, -face.left), 1 - face.right);
        const y = Math.min(Math.max(dy, -face.top), 1 - face.bottom);
        face.left += x;
        face.right += x;
        face.top += y;
        face.bottom += y;
      }
      this.place(box, face);
    };
    let from = null;
    box.addEventListener("pointerdown", (event) => {
      if (event.button > 0) return;
      box.setPointerCapture(event.pointerId);
      box.focus();
      from = { x: event.clientX, y: event.clientY, sizing: event.target === corner };
      event.stopPropagation();
      event.preventDefault();
    });
    box.addEventListener("pointermove", (event) => {
      if (from === null) return;
      const { width, height } = this.overlay.getBoundingClientRect();
      change((event.clientX - from.x) / width, (event.clientY - from.y) / height, from.sizing);
      Object.assign(from, { x: event.clientX, y: event.clientY });
      this.changed(this.faces, false);
    });
    for (const end of ["pointerup", "pointercancel"]) {
      box.addEventListener(end, () => {
        if (from !== null) this.changed(this.faces, true);
        from = null;
      });
    }
    box.addEventListener("keydown", (event) => {
      const steps = { ArrowLeft: [-1, 0], ArrowRight: [1, 0], ArrowUp: [0, -1], ArrowDown: [0, 1] };
      if (event.key in steps) {
        const [x, y] = steps[event.key];
        change(x * 0.01, y * 0.01, event.shiftKey);
      } else if (event.key === "Delete" || event.key === "Backspace") {
        this.faces.splice(this.faces.indexOf(face), 1);
        this.show(this.faces);
      } else {
        return;
      }
      event.preventDefault();
      event.stopPropagation();
      this.changed(this.faces, true);
    });
    return box;
  }
}
