#include "tools/check/ClassExamples.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFChannelFolder.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/tree/ChannelClass.h"

namespace lumenkey::tools {

unsigned ownersOf(KFFactory& factory) {
    if (factory.isKindOfClass(KFChannelObjectRootBase_Factory::getInstance().uuid())) {
        return kOfRoots;
    }
    return factory.isKindOfClass(KFChannelFolder_Factory::getInstance().uuid()) ? kOfFolders : kOfValues;
}

KFChannelBase* ClassExamples::of(KFFactory* factory) {
    auto const [place, isNew] = _examples.try_emplace(factory);
    if (isNew) {
        place->second = exampleOf(factory);
    }
    return place->second.get();
}

KFFactory* ClassExamples::componentOf(KFFactory* factory, std::uint64_t id) {
    auto const* const folder = dynamic_cast<KFChannelFolder const*>(of(factory));
    KFChannelBase const* const component =
        folder == nullptr ? nullptr : folder->getDescendant(static_cast<unsigned>(id));
    return component == nullptr ? nullptr : component->getFactory();
}

} // namespace lumenkey::tools
