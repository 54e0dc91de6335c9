#include "lumenkey/foundation/BXLocks.h"

#include <thread>

#if defined(__x86_64__) || defined(__i386__)
#include <immintrin.h>
#endif

namespace {

void pauseProcessor() noexcept {
#if defined(__x86_64__) || defined(__i386__)
    _mm_pause();
#elif defined(__aarch64__) || defined(__arm__)
    asm volatile("yield");
#endif
}

} // namespace

void BXSpinLock::waitAndLock() noexcept {
    // In pauses, which last 10 to 45 ns each. Every look takes the cache line from the owner, which costs it some
    // ten turns, so even the first wait lasts for many. Tuned by measuring two threads on one lock: half the longest
    // wait lost about 5 % of the throughput, twice as much gained nothing that stood out.
    constexpr unsigned firstWait = 16;
    constexpr unsigned longestWait = 128;
    constexpr unsigned looksBeforeYielding = 16;
    unsigned wait = firstWait;
    for (unsigned looks = 0;; ++looks) {
        if (looks < looksBeforeYielding) {
            for (unsigned i = 0; i < wait; ++i) {
                pauseProcessor();
            }
            wait = wait < longestWait ? wait * 2 : longestWait;
        } else {
            std::this_thread::yield();
        }
        if (tryLock()) {
            return;
        }
    }
}
