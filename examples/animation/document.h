// A document as this program uses it: the graph, and the information about its file.
//
//     Document document = openDocument("examples/documents/animation.json");
//     Patch const* patch = findPatchRecursive(document.root, 7);

#ifndef ANIMATION_DOCUMENT_H
#define ANIMATION_DOCUMENT_H

#include <Engine/Document/document.h>

#include <nlohmann/json.hpp>

#include <stdexcept>
#include <string>

using Json = nlohmann::json;

// Invalid input. `what()` is one line: the place in the file and the problem.
struct InputError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

struct Document {
    tarn::engine::Patch root;
    tarn::engine::DocumentInfo info;
};

// What this program does not support: more than a thousand levels, since it is recursive, or ports
// with an undefined type. Empty where the graph has neither.
std::string whatIsNotShown(tarn::engine::Patch const& root);

// Throws an InputError for invalid or unsupported documents.
Document openDocument(std::string const& fileName);
Document parseDocument(std::string const& text);

// Formats in one line. Invalid UTF-8 becomes U+FFFD.
std::string jsonText(Json const& json);

// Escapes control characters, including line ends.
std::string printable(std::string const& text);

#endif
