// Engine/Base/optional.h: a value that may be absent, and whose absence is never read by mistake.
//
//     Optional<Type> type = stringToType("vec2");
//     if (type) { use(*type); }

#ifndef TARN_ENGINE_BASE_OPTIONAL_H
#define TARN_ENGINE_BASE_OPTIONAL_H

#include <Engine/Base/assertion.h>

#include <optional>
#include <type_traits>
#include <utility>

namespace tarn::engine {

/// A flag and, when it is set, a `T`. Stored in place: no allocation beyond the `T`'s own.
/// Reading an empty one is an assertion failure (function `value`, condition `hasValue()`) in
/// every build; nothing here throws but the copying of a `T`.
template <class T>
class Optional {
public:
    /// Empty.
    Optional() = default;
    Optional(std::nullopt_t) {}

    /// Made from a `T` and from nothing that merely converts to one: an optional bound is
    /// written `Value(0.0)`, so that the alternative it holds is seen where it is chosen.
    template <class U, std::enable_if_t<std::is_same_v<std::decay_t<U>, T>, int> = 0>
    Optional(U&& value) : storage(std::forward<U>(value)) {}

    /// Whether there is a value.
    bool hasValue() const { return storage.has_value(); }
    bool has_value() const { return hasValue(); }
    explicit operator bool() const { return hasValue(); }

    /// The value. Of an empty one it is an assertion failure.
    T& value() & {
        check();
        return *storage;
    }
    T const& value() const& {
        check();
        return *storage;
    }
    T&& value() && {
        check();
        return *std::move(storage);
    }

    /// As `value()`.
    T& operator*() & { return value(); }
    T const& operator*() const& { return value(); }
    T&& operator*() && { return std::move(*this).value(); }

    /// A member of the value.
    T* operator->() { return &value(); }
    T const* operator->() const { return &value(); }

    /// Afterwards the optional is empty.
    void reset() { storage.reset(); }

    /// Equal when both are empty, or when both are set to equal values.
    friend bool operator==(Optional const& a, Optional const& b) {
        return a.hasValue() == b.hasValue() && (!a.hasValue() || *a.storage == *b.storage);
    }
    friend bool operator!=(Optional const& a, Optional const& b) { return !(a == b); }

private:
    void check() const {
        if (!hasValue()) assertionFailed("hasValue()", "value", "Engine/Base/optional", __LINE__);
    }

    std::optional<T> storage;
};

}  // namespace tarn::engine

#endif
