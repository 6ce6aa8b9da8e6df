// What all subjects need of the page.

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

/** Says something that is not shown. */
export function say(text) {
  byId("said").textContent = text;
}

/** Calls `update`; what it throws is shown in the place for errors, and what was shown before stays. */
export function attempt(place, update) {
  try {
    update();
    place.textContent = "";
  } catch (error) {
    place.textContent = error.message;
  }
}

/** Six digits, which is as many as people read. */
export const shortly = (number) => String(Number(number.toPrecision(6)));
