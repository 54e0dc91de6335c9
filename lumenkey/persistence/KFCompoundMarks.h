// Internal: not installed.
#pragma once

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFChannelFolder.h"

#include <memory>

/// A new channel of a class; null for a class that makes none, and for null.
inline std::unique_ptr<KFChannelBase> KFExampleOf(KFFactory* factory) {
    auto* const maker = dynamic_cast<KFChannelFactory*>(factory);
    return std::unique_ptr<KFChannelBase>(maker == nullptr ? nullptr : maker->createChannel("", 1));
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
            _example = KFExampleOf(_factory);
        }
        auto const* const example = dynamic_cast<KFChannelFolder const*>(_example.get());
        KFChannelBase const* const like =
            example == nullptr ? nullptr : example->getDescendant(child.getID());
        return like != nullptr && like->getFactory() == child.getFactory();
    }

    BXSerializerWriteStream& _stream;
    KFFactory* _factory = nullptr;
    std::unique_ptr<KFChannelBase> _example;
};
