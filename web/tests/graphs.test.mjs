// Graphs, edits, changes, documents and their evaluation.

import assert from "node:assert/strict";
import { readFileSync } from "node:fs";
import { test } from "node:test";

import * as engine from "../../build/web/engine_base.mjs";

const { Patch, PatchChangeKind, PatchEdit, PatchIndex, Type, Value } = engine;
const documents = new URL("../../examples/documents/", import.meta.url);
const textOf = (name) => readFileSync(new URL(name, documents), "utf8");

const connection = { fromPatchId: 2n, fromPortId: 22n, toPatchId: 3n, toPortId: 31n };
const fields = {
  id: 1, name: "root", descriptor: "d", builtin: 7n, attributes: { a: [1] },
  modelLayer: { id: 5, children: [{ id: 6 }], additionalLayers: [{ id: 7 }] },
  inputs: [{ id: 11, tag: 1, name: "in", typeInfo: { type: Type.Float, min: 0, max: 1 }, defaultValue: 0.5 }],
  connections: [connection],
  children: [
    { id: 2, name: "source", outputs: [{ id: 22, tag: 3, typeInfo: { type: Type.Vec2 } }] },
    { id: 3, name: "target", inputs: [{ id: 31, tag: 4, attributes: { unit: "mm" } }] },
  ],
};
const graph = () => new Patch(fields);

test("a patch has the fields that it was constructed from", () => {
  const root = graph();
  assert.deepEqual([root.id, root.builtin, root.name, root.descriptor], [1n, 7n, "root", "d"]);
  assert.deepEqual(root.attributes.toJS(), { a: [1] });
  assert.deepEqual(root.modelLayer, {
    id: 5n, children: [{ id: 6n, children: [], additionalLayers: [] }],
    additionalLayers: [{ id: 7n, children: [], additionalLayers: [] }],
  });
  const [input] = root.inputs;
  assert.deepEqual([input.id, input.tag, input.name, input.typeInfo.type], [11n, 1n, "in", Type.Float]);
  assert.deepEqual([input.typeInfo.min.number, input.typeInfo.max.number, input.typeInfo.extra], [0, 1, null]);
  assert.equal(input.defaultValue.number, 0.5);
  assert.deepEqual(root.connections, [connection]);
  assert.deepEqual(root.children.map((child) => child.name), ["source", "target"]);
  assert.ok(root.children[0].outputs[0].defaultValue.equals(new Value([0, 0])));
  assert.ok(root.equals(graph()));
  assert.ok(!root.equals(root.children[0]));
  assert.ok(new Patch({ ...fields, children: [...root.children] }).equals(root));
  const empty = new Patch();
  assert.deepEqual([empty.id, empty.name, empty.inputs.length, empty.children.length], [0n, "", 0, 0]);
});

test("patches and ports are found", () => {
  const root = graph();
  assert.equal(engine.findPatchRecursive(root, 3).name, "target");
  assert.equal(engine.findPatchRecursive(root, 9), null);
  assert.equal(engine.inPortForTag(root, 1).name, "in");
  assert.equal(engine.inPortForTag(root, 2), null);
  assert.equal(engine.outPortForTag(root.children[0], 3n).id, 22n);
  assert.equal(engine.outPortForTag(root, 1), null);
  const index = new PatchIndex(root);
  assert.equal(index.root, root);
  assert.equal(index.findPatch(1), root);
  assert.equal(index.findPatch(2n).name, "source");
  assert.equal(index.findPatch(9), null);
  assert.equal(index.parentOf(2), root);
  assert.equal(index.parentOf(1), null);
  assert.equal(index.ownerOfPort(22).name, "source");
  assert.equal(index.ownerOfPort(99), null);
  assert.equal(index.findInputPort(31).attributes.stringAt("unit", ""), "mm");
  assert.equal(index.findInputPort(22), null);
  assert.equal(index.findOutputPort(22).typeInfo.type, Type.Vec2);
  assert.equal(index.findOutputPort(31), null);
  assert.deepEqual(index.incomingConnection(31), connection);
  assert.equal(index.incomingConnection(11), null);
  assert.deepEqual(index.outgoingConnections(22), [connection]);
  assert.deepEqual(index.incomingConnectionsToPatch(3), [connection]);
  assert.deepEqual(index.outgoingConnectionsFromPatch(2), [connection]);
  assert.deepEqual(index.outgoingConnectionsFromPatch(3), []);
});

test("edits change documents, and changes are listed", () => {
  const before = graph();
  const index = new PatchIndex(before);
  const edit = new PatchEdit(index);
  const patch = edit.patch(2);
  patch.name = "renamed";
  patch.builtin = 9;
  patch.descriptor = "other";
  patch.attributes = { b: 2 };
  patch.modelLayer = { id: 8 };
  assert.deepEqual([patch.id, patch.name, patch.builtin, patch.descriptor], [2n, "renamed", 9n, "other"]);
  assert.deepEqual([patch.attributes.toJS(), patch.modelLayer.id], [{ b: 2 }, 8n]);
  const input = edit.inputPort(31);
  input.tag = 5;
  input.name = "size";
  input.typeInfo = { type: Type.Int, max: 3n };
  input.defaultValue = 2n;
  input.attributes = {};
  assert.deepEqual([input.tag, input.name, input.typeInfo.type, input.defaultValue.integer], [5n, "size", Type.Int, 2n]);
  edit.outputPort(22).name = "out";
  const patchId = edit.freshPatchId();
  const portId = edit.freshPortId();
  assert.ok(edit.addPatch(1, { id: patchId, name: "new" }, 0));
  assert.ok(edit.addPatch(1, new Patch({ id: 50 })));
  assert.ok(!edit.addPatch(1, { id: 50 }));
  assert.ok(edit.addInputPort(patchId, { id: portId }));
  assert.ok(edit.addOutputPort(patchId, { id: 60n }, 0));
  assert.ok(edit.connect({ ...connection, toPatchId: patchId, toPortId: portId }));
  assert.ok(!edit.connect(connection));
  assert.ok(edit.disconnect(connection));
  assert.ok(!edit.disconnect(connection));
  assert.ok(edit.movePatch(50, patchId));
  assert.ok(!edit.movePatch(1, 2));
  assert.ok(edit.removeOutputPort(60));
  assert.ok(!edit.removeInputPort(60));
  assert.ok(edit.removePatch(3));
  assert.ok(!edit.removePatch(3));
  assert.throws(() => { input.name = "gone"; }, /no longer in this edit/);
  assert.equal(edit.patch(99), null);
  assert.equal(edit.inputPort(22), null);
  const after = edit.commit();
  assert.ok(edit.commit().equals(after));
  assert.deepEqual(after.children.map((child) => child.name), ["new", "renamed"]);
  assert.deepEqual(after.children[0].children.map((child) => child.id), [50n]);
  assert.ok(before.equals(graph()));
  const changes = engine.patchChanges(before, after);
  assert.deepEqual(changes.map(({ kind, id }) => [kind, id]).sort(), [
    [PatchChangeKind.Added, patchId], [PatchChangeKind.Added, 50n], [PatchChangeKind.Changed, 1n],
    [PatchChangeKind.Changed, 2n], [PatchChangeKind.Removed, 3n],
  ].sort());
  const renamed = changes.find(({ id }) => id === 2n);
  assert.deepEqual([renamed.before.name, renamed.after.name], ["source", "renamed"]);
  assert.match(renamed.text, /^changed patch 2 /);
  assert.equal(changes.find(({ id }) => id === 3n).after, null);
  index.update(after);
  assert.equal(index.findPatch(3), null);
  assert.equal(index.findPatch(patchId).name, "new");
  assert.equal(index.root, after);
  assert.deepEqual(engine.patchChanges(after, after), []);
});

test("documents of both formats are read and written", () => {
  const { root, info } = engine.readDocumentWithInfo(textOf("animation.json"));
  assert.equal(root.name, "bouncing badge");
  assert.deepEqual([info.form, info.framesPerSecond, info.notes.length], [engine.DocumentForm.Own, 12, 0]);
  const written = engine.writeDocument(root, 24);
  const again = engine.readDocumentWithInfo(new TextEncoder().encode(written));
  assert.ok(again.root.equals(root));
  assert.equal(again.info.framesPerSecond, 24);
  const graphs = engine.readDocumentWithInfo(textOf("node_graph.json"));
  assert.equal(graphs.info.form, engine.DocumentForm.NodeGraph);
  assert.ok(graphs.info.summary.length > 0 && graphs.root.children.length > 0);
  assert.equal(engine.kindToString(engine.stringToKind("circle")), "circle");
  assert.equal(engine.stringToKind("none such"), null);
});

test("invalid documents are reported with their position", () => {
  for (const [text, line, column, message] of [
    ["", 0, 0, /it is empty/], ['{"root":{"id":1}', 1, 17, /./], ['{"root":\n{"id":"x"}}', 2, 7, /\/root\/id: /],
    ["\ud800", 1, 2, /./],
  ]) {
    assert.throws(() => engine.readDocument(text), (error) => {
      assert.ok(error instanceof engine.DocumentError && error instanceof SyntaxError);
      assert.equal(error.name, "DocumentError");
      assert.match(error.message, message);
      assert.deepEqual([error.line, error.column], [line, column], text);
      return true;
    });
  }
});

test("documents beyond the depth limit are rejected", () => {
  for (const levels of [1001, 5000, 300000]) {
    const open = Array.from({ length: levels - 1 }, (_, i) => `{"id":${i + 2},"children":[`).join("");
    for (const end of ["", "x"]) {
      const text = `{"root":{"id":1,"children":[${open}${"]}".repeat(levels)}}${end}`;
      assert.throws(() => engine.readDocument(text), { name: "DocumentError", message: /deeper than 1000 levels/ });
    }
  }
  const attributes = "[".repeat(300000) + "]".repeat(300000);
  const root = engine.readDocument(`{"root":{"id":1,"attributes":{"a":${attributes}}}}`);
  assert.ok(engine.readDocument(engine.writeDocument(root)).equals(root));
});

test("documents are evaluated and drawn frame by frame", () => {
  const root = engine.readDocument(textOf("animation.json"));
  const evaluator = new engine.Evaluator(root);
  const paths = [];
  for (const frame of [0, 1, 2]) {
    const drawn = evaluator.evaluate(frame).drawn();
    paths.push(drawn.map((outline) => outline.svgPathData).join(";"));
    for (const outline of drawn) {
      assert.ok(outline.path.length > 0 && outline.color.length === 4 && typeof outline.isLayer === "boolean");
    }
  }
  assert.notEqual(paths[1], paths[2]);
  const { inputs: [input], outputs: [output] } = root.children[0];
  assert.ok(evaluator.outputValues(output.id).length > 0);
  assert.equal(evaluator.outputValues(1), null);
  assert.ok(evaluator.inputValues(input.id)[0].equals(input.defaultValue));
});

test("using a freed object is an error, and others still work", () => {
  const root = graph();
  const index = new PatchIndex(root);
  const [child] = root.children;
  root.free();
  root.free();
  for (const call of [() => root.name, () => child.id, () => new PatchIndex(root), () => engine.writeDocument(root)]) {
    assert.throws(call, { name: "Error", message: "this patch was freed" });
  }
  assert.equal(index.findInputPort(31).id, 31n);
  index.free();
  assert.throws(() => index.findInputPort(31), { message: "this index was freed" });
  assert.throws(() => new PatchEdit(index), { message: "this index was freed" });
  const edit = new PatchEdit(new PatchIndex(graph()));
  const patch = edit.patch(2);
  edit.free();
  assert.throws(() => { patch.name = "x"; }, { message: "this edit was freed" });
});

test("invalid graphs are rejected, and nothing changes", () => {
  const root = graph();
  const index = new PatchIndex(root);
  const edit = new PatchEdit(index);
  const patch = edit.patch(2);
  let deep = { id: 1 };
  for (let i = 0; i < 1000; ++i) deep = { id: 1, children: [deep] };
  for (const [call, error] of [
    [() => new Patch(null), TypeError], [() => new Patch({ id: -1 }), RangeError], [() => new Patch({ name: 5 }), TypeError],
    [() => new Patch({ children: {} }), TypeError], [() => new Patch({ children: [1] }), TypeError],
    [() => new Patch({ attributes: [1] }), TypeError], [() => new Patch({ inputs: [{ id: "1" }] }), TypeError],
    [() => new Patch({ connections: [{}] }), TypeError], [() => new Patch({ inputs: [{ defaultValue: null }] }), TypeError],
    [() => new Patch({ modelLayer: 1 }), TypeError], [() => new Patch(deep), RangeError],
    [() => new PatchIndex({}), TypeError], [() => new PatchEdit(root), TypeError], [() => index.findPatch("1"), TypeError],
    [() => index.findPatch(), TypeError], [() => index.update(1), TypeError], [() => engine.patchChanges(root, null), TypeError],
    [() => { patch.name = 1; }, TypeError], [() => { patch.id = 5n; }, TypeError], [() => { patch.nme = ""; }, TypeError],
    [() => { patch.attributes = "x"; }, TypeError], [() => edit.addPatch(1, {}, -1), TypeError],
    [() => edit.addPatch(1, null), TypeError], [() => edit.connect(null), TypeError],
    [() => engine.readDocument(5), TypeError], [() => engine.writeDocument(root, "60"), TypeError],
    [() => engine.writeDocument({}), TypeError], [() => engine.kindToString("circle"), TypeError],
    [() => engine.stringToKind(1), TypeError], [() => new engine.Evaluator(null), TypeError],
    [() => new engine.Evaluator(root).evaluate(1.5), TypeError], [() => new engine.Evaluator(root).outputValues({}), TypeError],
    [() => Object.getOwnPropertyDescriptor(Patch.prototype, "name").get.call({}), TypeError],
  ]) {
    assert.throws(call, (thrown) => thrown instanceof error && thrown.message.includes(" "), call.toString());
  }
  assert.ok(root.equals(graph()));
  assert.ok(edit.commit().equals(root));
});
