// A document, as records of the library: our own form of it, and the form of browser node editors.
//
//     Document document = readDocument("examples/documents/animation.json");
//     Patch const* patch = findPatchRecursive(document.root, 7);

#ifndef DOCUMENT_ROAD_DOCUMENT_H
#define DOCUMENT_ROAD_DOCUMENT_H

#include "input.h"

#include <Engine/Base/patch.h>

#include <string>
#include <vector>

struct Document {
    std::string form;
    tarn::engine::Patch root;
    double framesPerSecond = 60.0;
    // What was left out, one line each. Only graphs of other programs are read in part.
    std::vector<std::string> skipped;
};

// Tells the two forms apart by their content. Throws an InputError for what cannot be used.
Document readDocument(std::string const& fileName);
Document parseDocument(std::string const& text);

// Our own form: see examples/documents/README.md.
Document readOwnForm(Field const& file);
// An object with "nodes" and "links".
Document readNodeGraph(Field const& file);

// "attributes", or whatever else holds free-form settings, as the records keep them.
std::map<std::string, tarn::engine::Unstructured> toAttributes(Json const& object);

#endif
