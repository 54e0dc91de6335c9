// Internal: not installed.
#pragma once

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <vector>

/// Entries by their keys, in one block. Open addressing with linear probing and deletion by shifting back (Knuth, "The
/// Art of Computer Programming", volume 3, 6.4, algorithm R).
///
/// Keys may come from whoever wrote a document. Where the system places code at random, their homes differ from process
/// to process, so that nobody can choose keys that all want the same place; in a program that is always placed alike
/// (linked without PIE around the static library) somebody who knows it can.
///
/// `Entry` has a type `Key`, `key()`, `isFree()`, which is true of a new one, and a static `bits(Key)`, which differs
/// between keys. Pointers to entries stay good until the next call that isn't const.
template <class Entry> class BXProbingTable {
public:
    using Key = typename Entry::Key;

    void reserve(std::size_t count) {
        if (std::size_t const slots = slotsFor(count); slots > _slots.size())
            rehash(slots);
    }

    /// Null where there is none.
    Entry const* find(Key key) const noexcept {
        if (_slots.empty())
            return nullptr;
        Entry const& entry = _slots[slotOf(key)];
        return entry.isFree() ? nullptr : &entry;
    }
    Entry* find(Key key) noexcept {
        return const_cast<Entry*>(static_cast<BXProbingTable const*>(this)->find(key));
    }

    /// Puts an entry in unless its key is there already. Gives the one that is there.
    Entry& insert(Entry const& entry) {
        reserve(_count + 1);
        Entry& found = _slots[slotOf(entry.key())];
        if (found.isFree()) {
            found = entry;
            _count += 1;
        }
        return found;
    }

    /// `entry` is one of the table.
    void erase(Entry const* entry) noexcept {
        std::size_t const mask = _slots.size() - 1;
        auto hole = static_cast<std::size_t>(entry - _slots.data());
        for (std::size_t slot = (hole + 1) & mask; !_slots[slot].isFree(); slot = (slot + 1) & mask) {
            // An entry may move into the hole unless its home lies cyclically between the hole and where it stands.
            std::size_t const distance = (slot - home(_slots[slot].key())) & mask;
            if (distance >= ((slot - hole) & mask)) {
                _slots[hole] = _slots[slot];
                hole = slot;
            }
        }
        _slots[hole] = Entry{};
        _count -= 1;
    }

    /// What the entries take.
    std::size_t bytes() const noexcept { return _slots.capacity() * sizeof(Entry); }

private:
    static constexpr std::size_t kSmallestTable = 16;

    static std::size_t slotsFor(std::size_t count) noexcept {
        return std::bit_ceil(std::max(kSmallestTable, count + count / 3 + 1));
    }

    /// Two rounds of a multiplication and a fold, as in the finalizer of MurmurHash3 (Appleby), behind a secret: where
    /// the system has put this library.
    std::size_t home(Key key) const noexcept {
        auto const secret = static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(&kSmallestTable));
        std::uint64_t mixed = (Entry::bits(key) ^ secret) * 0x9E3779B97F4A7C15ULL;
        mixed = (mixed ^ (mixed >> 32)) * 0xFF51AFD7ED558CCDULL;
        return static_cast<std::size_t>(mixed >> 32) & (_slots.size() - 1);
    }

    /// The slot of the key, or the free one where it would go.
    std::size_t slotOf(Key key) const noexcept {
        std::size_t slot = home(key);
        while (!_slots[slot].isFree() && _slots[slot].key() != key)
            slot = (slot + 1) & (_slots.size() - 1);
        return slot;
    }

    void rehash(std::size_t slots) {
        std::vector<Entry> old(slots);
        old.swap(_slots);
        for (Entry const& entry : old) {
            if (!entry.isFree())
                _slots[slotOf(entry.key())] = entry;
        }
    }

    /// A power of two of slots, at most three quarters of them in use.
    std::vector<Entry> _slots;
    std::size_t _count = 0;
};
