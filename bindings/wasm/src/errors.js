/** Why something could not be done: `kind` for programs, `message` for people. */
export class QuenbyError extends Error {
  constructor(kind, message) {
    super(message);
    this.name = "QuenbyError";
    this.kind = kind;
  }
}
