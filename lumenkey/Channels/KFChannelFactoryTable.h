// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXUUID.h"

#include <span>
#include <string_view>

class KFFactory;

/// A class of the tree as documents name it: UUIDs are for ever.
struct KFChannelFactoryRow {
    std::string_view className;
    std::string_view uuid;
    std::string_view superClassName; // empty at the top
    /// Null for a class that this version of the library doesn't have.
    KFFactory* (*getInstance)();
    /// Whether the registry lists it without the host's doing.
    bool registered = true;

    BXUUID identity() const noexcept;
};

/// All classes, in the order of registration.
std::span<KFChannelFactoryRow const> KFChannelFactoryTable() noexcept;
/// The row of a class; the class must be in the table.
KFChannelFactoryRow const& KFChannelFactoryRowOf(std::string_view className) noexcept;
/// The UUID of a class; all zero for an empty name.
BXUUID KFChannelFactoryUUID(std::string_view className) noexcept;
