// The sliders and switches of the filter that is chosen.
import { $, element } from "./dom.js";
import { filterNamed, shown } from "./edits.js";
import { edit, state } from "./state.js";

// In the order that they stand in, after those without one; empty for what is not shown.
const titles = {
  slider: "Strength", gtmOnly: "One tone curve for the whole photo", gtmExtraMemory: "",
  applyMask: "With a vignette", maskAlpha: "Vignette", maskRadius: "Vignette radius",
};

/** @param changed  called with the next edit and whether the change is complete. */
export function makeSettings(changed) {
  const filter = filterNamed(edit().filter);
  const rank = (row) => Object.keys(titles).indexOf(row.name);
  const rows = filter.parameters.filter((row) => shown(row) && titles[row.name] !== "")
    .sort((a, b) => rank(a) - rank(b));
  $("settings").replaceChildren(...rows.map((row) => row.kind === "boolean" ? tick(row, changed) : range(row, changed)));
}

function set(row, value, complete, changed) {
  const next = { ...edit(), values: { ...edit().values, [row.name]: value } };
  (state.current.kept ??= {})[next.filter] = next;
  changed(next, complete);
}

function range(row, changed) {
  const id = `setting-${row.name}`;
  const label = element("label", { htmlFor: id, textContent: titles[row.name] || row.name, title: row.description });
  const highest = Number.isFinite(row.highest) ? row.highest : 4;
  const input = element("input", {
    type: "range", id, min: row.aboveLowest ? 0.01 : row.lowest, max: highest, step: 0.01,
  });
  input.value = edit().values[row.name];
  input.title = row.description;
  const output = element("output", { value: Number(input.value).toFixed(2) });
  output.htmlFor = id;
  input.addEventListener("input", () => {
    output.value = Number(input.value).toFixed(2);
    set(row, Number(input.value), false, changed);
  });
  input.addEventListener("change", () => set(row, Number(input.value), true, changed));
  return element("div", { className: "setting" }, label, output, input);
}

function tick(row, changed) {
  const input = element("input", { type: "checkbox", checked: edit().values[row.name], id: `setting-${row.name}` });
  input.addEventListener("change", () => set(row, input.checked, true, changed));
  return element("label", { className: "check", title: row.description }, input, titles[row.name] || row.name);
}
