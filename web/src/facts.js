// What is known of the file, and how natural the photo looks.
import { $, element } from "./dom.js";
import { forWorker } from "./edits.js";
import { edit, state } from "./state.js";
import { failed } from "./telling.js";
import { ask } from "./workers.js";

export function tellFacts() {
  const { facts, width, height } = state.current.info;
  const rows = [
    ["Name", state.current.name],
    ["Size", `${width} × ${height}, ${(state.current.file.size / 1e6).toFixed(2)} MB`],
    ["Format", facts.format + (facts.progressive ? ", progressive" : "") +
      ({ 1: ", grey", 2: ", grey", 4: facts.format === "JPEG" ? ", CMYK" : "" }[facts.channels] ?? "")],
    ["Taken", facts.captureTime.replace("T", " ") || "unknown"],
    ["Edited", facts.lastEdit || "not by Quenby"],
  ];
  $("facts").replaceChildren(...rows.flatMap(([name, value]) => [
    element("dt", { textContent: name }),
    element("dd", { textContent: value }),
  ]));
  $("scores").value = "";
}

$("score").addEventListener("click", async () => {
  const photo = state.current;
  $("scores").value = "…";
  try {
    const { before, after } = await ask("score", [photo.id, forWorker(edit())]);
    if (photo !== state.current) return;
    $("scores").value = before === null ? "too small to score"
      : `before ${before.toFixed(2)}, after ${after.toFixed(2)}`;
  } catch (error) {
    $("scores").value = "";
    failed(error);
  }
});
