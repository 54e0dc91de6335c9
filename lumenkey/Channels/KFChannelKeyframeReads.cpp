// Keyframes by handle and in curve time: the reads. Each is the curve's answer.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/curves/KFCurve.h"

#include <algorithm>
#include <limits>

using Handle = void*;
using Time = Tempus const&;

namespace {

/// What the read writes to its argument; zero or false where it writes nothing.
template <class Value, class Read> Value given(Read read) {
    Value value{};
    read(&value);
    return value;
}

} // namespace

// --- Looking ---

std::vector<void*> KFChannel::getKeyframes(bool valid) const {
    std::vector<void*> handles;
    valid ? curve().getKeypointValidHandleList(handles) : curve().getKeypointHandleList(handles);
    return handles;
}

bool KFChannel::getKeyframe(Handle h, Tempus* t, double* value) const {
    return curve().getKeypoint(h, t, value);
}

void* KFChannel::getKeyframe(Time t) const {
    void* handle = nullptr;
    return curve().getKeypointHandle(t, &handle) ? handle : nullptr;
}

bool KFChannel::getNextKeyframe(Time t, Tempus* found, double* value) const {
    return curve().getNextKeypoint(t, found, value);
}

bool KFChannel::getPreviousKeyframe(Time t, Tempus* found, double* value) const {
    return curve().getPreviousKeypoint(t, found, value);
}

bool KFChannel::getFirstKeyframe(Tempus* found, double* value) const {
    return curve().getFirstKeypoint(found, value);
}

bool KFChannel::getLastKeyframe(Tempus* found, double* value) const {
    return curve().getLastKeypoint(found, value);
}

namespace {

template <class Find> void* enabledKeyframe(Find find) {
    void* handle = nullptr;
    return find(&handle) ? handle : nullptr;
}

} // namespace

void* KFChannel::getNextEnabledKeyframe(Time t) const {
    return enabledKeyframe([&](void** out) { return curve().getNextValidKeypointHandle(t, out); });
}

void* KFChannel::getNextEnabledKeyframe(Handle h) const {
    return enabledKeyframe([&](void** out) { return curve().getNextValidKeypointHandle(h, out); });
}

void* KFChannel::getPreviousEnabledKeyframe(Time t) const {
    return enabledKeyframe([&](void** out) { return curve().getPreviousValidKeypointHandle(t, out); });
}

void* KFChannel::getPreviousEnabledKeyframe(Handle h) const {
    return enabledKeyframe([&](void** out) { return curve().getPreviousValidKeypointHandle(h, out); });
}

void* KFChannel::getFirstEnabledKeyframe() const {
    return enabledKeyframe([&](void** out) { return curve().getFirstValidKeypointHandle(out); });
}

void* KFChannel::getLastEnabledKeyframe() const {
    return enabledKeyframe([&](void** out) { return curve().getLastValidKeypointHandle(out); });
}

// --- Attributes of one ---

bool KFChannel::getKeyframeInputTangents(Handle h, double* dx, double* dy, bool handles) const {
    return handles ? curve().getKeypointInputHandles(h, dx, dy)
                   : curve().getKeypointInputNormalizedTangents(h, dx, dy);
}

bool KFChannel::getKeyframeOutputTangents(Handle h, double* dx, double* dy, bool handles) const {
    return handles ? curve().getKeypointOutputHandles(h, dx, dy)
                   : curve().getKeypointOutputNormalizedTangents(h, dx, dy);
}

unsigned int KFChannel::getKeyframeInterpolation(Handle h) const {
    return given<std::uint32_t>([&](auto* out) { curve().getKeypointInterpolation(h, out, nullptr); });
}

bool KFChannel::getKeyframeInterpolationUsesTangents(Handle h) const {
    return given<bool>([&](bool* out) { curve().getKeypointInterpolation(h, nullptr, out); });
}

bool KFChannel::isSmoothKeyframe(Handle h) const {
    constexpr unsigned int kLinear = 1;
    constexpr unsigned int kBezier = 4;
    unsigned int const type = getKeyframeInterpolation(h);
    if (type != kBezier)
        return type == kLinear;
    double parts[4] = {};
    curve().getKeypointInputHandles(h, &parts[0], &parts[1]);
    curve().getKeypointOutputHandles(h, &parts[2], &parts[3]);
    return std::all_of(std::begin(parts), std::end(parts), [](double part) { return isSame(part, 0.0); });
}

unsigned int KFChannel::getKeyframeFlags(Handle h) const {
    return given<std::uint32_t>([&](auto* out) { curve().getKeypointFlags(h, out); });
}

bool KFChannel::getKeyframeEnabled(Handle h) const {
    return given<bool>([&](bool* out) { curve().isEnabledKeypoint(h, out); });
}

bool KFChannel::getKeyframeLocked(Handle h) const {
    return given<bool>([&](bool* out) { curve().isLockedKeypoint(h, out); });
}

double KFChannel::getKeyframeBias(Handle h) const {
    return given<double>([&](double* out) { curve().getKeypointBiasLinear(h, out); });
}

double KFChannel::getKeyframeNormal(Handle h) const {
    return given<double>([&](double* out) { curve().getKeypointNormal(h, out); });
}

double KFChannel::getKeyframeNormal(Time t) const {
    return given<double>([&](double* out) { curve().getKeypointNormal(t, out); });
}

bool KFChannel::getKeyframeTangentsBroken(Handle h) const {
    return given<bool>([&](bool* out) { curve().areHandlesBroken(h, out); });
}

bool KFChannel::getKeyframeTangentsScaled(Handle h) const {
    return given<bool>([&](bool* out) { curve().areHandlesWeighted(h, out); });
}

unsigned int KFChannel::getCurveSegmentSpeed(Handle h) const {
    return given<std::uint32_t>([&](auto* out) { curve().getKeypointSpeed(h, out); });
}

// --- The whole curve ---

Tempus KFChannel::getKeyframeMinTime() const {
    Tempus time = kTempusZero;
    curve().getCurrentMinValueU(&time);
    return time;
}

Tempus KFChannel::getKeyframeMaxTime() const {
    Tempus time = kTempusZero;
    curve().getCurrentMaxValueU(&time);
    return time;
}

Tempus KFChannel::getKeyframeTimeRange() const {
    Tempus range = kTempusZero;
    curve().getCurrentRangeU(&range);
    return range;
}

Tempus KFChannel::getKeyframeParametricRange() const { return getKeyframeTimeRange(); }

double KFChannel::getKeyframeMinValue(bool withTangents) const {
    return given<double>([&](double* out) { curve().getCurrentMinValueV(out, withTangents); });
}

double KFChannel::getKeyframeMaxValue(bool withTangents) const {
    return given<double>([&](double* out) { curve().getCurrentMaxValueV(out, withTangents); });
}

unsigned int KFChannel::getInterpolation() const {
    return given<std::uint32_t>([&](auto* out) { curve().getCurveInterpolation(out); });
}

bool KFChannel::hasInterpolation(unsigned int type) const {
    return given<bool>([&](bool* out) { curve().hasInterpolation(type, out); });
}

unsigned int KFChannel::getExtrapolation(unsigned int which) const {
    return given<std::uint32_t>([&](auto* out) { curve().getCurveExtrapolation(out, which); });
}

bool KFChannel::isParametricCurveClosed() const {
    return given<bool>([&](bool* out) { curve().isClosedCurve(out); });
}

bool KFChannel::useRetimingExtrapolation() const { return curve().getRetimingExtrapolation(); }

KFCurveNode* KFChannel::getPreviousProcessingNode(void* node) const {
    return given<KFCurveNode*>(
        [&](KFCurveNode** out) { curve().getPreviousProcessingNode(static_cast<KFCurveNode*>(node), out); });
}

// --- Samples ---

bool KFChannel::getSamples(Time start, Time step, unsigned int& count, std::vector<Tempus>* times,
                           std::vector<double>* values) const {
    return curve().getCurveSamples(start, step, count, times, values);
}

bool KFChannel::getSamples(void* node, Time start, Time step, unsigned int& count, std::vector<Tempus>* times,
                           std::vector<double>* values) const {
    return curve().getCurveSamples(node, start, step, count, times, values);
}

bool KFChannel::getSamples(double start, double step, unsigned int& count, double** times, double** values,
                           double operand) const {
    return curve().getCurveSamples(start, step, count, times, values, operand);
}

bool KFChannel::getSamples(double start, double step, unsigned int& count, std::vector<double>* times,
                           std::vector<double>* values) const {
    return curve().getCurveSamples(start, step, count, times, values);
}

bool KFChannel::getSamples(void* node, Time start, Time step, unsigned int& count, Tempus** times,
                           double** values) const {
    return curve().getCurveSamples(node, start, step, count, times, values);
}

bool KFChannel::getSamples(Time start, Time step, unsigned int& count, Tempus** times,
                           double** values) const {
    return curve().getCurveSamples(start, step, count, times, values);
}

bool KFChannel::getCurveDerivativesSamples(Time start, Time step, unsigned int& count,
                                           std::vector<Tempus>* times, std::vector<double>* values) const {
    return curve().getCurveDerivativesSamples(start, step, count, times, values);
}

bool KFChannel::getCurveInputTangents(Time t, double* dx, double* dy, bool scaled) const {
    return curve().getPointInputTangents(t, dx, dy, scaled);
}

bool KFChannel::getCurveOutputTangents(Time t, double* dx, double* dy, bool scaled) const {
    return curve().getPointOutputTangents(t, dx, dy, scaled);
}

bool KFChannel::getKeyframesTimeAndValue(TempusRange range,
                                         std::vector<std::pair<Tempus, std::pair<double, unsigned>>>& out,
                                         Tempus* first, Tempus* last) const {
    return curve().getKeypointsTimeAndValue(range, out, first, last);
}

// --- Ranges ---

std::vector<double> KFChannel::valuesInRange(Time from, Time to) const {
    std::vector<double> values;
    for (Tempus const& time : keypointTimesInRange(from, to)) {
        double value = 0.0;
        if (getKeyframe(keypointAt(time), nullptr, &value))
            values.push_back(value);
    }
    if (values.empty())
        values.push_back(getCurveValue(globalToLocalTime(from), true));
    return values;
}

double KFChannel::getKeyframeMinValueInRange(Time from, Time to) const {
    double lowest = std::numeric_limits<double>::max();
    for (double const value : valuesInRange(from, to))
        lowest = std::min(lowest, value);
    return lowest;
}

double KFChannel::getKeyframeMaxValueInRange(Time from, Time to) const {
    double highest = -std::numeric_limits<double>::max();
    for (double const value : valuesInRange(from, to))
        highest = std::max(highest, value);
    return highest;
}
