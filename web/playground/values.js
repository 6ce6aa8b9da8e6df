// The subject of values: what one reads as, and what a port makes of it.

import { castValueToType, portNameForTypeInfo, Type, typeToString, Value } from "../src/library.js";
import { cppOf, kinds, numberOf, typeNames } from "./contents.js";
import { attempt, byId, choices, element } from "./dom.js";
import { keepField } from "./state.js";

// What to show of a value of that type: its text, or for data the data.
const shown = (value) => (value.type === Type.Unstructured ? value.asUnstructured().toText(400) : value.toString());

function code(value) {
  const content = {
    [Type.Float]: () => cppOf(value.number), [Type.Int]: () => `${value.integer}LL`, [Type.Boolean]: () => String(value.boolean),
    [Type.Vec2]: () => cppOf(value.vec2), [Type.Vec3]: () => cppOf(value.vec3), [Type.Vec4]: () => cppOf(value.vec4),
    [Type.String]: () => JSON.stringify(value.string), [Type.Image]: () => `Value::Image(${value.id}u)`,
    [Type.Unstructured]: () => `Unstructured(fromJson(nlohmann::json::parse(R"(${JSON.stringify(value.asUnstructured())})")))`,
  }[value.type]();
  return `Value const value = ${content};\nstd::cout << value.asType(Type::Vec4);  // ${value.asType(Type.Vec4)}`;
}

function update() {
  attempt(byId("value-error"), () => {
    const value = kinds[byId("value-type").value].read(byId("value-content").value);
    byId("value-readings").replaceChildren(...typeNames.map((name) => {
      const type = Type[name];
      const heading = element("th", { scope: "row", class: `t-${typeToString(type)}` }, typeToString(type));
      return element("tr", {}, heading, element("td", {}, shown(value.asType(type))));
    }));
    const bound = (id) => (byId(id).value.trim() === "" ? null : numberOf(byId(id).value));
    const port = { type: Type[byId("port-type").value], min: bound("port-min"), max: bound("port-max") };
    byId("port-name").textContent = portNameForTypeInfo(port);
    byId("port-value").textContent = shown(castValueToType(value, port).asType(port.type));
    byId("value-code").textContent = code(value);
  });
}

export function start() {
  const kind = byId("value-type");
  choices(kind, Object.entries(kinds).map(([key, { name }]) => [key, name]));
  choices(byId("port-type"), typeNames.map((name) => [name, portNameForTypeInfo({ type: Type[name] })]));
  keepField(kind, "number", () => {
    byId("value-content").value = kinds[kind.value].begin;
    byId("value-content").dispatchEvent(new Event("input"));
  });
  keepField(byId("value-content"), kinds[kind.value].begin, update);
  keepField(byId("port-type"), "Float", update);
  keepField(byId("port-min"), "0", update);
  keepField(byId("port-max"), "1", update);
  update();
}
