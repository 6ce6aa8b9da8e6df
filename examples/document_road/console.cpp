#include "console.h"

#include "animation/evaluator.h"
#include "animation/labels.h"
#include "animation/scene.h"

#include <Engine/Base/patch_index.h>

#include <algorithm>
#include <sstream>
#include <tuple>

using namespace tarn::engine;

namespace {

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

// Sorts a set of connections, so that the output is always the same.
template <class Connections>
void writeSorted(std::ostream& stream, Connections const& connections) {
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

// Null where the patch has no input of this identifier.
Port const* inputOf(Patch const& patch, unsigned long long id) {
    auto const hasId = [id](Port const& port) { return port.id == id; };
    auto const found = std::find_if(patch.inputs->begin(), patch.inputs->end(), hasId);
    return found == patch.inputs->end() ? nullptr : &*found;
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

std::string patchText(Document const& document, unsigned long long id) {
    PatchIndex const index(document.root);
    Patch const* const patch = index.findPatch(id);
    if (patch == nullptr) return "";
    Patch const* const parent = index.parentOf(id);
    std::ostringstream text;
    text << title(*patch) << "\n";
    text << "  in: " << (parent != nullptr ? title(*parent) : "nothing, it is the root") << "\n";
    for (Port const& port : *patch->inputs) text << "  input " << portTitle(port) << "\n";
    for (Port const& port : *patch->outputs) text << "  output " << portTitle(port) << "\n";
    text << "  children: " << patch->children->size() << "\n";
    writeAttributes(text, patch->attributes);
    if (parent != nullptr) {
        text << "  incoming:\n";
        writeSorted(text, index.incomingConnectionsToPatch(id));
        text << "  outgoing:\n";
        writeSorted(text, index.outgoingConnectionsFromPatch(id));
    }
    return text.str();
}

std::string portText(Document const& document, unsigned long long id) {
    PatchIndex const index(document.root);
    Patch const* const owner = index.ownerOfPort(id);
    if (owner == nullptr) return "";
    Port const* port = inputOf(*owner, id);
    bool const isInput = port != nullptr;
    if (!isInput) port = index.findOutputPort(id);
    std::ostringstream text;
    text << (isInput ? "input " : "output ") << portTitle(*port) << "\n";
    text << "  of: " << title(*owner) << "\n";
    text << "  tag: " << port->tag << "\n";
    writeAttributes(text, port->attributes);
    if (isInput) {
        Connection const* const incoming = index.incomingConnection(id);
        text << "  incoming:\n";
        writeSorted(text, std::vector<Connection>(incoming, incoming + (incoming != nullptr)));
    } else {
        text << "  outgoing:\n";
        writeSorted(text, index.outgoingConnections(id));
    }
    return text.str();
}

std::string framesText(Document const& document, long long frames, long long every,
                       std::function<void(long long frame)> const& progress) {
    Evaluator evaluator(document);
    std::vector<ShownOutput> const outputs = shownOutputs(document, evaluator.root());
    std::vector<std::vector<std::string>> rows(1, {"frame"});
    for (ShownOutput const& output : outputs) rows[0].push_back(cutToBytes(printable(output.name)));
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

std::string pathsText(Document const& document, long long frames, long long every) {
    Evaluator evaluator(document);
    Scene const scene(document, evaluator.root());
    std::string text;
    for (long long frame = 0; frame < frames; ++frame) {
        evaluator.evaluate(frame);
        if (frame % every != 0) continue;
        for (Drawn const& drawn : scene.now()) {
            text += "frame " + std::to_string(frame) + ", " + printable(drawn.name) + ": " +
                    drawn.data + "\n";
        }
    }
    return text;
}
