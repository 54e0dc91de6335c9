#pragma once

#include "lumenkey/splines/KFControlVertices.h"
#include "lumenkey/splines/KFInterpolator.h"

#include <cstdint>

/// An X-spline whose control points are the spline's vertices and whose shape parameters are their biases
/// (Blanc and Schlick, "X-splines: a spline model designed for the end-user", SIGGRAPH 1995). One function
/// covers the whole spline. Meant for parametric splines: on any other the value is 0.
///
/// U counts control points, from 0. An open spline has one more than it has vertices, since its last vertex
/// counts twice; the shape at its two ends is 1. Where no control point weighs, which is outside, the value
/// is 0.
///
/// The slope is a difference over 1/1000 around the position, one-sided at the ends of the spline. Evaluation
/// costs O(1), and O(n) once after a change of the spline's vertices.
class LUMENKEY_API KFXSplineInterpolator : public KFInterpolator {
public:
    void init(KFSpline& spline, Tempus const& t) override;
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
    void subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) override;
    bool useKeypoints() override;
    Tempus getAdjustedMaxU(KFSpline& spline, Tempus const& t, Tempus const& u) override;
    Tempus getAdjustedMinU(KFSpline& spline, Tempus const& t, Tempus const& u) override;
    bool needInit(KFSpline& spline) override;

    /// As many control points.
    bool operator==(KFXSplineInterpolator const& other) const noexcept;

private:
    double evalXSpline(KFSpline& spline, double x, Tempus const& t);

    KFControlVertices _controlVertices;
    std::uint32_t _controlPointCount = 0;
};
