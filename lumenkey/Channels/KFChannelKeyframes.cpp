// Keyframes by handle and in curve time: the setters. Each is the curve's operation behind one and the same check.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/curves/KFCurve.h"

#include <algorithm>

using Handle = void*;
using Time = Tempus const&;

// --- Adding, moving, removing ---

void KFChannel::setKeyframe(Time t, double value, bool withTangents) {
    editKeyframes([&](KFCurve& c) {
        withTangents ? c.setKeypoint(t, value, true) : c.setKeypointNoTangents(t, value, true);
    });
}

void KFChannel::setKeyframe(Time t) {
    editKeyframes([&](KFCurve& c) { c.setKeypoint(t, true); });
}

void KFChannel::setKeyframeIfRecording(Time t) {
    editKeyframes([&](KFCurve& c) { c.setKeypoint(t, false); });
}

void KFChannel::setKeyframe(Handle h, Time t, double value) {
    editKeyframes([&](KFCurve& c) { c.setKeypoint(h, t, value, true); });
}

void KFChannel::appendKeyframe(Time t, double value, bool) {
    editKeyframes([&](KFCurve& c) { c.appendKeypointNoTangents(t, value, true); });
}

void KFChannel::appendKeyframes(unsigned int count, Tempus const* times, double const* values, bool) {
    if (count > 0 && times != nullptr && values != nullptr)
        editKeyframes([&](KFCurve& c) { c.appendKeypointsNoTangents(count, times, values, true); });
}

void KFChannel::willLoadKeyframes(bool loading, int count) {
    auto const expected = static_cast<std::uint32_t>(std::max(count, 0));
    editKeyframes([&](KFCurve& c) { c.loadVertices(loading, expected); });
}

void KFChannel::cloneKeyframe(Handle h, Time t) {
    editKeyframes([&](KFCurve& c) { c.cloneKeypoint(h, t, true); });
}

bool KFChannel::moveKeyframe(Handle h, Time t, bool a, bool b) {
    bool moved = false;
    editKeyframes([&](KFCurve& c) { moved = c.moveKeypoint(h, t, a, b, false); });
    return moved;
}

void KFChannel::offsetKeyframe(Handle h, Time t) {
    editKeyframes([&](KFCurve& c) { c.offsetKeypointInTime(h, t, true); });
}

void KFChannel::deleteKeyframe(Handle h) {
    announceAndEditKeyframes([&](KFCurve& c) { c.delKeypoint(h, true); });
}

void KFChannel::deleteAllKeyframes(Time t) {
    editKeyframes([&](KFCurve& c) { c.delAllKeypoints(t, true); });
}

void KFChannel::purgeKeyframes() { curve().purgeCurve(); }

// --- The whole curve ---

void KFChannel::setKeyframesValue(double value) {
    editKeyframes([&](KFCurve& c) { c.setKeypointsValue(value, true); });
}

void KFChannel::generateKeyframesFromDynamicCurve(Time t, KFDynamicCurve* dynamicCurve) {
    editKeyframes([&](KFCurve& c) { c.generateCurveFromDynamicCurve(t, dynamicCurve); });
}

void KFChannel::linearTimeWarp(double factor, Time t) {
    editKeyframes([&](KFCurve& c) { c.warpCurveLinear(factor, t, true); });
}

void KFChannel::reverseKeyframes(Handle first, Handle last) {
    editKeyframes([&](KFCurve& c) { c.reverseKeypoints(first, last, true); });
}

void KFChannel::setCustomInterpolator(KFCustomInterpolator* interpolator, BXSpinLock* lock) {
    editKeyframes([&](KFCurve& c) { c.setCustomInterpolator(interpolator, lock); });
}

// --- Attributes of one ---

void KFChannel::setKeyframeValue(Handle h, double value) {
    editKeyframes([&](KFCurve& c) { c.setKeypointValue(h, value, true); });
}

void KFChannel::setKeyframeFlags(Handle h, unsigned int flags) {
    editKeyframes([&](KFCurve& c) { c.setKeypointFlags(h, flags, true); });
}

void KFChannel::setKeyframeEnabled(Handle h, bool on) {
    editKeyframes([&](KFCurve& c) { c.enableKeypoint(h, on, true); });
}

void KFChannel::setKeyframeSelected(Handle h, bool on) {
    editKeyframes([&](KFCurve& c) { c.selectKeypoint(h, on, true); });
}

void KFChannel::setKeyframeLocked(Handle h, bool on) {
    editKeyframes([&](KFCurve& c) { c.lockKeypoint(h, on, true); });
}

void KFChannel::setKeyframeBias(Handle h, double bias) {
    editKeyframes([&](KFCurve& c) { c.setKeypointBiasLinear(h, bias); });
}

void KFChannel::setKeyframeNormal(Handle h, double normal) {
    editKeyframes([&](KFCurve& c) { c.setKeypointNormal(h, normal, true); });
}

void KFChannel::setKeyframeNormal(Time t, double normal) {
    editKeyframes([&](KFCurve& c) { c.setKeypointNormal(t, normal, true); });
}

void KFChannel::setKeyframeInterpolation(Handle h, unsigned int type) {
    announceAndEditKeyframes([&](KFCurve& c) { c.setKeypointInterpolation(h, type, true); });
}

// --- Tangents ---

void KFChannel::deriveKeyframe(Handle h) {
    editKeyframes([&](KFCurve& c) { c.deriveKeypoint(h); });
}

void KFChannel::smoothKeyframe(Handle h, bool on) {
    editKeyframes([&](KFCurve& c) { c.setKeypointSmooth(h, on, true); });
}

void KFChannel::setKeyframeInputTangents(Handle h, double dx, double dy, bool handles) {
    editKeyframes([&](KFCurve& c) {
        handles ? c.setKeypointInputHandles(h, dx, dy, true)
                : c.setKeypointInputNormalizedTangents(h, dx, dy, true);
    });
}

void KFChannel::setKeyframeOutputTangents(Handle h, double dx, double dy, bool handles) {
    editKeyframes([&](KFCurve& c) {
        handles ? c.setKeypointOutputHandles(h, dx, dy, true)
                : c.setKeypointOutputNormalizedTangents(h, dx, dy, true);
    });
}

void KFChannel::setKeyframeTangentsBroken(Handle h, bool on) {
    editKeyframes([&](KFCurve& c) { c.breakKeypointHandles(h, on, true); });
}

void KFChannel::setKeyframeTangentsScaled(Handle h, bool on) {
    editKeyframes([&](KFCurve& c) { c.weightHandles(h, on, true); });
}

void KFChannel::setKeyframeTangentsFlat(Handle h) {
    editKeyframes([&](KFCurve& c) { c.flattenHandles(h, true); });
}

// --- The segment behind one ---

// The host hears of these before the record becomes local.

void KFChannel::setCurveSegmentSpeed(Handle h, unsigned int speed) {
    if (getCurveInterface() != nullptr && beginEdit())
        curveToWrite().setKeypointSpeed(h, speed, true);
}

void KFChannel::offsetCurveSegmentSpeed(Handle h, double delta) {
    if (getCurveInterface() != nullptr && beginEdit())
        curveToWrite().adjustKeypointSpeed(h, delta, true);
}

// --- Ranges ---

void KFChannel::offsetKeyframesValuesInRange(Time from, Time to, Time t, double value) {
    std::vector<Tempus> const times = keypointTimesInRange(from, to);
    if (times.empty())
        return;
    double const delta = value - getCurveValue(globalToLocalTime(t), true);
    editKeyframes([&](KFCurve& c) { // on whose record the handles are looked up
        for (Tempus const& time : times) {
            void* const handle = keypointAt(time);
            double old = 0.0;
            if (c.getKeypoint(handle, nullptr, &old))
                c.setKeypointValue(handle, old + delta, true);
        }
    });
}
