// JSON and the library's data, either way.
//
//     Unstructured const data = toUnstructured(nlohmann::json::parse("[1, true]"));  // 1, 1

#ifndef EXAMPLES_JSON_H
#define EXAMPLES_JSON_H

#include <Engine/Base/unstructured.h>

#include <nlohmann/json.hpp>

#include <limits>

using Json = nlohmann::json;

// Truth becomes 1 or 0, and an integer is signed where it fits. Recurses over the levels.
inline tarn::engine::Unstructured toUnstructured(Json const& json) {
    using tarn::engine::Unstructured;
    switch (json.type()) {
        case Json::value_t::object: {
            Unstructured::Map map;
            for (auto const& [key, member] : json.items()) map.emplace(key, toUnstructured(member));
            return map;
        }
        case Json::value_t::array: {
            Unstructured::Array array;
            array.reserve(json.size());
            for (Json const& element : json) array.push_back(toUnstructured(element));
            return array;
        }
        case Json::value_t::string: return json.get<std::string>();
        case Json::value_t::boolean: return json.get<bool>() ? 1 : 0;
        case Json::value_t::number_integer: return json.get<long long>();
        case Json::value_t::number_unsigned: {
            auto const number = json.get<unsigned long long>();
            bool const fits =
                number <= static_cast<unsigned long long>(std::numeric_limits<long long>::max());
            return fits ? Unstructured(static_cast<long long>(number)) : Unstructured(number);
        }
        case Json::value_t::number_float: return json.get<double>();
        case Json::value_t::null:
        case Json::value_t::binary:
        case Json::value_t::discarded: break;
    }
    return Unstructured::Undefined();
}

// Nothing is copied on the way but what JSON keeps. JSON has no NaN and no infinity: they are
// written as null. Texts of data are any bytes: `dump` throws at those that are no UTF-8, unless it
// is told to write something else (`Json::error_handler_t::replace`). Recurses over the levels.
inline Json toJson(tarn::engine::Unstructured const& data) {
    using tarn::engine::Unstructured;
    switch (data.type()) {
        case Unstructured::Type::Null: break;
        case Unstructured::Type::Map: {
            Json object = Json::object();
            for (auto const& [key, member] : *data.ifMap()) object[key] = toJson(member);
            return object;
        }
        case Unstructured::Type::Array: {
            Json array = Json::array();
            for (Unstructured const& element : *data.ifArray()) array.push_back(toJson(element));
            return array;
        }
        case Unstructured::Type::Float: return data.asFloat();
        case Unstructured::Type::Integer: return data.asInteger();
        case Unstructured::Type::UnsignedInteger: return data.asId();
        case Unstructured::Type::String: return *data.ifString();
    }
    return nullptr;
}

#endif
