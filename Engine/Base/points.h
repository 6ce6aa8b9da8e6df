// Engine/Base/points.h: a list of points that allocates nothing for up to three of them.
//
//     Points points{{1, 2}, {3, 4}};
//     points.push_back({5, 6});

#ifndef TARN_ENGINE_BASE_POINTS_H
#define TARN_ENGINE_BASE_POINTS_H

#include <Engine/Base/assertion.h>
#include <Engine/Base/export.h>
#include <Engine/Base/value.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <iterator>
#include <limits>
#include <type_traits>
#include <utility>
#include <vector>

namespace tarn::engine {

namespace detail {

// Throw `std::out_of_range` and `std::length_error`, out of line: callers may be compiled without
// exceptions.
[[noreturn]] TARN_API void throwOutOfRange(char const* what);
[[noreturn]] TARN_API void throwLengthError(char const* what);

}  // namespace detail

/// A growable list with the interface of `std::vector<FloatVec2>` except for allocators. Up to
/// three points are stored in place, without an allocation. Differences to a vector:
///
/// - moving and swapping invalidate iterators, pointers and references;
/// - a range that is inserted or assigned is copied first, so it may be part of the list; an
///   insertion that fails leaves the list unchanged, wherever it was to go;
/// - conversions from and to a vector copy. A `std::vector<FloatVec2> const&` bound to a `Points`
///   refers to a copy, and `std::vector v{points}` is a vector with one `Points`.
class Points {
public:
    /// As for a vector.
    using value_type = FloatVec2;
    using size_type = std::size_t;
    using difference_type = std::ptrdiff_t;
    using reference = FloatVec2&;
    using const_reference = FloatVec2 const&;
    using pointer = FloatVec2*;
    using const_pointer = FloatVec2 const*;
    using iterator = FloatVec2*;
    using const_iterator = FloatVec2 const*;
    using reverse_iterator = std::reverse_iterator<iterator>;
    using const_reverse_iterator = std::reverse_iterator<const_iterator>;

    /// As for a vector; the constructor from a vector copies it.
    Points() = default;
    explicit Points(size_type count) { resize(count); }
    Points(size_type count, FloatVec2 point) { resize(count, point); }
    Points(std::initializer_list<FloatVec2> points) { append(points.begin(), points.size()); }
    Points(std::vector<FloatVec2> const& points) { append(points.data(), points.size()); }
    template <class Iterator, class = typename std::iterator_traits<Iterator>::iterator_category>
    Points(Iterator first, Iterator last)
        : Points() {  // Fully constructed by now: a failure releases it.
        using Category = typename std::iterator_traits<Iterator>::iterator_category;
        if constexpr (std::is_base_of_v<std::forward_iterator_tag, Category>) {
            reserve(static_cast<size_type>(std::distance(first, last)));
        }
        for (; first != last; ++first) push_back(*first);
    }
    Points(Points const& other) {
        if (other.isMany()) {
            append(other.held.many, other.length);
        } else {
            held = other.held;
            length = other.length;
        }
    }
    Points(Points&& other) noexcept { take(other); }
    ~Points() { release(); }

    /// Reuses the memory where it suffices. A failing allocation leaves this unchanged.
    Points& operator=(Points const& other) {
        if (other.length > room) return *this = Points(other);
        if (this != &other) overwrite(other.begin(), other.length);
        return *this;
    }
    Points& operator=(Points&& other) noexcept {
        if (this == &other) return *this;
        release();
        take(other);
        return *this;
    }
    Points& operator=(std::initializer_list<FloatVec2> points) {
        if (points.size() > room) return *this = Points(points);
        overwrite(points.begin(), points.size());
        return *this;
    }

    /// Copies.
    operator std::vector<FloatVec2>() const { return {begin(), end()}; }

    /// As for a vector. Constant time. More than `max_size` points throw `std::length_error`.
    FloatVec2* data() noexcept { return isMany() ? held.many : held.few; }
    FloatVec2 const* data() const noexcept { return isMany() ? held.many : held.few; }
    size_type size() const noexcept { return length; }
    size_type capacity() const noexcept { return room; }
    size_type max_size() const noexcept {
        constexpr auto kAddressable =
            static_cast<size_type>(std::numeric_limits<difference_type>::max() / sizeof(FloatVec2));
        return std::min<size_type>(std::numeric_limits<Count>::max(), kAddressable);
    }
    bool empty() const noexcept { return length == 0; }

    /// Invalidated when points are added or this is moved from.
    iterator begin() noexcept { return data(); }
    iterator end() noexcept { return data() + length; }
    const_iterator begin() const noexcept { return data(); }
    const_iterator end() const noexcept { return data() + length; }
    const_iterator cbegin() const noexcept { return begin(); }
    const_iterator cend() const noexcept { return end(); }
    reverse_iterator rbegin() noexcept { return reverse_iterator(end()); }
    reverse_iterator rend() noexcept { return reverse_iterator(begin()); }
    const_reverse_iterator rbegin() const noexcept { return const_reverse_iterator(end()); }
    const_reverse_iterator rend() const noexcept { return const_reverse_iterator(begin()); }
    const_reverse_iterator crbegin() const noexcept { return rbegin(); }
    const_reverse_iterator crend() const noexcept { return rend(); }

    /// One point. `at` throws `std::out_of_range` for a position out of range. For the others such
    /// a position is undefined behaviour; it is an assertion failure where `_GLIBCXX_ASSERTIONS` is
    /// defined, which checks vectors too.
    FloatVec2& operator[](size_type i) {
        check(i < length, "i < size()", "operator[]");
        return data()[i];
    }
    FloatVec2 const& operator[](size_type i) const {
        check(i < length, "i < size()", "operator[]");
        return data()[i];
    }
    FloatVec2& at(size_type i) { return data()[checked(i)]; }
    FloatVec2 const& at(size_type i) const { return data()[checked(i)]; }
    FloatVec2& front() {
        check(!empty(), "!empty()", "front");
        return *begin();
    }
    FloatVec2 const& front() const {
        check(!empty(), "!empty()", "front");
        return *begin();
    }
    FloatVec2& back() {
        check(!empty(), "!empty()", "back");
        return end()[-1];
    }
    FloatVec2 const& back() const {
        check(!empty(), "!empty()", "back");
        return end()[-1];
    }

    /// As for a vector: adding at the end takes amortised constant time, and a failing allocation
    /// leaves this unchanged.
    void reserve(size_type wanted) { withRoomFor(wanted); }
    void shrink_to_fit() {
        if (isMany() && length < room) *this = Points(*this);
    }
    void clear() noexcept { length = 0; }
    void push_back(FloatVec2 point) {
        if (length == room) moveTo(grownRoom(size_type(length) + 1));
        data()[length++] = point;
    }
    template <class... Coordinates>
    FloatVec2& emplace_back(Coordinates... coordinates) {
        push_back(pointOf(coordinates...));
        return back();
    }
    void pop_back() {
        check(!empty(), "!empty()", "pop_back");
        --length;
    }
    void resize(size_type count, FloatVec2 point = FloatVec2()) {
        FloatVec2* const first = withGrownRoomFor(count);
        if (count > length) std::fill(first + length, first + count, point);
        length = static_cast<Count>(count);
    }

    /// Linear in the points inserted and the points after them.
    iterator insert(const_iterator position, FloatVec2 point) {
        return insert(position, &point, &point + 1);
    }
    iterator insert(const_iterator position, size_type count, FloatVec2 point) {
        Points const points(count, point);
        return insert(position, points.begin(), points.end());
    }
    iterator insert(const_iterator position, std::initializer_list<FloatVec2> points) {
        return insert(position, points.begin(), points.end());
    }
    template <class Iterator, class = typename std::iterator_traits<Iterator>::iterator_category>
    iterator insert(const_iterator position, Iterator first, Iterator last) {
        auto const index = static_cast<size_type>(position - begin());
        auto const before = static_cast<difference_type>(length);
        Points const added(first, last);
        append(added.data(), added.length);
        std::rotate(begin() + index, begin() + before, end());
        return begin() + index;
    }
    template <class... Coordinates>
    iterator emplace(const_iterator position, Coordinates... coordinates) {
        return insert(position, pointOf(coordinates...));
    }
    iterator erase(const_iterator position) { return erase(position, position + 1); }
    iterator erase(const_iterator first, const_iterator last) {
        check(first <= last && last <= end(), "last <= end()", "erase");
        iterator const to = begin() + (first - begin());
        length = static_cast<Count>(std::copy(last, cend(), to) - begin());
        return to;
    }
    /// The same as assigning a newly constructed list.
    void assign(size_type count, FloatVec2 point) {
        if (count > room) {
            *this = Points(count, point);
        } else {
            std::fill_n(data(), count, point);
            length = static_cast<Count>(count);
        }
    }
    void assign(std::initializer_list<FloatVec2> points) { *this = points; }
    template <class Iterator, class = typename std::iterator_traits<Iterator>::iterator_category>
    void assign(Iterator first, Iterator last) {
        Points const points(first, last);
        *this = points;
    }
    /// Constant time.
    void swap(Points& other) noexcept { std::swap(*this, other); }
    friend void swap(Points& a, Points& b) noexcept { a.swap(b); }

    /// The same number of points, equal as floating-point numbers.
    friend bool operator==(Points const& a, Points const& b) {
        return a.length == b.length && std::equal(a.begin(), a.end(), b.begin());
    }
    friend bool operator!=(Points const& a, Points const& b) { return !(a == b); }

    /// Removes all points that equal the given one (for which the predicate is true) and returns
    /// their number. Linear.
    template <class Predicate>
    friend size_type erase_if(Points& points, Predicate predicate) {
        auto const kept = std::remove_if(points.begin(), points.end(), predicate);
        auto const erased = static_cast<size_type>(points.end() - kept);
        points.erase(kept, points.end());
        return erased;
    }
    friend size_type erase(Points& points, FloatVec2 const& point) {
        return erase_if(points, [copy = point](FloatVec2 const& each) { return each == copy; });
    }

private:
    using Count = std::uint32_t;
    static constexpr Count kInPlace = 3;

    // The points: in a block on the heap or in place, which `room` tells. Copying copies the
    // pointer.
    union Held {
        Held() noexcept : few{} {}
        FloatVec2 few[kInPlace];
        FloatVec2* many;
    };

    static FloatVec2 pointOf(FloatVec2 point) { return point; }
    template <class... Coordinates>
    static FloatVec2 pointOf(Coordinates... coordinates) {
        return FloatVec2{static_cast<double>(coordinates)...};
    }

    static void check([[maybe_unused]] bool holds, [[maybe_unused]] char const* condition,
                      [[maybe_unused]] char const* function) {
#if defined(_GLIBCXX_ASSERTIONS)
        if (!holds) assertionFailed(condition, function, "Engine/Base/points", __LINE__);
#endif
    }

    bool isMany() const noexcept { return room > kInPlace; }
    void release() {
        if (isMany()) delete[] held.many;
    }
    size_type checked(size_type i) const {
        if (i >= length) detail::throwOutOfRange("Points::at");
        return i;
    }
    void append(FloatVec2 const* points, size_type count) {
        std::copy(points, points + count, withGrownRoomFor(length + count) + length);
        length += static_cast<Count>(count);
    }
    void overwrite(FloatVec2 const* points, size_type count) {
        std::copy(points, points + count, data());
        length = static_cast<Count>(count);
    }
    // Doubles the capacity, or returns what is wanted if that is more.
    size_type grownRoom(size_type wanted) const {
        size_type const doubled = 2 * size_type(length);
        return std::max(wanted, std::min(doubled, max_size()));
    }
    FloatVec2* withGrownRoomFor(size_type wanted) {
        return withRoomFor(wanted <= room ? wanted : grownRoom(wanted));
    }
    // Grows if needed; returns where the points are then.
    FloatVec2* withRoomFor(size_type wanted) {
        if (wanted <= room) return data();
        moveTo(wanted);
        return held.many;
    }
    void moveTo(size_type newRoom) {
        if (newRoom > max_size()) detail::throwLengthError("Points");
        auto* const larger = new FloatVec2[newRoom];
        std::copy(begin(), end(), larger);
        release();
        held.many = larger;
        room = static_cast<Count>(newRoom);
    }
    // Takes the points of `other`, which is empty afterwards, and overwrites its own.
    void take(Points& other) noexcept {
        held = other.held;
        length = std::exchange(other.length, 0);
        room = std::exchange(other.room, kInPlace);
        if (isMany()) other.held = Held();
    }

    Held held;
    Count length = 0;
    Count room = kInPlace;
};
static_assert(sizeof(Points) == 56, "an element of a path is one cache line");
static_assert(std::is_nothrow_move_constructible_v<Points>, "elements move when paths grow");

}  // namespace tarn::engine

#endif
