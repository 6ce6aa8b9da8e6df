"""Pretty-prints the values, unstructured data, graphs and paths of Tarn Engine Base in lldb:

    (lldb) command script import tarn_engine_base_lldb.py
"""

import lldb

TYPES = ["float", "vec2", "vec3", "vec4", "mat4", "boolean", "int", "image", "video", "sound", "path",
         "string", "model", "unstructured"]
# The alternatives of a value, in the order of its variant.
VALUE_KINDS = ["int", "float", "vec2", "vec3", "vec4", "mat4", "boolean", "image", "video", "sound", "model",
               "path", "unstructured", "string"]
INSTRUCTIONS = ["moveTo", "lineTo", "curveTo", "quadCurveTo", "close"]
DATA_KINDS = ["null", "map", "array", "float", "integer", "unsigned", "string"]
STRING = "std::basic_string<char, std::char_traits<char>, std::allocator<char> >"
NAMESPACE = "tarn::engine::"
RECORDS = {"vec2": "FloatVec2", "vec3": "FloatVec3", "vec4": "FloatVec4", "mat4": "FloatMat4", "path": "Path",
           "unstructured": "Unstructured", "map": "Unstructured::Map", "array": "Unstructured::Array"}
BASIC = {"int": lldb.eBasicTypeLongLong, "integer": lldb.eBasicTypeLongLong, "float": lldb.eBasicTypeDouble,
         "boolean": lldb.eBasicTypeBool}
BY_POINTER = ("mat4", "path", "unstructured", "string", "map", "array")


# Containers of libstdc++, read without lldb's formatters.

def member(value, *names):
    value = value.GetNonSyntheticValue()
    for name in names:
        value = value.GetChildMemberWithName(name).GetNonSyntheticValue()
    return value


def text_of(string):
    length = member(string, "_M_string_length").GetValueAsUnsigned()
    if length == 0:
        return ""
    error = lldb.SBError()
    address = member(string, "_M_dataplus", "_M_p").GetValueAsUnsigned()
    return string.GetProcess().ReadMemory(address, length, error).decode("utf-8", "backslashreplace")


def quoted(string):
    text = text_of(string).replace("\\", "\\\\").replace('"', '\\"')
    return '"' + "".join(c if c.isprintable() else "\\x%02x" % ord(c) for c in text) + '"'


def at(value, name, address, kind):
    return value.CreateValueFromAddress(name, address, kind)


def elements_of(vector):
    start = member(vector, "_M_impl", "_M_start")
    kind = start.GetType().GetPointeeType()
    size = member(vector, "_M_impl", "_M_finish").GetValueAsUnsigned() - start.GetValueAsUnsigned()
    count = size // kind.GetByteSize() if kind.GetByteSize() else 0
    return [at(vector, "[%d]" % i, start.GetValueAsUnsigned() + i * kind.GetByteSize(), kind)
            for i in range(count)]


def entries_of(tree):
    """The (key, value) pairs of a std::map, in order."""
    header = member(tree, "_M_t", "_M_impl", "_M_header")
    count = member(tree, "_M_t", "_M_impl", "_M_node_count").GetValueAsUnsigned()
    pointer = tree.GetProcess().GetAddressByteSize()
    kind = record(tree, "Unstructured")
    key = string_type(tree)

    def link(node, i):  # After the colour: parent, left, right.
        return tree.GetProcess().ReadPointerFromMemory(node + (1 + i) * pointer, lldb.SBError())

    found = []
    node = member(header, "_M_left").GetValueAsUnsigned()
    for _ in range(count):
        entry = node + 4 * pointer
        found.append((at(tree, "key", entry, key), entry + key.GetByteSize(), kind))
        if link(node, 2):
            node = link(node, 2)
            while link(node, 1):
                node = link(node, 1)
        else:
            parent = link(node, 0)
            while node == link(parent, 2):
                node, parent = parent, link(parent, 0)
            node = parent
    return [(quoted(k), at(tree, "[%s]" % quoted(k), address, t)) for k, address, t in found]


def record(value, name):
    return value.GetTarget().FindFirstType(NAMESPACE + name)


def string_type(value):
    for name in ("std::string", "std::__cxx11::basic_string<char, std::char_traits<char>, std::allocator<char> >",
                 STRING):
        kind = value.GetTarget().FindFirstType(name)
        if kind.IsValid():
            return kind.GetCanonicalType()
    return lldb.SBType()


def pointee(value, shared):
    pointer = member(shared, "_M_ptr")
    return pointer.Dereference() if pointer.GetValueAsUnsigned() else None


def held(value, kinds):
    """The index of a Boost.Variant's alternative and its content, None for null. Payloads begin with
    the shared pointer, nodes with their content."""
    union = member(value, "storage")
    which = member(union, "which_").GetValueAsSigned()
    kind = kinds[which if which >= 0 else ~which]
    if kind == "null":
        return kind, None
    if kind == "string":
        content = string_type(value)
    elif kind in RECORDS:
        content = record(value, RECORDS[kind])
    else:
        content = value.GetTarget().GetBasicType(BASIC.get(kind, lldb.eBasicTypeUnsignedLongLong))
    address = member(union, "storage_").GetLoadAddress()
    if kind in BY_POINTER:
        address = value.GetProcess().ReadPointerFromMemory(address, lldb.SBError())
    return (kind, at(value, kind, address, content)) if address else (kind, None)


def double_of(value):
    return value.GetData().GetDouble(lldb.SBError(), 0)


def number(d):
    return "%.17g" % d if float("%.15g" % d) != d else "%.15g" % d


def vector(value):
    parts = [member(value, name) for name in "xyzw"]
    return "(" + ", ".join(number(double_of(p)) for p in parts if p.IsValid()) + ")"


def named(names, value):
    i = value.GetValueAsUnsigned()
    return names[i] if i < len(names) else str(i)


def value_text(value):
    kind, content = held(value, VALUE_KINDS)
    if content is None:
        return kind + " null"
    if kind == "string":
        return "string " + quoted(content)
    if kind == "path":
        return path_text(content)
    if kind == "unstructured":
        return "unstructured " + data_text(content)
    if kind == "mat4":
        elements = member(content, "elements")
        numbers = [number(double_of(elements.GetChildAtIndex(i))) for i in range(16)]
        return "mat4 (" + "; ".join(", ".join(numbers[i:i + 4]) for i in range(0, 16, 4)) + ")"
    if kind.startswith("vec"):
        return kind + " " + vector(content)
    if kind == "float":
        return "float " + number(double_of(content))
    if kind == "boolean":
        return "boolean " + ("true" if content.GetValueAsUnsigned() else "false")
    if kind == "int":
        return "int %d" % content.GetValueAsSigned()
    return "%s %d" % (kind, content.GetValueAsUnsigned())


def data_text(data):
    kind, content = held(data, DATA_KINDS)
    if kind == "map":
        return "map of %d" % member(content, "_M_t", "_M_impl", "_M_node_count").GetValueAsUnsigned()
    if kind == "array":
        return "array of %d" % len(elements_of(content))
    if kind == "string":
        return quoted(content)
    if kind == "float":
        return number(double_of(content))
    if kind == "null":
        return kind
    if kind == "unsigned":
        return "%du" % content.GetValueAsUnsigned()
    return "%d" % content.GetValueAsSigned()


def optional_text(value):
    storage = member(value, "storage")
    if "HeapOptional" in storage.GetType().GetCanonicalType().GetName():
        pointer = member(storage, "pointer")
        if not pointer.GetValueAsUnsigned():
            return "none"
        inside = pointer.Dereference()
    else:
        payload = member(storage, "_M_payload")
        if not member(payload, "_M_engaged").GetValueAsUnsigned():
            return "none"
        inside = member(payload, "_M_payload", "_M_value")
    is_value = inside.GetType().GetUnqualifiedType().GetName() == NAMESPACE + "Value"
    return value_text(inside) if is_value else inside.GetSummary() or inside.GetValue() or "some"


def type_info_text(value):
    text = named(TYPES, member(value, "type"))
    subtype = member(value, "subtype").GetValueAsUnsigned()
    if subtype:
        text += ", subtype %d" % subtype
    for bound in ("min", "max", "extra"):
        inside = optional_text(member(value, bound))
        if inside != "none":
            text += ", %s %s" % (bound, inside)
    return text


def points_text(value):
    kind = record(value, "FloatVec2")
    held = member(value, "held")
    # Some versions show an array of inline elements as empty.
    in_place = held.GetByteSize() // kind.GetByteSize()
    is_many = member(value, "room").GetValueAsUnsigned() > in_place
    start = member(held, "many").GetValueAsUnsigned() if is_many else held.GetLoadAddress()
    count = member(value, "length").GetValueAsUnsigned()
    return " ".join(vector(at(value, "p", start + i * kind.GetByteSize(), kind)) for i in range(count))


def element_text(value):
    return (named(INSTRUCTIONS, member(value, "instruction")) + " " +
            points_text(member(value, "points"))).rstrip()


def path_text(value):
    return "path of %d elements" % len(elements_of(member(value, "elements")))


def connection_text(value):
    ids = tuple(member(value, n).GetValueAsUnsigned()
                for n in ("fromPortId", "fromPatchId", "toPortId", "toPatchId"))
    return "port %d of patch %d -> port %d of patch %d" % ids


def port_text(value):
    return "port %d %s: %s = %s" % (
        member(value, "id").GetValueAsUnsigned(), quoted(member(value, "name")),
        type_info_text(member(value, "typeInfo")), value_text(member(value, "defaultValue")))


def eval_port_text(value):
    return "port %d %s: %s = [%s]" % (
        member(value, "id").GetValueAsUnsigned(), quoted(member(value, "name")),
        type_info_text(member(value, "typeInfo")),
        ", ".join(value_text(v) for v in elements_of(member(value, "values"))))


def patch_text(value):
    return "patch %d %s, builtin %d" % (
        member(value, "id").GetValueAsUnsigned(), quoted(member(value, "name")),
        member(value, "builtin").GetValueAsUnsigned())


def index_root(value):
    """The root of an index, None for a moved-from index or a library without debug symbols."""
    shared = member(value, "shared")
    if shared.IsValid():
        return pointee(value, shared)
    tables = record(value, "detail::PatchTables")  # Private to the library, so only in its symbols.
    address = member(value, "tables", "_M_ptr").GetValueAsUnsigned()
    return member(at(value, "tables", address, tables), "root") if address and tables.IsValid() else None


def index_text(value):
    root = index_root(value)
    return "index" if root is None else "index of " + patch_text(root)


def value_children(value):
    kind, content = held(value, VALUE_KINDS)
    if content is None:
        return []
    return {"path": path_children, "unstructured": data_children}.get(kind, lambda _: [])(content)


def data_children(data):
    kind, content = held(data, DATA_KINDS)
    if kind == "map":
        return [entry for _, entry in entries_of(content)]
    return elements_of(content) if kind == "array" else []


def path_children(value):
    return elements_of(member(value, "elements"))


def port_children(value):
    return [entry for _, entry in entries_of(member(value, "attributes"))]


def patch_children(value):
    found = []
    for name in ("inputs", "outputs", "connections", "children"):
        shared = member(value, name)
        inside = pointee(value, shared) if shared.IsValid() else None
        for i, element in enumerate(elements_of(inside) if inside is not None else []):
            found.append(at(value, "%s[%d]" % (name, i), element.GetLoadAddress(), element.GetType()))
    return found


def index_children(value):
    root = index_root(value)
    return [] if root is None else patch_children(root)


def summary(text):
    return lambda value, _: text(value.GetNonSyntheticValue())


def provider(children):
    class Children:
        def __init__(self, value, _):
            self.value = value
            self.found = []

        def update(self):
            self.found = children(self.value.GetNonSyntheticValue())
            return False

        def num_children(self):
            return len(self.found)

        def get_child_index(self, name):
            return next((i for i, c in enumerate(self.found) if c.GetName() == name), -1)

        def get_child_at_index(self, i):
            return self.found[i] if 0 <= i < len(self.found) else None

        def has_children(self):
            self.update()
            return bool(self.found)
    return Children


VIEWS = [  # type, text, children
    ("FloatVec[234]", vector, None), ("Value", value_text, value_children),
    ("Unstructured", data_text, data_children), ("Optional<.*>", optional_text, None),
    ("TypeInfo", type_info_text, None), ("Points", points_text, None), ("PathElement", element_text, None),
    ("Path", path_text, path_children), ("Connection", connection_text, None),
    ("Port", port_text, port_children), ("EvalPort", eval_port_text, None),
    ("(Eval)?Patch", patch_text, patch_children), ("(Eval)?PatchIndex", index_text, index_children)]


def __lldb_init_module(debugger, _):
    for i, (pattern, text, children) in enumerate(VIEWS):
        globals()["text%d" % i] = summary(text)
        name = "^tarn::engine::%s$" % pattern
        expand = "-e" if children is not None else ""
        debugger.HandleCommand("type summary add %s -w tarn -x '%s' -F %s.text%d"
                               % (expand, name, __name__, i))
        globals()["Children%d" % i] = provider(children or (lambda value: []))
        debugger.HandleCommand("type synthetic add -w tarn -x '%s' -l %s.Children%d" % (name, __name__, i))
    debugger.HandleCommand("type category enable tarn")
