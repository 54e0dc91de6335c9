// Internal: not installed.
#pragma once

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFChannelFolder.h"

#include <memory>

/// A new folder of the same class, with the children that the class makes; null where it makes no folder.
inline std::unique_ptr<KFChannelFolder> KFExampleOf(KFChannelFolder const& folder) {
    auto* const maker = dynamic_cast<KFChannelFactory*>(folder.getFactory());
    std::unique_ptr<KFChannelBase> made(maker == nullptr ? nullptr : maker->createChannel("", 1));
    auto* const like = dynamic_cast<KFChannelFolder*>(made.get());
    if (like != nullptr)
        static_cast<void>(made.release());
    return std::unique_ptr<KFChannelFolder>(like);
}

/// Marks what compounds leave unmarked, which mark no class below them but their own: classes of children
/// that theirs don't make, and that couldn't be read again without.
class KFCompoundMarks {
public:
    explicit KFCompoundMarks(BXSerializerWriteStream& stream) noexcept : _stream(stream) {}

    void markBelow(KFChannelBase& channel) {
        auto* const folder = dynamic_cast<KFChannelFolder*>(&channel);
        if (folder == nullptr || folder->getDescendants() == nullptr)
            return;
        bool const isCompound = folder->isCompoundChannel();
        for (KFChannelBase* const child : *folder->getDescendants()) {
            if (isCompound && !isMadeBy(*folder, *child))
                child->markFactoriesForSerialization(_stream, false);
            markBelow(*child);
        }
    }

private:
    /// As readers look for it, wherever it stands.
    bool isMadeBy(KFChannelFolder const& folder, KFChannelBase const& child) {
        if (_factory != folder.getFactory()) { // trees have many compounds of few classes
            _factory = folder.getFactory();
            _example = KFExampleOf(folder);
        }
        KFChannelBase const* const like = _example ? _example->getDescendant(child.getID()) : nullptr;
        return like != nullptr && like->getFactory() == child.getFactory();
    }

    BXSerializerWriteStream& _stream;
    KFFactory* _factory = nullptr;
    std::unique_ptr<KFChannelFolder> _example;
};
