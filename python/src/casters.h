// python/src/casters.h: casters for the enumerations in function signatures.

#ifndef TARN_PYTHON_CASTERS_H
#define TARN_PYTHON_CASTERS_H

#include "enumerations.h"
#include "value_type.h"

#include <Engine/Base/easing.h>
#include <Engine/Base/patch_changes.h>
#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>
#include <Engine/Document/document.h>

TARN_PYTHON_ENUMERATION(tarn::engine::Type);
TARN_PYTHON_ENUMERATION(tarn::engine::EasingFunction);
TARN_PYTHON_ENUMERATION(tarn::engine::PathInstruction);
TARN_PYTHON_ENUMERATION(tarn::engine::Unstructured::Type);
TARN_PYTHON_ENUMERATION(tarn::engine::PatchChange::Kind);
TARN_PYTHON_ENUMERATION(tarn::engine::DocumentInfo::Form);

#endif
