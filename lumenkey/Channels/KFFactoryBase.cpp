#include "lumenkey/Channels/KFFactoryBase.h"

#include "lumenkey/Channels/KFFactory.h"

KFFactoryBase::~KFFactoryBase() = default;

BXString KFFactoryBase::getIconName() const {
    return _factory == nullptr ? BXString() : _factory->getIconName();
}

BXString KFFactoryBase::getIconNameBW() const {
    return _factory == nullptr ? BXString() : _factory->getIconNameBW();
}

std::uint32_t KFFactoryBase::getIconID() const {
    return _factory == nullptr ? KFFactory::kNoIconID : _factory->getIconID();
}

BXString KFFactoryBase::getLibraryIconName() const {
    return _factory == nullptr ? BXString() : _factory->getLibraryIconName();
}

BXString KFFactoryBase::description() { return _factory == nullptr ? BXString() : _factory->description(); }

KFFactory* KFFactoryBase::getFactoryForSerialization(BXSerializerWriteStream&, bool) const {
    return _factory;
}
