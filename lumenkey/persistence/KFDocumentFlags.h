// Internal: not installed.
#pragma once

#include "lumenkey/Channels/KFChannelFlags.h"

#include <cstdint>

// What the flags of a channel become when a document is read: `own` are those that it has, `read` those that the
// document gives.

/// Bits 17, 21 and 25 of a folder's are its class's.
inline constexpr std::uint32_t kFoldFlagsOfClass = 0x2220000;
/// What `baseFlags`, of which the low word counts, doesn't change.
inline constexpr KFChannelFlags kNotOfBaseFlags =
    kChannelFlagDisabled | kChannelFlagLocked | kChannelFlagNameUnset | kChannelClassFlags;
inline constexpr KFChannelFlags kLowWord = 0xFFFFFFFF;

/// By the attribute of a child.
constexpr KFChannelFlags KFFlagsOfAttribute(KFChannelFlags own, KFChannelFlags read) noexcept {
    return (own & kChannelParsePreservedFlags) | (read & ~kChannelParsePreservedFlags);
}

/// By the element `flags`, which replaces the whole word, but for what a node is: a document can't make a folder of a
/// value. A root is locked only when its children have been read, and keeps the bit that no document holds.
constexpr KFChannelFlags KFFlagsOfElement(KFChannelFlags own, KFChannelFlags read) noexcept {
    bool const isRoot = (own & kChannelFlagIsObjectRoot) != 0;
    KFChannelFlags const kept = kChannelClassFlags | (isRoot ? kChannelFlagNameUnset : 0);
    KFChannelFlags const taken = isRoot ? read & ~kChannelFlagLocked : read;
    return (taken & ~kept) | (own & kept);
}

/// By the element `baseFlags` of a root, which stays one.
constexpr KFChannelFlags KFFlagsOfBaseFlags(KFChannelFlags own, KFChannelFlags read) noexcept {
    return (read & kLowWord & ~kNotOfBaseFlags) | (own & kNotOfBaseFlags) | kChannelClassFlags;
}

constexpr std::uint32_t KFFoldFlagsOfElement(std::uint32_t own, std::uint32_t read) noexcept {
    return (read & ~kFoldFlagsOfClass) | (own & kFoldFlagsOfClass);
}
