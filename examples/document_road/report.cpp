#include "report.h"

#include "kinds.h"

#include <algorithm>
#include <map>
#include <set>
#include <sstream>
#include <tuple>

using namespace tarn::engine;

namespace {

// Wider lists of columns are no help to a reader.
constexpr std::size_t kMostColumns = 12;

void forEachPatch(Patch const& root, std::function<void(Patch const&, std::size_t)> const& visit,
                  std::size_t level = 1) {
    visit(root, level);
    for (Patch const& child : *root.children) forEachPatch(child, visit, level + 1);
}

// The patch whose children hold `wanted`.
Patch const* parentOf(Patch const& root, Patch const& wanted) {
    Patch const* parent = nullptr;
    forEachPatch(root, [&](Patch const& patch, std::size_t) {
        for (Patch const& child : *patch.children) {
            if (&child == &wanted) parent = &patch;
        }
    });
    return parent;
}

std::string cut(std::string text, std::size_t longest = kWidestCell) {
    if (text.size() <= longest) return text;
    std::size_t end = longest - 3;
    while (end > 0 && (static_cast<unsigned char>(text[end]) & 0xc0) == 0x80) --end;
    return text.substr(0, end) + "...";
}

std::string title(Patch const& patch) {
    std::ostringstream text;
    text << "patch " << patch.id << " \"" << printable(patch.name) << "\", " << kindName(patch);
    if (!patch.descriptor.empty()) text << " (" << printable(patch.descriptor) << ")";
    return text.str();
}

std::string portTitle(Port const& port) {
    std::ostringstream text;
    text << "port " << port.id << " \"" << printable(port.name) << "\", " << portTypeText(port);
    return text.str();
}

// Sets of connections have no order: sorted, they are printed alike every time.
void writeSorted(std::ostream& stream, std::unordered_set<Connection> const& connections) {
    std::vector<Connection> sorted(connections.begin(), connections.end());
    auto const key = [](Connection const& c) {
        return std::tie(c.fromPatchId, c.fromPortId, c.toPatchId, c.toPortId);
    };
    std::sort(sorted.begin(), sorted.end(),
              [&](Connection const& a, Connection const& b) { return key(a) < key(b); });
    for (Connection const& c : sorted) {
        stream << "    " << c << " from patch " << c.fromPatchId << " to patch " << c.toPatchId
               << "\n";
    }
    if (sorted.empty()) stream << "    none\n";
}

void writeAttributes(std::ostream& stream, std::map<std::string, Unstructured> const& attributes) {
    if (attributes.empty()) return;
    stream << "  attributes:";
    for (auto const& [key, value] : attributes) stream << " " << printable(key);
    stream << "\n";
}

std::string tableText(std::vector<std::vector<std::string>> const& rows) {
    std::vector<std::size_t> widths(rows.front().size(), 0);
    for (auto const& row : rows) {
        for (std::size_t i = 0; i < row.size(); ++i) widths[i] = std::max(widths[i], row[i].size());
    }
    std::string text;
    for (auto const& row : rows) {
        std::string line;
        for (std::size_t i = 0; i < row.size(); ++i) {
            line += row[i] + std::string(widths[i] - row[i].size() + 2, ' ');
        }
        text += line.substr(0, line.find_last_not_of(' ') + 1) + "\n";
    }
    return text;
}

}  // namespace

std::vector<ShownOutput> shownOutputs(Document const& document, EvalPatch const& root) {
    std::vector<ShownOutput> result;
    for (EvalPort const& output : *root.outputs) result.push_back({output.name, &output});
    if (!result.empty()) return result;
    for (EvalPatch const& child : *root.children) {
        for (EvalPort const& output : *child.outputs) {
            bool const connected =
                !findOutgoingConnectionsFromPort(document.root, output.id).empty();
            if (connected || result.size() == kMostColumns) continue;
            result.push_back({std::to_string(child.id) + " " + output.name, &output});
        }
    }
    return result;
}

std::string shownValues(Loop const& values, std::size_t longest) {
    if (values.size() == 1) return cut(printable(to_string(values.front())), longest);
    std::string text;
    for (Value const& value : values) {
        text += (text.empty() ? "[" : " | ") + printable(to_string(value));
        if (text.size() > longest) break;
    }
    return cut(text + "]", longest);
}

std::string kindName(Patch const& patch) {
    std::string const name = kindToString(patch.builtin);
    return name.empty() ? kindToString(kUnknownKind) : name;
}

std::string portTypeText(Port const& port) {
    std::ostringstream text;
    text << portNameForTypeInfo(port.typeInfo, false) << " " << port.typeInfo;
    if (port.typeInfo.min) text << " from " << printable(to_string(*port.typeInfo.min));
    if (port.typeInfo.max) text << " to " << printable(to_string(*port.typeInfo.max));
    text << ", default " << shownValues({port.defaultValue});
    return text.str();
}

std::string counted(std::size_t count, std::string const& one, std::string const& more) {
    return std::to_string(count) + " " + (count == 1 ? one : more);
}

std::string countsText(Document const& document) {
    std::size_t patches = 0;
    std::size_t levels = 0;
    std::size_t ports = 0;
    std::size_t connections = 0;
    std::map<std::string, std::vector<TypeInfo>> types;
    std::set<std::string> unknown;
    forEachPatch(document.root, [&](Patch const& patch, std::size_t level) {
        ++patches;
        levels = std::max(levels, level);
        connections += patch.connections->size();
        if (patch.builtin == kUnknownKind) unknown.insert(printable(patch.descriptor));
        for (auto const& list : {patch.inputs, patch.outputs}) {
            ports += list->size();
            for (Port const& port : *list) {
                types[portNameForTypeInfo(port.typeInfo, true)].push_back(port.typeInfo);
            }
        }
    });
    std::ostringstream text;
    bool const isOwn = document.info.form == DocumentInfo::Form::Own;
    text << "read " << (isOwn ? "a document: " : "a node graph: ")
         << counted(patches, "patch", "patches") << " in " << counted(levels, "level", "levels")
         << ", " << counted(ports, "port", "ports") << ", "
         << counted(connections, "connection", "connections") << "\n";
    if (!types.empty()) {
        text << "ports:";
        for (auto const& [name, infos] : types) {
            text << (name == types.begin()->first ? " " : ", ") << infos.size() << " "
                 << portNameForTypeInfo(infos.front(), infos.size() > 1);
        }
        text << "\n";
    }
    if (!unknown.empty()) {
        text << "not implemented, inputs' defaults handed on:";
        for (std::string const& name : unknown) text << " " << name;
        text << "\n";
    }
    for (std::string const& line : document.info.notes) text << printable(line) << "\n";
    return text.str();
}

std::string patchText(Document const& document, unsigned long long id) {
    Patch const* const patch = findPatchRecursive(document.root, id);
    if (patch == nullptr) return "";
    Patch const* const parent = parentOf(document.root, *patch);
    std::ostringstream text;
    text << title(*patch) << "\n";
    text << "  in: " << (parent != nullptr ? title(*parent) : "nothing, it is the root") << "\n";
    for (Port const& port : *patch->inputs) text << "  input " << portTitle(port) << "\n";
    for (Port const& port : *patch->outputs) text << "  output " << portTitle(port) << "\n";
    text << "  children: " << patch->children->size() << "\n";
    writeAttributes(text, patch->attributes);
    if (parent != nullptr) {
        text << "  incoming:\n";
        writeSorted(text, findIncomingConnectionsToPatch(*parent, id));
        text << "  outgoing:\n";
        writeSorted(text, findOutgoingConnectionsFromPatch(*parent, id));
    }
    return text.str();
}

std::string portText(Document const& document, unsigned long long id) {
    Patch const* owner = nullptr;
    Port const* port = nullptr;
    bool isInput = false;
    forEachPatch(document.root, [&](Patch const& patch, std::size_t) {
        for (auto const& list : {patch.inputs, patch.outputs}) {
            for (Port const& candidate : *list) {
                if (candidate.id != id || port != nullptr) continue;
                owner = &patch;
                port = &candidate;
                isInput = list == patch.inputs;
            }
        }
    });
    if (port == nullptr) return "";
    Patch const* const parent = parentOf(document.root, *owner);
    std::ostringstream text;
    text << (isInput ? "input " : "output ") << portTitle(*port) << "\n";
    text << "  of: " << title(*owner) << "\n";
    text << "  tag: " << port->tag << "\n";
    writeAttributes(text, port->attributes);
    if (isInput) {
        std::unordered_set<Connection> incoming;
        if (parent != nullptr) {
            auto const connection = findIncomingConnectionToPort(*parent, id);
            if (connection) incoming.insert(*connection);
        }
        text << "  incoming:\n";
        writeSorted(text, incoming);
    } else {
        text << "  outgoing:\n";
        writeSorted(text, findOutgoingConnectionsFromPort(document.root, id));
    }
    return text.str();
}

std::string framesText(Document const& document, long long frames, long long every,
                       std::function<void(long long frame)> const& progress) {
    Evaluator evaluator(document);
    std::vector<ShownOutput> const outputs = shownOutputs(document, evaluator.root());
    std::vector<std::vector<std::string>> rows(1, {"frame"});
    for (ShownOutput const& output : outputs) rows[0].push_back(cut(printable(output.name)));
    for (long long frame = 0; frame < frames; ++frame) {
        progress(frame);
        evaluator.evaluate(frame);
        if (frame % every != 0) continue;
        rows.push_back({std::to_string(frame)});
        for (ShownOutput const& output : outputs) {
            rows.back().push_back(shownValues(output.port->values));
        }
    }
    return tableText(rows);
}
