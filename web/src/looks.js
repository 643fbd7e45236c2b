// All filters as small pictures of the photo, one of which is chosen.
import { $, element, paint } from "./dom.js";
import { editOf, forWorker, labelOf } from "./edits.js";
import { edit, state } from "./state.js";
import { ask } from "./workers.js";

/** @param chosen  called with the edit that a look begins with. */
export function makeLooks(chosen) {
  const rank = ({ name }) => ["AE0", "AE08bit", "PassThrough"].indexOf(name) + 1 || 9;
  const order = [...state.filters].sort((a, b) => rank(a) - rank(b));
  $("looks").replaceChildren($("looks").querySelector("legend"), ...order.map((filter) => {
    const label = element("label", { className: "look", title: filter.description });
    const radio = element("input", { type: "radio", name: "look", value: filter.name });
    const canvas = element("canvas", { width: 4, height: 3 });
    canvas.setAttribute("aria-hidden", "true");
    label.append(radio, canvas, element("span", { textContent: labelOf(filter) }));
    radio.addEventListener("change", () => {
      const { faces } = edit();
      chosen({ ...(state.current.kept?.[filter.name] ?? editOf(filter.name)), faces });
      intoView(label);
    });
    return label;
  }));
  // Another width is another row.
  new ResizeObserver(() => markLook($("looks").querySelector("input:checked")?.value)).observe($("looks"));
}

export function markLook(name) {
  for (const radio of $("looks").querySelectorAll("input")) {
    radio.checked = radio.value === name;
    if (radio.checked) intoView(radio.parentElement);
  }
}

// In the row that looks are on a narrow page; nothing else moves.
function intoView(look) {
  const row = $("looks");
  row.scrollLeft = look.offsetLeft - row.offsetLeft - (row.clientWidth - look.clientWidth) / 2;
}

/** The photo as each of them makes it. */
export async function thumbnails() {
  const photo = state.current;
  const looks = [...document.querySelectorAll(".look")];
  const edits = looks.map((look) =>
    ({ ...forWorker(editOf(look.querySelector("input").value)), faces: edit().faces }));
  const pictures = await ask("thumbnails", [photo.id, edits], { topic: "thumbnails" });
  if (!pictures || photo !== state.current) return;
  looks.forEach((look, i) => paint(look.querySelector("canvas"), pictures[i]));
  document.body.classList.add("looks-shown");
}
