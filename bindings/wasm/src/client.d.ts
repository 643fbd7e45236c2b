export { QuenbyError } from "./quenby.js";

/** A worker with the module in it, worker.js. One request is at work at a time; of requests with the same
 *  topic only the newest waits, and those that it takes the place of end with `undefined`. */
export class QuenbyWorker {
  constructor(url?: string | URL);
  /** Why the worker has ended, if it has: a new one is for the caller to make. */
  readonly error?: Error;
  /** @param name  start, attach, open, show, render, detail, analyse, score, thumbnails, save, survey,
   *               duplicates, selftest, close: docs/web.md tells what each takes and gives. */
  call(name: string, given?: unknown[], options?: { topic?: string; transfer?: Transferable[] }): Promise<any>;
  terminate(): void;
}
