// Helpers for all tabs.

import { hasEnded } from "../src/native.js";

export const byId = (id) => document.getElementById(id);

export function element(name, attributes = {}, ...content) {
  const made = document.createElement(name);
  for (const [key, value] of Object.entries(attributes)) made.setAttribute(key, value);
  made.append(...content);
  return made;
}

export function svgElement(name, attributes = {}) {
  const made = document.createElementNS("http://www.w3.org/2000/svg", name);
  for (const [key, value] of Object.entries(attributes)) made.setAttribute(key, value);
  return made;
}

/** Fills a select element; keys are the values, values the labels. */
export function choices(select, entries) {
  select.replaceChildren(...entries.map(([value, text]) => element("option", { value }, text)));
}

let saying = 0;

/** Shows a short confirmation. */
export function say(text) {
  clearTimeout(saying);
  byId("said").textContent = text;
  saying = setTimeout(() => (byId("said").textContent = ""), 3000);
}

/** A one-line message for an error. */
export function messageOf(error) {
  return hasEnded() ? "There is not enough memory for this. Reload the page to go on." : error.message;
}

/** Calls `update`. An exception is shown as an error, and the rest of the page stays unchanged. */
export function attempt(place, update) {
  try {
    update();
    place.textContent = "";
  } catch (error) {
    place.textContent = messageOf(error);
  }
}

/** Formats with six digits. */
export const shortly = (number) => String(Number(number.toPrecision(6)));
