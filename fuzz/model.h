// fuzz/model.h: a simple second implementation of data and numbers.

#ifndef TARN_FUZZ_MODEL_H
#define TARN_FUZZ_MODEL_H

#include "fuzz.h"

#include <Engine/Base/unstructured.h>

#include <array>
#include <cerrno>
#include <map>
#include <string>
#include <vector>

namespace fuzz {

/// Truncates towards zero and clamps; 0 for a NaN.
inline long long toInteger(double d) {
    if (!(d == d)) return 0;
    if (d >= 9223372036854775807.0) return INT64_MAX;
    if (d <= -9223372036854775808.0) return INT64_MIN;
    return static_cast<long long>(d);
}
inline unsigned long long toId(double d) {
    if (!(d > 0.0)) return 0;
    if (d >= 18446744073709551615.0) return UINT64_MAX;
    return static_cast<unsigned long long>(d);
}

/// Formats a number with the C library; `point` is the decimal point that is trimmed.
inline std::string numberText(double d, char point) {
    char buffer[128];
    std::snprintf(buffer, sizeof buffer, std::fabs(d) >= 1000.0 ? "%.1f" : "%.2f", d);
    std::string text = buffer;
    if (text.find(point) != std::string::npos) {
        while (text.back() == '0') text.pop_back();
        if (text.back() == point) text.pop_back();
    }
    return text == "-0" ? "0" : text;
}

/// The number that the whole string represents, else whether it is not empty.
inline double textAsNumber(std::string const& text) {
    if (text.empty()) return 0.0;
    char* end = nullptr;
    double const number = std::strtod(text.c_str(), &end);
    return static_cast<std::size_t>(end - text.c_str()) == text.size() ? number : 1.0;
}

/// Unstructured data as a struct with a field for everything.
struct Tree {
    enum Kind { Null, Map, Array, Float, Integer, Unsigned, String };

    Kind kind = Null;
    std::map<std::string, Tree> entries;
    std::vector<Tree> elements;
    double number = 0.0;
    long long integer = 0;
    unsigned long long id = 0;
    std::string text;

    static Tree random(Input& input, int depth) {
        Tree tree;
        tree.kind = static_cast<Kind>(input.below(7));
        std::size_t const size = input.below(5);
        switch (tree.kind) {
            case Null: break;
            case Map:
                for (std::size_t i = 0; i < size && depth > 0; ++i) {
                    char const* const keys[] = {"X", "Y", "Z", "W", "x", ""};
                    std::string const key =
                        input.chance() ? keys[input.below(std::size(keys))] : input.text(4);
                    tree.entries[key] = random(input, depth - 1);
                }
                break;
            case Array:
                for (std::size_t i = 0; i < size && depth > 0; ++i) {
                    tree.elements.push_back(random(input, depth - 1));
                }
                break;
            case Float: tree.number = input.anyDouble(); break;
            case Integer: tree.integer = static_cast<long long>(input.word()); break;
            case Unsigned: tree.id = input.word(); break;
            case String: tree.text = input.text(20); break;
        }
        return tree;
    }

    tarn::engine::Unstructured build() const {
        using tarn::engine::Unstructured;
        switch (kind) {
            case Null: return Unstructured::Undefined();
            case Map: {
                Unstructured::Map map;
                for (auto const& [key, tree] : entries) map.emplace(key, tree.build());
                return map;
            }
            case Array: {
                Unstructured::Array array;
                for (Tree const& tree : elements) array.push_back(tree.build());
                return array;
            }
            case Float: return number;
            case Integer: return integer;
            case Unsigned: return id;
            case String: return text;
        }
        return {};
    }

    bool equals(Tree const& other) const {
        if (kind != other.kind) return false;
        switch (kind) {
            case Null: return true;
            case Map: {
                if (entries.size() != other.entries.size()) return false;
                for (auto const& [key, tree] : entries) {
                    auto const found = other.entries.find(key);
                    if (found == other.entries.end() || !tree.equals(found->second)) return false;
                }
                return true;
            }
            case Array: {
                if (elements.size() != other.elements.size()) return false;
                for (std::size_t i = 0; i < elements.size(); ++i) {
                    if (!elements[i].equals(other.elements[i])) return false;
                }
                return true;
            }
            case Float: return number == other.number;
            case Integer: return integer == other.integer;
            case Unsigned: return id == other.id;
            case String: return text == other.text;
        }
        return false;
    }

    double asFloat() const {
        return kind == Float ? number : kind == Integer ? static_cast<double>(integer) : 0.0;
    }
    long long asInteger() const {
        return kind == Float ? toInteger(number) : kind == Integer ? integer : 0;
    }
    unsigned long long asId() const {
        if (kind == Float) return toId(number);
        return kind == Integer    ? static_cast<unsigned long long>(integer)
               : kind == Unsigned ? id
                                  : 0;
    }
    bool asBool() const {
        switch (kind) {
            case Null: return false;
            case Map:
            case Array: return true;
            case Float: return !(number == 0.0);
            case Integer: return integer != 0;
            case Unsigned: return id != 0;
            case String: return !text.empty();
        }
        return false;
    }
    bool isEmptyContainer() const {
        return (kind == Map && entries.empty()) || (kind == Array && elements.empty()) ||
               (kind == String && text.empty());
    }
    std::array<double, 4> vector() const {
        std::array<double, 4> result{};
        char const* const keys[] = {"X", "Y", "Z", "W"};
        for (std::size_t i = 0; i < 4; ++i) {
            if (kind == Map) {
                auto const entry = entries.find(keys[i]);
                if (entry != entries.end()) result[i] = entry->second.asFloat();
            } else if (kind == Array) {
                if (i < elements.size()) result[i] = elements[i].asFloat();
            } else {
                result[i] = asFloat();
            }
        }
        return result;
    }
};

/// Whether the data equals the model; doubles are compared by bits.
inline bool holds(tarn::engine::Unstructured const& data, Tree const& tree) {
    if (static_cast<int>(data.type()) != static_cast<int>(tree.kind)) return false;
    switch (tree.kind) {
        case Tree::Null: return true;
        case Tree::Map: {
            auto const* map = data.ifMap();
            if (map == nullptr || map->size() != tree.entries.size()) return false;
            auto entry = tree.entries.begin();
            for (auto const& [key, element] : *map) {
                if (key != entry->first || !holds(element, entry->second)) return false;
                ++entry;
            }
            return true;
        }
        case Tree::Array: {
            auto const* array = data.ifArray();
            if (array == nullptr || array->size() != tree.elements.size()) return false;
            for (std::size_t i = 0; i < array->size(); ++i) {
                if (!holds((*array)[i], tree.elements[i])) return false;
            }
            return true;
        }
        case Tree::Float: return same(data.asFloat(), tree.number);
        case Tree::Integer: return data.asInteger() == tree.integer;
        case Tree::Unsigned: return data.asId() == tree.id;
        case Tree::String: return data.ifString() != nullptr && *data.ifString() == tree.text;
    }
    return false;
}

}  // namespace fuzz

#endif
