// A channel and all below it as a blob, a file, or a digest.

#include "lumenkey/Channels/KFChannelBase.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/foundation/BXHashWriteStream.h"
#include "lumenkey/foundation/BXStream.h"
#include "lumenkey/foundation/BXXMLReadStream.h"
#include "lumenkey/foundation/BXXMLWriteStream.h"
#include "lumenkey/persistence/ChannelParser.h"
#include "lumenkey/persistence/KFCompoundMarks.h"

namespace {

constexpr unsigned int kMajorVersion = 5;
constexpr unsigned int kMinorVersion = 13;
constexpr int kBufferSize = 32768;

bool readDocument(KFChannelBase& channel, BXXMLReadStream& stream) {
    KFFactories::getInstance().clearFactoryLoadIDs();
    ChannelParser parser(&channel);
    stream.pushHandler(&parser);
    return stream.parse() && parser.hasFoundChannel();
}

} // namespace

BXData KFChannelBase::createChannelState(bool children, bool all) {
    BXBufferWriteStream buffer(kBufferSize, kBufferSize);
    BXXMLWriteStream stream(buffer, kMajorVersion, kMinorVersion);
    markFactoriesForSerialization(stream, false);
    KFCompoundMarks(stream).markBelow(*this);
    KFFactories::getInstance().saveFactories(stream);
    writeHeader(stream, true);
    writeBody(stream, true, children, all);
    stream.endElement();
    stream.close();
    return buffer.takeData();
}

bool KFChannelBase::configureWithState(BXData const& state) {
    BXXMLReadStream stream(state);
    return readDocument(*this, stream);
}

bool KFChannelBase::configureWithURL(BXURL const& url) {
    unsigned int const id = _id;
    BXXMLReadStream stream(url);
    bool const read = readDocument(*this, stream);
    setID(id);
    return read;
}

std::array<std::uint8_t, 16> KFChannelBase::getHash() {
    BXHashWriteStream stream;
    writeHeader(stream, false);
    writeBody(stream, false, true, true);
    stream.endElement();
    return stream.getHash();
}
