// Internal: not installed.
#pragma once

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFChannelFolder.h"

#include <cstddef>
#include <memory>

/// How many children a folder's class makes for itself; they stand in front of all others.
inline std::size_t KFComponentCountOf(KFChannelFolder const& folder) {
    auto* const maker = dynamic_cast<KFChannelFactory*>(folder.getFactory());
    std::unique_ptr<KFChannelBase> const example(maker == nullptr ? nullptr : maker->createChannel("", 1));
    auto const* const like = dynamic_cast<KFChannelFolder const*>(example.get());
    return like == nullptr ? 0 : like->getNumberOfDescendants();
}

/// Marks what compounds leave unmarked, which mark no class below them but their own: classes of children that
/// theirs don't make, and that couldn't be read again without.
class KFCompoundMarks {
public:
    explicit KFCompoundMarks(BXSerializerWriteStream& stream) noexcept : _stream(stream) {}

    void markBelow(KFChannelBase& channel) {
        auto* const folder = dynamic_cast<KFChannelFolder*>(&channel);
        if (folder == nullptr || folder->getDescendants() == nullptr)
            return;
        bool const isCompound = folder->isCompoundChannel();
        std::size_t const made = isCompound ? countOf(*folder) : 0;
        std::size_t position = 0;
        for (KFChannelBase* const child : *folder->getDescendants()) {
            if (isCompound && position++ >= made)
                child->markFactoriesForSerialization(_stream, false);
            markBelow(*child);
        }
    }

private:
    /// Trees have many compounds of few classes.
    std::size_t countOf(KFChannelFolder const& folder) {
        if (_factory != folder.getFactory()) {
            _factory = folder.getFactory();
            _count = KFComponentCountOf(folder);
        }
        return _count;
    }

    BXSerializerWriteStream& _stream;
    KFFactory* _factory = nullptr;
    std::size_t _count = 0;
};
