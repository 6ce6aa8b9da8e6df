// What is set, in the address: a link shows the same. Fields have the keys of their elements' identifiers.

const current = new URLSearchParams(location.hash.slice(1));
let writing = 0;

export function stateOf(key, otherwise) {
  return current.get(key) ?? otherwise;
}

/** Keeps a text; null takes the key away. */
export function keep(key, value) {
  if (value === null) current.delete(key);
  else current.set(key, value);
  // Browsers refuse to be told too often.
  clearTimeout(writing);
  writing = setTimeout(() => history.replaceState(null, "", `#${current}`), 250);
}

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
addEventListener("hashchange", () => location.reload());
