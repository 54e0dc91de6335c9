// Internal: not installed.
#pragma once

#include <atomic>
#include <cstdint>

/// A number for each state that a store of vertices goes through, which no other state of any store in the process has
/// or ever had: who finds it again has found the same store, unchanged, even where one was made at the address of
/// another. It grows. Numbers are drawn in runs, so that the stores don't contend for each.
///
/// Threads: one at a time advances it; any may read it. Who reads it with `acquired` and finds a number that was read
/// under the store's lock may use what was computed under that lock.
class KFStoreVersion {
public:
    KFStoreVersion() noexcept : _number(drawRun()) {}
    KFStoreVersion(KFStoreVersion const&) = delete;
    KFStoreVersion& operator=(KFStoreVersion const&) = delete;

    std::uint64_t get() const noexcept { return _number.load(std::memory_order_relaxed); }
    std::uint64_t acquired() const noexcept { return _number.load(std::memory_order_acquire); }

    void advance() noexcept {
        std::uint64_t const next = get() + 1;
        _number.store(next % kRun == 0 ? drawRun() : next, std::memory_order_release);
    }

    /// The run that a number comes from; each run is one store's. 0 is nobody's.
    static constexpr std::uint64_t runOf(std::uint64_t number) noexcept { return number / kRun; }

private:
    static constexpr std::uint64_t kRun = 4096;

    static std::uint64_t drawRun() noexcept {
        return _nextRun.fetch_add(1, std::memory_order_relaxed) * kRun;
    }

    static inline std::atomic<std::uint64_t> _nextRun{1};

    std::atomic<std::uint64_t> _number;
};
