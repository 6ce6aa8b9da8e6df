// A document as this program goes through it: the graph and what the library says of its file.
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

// Input that cannot be used. `what()` is one line: the place in the file, and what is wrong there.
struct InputError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

struct Document {
    tarn::engine::Patch root;
    tarn::engine::DocumentInfo info;
};

// What of the graph the library carries and this program does not show: more than a thousand
// levels, over which it recurses, or ports without a type. Empty where there is nothing of that
// kind.
std::string whatIsNotShown(tarn::engine::Patch const& root);

// Throws an InputError for what cannot be used, or is not shown.
Document openDocument(std::string const& fileName);
Document parseDocument(std::string const& text);

// In one line. Bytes that are no UTF-8 become U+FFFD.
std::string jsonText(Json const& json);

// The text with what a terminal would act on, line ends included, written as escapes.
std::string printable(std::string const& text);

#endif
