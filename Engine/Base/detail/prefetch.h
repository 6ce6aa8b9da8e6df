// Engine/Base/detail/prefetch.h: a hint to load memory into the cache.
//
//     prefetch(&list[i + 6]);

#ifndef TARN_ENGINE_BASE_DETAIL_PREFETCH_H
#define TARN_ENGINE_BASE_DETAIL_PREFETCH_H

namespace tarn::engine::detail {

/// Loads the memory at `address` into the cache in the background, on compilers that support it.
/// The address need not be valid.
inline void prefetch([[maybe_unused]] void const* address) {
#if defined(__GNUC__)
    __builtin_prefetch(address);
#endif
}

}  // namespace tarn::engine::detail

#endif
