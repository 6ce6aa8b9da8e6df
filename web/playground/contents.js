// Parses values as users type them.

import { pathFromSvgPathData, svgPathData, Type, Unstructured, Value } from "../src/library.js";

const colour = /^#([0-9a-f]{2})([0-9a-f]{2})([0-9a-f]{2})([0-9a-f]{2})?$/i;

function numbersOf(text, count) {
  const parts = text.split(/[\s,;]+/).filter((part) => part !== "");
  const numbers = parts.map(numberOf);
  if (count !== undefined && numbers.length !== count) throw new SyntaxError(`expected ${count} numbers, not ${numbers.length}`);
  return numbers;
}

export function numberOf(text) {
  const trimmed = text.trim();
  const number = /^[+-]?inf(inity)?$/i.test(trimmed) ? (trimmed[0] === "-" ? -Infinity : Infinity) : Number(trimmed);
  if (trimmed === "" || (Number.isNaN(number) && !/^[+-]?nan$/i.test(trimmed))) throw new SyntaxError(`"${text}" is not a number`);
  return number;
}

function integerOf(text) {
  if (!/^\s*[+-]?\d+\s*$/.test(text)) throw new SyntaxError(`"${text}" is not an integer`);
  return BigInt(text.trim().replace(/^\+/, ""));
}

function colourOf(text) {
  const found = colour.exec(text.trim());
  if (found === null) return numbersOf(text, 4);
  return found.slice(1).map((part) => (part === undefined ? 1 : parseInt(part, 16) / 255));
}

/** The kinds that can be typed: name, initial text, and parser. */
export const kinds = {
  number: { name: "Number", begin: "2.5", read: (text) => new Value(numberOf(text)) },
  integer: { name: "Integer", begin: "42", read: (text) => new Value(integerOf(text)) },
  boolean: { name: "Boolean", begin: "true", read: booleanOf },
  vec2: { name: "Two numbers", begin: "1, 2", read: (text) => new Value(numbersOf(text, 2)) },
  vec3: { name: "Three numbers", begin: "1, 2, 3", read: (text) => new Value(numbersOf(text, 3)) },
  vec4: { name: "Four numbers", begin: "1, 2, 3, 4", read: (text) => new Value(numbersOf(text, 4)) },
  colour: { name: "Colour", begin: "#ffb454", read: (text) => new Value(colourOf(text)) },
  string: { name: "String", begin: "text", read: (text) => new Value(text) },
  data: { name: "Data (JSON)", begin: '{"X": 1, "Y": [2, 3]}', read: (text) => new Value(new Unstructured(JSON.parse(text))) },
  image: { name: "Image", begin: "7", read: (text) => Value.Image(integerOf(text)) },
};

function booleanOf(text) {
  const found = new Map([["true", true], ["false", false], ["1", true], ["0", false]]).get(text.trim().toLowerCase());
  if (found === undefined) throw new SyntaxError(`expected true, false, 1 or 0, not "${text}"`);
  return new Value(found);
}

/** An end of a curve: a number, two to four numbers or a colour. */
export function endOf(text) {
  if (colour.test(text.trim())) return colourOf(text);
  const numbers = numbersOf(text);
  if (numbers.length === 1) return numbers[0];
  if (numbers.length >= 2 && numbers.length <= 4) return numbers;
  throw new SyntaxError("expected one to four numbers, or a colour");
}

const cppNumber = (number) =>
  Object.is(number, -0) ? "-0.0" : Number.isFinite(number) ? String(number).replace(/^(-?\d+)$/, "$1.0")
    : Number.isNaN(number) ? "NAN" : number < 0 ? "-INFINITY" : "INFINITY";

/** The same in C++. */
export function cppOf(content) {
  if (typeof content === "number") return cppNumber(content);
  return `FloatVec${content.length}{${Array.from(content, cppNumber).join(", ")}}`;
}

export const isColour = (text) => colour.test(text.trim());
export const typeNames = Object.keys(Type);

function pathOf(text) {
  const path = pathFromSvgPathData(text);
  if (path === null) throw new SyntaxError(`"${text}" is not valid SVG path data`);
  return new Value(path);
}

const vector = (count, name) => ({
  show: (value) => Array.from(value[name], String).join(", "), read: (text) => new Value(colourOrNumbers(text, count)),
});
const colourOrNumbers = (text, count) => (count === 4 ? colourOf(text) : numbersOf(text, count));
const resource = (name) => ({ show: (value) => String(value.id), read: (text) => Value[name](integerOf(text)) });

/** Formats the value of an input for a field, and parses it, by type. */
export const fields = {
  [Type.Float]: { show: (value) => String(value.number), read: kinds.number.read },
  [Type.Int]: { show: (value) => String(value.integer), read: kinds.integer.read },
  [Type.Boolean]: { show: (value) => String(value.boolean), read: booleanOf },
  [Type.Vec2]: vector(2, "vec2"),
  [Type.Vec3]: vector(3, "vec3"),
  [Type.Vec4]: vector(4, "vec4"),
  [Type.Mat4]: vector(16, "mat4"),
  [Type.Image]: resource("Image"),
  [Type.Video]: resource("Video"),
  [Type.Sound]: resource("Sound"),
  [Type.Model]: resource("Model"),
  [Type.String]: { show: (value) => value.string, read: kinds.string.read },
  [Type.Path]: { show: (value) => svgPathData(value.path), read: pathOf },
  [Type.Unstructured]: { show: (value) => JSON.stringify(value.asUnstructured()), read: kinds.data.read },
};
