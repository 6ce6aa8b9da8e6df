// Engine/Base/export.h: the mark of what the shared library shows to its callers.
//
//     TARN_ENGINE_BASE_EXPORT std::string typeToString(Type type);

#ifndef TARN_ENGINE_BASE_EXPORT_H
#define TARN_ENGINE_BASE_EXPORT_H

/// Put before every public function and every public member function that is compiled into the
/// library. Everything without it stays inside. `TARN_ENGINE_BASE_BUILDING` is defined by the
/// library's own build and by nobody else.
#if defined(_WIN32)
#if defined(TARN_ENGINE_BASE_BUILDING)
#define TARN_ENGINE_BASE_EXPORT __declspec(dllexport)
#else
#define TARN_ENGINE_BASE_EXPORT __declspec(dllimport)
#endif
#elif defined(__GNUC__)
#define TARN_ENGINE_BASE_EXPORT __attribute__((visibility("default")))
#else
#define TARN_ENGINE_BASE_EXPORT
#endif

/// The same for public functions that headers define, so that callers compile them in place: the
/// library has each of them too, for those who find functions by name.
#if defined(__GNUC__) && !defined(_WIN32) && defined(TARN_ENGINE_BASE_BUILDING)
#define TARN_ENGINE_BASE_EXPORT_INLINE __attribute__((visibility("default"), used))
#elif defined(_WIN32)
#define TARN_ENGINE_BASE_EXPORT_INLINE
#else
#define TARN_ENGINE_BASE_EXPORT_INLINE TARN_ENGINE_BASE_EXPORT
#endif

#endif
