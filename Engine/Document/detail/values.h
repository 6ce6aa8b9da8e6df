// Engine/Document/detail/values.h: the values of ports from their form in documents.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_VALUES_H
#define TARN_ENGINE_DOCUMENT_DETAIL_VALUES_H

#include <Engine/Base/value.h>
#include <Engine/Document/detail/json_reader.h>

#include <string>

namespace tarn::engine::detail {

/// A value that was read and waits for its type.
struct Pending {
    Scalar content = {};
    bool isGiven = false;
    /// Its own type, where it is not the usual one, and whether its payload is none.
    Optional<Type> type = {};
    bool isNullPayload = false;
};

/// Why something is not such a value, and the JSON pointer from it to the part that is to blame.
struct ValueFault {
    std::string problem;
    std::string step;
};

/// The value of this type that the content stands for. False where it stands for none.
bool toValue(Scalar const& content, Type type, Value& value, ValueFault& fault);

/// A value of this type with a null payload, as one that was moved from has; of types without a
/// payload the default value.
Value nullValue(Type type);

}  // namespace tarn::engine::detail

#endif
