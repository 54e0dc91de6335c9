#pragma once

#include "lumenkey/splines/KFInterpolator.h"

#include <cstdint>

/// The types that need no tangents. Below, a and b are the values of vA and vB and p is the fraction of the
/// segment that lies before u, computed from exact times and rounded once.
///
/// A segment of no length has the value a and the slope 0.
///
/// `uForCurveValue` reads values at time zero and gives false for a value that doesn't lie between those of
/// the spline at `lowU` and `highU`. Where a and b are the same the position is that of vA; a position that
/// no number expresses isn't given.
///
/// `getMinMaxValues` gives the lowest and highest value that a segment takes between two positions; both
/// targets aren't null, and values are read at time zero.

/// Holds a; its slope is 0.
class LUMENKEY_API KFConstantInterpolator : public KFInterpolator {
public:
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
    /// Adds a vertex of its own in the middle of the segment, whatever the place of `newVertex`. It locks the
    /// spline.
    void subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) override;
    /// `lowU`, when the segment holds exactly that value.
    bool uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                        double value, std::vector<Tempus>& out) override;
    void getMinMaxValues(KFSpline& spline, void* vA, void* vB, double lowU, double highU, double* min,
                         double* max);
};

/// (1 - p) a + p b, each fraction rounded by itself, so that both ends come out exactly; the slope is
/// constant.
class LUMENKEY_API KFLinearInterpolator : public KFInterpolator {
public:
    KFLinearInterpolator() noexcept = default;

    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
    void subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) override;
    /// The easing of the types that ease in time isn't undone.
    bool uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                        double value, std::vector<Tempus>& out) override;
    void getMinMaxValues(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                         double* min, double* max);

protected:
    /// For a type that eases in time. Its values are computed from the eased fraction itself and not from the
    /// time that `easeTime` makes of it, so that they don't depend on how finely that time can be written.
    explicit KFLinearInterpolator(std::uint32_t easing) noexcept : _easing(easing) {}
    /// What `easeTime` of such a type answers; the ramps follow the bias of vA at time zero.
    Tempus easedTime(KFSpline& spline, Tempus const& u, void* vA, void* vB) const;

private:
    std::uint32_t _easing = kKFInterpolationLinear;
};

/// Linear in eased time: a ramp at both ends, each (2 - bias) / 4 of the segment, with the bias of vA.
class LUMENKEY_API KFEaseInterpolator : public KFLinearInterpolator {
public:
    KFEaseInterpolator() noexcept : KFLinearInterpolator(kKFInterpolationEase) {}

    Tempus easeTime(KFSpline& spline, Tempus const& u, void* vA, void* vB) override;
};

/// Linear in eased time: a ramp at the start, (2 - bias) / 2 of the segment.
class LUMENKEY_API KFAccelerateInterpolator : public KFLinearInterpolator {
public:
    KFAccelerateInterpolator() noexcept : KFLinearInterpolator(kKFInterpolationAccelerate) {}

    Tempus easeTime(KFSpline& spline, Tempus const& u, void* vA, void* vB) override;
};

/// Linear in eased time: a ramp at the end, (2 - bias) / 2 of the segment.
class LUMENKEY_API KFDecelerateInterpolator : public KFLinearInterpolator {
public:
    KFDecelerateInterpolator() noexcept : KFLinearInterpolator(kKFInterpolationDecelerate) {}

    Tempus easeTime(KFSpline& spline, Tempus const& u, void* vA, void* vB) override;
};

/// What EaseIn, EaseOut, Exponential and Logarithmic share: monotonic shapes whose ends are their extremes.
class LUMENKEY_API KFMonotonicInterpolator : public KFInterpolator {
public:
    void subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) override;
    void getMinMaxValues(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                         double* min, double* max);
};

/// a + (b - a) (1 - cos(pi p / 2)).
class LUMENKEY_API KFEaseInInterpolator : public KFMonotonicInterpolator {
public:
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
    bool uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                        double value, std::vector<Tempus>& out) override;
};

/// a + (b - a) sin(pi p / 2).
class LUMENKEY_API KFEaseOutInterpolator : public KFMonotonicInterpolator {
public:
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
    bool uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                        double value, std::vector<Tempus>& out) override;
};

/// Exponential growth over four decades from a, scaled to reach b. `uForCurveValue` leaves the start of the
/// growth, a ten-thousandth, out of account: near a its positions come too early.
class LUMENKEY_API KFExponentialInterpolator : public KFMonotonicInterpolator {
public:
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
    bool uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                        double value, std::vector<Tempus>& out) override;
};

/// a + (b - a) log(999 p + 1) / log(1000).
class LUMENKEY_API KFLogarithmicInterpolator : public KFMonotonicInterpolator {
public:
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
    bool uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                        double value, std::vector<Tempus>& out) override;
};

/// What SCurve, Convex and Concave share. They know no position of a value.
class LUMENKEY_API KFTrigonometricInterpolator : public KFInterpolator {
public:
    void subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) override;
};

/// Half a cosine wave from a to b; the cosine is of single precision, and that is part of the result.
class LUMENKEY_API KFSCurveInterpolator : public KFTrigonometricInterpolator {
public:
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
};

/// A quarter wave that bulges upwards, of single precision.
class LUMENKEY_API KFConvexInterpolator : public KFTrigonometricInterpolator {
public:
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
};

/// A quarter wave that bulges downwards, of single precision.
class LUMENKEY_API KFConcaveInterpolator : public KFTrigonometricInterpolator {
public:
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
};
