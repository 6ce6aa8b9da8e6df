// Engine/Base/detail/immortal.h: a static object that is never destroyed.
//
//     static Immortal<std::string> const text(std::string("-0"));
//     return text.value;

#ifndef TARN_ENGINE_BASE_DETAIL_IMMORTAL_H
#define TARN_ENGINE_BASE_DETAIL_IMMORTAL_H

#include <utility>

namespace tarn::engine::detail {

/// Holds a value without ever destroying it, so that destructors of other statics can still use it.
/// What it allocated stays reachable, so leak checkers do not report it.
template <class T>
union Immortal {
    Immortal() : value() {}
    explicit Immortal(T initial) : value(std::move(initial)) {}
    // The implicit destructor would be deleted.
    ~Immortal() {}  // NOLINT(modernize-use-equals-default)

    T value;
};

}  // namespace tarn::engine::detail

#endif
