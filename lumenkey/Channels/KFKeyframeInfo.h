#pragma once

#include "lumenkey/foundation/Tempus.h"

#include <cstdint>

/// All that there is to one keypoint, apart from its curve: what is gathered from one channel and pasted to another.
/// Tangents are the handles of the curve; times are those of whoever gathered it.
// NOLINTNEXTLINE(bugprone-reserved-identifier): hosts know it by this name.
struct _KFKeyframeInfo {
    Tempus time;
    double value = 0.0;
    bool enabled = true;
    double bias = 0.0;
    double inputTangentX = 0.0;
    double outputTangentX = 0.0;
    double inputTangentY = 0.0;
    double outputTangentY = 0.0;
    std::uint32_t flags = 0;
    std::uint32_t interpolation = 0;
    double normal = 0.0;
};
