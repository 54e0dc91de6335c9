// How an open curve goes on outside its valid vertices.
//
// A position u outside lies q = distance / range cycles away, with range the length of the curve and distance taken
// from its start (after side) or back from it (before side). The cycle modes split q into whole cycles n and a
// rest, both exactly, and read the curve at the place that the rest names. `KFSpline::extrapolateAfter` and
// `KFSpline::extrapolateBefore` choose the mode; the functions above them compute one mode each.
//
// A mode reads the curve by `getVertexValue`, which extrapolates in turn what lies outside. Each position read is
// therefore limited to the valid range, with one exception on either side, neither of which can come back to where
// it started: the retimed ping-pong may read before the start, and the before side may read the end of a retimed
// curve, which already counts as outside.

#include "lumenkey/splines/KFSpline.h"

#include "lumenkey/foundation/BXMath.h"
#include "lumenkey/splines/KFVertex.h"

#include <cmath>
#include <limits>

namespace {

/// One reading outside the valid vertices. The range isn't empty.
struct Outside {
    KFSpline& spline;
    KFVertex& anchor;
    Tempus const& t;
    Tempus const& u;
    Tempus const& minU;
    Tempus const& maxU;
    Tempus range;

    Outside(KFSpline& splineIn, KFVertex& anchorIn, Tempus const& tIn, Tempus const& uIn,
            Tempus const& minUIn, Tempus const& maxUIn)
        : spline(splineIn), anchor(anchorIn), t(tIn), u(uIn), minU(minUIn), maxU(maxUIn),
          range(maxUIn - minUIn) {}

    double anchorValue() const { return anchor.getValueV(t); }
    Tempus limited(Tempus const& x) const { return BXMath::clamp(x, minU, maxU); }
    double valueAt(Tempus const& x) const { return spline.getVertexValue(x, t, false); }
};

/// Whole cycles, and what is left of the last one: 0 <= rest < range.
struct Cycles {
    std::int64_t count;
    Tempus rest;

    Cycles(Tempus const& distance, Tempus const& range)
        : count(TempusFloorQuotient(distance, range)), rest(TempusModulo(distance, range)) {}

    bool isReversed() const { return count % 2 != 0; }
};

/// The curve's value at x, limited to the range, for the after side. With retiming the end of the range would be
/// extrapolated once more, so it is answered here, as the anchor's value.
double valueInRange(Outside const& o, Tempus const& x) {
    Tempus const limited = o.limited(x);
    if (limited == o.maxU && o.spline.getState()->retimingExtrapolation) {
        return o.anchorValue();
    }
    return o.valueAt(limited);
}

/// The line through the anchor with a rise of `difference` over `distance`.
double valueOnLine(Outside const& o, double difference, Tempus const& distance) {
    double const seconds = TempusGetSeconds(distance);
    double slope = 0.0;
    if (seconds != 0.0) {
        slope = difference / seconds;
    } else if (difference != 0.0) {
        slope = std::copysign(static_cast<double>(std::numeric_limits<float>::max()), difference);
    }
    return TempusGetSeconds((o.u - o.anchor.getValueU()) * slope) + o.anchorValue();
}

// --- After the last vertex ---

double holdAfter(Outside const& o) {
    Tempus const step = o.spline.getStep();
    if (!o.spline.getState()->retimingExtrapolation || o.range < step) {
        return o.anchorValue();
    }
    return valueInRange(o, o.anchor.getValueU() - step);
}

double continueAfter(Outside const& o) {
    if (o.anchor.getInterpolation() == kKFInterpolationConstant) {
        return o.anchorValue();
    }
    Tempus const anchorU = o.anchor.getValueU();
    Tempus const x = o.limited(anchorU - o.spline.getSmallDeltaU());
    return valueOnLine(o, o.anchorValue() - valueInRange(o, x), anchorU - x);
}

/// Whether the mode before the start reads the end of the curve wherever it is asked.
bool beforeSideReadsEnd(Outside const& o) {
    switch (o.spline.getExtrapolation(1)) {
    case kKFExtrapolationLinear: {
        void* first = nullptr;
        return o.spline.getFirstValidVertex(&first, o.t) &&
               static_cast<KFVertex*>(first)->getValueU() + o.spline.getSmallDeltaU() >= o.maxU;
    }
    case kKFExtrapolationProgressiveRepeat:
        return true;
    default:
        return false;
    }
}

/// Ping-pong on the frame grid of a retimed clip: the last frame isn't shown twice at a turn. The range is at least
/// one step.
double pingPongOnFrames(Outside const& o, Tempus const& step) {
    Tempus w = kTempusZero;
    if (o.range != step) {
        Tempus const r = o.range - step;
        Tempus const m = BXMath::mod(o.u - o.maxU, r * 2.0);
        w = m >= r ? (m - r) + step : m + ((r - BX_TempusFloorToSampleDuration(m, step) * 2) - step);
    }
    Tempus const x = w + o.minU;
    // A range that is no multiple of the step leads up to a step before the start. In a range below two steps the
    // end of the curve leads there too; a before side that reads the end would then ask for it for ever.
    bool const wouldComeBack = o.range < step * 2 && beforeSideReadsEnd(o);
    return x < o.minU && !wouldComeBack ? o.valueAt(x) : valueInRange(o, x);
}

double pingPongAfter(Outside const& o) {
    if (o.spline.getState()->retimingExtrapolation) {
        Tempus const step = o.spline.getStep();
        if (o.range >= step) {
            return pingPongOnFrames(o, step);
        }
    }
    Cycles const cycles(o.u - o.minU, o.range);
    return valueInRange(o, cycles.isReversed() ? o.maxU - cycles.rest : o.minU + cycles.rest);
}

double repeatAfter(Outside const& o) { return valueInRange(o, o.minU + Cycles(o.u - o.minU, o.range).rest); }

double progressAfter(Outside const& o) {
    Cycles const cycles(o.u - o.minU, o.range);
    double const rise = o.anchorValue() - o.spline.getVertexValue(o.minU, kTempusZero, false);
    return rise * static_cast<double>(cycles.count) + valueInRange(o, o.minU + cycles.rest);
}

// --- Before the first vertex ---

/// Unlike the other side it follows a Constant vertex too: what is read stands just after it.
double continueBefore(Outside const& o) {
    Tempus const anchorU = o.anchor.getValueU();
    Tempus const x = o.limited(anchorU + o.spline.getSmallDeltaU());
    return valueOnLine(o, o.valueAt(x) - o.anchorValue(), x - anchorU);
}

double pingPongBefore(Outside const& o) {
    Cycles const cycles(o.minU - o.u, o.range);
    return o.valueAt(o.limited(cycles.isReversed() ? o.maxU - cycles.rest : o.minU + cycles.rest));
}

double repeatBefore(Outside const& o) {
    return o.valueAt(o.limited(o.maxU - Cycles(o.minU - o.u, o.range).rest));
}

/// The first cycle before the start is already a whole rise lower.
double progressBefore(Outside const& o) {
    Cycles const cycles(o.minU - o.u, o.range);
    double const endValue = o.spline.getVertexValue(o.maxU, kTempusZero, false);
    double const firstRise = endValue - o.anchor.getValueV(kTempusZero);
    double const rise = endValue - o.anchorValue();
    double const value = o.valueAt(o.limited(o.maxU - cycles.rest));
    return value - (firstRise + rise * static_cast<double>(cycles.count));
}

} // namespace

double KFSpline::extrapolateAfter(KFVertex& anchor, Tempus const& t, Tempus const& u, Tempus const& minU,
                                  Tempus const& maxU, double fallback) {
    Outside const outside(*this, anchor, t, u, minU, maxU);
    switch (getExtrapolation(0)) {
    case kKFExtrapolationConstant:
        return holdAfter(outside);
    case kKFExtrapolationLinear:
        return continueAfter(outside);
    case kKFExtrapolationPingPong:
        return pingPongAfter(outside);
    case kKFExtrapolationRepeat:
        return repeatAfter(outside);
    case kKFExtrapolationProgressiveRepeat:
        return progressAfter(outside);
    default:
        return fallback;
    }
}

double KFSpline::extrapolateBefore(KFVertex& anchor, Tempus const& t, Tempus const& u, Tempus const& minU,
                                   Tempus const& maxU, double fallback) {
    Outside const outside(*this, anchor, t, u, minU, maxU);
    switch (getExtrapolation(1)) {
    case kKFExtrapolationConstant:
        return outside.anchorValue();
    case kKFExtrapolationLinear:
        return continueBefore(outside);
    case kKFExtrapolationPingPong:
        return pingPongBefore(outside);
    case kKFExtrapolationRepeat:
        return repeatBefore(outside);
    case kKFExtrapolationProgressiveRepeat:
        return progressBefore(outside);
    default:
        return fallback;
    }
}

void KFSpline::extrapolate(void* anchor, Tempus const& t, Tempus const& u, double* out,
                           std::uint32_t before) {
    if (anchor == nullptr) {
        return;
    }
    KFVertex& vertex = *static_cast<KFVertex*>(anchor);
    Tempus const maxU = getMaxValueU(kTempusZero, false);
    Tempus const minU = getMinValueU(kTempusZero, false);
    // Less where vertices of different types disagree about the range.
    if (maxU <= minU) {
        *out = vertex.getValueV(t);
    } else if (before == 0) {
        *out = extrapolateAfter(vertex, t, u, minU, maxU, *out);
    } else {
        *out = extrapolateBefore(vertex, t, u, minU, maxU, *out);
    }
}
