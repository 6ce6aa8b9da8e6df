// Engine/Document/detail/kinds.h: the built-in kinds that the document format treats specially.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_KINDS_H
#define TARN_ENGINE_DOCUMENT_DETAIL_KINDS_H

namespace tarn::engine::detail {

constexpr unsigned long long kUnknownKind = 0;
constexpr unsigned long long kGroupKind = 1;
/// The patches inside a group that represent its inputs and outputs.
constexpr unsigned long long kGroupInputKind = 2;
constexpr unsigned long long kGroupOutputKind = 3;
constexpr unsigned long long kTimeKind = 4;

}  // namespace tarn::engine::detail

#endif
