#include "animation/labels.h"

#include "animation/kinds.h"

#include <Engine/Base/patch_index.h>

#include <algorithm>
#include <map>
#include <set>
#include <sstream>

using namespace tarn::engine;

namespace {

// More columns do not fit on a screen.
constexpr std::size_t kMostColumns = 12;

// Whether this is a continuation byte of UTF-8.
bool isContinuation(char byte) { return (static_cast<unsigned char>(byte) & 0xc0) == 0x80; }

}  // namespace

std::string cutToBytes(std::string text, std::size_t longest) {
    if (text.size() <= longest) return text;
    std::size_t end = longest - 3;
    while (end > 0 && isContinuation(text[end])) --end;
    return text.substr(0, end) + "...";
}

std::size_t columnsOf(std::string const& text) {
    std::size_t columns = 0;
    for (char const c : text) {
        if (isContinuation(c)) continue;
        columns += static_cast<unsigned char>(c) < 0xe0
                       ? 1
                       : 2;  // East Asian characters, of three or more bytes, are two columns wide.
    }
    return columns;
}

std::string shortened(std::string const& text, std::size_t longest) {
    if (columnsOf(text) <= longest) return text;
    std::string result;
    std::size_t columns = 0;
    for (std::size_t i = 0; i < text.size();) {
        std::size_t end = i + 1;
        while (end < text.size() && isContinuation(text[end])) ++end;
        std::string const character = text.substr(i, end - i);
        columns += columnsOf(character);
        if (columns >= longest) break;
        result += character;
        i = end;
    }
    return result + "\u2026";
}

std::vector<ShownOutput> shownOutputs(Document const& document, EvalPatch const& root) {
    std::vector<ShownOutput> result;
    for (EvalPort const& output : *root.outputs) result.push_back({output.name, &output});
    if (!result.empty()) return result;
    PatchIndex const index(document.root);
    for (EvalPatch const& child : *root.children) {
        for (EvalPort const& output : *child.outputs) {
            bool const connected = !index.outgoingConnections(output.id).empty();
            if (connected || result.size() == kMostColumns) continue;
            result.push_back({std::to_string(child.id) + " " + output.name, &output});
        }
    }
    return result;
}

std::string shownValues(Loop const& values, std::size_t longest) {
    if (values.size() == 1) return cutToBytes(printable(to_string(values.front())), longest);
    std::string text;
    for (Value const& value : values) {
        text += (text.empty() ? "[" : " | ") + printable(to_string(value));
        if (text.size() > longest) break;
    }
    return cutToBytes(text + "]", longest);
}

std::string kindName(Patch const& patch) {
    std::string const name = kindToString(patch.builtin);
    return name.empty() ? kindToString(kUnknownKind) : name;
}

std::string nameOf(Patch const& patch) {
    return printable(patch.name.empty() ? kindName(patch) : patch.name);
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
        text << "kinds without an implementation (outputs are the defaults of inputs):";
        for (std::string const& name : unknown) text << " " << name;
        text << "\n";
    }
    for (std::string const& line : document.info.notes) text << printable(line) << "\n";
    return text.str();
}
