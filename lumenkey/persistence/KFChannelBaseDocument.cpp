// What every node writes of itself and reads again.

#include "lumenkey/Channels/KFChannelBase.h"
#include "lumenkey/Channels/KFFactory.h"
#include "lumenkey/persistence/KFDocumentElements.h"
#include "lumenkey/persistence/KFDocumentFlags.h"

namespace {

/// Which flags go into a document, and which into a digest.
KFChannelFlags writtenFlags(KFChannelFlags flags, BXSerializerWriteStream const& stream) {
    return flags & ~(stream.isHashStream() ? kChannelNonStateFlags : kChannelFlagNameUnset);
}

} // namespace

void KFChannelBase::writeFlags(BXSerializerWriteStream& stream, WriteFlagType type) const {
    KFChannelFlags const flags = writtenFlags(_flags, stream);
    if (flags == 0)
        return;
    if (type == kWriteFlagsAsAttribute) {
        stream.writeAttribute(kFlagsAttribute, std::uint64_t{flags});
        return;
    }
    stream.pushScope(KFChannelBaseScope);
    KFWriteElement(stream, kFlagsElement, std::uint64_t{flags});
    stream.popScope();
}

void KFChannelBase::writeHeader(BXSerializerWriteStream& stream, bool full) {
    KFFactory const* const factory = getFactory();
    std::uint32_t const fileID =
        full && factory != nullptr && !stream.isHashStream() ? factory->fileRefID() : 0;
    stream.pushScope(KFChannelBaseScope);
    stream.startElement(kParameterElement);
    stream.writeAttribute(kNameAttribute, _name);
    if (!(stream.isHashStream() && testFlag(kChannelFlagExcludedFromHash)))
        stream.writeAttribute(kIDAttribute, std::uint32_t{_id});
    if (!full)
        writeFlags(stream, kWriteFlagsAsAttribute);
    if (fileID != 0)
        stream.writeAttribute(kFactoryIDAttributeOfNode, fileID);
    stream.popScope();
}

void KFChannelBase::writeBody(BXSerializerWriteStream& stream, bool full, bool, bool) {
    if (full)
        writeFlags(stream, kWriteFlagsAsElement);
}

void KFChannelBase::markFactoriesForSerialization(BXSerializerWriteStream&, bool) {
    if (KFFactory const* const factory = getFactory())
        factory->setNeedsSaving(true);
}

bool KFChannelBase::parseBegin(BXSerializerReadStream& stream) {
    stream.pushScope(KFChannelBaseReadScope);
    return true;
}

bool KFChannelBase::parseEnd(BXSerializerReadStream&) { return true; }

/// The flags of a document that stands alone.
bool KFChannelBase::parseElement(BXSerializerReadStream& stream, BXStreamElement& element) {
    // This was a folder for the writer; what its children hold isn't for this node.
    if (element.tag() == kParameterElement && !testFlag(kChannelFlagIsFolder))
        stream.skipElement();
    std::uint64_t flags = 0;
    if (element.tag() != kFlagsElement || !element.getAsUInt64(&flags))
        return true;
    if ((flags & ~kChannelNonStateFlags) != 0)
        willBeModified(kModifyState);
    _flags = KFFlagsOfElement(_flags, flags);
    return true;
}
