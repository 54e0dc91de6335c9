// Internal: not installed.
#pragma once

#include <cmath>

/// A cubic in power form, made from four Bezier control values.
struct KFCubic {
    double c0 = 0.0, c1 = 0.0, c2 = 0.0, c3 = 0.0;

    static KFCubic fromBezier(double const* p) noexcept {
        return {p[0], 3.0 * p[1] - 3.0 * p[0], 3.0 * p[0] - 6.0 * p[1] + 3.0 * p[2],
                p[3] + 3.0 * p[1] - p[0] - 3.0 * p[2]};
    }

    double operator()(double t) const noexcept { return ((c3 * t + c2) * t + c1) * t + c0; }
};

/// Inverts the U polygon of a segment: from the fraction of the segment to the parameter of its curve.
///
/// The answer is that of `KFBezierFindParameter` to within 1e-12, and a function of polygon and fraction alone: it
/// doesn't depend on an earlier answer, so that a row of samples, a single read and a read on another thread agree to
/// the last bit.
///
/// U(s) = c1 s + c2 s^2 + c3 s^3 runs from 0 to 1. How it is inverted depends on its least slope in 0..1:
///
/// - Handles at thirds: U(s) = s, nothing to solve.
/// - Slope at least `kSteep` or `kSteady`: starts from the cubic Hermite interpolant of the inverse function
///   through both ends with their slopes, plus the multiple of p^2 (1-p)^2 that makes it exact at s = 1/2; then two or
///   three steps of Halley's iteration (Halley 1694; Householder, "The Numerical Treatment of a Single Nonlinear
///   Equation", 1970), each of which cubes the error. Without a branch, so that a row of samples runs in vector units.
/// - Else, near a vertical tangent or a fold: `KFBezierFindParameter`.
class KFCubicInverse {
public:
    enum class Method { Identity, TwoSteps, ThreeSteps, Search };

    /// `polygonU` holds four values from 0 to 1.
    void prepare(double const* polygonU) noexcept {
        KFCubic const cubic = KFCubic::fromBezier(polygonU);
        _c1 = cubic.c1;
        _c2 = cubic.c2;
        _c3 = std::fabs(cubic.c3) < kNegligibleCubic ? 0.0 : cubic.c3;
        _twoC2 = 2.0 * _c2;
        _threeC3 = 3.0 * _c3;
        double const slopeAt1 = _c1 + _twoC2 + _threeC3;
        if (cubic.c0 == 0.0 && slopesReach(kSteady, slopeAt1)) [[likely]] {
            if (_c3 == 0.0 && std::fabs(_c2) <= kRoundings && std::fabs(_c1 - 1.0) <= kRoundings) {
                _method = Method::Identity;
                return;
            }
            _method = slopesReach(kSteep, slopeAt1) ? Method::TwoSteps : Method::ThreeSteps;
            _inverseSlopeAt0 = 1.0 / _c1;
            _inverseSlopeAt1 = 1.0 / slopeAt1;
            _bulge = 0.0;
            double const middle = (_c1 + (_c2 + 0.5 * _c3) * 0.5) * 0.5;
            double const weight = middle * (1.0 - middle);
            _bulge = (0.5 - start(middle)) / (weight * weight);
            return;
        }
        _method = Method::Search;
        for (int i = 0; i < 4; ++i)
            _polygon[i] = polygonU[i];
    }
    Method method() const noexcept { return _method; }

    /// `p` in 0 to 1; the result is clamped to that range.
    double operator()(double p) const noexcept {
        return _method == Method::Search ? search(p) : withoutSearch(p);
    }

    /// For the other methods than `Search`.
    double withoutSearch(double p) const noexcept {
        if (_method == Method::TwoSteps)
            return iterate<2>(p);
        return _method == Method::ThreeSteps ? iterate<3>(p) : p;
    }

    /// For the methods that iterate; `Steps` is theirs.
    template <int Steps> double iterate(double p) const noexcept {
        double s = start(p);
        for (int i = 0; i < Steps; ++i)
            s = halley(s, p);
        // Selections by value, not std::clamp by reference, which would keep the loop out of the vector units.
        s = s > 0.0 ? s : 0.0;
        return s < 1.0 ? s : 1.0;
    }

private:
    /// A leading coefficient below it counts as none, as in `KFBezierGetRoots`, whose answers these are.
    static constexpr double kNegligibleCubic = 1e-7;
    /// Handles that were derived stand at thirds but for a few roundings.
    static constexpr double kRoundings = 1e-14;
    /// Least slopes for which the start is near enough for two and for three steps to reach the last digit: measured
    /// over random polygons, the error of the parameter is below 1e-15 from these on.
    static constexpr double kSteep = 0.75;
    static constexpr double kSteady = 0.35;

    /// Whether U'(s) is at least `bound` all over 0..1: at both ends, and where it is least between them,
    /// c1 - c2^2 / (3 c3) at s = -c2 / (3 c3).
    bool slopesReach(double bound, double slopeAt1) const noexcept {
        bool const dips = _c2 < 0.0 && -_c2 < _threeC3;
        return _c1 >= bound && slopeAt1 >= bound && (!dips || (_c1 - bound) * _threeC3 >= _c2 * _c2);
    }

    double start(double p) const noexcept {
        double const q = 1.0 - p;
        double const pq = p * q;
        // p q^2 / U'(0) + p^2 (3 - 2p) - p^2 q / U'(1) + bulge p^2 q^2
        return pq * (q * _inverseSlopeAt0 - p * _inverseSlopeAt1 + _bulge * pq) + p * p * (3.0 - 2.0 * p);
    }

    double halley(double s, double p) const noexcept {
        double const square = s * s;
        double const f = (_c3 * s + _c2) * square + (_c1 * s - p);
        double const slope = _threeC3 * square + (_twoC2 * s + _c1);
        double const halfCurvature = _threeC3 * s + _c2;
        return s - f * slope / (slope * slope - f * halfCurvature);
    }

    double search(double p) const noexcept;

    double _c1 = 1.0, _c2 = 0.0, _c3 = 0.0;
    double _twoC2 = 0.0, _threeC3 = 0.0;
    double _inverseSlopeAt0 = 1.0, _inverseSlopeAt1 = 1.0, _bulge = 0.0;
    double _polygon[4] = {0.0, 1.0 / 3.0, 2.0 / 3.0, 1.0};
    Method _method = Method::Identity;
};
