// The differences between two documents that the report marks in a graph.
//
//     Marks const marks = marksOf(before, after);
//     Drawing const drawing(marks.shown, &marks);

#ifndef REPORT_MARKS_H
#define REPORT_MARKS_H

#include "animation/document.h"

#include <Engine/Base/patch.h>
#include <Engine/Base/patch_changes.h>

#include <string>
#include <unordered_map>
#include <unordered_set>
#include <vector>

// The kinds of marks: "added", "removed", "moved" or "changed".
std::string kindOfChange(tarn::engine::PatchChange::Kind kind);
// A one-character sign for each kind, for people who cannot see the colours.
std::string signOfChange(std::string const& kind);

struct Marks {
    // The later document, with removed patches after the other children of their former parent.
    tarn::engine::Patch shown;
    std::vector<tarn::engine::PatchChange> changes;
    // Both frame rates, where they differ.
    std::string frameRates;
    // For each shown identifier: the kind and a description of all changes.
    std::unordered_map<unsigned long long, std::string> kinds;
    std::unordered_map<unsigned long long, std::vector<std::string>> words;
    std::unordered_set<tarn::engine::Connection> added;
    // For each patch that had them.
    std::unordered_map<unsigned long long, std::vector<tarn::engine::Connection>> removed;
};

// The changes point into both documents, which must outlive the marks.
Marks marksOf(Document const& before, Document const& after);

#endif
