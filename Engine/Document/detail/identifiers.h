// Engine/Document/detail/identifiers.h: validates the identifiers of a graph.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_IDENTIFIERS_H
#define TARN_ENGINE_DOCUMENT_DETAIL_IDENTIFIERS_H

#include <Engine/Base/optional.h>
#include <Engine/Base/patch.h>
#include <Engine/Document/document.h>

namespace tarn::engine::detail {

/// Patches must have distinct identifiers, and so must ports; none may be 0. Connections must lead
/// from an output of one child to an input of another (or the same). Empty where the graph is
/// valid, else the first error with its JSON pointer. Nearly linear, not recursive.
Optional<DocumentError> findWrongIdentifier(Patch const& root);

}  // namespace tarn::engine::detail

#endif
