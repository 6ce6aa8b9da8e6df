// Draws graphs and scenes as SVG.
//
//     Drawing drawing(document.root);
//     std::string const svg = drawing.graph(layOut(document.root).front());

#ifndef REPORT_DRAWING_H
#define REPORT_DRAWING_H

#include "animation/document.h"
#include "animation/scene.h"
#include "report/layout.h"
#include "report/marks.h"

#include <Engine/Base/patch_index.h>

#include <string>
#include <vector>

// A rectangle; y points down.
struct Bounds {
    double left = 0.0;
    double top = 0.0;
    double right = 0.0;
    double bottom = 0.0;
    bool isEmpty = true;

    void add(tarn::engine::Path const& path);
    // The larger of width and height.
    double size() const;
    // Extended by `margin` on each side.
    Bounds widened(double margin) const;
};

// "rgb(255 127 0 / 0.5)".
std::string colorText(tarn::engine::FloatVec4 color);

class Drawing {
public:
    // Marks the changes, if given; they must outlive the drawing.
    explicit Drawing(tarn::engine::Patch const& root, Marks const* changes = nullptr)
        : index(root), marks(changes) {}

    // Draws one level: boxes with ports, and connections. `label` is the name for screen readers,
    // where the page supports the keyboard.
    std::string graph(Level const& level, std::string const& label = "") const;

    // The description of a patch or port in parts, beginning with its name.
    std::vector<std::string> describe(tarn::engine::Patch const& patch) const;
    std::vector<std::string> describe(tarn::engine::Port const& port, bool isInput) const;

private:
    std::string box(Box const& box) const;
    std::string port(tarn::engine::Port const& port, bool isInput, double width, double y) const;
    std::string portName(unsigned long long patchId, unsigned long long portId) const;
    // "changed", or empty.
    std::string markOf(tarn::engine::Patch const& patch) const;

    tarn::engine::PatchIndex index;
    Marks const* marks;
};

// The drawn paths as `path` elements.
std::string scenePaths(std::vector<Drawn> const& scene);

// The root's graph and the drawing of that frame as a stand-alone picture.
std::string pictureText(Document const& document, long long frame);

#endif
