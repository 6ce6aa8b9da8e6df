// Engine/Document/export.h: the macro that exports functions.
//
//     TARN_DOCUMENT_API std::string writeDocument(Patch const& root);

#ifndef TARN_ENGINE_DOCUMENT_EXPORT_H
#define TARN_ENGINE_DOCUMENT_EXPORT_H

/// `TARN_DOCUMENT_API` exports a public function, `TARN_ENGINE_DOCUMENT_BUILDING` and
/// `TARN_ENGINE_DOCUMENT_STATIC` tell how the library is built: the same as `TARN_API`,
/// `TARN_ENGINE_BASE_BUILDING` and `TARN_ENGINE_BASE_STATIC` of the base library.
#if defined(TARN_ENGINE_DOCUMENT_STATIC)
#define TARN_DOCUMENT_API
#elif defined(_WIN32) && defined(TARN_ENGINE_DOCUMENT_BUILDING)
#define TARN_DOCUMENT_API __declspec(dllexport)
#elif defined(_WIN32)
#define TARN_DOCUMENT_API __declspec(dllimport)
#elif defined(__GNUC__)
#define TARN_DOCUMENT_API __attribute__((visibility("default")))
#else
#define TARN_DOCUMENT_API
#endif

#endif
