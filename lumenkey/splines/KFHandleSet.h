// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXProbingTable.h"

#include <cstddef>
#include <cstdint>

/// A set of pointers that are compared and never followed: which handles are alive.
class KFHandleSet {
public:
    void reserve(std::size_t count) { _handles.reserve(count); }
    /// `handle` isn't null.
    void insert(void const* handle) { _handles.insert({handle}); }
    void erase(void const* handle) noexcept {
        if (Handle const* const entry = _handles.find(handle))
            _handles.erase(entry);
    }
    bool contains(void const* handle) const noexcept { return _handles.find(handle) != nullptr; }
    std::size_t bytes() const noexcept { return sizeof(*this) + _handles.bytes(); }

private:
    struct Handle {
        using Key = void const*;

        static std::uint64_t bits(Key handle) noexcept {
            return static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(handle));
        }
        Key key() const noexcept { return handle; }
        bool isFree() const noexcept { return handle == nullptr; }

        void const* handle = nullptr;
    };

    BXProbingTable<Handle> _handles;
};
