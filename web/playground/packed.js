// Compresses strings for addresses.

// The limit of unpacked strings: a few letters can stand for more memory than there is.
const mostBytes = 1 << 24;

async function through(stream, bytes) {
  const parts = [];
  let size = 0;
  for (const reader = new Blob([bytes]).stream().pipeThrough(stream).getReader();;) {
    const { done, value } = await reader.read();
    if (done) return new Uint8Array(await new Blob(parts).arrayBuffer());
    size += value.length;
    if (size > mostBytes) throw new RangeError("the document in the link is larger than 16 MiB");
    parts.push(value);
  }
}

/** Compresses a string into characters that addresses may contain. */
export async function packed(text) {
  const bytes = await through(new CompressionStream("deflate-raw"), new TextEncoder().encode(text));
  const letters = Array.from(bytes, (byte) => String.fromCharCode(byte)).join("");
  return btoa(letters).replaceAll("+", "-").replaceAll("/", "_").replace(/=+$/, "");
}

/** The inverse. Throws for other strings. */
export async function unpacked(letters) {
  const bytes = Uint8Array.from(atob(letters.replaceAll("-", "+").replaceAll("_", "/")), (letter) => letter.charCodeAt(0));
  return new TextDecoder().decode(await through(new DecompressionStream("deflate-raw"), bytes));
}
