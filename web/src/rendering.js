// The photo as it is edited: the preview while something moves, then what is measured of it, and the pixels
// of the full size where they are looked at.
import { drawCurve, drawHistogram } from "./charts.js";
import { $ } from "./dom.js";
import { forWorker } from "./edits.js";
import { edit, isWhole, state } from "./state.js";
import { complain, failed } from "./telling.js";
import { Viewer } from "./viewer.js";
import { ask } from "./workers.js";

export const viewer = new Viewer($("stage"));
/** How long each frame took, for measuring. */
export const frames = [];
let settles;

export function render(complete) {
  const photo = state.current;
  if (!photo?.info) return;
  viewer.hideDetail();
  const start = performance.now();
  ask("render", [photo.id, forWorker(edit())], { topic: "render" }).then((took) => {
    if (took) frames.push({ ...took, at: performance.now(), whole: performance.now() - start });
    if (frames.length > 1000) frames.length = 0;
  }).catch(failed);
  seen();
  clearTimeout(settles);
  settles = setTimeout(settle, complete ? 30 : 200);
}

export async function settle() {
  const photo = state.current;
  if (!photo?.info) return;
  try {
    detail();
    const found = await ask("analyse", [photo.id, forWorker(edit())], { topic: "analyse" });
    if (!found || photo !== state.current) return;
    drawHistogram($("histogram"), found.before, found.after);
    drawCurve($("curve"), found.curve);
  } catch (error) {
    failed(error);
  }
}

let detailFails = "";
function detail() {
  const photo = state.current;
  if (!photo?.info || isWhole(photo) || !viewer.atFullSize) return;
  const part = viewer.part;
  const wanted = edit();
  ask("detail", [photo.id, forWorker(wanted), part], { topic: "detail" }).then((drawn) => {
    if (drawn === undefined || photo !== state.current || wanted !== edit()) return;
    viewer.showDetail(part);
    seen();
  }).catch((error) => {
    if (detailFails !== `${photo.id}`) complain(`${photo.name}: ${error.message}`);
    detailFails = `${photo.id}`;
  });
}

let places;
viewer.addEventListener("placed", () => {
  if (!state.current?.info) return;
  clearTimeout(places);
  if (viewer.atFullSize) places = setTimeout(detail, 60);
  else if (viewer.detail) viewer.hideDetail();
  seen();
});

function seen() {
  const { info } = state.current;
  const percent = `${Math.round(100 * viewer.zoom * viewer.ratio)} %`;
  $("seen").textContent = isWhole(state.current) || (viewer.detail && viewer.atFullSize)
    ? `Full size, ${percent}`
    : viewer.atFullSize ? `Preview, ${percent}; the full size follows`
      : `Preview, ${info.preview.width} × ${info.preview.height} of ${info.width} × ${info.height}`;
}
