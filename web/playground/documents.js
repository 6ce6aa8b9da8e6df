// The subject of documents: one that is read, edited and played, and what it is compared with.

import animation from "../../examples/documents/animation.json";
import nodeGraph from "../../examples/documents/node_graph.json";
import small from "../../examples/documents/small.json";
import { openLevels, showChanges, showFilm, showGraphs } from "../../examples/report/page/page.js";
import { addressOf } from "../src/graphs.js";
import { PatchEdit, PatchIndex, portNameForTypeInfo, readDocumentWithInfo, Type, writeDocument } from "../src/library.js";
import { native } from "../src/native.js";
import { textOf } from "../src/wire.js";
import { fields } from "./contents.js";
import { attempt, byId, choices, element, say } from "./dom.js";
import { forgetAnswers } from "./layout.js";
import { packed, unpacked } from "./packed.js";
import { keep, keepField, stateOf } from "./state.js";

const samples = { animation, small, node_graph: nodeGraph };
const frames = 120;
// Longer addresses are cut off by programs that they are sent with.
const longestAddress = 30000;

// The document as it was opened and after each edit, each {root, port}: the input that was set last.
let versions = [];
let at = 0;
let info;
let fileName = "";
let index;
// The other file, {root, framesPerSecond, name}, or null.
let otherFile = null;
let frame = 0;

const root = () => versions[at].root;

// What it is compared with, or null.
function other() {
  const chosen = byId("compare").value;
  return chosen === "opened" ? { root: versions[0].root, framesPerSecond: info.framesPerSecond }
    : chosen === "file" ? otherFile : null;
}

// Sections

const shown = new Map();

// Whether the section was another one before.
function setSection(name, bytes) {
  const text = textOf(bytes);
  if (shown.get(name) === text) return false;
  shown.set(name, text);
  byId(`report-${name}`).innerHTML = text;
  return true;
}

function showFrames() {
  const { animation: player, outputs, data } = native.reportFilm(addressOf(root()), info.framesPerSecond, frames);
  setSection("animation", player);
  setSection("outputs", outputs);
  showFilm(JSON.parse(textOf(data)), frame, (next) => {
    frame = next;
    keep("frame", String(frame));
  });
}

function showGraph() {
  const open = openLevels();
  const before = other();
  const { changes, graph, attributes } = before === null
    ? native.reportGraph(addressOf(root()))
    : native.reportComparedGraph(addressOf(root()), info.framesPerSecond, addressOf(before.root), before.framesPerSecond);
  if (setSection("graph", graph)) showGraphs(open);
  if (setSection("changes", changes)) showChanges();
  setSection("attributes", attributes);
}

// Inputs

const patchSelect = () => byId("input-patch");
const nameOf = (patch) => patch.name || "unnamed";

function patchesWithInputs(patch, found = []) {
  if (patch.inputs.length > 0) found.push(patch);
  for (const child of patch.children) patchesWithInputs(child, found);
  return found;
}

function fieldOf(port) {
  const { show, read } = fields[port.typeInfo.type];
  const label = element("label", {}, `${port.name || "unnamed"} ${portNameForTypeInfo(port.typeInfo)} `);
  const connection = index.incomingConnection(port.id);
  const field = element("input", { autocomplete: "off", spellcheck: "false", "data-input": port.id });
  field.value = show(port.defaultValue.asType(port.typeInfo.type));
  label.append(field);
  if (connection !== null) {
    field.disabled = true;
    label.append(`from ${nameOf(index.ownerOfPort(connection.fromPortId) ?? { name: "" })}`);
    return [label];
  }
  const set = (text) => attempt(byId("input-error"), () => setInput(port.id, read(text)));
  field.addEventListener("input", () => set(field.value));
  // Each stay in a field is one step to be undone.
  field.addEventListener("change", () => (versions[at].port = null));
  const { min, max, type } = port.typeInfo;
  if (type !== Type.Float || min === null || max === null || !(min.number < max.number)) return [label];
  const slider = element("input", {
    type: "range", min: min.number, max: max.number, step: "any", "aria-label": `${port.name || "unnamed"}, by slider`,
  });
  slider.value = field.value;
  slider.addEventListener("input", () => {
    field.value = slider.value;
    set(field.value);
  });
  slider.addEventListener("change", () => (versions[at].port = null));
  field.addEventListener("input", () => (slider.value = field.value));
  label.append(slider);
  return [label];
}

function showInputs() {
  const patch = index.findPatch(BigInt(patchSelect().value || "0"));
  byId("inputs").replaceChildren(...(patch === null ? [] : patch.inputs.flatMap(fieldOf)));
  byId("input-error").textContent = "";
}

function choosePatch(id) {
  patchSelect().value = String(id);
  keep("input-patch", patchSelect().value);
  showInputs();
}

function showPatches() {
  const patches = patchesWithInputs(root());
  choices(patchSelect(), patches.map((patch) => [String(patch.id), `${nameOf(patch)} (${patch.id})`]));
  const canBeSet = ({ inputs }) => inputs.some(({ id }) => index.incomingConnection(id) === null);
  const first = patches.find(canBeSet) ?? patches[0];
  patchSelect().value = stateOf("input-patch", String(first?.id ?? ""));
  if (patchSelect().value === "" && first !== undefined) patchSelect().value = String(first.id);
  showInputs();
}

// Edits

let keeping = 0;
let comparing = 0;

function showEdit() {
  index.update(root());
  showFrames();
  byId("undo").disabled = at === 0;
  byId("redo").disabled = at === versions.length - 1;
  if (other() !== null) {
    // The graph is as it was but for its marks, which may wait until nobody types.
    clearTimeout(comparing);
    comparing = setTimeout(showGraph, 150);
  }
  clearTimeout(keeping);
  keeping = setTimeout(keepDocuments, 300);
}

function setInput(portId, value) {
  const edit = new PatchEdit(index);
  edit.inputPort(portId).defaultValue = value;
  const edited = edit.commit();
  edit.free();
  if (versions[at].port === portId) --at;
  versions.splice(at + 1, versions.length, { root: edited, port: portId });
  ++at;
  showEdit();
}

function step(by) {
  at += by;
  versions[at].port = null;
  showEdit();
  showInputs();
  say(by < 0 ? "Undone" : "Done again");
}

// Keeps a document in the address: by its name where it is one of ours, else itself. Whether that was possible.
async function keepDocument(key, { root: kept, framesPerSecond, name, isAsRead }) {
  const isSample = isAsRead && Object.hasOwn(samples, name);
  const text = isSample ? name : `~${await packed(writeDocument(kept, framesPerSecond))}`;
  const isShort = text.length <= longestAddress;
  keep(key, isShort ? text : null);
  keep(`${key}-name`, isSample || !isShort ? null : name);
  return isShort;
}

async function keepDocuments() {
  const { framesPerSecond } = info;
  let areShort = await keepDocument("document", { root: root(), framesPerSecond, name: fileName, isAsRead: at === 0 });
  if (otherFile !== null) areShort = (await keepDocument("other", { ...otherFile, isAsRead: true })) && areShort;
  byId("document-kept").textContent = areShort ? "" : "This is too large for the address: a link would not show it.";
}

// Opening

function show(read, name) {
  versions = [{ root: read.root, port: null }];
  at = 0;
  info = read.info;
  fileName = name;
  index = new PatchIndex(root());
  forgetAnswers();
  byId("document-name").textContent = name;
  const lines = `${textOf(native.reportCounts(addressOf(root())))}${info.summary}`.split("\n").filter((line) => line !== "");
  byId("document-notes").replaceChildren(...lines.map((line) => element("p", {}, line)));
  byId("undo").disabled = true;
  byId("redo").disabled = true;
  byId("sample").value = Object.hasOwn(samples, name) ? name : "";
  showPatches();
  showFrames();
  showGraph();
}

const longestError = 300;

// What cannot be read gives one line, and changes nothing.
function open(bytes, name, use) {
  let read;
  try {
    read = readDocumentWithInfo(bytes);
  } catch ({ message }) {
    const line = `${name}: ${message}`;
    const half = longestError / 2;
    byId("document-error").textContent = line.length > longestError ? `${line.slice(0, half)} … ${line.slice(-half)}` : line;
    return;
  }
  byId("document-error").textContent = "";
  use(read, name);
}

function openDocument(bytes, name) {
  open(bytes, name, (read) => {
    keep("input-patch", null);
    show(read, name);
    keepDocuments();
  });
}

function takeOther(bytes, name) {
  open(bytes, name, ({ root: read, info: { framesPerSecond } }) => {
    otherFile = { root: read, framesPerSecond, name };
    const option = byId("compare").querySelector("[value=file]");
    option.disabled = false;
    option.textContent = name;
  });
}

function compareWithFile(bytes, name) {
  const before = otherFile;
  takeOther(bytes, name);
  if (otherFile === before) return;
  byId("compare").value = "file";
  byId("compare").dispatchEvent(new Event("input"));
  keepDocuments();
}

async function readFile(file, use) {
  let bytes;
  try {
    bytes = new Uint8Array(await file.arrayBuffer());
  } catch ({ message }) {
    // A folder, or a file that is gone by now.
    byId("document-error").textContent = `${file.name}: ${message}`;
    return;
  }
  use(bytes, file.name);
}

// What the address has under the key, and its name.
async function kept(key, otherwise) {
  const text = stateOf(key, otherwise);
  if (Object.hasOwn(samples, text)) return [samples[text], text];
  try {
    return [await unpacked(text.slice(1)), stateOf(`${key}-name`, "a document")];
  } catch {
    byId("document-error").textContent = "The address has no document that can be read.";
    return null;
  }
}

export async function start() {
  byId("sample").append(...Object.keys(samples).map((name) => element("option", { value: name }, name)));
  frame = Number(stateOf("frame", "0")) || 0;
  if (stateOf("other", "") !== "") {
    const found = await kept("other");
    if (found !== null) takeOther(...found);
  }
  // The file comes first, since the choice is shown with it.
  keepField(byId("compare"), "", showGraph);
  const found = await kept("document", "animation");
  if (found !== null) open(...found, show);
  if (versions.length === 0) show(readDocumentWithInfo(animation), "animation");

  byId("sample").addEventListener("input", ({ target: { value } }) => {
    openDocument(samples[value], value);
  });
  for (const [id, use] of [["document-file", openDocument], ["compare-file", compareWithFile]]) {
    byId(id).addEventListener("change", async ({ target }) => {
      const file = target.files[0];
      // The same file can be chosen again, with what it has by then.
      if (file !== undefined) await readFile(file, use);
      target.value = "";
    });
  }
  patchSelect().addEventListener("input", () => choosePatch(patchSelect().value));
  byId("undo").addEventListener("click", () => step(-1));
  byId("redo").addEventListener("click", () => step(1));
  byId("save").addEventListener("click", () => {
    const url = URL.createObjectURL(new Blob([writeDocument(root(), info.framesPerSecond)], { type: "application/json" }));
    element("a", { href: url, download: `${fileName.replace(/\.json$/, "")}.json` }).click();
    setTimeout(() => URL.revokeObjectURL(url), 1000);
  });
  // A patch of the graph that is clicked or reached has its inputs shown.
  for (const kind of ["click", "focusin"]) {
    byId("report-graph").addEventListener(kind, ({ target }) => {
      const port = target.closest(".patch")?.querySelector("[data-port]");
      const patch = port ? index.ownerOfPort(BigInt(port.dataset.port)) : null;
      if (patch !== null && patch.inputs.length > 0 && String(patch.id) !== patchSelect().value) choosePatch(patch.id);
    });
  }
  addEventListener("dragover", (event) => event.preventDefault());
  addEventListener("drop", (event) => {
    event.preventDefault();
    const [file, second] = event.dataTransfer.files;
    if (file === undefined) return;
    byId("tab-documents").click();
    readFile(file, openDocument).then(() => second && readFile(second, compareWithFile));
  });
}
