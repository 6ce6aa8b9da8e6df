#include "animation/scene.h"

#include "animation/evaluator.h"
#include "animation/kinds.h"
#include "animation/markup.h"

#include <algorithm>

using namespace tarn::engine;

Scene::Scene(Document const& document, EvalPatch const& root) {
    for (ShownOutput const& output : shownOutputs(document, root)) {
        if (output.port->typeInfo.type == Type::Path) paths.push_back(output);
    }
    forEachPatch(root, [&](EvalPatch const& patch, std::size_t) {
        if (patch.builtin == kLayerKind) layers.push_back(&patch);
    });
}

std::vector<Drawn> Scene::now() const {
    std::vector<Drawn> result;
    auto const draw = [&](std::string const& name, Value const& value) -> Drawn* {
        Path const* const path = value.ifPath();
        if (path == nullptr || path->elements.empty()) return nullptr;
        result.push_back({name, *path, pathData(*path), false, {}, 0.0});
        return &result.back();
    };
    for (ShownOutput const& output : paths) {
        for (Value const& value : output.port->values) draw(output.name, value);
    }
    for (EvalPatch const* layer : layers) {
        std::size_t count = 0;
        for (EvalPort const& input : *layer->inputs) count = std::max(count, input.values.size());
        auto const in = [&](unsigned long long tag, std::size_t index) {
            EvalPort const* const port = inPortForTag(*layer, tag);
            return port != nullptr ? indexLoopCasting(port->values, port->typeInfo, index)
                                   : Value();
        };
        for (std::size_t i = 0; i < count; ++i) {
            Drawn* const drawn = draw(layer->name, in(1, i));
            if (drawn == nullptr) continue;
            drawn->isLayer = true;
            drawn->color = in(2, i);
            drawn->color.w *= double(in(4, i));
            drawn->width = in(3, i);
        }
    }
    return result;
}
