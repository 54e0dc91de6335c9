#include "tools/edit/KeypointStretch.h"

#include "lumenkey/Channels/KFKeyframeInfo.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "lumenkey/splines/KFVertex.h"
#include "tools/curve/Keypoint.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <memory>

namespace lumenkey::tools {

namespace {

std::vector<void*> allKeypoints(KFCurve& curve) {
    KFSpline* const spline = curve.getNumberOfKeypoints() == 0 ? nullptr : curve.getSpline();
    return spline == nullptr ? std::vector<void*>() : everyKeypointHandle(*spline);
}

Tempus timeOf(KFCurve& curve, void* handle) {
    Tempus time{};
    curve.getKeypoint(handle, &time, nullptr);
    return time;
}

bool isLocked(KFCurve& curve, void* handle) {
    bool locked = false;
    return curve.isLockedKeypoint(handle, &locked) && locked;
}

std::vector<void*> unlockedWithin(KFCurve& curve, TimeSpan const& span) {
    std::vector<void*> handles = keypointsWithin(curve, span);
    std::erase_if(handles, [&](void* handle) { return isLocked(curve, handle); });
    return handles;
}

/// In their order.
std::vector<Tempus> timesOfLocked(KFCurve& curve) {
    std::vector<Tempus> times;
    for (void* const handle : allKeypoints(curve)) {
        if (isLocked(curve, handle)) {
            times.push_back(timeOf(curve, handle));
        }
    }
    std::sort(times.begin(), times.end());
    return times;
}

struct LostTimes {
    std::size_t outside = 0;
    std::size_t shared = 0;
};

LostTimes lostTimesOf(KFCurve& curve) {
    std::vector<Tempus> times;
    for (void* const handle : allKeypoints(curve)) {
        times.push_back(timeOf(curve, handle));
    }
    LostTimes lost;
    lost.outside = std::erase_if(times, [](Tempus const& time) { return !TempusIsNumeric(time); });
    std::sort(times.begin(), times.end());
    lost.shared = static_cast<std::size_t>(times.end() - std::unique(times.begin(), times.end()));
    return lost;
}

/// Others keep their handles, unlike where a user deletes one.
void deleteKeypoint(KFCurve& curve, void* handle) {
    curve.getSpline()->deleteVertex(handle, false, kTempusZero);
}

/// But those that are locked.
void deleteKeypoints(KFCurve& curve, TimeSpan const& span) {
    for (void* const handle : unlockedWithin(curve, span)) {
        deleteKeypoint(curve, handle);
    }
}

/// Of a copy: what is locked stays where it is on the curve itself.
void keepUnlockedWithin(KFCurve& curve, TimeSpan const& span) {
    for (void* const handle : allKeypoints(curve)) {
        bool const locked = isLocked(curve, handle);
        if (locked) {
            curve.lockKeypoint(handle, false, true);
        }
        if (locked || !span.holds(timeOf(curve, handle))) {
            deleteKeypoint(curve, handle);
        }
    }
}

/// A keypoint as it is pasted, and where it stands in its curve.
struct GatheredKeypoint {
    _KFKeyframeInfo info;
    Tempus time{};
    double value = 0;
};

/// All keypoints; the library's own gathering leaves out disabled ones at the ends.
std::vector<GatheredKeypoint> gather(KFChannel& channel) {
    std::vector<GatheredKeypoint> all;
    KFCurve& curve = *channel.getCurveInterface();
    for (void* const handle : allKeypoints(curve)) {
        GatheredKeypoint keypoint;
        _KFKeyframeInfo& info = keypoint.info;
        curve.getKeypoint(handle, &keypoint.time, &keypoint.value);
        channel.getKeyframe(handle, &info.time, &info.value);
        channel.getKeyframeInputTangents(handle, &info.inputTangentX, &info.inputTangentY, true);
        channel.getKeyframeOutputTangents(handle, &info.outputTangentX, &info.outputTangentY, true);
        info.enabled = channel.getKeyframeEnabled(handle);
        info.bias = channel.getKeyframeBias(handle);
        info.flags = channel.getKeyframeFlags(handle);
        info.interpolation = channel.getKeyframeInterpolation(handle);
        info.normal = channel.getKeyframeNormal(handle);
        all.push_back(keypoint);
    }
    return all;
}

/// Only where it changes something: a curve looks for the keypoint among all that share its time.
void enable(KFCurve& curve, void* handle, bool on) {
    bool isOn = false;
    if (curve.isEnabledKeypoint(handle, &isOn) && isOn != on) {
        curve.enableKeypoint(handle, on, true);
    }
}

/// Gives a keypoint of the curve all but the time of a gathered one.
void write(KFCurve& curve, void* handle, GatheredKeypoint const& keypoint) {
    _KFKeyframeInfo const& info = keypoint.info;
    // What ties handles together, or guards a keypoint, comes last.
    curve.setKeypointFlags(handle, kKFVertexFlagHandlesBroken, true);
    enable(curve, handle, true);
    // As it is stored, also out of the limits.
    curve.getSpline()->setVertexValue(handle, keypoint.value, kTempusZero);
    curve.setKeypointNormal(handle, info.normal, true);
    curve.setKeypointInterpolation(handle, info.interpolation, true);
    curve.setKeypointBiasLinear(handle, info.bias);
    curve.setKeypointInputHandles(handle, info.inputTangentX, info.inputTangentY, true);
    curve.setKeypointOutputHandles(handle, info.outputTangentX, info.outputTangentY, true);
    curve.setKeypointFlags(handle, info.flags, true);
    enable(curve, handle, info.enabled);
}

/// All of them, in their order, into a stretch that is free of others. Pasting goes by time: it takes one of
/// several at one time, and shortens handles of each for the sake of the next.
void paste(KFChannel& channel, std::vector<GatheredKeypoint> const& keypoints) {
    std::vector<_KFKeyframeInfo> pasted;
    std::vector<GatheredKeypoint const*> others;
    for (GatheredKeypoint const& keypoint : keypoints) {
        bool const isLast = &keypoint == &keypoints.back() || (&keypoint)[1].time != keypoint.time;
        if (isLast) {
            pasted.push_back(keypoint.info);
        } else {
            others.push_back(&keypoint);
        }
    }
    channel.setKeyframesWithInfo(pasted.front().time, pasted);
    KFCurve& curve = *channel.getCurveInterface();
    TimeSpan const arrival{keypoints.front().time, keypoints.back().time};
    for (std::size_t i = others.size(); i > 0; --i) {
        // In front of those that are there.
        curve.getSpline()->addVertexNoTangents(others[i - 1]->time, 0, kTempusZero, false);
    }
    std::vector<void*> const handles = unlockedWithin(curve, arrival);
    for (std::size_t i = 0; i < std::min(handles.size(), keypoints.size()); ++i) {
        write(curve, handles[i], keypoints[i]);
    }
}

} // namespace

std::vector<void*> keypointsWithin(KFCurve& curve, TimeSpan const& span) {
    std::vector<void*> handles = allKeypoints(curve);
    std::erase_if(handles, [&](void* handle) { return !span.holds(timeOf(curve, handle)); });
    return handles;
}

std::string faultOfTimes(KFCurve& before, KFCurve& after) {
    LostTimes const old = lostTimesOf(before);
    LostTimes const now = lostTimesOf(after);
    if (now.outside > old.outside) {
        return "no place in time";
    }
    return now.shared > old.shared ? "one time, between which there is none" : "";
}

void deleteDisabledAt(KFCurve& curve, Tempus const& time) {
    for (void* const handle : unlockedWithin(curve, {time, time})) {
        if (!readKeypoint(*curve.getSpline(), handle).enabled) {
            deleteKeypoint(curve, handle);
        }
    }
}

SampledStretch::SampledStretch(TimeSpan const& span, Tempus const& sampleStep)
    : start(span.from), step(sampleStep) {
    Tempus const steps = TempusMake(TempusFloorQuotient(span.to - span.from, step), 1);
    last = start + step * steps;
    end = last + step;
}

OutsideKept::OutsideKept(KFCurve& curve, TimeSpan const& span) : _curve(curve) {
    for (void* const handle : allKeypoints(curve)) {
        if (!isLocked(curve, handle) && !span.holds(timeOf(curve, handle))) {
            curve.lockKeypoint(handle, true, true);
            _locked.push_back(handle);
        }
    }
}

OutsideKept::~OutsideKept() {
    for (void* const handle : _locked) {
        _curve.lockKeypoint(handle, false, true);
    }
}

void makeLinesBezier(KFCurve& curve, TimeSpan const& span) {
    for (void* const handle : keypointsWithin(curve, span)) {
        std::uint32_t type = 0;
        void* next = nullptr;
        if (!curve.getKeypointInterpolation(handle, &type, nullptr) || type != kKFInterpolationLinear) {
            continue;
        }
        curve.setKeypointInterpolation(handle, kKFInterpolationBezier, true);
        curve.setKeypointOutputHandles(handle, 0, 0, true);
        if (curve.getNextValidKeypointHandle(handle, &next)) {
            curve.setKeypointInputHandles(next, 0, 0, true);
        }
    }
}

void editKeypointsWithin(KFChannel& channel, TimeSpan const& span,
                         std::function<void(KFCurve&)> const& edit) {
    KFCurve& curve = *channel.getCurveInterface();
    if (!curve.isCurveKeyframable()) {
        return;
    }
    std::vector<void*> const edited = unlockedWithin(curve, span);
    if (edited.size() == curve.getNumberOfKeypoints()) {
        edit(curve);
        return;
    }
    if (edited.empty()) {
        return;
    }
    std::unique_ptr<KFChannelBase> const copy(channel.clone());
    KFChannel& part = static_cast<KFChannel&>(*copy);
    keepUnlockedWithin(*part.getCurveInterface(), span);
    edit(*part.getCurveInterface());
    std::vector<GatheredKeypoint> gathered = gather(part);
    std::stable_sort(gathered.begin(), gathered.end(),
                     [](GatheredKeypoint const& a, GatheredKeypoint const& b) { return a.time < b.time; });
    deleteKeypoints(curve, span);
    deleteKeypoints(curve, {gathered.front().time, gathered.back().time});
    std::vector<Tempus> const taken = timesOfLocked(curve);
    std::erase_if(gathered, [&](GatheredKeypoint const& keypoint) {
        return std::binary_search(taken.begin(), taken.end(), keypoint.time);
    });
    if (!gathered.empty()) {
        paste(channel, gathered);
    }
}

} // namespace lumenkey::tools
