#include "lumenkey/splines/KFBSplineInterpolator.h"

#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFVertex.h"
#include "lumenkey/splines/KFWholeCurve.h"

#include <algorithm>
#include <cmath>

namespace {

/// A basis function, a sum of weights or a distance to the last knot below it counts as 0.
constexpr double kNegligible = 1e-7;

constexpr std::uint32_t kHighestOrder = 4;

double weightOfBias(double bias) noexcept { return bias <= 1.0 ? 25.0 - 24.0 * bias : 1.9 - 0.9 * bias; }

} // namespace

double KFBSplineInterpolator::convertBSplineBiasToLinear(double weight) noexcept {
    return weight < 1.0 ? (1.9 - weight) / 0.9 : (25.0 - weight) / 24.0;
}

void KFBSplineInterpolator::init(KFSpline& spline, Tempus const&) {
    generateKnotVector(spline.getNumberOfValidVerticesWithMultiplicity(kTempusZero), spline.isClosed());
    spline.setDirty(false);
}

bool KFBSplineInterpolator::needInit(KFSpline& spline) { return spline.isDirty() || _knots.empty(); }

bool KFBSplineInterpolator::useKeypoints() { return false; }

void KFBSplineInterpolator::generateKnotVector(std::uint32_t vertexCount, bool closed) {
    _vertexCount = vertexCount;
    _closed = closed;
    if (closed) {
        generatePeriodicKnotVector(vertexCount);
    } else {
        generateOpenKnotVector(vertexCount);
    }
}

void KFBSplineInterpolator::generatePeriodicKnotVector(std::uint32_t count) {
    _controlPointCount = count + 3;
    _order = kHighestOrder;
    _knots.resize(_controlPointCount + _order);
    for (std::size_t i = 0; i < _knots.size(); ++i) {
        _knots[i] = static_cast<double>(i);
    }
}

void KFBSplineInterpolator::generateOpenKnotVector(std::uint32_t count) {
    _controlPointCount = count;
    _order = std::min(count, kHighestOrder);
    _knots.assign(_controlPointCount + _order, 0.0);
    for (std::size_t i = 1; i < _knots.size(); ++i) {
        bool const repeats = i < _order || i + 1 >= _controlPointCount + 2;
        _knots[i] = repeats ? _knots[i - 1] : _knots[i - 1] + 1.0;
    }
}

/// Reads `count` control points from the first on.
void KFBSplineInterpolator::fillTempArrays(std::vector<KFVertex*> const& vertices, Tempus const& t,
                                           std::uint32_t first, std::uint32_t count) {
    _values.resize(_controlPointCount);
    _weights.resize(_controlPointCount);
    for (std::size_t i = first; i < std::size_t{first} + count; ++i) {
        // On a closed spline the last vertex stands in front of the first too, and the first two behind the
        // last.
        std::size_t const index = _closed ? (i + vertices.size() - 1) % vertices.size() : i;
        _values[i] = vertices[index]->getValueV(t);
        _weights[i] = weightOfBias(vertices[index]->getBias(t));
    }
}

/// The recursion of Cox and de Boor ("The NURBS Book", equation 2.5), for the basis functions that aren't 0
/// over the knot span of x alone: those of the control points from `_firstControlPoint` on, one for each
/// entry of `_basis`.
void KFBSplineInterpolator::generateRationalBasisFunctions(double x) {
    auto const lastKnot = static_cast<std::ptrdiff_t>(_knots.size()) - 1;
    std::ptrdiff_t const span = std::upper_bound(_knots.begin(), _knots.end(), x) - _knots.begin() - 1;
    auto const order = static_cast<std::ptrdiff_t>(_order);
    auto const knot = [this](std::ptrdiff_t i) { return _knots[static_cast<std::size_t>(i)]; };

    // entries[j] belongs to control point span - order + 1 + j; one more, for the end of the recursion, stays
    // 0.
    double entries[kHighestOrder + 1] = {};
    if (span >= 0 && span < lastKnot) {
        entries[order - 1] = 1.0;
    }
    for (std::ptrdiff_t degree = 1; degree < order; ++degree) {
        for (std::ptrdiff_t j = order - 1 - degree; j < order; ++j) {
            std::ptrdiff_t const i = span - order + 1 + j;
            double& entry = entries[j];
            double const next = entries[j + 1];
            if (i < 0 || i + degree >= lastKnot) {
                entry = 0.0;
                continue;
            }
            double const rising =
                std::fabs(entry) >= kNegligible ? entry * (x - knot(i)) / (knot(i + degree) - knot(i)) : 0.0;
            double const falling = std::fabs(next) >= kNegligible ? next * (knot(i + degree + 1) - x) /
                                                                        (knot(i + degree + 1) - knot(i + 1))
                                                                  : 0.0;
            entry = rising + falling;
        }
    }

    auto const count = static_cast<std::ptrdiff_t>(_controlPointCount);
    std::ptrdiff_t const first = std::clamp(span - order + 1, std::ptrdiff_t{0}, count - order);
    _firstControlPoint = static_cast<std::uint32_t>(first);
    _basis.assign(_order, 0.0);
    for (std::ptrdiff_t j = 0; j < order; ++j) {
        std::ptrdiff_t const position = span - order + 1 + j - first;
        if (position >= 0 && position < order) {
            _basis[static_cast<std::size_t>(position)] = entries[j];
        }
    }
    // The last basis function has its last value at the last knot itself, which no half-open span contains.
    if (std::fabs(x - _knots.back()) < kNegligible) {
        _basis.back() = 1.0;
    }
}

double KFBSplineInterpolator::evalBSplineNURB(std::vector<KFVertex*> const& vertices, Tempus const& t,
                                              double x) {
    generateRationalBasisFunctions(x);
    fillTempArrays(vertices, t, _firstControlPoint, _order);
    double const* const values = &_values[_firstControlPoint];
    double const* const weights = &_weights[_firstControlPoint];

    double sum = 0.0;
    for (std::size_t i = 0; i < _basis.size(); ++i) {
        sum += _basis[i] * weights[i];
    }
    double value = 0.0;
    for (std::size_t i = 0; i < _basis.size(); ++i) {
        _basis[i] = std::fabs(sum) < kNegligible ? 0.0 : _basis[i] * weights[i] / sum;
        value += values[i] * _basis[i];
    }
    return value;
}

double KFBSplineInterpolator::valueAt(KFSpline& spline, Tempus const& t, Tempus const& u) {
    bool listedAnew = false;
    std::vector<KFVertex*> const& vertices = _controlVertices.of(spline, t, &listedAnew);
    // The flag of the spline may have been cleared on behalf of another strategy.
    if (vertices.size() != _vertexCount || spline.isClosed() != _closed) {
        generateKnotVector(static_cast<std::uint32_t>(vertices.size()), spline.isClosed());
    }
    spline.setDirty(false);
    if (listedAnew || _values.size() != _controlPointCount) {
        fillTempArrays(vertices, t, 0, vertices.empty() ? 0 : _controlPointCount);
    }
    if (vertices.empty()) {
        return 0.0;
    }
    double x = TempusGetSeconds(u);
    if (!_closed) {
        x = x / TempusGetSeconds(spline.getMaxValueU(kTempusZero, false)) * _knots.back();
    }
    return std::isfinite(x) ? evalBSplineNURB(vertices, t, x) : 0.0;
}

double KFBSplineInterpolator::interpolate(KFSpline& spline, Tempus const& t, void*, void*, Tempus const& u,
                                          bool parametric, bool derivative) {
    if (!parametric) {
        return 0.0;
    }
    if (derivative) {
        return KFSlopeOfWholeCurve(spline, u, [&](Tempus const& at) { return valueAt(spline, t, at); });
    }
    return valueAt(spline, t, u);
}

void KFBSplineInterpolator::subDivide(KFSpline&, Tempus const& t, void* vA, void* vB, void* newVertex) {
    KFSetValueOnChord(t, vA, vB, newVertex);
}

Tempus KFBSplineInterpolator::getAdjustedMinU(KFSpline& spline, Tempus const& t, Tempus const& u) {
    if (!spline.getFirstValidVertex(nullptr, t)) {
        return u;
    }
    if (needInit(spline)) {
        init(spline, t);
    }
    return spline.isClosed() ? KFChronoForChannelSeconds(_order - 1.0, kKFChannelTimescale) : kTempusZero;
}

Tempus KFBSplineInterpolator::getAdjustedMaxU(KFSpline& spline, Tempus const& t, Tempus const& u) {
    if (!spline.getFirstValidVertex(nullptr, t)) {
        return u;
    }
    if (needInit(spline)) {
        init(spline, t);
    }
    double const end = spline.isClosed() ? _controlPointCount : static_cast<double>(_knots.size()) - 1.0;
    return KFChronoForChannelSeconds(end, kKFChannelTimescale);
}

double KFBSplineInterpolator::basisOf(std::uint32_t controlPoint) const noexcept {
    std::size_t const place = std::size_t{controlPoint} - _firstControlPoint;
    return controlPoint >= _firstControlPoint && place < _basis.size() ? _basis[place] : 0.0;
}

bool KFBSplineInterpolator::operator==(KFBSplineInterpolator const& other) const {
    if (_order != other._order || _controlPointCount != other._controlPointCount || _knots != other._knots ||
        _weights != other._weights || _values != other._values) {
        return false;
    }
    for (std::uint32_t i = 0; i < _controlPointCount; ++i) {
        if (basisOf(i) != other.basisOf(i)) {
            return false;
        }
    }
    return true;
}
