#include <Engine/Base/patch_changes.h>

#include <Engine/Base/detail/hash_table.h>
#include <Engine/Base/svg_path.h>

#include <algorithm>
#include <cstddef>
#include <ostream>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <utility>

namespace tarn::engine {

namespace {

using detail::elementsOf;
using detail::SeededHash;

constexpr std::size_t kNowhere = static_cast<std::size_t>(-1);

// For each element of `after`, the position of the element with its identifier in `before`, or
// `kNowhere`. Repeated identifiers are matched in order.
template <class T>
std::vector<std::size_t> matched(std::vector<T> const& before, std::vector<T> const& after) {
    std::vector<std::size_t> positions(after.size(), kNowhere);
    std::size_t same = 0;
    while (same < before.size() && same < after.size() && before[same].id == after[same].id) {
        positions[same] = same;
        ++same;
    }
    if (same == after.size()) return positions;
    std::unordered_map<unsigned long long, std::vector<std::size_t>, SeededHash> places;
    places.reserve(before.size() - same);
    for (std::size_t i = before.size(); i > same; --i) places[before[i - 1].id].push_back(i - 1);
    for (std::size_t i = same; i < after.size(); ++i) {
        auto const place = places.find(after[i].id);
        if (place == places.end() || place->second.empty()) continue;
        positions[i] = place->second.back();
        place->second.pop_back();
    }
    return positions;
}

// Whether the elements that are in both lists have the same order.
bool isInOrder(std::vector<std::size_t> const& positions) {
    std::size_t last = 0;
    for (std::size_t const position : positions) {
        if (position == kNowhere) continue;
        if (position < last) return false;
        last = position;
    }
    return true;
}

// The positions below `count` that are not in `positions`, in order.
std::vector<std::size_t> missing(std::vector<std::size_t> const& positions, std::size_t count) {
    std::vector<bool> isThere(count, false);
    for (std::size_t const position : positions) {
        if (position != kNowhere) isThere[position] = true;
    }
    std::vector<std::size_t> result;
    for (std::size_t i = 0; i < count; ++i) {
        if (!isThere[i]) result.push_back(i);
    }
    return result;
}

class Comparison {
public:
    std::vector<PatchChange> run(Patch const& before, Patch const& after) {
        pairs.push_back({&before, &after, nullptr, nullptr});
        comparePairs();
        isMoving = true;
        // A patch that is only in one of the two lists was usually moved with its whole content.
        // Then the content is not compared.
        std::vector<Place> rest;
        std::size_t next = 0;
        while (next < onlyAfter.size()) {  // The list grows in the loop.
            Place const place = onlyAfter[next++];
            if (!findMoved(place, false)) rest.push_back(place);
        }
        onlyAfter.assign(rest.rbegin(), rest.rend());
        while (!onlyAfter.empty()) {
            Place const place = onlyAfter.back();
            onlyAfter.pop_back();
            std::size_t const waiting = onlyAfter.size();
            if (!findMoved(place, true)) {
                changes.push_back({PatchChange::Kind::Added, place.patch->id, nullptr, place.patch,
                                   nullptr, place.parent});
                for (Patch const& child : childrenOf(*place.patch)) {
                    onlyAfter.push_back({&child, place.patch});
                }
            }
            std::reverse(onlyAfter.begin() + static_cast<std::ptrdiff_t>(waiting), onlyAfter.end());
        }
        reportRemoved();
        return std::move(changes);
    }

private:
    struct Place {
        Patch const* patch;
        Patch const* parent;
    };
    struct Pair {
        Patch const* before;
        Patch const* after;
        Patch const* parentBefore;
        Patch const* parentAfter;
    };

    static std::vector<Patch> const& childrenOf(Patch const& patch) {
        return elementsOf(patch.children, "children != nullptr");
    }

    void comparePairs() {
        while (!pairs.empty()) {
            Pair const pair = pairs.back();
            pairs.pop_back();
            compare(pair);
        }
    }

    void compare(Pair const& pair) {
        Patch const& before = *pair.before;
        Patch const& after = *pair.after;
        if (isMoving) taken.insert(&before);
        PatchChange change;
        auto const note = [&change](PatchField field, bool differs) {
            if (differs) change.fields.push_back(field);
        };
        note(PatchField::Id, before.id != after.id);
        note(PatchField::Builtin, before.builtin != after.builtin);
        note(PatchField::Descriptor, before.descriptor != after.descriptor);
        note(PatchField::ModelLayer, before.modelLayer != after.modelLayer);
        note(PatchField::Name, before.name != after.name);
        note(PatchField::Attributes, before.attributes != after.attributes);
        if (before.inputs != after.inputs) {
            note(PatchField::InputOrder,
                 comparePorts(elementsOf(before.inputs, "inputs != nullptr"),
                              elementsOf(after.inputs, "inputs != nullptr"), true, change));
        }
        if (before.outputs != after.outputs) {
            note(PatchField::OutputOrder,
                 comparePorts(elementsOf(before.outputs, "outputs != nullptr"),
                              elementsOf(after.outputs, "outputs != nullptr"), false, change));
        }
        if (before.connections != after.connections) {
            note(PatchField::ConnectionOrder,
                 compareConnections(elementsOf(before.connections, "connections != nullptr"),
                                    elementsOf(after.connections, "connections != nullptr"),
                                    change));
        }
        if (before.children != after.children) {
            note(PatchField::ChildOrder, compareChildren(before, after));
        }
        bool const isChanged = !change.fields.empty() || !change.ports.empty() ||
                               !change.connectionsAdded.empty() ||
                               !change.connectionsRemoved.empty();
        if (!isChanged) return;
        change.id = before.id;
        change.before = &before;
        change.after = &after;
        change.parentBefore = pair.parentBefore;
        change.parentAfter = pair.parentAfter;
        changes.push_back(std::move(change));
    }

    // These and the next two functions return whether the order differs.
    static bool comparePorts(std::vector<Port> const& before, std::vector<Port> const& after,
                             bool areInputs, PatchChange& change) {
        std::vector<std::size_t> const positions = matched(before, after);
        for (std::size_t const position : missing(positions, before.size())) {
            change.ports.push_back({&before[position], nullptr, areInputs});
        }
        for (std::size_t i = 0; i < after.size(); ++i) {
            if (positions[i] == kNowhere) {
                change.ports.push_back({nullptr, &after[i], areInputs});
                continue;
            }
            Port const& was = before[positions[i]];
            PortChange port{&was, &after[i], areInputs};
            auto const note = [&port](PortField field, bool differs) {
                if (differs) port.fields.push_back(field);
            };
            note(PortField::Tag, was.tag != after[i].tag);
            note(PortField::Name, was.name != after[i].name);
            note(PortField::TypeInfo, was.typeInfo != after[i].typeInfo);
            note(PortField::DefaultValue, was.defaultValue != after[i].defaultValue);
            note(PortField::Attributes, was.attributes != after[i].attributes);
            if (!port.fields.empty()) change.ports.push_back(std::move(port));
        }
        return !isInOrder(positions);
    }

    static bool compareConnections(std::vector<Connection> const& before,
                                   std::vector<Connection> const& after, PatchChange& change) {
        if (before == after) return false;
        // The number of occurrences after minus that before.
        std::unordered_map<Connection, std::ptrdiff_t, SeededHash> surplus;
        for (Connection const& c : after) ++surplus[c];
        for (Connection const& c : before) --surplus[c];
        std::vector<Connection> keptBefore;
        for (Connection const& c : before) {
            std::ptrdiff_t& count = surplus[c];
            (count < 0 ? change.connectionsRemoved : keptBefore).push_back(c);
            if (count < 0) ++count;
        }
        std::vector<Connection> keptAfter;
        for (Connection const& c : after) {
            std::ptrdiff_t& count = surplus[c];
            (count > 0 ? change.connectionsAdded : keptAfter).push_back(c);
            if (count > 0) --count;
        }
        return keptBefore != keptAfter;
    }

    bool compareChildren(Patch const& before, Patch const& after) {
        std::vector<Patch> const& former = childrenOf(before);
        std::vector<Patch> const& present = childrenOf(after);
        std::vector<std::size_t> const positions = matched(former, present);
        for (std::size_t const position : missing(positions, former.size())) {
            onlyBefore.push_back({&former[position], &before});
        }
        std::size_t const waiting = pairs.size();
        for (std::size_t i = 0; i < present.size(); ++i) {
            if (positions[i] == kNowhere) {
                onlyAfter.push_back({&present[i], &after});
            } else {
                pairs.push_back({&former[positions[i]], &present[i], &before, &after});
            }
        }
        std::reverse(pairs.begin() + static_cast<std::ptrdiff_t>(waiting), pairs.end());
        return !isInOrder(positions);
    }

    using Places = std::unordered_map<unsigned long long, std::vector<Place>, SeededHash>;

    // Whether the patch was elsewhere before; then both are compared. Searches the patches that
    // have lost their place, and where `isDeep` also inside them.
    bool findMoved(Place const& place, bool isDeep) {
        for (; knownRoots < onlyBefore.size(); ++knownRoots) {
            rootsBefore[onlyBefore[knownRoots].patch->id].push_back(onlyBefore[knownRoots]);
        }
        Place former = takeFrom(rootsBefore, place.patch->id);
        if (former.patch == nullptr && isDeep) {
            if (!hasPlacesInside) findPlacesInside();
            former = takeFrom(placesInside, place.patch->id);
        }
        if (former.patch == nullptr) return false;
        changes.push_back({PatchChange::Kind::Moved, place.patch->id, former.patch, place.patch,
                           former.parent, place.parent});
        pairs.push_back({former.patch, place.patch, former.parent, place.parent});
        comparePairs();
        return true;
    }

    void findPlacesInside() {
        hasPlacesInside = true;
        std::vector<Place> pending(onlyBefore.rbegin(), onlyBefore.rend());
        while (!pending.empty()) {
            Place const place = pending.back();
            pending.pop_back();
            if (taken.count(place.patch) != 0) continue;
            placesInside[place.patch->id].push_back(place);
            std::vector<Patch> const& children = childrenOf(*place.patch);
            for (auto child = children.rbegin(); child != children.rend(); ++child) {
                pending.push_back({&*child, place.patch});
            }
        }
        for (auto& entry : placesInside) std::reverse(entry.second.begin(), entry.second.end());
    }

    // A place with that identifier that was not matched yet, if any.
    Place takeFrom(Places& places, unsigned long long id) const {
        auto const known = places.find(id);
        while (known != places.end() && !known->second.empty()) {
            Place const place = known->second.back();
            known->second.pop_back();
            if (taken.count(place.patch) == 0) return place;
        }
        return {nullptr, nullptr};
    }

    void reportRemoved() {
        std::vector<Place> pending(onlyBefore.rbegin(), onlyBefore.rend());
        while (!pending.empty()) {
            Place const place = pending.back();
            pending.pop_back();
            if (taken.count(place.patch) != 0) continue;
            changes.push_back({PatchChange::Kind::Removed, place.patch->id, place.patch, nullptr,
                               place.parent, nullptr});
            std::vector<Patch> const& children = childrenOf(*place.patch);
            for (auto child = children.rbegin(); child != children.rend(); ++child) {
                pending.push_back({&*child, place.patch});
            }
        }
    }

    std::vector<PatchChange> changes;
    std::vector<Pair> pairs;  // Still to be compared.
    std::vector<Place> onlyBefore;
    std::vector<Place> onlyAfter;
    Places rootsBefore;  // Those of the first `knownRoots` elements of `onlyBefore`.
    std::size_t knownRoots = 0;
    Places placesInside;
    bool hasPlacesInside = false;
    bool isMoving = false;
    std::unordered_set<Patch const*> taken;
};

// Formatting

constexpr std::size_t kLongestText = 60;
constexpr std::size_t kMostConnections = 20;

std::string shown(std::string const& text) { return Unstructured(text).toText(kLongestText); }

std::string shown(Unstructured const& data) { return data.toText(kLongestText); }

template <class... Numbers>
std::string shownNumbers(Numbers... numbers) {
    return Unstructured(Unstructured::Array{Unstructured(numbers)...}).toText(kLongestText);
}

std::string shown(Value const& value) {
    switch (value.type()) {
        case Type::Float:
        case Type::Int:
        case Type::String:
        case Type::Unstructured: return shown(value.asUnstructured());
        case Type::Boolean: return bool(value) ? "true" : "false";
        case Type::Vec2: {
            FloatVec2 const v = value;
            return shownNumbers(v.x, v.y);
        }
        case Type::Vec3: {
            FloatVec3 const v = value;
            return shownNumbers(v.x, v.y, v.z);
        }
        case Type::Vec4: {
            FloatVec4 const v = value;
            return shownNumbers(v.x, v.y, v.z, v.w);
        }
        case Type::Mat4: {
            FloatMat4 const matrix = value;
            Unstructured::Array elements(std::begin(matrix.elements), std::end(matrix.elements));
            return shown(Unstructured(std::move(elements)));
        }
        case Type::Path: {
            Path const* const path = value.ifPath();
            return path == nullptr ? "null" : shown(svgPathData(*path));
        }
        case Type::Image:
        case Type::Video:
        case Type::Sound:
        case Type::Model:
            return typeToString(value.type()) + " " +
                   std::to_string(static_cast<unsigned long long>(value));
    }
    return "";
}

std::string shown(unsigned long long number) { return std::to_string(number); }

std::string shown(TypeInfo const& info) {
    std::string text = info.type <= Type::Unstructured
                           ? typeToString(info.type)
                           : std::to_string(static_cast<unsigned>(info.type));
    if (info.subtype != 0) text += " subtype " + std::to_string(info.subtype);
    if (info.min) text += " min " + shown(*info.min);
    if (info.max) text += " max " + shown(*info.max);
    if (info.extra) text += " extra " + shown(*info.extra);
    return text;
}

// "label 1 -> 2", or "label changed" where both would look the same.
template <class T>
std::string changeOf(std::string const& label, T const& before, T const& after) {
    std::string const from = shown(before);
    std::string const to = shown(after);
    return label + (from == to ? " changed" : " " + from + " -> " + to);
}

using Attributes = std::map<std::string, Unstructured>;

std::string changeOfAttributes(Attributes const& before, Attributes const& after) {
    std::string text;
    auto const add = [&text](std::string const& part) {
        text += (text.empty() ? "" : ", ") + part;
    };
    for (auto const& [key, data] : before) {
        auto const now = after.find(key);
        if (now == after.end()) {
            add("attribute " + shown(key) + " removed");
        } else if (now->second != data) {
            add(changeOf("attribute " + shown(key), data, now->second));
        }
    }
    for (auto const& [key, data] : after) {
        if (before.count(key) == 0) add("attribute " + shown(key) + " added " + shown(data));
    }
    return text;
}

std::string named(Patch const& patch) {
    return "patch " + std::to_string(patch.id) +
           (patch.name.empty() ? "" : " " + shown(patch.name));
}

std::string shown(PortField field, Port const& before, Port const& after) {
    switch (field) {
        case PortField::Tag: return changeOf("tag", before.tag, after.tag);
        case PortField::Name: return changeOf("name", before.name, after.name);
        case PortField::TypeInfo: return changeOf("type", before.typeInfo, after.typeInfo);
        case PortField::DefaultValue:
            return changeOf("default", before.defaultValue, after.defaultValue);
        case PortField::Attributes: return changeOfAttributes(before.attributes, after.attributes);
    }
    return "";
}

std::string shown(PatchField field, Patch const& before, Patch const& after) {
    switch (field) {
        case PatchField::Id: return changeOf("id", before.id, after.id);
        case PatchField::Builtin: return changeOf("builtin", before.builtin, after.builtin);
        case PatchField::Descriptor:
            return changeOf("descriptor", before.descriptor, after.descriptor);
        case PatchField::ModelLayer: return "model layer changed";
        case PatchField::Name: return changeOf("name", before.name, after.name);
        case PatchField::Attributes: return changeOfAttributes(before.attributes, after.attributes);
        case PatchField::InputOrder: return "inputs in another order";
        case PatchField::OutputOrder: return "outputs in another order";
        case PatchField::ConnectionOrder: return "connections in another order";
        case PatchField::ChildOrder: return "children in another order";
    }
    return "";
}

std::string shown(PortChange const& change) {
    Port const& port = *(change.before == nullptr ? change.after : change.before);
    std::string text = (change.isInput ? "input " : "output ") + std::to_string(change.id());
    if (!port.name.empty()) text += " " + shown(port.name);
    if (change.before == nullptr) return text + " added";
    if (change.after == nullptr) return text + " removed";
    char const* separator = " ";
    for (PortField const field : change.fields) {
        text += separator + shown(field, *change.before, *change.after);
        separator = ", ";
    }
    return text;
}

std::string shown(Connection const& connection) {
    return std::to_string(connection.fromPortId) + "->" + std::to_string(connection.toPortId);
}

std::string differences(PatchChange const& change) {
    std::string text;
    auto const add = [&text](std::string const& part) {
        text += (text.empty() ? ": " : "; ") + part;
    };
    for (PatchField const field : change.fields) add(shown(field, *change.before, *change.after));
    for (PortChange const& port : change.ports) add(shown(port));
    auto const addAll = [&](char const* what, std::vector<Connection> const& connections) {
        for (std::size_t i = 0; i < std::min(connections.size(), kMostConnections); ++i) {
            add(what + shown(connections[i]));
        }
        if (connections.size() > kMostConnections) {
            add(what + std::to_string(connections.size() - kMostConnections) + " more");
        }
    };
    addAll("disconnected ", change.connectionsRemoved);
    addAll("connected ", change.connectionsAdded);
    return text;
}

std::string parentOf(Patch const* parent) { return parent == nullptr ? "" : named(*parent); }

}  // namespace

std::vector<PatchChange> patchChanges(Patch const& before, Patch const& after) {
    return Comparison().run(before, after);
}

std::string to_string(PatchChange const& change) {
    switch (change.kind) {
        case PatchChange::Kind::Added:
            return "added " + named(*change.after) + " to " + parentOf(change.parentAfter);
        case PatchChange::Kind::Removed:
            return "removed " + named(*change.before) + " from " + parentOf(change.parentBefore);
        case PatchChange::Kind::Moved:
            return "moved " + named(*change.after) + " from " + parentOf(change.parentBefore) +
                   " to " + parentOf(change.parentAfter);
        case PatchChange::Kind::Changed:
            return "changed " + named(*change.before) + differences(change);
    }
    return "";
}

std::string to_string(std::vector<PatchChange> const& changes) {
    std::string text;
    for (PatchChange const& change : changes) text += to_string(change) + "\n";
    return text;
}

std::ostream& operator<<(std::ostream& stream, PatchChange const& change) {
    return stream << to_string(change);
}

}  // namespace tarn::engine
