// What an animation draws in its first frames, and what another setting of it changes: lines for people.
//
//     console.log(framesText(readFileSync("animation.json", "utf8"), 3).join("\n"));

import { Evaluator, Patch, patchChanges, PatchEdit, PatchIndex, Port, readDocument, Type } from "../engine_base.mjs";

function drawnText(root: Patch, frames: number): string[] {
  const evaluator = new Evaluator(root);
  const lines = Array.from({ length: frames }, (_, frame) => {
    const outlines = evaluator.evaluate(frame).drawn().map(({ name, svgPathData }) => `${name} ${svgPathData}`);
    return `frame ${frame}: ${outlines.map((outline) => outline.slice(0, 20)).join(", ")}`;
  });
  evaluator.free();
  return lines;
}

const isBounded = ({ typeInfo: { type, max } }: Port): boolean => type === Type.Float && max !== null;

export function framesText(document: string, frames: number): string[] {
  const before = readDocument(document);
  const lines = drawnText(before, frames);
  // The first number that has bounds goes to its upper one.
  const input = before.children.flatMap((child) => child.inputs).find(isBounded);
  const edit = new PatchEdit(new PatchIndex(before));
  const port = input === undefined ? null : edit.inputPort(input.id);
  if (port?.typeInfo.max) port.defaultValue = port.typeInfo.max;
  const after = edit.commit();
  return [...lines, ...patchChanges(before, after).map(({ text }) => text), ...drawnText(after, frames)];
}
