// A small evaluator: what the library leaves to its callers, in its simplest form.
//
//     Evaluator evaluator(document);
//     evaluator.evaluate(12);
//     EvalPort const* port = findOutputPort(evaluator.root(), 34);

#ifndef ANIMATION_EVALUATOR_H
#define ANIMATION_EVALUATOR_H

#include "animation/document.h"

#include <Engine/Base/patch.h>

#include <cstddef>
#include <memory>
#include <vector>

// Evaluates all patches of a document, frame by frame. Within each group the patches are put in an
// order in which every one comes after those that it takes values from; where connections run in
// a circle, one of them hands on the value of the frame before.
class Evaluator {
public:
    // `document` is used as long as the evaluator lives.
    explicit Evaluator(Document const& document);

    void evaluate(long long frame);

    // The graph with the values of the frame that was evaluated last.
    tarn::engine::EvalPatch const& root() const { return evaluatedRoot; }

private:
    struct Level;
    // One child of a group, with the output port that each of its inputs takes values from, or
    // null.
    struct Step {
        tarn::engine::EvalPatch* patch;
        std::vector<tarn::engine::EvalPort const*> sources;
        std::shared_ptr<Level> inside;
    };
    struct Level {
        tarn::engine::EvalPatch* group;
        std::vector<Step> steps;
    };

    static std::shared_ptr<Level> plan(tarn::engine::Patch const& patch,
                                       tarn::engine::EvalPatch& evaluated);
    static std::vector<std::size_t> order(tarn::engine::Patch const& patch);
    void run(Level const& level, long long frame) const;
    void compute(tarn::engine::EvalPatch& patch, long long frame) const;

    Document const& document;
    tarn::engine::EvalPatch evaluatedRoot;
    std::shared_ptr<Level> top;
};

#endif
