// Segments of a curve: vertices around a stretch, the value of the segment at a time, and the continuation of the curve
// written out as keypoints.

#include "lumenkey/curves/KFCurve.h"

#include "lumenkey/splines/KFSpline.h"

bool KFCurve::createCurveSegment(Tempus const& a, Tempus const& b, Tempus const& c, bool eased, bool force) {
    return isSpline() && canModifyCurve(force) && splineForNewKeypoints()->createSegment(a, b, c, eased);
}

bool KFCurve::setCurveSegmentValue(Tempus const& t, double value, bool force) {
    if (canModifyCurve(force))
        offsetRoot(t, clamped(value), _minValue, _maxValue, true, false);
    return true;
}

bool KFCurve::setCurveSegmentValueBounded(Tempus const& t, double value, double low, double high,
                                          bool force) {
    if (!canModifyCurve(force))
        return true;
    double const bounded = value > high ? high : value < low ? low : value;
    offsetRoot(t, isSpline() ? bounded : clamped(value), low, high, true, true);
    return true;
}

std::uint32_t KFCurve::generateKeypoints(std::uint32_t side, std::uint32_t cycles, bool force) {
    KFSpline* const spline = modifiableSpline(force);
    if (spline == nullptr || spline->getNumberOfVertices() * std::uint64_t{cycles} > kMostGeneratedKeypoints)
        return 0;
    return spline->generateExtrapolatedVertices(side, cycles, kTempusZero) ? 1 : 0;
}
