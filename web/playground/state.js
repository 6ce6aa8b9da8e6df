// Keeps the settings in the address, so that a link shows the same. Keys are the identifiers of the
// fields.

const current = new URLSearchParams(location.hash.slice(1));
let writing = 0;
/** The longest value in the address: programs that send links truncate long ones. */
export const longest = 30000;

export function stateOf(key, otherwise) {
  return current.get(key) ?? otherwise;
}

function write() {
  clearTimeout(writing);
  writing = 0;
  history.replaceState(null, "", `#${current}`);
}

/** Stores a string; null and strings that are too long remove the key. */
export function keep(key, value) {
  if (value === null || value.length > longest) current.delete(key);
  else current.set(key, value);
  // Browsers limit how often the address may change.
  if (writing === 0) writing = setTimeout(write, 250);
}
addEventListener("pagehide", () => writing !== 0 && write());

/** Sets a field from the address, or to `otherwise`, and stores its changes. */
export function keepField(field, otherwise, changed) {
  field.value = stateOf(field.id, otherwise);
  // The option does not exist.
  if (field.value === "" && field.options !== undefined) field.value = otherwise;
  field.addEventListener("input", () => {
    keep(field.id, field.value);
    changed();
  });
}

// Another link to this page.
addEventListener("hashchange", () => location.hash.includes("=") && location.reload());
