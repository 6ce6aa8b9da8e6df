#include <Engine/Document/detail/identifiers.h>

#include <algorithm>
#include <string>
#include <unordered_set>
#include <utility>
#include <vector>

namespace tarn::engine::detail {

namespace {

using Id = unsigned long long;
using End = std::pair<Id, Id>;  // A patch and one of its ports.

std::vector<Port> const& portsOf(Patch const& patch, bool outputs) {
    return outputs ? elementsOf(patch.outputs, "outputs != nullptr")
                   : elementsOf(patch.inputs, "inputs != nullptr");
}
std::vector<Patch> const& childrenOf(Patch const& patch) {
    return elementsOf(patch.children, "children != nullptr");
}

// Calls `visit(patch)` for every patch, parents before children, until it returns false. `path` has
// the positions from the root to the patch.
class Walk {
public:
    template <class Visit>
    void over(Patch const& root, Visit visit) {
        if (!visit(root)) return;
        levels.emplace_back(&childrenOf(root), 0);
        while (!levels.empty()) {
            auto& [children, next] = levels.back();
            if (next == children->size()) {
                levels.pop_back();
                continue;
            }
            Patch const& child = (*children)[next++];
            if (!visit(child)) return;
            levels.emplace_back(&childrenOf(child), 0);
        }
    }

    // The JSON pointer of the last visited patch.
    std::string pointer() const {
        std::string result = "/root";
        for (auto const& [children, next] : levels) {
            result += "/children/" + std::to_string(next - 1);
        }
        return result;
    }

private:
    std::vector<std::pair<std::vector<Patch> const*, std::size_t>> levels;
};

// Whether the identifiers are distinct and not 0. Sorts them, unless they are in order as in most
// documents.
bool areUnique(std::vector<Id>& ids) {
    auto const isNotBefore = [](Id a, Id b) { return a >= b; };
    if (std::adjacent_find(ids.begin(), ids.end(), isNotBefore) != ids.end()) {
        std::sort(ids.begin(), ids.end());
    }
    return std::adjacent_find(ids.begin(), ids.end()) == ids.end() && (ids.empty() || ids[0] != 0);
}

// Finds the first identifier that is 0 or repeated.
class FirstFault {
public:
    DocumentError find(Patch const& root) {
        Walk walk;
        walk.over(root, [&](Patch const& patch) {
            if (!isNew(patches, patch.id, "patch", "/id")) return failedAt(walk);
            for (bool outputs : {false, true}) {
                std::size_t index = 0;
                for (Port const& port : portsOf(patch, outputs)) {
                    std::string const step =
                        (outputs ? "/outputs/" : "/inputs/") + std::to_string(index++) + "/id";
                    if (!isNew(ports, port.id, "port", step)) return failedAt(walk);
                }
            }
            return true;
        });
        return std::move(fault);
    }

private:
    bool isNew(std::unordered_set<Id>& used, Id id, char const* what, std::string const& step) {
        if (id == 0) {
            fault.message = "identifier 0 is reserved; identifiers start at 1";
        } else if (!used.insert(id).second) {
            fault.message =
                "the " + std::string(what) + " identifier " + std::to_string(id) + " is used twice";
        } else {
            return true;
        }
        fault.pointer = step;
        return false;
    }
    bool failedAt(Walk const& walk) {
        fault.pointer = walk.pointer() + fault.pointer;
        return false;
    }

    DocumentError fault;
    std::unordered_set<Id> patches;
    std::unordered_set<Id> ports;
};

// All ends that connections between the children may have.
std::vector<End> endsOf(Patch const& parent, bool outputs) {
    std::vector<End> ends;
    for (Patch const& child : childrenOf(parent)) {
        for (Port const& port : portsOf(child, outputs)) ends.emplace_back(child.id, port.id);
    }
    if (!std::is_sorted(ends.begin(), ends.end())) std::sort(ends.begin(), ends.end());
    return ends;
}

std::string missingEnd(Patch const& parent, End end, bool outputs) {
    for (Patch const& child : childrenOf(parent)) {
        if (child.id == end.first) {
            return "patch " + std::to_string(end.first) + " has no " +
                   (outputs ? "output" : "input") + " port " + std::to_string(end.second);
        }
    }
    return "there is no patch " + std::to_string(end.first) + " beside the connection";
}

// Whether every connection has valid ends; otherwise `fault` describes the first that has not.
bool connectionsAreRight(Patch const& patch, DocumentError& fault) {
    std::vector<Connection> const& connections =
        elementsOf(patch.connections, "connections != nullptr");
    if (connections.empty()) return true;
    std::vector<End> const outputs = endsOf(patch, true);
    std::vector<End> const inputs = endsOf(patch, false);
    for (std::size_t i = 0; i < connections.size(); ++i) {
        Connection const& connection = connections[i];
        for (bool isFrom : {true, false}) {
            End const end = isFrom ? End(connection.fromPatchId, connection.fromPortId)
                                   : End(connection.toPatchId, connection.toPortId);
            std::vector<End> const& ends = isFrom ? outputs : inputs;
            if (std::binary_search(ends.begin(), ends.end(), end)) continue;
            fault.pointer = "/connections/" + std::to_string(i) + (isFrom ? "/from" : "/to");
            fault.message = missingEnd(patch, end, isFrom);
            return false;
        }
    }
    return true;
}

}  // namespace

Optional<DocumentError> findWrongIdentifier(Patch const& root) {
    std::vector<Id> patches;
    std::vector<Id> ports;
    DocumentError fault;
    Walk walk;
    walk.over(root, [&](Patch const& patch) {
        patches.push_back(patch.id);
        for (bool outputs : {false, true}) {
            for (Port const& port : portsOf(patch, outputs)) ports.push_back(port.id);
        }
        if (fault.message.empty() && !connectionsAreRight(patch, fault)) {
            fault.pointer = walk.pointer() + fault.pointer;
        }
        return true;
    });
    if (!areUnique(patches) || !areUnique(ports)) return FirstFault().find(root);
    if (!fault.message.empty()) return fault;
    return std::nullopt;
}

}  // namespace tarn::engine::detail
