// Engine/Base/detail/connection_groups.h: which connections belong to a patch or an output, in few
// bytes.
//
//     groups.count(members);           // how large each group is,
//     groups.layOut(group, end);       // where it begins (for each group),
//     groups.fill(members);            // and what is in it

#ifndef TARN_ENGINE_BASE_DETAIL_CONNECTION_GROUPS_H
#define TARN_ENGINE_BASE_DETAIL_CONNECTION_GROUPS_H

#include <Engine/Base/detail/hash_table.h>
#include <Engine/Base/patch_index.h>

#include <cstddef>
#include <cstdint>
#include <vector>

namespace tarn::engine::detail {

/// A group of connections. It is counted first and has a place afterwards; never both, so that four
/// bytes are enough for it in each record.
class ConnectionGroup {
public:
    /// Before it is laid out: one connection more; how many those are.
    void grow() { number = exists() ? number + 1 : 1; }
    std::uint32_t size() const { return number; }
    /// Afterwards: where it begins.
    void place(std::uint32_t at) { number = at; }
    std::uint32_t begin() const { return number; }

    bool exists() const { return number != kNone; }
    void reset() { number = kNone; }

private:
    std::uint32_t number = kNone;
};

/// The groups of a graph, behind one another: how many connections there are, then their positions
/// in the list that has them.
class ConnectionGroups {
public:
    /// A connection's membership in a group.
    struct Member {
        ConnectionGroup* group;
        std::uint32_t position;
    };

    static void count(std::vector<Member> const& members) {
        for (std::size_t i = 0; i < members.size(); ++i) {
            if (i + 4 * kAhead < members.size()) prefetch(members[i + 4 * kAhead].group);
            members[i].group->grow();
        }
    }

    /// The group, if it was counted, gets the place at `end`, which then is the end behind it.
    static void layOut(ConnectionGroup& group, std::size_t& end) noexcept {
        if (!group.exists()) return;
        auto const begin = static_cast<std::uint32_t>(end);
        end += 1 + group.size();
        group.place(begin);
    }

    /// After all groups were laid out, up to `end`, which is to be countable.
    void fill(std::vector<Member> const& members, std::size_t end) {
        numbers.resize(end);
        for (std::size_t i = 0; i < members.size(); ++i) {
            if (i + 4 * kAhead < members.size()) prefetch(members[i + 4 * kAhead].group);
            if (i + 2 * kAhead < members.size()) {
                prefetch(&numbers[members[i + 2 * kAhead].group->begin()]);
            }
            std::uint32_t const begin = members[i].group->begin();
            std::uint32_t const size = ++numbers[begin];
            numbers[begin + size] = members[i].position;
        }
    }

    /// Where a further group would begin.
    std::size_t end() const { return numbers.size(); }
    /// Afterwards filling up to that many more does not allocate.
    void reserveFor(std::size_t more) {
        requireCountable(numbers.size() + more);
        detail::reserveFor(numbers, more);
    }

    void drop(ConnectionGroup& group) noexcept {
        if (!group.exists()) return;
        unused += 1 + numbers[group.begin()];
        group.reset();
    }
    /// Whether more of it belonged to groups that were dropped than to those that are there.
    bool isWasteful() const { return unused > numbers.size() / 2 + 1000; }

    /// The connections of the group, which are in that list.
    ConnectionView view(std::vector<Connection> const& list, ConnectionGroup group) const {
        if (!group.exists()) return {};
        std::uint32_t const* const first = &numbers[group.begin()];
        return {list.data(), first + 1, *first};
    }

private:
    std::vector<std::uint32_t> numbers;
    std::size_t unused = 0;
};

}  // namespace tarn::engine::detail

#endif
