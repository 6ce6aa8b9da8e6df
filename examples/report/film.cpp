#include "report/film.h"

#include "animation/evaluator.h"
#include "animation/labels.h"
#include "animation/markup.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <functional>

using namespace tarn::engine;

namespace {

// The approximate limit of all frames of a page, in bytes.
constexpr std::size_t kMostBytes = 32u << 20;
constexpr std::size_t kBytesOfAPlace = 16;

struct Component {
    char const* name;
    double value;
};

// The numbers to plot for a value; empty where it has none.
std::vector<Component> components(Value const& value) {
    switch (value.type()) {
        case Type::Float:
        case Type::Int:
        case Type::Boolean: return {{"value", double(value)}};
        case Type::Vec2: {
            FloatVec2 const v = value;
            return {{"x", v.x}, {"y", v.y}};
        }
        case Type::Vec3: {
            FloatVec3 const v = value;
            return {{"x", v.x}, {"y", v.y}, {"z", v.z}};
        }
        case Type::Vec4: {
            FloatVec4 const v = value;
            return {{"red", v.x}, {"green", v.y}, {"blue", v.z}, {"opacity", v.w}};
        }
        case Type::Path: {
            Bounds bounds;
            bounds.add(*value.ifPath());
            return {{"left", bounds.left},
                    {"right", bounds.right},
                    {"top", bounds.top},
                    {"bottom", bounds.bottom}};
        }
        case Type::Mat4:
        case Type::Image:
        case Type::Video:
        case Type::Sound:
        case Type::String:
        case Type::Model:
        case Type::Unstructured: break;
    }
    return {};
}

void addFrame(Plot& plot, Loop const& values, long long frame) {
    plot.longestLoop = std::max(plot.longestLoop, values.size());
    bool hasNumbers = false;
    std::size_t line = 0;
    for (Value const& value : values) {
        std::size_t color = 0;
        for (Component const& component : components(value)) {
            hasNumbers = true;
            if (line == plot.lines.size()) {
                plot.lines.push_back({component.name, color, {}});
                // It did not exist in earlier frames.
                plot.lines.back().values.assign(static_cast<std::size_t>(frame), NAN);
            }
            plot.lines[line++].values.push_back(component.value);
            ++color;
        }
    }
    for (; line < plot.lines.size(); ++line) plot.lines[line].values.push_back(NAN);
    if (!hasNumbers && frame > 0 && values != plot.last) plot.changes.push_back(frame);
    plot.last = values;
}

}  // namespace

Film filmOf(Document const& document, long long frames, double seconds) {
    auto const start = std::chrono::steady_clock::now();
    auto const passed = [&] {
        return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    };
    Film film;
    Evaluator evaluator(document);
    Scene const scene(document, evaluator.root());
    std::vector<ShownOutput> const outputs = shownOutputs(document, evaluator.root());
    for (ShownOutput const& output : outputs) {
        film.plots.push_back({printable(output.name), output.port->typeInfo, {}, {}, {}, {}, 1});
    }
    double widest = 0.0;
    std::size_t places = 0;
    for (long long frame = 0; frame < frames; ++frame) {
        if (film.texts.bytes() + kBytesOfAPlace * places > kMostBytes) break;
        if (frame > 0 && passed() > seconds) break;
        evaluator.evaluate(frame);
        for (std::size_t i = 0; i < outputs.size(); ++i) {
            addFrame(film.plots[i], outputs[i].port->values, frame);
            film.plots[i].texts.push_back(
                film.texts.add(shownValues(outputs[i].port->values, kLongestText)));
        }
        std::vector<Drawn> drawn = scene.now();
        Json items = Json::array();
        for (Drawn const& outline : drawn) {
            film.bounds.add(outline.path);
            if (outline.isLayer && std::isfinite(outline.width)) {
                widest = std::max(widest, outline.width);
            }
            Json item = {film.texts.add(outline.data)};
            if (outline.isLayer) {
                item.push_back(film.texts.add(colorText(outline.color)));
                item.push_back(film.texts.add(number(outline.width)));
            }
            items.push_back(std::move(item));
        }
        film.frames.push_back(std::move(items));
        places += 3 * drawn.size() + outputs.size();
        for (Plot const& plot : film.plots) places += plot.lines.size();
        if (frame == 0) film.first = std::move(drawn);
    }
    film.bounds = film.bounds.widened(widest / 2.0 + film.bounds.size() / 20.0);
    return film;
}

bool isConstant(Plot const& plot) {
    auto const isFlat = [](Line const& line) {
        return std::adjacent_find(line.values.begin(), line.values.end(), std::not_equal_to<>()) ==
               line.values.end();
    };
    return plot.changes.empty() && std::all_of(plot.lines.begin(), plot.lines.end(), isFlat);
}
