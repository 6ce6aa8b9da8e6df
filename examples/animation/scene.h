// The drawing of the latest frame: the outputs that are paths, and the layers.
//
//     Scene scene(document, evaluator.root());
//     for (Drawn const& drawn : scene.now()) std::cout << drawn.name << " " << drawn.data << "\n";

#ifndef ANIMATION_SCENE_H
#define ANIMATION_SCENE_H

#include "animation/document.h"
#include "animation/labels.h"

#include <Engine/Base/path.h>

#include <string>
#include <vector>

// One path.
struct Drawn {
    std::string name;
    tarn::engine::Path path;
    // The value of an SVG path's `d`.
    std::string data;
    // A layer is stroked; an output that is a path is filled, without a stroke.
    bool isLayer = false;
    // Red, green, blue and opacity.
    tarn::engine::FloatVec4 color;
    double width = 0.0;
};

class Scene {
public:
    // Both must outlive the scene.
    Scene(Document const& document, tarn::engine::EvalPatch const& root);

    // In drawing order, one for each element of a loop.
    std::vector<Drawn> now() const;

private:
    std::vector<ShownOutput> paths;
    std::vector<tarn::engine::EvalPatch const*> layers;
};

#endif
