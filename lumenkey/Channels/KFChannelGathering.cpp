// Gathering a channel's keypoints, and pasting them.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFVertex.h"

#include <cmath>

namespace {

/// The nearest keypoint that takes part in the curve, on one side of a pasted one.
struct Neighbour {
    void* handle = nullptr;
    double value = 0.0;

    bool differsFrom(double other) const { return handle != nullptr && std::fabs(value - other) >= 1e-7; }
};

Neighbour neighbour(KFCurve& curve, Tempus const& t, bool next) {
    Neighbour found;
    bool const exists = next ? curve.getNextValidKeypointHandle(t, &found.handle)
                             : curve.getPreviousValidKeypointHandle(t, &found.handle);
    if (!exists || !curve.getKeypoint(found.handle, nullptr, &found.value))
        return {};
    return found;
}

/// Gives a pasted keypoint its own tangents on the sides where the curve isn't level: a single one that stands as high
/// as its neighbour doesn't bend the segment between, and there a neighbour within the curve loses its tangent.
template <class SetInput, class SetOutput>
void pasteTangents(KFCurve& curve, Tempus const& t, double value, bool several, SetInput setInput,
                   SetOutput setOutput) {
    Neighbour const previous = neighbour(curve, t, false);
    Neighbour const next = neighbour(curve, t, true);
    bool const isBetween = previous.handle != nullptr && next.handle != nullptr;
    if (several || previous.differsFrom(value)) {
        setInput();
    } else if (isBetween) {
        curve.setKeypointOutputNormalizedTangents(previous.handle, 0.0, 0.0, true);
    }
    if (several || next.differsFrom(value)) {
        setOutput();
    } else if (isBetween) {
        curve.setKeypointInputNormalizedTangents(next.handle, 0.0, 0.0, true);
    }
}

/// What decides whether the other attributes of a keypoint may be written, and what ties its handles
/// together, comes last: so each is as it was pasted. One that is locked and stays so keeps what the lock
/// guards.
template <class PasteOthers>
void pasteFlagsAround(KFCurve& curve, void* handle, _KFKeyframeInfo const& info, PasteOthers pasteOthers) {
    bool wasLocked = false;
    curve.isLockedKeypoint(handle, &wasLocked);
    bool const staysLocked = wasLocked && (info.flags & kKFVertexFlagLocked) != 0;
    curve.setKeypointFlags(handle, staysLocked ? info.flags : kKFVertexFlagHandlesBroken, true);
    curve.enableKeypoint(handle, true, true);
    pasteOthers();
    curve.setKeypointFlags(handle, info.flags, true);
    curve.enableKeypoint(handle, info.enabled, true);
}

} // namespace

// --- Gathering ---

std::vector<Tempus> KFChannel::visibleKeypoints(TempusRange range, bool withNeighbours, unsigned int mask) {
    std::vector<std::pair<Tempus, std::pair<double, unsigned>>> inRange;
    getKeyframesTimeAndValue({globalToLocalTime(range.start), range.duration}, inRange, nullptr, nullptr);
    std::vector<Tempus> times;
    Tempus previous = range.start;
    if (withNeighbours && previousKeypoint(&previous, mask))
        times.push_back(previous);
    for (auto const& keypoint : inRange)
        times.push_back(localToGlobalTime(keypoint.first));
    Tempus next = TempusRangeGetEnd(range);
    if (withNeighbours && nextKeypoint(&next, mask))
        times.push_back(next);
    return times;
}

_KFKeyframeInfo KFChannel::keyframeInfo(void* handle, bool withHandles) const {
    _KFKeyframeInfo info;
    getKeyframe(handle, &info.time, &info.value);
    info.enabled = getKeyframeEnabled(handle);
    info.bias = getKeyframeBias(handle);
    getKeyframeInputTangents(handle, &info.inputTangentX, &info.inputTangentY, withHandles);
    getKeyframeOutputTangents(handle, &info.outputTangentX, &info.outputTangentY, withHandles);
    info.flags = getKeyframeFlags(handle);
    info.interpolation = getKeyframeInterpolation(handle);
    info.normal = getKeyframeNormal(handle);
    return info;
}

void KFChannel::keyframesWithChannels(TempusRange range, KeyframesByChannel& out) {
    if (getCurveInterface() == nullptr)
        return;
    std::vector<_KFKeyframeInfo> keyframes;
    for (Tempus const& time : keypointTimesInRange(range.start, TempusRangeGetEnd(range))) {
        if (void* const handle = keypointAt(time))
            keyframes.push_back(keyframeInfo(handle, true));
    }
    if (!keyframes.empty())
        out.emplace_back(this, std::move(keyframes));
}

// --- Pasting ---

void KFChannel::setKeyframesWithInfo(Tempus const& t, std::vector<_KFKeyframeInfo> const& keyframes) {
    if (isLocked(false) || keyframes.empty())
        return;
    KFCurve& written = curveToWrite();
    for (_KFKeyframeInfo const& info : keyframes) {
        Tempus const target = t + (info.time - keyframes.front().time);
        setKeyframe(target, info.value, false);
        void* const h = getKeyframe(target);
        if (h == nullptr) // a curve that takes no keypoints took the value
            continue;
        pasteFlagsAround(written, h, info, [&] {
            written.setKeypointNormal(h, info.normal, true);
            written.setKeypointInterpolation(h, info.interpolation, true);
            written.setKeypointBiasLinear(h, info.bias);
            pasteTangents(
                written, target, info.value, keyframes.size() > 1,
                [&] { written.setKeypointInputHandles(h, info.inputTangentX, info.inputTangentY, true); },
                [&] { written.setKeypointOutputHandles(h, info.outputTangentX, info.outputTangentY, true); });
        });
    }
}

void KFChannel::copyKeyframesFromChannel(Tempus const& t, KFChannelBase* other) {
    auto* const source = dynamic_cast<KFChannel*>(other);
    if (isLocked(false) || source == nullptr)
        return;
    createLocalChannelImplementation();
    double const scale = getScale();
    double const sourceScale = source->getScale();
    auto const inOwnUnit = [=](double value) { return scale == 0.0 ? value : value * sourceScale / scale; };

    // All are read before the first is written: a channel may be pasted into itself.
    std::vector<_KFKeyframeInfo> keyframes;
    for (void* const handle : source->getKeyframes(false))
        keyframes.push_back(source->keyframeInfo(handle, false));
    if (keyframes.empty()) {
        reset(false);
        setInitialValue(inOwnUnit(source->getValueAsDouble(kTempusZero, 0.0)), false);
        return;
    }

    KFCurve& written = curveToWrite();
    Tempus const base = globalToLocalTime(t) - keyframes.front().time;
    for (_KFKeyframeInfo const& info : keyframes) {
        Tempus const target = base + info.time;
        if (getKeyframeLocked(getKeyframe(target)))
            continue;
        double const value = inOwnUnit(info.value);
        setKeyframe(target, value, false);
        void* const h = getKeyframe(target);
        if (h == nullptr)
            continue;
        pasteFlagsAround(written, h, info, [&] {
            written.setKeypointInterpolation(h, info.interpolation, true);
            pasteTangents(
                written, target, value, keyframes.size() > 1,
                [&] {
                    written.setKeypointInputNormalizedTangents(h, info.inputTangentX,
                                                               inOwnUnit(info.inputTangentY), true);
                },
                [&] {
                    written.setKeypointOutputNormalizedTangents(h, info.outputTangentX,
                                                                inOwnUnit(info.outputTangentY), true);
                });
        });
    }
}
