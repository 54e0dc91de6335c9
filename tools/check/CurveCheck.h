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

/// Those of a channel's class; none for what has no curve, and for null.
CurveLimits limitsOf(KFChannelBase* channel);

// What is at fault; empty where nothing is.

std::string faultOfNumber(std::string_view text, CurveLimits const& limits);
/// Of a keypoint with or without its parts.
std::string faultOfParts(bool hasTime, bool hasValue);
/// Of the attributes of a keypoint.
std::string faultOfInterpolation(Attributes const& attributes);
/// Of the time of a keypoint, in frames where `countsFrames`; `lastTime` is that of the one before it, and
/// becomes this one.
std::string faultOfOrder(std::string_view text, bool countsFrames, Tempus& lastTime);

} // namespace lumenkey::tools
