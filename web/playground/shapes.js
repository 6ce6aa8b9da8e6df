// The Shapes tab: a shape with its parameters as handles and fields, and another one to morph to.

import { interpolate, PathBuilder, PathInstruction, svgPathData } from "../src/library.js";
import { numberOf } from "./contents.js";
import { attempt, byId, choices, element, shortly, svgElement } from "./dom.js";
import { keep, keepField, stateOf } from "./state.js";

// Parameters by name; a point is two numbers. `of` computes the position of a handle from the
// parameters, `to` the parameters from the position.
const point = (name) => ({ names: [`${name} x`, `${name} y`], of: (p) => [p[`${name} x`], p[`${name} y`]], to: (x, y) => ({ [`${name} x`]: x, [`${name} y`]: y }) });
const size = {
  names: ["width", "height"], of: (p) => [p["origin x"] + p.width, p["origin y"] + p.height],
  to: (x, y, p) => ({ width: x - p["origin x"], height: y - p["origin y"] }),
};
const corner = (name) => ({
  names: [name], of: (p) => [p["origin x"] + p[name], p["origin y"]], to: (x, y, p) => ({ [name]: x - p["origin x"] }),
});

const arc = (isVerticalFirst) => ({
  handles: [point("start"), point("end")], begin: [-60, 60, 60, -60],
  draw: (b, [x, y, ...end]) => b.moveTo([x, y]).arcTo(end, isVerticalFirst),
  code: ([x, y, endX, endY]) => `moveTo({${x}, ${y}}).arcTo({${endX}, ${endY}}, ${isVerticalFirst})`,
});

const shapes = {
  circle: {
    handles: [point("center"), { names: ["radius"], of: (p) => [p["center x"] + p.radius, p["center y"]], to: (x, y, p) => ({ radius: x - p["center x"] }) }],
    begin: [0, 0, 60], draw: (b, [x, y, r]) => b.circle([x, y], r), code: ([x, y, r]) => `circle({${x}, ${y}}, ${r})`,
  },
  ellipse: {
    handles: [point("center"), {
      names: ["radius x", "radius y"], of: (p) => [p["center x"] + p["radius x"], p["center y"] + p["radius y"]],
      to: (x, y, p) => ({ "radius x": x - p["center x"], "radius y": y - p["center y"] }),
    }],
    begin: [0, 0, 80, 50], draw: (b, [x, y, w, h]) => b.ellipse([x, y], [w, h]), code: ([x, y, w, h]) => `ellipse({${x}, ${y}}, {${w}, ${h}})`,
  },
  roundRect: {
    handles: [point("origin"), size, corner("radius")], begin: [-80, -50, 160, 100, 20],
    draw: (b, [x, y, w, h, r]) => b.roundRect([x, y], [w, h], r), code: ([x, y, w, h, r]) => `roundRect({${x}, ${y}}, {${w}, ${h}}, ${r})`,
  },
  hexaRect: {
    handles: [point("origin"), size, corner("cut")], begin: [-80, -50, 160, 100, 30],
    draw: (b, [x, y, w, h, c]) => b.hexaRect([x, y], [w, h], c), code: ([x, y, w, h, c]) => `hexaRect({${x}, ${y}}, {${w}, ${h}}, ${c})`,
  },
  "arcTo, vertical first": arc(true),
  "arcTo, horizontal first": arc(false),
  "moveTo, lineTo, close": {
    handles: [point("first"), point("second"), point("third")], begin: [-80, 60, 0, -70, 80, 60],
    draw: (b, n) => b.moveTo(n.slice(0, 2)).lineTo(n.slice(2, 4)).lineTo(n.slice(4)).close(),
    code: (n) => `moveTo({${n[0]}, ${n[1]}}).lineTo({${n[2]}, ${n[3]}}).lineTo({${n[4]}, ${n[5]}}).close()`,
  },
  curveTo: {
    handles: [point("start"), point("first control"), point("second control"), point("end")], begin: [-90, 60, -30, -90, 30, 90, 90, -60],
    draw: (b, n) => b.moveTo(n.slice(0, 2)).curveTo(n.slice(2, 4), n.slice(4, 6), n.slice(6)),
    code: (n) => `moveTo({${n[0]}, ${n[1]}}).curveTo({${n[2]}, ${n[3]}}, {${n[4]}, ${n[5]}}, {${n[6]}, ${n[7]}})`,
  },
  quadCurveTo: {
    handles: [point("start"), point("control"), point("end")], begin: [-90, 60, 0, -120, 90, 60],
    draw: (b, n) => b.moveTo(n.slice(0, 2)).quadCurveTo(n.slice(2, 4), n.slice(4)),
    code: (n) => `moveTo({${n[0]}, ${n[1]}}).quadCurveTo({${n[2]}, ${n[3]}}, {${n[4]}, ${n[5]}})`,
  },
};
const instructions = Object.keys(PathInstruction);

let fields = [];
const shape = () => shapes[byId("shape-kind").value];
const namesOf = ({ handles }) => handles.flatMap(({ names }) => names);
const pathOf = ({ draw }, numbers) => draw(new PathBuilder(), numbers).build();

// The visible part of the plane.
const farthest = 1e6;

function numbers() {
  return fields.map(({ value }) => {
    const number = numberOf(value);
    if (!(Math.abs(number) <= farthest)) throw new RangeError(`"${value}" is not within ${farthest} of 0`);
    return number;
  });
}

function parameters() {
  const values = numbers();
  return Object.fromEntries(namesOf(shape()).map((name, i) => [name, values[i]]));
}

const keepFields = () => keep("shape", fields.map(({ value }) => value.trim()).join(" "));

function setParameters(changed) {
  namesOf(shape()).forEach((name, i) => {
    if (changed[name] !== undefined) fields[i].value = Math.round(changed[name] * 100) / 100;
  });
  keepFields();
  update();
}

function codeOf(values, other, t) {
  const path = (name, code) => `Path const ${name} = PathBuilder().${code}.build();`;
  const first = path("path", shape().code(values));
  if (other === "") return first;
  const second = path("other", shapes[other].code(shapes[other].begin));
  return `${first}\n${second}\nOptional<Path> const between = interpolate(path, other, ${t});`;
}

function update() {
  attempt(byId("shape-error"), () => {
    const values = numbers();
    const path = pathOf(shape(), values);
    const other = byId("morph-kind").value;
    const t = Number(byId("morph-progress").value);
    const morphed = other === "" ? path : interpolate(path, pathOf(shapes[other], shapes[other].begin), t);
    byId("morph-note").textContent = morphed === null ? "These two have different instructions, so there is no shape between them." : "";
    const shownPath = morphed ?? path;
    byId("shape-outline").setAttribute("d", svgPathData(shownPath));
    byId("shape-elements").replaceChildren(...shownPath.elements.map(({ instruction, points }) =>
      element("li", {}, `${instructions[instruction]} ${points.map((p) => p.map(shortly).join(" ")).join(", ")}`)));
    byId("shape-svg").textContent = svgPathData(shownPath);
    byId("shape-code").textContent = codeOf(values, other, t);
    const places = parameters();
    [...byId("shape-handles").children].forEach((handle, i) => {
      const [x, y] = shape().handles[i].of(places);
      handle.setAttribute("cx", x);
      handle.setAttribute("cy", y);
      handle.setAttribute("aria-valuenow", Math.round(x));
      handle.setAttribute("aria-valuetext", `${shortly(x)}, ${shortly(y)}`);
    });
  });
}

// Moves the handle by this much.
function moveHandle(i, dx, dy) {
  attempt(byId("shape-error"), () => {
    const now = parameters();
    const [x, y] = shape().handles[i].of(now);
    setParameters(shape().handles[i].to(x + dx, y + dy, now));
  });
}

function makeHandles() {
  const picture = byId("shape-picture");
  const placeOf = (event) => {
    const box = picture.getBoundingClientRect();
    return [(event.clientX - box.left) / box.width * 240 - 120, (event.clientY - box.top) / box.height * 240 - 120];
  };
  byId("shape-handles").replaceChildren(...shape().handles.map(({ names }, i) => {
    const label = names.length === 1 ? names[0] : names[0].replace(/ x$/, "").replace("width", "size");
    const handle = svgElement("circle", { r: 7, tabindex: 0, role: "slider", "aria-label": label, "aria-valuenow": 0, "aria-valuemin": -120, "aria-valuemax": 120 });
    let last;
    handle.addEventListener("pointerdown", (event) => {
      handle.setPointerCapture(event.pointerId);
      last = placeOf(event);
    });
    handle.addEventListener("pointermove", (event) => {
      if (event.buttons === 0 || last === undefined) return;
      const [x, y] = placeOf(event);
      moveHandle(i, x - last[0], y - last[1]);
      last = [x, y];
    });
    handle.addEventListener("keydown", (event) => {
      const [dx, dy] = { ArrowLeft: [-1, 0], ArrowRight: [1, 0], ArrowUp: [0, -1], ArrowDown: [0, 1] }[event.key] ?? [0, 0];
      if (dx === 0 && dy === 0) return;
      event.preventDefault();
      const far = event.shiftKey ? 10 : 1;
      moveHandle(i, far * dx, far * dy);
    });
    return handle;
  }));
}

function makeFields(values) {
  const holder = byId("shape-fields");
  while (holder.children.length > 1) holder.lastElementChild.remove();
  fields = namesOf(shape()).map((name, i) => {
    const field = element("input", { autocomplete: "off", inputmode: "decimal", "aria-describedby": "shape-error" });
    field.value = values[i];
    field.addEventListener("input", () => {
      keepFields();
      update();
    });
    holder.append(element("label", {}, `${name} `, field));
    return field;
  });
  makeHandles();
}

export function start() {
  const kind = byId("shape-kind");
  choices(kind, Object.keys(shapes).map((name) => [name, name]));
  choices(byId("morph-kind"), [["", "nothing"], ...Object.keys(shapes).map((name) => [name, name])]);
  keepField(kind, "roundRect", () => {
    makeFields(shape().begin);
    setParameters({});
  });
  keepField(byId("morph-kind"), "", update);
  keepField(byId("morph-progress"), "0.5", update);
  const kept = stateOf("shape", "").split(" ");
  makeFields(kept.length === shape().begin.length ? kept : shape().begin);
  update();
}
