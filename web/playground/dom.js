// What all subjects need of the page.

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

/** Fills a list of choices; keys are what is kept, values what is shown. */
export function choices(select, entries) {
  select.replaceChildren(...entries.map(([value, text]) => element("option", { value }, text)));
}

let saying = 0;

/** Says what was done, for a moment. */
export function say(text) {
  clearTimeout(saying);
  byId("said").textContent = text;
  saying = setTimeout(() => (byId("said").textContent = ""), 3000);
}

/** What went wrong, in one line. */
export function messageOf(error) {
  return hasEnded() ? "There is not enough memory for this. Reload the page to go on." : error.message;
}

/** Calls `update`; what it throws is shown in the place for errors, and what was shown before stays. */
export function attempt(place, update) {
  try {
    update();
    place.textContent = "";
  } catch (error) {
    place.textContent = messageOf(error);
  }
}

/** Six digits, which is as many as people read. */
export const shortly = (number) => String(Number(number.toPrecision(6)));
