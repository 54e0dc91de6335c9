// Two slower truths about the value of a curve: the rules of evaluation as a plain walk over the vertices, and cubic
// segments by de Casteljau's construction and bisection. Neither searches, caches, or knows of an index.
#pragma once

#include "tests/splines/museum.h"

/// Walks all vertices from the first one; draws with the strategies and the extrapolation of the spline.
double walkedValue(KFSpline& spline, Tempus const& u);
double walkedSlope(KFSpline& spline, Tempus const& u);

inline bool isWholeCurveType(std::uint32_t type) { return type == 10 || type == 12; }
/// Every number without a shape of its own draws as Bezier.
bool isCubicType(std::uint32_t type);

/// b - a, from whole numbers.
long double distanceInSeconds(Tempus const& a, Tempus const& b);

/// A segment of any other type that draws segments, in long double, at a fraction of it; how far the value
/// may be off.
long double longShape(KFVertex const& a, KFVertex const& b, long double fraction);
double longShapeTolerance(KFVertex const& a, KFVertex const& b);

/// Neighbours of the valid vertices, the second strictly after the first.
struct Segment {
    KFVertex* a;
    KFVertex* b;
};
std::vector<Segment> segmentsOf(KFSpline& spline);

/// The value of a cubic with these control values.
long double casteljau(double const* controls, long double t);

/// A cubic segment from the tangents of its ends, or of its neighbours, in long double. Not for one that may fold back
/// in time.
class LongCubic {
public:
    LongCubic(KFSpline& spline, Segment const& segment);

    /// The lowest and highest value that the curve may have at `u`, which lies inside the segment. They differ by the
    /// rounding of U and V: where U hardly moves with the parameter, a rounding of U is a stretch of the curve, and
    /// any value on it is right.
    struct Bounds {
        double low, high;
    };
    Bounds at(Tempus const& u) const;

private:
    long double parameterAt(long double fraction) const;
    long double curveU(long double t) const;

    bool _parametric;
    Tempus _start;
    long double _span;
    double _u[4];
    double _v[4];
};
