// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXMath.h"
#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFVertex.h"

#include <cmath>
#include <cstdint>

/// Where a segment lies. The end is never before the start.
struct KFSegmentSpan {
    Tempus u1, u2;

    Tempus duration() const noexcept { return BX_TempusSaferSubtract(u2, u1); }
    /// No fraction may be asked of an empty segment.
    bool isEmpty() const noexcept { return TempusCompare(u1, u2) == 0; }
    double seconds() const noexcept { return TempusSecondsBetween(u1, u2); }
    /// The fraction of the segment that lies before `u`, and the one that lies behind it. Each is rounded by
    /// itself, once, so that the two are exact at both ends and a quotient of whole steps has the same bits.
    double fraction(Tempus const& u) const noexcept { return TempusFraction(u, u1, u2); }
    double complement(Tempus const& u) const noexcept { return TempusFraction(u, u2, u1); }
    /// The fraction of a cubic segment, for one shorter than `KFShape::kShortestCurve` too.
    double curveFraction(Tempus const& u) const noexcept;
};

/// The segment between two vertices; one that closes a spline, whose end stands before its start, is short.
inline KFSegmentSpan segmentSpan(KFSpline& spline, void* vA, void* vB) {
    Tempus const u1 = static_cast<KFVertex*>(vA)->getValueU();
    Tempus const u2 = static_cast<KFVertex*>(vB)->getValueU();
    return {u1, TempusCompare(u1, u2) > 0 ? BX_TempusSaferAdd(u1, spline.getSmallDeltaU()) : u2};
}

/// The shapes of segments, each a pure function of the fraction `p` of the segment and of the values a and b
/// at its ends. The strategies and the evaluator of a spline both draw with them, and so agree to the last
/// bit.
///
/// A segment of no length has the value a and the slope 0; that is for the caller to see to.
namespace KFShape {

inline constexpr double kPi = 3.141592653589793;
inline constexpr double kHalfPi = 1.5707963267948966;
/// Exponential grows over this many e-foldings, four decades ...
inline constexpr double kExponentialRange = 9.210340371976182; // ln 10000
/// ... from this fraction of its end.
inline constexpr double kExponentialStart = 0.00010000000000000009; // exp(-kExponentialRange)
/// Logarithmic goes through three decades.
inline constexpr double kLogarithmicRange = 6.907755278982137; // ln 1000
/// Bezier segments below this duration, in seconds, are read as if they had it: 1e-5 in single precision.
inline constexpr double kShortestCurve = 9.999999747378752e-06;

inline double linear(double complement, double p, double a, double b) noexcept {
    return complement * a + p * b;
}

/// How a segment of a type that eases in time moves, given the bias of its first vertex. Other types move
/// evenly.
inline BXMath::EaseInOut easing(std::uint32_t type, double bias) noexcept {
    double const ramp = 2.0 - bias;
    switch (type) {
    case kKFInterpolationEase:
        return {ramp * 0.25, ramp * 0.25};
    case kKFInterpolationAccelerate:
        return {ramp * 0.5, 0.0};
    case kKFInterpolationDecelerate:
        return {0.0, ramp * 0.5};
    default:
        return {};
    }
}

inline double eased(BXMath::EaseInOut const& easing, double p, double a, double b) noexcept {
    double const q = easing.fraction(p);
    return linear(1.0 - q, q, a, b);
}

inline double easeIn(double p, double a, double b) noexcept {
    return a + (b - a) * (1.0 - std::cos(kPi * p * 0.5));
}

inline double easeOut(double p, double a, double b) noexcept { return a + (b - a) * std::sin(kPi * p * 0.5); }

/// With L = ln|b - a| and K the range, a + (b - a) (exp((L + K) p - K) - exp(-K)) / (exp(L) - exp(-K)). With
/// exp(-K) taken out, the quotient is that of exp(g p) - 1 and exp(g) - 1 for g = L + K: nothing cancels
/// where g or p is small, and where g is large exp(g (p - 1)) is taken out too, so that nothing overflows.
inline double exponential(double p, double a, double b) noexcept {
    double const d = b - a;
    if (d == 0.0) {
        return a;
    }
    double const growth = std::log(std::fabs(d)) + kExponentialRange;
    if (growth == 0.0) {
        return a + d * p;
    }
    if (growth < 0.0) {
        return a + d * (std::expm1(growth * p) / std::expm1(growth));
    }
    if (p < 0.0) {
        // Before the segment, where a closed spline is read: neither factor of the form below would stay finite.
        return a + d * (std::expm1(growth * p) * std::exp(-growth) / -std::expm1(-growth));
    }
    return a + d * (std::exp(growth * (p - 1.0)) * (std::expm1(-growth * p) / std::expm1(-growth)));
}

inline double logarithmic(double p, double a, double b) noexcept {
    // Before the segment, where a closed spline is read, the logarithm has an end; the curve stays at a there.
    return p < 0.0 ? a : a + ((b - a) / kLogarithmicRange) * std::log(p * 999.0 + 1.0);
}

// The three below are drawn with sines and cosines of single precision, which is part of their result: only
// the angle and what is made of the sine or cosine have double precision.

inline double sCurve(double p, double a, double b) noexcept {
    double const c = std::cos(static_cast<float>(p * kPi));
    double const s = (1.0 - c) * 0.5;
    return b * s + a * (1.0 - s);
}

inline double convex(double p, double a, double b) noexcept {
    float const x = static_cast<float>(p * kHalfPi);
    if (a >= b) {
        double const c = std::cos(x);
        return a * c + b * (1.0 - c);
    }
    double const s = std::sin(x);
    return a * (1.0 - s) + b * s;
}

inline double concave(double p, double a, double b) noexcept {
    float const x = static_cast<float>(p * kHalfPi);
    if (a >= b) {
        double const s = std::sin(x);
        return a * (1.0 - s) + b * (1.0 - (1.0 - s));
    }
    double const c = std::cos(x);
    return a * (1.0 - (1.0 - c)) + b * (1.0 - c);
}

} // namespace KFShape

inline double KFSegmentSpan::curveFraction(Tempus const& u) const noexcept {
    return seconds() > KFShape::kShortestCurve ? fraction(u)
                                               : TempusSecondsBetween(u1, u) / KFShape::kShortestCurve;
}
