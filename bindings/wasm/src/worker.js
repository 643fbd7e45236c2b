// A module worker that holds one photo: requests come as { id, call, arguments }, answers go as
// { id, result } or { id, error }. QuenbyWorker (client.js) speaks with it.
import { load, QuenbyError } from "./quenby.js";

const mostPreviewPixels = 1_000_000;
/** Above it, the whole picture's session would not leave room for anything else in 1 GiB. */
const mostFullPixels = 40_000_000;

let loading;
const photos = new Map();
let canvases = {};

const quenbyOf = () => (loading ??= load());

// The smallest decoding that has enough pixels, then exactly the size that is wanted: what is shown while
// a slider moves.
function previewOf(quenby, file, facts, most) {
  const pixels = facts.width * facts.height;
  let scale = 1;
  while (scale < 8 && pixels / (4 * scale * scale) >= most) scale *= 2;
  const photo = quenby.open(file, { scale });
  const share = Math.sqrt(most / (photo.width * photo.height));
  if (share >= 1) return { photo, picture: null, width: photo.width, height: photo.height };
  const width = Math.max(1, Math.round(photo.width * share));
  const height = Math.max(1, Math.round(photo.height * share));
  const from = new OffscreenCanvas(photo.width, photo.height);
  from.getContext("2d").putImageData(new ImageData(photo.data, photo.width, photo.height), 0, 0);
  const to = new OffscreenCanvas(width, height).getContext("2d", { willReadFrequently: true });
  to.imageSmoothingQuality = "high";
  to.drawImage(from, 0, 0, width, height);
  return { photo, picture: to.getImageData(0, 0, width, height), width, height };
}

const key = (faces) => JSON.stringify(faces);

// The session on the preview with these faces; another one when they have changed.
function previewSession(entry, faces) {
  if (entry.session && entry.facesOfSession === key(faces)) return entry.session;
  entry.session?.close();
  entry.session = entry.quenby.session(
    { data: previewData(entry), width: entry.width, height: entry.height }, faces);
  entry.facesOfSession = key(faces);
  return entry.session;
}

const previewData = (entry) => entry.picture?.data ?? entry.photo.data;

function entryOf(photo) {
  const entry = photos.get(photo);
  if (entry === undefined) throw new QuenbyError("invalid-argument", "this photo is not open");
  return entry;
}

function draw(canvas, data, width, height) {
  if (!canvas) return;
  if (canvas.width !== width || canvas.height !== height) Object.assign(canvas, { width, height });
  canvas.context ??= canvas.getContext("2d");
  canvas.context.putImageData(new ImageData(data, width, height), 0, 0);
}

// A part of a picture at 1:1.
function drawPart(canvas, data, width, height, part) {
  if (!canvas) return;
  if (canvas.width !== part.width || canvas.height !== part.height) {
    Object.assign(canvas, { width: part.width, height: part.height });
  }
  canvas.context ??= canvas.getContext("2d");
  canvas.context.putImageData(new ImageData(data, width, height), -part.x, -part.y, part.x, part.y,
    part.width, part.height);
}

// The faces that count: the file's own, unless the caller has changed them.
const facesOf = (entry, edit) => edit.faces ?? entry.faces;

function fullSession(entry, edit) {
  if (entry.facts.width * entry.facts.height > mostFullPixels) {
    throw new QuenbyError("too-large",
      `the picture at its full size is shown up to ${mostFullPixels / 1e6} megapixels; saving knows no such limit`);
  }
  const faces = facesOf(entry, edit);
  if (entry.full && entry.facesOfFull !== key(faces)) closeFull(entry);
  if (!entry.full) {
    const photo = entry.quenby.open(entry.file, { ignoreKnownFaces: true });
    try {
      entry.full = { photo, session: photo.session(faces), applied: "" };
    } catch (error) {
      photo.close();
      throw error;
    }
    entry.facesOfFull = key(faces);
  }
  return entry.full;
}

function closeFull(entry) {
  entry.full?.session.close();
  entry.full?.photo.close();
  entry.full = undefined;
}

function applyFull(entry, edit) {
  const full = fullSession(entry, edit);
  const wanted = `${edit.filter} ${edit.parameters}`;
  if (full.applied !== wanted) {
    full.applied = "";
    full.data = full.session.apply(edit.filter, edit.parameters);
    full.applied = wanted;
  }
  // Memory may have grown since.
  full.data = new Uint8ClampedArray(entry.quenby.bytes.buffer, full.session.output,
    4 * full.session.width * full.session.height);
  return full;
}

function histogramOf(data) {
  const bins = [new Uint32Array(256), new Uint32Array(256), new Uint32Array(256)];
  for (let i = 0; i < data.length; i += 4) {
    for (let channel = 0; channel < 3; ++channel) ++bins[channel][data[i + channel]];
  }
  return bins;
}

// What becomes of each level of light, on the average; NaN where the picture has none.
function toneCurveOf(before, after) {
  const sums = new Float64Array(256);
  const counts = new Float64Array(256);
  const luma = (data, i) => (54 * data[i] + 183 * data[i + 1] + 19 * data[i + 2]) >> 8;
  for (let i = 0; i < before.length; i += 4) {
    const from = luma(before, i);
    sums[from] += luma(after, i);
    ++counts[from];
  }
  return Float32Array.from(sums, (sum, i) => (counts[i] < 8 ? NaN : sum / counts[i]));
}

const calls = {
  async start() {
    const quenby = await quenbyOf();
    return { version: quenby.version, build: quenby.build, filters: quenby.filters() };
  },

  /** Canvases to draw on: before, after; detailBefore, detailAfter at 1:1. */
  async attach(given) {
    canvases = given;
  },

  async open(photo, bytes, most = mostPreviewPixels) {
    const quenby = await quenbyOf();
    const file = new Uint8Array(bytes);
    const facts = quenby.facts(file);
    const entry = { quenby, file, facts, ...previewOf(quenby, file, facts, most) };
    const { faces, notices } = entry.photo;
    entry.faces = faces.map(({ left, top, right, bottom, name }) => ({ left, top, right, bottom, name }));
    if (entry.picture) entry.photo.close();
    const turned = facts.orientation >= 5;
    const size = turned ? [facts.height, facts.width] : [facts.width, facts.height];
    photos.set(photo, entry);
    return {
      facts, faces: entry.faces, notices, width: size[0], height: size[1],
      preview: { width: entry.width, height: entry.height },
      canBeSeenWhole: facts.width * facts.height <= mostFullPixels,
    };
  },

  async close(photo) {
    const entry = photos.get(photo);
    if (entry === undefined) return;
    entry.session?.close();
    closeFull(entry);
    entry.photo.close();
    photos.delete(photo);
  },

  /** The preview of before, once. */
  async show(photo) {
    const entry = entryOf(photo);
    draw(canvases.before, previewData(entry), entry.width, entry.height);
  },

  /** The preview with an edit. @returns milliseconds of filter and canvas. */
  async render(photo, edit) {
    const entry = entryOf(photo);
    const start = performance.now();
    const data = previewSession(entry, facesOf(entry, edit)).apply(edit.filter, edit.parameters);
    const filtered = performance.now();
    draw(canvases.after, data, entry.width, entry.height);
    return { filter: filtered - start, draw: performance.now() - filtered };
  },

  /** A part of the whole picture at 1:1, in its pixels. @returns true: it was drawn. */
  async detail(photo, edit, part) {
    const entry = entryOf(photo);
    const full = applyFull(entry, edit);
    const { width, height } = full.photo;
    drawPart(canvases.detailBefore, full.photo.data, width, height, part);
    drawPart(canvases.detailAfter, full.data, width, height, part);
    return true;
  },

  async forgetDetail(photo) {
    const entry = photos.get(photo);
    if (entry) closeFull(entry);
  },

  /** Histograms and tone curve of the preview with an edit. */
  async analyse(photo, edit) {
    const entry = entryOf(photo);
    const after = previewSession(entry, facesOf(entry, edit)).apply(edit.filter, edit.parameters);
    const before = previewData(entry);
    return {
      before: histogramOf(before), after: histogramOf(after), curve: toneCurveOf(before, after),
    };
  },

  /** NIQE at the full size, as the command scores. */
  async score(photo, edit) {
    const entry = entryOf(photo);
    const full = applyFull(entry, edit);
    return { before: full.photo.score(), after: full.session.score() };
  },

  /** Small pictures of several edits. */
  async thumbnails(photo, edits, side = 160) {
    const entry = entryOf(photo);
    const share = Math.min(1, side / Math.max(entry.width, entry.height));
    const width = Math.max(1, Math.round(entry.width * share));
    const height = Math.max(1, Math.round(entry.height * share));
    const from = new OffscreenCanvas(entry.width, entry.height);
    from.getContext("2d").putImageData(new ImageData(new Uint8ClampedArray(previewData(entry)),
      entry.width, entry.height), 0, 0);
    const small = new OffscreenCanvas(width, height).getContext("2d", { willReadFrequently: true });
    small.drawImage(from, 0, 0, width, height);
    const picture = small.getImageData(0, 0, width, height);
    const session = entry.quenby.session(picture, facesOf(entry, edits[0] ?? {}));
    try {
      return edits.map((edit) =>
        new ImageData(session.apply(edit.filter, edit.parameters).slice(), width, height));
    } finally {
      session.close();
    }
  },

  /** The file that the command makes. */
  async save(bytes, { filter, parameters, faces }, options = {}) {
    const quenby = await quenbyOf();
    const open = faces ? { ...options.open, ignoreKnownFaces: true } : options.open;
    const made = quenby.filterFile(new Uint8Array(bytes), filter, parameters,
      { ...options, open, faces: faces ?? [] });
    return { ...made, memory: quenby.bytes.length };
  },

  /** What near-duplicates are found by, and a small picture for a strip. */
  async survey(bytes, side = 160) {
    const quenby = await quenbyOf();
    const file = new Uint8Array(bytes);
    const shot = quenby.shot(file);
    const facts = quenby.facts(file);
    const preview = previewOf(quenby, file, facts, side * side);
    const data = new Uint8ClampedArray(preview.picture?.data ?? preview.photo.data);
    preview.photo.close();
    return { shot, facts, picture: new ImageData(data, preview.width, preview.height) };
  },

  async duplicates(shots, threshold) {
    return (await quenbyOf()).duplicates(shots, threshold);
  },

  async selftest() {
    return (await quenbyOf()).selftest();
  },
};

function told(error) {
  if (error instanceof QuenbyError) return { kind: error.kind, message: error.message };
  if (error instanceof RangeError) return { kind: "out-of-memory", message: "not enough memory" };
  // The module itself has failed: nothing of it can be trusted from here on.
  return { kind: "broken", message: String(error?.message ?? error) };
}

function transferable(result) {
  if (result?.bytes) return [result.bytes.buffer];
  if (result?.picture) return [result.picture.data.buffer];
  return [];
}

// One after the other, also those that wait for the module.
let last = Promise.resolve();
onmessage = ({ data: { id, call, given } }) => {
  last = last.then(async () => {
    try {
      const result = await calls[call](...given);
      postMessage({ id, result }, transferable(result));
    } catch (error) {
      postMessage({ id, error: told(error) });
    }
  });
};
