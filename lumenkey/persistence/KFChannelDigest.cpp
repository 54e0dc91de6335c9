// What is seen of a channel at one time, given to a digest.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelFolder.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/persistence/KFDocumentElements.h"

void KFChannelBase::calcHashForState(BXSerializerWriteStream&, Tempus const&) {}

void KFChannel::calcHashForState(BXSerializerWriteStream& stream, Tempus const& t) {
    if (testFlag(kChannelFlagExcludedFromHash))
        return;
    stream.pushScope(KFChannelScope);
    KFWriteElement(stream, kParameterElement, getValueAsDouble(t, 0.0));
    if (KFFadeBlock const* const fades = _impl == nullptr ? nullptr : _impl->getFades()) {
        KFWriteElement(stream, kFadeInOffsetElement, fades->fadeInOffset);
        KFWriteElement(stream, kFadeOutOffsetElement, fades->fadeOutOffset);
        KFWriteElement(stream, kFadeInCurveElement, fades->fadeInCurve);
        KFWriteElement(stream, kFadeOutCurveElement, fades->fadeOutCurve);
    }
    stream.popScope();
}

void KFChannelFolder::calcHashForState(BXSerializerWriteStream& stream, Tempus const& t) {
    if (getDescendants() == nullptr)
        return;
    KFWriteElement(stream, kUnnamedElement, std::uint64_t{getFlags() & kChannelFlagDisabled});
    forEachChild([&](KFChannelBase& child) { child.calcHashForState(stream, t); });
}
