"""Pretty-prints the values, unstructured data, graphs and paths of Tarn Engine Base in gdb.

gdb loads this file automatically for an installed library. Manually:

    (gdb) source tarn_engine_base.py
"""

import gdb
import gdb.printing

TYPES = ["float", "vec2", "vec3", "vec4", "mat4", "boolean", "int", "image", "video", "sound", "path",
         "string", "model", "unstructured"]
# The alternatives of a value, in the order of its variant.
VALUE_KINDS = ["int", "float", "vec2", "vec3", "vec4", "mat4", "boolean", "image", "video", "sound", "model",
               "path", "unstructured", "string"]
INSTRUCTIONS = ["moveTo", "lineTo", "curveTo", "quadCurveTo", "close"]
DATA_KINDS = ["null", "map", "array", "float", "integer", "unsigned", "string"]


# Containers of libstdc++, read without its printers, which may be missing.

def text_of(string):
    data = string["_M_dataplus"]["_M_p"]
    return data.string("utf-8", "backslashreplace", int(string["_M_string_length"]))


def quoted(string):
    text = text_of(string).replace("\\", "\\\\").replace('"', '\\"')
    return '"' + "".join(c if c.isprintable() else "\\x%02x" % ord(c) for c in text) + '"'


def elements_of(vector):
    item = vector["_M_impl"]["_M_start"]
    end = vector["_M_impl"]["_M_finish"]
    while item != end:
        yield item.dereference()
        item += 1


def entries_of(tree):
    """The pairs of a std::map, in order."""
    header = tree["_M_t"]["_M_impl"]["_M_header"]
    pair = tree.type.strip_typedefs().template_argument(0), tree.type.strip_typedefs().template_argument(1)
    node_type = gdb.lookup_type(
        "std::_Rb_tree_node<std::pair<%s const, %s> >" % (pair[0], pair[1])).pointer()
    node = header["_M_left"]
    for _ in range(int(tree["_M_t"]["_M_impl"]["_M_node_count"])):
        entry = node.cast(node_type)["_M_storage"]["_M_storage"].address
        yield entry.cast(node_type.target().template_argument(0).pointer()).dereference()
        if node["_M_right"]:
            node = node["_M_right"]
            while node["_M_left"]:
                node = node["_M_left"]
        else:
            parent = node["_M_parent"]
            while node == parent["_M_right"]:
                node, parent = parent, parent["_M_parent"]
            node = parent


def pointee(shared):
    """The object that a shared pointer points to, or None."""
    pointer = shared["_M_ptr"]
    return pointer.dereference() if pointer else None


STRING = "std::__cxx11::basic_string<char, std::char_traits<char>, std::allocator<char> >"
# gdb does not know the arguments of variadic variants, so the alternatives are listed here. Payloads begin with the
# shared pointer, nodes with their content.
VALUE_CONTENT = {
    "int": "long long", "float": "double", "boolean": "bool", "vec2": "tarn::engine::FloatVec2",
    "vec3": "tarn::engine::FloatVec3", "vec4": "tarn::engine::FloatVec4",
    "image": "unsigned long long", "video": "unsigned long long", "sound": "unsigned long long",
    "model": "unsigned long long", "mat4": "tarn::engine::FloatMat4", "path": "tarn::engine::Path",
    "unstructured": "tarn::engine::Unstructured", "string": STRING}
DATA_CONTENT = {
    "map": "tarn::engine::Unstructured::Map", "array": "tarn::engine::Unstructured::Array",
    "string": STRING, "float": "double", "integer": "long long", "unsigned": "unsigned long long"}
BY_POINTER = ("mat4", "path", "unstructured", "string", "map", "array")


def held(union, kinds, types):
    """The index of a Boost.Variant's alternative and its content, None for null."""
    which = int(union["which_"])
    kind = kinds[which if which >= 0 else ~which]
    if kind not in types:
        return kind, None
    content = gdb.lookup_type(types[kind]).pointer()
    storage = union["storage_"].address
    if kind not in BY_POINTER:
        return kind, storage.cast(content).dereference()
    pointer = storage.cast(content.pointer()).dereference()
    return kind, pointer.dereference() if pointer else None


def held_by_value(value):
    return held(value["storage"], VALUE_KINDS, VALUE_CONTENT)


def held_by_data(data):
    return held(data["storage"], DATA_KINDS, DATA_CONTENT)


def number(value):
    return "%.17g" % float(value) if float("%.15g" % float(value)) != float(value) \
        else "%.15g" % float(value)


def vector(value):
    return "(" + ", ".join(number(value[f]) for f in "xyzw" if has_field(value, f)) + ")"


def has_field(value, name):
    return any(field.name == name for field in value.type.strip_typedefs().fields())


def named(names, value):
    i = int(value)
    return names[i] if 0 <= i < len(names) else str(i)


def value_text(value):
    kind, content = held_by_value(value)
    if content is None:
        return kind + " null"
    if kind == "string":
        return "string " + quoted(content)
    if kind == "path":
        return "path of %d elements" % len(list(elements_of(content["elements"])))
    if kind == "unstructured":
        return "unstructured " + data_text(content)
    if kind == "mat4":
        numbers = [number(content["elements"][i]) for i in range(16)]
        return "mat4 (" + "; ".join(", ".join(numbers[i:i + 4]) for i in range(0, 16, 4)) + ")"
    if kind.startswith("vec"):
        return kind + " " + vector(content)
    if kind == "float":
        return "float " + number(content)
    if kind == "boolean":
        return "boolean " + ("true" if content else "false")
    return "%s %d" % (kind, int(content))


def data_text(data):
    kind, content = held_by_data(data)
    if kind == "map":
        return "map of %d" % int(content["_M_t"]["_M_impl"]["_M_node_count"])
    if kind == "array":
        return "array of %d" % len(list(elements_of(content)))
    if kind == "string":
        return quoted(content)
    if kind == "float":
        return number(content)
    if kind == "null":
        return kind
    return "%d%s" % (int(content), "u" if kind == "unsigned" else "")


class Printer:
    def __init__(self, value):
        self.value = value

    def children(self):
        return iter(())


class VectorPrinter(Printer):
    def to_string(self):
        return vector(self.value)


class ValuePrinter(Printer):
    def to_string(self):
        return value_text(self.value)

    def children(self):
        kind, content = held_by_value(self.value)
        if kind not in ("path", "unstructured") or content is None:
            return iter(())
        return gdb.default_visualizer(content).children()


class DataPrinter(Printer):
    def to_string(self):
        return data_text(self.value)

    def children(self):
        kind, content = held_by_data(self.value)
        if kind == "map":
            for entry in entries_of(content):
                yield "[%s]" % quoted(entry["first"]), entry["second"]
        elif kind == "array":
            for i, element in enumerate(elements_of(content)):
                yield "[%d]" % i, element


class OptionalPrinter(Printer):
    def inside(self):
        storage = self.value["storage"]
        if "HeapOptional" in str(storage.type.strip_typedefs()):
            pointer = storage["pointer"]
            return pointer.dereference() if int(pointer) != 0 else None
        payload = storage["_M_payload"]
        return payload["_M_payload"]["_M_value"] if payload["_M_engaged"] else None

    def to_string(self):
        inside = self.inside()
        if inside is None:
            return "none"
        printer = gdb.default_visualizer(inside)
        return str(printer.to_string()) if printer is not None else str(inside)


class TypeInfoPrinter(Printer):
    def to_string(self):
        text = named(TYPES, self.value["type"])
        if int(self.value["subtype"]) != 0:
            text += ", subtype %d" % int(self.value["subtype"])
        for bound in ("min", "max", "extra"):
            inside = OptionalPrinter(self.value[bound]).to_string()
            if inside != "none":
                text += ", %s %s" % (bound, inside)
        return text


class PointsPrinter(Printer):
    def points(self):
        held = self.value["held"]
        is_many = int(self.value["room"]) > held["few"].type.range()[1] + 1
        start = held["many"] if is_many else held["few"][0].address
        return [(start + i).dereference() for i in range(int(self.value["length"]))]

    def to_string(self):
        return " ".join(vector(point) for point in self.points())


class ElementPrinter(Printer):
    def to_string(self):
        points = PointsPrinter(self.value["points"]).to_string()
        return (named(INSTRUCTIONS, self.value["instruction"]) + " " + points).rstrip()


class PathPrinter(Printer):
    def to_string(self):
        return "path of %d elements" % len(list(elements_of(self.value["elements"])))

    def children(self):
        for i, element in enumerate(elements_of(self.value["elements"])):
            yield "[%d]" % i, element


class ConnectionPrinter(Printer):
    def to_string(self):
        return "port %d of patch %d -> port %d of patch %d" % (
            int(self.value["fromPortId"]), int(self.value["fromPatchId"]),
            int(self.value["toPortId"]), int(self.value["toPatchId"]))


class PortPrinter(Printer):
    def to_string(self):
        return "port %d %s: %s = %s" % (
            int(self.value["id"]), quoted(self.value["name"]),
            TypeInfoPrinter(self.value["typeInfo"]).to_string(), value_text(self.value["defaultValue"]))

    def children(self):
        for entry in entries_of(self.value["attributes"]):
            yield "[%s]" % quoted(entry["first"]), entry["second"]


class EvalPortPrinter(Printer):
    def to_string(self):
        values = [value_text(v) for v in elements_of(self.value["values"])]
        return "port %d %s: %s = [%s]" % (
            int(self.value["id"]), quoted(self.value["name"]),
            TypeInfoPrinter(self.value["typeInfo"]).to_string(), ", ".join(values))


class PatchPrinter(Printer):
    LISTS = ("inputs", "outputs", "connections", "children")

    def to_string(self):
        return "patch %d %s, builtin %d" % (
            int(self.value["id"]), quoted(self.value["name"]), int(self.value["builtin"]))

    def children(self):
        for name in self.LISTS:
            if has_field(self.value, name):
                shared = pointee(self.value[name])
                for i, element in enumerate(elements_of(shared) if shared is not None else ()):
                    yield "%s[%d]" % (name, i), element


class IndexPrinter(Printer):
    def root(self):
        """The root, or None for a moved-from index or a library without debug symbols."""
        if has_field(self.value, "shared"):
            return pointee(self.value["shared"])
        tables = pointee(self.value["tables"])
        return tables["root"] if tables is not None and has_field(tables, "root") else None

    def to_string(self):
        root = self.root()
        return "index" if root is None else "index of " + PatchPrinter(root).to_string()

    def children(self):
        root = self.root()
        return iter(()) if root is None else PatchPrinter(root).children()


def printers():
    collection = gdb.printing.RegexpCollectionPrettyPrinter("tarn_engine_base")
    for pattern, printer in (
            ("FloatVec[234]", VectorPrinter), ("Value", ValuePrinter), ("Unstructured", DataPrinter),
            ("Optional<.*>", OptionalPrinter), ("TypeInfo", TypeInfoPrinter), ("Points", PointsPrinter),
            ("PathElement", ElementPrinter), ("Path", PathPrinter), ("Connection", ConnectionPrinter),
            ("Port", PortPrinter), ("EvalPort", EvalPortPrinter), ("(Eval)?Patch", PatchPrinter),
            ("(Eval)?PatchIndex", IndexPrinter)):
        collection.add_printer(pattern, "^tarn::engine::" + pattern + "$", printer)
    return collection


gdb.printing.register_pretty_printer(gdb.current_objfile(), printers(), replace=True)
