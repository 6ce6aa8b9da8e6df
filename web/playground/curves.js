// The Curves tab: a curve and the values that it gives.

import { ease, EasingFunction, easingFunctionNames, Value } from "../src/library.js";
import { cppOf, endOf, isColour } from "./contents.js";
import { attempt, byId, choices, shortly } from "./dom.js";
import { keepField } from "./state.js";

const names = Object.keys(EasingFunction);
const steps = Float64Array.from({ length: 201 }, (_, i) => i / 200);

const hex = (rgba) => `#${Array.from(rgba, (part) =>
  Math.round(Math.min(Math.max(part, 0), 1) * 255).toString(16).padStart(2, "0")).join("")}`;

function update() {
  attempt(byId("curve-error"), () => {
    const name = byId("curve-function").value;
    const curve = EasingFunction[name];
    const progress = Number(byId("curve-progress").value);
    const [from, to] = ["curve-from", "curve-to"].map((id) => endOf(byId(id).value));
    const eased = ease(curve, from, to, progress);
    const along = ease(curve, 200, 0, steps);
    byId("curve-line").setAttribute("d", `M${Array.from(along, (y, i) => `${i} ${shortly(y)}`).join("L")}`);
    const [x, y] = [200 * progress, ease(curve, 200, 0, progress)];
    byId("curve-cursor").setAttribute("d", `M${x} -20V220`);
    byId("curve-dot").setAttribute("cx", x);
    byId("curve-dot").setAttribute("cy", y);
    byId("curve-at").textContent = progress.toFixed(3);
    const areColours = ["curve-from", "curve-to"].every((id) => isColour(byId(id).value));
    byId("curve-value").textContent = areColours ? hex(eased) : String(new Value(eased));
    byId("curve-swatch").style.background = areColours ? hex(eased) : "";
    byId("curve-swatch").hidden = !areColours;
    byId("curve-code").textContent =
      `ease(EasingFunction::${name}, ${cppOf(from)}, ${cppOf(to)}, ${progress})  // ${new Value(eased)}`;
  });
}

export function start() {
  choices(byId("curve-function"), easingFunctionNames().map((name, i) => [names[i], name]));
  const slider = byId("curve-progress");
  keepField(byId("curve-function"), "CubicInOut", update);
  keepField(byId("curve-from"), "0", update);
  keepField(byId("curve-to"), "100", update);
  keepField(slider, "0.25", update);
  const picture = byId("curve-picture");
  const drag = (event) => {
    if (event.buttons === 0) return;
    const box = picture.getBoundingClientRect();
    slider.value = ((event.clientX - box.left) / box.width * 240 - 20) / 200;
    slider.dispatchEvent(new Event("input"));
  };
  picture.addEventListener("pointerdown", (event) => {
    picture.setPointerCapture(event.pointerId);
    drag(event);
  });
  picture.addEventListener("pointermove", drag);
  update();
}
