#pragma once

#include "lumenkey/splines/KFControlVertices.h"
#include "lumenkey/splines/KFInterpolator.h"

#include <cstdint>
#include <vector>

/// A rational B-spline of order up to 4 whose weighted control points are the spline's vertices (Piegl and
/// Tiller, "The NURBS Book", 1997, chapters 2 and 4). One function covers the whole spline. Meant for
/// parametric splines: on any other the value is 0.
///
/// A bias of 1 is weight 1, a bias of 0 weight 25, a bias of 2 weight 0.1.
///
/// An open spline has the order of its number of vertices, up to 4, and U runs from 0 to the number of knots
/// less 1. On a closed spline the first three control points return behind the last one, knots are the whole
/// numbers, and U runs from the order less 1 to the number of control points. Outside, the value falls to 0.
///
/// The slope is a difference over 1/1000 around the position, one-sided at the ends of that range. Evaluation
/// costs O(log n), and O(n) once after a change of the spline's vertices.
class LUMENKEY_API KFBSplineInterpolator : public KFInterpolator {
public:
    void init(KFSpline& spline, Tempus const& t) override;
    double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                       bool parametric, bool derivative) override;
    void subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) override;
    bool useKeypoints() override;
    Tempus getAdjustedMaxU(KFSpline& spline, Tempus const& t, Tempus const& u) override;
    Tempus getAdjustedMinU(KFSpline& spline, Tempus const& t, Tempus const& u) override;
    bool needInit(KFSpline& spline) override;

    /// The same knots, the same values and weights of all control points, and the same basis at the position evaluated
    /// last, exactly. Values and weights are those that the last evaluation knew: a vertex that was written past its
    /// spline counts with what it had when the vertices were listed or when it last weighed in an evaluation.
    bool operator==(KFBSplineInterpolator const& other) const;

    /// The bias that gives a weight.
    static double convertBSplineBiasToLinear(double weight) noexcept;

private:
    void generateKnotVector(std::uint32_t vertexCount, bool closed);
    void generatePeriodicKnotVector(std::uint32_t count);
    void generateOpenKnotVector(std::uint32_t count);
    void fillTempArrays(std::vector<KFVertex*> const& vertices, Tempus const& t, std::uint32_t first,
                        std::uint32_t count);
    void generateRationalBasisFunctions(double x);
    double basisOf(std::uint32_t controlPoint) const noexcept;
    double evalBSplineNURB(std::vector<KFVertex*> const& vertices, Tempus const& t, double x);
    double valueAt(KFSpline& spline, Tempus const& t, Tempus const& u);

    KFControlVertices _controlVertices;
    std::uint32_t _vertexCount = 0;
    bool _closed = false;

    /// One entry for each control point. All are read when the vertices are listed, which takes as long anyway, and
    /// those that weigh at each evaluation.
    std::vector<double> _values;
    std::vector<double> _weights;
    std::vector<double> _knots;
    /// Of the last position evaluated: the share of each control point that weighs there, at most `_order` from this
    /// first one on.
    std::vector<double> _basis;
    std::uint32_t _firstControlPoint = 0;
    std::uint32_t _controlPointCount = 0;
    std::uint32_t _order = 4;
};
