#pragma once

#include <atomic>

/// A plain value that several threads may read and write at once without a data race.
///
/// Reads and writes are relaxed atomic accesses: each sees some whole value that was once written, and nothing is
/// ordered by them. That is what a hint, a flag or a number of a keypoint needs that one thread edits while others
/// evaluate: whoever needs several of them to agree holds the lock that guards them. On the usual machines the
/// accesses cost what plain ones do.
template <class Value> class BXRelaxed {
public:
    constexpr BXRelaxed() noexcept : _value() {}
    constexpr BXRelaxed(Value value) noexcept : _value(value) {}
    BXRelaxed(BXRelaxed const& other) noexcept : _value(other.get()) {}

    BXRelaxed& operator=(BXRelaxed const& other) noexcept {
        set(other.get());
        return *this;
    }
    BXRelaxed& operator=(Value value) noexcept {
        set(value);
        return *this;
    }

    Value get() const noexcept { return _value.load(std::memory_order_relaxed); }
    void set(Value value) noexcept { _value.store(value, std::memory_order_relaxed); }
    operator Value() const noexcept { return get(); }

private:
    std::atomic<Value> _value;
};
