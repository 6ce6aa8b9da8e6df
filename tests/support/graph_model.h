// tests/support/graph_model.h: a model of the queries that searches everything.

#ifndef TARN_TESTS_SUPPORT_GRAPH_MODEL_H
#define TARN_TESTS_SUPPORT_GRAPH_MODEL_H

#include "support/graphs.h"

#include <algorithm>
#include <iterator>
#include <unordered_set>
#include <vector>

namespace tests {

// All patches of the tree in search order, by an explicit stack.
template <class AnyPatch>
std::vector<AnyPatch const*> searchOrder(AnyPatch const& root) {
    std::vector<AnyPatch const*> order{&root};
    std::vector<AnyPatch const*> toEnter{&root};
    while (!toEnter.empty()) {
        AnyPatch const* const next = toEnter.back();
        toEnter.pop_back();
        for (AnyPatch const& child : *next->children) order.push_back(&child);
        for (auto child = next->children->rbegin(); child != next->children->rend(); ++child) {
            toEnter.push_back(&*child);
        }
    }
    return order;
}

// The patch whose children contain the object itself.
template <class AnyPatch>
AnyPatch const* modelParent(AnyPatch const& root, AnyPatch const* wanted) {
    for (AnyPatch const* candidate : searchOrder(root)) {
        for (AnyPatch const& child : *candidate->children) {
            if (&child == wanted) return candidate;
        }
    }
    return nullptr;
}

struct Found {
    Port const* port = nullptr;
    Patch const* owner = nullptr;
};

inline Found modelPort(Patch const& root, Array<Port> Patch::*ports, unsigned long long id) {
    for (Patch const* candidate : searchOrder(root)) {
        for (Port const& port : *(candidate->*ports)) {
            if (port.id == id) return {&port, candidate};
        }
    }
    return {};
}

inline Patch const* modelOwner(Patch const& root, unsigned long long id) {
    for (Patch const* candidate : searchOrder(root)) {
        for (auto const& list : {candidate->inputs, candidate->outputs}) {
            for (Port const& port : *list) {
                if (port.id == id) return candidate;
            }
        }
    }
    return nullptr;
}

template <class AnyPatch>
AnyPatch const* modelFind(AnyPatch const& root, unsigned long long id) {
    for (AnyPatch const* candidate : searchOrder(root)) {
        if (id != 0 && candidate->id == id) return candidate;
    }
    return nullptr;
}

// The parents in the order in which a search for an output port visits them: depth first.
inline std::vector<Patch const*> depthFirst(Patch const& root) {
    std::vector<Patch const*> order;
    std::vector<Patch const*> stack{&root};
    while (!stack.empty()) {
        Patch const* const next = stack.back();
        stack.pop_back();
        order.push_back(next);
        for (auto child = next->children->rbegin(); child != next->children->rend(); ++child) {
            stack.push_back(&*child);
        }
    }
    return order;
}

inline tarn::engine::Optional<std::unordered_set<Connection>>
modelOutgoing(Patch const& root, unsigned long long portId) {
    for (Patch const* parent : depthFirst(root)) {
        bool const holds = std::any_of(
            parent->children->begin(), parent->children->end(), [&](Patch const& child) {
                return std::any_of(child.outputs->begin(), child.outputs->end(),
                                   [&](Port const& p) { return p.id == portId; });
            });
        if (!holds) continue;
        std::unordered_set<Connection> found;
        std::copy_if(parent->connections->begin(), parent->connections->end(),
                     std::inserter(found, found.end()),
                     [&](Connection const& c) { return c.fromPortId == portId; });
        return found;
    }
    return std::nullopt;
}

}  // namespace tests

#endif
