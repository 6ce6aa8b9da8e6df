// Engine/Document/detail/data_builder.h: builds unstructured data from parser events.
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

/// Builds one tree at a time, innermost values first. Finished values wait in compact lists, so
/// that building takes little more memory than the tree.
class DataBuilder {
public:
    enum class Strictness {
        /// Of repeated keys the last one counts, as in browsers.
        Lenient,
        /// Our own format: keys must be distinct, and a "$" at the start has a meaning.
        Own,
    };
    explicit DataBuilder(Strictness chosen) : strictness(chosen) {}

    /// Whether a map or an array is open.
    bool isOpen() const { return !levels.empty(); }
    /// False where there are more values than can be counted.
    bool open(bool isMap);
    /// Opens the outermost map, to be taken by `takeMap`.
    bool openMap() {
        isMapWanted = true;
        return open(true);
    }
    void add(Unstructured data) { values.push_back(std::move(data)); }
    void key(std::string& text) { keys.push_back(std::move(text)); }
    /// False where the map is invalid; then `problem` says why.
    bool close();
    std::string problem;

    /// Returns the tree, once everything is closed.
    Unstructured take();
    Unstructured::Map takeMap() {
        isMapWanted = false;
        return std::move(outermost);
    }
    bool wantsMap() const { return isMapWanted; }
    /// The JSON pointer from the tree to the innermost open map or array and its next element; for
    /// deep trees, to something around it.
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
    // For each open level 2 * its first value, plus 1 for a map. There are as many keys as values.
    std::deque<std::uint32_t> levels;
};

}  // namespace tarn::engine::detail

#endif
