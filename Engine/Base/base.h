// Engine/Base/base.h: includes every header of the base library except json.h.
//
//     #include <Engine/Base/base.h>
//     using namespace tarn::engine;

#ifndef TARN_ENGINE_BASE_BASE_H
#define TARN_ENGINE_BASE_BASE_H

#include <Engine/Base/assertion.h>
#include <Engine/Base/comparison.h>
#include <Engine/Base/conversion_traits.h>
#include <Engine/Base/easing.h>
#include <Engine/Base/export.h>
#include <Engine/Base/fwd.h>
#include <Engine/Base/layers.h>
#include <Engine/Base/media.h>
#include <Engine/Base/optional.h>
#include <Engine/Base/patch.h>
#include <Engine/Base/patch_changes.h>
#include <Engine/Base/patch_edit.h>
#include <Engine/Base/patch_index.h>
#include <Engine/Base/path.h>
#include <Engine/Base/path_geometry.h>
#include <Engine/Base/points.h>
#include <Engine/Base/svg_path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>
#include <Engine/Base/vector_math.h>
#include <Engine/Base/version.h>

#endif
