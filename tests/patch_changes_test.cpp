#include <Engine/Base/patch_changes.h>

#include <Engine/Base/path.h>

#include "support/allocations.h"
#include "support/edits.h"
#include "support/print.h"
#include "support/random.h"
#include "support/stack.h"

#include <gtest/gtest.h>

#include <map>
#include <set>
#include <sstream>
#include <tuple>

using namespace tarn::engine;
using namespace tests;

namespace {

using Kind = PatchChange::Kind;

// Every patch by its identifier, with what has to be compared; independent of sharing.
struct Flat {
    Patch const* patch;
    unsigned long long parent;
};
std::map<unsigned long long, Flat> flattened(Patch const& root) {
    std::map<unsigned long long, Flat> result;
    std::function<void(Patch const&, unsigned long long)> const visit =
        [&](Patch const& patch, unsigned long long parent) {
            result[patch.id] = {&patch, parent};
            for (Patch const& child : *patch.children) visit(child, patch.id);
        };
    visit(root, 0);
    return result;
}

template <class T>
std::vector<unsigned long long> commonIds(std::vector<T> const& list, std::vector<T> const& other) {
    std::set<unsigned long long> others;
    for (T const& element : other) others.insert(element.id);
    std::vector<unsigned long long> result;
    for (T const& element : list) {
        if (others.count(element.id) != 0) result.push_back(element.id);
    }
    return result;
}

std::set<std::tuple<bool, unsigned long long, int>>
portDifferences(std::vector<Port> const& before, std::vector<Port> const& after, bool areInputs) {
    std::map<unsigned long long, Port const*> was;
    std::map<unsigned long long, Port const*> is;
    for (Port const& port : before) was[port.id] = &port;
    for (Port const& port : after) is[port.id] = &port;
    std::set<std::tuple<bool, unsigned long long, int>> result;
    for (auto const& [id, port] : was) {
        if (is.count(id) == 0) result.insert({areInputs, id, -1});
        if (is.count(id) != 0 && *is[id] != *port) result.insert({areInputs, id, 0});
    }
    for (auto const& [id, port] : is) {
        if (was.count(id) == 0) result.insert({areInputs, id, 1});
    }
    return result;
}

// The expected changes, one line each, found by comparing everything.
std::multiset<std::string> expectedChanges(Patch const& before, Patch const& after) {
    auto const was = flattened(before);
    auto const is = flattened(after);
    std::multiset<std::string> result;
    for (auto const& [id, place] : was) {
        auto const now = is.find(id);
        if (now == is.end()) {
            result.insert("removed " + std::to_string(id));
            continue;
        }
        if (place.parent != now->second.parent) result.insert("moved " + std::to_string(id));
        Patch const& a = *place.patch;
        Patch const& b = *now->second.patch;
        std::string differences;
        if (a.name != b.name) differences += " name";
        if (a.attributes != b.attributes) differences += " attributes";
        if (commonIds(*a.inputs, *b.inputs) != commonIds(*b.inputs, *a.inputs)) {
            differences += " inputs";
        }
        if (commonIds(*a.outputs, *b.outputs) != commonIds(*b.outputs, *a.outputs)) {
            differences += " outputs";
        }
        if (commonIds(*a.children, *b.children) != commonIds(*b.children, *a.children)) {
            differences += " children";
        }
        for (bool const areInputs : {true, false}) {
            for (auto const& [input, port, what] :
                 portDifferences(areInputs ? *a.inputs : *a.outputs,
                                 areInputs ? *b.inputs : *b.outputs, areInputs)) {
                differences += " " + std::to_string(input) + "/" + std::to_string(port) + "/" +
                               std::to_string(what);
            }
        }
        std::set<std::pair<unsigned long long, unsigned long long>> connections;
        for (Connection const& c : *a.connections) connections.insert({c.fromPortId, c.toPortId});
        for (Connection const& c : *b.connections) {
            if (connections.erase({c.fromPortId, c.toPortId}) == 0) {
                differences +=
                    " +" + std::to_string(c.fromPortId) + "," + std::to_string(c.toPortId);
            }
        }
        for (auto const& [from, to] : connections) {
            differences += " -" + std::to_string(from) + "," + std::to_string(to);
        }
        if (!differences.empty()) result.insert("changed " + std::to_string(id) + differences);
    }
    for (auto const& [id, place] : is) {
        if (was.count(id) == 0) result.insert("added " + std::to_string(id));
    }
    return result;
}

// The same line for a reported change.
std::string lineOf(PatchChange const& change) {
    std::string const id = std::to_string(change.id);
    switch (change.kind) {
        case Kind::Added: return "added " + id;
        case Kind::Removed: return "removed " + id;
        case Kind::Moved: return "moved " + id;
        case Kind::Changed: break;
    }
    std::string line = "changed " + id;
    for (PatchField const field : change.fields) {
        if (field == PatchField::Name) line += " name";
        if (field == PatchField::Attributes) line += " attributes";
        if (field == PatchField::InputOrder) line += " inputs";
        if (field == PatchField::OutputOrder) line += " outputs";
        if (field == PatchField::ChildOrder) line += " children";
    }
    for (bool const areInputs : {true, false}) {
        std::set<std::tuple<bool, unsigned long long, int>> ports;
        for (PortChange const& port : change.ports) {
            int const what = port.before == nullptr ? 1 : port.after == nullptr ? -1 : 0;
            if (port.isInput == areInputs) ports.insert({areInputs, port.id(), what});
        }
        for (auto const& [input, port, what] : ports) {
            line += " " + std::to_string(input) + "/" + std::to_string(port) + "/" +
                    std::to_string(what);
        }
    }
    for (Connection const& c : change.connectionsAdded) {
        line += " +" + std::to_string(c.fromPortId) + "," + std::to_string(c.toPortId);
    }
    std::set<std::pair<unsigned long long, unsigned long long>> removed;
    for (Connection const& c : change.connectionsRemoved)
        removed.insert({c.fromPortId, c.toPortId});
    for (auto const& [from, to] : removed) {
        line += " -" + std::to_string(from) + "," + std::to_string(to);
    }
    return line;
}

std::multiset<std::string> linesOf(std::vector<PatchChange> const& changes) {
    std::multiset<std::string> result;
    for (PatchChange const& change : changes) result.insert(lineOf(change));
    return result;
}

void expectChanges(Patch const& before, Patch const& after) {
    std::vector<PatchChange> const changes = patchChanges(before, after);
    ASSERT_EQ(linesOf(changes), expectedChanges(before, after));
    ASSERT_EQ(linesOf(patchChanges(after, before)), expectedChanges(after, before));
    ASSERT_EQ(changes.empty(), before == after);
    auto const was = flattened(before);
    auto const is = flattened(after);
    auto const parentIn = [](auto const& flat, unsigned long long id) -> Patch const* {
        unsigned long long const parent = flat.at(id).parent;
        return parent == 0 ? nullptr : flat.at(parent).patch;
    };
    for (PatchChange const& change : changes) {
        ASSERT_EQ(change.before, was.count(change.id) ? was.at(change.id).patch : nullptr);
        ASSERT_EQ(change.after, is.count(change.id) ? is.at(change.id).patch : nullptr);
        ASSERT_EQ(change.parentBefore, change.before ? parentIn(was, change.id) : nullptr);
        ASSERT_EQ(change.parentAfter, change.after ? parentIn(is, change.id) : nullptr);
        ASSERT_EQ(to_string(change).find('\n'), std::string::npos);
    }
}

}  // namespace

TEST(PatchChanges, FindsWhatRandomEditsChanged) {
    Random random(12);
    for (int i = 0; i < 400; ++i) {
        AnyDocument any(random);
        PatchIndex const index(any.patch(3));
        Model model(index.root());
        PatchEdit edit(index);
        for (std::size_t n = random.below(12); n > 0; --n) ASSERT_TRUE(editOnce(any, edit, model));
        Patch const after = edit.commit();
        SCOPED_TRACE(i);
        expectChanges(index.root(), after);
        // Parsed again, so that nothing is shared; the changes stay the same.
        Patch const apart = model.toPatch();
        EXPECT_EQ(linesOf(patchChanges(index.root(), apart)),
                  linesOf(patchChanges(index.root(), after)));
        EXPECT_TRUE(patchChanges(after, apart).empty());
        if (HasFatalFailure()) return;
    }
}

TEST(PatchChanges, AreEmptyExactlyForEqualDocuments) {
    Random random(13);
    for (int i = 0; i < 1000; ++i) {
        // Few identifiers, so that they repeat, and 0.
        std::uint64_t const seed = random.below(40);
        Random one(seed);
        Random other(random.below(3) == 0 ? seed : random.below(40));
        Patch const a = randomPatch(one, 3);
        Patch const b = randomPatch(other, 3);
        ASSERT_EQ(patchChanges(a, b).empty(), a == b) << i;
        ASSERT_EQ(patchChanges(b, a).empty(), a == b) << i;
    }
}

TEST(PatchChanges, ArePrintedForPeople) {
    auto const base = [] {
        return withPorts(patch(1,
                               {withPorts(patch(2, {patch(4)}), {port(21, 1), port(22, 2)}, {}),
                                withPorts(patch(3), {port(31)}, {port(32), port(33)})},
                               {{3, 32, 2, 21}, {3, 33, 2, 22}}),
                         {}, {});
    };
    struct Row {
        char const* what;
        std::function<void(Model&)> change;
        char const* text;
    };
    auto const only = [](Model& model, unsigned long long id) -> Model& {
        return *model.find(id).patch;
    };
    for (Row const& row : {
             Row{"nothing", [](Model&) {}, ""},
             Row{"name", [&](Model& m) { only(m, 4).fields.name = "a\"\nb"; },
                 "changed patch 4 \"n4\": name \"n4\" -> \"a\\\"\\nb\"\n"},
             Row{"no name", [&](Model& m) { only(m, 4).fields.name = ""; },
                 "changed patch 4 \"n4\": name \"n4\" -> \"\"\n"},
             Row{"long name", [&](Model& m) { only(m, 4).fields.name = std::string(90, 'x'); },
                 "changed patch 4 \"n4\": name \"n4\" -> "
                 "\"xxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxxx...\n"},
             Row{"builtin and descriptor",
                 [&](Model& m) {
                     only(m, 4).fields.builtin = 5;
                     only(m, 4).fields.descriptor = "d";
                 },
                 "changed patch 4 \"n4\": builtin 0 -> 5; descriptor \"\" -> \"d\"\n"},
             Row{"model layer", [&](Model& m) { only(m, 4).fields.modelLayer.id = 5; },
                 "changed patch 4 \"n4\": model layer changed\n"},
             Row{"attributes", [&](Model& m) { only(m, 4).fields.attributes["k"] = 5; },
                 "changed patch 4 \"n4\": attribute \"k\" added 5\n"},
             Row{"identifier of the root", [&](Model& m) { m.fields.id = 9; },
                 "changed patch 1 \"n1\": id 1 -> 9\n"},
             Row{"default of a port", [&](Model& m) { only(m, 2).inputs[0].defaultValue = 0.125; },
                 "changed patch 2 \"n2\": input 21 \"p21\" default 0.0 -> 0.125\n"},
             Row{"defaults of other types",
                 [&](Model& m) {
                     only(m, 2).inputs[0].defaultValue = true;
                     only(m, 2).inputs[1].defaultValue = FloatVec2{0.5, 1};
                     only(m, 3).inputs[0].defaultValue = Value::Image(7);
                     only(m, 3).outputs[0].defaultValue = "text";
                     only(m, 3).outputs[1].defaultValue = PathBuilder().moveTo({1, 2}).build();
                 },
                 "changed patch 2 \"n2\": input 21 \"p21\" default 0.0 -> true; input 22 \"p22\" "
                 "default 0.0 -> [0.5, 1.0]\n"
                 "changed patch 3 \"n3\": input 31 \"p31\" default 0.0 -> image 7; output 32 "
                 "\"p32\" "
                 "default 0.0 -> \"text\"; output 33 \"p33\" default 0.0 -> \"M1 2\"\n"},
             Row{"a difference that prints the same",
                 [&](Model& m) { only(m, 2).inputs[0].defaultValue = std::string(); },
                 "changed patch 2 \"n2\": input 21 \"p21\" default 0.0 -> \"\"\n"},
             Row{"tag, name, type and attributes of a port",
                 [&](Model& m) {
                     Port& p = only(m, 2).inputs[0];
                     p.tag = 9;
                     p.name = "q";
                     p.typeInfo.type = Type::Int;
                     p.typeInfo.subtype = 2;
                     p.typeInfo.min = Value(0.5);
                     p.attributes["k"] = "v";
                 },
                 "changed patch 2 \"n2\": input 21 \"p21\" tag 1 -> 9, name \"p21\" -> \"q\", type "
                 "float -> int subtype 2 min 0.5, attribute \"k\" added \"v\"\n"},
             Row{"ports added and removed",
                 [&](Model& m) {
                     only(m, 2).inputs[0] = port(90);
                     only(m, 3).outputs.pop_back();
                 },
                 "changed patch 2 \"n2\": input 21 \"p21\" removed; input 90 \"p90\" added\n"
                 "changed patch 3 \"n3\": output 33 \"p33\" removed\n"},
             Row{"ports in another order",
                 [&](Model& m) {
                     std::swap(only(m, 2).inputs[0], only(m, 2).inputs[1]);
                     std::swap(only(m, 3).outputs[0], only(m, 3).outputs[1]);
                 },
                 "changed patch 2 \"n2\": inputs in another order\n"
                 "changed patch 3 \"n3\": outputs in another order\n"},
             Row{"connections",
                 [&](Model& m) {
                     m.connections[0] = {3, 32, 2, 22};
                 },
                 "changed patch 1 \"n1\": disconnected 32->21; connected 32->22\n"},
             Row{"connections in another order",
                 [&](Model& m) { std::swap(m.connections[0], m.connections[1]); },
                 "changed patch 1 \"n1\": connections in another order\n"},
             Row{"children in another order", [&](Model& m) { m.children.reverse(); },
                 "changed patch 1 \"n1\": children in another order\n"},
             Row{"a patch moved and changed",
                 [&](Model& m) {
                     only(m, 4).fields.name = "m";
                     m.movePatch(4, 3, 0);
                 },
                 "moved patch 4 \"m\" from patch 2 \"n2\" to patch 3 \"n3\"\n"
                 "changed patch 4 \"n4\": name \"n4\" -> \"m\"\n"},
             Row{"a patch removed with what is in it", [&](Model& m) { m.children.pop_front(); },
                 "removed patch 2 \"n2\" from patch 1 \"n1\"\n"
                 "removed patch 4 \"n4\" from patch 2 \"n2\"\n"},
             Row{"a patch added with what is in it",
                 [&](Model& m) { m.children.emplace_back(patch(7, {patch(8)})); },
                 "added patch 7 \"n7\" to patch 1 \"n1\"\n"
                 "added patch 8 \"n8\" to patch 7 \"n7\"\n"},
         }) {
        SCOPED_TRACE(row.what);
        Patch const before = base();
        Model model(before);
        row.change(model);
        Patch const after = model.toPatch();
        std::vector<PatchChange> const changes = patchChanges(before, after);
        EXPECT_EQ(to_string(changes), row.text);
        std::ostringstream stream;
        for (PatchChange const& change : changes) stream << change << "\n";
        EXPECT_EQ(stream.str(), row.text);
    }
}

TEST(PatchChanges, ReportChangesThatPrintTheSame) {
    Patch before = patch(1);
    before.attributes["k"] = std::string(100, 'x') + "1";
    Patch after = before;
    after.attributes["k"] = std::string(100, 'x') + "2";
    EXPECT_EQ(to_string(patchChanges(before, after)),
              "changed patch 1 \"n1\": attribute \"k\" changed\n");
    EXPECT_EQ(to_string(patchChanges(after, patch(1))),
              "changed patch 1 \"n1\": attribute \"k\" removed\n");
}

TEST(PatchChanges, SkipSharedLists) {
    std::vector<Patch> groups;
    for (unsigned long long g = 0; g < 50; ++g) {
        std::vector<Patch> children;
        for (unsigned long long i = 1; i <= 50; ++i) {
            children.push_back(withPorts(patch(g * 100 + i + 100), {port(g * 100 + i)}, {}));
        }
        groups.push_back(patch(g + 2, std::move(children)));
    }
    PatchIndex const index(patch(1, std::move(groups)));
    PatchEdit edit(index);
    edit.inputPort(4025)->defaultValue = 1.0;
    Patch const after = edit.commit();
    AllocationCounter counter;
    std::vector<PatchChange> const changes = patchChanges(index.root(), after);
    EXPECT_EQ(changes.size(), 1u);
    // For two lists of fifty.
    EXPECT_LT(counter.peakBytes(), 20000u);
}

TEST(PatchChanges, NeedNoDeepStack) {
    onStackOf(kStack, [] {
        auto const deep = [](char const* name) {
            Patch root = patch(kDeepest);
            root.name = name;
            for (unsigned long long id = kDeepest - 1; id > 0; --id) {
                root = patch(id, {std::move(root)});
            }
            return root;
        };
        Patch const a = deep("a");
        Patch const b = deep("b");
        EXPECT_EQ(patchChanges(a, b).size(), 1u);
        EXPECT_EQ(patchChanges(a, patch(1)).size(), kDeepest - 1);
        EXPECT_EQ(patchChanges(patch(1), b).size(), kDeepest - 1);
    });
}

TEST(PatchChanges, SurviveFailingAllocations) {
    Random random(14);
    AnyDocument any(random);
    PatchIndex const index(any.patch(2));
    Model model(index.root());
    PatchEdit edit(index);
    for (int n = 0; n < 12; ++n) ASSERT_TRUE(editOnce(any, edit, model));
    Patch const after = edit.commit();
    std::vector<PatchChange> changes;
    EXPECT_GT(failEachAllocation([&] { changes = patchChanges(index.root(), after); },
                                 [&] { EXPECT_TRUE(changes.empty()); }),
              3u);
    EXPECT_EQ(linesOf(changes), expectedChanges(index.root(), after));
}
