#include "bench/CountedMemory.h"

#include <cstdlib>
#include <new>

#include <malloc.h>

namespace {

thread_local std::uint64_t callsOfThread = 0;
thread_local bool isWatched = false;
thread_local std::ptrdiff_t risen = 0;
thread_local std::ptrdiff_t highest = 0;

void* watched(void* object) noexcept {
    if (isWatched && object != nullptr) {
        risen += static_cast<std::ptrdiff_t>(malloc_usable_size(object));
        if (risen > highest)
            highest = risen;
    }
    return object;
}

void* allocate(std::size_t size) noexcept {
    ++callsOfThread;
    return watched(std::malloc(size == 0 ? 1 : size));
}

void* allocate(std::size_t size, std::align_val_t alignment) noexcept {
    ++callsOfThread;
    auto const step = static_cast<std::size_t>(alignment);
    return watched(std::aligned_alloc(step, (size + step - 1) / step * step));
}

void release(void* object) noexcept {
    if (object != nullptr)
        ++callsOfThread;
    if (isWatched)
        risen -= static_cast<std::ptrdiff_t>(malloc_usable_size(object));
    std::free(object);
}

void* orThrow(void* object) {
    if (object == nullptr)
        throw std::bad_alloc();
    return object;
}

} // namespace

namespace CountedMemory {

std::uint64_t calls() noexcept { return callsOfThread; }

std::size_t heapBytes() noexcept {
    struct mallinfo2 const info = mallinfo2();
    return info.uordblks + info.hblkhd;
}

void Peak::start() noexcept {
    risen = 0;
    highest = 0;
    isWatched = true;
}

Peak::Rise Peak::stop() noexcept {
    isWatched = false;
    return {highest, risen};
}

std::size_t objectBytes(void* object) noexcept { return malloc_usable_size(object); }

} // namespace CountedMemory

// The array and the other forms call these by the standard's defaults.
void* operator new(std::size_t size) { return orThrow(allocate(size)); }
void* operator new(std::size_t size, std::align_val_t alignment) {
    return orThrow(allocate(size, alignment));
}
void operator delete(void* object) noexcept { release(object); }
void operator delete(void* object, std::size_t) noexcept { release(object); }
void operator delete(void* object, std::align_val_t) noexcept { release(object); }
void operator delete(void* object, std::size_t, std::align_val_t) noexcept { release(object); }
