#include "animation/kinds.h"

#include <Engine/Base/easing.h>
#include <Engine/Base/layers.h>
#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>

#include <algorithm>
#include <cmath>

using namespace tarn::engine;

namespace {

constexpr double kTwoPi = 6.283185307179586;

void time(Call const& call) {
    call.out(1, call.moment.seconds());
    call.out(2, call.moment.frame);
    call.out(3, call.moment.seconds() * 1000.0);
}

void constant(Call const& call) {
    for (std::size_t i = 0; i < call.inputs.size(); ++i) call.out(i + 1, call.inputs[i]);
}

// The curve by its name or its number; linear for anything else.
EasingFunction easingFunction(Value const& curve) {
    std::vector<std::string> const names = easingFunctionNames();
    auto const named = std::find(names.begin(), names.end(), std::string(curve));
    if (named != names.end()) return EasingFunction(named - names.begin());
    long long const number = curve;
    bool const known = number >= 0 && number < static_cast<long long>(names.size());
    return known ? EasingFunction(number) : EasingFunction::Linear;
}

void easeBetween(Call const& call) {
    call.out(1, ease(easingFunction(call.in(4)), call.in(1), call.in(2), double(call.in(3))));
}

void oscillator(Call const& call) {
    double const amplitude = call.in(1);
    double const hertz = call.in(2);
    double const turns = call.in(3);
    double const seconds = call.in(4);
    call.out(1, amplitude * std::sin(kTwoPi * (hertz * seconds + turns)));
}

// Component by component; a number fills every component.
void combine(Call const& call, FloatVec4 result, double (*operation)(double, double)) {
    for (Value const& input : call.inputs) {
        FloatVec4 const v = input;
        result = {operation(result.x, v.x), operation(result.y, v.y), operation(result.z, v.z),
                  operation(result.w, v.w)};
    }
    call.out(1, result);
}

void add(Call const& call) {
    combine(call, {0, 0, 0, 0}, [](double a, double b) { return a + b; });
}

void multiply(Call const& call) {
    combine(call, {1, 1, 1, 1}, [](double a, double b) { return a * b; });
}

void compose(Call const& call) {
    call.out(1, FloatVec4{call.in(1), call.in(2), call.in(3), call.in(4)});
}

void split(Call const& call) {
    FloatVec4 const v = call.in(1);
    call.out(1, v.x);
    call.out(2, v.y);
    call.out(3, v.z);
    call.out(4, v.w);
}

void loopOfIndices(Call const& call) {
    auto const longest = static_cast<long long>(kLongestLoop);
    long long const count = std::clamp(static_cast<long long>(call.in(1)), 1LL, longest);
    for (long long i = 0; i < count; ++i) {
        call.out(1, i);
        call.out(2, static_cast<double>(i) / static_cast<double>(count));
    }
}

void pulse(Call const& call) {
    double const period = call.in(1);
    double const now = std::floor(call.moment.seconds() / period);
    Moment before = call.moment;
    --before.frame;
    call.out(1, period > 0.0 && now > std::floor(before.seconds() / period));
}

void choose(Call const& call) { call.out(1, call.in(1) ? call.in(2) : call.in(3)); }

void circle(Call const& call) {
    call.out(1, PathBuilder().circle(call.in(1), double(call.in(2))).build());
}

void ellipse(Call const& call) {
    call.out(1, PathBuilder().ellipse(call.in(1), call.in(2)).build());
}

void roundRect(Call const& call) {
    call.out(1, PathBuilder().roundRect(call.in(1), call.in(2), double(call.in(3))).build());
}

void hexaRect(Call const& call) {
    call.out(1, PathBuilder().hexaRect(call.in(1), call.in(2), double(call.in(3))).build());
}

void arc(Call const& call) {
    call.out(1, PathBuilder().moveTo(call.in(1)).arcTo(call.in(2), bool(call.in(3))).build());
}

void joinPaths(Call const& call) {
    PathBuilder builder;
    for (Value const& input : call.inputs) {
        if (Path const* path = input.ifPath()) builder.append(*path);
    }
    call.out(1, std::move(builder).build());
}

void layer(Call const& call) {
    StrokeSettings stroke;
    stroke.width = call.in(3);
    stroke.opacity = call.in(4);
    stroke.end = 1.0;
    Path const* const path = call.in(1).ifPath();
    Unstructured::Map map;
    map["elements"] = static_cast<long long>(path ? path->elements.size() : 0);
    map["color"] = call.in(2).asUnstructured();
    map["stroke"] = stroke.isVisible() ? 1 : 0;
    map["image"] = static_cast<unsigned long long>(call.in(5));
    call.out(1, Unstructured(std::move(map)));
}

void text(Call const& call) {
    std::string joined;
    for (Value const& input : call.inputs) joined += to_string(input);
    call.out(1, joined);
}

// Indexed by the number of the kind.
Kind const kKinds[] = {
    {kUnknownKind, nullptr, "hands its inputs' defaults on, position by position"},
    {kGroupKind, nullptr, "any ports; its children compute"},
    {kGroupInputKind, nullptr, "out: those of the group's inputs with the same tags"},
    {kGroupOutputKind, nullptr, "in: what the group's outputs of these tags give"},
    {4, time, "out: 1 seconds, 2 frame, 3 milliseconds"},
    {5, constant, "in: 1, 2, ...; out: 1, 2, ..."},
    {6, easeBetween, "in: 1 from, 2 to, 3 progress, 4 curve; out: 1"},
    {7, oscillator, "in: 1 amplitude, 2 hertz, 3 turns, 4 seconds; out: 1"},
    {8, add, "in: any; out: 1"},
    {9, multiply, "in: any; out: 1"},
    {10, compose, "in: 1 x, 2 y, 3 z, 4 w; out: 1"},
    {11, split, "in: 1; out: 1 x, 2 y, 3 z, 4 w"},
    {12, loopOfIndices, "in: 1 count; out: 1 index, 2 index / count"},
    {13, pulse, "in: 1 period in seconds; out: 1"},
    {14, choose, "in: 1 condition, 2 if true, 3 if false; out: 1"},
    {15, circle, "in: 1 center, 2 radius; out: 1"},
    {16, ellipse, "in: 1 center, 2 radii; out: 1"},
    {17, roundRect, "in: 1 origin, 2 size, 3 radius; out: 1"},
    {18, hexaRect, "in: 1 origin, 2 size, 3 cut; out: 1"},
    {19, arc, "in: 1 from, 2 to, 3 vertical first; out: 1"},
    {20, joinPaths, "in: any; out: 1"},
    {21, layer, "in: 1 path, 2 color, 3 stroke width, 4 opacity, 5 image; out: 1"},
    {22, text, "in: any; out: 1"},
};

}  // namespace

Kind const* kindByNumber(unsigned long long number) {
    return number < std::size(kKinds) ? &kKinds[number] : nullptr;
}
