// Engine/Document/export.h: the mark of what the library shows to its callers.
//
//     TARN_ENGINE_DOCUMENT_EXPORT std::string writeDocument(Patch const& root);

#ifndef TARN_ENGINE_DOCUMENT_EXPORT_H
#define TARN_ENGINE_DOCUMENT_EXPORT_H

/// `TARN_ENGINE_DOCUMENT_EXPORT` is put before every public function. It is to this library what
/// `TARN_ENGINE_BASE_EXPORT` is to the base library; so are `TARN_ENGINE_DOCUMENT_BUILDING` and
/// `TARN_ENGINE_DOCUMENT_STATIC`.
#if defined(TARN_ENGINE_DOCUMENT_STATIC)
#define TARN_ENGINE_DOCUMENT_EXPORT
#elif defined(_WIN32) && defined(TARN_ENGINE_DOCUMENT_BUILDING)
#define TARN_ENGINE_DOCUMENT_EXPORT __declspec(dllexport)
#elif defined(_WIN32)
#define TARN_ENGINE_DOCUMENT_EXPORT __declspec(dllimport)
#elif defined(__GNUC__)
#define TARN_ENGINE_DOCUMENT_EXPORT __attribute__((visibility("default")))
#else
#define TARN_ENGINE_DOCUMENT_EXPORT
#endif

#endif
