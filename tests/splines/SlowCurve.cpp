#include "tests/splines/SlowCurve.h"

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

// --- Cubic segments ---

namespace {

/// A few roundings of a double.
constexpr long double kRoundings = 16.0L * std::numeric_limits<double>::epsilon();

/// b - a in seconds, from whole numbers.
long double distance(Tempus const& a, Tempus const& b) {
    TempusDetail::Wide const left = TempusDetail::Wide{a.value} * b.timescale;
    TempusDetail::Wide const right = TempusDetail::Wide{b.value} * a.timescale;
    return static_cast<long double>(right - left) /
           (static_cast<long double>(a.timescale) * static_cast<long double>(b.timescale));
}

long double casteljau(long double const* p, long double t) {
    long double level[4] = {p[0], p[1], p[2], p[3]};
    for (int n = 3; n > 0; --n) {
        for (int i = 0; i < n; ++i) {
            level[i] += t * (level[i + 1] - level[i]);
        }
    }
    return level[0];
}

} // namespace

LongCubic::LongCubic(KFSpline& spline, Segment const& segment)
    : _parametric(spline.getState()->parametric), _start(segment.a->getValueU()),
      _end(segment.b->getValueU()), _u{0.0L, 0.0L, 1.0L, 1.0L} {
    _v[0] = segment.a->getValueV(kTempusZero);
    _v[3] = segment.b->getValueV(kTempusZero);
    if (segment.a->getInterpolation() == 6) {
        readNeighbours(spline, segment);
    } else {
        readTangents(spline, segment);
    }
    if (!_parametric && spline.getState()->sanitizeBezier) {
        sanitize();
    }
    _c1 = 3.0L * (_u[1] - _u[0]);
    _c2 = 3.0L * (_u[0] - 2.0L * _u[1] + _u[2]);
    _c3 = _u[3] - _u[0] + 3.0L * (_u[1] - _u[2]);
    // Part of the rule, not of the rounding.
    if (std::fabs(_c3) < 1e-7L) {
        _c3 = 0.0L;
    }
}

void LongCubic::readTangents(KFSpline& spline, Segment const& segment) {
    long double const factor = spline.getState()->parametric ? 1.0L : 12.0L;
    long double const span = distance(_start, _end);
    double x = 0.0;
    double y = 0.0;
    segment.a->getOutputTangents(&x, &y, kTempusZero);
    _u[1] = factor * x / span;
    _v[1] = _v[0] + factor * y;
    segment.b->getInputTangents(&x, &y, kTempusZero);
    _u[2] = 1.0L + factor * x / span;
    _v[2] = _v[3] + factor * y;
}

/// A sixth of the way between the neighbours on either side. Where there is none, the curve ends level, or, closed,
/// goes on a small step away at the other end.
void LongCubic::readNeighbours(KFSpline& spline, Segment const& segment) {
    long double const sixth = 0.3333333333333333 * 0.5L;
    long double const span = distance(_start, _end);
    long double const step = distance(kTempusZero, spline.getSmallDeltaU());
    auto const valid = enabledOf(museumVertices(spline));
    auto const a = std::find(valid.begin(), valid.end(), segment.a);
    auto const b = std::find(valid.begin(), valid.end(), segment.b);
    auto const value = [](KFVertex const* vertex) {
        return static_cast<long double>(vertex->getValueV(kTempusZero));
    };

    long double reach = 2.0L * span;
    long double rise = 0.0L;
    if (a != valid.begin()) {
        reach = distance((*(a - 1))->getValueU(), _end);
        rise = _v[3] - value(*(a - 1));
    } else if (spline.isClosed()) {
        reach = span + step;
        rise = _v[3] - value(valid.back());
    }
    _u[1] = sixth * reach / span;
    _v[1] = _v[0] + sixth * rise;

    reach = 2.0L * span;
    rise = 0.0L;
    if (b + 1 != valid.end()) {
        reach = distance(_start, (*(b + 1))->getValueU());
        rise = value(*(b + 1)) - _v[0];
    } else if (spline.isClosed()) {
        reach = span + step;
        rise = value(valid.front()) - _v[0];
    }
    _u[2] = 1.0L - sixth * reach / span;
    _v[2] = _v[3] - sixth * rise;
}

/// U turns back when its slope has two zeros inside. The handles that just don't let it, in the same proportion, give
/// the slope a double zero at s, with s^2 : (1 - s)^2 as d1 : d2.
void LongCubic::sanitize() {
    long double const d1 = _u[1];
    long double const d2 = 1.0L - _u[2];
    long double const a = 3.0L * (d1 + d2) - 2.0L; // slope / 3 = a x^2 + b x + d1
    long double const b = 2.0L * (_u[2] - 2.0L * d1);
    if (!(a > 0.0L) || !(-b >= 0.0L && -b <= 2.0L * a) || !(b * b - 4.0L * a * d1 > 0.0L)) {
        return;
    }
    long double const s = std::sqrt(d1) / (std::sqrt(d1) + std::sqrt(d2));
    long double const shape = 1.0L - 3.0L * s + 3.0L * s * s;
    long double const reach1 = s * s / shape;
    long double const reach2 = (1.0L - s) * (1.0L - s) / shape;
    long double const shortening = d2 <= d1 ? reach1 / d1 : reach2 / d2;
    _u[1] = reach1;
    _u[2] = 1.0L - reach2;
    _v[1] = _v[0] + (_v[1] - _v[0]) * shortening;
    _v[2] = _v[3] + (_v[2] - _v[3]) * shortening;
}

long double LongCubic::curveU(long double parameter) const {
    return ((_c3 * parameter + _c2) * parameter + _c1) * parameter;
}

bool LongCubic::folds() const {
    if (_parametric) {
        return false;
    }
    for (int i = 0; i <= 1000; ++i) {
        long double const x = static_cast<long double>(i) / 1000.0L;
        if ((3.0L * _c3 * x + 2.0L * _c2) * x + _c1 < -1e-12L) {
            return true;
        }
    }
    return false;
}

bool LongCubic::isAtTurn(Tempus const& u) const {
    long double const root = std::sqrt(std::max(0.0L, _c2 * _c2 - 3.0L * _c3 * _c1));
    for (long double const turn : {(-_c2 - root) / (3.0L * _c3), (-_c2 + root) / (3.0L * _c3)}) {
        if (std::fabs(curveU(turn) - fractionOf(u)) < 1e-7L) {
            return true;
        }
    }
    return false;
}

long double LongCubic::fractionOf(Tempus const& u) const {
    long double const shortest = 9.999999747378752e-06L;
    return distance(_start, u) / std::max(distance(_start, _end), _parametric ? 0.0L : shortest);
}

/// The last parameter in 0 to 1 at which U reaches the fraction: from the end, the first step that crosses it, halved.
long double LongCubic::parameterAt(long double fraction) const {
    int const steps = folds() ? 4096 : 1;
    long double low = 0.0L;
    long double high = 1.0L;
    for (int i = steps; i > 0; --i) {
        low = static_cast<long double>(i - 1) / steps;
        high = static_cast<long double>(i) / steps;
        if ((curveU(low) < fraction) != (curveU(high) < fraction)) {
            break;
        }
    }
    bool const rises = curveU(low) < curveU(high);
    for (int i = 0; i < 80; ++i) {
        long double const middle = (low + high) / 2.0L;
        ((curveU(middle) < fraction) == rises ? low : high) = middle;
    }
    return low;
}

LongCubic::Bounds LongCubic::at(Tempus const& u) const {
    long double const fraction = fractionOf(u);
    long double const slack = kRoundings * (1.0L + std::fabs(_c1) + std::fabs(_c2) + std::fabs(_c3));
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
    for (long double const v : _v) {
        size = std::max(size, std::fabs(v));
    }
    long double const rounding = kRoundings * size + std::numeric_limits<double>::denorm_min();
    return {static_cast<double>(low - rounding), static_cast<double>(high + rounding)};
}
