#include <Engine/Document/detail/data_builder.h>

#include <Engine/Document/detail/texts.h>

#include <algorithm>
#include <limits>
#include <string_view>
#include <utility>

namespace tarn::engine::detail {

bool DataBuilder::open(bool isMap) {
    if (values.size() > std::numeric_limits<std::uint32_t>::max() / 2 - 1) return false;
    levels.push_back(static_cast<std::uint32_t>(values.size() * 2 + (isMap ? 1 : 0)));
    return true;
}

bool DataBuilder::close() {
    bool const isMap = levels.back() % 2 == 1;
    std::size_t const first = levels.back() / 2;
    if (isMap) {
        if (!closeMap(first, keys.size() - (values.size() - first))) return false;
    } else {
        Unstructured::Array array;
        array.reserve(values.size() - first);
        for (std::size_t i = first; i < values.size(); ++i) array.push_back(std::move(values[i]));
        values.resize(first);
        values.emplace_back(std::move(array));
    }
    levels.pop_back();
    return true;
}

bool DataBuilder::closeMap(std::size_t firstValue, std::size_t firstKey) {
    if (strictness == Strictness::Own) {
        if (keys.size() == firstKey + 1 && !(isMapWanted && levels.size() == 1)) {
            std::string const& only = keys.back();
            if (only == "$float" || only == "$integer" || only == "$unsigned") {
                return decodeTagged(only);
            }
        }
        if (!decodeKeys(firstKey)) return false;
    }
    Unstructured::Map map;
    for (std::size_t i = firstKey; i < keys.size(); ++i) {
        std::size_t const before = map.size();
        Unstructured& value = values[firstValue + i - firstKey];
        auto const entry = map.emplace_hint(map.end(), std::move(keys[i]), Unstructured());
        if (map.size() == before && strictness == Strictness::Own) {
            problem = "the key \"" + printable(entry->first) + "\" is repeated";
            return false;
        }
        entry->second = std::move(value);
    }
    keys.resize(firstKey);
    values.resize(firstValue);
    if (isMapWanted && levels.size() == 1) {
        outermost = std::move(map);
    } else {
        values.emplace_back(std::move(map));
    }
    return true;
}

// Removes the escape from keys that begin with "$".
bool DataBuilder::decodeKeys(std::size_t firstKey) {
    for (std::size_t i = firstKey; i < keys.size(); ++i) {
        std::string& name = keys[i];
        if (name.empty() || name[0] != '$') continue;
        if (name.size() < 2 || name[1] != '$') {
            problem = "the key \"" + printable(name) +
                      "\" is unknown; a key that begins with $ is "
                      "written with $$";
            return false;
        }
        name.erase(0, 1);
    }
    return true;
}

// Replaces {"$float": "inf"} and similar objects by the values that they stand for.
bool DataBuilder::decodeTagged(std::string const& tag) {
    Unstructured& value = values.back();
    std::string_view const text = value.isString() ? *value.ifString() : std::string_view();
    Unstructured decoded;
    if (tag == "$float") {
        if (Optional<double> const number = nonFiniteNumber(text)) decoded = *number;
    } else if (tag == "$integer") {
        if (Optional<long long> const number = integerOfText(text)) decoded = *number;
    } else if (Optional<unsigned long long> const number = identifierOfText(text)) {
        decoded = *number;
    } else if (value.isIdentifier() ||
               (value.type() == Unstructured::Type::Integer && value.asInteger() >= 0)) {
        decoded = value.asId();
    }
    if (decoded.isNull()) {
        problem = "\"" + tag + "\" has no such value";
        return false;
    }
    value = std::move(decoded);
    keys.pop_back();
    return true;
}

Unstructured DataBuilder::take() {
    Unstructured result = std::move(values.back());
    values.clear();
    keys.clear();
    return result;
}

std::string DataBuilder::pointer(bool toNext) const {
    constexpr std::size_t kMostSteps = 100;
    std::string result;
    std::size_t firstKey = 0;
    for (std::size_t i = 0; i < std::min(levels.size(), kMostSteps); ++i) {
        bool const isInnermost = i + 1 == levels.size();
        if (isInnermost && !toNext) break;
        std::size_t const end = isInnermost ? values.size() : levels[i + 1] / 2;
        std::size_t const position = end - levels[i] / 2;
        if (levels[i] % 2 == 0) {
            result += pointerStep(position);
        } else if (firstKey + position < keys.size()) {
            result += pointerStep(keys[firstKey + position]);
            firstKey += position + 1;
        }
    }
    return result;
}

std::string DataBuilder::pointerToOpen() const { return pointer(false); }
std::string DataBuilder::pointerToNext() const { return pointer(true); }

}  // namespace tarn::engine::detail
