// Engine/Base/optional.h: a value that may be absent; reading an absent one always aborts.
//
//     Optional<Type> type = stringToType("vec2");
//     if (type) { use(*type); }

#ifndef TARN_ENGINE_BASE_OPTIONAL_H
#define TARN_ENGINE_BASE_OPTIONAL_H

#include <Engine/Base/assertion.h>
#include <Engine/Base/export.h>

#include <optional>
#include <type_traits>
#include <utility>

namespace tarn::engine {

class Value;

namespace detail {

// As much of `std::optional` as `Optional` needs, with the value in an allocation of its own.
template <class T>
class HeapOptional {
public:
    HeapOptional() = default;
    template <class U, std::enable_if_t<std::is_same_v<std::decay_t<U>, T>, int> = 0>
    HeapOptional(U&& value) : pointer(new T(std::forward<U>(value))) {}
    HeapOptional(HeapOptional const& other)
        : pointer(other.pointer ? copyOf(*other.pointer) : nullptr) {}
    HeapOptional(HeapOptional&& other) noexcept : pointer(std::exchange(other.pointer, nullptr)) {}
    ~HeapOptional() {
        if (pointer) destroy(pointer);
    }

    // Assigned in place where both have a value, so that references to it stay valid.
    HeapOptional& operator=(HeapOptional const& other) {
        if (this == &other) return *this;
        if (pointer && other.pointer) {
            *pointer = *other.pointer;
        } else {
            HeapOptional(other).swap(*this);
        }
        return *this;
    }
    HeapOptional& operator=(HeapOptional&& other) noexcept {
        if (pointer && other.pointer) {
            *pointer = std::move(*other.pointer);
        } else {
            swap(other);
            other.reset();
        }
        return *this;
    }

    bool has_value() const noexcept { return pointer != nullptr; }
    T& operator*() & { return *pointer; }
    T const& operator*() const& { return *pointer; }
    T&& operator*() && { return std::move(*pointer); }

    template <class... Arguments>
    T& emplace(Arguments&&... arguments) {
        if (!pointer) return *(pointer = new T(std::forward<Arguments>(arguments)...));
        return *pointer = T(std::forward<Arguments>(arguments)...);
    }
    void reset() noexcept { HeapOptional().swap(*this); }
    void swap(HeapOptional& other) noexcept { std::swap(pointer, other.pointer); }

private:
    // Not inlined: ports are copied and destroyed in many places, and few have bounds.
    TARN_NOINLINE static T* copyOf(T const& value) { return new T(value); }
    TARN_NOINLINE static void destroy(T* value) noexcept {
        static_assert(sizeof(T) != 0, "include value.h");
        delete value;
    }

    T* pointer = nullptr;
};

template <class T>
struct OptionalStorage {
    using type = std::optional<T>;
};
// Each port has three, which are nearly always empty: 8 bytes each instead of 48.
template <>
struct OptionalStorage<Value> {
    using type = HeapOptional<Value>;
};

}  // namespace detail

/// Empty, or a `T`. Reading an empty one is an assertion failure (function `value`, condition
/// `hasValue()`) in every build type. The `T` is stored in place, without an allocation beyond its
/// own, and only what its own operations throw is thrown. But an `Optional<Value>` has the size of
/// a pointer: its value is an allocation of its own. Copying it allocates and may throw
/// `std::bad_alloc`; assigning to one that has a value keeps that value's address, swapping does
/// not; one that was moved from may be empty.
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
    Optional(U other) {
        if (other) storage.emplace(*std::move(other));
    }
    explicit operator std::optional<T>() const& {
        return hasValue() ? std::optional<T>(*storage) : std::nullopt;
    }
    explicit operator std::optional<T>() && {
        return hasValue() ? std::optional<T>(*std::move(storage)) : std::nullopt;
    }

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

    /// Constructs `T(arguments...)` in place of the value. Empty where that throws; an
    /// `Optional<Value>` then keeps its value.
    template <class... Arguments>
    T& emplace(Arguments&&... arguments) {
        return storage.emplace(std::forward<Arguments>(arguments)...);
    }
    /// Makes the optional empty.
    void reset() noexcept { storage.reset(); }
    /// Swaps the values. Throws only what moving a `T` throws.
    void swap(Optional& other) noexcept(
        std::is_nothrow_swappable_v<typename detail::OptionalStorage<T>::type>) {
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

    typename detail::OptionalStorage<T>::type storage;
};

}  // namespace tarn::engine

#endif
