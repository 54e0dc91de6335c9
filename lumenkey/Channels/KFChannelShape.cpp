// Operations on the shape of a channel's curve.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/curves/KFCurve.h"

#include <algorithm>
#include <cmath>

namespace {

/// Baking may be off by so much of what the values span.
constexpr double kBakeTolerance = 0.005;
/// Values that span less are one value.
constexpr double kLeastSpan = 1e-7;

} // namespace

// --- A stretch ---

double KFChannel::spanOfValues() const {
    double maximum = 0.0;
    double minimum = 0.0;
    curve().getCurrentMaxValueV(&maximum, false);
    curve().getCurrentMinValueV(&minimum, false);
    return std::fabs(maximum - minimum);
}

void KFChannel::bake(BXTimeRange const& range, Tempus const&) {
    if (isLocked(false) || getNumberOfCurveProcessingNodes() == 0 || !isChannelAffectedByBehaviors(true))
        return;
    willBeModified(kModifyData);
    KFCurve& written = curveToWrite();
    // Asked anew: the host may have changed the chain meanwhile, and a copy of the curve has nodes of its own.
    std::vector<KFCurveNode*> const nodes = enumerateCurveProcessingNodes();
    if (nodes.empty())
        return;
    double const span = spanOfValues();
    double const tolerance =
        std::min(span >= kLeastSpan ? span * kBakeTolerance : getFineDelta(), getCoarseDelta());
    Tempus start, end, frame;
    getBakeParameters(range, &start, &end, &frame);
    written.bakeCurve(nodes.back(), start, frame, end, tolerance, getScale());
}

void KFChannel::simplify(Tempus const& a, Tempus const& b, Tempus const& step, double percent,
                         unsigned int mode1, unsigned int mode2, bool clampToCoarse) {
    if (!beginEdit())
        return;
    KFCurve& written = curveToWrite();
    double const span = spanOfValues();
    double tolerance = span >= kLeastSpan ? percent / 100.0 * span : getFineDelta();
    if (clampToCoarse && getCoarseDelta() < tolerance)
        tolerance = getCoarseDelta();
    written.simplifyCurve(globalToLocalTime(a), globalToLocalTime(b), step, tolerance, getScale(), mode1,
                          static_cast<std::int32_t>(mode2));
}

void KFChannel::generateKeys(unsigned int first, unsigned int second) {
    if (beginEdit())
        curveToWrite().generateKeypoints(first, second, true);
}

void KFChannel::reduceKeyframes(Tempus const& a, Tempus const& b, Tempus const& step, double tolerance,
                                double range, unsigned int mode, int radius) {
    if (!isLocked(false))
        curveToWrite().simplifyCurve(a, b, step, tolerance, range, mode, radius);
}

void KFChannel::smoothKeyframes(Tempus const& a, Tempus const& b, Tempus const& step) {
    if (!isLocked(false))
        curveToWrite().smoothCurve(a, b, step);
}

// --- A segment ---

bool KFChannel::createCurveSegment(Tempus const& a, Tempus const& b, Tempus const& c, bool eased) {
    return getCurveInterface() != nullptr && beginEdit() &&
           curveToWrite().createCurveSegment(a, b, c, eased, true);
}

void KFChannel::setCurveSegmentValue(Tempus const& t, double value, bool bounded) {
    if (getCurveInterface() == nullptr || !beginEdit())
        return;
    KFCurve& written = curveToWrite();
    if (bounded) {
        written.setCurveSegmentValueBounded(t, value, getSliderMin(), getSliderMax(), true);
    } else {
        written.setCurveSegmentValue(t, value, true);
    }
}

// --- The whole curve ---

void KFChannel::closeParametricCurve() {
    bool isClosed = false;
    curve().isClosedCurve(&isClosed);
    if (!isLocked(false) && !isClosed)
        curveToWrite().closeCurve();
}

void KFChannel::reparametrizeChannel() {
    if (!isLocked(false))
        curveToWrite().reparametrizeCurve();
}

void KFChannel::setUseRetimingExtrapolation(bool on) {
    if (isLocked(false))
        return;
    curveToWrite().setRetimingExtrapolation(on);
    setOwnerChannel(this);
}

void KFChannel::resetCurve() {
    if (isLocked(false))
        return;
    curveToWrite().setCurveToDefault();
    resetLocalChannelImplementation();
}
