#pragma once

#include "lumenkey/splines/KFInterpolator.h"

/// The cubic family: a segment is a Bezier curve in the plane of U and V, and U is inverted to find the
/// curve's parameter. This base converts handles: a handle is 12 times its tangent, or a third of it on a
/// parametric spline.
class LUMENKEY_API KFSplineInterpolator : public KFInterpolator {
public:
    /// 0.
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
    void subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) override;
    void convertHandlesToTangents(KFSpline& spline, double* u, double* v) override;
    void convertTangentsToHandles(KFSpline& spline, double* u, double* v) override;
    bool useTangents() override;

    /// The value of the cubic with these four control values at a parameter; 0 here.
    virtual double eval(double* polygon, double param);
    /// The value of a segment at a known parameter.
    virtual double eval(KFSpline& spline, Tempus const& t, void* vA, void* vB, double param) = 0;
};

/// Bezier segments from the stored tangents.
class LUMENKEY_API KFBezierInterpolator : public KFSplineInterpolator {
public:
    KFBezierInterpolator() noexcept = default;

    /// The slope, when asked for, is a difference over 1/1000 s of the whole spline around `u`, one-sided at
    /// its ends.
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
    /// Splits the curve at the fraction of the segment at which `newVertex` stands, read as the parameter,
    /// and shortens the facing tangents of vA and vB, locked or not.
    void subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) override;
    bool uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                        double value, std::vector<Tempus>& out) override;
    double eval(double* polygon, double param) override;
    double eval(KFSpline& spline, Tempus const& t, void* vA, void* vB, double param) override;

    /// The tangents that leave vA and enter vB, already as handles before `handleScale`. No target is null.
    virtual void computeTangents(KFSpline& spline, void* vA, void* vB, Tempus const& t, double* outU,
                                 double* outV, double* inU, double* inV);

    /// The control polygon of a segment: U as fractions of the segment from 0 to 1, V as values, four each.
    void getControlPoints(KFSpline& spline, void* vA, void* vB, Tempus const& t, Tempus& startU, Tempus& endU,
                          double* polygonU, double* polygonV);

    /// The lowest and highest value of the segment between two positions, its extremes inside included.
    void getMinMaxValues(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                         double* min, double* max);

protected:
    explicit KFBezierInterpolator(double handleScale) noexcept : _handleScale(handleScale) {}
    double handleScale() const noexcept { return _handleScale; }

private:
    double _handleScale = 1.0;
};

/// Hermite segments: the stored tangents are derivatives, a third of which makes a handle. A base; no type
/// stands for it.
class LUMENKEY_API KFHermiteInterpolator : public KFBezierInterpolator {
public:
    KFHermiteInterpolator() noexcept;
};

/// A cardinal spline: tangents from the neighbours, shortened by the tension. A base; no type stands for it.
class LUMENKEY_API KFCardinalInterpolator : public KFHermiteInterpolator {
public:
    explicit KFCardinalInterpolator(double tension) noexcept : _tension(tension) {}

    void convertHandlesToTangents(KFSpline& spline, double* u, double* v) override;
    void convertTangentsToHandles(KFSpline& spline, double* u, double* v) override;
    bool useTangents() override;
    void computeTangents(KFSpline& spline, void* vA, void* vB, Tempus const& t, double* outU, double* outV,
                         double* inU, double* inV) override;

private:
    double _tension;
};

/// The cardinal spline of tension 0 (Catmull and Rom, "A class of local interpolating splines", 1974).
class LUMENKEY_API KFCatmullRomInterpolator : public KFCardinalInterpolator {
public:
    KFCatmullRomInterpolator() noexcept : KFCardinalInterpolator(0.0) {}
};
