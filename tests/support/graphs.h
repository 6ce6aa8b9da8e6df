// tests/support/graphs.h: short constructors for graphs, and random graphs.

#ifndef TARN_TESTS_SUPPORT_GRAPHS_H
#define TARN_TESTS_SUPPORT_GRAPHS_H

#include <Engine/Base/patch.h>
#include <Engine/Base/path.h>

#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace tests {

using tarn::engine::Array;
using tarn::engine::arrayOf;
using tarn::engine::Connection;
using tarn::engine::FloatVec4;
using tarn::engine::Patch;
using tarn::engine::Path;
using tarn::engine::Port;
using tarn::engine::Type;

inline Port port(unsigned long long id, unsigned long long tag = 0) {
    Port result;
    result.id = id;
    result.tag = tag;
    result.name = "p" + std::to_string(id);
    return result;
}

inline Patch patch(unsigned long long id, std::vector<Patch> children = {},
                   std::vector<Connection> connections = {}) {
    Patch result;
    result.id = id;
    result.name = "n" + std::to_string(id);
    result.children = arrayOf(std::move(children));
    result.connections = arrayOf(std::move(connections));
    return result;
}

inline Patch withPorts(Patch base, std::vector<Port> inputs, std::vector<Port> outputs) {
    base.inputs = arrayOf(std::move(inputs));
    base.outputs = arrayOf(std::move(outputs));
    return base;
}

// Three levels, with everything that the debug output prints.
inline Patch sampleDocument() {
    Port number = port(11, 1);
    number.name = "";
    number.defaultValue = 2.5;
    Port text = port(12, 2);
    text.typeInfo.type = Type::String;
    text.defaultValue = "a text";
    Port color = port(13);
    color.typeInfo.type = Type::Vec4;
    color.defaultValue = FloatVec4{1, 0.5, 0, 1};
    Port shape = port(21, 7);
    shape.typeInfo.type = Type::Path;
    shape.defaultValue = Path();
    Patch const leaf = withPorts(patch(4), {number}, {});
    Patch const bare = patch(5);
    Patch const middle =
        withPorts(patch(2, {leaf, bare}, {{4, 11, 5, 99}}), {text, color}, {shape});
    Patch root = patch(1, {middle, patch(3)}, {{2, 21, 3, 31}, {2, 21, 2, 12}});
    root.builtin = 77;
    root.descriptor = "not printed";
    return root;
}

// A random tree with few identifiers, so that they repeat often. `Source` returns numbers below a
// bound, as `Random` does.
template <class Source>
Patch randomPatch(Source& random, int depth) {
    auto const ports = [&] {
        std::vector<Port> list;
        for (std::size_t n = random.below(3); n > 0; --n) {
            list.push_back(port(random.below(12), random.below(3)));
        }
        return list;
    };
    Patch result = withPorts(patch(random.below(12)), ports(), ports());
    std::vector<Connection> connections;
    for (std::size_t n = random.below(random.below(8) == 0 ? 60 : 5); n > 0; --n) {
        connections.push_back(
            {random.below(4), random.below(12), random.below(4), random.below(12)});
    }
    result.connections = arrayOf(std::move(connections));
    std::vector<Patch> children;
    for (std::size_t n = depth > 0 ? random.below(4) : 0; n > 0; --n) {
        children.push_back(random.below(4) == 0 && !children.empty()
                               ? children.back()  // Shares all its lists.
                               : randomPatch(random, depth - 1));
    }
    result.children = arrayOf(std::move(children));
    return result;
}

}  // namespace tests

#endif
