// Internal: not installed.
#pragma once

#include <algorithm>
#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <vector>

class KFVertex;

/// One bit for each slot of a block.
class KFSlotSet {
public:
    static constexpr std::uint32_t kCapacity = 256;

    bool test(std::uint32_t slot) const noexcept {
        return (_words[slot / kWordBits] >> (slot % kWordBits) & 1) != 0;
    }

    void set(std::uint32_t slot, bool value) noexcept {
        std::uint64_t const bit = std::uint64_t{1} << (slot % kWordBits);
        std::uint64_t& word = _words[slot / kWordBits];
        word = value ? word | bit : word & ~bit;
    }

    /// Moves the bits from `slot` on up by one and puts `value` there.
    void insert(std::uint32_t slot, bool value) noexcept {
        for (std::size_t i = _words.size() - 1; i > slot / kWordBits; --i) {
            _words[i] = _words[i] << 1 | _words[i - 1] >> (kWordBits - 1);
        }
        std::uint64_t& word = _words[slot / kWordBits];
        std::uint64_t const below = (std::uint64_t{1} << (slot % kWordBits)) - 1;
        word = (word & below) | (word & ~below) << 1;
        set(slot, value);
    }

    /// Moves the bits behind `slot` down by one.
    void remove(std::uint32_t slot) noexcept {
        std::size_t const first = slot / kWordBits;
        std::uint64_t const below = (std::uint64_t{1} << (slot % kWordBits)) - 1;
        _words[first] = (_words[first] & below) | (_words[first] >> 1 & ~below);
        for (std::size_t i = first + 1; i < _words.size(); ++i) {
            _words[i - 1] |= _words[i] << (kWordBits - 1);
            _words[i] >>= 1;
        }
    }

    /// The first set bit at or after `slot`; the capacity when there is none.
    std::uint32_t from(std::uint32_t slot) const noexcept {
        for (std::uint32_t i = slot / kWordBits; i < kWords; ++i) {
            std::uint64_t word = _words[i];
            if (i == slot / kWordBits)
                word &= ~std::uint64_t{0} << (slot % kWordBits);
            if (word != 0)
                return i * kWordBits + static_cast<std::uint32_t>(std::countr_zero(word));
        }
        return kCapacity;
    }

    /// The last set bit before `slot`, which may be the capacity; the capacity when there is none.
    std::uint32_t before(std::uint32_t slot) const noexcept {
        for (std::uint32_t i = std::min(slot / kWordBits, kWords - 1) + 1; i-- > 0;) {
            std::uint64_t word = _words[i];
            if (i == slot / kWordBits)
                word &= (std::uint64_t{1} << (slot % kWordBits)) - 1;
            if (word != 0)
                return i * kWordBits + static_cast<std::uint32_t>(std::bit_width(word)) - 1;
        }
        return kCapacity;
    }

private:
    static constexpr std::uint32_t kWordBits = 64;
    static constexpr std::uint32_t kWords = kCapacity / kWordBits;

    std::array<std::uint64_t, kWords> _words{};
};

/// A vertex and its position, side by side: the search that ends at a position has then fetched the vertex's address.
struct KFVertexEntry {
    std::int64_t tick;
    KFVertex* vertex;
};

/// A run of neighbouring vertices of a store, and the set of those that are valid. No block of a store is empty.
struct KFVertexBlock {
    static constexpr std::uint32_t kCapacity = KFSlotSet::kCapacity;
    /// Of entries, in one that holds any.
    static constexpr std::uint32_t kLeastRoom = 8;

    std::vector<KFVertexEntry> entries;
    KFSlotSet valid;
    std::uint32_t validCount = 0;

    std::uint32_t count() const noexcept { return static_cast<std::uint32_t>(entries.size()); }
    bool isAllValid() const noexcept { return validCount == entries.size(); }

    void insert(std::uint32_t slot, KFVertex* vertex, std::int64_t tick, bool isValid) {
        growForOne();
        entries.insert(entries.begin() + slot, KFVertexEntry{tick, vertex});
        valid.insert(slot, isValid);
        validCount += isValid ? 1 : 0;
    }

    void remove(std::uint32_t slot) {
        validCount -= valid.test(slot) ? 1 : 0;
        entries.erase(entries.begin() + slot);
        valid.remove(slot);
    }

    void setValid(std::uint32_t slot, bool isValid) noexcept {
        validCount -= valid.test(slot) ? 1 : 0;
        validCount += isValid ? 1 : 0;
        valid.set(slot, isValid);
    }

private:
    void growForOne() {
        if (entries.size() < entries.capacity())
            return;
        std::size_t const wanted =
            std::min<std::size_t>(std::max<std::size_t>(kLeastRoom, 2 * entries.size()), kCapacity);
        entries.reserve(wanted);
    }
};
