// Engine/Base/svg_path.h: converts paths to and from SVG path data.
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

/// The value of a `d` attribute: M, L, C, Q and Z with absolute coordinates. Each number is the
/// shortest that converts back to the same double, in every locale. SVG has no NaN, which is
/// written as 0, and no infinity, which is written as the largest double. Elements with fewer
/// points than their instruction needs are skipped, and additional points are ignored. A path that
/// begins without a `moveTo` gets "M0 0" in front. Linear.
TARN_API std::string svgPathData(Path const& path);

/// Parses such a string with all commands of SVG 2: M, L, H, V, C, S, Q, T, A, Z, absolute or
/// relative. The path consists of `moveTo`, `lineTo`, `curveTo`, `quadCurveTo` and `close` alone:
/// an arc becomes up to four cubic curves, as accurate as those of `PathBuilder::arcTo`, and a
/// `moveTo` is added after a close where drawing goes on. A string without commands is the empty
/// path.
///
/// Empty where the data is invalid: also where it is incomplete, does not begin with M, or has a
/// number beyond the range of a double. `*fault` is then the position of the first byte that cannot
/// be parsed; otherwise it is not changed.
TARN_API Optional<Path> pathFromSvgPathData(std::string const& data, std::size_t* fault = nullptr);

}  // namespace tarn::engine

#endif
