// The page: which photo is open, how its edit changes, and what of it is shown where. All work on pixels is
// the workers'.
import { about } from "./about.js";
import { $ } from "./dom.js";
import { firstEdit } from "./edits.js";
import { FaceBoxes } from "./faces.js";
import { tellFacts } from "./facts.js";
import { History } from "./history.js";
import { listen } from "./input.js";
import { makeLooks, markLook, thumbnails } from "./looks.js";
import { frames, render, settle, viewer } from "./rendering.js";
import { save, saveAll } from "./saving.js";
import { makeSettings } from "./settings.js";
import { edit, state } from "./state.js";
import { showStrip, survey } from "./strip.js";
import { complain, failed, tell } from "./telling.js";
import { ask, forget, mainWorker, start } from "./workers.js";

// ---- Photos ----

let nextPhoto = 0;
function add(files) {
  const { photos, current: before } = state;
  const added = [...files].map((file) => ({ id: ++nextPhoto, file, name: file.name || "photo.jpg" }));
  if (added.length === 0) return;
  photos.push(...added);
  void select(added[0]);
  if (photos.length > 1) {
    for (const photo of before === null || photos.length > added.length ? photos : added) {
      if (!photo.surveyed) void survey(photo, drop, update);
    }
  }
  update();
}

/** A photo that cannot be read goes, with the reason. */
function drop(photo, error) {
  const { photos } = state;
  complain(`${photo.name}: ${error.message}`);
  const at = photos.indexOf(photo);
  if (at >= 0) photos.splice(at, 1);
  if (photo === state.current) {
    state.current = null;
    if (photos.length > 0) void select(photos[Math.min(at, photos.length - 1)]);
  }
  update();
}

async function select(photo) {
  if (state.current?.info) forget(state.current);
  state.current = photo;
  update();
  await openCurrent();
}

async function openCurrent() {
  const photo = state.current;
  document.body.classList.add("busy");
  try {
    const bytes = await photo.file.arrayBuffer();
    if (photo !== state.current) return;
    const info = await ask("open", [photo.id, bytes], { transfer: [bytes] });
    if (photo !== state.current) {
      forget(photo);
      return;
    }
    photo.info = info;
    photo.history ??= new History(firstEdit());
    viewer.show(info.width, info.height, info.preview);
    await ask("show", [photo.id]);
    showEdit();
    tellFacts();
    if (info.notices.length > 0) tell(photo.name, info.notices);
    await thumbnails();
  } catch (error) {
    if (state.photos.includes(photo)) drop(photo, error);
  } finally {
    document.body.classList.remove("busy");
  }
}

const step = (by) => {
  const next = state.photos[state.photos.indexOf(state.current) + by];
  if (next) void select(next);
};

// ---- Edits ----

function change(next, complete) {
  state.live = next;
  if (complete) {
    state.current.history.add(next);
    state.live = null;
    update();
  }
  render(complete);
}

function choose(next) {
  change(next, true);
  makeSettings(change);
}

const boxes = new FaceBoxes($("faces"), (faces, complete) => {
  const plain = faces.map(({ left, top, right, bottom, name }) => ({ left, top, right, bottom, name }));
  change({ ...edit(), faces: plain }, complete);
  if (complete) void thumbnails().catch(failed);
});

function showEdit() {
  state.live = null;
  boxes.show(edit().faces ?? state.current.info.faces);
  markLook(edit().filter);
  makeSettings(change);
  update();
  render(true);
}

function undo(which) {
  if (!state.current?.history) return;
  state.current.history[which]();
  showEdit();
}

// ---- What there is to see ----

function update() {
  const { photos, current } = state;
  document.body.classList.toggle("empty", current === null);
  document.body.classList.toggle("several", photos.length > 1);
  $("undo").disabled = !current?.history?.canUndo;
  $("redo").disabled = !current?.history?.canRedo;
  $("faces").hidden = !$("face-panel").open;
  $("face-count").textContent = current?.info ? (edit().faces ?? current.info.faces).length : 0;
  document.title = current ? `${current.name} – Quenby` : "Quenby";
  showStrip((photo) => void select(photo));
}

function compare() {
  viewer.comparing = !viewer.comparing;
  $("compare").setAttribute("aria-pressed", String(viewer.comparing));
}
viewer.comparing = true;

// ---- What is done ----

const pick = () => $("files").click();
const actions = {
  open: pick, choose: pick, undo: () => undo("undo"), redo: () => undo("redo"), save, "save-all": saveAll,
  fit: () => viewer.fit(), full: () => viewer.toFullSize(), compare, about,
  "zoom-in": () => viewer.zoomTo(viewer.zoom * 1.4), "zoom-out": () => viewer.zoomTo(viewer.zoom / 1.4),
  "add-face": () => boxes.add(),
  "own-faces": () => {
    change({ ...edit(), faces: null }, true);
    boxes.show(state.current.info.faces);
  },
};
for (const [id, act] of Object.entries(actions)) $(id).addEventListener("click", () => void act());
$("face-panel").addEventListener("toggle", update);
$("files").addEventListener("change", () => {
  add($("files").files);
  $("files").value = "";
});
listen({
  commands: {
    o: pick, s: save, z: (event) => undo(event.shiftKey ? "redo" : "undo"), y: actions.redo,
  },
  keys: {
    "+": actions["zoom-in"], "=": actions["zoom-in"], "-": actions["zoom-out"], 0: actions.fit, 1: actions.full,
    c: compare, f: () => ($("face-panel").open = !$("face-panel").open), "[": () => step(-1), "]": () => step(1),
    "?": about,
  },
  add,
});

// ---- From here on ----

matchMedia("(prefers-color-scheme: dark)").addEventListener("change", () => void settle());
window.quenbyFrames = frames; // for measuring
window.quenbyWorker = mainWorker; // for tests
if ("serviceWorker" in navigator) navigator.serviceWorker.register("sw.js").catch(() => {});
start(viewer, {
  broken: () => {
    if (state.current) state.current.info = undefined; // until it is open again
  },
  restarted: () => {
    if (state.current) void openCurrent();
  },
}).then(({ version, build, filters }) => {
  state.filters = filters;
  $("version").textContent = version;
  $("build").textContent = build === "simd"
    ? "This browser runs it with vectors (WebAssembly SIMD)."
    : "This browser has no vectors for WebAssembly: the results are the same, and take longer.";
  makeLooks(choose);
  document.body.classList.add("ready");
}, (error) => complain(`This browser cannot run Quenby: ${error.message}`));
