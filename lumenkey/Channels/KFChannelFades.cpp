// Fades: a factor on top of the curve that rises from 0 at the start of the extent and falls to 0 at its end.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFChannelTimeConverter.h"

#include <cmath>
#include <numbers>

namespace {

/// First and last frame of the channel's extent, in the time of the extent.
struct Extent {
    Tempus first;
    Tempus last;
};

Extent extentOf(KFChannelObjectRootBase const& root, KFChannel const& channel) {
    BXTimeRange const range = root.getTimeExtentForChannel(&channel);
    return {range.start, BX_TempusSaferSubtract(TempusRangeGetEnd(range), root.getFrameDuration())};
}

Tempus notNegative(Tempus const& t) { return t < kTempusZero ? kTempusZero : t; }

/// `position` is 0 at the outer end of a fade and 1 at its inner end.
double shaped(double position, unsigned int shape) {
    double const r = !(position > 0.0) ? 0.0 : position > 1.0 ? 1.0 : position;
    switch (shape) {
    case 1:
        return std::sin(r * std::numbers::pi / 2.0);
    case 2:
        return std::sin((r - 1.0) * std::numbers::pi / 2.0) + 1.0;
    case 3:
        return 0.5 - std::cos(r * std::numbers::pi) * 0.5;
    default:
        return r;
    }
}

KFFadeBlock const& fadesOf(KFChannelImpl const* impl) {
    static KFFadeBlock const none;
    KFFadeBlock const* const fades = impl == nullptr ? nullptr : impl->getFades();
    return fades == nullptr ? none : *fades;
}

} // namespace

bool KFChannel::hasFadeHandles() const { return _impl != nullptr && _impl->hasFadeHandles(); }
Tempus KFChannel::getFadeInOffset() const { return fadesOf(_impl).fadeInOffset; }
Tempus KFChannel::getFadeOutOffset() const { return fadesOf(_impl).fadeOutOffset; }
unsigned int KFChannel::getFadeInCurve() const { return fadesOf(_impl).fadeInCurve; }
unsigned int KFChannel::getFadeOutCurve() const { return fadesOf(_impl).fadeOutCurve; }

// --- Setting ---

KFFadeBlock& KFChannel::fadesToWrite() { return createLocalChannelImplementation()->createFades(); }

/// Makes the block, where there is none, only for what needs one.
bool KFChannel::beginFadeEdit(bool wantsBlock) {
    if (isLocked(false) || _impl == nullptr || (_impl->getFades() == nullptr && !wantsBlock))
        return false;
    fadesToWrite();
    willBeModified(kModifyData);
    return true;
}

void KFChannel::setFadeInOffset(Tempus const& t, bool limit) {
    if (!beginFadeEdit(t > kTempusZero))
        return;
    Tempus length = notNegative(t);
    if (KFChannelObjectRootBase const* const root = limit ? getAncestorRootBase() : nullptr) {
        auto const [first, last] = extentOf(*root, *this);
        Tempus const latestEnd = BX_TempusSaferSubtract(last, getFadeOutOffset());
        if (BX_TempusSaferAdd(first, length) > latestEnd)
            length = BX_TempusSaferSubtract(latestEnd, first);
    }
    fadesToWrite().fadeInOffset = length;
}

void KFChannel::setFadeOutOffset(Tempus const& t, bool limit) {
    if (!beginFadeEdit(t > kTempusZero))
        return;
    Tempus length = notNegative(t);
    if (KFChannelObjectRootBase const* const root = limit ? getAncestorRootBase() : nullptr) {
        auto const [first, last] = extentOf(*root, *this);
        Tempus const earliestStart = BX_TempusSaferAdd(first, getFadeInOffset());
        if (BX_TempusSaferSubtract(last, length) < first)
            length = BX_TempusSaferSubtract(last, first);
        if (BX_TempusSaferSubtract(last, length) < earliestStart)
            length = BX_TempusSaferSubtract(last, earliestStart);
    }
    fadesToWrite().fadeOutOffset = length;
}

void KFChannel::setFadeInCurve(unsigned int shape) {
    if (beginFadeEdit(shape != 0))
        fadesToWrite().fadeInCurve = shape;
}

void KFChannel::setFadeOutCurve(unsigned int shape) {
    if (beginFadeEdit(shape != 0))
        fadesToWrite().fadeOutCurve = shape;
}

void KFChannel::scaleFadeHandles(double factor) {
    if (!hasFadeHandles())
        return;
    KFFadeBlock& fades = fadesToWrite();
    for (Tempus* const offset : {&fades.fadeInOffset, &fades.fadeOutOffset}) {
        if (*offset != kTempusZero)
            *offset = *offset * factor;
    }
}

// --- The factor ---

double KFChannel::getFadeRatio(Tempus const& t) const {
    KFChannelObjectRootBase const* const root = hasFadeHandles() ? getAncestorRootBase() : nullptr;
    if (root == nullptr)
        return 1.0;
    auto [first, last] = extentOf(*root, *this);
    KFChannelTimeConverter const* const converter = getTimeConverterDelegate();
    if (converter == nullptr || !converter->extentIsLocal()) {
        first = globalToLocalTime(first);
        last = globalToLocalTime(last);
    }
    KFFadeBlock const& fades = fadesOf(_impl);
    Tempus const sinceFirst = BX_TempusSaferSubtract(t, first);
    // Where the two overlap the fade in wins.
    if (fades.fadeInOffset != kTempusZero && sinceFirst < fades.fadeInOffset)
        return shaped(TempusGetSeconds(sinceFirst / fades.fadeInOffset), fades.fadeInCurve);
    if (fades.fadeOutOffset != kTempusZero && t > BX_TempusSaferSubtract(last, fades.fadeOutOffset))
        return shaped(TempusGetSeconds(BX_TempusSaferSubtract(last, t) / fades.fadeOutOffset),
                      fades.fadeOutCurve);
    return 1.0;
}
