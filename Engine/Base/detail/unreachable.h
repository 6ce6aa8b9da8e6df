// Engine/Base/detail/unreachable.h: aborts at a place that is only reached after a broken
// precondition.
//
//     TARN_ENGINE_BASE_UNREACHABLE("Engine/Base/path");

#ifndef TARN_ENGINE_BASE_DETAIL_UNREACHABLE_H
#define TARN_ENGINE_BASE_DETAIL_UNREACHABLE_H

#include <Engine/Base/assertion.h>

/// The condition is "0", since no expression was tested. The function is the enclosing one, which
/// has to be in this namespace.
#define TARN_ENGINE_BASE_UNREACHABLE(module) TARN_ENGINE_BASE_UNREACHABLE_AT(module, __LINE__)
/// The same with an explicit line number.
#define TARN_ENGINE_BASE_UNREACHABLE_AT(module, line) assertionFailed("0", __func__, module, line)

#endif
