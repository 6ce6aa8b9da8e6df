// Checks arguments. Invalid ones throw an error with a full sentence.

export function describe(x) {
  if (x === null) return "null";
  if (Array.isArray(x)) return `an array of ${x.length}`;
  switch (typeof x) {
    case "undefined":
      return "nothing";
    case "string":
      return x.length > 40 ? "a long string" : JSON.stringify(x);
    case "number":
    case "boolean":
      return String(x);
    case "bigint":
      return x >= -(2n ** 70n) && x <= 2n ** 70n ? `${x}n` : "a very large integer";
    case "object":
      return `an object (${typeof x.constructor?.name === "string" ? x.constructor.name : "without a class"})`;
    default:
      return `a ${typeof x}`;
  }
}

export function mustBe(what, wanted, x) {
  return new TypeError(`${what} must be ${wanted}, not ${describe(x)}`);
}

export function number(x, what) {
  if (typeof x !== "number") throw mustBe(what, "a number", x);
  return x;
}

export function string(x, what) {
  if (typeof x !== "string") throw mustBe(what, "a string", x);
  return x;
}

// A 64-bit BigInt, from a BigInt or an exact integral number.
function wide(x, what, wanted, least, most) {
  if (typeof x === "number" && Number.isSafeInteger(x)) x = BigInt(x);
  if (typeof x !== "bigint") throw mustBe(what, wanted, x);
  if (x < least || x > most) throw new RangeError(`${what} must be ${wanted}, not ${describe(x)}`);
  return x;
}

export function signed64(x, what) {
  return wide(x, what, "an integer of 64 bits", -(2n ** 63n), 2n ** 63n - 1n);
}

export function identifier(x, what = "an identifier") {
  return wide(x, what, "an unsigned integer of 64 bits", 0n, 2n ** 64n - 1n);
}

// Splits it into the two halves that native functions take.
export function halves(x, what) {
  const id = identifier(x, what);
  return [Number(id & 0xffffffffn), Number(id >> 32n)];
}

export function enumerator(x, names, what) {
  if (!Number.isInteger(x) || x < 0 || x >= names) throw mustBe(what, `one of its ${names} enumerators`, x);
  return x;
}

// A position in a list; undefined is the end.
export function position(x) {
  if (x === undefined) return -1;
  if (!Number.isSafeInteger(x) || x < 0) throw mustBe("a position", "an integer from 0", x);
  return x;
}

const typedArray = Object.getPrototypeOf(Uint8Array.prototype);
const tagOf = Object.getOwnPropertyDescriptor(typedArray, Symbol.toStringTag).get;

/** The kind of a typed array, from this page or another: "Float64Array"; undefined for everything else. */
export const typedArrayKind = (x) => tagOf.call(x);

export const isList = (x) => Array.isArray(x) || typedArrayKind(x) !== undefined;

// The numbers of a list, or undefined for anything else; `counts` are the allowed lengths, if
// limited.
export function listOfNumbers(x, counts) {
  if (!isList(x)) return undefined;
  const numbers = Array.from(x);
  const isOfCount = counts === undefined || counts.includes(numbers.length);
  return isOfCount && numbers.every((n) => typeof n === "number") ? numbers : undefined;
}

export function point(x, what) {
  const numbers = listOfNumbers(x, [2]);
  if (numbers !== undefined) return numbers;
  if (x !== null && typeof x === "object" && !isList(x)) {
    const { x: px, y: py } = x;
    if (typeof px === "number" && typeof py === "number") return [px, py];
  }
  throw mustBe(what, "a point: [x, y] or {x, y}", x);
}

export function instance(x, type, what) {
  if (!(x instanceof type)) throw mustBe(what, `a ${type.name}`, x);
  return x;
}
