// Files of the photos with their edits: one, or all in a zip.
import { $, element } from "./dom.js";
import { firstEdit, forWorker } from "./edits.js";
import { state } from "./state.js";
import { complain, failed, tell } from "./telling.js";
import { ask, helper } from "./workers.js";
import { zipOf } from "./zip.js";

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
  const link = element("a", { href: URL.createObjectURL(blob), download: name });
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

export async function save() {
  const photo = state.current;
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

export async function saveAll() {
  let done = 0;
  document.body.classList.add("busy");
  $("save-all").disabled = true;
  const files = await Promise.all(state.photos.map(async (photo) => {
    try {
      const one = helper();
      const file = await made(photo, (...given) => one.call(...given));
      tell(`${++done} of ${state.photos.length}`);
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
    tell(`Saved ${good.length} of ${state.photos.length} photos.${lost.length > 0 ? " Not in them:" : ""}`,
      lost.slice(0, 6));
  } catch (error) {
    failed(error);
  }
  $("save-all").disabled = false;
  document.body.classList.remove("busy");
}
