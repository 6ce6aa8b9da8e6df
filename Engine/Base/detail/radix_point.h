// Engine/Base/detail/radix_point.h: the C library's decimal point.
//
//     RadixPoint const radix;
//     bool plain = radix.text[0] == '.' && radix.text[1] == '\0';

#ifndef TARN_ENGINE_BASE_DETAIL_RADIX_POINT_H
#define TARN_ENGINE_BASE_DETAIL_RADIX_POINT_H

#if __has_include(<langinfo.h>)
#include <langinfo.h>
#else
#include <cstdio>
#include <cstring>
#endif

namespace tarn::engine::detail {

/// The decimal point of the C library's current locale. `text` is valid until the locale is
/// changed, which no other thread may do meanwhile. (`localeconv` must not be called on two threads
/// at once.)
#if __has_include(<langinfo.h>)
struct RadixPoint {
    char const* const text = nl_langinfo(RADIXCHAR);
};
#else
struct RadixPoint {
    RadixPoint() {
        std::snprintf(half, sizeof half, "%.1f", 0.5);
        half[std::strlen(half) - 1] = '\0';  // Removes the 5.
    }
    char half[16];
    char const* const text = half + 1;
};
#endif

}  // namespace tarn::engine::detail

#endif
