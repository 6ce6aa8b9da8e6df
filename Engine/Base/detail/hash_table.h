// Engine/Base/detail/hash_table.h: slots by 64-bit keys, whatever keys a document chooses.
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

/// The position of nothing.
constexpr std::uint32_t kNone = std::numeric_limits<std::uint32_t>::max();

/// Positions take 32 bits, of which one pattern stands for none.
inline void requireCountable(std::size_t count) {
    if (count >= kNone) throw std::length_error("PatchIndex");
}

/// Tables and documents are larger than caches: what is needed a few steps on is asked for early.
constexpr std::size_t kAhead = 8;

/// Spreads identifiers that were counted up over all bits.
constexpr std::uint64_t mix(std::uint64_t key) {
    key ^= key >> 32;
    key *= 0xd6e8feb86659fd93;
    key ^= key >> 32;
    key *= 0xd6e8feb86659fd93;
    return key;
}

/// Different in every table, by where it is in memory: a document cannot choose its identifiers so
/// that all of them come to the same slot.
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

/// A hash table in one block, made from all its slots at once and probed in a line. A `Slot` has a
/// `key` and says itself whether it is free; one made by default is. The first slot that comes for
/// a key stays.
template <class Slot>
class HashTable {
public:
    explicit HashTable(std::vector<Slot> const& filled)
        : HashTable(filled, SeededHash{mix(reinterpret_cast<std::uintptr_t>(this))}) {}
    /// Tables with one seed have their keys in one order.
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
    /// How many keys there are.
    std::size_t size() const { return count; }

    /// The slot of the key, or the free one where it would be.
    Slot const& slotFor(std::uint64_t key) const { return slots[positionOf(key)]; }
    Slot& slotFor(std::uint64_t key) { return slots[positionOf(key)]; }

    /// Asks for the slots where the key will be looked for; probes often reach into a second line
    /// of the cache.
    void prefetch(std::uint64_t key) const {
        std::size_t const start = startOf(key);
        detail::prefetch(&slots[start]);
        detail::prefetch(&slots[std::min(start + 3, slots.size() - 1)]);
    }

    /// Makes room for so many further keys. A failing allocation changes nothing.
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

    /// Adds a slot. There is room, and its key is new.
    void insert(Slot const& slot) noexcept {
        slotFor(slot.key) = slot;
        ++count;
    }

    /// Frees the slot of a key that is there. References to other slots are no longer valid.
    void erase(std::uint64_t key) noexcept {
        std::size_t gap = positionOf(key);
        // Slots that were probed for across the gap move into it.
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
    // A quarter more slots than keys keeps the probes short, and one is always free.
    static std::size_t sizeFor(std::size_t keys) {
        std::size_t const wanted = keys + keys / 4 + 1;
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

/// Room for so many further elements, at a cost that does not add up.
template <class T>
void reserveFor(std::vector<T>& list, std::size_t further) {
    std::size_t const wanted = list.size() + further;
    if (wanted > list.capacity()) list.reserve(std::max(wanted, 2 * list.capacity()));
}
/// The same for a container of the standard library that hashes.
template <class Container>
void reserveSlots(Container& container, std::size_t further) {
    auto const room = static_cast<double>(container.bucket_count()) *
                      static_cast<double>(container.max_load_factor());
    std::size_t const wanted = container.size() + further;
    if (static_cast<double>(wanted) >= room) container.reserve(2 * wanted);
}

}  // namespace tarn::engine::detail

#endif
