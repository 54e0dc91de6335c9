// Internal: not installed.
#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFBasicInterpolators.h"
#include "lumenkey/splines/KFSplineInterpolator.h"

#include <limits>

class KFSpline;

/// The lowest and the highest of some values. What is not a number is none.
struct KFValueExtremes {
    double lowest = std::numeric_limits<double>::max();
    double highest = -std::numeric_limits<double>::max();

    void include(double low, double high) noexcept {
        if (low < lowest)
            lowest = low;
        if (high > highest)
            highest = high;
    }
};

/// The extremes of the segment between two vertices from `lowU` to `highU`, by what its interpolator knows of
/// them.
template <class Interpolator>
KFValueExtremes KFExtremesOfSegment(KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
                                    Tempus const& highU) {
    KFValueExtremes extremes;
    Interpolator().getMinMaxValues(spline, vA, vB, lowU, highU, &extremes.lowest, &extremes.highest);
    return extremes;
}

/// Includes the values of the spline at all its vertices from `from` to `to`, and those of the whole segments
/// between them, to the bit as they are found by `getVertexValue` and by `KFExtremesOfSegment` segment by
/// segment. False where the vertices must be looked at one by one, as those of a foreign class; some of the
/// values may be included then.
///
/// Under one lock, which it takes. Most segments cost a look at their ends: a curve lies within its control
/// values, and where these lie within the extremes found so far there is nothing to solve.
bool KFIncludeWholeSegments(KFSpline& spline, Tempus const& from, Tempus const& to,
                            KFValueExtremes& extremes);
