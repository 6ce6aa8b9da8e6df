// Engine/Base/version.h: the version of these headers.
//
//     static_assert(TARN_ENGINE_BASE_VERSION >= 10100, "needs Tarn Engine Base 1.1");

#ifndef TARN_ENGINE_BASE_VERSION_H
#define TARN_ENGINE_BASE_VERSION_H

/// The semantic version. The build files read it here.
#define TARN_ENGINE_BASE_VERSION_MAJOR 1
#define TARN_ENGINE_BASE_VERSION_MINOR 1
#define TARN_ENGINE_BASE_VERSION_PATCH 0

/// The version as one number to compare: 10203 is 1.2.3.
#define TARN_ENGINE_BASE_VERSION                                                                   \
    (TARN_ENGINE_BASE_VERSION_MAJOR * 10000 + TARN_ENGINE_BASE_VERSION_MINOR * 100 +               \
     TARN_ENGINE_BASE_VERSION_PATCH)

#endif
