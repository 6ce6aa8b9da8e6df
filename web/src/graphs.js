// Patches, indexes, edits, changes, documents and their evaluation.

import * as check from "./check.js";
import { native, release } from "./native.js";
import { Path } from "./paths.js";
import { bytesOf, fromBytes, Type, typeInfoBytes, Unstructured, Value, valueOf } from "./values.js";
import { Reader, skipData, skipValue, textOf, Writer } from "./wire.js";

const inspect = Symbol.for("nodejs.util.inspect.custom");

// Memory of the library is released with the object that owns it; `free` releases it at once.
const forgotten = new FinalizationRegistry(release);

class Held {
  #handle;
  #what;

  constructor(handle, what) {
    this.#handle = handle;
    this.#what = what;
    forgotten.register(this, handle, this);
  }
  get handle() {
    if (this.#handle === undefined) throw new Error(`this ${this.#what} was freed`);
    return this.#handle;
  }
  free() {
    if (this.#handle === undefined) return;
    forgotten.unregister(this);
    release(this.#handle);
    this.#handle = undefined;
  }
}

// Plain records.

function readTypeInfo(reader) {
  const info = { type: reader.byte(), subtype: reader.byte() };
  for (const name of ["min", "max", "extra"]) info[name] = reader.byte() === 0 ? null : readValue(reader);
  return Object.freeze(info);
}

const readValue = (reader) => new Value(fromBytes, reader.part(skipValue));
const readUnstructured = (reader) => new Unstructured(fromBytes, reader.part(skipData));

function readPort(reader) {
  return Object.freeze({
    id: reader.unsigned(), tag: reader.unsigned(), typeInfo: readTypeInfo(reader), defaultValue: readValue(reader),
    name: reader.text(), attributes: readUnstructured(reader),
  });
}

const ends = ["fromPatchId", "fromPortId", "toPatchId", "toPortId"];

function readConnection(reader) {
  return Object.freeze(Object.fromEntries(ends.map((end) => [end, reader.unsigned()])));
}

function readList(reader, read) {
  return Object.freeze(Array.from({ length: reader.count() }, () => read(reader)));
}

function readModelLayer(reader) {
  return Object.freeze({
    id: reader.unsigned(), children: readList(reader, readModelLayer), additionalLayers: readList(reader, readModelLayer),
  });
}

function record(x, what) {
  if (x === null || typeof x !== "object") throw check.mustBe(what, "an object", x);
  return x;
}

function list(x, what) {
  if (x === undefined) return [];
  if (!Array.isArray(x)) throw check.mustBe(what, "an array", x);
  return [...x];
}

function writeAttributes(out, attributes) {
  const data = attributes instanceof Unstructured ? attributes : new Unstructured(attributes ?? {});
  if (!data.isMap()) throw check.mustBe("attributes", "an object", attributes);
  out.raw(bytesOf(data));
}

function writePort(out, port) {
  const { id = 0n, tag = 0n, typeInfo = {}, defaultValue, name = "", attributes = {} } = record(port, "a port");
  out.integer(check.identifier(id, "a port's id")).integer(check.identifier(tag, "a tag"));
  typeInfoBytes(typeInfo, out);
  const value = defaultValue === undefined ? Value.defaultValue(typeInfo.type ?? Type.Float) : valueOf(defaultValue);
  out.raw(bytesOf(value)).text(check.string(name, "a port's name"));
  writeAttributes(out, attributes);
}

function writeConnection(out, connection) {
  for (const end of ends) out.integer(check.identifier(record(connection, "a connection")[end], end));
}

// Destroying a graph is recursive, and browsers have small stacks.
const deepest = 1000;

function writeList(out, items, write) {
  out.count(items.length);
  for (const item of items) write(out, item);
}

function writeModelLayer(out, layer, level = 1) {
  if (level > deepest) throw new RangeError(`layers must not be nested deeper than ${deepest} levels`);
  const { id = 0n, children, additionalLayers } = record(layer, "a model layer");
  out.integer(check.identifier(id, "a layer's id"));
  for (const inner of [children, additionalLayers]) {
    writeList(out, list(inner, "layers"), (to, item) => writeModelLayer(to, item, level + 1));
  }
}

function writePatch(out, patch, level = 1) {
  if (level > deepest) throw new RangeError(`patches must not be nested deeper than ${deepest} levels`);
  const { id = 0n, builtin = 0n, name = "", descriptor = "", attributes, modelLayer = {}, inputs, outputs, connections,
    children } = record(patch, "a patch");
  out.integer(check.identifier(id, "a patch's id")).integer(check.identifier(builtin, "a builtin"));
  out.text(check.string(name, "a patch's name")).text(check.string(descriptor, "a descriptor"));
  writeAttributes(out, attributes);
  writeModelLayer(out, modelLayer);
  writeList(out, list(inputs, "inputs"), writePort);
  writeList(out, list(outputs, "outputs"), writePort);
  writeList(out, list(connections, "connections"), writeConnection);
  writeList(out, list(children, "children"), (to, child) => writePatch(to, child, level + 1));
}

let rootOf;
/** The address of a patch in the library's memory, for native functions. */
export let addressOf;
let patchAt;

export class Patch {
  #root;
  #address;
  #fields;

  constructor(fields = {}, root = undefined, address = undefined) {
    if (fields === fromBytes) {
      this.#root = root;
      this.#address = address;
      return;
    }
    const out = new Writer();
    writePatch(out, fields);
    this.#root = new Held(native.makeRoot(out.bytes()), "patch");
    this.#address = native.rootAddress(this.#root.handle);
  }
  static {
    rootOf = (patch) => patch.#root;
    // Valid while the graph is alive.
    addressOf = (patch) => (patch.#root.handle, patch.#address);
    patchAt = (root, address) => (address === 0 ? null : new Patch(fromBytes, root, address));
  }

  get #all() {
    const address = addressOf(this);
    if (this.#fields !== undefined) return this.#fields;
    const reader = new Reader(native.patchRecord(address));
    this.#fields = {
      id: reader.unsigned(), builtin: reader.unsigned(), name: reader.text(), descriptor: reader.text(),
      attributes: readUnstructured(reader), modelLayer: readModelLayer(reader), inputs: readList(reader, readPort),
      outputs: readList(reader, readPort), connections: readList(reader, readConnection),
      children: readList(reader, () => patchAt(this.#root, reader.count())),
    };
    return this.#fields;
  }
  get id() {
    return this.#all.id;
  }
  get builtin() {
    return this.#all.builtin;
  }
  get name() {
    return this.#all.name;
  }
  get descriptor() {
    return this.#all.descriptor;
  }
  get attributes() {
    return this.#all.attributes;
  }
  get modelLayer() {
    return this.#all.modelLayer;
  }
  get inputs() {
    return this.#all.inputs;
  }
  get outputs() {
    return this.#all.outputs;
  }
  get connections() {
    return this.#all.connections;
  }
  get children() {
    return this.#all.children;
  }
  equals(other) {
    return native.patchEquals(addressOf(this), addressOf(patchOf(other)));
  }
  free() {
    this.#root.free();
  }
  [inspect]() {
    return `Patch(${this.id} ${JSON.stringify(this.name)}, ${this.children.length} children)`;
  }
}

const patchOf = (x) => check.instance(x, Patch, "a graph");
const rootFrom = (handle) => {
  const root = new Held(handle, "patch");
  return patchAt(root, native.rootAddress(handle));
};
const optional = (bytes, read) => (bytes === null ? null : read(new Reader(bytes)));

export function findPatchRecursive(root, id) {
  return patchAt(rootOf(patchOf(root)), native.findPatchRecursive(addressOf(root), ...check.halves(id)));
}
export const inPortForTag = (patch, tag) =>
  optional(native.inPortForTag(addressOf(patchOf(patch)), ...check.halves(tag, "a tag")), readPort);
export const outPortForTag = (patch, tag) =>
  optional(native.outPortForTag(addressOf(patchOf(patch)), ...check.halves(tag, "a tag")), readPort);

let indexOf;

export class PatchIndex {
  #held;
  #root;

  constructor(root) {
    this.#held = new Held(native.makeIndex(addressOf(patchOf(root))), "index");
    this.#root = root;
  }
  static {
    indexOf = (index) => index.#held.handle;
  }
  get root() {
    return this.#root;
  }
  // 1 stands for the root.
  #patch(address) {
    return address === 1 ? this.#root : patchAt(rootOf(this.#root), address);
  }

  findPatch(id) {
    return this.#patch(native.indexPatch(this.#held.handle, ...check.halves(id)));
  }
  parentOf(id) {
    return this.#patch(native.indexParent(this.#held.handle, ...check.halves(id)));
  }
  ownerOfPort(portId) {
    return this.#patch(native.indexOwner(this.#held.handle, ...check.halves(portId)));
  }
  findInputPort(portId) {
    return optional(native.indexInput(this.#held.handle, ...check.halves(portId)), readPort);
  }
  findOutputPort(portId) {
    return optional(native.indexOutput(this.#held.handle, ...check.halves(portId)), readPort);
  }
  incomingConnection(portId) {
    return optional(native.indexIncoming(this.#held.handle, ...check.halves(portId)), readConnection);
  }
  #connections(bytes) {
    return readList(new Reader(bytes), readConnection);
  }
  outgoingConnections(portId) {
    return this.#connections(native.indexOutgoing(this.#held.handle, ...check.halves(portId)));
  }
  incomingConnectionsToPatch(id) {
    return this.#connections(native.indexIncomingToPatch(this.#held.handle, ...check.halves(id)));
  }
  outgoingConnectionsFromPatch(id) {
    return this.#connections(native.indexOutgoingFromPatch(this.#held.handle, ...check.halves(id)));
  }
  update(root) {
    native.updateIndex(this.#held.handle, addressOf(patchOf(root)));
    this.#root = root;
  }
  free() {
    this.#held.free();
  }
}

const written = (write) => {
  const out = new Writer();
  write(out);
  return out.bytes();
};

// Writers for the fields of a record in an edit.
const patchFields = {
  builtin: (out, x) => out.integer(check.identifier(x, "a builtin")),
  name: (out, x) => out.text(check.string(x, "a name")),
  descriptor: (out, x) => out.text(check.string(x, "a descriptor")),
  attributes: writeAttributes,
  modelLayer: (out, x) => writeModelLayer(out, x),
};
const portFields = {
  tag: (out, x) => out.integer(check.identifier(x, "a tag")),
  name: (out, x) => out.text(check.string(x, "a name")),
  typeInfo: (out, x) => typeInfoBytes(x, out),
  defaultValue: (out, x) => out.raw(bytesOf(valueOf(x))),
  attributes: writeAttributes,
};

// An object whose properties are the fields of a record in an edit.
function inEdit(fields, id, read, write) {
  const object = {};
  Object.defineProperty(object, "id", { value: id, enumerable: true });
  for (const [name, writeField] of Object.entries(fields)) {
    Object.defineProperty(object, name, {
      enumerable: true,
      get: () => read()[name],
      set: (x) => {
        if (!write(name, written((out) => writeField(out, x)))) throw new Error(`${id} is no longer in this edit`);
      },
    });
  }
  return Object.preventExtensions(object);
}

export class PatchEdit {
  #held;

  constructor(index) {
    this.#held = new Held(native.makeEdit(indexOf(check.instance(index, PatchIndex, "what is edited"))), "edit");
  }
  patch(id) {
    const halves = check.halves(id);
    const read = () => {
      const address = native.editPatch(this.#held.handle, ...halves);
      // Only the record: its lists may change while the edit continues.
      return address === 0 ? null : recordOf(new Reader(native.patchRecord(address)));
    };
    if (read() === null) return null;
    const write = (name, bytes) => native.setPatchField(this.#held.handle, ...halves, name, bytes);
    return inEdit(patchFields, BigInt(id), () => read() ?? gone(id), write);
  }
  #port(isInput, portId) {
    const halves = check.halves(portId);
    const read = () => optional(native.editPort(this.#held.handle, isInput, ...halves), readPort);
    if (read() === null) return null;
    const write = (name, bytes) => native.setPortField(this.#held.handle, isInput, ...halves, name, bytes);
    return inEdit(portFields, BigInt(portId), () => read() ?? gone(portId), write);
  }
  inputPort(portId) {
    return this.#port(true, portId);
  }
  outputPort(portId) {
    return this.#port(false, portId);
  }
  #addPort(isInput, patchId, port, position) {
    const bytes = written((out) => writePort(out, port));
    return native.addPort(this.#held.handle, isInput, ...check.halves(patchId), bytes, check.position(position));
  }
  addInputPort(patchId, port, position) {
    return this.#addPort(true, patchId, port, position);
  }
  addOutputPort(patchId, port, position) {
    return this.#addPort(false, patchId, port, position);
  }
  removeInputPort(portId) {
    return native.removePort(this.#held.handle, true, ...check.halves(portId));
  }
  removeOutputPort(portId) {
    return native.removePort(this.#held.handle, false, ...check.halves(portId));
  }
  addPatch(parentId, patch, position) {
    const added = patch instanceof Patch ? patch : new Patch(patch);
    const inputs = [...check.halves(parentId), addressOf(added), check.position(position)];
    return isDone(native.addPatch(this.#held.handle, ...inputs));
  }
  removePatch(id) {
    return native.removePatch(this.#held.handle, ...check.halves(id));
  }
  movePatch(id, parentId, position) {
    const inputs = [...check.halves(id), ...check.halves(parentId), check.position(position)];
    return isDone(native.movePatch(this.#held.handle, ...inputs));
  }
  connect(connection) {
    const bytes = written((out) => writeConnection(out, connection));
    return native.connect(this.#held.handle, bytes);
  }
  disconnect(connection) {
    const bytes = written((out) => writeConnection(out, connection));
    return native.disconnect(this.#held.handle, bytes);
  }
  freshPatchId() {
    return BigInt(native.freshPatchId(this.#held.handle));
  }
  freshPortId() {
    return BigInt(native.freshPortId(this.#held.handle));
  }
  commit() {
    return rootFrom(native.commit(this.#held.handle));
  }
  free() {
    this.#held.free();
  }
}

// The same numbers as in graphs.cpp.
function isDone(answer) {
  if (answer === 2) throw new RangeError(`patches must not be nested deeper than ${deepest} levels`);
  return answer === 1;
}

function gone(id) {
  throw new Error(`${id} is no longer in this edit`);
}

function recordOf(reader) {
  return {
    id: reader.unsigned(), builtin: reader.unsigned(), name: reader.text(), descriptor: reader.text(),
    attributes: readUnstructured(reader), modelLayer: readModelLayer(reader),
  };
}

export const PatchChangeKind = Object.freeze({ Added: 0, Removed: 1, Moved: 2, Changed: 3 });

export function patchChanges(before, after) {
  const reader = new Reader(native.patchChanges(addressOf(patchOf(before)), addressOf(patchOf(after))));
  return readList(reader, () => Object.freeze({
    kind: reader.byte(), id: reader.unsigned(), before: patchAt(rootOf(before), reader.count()),
    after: patchAt(rootOf(after), reader.count()), text: reader.text(),
  }));
}

// Prints one line, whatever the keys of a document are.
const shown = (pointer) =>
  pointer.replace(/[\u0000-\u001f\u007f]/g, (c) => `\\x${c.charCodeAt(0).toString(16).padStart(2, "0")}`);

export class DocumentError extends SyntaxError {
  constructor({ message, pointer, line, column }) {
    super(line > 0 ? `line ${line}, column ${column}: ${pointer === "" ? "" : `${shown(pointer)}: `}${message}` : message);
    this.name = "DocumentError";
    Object.assign(this, { pointer, line, column });
  }
}

export const DocumentForm = Object.freeze({ Own: 0, NodeGraph: 1 });

export function readDocumentWithInfo(text) {
  const isBytes = check.typedArrayKind(text) === "Uint8Array";
  if (!isBytes && typeof text !== "string") throw check.mustBe("a document", "a string or a Uint8Array", text);
  const { root, info, error } = native.readDocument(isBytes ? new Uint8Array(text) : new TextEncoder().encode(text));
  if (error !== undefined) {
    throw new DocumentError({ ...error, message: textOf(error.message), pointer: textOf(error.pointer) });
  }
  const notes = Object.freeze(info.notes.map(textOf));
  return { root: rootFrom(root), info: Object.freeze({ ...info, notes, summary: textOf(info.summary) }) };
}

export const readDocument = (text) => readDocumentWithInfo(text).root;
export const writeDocument = (root, framesPerSecond = 60) =>
  textOf(native.writeDocument(addressOf(patchOf(root)), check.number(framesPerSecond, "frames per second")));

export const kindToString = (builtin) => native.kindToString(...check.halves(builtin, "a builtin"));
export function stringToKind(name) {
  const kind = native.stringToKind(check.string(name, "a name"));
  return kind === null ? null : BigInt(kind);
}

export class Evaluator {
  #held;

  constructor(root, framesPerSecond = 60) {
    const reason = native.whatIsNotShown(addressOf(patchOf(root)));
    if (reason !== "") throw new RangeError(reason);
    const rate = check.number(framesPerSecond, "frames per second");
    this.#held = new Held(native.makeEvaluator(addressOf(root), rate), "evaluator");
  }
  evaluate(frame) {
    if (!Number.isSafeInteger(frame)) throw check.mustBe("a frame", "an integer", frame);
    native.evaluate(this.#held.handle, frame);
    return this;
  }
  #values(isInput, portId) {
    const bytes = native.portValues(this.#held.handle, isInput, ...check.halves(portId));
    return bytes === null ? null : readList(new Reader(bytes), readValue);
  }
  inputValues(portId) {
    return this.#values(true, portId);
  }
  outputValues(portId) {
    return this.#values(false, portId);
  }
  drawn() {
    return native.drawn(this.#held.handle).map(({ name, path, svgPathData, isLayer, color, width }) => Object.freeze({
      name: textOf(name), path: new Path(fromBytes, path), svgPathData, isLayer, color: new Value(fromBytes, color).vec4, width,
    }));
  }
  free() {
    this.#held.free();
  }
}
