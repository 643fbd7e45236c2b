/** `{ slider: 0.4 }` as the text that filters take. */
export function parameterText(parameters = {}) {
  if (typeof parameters === "string") return parameters;
  return Object.entries(parameters)
    .map(([key, value]) => `${key}=${Array.isArray(value) ? value.map((x) => `${x},`).join("") : value};`)
    .join("");
}
