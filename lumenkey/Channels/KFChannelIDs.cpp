// The generator of dynamic IDs.

#include "lumenkey/Channels/KFChannelFolder.h"

#include <atomic>

namespace {

// Only the number itself is shared, nothing is ordered by it: relaxed accesses are enough.
constinit std::atomic<unsigned int> nextID{kFirstDynamicChannelID};

} // namespace

unsigned int KFChannelBase::getNextUniqueID() noexcept {
    return nextID.fetch_add(1, std::memory_order_relaxed);
}

unsigned int KFChannelBase::getLastUsedUniqueID() noexcept { return nextID.load(std::memory_order_relaxed); }

void KFChannelBase::updateIDGenerator(unsigned int id) noexcept {
    if (id >= kFirstForeignChannelID) {
        return;
    }
    unsigned int next = nextID.load(std::memory_order_relaxed);
    while (next <= id && !nextID.compare_exchange_weak(next, id + 1, std::memory_order_relaxed)) {
    }
}

void KFChannelBase::updateIDGenerator(KFChannelFolder const& folder) {
    std::vector<KFChannelBase*> const* const children = folder.getDescendants();
    if (children == nullptr) {
        return;
    }
    for (KFChannelBase const* const child : *children) {
        if (child->shouldIgnoreDynamicIDs()) {
            continue;
        }
        updateIDGenerator(child->getID());
        if (child->testFlag(kChannelFlagIsFolder)) {
            updateIDGenerator(static_cast<KFChannelFolder const&>(*child));
        }
    }
}
