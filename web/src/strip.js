// All photos in a row, with near-duplicates marked.
import { $, element, paint } from "./dom.js";
import { state } from "./state.js";
import { helper } from "./workers.js";

/** @param dropped  called with a photo that cannot be read, and why; @param changed  when there is more to see. */
export async function survey(photo, dropped, changed) {
  photo.surveyed = true;
  try {
    const bytes = await photo.file.arrayBuffer();
    const found = await helper().call("survey", [bytes], { transfer: [bytes] });
    photo.shot = found.shot;
    photo.picture = found.picture;
    await mark();
  } catch (error) {
    if (state.photos.includes(photo) && photo !== state.current) dropped(photo, error);
  }
  changed();
}

// Which photos are shots of one scene a moment apart.
async function mark() {
  const seen = state.photos.filter((photo) => photo.shot);
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

/** @param chosen  called with the photo that is. */
export function showStrip(chosen) {
  const strip = $("strip");
  const focused = [...strip.children].indexOf(document.activeElement);
  strip.replaceChildren(...state.photos.map((photo) => {
    const title = photo.name + (photo.group ? `, near-duplicate, group ${photo.group}` : "");
    const button = element("button", { className: "shot", title, ariaLabel: title });
    if (photo === state.current) button.setAttribute("aria-current", "true");
    if (photo.picture) {
      const canvas = element("canvas");
      paint(canvas, photo.picture);
      button.append(canvas);
    } else {
      button.append(element("span", { className: "none" }));
    }
    if (photo.group) button.append(element("em", { textContent: `≈ ${photo.group}` }));
    button.addEventListener("click", () => chosen(photo));
    return button;
  }));
  strip.children[focused]?.focus();
}
