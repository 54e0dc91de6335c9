// Keypoints: the family that takes global time.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/curves/KFCurve.h"

unsigned int KFChannel::getNumberOfKeyframes() const {
    KFCurve const* const used = _impl == nullptr ? nullptr : _impl->getCurve();
    return used == nullptr ? 0 : used->keypointCount();
}

// --- Looking ---

Tempus KFChannel::curveTimeAt(Tempus const& t) const {
    Tempus const local = globalToLocalTime(t);
    if (!TempusHasBeenRounded(local) || curve().getKeypointHandle(local, nullptr))
        return local;
    Tempus found;
    bool const isNext = curve().getNextKeypoint(local, &found, nullptr) && localToGlobalTime(found) == t;
    bool const isPrevious =
        !isNext && curve().getPreviousKeypoint(local, &found, nullptr) && localToGlobalTime(found) == t;
    return isNext || isPrevious ? found : local;
}

void* KFChannel::keypointAt(Tempus const& t) const {
    void* handle = nullptr;
    return curve().getKeypointHandle(curveTimeAt(t), &handle) ? handle : nullptr;
}

template <class Step> bool KFChannel::stepToKeypoint(Tempus* t, Step step) const {
    if (t == nullptr)
        return false;
    Tempus local = globalToLocalTime(*t);
    Tempus found, global;
    do {
        if (!step(local, &found))
            return false;
        local = found;
        global = localToGlobalTime(found);
    } while (global == *t); // converting there and back may round, and a host's converter may hold the time
    *t = global;
    return true;
}

bool KFChannel::hasKeypoints(unsigned int) const { return KFChannel::getNumberOfKeyframes() > 0; }
bool KFChannel::hasMoreThanOneKeypoint() const { return KFChannel::getNumberOfKeyframes() > 1; }
bool KFChannel::hasKeypointAt(Tempus const& t, unsigned int) const { return keypointAt(t) != nullptr; }
bool KFChannel::allHaveKeypointsAt(Tempus const& t) const { return keypointAt(t) != nullptr; }
unsigned int KFChannel::numberOfKeypointsAt(Tempus const& t) const { return keypointAt(t) != nullptr; }

bool KFChannel::previousKeypoint(Tempus* t, unsigned int) const {
    return stepToKeypoint(t, [this](Tempus const& local, Tempus* found) {
        return curve().getPreviousKeypoint(local, found, nullptr);
    });
}

bool KFChannel::nextKeypoint(Tempus* t, unsigned int) const {
    return stepToKeypoint(t, [this](Tempus const& local, Tempus* found) {
        return curve().getNextKeypoint(local, found, nullptr);
    });
}

// --- Editing ---

void KFChannel::addKeypointAt(Tempus const& t) {
    if (KFCompoundChannel* const compound = linkedCompound()) {
        compound->compoundAddKeypointAt(this, t, false);
        return;
    }
    if (!beginEdit())
        return;
    createLocalChannelImplementation();
    if (!isSpline())
        setIsSpline(true);
    curveToWrite().setKeypoint(curveTimeAt(t), true);
}

void KFChannel::deleteKeypointAt(Tempus const& t) {
    if (KFCompoundChannel* const compound = linkedCompound()) {
        compound->compoundDeleteKeypointAt(this, t, false);
        return;
    }
    if (!beginEdit())
        return;
    KFCurve& written = curveToWrite();
    if (void* const handle = keypointAt(t))
        written.delKeypoint(handle, true);
}

Tempus KFChannel::moveKeypointTo(Tempus const& from, Tempus const& to, bool a, bool b) {
    if (KFCompoundChannel* const compound = linkedCompound())
        return compound->compoundMoveKeypointTo(this, from, to, a, b, false);
    if (!beginEdit())
        return from;
    createLocalChannelImplementation();
    if (!isSpline())
        setIsSpline(true);
    void* const handle = keypointAt(from);
    if (handle == nullptr)
        return to;
    // The curve takes the two switches in the other order.
    curve().moveKeypoint(handle, curveTimeAt(to), true, b, a);
    Tempus moved;
    // A keypoint that was merged into another is gone; then it is the target that stands there.
    return curve().getKeypoint(handle, &moved, nullptr) ? localToGlobalTime(moved) : to;
}

void KFChannel::deleteKeypoints(Tempus const& from, Tempus const& to) {
    if (isLocked(false))
        return;
    createLocalChannelImplementation();
    willBeModified(kModifyData);
    curveToWrite().delKeypoints(from, to, true); // the host may have reset the channel meanwhile
}

// --- The curve between and beyond ---

void KFChannel::retimeKeypoints(double factor, Tempus const& t) {
    if (!beginEdit())
        return;
    createLocalChannelImplementation();
    if (!testFlag(kChannelFlagNotRetimed))
        curve().warpCurveLinear(factor, t, true);
}

void KFChannel::adjustToFrameDuration(Tempus const& frameDuration) {
    curveToWrite().forceRetimeCurve(frameDuration, kTempusZero);
}

void KFChannel::setInterpolation(unsigned int type) {
    std::uint32_t present = 0;
    if (isLocked(false) || (curve().getCurveInterpolation(&present) && present == type))
        return;
    willBeModified(kModifyData);
    curveToWrite().setCurveInterpolation(type);
}

void KFChannel::setExtrapolation(unsigned int mode, unsigned int which) {
    std::uint32_t present = 0;
    if (isLocked(false) || (curve().getCurveExtrapolation(&present, which) && present == mode))
        return;
    willBeModified(kModifyData);
    curveToWrite().setCurveExtrapolation(mode, which);
}

// --- Ranges ---

void KFChannel::getBakeParameters(BXTimeRange const& range, Tempus* start, Tempus* end, Tempus* frame) const {
    if (start != nullptr)
        *start = globalToLocalTime(range.start);
    if (end != nullptr)
        *end = globalToLocalTime(TempusRangeGetEnd(range));
    if (frame != nullptr)
        *frame = getFrameDuration();
}
