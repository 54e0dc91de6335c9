// Walks through everything below a folder: searches, lists, and counterparts of channels from elsewhere.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelFolder.h"

#include <array>
#include <memory>

namespace {

/// Matches by how much agrees, as the search fills them: 1 for the ID plus 2 for the name.
using MatchSlots = std::array<KFChannelBase*, 4>;

KFChannelFolder* asFolder(KFChannelBase* channel) noexcept {
    return channel->testFlag(kChannelFlagIsFolder) ? static_cast<KFChannelFolder*>(channel) : nullptr;
}

KFChannelBase* bestMatch(KFChannelFolder& folder, KFChannelBase const* channel) {
    MatchSlots slots{};
    folder.findMatchingDescendant(channel, slots.data());
    for (std::size_t const preferred : {3U, 2U, 1U}) {
        if (slots[preferred] != nullptr) {
            return slots[preferred];
        }
    }
    return nullptr;
}

/// Where the name of a component begins in a name such as `Compound.component` or
/// `Folder.Compound.component`; 0 in a plain name.
std::size_t componentBegin(BXString const& name) noexcept {
    long const first = name.find(".");
    if (first < 0) {
        return 0;
    }
    long const second = name.find(".", static_cast<std::size_t>(first) + 1);
    return static_cast<std::size_t>(second < 0 ? first : second) + 1;
}

} // namespace

bool KFChannelFolder::hasDescendant(KFChannelBase const* channel) const {
    return anyChild([channel](KFChannelBase const& child) {
        return &child == channel || (child.testFlag(kChannelFlagIsFolder) &&
                                     static_cast<KFChannelFolder const&>(child).hasDescendant(channel));
    });
}

void KFChannelFolder::getDescendantObjects(std::vector<unsigned int>* out) const {
    if (out == nullptr) {
        return;
    }
    auto const append = [out](KFChannelBase const& node) {
        if (node.getID() >= kFirstDynamicChannelID) {
            out->push_back(node.getID());
        }
    };
    append(*this);
    forEachChild([&](KFChannelBase& child) {
        append(child);
        if (KFChannelFolder const* const folder = asFolder(&child)) {
            folder->getDescendantObjects(out);
        }
    });
}

void KFChannelFolder::getAllDescendantsFlattened(std::vector<KFChannelBase*>& out, KFChannelFlags mask,
                                                 bool stopAtRoots) const {
    forEachChild([&](KFChannelBase& child) {
        if (child.testFlag(mask)) {
            return;
        }
        if (KFChannelFolder const* const folder = asFolder(&child)) {
            if (!stopAtRoots || !child.testFlag(kChannelFlagIsObjectRoot)) {
                folder->getAllDescendantsFlattened(out, mask, false);
            }
        } else if (dynamic_cast<KFChannel*>(&child) != nullptr) {
            out.push_back(&child);
        }
    });
}

// Counterparts ----------------------------------------------------------------------------------------------

void KFChannelFolder::findMatchingDescendant(KFChannelBase const* channel, KFChannelBase** slots) {
    if (channel == nullptr || slots == nullptr) {
        return;
    }
    forEachChild([=](KFChannelBase& child) {
        if (child.allowsAssignment(channel)) {
            bool const sameID = child.getID() == channel->getID();
            bool const sameName = child.getName().caseInsensitiveCompare(channel->getName()) == 0;
            KFChannelBase*& slot = slots[(sameID ? 1 : 0) + (sameName ? 2 : 0)];
            slot = slot != nullptr ? slot : &child;
        }
        if (KFChannelFolder* const folder = asFolder(&child)) {
            folder->findMatchingDescendant(channel, slots);
        }
    });
}

KFChannelBase* KFChannelFolder::findMatchingCompoundChannel(BXString const& fullDisplayName) {
    KFChannelBase* found = nullptr;
    anyChild([&](KFChannelBase const& child) {
        if (child.isCompoundChannel() &&
            child.getFullDisplayName().caseInsensitiveCompare(fullDisplayName) == 0) {
            found = const_cast<KFChannelBase*>(&child);
        } else if (child.testFlag(kChannelFlagIsFolder)) {
            auto const& folder = static_cast<KFChannelFolder const&>(child);
            found = const_cast<KFChannelFolder&>(folder).findMatchingCompoundChannel(fullDisplayName);
        }
        return found != nullptr;
    });
    return found;
}

KFChannelBase* KFChannelFolder::findMatchingDescendant(KFChannelBase const* channel) {
    if (channel == nullptr) {
        return nullptr;
    }
    if (allowsAssignment(channel)) {
        return this;
    }
    KFChannelFolder const* const parent = channel->getParent();
    std::size_t const begin = parent == nullptr ? componentBegin(channel->getName()) : 0;
    if (begin > 0) {
        KFChannelBase* const compound = findMatchingCompoundChannel(channel->getName().substrTo(begin - 1));
        std::unique_ptr<KFChannelBase> const component(compound != nullptr ? channel->clone() : nullptr);
        if (component) {
            component->setName(channel->getName().substrFrom(begin), false);
            return bestMatch(*asFolder(compound), component.get());
        }
    }
    if (parent == nullptr || !parent->isCompoundChannel()) {
        return bestMatch(*this, channel);
    }
    KFChannelBase* const compound = bestMatch(*this, parent);
    if (compound == nullptr || !compound->isCompoundChannel()) {
        return compound;
    }
    return bestMatch(*asFolder(compound), channel);
}
