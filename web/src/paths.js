// Paths and easing.

import * as check from "./check.js";
import { native } from "./native.js";
import { bytesOf, fromBytes, held, remember, Value, valueOf } from "./values.js";
import { Reader, Writer } from "./wire.js";

const inspect = Symbol.for("nodejs.util.inspect.custom");

export const PathInstruction = Object.freeze({ moveTo: 0, lineTo: 1, curveTo: 2, quadCurveTo: 3, close: 4 });
const instructionOf = (x) => check.enumerator(x, 5, "a PathInstruction");

export const pathInstructionToString = (instruction) => native.pathInstructionToString(instructionOf(instruction));
export function stringToPathInstruction(name) {
  const instruction = native.stringToPathInstruction(check.string(name, "a name"));
  return instruction < 0 ? null : instruction;
}

function pathBytes(elements) {
  if (elements === null || typeof elements?.[Symbol.iterator] !== "function" || typeof elements === "string") {
    throw check.mustBe("a path's elements", "a list of {instruction, points}", elements);
  }
  const list = [...elements];
  const out = new Writer().count(list.length);
  for (const element of list) {
    if (element === null || typeof element !== "object") throw check.mustBe("an element", "{instruction, points}", element);
    const { instruction, points: given = [] } = element;
    if (!check.isList(given)) throw check.mustBe("an element's points", "an array of points", given);
    const points = Array.from(given, (p) => check.point(p, "a point of an element"));
    out.byte(instructionOf(instruction)).count(points.length);
    for (const [x, y] of points) out.number(x).number(y);
  }
  return out.bytes();
}

export class Path {
  #elements;

  constructor(elements = [], bytes = undefined) {
    remember(this, elements === fromBytes ? bytes : pathBytes(elements));
  }
  get length() {
    return new Reader(bytesOf(this)).count();
  }
  get elements() {
    if (this.#elements === undefined) {
      const reader = new Reader(bytesOf(this));
      this.#elements = Object.freeze(Array.from({ length: reader.count() }, () => {
        const instruction = reader.byte();
        const points = Array.from({ length: reader.count() }, () => Object.freeze([reader.number(), reader.number()]));
        return Object.freeze({ instruction, points: Object.freeze(points) });
      }));
    }
    return this.#elements;
  }
  equals(other) {
    return native.pathEquals(bytesOf(this), bytesOf(pathOf(other, "what a path is compared with")));
  }
  toString() {
    return svgPathData(this);
  }
  [inspect]() {
    return `Path(${this})`;
  }
}
held.Path = Path;

const pathOf = (x, what = "a path") => check.instance(x, Path, what);

export const svgPathData = (path) => native.svgPathData(bytesOf(pathOf(path)));
export function pathFromSvgPathData(data) {
  const answer = native.pathFromSvgPathData(check.string(data, "SVG path data"));
  if (typeof answer === "number") throw new SyntaxError(`invalid SVG path data at byte ${answer}`);
  return new Path(fromBytes, answer);
}
export function bounds(path) {
  const corners = native.bounds(bytesOf(pathOf(path)));
  return corners === null ? null : { min: [corners[0], corners[1]], max: [corners[2], corners[3]] };
}
export const translated = (path, offset) =>
  new Path(fromBytes, native.translated(bytesOf(pathOf(path)), ...check.point(offset, "an offset")));
export const scaled = (path, factors) =>
  new Path(fromBytes, native.scaled(bytesOf(pathOf(path)), ...check.point(factors, "the factors")));
export function interpolate(a, b, t) {
  const bytes = native.interpolate(bytesOf(pathOf(a)), bytesOf(pathOf(b)), check.number(t, "progress"));
  return bytes === null ? null : new Path(fromBytes, bytes);
}

// The same numbers as in drawing.cpp.
const Command = Object.freeze({
  moveTo: 0, lineTo: 1, curveTo: 2, quadCurveTo: 3, close: 4, append: 5, arcTo: 6, ellipse: 7, circle: 8, roundRect: 9,
  hexaRect: 10,
});

export class PathBuilder {
  #commands = new Writer();
  #count = 0;
  #path;
  #point;

  #draw(command, points, last) {
    const checked = points.map((p) => check.point(p, "a point"));
    if (last !== undefined) check.number(last, "a length");
    this.#commands.byte(command);
    for (const [x, y] of checked) this.#commands.number(x).number(y);
    if (last !== undefined) this.#commands.number(last);
    return this.#drawn();
  }
  #drawn() {
    ++this.#count;
    this.#path = undefined;
    this.#point = undefined;
    return this;
  }
  #all() {
    return new Writer().count(this.#count).raw(this.#commands.bytes()).bytes();
  }

  get currentPoint() {
    this.#point ??= Object.freeze(Array.from(native.currentPoint(this.#all())));
    return this.#point;
  }
  moveTo(p) {
    return this.#draw(Command.moveTo, [p]);
  }
  lineTo(p) {
    return this.#draw(Command.lineTo, [p]);
  }
  curveTo(c1, c2, p) {
    return this.#draw(Command.curveTo, [c1, c2, p]);
  }
  quadCurveTo(c, p) {
    return this.#draw(Command.quadCurveTo, [c, p]);
  }
  close() {
    return this.#draw(Command.close, []);
  }
  append(path) {
    const bytes = bytesOf(pathOf(path));
    this.#commands.byte(Command.append).raw(bytes);
    return this.#drawn();
  }
  arcTo(p, verticalFirst) {
    if (typeof verticalFirst !== "boolean") throw check.mustBe("verticalFirst", "a boolean", verticalFirst);
    const [x, y] = check.point(p, "a point");
    this.#commands.byte(Command.arcTo).number(x).number(y).byte(verticalFirst ? 1 : 0);
    return this.#drawn();
  }
  ellipse(center, radii) {
    return this.#draw(Command.ellipse, [center, radii]);
  }
  circle(center, radius) {
    return this.#draw(Command.circle, [center], check.number(radius, "a radius"));
  }
  roundRect(origin, size, radius) {
    return this.#draw(Command.roundRect, [origin, size], check.number(radius, "a radius"));
  }
  hexaRect(origin, size, cut) {
    return this.#draw(Command.hexaRect, [origin, size], check.number(cut, "a cut"));
  }
  build() {
    this.#path ??= new Path(fromBytes, native.buildPath(this.#all()));
    return this.#path;
  }
}

export const EasingFunction = Object.freeze({
  Linear: 0, QuadraticIn: 1, QuadraticOut: 2, QuadraticInOut: 3, CubicIn: 4, CubicOut: 5, CubicInOut: 6,
  ExponentialIn: 7, ExponentialOut: 8, ExponentialInOut: 9, SinusoidalIn: 10, SinusoidalOut: 11, SinusoidalInOut: 12,
});
const curveOf = (x) => check.enumerator(x, 13, "an EasingFunction");

export const easingFunctionNames = () => native.easingFunctionNames();
export function stringToEasingFunction(name) {
  const curve = native.stringToEasingFunction(check.string(name, "a name"));
  return curve < 0 ? null : curve;
}

// The type of an end: "number", "bigint", "value" or the number of a vector's components.
function endOf(x) {
  if (typeof x === "number" || typeof x === "bigint") return typeof x;
  if (x instanceof Value) return "value";
  const numbers = check.listOfNumbers(x, [2, 3, 4]);
  if (numbers !== undefined) return numbers.length;
  throw check.mustBe("an end", "a number, a bigint, 2 to 4 numbers or a Value", x);
}

export function ease(easingFunction, start, end, t) {
  const curve = curveOf(easingFunction);
  const kind = endOf(start);
  const other = endOf(end);
  if (kind !== other && kind !== "value" && other !== "value") {
    throw new TypeError(`both ends must be of one type, not ${check.describe(start)} and ${check.describe(end)}`);
  }
  if (typeof t === "number") {
    if (kind === "number" && other === "number") return native.easeNumber(curve, start, end, t);
    const eased = new Value(fromBytes, native.easeValue(curve, bytesOf(valueOf(start)), bytesOf(valueOf(end)), t));
    if (kind === "value" || other === "value") return eased;
    return kind === "bigint" ? eased.integer : eased[`vec${kind}`];
  }
  const progress = progressOf(t);
  if (kind === "bigint" || kind === "value" || other === "value") {
    throw new TypeError("a list of progress needs numbers or vectors as ends");
  }
  return native.easeMany(curve, bytesOf(valueOf(start)), bytesOf(valueOf(end)), progress);
}

// A copy, which cannot change or be detached while it is read.
function progressOf(t) {
  if (check.typedArrayKind(t) === "Float64Array") return new Float64Array(t);
  const numbers = check.listOfNumbers(t);
  if (numbers === undefined) throw check.mustBe("progress", "a number or a list of numbers", t);
  return Float64Array.from(numbers);
}
