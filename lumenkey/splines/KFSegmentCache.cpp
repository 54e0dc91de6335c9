#include "lumenkey/splines/KFSegmentCache.h"

#include <numeric>

bool KFStepScale::prepare(std::int64_t tickScaleIn, std::int32_t timescaleIn) noexcept {
    constexpr std::int64_t limit = std::int64_t{1} << 53;
    std::int64_t const units = timescaleIn;
    std::int64_t const common = tickScaleIn % units == 0 ? units : std::gcd(tickScaleIn, units);
    perTick = units / common;
    perUnit = tickScaleIn / common;
    std::int64_t steps = 0;
    bool const fits = !__builtin_mul_overflow(tickScaleIn, perTick, &steps) && steps < limit;
    tickScale = fits ? tickScaleIn : 0;
    timescale = fits ? timescaleIn : 0;
    stepsPerSecond = static_cast<double>(steps);
    return fits;
}

double KFSegmentCache::shapeAt(double p) const noexcept {
    if (kind == Kind::ParametricCubic)
        return value(p);
    if (kind == Kind::Cubic)
        return value(parameter(p));
    switch (type) {
    case kKFInterpolationEaseIn:
        return KFShape::easeIn(p, a, b);
    case kKFInterpolationEaseOut:
        return KFShape::easeOut(p, a, b);
    case kKFInterpolationExponential:
        return KFShape::exponential(p, a, b);
    case kKFInterpolationLogarithmic:
        return KFShape::logarithmic(p, a, b);
    case kKFInterpolationConvex:
        return KFShape::convex(p, a, b);
    case kKFInterpolationConcave:
        return KFShape::concave(p, a, b);
    case kKFInterpolationSCurve:
        return KFShape::sCurve(p, a, b);
    default:
        return a;
    }
}
