#include "lumenkey/Channels/KFFactories.h"

#include "lumenkey/Channels/KFChannelFactoryTable.h"
#include "lumenkey/Channels/KFFactory.h"
#include "lumenkey/Channels/KFFactoryBase.h"
#include "lumenkey/Channels/KFFactoryScope.h"
#include "lumenkey/Channels/KFThreadState.h"
#include "lumenkey/foundation/BXSerializerStreams.h"

KFFactories& KFFactories::getInstance() { return BXSingletonInstance<KFFactories>(); }

KFFactories::KFFactories() : BXSingleton(0) { addChannelFactories(); }

KFFactories::~KFFactories() = default;

void KFFactories::addChannelFactories() {
    for (KFChannelFactoryRow const& row : KFChannelFactoryTable()) {
        if (row.registered && row.getInstance != nullptr) {
            addFactory(row.getInstance());
        }
    }
}

void KFFactories::addFactory(KFFactory* factory) {
    if (factory != nullptr) {
        _factories.insert_or_assign(factory->uuid(), factory);
    }
}

KFFactory* KFFactories::findFactory(BXUUID const& uuid) const {
    auto const found = _factories.find(uuid);
    return found == _factories.end() ? nullptr : found->second;
}

namespace {
bool isOneOrAncestorOf(KFFactory const* candidate, KFFactory const* factory) {
    for (KFFactory const* at = factory; at != nullptr; at = at->getSuperFactory()) {
        if (at == candidate) {
            return true;
        }
    }
    return false;
}
} // namespace

KFFactory* KFFactories::findCommonFactory(std::vector<KFFactoryBase*> const& objects) const {
    KFFactory* candidate =
        objects.empty() || objects.front() == nullptr ? nullptr : objects.front()->getFactory();
    for (KFFactoryBase const* object : objects) {
        KFFactory const* const factory = object == nullptr ? nullptr : object->getFactory();
        while (candidate != nullptr && !isOneOrAncestorOf(candidate, factory)) {
            candidate = candidate->getSuperFactory();
        }
    }
    return candidate;
}

std::map<std::uint32_t, KFFactory*>& KFFactories::getFactoryLoadMap() {
    return KFThreadState<std::map<std::uint32_t, KFFactory*>>();
}

void KFFactories::setFactoryLoadID(std::uint32_t fileID, KFFactory* factory) {
    getFactoryLoadMap().insert_or_assign(fileID, factory);
}

KFFactory* KFFactories::lookupFactory(std::uint32_t fileID) {
    std::map<std::uint32_t, KFFactory*> const& loadMap = getFactoryLoadMap();
    auto const found = loadMap.find(fileID);
    return found == loadMap.end() ? nullptr : found->second;
}

void KFFactories::clearFactoryLoadIDs() { getFactoryLoadMap().clear(); }

void KFFactories::saveFactories(BXSerializerWriteStream& stream) {
    stream.pushScope(KFFactoryScope);
    std::uint32_t nextID = 1;
    for (auto const& [uuid, factory] : _factories) {
        factory->setFileRefID(0);
        if (!factory->needsSaving()) {
            continue;
        }
        stream.startElement(kFactoryElement);
        stream.writeAttribute(kFactoryIDAttribute, nextID);
        stream.writeAttribute(kFactoryUUIDAttribute, uuid);
        stream.startElement(kFactoryDescriptionElement);
        stream.writeValue(factory->description());
        stream.endElement();
        stream.startElement(kFactoryManufacturerElement);
        stream.writeValue(factory->manufacturer());
        stream.endElement();
        stream.startElement(kFactoryVersionElement);
        stream.writeValue(factory->version() + 0.1 * factory->revision());
        stream.endElement();
        stream.endElement();
        stream.endLine();
        factory->setNeedsSaving(false);
        factory->setFileRefID(nextID++);
    }
    stream.endLine();
    stream.popScope();
}
