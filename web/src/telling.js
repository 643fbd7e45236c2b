// What the page says: in passing, and what has to be read.
import { $, element } from "./dom.js";
import { state } from "./state.js";

let ends;
export function tell(text, list = []) {
  clearTimeout(ends);
  $("status").textContent = text;
  if (list.length > 0) {
    $("status").append(element("ul", {}, ...list.map((line) => element("li", { textContent: line }))));
  }
  if (text !== "") ends = setTimeout(() => tell(""), 4000 + 2500 * list.length);
}

export function complain(text) {
  const close = element("button", { textContent: "OK" });
  const line = element("p", {}, element("span", { textContent: text }), close);
  close.addEventListener("click", () => line.remove());
  $("problems").append(line);
  while ($("problems").children.length > 5) $("problems").firstElementChild.remove();
}

export function failed(error) {
  if (error.told) return; // calls that ended with their worker end with one error
  error.told = true;
  complain(`${state.current?.name ?? "Quenby"}: ${error.message}`);
}
