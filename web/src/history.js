// The edits of one photo, from the first on.

export class History {
  constructor(first) {
    this.edits = [first];
    this.at = 0;
  }
  get edit() {
    return this.edits[this.at];
  }
  /** Another edit; what was undone is gone. */
  add(edit) {
    if (JSON.stringify(edit) === JSON.stringify(this.edit)) return;
    this.edits.splice(this.at + 1, Infinity, edit);
    ++this.at;
  }
  get canUndo() {
    return this.at > 0;
  }
  get canRedo() {
    return this.at + 1 < this.edits.length;
  }
  undo() {
    if (this.canUndo) --this.at;
  }
  redo() {
    if (this.canRedo) ++this.at;
  }
}
