// Attacks on the module: objects that lie, change or are detached while they are read, and graphs
// that no editor makes. The library must stay intact after each.

import assert from "node:assert/strict";
import { afterEach, test } from "node:test";
import vm from "node:vm";

import * as engine from "../../build/web/engine_base.mjs";

const { Patch, PatchEdit, PatchIndex, PathBuilder, Unstructured, Value } = engine;

afterEach(() => assert.equal(`${new Value([1, 2])}`, "1, 2"));

class Lying extends Float64Array {
  get length() {
    return 8;
  }
  *[Symbol.iterator]() {
    yield "x";
  }
}

function detached(array) {
  structuredClone(array.buffer, { transfer: [array.buffer] });
  return array;
}

test("a builder still works after rejecting a path", () => {
  const builder = new PathBuilder().moveTo([1, 2]);
  assert.throws(() => builder.append(null), TypeError);
  assert.throws(() => builder.append({}), TypeError);
  assert.equal(`${builder.lineTo([3, 4]).build()}`, "M1 2L3 4");
});

test("points are read once", () => {
  let reads = 0;
  const builder = new PathBuilder();
  builder.moveTo({ get x() { return reads++ === 0 ? 5 : 1n; }, y: 0 });
  assert.equal(`${builder.build()}`, "M5 0");
});

test("lists with a wrong length are read by their content", () => {
  for (const list of [new Lying(4), Object.defineProperty(new Float64Array(4), "length", { value: 2 ** 29 })]) {
    assert.throws(() => new Unstructured(new Lying(4)), TypeError);
    assert.equal(engine.ease(0, 0, 1, list).length, 4);
  }
  assert.equal(engine.ease(0, 0, 1, detached(new Float64Array(4)).length).length, undefined);
  for (let i = 0; i < 30000; ++i) assert.throws(() => engine.ease(0, 0, 1, detached(new Float64Array(1))), TypeError);
  for (const length of [-3, 2 ** 32 + 10]) {
    const bytes = Object.defineProperty(new TextEncoder().encode("{}"), "length", { value: length });
    assert.throws(() => engine.readDocument(bytes), engine.DocumentError);
  }
  assert.throws(() => engine.ease(0, 0, 1, Object.create(Float64Array.prototype)), TypeError);
});

test("integers of typed arrays are exact or rejected", () => {
  assert.equal(new Unstructured(new Int32Array([1, 2])).toText(), "[1, 2]");
  assert.throws(() => new Unstructured(new BigUint64Array([2n ** 64n - 1n])), RangeError);
  assert.throws(() => new Value(1n << 1000000n), { name: "RangeError", message: /a very large integer/ });
});

test("values are immutable, and their bytes are private", () => {
  const value = new Value("abc");
  assert.deepEqual(Object.getOwnPropertySymbols(Value.prototype).map(String),
    ["Symbol(Symbol.toPrimitive)", "Symbol(nodejs.util.inspect.custom)"]);
  assert.deepEqual([Object.keys(value), Object.getOwnPropertySymbols(value)], [[], []]);
  for (const get of ["number", "string", "path", "type"]) {
    assert.throws(() => Object.getOwnPropertyDescriptor(Value.prototype, get).get.call(Object.create(Value.prototype)),
      { name: "TypeError", message: /^this must be a Value/ });
  }
});

test("strings keep byte order marks, and invalid UTF-8 becomes U+FFFD", () => {
  for (const text of ["\ufeff" + "a".repeat(30), "x\0\ufeff" + "a".repeat(40), "\ufeffa"]) {
    assert.equal(new Value(text).string, text);
    assert.equal(`${new Value(text)}`, text);
    assert.equal(new Unstructured(text).asString(), text);
  }
  const document = '{"root":{"id":1,"inputs":[{"id":1,"type":"string","default":"a\\u001ae2b"}]}}';
  assert.equal(engine.readDocument(document).inputs[0].defaultValue.string, "a\ufffdb");
});

test("lone surrogates in keys become U+FFFD", () => {
  const data = new Unstructured(new Map([["\ud800", 1], ["\ud801", 2]]));
  assert.deepEqual([data.size, data.find("\ufffd").asInteger(), data.find("\ud800").asInteger()], [1, 2n, 2n]);
});

test("objects of other realms are accepted", () => {
  assert.equal(new Unstructured(vm.runInNewContext("({a: [1, new Float64Array([2])]})")).toText(), '{"a": [1, [2.0]]}');
  assert.equal(`${new Value(vm.runInNewContext("new Float32Array([1, 2])"))}`, "1, 2");
  const bytes = vm.runInNewContext("Uint8Array.from(text, (c) => c.charCodeAt(0))", { text: '{"root":{"id":5}}' });
  assert.equal(engine.readDocument(bytes).id, 5n);
});

test("graphs with dangling connections are evaluated", () => {
  const text = '{"identifiers":"any","root":{"id":1,"connections":[{"from":[5,6],"to":[7,8]}]}}';
  assert.deepEqual(new engine.Evaluator(engine.readDocument(text)).evaluate(0).drawn(), []);
});

test("evaluators use the frame rate", () => {
  const root = engine.readDocument('{"root":{"id":1,"children":[{"id":2,"kind":"time","outputs":[{"id":3,"type":"float"}]}]}}');
  assert.equal(new engine.Evaluator(root, 10).evaluate(10).outputValues(3)[0].number, 1);
  assert.equal(new engine.Evaluator(root).evaluate(60).outputValues(3)[0].number, 1);
});

test("ports with null payloads are copied", () => {
  const ports = Array.from({ length: 40 }, (_, i) => `{"id":${i + 1},"type":"string","defaultType":"null string"}`);
  const { inputs } = engine.readDocument(`{"root":{"id":1,"inputs":[${ports}]}}`);
  assert.equal(new Patch({ id: 1, inputs }).inputs.length, 40);
});

test("edits cannot exceed the depth limit", () => {
  const chain = (first, levels) => {
    let patch = { id: first + levels - 1 };
    for (let i = first + levels - 2; i >= first; --i) patch = { id: i, children: [patch] };
    return patch;
  };
  const edit = new PatchEdit(new PatchIndex(new Patch(chain(1, 10))));
  for (let i = 10; i < 1000; ++i) assert.ok(edit.addPatch(i, { id: i + 1 }));
  assert.throws(() => edit.addPatch(1000, { id: 2000 }), { name: "RangeError", message: /deeper than 1000 levels/ });
  assert.ok(edit.addPatch(1, chain(3000, 999)));
  assert.throws(() => edit.addPatch(2, chain(5000, 999)), RangeError);
  assert.throws(() => edit.movePatch(3000, 2), RangeError);
  assert.ok(!edit.addPatch(1, { id: 5 }));
  assert.ok(edit.movePatch(500, 1));
  assert.ok(edit.addPatch(1000, chain(7000, 400)));
  const root = edit.commit();
  assert.equal(root.children.length, 3);
  assert.ok(!edit.addPatch(1, { id: 9000 }));
  root.free();
});

test("repeated moves, also with repeated identifiers, terminate", () => {
  let chain = { id: 40 };
  for (let id = 39; id > 2; --id) chain = { id, children: [chain] };
  const edit = new PatchEdit(new PatchIndex(new Patch({ id: 1, children: [{ id: 2 }, chain] })));
  for (let id = 40; id > 3; --id) {
    for (const parent of [2, id - 1, 2, id - 1]) assert.ok(edit.movePatch(id, parent));
  }
  assert.ok(edit.movePatch(3, 2));
  const repeated = new Patch({ id: 1, children: [{ id: 2, children: [{ id: 1 }, { id: 3 }, { id: 3 }] }, { id: 3 }] });
  const other = new PatchEdit(new PatchIndex(repeated));
  for (const [id, parent] of [[2, 3], [3, 2], [2, 1], [3, 1]]) {
    try {
      assert.equal(typeof other.movePatch(id, parent), "boolean");
    } catch (error) {
      assert.equal(error.name, "RangeError");
    }
  }
});

test("positions beyond a list mean its end", () => {
  for (const position of [2, 2 ** 32, Number.MAX_SAFE_INTEGER]) {
    const edit = new PatchEdit(new PatchIndex(new Patch({ id: 1, children: [{ id: 2 }, { id: 3 }] })));
    assert.ok(edit.addPatch(1, { id: 4 }, position));
    assert.deepEqual(edit.commit().children.map(({ id }) => id), [2n, 3n, 4n]);
  }
});

test("freeing an object while an argument is read is an error", () => {
  const edit = new PatchEdit(new PatchIndex(new Patch({ id: 1 })));
  const connection = { get fromPatchId() { edit.free(); return 1; }, fromPortId: 1, toPatchId: 1, toPortId: 1 };
  assert.throws(() => edit.connect(connection), { message: "this edit was freed" });
});

test("errors of documents are one line", () => {
  assert.throws(() => engine.readDocument('{"root":{"id":1,"attributes":{},"children":[{"id":"\\n"}]}}'),
    (error) => !/[\u0000-\u001f]/.test(error.message));
});
