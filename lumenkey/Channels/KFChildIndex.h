// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXProbingTable.h"

#include <cstdint>

class KFChannelBase;

/// What a folder with many children knows of an ID.
struct KFChildIndexEntry {
    using Key = unsigned int;

    static std::uint64_t bits(Key id) noexcept { return id; }
    Key key() const noexcept { return id; }
    bool isFree() const noexcept { return first == nullptr; }

    KFChannelBase* first = nullptr;
    unsigned int id = 0;
    unsigned int count = 0; // of entries in the list with this ID
};

/// The first child of each ID.
class KFChildIndex : public BXProbingTable<KFChildIndexEntry> {};
