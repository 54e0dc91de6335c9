#include "tests/splines/SlowCurve.h"

#include "lumenkey/splines/KFBezierUtil.h"
#include "lumenkey/splines/KFInterpolator.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace {

std::vector<KFVertex*> enabledOf(std::vector<KFVertex*> const& vertices) {
    std::vector<KFVertex*> enabled;
    std::copy_if(vertices.begin(), vertices.end(), std::back_inserter(enabled),
                 [](KFVertex const* vertex) { return vertex->isEnabled(kTempusZero); });
    return enabled;
}

double draw(KFSpline& spline, KFVertex* a, KFVertex* b, Tempus const& u, bool slope) {
    KFInterpolator& strategy = *spline.getInterpolator(a->getInterpolation());
    if (strategy.needInit(spline)) {
        strategy.init(spline, kTempusZero);
    }
    return strategy.interpolate(spline, kTempusZero, a, b, u, spline.getState()->parametric, slope);
}

struct Range {
    Tempus min, max;

    Range(KFSpline& spline, std::vector<KFVertex*> const& valid) : min(kTempusZero), max(kTempusZero) {
        if (valid.empty()) {
            return;
        }
        auto const strategyOf = [&](KFVertex const* vertex) {
            return spline.getInterpolator(vertex->getInterpolation());
        };
        min = strategyOf(valid.front())->getAdjustedMinU(spline, kTempusZero, valid.front()->getValueU());
        max = strategyOf(valid.back())->getAdjustedMaxU(spline, kTempusZero, valid.back()->getValueU());
    }
};

/// The valid vertex before one that isn't the first of all; null when there is none.
KFVertex* validBefore(std::vector<KFVertex*> const& valid, KFVertex const* vertex) {
    auto const place = std::find(valid.begin(), valid.end(), vertex);
    return place == valid.begin() ? nullptr : *(place - 1);
}

} // namespace

double walkedValue(KFSpline& spline, Tempus const& u) {
    auto const all = museumVertices(spline);
    auto const valid = enabledOf(all);
    KFSplineState const& state = *spline.getState();
    double result = 0.0;
    auto const agrees = [&](KFVertex const* vertex) {
        return vertex->getInterpolation() == all.front()->getInterpolation();
    };
    if (isWholeCurveType(state.interpolation) && state.parametric &&
        std::all_of(all.begin(), all.end(), agrees) &&
        (all.empty() || isWholeCurveType(all.front()->getInterpolation()))) {
        return all.empty() ? result : draw(spline, all.front(), all.back(), u, false);
    }

    Range const range(spline, valid);
    bool const closed = spline.isClosed();
    if (u < range.min && !closed) {
        spline.extrapolate(valid.empty() ? nullptr : valid.front(), kTempusZero, u, &result, 1);
        return result;
    }
    bool const past = u > range.max || (u == range.max && state.retimingExtrapolation);
    if (past && !closed) {
        spline.extrapolate(valid.empty() ? nullptr : valid.back(), kTempusZero, u, &result, 0);
        return result;
    }
    bool atLast = false;
    for (std::size_t i = 0; i < all.size() && !past && !atLast; ++i) {
        KFVertex* const w = all[i];
        if (w->getValueU() < u || !w->isEnabled(kTempusZero)) {
            continue;
        }
        if (w->getValueU() == u) {
            if (!isWholeCurveType(all[i == 0 ? 0 : i - 1]->getInterpolation())) {
                return w->getValueV(kTempusZero);
            }
            if (i + 1 < all.size()) {
                return draw(spline, w, all[i + 1], w->getValueU(), false);
            }
            atLast = true;
        } else if (KFVertex* const p = i == 0 ? nullptr : validBefore(valid, w); p != nullptr) {
            return draw(spline, p, w, u, false);
        }
    }
    if (valid.empty()) {
        return result;
    }
    if (closed) {
        return draw(spline, valid.back(), valid.front(), u, false);
    }
    return isWholeCurveType(valid.back()->getInterpolation())
               ? draw(spline, valid.back(), valid.back(), u, false)
               : result;
}

double walkedSlope(KFSpline& spline, Tempus const& u) {
    auto const all = museumVertices(spline);
    auto const valid = enabledOf(all);
    Range const range(spline, valid);
    if (all.empty() || u < range.min || u > range.max) {
        return 0.0;
    }
    for (std::size_t i = 1; i < all.size(); ++i) {
        if (all[i]->getValueU() < u || !all[i]->isEnabled(kTempusZero)) {
            continue;
        }
        if (KFVertex* const p = validBefore(valid, all[i]); p != nullptr) {
            return draw(spline, p, all[i], u, true);
        }
    }
    return 0.0;
}

bool isCubicType(std::uint32_t type) { return type == 4 || type == 6 || type == 77; }

std::vector<Segment> segmentsOf(KFSpline& spline) {
    std::vector<Segment> segments;
    auto const valid = enabledOf(museumVertices(spline));
    for (std::size_t i = 1; i < valid.size(); ++i) {
        if (valid[i - 1]->getValueU() < valid[i]->getValueU()) {
            segments.push_back({valid[i - 1], valid[i]});
        }
    }
    return segments;
}

long double distanceInSeconds(Tempus const& a, Tempus const& b) {
    TempusDetail::Wide const left = TempusDetail::Wide{a.value} * b.timescale;
    TempusDetail::Wide const right = TempusDetail::Wide{b.value} * a.timescale;
    return static_cast<long double>(right - left) /
           (static_cast<long double>(a.timescale) * static_cast<long double>(b.timescale));
}

// --- Segments of simple shapes ---

namespace {

/// The way after the fraction `p` of a motion that gets to its speed within `in` and stops within `out`,
/// evenly.
long double easedFraction(long double p, long double in, long double out) {
    long double const speed = 2.0L / (2.0L - in - out);
    if (p < in)
        return speed * p * p / (2.0L * in);
    if (p > 1.0L - out)
        return 1.0L - speed * (1.0L - p) * (1.0L - p) / (2.0L * out);
    return speed * (p - in / 2.0L);
}

} // namespace

long double longShape(KFVertex const& vertexA, KFVertex const& vertexB, long double p) {
    long double const pi = std::acos(-1.0L);
    long double const a = vertexA.getValueV(kTempusZero);
    long double const b = vertexB.getValueV(kTempusZero);
    long double const d = b - a;
    long double const ramp = 2.0L - vertexA.getBias(kTempusZero);
    long double const decades = std::log(10000.0L);
    long double const growth = std::log(std::fabs(d)) + decades;
    switch (vertexA.getInterpolation()) {
    case 0:
        return a;
    case 7:
        return a + d * (1.0L - std::cos(pi * p / 2.0L));
    case 8:
        return a + d * std::sin(pi * p / 2.0L);
    case 13:
        return d == 0.0L        ? a
               : growth == 0.0L ? a + d * p
                                : a + d * (std::expm1(growth * p) / std::expm1(growth));
    case 14:
        return a + d * std::log(999.0L * p + 1.0L) / std::log(1000.0L);
    case 15:
        return a + d * easedFraction(p, ramp / 4.0L, ramp / 4.0L);
    case 16:
        return a + d * easedFraction(p, ramp / 2.0L, 0.0L);
    case 17:
        return a + d * easedFraction(p, 0.0L, ramp / 2.0L);
    case 19:
        return a + d * (a >= b ? 1.0L - std::cos(pi * p / 2.0L) : std::sin(pi * p / 2.0L));
    case 20:
        return a + d * (a >= b ? std::sin(pi * p / 2.0L) : 1.0L - std::cos(pi * p / 2.0L));
    case 21:
        return a + d * (1.0L - std::cos(pi * p)) / 2.0L;
    default:
        return a + d * p;
    }
}

double longShapeTolerance(KFVertex const& a, KFVertex const& b) {
    double const size = std::fabs(a.getValueV(kTempusZero)) + std::fabs(b.getValueV(kTempusZero));
    // Three have sines of single precision.
    bool const single = a.getInterpolation() >= 19 && a.getInterpolation() <= 21;
    return size * (single ? 5e-7 : 2e-14);
}

// --- Cubic segments ---

namespace {

/// A few roundings of a double.
constexpr long double kRoundings = 16.0L * std::numeric_limits<double>::epsilon();

long double valueOf(KFVertex const* vertex) { return vertex->getValueV(kTempusZero); }

/// The handles of a segment, as offsets from its ends.
struct Handles {
    long double outU, outV, inU, inV;
};

Handles handlesFromTangents(KFSpline& spline, Segment const& segment) {
    long double const factor = spline.getState()->parametric ? 1.0L : 12.0L;
    double outU = 0.0, outV = 0.0, inU = 0.0, inV = 0.0;
    segment.a->getOutputTangents(&outU, &outV, kTempusZero);
    segment.b->getInputTangents(&inU, &inV, kTempusZero);
    return {factor * outU, factor * outV, factor * inU, factor * inV};
}

/// A sixth of the way between the neighbours on either side. Where there is none, the curve ends level, or, closed,
/// goes on a small step away at the other end.
Handles handlesFromNeighbours(KFSpline& spline, Segment const& segment) {
    long double const sixth = 0.3333333333333333 * 0.5L;
    long double const span = distanceInSeconds(segment.a->getValueU(), segment.b->getValueU());
    long double const step = distanceInSeconds(kTempusZero, spline.getSmallDeltaU());
    auto const valid = enabledOf(museumVertices(spline));
    auto const a = std::find(valid.begin(), valid.end(), segment.a);
    auto const b = std::find(valid.begin(), valid.end(), segment.b);
    long double out[2] = {2.0L * span, 0.0L};
    long double in[2] = {2.0L * span, 0.0L};
    if (a != valid.begin()) {
        out[0] = distanceInSeconds((*(a - 1))->getValueU(), segment.b->getValueU());
        out[1] = valueOf(segment.b) - valueOf(*(a - 1));
    } else if (spline.isClosed()) {
        out[0] = span + step;
        out[1] = valueOf(segment.b) - valueOf(valid.back());
    }
    if (b + 1 != valid.end()) {
        in[0] = distanceInSeconds(segment.a->getValueU(), (*(b + 1))->getValueU());
        in[1] = valueOf(*(b + 1)) - valueOf(segment.a);
    } else if (spline.isClosed()) {
        in[0] = span + step;
        in[1] = valueOf(valid.front()) - valueOf(segment.a);
    }
    return {sixth * out[0], sixth * out[1], -sixth * in[0], -sixth * in[1]};
}

} // namespace

long double casteljau(double const* p, long double t) {
    long double level[4] = {p[0], p[1], p[2], p[3]};
    for (int n = 3; n > 0; --n) {
        for (int i = 0; i < n; ++i) {
            level[i] += t * (level[i + 1] - level[i]);
        }
    }
    return level[0];
}

LongCubic::LongCubic(KFSpline& spline, Segment const& segment)
    : _parametric(spline.getState()->parametric), _start(segment.a->getValueU()),
      _span(distanceInSeconds(_start, segment.b->getValueU())) {
    Handles const handles = segment.a->getInterpolation() == 6 ? handlesFromNeighbours(spline, segment)
                                                               : handlesFromTangents(spline, segment);
    double const v[4] = {
        segment.a->getValueV(kTempusZero), static_cast<double>(valueOf(segment.a) + handles.outV),
        static_cast<double>(valueOf(segment.b) + handles.inV), segment.b->getValueV(kTempusZero)};
    double const u[4] = {0.0, static_cast<double>(handles.outU / _span),
                         static_cast<double>(1.0L + handles.inU / _span), 1.0};
    std::copy(u, u + 4, _u);
    std::copy(v, v + 4, _v);
    if (!_parametric) {
        KFBezierSanitizeControlPolygon(_u, _v); // which is tested by itself
    }
}

/// The parameter in 0 to 1 at which U reaches the fraction, by bisection.
long double LongCubic::parameterAt(long double fraction) const {
    long double low = 0.0L;
    long double high = 1.0L;
    for (int i = 0; i < 80; ++i) {
        long double const middle = (low + high) / 2.0L;
        (curveU(middle) < fraction ? low : high) = middle;
    }
    return low;
}

/// A leading coefficient of U below 1e-7 counts as none: that is part of the rule, not of the rounding.
long double LongCubic::curveU(long double t) const {
    long double const u1 = _u[1];
    long double const u2 = _u[2];
    long double const leading = 1.0L + 3.0L * (u1 - u2);
    return 3.0L * u1 * t + 3.0L * (u2 - 2.0L * u1) * t * t +
           (std::fabs(leading) < 1e-7L ? 0.0L : leading * t * t * t);
}

LongCubic::Bounds LongCubic::at(Tempus const& u) const {
    long double const shortest = 9.999999747378752e-06L;
    long double const fraction =
        distanceInSeconds(_start, u) / std::max(_span, _parametric ? 0.0L : shortest);
    long double const slack = kRoundings * (2.0L + 9.0L * (std::fabs(_u[1]) + std::fabs(_u[2])));
    long double from = fraction - kRoundings;
    long double to = fraction + kRoundings;
    if (!_parametric) {
        from = parameterAt(std::max(0.0L, fraction - slack));
        to = parameterAt(std::min(1.0L, fraction + slack));
    }
    long double low = std::numeric_limits<long double>::infinity();
    long double high = -low;
    for (int i = 0; i <= 16; ++i) {
        long double const value = casteljau(_v, from + (to - from) * static_cast<long double>(i) / 16.0L);
        low = std::min(low, value);
        high = std::max(high, value);
    }
    long double size = 0.0L;
    for (double const v : _v) {
        size = std::max<long double>(size, std::fabs(v));
    }
    long double const rounding = kRoundings * size + std::numeric_limits<double>::denorm_min();
    return {static_cast<double>(low - rounding), static_cast<double>(high + rounding)};
}
