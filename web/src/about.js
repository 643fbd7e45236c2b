// The About box: licences, and the table that tells whether this browser gives the same bytes.
import { $, element } from "./dom.js";
import { ask } from "./workers.js";

export async function about() {
  $("about-box").showModal();
  if ($("licences").children.length > 0) return;
  const texts = await (await fetch("licences.json")).json();
  $("licences").replaceChildren(...texts.map(({ name, text }) => {
    return element("details", {}, element("summary", { textContent: name }),
      element("pre", { textContent: text, tabIndex: 0 }));
  }));
}
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
