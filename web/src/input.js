// What comes from outside of the page's controls: keys, dropped and pasted files.
import { $ } from "./dom.js";
import { state } from "./state.js";

/** @param commands  what keys with Ctrl do, by key; @param keys  what others do; each gets the event. @param add
 *  called with files. */
export function listen({ commands, keys, add }) {
  document.addEventListener("keydown", (event) => {
    if ($("about-box").open) return;
    const typing = event.target.matches("input[type='number'], select");
    const act = event.ctrlKey || event.metaKey ? commands[event.key.toLowerCase()]
      : typing || event.altKey ? undefined : keys[event.key];
    const needsPhoto = !["o", "?"].includes(event.key.toLowerCase());
    if (act === undefined || (needsPhoto && state.current === null)) return;
    event.preventDefault();
    void act(event);
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
}
