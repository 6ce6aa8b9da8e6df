// Converts a patch to Graphviz's language: groups become clusters, ports become fields of record
// nodes.
//
//     graph_to_dot | dot -Tsvg > graph.svg

#include <Engine/Base/patch.h>

#include <iostream>
#include <string>
#include <unordered_map>
#include <vector>

using namespace tarn::engine;

namespace {

// Escapes a field of a record label. Graphviz interprets entities and some characters.
std::string label(std::string const& text) {
    std::string result;
    for (char const c : text) {
        if (c == '&') {
            result += "&amp;";
        } else if (static_cast<unsigned char>(c) < 0x20) {
            result += "\\ ";
        } else {
            if (std::string("\\\"{}|<> ").find(c) != std::string::npos) result += '\\';
            result += c;
        }
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

// Names nodes by their position, "1/2/3", because identifiers in unchecked graphs may repeat.
void writePatch(std::ostream& stream, Patch const& patch, std::string const& place) {
    bool const isGroup = !patch.children->empty();
    if (isGroup) stream << "subgraph \"cluster " << place << "\" {\n";
    stream << "\"" << place << "\" [label=\"{{" << fields(*patch.inputs) << "}|"
           << label(patch.name) << "|{" << fields(*patch.outputs) << "}}\""
           << (isGroup ? ", style=bold];\n" : "];\n");
    std::unordered_map<unsigned long long, std::string> places;
    for (std::size_t i = 0; i < patch.children->size(); ++i) {
        Patch const& child = (*patch.children)[i];
        places.emplace(child.id, place + "/" + std::to_string(i + 1));
        writePatch(stream, child, place + "/" + std::to_string(i + 1));
    }
    for (Connection const& c : *patch.connections) {
        auto const from = places.find(c.fromPatchId);
        auto const to = places.find(c.toPatchId);
        if (from == places.end() || to == places.end()) continue;  // A dangling connection.
        stream << "\"" << from->second << "\":" << c.fromPortId << ":s -> \"" << to->second
               << "\":" << c.toPortId << ":n;\n";
    }
    if (isGroup) stream << "}\n";
}

}  // namespace

int main() {
    Patch clock;
    clock.id = 3;
    clock.name = "clock & calendar";

    Patch time;
    time.id = 2;
    time.name = "time";
    time.outputs = arrayOf<Port>({{21, 1, "seconds", {}, {}, {}}});
    time.children = arrayOf<Patch>({clock});

    Patch ring;
    ring.id = 4;
    ring.name = "ring <round>";
    ring.inputs = arrayOf<Port>({{41, 1, "radius", {}, {}, {}}});

    Patch root;
    root.id = 1;
    root.name = "pulsing ring";
    root.children = arrayOf<Patch>({time, ring});
    root.connections = arrayOf<Connection>({{2, 21, 4, 41}});

    std::cout << "digraph {\nnode [shape=record];\n";
    writePatch(std::cout, root, "1");
    std::cout << "}\n";
}
