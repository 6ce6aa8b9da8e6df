// Values, unstructured data and ports: the table of conversions shared with C++ and Python, and invalid values.

import assert from "node:assert/strict";
import { readFileSync } from "node:fs";
import { test } from "node:test";

import * as engine from "../../build/web/engine_base.mjs";

const { Type, Unstructured, Value } = engine;
const tables = new URL("../../tests/tables/", import.meta.url);

function bits(numbers) {
  return [...new BigUint64Array(Float64Array.from(numbers).buffer)];
}

// Compares a conversion of the table.
const conversions = {
  integer: (value, expected) => assert.equal(value.integer, expected.asInteger()),
  number: (value, expected) => {
    assert.deepEqual(bits([value.number]), bits([expected.asFloat()]));
    assert.deepEqual(bits([Number(value)]), bits([expected.asFloat()]));
  },
  boolean: (value, expected) => assert.equal(value.boolean, expected.asInteger() === 1n),
  identifier: (value, expected) => assert.equal(value.id, expected.asId()),
  vec2: (value, expected) => assert.deepEqual(bits(value.vec2), bits(expected.toJS())),
  vec3: (value, expected) => assert.deepEqual(bits(value.vec3), bits(expected.toJS())),
  vec4: (value, expected) => assert.deepEqual(bits(value.vec4), bits(expected.toJS())),
  string: (value, expected) => assert.equal(value.string, expected.asString()),
  to_string: (value, expected) => {
    assert.equal(value.toString(), expected.asString());
    assert.equal(`${value}`, expected.asString());
  },
};

test("conversions match the table", () => {
  const root = engine.readDocument(readFileSync(new URL("conversions.json", tables)));
  let compared = 0;
  for (const row of root.inputs) {
    assert.equal(row.defaultValue.type, row.typeInfo.type, row.name);
    for (const target of Object.keys(row.attributes.toJS())) {
      conversions[target](row.defaultValue, row.attributes.find(target));
      ++compared;
    }
  }
  assert.equal(compared, 434);
});

test("values are constructed from JavaScript's values", () => {
  for (const [content, type, text] of [
    [undefined, Type.Float, "0"], [2.5, Type.Float, "2.5"], [-0, Type.Float, "0"], [NaN, Type.Float, "nan"],
    [true, Type.Boolean, "1"], ["text", Type.String, "text"], ["", Type.String, ""], [7n, Type.Int, "7"],
    [-(2n ** 63n), Type.Int, "-9223372036854775808"], [[1, 2], Type.Vec2, "1, 2"],
    [new Float32Array([1, 2, 3]), Type.Vec3, "1, 2, 3"], [new Float64Array([1, 2, 3, 4]), Type.Vec4, "1, 2, 3, 4"],
    [new engine.Path(), Type.Path, "Empty Path"], [new Unstructured("data"), Type.Unstructured, "data"],
    [{ a: 1 }, Type.Unstructured, "unstructured"], [new Map([["a", 1]]), Type.Unstructured, "unstructured"],
    [new Value([1, 2]), Type.Vec2, "1, 2"],
  ]) {
    const value = new Value(content);
    assert.equal(value.type, type, text);
    assert.equal(value.toString(), text);
  }
  const identity = [1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1];
  assert.deepEqual([...new Value(identity).mat4], identity);
  assert.deepEqual([...new Value(3).mat4], identity);
  for (const kind of ["Image", "Video", "Sound", "Model"]) {
    const value = Value[kind](2n ** 64n - 1n);
    assert.equal(value.type, Type[kind]);
    assert.equal(value.id, 2n ** 64n - 1n);
    assert.equal(Value[kind](5).id, 5n);
  }
});

test("values convert, compare and do arithmetic", () => {
  assert.equal(new Value([3, 4]).asType(Type.Int).integer, 3n);
  assert.equal(new Value("12.5").asType(Type.Float).number, 12.5);
  assert.equal(new Value(1) + 1, 2);
  assert.ok(new Value(1).equals(new Value(1)));
  assert.ok(!new Value(1).equals(new Value(1n)));
  assert.ok(new Value([1, 2]).asUnstructured().equals(new Unstructured({ X: 1.5, Y: 2 })) === false);
  assert.equal(new Value([1.5, 2.5]).asUnstructured().toText(), '{"X": 1.5, "Y": 2.5}');
  assert.equal(Value.defaultValue(Type.Vec4, 4).toString(), "0, 0, 0, 1");
  assert.equal(new Value(new engine.PathBuilder().circle([0, 0], 1).build()).path.length, 6);
  assert.equal(new Value(3).path.length, 0);
});

test("types have names", () => {
  const names = Object.values(Type).map(engine.typeToString);
  assert.deepEqual(names, ["float", "vec2", "vec3", "vec4", "mat4", "boolean", "int", "image", "video", "sound", "path",
    "string", "model", "unstructured"]);
  for (const [number, name] of names.entries()) assert.equal(engine.stringToType(name), number);
  assert.equal(engine.stringToType("Float"), null);
  assert.deepEqual(names.filter((_, type) => engine.typeIsResource(type)), ["image", "video", "sound", "model"]);
  assert.deepEqual(names.filter((_, type) => !engine.typeShouldCopyAcrossDeletedConnections(type)),
    ["path", "model", "unstructured"]);
});

test("ports clamp values and have names", () => {
  const info = { type: Type.Float, min: 0, max: new Value(10) };
  for (const [value, bounded] of [[-1, 0], [5, 5], [11, 10]]) {
    assert.equal(engine.castValueToType(value, info).number, bounded);
  }
  assert.equal(engine.castValueToType(-1, {}).number, -1);
  assert.equal(engine.portNameForTypeInfo({}), "Number");
  assert.equal(engine.portNameForTypeInfo({ type: Type.Vec4, subtype: 0 }, true).length > 0, true);
  assert.equal(engine.portNameForTypeInfo({ type: Type.Unstructured, subtype: 1 }), "Layer");
});

test("unstructured data converts from and to plain objects", () => {
  const plain = {
    text: "x", integer: 3, number: 2.5, negative: -1, zero: 0, nothing: null, list: [1, [2, { deep: [] }], "é\u0000"],
    empty: {}, __proto__x: 1, large: 2n ** 60n,
  };
  assert.deepEqual(new Unstructured(plain).toJS(), plain);
  assert.deepEqual(new Unstructured(JSON.parse('{"__proto__": {"a": 1}}')).toJS(), JSON.parse('{"__proto__": {"a": 1}}'));
  for (const [data, text] of [
    [3, "3"], [2.5, "2.5"], [1e300, "1e300"], [-0, "-0.0"], [NaN, "nan"], [5n, "5"], [Unstructured.identifier(7), "7u"],
    ["a\n", '"a\\n"'], [[true, false], "[1, 0]"], [new Float64Array([1, 2]), "[1.0, 2.0]"], [new BigInt64Array([1n]), "[1]"], [[undefined], "[null]"],
    [{ a: undefined, b: 1 }, '{"b": 1}'], [new Value([1, 2]), '{"X": 1.0, "Y": 2.0}'], [undefined, "null"],
    [[new Unstructured([1])], "[[1]]"], [new Map([["k", 1]]), '{"k": 1}'], ["\ud800", '"\ufffd"'],
  ]) {
    assert.equal(new Unstructured(data).toText(), text);
  }
  assert.equal(JSON.stringify({ data: new Unstructured([1, "a"]) }), '{"data":[1,"a"]}');
});

test("lookups take paths and defaults", () => {
  const data = new Unstructured({ a: { b: [1, 2.5, "x", 0] }, id: Unstructured.identifier(9) });
  assert.equal(data.find("a", "b", 1).asFloat(), 2.5);
  assert.equal(data.find("a", "b").size, 4);
  assert.equal(data.find("a", "c"), null);
  assert.equal(data.find("a", 0), null);
  assert.equal(data.find("a", "b", 4), null);
  assert.ok(data.find().equals(data));
  assert.equal(data.numberAt(["a", "b", 0], 7), 1);
  assert.equal(data.numberAt(["a", "b", 2], 7), 7);
  assert.equal(data.integerAt(["a", "b", 0], 7), 1n);
  assert.equal(data.integerAt("missing", -7), -7n);
  assert.equal(data.boolAt(["a", "b", 3], true), false);
  assert.equal(data.boolAt(["a", "b", 2], true), true);
  assert.equal(data.stringAt(["a", "b", 2], "y"), "x");
  assert.equal(data.stringAt("a", "y"), "y");
  assert.equal(data.find("id").asId(), 9n);
  assert.equal(data.find("id").asInteger(), 0n);
  assert.deepEqual([data, data.find("a", "b"), data.find("a", "b", 0), data.find("id"), data.find("a", "b", 2),
    new Unstructured()].map((x) => [x.isMap(), x.isArray(), x.isNumber(), x.isIdentifier(), x.isString(), x.isNull()]
    .indexOf(true)), [0, 1, 2, 3, 4, 5]);
  assert.equal(data.find("a").asBool(), true);
  assert.equal(data.find("a", "b", 2).asString(), "x");
  assert.equal(data.type, engine.UnstructuredType.Map);
  assert.equal(data.toText(20), data.toText().slice(0, 17) + "...");
});

test("unstructured data may be of any depth", () => {
  let nested = [];
  for (let i = 0; i < 200000; ++i) nested = [nested];
  const data = new Unstructured(nested);
  assert.ok(data.equals(new Unstructured(nested)));
  let found = data.toJS();
  let levels = 0;
  for (; found.length > 0; ++levels) [found] = found;
  assert.equal(levels, 200000);
});

test("invalid values, data and types are rejected, and nothing changes", () => {
  const cyclic = { a: [] };
  cyclic.a.push(cyclic);
  const value = new Value(1);
  for (const [call, error] of [
    [() => new Value(null), TypeError], [() => new Value(Symbol()), TypeError], [() => new Value([1]), TypeError],
    [() => new Value([1, "2"]), TypeError], [() => new Value(() => 1), TypeError], [() => new Value(2n ** 63n), RangeError],
    [() => new Value(new Date()), TypeError], [() => Value.Image(-1), RangeError], [() => Value.Image(1.5), TypeError],
    [() => Value.Image(2n ** 64n), RangeError], [() => value.asType(14), TypeError], [() => value.asType("vec2"), TypeError],
    [() => value.asType(), TypeError], [() => value.equals(1), TypeError], [() => Value.defaultValue(3, 256), TypeError],
    [() => Object.getOwnPropertyDescriptor(Value.prototype, "number").get.call({}), TypeError],
    [() => new Unstructured(cyclic), TypeError], [() => new Unstructured({ a: Symbol() }), TypeError],
    [() => new Unstructured([() => 1]), TypeError],
    [() => new Unstructured(new Map([[1, 2]])), TypeError], [() => new Unstructured(2n ** 64n), RangeError],
    [() => new Unstructured({ get a() { throw new RangeError("of the getter"); } }), RangeError],
    [() => new Unstructured([1]).find(1.5), TypeError], [() => new Unstructured().toText(-1), TypeError],
    [() => new Unstructured().toText("x"), TypeError], [() => new Unstructured().numberAt([], "x"), TypeError],
    [() => new Unstructured().boolAt([], 1), TypeError], [() => new Unstructured().stringAt([], 1), TypeError],
    [() => new Unstructured().integerAt([], 1.5), TypeError], [() => new Unstructured().equals(null), TypeError],
    [() => engine.typeToString(-1), TypeError], [() => engine.stringToType(1), TypeError],
    [() => engine.castValueToType(1, null), TypeError], [() => engine.castValueToType(1, { min: null, type: 99 }), TypeError],
    [() => engine.portNameForTypeInfo({ subtype: 256 }), TypeError],
  ]) {
    assert.throws(call, (thrown) => thrown instanceof error && /^[a-z].* .*[^.]$/i.test(thrown.message), call.toString());
  }
  assert.equal(value.number, 1);
  assert.equal(new Value(2).number, 2);
});
