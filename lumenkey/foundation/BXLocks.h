#pragma once

#include "lumenkey/foundation/BXExport.h"

#include <atomic>
#include <cstdint>
#include <mutex>

/// Mutual exclusion for stretches of some ten nanoseconds, in four bytes. Not recursive: taking it twice on one
/// thread waits for ever. Not fair: under contention the owner may take it many times in a row, which is what
/// keeps two threads from being slower than one. Do not hold it over anything that may block.
///
/// Uncontended, a lock is one exchange and an unlock one store. A thread that finds it taken pauses without
/// touching the lock's cache line, twice as long after each failed look, up to a few microseconds (Anderson,
/// "The Performance of Spin Lock Alternatives for Shared-Memory Multiprocessors", 1990); after many looks it
/// yields the processor each time, so that a preempted owner can go on.
class LUMENKEY_API BXSpinLock {
public:
    constexpr BXSpinLock() noexcept = default;
    BXSpinLock(BXSpinLock const&) = delete;
    BXSpinLock& operator=(BXSpinLock const&) = delete;

    void lock() noexcept {
        if (_taken.exchange(1, std::memory_order_acquire) != 0) [[unlikely]] {
            waitAndLock();
        }
    }
    void unlock() noexcept { _taken.store(0, std::memory_order_release); }

    /// True if the lock was free and is now the caller's. Never waits.
    bool tryLock() noexcept {
        return _taken.load(std::memory_order_relaxed) == 0 &&
               _taken.exchange(1, std::memory_order_acquire) == 0;
    }
    bool try_lock() noexcept { return tryLock(); }

private:
    void waitAndLock() noexcept;

    std::atomic<uint32_t> _taken{0};
};

/// Mutual exclusion where a thread may have to wait for long, or for a stretch that may block. Not recursive.
using BXMutex = std::mutex;

/// Holds a lock for a scope. A null lock means that there is nothing to hold.
template <class Lock> class [[nodiscard]] BXLockSentry {
public:
    explicit BXLockSentry(Lock& lock) : _lock(&lock) { lock.lock(); }
    explicit BXLockSentry(Lock* lock) : _lock(lock) {
        if (lock != nullptr) {
            lock->lock();
        }
    }
    ~BXLockSentry() { release(); }
    BXLockSentry(BXLockSentry const&) = delete;
    BXLockSentry& operator=(BXLockSentry const&) = delete;

    /// Gives the lock back before the scope ends; later calls do nothing.
    void release() noexcept {
        if (_lock != nullptr) {
            _lock->unlock();
            _lock = nullptr;
        }
    }

private:
    Lock* _lock;
};
