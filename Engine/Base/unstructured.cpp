#include <Engine/Base/unstructured.h>

#include <Engine/Base/detail/truncate.h>

#include <boost/variant/get.hpp>

#include <algorithm>
#include <array>
#include <cmath>
#include <iterator>
#include <ostream>
#include <string_view>

namespace tarn::engine {

namespace {

// Trees up to this depth are handled recursively, with some hundred bytes of stack a level.
constexpr std::uint32_t kDeepestRecursion = 256;

Unstructured const& elementOf(Unstructured const& element) { return element; }
Unstructured const& elementOf(Unstructured::Map::value_type const& entry) { return entry.second; }

constexpr std::array<char const*, 4> kComponentKeys{"X", "Y", "Z", "W"};

// Indexed by enumerator.
constexpr std::array<std::string_view, 7> kKindNames{
    "null", "map", "array", "float", "integer", "unsigned integer", "string"};
static_assert(kKindNames.size() == std::size_t(Unstructured::Type::String) + 1);

// Component `i` of the vector that `tree` converts to.
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

Unstructured::Unstructured(Map const& map) : storage(makeStorage(Map(map))) {}
Unstructured::Unstructured(Map&& map) : storage(makeStorage(std::move(map))) {}
Unstructured::Unstructured(Array const& array) : storage(makeStorage(Array(array))) {}
Unstructured::Unstructured(Array&& array) : storage(makeStorage(std::move(array))) {}
Unstructured::Unstructured(std::string const& text) : storage(new std::string(text)) {}
Unstructured::Unstructured(std::string&& text) : storage(new std::string(std::move(text))) {}
Unstructured::Unstructured(char const* text)
    : storage(new std::string(text == nullptr ? "" : text)) {}
Unstructured::Unstructured(Value const& value) : Unstructured(value.asUnstructured()) {}

Unstructured& Unstructured::operator=(Unstructured const& other) {
    return *this = Unstructured(other);
}
Unstructured& Unstructured::operator=(Unstructured&& other) noexcept {
    // Moved out first: `other` may be this value or a part of it.
    Unstructured taken(std::move(other));
    if (ownsContent()) destroyContent();
    ::new (static_cast<void*>(&storage)) Storage(taken.storage);
    taken.forget();
    return *this;
}

std::uint32_t Unstructured::height() const {
    if (Node<Map> const* map = node<Map>()) return map->height;
    if (Node<Array> const* array = node<Array>()) return array->height;
    return 0;
}

bool Unstructured::isDeep() const { return height() > kDeepestRecursion; }

template <class T>
Unstructured::Storage Unstructured::makeStorage(T&& content) {
    std::uint32_t levels = 0;
    for (auto const& element : content) {
        Unstructured const& tree = elementOf(element);
        if (tree.ownsContent()) levels = std::max(levels, tree.height());
    }
    levels = std::max(levels, levels + 1);  // Saturates.
    return new Node<T>{std::forward<T>(content), levels};
}

template <class T>
Unstructured::Storage Unstructured::copyStorage(Node<T> const& node) {
    return new Node<T>{node.content, node.height};
}

Unstructured::Storage Unstructured::copiedContent() const {
    if (isDeep()) {
        Unstructured copy;
        copyDeep(*this, copy);
        Storage taken = copy.storage;
        copy.forget();
        return taken;
    }
    switch (type()) {
        case Type::Map: return copyStorage(*node<Map>());
        case Type::Array: return copyStorage(*node<Array>());
        case Type::String: return new std::string(*ifString());
        case Type::Null:
        case Type::Float:
        case Type::Integer:
        case Type::UnsignedInteger: break;
    }
    return storage;
}

// Copies a deep tree container by container: each copy has null in place of its deep elements,
// which are copied later. When an allocation fails, the copy so far is a valid tree.
void Unstructured::copyDeep(Unstructured const& from, Unstructured& to) {
    std::vector<std::pair<Unstructured const*, Unstructured*>> waiting{{&from, &to}};
    auto const put = [&waiting](Unstructured const& element, Unstructured& place) {
        if (element.isDeep()) {
            waiting.emplace_back(&element, &place);
        } else {
            place = element;
        }
    };
    while (!waiting.empty()) {
        auto const [source, target] = waiting.back();
        waiting.pop_back();
        if (Node<Array> const* array = source->node<Array>()) {
            auto* const copy = new Node<Array>{Array(), array->height};
            ::new (static_cast<void*>(&target->storage)) Storage(copy);
            copy->content.resize(array->content.size());
            for (std::size_t i = 0; i < array->content.size(); ++i) {
                put(array->content[i], copy->content[i]);
            }
        } else {
            Node<Map> const* const map = source->node<Map>();
            auto* const copy = new Node<Map>{Map(), map->height};
            ::new (static_cast<void*>(&target->storage)) Storage(copy);
            for (auto const& [key, element] : map->content) {
                put(element, copy->content.try_emplace(copy->content.end(), key)->second);
            }
        }
    }
}

// Doubles, the most frequent elements, are compared without a function call. Not by `type()` and
// `asFloat()`: each of them would test the variant's index again.
inline bool Unstructured::equalElements(Unstructured const& a, Unstructured const& b) {
    double const* const x = boost::get<double>(&a.storage);
    double const* const y = boost::get<double>(&b.storage);
    return x != nullptr && y != nullptr ? *x == *y : a == b;
}

inline bool Unstructured::equalMaps(Map const& a, Map const& b) {
    return a.size() == b.size() &&
           std::equal(a.begin(), a.end(), b.begin(), [](auto const& x, auto const& y) {
               return x.first == y.first && equalElements(x.second, y.second);
           });
}

inline bool Unstructured::equalArrays(Array const& a, Array const& b) {
    return a.size() == b.size() && std::equal(a.begin(), a.end(), b.begin(), equalElements);
}

// For two containers of the same kind, at least one of them deep.
bool Unstructured::equalDeep(Unstructured const& a, Unstructured const& b) {
    std::vector<std::pair<Unstructured const*, Unstructured const*>> waiting{{&a, &b}};
    auto const differ = [&waiting](Unstructured const& x, Unstructured const& y) {
        if (x.type() != y.type() || !x.isDeep() || !y.isDeep()) return x != y;
        waiting.emplace_back(&x, &y);
        return false;
    };
    while (!waiting.empty()) {
        auto const [x, y] = waiting.back();
        waiting.pop_back();
        if (Array const* array = x->ifArray()) {
            Array const& other = *y->ifArray();
            if (array->size() != other.size()) return false;
            for (std::size_t i = 0; i < array->size(); ++i) {
                if (differ((*array)[i], other[i])) return false;
            }
        } else {
            Map const& other = *y->ifMap();
            if (x->ifMap()->size() != other.size()) return false;
            auto entry = other.begin();
            for (auto const& [key, element] : *x->ifMap()) {
                if (key != entry->first || differ(element, entry->second)) return false;
                ++entry;
            }
        }
    }
    return true;
}

Unstructured* Unstructured::lastElement() const {
    if (Node<Array>* array = node<Array>()) {
        return array->content.empty() ? nullptr : &array->content.back();
    }
    Map& map = node<Map>()->content;
    return map.empty() ? nullptr : &std::prev(map.end())->second;
}

void Unstructured::dropLastElement() {
    if (Node<Array>* array = node<Array>()) {
        array->content.pop_back();
    } else {
        Map& map = node<Map>()->content;
        map.erase(std::prev(map.end()));
    }
}

// Removes every element of a deep container without recursion and without allocating: on the way
// down, each container's last element stores the container above it.
void Unstructured::emptyDeep() noexcept {
    Unstructured current;
    std::swap(current.storage, storage);
    Unstructured above;
    for (;;) {
        Unstructured* const last = current.lastElement();
        if (last != nullptr && !last->isDeep()) {
            current.dropLastElement();
        } else if (last != nullptr) {
            Unstructured below(std::move(*last));
            *last = std::move(above);
            above = std::move(current);
            current = std::move(below);
        } else if (above.type() == Type::Null) {
            break;
        } else {
            delete current.node<Map>();
            delete current.node<Array>();
            current.forget();
            current = std::move(above);
            Unstructured* const link = current.lastElement();
            above = std::move(*link);
            current.dropLastElement();
        }
    }
    storage = current.storage;
    current.forget();
}

void Unstructured::destroyContent() noexcept {
    if (isDeep()) emptyDeep();
    switch (type()) {
        case Type::Map: delete node<Map>(); break;
        case Type::Array: delete node<Array>(); break;
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
    if (auto const* number = boost::get<double>(&storage))
        return detail::truncate<long long>(*number);
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
        return detail::truncate<unsigned long long>(*number);
    }
    return 0;
}

std::size_t Unstructured::size() const noexcept {
    if (Map const* map = ifMap()) return map->size();
    if (Array const* array = ifArray()) return array->size();
    return 0;
}

Unstructured const* Unstructured::find(std::string const& key) const noexcept {
    Map const* const map = ifMap();
    if (map == nullptr) return nullptr;
    auto const entry = map->find(key);
    return entry == map->end() ? nullptr : &entry->second;
}

Unstructured const* Unstructured::find(std::size_t position) const noexcept {
    Array const* const array = ifArray();
    return array != nullptr && position < array->size() ? &(*array)[position] : nullptr;
}

Unstructured const* Unstructured::find(Steps path) const noexcept {
    Unstructured const* found = this;
    for (Step const& step : path) {
        found = step.isKey ? found->find(step.key) : found->find(step.position);
        if (found == nullptr) break;
    }
    return found;
}

// The value at the end of the path if it is of the kind, else null.
Unstructured const* Unstructured::findOfKind(Steps path, bool (*isKind)(Unstructured const&),
                                             Lookup* lookup) const noexcept {
    Unstructured const* const found = find(path);
    Lookup const outcome = found == nullptr ? Lookup::Missing
                           : isKind(*found) ? Lookup::Found
                                            : Lookup::WrongKind;
    if (lookup != nullptr) *lookup = outcome;
    return outcome == Lookup::Found ? found : nullptr;
}

double Unstructured::numberAt(Steps path, double otherwise, Lookup* lookup) const noexcept {
    auto const isKind = [](Unstructured const& data) { return data.isNumber(); };
    Unstructured const* const found = findOfKind(path, isKind, lookup);
    return found ? found->asFloat() : otherwise;
}

long long Unstructured::integerAt(Steps path, long long otherwise, Lookup* lookup) const noexcept {
    auto const isKind = [](Unstructured const& data) {
        constexpr double kTwo63 = 9223372036854775808.0;
        double const number = data.asFloat();
        return data.type() == Type::Integer ||
               (data.type() == Type::Float && number == std::trunc(number) && number >= -kTwo63 &&
                number < kTwo63);
    };
    Unstructured const* const found = findOfKind(path, isKind, lookup);
    return found ? found->asInteger() : otherwise;
}

bool Unstructured::boolAt(Steps path, bool otherwise, Lookup* lookup) const noexcept {
    auto const isKind = [](Unstructured const& data) {
        return data.type() == Type::Integer && (data.asInteger() == 0 || data.asInteger() == 1);
    };
    Unstructured const* const found = findOfKind(path, isKind, lookup);
    return found ? found->asBool() : otherwise;
}

std::string Unstructured::stringAt(Steps path, std::string otherwise, Lookup* lookup) const {
    auto const isKind = [](Unstructured const& data) { return data.isString(); };
    Unstructured const* const found = findOfKind(path, isKind, lookup);
    std::string const* const text = found ? found->ifString() : nullptr;
    return text ? *text : otherwise;
}

Unstructured::operator FloatVec2() const { return {component(*this, 0), component(*this, 1)}; }
Unstructured::operator FloatVec3() const {
    return {component(*this, 0), component(*this, 1), component(*this, 2)};
}
Unstructured::operator FloatVec4() const {
    return {component(*this, 0), component(*this, 1), component(*this, 2), component(*this, 3)};
}

bool Unstructured::operator==(Unstructured const& other) const {
    // Not by `type()`, which is narrower: from equal indices the compiler knows the alternative
    // that it reads from `other`.
    if (storage.which() != other.storage.which()) return false;
    if (auto const* text = ifString()) return *text == *other.ifString();
    if (auto const* integer = boost::get<long long>(&storage)) {
        return *integer == *boost::get<long long>(&other.storage);
    }
    if (auto const* integer = boost::get<unsigned long long>(&storage)) {
        return *integer == *boost::get<unsigned long long>(&other.storage);
    }
    if (auto const* number = boost::get<double>(&storage)) {
        return *number == *boost::get<double>(&other.storage);
    }
    auto const areDeep = [](auto const& a, auto const& b) {
        return a.height > kDeepestRecursion && b.height > kDeepestRecursion;
    };
    if (Node<Map> const* map = node<Map>()) {
        Node<Map> const& otherMap = *other.node<Map>();
        return areDeep(*map, otherMap) ? equalDeep(*this, other)
                                       : equalMaps(map->content, otherMap.content);
    }
    if (Node<Array> const* array = node<Array>()) {
        Node<Array> const& otherArray = *other.node<Array>();
        return areDeep(*array, otherArray) ? equalDeep(*this, other)
                                           : equalArrays(array->content, otherArray.content);
    }
    return true;  // Both are null.
}
bool Unstructured::operator!=(Unstructured const& other) const { return !(*this == other); }

Unstructured::Map Unstructured::removeEmptyValues(Map const& map) {
    Map kept;
    for (auto const& entry : map) {
        if (!isEmptyContainer(entry.second)) kept.emplace_hint(kept.end(), entry);
    }
    return kept;
}

std::string to_string(Unstructured::Type kind) {
    if (std::size_t(kind) >= kKindNames.size()) {
        return "Unstructured::Type(" + std::to_string(int(kind)) + ")";
    }
    return std::string(kKindNames[std::size_t(kind)]);
}

std::ostream& operator<<(std::ostream& stream, Unstructured::Type kind) {
    return stream << to_string(kind);
}

}  // namespace tarn::engine
