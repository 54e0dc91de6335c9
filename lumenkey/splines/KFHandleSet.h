// Internal: not installed.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

/// A set of pointers that are compared and never followed: which handles are alive. Open addressing with linear
/// probing and deletion by shifting back (Knuth, "The Art of Computer Programming", volume 3, 6.4, algorithm R).
class KFHandleSet {
public:
    void reserve(std::size_t count);
    void insert(void const* handle);
    void erase(void const* handle) noexcept;
    bool contains(void const* handle) const noexcept;
    std::size_t bytes() const noexcept { return sizeof(*this) + _slots.capacity() * sizeof(void const*); }

private:
    std::size_t home(void const* handle) const noexcept;
    std::size_t slotOf(void const* handle) const noexcept;
    void rehash(std::size_t slots);

    /// A power of two of slots, at most three quarters of them in use; null is free.
    std::vector<void const*> _slots;
    std::size_t _count = 0;
};
