// Engine/Base/detail/connection_groups.h: a compact table of the connections of each patch and
// output.
//
//     group.grow();                    // how large each group is,
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

/// A group of connections: first its size, then its position. It never needs both at once, so four
/// bytes are enough in each record.
class ConnectionGroup {
public:
    /// While counting: adds a connection; the number so far.
    void grow() { number = exists() ? number + 1 : 1; }
    std::uint32_t size() const { return number; }
    /// After counting: the position of the group's first connection.
    void place(std::uint32_t at) { number = at; }
    std::uint32_t begin() const { return number; }

    bool exists() const { return number != kNone; }
    void reset() { number = kNone; }

private:
    std::uint32_t number = kNone;
};

/// The groups of a graph in one array: for each group the number of its connections, followed by
/// their positions in the connection list.
class ConnectionGroups {
public:
    /// The membership of a connection in a group.
    struct Member {
        Member(ConnectionGroup& of, std::uint32_t at) : group(&of), position(at) {}

        ConnectionGroup* group;
        std::uint32_t position;
    };

    /// Gives a group that has connections the position `end`, and moves `end` behind it.
    static void layOut(ConnectionGroup& group, std::size_t& end) noexcept {
        if (!group.exists()) return;
        auto const begin = static_cast<std::uint32_t>(end);
        end += 1 + group.size();
        group.place(begin);
    }

    /// Stores the members, after every group was laid out, up to `end`, which must be countable.
    /// Allocates nothing where `reserveFor` made room.
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

    /// The position of the next group.
    std::size_t end() const { return numbers.size(); }
    /// Reserves memory so that filling in that many more numbers does not allocate.
    void reserveFor(std::size_t more) {
        requireCountable(numbers.size() + more);
        detail::reserveFor(numbers, more);
    }

    void drop(ConnectionGroup& group) noexcept {
        if (!group.exists()) return;
        unused += 1 + numbers[group.begin()];
        group.reset();
    }
    /// Whether more than half of the table belongs to groups that were dropped.
    bool isWasteful() const { return unused > numbers.size() / 2 + 1000; }

    /// The connections of the group; `list` is the list that they are in.
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
