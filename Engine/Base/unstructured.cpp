#include <Engine/Base/unstructured.h>

#include <Engine/Base/truncate.h>

#include <boost/variant/get.hpp>

#include <algorithm>
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

// Numbers, the most of what arrays hold, are compared without a call.
bool elementsEqual(Unstructured const& a, Unstructured const& b) {
    bool const numbers = a.type() == Unstructured::Type::Float && b.type() == a.type();
    return numbers ? a.asFloat() == b.asFloat() : a == b;
}

bool mapsEqual(Unstructured::Map const& a, Unstructured::Map const& b) {
    return a.size() == b.size() &&
           std::equal(a.begin(), a.end(), b.begin(), [](auto const& x, auto const& y) {
               return x.first == y.first && elementsEqual(x.second, y.second);
           });
}

bool arraysEqual(Unstructured::Array const& a, Unstructured::Array const& b) {
    return a.size() == b.size() && std::equal(a.begin(), a.end(), b.begin(), elementsEqual);
}

bool isEmptyContainer(Unstructured const& tree) {
    if (auto const* map = tree.ifMap()) return map->empty();
    if (auto const* array = tree.ifArray()) return array->empty();
    if (auto const* text = tree.ifString()) return text->empty();
    return false;
}

}  // namespace

Unstructured::Unstructured(Map const& map) : storage(new Map(map)) {}
Unstructured::Unstructured(Map&& map) : storage(new Map(std::move(map))) {}
Unstructured::Unstructured(Array const& array) : storage(new Array(array)) {}
Unstructured::Unstructured(Array&& array) : storage(new Array(std::move(array))) {}
Unstructured::Unstructured(std::string const& text) : storage(new std::string(text)) {}
Unstructured::Unstructured(std::string&& text) : storage(new std::string(std::move(text))) {}
Unstructured::Unstructured(char const* text)
    : storage(new std::string(text == nullptr ? "" : text)) {}
Unstructured::Unstructured(Value const& value) : Unstructured(value.asUnstructured()) {}

Unstructured& Unstructured::operator=(Unstructured const& other) {
    return *this = Unstructured(other);
}
Unstructured& Unstructured::operator=(Unstructured&& other) noexcept {
    // First out of `other`, which may be this or a part of it.
    Unstructured taken(std::move(other));
    if (ownsContent()) destroyContent();
    ::new (static_cast<void*>(&storage)) Storage(taken.storage);
    taken.forget();
    return *this;
}

Unstructured::Storage Unstructured::copiedContent() const {
    switch (type()) {
        case Type::Map: return new Map(*ifMap());
        case Type::Array: return new Array(*ifArray());
        case Type::String: return new std::string(*ifString());
        case Type::Null:
        case Type::Float:
        case Type::Integer:
        case Type::UnsignedInteger: break;
    }
    return storage;
}

void Unstructured::destroyContent() noexcept {
    switch (type()) {
        case Type::Map: delete ifMap(); break;
        case Type::Array: delete ifArray(); break;
        case Type::String: delete ifString(); break;
        case Type::Null:
        case Type::Float:
        case Type::Integer:
        case Type::UnsignedInteger: break;
    }
}

Unstructured::Map Unstructured::asMap() const { return ifMap() ? *ifMap() : Map(); }
Unstructured::Array Unstructured::asArray() const { return ifArray() ? *ifArray() : Array(); }
std::string Unstructured::asString() const { return ifString() ? *ifString() : std::string(); }

long long Unstructured::asInteger() const {
    if (auto const* integer = boost::get<long long>(&storage)) return *integer;
    if (auto const* number = boost::get<double>(&storage)) return truncate<long long>(*number);
    return 0;
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
        case Type::Map: return mapsEqual(*ifMap(), *other.ifMap());
        case Type::Array: return arraysEqual(*ifArray(), *other.ifArray());
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
