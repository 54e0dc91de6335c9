#include "lumenkey/splines/KFSplineInterpolator.h"

#include "lumenkey/foundation/BXAlgorithm.h"
#include "lumenkey/foundation/BXMath.h"
#include "lumenkey/splines/KFBezierUtil.h"
#include "lumenkey/splines/KFCubic.h"
#include "lumenkey/splines/KFShapes.h"
#include "lumenkey/splines/KFTangent.h"
#include "lumenkey/splines/KFWholeCurve.h"

#include <algorithm>

namespace {

constexpr double kThird = 0.3333333333333333;
/// How far, as a parameter or a fraction of the segment, a position may miss an end and still count as there.
constexpr double kEndTolerance = 1e-7;

KFVertex& vertexOf(void* handle) { return *static_cast<KFVertex*>(handle); }

bool isParametric(KFSpline& spline) { return spline.getState()->parametric; }

double handleFactor(KFSpline& spline) { return isParametric(spline) ? kThird : kKFHandlesPerTangent; }

/// What `getControlPoints` of a strategy says of a segment.
struct ControlPolygon {
    KFSegmentSpan segment;
    double u[4];
    double v[4];

    ControlPolygon(KFBezierInterpolator& strategy, KFSpline& spline, void* vA, void* vB, Tempus const& t) {
        strategy.getControlPoints(spline, vA, vB, t, segment.u1, segment.u2, u, v);
    }
    /// The parameter at which a position in time is reached.
    double parameterAt(Tempus const& at) const { return KFBezierFindParameter(u, segment.fraction(at)); }
};

/// A locked vertex keeps its lock through a write that must reach it.
template <class Write> void writeLocked(KFVertex& vertex, Write write) {
    std::uint32_t const flags = vertex.getFlags();
    vertex.resetFlag(kKFVertexFlagLocked);
    write();
    vertex.setFlags(flags);
}

} // namespace

// The base of the family

double KFSplineInterpolator::interpolate(KFSpline&, Tempus const&, void*, void*, Tempus const&, bool, bool) {
    return 0.0;
}

void KFSplineInterpolator::subDivide(KFSpline&, Tempus const&, void*, void*, void*) {}

void KFSplineInterpolator::convertHandlesToTangents(KFSpline& spline, double* u, double* v) {
    double const factor = handleFactor(spline);
    if (u != nullptr)
        *u /= factor;
    if (v != nullptr)
        *v /= factor;
}

void KFSplineInterpolator::convertTangentsToHandles(KFSpline& spline, double* u, double* v) {
    double const factor = handleFactor(spline);
    if (u != nullptr)
        *u *= factor;
    if (v != nullptr)
        *v *= factor;
}

bool KFSplineInterpolator::useTangents() { return true; }

double KFSplineInterpolator::eval(double*, double) { return 0.0; }

// Bezier

void KFBezierInterpolator::computeTangents(KFSpline& spline, void* vA, void* vB, Tempus const& t,
                                           double* outU, double* outV, double* inU, double* inV) {
    vertexOf(vA).getOutputTangents(outU, outV, t);
    vertexOf(vB).getInputTangents(inU, inV, t);
    if (!isParametric(spline)) {
        convertTangentsToHandles(spline, outU, outV);
        convertTangentsToHandles(spline, inU, inV);
    }
}

void KFBezierInterpolator::getControlPoints(KFSpline& spline, void* vA, void* vB, Tempus const& t,
                                            Tempus& startU, Tempus& endU, double* polygonU,
                                            double* polygonV) {
    KFSegmentSpan const segment = segmentSpan(spline, vA, vB);
    startU = segment.u1;
    endU = segment.u2;
    polygonU[0] = 0.0;
    polygonU[3] = 1.0;
    polygonV[0] = vertexOf(vA).getValueV(t);
    polygonV[3] = vertexOf(vB).getValueV(t);
    computeTangents(spline, vA, vB, t, &polygonU[1], &polygonV[1], &polygonU[2], &polygonV[2]);
    if (segment.isEmpty()) {
        polygonU[1] = 0.0;
        polygonU[2] = 1.0;
    } else {
        double const span = segment.seconds();
        polygonU[1] = _handleScale * polygonU[1] / span;
        polygonU[2] = (span + _handleScale * polygonU[2]) / span;
    }
    polygonV[1] = polygonV[0] + polygonV[1] * _handleScale;
    polygonV[2] = polygonV[3] + polygonV[2] * _handleScale;
    if (!isParametric(spline) && spline.getState()->sanitizeBezier) {
        KFBezierSanitizeControlPolygon(polygonU, polygonV);
    }
}

double KFBezierInterpolator::interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB,
                                         Tempus const& u, bool parametric, bool derivative) {
    if (derivative) {
        if (segmentSpan(spline, vA, vB).isEmpty()) {
            return 0.0;
        }
        auto const valueAt = [&spline](Tempus const& at) {
            return spline.getVertexValue(at, kTempusZero, false);
        };
        return KFSlopeOfWholeCurve(spline, u, valueAt);
    }
    ControlPolygon polygon(*this, spline, vA, vB, t);
    if (polygon.segment.isEmpty()) {
        return polygon.v[0];
    }
    double p = polygon.segment.curveFraction(u);
    if (parametric) {
        return eval(polygon.v, p);
    }
    if (p >= 0.0 && p <= 1.0) {
        KFCubicInverse inverse;
        inverse.prepare(polygon.u);
        p = inverse(p);
    } else {
        p = KFBezierFindParameter(polygon.u, p);
    }
    return eval(polygon.v, p);
}

double KFBezierInterpolator::eval(double* polygon, double param) { return KFBezierEval(polygon, param); }

double KFBezierInterpolator::eval(KFSpline& spline, Tempus const& t, void* vA, void* vB, double param) {
    KFVertex& a = vertexOf(vA);
    KFVertex& b = vertexOf(vB);
    double leaving = 0.0;
    double entering = 0.0;
    if (a.getValueU() <= b.getValueU()) {
        a.getOutputTangents(nullptr, &leaving, t);
        b.getInputTangents(nullptr, &entering, t);
    } else {
        a.getInputTangents(nullptr, &leaving, t);
        b.getOutputTangents(nullptr, &entering, t);
    }
    if (!isParametric(spline)) {
        convertTangentsToHandles(spline, nullptr, &leaving);
        convertTangentsToHandles(spline, nullptr, &entering);
    }
    double const valueA = a.getValueV(t);
    double const valueB = b.getValueV(t);
    double polygon[4] = {valueA, valueA + leaving * _handleScale, valueB + entering * _handleScale, valueB};
    return eval(polygon, param);
}

void KFBezierInterpolator::subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) {
    KFVertex& a = vertexOf(vA);
    KFVertex& b = vertexOf(vB);
    KFVertex& added = vertexOf(newVertex);
    double outU = 0.0, outV = 0.0, inU = 0.0, inV = 0.0;
    computeTangents(spline, vA, vB, t, &outU, &outV, &inU, &inV);
    double const valueA = a.getValueV(t);
    double const valueB = b.getValueV(t);
    double const polygon[4] = {valueA, valueA + outV * _handleScale, valueB + inV * _handleScale, valueB};

    KFSegmentSpan const segment = segmentSpan(spline, vA, vB);
    double const s = segment.isEmpty() ? 0.0 : segment.fraction(added.getValueU());
    double left[4];
    double right[4];
    BXAlgorithm::DeCasteljauSubdivide(0.0, 1.0, s, polygon, nullptr, nullptr, left, nullptr, nullptr, right,
                                      nullptr, nullptr);
    double enteringNew = left[2] - left[3];
    double leavingA = left[1] - left[0];
    double enteringB = right[2] - right[3];
    double leavingNew = right[1] - right[0];
    if (!isParametric(spline)) {
        for (double* handle : {&enteringNew, &leavingA, &enteringB, &leavingNew}) {
            convertHandlesToTangents(spline, nullptr, handle);
        }
    }
    added.setValueV(left[3], t);
    added.setInputTangents(1.0, enteringNew, t);
    added.setOutputTangents(1.0, leavingNew, t);
    writeLocked(a, [&] { a.setOutputTangents(1.0, leavingA, t); });
    writeLocked(b, [&] { b.setInputTangents(1.0, enteringB, t); });
}

void KFBezierInterpolator::getMinMaxValues(KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
                                           Tempus const& highU, double* min, double* max) {
    ControlPolygon polygon(*this, spline, vA, vB, kTempusZero);
    KFSegmentSpan const& segment = polygon.segment;
    double const(&polygonV)[4] = polygon.v;
    bool const empty = segment.isEmpty();
    double const low = !empty && segment.u1 < lowU ? polygon.parameterAt(lowU) : 0.0;
    double const high = !empty && segment.u2 > highU ? polygon.parameterAt(highU) : 1.0;
    double const atLow = eval(polygon.v, low);
    double const atHigh = eval(polygon.v, high);
    *min = std::min(atLow, atHigh);
    *max = std::max(atLow, atHigh);

    // The extremes of the cubic, where its derivative is 0.
    double roots[2] = {};
    int const count =
        BXMath::quadratic(-3.0 * polygonV[0] + 9.0 * polygonV[1] - 9.0 * polygonV[2] + 3.0 * polygonV[3],
                          6.0 * polygonV[0] - 12.0 * polygonV[1] + 6.0 * polygonV[2],
                          -3.0 * polygonV[0] + 3.0 * polygonV[1], roots[0], roots[1], 0.0);
    for (int i = 0; i < count; ++i) {
        if (roots[i] >= low && roots[i] <= high) {
            double const extreme = eval(polygon.v, roots[i]);
            *min = std::min(*min, extreme);
            *max = std::max(*max, extreme);
        }
    }
}

bool KFBezierInterpolator::uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU,
                                          Tempus const& highU, double value, std::vector<Tempus>& out) {
    ControlPolygon polygon(*this, spline, vA, vB, kTempusZero);
    KFSegmentSpan const& segment = polygon.segment;
    if (segment.isEmpty()) {
        return !out.empty();
    }
    double const span = segment.seconds();
    double const lowest = segment.fraction(lowU) - kEndTolerance;
    double const highest = segment.fraction(highU) + kEndTolerance;
    double roots[3] = {};
    int const count = KFBezierGetRoots(polygon.v, value, roots);
    for (int i = 0; i < count; ++i) {
        if (roots[i] < -kEndTolerance || roots[i] > 1.0 + kEndTolerance) {
            continue;
        }
        double const fraction = eval(polygon.u, roots[i]);
        if (fraction >= lowest && fraction <= highest) {
            Tempus const offset = KFChronoForChannelSeconds(span * fraction, kKFChannelTimescale);
            out.push_back(BXMath::clamp(BX_TempusSaferAdd(segment.u1, offset), lowU, highU));
        }
    }
    return !out.empty();
}

KFHermiteInterpolator::KFHermiteInterpolator() noexcept : KFBezierInterpolator(kThird) {}

// Cardinal

void KFCardinalInterpolator::convertHandlesToTangents(KFSpline&, double*, double*) {}

void KFCardinalInterpolator::convertTangentsToHandles(KFSpline&, double*, double*) {}

bool KFCardinalInterpolator::useTangents() { return false; }

void KFCardinalInterpolator::computeTangents(KFSpline& spline, void* vA, void* vB, Tempus const& t,
                                             double* outU, double* outV, double* inU, double* inV) {
    double const k = (1.0 - _tension) * 0.5;
    Tempus const uA = vertexOf(vA).getValueU();
    Tempus const uB = vertexOf(vB).getValueU();
    double const valueA = vertexOf(vA).getValueV(t);
    double const valueB = vertexOf(vB).getValueV(t);
    double const smallDelta = TempusGetSeconds(spline.getSmallDeltaU());
    void* neighbour = nullptr;

    // The neighbour that an end of an open spline lacks is the mirror image of the other one, at the same
    // value.
    if (spline.getPreviousValidVertex(vA, &neighbour, kTempusZero)) {
        *outU = k * TempusSecondsBetween(vertexOf(neighbour).getValueU(), uB);
        *outV = k * (valueB - vertexOf(neighbour).getValueV(t));
    } else if (spline.isClosed() && spline.getLastValidVertex(&neighbour, kTempusZero)) {
        *outU = k * (TempusSecondsBetween(uA, uB) + smallDelta);
        *outV = k * (valueB - vertexOf(neighbour).getValueV(t));
    } else {
        *outU = k * 2.0 * TempusSecondsBetween(uA, uB);
        *outV = 0.0;
    }

    if (spline.getNextValidVertex(vB, &neighbour, kTempusZero)) {
        *inU = k * TempusSecondsBetween(vertexOf(neighbour).getValueU(), uA);
        *inV = k * (valueA - vertexOf(neighbour).getValueV(t));
    } else if (spline.isClosed() && spline.getFirstValidVertex(&neighbour, kTempusZero)) {
        *inU = k * (TempusSecondsBetween(uB, uA) - smallDelta);
        *inV = k * (valueA - vertexOf(neighbour).getValueV(t));
    } else {
        *inU = k * 2.0 * TempusSecondsBetween(uB, uA);
        *inV = 0.0;
    }
}
