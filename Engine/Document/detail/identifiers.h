// Engine/Document/detail/identifiers.h: whether each identifier of a graph stands for one thing.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_IDENTIFIERS_H
#define TARN_ENGINE_DOCUMENT_DETAIL_IDENTIFIERS_H

#include <Engine/Base/optional.h>
#include <Engine/Base/patch.h>
#include <Engine/Document/document.h>

namespace tarn::engine::detail {

/// Patches have identifiers of their own that are not 0, and so have ports; connections lead from
/// an output of one child to an input of another (or of the same). Empty where all that holds, else
/// the first that is wrong, with its pointer in the document. About linear, without recursion.
Optional<DocumentError> findWrongIdentifier(Patch const& root);

}  // namespace tarn::engine::detail

#endif
