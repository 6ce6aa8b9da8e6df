// Engine/Base/export.h: macros that export functions and control how they are compiled.
//
//     TARN_API std::string typeToString(Type type);

#ifndef TARN_ENGINE_BASE_EXPORT_H
#define TARN_ENGINE_BASE_EXPORT_H

/// `TARN_API` exports a public function or member function that is compiled into the library.
/// Everything without it has hidden visibility.
///
/// `TARN_API_INLINE` is for public functions that headers define: callers inline them, and the
/// shared library exports each of them too, for debuggers and foreign-function interfaces.
///
/// `TARN_ENGINE_BASE_BUILDING` is defined only while the library itself is built.
/// `TARN_ENGINE_BASE_STATIC` is defined while a static library is built and by everyone who links
/// it. The CMake target and the pkg-config file define them.
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

/// `TARN_FLATTEN` inlines everything that a function calls: a `boost::variant` that is read in
/// several steps is a switch in each step until the compiler sees all of them at once.
/// `TARN_LIKELY` marks a condition that is usually true, `TARN_NOINLINE` a function for rare cases.
/// All expand to nothing for compilers without such attributes; `TARN_FLATTEN` also where code is
/// optimised for size.
#if defined(__GNUC__) && !defined(__OPTIMIZE_SIZE__)
#define TARN_FLATTEN __attribute__((flatten))
#else
#define TARN_FLATTEN
#endif
#if defined(__GNUC__)
#define TARN_LIKELY(condition) __builtin_expect(!!(condition), 1)
#define TARN_NOINLINE __attribute__((noinline))
#else
#define TARN_NOINLINE
#define TARN_LIKELY(condition) (condition)
#endif

#endif
