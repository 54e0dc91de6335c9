#include "lumenkey/splines/KFSplineExtremes.h"

#include "lumenkey/splines/KFShapes.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineIndex.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "lumenkey/splines/KFVertexStore.h"

#include <algorithm>
#include <cmath>

namespace {

constexpr double kInfinity = std::numeric_limits<double>::infinity();

/// Extremes, and the band within which a value changes nothing even when it is computed less exactly than it is bounded:
/// the power form in which a cubic is evaluated rounds some dozen times, each by a part of the largest control value.
class GrowingExtremes {
public:
    explicit GrowingExtremes(KFValueExtremes& extremes) noexcept : _extremes(extremes) { settle(); }

    void include(double low, double high) noexcept {
        if (low < _extremes.lowest || high > _extremes.highest) {
            _extremes.include(low, high);
            settle();
        }
    }
    void include(KFValueExtremes const& of) noexcept { include(of.lowest, of.highest); }
    bool hold(double value) const noexcept { return _innerLow <= value && value <= _innerHigh; }

private:
    static constexpr double kRoundings = 256.0 * std::numeric_limits<double>::epsilon();
    /// What denormal numbers round by is far below; sums of a few numbers up to `kLarge` don't overflow.
    static constexpr double kSmall = 1e-300;
    static constexpr double kLarge = 1e300;

    void settle() noexcept {
        double const magnitude = std::max(std::fabs(_extremes.lowest), std::fabs(_extremes.highest));
        double const slack = magnitude < kLarge ? magnitude * kRoundings + kSmall : kInfinity;
        _innerLow = _extremes.lowest + slack;
        _innerHigh = _extremes.highest - slack;
    }

    KFValueExtremes& _extremes;
    double _innerLow = kInfinity;
    double _innerHigh = -kInfinity;
};

} // namespace

/// The walk over whole segments. The caller holds the lock.
class KFSplineExtremes {
public:
    KFSplineExtremes(KFSpline& spline, KFValueExtremes& extremes)
        : _spline(spline), _store(*spline._store), _extremes(extremes),
          _handlesPerTangent(spline.getState()->parametric ? 1.0 : 12.0) {}

    bool walk(Tempus const& from, Tempus const& to);

private:
    using Place = KFVertexIterator;

    bool canWalk(Place start) const;
    double valueAtVertex(Place place, KFStaticVertex const& vertex);
    bool includeSegment(Place place, KFStaticVertex& a, KFStaticVertex& b);
    void includeBezier(KFStaticVertex& a, KFStaticVertex& b);
    void includeConstant(Place place, KFStaticVertex const& a, KFStaticVertex const& b);
    template <class Interpolator> void includeWithinEnds(KFStaticVertex& a, KFStaticVertex& b);
    template <class Interpolator> void ask(KFStaticVertex& a, KFStaticVertex& b) {
        _extremes.include(KFExtremesOfSegment<Interpolator>(_spline, &a, &b, a.getValueU(), b.getValueU()));
    }

    KFSpline& _spline;
    KFVertexStore const& _store;
    GrowingExtremes _extremes;
    double const _handlesPerTangent;
};

/// What the index says must be what a reading by `getVertexValue` says.
bool KFSplineExtremes::canWalk(Place start) const {
    if (!_spline._staticVertices || !_spline.listAnswers() || !_store.hasTicks() ||
        _store.validCount() != _store.size() || _store.empty() || _spline.customInterpolator() != nullptr) {
        return false;
    }
    auto const isWhole = [](KFVertex const* vertex) {
        return KFSpline::isWholeCurve(vertex->KFVertex::getInterpolation());
    };
    bool const followsWhole =
        start != _store.end() && start != _store.begin() && isWhole(_store.at(_store.previous(start)));
    return !followsWhole && !KFSpline::isWholeCurve(_spline.getState()->interpolation) &&
           !isWhole(_store.front()) && !isWhole(_store.back());
}

/// A retimed curve is extrapolated from its last vertex on.
double KFSplineExtremes::valueAtVertex(Place place, KFStaticVertex const& vertex) {
    bool const isOutside =
        _spline.getState()->retimingExtrapolation && _store.tickAt(place) == _store.tickAt(_store.last());
    return isOutside ? _spline.getVertexValue(vertex.getValueU(), kTempusZero, false)
                     : vertex.getValueV(kTempusZero);
}

bool KFSplineExtremes::walk(Tempus const& from, Tempus const& to) {
    Place place = _store.lowerBound(from);
    Place const end = _store.upperBound(to);
    if (!canWalk(place))
        return false;
    if (place == end)
        return true;
    auto* a = static_cast<KFStaticVertex*>(_store.at(place));
    double const first = valueAtVertex(place, *a);
    _extremes.include(first, first);
    for (Place next = _store.next(place); next != end; next = _store.next(next)) {
        auto* const b = static_cast<KFStaticVertex*>(_store.at(next));
        std::int64_t const tickA = _store.tickAt(place);
        std::int64_t const tickB = _store.tickAt(next);
        if (tickB < tickA)
            return false;
        if (tickB > tickA) { // of several at one place the first has the value
            if (!includeSegment(place, *a, *b))
                return false;
            double const value = valueAtVertex(next, *b);
            _extremes.include(value, value);
        }
        place = next;
        a = b;
    }
    return true;
}

/// False for a whole-curve type, which changes what is read at the vertex behind it.
bool KFSplineExtremes::includeSegment(Place place, KFStaticVertex& a, KFStaticVertex& b) {
    double const valueA = a.getValueV(kTempusZero);
    double const valueB = b.getValueV(kTempusZero);
    switch (a.getInterpolation()) {
    case kKFInterpolationConstant:
        includeConstant(place, a, b);
        return true;
    case kKFInterpolationLinear: {
        double const start = KFShape::linear(1.0, 0.0, valueA, valueB);
        double const end = KFShape::linear(0.0, 1.0, valueA, valueB);
        _extremes.include(start, start);
        _extremes.include(end, end);
        return true;
    }
    case kKFInterpolationBezier:
        includeBezier(a, b);
        return true;
    case kKFInterpolationCatmullRom:
        ask<KFCatmullRomInterpolator>(a, b);
        return true;
    case kKFInterpolationEaseIn:
        includeWithinEnds<KFEaseInInterpolator>(a, b);
        return true;
    case kKFInterpolationEaseOut:
        includeWithinEnds<KFEaseOutInterpolator>(a, b);
        return true;
    case kKFInterpolationExponential:
        includeWithinEnds<KFExponentialInterpolator>(a, b);
        return true;
    case kKFInterpolationLogarithmic:
        includeWithinEnds<KFLogarithmicInterpolator>(a, b);
        return true;
    case kKFInterpolationEase:
    case kKFInterpolationAccelerate:
    case kKFInterpolationDecelerate:
        _extremes.include(std::min(valueA, valueB), std::max(valueA, valueB));
        return true;
    case kKFInterpolationBSpline:
    case kKFInterpolationXSpline:
        return false;
    default:
        return true;
    }
}

/// Handles that point into the segment are at most shortened where they would fold it, so that the curve stays within
/// the control values that they have here.
void KFSplineExtremes::includeBezier(KFStaticVertex& a, KFStaticVertex& b) {
    double outU = 0.0;
    double outV = 0.0;
    double inU = 0.0;
    double inV = 0.0;
    a.getOutputTangents(&outU, &outV, kTempusZero);
    b.getInputTangents(&inU, &inV, kTempusZero);
    double const valueA = a.getValueV(kTempusZero);
    double const valueB = b.getValueV(kTempusZero);
    bool const changesNothing = outU >= 0.0 && inU <= 0.0 && _extremes.hold(valueA) &&
                                _extremes.hold(valueB) &&
                                _extremes.hold(valueA + outV * _handlesPerTangent) &&
                                _extremes.hold(valueB + inV * _handlesPerTangent);
    if (!changesNothing)
        ask<KFBezierInterpolator>(a, b);
}

template <class Interpolator> void KFSplineExtremes::includeWithinEnds(KFStaticVertex& a, KFStaticVertex& b) {
    if (!_extremes.hold(a.getValueV(kTempusZero)) || !_extremes.hold(b.getValueV(kTempusZero)))
        ask<Interpolator>(a, b);
}

/// The value in the middle: that of the start, unless the middle can't be told from an end.
void KFSplineExtremes::includeConstant(Place place, KFStaticVertex const& a, KFStaticVertex const& b) {
    constexpr std::int64_t farthest = std::int64_t{1} << 60;
    constexpr std::int64_t finest = std::int64_t{1} << 29;
    std::int64_t const tick = _store.tickAt(place);
    bool const hasMiddle =
        _store.tickScale() <= finest && tick > -farthest && _store.tickAt(_store.next(place)) < farthest;
    double const value =
        hasMiddle ? a.getValueV(kTempusZero)
                  : _spline.getVertexValue((a.getValueU() + b.getValueU()) / 2, kTempusZero, false);
    _extremes.include(value, value);
}

bool KFIncludeWholeSegments(KFSpline& spline, Tempus const& from, Tempus const& to,
                            KFValueExtremes& extremes) {
    KFSplineAccess const access(spline);
    return KFSplineExtremes(spline, extremes).walk(from, to);
}
