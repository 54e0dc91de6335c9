// A value channel in a document: its header, in a short form for a plain value, its fades and its curve.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/persistence/KFDocumentElements.h"

#include <algorithm>
#include <limits>

namespace {

constexpr std::uint32_t kFadeShapes = 4;

bool hasKeypointsIn(KFChannelImpl const& impl) {
    return impl.getCurve() != nullptr && impl.getCurve()->getNumberOfKeypoints() > 0;
}

/// Nothing but a value: a constant, or a spline without keypoints, that doesn't fade.
bool isPlain(KFChannelImpl const& impl) {
    std::uint32_t type = 0;
    if (impl.getCurve() == nullptr || !impl.getCurve()->getCurveType(&type) || type > 1)
        return false;
    return !(type == 1 && hasKeypointsIn(impl)) && !impl.hasFadeHandles();
}

void writeFades(BXSerializerWriteStream& stream, KFFadeBlock const& fades) {
    if (fades.fadeInOffset != kTempusZero)
        KFWriteElement(stream, kFadeInOffsetElement, fades.fadeInOffset);
    if (fades.fadeOutOffset != kTempusZero)
        KFWriteElement(stream, kFadeOutOffsetElement, fades.fadeOutOffset);
    if (fades.fadeInCurve != 0)
        KFWriteElement(stream, kFadeInCurveElement, fades.fadeInCurve);
    if (fades.fadeOutCurve != 0)
        KFWriteElement(stream, kFadeOutCurveElement, fades.fadeOutCurve);
}

/// Limits don't stand in the short form, but a digest tells what they let be seen. It is blind for what no
/// document tells: limits of boolean curves, and whether one is infinite or the greatest number.
void writeSeenValue(BXSerializerWriteStream& stream, KFCurve& curve, double stored) {
    constexpr double greatest = std::numeric_limits<double>::max();
    double seen = stored;
    if (curve.isCurveBoolean() || !curve.getCurveInitialValue(&seen))
        return;
    seen = std::clamp(seen, -greatest, greatest);
    if (seen != stored)
        stream.writeAttribute(kValueAttribute, seen);
}

} // namespace

bool KFChannel::isLeftOutOf(BXSerializerWriteStream const& stream) const {
    return stream.isHashStream() && testFlag(kChannelFlagExcludedFromHash);
}

void KFChannel::writeHeader(BXSerializerWriteStream& stream, bool full) {
    if (isLeftOutOf(stream))
        return;
    if (full || _impl == nullptr || !isPlain(*_impl)) {
        KFChannelBase::writeHeader(stream, full);
        return;
    }
    stream.pushScope(KFChannelScope);
    stream.startElement(kParameterElement);
    stream.writeAttribute(kNameAttribute, getName());
    stream.writeAttribute(kIDAttribute, std::uint32_t{getID()});
    writeFlags(stream, kWriteFlagsAsAttribute);
    if (!stream.isHashStream())
        stream.writeAttribute(kDefaultAttribute, getDefaultValue());
    double const stored = curve().getRootNode()->getInitialValue();
    stream.writeAttribute(kValueAttribute, stored);
    if (stream.isHashStream())
        writeSeenValue(stream, curve(), stored);
    stream.popScope();
}

void KFChannel::writeBody(BXSerializerWriteStream& stream, bool full, bool children, bool all) {
    if (isLeftOutOf(stream))
        return;
    stream.pushScope(KFChannelScope);
    KFChannelBase::writeBody(stream, full, children, all);
    if (_impl != nullptr) {
        if (KFFadeBlock const* const fades = _impl->getFades())
            writeFades(stream, *fades);
        if (_impl->getCurve() != nullptr && (full || hasKeypointsIn(*_impl) || _impl->hasFadeHandles())) {
            curve().writeHeader(stream, false);
            curve().writeBody(stream, false, true, true);
            stream.endElement();
        }
    }
    stream.popScope();
}

// --- Reading ---

bool KFChannel::parseBegin(BXSerializerReadStream& stream) {
    KFChannelBase::parseBegin(stream);
    stream.pushScope(KFChannelScope);
    if (_impl == nullptr)
        return true;
    if (_impl->getCurve() != nullptr)
        curve().parseBegin(stream);
    if (!_impl->isShared())
        _impl->freeFades();
    return true;
}

bool KFChannel::parseEnd(BXSerializerReadStream& stream) {
    KFChannelBase::parseEnd(stream);
    if (_impl != nullptr && _impl->getCurve() != nullptr)
        curve().parseEnd(stream);
    resetLocalChannelImplementation();
    return true;
}

/// What a document holds comes in on a locked channel too: its flags, the lock among them, stand in front.
bool KFChannel::parseElement(BXSerializerReadStream& stream, BXStreamElement& element) {
    KFChannelBase::parseElement(stream, element);
    if (_impl == nullptr)
        return true;
    switch (element.tag()) {
    case kCurveElement:
        if (_impl->getCurve() != nullptr) {
            KFCurve& read = curveToWrite();
            stream.pushHandler(&read);
            read.parseElement(stream, element);
        }
        break;
    case kFadeInOffsetElement:
    case kFadeOutOffsetElement:
        parseFadeOffset(element);
        break;
    case kFadeInCurveElement:
    case kFadeOutCurveElement:
        parseFadeShape(element);
        break;
    default:
        break;
    }
    return true;
}

void KFChannel::parseFadeOffset(BXStreamElement const& element) {
    Tempus length = kTempusZero;
    if (!element.getAsTime(&length) || (_impl->getFades() == nullptr && !(length > kTempusZero)))
        return;
    KFFadeBlock& fades = fadesToWrite();
    willBeModified(kModifyData);
    bool const fadesIn = element.tag() == kFadeInOffsetElement;
    (fadesIn ? fades.fadeInOffset : fades.fadeOutOffset) = TempusMaximum(length, kTempusZero);
}

void KFChannel::parseFadeShape(BXStreamElement const& element) {
    std::uint32_t shape = 0;
    if (!element.getAsUInt32(&shape))
        return;
    if (shape >= kFadeShapes)
        shape = 0;
    if (_impl->getFades() == nullptr && shape == 0)
        return;
    KFFadeBlock& fades = fadesToWrite();
    willBeModified(kModifyData);
    (element.tag() == kFadeInCurveElement ? fades.fadeInCurve : fades.fadeOutCurve) = shape;
}
