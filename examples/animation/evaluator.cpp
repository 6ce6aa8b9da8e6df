#include "animation/evaluator.h"

#include "animation/kinds.h"

#include <algorithm>
#include <set>
#include <unordered_map>

using namespace tarn::engine;

namespace {

// The ports of a group have bounds too.
Loop castAll(Loop const& values, TypeInfo const& typeInfo) {
    Loop result;
    result.reserve(values.size());
    for (Value const& value : values) result.push_back(castValueToType(value, typeInfo));
    return result;
}

}  // namespace

Evaluator::Evaluator(Document const& evaluatedDocument)
    : document(evaluatedDocument),
      evaluatedRoot(document.root),
      top(plan(document.root, evaluatedRoot)) {}

void Evaluator::evaluate(long long frame) { run(*top, frame); }

// The lists of the evaluation form never change their size here: pointers into them stay valid.
std::shared_ptr<Evaluator::Level> Evaluator::plan(Patch const& patch, EvalPatch& evaluated) {
    // The first connection to a port counts, and the first port with an identifier, as in the
    // queries.
    std::unordered_map<unsigned long long, unsigned long long> incoming;
    for (Connection const& c : *patch.connections) incoming.emplace(c.toPortId, c.fromPortId);
    std::unordered_map<unsigned long long, EvalPort const*> outputs;
    for (EvalPort const& port : *evaluated.outputs) outputs.emplace(port.id, &port);
    for (EvalPatch const& child : *evaluated.children) {
        for (EvalPort const& port : *child.outputs) outputs.emplace(port.id, &port);
    }
    auto const sourceOf = [&](Port const& input) -> EvalPort const* {
        auto const connection = incoming.find(input.id);
        if (connection == incoming.end()) return nullptr;
        auto const source = outputs.find(connection->second);
        return source == outputs.end() ? nullptr : source->second;
    };
    auto level = std::make_shared<Level>(Level{&evaluated, {}});
    for (std::size_t const i : order(patch)) {
        Patch const& child = patch.children->at(i);
        EvalPatch& evaluatedChild = evaluated.children->at(i);
        Step step{&evaluatedChild, {}, nullptr};
        // A patch of unknown kind passes on its inputs' defaults: connections to it are ignored.
        for (Port const& input : *child.inputs) {
            if (child.builtin == kUnknownKind) break;
            step.sources.push_back(sourceOf(input));
        }
        if (!child.children->empty()) step.inside = plan(child, evaluatedChild);
        level->steps.push_back(std::move(step));
    }
    return level;
}

// The positions of the children in topological order; those in a cycle or after one come last, in
// their own order. Connections whose ends are not children are ignored.
std::vector<std::size_t> Evaluator::order(Patch const& patch) {
    std::vector<Patch> const& children = *patch.children;
    std::unordered_map<unsigned long long, std::size_t> positions;
    for (std::size_t i = 0; i < children.size(); ++i) positions.emplace(children[i].id, i);

    std::vector<std::vector<std::size_t>> followers(children.size());
    std::vector<std::size_t> waitingFor(children.size(), 0);
    for (Connection const& connection : *patch.connections) {
        auto const from = positions.find(connection.fromPatchId);
        auto const to = positions.find(connection.toPatchId);
        if (from == positions.end() || to == positions.end()) continue;
        followers[from->second].push_back(to->second);
        ++waitingFor[to->second];
    }

    std::set<std::size_t> ready;
    for (std::size_t i = 0; i < children.size(); ++i) {
        if (waitingFor[i] == 0) ready.insert(i);
    }
    std::vector<std::size_t> result;
    while (!ready.empty()) {
        std::size_t const next = *ready.begin();
        ready.erase(ready.begin());
        result.push_back(next);
        for (std::size_t const follower : followers[next]) {
            if (--waitingFor[follower] == 0) ready.insert(follower);
        }
    }
    for (std::size_t i = 0; i < children.size(); ++i) {
        if (waitingFor[i] != 0) result.push_back(i);
    }
    return result;
}

void Evaluator::run(Level const& level, long long frame) const {
    for (Step const& step : level.steps) {
        EvalPatch& patch = *step.patch;
        for (std::size_t i = 0; i < step.sources.size(); ++i) {
            if (step.sources[i] != nullptr) patch.inputs->at(i).values = step.sources[i]->values;
        }
        if (patch.builtin == kGroupInputKind) {
            for (EvalPort& output : *patch.outputs) {
                EvalPort const* const port = inPortForTag(*level.group, output.tag);
                if (port != nullptr) output.values = castAll(port->values, port->typeInfo);
            }
        } else if (patch.builtin == kGroupOutputKind) {
            for (EvalPort const& input : *patch.inputs) {
                for (EvalPort& port : *level.group->outputs) {
                    if (port.tag == input.tag) port.values = castAll(input.values, port.typeInfo);
                }
            }
        } else if (step.inside) {
            run(*step.inside, frame);
        } else {
            compute(patch, frame);
        }
    }
}

void Evaluator::compute(EvalPatch& patch, long long frame) const {
    std::vector<EvalPort> const& inputs = *patch.inputs;
    std::vector<EvalPort>& outputs = *patch.outputs;
    Kind const* const kind = kindByNumber(patch.builtin);
    if (kind == nullptr || kind->evaluate == nullptr) {
        for (std::size_t i = 0; i < std::min(inputs.size(), outputs.size()); ++i) {
            outputs[i].values = {inputs[i].values.front().asType(outputs[i].typeInfo.type)};
        }
        return;
    }

    std::size_t iterations = 1;
    for (EvalPort const& input : inputs) iterations = std::max(iterations, input.values.size());

    Value const absent;
    std::vector<Value> values(inputs.size());
    std::vector<Loop> results(outputs.size());
    auto const in = [&](unsigned long long tag) -> Value const& {
        for (std::size_t i = 0; i < inputs.size(); ++i) {
            if (inputs[i].tag == tag) return values[i];
        }
        return absent;
    };
    auto const outType = [&](unsigned long long tag) {
        EvalPort const* const port = outPortForTag(patch, tag);
        return port != nullptr ? port->typeInfo.type : Type::Float;
    };
    auto const out = [&](unsigned long long tag, Value value) {
        for (std::size_t i = 0; i < outputs.size(); ++i) {
            if (outputs[i].tag != tag || results[i].size() >= kLongestLoop) continue;
            results[i].push_back(value.asType(outputs[i].typeInfo.type));
        }
    };
    for (std::size_t index = 0; index < iterations; ++index) {
        for (std::size_t i = 0; i < inputs.size(); ++i) {
            // Clamps to the port's bounds, then converts to the port's type.
            TypeInfo const& typeInfo = inputs[i].typeInfo;
            values[i] = indexLoopCasting(inputs[i].values, typeInfo, index).asType(typeInfo.type);
        }
        kind->evaluate({{frame, document.info.framesPerSecond}, in, values, outType, out});
    }
    for (std::size_t i = 0; i < outputs.size(); ++i) {
        if (!results[i].empty()) outputs[i].values = std::move(results[i]);
    }
}
