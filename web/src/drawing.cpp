// Paths and easing.

#include "native.h"
#include "wire.h"

#include <Engine/Base/base.h>

#include <cstddef>
#include <cstdlib>
#include <string>
#include <vector>

using namespace tarn::engine;
using emscripten::val;

namespace web {

namespace {

using Bytes = std::string;

// The calls of a PathBuilder in JavaScript; engine_base.js has the same numbers.
enum class Command : unsigned char {
    MoveTo,
    LineTo,
    CurveTo,
    QuadCurveTo,
    Close,
    Append,
    ArcTo,
    Ellipse,
    Circle,
    RoundRect,
    HexaRect,
};

FloatVec2 point(Reader& in) {
    double const x = in.number();
    return {x, in.number()};
}

void draw(PathBuilder& builder, Command command, Reader& in) {
    switch (command) {
        case Command::MoveTo: builder.moveTo(point(in)); return;
        case Command::LineTo: builder.lineTo(point(in)); return;
        case Command::CurveTo: {
            FloatVec2 const c1 = point(in);
            FloatVec2 const c2 = point(in);
            builder.curveTo(c1, c2, point(in));
            return;
        }
        case Command::QuadCurveTo: {
            FloatVec2 const c = point(in);
            builder.quadCurveTo(c, point(in));
            return;
        }
        case Command::Close: builder.close(); return;
        case Command::Append: builder.append(in.path()); return;
        case Command::ArcTo: {
            FloatVec2 const end = point(in);
            builder.arcTo(end, in.byte() != 0);
            return;
        }
        case Command::Ellipse: {
            FloatVec2 const center = point(in);
            builder.ellipse(center, point(in));
            return;
        }
        case Command::Circle: {
            FloatVec2 const center = point(in);
            builder.circle(center, in.number());
            return;
        }
        case Command::RoundRect:
        case Command::HexaRect: {
            FloatVec2 const origin = point(in);
            FloatVec2 const size = point(in);
            double const corner = in.number();
            if (command == Command::RoundRect) {
                builder.roundRect(origin, size, corner);
            } else {
                builder.hexaRect(origin, size, corner);
            }
            return;
        }
    }
    std::abort();
}

PathBuilder drawn(Bytes const& commands) {
    Reader in(commands);
    PathBuilder builder;
    for (std::size_t n = in.count(); n > 0; --n) {
        auto const command = Command(in.byte());
        draw(builder, command, in);
    }
    return builder;
}

val points(FloatVec2 const* first, std::size_t count) {
    return val(emscripten::typed_memory_view(2 * count, &first->x)).call<val>("slice");
}

val buildPath(Bytes const& commands) {
    return bytesOf(Writer().path(drawn(commands).build()).bytes);
}
val currentPoint(Bytes const& commands) {
    FloatVec2 const point = drawn(commands).currentPoint;
    return points(&point, 1);
}

Path pathOf(Bytes const& bytes) { return Reader(bytes).path(); }
val optionalPath(Optional<Path> const& path) {
    return path ? bytesOf(Writer().path(*path).bytes) : val::null();
}

bool pathEquals(Bytes const& a, Bytes const& b) { return pathOf(a) == pathOf(b); }
std::string svgData(Bytes const& path) { return svgPathData(pathOf(path)); }
// Returns the path, or the position of the error in the string.
val pathFromSvg(std::string const& data) {
    std::size_t fault = 0;
    Optional<Path> const path = pathFromSvgPathData(data, &fault);
    return path ? optionalPath(path) : val(static_cast<double>(fault));
}
val pathBounds(Bytes const& path) {
    Optional<Bounds> const found = bounds(pathOf(path));
    if (!found) return val::null();
    FloatVec2 const corners[] = {found->min, found->max};
    return points(corners, 2);
}
val pathTranslated(Bytes const& path, double x, double y) {
    return bytesOf(Writer().path(translated(pathOf(path), {x, y})).bytes);
}
val pathScaled(Bytes const& path, double x, double y) {
    return bytesOf(Writer().path(scaled(pathOf(path), {x, y})).bytes);
}
val pathInterpolated(Bytes const& a, Bytes const& b, double t) {
    return optionalPath(interpolate(pathOf(a), pathOf(b), t));
}
std::string instructionName(unsigned char instruction) {
    return pathInstructionToString(PathInstruction(instruction));
}
int instructionOfName(std::string const& name) {
    Optional<PathInstruction> const instruction = parsePathInstruction(name);
    return instruction ? int(*instruction) : -1;
}

double easeNumber(unsigned char function, double start, double end, double t) {
    return ease(EasingFunction(function), start, end, t);
}
val easeValue(unsigned char function, Bytes const& start, Bytes const& end, double t) {
    Value const eased =
        ease(EasingFunction(function), Reader(start).value(), Reader(end).value(), t);
    return bytesOf(Writer().value(eased).bytes);
}
// The components of all results. `easeEach` has separate code for each curve and type, which would
// make the module too large.
template <class T>
val easedEach(EasingFunction function, T start, T end, std::vector<double> const& progress) {
    std::vector<T> eased;
    eased.reserve(progress.size());
    for (double const t : progress) eased.push_back(ease(function, start, end, t));
    auto const* const numbers = reinterpret_cast<double const*>(eased.data());
    return val(emscripten::typed_memory_view(eased.size() * (sizeof(T) / sizeof(double)), numbers))
        .call<val>("slice");
}
val easeMany(unsigned char function, Bytes const& start, Bytes const& end, val const& progress) {
    Value const from = Reader(start).value();
    Value const to = Reader(end).value();
    std::vector<double> t(progress["length"].as<std::size_t>());
    val(emscripten::typed_memory_view(t.size(), t.data())).call<void>("set", progress);
    auto const curve = EasingFunction(function);
    switch (from.type()) {
        case Type::Vec2: return easedEach(curve, FloatVec2(from), FloatVec2(to), t);
        case Type::Vec3: return easedEach(curve, FloatVec3(from), FloatVec3(to), t);
        case Type::Vec4: return easedEach(curve, FloatVec4(from), FloatVec4(to), t);
        default: return easedEach(curve, double(from), double(to), t);
    }
}
val easingNames() {
    val names = val::array();
    for (std::string const& name : easingFunctionNames()) names.call<void>("push", name);
    return names;
}
int easingOfName(std::string const& name) {
    Optional<EasingFunction> const function = stringToEasingFunction(name);
    return function ? int(*function) : -1;
}

}  // namespace

EMSCRIPTEN_BINDINGS(drawing) {
    native<&buildPath>("buildPath");
    native<&currentPoint>("currentPoint");
    native<&pathEquals>("pathEquals");
    native<&svgData>("svgPathData");
    native<&pathFromSvg>("pathFromSvgPathData");
    native<&pathBounds>("bounds");
    native<&pathTranslated>("translated");
    native<&pathScaled>("scaled");
    native<&pathInterpolated>("interpolate");
    native<&instructionName>("pathInstructionToString");
    native<&instructionOfName>("stringToPathInstruction");
    native<&easeNumber>("easeNumber");
    native<&easeValue>("easeValue");
    native<&easeMany>("easeMany");
    native<&easingNames>("easingFunctionNames");
    native<&easingOfName>("stringToEasingFunction");
}

}  // namespace web
