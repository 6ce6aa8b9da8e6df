// Engine/Base/json.h: converts between nlohmann-json 3 and `Unstructured`.
//
//     Unstructured data = fromJson(nlohmann::json::parse(R"({"tags": ["intro", true]})"));
//     std::string text = toJson(data).dump();  // {"tags":["intro",1]}

#ifndef TARN_ENGINE_BASE_JSON_H
#define TARN_ENGINE_BASE_JSON_H

#include <Engine/Base/unstructured.h>

#include <nlohmann/json.hpp>

#include <limits>
#include <string>
#include <utility>
#include <vector>

namespace tarn::engine {

/// Converts a JSON document: an object becomes a map, an array an array, a string its bytes. A bool
/// becomes the integer 1 or 0. An integer is signed where it fits into 64 bits, else unsigned. A
/// number with a fraction or an exponent is a double. Binary values, which only nlohmann-json has,
/// become null.
///
/// Linear. Not recursive: documents of any depth are safe. Throws only `std::bad_alloc`.
inline Unstructured fromJson(nlohmann::json const& json);

/// The inverse; an unsigned integer stays unsigned. JSON has no NaN and no infinity: `dump` writes
/// them as null. Strings may hold any bytes: `dump` throws for those that are not UTF-8, unless it
/// is given another `nlohmann::json::error_handler_t`, such as `replace`.
///
/// Linear, and not recursive itself; `dump` is, and so may be the destructor of a deep document.
/// Throws only `std::bad_alloc`.
inline nlohmann::json toJson(Unstructured const& data);

// Implementation

namespace detail {

// For values that are neither objects nor arrays.
inline Unstructured leafFromJson(nlohmann::json const& json) {
    using Kind = nlohmann::json::value_t;
    switch (json.type()) {
        case Kind::string: return *json.get_ptr<std::string const*>();
        case Kind::boolean: return json.get<bool>() ? 1 : 0;
        case Kind::number_integer: return static_cast<long long>(json.get<std::int64_t>());
        case Kind::number_unsigned: {
            auto const number = static_cast<unsigned long long>(json.get<std::uint64_t>());
            constexpr auto kLargest =
                static_cast<unsigned long long>(std::numeric_limits<long long>::max());
            if (number > kLargest) return number;
            return static_cast<long long>(number);
        }
        case Kind::number_float: return json.get<double>();
        case Kind::object:
        case Kind::array:
        case Kind::null:
        case Kind::binary:
        case Kind::discarded: break;
    }
    return Unstructured();
}

inline nlohmann::json leafToJson(Unstructured const& data) {
    switch (data.type()) {
        case Unstructured::Type::Float: return data.asFloat();
        case Unstructured::Type::Integer: return data.asInteger();
        case Unstructured::Type::UnsignedInteger: return data.asId();
        case Unstructured::Type::String: return *data.ifString();
        case Unstructured::Type::Null:
        case Unstructured::Type::Map:
        case Unstructured::Type::Array: break;
    }
    return nullptr;
}

}  // namespace detail

inline Unstructured fromJson(nlohmann::json const& json) {
    // An open object or array with its finished elements.
    struct Level {
        nlohmann::json const* json;
        nlohmann::json::const_iterator next;
        Unstructured::Map map;
        Unstructured::Array array;
    };
    if (!json.is_structured()) return detail::leafFromJson(json);
    std::vector<Level> open;
    auto const enter = [&open](nlohmann::json const& entered) {
        open.push_back({&entered, entered.begin(), {}, {}});
        if (entered.is_array()) open.back().array.reserve(entered.size());
    };
    enter(json);
    for (;;) {
        Level& level = open.back();
        if (level.next != level.json->end() && level.next->is_structured()) {
            enter(*level.next);
            continue;
        }
        Unstructured done;
        if (level.next != level.json->end()) {
            done = detail::leafFromJson(*level.next);
        } else {
            done = level.json->is_object() ? Unstructured(std::move(level.map))
                                           : Unstructured(std::move(level.array));
            open.pop_back();
            if (open.empty()) return done;
        }
        Level& around = open.back();
        if (around.json->is_object()) {
            around.map.emplace_hint(around.map.end(), around.next.key(), std::move(done));
        } else {
            around.array.push_back(std::move(done));
        }
        ++around.next;
    }
}

inline nlohmann::json toJson(Unstructured const& data) {
    nlohmann::json result;
    // Maps and arrays that are still to be converted, and their targets.
    std::vector<std::pair<Unstructured const*, nlohmann::json*>> pending;
    auto const place = [&pending](Unstructured const& from, nlohmann::json& to) {
        if (from.isMap() || from.isArray()) {
            pending.emplace_back(&from, &to);
        } else {
            to = detail::leafToJson(from);
        }
    };
    place(data, result);
    while (!pending.empty()) {
        auto const [from, to] = pending.back();
        pending.pop_back();
        if (Unstructured::Map const* const map = from->ifMap()) {
            *to = nlohmann::json::object();
            for (auto const& [key, element] : *map) place(element, (*to)[key]);
        } else {
            *to = nlohmann::json::array_t(from->size());
            for (std::size_t i = 0; i < from->size(); ++i) place(*from->find(i), (*to)[i]);
        }
    }
    return result;
}

}  // namespace tarn::engine

#endif
