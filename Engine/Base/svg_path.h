// Engine/Base/svg_path.h: paths as the data of SVG's `path` elements, either way.
//
//     Path line = PathBuilder().moveTo({0, 0}).lineTo({1.5, 2}).build();
//     std::string data = svgPathData(line);  // "M0 0L1.5 2"
//     Optional<Path> read = pathFromSvgPathData(data);

#ifndef TARN_ENGINE_BASE_SVG_PATH_H
#define TARN_ENGINE_BASE_SVG_PATH_H

#include <Engine/Base/export.h>
#include <Engine/Base/optional.h>
#include <Engine/Base/path.h>

#include <cstddef>
#include <string>

namespace tarn::engine {

/// The string of a `d` attribute: M, L, C, Q and Z, with absolute coordinates. Each number is the
/// shortest that reads back to the same double, in every locale. SVG has no NaN, which is written
/// as 0, and no infinity, which is written as the largest double. Elements with fewer points than
/// their instruction wants are left out, their further points are not written, and a path that
/// begins without a `moveTo` begins with "M0 0". Linear.
TARN_API std::string svgPathData(Path const& path);

/// The path of such a string, of all commands of SVG 2: M, L, H, V, C, S, Q, T, A, Z, absolute or
/// relative. It consists of `moveTo`, `lineTo`, `curveTo`, `quadCurveTo` and `close` alone: arcs
/// become up to four cubic curves each, as close as `PathBuilder::arcTo` is, and what is drawn
/// after a close begins with a `moveTo`. No data is the empty path.
///
/// Empty where the data is faulty, also where it only ends too early, does not begin with M, or has
/// a number beyond the range of a double; `*fault` is then the position of the first byte that
/// cannot be read. Otherwise it is left as it is.
TARN_API Optional<Path> pathFromSvgPathData(std::string const& data, std::size_t* fault = nullptr);

}  // namespace tarn::engine

#endif
