#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSerializer.h"
#include "lumenkey/foundation/BXString.h"

#include <compare>
#include <cstddef>
#include <string>

class KFChannelBase;

/// Names a channel by a path of IDs, so that a reference survives copying, renaming and storing.
///
///     ./12/3     from the node given on resolving: its child 12, and of that the child 3
///     ./         that node itself
///     7/12/3     the same, if the node's own ID is 7
///     7          the node itself
///     (empty)    no channel
///
/// IDs are decimal, of 32 bits. The slash behind the dot may be missing, and one slash may stand at the end.
/// Malformed text (anything but digits between the slashes, an empty part, a number over 32 bits) names no
/// channel.
class LUMENKEY_API KFChannelRef : public std::string {
public:
    KFChannelRef() = default;
    KFChannelRef(BXString const& path);
    KFChannelRef(char const* path);
    /// The path from `root`, which must be `channel` or above it: the single form for `channel` itself, else
    /// the relative one. With a null root the absolute form from the top of the tree. A root that isn't above
    /// `channel` counts as null; a null channel gives the empty path.
    KFChannelRef(KFChannelBase const* channel, KFChannelBase const* root);

    KFChannelRef& operator=(BXString const& path);
    KFChannelRef& operator=(char const* path);

    /// The channel on the path from `root`; null for a null root, malformed text, or no such channel.
    KFChannelBase* getChannel(KFChannelBase* root) const;
    /// The last ID behind a "/" or "."; 0 without one (so also for the single form) and for what is no
    /// number.
    unsigned int getID() const noexcept;
    /// Replaces what `getID` reads; nothing without a "/" or ".".
    void setID(unsigned int id);
    /// The text from its first component 9999 on, else from its last component; without a 9999, the whole of
    /// a text that ends in "/". Points into this string.
    char const* getCobaltOnlyPath() const noexcept;

    /// Appends the length in bytes as 32 bits in the machine's order, and the text without a terminator.
    /// True; false, with nothing appended, for a text whose length doesn't fit.
    bool writeToData(BXData& data) const;
    /// Reads that at `offset`; the place behind it. What doesn't lie within `data` is left unread: the answer
    /// is `offset`, and this path stays as it was.
    int readFromData(BXData const& data, int offset);

    friend bool operator==(KFChannelRef const& a, KFChannelRef const& b) noexcept {
        return a.str() == b.str();
    }
    friend bool operator==(KFChannelRef const& a, char const* b) noexcept {
        return b != nullptr && a.str() == b;
    }
    friend std::strong_ordering operator<=>(KFChannelRef const& a, KFChannelRef const& b) noexcept {
        return a.str() <=> b.str();
    }
    std::string const& str() const noexcept { return *this; }
};
