#include <Engine/Document/document.h>

#include <Engine/Document/detail/graph_reader.h>
#include <Engine/Document/detail/own_reader.h>
#include <Engine/Document/detail/texts.h>

#include <ostream>
#include <utility>

namespace tarn::engine {

namespace {

std::string counted(std::size_t count, char const* one, char const* more) {
    return std::to_string(count) + " " + (count == 1 ? one : more);
}

void append(std::string& list, std::string const& part) {
    if (!list.empty()) list += ", ";
    list += part;
}

bool readNodeGraph(std::string_view text, Patch& root, DocumentInfo& info, DocumentError& error) {
    detail::GraphReader reader;
    if (!reader.read(text)) {
        error = std::move(reader.fault);
        return false;
    }
    info.form = DocumentInfo::Form::NodeGraph;
    return detail::toPatches(reader.graph, reader.definitions, root, info, error);
}

bool read(std::string_view text, Patch& root, DocumentInfo& info, DocumentError& error) {
    detail::OwnReader reader;
    if (reader.read(text) && reader.finish()) {
        info.framesPerSecond = reader.framesPerSecond;
        root = std::move(reader.root);
        return true;
    }
    if (reader.isNodeGraph) return readNodeGraph(text, root, info, error);
    error = std::move(reader.fault);
    return false;
}

}  // namespace

std::ostream& operator<<(std::ostream& stream, DocumentError const& error) {
    if (error.line != 0) stream << "line " << error.line << ", column " << error.column << ": ";
    if (!error.pointer.empty()) stream << detail::printable(error.pointer) << ": ";
    return stream << error.message;
}

std::string DocumentInfo::summary() const {
    std::string list;
    if (renumberedNodes > 0)
        append(list, counted(renumberedNodes, "node", "nodes") + " renumbered");
    if (omittedLinks > 0) append(list, counted(omittedLinks, "link", "links") + " left out");
    if (unusedDefinitions > 0) {
        append(list, counted(unusedDefinitions, "definition", "definitions") + " not used");
    }
    return list;
}

Optional<Patch> readDocument(std::string_view text, DocumentError* error, DocumentInfo* info) {
    Patch root;
    DocumentInfo found;
    DocumentError fault;
    if (!read(text, root, found, fault)) {
        if (error != nullptr) {
            if (fault.line == 0) detail::locate(text, fault);
            *error = std::move(fault);
        }
        return std::nullopt;
    }
    if (info != nullptr) *info = std::move(found);
    return root;
}

}  // namespace tarn::engine
