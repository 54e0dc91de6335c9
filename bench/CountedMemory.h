#pragma once

#include <cstddef>
#include <cstdint>

/// The program's `operator new` and `operator delete`, which the library calls too, count and hand on to
/// malloc.
namespace CountedMemory {

/// Allocations and releases by this thread so far.
std::uint64_t calls() noexcept;
/// Bytes of the heap in use, with its own bookkeeping.
std::size_t heapBytes() noexcept;
/// How far the memory from `operator new` rises above what it is at `start`, and what is left of that at
/// `stop`. One thread.
class Peak {
public:
    struct Rise {
        std::ptrdiff_t highest;
        std::ptrdiff_t left;
    };
    void start() noexcept;
    Rise stop() noexcept;
};
/// Bytes that the heap gave for an object from `operator new`, without its bookkeeping.
std::size_t objectBytes(void* object) noexcept;

} // namespace CountedMemory
