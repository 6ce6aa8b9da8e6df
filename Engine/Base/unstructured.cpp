#include <Engine/Base/unstructured.h>

#include <Engine/Base/truncate.h>

#include <boost/variant/get.hpp>

#include <array>

namespace tarn::engine {

namespace {

constexpr std::array<char const*, 4> kComponentKeys{"X", "Y", "Z", "W"};

// Component `i` of the vector that `tree` reads as.
double component(Unstructured const& tree, std::size_t i) {
    if (Unstructured::Map const* map = tree.ifMap()) {
        auto const entry = map->find(kComponentKeys[i]);
        return entry == map->end() ? 0.0 : entry->second.asFloat();
    }
    if (Unstructured::Array const* array = tree.ifArray()) {
        return i < array->size() ? (*array)[i].asFloat() : 0.0;
    }
    return tree.asFloat();
}

bool isEmptyContainer(Unstructured const& tree) {
    if (auto const* map = tree.ifMap()) return map->empty();
    if (auto const* array = tree.ifArray()) return array->empty();
    if (auto const* text = tree.ifString()) return text->empty();
    return false;
}

}  // namespace

Unstructured::Unstructured() : storage(nullptr) {}
Unstructured::Unstructured(Map const& map) : storage(Box<Map>(map)) {}
Unstructured::Unstructured(Map&& map) : storage(Box<Map>(std::move(map))) {}
Unstructured::Unstructured(Array const& array) : storage(Box<Array>(array)) {}
Unstructured::Unstructured(Array&& array) : storage(Box<Array>(std::move(array))) {}
Unstructured::Unstructured(std::string const& text) : storage(Box<std::string>(text)) {}
Unstructured::Unstructured(std::string&& text) : storage(Box<std::string>(std::move(text))) {}
Unstructured::Unstructured(char const* text)
    : storage(Box<std::string>(text == nullptr ? "" : text)) {}
Unstructured::Unstructured(long long const& integer) : storage(integer) {}
Unstructured::Unstructured(double const& number) : storage(number) {}
Unstructured::Unstructured(unsigned long long const& integer) : storage(integer) {}
Unstructured::Unstructured(Value const& value) : Unstructured(value.asUnstructured()) {}

Unstructured::Unstructured(Unstructured const& other) = default;
Unstructured::Unstructured(Unstructured&& other) noexcept : storage(std::move(other.storage)) {
    other.storage = nullptr;
}
Unstructured& Unstructured::operator=(Unstructured const& other) {
    return *this = Unstructured(other);
}
Unstructured& Unstructured::operator=(Unstructured&& other) noexcept {
    // First out of `other`, which may be this or a part of it.
    Unstructured taken(std::move(other));
    storage = std::move(taken.storage);
    taken.storage = nullptr;
    return *this;
}
Unstructured::~Unstructured() = default;

Unstructured Unstructured::Undefined() { return Unstructured(); }

Unstructured::Type Unstructured::type() const { return Type(storage.which()); }

Unstructured::Map Unstructured::asMap() const { return ifMap() ? *ifMap() : Map(); }
Unstructured::Array Unstructured::asArray() const { return ifArray() ? *ifArray() : Array(); }
std::string Unstructured::asString() const { return ifString() ? *ifString() : std::string(); }

long long Unstructured::asInteger() const {
    if (auto const* integer = boost::get<long long>(&storage)) return *integer;
    if (auto const* number = boost::get<double>(&storage)) return truncate<long long>(*number);
    return 0;
}

double Unstructured::asFloat() const {
    if (auto const* number = boost::get<double>(&storage)) return *number;
    if (auto const* integer = boost::get<long long>(&storage)) return static_cast<double>(*integer);
    return 0.0;
}

bool Unstructured::asBool() const {
    switch (type()) {
        case Type::Null: return false;
        case Type::Map:
        case Type::Array: return true;
        case Type::Float: return asFloat() != 0.0;  // A NaN is true.
        case Type::Integer:
        case Type::UnsignedInteger: return asId() != 0;
        case Type::String: return !ifString()->empty();
    }
    return false;
}

unsigned long long Unstructured::asId() const {
    if (auto const* id = boost::get<unsigned long long>(&storage)) return *id;
    if (auto const* integer = boost::get<long long>(&storage)) {
        return static_cast<unsigned long long>(*integer);
    }
    if (auto const* number = boost::get<double>(&storage)) {
        return truncate<unsigned long long>(*number);
    }
    return 0;
}

Unstructured::Map const* Unstructured::ifMap() const {
    auto const* box = boost::get<Box<Map>>(&storage);
    return box ? box->get() : nullptr;
}
Unstructured::Array const* Unstructured::ifArray() const {
    auto const* box = boost::get<Box<Array>>(&storage);
    return box ? box->get() : nullptr;
}
std::string const* Unstructured::ifString() const {
    auto const* box = boost::get<Box<std::string>>(&storage);
    return box ? box->get() : nullptr;
}

Unstructured::operator FloatVec2() const { return {component(*this, 0), component(*this, 1)}; }
Unstructured::operator FloatVec3() const {
    return {component(*this, 0), component(*this, 1), component(*this, 2)};
}
Unstructured::operator FloatVec4() const {
    return {component(*this, 0), component(*this, 1), component(*this, 2), component(*this, 3)};
}

bool Unstructured::operator==(Unstructured const& other) const {
    if (type() != other.type()) return false;
    switch (type()) {
        case Type::Null: return true;
        case Type::Map: return *ifMap() == *other.ifMap();
        case Type::Array: return *ifArray() == *other.ifArray();
        case Type::Float: return asFloat() == other.asFloat();
        case Type::Integer:
        case Type::UnsignedInteger: return asId() == other.asId();
        case Type::String: return *ifString() == *other.ifString();
    }
    return false;
}
bool Unstructured::operator!=(Unstructured const& other) const { return !(*this == other); }

Unstructured::Map Unstructured::removeEmptyValues(Map const& map) {
    Map kept;
    for (auto const& entry : map) {
        if (!isEmptyContainer(entry.second)) kept.emplace_hint(kept.end(), entry);
    }
    return kept;
}

}  // namespace tarn::engine
