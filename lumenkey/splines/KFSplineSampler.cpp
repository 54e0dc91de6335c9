#include "lumenkey/splines/KFSplineSampler.h"

#include "lumenkey/splines/KFShapes.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineIndex.h"
#include "lumenkey/splines/KFVertexStore.h"

#include <algorithm>
#include <limits>
#include <numeric>

// The loops over a run are compiled for the plain machine and for one with 256-bit vectors; the loader picks. Both
// round every operation alike, since neither fuses a product with a sum. The sanitizers can't start with such a
// choice in the library.
#if defined(__x86_64__) && defined(__GNUC__) && !defined(__clang__) && !defined(__SANITIZE_ADDRESS__) &&     \
    !defined(__SANITIZE_THREAD__)
#define LUMENKEY_FOR_EACH_MACHINE __attribute__((target_clones("default", "avx2")))
#else
#define LUMENKEY_FOR_EACH_MACHINE
#endif

namespace {

/// Positions of a row stay within this magnitude, so that sums of two don't overflow.
constexpr std::int64_t kLargestPosition = std::int64_t{1} << 61;

/// The distances of a run's samples from the start of their segment: whole numbers below 2^53, so exact.
struct Run {
    double first;
    double stride;
    double width;

    double distance(int k) const noexcept { return first + stride * k; }
};

LUMENKEY_FOR_EACH_MACHINE
void linearRun(Run const run, double const a, double const b, int const count, double* out) noexcept {
    for (int k = 0; k < count; ++k) {
        double const distance = run.distance(k);
        out[k] = KFShape::linear((run.width - distance) / run.width, distance / run.width, a, b);
    }
}

LUMENKEY_FOR_EACH_MACHINE
void polynomialRun(Run const run, KFCubic const value, int const count, double* out) noexcept {
    for (int k = 0; k < count; ++k)
        out[k] = value(run.distance(k) / run.width);
}

LUMENKEY_FOR_EACH_MACHINE
void twoStepRun(Run const run, KFCubicInverse const parameter, KFCubic const value, int const count,
                double* out) noexcept {
    for (int k = 0; k < count; ++k)
        out[k] = value(parameter.iterate<2>(run.distance(k) / run.width));
}

LUMENKEY_FOR_EACH_MACHINE
void threeStepRun(Run const run, KFCubicInverse const parameter, KFCubic const value, int const count,
                  double* out) noexcept {
    for (int k = 0; k < count; ++k)
        out[k] = value(parameter.iterate<3>(run.distance(k) / run.width));
}

void cubicRun(Run const& run, KFSegmentCache const& segment, int count, double* out) noexcept {
    switch (segment.parameter.method()) {
    case KFCubicInverse::Method::Identity:
        polynomialRun(run, segment.value, count, out);
        break;
    case KFCubicInverse::Method::TwoSteps:
        twoStepRun(run, segment.parameter, segment.value, count, out);
        break;
    case KFCubicInverse::Method::ThreeSteps:
        threeStepRun(run, segment.parameter, segment.value, count, out);
        break;
    case KFCubicInverse::Method::Search:
        for (int k = 0; k < count; ++k)
            out[k] = segment.value(segment.parameter(run.distance(k) / run.width));
        break;
    }
}

} // namespace

KFSplineSampler::KFSplineSampler(KFSpline& spline, Tempus const& start, Tempus const& step,
                                 std::uint32_t count, Tempus const& t, std::uint32_t first)
    : _spline(spline), _start(start), _step(step), _t(t), _first(first), _count(count) {}

/// Brings the row to one scale with the spline's positions; false when there is none.
bool KFSplineSampler::prepareRow() noexcept {
    std::uint32_t const changes = KFStaticVertex::getWholeCurveChanges();
    if (!_spline.indexServes())
        return false;
    _segment.wholeCurveChanges = changes;
    if (!TempusIsNumeric(_start) || !TempusIsNumeric(_step) || _start.epoch != 0 || _step.epoch != 0)
        return false;
    // Beyond that the positions themselves are rounded, one by one.
    std::int64_t const common = std::lcm(std::int64_t{_start.timescale}, std::int64_t{_step.timescale});
    if (common > std::numeric_limits<std::int32_t>::max())
        return false;
    if (!_segment.scale.prepare(_spline._store->tickScale(), static_cast<std::int32_t>(common)))
        return false;
    std::int64_t const perUnit = _segment.scale.perUnit;
    std::int64_t last = 0;
    if (__builtin_mul_overflow(_start.value, common / _start.timescale * perUnit, &_origin) ||
        __builtin_mul_overflow(_step.value, common / _step.timescale * perUnit, &_stride) ||
        __builtin_mul_overflow(_stride, std::int64_t{_first} + _count, &last)) {
        return false;
    }
    auto const isNear = [](std::int64_t position) {
        return position > -kLargestPosition && position < kLargestPosition;
    };
    if (!isNear(_origin) || !isNear(last))
        return false;
    _origin += _stride * std::int64_t{_first};
    return true;
}

void KFSplineSampler::values(double* out) {
    bool const indexed = prepareRow();
    for (std::uint32_t i = 0; i < _count;) {
        std::int64_t const at = _origin + _stride * std::int64_t{i};
        if (indexed && _spline.segmentStands(_segment) && _segment.holds(at)) {
            std::uint32_t const count = runLength(at, _count - i);
            run(at, count, out + i);
            i += count;
            continue;
        }
        if (!indexed || !_spline.evaluateAtVertexOrMove(at, _segment, out + i)) {
            out[i] = _spline.getVertexValue(position(i), _t, false);
        }
        i += 1;
    }
}

/// How many samples from `position` on lie strictly inside the segment that holds it.
std::uint32_t KFSplineSampler::runLength(std::int64_t position, std::uint32_t left) const noexcept {
    constexpr std::int64_t longest = std::numeric_limits<int>::max();
    std::int64_t const room = _stride > 0 ? _segment.high - 1 - position : position - _segment.low - 1;
    std::int64_t const fits = _stride == 0 ? longest : room / std::abs(_stride) + 1;
    return static_cast<std::uint32_t>(std::min({fits, std::int64_t{left}, longest}));
}

void KFSplineSampler::run(std::int64_t position, std::uint32_t count, double* out) const noexcept {
    Run const samples{static_cast<double>(position - _segment.low), static_cast<double>(_stride),
                      _segment.width};
    int const n = static_cast<int>(count);
    switch (_segment.kind) {
    case KFSegmentCache::Kind::Constant:
        std::fill_n(out, count, _segment.a);
        break;
    case KFSegmentCache::Kind::Linear:
        linearRun(samples, _segment.a, _segment.b, n, out);
        break;
    case KFSegmentCache::Kind::Cubic:
        cubicRun(samples, _segment, n, out);
        break;
    case KFSegmentCache::Kind::ParametricCubic:
        polynomialRun(samples, _segment.value, n, out);
        break;
    case KFSegmentCache::Kind::Eased:
        for (int k = 0; k < n; ++k) {
            out[k] =
                KFShape::eased(_segment.easing, samples.distance(k) / samples.width, _segment.a, _segment.b);
        }
        break;
    case KFSegmentCache::Kind::Shape:
    case KFSegmentCache::Kind::None:
        for (std::uint32_t k = 0; k < count; ++k)
            out[k] = _segment.valueAt(position + _stride * std::int64_t{k});
        break;
    }
}
