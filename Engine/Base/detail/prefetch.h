// Engine/Base/detail/prefetch.h: a word to the processor about what comes next.
//
//     prefetch(&list[i + 6]);

#ifndef TARN_ENGINE_BASE_DETAIL_PREFETCH_H
#define TARN_ENGINE_BASE_DETAIL_PREFETCH_H

namespace tarn::engine::detail {

/// Has the memory at `address` fetched in the background, where the compiler can say so. Any
/// address will do.
inline void prefetch([[maybe_unused]] void const* address) {
#if defined(__GNUC__)
    __builtin_prefetch(address);
#endif
}

}  // namespace tarn::engine::detail

#endif
