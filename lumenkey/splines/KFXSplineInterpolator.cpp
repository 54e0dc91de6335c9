#include "lumenkey/splines/KFXSplineInterpolator.h"

#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFVertex.h"
#include "lumenkey/splines/KFWholeCurve.h"

#include <algorithm>
#include <array>
#include <cmath>

// Letters of the paper: the control points k .. k+3 weigh in k+1 <= x < k+2. A control point's influence
// begins and ends at T- and T+, which its neighbour's shape s moves: p = max(s, 0) widens it, and q = -s/2
// for s < 0 makes the curve pass through the control point, as an interpolating spline does.

namespace {

/// A blending function below it adds nothing to the weighted sum.
constexpr double kNegligible = 1e-7;

/// The blending function of a control point whose side lies towards x.
double towards(double u, double q, double p) noexcept {
    return u * (q + u * (2.0 * q + u * (10.0 - 12.0 * q - p +
                                        u * (2.0 * p + 14.0 * q - 15.0 + u * (6.0 - 5.0 * q - p)))));
}

/// The blending function beyond the reach of a control point: the undershoot of an interpolating spline.
double beyond(double u, double q) noexcept { return u * (q + u * (2.0 * q - u * u * (2.0 * q + u * q))); }

/// The vertices as control points, of which an open spline has its last vertex once more.
class Controls {
public:
    Controls(std::vector<KFVertex*> const& vertices, bool closed, Tempus const& t)
        : _vertices(vertices), _t(t), _closed(closed),
          _count(static_cast<std::int64_t>(vertices.size()) + (closed ? 0 : 1)) {}

    std::int64_t count() const noexcept { return _count; }

    double valueAt(std::int64_t index) const { return _vertices[place(index)]->getValueV(_t); }

    double shapeAt(std::int64_t index) const {
        std::size_t const at = place(index);
        bool const isEnd = !_closed && (at == 0 || at + 1 == _vertices.size());
        if (isEnd) {
            return 1.0;
        }
        double const bias = _vertices[at]->getBias(_t);
        return bias <= 1.0 ? bias : 1.0;
    }

private:
    std::size_t place(std::int64_t index) const noexcept {
        if (_closed) {
            return static_cast<std::size_t>((index % _count + _count) % _count);
        }
        auto const last = static_cast<std::int64_t>(_vertices.size()) - 1;
        return static_cast<std::size_t>(std::clamp(index, std::int64_t{0}, last));
    }

    std::vector<KFVertex*> const& _vertices;
    Tempus const& _t;
    bool const _closed;
    std::int64_t const _count;
};

/// The weights at x of the control points k .. k+3; s1 and s2 are the shapes of k+1 and k+2.
std::array<double, 4> blend(double x, double k, double s1, double s2) noexcept {
    double const p1 = std::max(s1, 0.0);
    double const p2 = std::max(s2, 0.0);
    double const q1 = s1 < 0.0 ? -0.5 * s1 : 0.0;
    double const q2 = s2 < 0.0 ? -0.5 * s2 : 0.0;
    double const end0 = k + 1.0 + p1;
    double const end1 = k + 2.0 + p2;
    double const begin2 = k + 1.0 - p1;
    double const begin3 = k + 2.0 - p2;
    double const reach0 = k - end0;
    double const reach1 = k + 1.0 - end1;
    double const reach2 = k + 2.0 - begin2;
    double const reach3 = k + 3.0 - begin3;
    double const u0 = (x - end0) / reach0;
    double const u3 = (x - begin3) / reach3;
    return {
        x <= end0  ? towards(u0, q1, 2.0 * reach0 * reach0)
        : q1 > 0.0 ? beyond(u0, q1)
                   : 0.0,
        towards((x - end1) / reach1, q2, 2.0 * reach1 * reach1),
        towards((x - begin2) / reach2, q1, 2.0 * reach2 * reach2),
        x >= begin3 ? towards(u3, q2, 2.0 * reach3 * reach3)
        : q2 > 0.0  ? beyond(u3, q2)
                    : 0.0,
    };
}

} // namespace

void KFXSplineInterpolator::init(KFSpline& spline, Tempus const& t) {
    _controlPointCount = spline.getNumberOfValidVertices(t) + (spline.isClosed() ? 0u : 1u);
    spline.setDirty(false);
}

bool KFXSplineInterpolator::needInit(KFSpline&) { return true; }

bool KFXSplineInterpolator::useKeypoints() { return false; }

double KFXSplineInterpolator::evalXSpline(KFSpline& spline, double x, Tempus const& t) {
    std::vector<KFVertex*> const& vertices = _controlVertices.of(spline, t);
    spline.setDirty(false);
    double const k = std::trunc(x) - 1.0;
    bool const closed = spline.isClosed();
    if (vertices.empty() || !std::isfinite(k) || (closed && k < -2.0)) {
        return 0.0;
    }
    Controls const controls(vertices, closed, t);
    std::int64_t const last = controls.count() - 1;
    auto index = static_cast<std::int64_t>(std::clamp(k, -1e15, 1e15));
    double s1 = 0.0;
    double s2 = 0.0;
    if (closed) {
        s1 = controls.shapeAt(index + 1);
        s2 = controls.shapeAt(index + 2);
    } else {
        if (index >= 0 && index < last)
            s1 = controls.shapeAt(index + 1);
        index = std::max(index, std::int64_t{-1});
        if (index + 2 < last)
            s2 = controls.shapeAt(index + 2);
    }

    double weighted = 0.0;
    double weights = 0.0;
    for (double const weight : blend(x, k, s1, s2)) {
        if (std::fabs(weight) >= kNegligible) {
            weighted += weight * controls.valueAt(index);
        }
        weights += weight;
        index += 1;
    }
    return weights == 0.0 ? 0.0 : weighted / weights;
}

double KFXSplineInterpolator::interpolate(KFSpline& spline, Tempus const& t, void*, void*, Tempus const& u,
                                          bool parametric, bool derivative) {
    if (!parametric) {
        return 0.0;
    }
    auto const valueAt = [&](Tempus const& at) { return evalXSpline(spline, TempusGetSeconds(at), t); };
    return derivative ? KFSlopeOfWholeCurve(spline, u, valueAt) : valueAt(u);
}

void KFXSplineInterpolator::subDivide(KFSpline&, Tempus const& t, void* vA, void* vB, void* newVertex) {
    KFSetValueOnChord(t, vA, vB, newVertex);
}

Tempus KFXSplineInterpolator::getAdjustedMinU(KFSpline& spline, Tempus const& t, Tempus const& u) {
    return spline.getFirstValidVertex(nullptr, t) ? kTempusZero : u;
}

Tempus KFXSplineInterpolator::getAdjustedMaxU(KFSpline& spline, Tempus const& t, Tempus const& u) {
    if (!spline.getFirstValidVertex(nullptr, t)) {
        return u;
    }
    init(spline, t);
    double const end = spline.isClosed() ? _controlPointCount : _controlPointCount - 1.0;
    return KFChronoForChannelSeconds(end, static_cast<std::uint32_t>(u.timescale));
}

bool KFXSplineInterpolator::operator==(KFXSplineInterpolator const& other) const noexcept {
    return _controlPointCount == other._controlPointCount;
}
