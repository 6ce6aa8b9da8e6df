// Engine/Base/optional.h: a value that may be absent; reading an absent one always aborts.
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

/// A flag and, where it is set, a `T`. Stored in place: no allocation beyond the `T`'s own. Reading
/// an empty one is an assertion failure (function `value`, condition `hasValue()`) in every build
/// type. Throws only what the `T`'s own operations throw.
template <class T>
class Optional {
public:
    /// Empty.
    Optional() = default;
    Optional(std::nullopt_t) noexcept {}

    /// Only from a `T`, not from types that convert to it: an optional bound is written
    /// `Value(0.0)`, so that its type is visible where it is chosen.
    template <class U, std::enable_if_t<std::is_same_v<std::decay_t<U>, T>, int> = 0>
    Optional(U&& value) : storage(std::forward<U>(value)) {}

    /// From `std::optional<T>`, and explicitly back to it. (Not for `bool`: `std::optional<bool>`
    /// would take `hasValue()` for the value. Write `o ? std::optional<bool>(*o) : std::nullopt`.)
    template <class U, std::enable_if_t<std::is_same_v<U, std::optional<T>>, int> = 0>
    Optional(U other) : storage(std::move(other)) {}
    explicit operator std::optional<T>() const& { return storage; }
    explicit operator std::optional<T>() && { return std::move(storage); }

    /// Whether there is a value.
    bool hasValue() const noexcept { return storage.has_value(); }
    bool has_value() const noexcept { return hasValue(); }
    explicit operator bool() const noexcept { return hasValue(); }

    /// The value. An assertion failure where there is none.
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

    /// Same as `value()`.
    T& operator*() & { return value(); }
    T const& operator*() const& { return value(); }
    T&& operator*() && { return std::move(*this).value(); }

    /// A member of the value.
    T* operator->() { return &value(); }
    T const* operator->() const { return &value(); }

    /// The value, or `other` where there is none.
    T value_or(T other) const& { return hasValue() ? *storage : std::move(other); }
    T value_or(T other) && { return hasValue() ? *std::move(storage) : std::move(other); }

    /// Constructs `T(arguments...)` in place. Empty where the constructor throws.
    template <class... Arguments>
    T& emplace(Arguments&&... arguments) {
        return storage.emplace(std::forward<Arguments>(arguments)...);
    }
    /// Makes the optional empty.
    void reset() noexcept { storage.reset(); }
    /// Swaps the values. Throws only what moving a `T` throws.
    void swap(Optional& other) noexcept(std::is_nothrow_swappable_v<std::optional<T>>) {
        storage.swap(other.storage);
    }
    friend void swap(Optional& a, Optional& b) noexcept(noexcept(a.swap(b))) { a.swap(b); }

    /// Equal when both are empty, or when both have equal values.
    friend bool operator==(Optional const& a, Optional const& b) {
        return a.hasValue() == b.hasValue() && (!a.hasValue() || *a.storage == *b.storage);
    }
    friend bool operator!=(Optional const& a, Optional const& b) { return !(a == b); }
    /// Compares with a `T`, not with types that convert to it: equal when there is a value, and it
    /// is equal.
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
