#include "tools/check/ClassExamples.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFChannelFolder.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/tree/ChannelClass.h"

#include <algorithm>

namespace lumenkey::tools {

unsigned ownersOf(KFFactory& factory) {
    if (factory.isKindOfClass(KFChannelObjectRootBase_Factory::getInstance().uuid())) {
        return kOfRoots;
    }
    if (factory.isKindOfClass(KFChannelFolder_Factory::getInstance().uuid())) {
        return kOfFolders;
    }
    return factory.isKindOfClass(KFChannel_Factory::getInstance().uuid()) ? kOfValues : kOfOthers;
}

KFChannelBase* ClassExamples::of(KFFactory* factory) {
    auto const [place, isNew] = _examples.try_emplace(factory);
    if (isNew) {
        place->second = exampleOf(factory);
    }
    return place->second.get();
}

KFChannelBase* ClassExamples::componentOf(KFFactory* factory, std::uint64_t id) {
    auto const* const folder = dynamic_cast<KFChannelFolder const*>(of(factory));
    return folder == nullptr ? nullptr : folder->getDescendant(static_cast<unsigned>(id));
}

std::optional<std::size_t> ClassExamples::placeOf(KFFactory* factory, std::uint64_t id) {
    auto const* const folder = dynamic_cast<KFChannelFolder const*>(of(factory));
    if (folder == nullptr || folder->getNumberOfDescendants() == 0) {
        return std::nullopt;
    }
    auto const& components = *folder->getDescendants();
    return std::find(components.begin(), components.end(), componentOf(factory, id)) - components.begin();
}

} // namespace lumenkey::tools
