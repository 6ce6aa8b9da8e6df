// Engine/Base/detail/hash_table.h: a hash table for 64-bit keys that is safe against chosen keys.
//
//     HashTable<Slot> table(slots);
//     if (!table.slotFor(id).isFree()) { use(table.slotFor(id)); }

#ifndef TARN_ENGINE_BASE_DETAIL_HASH_TABLE_H
#define TARN_ENGINE_BASE_DETAIL_HASH_TABLE_H

#include <Engine/Base/detail/prefetch.h>
#include <Engine/Base/patch.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <stdexcept>
#include <utility>
#include <vector>

namespace tarn::engine::detail {

/// The position that stands for "none".
constexpr std::uint32_t kNone = std::numeric_limits<std::uint32_t>::max();

/// Throws where positions would not fit into 32 bits, of which one value means none.
inline void requireCountable(std::size_t count) {
    if (count >= kNone) throw std::length_error("PatchIndex");
}

/// How many elements to prefetch ahead: tables and documents are larger than caches.
constexpr std::size_t kAhead = 8;

/// Mixes the bits of a key: identifiers are often consecutive.
constexpr std::uint64_t mix(std::uint64_t key) {
    key ^= key >> 32;
    key *= 0xd6e8feb86659fd93;
    key ^= key >> 32;
    key *= 0xd6e8feb86659fd93;
    return key;
}

/// A hash with a different seed in every table, taken from its address in memory, so that a
/// document cannot choose identifiers that collide.
struct SeededHash {
    std::uint64_t seed = mix(reinterpret_cast<std::uintptr_t>(this));
    std::uint64_t operator()(std::uint64_t key) const { return mix(key ^ seed); }
    std::size_t operator()(Connection const& c) const {
        std::uint64_t result = seed;
        for (std::uint64_t const end : {c.fromPatchId, c.fromPortId, c.toPatchId, c.toPortId}) {
            result = mix(result ^ end);
        }
        return static_cast<std::size_t>(result);
    }
};

/// An open-addressing hash table with linear probing, built at once from all its slots. A `Slot`
/// has a `key` and `isFree()`; a default-constructed one is free. Of several slots with one key the
/// first is kept.
template <class Slot>
class HashTable {
public:
    explicit HashTable(std::vector<Slot> const& filled)
        : HashTable(filled, SeededHash{mix(reinterpret_cast<std::uintptr_t>(this))}) {}
    /// Tables with the same seed iterate over their keys in the same order.
    HashTable(std::vector<Slot> const& filled, SeededHash seeded)
        : slots(sizeFor(filled.size())), hash(seeded) {
        for (std::size_t i = 0; i < filled.size(); ++i) {
            if (i + kAhead < filled.size()) prefetch(filled[i + kAhead].key);
            Slot& slot = slotFor(filled[i].key);
            if (!slot.isFree()) continue;
            slot = filled[i];
            ++count;
        }
    }

    SeededHash const& hashFunction() const { return hash; }
    /// The number of keys.
    std::size_t size() const { return count; }

    /// The slot of the key, or the free one where it would be inserted.
    Slot const& slotFor(std::uint64_t key) const { return slots[positionOf(key)]; }
    Slot& slotFor(std::uint64_t key) { return slots[positionOf(key)]; }

    /// Prefetches the slots where a lookup of the key begins; probing often reaches a second cache
    /// line.
    void prefetch(std::uint64_t key) const {
        std::size_t const start = startOf(key);
        detail::prefetch(&slots[start]);
        detail::prefetch(&slots[std::min(start + 3, slots.size() - 1)]);
    }

    /// Makes room for so many more keys. A failing allocation changes nothing.
    void reserveFor(std::size_t further) {
        std::size_t const wanted = sizeFor(count + further);
        if (wanted <= slots.size()) return;
        std::vector<Slot> old(wanted + wanted / 2);
        requireCountable(old.size());
        old.swap(slots);
        for (Slot const& slot : old) {
            if (!slot.isFree()) slotFor(slot.key) = slot;
        }
    }

    /// Inserts a slot. There must be room, and the key must be new.
    void insert(Slot const& slot) noexcept {
        slotFor(slot.key) = slot;
        ++count;
    }

    /// Erases a key that is present. Invalidates references to all slots.
    void erase(std::uint64_t key) noexcept {
        std::size_t gap = positionOf(key);
        // Slots that were probed for past the gap move into it.
        for (std::size_t i = next(gap); !slots[i].isFree(); i = next(i)) {
            std::size_t const start = startOf(slots[i].key);
            bool const isBehindGap =
                gap <= i ? gap < start && start <= i : gap < start || start <= i;
            if (isBehindGap) continue;
            slots[gap] = slots[i];
            gap = i;
        }
        slots[gap] = Slot();
        --count;
    }

    typename std::vector<Slot>::iterator begin() { return slots.begin(); }
    typename std::vector<Slot>::iterator end() { return slots.end(); }
    typename std::vector<Slot>::const_iterator begin() const { return slots.begin(); }
    typename std::vector<Slot>::const_iterator end() const { return slots.end(); }

private:
    // At most a little over half full: probes stay short, and one slot is always free.
    static std::size_t sizeFor(std::size_t keys) {
        std::size_t const wanted = keys + keys * 15 / 16 + 1;
        requireCountable(wanted);
        return wanted;
    }
    // The upper half of the hash, scaled to the number of slots.
    std::size_t startOf(std::uint64_t key) const {
        return static_cast<std::size_t>((hash(key) >> 32) * slots.size() >> 32);
    }
    std::size_t next(std::size_t i) const { return i + 1 == slots.size() ? 0 : i + 1; }
    std::size_t positionOf(std::uint64_t key) const {
        std::size_t i = startOf(key);
        while (!slots[i].isFree() && slots[i].key != key) i = next(i);
        return i;
    }

    std::vector<Slot> slots;
    std::size_t count = 0;
    SeededHash hash;
};

/// Reserves room for so many more elements, with geometric growth.
template <class T>
void reserveFor(std::vector<T>& list, std::size_t further) {
    std::size_t const wanted = list.size() + further;
    if (wanted > list.capacity()) list.reserve(std::max(wanted, 2 * list.capacity()));
}
/// The same for an unordered container of the standard library.
template <class Container>
void reserveSlots(Container& container, std::size_t further) {
    auto const room = static_cast<double>(container.bucket_count()) *
                      static_cast<double>(container.max_load_factor());
    std::size_t const wanted = container.size() + further;
    if (static_cast<double>(wanted) >= room) container.reserve(2 * wanted);
}

}  // namespace tarn::engine::detail

#endif
