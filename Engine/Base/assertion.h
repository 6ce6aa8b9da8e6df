// Engine/Base/assertion.h: reports a broken precondition and ends the program.
//
//     if (!hasValue()) assertionFailed("hasValue()", "value", "Engine/Base/optional", __LINE__);

#ifndef TARN_ENGINE_BASE_ASSERTION_H
#define TARN_ENGINE_BASE_ASSERTION_H

#include <Engine/Base/export.h>

namespace tarn::engine {

/// Writes one line to standard error and calls `abort()`, in every build type:
/// `Assertion failed: (<condition>), function <function>, file <module>, line <line>.`
/// `module` is the path of the header that declares the function, from the repository root, without
/// its extension. Allocates nothing. The arguments must not be null.
[[noreturn]] TARN_API void assertionFailed(char const* condition, char const* function,
                                           char const* module, int line) noexcept;

}  // namespace tarn::engine

#endif
