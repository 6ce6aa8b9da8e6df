// What is set, in the address: a link shows the same. Fields have the keys of their elements' identifiers.

const current = new URLSearchParams(location.hash.slice(1));
let writing = 0;
/** No value in the address is longer: programs that links are sent with cut them off. */
export const longest = 30000;

export function stateOf(key, otherwise) {
  return current.get(key) ?? otherwise;
}

function write() {
  clearTimeout(writing);
  writing = 0;
  history.replaceState(null, "", `#${current}`);
}

/** Keeps a text; null, and what is too long, takes the key away. */
export function keep(key, value) {
  if (value === null || value.length > longest) current.delete(key);
  else current.set(key, value);
  // Browsers refuse to be told too often.
  if (writing === 0) writing = setTimeout(write, 250);
}
addEventListener("pagehide", () => writing !== 0 && write());

/** Gives a field what the address has for it, or `otherwise`, and keeps what it is set to. */
export function keepField(field, otherwise, changed) {
  field.value = stateOf(field.id, otherwise);
  // A choice that is not there.
  if (field.value === "" && field.options !== undefined) field.value = otherwise;
  field.addEventListener("input", () => {
    keep(field.id, field.value);
    changed();
  });
}

// Another link to this page.
addEventListener("hashchange", () => location.hash.includes("=") && location.reload());
