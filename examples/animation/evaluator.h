// A minimal evaluator: the part that the library leaves to its users.
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

// Evaluates all patches of a document, frame by frame. Within each group, patches are evaluated in
// topological order; in a cycle, at least one connection carries the value of the previous frame.
class Evaluator {
public:
    // `document` must outlive the evaluator.
    explicit Evaluator(Document const& document);

    void evaluate(long long frame);

    // The graph with the values of the latest frame.
    tarn::engine::EvalPatch const& root() const { return evaluatedRoot; }

private:
    struct Level;
    // One child of a group with the output port that is connected to each of its inputs, or null.
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
