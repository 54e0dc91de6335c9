// Replaces the program's `new` and `delete`. A source of its own: where the compiler sees them beside their
// callers, it takes the block from std::malloc for one from another allocator.

#include "tests/curves/CountedMemory.h"

#include <cstdint>
#include <cstdlib>
#include <new>

namespace {

thread_local std::size_t allocations = 0;
thread_local std::size_t given = SIZE_MAX; // blocks, before one is refused

} // namespace

std::size_t allocationsOfThisThread() noexcept { return allocations; }
void refuseAllocationsAfter(std::size_t count) noexcept { given = count; }

void* operator new(std::size_t size) {
    ++allocations;
    if (given == 0)
        throw std::bad_alloc();
    given -= given == SIZE_MAX ? 0 : 1;
    if (void* const block = std::malloc(size == 0 ? 1 : size))
        return block;
    throw std::bad_alloc();
}
void* operator new(std::size_t size, std::nothrow_t const&) noexcept {
    try {
        return operator new(size);
    } catch (std::bad_alloc const&) {
        return nullptr;
    }
}
void operator delete(void* block) noexcept { std::free(block); }
void operator delete(void* block, std::size_t) noexcept { std::free(block); }
