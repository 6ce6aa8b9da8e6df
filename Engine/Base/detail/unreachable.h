// Engine/Base/detail/unreachable.h: the end of a program at a place that a broken contract alone
// leads to.
//
//     TARN_ENGINE_BASE_UNREACHABLE("Engine/Base/path");

#ifndef TARN_ENGINE_BASE_DETAIL_UNREACHABLE_H
#define TARN_ENGINE_BASE_DETAIL_UNREACHABLE_H

#include <Engine/Base/assertion.h>

/// The condition reads "0": it is the place itself that must not be reached, and not an expression
/// that turned out to be false. The function is the one that this stands in, in this namespace.
#define TARN_ENGINE_BASE_UNREACHABLE(module) TARN_ENGINE_BASE_UNREACHABLE_AT(module, __LINE__)
/// The same with a line of its own.
#define TARN_ENGINE_BASE_UNREACHABLE_AT(module, line) assertionFailed("0", __func__, module, line)

#endif
