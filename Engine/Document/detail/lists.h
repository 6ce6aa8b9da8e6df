// Engine/Document/detail/lists.h: lists of records that grow while a document is parsed.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_LISTS_H
#define TARN_ENGINE_DOCUMENT_DETAIL_LISTS_H

#include <Engine/Base/patch.h>

#include <cstddef>
#include <deque>
#include <memory>
#include <utility>
#include <vector>

namespace tarn::engine::detail {

/// Moves the elements into a list of exactly their number. Memory is released while moving, so that
/// both lists together take little more than one.
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

/// A list that allocates nothing while it is empty.
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
    /// Removes and returns the first element.
    T takeFirst() {
        T result = std::move(elements->front());
        elements->pop_front();
        return result;
    }

private:
    std::unique_ptr<std::deque<T>> elements;
};

/// Same as `takeAll` for a field of a record: an empty list stays the shared one.
template <class T>
void takeInto(Array<T>& field, std::deque<T>& elements) {
    if (!elements.empty()) field = arrayOf(takeAll(elements));
}

}  // namespace tarn::engine::detail

#endif
