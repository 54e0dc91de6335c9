#pragma once

#include "lumenkey/Channels/KFChannel.h"

#include <utility>
#include <vector>

// What the tests read of a channel's keypoints. The times are curve times.

using Handle = std::pair<double, double>;

/// The time and value of a handle, or of a normalized tangent.
inline Handle input(KFChannel const& c, void* h, bool handles) {
    Handle p;
    c.getKeyframeInputTangents(h, &p.first, &p.second, handles);
    return p;
}

inline Handle output(KFChannel const& c, void* h, bool handles) {
    Handle p;
    c.getKeyframeOutputTangents(h, &p.first, &p.second, handles);
    return p;
}

inline std::vector<std::pair<Tempus, double>> keypointsOf(KFChannel const& c) {
    std::vector<std::pair<Tempus, double>> all;
    for (void* const h : c.getKeyframes(false)) {
        auto& [time, value] = all.emplace_back();
        c.getKeyframe(h, &time, &value);
    }
    return all;
}

inline std::vector<Tempus> timesOf(KFChannel const& c, Tempus const& later = kTempusZero) {
    std::vector<Tempus> times;
    for (auto const& keypoint : keypointsOf(c))
        times.push_back(keypoint.first + later);
    return times;
}
