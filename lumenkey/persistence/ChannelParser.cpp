#include "lumenkey/persistence/ChannelParser.h"

#include "lumenkey/Channels/KFChannelBase.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/Channels/KFFactoryScope.h"
#include "lumenkey/persistence/KFDocumentScopes.h"
#include "lumenkey/persistence/KFDocumentVersion.h"

#include <memory>

namespace {

void readFactory(BXStreamElement const& element) {
    std::uint32_t fileID = 0;
    element.getAttributeAsUInt32(kFactoryIDAttribute, &fileID);
    std::unique_ptr<BXUUID const> const uuid(element.getAttributeAsUUID(kFactoryUUIDAttribute));
    KFFactories& factories = KFFactories::getInstance();
    if (KFFactory* const factory = uuid == nullptr ? nullptr : factories.findFactory(*uuid))
        factories.setFactoryLoadID(fileID, factory);
}

} // namespace

ChannelParser::~ChannelParser() = default;

void ChannelParser::writeHeader(BXSerializerWriteStream&, bool) {}
void ChannelParser::writeBody(BXSerializerWriteStream&, bool, bool, bool) {}
void ChannelParser::markFactoriesForSerialization(BXSerializerWriteStream&, bool) {}

bool ChannelParser::parseBegin(BXSerializerReadStream& stream) {
    stream.pushScope(KFMLScope);
    _channel->willBeModified(kModifyData);
    return true;
}

bool ChannelParser::parseEnd(BXSerializerReadStream&) { return true; }

bool ChannelParser::parseElement(BXSerializerReadStream& stream, BXStreamElement& element) {
    BXString version;
    std::uint32_t id = 0;
    switch (element.tag()) {
    case kOldDocumentElement:
    case kDocumentElement:
        if (element.getAttributeAsString(kVersionAttribute, &version))
            KFReadVersion(version.view(), stream.major, stream.minor);
        break;
    case kFactoryElement:
        readFactory(element);
        break;
    case kParameterElement:
        if (element.getAttributeAsUInt32(kIDAttribute, &id))
            _channel->setID(id);
        _found = true;
        stream.pushHandler(_channel);
        break;
    default:
        break;
    }
    return true;
}
