// The binary format of values, data, paths and records, as in wire.cpp.

const encoder = new TextEncoder();
const decoder = new TextDecoder("utf-8", { ignoreBOM: true });

export const textOf = (bytes) => decoder.decode(bytes);
/** As UTF-8: a lone surrogate becomes U+FFFD. */
export const wellFormed = (text) => decoder.decode(encoder.encode(text));

export class Writer {
  #bytes = new Uint8Array(64);
  #view = new DataView(this.#bytes.buffer);
  #end = 0;

  // Reserves this many more bytes.
  #take(count) {
    const at = this.#end;
    this.#end += count;
    if (this.#end > this.#bytes.length) {
      const larger = new Uint8Array(Math.max(this.#end, 2 * this.#bytes.length));
      larger.set(this.#bytes.subarray(0, at));
      this.#bytes = larger;
      this.#view = new DataView(larger.buffer);
    }
    return at;
  }

  byte(b) {
    const at = this.#take(1);
    this.#bytes[at] = b;
    return this;
  }
  count(n) {
    const at = this.#take(4);
    this.#view.setUint32(at, n, true);
    return this;
  }
  number(d) {
    const at = this.#take(8);
    this.#view.setFloat64(at, d, true);
    return this;
  }
  // A 64-bit integer, signed or unsigned.
  integer(i) {
    const at = this.#take(8);
    this.#view.setBigUint64(at, BigInt.asUintN(64, i), true);
    return this;
  }
  text(s) {
    const bytes = encoder.encode(s);
    return this.count(bytes.length).raw(bytes);
  }
  raw(bytes) {
    const at = this.#take(bytes.length);
    this.#bytes.set(bytes, at);
    return this;
  }
  bytes() {
    return this.#bytes.slice(0, this.#end);
  }
}

export class Reader {
  #bytes;
  #view;
  #at = 0;

  constructor(bytes) {
    this.#bytes = bytes;
    this.#view = new DataView(bytes.buffer, bytes.byteOffset, bytes.length);
  }

  get position() {
    return this.#at;
  }
  #take(count) {
    const at = this.#at;
    this.#at += count;
    return at;
  }
  byte() {
    return this.#bytes[this.#take(1)];
  }
  count() {
    return this.#view.getUint32(this.#take(4), true);
  }
  number() {
    return this.#view.getFloat64(this.#take(8), true);
  }
  signed() {
    return this.#view.getBigInt64(this.#take(8), true);
  }
  unsigned() {
    return this.#view.getBigUint64(this.#take(8), true);
  }
  text() {
    return decoder.decode(this.raw(this.count()));
  }
  // A view of the bytes, not a copy.
  raw(count) {
    const at = this.#take(count);
    return this.#bytes.subarray(at, at + count);
  }
  // A copy of the bytes that `skip` passes over.
  part(skip) {
    const begin = this.#at;
    skip(this);
    return this.#bytes.slice(begin, this.#at);
  }
}

export const Kind = Object.freeze({ Null: 0, Map: 1, Array: 2, Float: 3, Integer: 4, UnsignedInteger: 5, String: 6 });

// Skips data of any depth.
export function skipData(reader) {
  const open = [{ isMap: false, missing: 1 }];
  while (open.length > 0) {
    const top = open[open.length - 1];
    if (top.missing === 0) {
      open.pop();
      continue;
    }
    --top.missing;
    if (top.isMap) reader.raw(reader.count());
    const kind = reader.byte();
    if (kind === Kind.Map || kind === Kind.Array) {
      open.push({ isMap: kind === Kind.Map, missing: reader.count() });
    } else if (kind === Kind.String) {
      reader.raw(reader.count());
    } else if (kind !== Kind.Null) {
      reader.raw(8);
    }
  }
}

export function skipPath(reader) {
  for (let elements = reader.count(); elements > 0; --elements) {
    reader.byte();
    reader.raw(16 * reader.count());
  }
}

// The size of the values of a type in bytes; undefined for types without a fixed size.
const sizes = [8, 16, 24, 32, 128, 1, 8, 8, 8, 8, undefined, undefined, 8, undefined];

/** Added to the type of a value with a null payload; only documents have those. */
export const nullPayload = 0x80;

export function skipValue(reader) {
  const type = reader.byte();
  if (type & nullPayload) return;
  if (sizes[type] !== undefined) reader.raw(sizes[type]);
  else if (type === 10) skipPath(reader);
  else if (type === 11) reader.raw(reader.count());
  else skipData(reader);
}
