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
/// every build; nothing here throws but what a `T` throws when it is made, copied, moved or
/// compared.
template <class T>
class Optional {
public:
    /// Empty.
    Optional() = default;
    Optional(std::nullopt_t) noexcept {}

    /// Made from a `T` and from nothing that merely converts to one: an optional bound is
    /// written `Value(0.0)`, so that the alternative it holds is seen where it is chosen.
    template <class U, std::enable_if_t<std::is_same_v<std::decay_t<U>, T>, int> = 0>
    Optional(U&& value) : storage(std::forward<U>(value)) {}

    /// From the standard's optional of the same `T`, and back on request. (Not for a `bool`: there
    /// the standard's optional takes the answer of `hasValue()` for the value. Write `o ?
    /// std::optional<bool>(*o) : std::nullopt`.)
    template <class U, std::enable_if_t<std::is_same_v<U, std::optional<T>>, int> = 0>
    Optional(U other) : storage(std::move(other)) {}
    explicit operator std::optional<T>() const& { return storage; }
    explicit operator std::optional<T>() && { return std::move(storage); }

    /// Whether there is a value.
    bool hasValue() const noexcept { return storage.has_value(); }
    bool has_value() const noexcept { return hasValue(); }
    explicit operator bool() const noexcept { return hasValue(); }

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

    /// The value, or `other` where there is none.
    T value_or(T other) const& { return hasValue() ? *storage : std::move(other); }
    T value_or(T other) && { return hasValue() ? *std::move(storage) : std::move(other); }

    /// Afterwards the value is `T(arguments...)`, made in place. Empty where making it throws.
    template <class... Arguments>
    T& emplace(Arguments&&... arguments) {
        return storage.emplace(std::forward<Arguments>(arguments)...);
    }
    /// Afterwards the optional is empty.
    void reset() noexcept { storage.reset(); }
    /// Afterwards each has what the other had. Throws where moving a `T` does.
    void swap(Optional& other) noexcept(std::is_nothrow_swappable_v<std::optional<T>>) {
        storage.swap(other.storage);
    }
    friend void swap(Optional& a, Optional& b) noexcept(noexcept(a.swap(b))) { a.swap(b); }

    /// Equal when both are empty, or when both are set to equal values.
    friend bool operator==(Optional const& a, Optional const& b) {
        return a.hasValue() == b.hasValue() && (!a.hasValue() || *a.storage == *b.storage);
    }
    friend bool operator!=(Optional const& a, Optional const& b) { return !(a == b); }
    /// With a `T`, and nothing that merely converts to one: equal when there is a value, and it is.
    template <class U, std::enable_if_t<std::is_same_v<U, T>, int> = 0>
    friend bool operator==(Optional const& a, U const& b) {
        return a.hasValue() && *a.storage == b;
    }
    template <class U, std::enable_if_t<std::is_same_v<U, T>, int> = 0>
    friend bool operator==(U const& a, Optional const& b) {
        return b == a;
    }
    template <class U, std::enable_if_t<std::is_same_v<U, T>, int> = 0>
    friend bool operator!=(Optional const& a, U const& b) {
        return !(a == b);
    }
    template <class U, std::enable_if_t<std::is_same_v<U, T>, int> = 0>
    friend bool operator!=(U const& a, Optional const& b) {
        return !(b == a);
    }

private:
    void check() const {
        if (!hasValue()) assertionFailed("hasValue()", "value", "Engine/Base/optional", __LINE__);
    }

    std::optional<T> storage;
};

}  // namespace tarn::engine

#endif
