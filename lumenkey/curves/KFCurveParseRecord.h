// Internal: not installed.
#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFInterpolation.h"

/// The keypoint that a curve is reading from a document.
struct KFCurveParseRecord {
    /// Null until its value has been read.
    void* handle = nullptr;
    std::uint32_t interpolation = kKFInterpolationBezier;
    bool enabled = true;
    std::uint32_t flags = 0;
    Tempus time = kTempusZero;
    /// Tangents: time and value.
    double in[2] = {};
    double out[2] = {};
};
