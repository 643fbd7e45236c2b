// An edit: a filter, the values of its parameters, and faces where they are not those of the file.
import { parameterText } from "./quenby/parameters.js";
import { state } from "./state.js";

export const filterNamed = (name) => state.filters.find((filter) => filter.name === name);
const standard = (row) => row.kind === "boolean" ? row.standard === 1 : row.standard;
export const shown = (row) =>
  row.kind === "boolean" ||
  (row.kind === "number" && row.standard !== null && Number.isFinite(row.lowest));
export const firstEdit = () => editOf("AE0");

export function editOf(name) {
  const values = {};
  for (const row of filterNamed(name).parameters.filter(shown)) values[row.name] = standard(row);
  return { filter: name, values, faces: null };
}

/** What the filter is given: what it requires and what is not as it would be anyway. */
function parametersOf({ filter, values }) {
  const given = {};
  for (const row of filterNamed(filter).parameters) {
    const value = values[row.name];
    if (value === undefined || (!row.required && value === standard(row))) continue;
    given[row.name] = row.kind !== "boolean" ? value
      : row.wanted.includes("true") ? value : Number(value);
  }
  return parameterText(given);
}

export const forWorker = (edit) => ({ filter: edit.filter, parameters: parametersOf(edit), faces: edit.faces });

export function labelOf(filter) {
  const twice = state.filters.filter((other) => other.displayName === filter.displayName).length > 1;
  return twice && /8bit$/.test(filter.name) ? `${filter.displayName}, 8 bits` : filter.displayName;
}
