#include "tools/check/FolderCheck.h"

#include "lumenkey/Channels/KFChannelFlags.h"

namespace lumenkey::tools {

void FolderCheck::addRanked(TextPlace const& place, std::string name, std::size_t rank) {
    _children.push_back({place, std::move(name), rank});
}

void FolderCheck::addUnlockedBelow(FolderCheck& child) {
    if (_unlocked.size() < child._unlocked.size()) {
        _unlocked.swap(child._unlocked); // their order doesn't matter
    }
    _unlocked.insert(_unlocked.end(), child._unlocked.begin(), child._unlocked.end());
}

void FolderCheck::readFoldFlags(TextPlace const& place, std::uint32_t flags) {
    _foldFlagsPlace = place;
    _foldFlags = flags;
}

/// Of the first child that is put behind one that follows it.
std::pair<TextPlace, Fault> FolderCheck::faultOfOrder() const {
    Child const* first = nullptr;
    Child const* least = nullptr;
    Child const* ahead = nullptr;
    for (auto child = _children.rbegin(); child != _children.rend(); ++child) {
        if (least != nullptr && child->rank > least->rank) {
            first = &*child;
            ahead = least;
        } else {
            least = &*child;
        }
    }
    if (first == nullptr) {
        return {};
    }
    return {first->place,
            {"the channel '" + first->name + "' is put behind '" + ahead->name +
                 "', which its folder has in front of it",
             true}};
}

std::vector<std::pair<TextPlace, Fault>> FolderCheck::faultsAtEnd(bool locks, bool hasChildren) {
    std::vector<std::pair<TextPlace, Fault>> faults{faultOfOrder()};
    if (hasChildren && (_foldFlags & kFoldFlagChildrenNotSaved) != 0) {
        faults.push_back({_foldFlagsPlace,
                          {"'foldFlags' is " + std::to_string(_foldFlags) +
                           ", by which documents leave out the channels of the folder"}});
    }
    if (locks) {
        for (TextPlace const& place : std::exchange(_unlocked, {})) {
            faults.push_back({place, {"the channel isn't locked: the object root above it locks it"}});
        }
    }
    return faults;
}

} // namespace lumenkey::tools
