// Engine/Base/export.h: the marks of functions: what the library shows to its callers, and how it
// is compiled.
//
//     TARN_API std::string typeToString(Type type);

#ifndef TARN_ENGINE_BASE_EXPORT_H
#define TARN_ENGINE_BASE_EXPORT_H

/// `TARN_API` is put before every public function and every public member function that is compiled
/// into the library. Everything without it stays inside.
///
/// `TARN_API_INLINE` is the same for public functions that headers define, so that callers compile
/// them in place: the shared library has each of them too, for those who find functions by name.
///
/// `TARN_ENGINE_BASE_BUILDING` is defined by the library's own build and by nobody else,
/// `TARN_ENGINE_BASE_STATIC` by that of a static library and by everyone who links it. The CMake
/// target and the pkg-config file do that.
#if defined(TARN_ENGINE_BASE_STATIC)
#define TARN_API
#define TARN_API_INLINE
#elif defined(_WIN32) && defined(TARN_ENGINE_BASE_BUILDING)
#define TARN_API __declspec(dllexport)
#define TARN_API_INLINE __declspec(dllexport)
#elif defined(_WIN32)
#define TARN_API __declspec(dllimport)
#define TARN_API_INLINE
#elif defined(__GNUC__) && defined(TARN_ENGINE_BASE_BUILDING)
#define TARN_API __attribute__((visibility("default")))
#define TARN_API_INLINE __attribute__((visibility("default"), used))
#elif defined(__GNUC__)
#define TARN_API __attribute__((visibility("default")))
#define TARN_API_INLINE TARN_API
#else
#define TARN_API
#define TARN_API_INLINE
#endif

/// `TARN_FLATTEN` has everything that a function calls compiled into it. What reads a union in
/// several steps is a switch over its alternatives in each of them, until the compiler sees all of
/// the steps at once. `TARN_LIKELY` is a condition that mostly holds. Both are nothing to compilers
/// that have no such mark, and the first where code has to be small.
#if defined(__GNUC__) && !defined(__OPTIMIZE_SIZE__)
#define TARN_FLATTEN __attribute__((flatten))
#else
#define TARN_FLATTEN
#endif
#if defined(__GNUC__)
#define TARN_LIKELY(condition) __builtin_expect(!!(condition), 1)
#else
#define TARN_LIKELY(condition) (condition)
#endif

#endif
