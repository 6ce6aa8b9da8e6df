// Engine/Document/detail/data_builder.h: data from the events of a JSON text.
//
//     DataBuilder builder(DataBuilder::Strictness::Lenient);
//     builder.open(false), builder.add(1), builder.close();
//     Unstructured data = builder.take();  // [1]

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_DATA_BUILDER_H
#define TARN_ENGINE_DOCUMENT_DETAIL_DATA_BUILDER_H

#include <Engine/Base/unstructured.h>

#include <cstddef>
#include <cstdint>
#include <deque>
#include <string>
#include <utility>

namespace tarn::engine::detail {

/// Builds one tree at a time from the inside to the outside: what is done waits in lists without
/// room to spare, so that a level and an element cost little more than they do in the tree.
class DataBuilder {
public:
    enum class Strictness {
        /// Of several elements with one key, the last counts, as in the browsers' JSON.
        Lenient,
        /// Of our own form: a key is there once, and a "$" at its beginning has a meaning.
        Own,
    };
    explicit DataBuilder(Strictness chosen) : strictness(chosen) {}

    /// Whether a map or an array is open.
    bool isOpen() const { return !levels.empty(); }
    /// False where there are more values than can be counted.
    bool open(bool isMap);
    /// The outermost level, which is a map to be taken by `takeMap`.
    bool openMap() {
        isMapWanted = true;
        return open(true);
    }
    void add(Unstructured data) { values.push_back(std::move(data)); }
    void key(std::string& text) { keys.push_back(std::move(text)); }
    /// False where the map is refused; then `problem` says why.
    bool close();
    std::string problem;

    /// What was built, once nothing is open.
    Unstructured take();
    Unstructured::Map takeMap() {
        isMapWanted = false;
        return std::move(outermost);
    }
    bool wantsMap() const { return isMapWanted; }
    /// The JSON pointer from the tree to the innermost map or array that is open, and to the
    /// element that comes next in it; of deep trees to something around it.
    std::string pointerToOpen() const;
    std::string pointerToNext() const;

private:
    std::string pointer(bool toNext) const;
    bool closeMap(std::size_t firstValue, std::size_t firstKey);
    bool decodeKeys(std::size_t firstKey);
    bool decodeTagged(std::string const& tag);

    Strictness strictness;
    bool isMapWanted = false;
    Unstructured::Map outermost;
    std::deque<Unstructured> values;
    std::deque<std::string> keys;
    // For each open level 2 * its first value, and 1 more for a map. Keys are as many as values.
    std::deque<std::uint32_t> levels;
};

}  // namespace tarn::engine::detail

#endif
