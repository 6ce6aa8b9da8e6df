// Compares random trees with a simple model: construction, copies, comparison, conversions,
// filtering, nesting.

#include "model.h"

#include <Engine/Base/unstructured.h>

using namespace fuzz;
using tarn::engine::FloatVec2;
using tarn::engine::FloatVec3;
using tarn::engine::FloatVec4;
using tarn::engine::Unstructured;

namespace {

void checkReadings(Unstructured const& data, Tree const& tree) {
    check(holds(data, tree), "content");
    check(same(data.asFloat(), tree.asFloat()), "asFloat");
    check(data.asInteger() == tree.asInteger(), "asInteger");
    check(data.asId() == tree.asId(), "asId");
    check(data.asBool() == tree.asBool(), "asBool");
    check(data.asString() == tree.text, "asString");
    check(data.asMap().size() == tree.entries.size(), "asMap");
    check(data.asArray().size() == tree.elements.size(), "asArray");
    auto const v = tree.vector();
    FloatVec2 const v2 = data;
    FloatVec3 const v3 = data;
    FloatVec4 const v4 = data;
    check(same(v2.x, v[0]) && same(v2.y, v[1]), "vector of 2");
    check(same(v3.x, v[0]) && same(v3.y, v[1]) && same(v3.z, v[2]), "vector of 3");
    check(same(v4.x, v[0]) && same(v4.y, v[1]) && same(v4.z, v[2]) && same(v4.w, v[3]),
          "vector of 4");
}

void checkFilter(Unstructured const& data, Tree const& tree) {
    Tree kept;
    kept.kind = Tree::Map;
    for (auto const& [key, element] : tree.entries) {
        if (!element.isEmptyContainer()) kept.entries.emplace(key, element);
    }
    check(holds(Unstructured::removeEmptyValues(data.asMap()), kept), "removeEmptyValues");
}

// Nests the data in `levels` containers.
Unstructured nested(Unstructured data, std::size_t levels, bool arrays) {
    for (std::size_t i = 0; i < levels; ++i) {
        if (arrays) {
            Unstructured::Array array;
            array.push_back(std::move(data));
            data = std::move(array);
        } else {
            Unstructured::Map map;
            map.emplace("k", std::move(data));
            data = std::move(map);
        }
    }
    return data;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Input input(data, size);
    std::size_t const levels = input.chance() ? input.below(1000) : input.below(4);
    bool const arrays = input.chance();
    Tree const a = Tree::random(input, 5);
    Tree const b = Tree::random(input, 5);
    Unstructured first = a.build();
    Unstructured second = b.build();
    checkReadings(first, a);
    checkReadings(second, b);
    checkFilter(first, a);

    bool const equal = a.equals(b);
    check((first == second) == equal && (second == first) == equal, "equality");
    check((first != second) == !equal, "inequality");
    check((first == a.build()) == a.equals(a), "equality with a twin");

    Unstructured const deepFirst = nested(first, levels, arrays);
    Unstructured const deepSecond = nested(second, levels, arrays);
    check((deepFirst == deepSecond) == equal, "equality far down");
    check((deepFirst == Unstructured(deepFirst)) == a.equals(a), "equality of a deep copy");
    Unstructured const* inner = &deepFirst;
    for (std::size_t i = 0; i < levels; ++i) {
        inner = arrays ? &inner->ifArray()->front() : &inner->ifMap()->at("k");
    }
    check(holds(*inner, a), "content far down");

    Unstructured copy = deepSecond;
    copy = first;
    check(holds(copy, a), "assignment");
    Unstructured moved = std::move(copy);
    check(copy.type() == Unstructured::Type::Null && holds(moved, a), "move");
    // Assigns a part of a tree to the whole.
    if (auto const* array = first.ifArray(); array != nullptr && !array->empty()) {
        first = array->back();
        check(holds(first, a.elements.back()), "assignment from within");
    } else if (auto const* map = first.ifMap(); map != nullptr && !map->empty()) {
        first = map->begin()->second;
        check(holds(first, a.entries.begin()->second), "assignment from within");
    }
    std::swap(first, second);
    check(holds(first, b), "swap");
    return 0;
}
