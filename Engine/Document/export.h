// Engine/Document/export.h: the mark of what the library shows to its callers.
//
//     TARN_DOCUMENT_API std::string writeDocument(Patch const& root);

#ifndef TARN_ENGINE_DOCUMENT_EXPORT_H
#define TARN_ENGINE_DOCUMENT_EXPORT_H

/// `TARN_DOCUMENT_API` is put before every public function. It is to this library what
/// `TARN_API` is to the base library; so are `TARN_ENGINE_DOCUMENT_BUILDING` and
/// `TARN_ENGINE_DOCUMENT_STATIC`.
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
