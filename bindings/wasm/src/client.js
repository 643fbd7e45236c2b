// The page's side of worker.js.
import { QuenbyError } from "./errors.js";

/** A worker with the module in it. One request is at work at a time; of requests with the same topic only
 *  the newest waits, and those that it takes the place of end with `undefined`. */
export class QuenbyWorker {
  constructor(url = new URL("./worker.js", import.meta.url)) {
    this.worker = new Worker(url, { type: "module" });
    this.waiting = [];
    this.current = null;
    this.next = 0;
    this.worker.onmessage = ({ data }) => this.answered(data);
    this.worker.onerror = (event) =>
      this.broken(event.message || "the worker could not be loaded");
  }

  /** @param options  `topic`: see above; `transfer`: what goes to the worker for good. */
  call(name, given = [], { topic, transfer = [] } = {}) {
    return new Promise((resolve, reject) => {
      if (this.error) return reject(this.error);
      const request = { name, given, topic, transfer, resolve, reject };
      const place = topic === undefined ? -1 : this.waiting.findIndex((other) => other.topic === topic);
      if (place < 0) {
        this.waiting.push(request);
      } else {
        this.waiting[place].resolve(undefined);
        this.waiting[place] = request;
      }
      this.send();
    });
  }

  send() {
    if (this.current !== null || this.waiting.length === 0) return;
    this.current = this.waiting.shift();
    const { name, given, transfer } = this.current;
    try {
      this.worker.postMessage({ id: ++this.next, call: name, given }, transfer);
    } catch (error) {
      this.settle((request) => request.reject(error));
    }
  }

  answered({ error, result }) {
    if (error?.kind === "broken") return this.broken(error.message);
    this.settle(({ resolve, reject }) =>
      error ? reject(new QuenbyError(error.kind, error.message)) : resolve(result));
  }

  settle(end) {
    const request = this.current;
    this.current = null;
    if (request) end(request);
    this.send();
  }

  // Ends what waits, too: a new worker is for the caller to make.
  broken(message) {
    this.error = new QuenbyError("failed", `the engine stopped: ${message}`);
    this.worker.terminate();
    const left = [this.current, ...this.waiting];
    this.current = null;
    this.waiting = [];
    for (const request of left) request?.reject(this.error);
  }

  terminate() {
    this.broken("it was ended");
  }
}
