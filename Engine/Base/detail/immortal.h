// Engine/Base/detail/immortal.h: a static that nobody outlives.
//
//     static Immortal<std::string> const text(std::string("-0"));
//     return text.value;

#ifndef TARN_ENGINE_BASE_DETAIL_IMMORTAL_H
#define TARN_ENGINE_BASE_DETAIL_IMMORTAL_H

#include <utility>

namespace tarn::engine::detail {

/// Holds a value that is made and never destroyed: the destructor of another static may still read
/// it while the program ends. What it has allocated is within reach of leak checkers.
template <class T>
union Immortal {
    Immortal() : value() {}
    explicit Immortal(T initial) : value(std::move(initial)) {}
    // By default there would be none.
    ~Immortal() {}  // NOLINT(modernize-use-equals-default)

    T value;
};

}  // namespace tarn::engine::detail

#endif
