// The Values tab: the conversions of a value, and what a port does with it.

import { castValueToType, portNameForTypeInfo, Type, typeToString, Value } from "../src/library.js";
import { cppOf, kinds, numberOf, typeNames } from "./contents.js";
import { attempt, byId, choices, element } from "./dom.js";
import { keepField } from "./state.js";

// The string to show for a value of that type; for unstructured data the data.
const shown = (value) => (value.type === Type.Unstructured ? value.asUnstructured().toText(400) : value.toString());

// The smallest integer has no literal.
const cppInteger = (integer) => (integer === -(2n ** 63n) ? "-9223372036854775807LL - 1" : `${integer}LL`);
const cppString = (string) =>
  JSON.stringify(string).replace(/\\u00([01][0-9a-f])|\u007f/g, (_, code = "7f") => `\\${parseInt(code, 16).toString(8).padStart(3, "0")}`);
// JavaScript's JSON has no 64-bit integers.
const wholeNumber = (_, content) => (typeof content === "bigint" ? Number(content) : content);

function code(value) {
  const content = {
    [Type.Float]: () => cppOf(value.number), [Type.Int]: () => cppInteger(value.integer), [Type.Boolean]: () => String(value.boolean),
    [Type.Vec2]: () => cppOf(value.vec2), [Type.Vec3]: () => cppOf(value.vec3), [Type.Vec4]: () => cppOf(value.vec4),
    [Type.String]: () => cppString(value.string), [Type.Image]: () => `Value::Image(${value.id}u)`,
    [Type.Unstructured]: () => `Unstructured(fromJson(nlohmann::json::parse(R"json(${JSON.stringify(value.asUnstructured().toJS(), wholeNumber)})json")))`,
  }[value.type]();
  return `Value const value = ${content};\nstd::cout << value.asType(Type::Vec4);  // ${value.asType(Type.Vec4)}`;
}

function update() {
  attempt(byId("value-error"), () => {
    const value = kinds[byId("value-type").value].read(byId("value-content").value);
    const conversions = typeNames.map((name) => {
      const type = Type[name];
      const heading = element("th", { scope: "row", class: `t-${typeToString(type)}` }, typeToString(type));
      return element("tr", {}, heading, element("td", {}, shown(value.asType(type))));
    });
    const bound = (id) => (byId(id).value.trim() === "" ? null : numberOf(byId(id).value));
    const port = { type: Type[byId("port-type").value], min: bound("port-min"), max: bound("port-max") };
    const ofPort = shown(castValueToType(value, port).asType(port.type));
    const inCpp = code(value);
    // Updates everything, or nothing where an input is invalid.
    byId("value-conversions").replaceChildren(...conversions);
    byId("port-name").textContent = portNameForTypeInfo(port);
    byId("port-value").textContent = ofPort;
    byId("value-code").textContent = inCpp;
  });
}

export function start() {
  const kind = byId("value-type");
  choices(kind, Object.entries(kinds).map(([key, { name }]) => [key, name]));
  choices(byId("port-type"), typeNames.map((name) => [name, `${portNameForTypeInfo({ type: Type[name] })} (${typeToString(Type[name])})`]));
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
