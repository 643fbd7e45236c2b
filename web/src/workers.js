// The worker that has the photo shown, and those that help with many.
import { QuenbyWorker } from "./quenby/client.js";

const script = new URL("./quenby/worker.js", import.meta.url);
let main = null;
let helpers = [];
let viewer, broken, restarted;

export const mainWorker = () => main;

/** Starts the main worker, which draws on the viewer's canvases. @param events  broken: called when it has
 *  stopped, restarted: when another one has taken its place. @returns version, build, filters */
export function start(shown, events) {
  viewer = shown;
  ({ broken, restarted } = events);
  return startMain();
}

// A canvas goes to a worker for good: another worker needs others.
async function startMain() {
  main = new QuenbyWorker(script);
  const canvases = {};
  for (const name of ["before", "after", "detailBefore", "detailAfter"]) {
    let canvas = viewer[name];
    if (canvas.given) {
      canvas = canvas.cloneNode();
      viewer[name].replaceWith(canvas);
      viewer[name] = canvas;
    }
    canvas.given = true;
    canvases[name] = canvas.transferControlToOffscreen();
  }
  main.call("attach", [canvases], { transfer: Object.values(canvases) });
  return main.call("start");
}

/** The main worker's answer; after it has broken, another one takes its place. */
export async function ask(name, given, options) {
  const asked = main;
  try {
    return await asked.call(name, given, options);
  } catch (error) {
    if (asked.error && asked === main) {
      broken();
      await startMain();
      restarted();
    }
    throw error;
  }
}

/** What the main worker keeps of a photo goes. */
export function forget(photo) {
  void main.call("close", [photo.id]).catch(() => {});
}

/** The one of the other workers that has the least to do. */
export function helper() {
  const most = Math.max(1, Math.min(4, (navigator.hardwareConcurrency || 2) - 1));
  helpers = helpers.filter((one) => !one.error);
  const idle = helpers.find((one) => one.current === null);
  if (idle) return idle;
  if (helpers.length < most) helpers.push(new QuenbyWorker(script));
  return helpers.reduce((best, one) => one.waiting.length < best.waiting.length ? one : best, helpers.at(-1));
}
