#include "animation/document.h"

#include <sstream>
#include <utility>
#include <vector>

using namespace tarn::engine;

namespace {

constexpr std::size_t kDeepest = 1000;

Document requireUsable(Optional<Patch> root, DocumentInfo info, DocumentError const& error) {
    if (!root) {
        std::ostringstream line;
        line << error;
        throw InputError(line.str());
    }
    std::string const reason = whatIsNotShown(*root);
    if (!reason.empty()) throw InputError(reason);
    return {std::move(*root), std::move(info)};
}

}  // namespace

// Not recursive, since the depth is what this determines.
std::string whatIsNotShown(Patch const& root) {
    std::vector<std::pair<Patch const*, std::size_t>> pending{{&root, 1}};
    while (!pending.empty()) {
        auto const [patch, level] = pending.back();
        pending.pop_back();
        if (level > kDeepest) {
            return "nested deeper than " + std::to_string(kDeepest) + " levels";
        }
        for (auto const& list : {patch->inputs, patch->outputs}) {
            for (Port const& port : *list) {
                if (port.typeInfo.type <= Type::Unstructured) continue;
                return "port " + std::to_string(port.id) + " has no type that is known";
            }
        }
        for (Patch const& child : *patch->children) pending.emplace_back(&child, level + 1);
    }
    return "";
}

Document openDocument(std::string const& fileName) {
    DocumentError error;
    DocumentInfo info;
    Optional<Patch> root = loadDocument(fileName, &error, &info);
    return requireUsable(std::move(root), std::move(info), error);
}

Document parseDocument(std::string const& text) {
    DocumentError error;
    DocumentInfo info;
    Optional<Patch> root = readDocument(text, &error, &info);
    return requireUsable(std::move(root), std::move(info), error);
}

std::string jsonText(Json const& json) {
    return json.dump(-1, ' ', false, Json::error_handler_t::replace);
}

std::string printable(std::string const& text) {
    std::string result;
    for (char const c : text) {
        auto const byte = static_cast<unsigned char>(c);
        if (c == '\n') {
            result += "\\n";
        } else if (byte < 0x20 || byte == 0x7f) {
            char const* const digits = "0123456789abcdef";
            result += std::string("\\x") + digits[byte >> 4] + digits[byte & 15];
        } else {
            result += c;
        }
    }
    return result;
}
