// Any patch as a graph in the language of Graphviz: groups as clusters, ports as fields of their
// patch.
//
//     graph_to_dot | dot -Tsvg > graph.svg

#include <Engine/Base/patch.h>

#include <iostream>

using namespace tarn::engine;

namespace {

// Within the braces and bars of a record label.
std::string label(std::string const& text) {
    std::string result;
    for (char const c : text) {
        if (c == '\n') {
            result += "\\n";
            continue;
        }
        if (std::string("\\\"{}|<> ").find(c) != std::string::npos) result += '\\';
        result += c;
    }
    return result;
}

std::string fields(std::vector<Port> const& ports) {
    std::string text;
    for (Port const& port : ports) {
        text += (text.empty() ? "<" : "|<") + std::to_string(port.id) + "> " + label(port.name) +
                " (" + label(portNameForTypeInfo(port.typeInfo, false)) + ")";
    }
    return text;
}

void writePatch(std::ostream& stream, Patch const& patch) {
    stream << "  " << patch.id << " [label=\"{{" << fields(*patch.inputs) << "}|"
           << label(patch.name) << "|{" << fields(*patch.outputs) << "}}\"];\n";
    if (patch.children->empty()) return;
    stream << "  subgraph \"cluster " << patch.id << "\" {\n";
    for (Patch const& child : *patch.children) writePatch(stream, child);
    for (Connection const& c : *patch.connections) {
        stream << "  " << c.fromPatchId << ":" << c.fromPortId << ":s -> " << c.toPatchId << ":"
               << c.toPortId << ":n;\n";
    }
    stream << "  }\n";
}

Port port(unsigned long long id, char const* name, Type type) {
    Port made;
    made.id = id;
    made.name = name;
    made.typeInfo.type = type;
    return made;
}

template <class T>
Array<T> listOf(std::vector<T> elements) {
    return std::make_shared<std::vector<T> const>(std::move(elements));
}

}  // namespace

int main() {
    Patch clock;
    clock.id = 2;
    clock.name = "clock";
    clock.outputs = listOf<Port>({port(21, "seconds", Type::Float)});

    Patch ring;
    ring.id = 3;
    ring.name = "ring <round>";
    ring.inputs = listOf<Port>({port(31, "center", Type::Vec2), port(32, "radius", Type::Float)});
    ring.outputs = listOf<Port>({port(33, "path", Type::Path)});

    Patch root;
    root.id = 1;
    root.name = "pulsing ring";
    root.children = listOf<Patch>({clock, ring});
    root.connections = listOf<Connection>({{2, 21, 3, 32}});

    std::cout << "digraph {\n  node [shape=record];\n";
    writePatch(std::cout, root);
    std::cout << "}\n";
}
