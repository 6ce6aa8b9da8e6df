// What the report marks in a graph: how a document differs from another one.
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

// The kinds by which a patch is marked: "added", "removed", "moved" or "changed".
std::string kindOfChange(tarn::engine::PatchChange::Kind kind);
// A sign of one character for each of them, for those who do not see colours.
std::string signOfChange(std::string const& kind);

struct Marks {
    // The later document, with what was removed behind the other children of its former parent.
    tarn::engine::Patch shown;
    std::vector<tarn::engine::PatchChange> changes;
    // A line with both frame rates, where they differ.
    std::string frameRates;
    // By the identifier that the patch is shown with: its kind, and all of its changes in words.
    std::unordered_map<unsigned long long, std::string> kinds;
    std::unordered_map<unsigned long long, std::vector<std::string>> words;
    std::unordered_set<tarn::engine::Connection> added;
    // By the patch that had them.
    std::unordered_map<unsigned long long, std::vector<tarn::engine::Connection>> removed;
};

// The changes point into both documents, which have to outlive the marks.
Marks marksOf(Document const& before, Document const& after);

#endif
