#include "bench.h"

#include <Engine/Base/patch.h>
#include <Engine/Base/patch_index.h>

#include <malloc.h>

#include <ostream>
#include <streambuf>
#include <string>
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

// A tree in which every patch but the leaves has ten children, each with an input, an output and a
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

// The same data in flat arrays, as nobody shares or nests them.
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

void forSize(std::size_t size) {
    static std::vector<std::unique_ptr<Patch>> trees;
    static std::vector<std::unique_ptr<Flat>> flats;
    auto const keepTree = [](Patch patch) -> Patch const& {
        trees.push_back(std::make_unique<Patch>(std::move(patch)));
        return *trees.back();
    };
    Patch const& root = keepTree(tree(size));
    Patch const& twin = keepTree(tree(size));
    auto const keepFlat = [](Patch const& patch) -> Flat const& {
        flats.push_back(std::make_unique<Flat>());
        flatten(patch, 0, *flats.back());
        return *flats.back();
    };
    Flat const& flat = keepFlat(root);
    Flat const& flatTwin = keepFlat(root);
    bench::agree(flat.patches.size() == size, "the size of a tree");
    std::string const of = ", " + std::to_string(size) + " patches";

    bench::measureOn("== unshared" + of, "ours", root,
                     [&twin](Patch const& p) { return p == twin; });
    bench::measureOn("== unshared" + of, "flat arrays", flat,
                     [&flatTwin](Flat const& f) { return flatEqual(f, flatTwin); });
    bench::target("== unshared" + of, 12.0);

    bench::measureOn("convert for evaluation" + of, "ours", root,
                     [](Patch const& p) { return EvalPatch(p); });
    bench::measureOn("convert for evaluation" + of, "flat arrays", flat,
                     [](Flat const& f) { return f; });
    bench::target("convert for evaluation" + of, 13.0);

    bench::measureOn("debug text" + of, "ours", root, [](Patch const& p) {
        NullBuffer buffer;
        std::ostream stream(&buffer);
        stream << p;
        return stream.good();
    });
    bench::measureOn("debug text" + of, "flat arrays", flat, [](Flat const& f) {
        NullBuffer buffer;
        std::ostream stream(&buffer);
        flatText(f, stream);
        return stream.good();
    });
    bench::target("debug text" + of, 1.9);

    bench::measureOn("walk to the last patch" + of, "ours", root,
                     [size](Patch const& p) { return findPatchRecursive(p, size); });
    bench::measureOn("walk to the last patch" + of, "flat arrays", flat, [size](Flat const& f) {
        for (auto const& item : f.patches) {
            if (item.id == size) return &item;
        }
        return static_cast<Flat::Item const*>(nullptr);
    });
    bench::target("walk to the last patch" + of, 45.0);

    bench::measureOn(
        "outgoing connections of a deep port" + of, "ours", root,
        [size](Patch const& p) { return findOutgoingConnectionsFromPort(p, (size - 1) * 2 + 1); });
    bench::measureOn("outgoing connections of a deep port" + of, "flat arrays", flat,
                     [size](Flat const& f) {
                         std::vector<Connection> found;
                         for (auto const& c : f.connections) {
                             if (c.fromPortId == (size - 1) * 2 + 1) found.push_back(c);
                         }
                         return found;
                     });
    bench::target("outgoing connections of a deep port" + of, 75.0);

    bench::measureOn("build an index" + of, "ours", root,
                     [](Patch const& p) { return PatchIndex(p); });
    bench::measureOn("build an index" + of, "a walk that finds nothing", root,
                     [](Patch const& p) { return findPatchRecursive(p, ~0ULL); });
    bench::target("build an index" + of, 3.0, "a walk that finds nothing");

    static std::vector<std::unique_ptr<PatchIndex>> indexes;
    double const before = static_cast<double>(mallinfo2().uordblks + mallinfo2().hblkhd);
    indexes.push_back(std::make_unique<PatchIndex>(root));
    double const bytes = static_cast<double>(mallinfo2().uordblks + mallinfo2().hblkhd) - before;
    bench::record("bytes of an index" + of, "ours", bytes);
    bench::record("bytes of an index" + of, "64 a patch, 24 a port and a connection",
                  static_cast<double>(64 * size + 48 * size + 24 * flat.connections.size()));
    bench::target("bytes of an index" + of, 1.0, "64 a patch, 24 a port and a connection");

    PatchIndex const& index = *indexes.back();
    // 1,000 identifiers all over the tree: nanoseconds each.
    std::string const lookups = "1,000 lookups of patches" + of;
    bench::measureOn(lookups, "ours", index, [size](PatchIndex const& i) {
        std::size_t sum = 0;
        for (std::size_t n = 0; n < 1000; ++n) {
            sum += reinterpret_cast<std::size_t>(i.findPatch(n * 7919 % size + 1));
        }
        return sum;
    });
    bench::measureOn("1,000 lookups of connections" + of, "ours", index,
                     [size](PatchIndex const& i) {
                         std::size_t sum = 0;
                         for (std::size_t n = 0; n < 1000; ++n) {
                             sum += i.outgoingConnections((n * 7919 % size + 1) * 2 + 1).size();
                         }
                         return sum;
                     });
    for (std::string const what : {"patches", "connections"}) {
        bench::record("1,000 lookups of " + what + of, "100 ns each", 100.0);
        bench::target("1,000 lookups of " + what + of, 1.0, "100 ns each");
    }
}

}  // namespace

void bench::graphs() {
    forSize(1000);
    forSize(10000);
    forSize(100000);
}
