// Engine/Document/detail/values.h: parses the values of ports.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_VALUES_H
#define TARN_ENGINE_DOCUMENT_DETAIL_VALUES_H

#include <Engine/Base/value.h>
#include <Engine/Document/detail/json_reader.h>

#include <string>

namespace tarn::engine::detail {

/// A parsed value whose type is not known yet.
struct Pending {
    Scalar content = {};
    bool isGiven = false;
    /// The explicit type, where it is not the usual one, and whether the payload is null.
    Optional<Type> type = {};
    bool isNullPayload = false;
};

/// Why a value is invalid, and the JSON pointer to the part that is wrong.
struct ValueFault {
    std::string problem;
    std::string step;
};

/// Converts the content to a value of this type. False where that is impossible.
bool toValue(Scalar const& content, Type type, Value& value, ValueFault& fault);

/// A value of this type with a null payload, as a moved-from one has; for types without a payload
/// the default value.
Value nullValue(Type type);

}  // namespace tarn::engine::detail

#endif
