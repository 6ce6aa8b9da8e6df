// Engine/Base/assertion.h: the end of a program that broke a contract.
//
//     if (!hasValue()) assertionFailed("hasValue()", "value", "Engine/Base/optional", __LINE__);

#ifndef TARN_ENGINE_BASE_ASSERTION_H
#define TARN_ENGINE_BASE_ASSERTION_H

#include <Engine/Base/export.h>

namespace tarn::engine {

/// Writes one line to standard error and calls `abort()`, in every build type:
/// `Assertion failed: (<condition>), function <function>, file <module>, line <line>.`
/// `module` is the header that says so, from the repository root, without its extension.
/// Allocates nothing. The arguments are never null.
[[noreturn]] TARN_API void assertionFailed(char const* condition, char const* function,
                                           char const* module, int line) noexcept;

}  // namespace tarn::engine

#endif
