// Values, unstructured data and ports.

import * as check from "./check.js";
import { native } from "./native.js";
import { Kind, nullPayload, Reader, skipData, textOf, wellFormed, Writer } from "./wire.js";

const inspect = Symbol.for("nodejs.util.inspect.custom");

/** Makes an object of a class from bytes written by the library. */
export const fromBytes = Symbol("from bytes");
// The bytes of each value, tree and path. They are private, so they never change.
const contents = new WeakMap();

export const remember = (object, bytes) => contents.set(object, bytes);
export function bytesOf(object) {
  const bytes = contents.get(object);
  if (bytes === undefined) throw check.mustBe("this", "a Value, an Unstructured or a Path", object);
  return bytes;
}

export const Type = Object.freeze({
  Float: 0, Vec2: 1, Vec3: 2, Vec4: 3, Mat4: 4, Boolean: 5, Int: 6, Image: 7, Video: 8, Sound: 9, Path: 10, String: 11,
  Model: 12, Unstructured: 13,
});
const typeOf = (x) => check.enumerator(x, 14, "a Type");

export const typeToString = (type) => native.typeToString(typeOf(type));
export function stringToType(name) {
  const type = native.stringToType(check.string(name, "a name"));
  return type < 0 ? null : type;
}
export const typeIsResource = (type) => native.typeIsResource(typeOf(type));
export const typeShouldCopyAcrossDeletedConnections = (type) =>
  native.typeShouldCopyAcrossDeletedConnections(typeOf(type));

// Other classes that a value can contain; paths.js adds its own.
export const held = { Path: undefined };

// From this page or another one.
const plain = (x) => {
  const prototype = Object.getPrototypeOf(x);
  return prototype === null || Object.getPrototypeOf(prototype) === null || x instanceof Map;
};

/** Writes JavaScript values as unstructured data, of any depth. A TypeError for data that contains itself. */
function writeData(out, data) {
  const open = [{ items: [data].values(), of: undefined, isMap: false }];
  const inside = new Set();
  while (open.length > 0) {
    const top = open[open.length - 1];
    const { done, value: item } = top.items.next();
    if (done) {
      inside.delete(top.of);
      open.pop();
      continue;
    }
    const value = top.isMap ? (out.text(item[0]), item[1]) : item;
    if (value === null || value === undefined) {
      out.byte(Kind.Null);
    } else if (typeof value === "number") {
      const isInteger = Number.isSafeInteger(value) && !Object.is(value, -0);
      if (isInteger) out.byte(Kind.Integer).integer(BigInt(value));
      else out.byte(Kind.Float).number(value);
    } else if (typeof value === "bigint") {
      out.byte(Kind.Integer).integer(check.signed64(value, "an integer of data"));
    } else if (typeof value === "boolean") {
      out.byte(Kind.Integer).integer(value ? 1n : 0n);
    } else if (typeof value === "string") {
      out.byte(Kind.String).text(value);
    } else if (value instanceof Unstructured) {
      out.raw(bytesOf(value));
    } else if (value instanceof Value) {
      out.raw(bytesOf(value.asUnstructured()));
    } else if (check.typedArrayKind(value) !== undefined) {
      const isFloat = check.typedArrayKind(value).startsWith("Float");
      const numbers = Array.from(value);
      out.byte(Kind.Array).count(numbers.length);
      for (const n of numbers) {
        if (isFloat) out.byte(Kind.Float).number(check.number(n, "an element"));
        else out.byte(Kind.Integer).integer(check.signed64(n, "an element"));
      }
    } else if (typeof value === "object" && (Array.isArray(value) || plain(value))) {
      if (inside.has(value)) throw new TypeError("data must not contain itself");
      inside.add(value);
      const isMap = !Array.isArray(value);
      // A copy, since getters may change the original.
      const items = isMap ? entriesOf(value) : Array.from(value);
      out.byte(isMap ? Kind.Map : Kind.Array).count(items.length);
      open.push({ items: items.values(), of: value, isMap });
    } else {
      throw check.mustBe("data", "null, a number, a bigint, a boolean, a string, an array or an object of such", value);
    }
  }
}

function entriesOf(map) {
  const entries = (map instanceof Map ? [...map] : Object.entries(map)).filter(([, value]) => value !== undefined);
  // Keys that become equal are merged; the last one counts.
  return [...new Map(entries.map(([key, value]) => [wellFormed(check.string(key, "a key of data")), value]))];
}

const smallest = (i) => (i >= Number.MIN_SAFE_INTEGER && i <= Number.MAX_SAFE_INTEGER ? Number(i) : i);

function readData(reader) {
  const open = [];
  for (;;) {
    const kind = reader.byte();
    let whole;
    if (kind === Kind.Map) open.push({ map: {}, missing: reader.count() });
    else if (kind === Kind.Array) open.push({ array: [], missing: reader.count() });
    else if (kind === Kind.Null) whole = null;
    else if (kind === Kind.Float) whole = reader.number();
    else if (kind === Kind.Integer) whole = smallest(reader.signed());
    else if (kind === Kind.UnsignedInteger) whole = smallest(reader.unsigned());
    else whole = reader.text();
    let isWhole = kind !== Kind.Map && kind !== Kind.Array;
    for (;;) {
      const top = open[open.length - 1];
      if (isWhole) {
        if (top === undefined) return whole;
        // Not an assignment, which would treat "__proto__" specially.
        if (top.map === undefined) top.array.push(whole);
        else Object.defineProperty(top.map, top.key, { value: whole, enumerable: true, writable: true, configurable: true });
        isWhole = false;
      }
      if (top.missing > 0) {
        --top.missing;
        if (top.map !== undefined) top.key = reader.text();
        break;
      }
      whole = top.map ?? top.array;
      isWhole = true;
      open.pop();
    }
  }
}

export class Unstructured {
  constructor(data = null, bytes = undefined) {
    if (data === fromBytes) {
      remember(this, bytes);
      return;
    }
    const out = new Writer();
    writeData(out, data);
    remember(this, out.bytes());
  }
  static identifier(id) {
    return new Unstructured(fromBytes, new Writer().byte(Kind.UnsignedInteger).integer(check.identifier(id)).bytes());
  }

  get type() {
    return bytesOf(this)[0];
  }
  get size() {
    const isList = this.type === Kind.Map || this.type === Kind.Array;
    return isList ? new Reader(bytesOf(this).subarray(1)).count() : 0;
  }
  isNull() {
    return this.type === Kind.Null;
  }
  isMap() {
    return this.type === Kind.Map;
  }
  isArray() {
    return this.type === Kind.Array;
  }
  isNumber() {
    return this.type === Kind.Float || this.type === Kind.Integer;
  }
  isIdentifier() {
    return this.type === Kind.UnsignedInteger;
  }
  isString() {
    return this.type === Kind.String;
  }

  asFloat() {
    return native.dataNumber(bytesOf(this));
  }
  asInteger() {
    return BigInt(native.dataInteger(bytesOf(this)));
  }
  asId() {
    return BigInt(native.dataIdentifier(bytesOf(this)));
  }
  asBool() {
    return native.dataTruth(bytesOf(this));
  }
  asString() {
    return textOf(native.dataString(bytesOf(this)));
  }
  /** Converts to JavaScript values: integers become numbers where those are exact, otherwise bigints. */
  toJS() {
    return readData(new Reader(bytesOf(this)));
  }
  toJSON() {
    return this.toJS();
  }

  find(...path) {
    const reader = new Reader(bytesOf(this));
    let begin = 0;
    for (const step of path) {
      if (typeof step !== "string" && !Number.isInteger(step)) throw check.mustBe("a step", "a key or a position", step);
      const kind = reader.byte();
      if (kind !== (typeof step === "string" ? Kind.Map : Kind.Array)) return null;
      let found = false;
      const size = reader.count();
      for (let i = 0; i < size && !found; ++i) {
        found = kind === Kind.Map ? reader.text() === wellFormed(step) : i === step;
        if (!found) skipData(reader);
      }
      if (!found) return null;
      begin = reader.position;
    }
    const rest = new Reader(bytesOf(this).subarray(begin));
    return new Unstructured(fromBytes, rest.part(skipData));
  }
  #at(path) {
    return this.find(...(Array.isArray(path) ? path : [path])) ?? new Unstructured();
  }
  numberAt(path, otherwise) {
    return native.dataNumberAt(bytesOf(this.#at(path)), check.number(otherwise, "the default number"));
  }
  integerAt(path, otherwise) {
    const [low, high] = check.halves(BigInt.asUintN(64, check.signed64(otherwise, "the default integer")));
    return BigInt(native.dataIntegerAt(bytesOf(this.#at(path)), low, high));
  }
  boolAt(path, otherwise) {
    if (typeof otherwise !== "boolean") throw check.mustBe("the default boolean", "a boolean", otherwise);
    return native.dataBoolAt(bytesOf(this.#at(path)), otherwise);
  }
  stringAt(path, otherwise) {
    const found = this.#at(path);
    return found.isString() ? found.asString() : check.string(otherwise, "the default string");
  }

  toText(maxBytes = 4096, maxDepth = 16) {
    const most = [limit(maxBytes, "a number of bytes"), limit(maxDepth, "a number of levels")];
    return textOf(native.dataText(bytesOf(this), ...most));
  }
  toString() {
    return this.toText();
  }
  [inspect]() {
    return `Unstructured(${this.toText()})`;
  }
  equals(other) {
    return native.dataEquals(bytesOf(this), bytesOf(check.instance(other, Unstructured, "what data is compared with")));
  }
}
export const UnstructuredType = Kind;

function limit(x, what) {
  if (typeof x !== "number" || !(x >= 0)) throw check.mustBe(what, "a number from 0", x);
  return Math.min(Math.floor(x), 0xffffffff);
}

// The vector type with this many components.
const vectors = new Map([[2, Type.Vec2], [3, Type.Vec3], [4, Type.Vec4], [16, Type.Mat4]]);

function valueBytes(content) {
  const out = new Writer();
  if (typeof content === "number") return out.byte(Type.Float).number(content).bytes();
  if (typeof content === "boolean") return out.byte(Type.Boolean).byte(content ? 1 : 0).bytes();
  if (typeof content === "bigint") return out.byte(Type.Int).integer(check.signed64(content, "an integer")).bytes();
  if (typeof content === "string") return out.byte(Type.String).text(content).bytes();
  if (content instanceof Value) return bytesOf(content);
  if (content instanceof held.Path) return out.byte(Type.Path).raw(bytesOf(content)).bytes();
  if (content instanceof Unstructured) return out.byte(Type.Unstructured).raw(bytesOf(content)).bytes();
  const numbers = check.listOfNumbers(content, [...vectors.keys()]);
  if (numbers !== undefined) {
    out.byte(vectors.get(numbers.length));
    for (const n of numbers) out.number(n);
    return out.bytes();
  }
  if (content !== null && typeof content === "object" && plain(content)) {
    return out.byte(Type.Unstructured).raw(bytesOf(new Unstructured(content))).bytes();
  }
  throw check.mustBe("a value",
    "a number, a bigint, a boolean, a string, 2, 3, 4 or 16 numbers, a Path, an Unstructured or an object", content);
}

function resource(type) {
  return (id) => new Value(fromBytes, new Writer().byte(type).integer(check.identifier(id)).bytes());
}

export class Value {
  constructor(content = 0, bytes = undefined) {
    remember(this, content === fromBytes ? bytes : valueBytes(content));
  }
  static Image = resource(Type.Image);
  static Video = resource(Type.Video);
  static Sound = resource(Type.Sound);
  static Model = resource(Type.Model);
  static defaultValue(type, qualifier = 0) {
    return new Value(fromBytes, native.valueDefault(typeOf(type), check.enumerator(qualifier, 256, "a qualifier")));
  }

  get type() {
    return bytesOf(this)[0] & ~nullPayload;
  }
  get number() {
    return native.valueNumber(bytesOf(this));
  }
  get integer() {
    return BigInt(native.valueInteger(bytesOf(this)));
  }
  get boolean() {
    return native.valueTruth(bytesOf(this));
  }
  get id() {
    return BigInt(native.valueIdentifier(bytesOf(this)));
  }
  get vec2() {
    return native.valueVec2(bytesOf(this));
  }
  get vec3() {
    return native.valueVec3(bytesOf(this));
  }
  get vec4() {
    return native.valueVec4(bytesOf(this));
  }
  get mat4() {
    return native.valueMat4(bytesOf(this));
  }
  get string() {
    return textOf(native.valueString(bytesOf(this)));
  }
  get path() {
    return new held.Path(fromBytes, native.valuePath(bytesOf(this)));
  }
  asUnstructured() {
    return new Unstructured(fromBytes, native.valueData(bytesOf(this)));
  }
  asType(type) {
    return new Value(fromBytes, native.valueAsType(bytesOf(this), typeOf(type)));
  }

  toString() {
    return textOf(native.valueText(bytesOf(this)));
  }
  [Symbol.toPrimitive](hint) {
    return hint === "string" ? this.toString() : this.number;
  }
  [inspect]() {
    return `Value(${typeToString(this.type)} ${this})`;
  }
  equals(other) {
    return native.valueEquals(bytesOf(this), bytesOf(check.instance(other, Value, "what a value is compared with")));
  }
}

export const valueOf = (x) => (x instanceof Value ? x : new Value(x));

/** The type of a port as a plain object: {type, subtype, min, max, extra}. */
export function typeInfoBytes(info, out = new Writer()) {
  if (info === null || typeof info !== "object") throw check.mustBe("a TypeInfo", "an object such as {type: Type.Float}", info);
  out.byte(typeOf(info.type ?? Type.Float)).byte(check.enumerator(info.subtype ?? 0, 256, "a subtype"));
  for (const bound of [info.min, info.max, info.extra]) {
    if (bound === undefined || bound === null) out.byte(0);
    else out.byte(1).raw(bytesOf(valueOf(bound)));
  }
  return out.bytes();
}

export const castValueToType = (value, typeInfo) =>
  new Value(fromBytes, native.valueCast(bytesOf(valueOf(value)), typeInfoBytes(typeInfo)));
export const portNameForTypeInfo = (typeInfo, plural = false) =>
  native.portName(typeInfoBytes(typeInfo), Boolean(plural));
