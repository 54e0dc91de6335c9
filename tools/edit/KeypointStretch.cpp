#include "tools/edit/KeypointStretch.h"

#include "lumenkey/Channels/KFKeyframeInfo.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "tools/curve/Keypoint.h"

#include <algorithm>
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

/// But those that are locked.
void deleteKeypoints(KFCurve& curve, TimeSpan const& span) {
    for (void* const handle : keypointsWithin(curve, span)) {
        curve.delKeypoint(handle, true);
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
            curve.delKeypoint(handle, true);
        }
    }
}

/// All keypoints; the library's own gathering leaves out disabled ones at the ends.
std::vector<_KFKeyframeInfo> gather(KFChannel& channel) {
    std::vector<_KFKeyframeInfo> all;
    for (void* const handle : allKeypoints(*channel.getCurveInterface())) {
        _KFKeyframeInfo info;
        channel.getKeyframe(handle, &info.time, &info.value);
        channel.getKeyframeInputTangents(handle, &info.inputTangentX, &info.inputTangentY, true);
        channel.getKeyframeOutputTangents(handle, &info.outputTangentX, &info.outputTangentY, true);
        info.enabled = channel.getKeyframeEnabled(handle);
        info.bias = channel.getKeyframeBias(handle);
        info.flags = channel.getKeyframeFlags(handle);
        info.interpolation = channel.getKeyframeInterpolation(handle);
        info.normal = channel.getKeyframeNormal(handle);
        all.push_back(info);
    }
    return all;
}

} // namespace

std::vector<void*> keypointsWithin(KFCurve& curve, TimeSpan const& span) {
    std::vector<void*> handles = allKeypoints(curve);
    std::erase_if(handles, [&](void* handle) { return !span.holds(timeOf(curve, handle)); });
    return handles;
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
    std::vector<void*> edited = keypointsWithin(curve, span);
    std::erase_if(edited, [&](void* handle) { return isLocked(curve, handle); });
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
    std::vector<_KFKeyframeInfo> gathered = gather(part);
    deleteKeypoints(curve, span);
    deleteKeypoints(curve, {gathered.front().time, gathered.back().time});
    std::vector<Tempus> const taken = timesOfLocked(curve);
    std::erase_if(gathered, [&](_KFKeyframeInfo const& info) {
        return std::binary_search(taken.begin(), taken.end(), info.time);
    });
    if (gathered.empty()) {
        return;
    }
    channel.setKeyframesWithInfo(gathered.front().time, gathered);
}

} // namespace lumenkey::tools
