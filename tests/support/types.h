// tests/support/types.h: all types of values, and an undefined one.

#ifndef TARN_TESTS_SUPPORT_TYPES_H
#define TARN_TESTS_SUPPORT_TYPES_H

#include <Engine/Base/value.h>

#include <array>

namespace tests {

constexpr std::array<tarn::engine::Type, 14> kAllTypes = [] {
    std::array<tarn::engine::Type, 14> types{};
    for (unsigned char i = 0; i < 14; ++i) types[i] = tarn::engine::Type(i);
    return types;
}();

constexpr tarn::engine::Type kNoType = tarn::engine::Type(14);

}  // namespace tests

#endif
