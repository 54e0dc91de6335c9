#pragma once

#include "tools/check/DocumentScanner.h"
#include "tools/check/Fault.h"

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

namespace lumenkey::tools {

/// What a folder does to the channels below it when it is read and written again.
class FolderCheck {
public:
    /// A child of a folder whose class makes some: `rank` is its place among those, or behind them.
    void addRanked(TextPlace const& place, std::string name, std::size_t rank);
    /// A value channel that isn't locked, and that a lock from above reaches.
    void addUnlocked(TextPlace const& place) { _unlocked.push_back(place); }
    /// Those below a child that a lock from above reaches. They may stay in the child, or others.
    void addUnlockedBelow(FolderCheck& child);
    void readFoldFlags(TextPlace const& place, std::uint32_t flags);

    /// `locks` is for an object root that is locked.
    std::vector<std::pair<TextPlace, Fault>> faultsAtEnd(bool locks, bool hasChildren);

private:
    struct Child {
        TextPlace place;
        std::string name;
        std::size_t rank;
    };

    std::pair<TextPlace, Fault> faultOfOrder() const;

    std::vector<Child> _children;
    std::vector<TextPlace> _unlocked;
    TextPlace _foldFlagsPlace;
    std::uint32_t _foldFlags = 0;
};

} // namespace lumenkey::tools
