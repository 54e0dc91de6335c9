// Reading, writing and removing values; the initial value, the default and the limits.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/curves/KFCurve.h"

#include <limits>

namespace {

/// Where the type ends the value stays; what is no number is 0.
template <class Integer> Integer truncated(double value) {
    using Limits = std::numeric_limits<Integer>;
    if (!(value > static_cast<double>(Limits::min())))
        return value <= static_cast<double>(Limits::min()) ? Limits::min() : Integer{0};
    return value < static_cast<double>(Limits::max()) ? static_cast<Integer>(value) : Limits::max();
}

} // namespace

// --- Reading ---

double KFChannel::getValueAsDouble(Tempus const& t, double input) const {
    if (_impl == nullptr || _impl->getCurve() == nullptr)
        return 0.0;
    KFCurve& curve = *_impl->getCurve();
    bool const faded = !testFlag(kChannelFlagFadesOff) && hasFadeHandles();
    if (!curve.hasProcessingNodes() && getNumberOfKeyframes() == 0) {
        double const result = curve.clampedInitialValue();
        return faded ? result * getFadeRatio(globalToLocalTime(t)) : result;
    }
    Tempus const local = globalToLocalTime(t);
    double result = 0.0;
    if (testFlag(kChannelFlagBehaviorsOff)) {
        curve.getPointWithoutBehavior(local, input, &result);
    } else {
        result = curve.getValue(local, input);
    }
    return faded ? result * getFadeRatio(local) : result;
}

int KFChannel::getValueAsInt(Tempus const& t, double input) const {
    return truncated<int>(getValueAsDouble(t, input));
}

unsigned int KFChannel::getValueAsUint(Tempus const& t, double input) const {
    return truncated<unsigned int>(getValueAsDouble(t, input));
}

BXString KFChannel::getValueAsString(Tempus const&, double) const { return BXString(); }

double KFChannel::getCurveValue(Tempus const& t, bool withBehaviors) const {
    double value = 0.0;
    if (withBehaviors) {
        curve().getPoint(t, 0.0, &value);
    } else {
        curve().getPointWithoutBehavior(t, 0.0, &value);
    }
    return value;
}

double KFChannel::getCurveValueForNode(Tempus const& t, void* node, double input) const {
    double value = 0.0;
    curve().getPointFromCurveNode(t, input, &value, node);
    return value;
}

// --- Writing ---

void KFChannel::setValue(Tempus const& t, double value, bool silent) {
    if (KFCompoundChannel* const compound = linkedCompound()) {
        compound->setValue(this, t, value);
        return;
    }
    if (isLocked(false))
        return;
    if (!silent)
        willBeModified(kModifyData);
    if (!isKeyframable() && isSame(value, getInitialValue()))
        return;
    createLocalChannelImplementation();
    if (KFChannelObjectRootBase* const root = getChannelRootBase()) {
        root->channelValueWillBeSet(this, t, value);
        keyStartOfExtentIfWanted(*root, t, false);
    }
    curveToWrite().setKeypoint(curveTimeAt(t), value, false);
    noteRecordedValue(t);
}

void KFChannel::keyStartOfExtentIfWanted(KFChannelObjectRootBase& root, Tempus const& t, bool atCurveValue) {
    if (hasKeypoints(0) || !root.shouldAddKeypointAt0(t))
        return;
    Tempus const start = globalToLocalTime(root.getTimeExtent().start);
    // Read before the local record is asked for: reading may run through the host.
    if (atCurveValue) {
        curveToWrite().setKeypoint(start, false);
    } else {
        double const oldValue = getValueAsDouble(kTempusZero, 0.0);
        curveToWrite().setKeypoint(start, oldValue, false);
    }
}

void KFChannel::noteRecordedValue(Tempus const& t) {
    if (isRecording())
        didRecordValue(t);
}

void KFChannel::setValue(Tempus const& t) {
    if (!beginEdit())
        return;
    createLocalChannelImplementation();
    if (KFChannelObjectRootBase* const root = getChannelRootBase())
        keyStartOfExtentIfWanted(*root, t, true);
    curveToWrite().setKeypoint(curveTimeAt(t), false);
    noteRecordedValue(t);
}

void KFChannel::setValueAndIgnoreRecordOption(Tempus const& t) {
    if (!beginEdit())
        return;
    curveToWrite().setKeypoint(curveTimeAt(t), true);
    noteRecordedValue(t);
}

void KFChannel::setValueAndDontAddFirstKeypoint(Tempus const& t, double value) {
    if (!beginEdit())
        return;
    curveToWrite().setKeypoint(curveTimeAt(t), value, false);
    noteRecordedValue(t);
}

void KFChannel::setValueOffsetByBehaviors(Tempus const& t, double value) {
    double const delta = value - getValueAsDouble(t, 0.0);
    double const base = getCurveValue(globalToLocalTime(t), false);
    setValue(t, base + delta, false);
}

// --- Removing, moving, offsetting ---

bool KFChannel::removeValue(Tempus const& t, bool force) {
    if (!beginEdit() || keypointAt(t) == nullptr)
        return false;
    KFCurve& written = curveToWrite();
    written.delKeypoint(keypointAt(t), force);
    return true;
}

void KFChannel::removeAllValues(Tempus const& t, bool force) {
    if (beginEdit())
        curveToWrite().delAllKeypoints(globalToLocalTime(t), force);
}

bool KFChannel::moveValue(Tempus const& from, Tempus const& to, bool force) {
    if (!beginEdit() || keypointAt(from) == nullptr)
        return false;
    KFCurve& written = curveToWrite();
    written.moveKeypoint(keypointAt(from), globalToLocalTime(to), force, false, false);
    return true;
}

void KFChannel::offsetChannel(Tempus const& t, double delta) {
    if (!isLocked(false))
        curveToWrite().setCurveOffset(globalToLocalTime(t), delta);
}

void KFChannel::scaleChannel(double factor) {
    if (!isLocked(false) && !isSame(factor, 1.0))
        curveToWrite().scaleCurve(factor);
}

// --- Initial value and default ---

double KFChannel::getInitialValue() const {
    double value = 0.0;
    curve().getCurveInitialValue(&value);
    return value;
}

void KFChannel::setInitialValue(double value, bool silent) {
    // Held against what is stored, as documents hold it: the limits are for reading.
    if (isSame(value, curve().getRootNode()->getInitialValue()))
        return;
    if (!silent)
        willBeModified(kModifyData);
    curveToWrite().setCurveInitialValue(value);
}

double KFChannel::getDefaultValue() const {
    double value = 0.0;
    curve().getCurveDefaultValue(&value);
    return value;
}

void KFChannel::setDefaultValue(double value) {
    if (isSame(value, getDefaultValue()))
        return;
    curveToWrite().setCurveDefaultValue(value);
    if (testFlag(kChannelFlagInitialized))
        setFlag(kChannelFlagSaveWhenAtDefault, true);
}

void KFChannel::setDefaultAtCurrentTime(Tempus const& t) { setDefaultValue(getValueAsDouble(t, 0.0)); }
void KFChannel::setDefaultToCurrentValue() { setDefaultAtCurrentTime(kTempusZero); }

void KFChannel::resetToDefault(bool silent) {
    if (KFCompoundChannel* const compound = linkedCompound()) {
        compound->compoundReset(this, false);
        return;
    }
    if (!silent)
        willBeModified(kModifyData);
    if (_impl == nullptr || _impl->isShared())
        return;
    _impl->freeFades();
    if (_impl->getCurve() != nullptr)
        curve().setCurveToDefault();
    resetLocalChannelImplementation();
}

bool KFChannel::isModified(bool) const {
    if (hasKeypoints(0) || hasFadeHandles() || !isSame(getValueAsDouble(kTempusZero, 0.0), getDefaultValue()))
        return true;
    return isChannelAffectedByBehaviors(false);
}

// --- Limits ---

double KFChannel::getMin() const {
    double value = 0.0;
    curve().getAbsoluteMinValueV(&value);
    return value;
}

double KFChannel::getMax() const {
    double value = 0.0;
    curve().getAbsoluteMaxValueV(&value);
    return value;
}

void KFChannel::setMin(double value) {
    if (isLocked(false) || isSame(value, getMin()))
        return;
    curveToWrite().setAbsoluteMinValueV(value);
    if (value > getSliderMin())
        setSliderMin(value);
}

void KFChannel::setMax(double value) {
    if (isLocked(false) || isSame(value, getMax()))
        return;
    curveToWrite().setAbsoluteMaxValueV(value);
    if (getSliderMax() > value)
        setSliderMax(value);
}
