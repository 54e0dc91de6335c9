#include "lumenkey/splines/KFBasicInterpolators.h"

#include "lumenkey/splines/KFShapes.h"

#include <algorithm>
#include <cmath>

namespace {

double valueOf(void* handle, Tempus const& t) { return static_cast<KFVertex*>(handle)->getValueV(t); }

void sortInto(double first, double second, double* min, double* max) {
    *min = std::min(first, second);
    *max = std::max(first, second);
}

/// The two ends of a segment whose curve is asked for a value.
struct Inversion {
    KFSegmentSpan segment;
    double a, b;

    Inversion(KFSpline& spline, void* vA, void* vB)
        : segment(segmentSpan(spline, vA, vB)), a(valueOf(vA, kTempusZero)), b(valueOf(vB, kTempusZero)) {}

    /// True when the position at a fraction of the segment can be written as a time; it is appended then.
    bool append(double fraction, std::vector<Tempus>& out) const {
        Tempus const u = BX_TempusSaferAdd(segment.u1, segment.duration() * fraction);
        if (!TempusIsNumeric(u)) {
            return false;
        }
        out.push_back(u);
        return true;
    }
};

bool isWithinEnds(KFSpline& spline, Tempus const& lowU, Tempus const& highU, double value) {
    double const atLow = spline.getVertexValue(lowU, kTempusZero, false);
    double const atHigh = spline.getVertexValue(highU, kTempusZero, false);
    return value >= std::min(atLow, atHigh) && value <= std::max(atLow, atHigh);
}

/// The value of `shape` at `u`.
template <class Shape>
double draw(Shape shape, KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u) {
    KFSegmentSpan const segment = segmentSpan(spline, vA, vB);
    double const a = valueOf(vA, t);
    return segment.isEmpty() ? a : shape(segment.fraction(u), a, valueOf(vB, t));
}

/// Appends the position at which a segment has the value, by the inverse of its shape: a fraction from an
/// inversion whose ends differ.
template <class InverseShape>
bool invert(InverseShape inverseShape, KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
            Tempus const& highU, double value, std::vector<Tempus>& out) {
    if (!isWithinEnds(spline, lowU, highU, value)) {
        return false;
    }
    Inversion const ends(spline, vA, vB);
    if (ends.a == ends.b) {
        return value == ends.a && ends.append(0.0, out);
    }
    return ends.append(inverseShape(ends), out);
}

/// A sine or cosine that roundings alone took past the range; one that lies further out has no angle.
double withinRoundings(double sine) {
    constexpr double roundings = 1e-12;
    return std::fabs(sine) <= 1.0 + roundings ? std::clamp(sine, -1.0, 1.0) : sine;
}

double easedFraction(std::uint32_t easing, void* vA, KFSegmentSpan const& segment, Tempus const& u) {
    double const bias = static_cast<KFVertex*>(vA)->getBias(kTempusZero);
    return KFShape::easing(easing, bias).fraction(segment.fraction(u));
}

/// The value of the spline, read at the eased time of a vertex that was put into it.
void readFromSpline(KFInterpolator& interpolator, KFSpline& spline, Tempus const& t, void* vA, void* vB,
                    void* newVertex) {
    KFVertex& added = *static_cast<KFVertex*>(newVertex);
    Tempus const u = interpolator.easeTime(spline, added.getValueU(), vA, vB);
    added.setValueV(spline.getVertexValue(u, t, false), t);
}

} // namespace

// Constant

double KFConstantInterpolator::interpolate(KFSpline&, Tempus const& t, void* vA, void*, Tempus const&, bool,
                                           bool derivative) {
    return derivative ? 0.0 : valueOf(vA, t);
}

void KFConstantInterpolator::subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void*) {
    KFSegmentSpan const segment = segmentSpan(spline, vA, vB);
    Tempus const middle = BX_TempusSaferAdd(segment.u1, segment.duration() * 0.5);
    spline.addVertex(middle, interpolate(spline, t, vA, vB, middle, false, false), t, true);
}

bool KFConstantInterpolator::uForCurveValue(KFSpline& spline, void* vA, void*, Tempus const& lowU,
                                            Tempus const& highU, double value, std::vector<Tempus>& out) {
    if (!isWithinEnds(spline, lowU, highU, value) || value != valueOf(vA, kTempusZero)) {
        return false;
    }
    out.push_back(lowU);
    return true;
}

void KFConstantInterpolator::getMinMaxValues(KFSpline&, void* vA, void*, double, double, double* min,
                                             double* max) {
    *min = *max = valueOf(vA, kTempusZero);
}

// Linear, and linear in eased time

Tempus KFLinearInterpolator::easedTime(KFSpline& spline, Tempus const& u, void* vA, void* vB) const {
    KFSegmentSpan const segment = segmentSpan(spline, vA, vB);
    if (segment.isEmpty()) {
        return segment.u1;
    }
    return BX_TempusSaferAdd(segment.u1, segment.duration() * easedFraction(_easing, vA, segment, u));
}

double KFLinearInterpolator::interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                         Tempus const& u, bool, bool derivative) {
    KFSegmentSpan const segment = segmentSpan(spline, vA, vB);
    double const a = valueOf(vA, t);
    if (segment.isEmpty()) {
        return derivative ? 0.0 : a;
    }
    double const b = valueOf(vB, t);
    if (derivative) {
        return (b - a) / segment.seconds();
    }
    if (_easing != kKFInterpolationLinear) {
        double const q = easedFraction(_easing, vA, segment, u);
        return KFShape::linear(1.0 - q, q, a, b);
    }
    Tempus const e = easeTime(spline, u, vA, vB);
    return KFShape::linear(segment.complement(e), segment.fraction(e), a, b);
}

void KFLinearInterpolator::subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) {
    readFromSpline(*this, spline, t, vA, vB, newVertex);
}

bool KFLinearInterpolator::uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
                                          Tempus const& highU, double value, std::vector<Tempus>& out) {
    auto const inverse = [value](Inversion const& ends) {
        double const rise = ends.b - ends.a;
        return (value - ends.a) / (std::fabs(rise) >= 1e-7 ? rise : 0.001);
    };
    return invert(inverse, spline, vA, vB, lowU, highU, value, out);
}

void KFLinearInterpolator::getMinMaxValues(KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
                                           Tempus const& highU, double* min, double* max) {
    KFSegmentSpan const segment = segmentSpan(spline, vA, vB);
    auto const valueAt = [&](Tempus const& u) {
        if (u <= segment.u1) {
            return valueOf(vA, kTempusZero);
        }
        return u >= segment.u2 ? valueOf(vB, kTempusZero)
                               : interpolate(spline, kTempusZero, vA, vB, u, false, false);
    };
    sortInto(valueAt(lowU), valueAt(highU), min, max);
}

Tempus KFEaseInterpolator::easeTime(KFSpline& spline, Tempus const& u, void* vA, void* vB) {
    return easedTime(spline, u, vA, vB);
}

Tempus KFAccelerateInterpolator::easeTime(KFSpline& spline, Tempus const& u, void* vA, void* vB) {
    return easedTime(spline, u, vA, vB);
}

Tempus KFDecelerateInterpolator::easeTime(KFSpline& spline, Tempus const& u, void* vA, void* vB) {
    return easedTime(spline, u, vA, vB);
}

// Monotonic shapes

void KFMonotonicInterpolator::subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                        void* newVertex) {
    KFVertex& added = *static_cast<KFVertex*>(newVertex);
    added.setValueV(interpolate(spline, t, vA, vB, added.getValueU(), false, false), t);
}

void KFMonotonicInterpolator::getMinMaxValues(KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
                                              Tempus const& highU, double* min, double* max) {
    KFSegmentSpan const segment = segmentSpan(spline, vA, vB);
    auto const valueAt = [&](Tempus const& u) {
        return interpolate(spline, kTempusZero, vA, vB, u, false, false);
    };
    sortInto(valueAt(TempusMaximum(lowU, segment.u1)), valueAt(TempusMinimum(highU, segment.u2)), min, max);
}

double KFEaseInInterpolator::interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                         Tempus const& u, bool, bool) {
    return draw(KFShape::easeIn, spline, t, vA, vB, u);
}

bool KFEaseInInterpolator::uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
                                          Tempus const& highU, double value, std::vector<Tempus>& out) {
    auto const inverse = [value](Inversion const& ends) {
        double const cosine = (ends.a - value) / (ends.b - ends.a) + 1.0;
        return 2.0 * std::acos(withinRoundings(cosine)) / KFShape::kPi;
    };
    return invert(inverse, spline, vA, vB, lowU, highU, value, out);
}

double KFEaseOutInterpolator::interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                          Tempus const& u, bool, bool) {
    return draw(KFShape::easeOut, spline, t, vA, vB, u);
}

bool KFEaseOutInterpolator::uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
                                           Tempus const& highU, double value, std::vector<Tempus>& out) {
    auto const inverse = [value](Inversion const& ends) {
        double const sine = (value - ends.a) / (ends.b - ends.a);
        return 2.0 * std::asin(withinRoundings(sine)) / KFShape::kPi;
    };
    return invert(inverse, spline, vA, vB, lowU, highU, value, out);
}

double KFExponentialInterpolator::interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                              Tempus const& u, bool, bool) {
    return draw(KFShape::exponential, spline, t, vA, vB, u);
}

bool KFExponentialInterpolator::uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
                                               Tempus const& highU, double value, std::vector<Tempus>& out) {
    auto const inverse = [value](Inversion const& ends) {
        if (value == ends.a) {
            return 0.0;
        }
        double const d = ends.b - ends.a;
        double const growth = std::log(std::fabs(d)) + KFShape::kExponentialRange;
        double const end = std::exp(growth - KFShape::kExponentialRange);
        double const grown = (value - ends.a) * (end - KFShape::kExponentialStart) / d;
        return (std::log(grown) + KFShape::kExponentialRange) / growth;
    };
    return !segmentSpan(spline, vA, vB).isEmpty() && invert(inverse, spline, vA, vB, lowU, highU, value, out);
}

double KFLogarithmicInterpolator::interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                              Tempus const& u, bool, bool) {
    return draw(KFShape::logarithmic, spline, t, vA, vB, u);
}

bool KFLogarithmicInterpolator::uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
                                               Tempus const& highU, double value, std::vector<Tempus>& out) {
    auto const inverse = [value](Inversion const& ends) {
        double const scale = (ends.b - ends.a) / KFShape::kLogarithmicRange;
        return (std::exp((value - ends.a) / scale) - 1.0) / 999.0;
    };
    return invert(inverse, spline, vA, vB, lowU, highU, value, out);
}

// Trigonometric shapes of single precision

void KFTrigonometricInterpolator::subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                            void* newVertex) {
    readFromSpline(*this, spline, t, vA, vB, newVertex);
}

double KFSCurveInterpolator::interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                         Tempus const& u, bool, bool) {
    return draw(KFShape::sCurve, spline, t, vA, vB, easeTime(spline, u, vA, vB));
}

double KFConvexInterpolator::interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                         Tempus const& u, bool, bool) {
    return draw(KFShape::convex, spline, t, vA, vB, easeTime(spline, u, vA, vB));
}

double KFConcaveInterpolator::interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                          Tempus const& u, bool, bool) {
    return draw(KFShape::concave, spline, t, vA, vB, easeTime(spline, u, vA, vB));
}
