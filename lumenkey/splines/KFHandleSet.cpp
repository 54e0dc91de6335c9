#include "lumenkey/splines/KFHandleSet.h"

#include <algorithm>
#include <bit>
#include <utility>

namespace {

constexpr std::size_t kSmallestTable = 16;

std::size_t slotsFor(std::size_t count) noexcept {
    return std::bit_ceil(std::max(kSmallestTable, count + count / 3 + 1));
}

} // namespace

void KFHandleSet::reserve(std::size_t count) {
    if (slotsFor(count) > _slots.size())
        rehash(slotsFor(count));
}

std::size_t KFHandleSet::home(void const* handle) const noexcept {
    // Multiplicative hashing by the golden ratio: the low bits of pointers carry little.
    auto const hash =
        static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(handle)) * 0x9E3779B97F4A7C15ULL;
    return static_cast<std::size_t>(hash >> 32) & (_slots.size() - 1);
}

/// The slot of the handle, or the free one where it would go.
std::size_t KFHandleSet::slotOf(void const* handle) const noexcept {
    std::size_t slot = home(handle);
    while (_slots[slot] != nullptr && _slots[slot] != handle)
        slot = (slot + 1) & (_slots.size() - 1);
    return slot;
}

void KFHandleSet::insert(void const* handle) {
    reserve(_count + 1);
    std::size_t const slot = slotOf(handle);
    if (_slots[slot] != nullptr)
        return;
    _slots[slot] = handle;
    _count += 1;
}

bool KFHandleSet::contains(void const* handle) const noexcept {
    return handle != nullptr && !_slots.empty() && _slots[slotOf(handle)] == handle;
}

void KFHandleSet::erase(void const* handle) noexcept {
    if (!contains(handle))
        return;
    std::size_t const mask = _slots.size() - 1;
    std::size_t hole = slotOf(handle);
    for (std::size_t slot = (hole + 1) & mask; _slots[slot] != nullptr; slot = (slot + 1) & mask) {
        // An entry may move into the hole unless its home lies cyclically between the hole and where it stands.
        std::size_t const distance = (slot - home(_slots[slot])) & mask;
        if (distance >= ((slot - hole) & mask)) {
            _slots[hole] = _slots[slot];
            hole = slot;
        }
    }
    _slots[hole] = nullptr;
    _count -= 1;
}

void KFHandleSet::rehash(std::size_t slots) {
    std::vector<void const*> old(slots, nullptr);
    old.swap(_slots);
    for (void const* handle : old) {
        if (handle != nullptr)
            _slots[slotOf(handle)] = handle;
    }
}
