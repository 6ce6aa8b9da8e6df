#include "document.h"

using namespace tarn::engine;

Document readDocument(std::string const& fileName) { return parseDocument(readFile(fileName)); }

Document parseDocument(std::string const& text) {
    Json const json = parseJson(text);
    Field const file(json);
    if (file.object().contains("nodes")) return readNodeGraph(file);
    if (file.object().contains("root")) return readOwnForm(file);
    file.refuse("neither a document (it has no \"root\") nor a node graph (it has no \"nodes\")");
}

std::map<std::string, Unstructured> toAttributes(Json const& object) {
    std::map<std::string, Unstructured> result;
    for (auto const& [key, member] : object.items()) result.emplace(key, fromJson(member));
    return result;
}
