// An object root in a document: its timing and its state, in front of what it writes as a folder.

#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFFactory.h"
#include "lumenkey/persistence/KFDocumentElements.h"
#include "lumenkey/persistence/KFDocumentFlags.h"

namespace {

/// Told by elements of their own, or by the class; the last one isn't stored.
constexpr KFChannelFlags kFlagsLeftOut = kChannelFlagLocked | kChannelFlagNotSaved | kChannelFlagIsFolder |
                                         kChannelFlagIsObjectRoot | kChannelFlagDisabled |
                                         kChannelFlagNameUnset;
constexpr KFChannelFlags kSelfDigestFlags = kChannelFlagDisabled | kChannelFlagSolo;
constexpr std::uint32_t kSelfDigestFoldFlagsLeftOut = 0x7200F;

constexpr BXUUID kVaryingFolder = KFClassUUID("46C844A8-13D3-11D8-A438-000A95AF9F7E");

KFChannelFlags writtenFlags(KFChannelFlags flags, BXSerializerWriteStream const& stream) {
    return flags & (stream.isHashStream() ? kChannelFlagSolo : ~kFlagsLeftOut);
}

} // namespace

void KFChannelObjectRootBase::writeTiming(BXSerializerWriteStream& stream) const {
    stream.startElement(kTimingElement);
    if (_writesTimeRange) {
        stream.writeAttribute(kTimingInAttribute, _timeExtent.start);
        stream.writeAttribute(kTimingOutAttribute,
                              BX_TempusSaferSubtract(TempusRangeGetEnd(_timeExtent), getFrameDuration()));
    }
    stream.writeAttribute(kTimingOffsetAttribute, _timeOffset);
    stream.endElement();
}

void KFChannelObjectRootBase::writeState(BXSerializerWriteStream& stream) const {
    if (!isEnabled(false, false))
        KFWriteElement(stream, kEnabledElement, false);
    if (testFlag(kChannelFlagLocked))
        KFWriteElement(stream, kLockedElement, true);
}

void KFChannelObjectRootBase::writeBody(BXSerializerWriteStream& stream, bool full, bool children, bool all) {
    stream.pushScope(KFChannelObjectRootBaseScope);
    writeTiming(stream);
    KFWriteElement(stream, kBaseFlagsElement, std::uint64_t{writtenFlags(getFlags(), stream)});
    writeState(stream);
    stream.popScope();
    KFChannelFolder::writeBody(stream, full, children, all);
}

void KFChannelObjectRootBase::serializeSelfOnly(BXSerializerWriteStream& stream, bool, bool) {
    stream.pushScope(KFChannelObjectRootBaseScope);
    writeTiming(stream);
    KFWriteElement(stream, kRootFoldFlagsElement, getFoldFlags());
    KFWriteElement(stream, kBaseFlagsElement, static_cast<std::uint32_t>(writtenFlags(getFlags(), stream)));
    writeState(stream);
    stream.popScope();
}

void KFChannelObjectRootBase::markChannelFactoriesForSerialization(BXSerializerWriteStream& stream) {
    markVaryingFolderFactoriesForSerialization(this, stream);
}

void KFChannelObjectRootBase::markVaryingFolderFactoriesForSerialization(KFChannelFolder* folder,
                                                                         BXSerializerWriteStream& stream) {
    if (folder == nullptr || folder->getDescendants() == nullptr)
        return;
    for (KFChannelBase* const child : *folder->getDescendants()) {
        KFFactory const* const factory = child->getFactory();
        if (factory != nullptr && factory->isKindOfClass(kVaryingFolder)) {
            child->markFactoriesForSerialization(stream, false);
        } else if (child->testFlag(kChannelFlagIsFolder) && !child->testFlag(kChannelFlagIsObjectRoot)) {
            markVaryingFolderFactoriesForSerialization(static_cast<KFChannelFolder*>(child), stream);
        }
    }
}

void KFChannelObjectRootBase::calcHashForStateSelfOnly(BXSerializerWriteStream& stream, Tempus const&) {
    KFWriteElement(stream, kUnnamedElement, std::uint64_t{getFlags() & kSelfDigestFlags});
    KFWriteElement(stream, kUnnamedElement, getFoldFlags() & ~kSelfDigestFoldFlagsLeftOut);
    KFWriteElement(stream, kUnnamedElement, getTimeOffset());
}

// --- Reading ---

bool KFChannelObjectRootBase::parseBegin(BXSerializerReadStream& stream) {
    KFChannelFolder::parseBegin(stream);
    _locksAfterParse = false;
    stream.pushScope(KFChannelObjectRootBaseScope);
    return true;
}

bool KFChannelObjectRootBase::parseEnd(BXSerializerReadStream& stream) {
    KFChannelFolder::parseEnd(stream);
    if (_locksAfterParse)
        lock(true, true);
    _locksAfterParse = false;
    return true;
}

bool KFChannelObjectRootBase::parseElement(BXSerializerReadStream& stream, BXStreamElement& element) {
    KFChannelFolder::parseElement(stream, element);
    std::uint32_t number = 0;
    std::uint64_t flags = 0;
    bool on = false;
    switch (element.tag()) {
    case kTimingElement:
        parseTiming(stream, element);
        break;
    case kRootFoldFlagsElement:
        if (element.getAsUInt32(&number))
            storeFoldFlags(number);
        break;
    case kBaseFlagsElement:
        // Only the low word of a document counts.
        if (element.getAsUInt64(&flags))
            setFlags(KFFlagsOfBaseFlags(getFlags(), flags));
        break;
    case kEnabledElement:
        if (element.getAsBool(&on))
            enable(on, false);
        break;
    case kLockedElement:
        if (element.getAsBool(&on))
            _locksAfterParse = on;
        break;
    default:
        break;
    }
    return true;
}

void KFChannelObjectRootBase::parseTiming(BXSerializerReadStream const& stream,
                                          BXStreamElement const& element) {
    // Old documents have frames.
    auto const read = [&](std::uint32_t tag, Tempus* out) {
        if (stream.major >= kFirstVersionWithTimes)
            return element.getAttributeAsTime(tag, out);
        double frames = 0.0;
        if (!element.getAttributeAsDouble(tag, &frames))
            return false;
        *out = stream.frameDuration * frames;
        return true;
    };
    bool const framesOfStream = stream.major < kFirstVersionWithTimes || stream.useStreamFrameDuration;
    read(kTimingInAttribute, &_timeExtent.start);
    Tempus lastFrame = kTempusZero;
    if (read(kTimingOutAttribute, &lastFrame))
        _timeExtent.duration = BX_TempusSaferAdd(BX_TempusSaferSubtract(lastFrame, _timeExtent.start),
                                                 framesOfStream ? stream.frameDuration : getFrameDuration());
    read(kTimingOffsetAttribute, &_timeOffset);
}
