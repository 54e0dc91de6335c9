#include "lumenkey/persistence/ChannelParser.h"

#include "lumenkey/Channels/KFChannelBase.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/Channels/KFFactoryScope.h"
#include "lumenkey/persistence/KFDocumentScopes.h"

#include <algorithm>
#include <charconv>
#include <memory>

namespace {

/// Takes a number off the front, behind spaces and a plus sign. False, and both as they were, without one.
bool takeNumber(std::string_view& text, std::uint32_t& number) {
    std::size_t start = std::min(text.find_first_not_of(" \t\r\n\v\f"), text.size());
    if (start < text.size() && text[start] == '+')
        ++start;
    char const* const end = text.data() + text.size();
    auto const [behind, error] = std::from_chars(text.data() + start, end, number);
    if (error != std::errc())
        return false;
    text.remove_prefix(static_cast<std::size_t>(behind - text.data()));
    return true;
}

/// Two numbers, each behind any spaces, with a dot between them; what isn't there stays.
void readVersion(std::string_view text, BXSerializerReadStream& stream) {
    if (takeNumber(text, stream.major) && text.starts_with('.')) {
        text.remove_prefix(1);
        takeNumber(text, stream.minor);
    }
}

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
            readVersion(version.view(), stream);
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
