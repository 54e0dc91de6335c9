#pragma once

#include "lumenkey/Channels/KFChannelBase.h"
#include "tools/check/DocumentScanner.h"

#include <limits>
#include <string>
#include <string_view>

namespace lumenkey::tools {

/// Between which the values of a curve lie.
struct CurveLimits {
    double low = std::numeric_limits<double>::lowest();
    double high = std::numeric_limits<double>::max();
};

/// What a class of channels has as its curve.
struct CurveClass {
    CurveLimits limits;
    /// Whether documents hold limits of it at all.
    bool hasWrittenLimits = true;
    /// Whether keypoints of every type have handles.
    bool derivesTangents = true;
};

/// That of a channel's class; without limits for what has no curve, and for null.
CurveClass curveClassOf(KFChannelBase* channel);

// What is at fault; empty where nothing is.

std::string faultOfNumber(std::string_view text, CurveLimits const& limits);
/// Of a limit, `min` or `max`: documents leave out some of which the class has others.
std::string faultOfLimit(std::string_view name, double limit, CurveClass const& curve);
/// Of the attributes of a keypoint.
std::string faultOfInterpolation(Attributes const& attributes);
/// Of the time of a keypoint, in frames where `countsFrames`; `lastTime` is that of the one before it, and
/// becomes this one.
std::string faultOfOrder(std::string_view text, bool countsFrames, Tempus& lastTime);

} // namespace lumenkey::tools
