#include "bench.h"

#include <Engine/Base/patch.h>
#include <Engine/Base/patch_index.h>

#include <memory>
#include <ostream>
#include <streambuf>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

using namespace tarn::engine;

namespace {

constexpr std::size_t kChildren = 10;

Port port(unsigned long long id, unsigned long long tag) {
    Port result;
    result.id = id;
    result.tag = tag;
    result.name = "port";
    result.defaultValue = static_cast<double>(id);
    return result;
}

// A tree in which every inner patch has ten children, each with an input, an output and a
// connection to the next.
Patch tree(std::size_t size, unsigned long long& next) {
    Patch patch;
    patch.id = ++next;
    patch.name = "patch " + std::to_string(patch.id);
    patch.inputs = arrayOf<Port>({port(patch.id * 2, 1)});
    patch.outputs = arrayOf<Port>({port(patch.id * 2 + 1, 1)});
    std::vector<Patch> children;
    std::size_t rest = size - 1;
    for (std::size_t i = 0; i < kChildren && rest > 0; ++i) {
        std::size_t const share = (rest + kChildren - 1 - i) / (kChildren - i);
        children.push_back(tree(share, next));
        rest -= share;
    }
    std::vector<Connection> connections;
    for (std::size_t i = 1; i < children.size(); ++i) {
        unsigned long long const from = children[i - 1].id;
        unsigned long long const to = children[i].id;
        connections.push_back({from, from * 2 + 1, to, to * 2});
    }
    patch.children = arrayOf(std::move(children));
    patch.connections = arrayOf(std::move(connections));
    return patch;
}

Patch tree(std::size_t size) {
    unsigned long long next = 0;
    return tree(size, next);
}

// The same data in flat arrays, without sharing or nesting.
struct Flat {
    struct Item {
        unsigned long long id;
        unsigned long long parent;
        std::string name;
    };
    struct FlatPort {
        unsigned long long id;
        unsigned long long tag;
        std::string name;
        double value;
    };
    std::vector<Item> patches;
    std::vector<FlatPort> inputs;
    std::vector<FlatPort> outputs;
    std::vector<Connection> connections;
};

void flatten(Patch const& patch, unsigned long long parent, Flat& flat) {
    flat.patches.push_back({patch.id, parent, patch.name});
    for (Port const& p : *patch.inputs) {
        flat.inputs.push_back({p.id, p.tag, p.name, double(p.defaultValue)});
    }
    for (Port const& p : *patch.outputs) {
        flat.outputs.push_back({p.id, p.tag, p.name, double(p.defaultValue)});
    }
    flat.connections.insert(flat.connections.end(), patch.connections->begin(),
                            patch.connections->end());
    for (Patch const& child : *patch.children) flatten(child, patch.id, flat);
}

struct NullBuffer : std::streambuf {
    std::streamsize xsputn(char const*, std::streamsize n) override { return n; }
    int overflow(int c) override { return c; }
};

bool flatEqual(Flat const& a, Flat const& b) {
    auto const samePorts = [](auto const& x, auto const& y) {
        for (std::size_t i = 0; i < x.size(); ++i) {
            if (x[i].id != y[i].id || x[i].tag != y[i].tag || x[i].name != y[i].name ||
                x[i].value != y[i].value) {
                return false;
            }
        }
        return true;
    };
    for (std::size_t i = 0; i < a.patches.size(); ++i) {
        if (a.patches[i].id != b.patches[i].id || a.patches[i].parent != b.patches[i].parent ||
            a.patches[i].name != b.patches[i].name) {
            return false;
        }
    }
    return samePorts(a.inputs, b.inputs) && samePorts(a.outputs, b.outputs) &&
           a.connections == b.connections;
}

void flatText(Flat const& flat, std::ostream& stream) {
    auto const ports = [&](auto const& list) {
        for (auto const& p : list) {
            stream << "  [" << p.name << ":" << p.id << " tag: " << p.tag
                   << " typeInfo: [type: float] defaultValue: " << to_string(Value(p.value)) << "]"
                   << std::endl;
        }
    };
    for (auto const& p : flat.patches) {
        stream << "[patch:" << p.id << " name: " << p.name << " builtin: " << 0 << std::endl;
    }
    ports(flat.inputs);
    ports(flat.outputs);
    for (Connection const& c : flat.connections) {
        stream << "[connection:" << c.fromPortId << "->" << c.toPortId << "]" << std::endl;
    }
}

Flat flatOf(Patch const& root) {
    Flat flat;
    flatten(root, 0, flat);
    return flat;
}

// A straightforward index with the same results.
struct Maps {
    using Id = unsigned long long;
    std::unordered_map<Id, std::pair<Patch const*, Patch const*>> patches;
    std::unordered_map<Id, std::pair<Port const*, Patch const*>> inputs;
    std::unordered_map<Id, std::pair<Port const*, Patch const*>> outputs;
    std::unordered_map<Id, Connection const*> toPort;
    std::unordered_map<Id, std::vector<Connection const*>> fromPort;
    std::unordered_map<Id, std::vector<Connection const*>> toPatch;
    std::unordered_map<Id, std::vector<Connection const*>> fromPatch;

    void add(Patch const& patch, Patch const* parent) {
        patches.emplace(patch.id, std::pair(&patch, parent));
        for (Port const& p : *patch.inputs) inputs.emplace(p.id, std::pair(&p, &patch));
        for (Port const& p : *patch.outputs) outputs.emplace(p.id, std::pair(&p, &patch));
        for (Connection const& c : *patch.connections) {
            toPort.emplace(c.toPortId, &c);
            fromPort[c.fromPortId].push_back(&c);
            toPatch[c.toPatchId].push_back(&c);
            fromPatch[c.fromPatchId].push_back(&c);
        }
        for (Patch const& child : *patch.children) add(child, &patch);
    }
};

Maps mapsOf(Patch const& root) {
    Maps maps;
    maps.add(root, nullptr);
    return maps;
}

// The inputs of the measurements: a graph and its flat form.
struct Inputs {
    explicit Inputs(std::size_t patches) : size(patches) {}

    template <class Work>
    bench::Implementation graph(Work work) const {
        return bench::on([size = size] { return tree(size); }, work);
    }
    template <class Work>
    bench::Implementation flat(Work work) const {
        return bench::on([size = size] { return flatOf(tree(size)); }, work);
    }
    bench::Operation& operation(std::string const& name) const {
        return bench::operation(name + ", " + bench::grouped(size) + " patches");
    }

    std::size_t size;
};

void wholeGraphs(Inputs const& in) {
    std::size_t const size = in.size;
    bench::agreement(
        [size] { bench::agree(flatOf(tree(size)).patches.size() == size, "the size of a tree"); });
    auto const pair = [size] { return std::pair(tree(size), tree(size)); };
    auto const flatPair = [pair] {
        auto const [a, b] = pair();
        return std::pair(flatOf(a), flatOf(b));
    };
    in.operation("== unshared")
        .ours(bench::on(pair, [](auto const& both) { return both.first == both.second; }))
        .peer("flat arrays", bench::on(flatPair, [](auto const& both) {
                  return flatEqual(both.first, both.second);
              }));
    in.operation("convert for evaluation")
        .ours(in.graph([](Patch const& root) { return EvalPatch(root); }))
        .peer("flat arrays", in.flat([](Flat const& flat) { return flat; }));
    in.operation("debug output")
        .ours(in.graph([](Patch const& root) {
            NullBuffer buffer;
            std::ostream stream(&buffer);
            stream << root;
            return stream.good();
        }))
        .peer("flat arrays", in.flat([](Flat const& flat) {
            NullBuffer buffer;
            std::ostream stream(&buffer);
            flatText(flat, stream);
            return stream.good();
        }));
    in.operation("memory")
        .inBytes()
        .ours(bench::bytes([size] {
            double const before = bench::heapBytes();
            Patch const root = tree(size);
            return bench::heapBytes() - before;
        }))
        .peer("flat arrays", bench::bytes([size] {
                  Patch const root = tree(size);
                  Flat const flat = flatOf(root);
                  double const before = bench::heapBytes();
                  Flat const copy = flat;
                  return bench::heapBytes() - before;
              }));
}

void queries(Inputs const& in) {
    std::size_t const size = in.size;
    in.operation("findPatchRecursive, last patch")
        .ours(in.graph([size](Patch const& root) { return findPatchRecursive(root, size); }))
        .peer("flat arrays", in.flat([size](Flat const& flat) {
            for (auto const& item : flat.patches) {
                if (item.id == size) return &item;
            }
            return static_cast<Flat::Item const*>(nullptr);
        }));
    unsigned long long const port = (size - 1) * 2 + 1;
    in.operation("findOutgoingConnectionsFromPort, deep port")
        .ours(in.graph(
            [port](Patch const& root) { return findOutgoingConnectionsFromPort(root, port); }))
        .peer("flat arrays", in.flat([port](Flat const& flat) {
            std::vector<Connection> found;
            for (auto const& c : flat.connections) {
                if (c.fromPortId == port) found.push_back(c);
            }
            return found;
        }));
}

void indexes(Inputs const& in) {
    std::size_t const size = in.size;
    std::string const maps = "std::unordered_map";
    auto const bytes = [size](auto build) {
        return bench::bytes([size, build] {
            Patch const root = tree(size);
            double const before = bench::heapBytes();
            auto const index = build(root);
            return bench::heapBytes() - before;
        });
    };
    auto const build = [](Patch const& root) { return PatchIndex(root); };
    in.operation("build an index").ours(in.graph(build)).peer(maps, in.graph(mapsOf)).atMost(0.5);
    in.operation("memory of an index")
        .inBytes()
        .ours(bytes(build))
        .peer(maps, bytes(mapsOf))
        .atMost(0.6);
    // Looks up identifiers spread over the tree.
    auto const lookups = [size](auto const& make, auto const& lookUp) {
        return bench::on(
            [size, make] {
                auto root = std::make_unique<Patch const>(tree(size));
                auto index = make(*root);
                return std::pair(std::move(root), std::move(index));
            },
            [size, lookUp](auto const& made) {
                std::size_t sum = 0;
                for (std::size_t n = 0; n < 1000; ++n) {
                    sum += lookUp(made.second, n * 7919 % size + 1);
                }
                return sum;
            });
    };
    in.operation("1,000 lookups of patches")
        .ours(lookups(build,
                      [](PatchIndex const& index, std::size_t id) {
                          return reinterpret_cast<std::size_t>(index.findPatch(id));
                      }))
        .peer(maps, lookups(mapsOf, [](Maps const& index, std::size_t id) {
                  return reinterpret_cast<std::size_t>(index.patches.find(id)->second.first);
              }));
    in.operation("1,000 lookups of connections")
        .ours(lookups(build,
                      [](PatchIndex const& index, std::size_t id) {
                          return index.outgoingConnections(id * 2 + 1).size();
                      }))
        .peer(maps, lookups(mapsOf, [](Maps const& index, std::size_t id) {
                  auto const found = index.fromPort.find(id * 2 + 1);
                  return found == index.fromPort.end() ? 0 : found->second.size();
              }));
}

}  // namespace

void bench::graphs() {
    for (std::size_t const size : {1000u, 10000u, 100000u}) {
        Inputs const in(size);
        wholeGraphs(in);
        queries(in);
        indexes(in);
    }
    Inputs const middle(10000);
    middle.operation("== unshared").quick();
    middle.operation("convert for evaluation").quick();
    middle.operation("memory").quick();
    Inputs const large(100000);
    large.operation("findPatchRecursive, last patch").atMost(40.0).quick();
    large.operation("findOutgoingConnectionsFromPort, deep port").quick();
    large.operation("build an index").quick();
    large.operation("1,000 lookups of connections").quick();
}
