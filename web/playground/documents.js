// The Documents tab: reads, edits and plays a document, and compares it with another one.

import animation from "../../examples/documents/animation.json";
import nodeGraph from "../../examples/documents/node_graph.json";
import small from "../../examples/documents/small.json";
import { openLevels, showChanges, showFilm, showGraphs, showParts } from "../../examples/report/page/page.js";
import { halves } from "../src/check.js";
import { addressOf } from "../src/graphs.js";
import { PatchEdit, PatchIndex, portNameForTypeInfo, readDocumentWithInfo, Type, writeDocument } from "../src/library.js";
import { native } from "../src/native.js";
import { bytesOf } from "../src/values.js";
import { textOf } from "../src/wire.js";
import { fields } from "./contents.js";
import { byId, choices, element, messageOf, say } from "./dom.js";
import { forgetAnswers } from "./layout.js";
import { packed, unpacked } from "./packed.js";
import { keep, keepField, longest, stateOf } from "./state.js";

const samples = { animation, small, node_graph: nodeGraph };
const frames = 120;
// The time after which a page seems to have stopped responding.
const longestSeconds = 2;

// The undo history: each document that was opened, and each edit. `root` and `info` belong to the
// document; `sample` is its name if it is an unchanged bundled one; `edited` is the input that was
// set, and `open` is that input while it is being set.
let versions = [];
let at = 0;
// Stands for edits that were made before the document was opened here. No input has this
// identifier.
const several = 0n;
let index;
// The other file, {root, info, name, sample}, or null.
let otherFile = null;
let frame = 0;

const current = () => versions[at];

// The document as it was opened.
function opened() {
  let first = at;
  while (versions[first].edited !== null) --first;
  return versions[first];
}

// The document to compare with, or null.
function other() {
  const chosen = byId("compare").value;
  return chosen === "opened" ? opened() : chosen === "file" ? otherFile : null;
}

// Sections

const shown = new Map();

// Returns whether the section changed.
function setSection(name, bytes) {
  const text = textOf(bytes);
  if (shown.get(name) === text) return false;
  shown.set(name, text);
  byId(`report-${name}`).innerHTML = text;
  return true;
}

function showFrames() {
  const { root, info } = current();
  const { animation: player, outputs, data } = native.reportFilm(addressOf(root), info.framesPerSecond, frames, longestSeconds);
  const withPoints = byId("show-points")?.checked ?? false;
  setSection("animation", player);
  setSection("outputs", outputs);
  if (byId("show-points")) byId("show-points").checked = withPoints;
  showFilm(JSON.parse(textOf(data)), frame, (next) => {
    frame = next;
    keep("frame", String(frame));
  });
}

function showGraph() {
  const open = openLevels();
  const { root, info } = current();
  const before = other();
  const { changes, graph, attributes } = before === null
    ? native.reportGraph(addressOf(root))
    : native.reportComparedGraph(addressOf(root), info.framesPerSecond, addressOf(before.root), before.info.framesPerSecond);
  if (setSection("graph", graph)) showGraphs(open);
  if (setSection("changes", changes)) showChanges();
  setSection("attributes", attributes);
}

// Inputs

const patchSelect = () => byId("input-patch");
const nameOf = (patch) => patch.name || "unnamed";
// The patches that have inputs, by their label in the list, and the identifiers that several inputs
// have.
let patches = new Map();
let repeated = new Set();

function collectPatches(patch) {
  if (patch.inputs.length > 0) {
    const id = String(patch.id);
    patches.set(patches.has(id) ? `${id}/${patches.size}` : id, patch);
  }
  for (const child of patch.children) collectPatches(child);
}

// A note next to the field says why it cannot be set.
function fieldOf(port) {
  const { show, read } = fields[port.typeInfo.type];
  const name = port.name || "unnamed";
  const label = element("label", {}, `${name} ${portNameForTypeInfo(port.typeInfo)} `);
  const field = element("input", { autocomplete: "off", spellcheck: "false", "aria-describedby": "input-error" });
  label.append(field);
  const connection = index.incomingConnection(port.id);
  const value = port.defaultValue;
  const notText = "not editable as text";
  let note = "";
  try {
    field.value = show(value);
    if (connection !== null) note = `from ${nameOf(index.ownerOfPort(connection.fromPortId) ?? { name: "" })}`;
    else if (repeated.has(port.id)) note = "not editable: another input has the same identifier";
    else if (String(bytesOf(read(field.value))) !== String(bytesOf(value))) note = notText;
  } catch {
    note = notText;
  }
  if (note !== "") {
    field.disabled = true;
    label.append(note);
    return label;
  }

  let last = field.value;
  const set = () => {
    try {
      setInput(port.id, read(field.value));
      last = field.value;
      field.removeAttribute("aria-invalid");
      byId("input-error").textContent = "";
    } catch (error) {
      field.setAttribute("aria-invalid", "true");
      byId("input-error").textContent = `${name}: ${messageOf(error)}`;
    }
  };
  // All changes while a field has the focus are one undo step; invalid content is discarded
  // afterwards.
  const leave = () => {
    current().open = null;
    if (!field.hasAttribute("aria-invalid")) return;
    field.value = last;
    field.removeAttribute("aria-invalid");
    byId("input-error").textContent = "";
  };
  field.addEventListener("input", set);
  field.addEventListener("change", leave);

  const { min, max, type } = port.typeInfo;
  const [least, most] = [min, max].map((bound) => (bound === null ? NaN : bound.number));
  if (type !== Type.Float || !Number.isFinite(most - least) || least >= most) return label;
  const slider = element("input", { type: "range", min: least, max: most, step: "any", "aria-label": `${name}, by slider` });
  slider.value = field.value;
  slider.addEventListener("input", () => {
    field.value = slider.value;
    set();
  });
  slider.addEventListener("change", leave);
  field.addEventListener("input", () => (slider.value = field.value));
  label.append(slider);
  return label;
}

function showInputs() {
  const chosen = patches.get(patchSelect().value);
  // The input after the last edit, if it can be identified.
  const patch = chosen === undefined || patchSelect().value.includes("/") ? chosen : index.findPatch(chosen.id);
  byId("inputs").replaceChildren(...(patch?.inputs ?? []).map(fieldOf));
  byId("input-error").textContent = "";
}

function choosePatch(key) {
  if (!patches.has(key)) return;
  patchSelect().value = key;
  keep("input-patch", key);
  showInputs();
}

function showPatches() {
  patches = new Map();
  collectPatches(current().root);
  const seen = new Set();
  repeated = new Set();
  for (const { inputs } of patches.values()) {
    for (const { id } of inputs) (seen.has(id) ? repeated : seen).add(id);
  }
  choices(patchSelect(), [...patches].map(([key, patch]) => [key, `${nameOf(patch)} (${patch.id})`]));
  const canBeSet = ([, { inputs }]) => inputs.some(({ id }) => index.incomingConnection(id) === null);
  const [first] = [...patches].find(canBeSet) ?? [...patches][0] ?? [""];
  const kept = stateOf("input-patch", "");
  patchSelect().value = patches.has(kept) ? kept : first;
  showInputs();
}

// Versions

let keeping = 0;
let comparing = 0;

// Updates everything for the current version. The graph shows the inputs: all but the one that was
// set are unchanged.
function showVersion(edited) {
  const { root, sample } = current();
  index.update(root);
  showFrames();
  for (const [id, isThere] of [["undo", at > 0], ["redo", at < versions.length - 1]]) {
    byId(id).setAttribute("aria-disabled", String(!isThere));
  }
  byId("sample").value = sample ?? "";
  showParts(edited, JSON.parse(textOf(native.reportInput(addressOf(root), ...halves(edited)))));
  clearTimeout(comparing);
  // Drawing a large graph takes longer than the time between two keys.
  if (other() !== null) comparing = setTimeout(showGraph, 400);
  clearTimeout(keeping);
  keeping = setTimeout(keepDocuments, 300);
}

function setInput(portId, value) {
  const edit = new PatchEdit(index);
  edit.inputPort(portId).defaultValue = value;
  const root = edit.commit();
  edit.free();
  const before = [versions, at];
  const kept = versions.slice(0, current().open === portId ? at : at + 1);
  versions = [...kept, { ...current(), root, sample: null, edited: portId, open: portId }];
  at = kept.length;
  try {
    showVersion(portId);
  } catch (error) {
    [versions, at] = before;
    throw error;
  }
}

function step(by) {
  if (versions[at + by] === undefined) return;
  const { edited } = versions[Math.max(at, at + by)];
  at += by;
  current().open = null;
  if (edited === null || edited === several) {
    showDocument();
  } else {
    showVersion(edited);
    choosePatch(String(index.ownerOfPort(edited)?.id ?? ""));
    showInputs();
  }
  say(by < 0 ? "Undone" : "Redone");
}

// Keeping

let keepings = 0;

// A document in the address: the name of a bundled one, otherwise its content.
async function addressText({ root, info, sample }) {
  return sample ?? `~${await packed(writeDocument(root, info.framesPerSecond))}`;
}

async function keepDocuments() {
  const turn = ++keepings;
  const isCompared = byId("compare").value === "opened" && current().edited !== null;
  const texts = await Promise.all([current(), otherFile, isCompared ? opened() : null].map((document) => document && addressText(document)));
  // Another document was opened meanwhile.
  if (turn !== keepings) return;
  const [documentName, otherName] = [current(), otherFile].map((document) => (document?.sample === null ? document.name : null));
  for (const [i, key] of ["document", "other", "opened"].entries()) keep(key, texts[i]);
  keep("document-name", documentName);
  keep("other-name", otherName);
  const isKept = texts.every((text) => text === null || text.length <= longest);
  byId("document-kept").textContent = isKept ? "" : "This is too large for the address: a link would not include it.";
}

// Opening

function showDocument() {
  const { root, info, name } = current();
  index = new PatchIndex(root);
  forgetAnswers();
  byId("document-name").textContent = name;
  const lines = `${textOf(native.reportCounts(addressOf(root)))}${info.summary}`.split("\n").filter((line) => line !== "");
  byId("document-notes").replaceChildren(...lines.map((line) => element("p", {}, line)));
  showPatches();
  showVersion(several);
  showGraph();
}

const longestError = 300;

function sayError(name, error) {
  const line = `${name}: ${messageOf(error)}`;
  const half = longestError / 2;
  byId("document-error").textContent = line.length > longestError ? `${line.slice(0, half)} … ${line.slice(-half)}` : line;
}

// Parses the document, or returns null and shows a one-line error.
function read(bytes, name, sample = null) {
  try {
    return { ...readDocumentWithInfo(bytes), name, sample };
  } catch (error) {
    sayError(name, error);
    return null;
  }
}

function open(document) {
  if (document === null) return;
  keep("input-patch", null);
  const before = [versions, at];
  versions = [...versions.slice(0, at + 1), { ...document, edited: null, open: null }];
  at = versions.length - 1;
  try {
    showDocument();
  } catch (error) {
    sayError(document.name, error);
    [versions, at] = before;
    if (versions.length > 0) showDocument();
  }
}

function takeOther(document) {
  if (document === null) return;
  otherFile = document;
  const option = byId("compare").querySelector("[value=file]");
  option.disabled = false;
  option.textContent = document.name;
}

function compareWithFile(document) {
  takeOther(document);
  if (document === null) return;
  byId("compare").value = "file";
  byId("compare").dispatchEvent(new Event("input"));
}

let reading = 0;

// Calls `use` with each file in order, up to the first that cannot be read; with none where other
// files were chosen meanwhile.
async function readFiles(files, uses) {
  const turn = ++reading;
  byId("document-error").textContent = "";
  for (const [i, file] of files.entries()) {
    let document = null;
    try {
      const bytes = new Uint8Array(await file.arrayBuffer());
      if (turn !== reading) return;
      document = read(bytes, file.name);
    } catch (error) {
      // A folder, or a file that no longer exists.
      sayError(file.name, error);
    }
    if (document === null) return;
    uses[i](document);
  }
}

// The address's value for the key, or null.
async function kept(key, otherwise) {
  const text = stateOf(key, otherwise);
  if (text === "") return null;
  if (Object.hasOwn(samples, text)) return read(samples[text], text, text);
  try {
    return read(await unpacked(text.slice(1)), stateOf(`${key}-name`, "a document"));
  } catch {
    byId("document-error").textContent = "The link contains no readable document.";
    return null;
  }
}

function listen() {
  byId("sample").addEventListener("input", ({ target: { value } }) => {
    ++reading;
    byId("document-error").textContent = "";
    open(read(samples[value], value, value));
  });
  for (const [id, use] of [["document-file", open], ["compare-file", compareWithFile]]) {
    byId(id).addEventListener("change", ({ target }) => {
      const files = [...target.files];
      // Allows choosing the same file again after it changed.
      target.value = "";
      readFiles(files, [use]);
    });
  }
  patchSelect().addEventListener("input", () => choosePatch(patchSelect().value));
  byId("undo").addEventListener("click", () => step(-1));
  byId("redo").addEventListener("click", () => step(1));
  addEventListener("keydown", (event) => {
    // Text fields have their own undo.
    const isElsewhere = byId("documents").hidden || event.target.matches("input:not([type=range])");
    if (isElsewhere || !(event.ctrlKey || event.metaKey)) return;
    const by = { z: event.shiftKey ? 1 : -1, y: 1 }[event.key.toLowerCase()];
    if (by === undefined) return;
    event.preventDefault();
    step(by);
  });
  byId("save").addEventListener("click", () => {
    const { root, info, name } = current();
    const url = URL.createObjectURL(new Blob([writeDocument(root, info.framesPerSecond)], { type: "application/json" }));
    element("a", { href: url, download: `${name.replace(/\.json$/, "")}.json` }).click();
    setTimeout(() => URL.revokeObjectURL(url), 1000);
  });
  // Clicking or focusing a patch in the graph shows its inputs.
  for (const kind of ["click", "focusin"]) {
    byId("report-graph").addEventListener(kind, ({ target }) => {
      const port = target.closest(".patch")?.querySelector("[data-port]");
      const patch = port ? index.ownerOfPort(BigInt(port.dataset.port)) : null;
      if (patch !== null && String(patch.id) !== patchSelect().value) choosePatch(String(patch.id));
    });
  }
  const hasFiles = (event) => event.dataTransfer.types.includes("Files");
  addEventListener("dragover", (event) => {
    if (hasFiles(event)) event.preventDefault();
  });
  addEventListener("drop", (event) => {
    if (!hasFiles(event)) return;
    event.preventDefault();
    byId("tab-documents").click();
    readFiles([...event.dataTransfer.files].slice(0, 2), [open, compareWithFile]);
  });
}

export async function start() {
  byId("sample").append(...Object.keys(samples).map((name) => element("option", { value: name }, name)));
  frame = Number(stateOf("frame", "0")) || 0;
  takeOther(await kept("other", ""));
  const before = await kept("opened", "");
  const document = (await kept("document", "animation")) ?? read(animation, "animation", "animation");
  // Both must exist before the choice between them.
  versions = [{ ...(before ?? document), name: document.name, edited: null, open: null }];
  if (before !== null) versions.push({ ...document, edited: several, open: null });
  at = versions.length - 1;
  keepField(byId("compare"), "", () => {
    showGraph();
    keepDocuments();
  });
  if (byId("compare").selectedOptions[0].disabled) byId("compare").value = "";
  try {
    showDocument();
  } catch (error) {
    sayError(document.name, error);
    open(read(animation, "animation", "animation"));
  }
  listen();
}
