// The page: photos, their edits, and what is shown of them. All work on pixels is the workers'.
import { drawCurve, drawHistogram } from "./charts.js";
import { FaceBoxes } from "./faces.js";
import { History } from "./history.js";
import { QuenbyWorker } from "./quenby/client.js";
import { parameterText } from "./quenby/parameters.js";
import { Viewer } from "./viewer.js";
import { zipOf } from "./zip.js";

const $ = (id) => document.getElementById(id);
const viewer = new Viewer($("stage"));
const photos = [];
let current = null;
let filters = [];
let worker = null;
let helpers = [];
let nextPhoto = 0;

// ---- What is told ----

let statusEnds;
function tell(text, list = []) {
  clearTimeout(statusEnds);
  $("status").textContent = text;
  if (list.length > 0) {
    const items = document.createElement("ul");
    items.append(...list.map((line) => Object.assign(document.createElement("li"), { textContent: line })));
    $("status").append(items);
  }
  if (text !== "") statusEnds = setTimeout(() => tell(""), 4000 + 2500 * list.length);
}

function complain(text) {
  const line = document.createElement("p");
  const close = Object.assign(document.createElement("button"), { textContent: "OK" });
  close.addEventListener("click", () => line.remove());
  line.append(Object.assign(document.createElement("span"), { textContent: text }), close);
  $("problems").append(line);
  while ($("problems").children.length > 5) $("problems").firstElementChild.remove();
}

// ---- Workers ----

// A canvas goes to a worker for good: another worker needs others.
async function startWorker() {
  worker = new QuenbyWorker();
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
  worker.call("attach", [canvases], { transfer: Object.values(canvases) });
  const { version, build, filters: all } = await worker.call("start");
  filters = all;
  $("version").textContent = version;
  $("build").textContent = build === "simd"
    ? "This browser runs it with vectors (WebAssembly SIMD)."
    : "This browser has no vectors for WebAssembly: the results are the same, and take longer.";
  makeLooks();
}

/** The main worker's answer; after it has broken, another one takes its place. */
async function ask(name, given, options) {
  const asked = worker;
  try {
    return await asked.call(name, given, options);
  } catch (error) {
    if (asked.error && asked === worker) {
      if (current) current.info = undefined; // until it is open again
      await startWorker();
      if (current) void openCurrent();
    }
    throw error;
  }
}

function helper() {
  const most = Math.max(1, Math.min(4, (navigator.hardwareConcurrency || 2) - 1));
  helpers = helpers.filter((one) => !one.error);
  const idle = helpers.find((one) => one.current === null);
  if (idle) return idle;
  if (helpers.length < most) helpers.push(new QuenbyWorker());
  return helpers.reduce((best, one) => one.waiting.length < best.waiting.length ? one : best,
    helpers.at(-1));
}

// ---- Photos ----

function add(files) {
  const added = [...files].map((file) => ({ id: ++nextPhoto, file, name: file.name || "photo.jpg" }));
  if (added.length === 0) return;
  photos.push(...added);
  const before = current;
  void select(added[0]);
  if (photos.length > 1) {
    for (const photo of before === null || photos.length > added.length ? photos : added) {
      if (!photo.surveyed) void survey(photo);
    }
  }
  update();
}

async function survey(photo) {
  photo.surveyed = true;
  try {
    const bytes = await photo.file.arrayBuffer();
    const found = await helper().call("survey", [bytes], { transfer: [bytes] });
    photo.shot = found.shot;
    photo.picture = found.picture;
    await mark();
  } catch (error) {
    if (photos.includes(photo) && photo !== current) drop(photo, error);
  }
  update();
}

// Which photos are shots of one scene a moment apart.
async function mark() {
  const seen = photos.filter((photo) => photo.shot);
  if (seen.length < 2) return;
  const firstOf = await helper().call("duplicates", [seen.map((photo) => photo.shot), 1.5]);
  const sizes = new Map();
  for (const first of firstOf) sizes.set(first, (sizes.get(first) ?? 0) + 1);
  const groups = [...sizes].filter(([, size]) => size > 1).map(([first]) => first);
  seen.forEach((photo, i) => {
    const place = groups.indexOf(firstOf[i]);
    photo.group = place < 0 ? null : place + 1;
  });
}

/** A photo that cannot be read goes, with the reason. */
function drop(photo, error) {
  complain(`${photo.name}: ${error.message}`);
  const at = photos.indexOf(photo);
  if (at >= 0) photos.splice(at, 1);
  if (photo === current) {
    current = null;
    if (photos.length > 0) void select(photos[Math.min(at, photos.length - 1)]);
  }
  update();
}

async function select(photo) {
  if (current?.info) void worker.call("close", [current.id]).catch(() => {});
  current = photo;
  update();
  await openCurrent();
}

async function openCurrent() {
  const photo = current;
  document.body.classList.add("busy");
  try {
    const bytes = await photo.file.arrayBuffer();
    if (photo !== current) return;
    const info = await ask("open", [photo.id, bytes], { transfer: [bytes] });
    if (photo !== current) {
      void worker.call("close", [photo.id]);
      return;
    }
    photo.info = info;
    photo.history ??= new History(firstEdit());
    viewer.show(info.width, info.height, info.preview);
    boxes.show(photo.history.edit.faces ?? info.faces);
    await ask("show", [photo.id]);
    showEdit();
    tellFacts();
    if (info.notices.length > 0) tell(photo.name, info.notices);
    await thumbnails();
  } catch (error) {
    if (photos.includes(photo)) drop(photo, error);
  } finally {
    document.body.classList.remove("busy");
  }
}

// ---- Edits ----

const filterNamed = (name) => filters.find((filter) => filter.name === name);
const standard = (row) => row.kind === "boolean" ? row.standard === 1 : row.standard;
const shown = (row) =>
  row.kind === "boolean" ||
  (row.kind === "number" && row.standard !== null && Number.isFinite(row.lowest));
const firstEdit = () => editOf("AE0");

function editOf(name) {
  const values = {};
  for (const row of filterNamed(name).parameters.filter(shown)) values[row.name] = standard(row);
  return { filter: name, values, faces: null };
}

/** What the filter is given: what it requires and what is not as it would be anyway. */
function textOf({ filter, values }) {
  const given = {};
  for (const row of filterNamed(filter).parameters) {
    const value = values[row.name];
    if (value === undefined || (!row.required && value === standard(row))) continue;
    given[row.name] = row.kind !== "boolean" ? value
      : row.wanted.includes("true") ? value : Number(value);
  }
  return parameterText(given);
}

const forWorker = (edit) => ({ filter: edit.filter, parameters: textOf(edit), faces: edit.faces });

// What is shown now: the history's, or on the way to the next one.
let live = null;
const edit = () => live ?? current.history.edit;

function change(next, complete) {
  live = next;
  if (complete) {
    current.history.add(next);
    live = null;
    update();
  }
  render(complete);
}

function showEdit() {
  live = null;
  boxes.show(edit().faces ?? current.info.faces);
  for (const radio of document.querySelectorAll("#looks input")) {
    radio.checked = radio.value === edit().filter;
    if (radio.checked) intoView(radio.parentElement);
  }
  makeSettings();
  update();
  render(true);
}

// ---- Rendering ----

const frames = [];
let settles;

function render(complete) {
  const photo = current;
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

async function settle() {
  const photo = current;
  if (!photo?.info) return;
  try {
    detail();
    const found = await ask("analyse", [photo.id, forWorker(edit())], { topic: "analyse" });
    if (!found || photo !== current) return;
    drawHistogram($("histogram"), found.before, found.after);
    drawCurve($("curve"), found.curve);
  } catch (error) {
    failed(error);
  }
}

const isWhole = ({ info }) => info.preview.width === info.width && info.preview.height === info.height;

let detailFails = "";
function detail() {
  const photo = current;
  if (!photo?.info || isWhole(photo) || !viewer.atFullSize) return;
  const part = viewer.part;
  const wanted = edit();
  ask("detail", [photo.id, forWorker(wanted), part], { topic: "detail" }).then((drawn) => {
    if (drawn === undefined || photo !== current || wanted !== edit()) return;
    viewer.showDetail(part);
    seen();
  }).catch((error) => {
    if (detailFails !== `${photo.id}`) complain(`${photo.name}: ${error.message}`);
    detailFails = `${photo.id}`;
  });
}

let places;
viewer.addEventListener("placed", () => {
  if (!current?.info) return;
  clearTimeout(places);
  if (viewer.atFullSize) places = setTimeout(detail, 60);
  else if (viewer.detail) viewer.hideDetail();
  seen();
});

function seen() {
  const { info } = current;
  const percent = `${Math.round(100 * viewer.zoom * viewer.ratio)} %`;
  $("seen").textContent = isWhole(current) || (viewer.detail && viewer.atFullSize)
    ? `Full size, ${percent}`
    : viewer.atFullSize ? `Preview, ${percent}; the full size follows`
      : `Preview, ${info.preview.width} × ${info.preview.height} of ${info.width} × ${info.height}`;
}

function failed(error) {
  if (error.told) return; // calls that ended with their worker end with one error
  error.told = true;
  complain(`${current?.name ?? "Quenby"}: ${error.message}`);
}

// ---- Looks and settings ----

function labelOf(filter) {
  const twice = filters.filter((other) => other.displayName === filter.displayName).length > 1;
  return twice && /8bit$/.test(filter.name) ? `${filter.displayName}, 8 bits` : filter.displayName;
}

function makeLooks() {
  const rank = ({ name }) => ["AE0", "AE08bit", "PassThrough"].indexOf(name) + 1 || 9;
  const order = [...filters].sort((a, b) => rank(a) - rank(b));
  $("looks").replaceChildren($("looks").querySelector("legend"), ...order.map((filter) => {
    const label = document.createElement("label");
    const radio = Object.assign(document.createElement("input"),
      { type: "radio", name: "look", value: filter.name });
    const canvas = Object.assign(document.createElement("canvas"), { width: 4, height: 3 });
    canvas.setAttribute("aria-hidden", "true");
    label.className = "look";
    label.title = filter.description;
    label.append(radio, canvas,
      Object.assign(document.createElement("span"), { textContent: labelOf(filter) }));
    radio.addEventListener("change", () => {
      const { faces } = edit();
      change({ ...(current.kept?.[filter.name] ?? editOf(filter.name)), faces }, true);
      makeSettings();
      intoView(label);
    });
    return label;
  }));
}

// In the row that looks are on a narrow page; nothing else moves.
function intoView(look) {
  const row = $("looks");
  row.scrollLeft = look.offsetLeft - row.offsetLeft - (row.clientWidth - look.clientWidth) / 2;
}

async function thumbnails() {
  const photo = current;
  const looks = [...document.querySelectorAll(".look")];
  const edits = looks.map((look) =>
    ({ ...forWorker(editOf(look.querySelector("input").value)), faces: edit().faces }));
  const pictures = await ask("thumbnails", [photo.id, edits], { topic: "thumbnails" });
  if (!pictures || photo !== current) return;
  looks.forEach((look, i) => paint(look.querySelector("canvas"), pictures[i]));
  document.body.classList.add("looks-shown");
}

function paint(canvas, picture) {
  Object.assign(canvas, { width: picture.width, height: picture.height });
  canvas.getContext("2d").putImageData(picture, 0, 0);
}

const titles = { slider: "Strength", maskAlpha: "Vignette", maskRadius: "Vignette radius", applyMask: "With a vignette",
  gtmOnly: "One tone curve for the whole photo", gtmExtraMemory: "" };

function makeSettings() {
  const filter = filterNamed(edit().filter);
  // What it cannot do without, then what switches others on, then those.
  const rank = (row) => row.required ? 0 : row.kind === "boolean" ? 1 : row.onlyWith ? 2 : 0;
  const rows = filter.parameters.filter((row) => shown(row) && titles[row.name] !== "")
    .sort((a, b) => rank(a) - rank(b));
  $("settings").replaceChildren(...rows.map((row) => row.kind === "boolean" ? tick(row) : range(row)));
}

function set(row, value, complete) {
  const next = { ...edit(), values: { ...edit().values, [row.name]: value } };
  (current.kept ??= {})[next.filter] = next;
  change(next, complete);
}

function range(row) {
  const box = document.createElement("div");
  const id = `setting-${row.name}`;
  box.className = "setting";
  const label = Object.assign(document.createElement("label"),
    { htmlFor: id, textContent: titles[row.name] || row.name, title: row.description });
  const highest = Number.isFinite(row.highest) ? row.highest : 4;
  const input = Object.assign(document.createElement("input"), {
    type: "range", id, min: row.aboveLowest ? 0.01 : row.lowest, max: highest, step: 0.01,
  });
  input.value = edit().values[row.name];
  input.title = row.description;
  const output = Object.assign(document.createElement("output"), { value: Number(input.value).toFixed(2) });
  output.htmlFor = id;
  input.addEventListener("input", () => {
    output.value = Number(input.value).toFixed(2);
    set(row, Number(input.value), false);
  });
  input.addEventListener("change", () => set(row, Number(input.value), true));
  box.append(label, output, input);
  return box;
}

function tick(row) {
  const label = document.createElement("label");
  label.className = "check";
  label.title = row.description;
  const input = Object.assign(document.createElement("input"),
    { type: "checkbox", checked: edit().values[row.name], id: `setting-${row.name}` });
  input.addEventListener("change", () => set(row, input.checked, true));
  label.append(input, titles[row.name] || row.name);
  return label;
}

// ---- Faces ----

const boxes = new FaceBoxes($("faces"), (faces, complete) => {
  const plain = faces.map(({ left, top, right, bottom, name }) => ({ left, top, right, bottom, name }));
  change({ ...edit(), faces: plain }, complete);
  if (complete) void thumbnails().catch(failed);
});
$("add-face").addEventListener("click", () => boxes.add());
$("own-faces").addEventListener("click", () => {
  change({ ...edit(), faces: null }, true);
  boxes.show(current.info.faces);
});
$("face-panel").addEventListener("toggle", () => update());

// ---- The file ----

function tellFacts() {
  const { facts, width, height } = current.info;
  const rows = [
    ["Name", current.name],
    ["Size", `${width} × ${height}, ${(current.file.size / 1e6).toFixed(2)} MB`],
    ["Format", facts.format + (facts.progressive ? ", progressive" : "") +
      ({ 1: ", grey", 2: ", grey", 4: facts.format === "JPEG" ? ", CMYK" : "" }[facts.channels] ?? "")],
    ["Taken", facts.captureTime.replace("T", " ") || "unknown"],
    ["Edited", facts.lastEdit || "not by Quenby"],
  ];
  $("facts").replaceChildren(...rows.flatMap(([name, value]) => [
    Object.assign(document.createElement("dt"), { textContent: name }),
    Object.assign(document.createElement("dd"), { textContent: value }),
  ]));
  $("scores").value = "";
}

$("score").addEventListener("click", async () => {
  const photo = current;
  $("scores").value = "…";
  try {
    const { before, after } = await ask("score", [photo.id, forWorker(edit())]);
    if (photo !== current) return;
    $("scores").value = before === null ? "too small to score"
      : `before ${before.toFixed(2)}, after ${after.toFixed(2)}`;
  } catch (error) {
    $("scores").value = "";
    failed(error);
  }
});

// ---- Saving ----

function saveOptions() {
  const quality = Number($("quality").value);
  return {
    format: $("format").value || undefined,
    save: {
      quality: Number.isInteger(quality) && quality >= 1 && quality <= 100 ? quality : 90,
      dropLocation: $("drop-location").checked,
    },
  };
}

const nameOf = (photo, { filter }, bytes) =>
  `${photo.name.replace(/\.[^.]*$/, "") || "photo"}_${filter}.${bytes[0] === 0xff ? "jpg" : "png"}`;

function download(blob, name) {
  const link = Object.assign(document.createElement("a"), { href: URL.createObjectURL(blob), download: name });
  link.click();
  setTimeout(() => URL.revokeObjectURL(link.href), 60_000);
}

async function made(photo, by) {
  const bytes = await photo.file.arrayBuffer();
  const wanted = photo.history?.edit ?? firstEdit();
  const file = await by("save", [bytes, forWorker(wanted), saveOptions()], { transfer: [bytes] });
  return { ...file, name: nameOf(photo, wanted, file.bytes) };
}

const lossText = ({ what, why }) => `${what}: ${why}`;

async function save() {
  const photo = current;
  if (!photo?.info) return;
  document.body.classList.add("busy");
  const start = performance.now();
  try {
    const { bytes, losses, name, memory } = await made(photo, ask);
    download(new Blob([bytes], { type: bytes[0] === 0xff ? "image/jpeg" : "image/png" }), name);
    document.body.dataset.saved = Math.round(performance.now() - start);
    document.body.dataset.memory = memory;
    tell(losses.length > 0 ? `Saved ${name}. Not in it:` : `Saved ${name} with all its metadata.`,
      losses.map(lossText));
  } catch (error) {
    failed(error);
  } finally {
    document.body.classList.remove("busy");
  }
}

async function saveAll() {
  let done = 0;
  document.body.classList.add("busy");
  $("save-all").disabled = true;
  const files = await Promise.all(photos.map(async (photo) => {
    try {
      const one = helper();
      const file = await made(photo, (...given) => one.call(...given));
      tell(`${++done} of ${photos.length}`);
      return file;
    } catch (error) {
      complain(`${photo.name}: ${error.message}`);
      return null;
    }
  }));
  const good = files.filter(Boolean);
  const names = new Map();
  for (const file of good) { // two of one name keep both
    const count = names.get(file.name) ?? 0;
    names.set(file.name, count + 1);
    if (count > 0) file.name = file.name.replace(/(\.[^.]*)$/, ` (${count + 1})$1`);
  }
  try {
    if (good.length > 0) download(zipOf(good), "photos.zip");
    const lost = good.flatMap((file) => file.losses.map((loss) => `${file.name}: ${lossText(loss)}`));
    tell(`Saved ${good.length} of ${photos.length} photos.${lost.length > 0 ? " Not in them:" : ""}`,
      lost.slice(0, 6));
  } catch (error) {
    failed(error);
  }
  $("save-all").disabled = false;
  document.body.classList.remove("busy");
  update();
}

// ---- What there is to see ----

function update() {
  document.body.classList.toggle("empty", current === null);
  document.body.classList.toggle("several", photos.length > 1);
  const history = current?.history;
  $("undo").disabled = !history?.canUndo;
  $("redo").disabled = !history?.canRedo;
  $("faces").hidden = !$("face-panel").open;
  $("face-count").textContent = current?.info ? (edit().faces ?? current.info.faces).length : 0;
  document.title = current ? `${current.name} – Quenby` : "Quenby";
  updateStrip();
}

function updateStrip() {
  const strip = $("strip");
  const focused = [...strip.children].indexOf(document.activeElement);
  strip.replaceChildren(...photos.map((photo) => {
    const button = document.createElement("button");
    button.className = "shot";
    const group = photo.group ? `, near-duplicate, group ${photo.group}` : "";
    button.setAttribute("aria-label", photo.name + group);
    button.title = photo.name + group;
    if (photo === current) button.setAttribute("aria-current", "true");
    if (photo.picture) {
      const canvas = document.createElement("canvas");
      paint(canvas, photo.picture);
      button.append(canvas);
    } else {
      button.append(Object.assign(document.createElement("span"), { className: "none" }));
    }
    if (photo.group) {
      button.append(Object.assign(document.createElement("em"), { textContent: `≈ ${photo.group}` }));
    }
    button.addEventListener("click", () => void select(photo));
    return button;
  }));
  strip.children[focused]?.focus();
}

// ---- What is done ----

function undo(step) {
  if (!current?.history) return;
  current.history[step]();
  showEdit();
}

function compare() {
  viewer.comparing = !viewer.comparing;
  $("compare").setAttribute("aria-pressed", String(viewer.comparing));
}
viewer.comparing = true;

const step = (by) => {
  const next = photos[photos.indexOf(current) + by];
  if (next) void select(next);
};

$("open").addEventListener("click", () => $("files").click());
$("choose").addEventListener("click", () => $("files").click());
$("files").addEventListener("change", () => {
  add($("files").files);
  $("files").value = "";
});
$("undo").addEventListener("click", () => undo("undo"));
$("redo").addEventListener("click", () => undo("redo"));
$("save").addEventListener("click", () => void save());
$("save-all").addEventListener("click", () => void saveAll());
$("fit").addEventListener("click", () => viewer.fit());
$("full").addEventListener("click", () => viewer.toFullSize());
$("zoom-in").addEventListener("click", () => viewer.zoomTo(viewer.zoom * 1.4));
$("zoom-out").addEventListener("click", () => viewer.zoomTo(viewer.zoom / 1.4));
$("compare").addEventListener("click", compare);

document.addEventListener("keydown", (event) => {
  if ($("about-box").open) return;
  const command = event.ctrlKey || event.metaKey;
  const typing = event.target.matches("input[type='number'], select");
  const act = command
    ? { o: () => $("files").click(), s: save, z: () => undo(event.shiftKey ? "redo" : "undo"),
        y: () => undo("redo") }[event.key.toLowerCase()]
    : typing || event.altKey ? undefined
      : { "+": () => $("zoom-in").click(), "=": () => $("zoom-in").click(), "-": () => $("zoom-out").click(),
          0: () => viewer.fit(), 1: () => viewer.toFullSize(), c: compare,
          f: () => ($("face-panel").open = !$("face-panel").open), "[": () => step(-1), "]": () => step(1),
          "?": about }[event.key];
  if (act === undefined || (current === null && !["o", "?"].includes(event.key.toLowerCase()))) return;
  event.preventDefault();
  void act();
});

let dragged = 0;
document.addEventListener("dragenter", () => document.body.classList.toggle("dragging", ++dragged > 0));
document.addEventListener("dragleave", () => document.body.classList.toggle("dragging", --dragged > 0));
document.addEventListener("dragover", (event) => event.preventDefault());
document.addEventListener("drop", (event) => {
  event.preventDefault();
  dragged = 0;
  document.body.classList.remove("dragging");
  add(event.dataTransfer.files);
});
document.addEventListener("paste", (event) => add(event.clipboardData.files));

// ---- About ----

async function about() {
  $("about-box").showModal();
  if ($("licences").children.length > 0) return;
  const texts = await (await fetch("licences.json")).json();
  $("licences").replaceChildren(...texts.map(({ name, text }) => {
    const box = document.createElement("details");
    box.append(Object.assign(document.createElement("summary"), { textContent: name }),
      Object.assign(document.createElement("pre"), { textContent: text, tabIndex: 0 }));
    return box;
  }));
}
$("about").addEventListener("click", () => void about());
$("selftest").addEventListener("click", async () => {
  $("digest").value = "…";
  try {
    const table = await ask("selftest", []);
    const sum = await crypto.subtle.digest("SHA-256", new TextEncoder().encode(table));
    $("digest").value = `SHA-256 ${[...new Uint8Array(sum)].map((x) => x.toString(16).padStart(2, "0")).join("")}`;
    $("table").textContent = table;
    $("table").hidden = false;
  } catch (error) {
    $("digest").value = error.message;
  }
});

// ---- From here on ----

matchMedia("(prefers-color-scheme: dark)").addEventListener("change", () => void settle());
window.quenbyFrames = frames; // for measuring
window.quenbyWorker = () => worker; // for tests
if ("serviceWorker" in navigator) navigator.serviceWorker.register("sw.js").catch(() => {});
startWorker().then(
  () => document.body.classList.add("ready"),
  (error) => complain(`This browser cannot run Quenby: ${error.message}`));
