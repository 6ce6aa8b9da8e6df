// Engine/Document/detail/lists.h: lists of records that are read one after the other.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_LISTS_H
#define TARN_ENGINE_DOCUMENT_DETAIL_LISTS_H

#include <Engine/Base/patch.h>

#include <cstddef>
#include <deque>
#include <memory>
#include <utility>
#include <vector>

namespace tarn::engine::detail {

/// The elements in a list that has just their size. Both take up little more memory than one: what
/// has been moved is let go of on the way.
template <class T>
std::vector<T> takeAll(std::deque<T>& elements) {
    std::vector<T> result;
    result.reserve(elements.size());
    while (!elements.empty()) {
        result.push_back(std::move(elements.front()));
        elements.pop_front();
    }
    return result;
}

/// A list that costs nothing while it has no elements.
template <class T>
class LazyList {
public:
    bool empty() const { return elements == nullptr || elements->empty(); }
    std::size_t size() const { return elements == nullptr ? 0 : elements->size(); }
    T& emplace_back() {
        if (elements == nullptr) elements = std::make_unique<std::deque<T>>();
        return elements->emplace_back();
    }
    T& back() { return elements->back(); }
    T& operator[](std::size_t i) { return (*elements)[i]; }
    T const& operator[](std::size_t i) const { return (*elements)[i]; }
    /// The first element, which is taken out.
    T takeFirst() {
        T result = std::move(elements->front());
        elements->pop_front();
        return result;
    }

private:
    std::unique_ptr<std::deque<T>> elements;
};

/// The same as `takeAll` for a field of a record that has an empty list so far: it shares that one.
template <class T>
void takeInto(Array<T>& field, std::deque<T>& elements) {
    if (!elements.empty()) field = arrayOf(takeAll(elements));
}

}  // namespace tarn::engine::detail

#endif
