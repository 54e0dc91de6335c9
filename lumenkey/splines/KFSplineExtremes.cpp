#include "lumenkey/splines/KFSplineExtremes.h"

#include "lumenkey/splines/KFShapes.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineIndex.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "lumenkey/splines/KFTangent.h"
#include "lumenkey/splines/KFVertexStore.h"

#include <algorithm>
#include <cmath>

namespace {

constexpr double kInfinity = std::numeric_limits<double>::infinity();

/// Extremes, and the band within which a bound changes nothing, even though what it bounds is computed with
/// roundings: the power form in which a cubic is evaluated has some dozen, each of a part of the largest
/// control value.
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
    /// Whether a cubic with these control values changes nothing.
    bool holdCubic(double const (&v)[4]) const noexcept {
        return hold(v[0]) && hold(v[3]) && hold(v[1]) && hold(v[2]);
    }
    /// The same by the control values of its two halves (de Casteljau), which lie nearer to it.
    bool holdHalves(double const (&v)[4]) const noexcept {
        double const middle = 0.5 * (v[1] + v[2]);
        double const left = 0.5 * (v[0] + v[1]);
        double const right = 0.5 * (v[2] + v[3]);
        // The point where they meet lies between the two next to it.
        return hold(v[0]) && hold(v[3]) && hold(left) && hold(right) && hold(0.5 * (left + middle)) &&
               hold(0.5 * (middle + right));
    }

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

/// Fetches vertices from memory some steps before they are looked at.
class Prefetch {
public:
    Prefetch(KFVertexStore const& store, KFVertexIterator place) noexcept : _store(store), _ahead(place) {
        for (int i = 0; i < kSteps; ++i)
            step();
    }
    void step() noexcept {
        if (_ahead == _store.end())
            return;
        auto const* const vertex = static_cast<KFStaticVertex const*>(_store.at(_ahead));
        __builtin_prefetch(vertex);
        __builtin_prefetch(vertex + 1); // its end
        _ahead = _store.next(_ahead);
    }

private:
    static constexpr int kSteps = 8; // tuned

    KFVertexStore const& _store;
    KFVertexIterator _ahead;
};

} // namespace

/// The walk over whole segments. The caller holds the lock.
class KFSplineExtremes {
public:
    KFSplineExtremes(KFSpline& spline, KFValueExtremes& extremes)
        : _spline(spline), _store(*spline._store), _extremes(extremes),
          _handlesPerTangent(spline.getState()->parametric ? 1 : kKFHandlesPerTangent) {
        if (spline.getState()->retimingExtrapolation && !_store.empty())
            _outsideFrom = _store.tickAt(_store.last());
    }

    bool walk(Tempus const& from, Tempus const& to);

private:
    using Place = KFVertexIterator;

    bool canWalk(Place start) const;
    double valueAtVertex(std::int64_t tick, KFStaticVertex const& vertex);
    bool includeSegment(Place place, KFStaticVertex& a, KFStaticVertex& b);
    void includeBezier(KFStaticVertex& a, KFStaticVertex& b);
    void includeCatmullRom(Place place, KFStaticVertex& a, KFStaticVertex& b);
    void includeConstant(Place place, KFStaticVertex const& a, KFStaticVertex const& b);
    template <class Interpolator> void includeWithinEnds(KFStaticVertex& a, KFStaticVertex& b);
    template <class Interpolator> void ask(KFStaticVertex& a, KFStaticVertex& b) {
        _extremes.include(KFExtremesOfSegment<Interpolator>(_spline, &a, &b, a.getValueU(), b.getValueU()));
    }

    KFSpline& _spline;
    KFVertexStore const& _store;
    GrowingExtremes _extremes;
    double const _handlesPerTangent;
    /// A retimed curve is extrapolated from its last vertex on.
    std::int64_t _outsideFrom = std::numeric_limits<std::int64_t>::max();
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

double KFSplineExtremes::valueAtVertex(std::int64_t tick, KFStaticVertex const& vertex) {
    return tick < _outsideFrom ? vertex.getValueV(kTempusZero)
                               : _spline.getVertexValue(vertex.getValueU(), kTempusZero, false);
}

bool KFSplineExtremes::walk(Tempus const& from, Tempus const& to) {
    Place place = _store.lowerBound(from);
    Place const end = _store.upperBound(to);
    if (!canWalk(place))
        return false;
    if (place == end)
        return true;
    auto* a = static_cast<KFStaticVertex*>(_store.at(place));
    std::int64_t tickA = _store.tickAt(place);
    double const first = valueAtVertex(tickA, *a);
    _extremes.include(first, first);
    Prefetch prefetch(_store, place);
    for (Place next = _store.next(place); next != end; next = _store.next(next)) {
        prefetch.step();
        auto* const b = static_cast<KFStaticVertex*>(_store.at(next));
        std::int64_t const tickB = _store.tickAt(next);
        if (tickB < tickA)
            return false;
        if (tickB > tickA) { // of several at one place the first has the value
            if (!includeSegment(place, *a, *b))
                return false;
            double const value = valueAtVertex(tickB, *b);
            _extremes.include(value, value);
        }
        place = next;
        a = b;
        tickA = tickB;
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
        includeCatmullRom(place, a, b);
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

/// Handles that point into the segment are at most shortened, where they would fold it, so that the curve
/// stays within the control values that they have here; within its halves' where they aren't.
void KFSplineExtremes::includeBezier(KFStaticVertex& a, KFStaticVertex& b) {
    double outU = 0.0;
    double outV = 0.0;
    double inU = 0.0;
    double inV = 0.0;
    a.getOutputTangents(&outU, &outV, kTempusZero);
    b.getInputTangents(&inU, &inV, kTempusZero);
    double const valueA = a.getValueV(kTempusZero);
    double const valueB = b.getValueV(kTempusZero);
    double const polygon[4] = {valueA, valueA + outV * _handlesPerTangent, valueB + inV * _handlesPerTangent,
                               valueB};
    if (outU >= 0.0 && inU <= 0.0) {
        if (_extremes.holdCubic(polygon))
            return;
        double const longest = _handlesPerTangent * std::max(outU, -inU);
        if (longest <= TempusSecondsBetween(a.getValueU(), b.getValueU()) && _extremes.holdHalves(polygon))
            return;
    }
    ask<KFBezierInterpolator>(a, b);
}

/// The handles rise with the line through the neighbours, at an open end not at all.
void KFSplineExtremes::includeCatmullRom(Place place, KFStaticVertex& a, KFStaticVertex& b) {
    auto const valueAt = [this](Place at) { return _store.at(at)->getValueV(kTempusZero); };
    Place const next = _store.next(_store.next(place));
    bool const hasBefore = place != _store.begin();
    bool const hasAfter = next != _store.end();
    double const valueA = a.getValueV(kTempusZero);
    double const valueB = b.getValueV(kTempusZero);
    double const riseA = hasBefore ? valueB - valueAt(_store.previous(place)) : 0.0;
    double const riseB = hasAfter ? valueA - valueAt(next) : 0.0;
    bool const knowsHandles = !_spline.isClosed() || (hasBefore && hasAfter);
    double const polygon[4] = {valueA, valueA + riseA / 6.0, valueB + riseB / 6.0, valueB};
    if (!knowsHandles || !_extremes.holdCubic(polygon))
        ask<KFCatmullRomInterpolator>(a, b);
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
