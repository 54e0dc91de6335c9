// The value and the slope of a spline at a position.
//
// Two paths give the same answers. The walk (`evaluateByWalk`, `getDerivativeValue`) tells the rules: it asks each
// vertex, each interpolator and the extrapolation by their virtual operations, whatever they are. The index
// (`evaluateIndexed`) serves what nearly all splines are, static vertices whose list of valid ones is current and
// whose positions have a common timescale: it finds the segment by comparing whole numbers and draws it with the same
// pure functions as the interpolators. What it can't serve (extrapolation, the segment that closes a spline, a
// whole-curve type, a custom interpolator) it leaves to the walk.

#include "lumenkey/splines/KFBezierUtil.h"
#include "lumenkey/splines/KFSegmentCache.h"
#include "lumenkey/splines/KFShapes.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineIndex.h"
#include "lumenkey/splines/KFSplineInterpolator.h"
#include "lumenkey/splines/KFSplineOwner.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "lumenkey/splines/KFTangent.h"
#include "lumenkey/splines/KFThreadSegments.h"
#include "lumenkey/splines/KFVertexStore.h"

namespace {

/// Whole numbers below it are doubles, so that a fraction of two of them is rounded once, whatever the scale.
constexpr std::int64_t kExactInDouble = std::int64_t{1} << 53;

KFVertex& vertexOf(void* handle) noexcept { return *static_cast<KFVertex*>(handle); }

} // namespace

double KFSpline::initialValue() const {
    KFSplineOwner const* const node = getNode();
    return node == nullptr ? 0.0 : node->getInitialValue();
}

void KFSpline::interpolate(Tempus const& t, void* vA, void* vB, Tempus const& u, double* out,
                           bool derivative) {
    KFInterpolator* strategy = customInterpolator();
    if (strategy == nullptr || !static_cast<KFCustomInterpolator*>(strategy)->isActive(*this, vA)) {
        strategy = getInterpolator(vertexOf(vA).getInterpolation());
        if (strategy->needInit(*this))
            strategy->init(*this, t);
    }
    *out = strategy->interpolate(*this, t, vA, vB, u, getState()->parametric, derivative);
}

// The functions that reading a point spends its time in are flattened: their calls cost as much as what they call.

/// One position after another in one segment is what happens most: the thread has all that it needs. All else is called
/// last, so that this has no register to save.
[[gnu::flatten]] double KFSpline::getVertexValue(Tempus const& u, Tempus const& t, bool lock) {
    std::uint64_t const version = _store->acquiredVersion();
    KFSegmentPlace* const place = KFThreadSegments::placeOf(version);
    if (place == nullptr) [[unlikely]]
        return readFirst(u, t, lock, version);
    KFSegmentCache const& segment = place->current();
    std::int64_t position = 0;
    if (segment.scale.stepsOf(u, &position)) [[likely]] {
        if (!segment.holds(position)) {
            if (place->keepsSeveral(version))
                return readAround(u, t, lock, position, *place);
        } else if (segmentStandsWithoutLock(segment, version)) [[likely]] {
            return segment.valueAt(position);
        }
    }
    return lock ? readUnderLock(u, t, place) : readWithoutLock(u, t, place);
}

[[gnu::noinline]] double KFSpline::readFirst(Tempus const& u, Tempus const& t, bool lock,
                                             std::uint64_t version) {
    KFSegmentPlace* const place = KFThreadSegments::makePlaceOf(version);
    return lock ? readUnderLock(u, t, place) : readWithoutLock(u, t, place);
}

/// From another segment that the thread keeps of the spline; `position` is by the scale of the current one.
[[gnu::noinline, gnu::flatten]] double KFSpline::readAround(Tempus const& u, Tempus const& t, bool lock,
                                                            std::int64_t position, KFSegmentPlace& place) {
    std::uint64_t const version = _store->acquiredVersion();
    KFSegmentCache const& segment = place.around(u, position, version);
    if (segment.scale.stepsOf(u, &position) && segment.holds(position) &&
        segmentStandsWithoutLock(segment, version)) [[likely]] {
        return segment.valueAt(position);
    }
    return lock ? readUnderLock(u, t, &place) : readWithoutLock(u, t, &place);
}

[[gnu::noinline]] double KFSpline::readUnderLock(Tempus const& u, Tempus const& t, KFSegmentPlace* place) {
    double value = 0.0;
    bool wholeCurve = false;
    BXSpinLock& held = guard();
    held.lock();
    if (!evaluateAndKeep(u, place, *_segment, &value)) {
        wholeCurve = drawsWholeCurve();
        if (!wholeCurve)
            value = evaluateByWalk(u, t);
    }
    held.unlock();
    return wholeCurve ? valueOfWholeCurve(u, t, true) : value;
}

[[gnu::noinline]] double KFSpline::readWithoutLock(Tempus const& u, Tempus const& t, KFSegmentPlace* place) {
    KFSegmentCache own;
    double value = 0.0;
    if (evaluateAndKeep(u, place, own, &value))
        return value;
    return drawsWholeCurve() ? valueOfWholeCurve(u, t, false) : evaluateByWalk(u, t);
}

/// Evaluates with a segment that the thread keeps for this spline, or with `instead` while it has no place for one.
[[gnu::always_inline]] inline bool KFSpline::evaluateAndKeep(Tempus const& u, KFSegmentPlace* place,
                                                             KFSegmentCache& instead, double* out) {
    KFVertexStore const& store = *_store;
    std::uint64_t const version = store.version();
    bool const keepsAll = KFSegmentPlace::keepsAll(store.size());
    KFSegmentCache* kept = nullptr;
    if (place != nullptr)
        kept = keepsAll ? place->claimFor(u, version) : place->claim(version);
    if (kept == nullptr)
        return evaluateIndexed(u, instead, out);
    bool const done = evaluateIndexed(u, *kept, out);
    // One of an earlier version names vertices that may be gone.
    if (kept->version == version)
        kept->watch();
    if (keepsAll)
        place->keep(*kept, u);
    return done;
}

/// The whole spline is one function of its vertices. Only on a parametric spline whose vertices agree does the
/// sampling of a segment draw it so; elsewhere it would come back here.
bool KFSpline::drawsWholeCurve() {
    KFSplineState const& state = *getState();
    if (!isWholeCurve(state.interpolation) || !state.parametric)
        return false;
    if (_staticVertices && !_store->empty() && !isWholeCurve(_store->front()->getInterpolation()))
        return false;
    std::uint32_t type = 0;
    getInterpolation(&type, nullptr, nullptr);
    return isWholeCurve(type);
}

double KFSpline::valueOfWholeCurve(Tempus const& u, Tempus const& t, bool lock) {
    double value = initialValue();
    std::uint32_t count = 1;
    sampleSplineSegment(u, TempusMake(1, 1), count, nullptr, &value, t, lock);
    return value;
}

// --- The walk ---

double KFSpline::evaluateByWalk(Tempus const& u, Tempus const& t) {
    double result = initialValue();
    void* end = nullptr;
    if (!_closed && TempusCompare(u, getMinValueU(kTempusZero, false)) < 0) {
        if (getFirstValidVertex(&end, t))
            extrapolate(end, t, u, &result, 1);
        return result;
    }
    int const order = TempusCompare(u, getMaxValueU(kTempusZero, false));
    bool const past = order > 0 || (order == 0 && getState()->retimingExtrapolation);
    if (past && !_closed) {
        if (getLastValidVertex(&end, t))
            extrapolate(end, t, u, &result, 0);
        return result;
    }
    if (!past && evaluateBetween(u, t, &result))
        return result;

    if (!getLastValidVertex(&end, t))
        return result;
    if (_closed) {
        void* first = nullptr;
        if (getFirstValidVertex(&first, t))
            interpolate(t, end, first, u, &result, false);
    } else if (isWholeCurve(vertexOf(end).getInterpolation())) {
        interpolate(t, end, end, u, &result, false);
    }
    return result;
}

/// The first enabled vertex at `u`, or the segment that ends at the first one after it. Vertices before `u` decide
/// nothing, so the walk starts behind them.
bool KFSpline::evaluateBetween(Tempus const& u, Tempus const& t, double* result) {
    KFVertexStore const& store = *_store;
    for (auto place = store.lowerBound(u); place != store.end(); place = store.next(place)) {
        KFVertex& vertex = *store.at(place);
        if (!vertex.isEnabled(t))
            continue;
        if (TempusCompare(vertex.getValueU(), u) == 0) {
            KFVertex const& before = place == store.begin() ? vertex : *store.at(store.previous(place));
            auto const next = store.next(place);
            if (!isWholeCurve(before.getInterpolation())) {
                *result = vertex.getValueV(t);
            } else if (next != store.end()) {
                interpolate(t, &vertex, store.at(next), vertex.getValueU(), result, false);
            } else {
                return false;
            }
            return true;
        }
        void* previous = nullptr;
        if (getPreviousValidVertex(place, &previous, t)) {
            interpolate(t, previous, &vertex, u, result, false);
            return true;
        }
    }
    return false;
}

double KFSpline::getDerivativeValue(Tempus const& u, Tempus const& t, bool lock) {
    KFSplineAccess const access(*this, lock);
    KFVertexStore const& store = *_store;
    if (store.empty() || TempusCompare(u, getMinValueU(kTempusZero, false)) < 0 ||
        TempusCompare(u, getMaxValueU(kTempusZero, false)) > 0) {
        return 0.0;
    }
    double result = 0.0;
    for (auto place = store.lowerBound(u); place != store.end(); place = store.next(place)) {
        void* previous = nullptr;
        if (!store.at(place)->isEnabled(t) || !getPreviousValidVertex(place, &previous, t))
            continue;
        interpolate(t, previous, store.at(place), u, &result, true);
        break;
    }
    return result;
}

// --- The index ---

/// Whether the index may answer at all: what it draws depends on the index, the vertices and the settings alone.
bool KFSpline::indexServes() const noexcept {
    KFVertexStore const& store = *_store;
    if (!_staticVertices || !listAnswers() || !store.hasTicks() || store.validCount() < 2)
        return false;
    if (customInterpolator() != nullptr || isWholeCurve(getState()->interpolation))
        return false;
    return !isWholeCurve(store.firstValid()->KFVertex::getInterpolation()) &&
           !isWholeCurve(store.lastValid()->KFVertex::getInterpolation());
}

/// Whether it did when the cache was prepared, and nothing that decides it has changed since.
[[gnu::always_inline]] inline bool KFSpline::indexStillServes(KFSegmentCache const& cache) const noexcept {
    return cache.version == _store->version() && settingsStand(cache) && customInterpolator() == nullptr &&
           cache.wholeCurveChanges == KFStaticVertex::getWholeCurveChanges();
}

bool KFSpline::evaluateIndexed(Tempus const& u, KFSegmentCache& cache, double* out) {
    // Read before what it tells of: a change that comes in between leaves a cache that doesn't stand.
    std::uint64_t const watchedChanges = KFStaticVertex::getWatchedChanges();
    std::int64_t position = 0;
    if (cache.scale.stepsOf(u, &position) && indexStillServes(cache)) {
        cache.watchedChanges = watchedChanges;
        if (cache.holds(position) && segmentStands(cache)) {
            *out = cache.valueAt(position);
            return true;
        }
        return evaluateAtVertexOrMove(position, cache, out);
    }
    if (!TempusIsNumeric(u) || u.epoch != 0)
        return false;
    cache.watchedChanges = watchedChanges;
    cache.wholeCurveChanges = KFStaticVertex::getWholeCurveChanges();
    if (!indexServes()) {
        cache.forget();
        return false;
    }
    std::int64_t const tickScale = _store->tickScale();
    if (cache.scale.tickScale != tickScale || cache.scale.timescale != u.timescale) {
        cache.kind = KFSegmentCache::Kind::None;
        if (!cache.scale.prepare(tickScale, u.timescale))
            return false;
    }
    return !__builtin_mul_overflow(u.value, cache.scale.perUnit, &position) &&
           evaluateAtVertexOrMove(position, cache, out);
}

/// A vertex exactly at `position` gives its own value; else the cache moves to the segment around it. False outside
/// the valid vertices, and where the walk must decide.
[[gnu::flatten]] bool KFSpline::evaluateAtVertexOrMove(std::int64_t position, KFSegmentCache& cache,
                                                       double* out) {
    KFVertexStore const& store = *_store;
    auto const end = placeAtOrAfter(position, cache);
    if (end == store.end())
        return false;
    std::int64_t high = 0;
    if (__builtin_mul_overflow(store.tickAt(end), cache.scale.perTick, &high))
        return false;
    if (high == position)
        return valueAtVertex(end, out);

    auto const start = store.validBefore(end);
    std::int64_t low = 0;
    if (start == store.end() || __builtin_mul_overflow(store.tickAt(start), cache.scale.perTick, &low))
        return false;
    if (!prepareSegment(start, end, low, high, cache))
        return false;
    *out = cache.valueAt(position);
    return true;
}

/// The first valid place at or after `position`. At ascending positions it is the end of the same or the next segment.
[[gnu::always_inline]] inline KFVertexIterator
KFSpline::placeAtOrAfter(std::int64_t position, KFSegmentCache const& cache) const noexcept {
    KFVertexStore const& store = *_store;
    std::int64_t const perTick = cache.scale.perTick;
    if (cache.kind != KFSegmentCache::Kind::None && cache.version == store.version() &&
        cache.low < position) {
        if (position <= cache.high)
            return cache.placeOfB;
        auto const next = store.validFrom(store.next(cache.placeOfB));
        std::int64_t high = 0;
        if (next == store.end())
            return next;
        if (!__builtin_mul_overflow(store.tickAt(next), perTick, &high) && position <= high)
            return next;
    }
    std::int64_t tick = position;
    if (perTick != 1) {
        tick = position / perTick;
        if (tick * perTick < position)
            tick += 1;
    }
    return store.validFrom(store.lowerBoundTick(tick));
}

/// The value of the vertex at a valid place, the first of those that share its position. False where the walk must
/// decide: behind a whole-curve type, and where a retimed continuation begins.
[[gnu::always_inline]] inline bool KFSpline::valueAtVertex(KFVertexIterator place, double* out) const {
    KFVertexStore const& store = *_store;
    KFVertex const& vertex = *store.at(place);
    KFVertex const& before = place == store.begin() ? vertex : *store.at(store.previous(place));
    if (isWholeCurve(before.KFVertex::getInterpolation()))
        return false;
    if (getState()->retimingExtrapolation &&
        TempusCompare(vertex.getValueU(), store.lastValid()->getValueU()) == 0) {
        return false;
    }
    *out = static_cast<KFStaticVertex const&>(vertex).getValueV(kTempusZero);
    return true;
}

/// Computes what the segment between two neighbouring valid vertices needs. False for one that the index doesn't draw.
[[gnu::always_inline]] inline bool KFSpline::prepareSegment(KFVertexIterator start, KFVertexIterator end,
                                                            std::int64_t low, std::int64_t high,
                                                            KFSegmentCache& cache) {
    cache.kind = KFSegmentCache::Kind::None;
    std::int64_t width = 0;
    if (__builtin_sub_overflow(high, low, &width) || width >= kExactInDouble || width <= 0)
        return false;

    KFVertexStore const& store = *_store;
    KFSplineState const& state = *getState();
    auto const& vertexA = static_cast<KFStaticVertex const&>(*store.at(start));
    auto const& vertexB = static_cast<KFStaticVertex const&>(*store.at(end));
    cache.version = store.version();
    cache.placeOfB = end;
    cache.low = low;
    cache.high = high;
    cache.width = static_cast<double>(width);
    cache.vertexA.take(&vertexA);
    cache.vertexB.take(&vertexB);
    cache.dependsOnNeighbours = false;
    cache.a = vertexA.getValueV(kTempusZero);
    cache.b = vertexB.getValueV(kTempusZero);
    cache.type = vertexA.KFVertex::getInterpolation();
    cache.parametric = state.parametric;
    cache.sanitizeBezier = state.sanitizeBezier;
    cache.defaultType = state.interpolation;
    if (isWholeCurve(cache.defaultType))
        return false;

    switch (cache.type) {
    case kKFInterpolationConstant:
        cache.kind = KFSegmentCache::Kind::Constant;
        return true;
    case kKFInterpolationLinear:
    case kKFInterpolationLinearToo:
        cache.kind = KFSegmentCache::Kind::Linear;
        return true;
    case kKFInterpolationBSpline:
    case kKFInterpolationXSpline:
        return false;
    case kKFInterpolationEaseIn:
    case kKFInterpolationEaseOut:
    case kKFInterpolationExponential:
    case kKFInterpolationLogarithmic:
    case kKFInterpolationConvex:
    case kKFInterpolationConcave:
    case kKFInterpolationSCurve:
        cache.kind = KFSegmentCache::Kind::Shape;
        return true;
    case kKFInterpolationEase:
    case kKFInterpolationAccelerate:
    case kKFInterpolationDecelerate:
        cache.easing = KFShape::easing(cache.type, vertexA.getBias(kTempusZero));
        cache.kind = KFSegmentCache::Kind::Eased;
        return true;
    case kKFInterpolationCatmullRom:
        return prepareCatmullRom(start, end, cache);
    default:
        return prepareBezier(cache);
    }
}

namespace {

void takeCubic(double const* polygonU, double const* polygonV, KFSegmentCache& cache) noexcept {
    cache.value = KFCubic::fromBezier(polygonV);
    if (cache.parametric) {
        cache.kind = KFSegmentCache::Kind::ParametricCubic;
    } else {
        cache.parameter.prepare(polygonU);
        cache.kind = KFSegmentCache::Kind::Cubic;
    }
}

} // namespace

/// The same steps as `KFBezierInterpolator::getControlPoints`, without a virtual call. Segments too short for their
/// fraction to be a ratio of positions are left to the walk.
[[gnu::always_inline]] inline bool KFSpline::prepareBezier(KFSegmentCache& cache) {
    double const span = cache.width / cache.scale.stepsPerSecond;
    if (!(span > KFShape::kShortestCurve))
        return false;
    double const factor = cache.parametric ? 1 : kKFHandlesPerTangent;
    double outU = 0.0;
    double outV = 0.0;
    double inU = 0.0;
    double inV = 0.0;
    cache.vertexA.vertex->getOutputTangents(&outU, &outV, kTempusZero);
    cache.vertexB.vertex->getInputTangents(&inU, &inV, kTempusZero);
    double polygonU[4] = {0.0, outU * factor / span, (span + inU * factor) / span, 1.0};
    double polygonV[4] = {cache.a, cache.a + outV * factor, cache.b + inV * factor, cache.b};
    // Control points inside the segment can't fold it.
    bool const inside = polygonU[1] >= 0.0 && polygonU[1] <= 1.0 && polygonU[2] >= 0.0 && polygonU[2] <= 1.0;
    if (!inside && !cache.parametric && cache.sanitizeBezier)
        KFBezierSanitizeControlPolygon(polygonU, polygonV);
    takeCubic(polygonU, polygonV, cache);
    return true;
}

[[gnu::noinline]] bool KFSpline::prepareCatmullRom(KFVertexIterator start, KFVertexIterator end,
                                                   KFSegmentCache& cache) {
    KFVertexStore const& store = *_store;
    double const span = cache.width / cache.scale.stepsPerSecond;
    if (!(span > KFShape::kShortestCurve))
        return false;
    // Where a neighbour is missing, the tangent depends on the far end of a closed spline or on nothing further.
    auto const before = store.validBefore(start);
    auto const after = store.validFrom(store.next(end));
    cache.beforeA.take(
        static_cast<KFStaticVertex const*>(before == store.end() ? store.lastValid() : store.at(before)));
    cache.afterB.take(
        static_cast<KFStaticVertex const*>(after == store.end() ? store.firstValid() : store.at(after)));
    cache.dependsOnNeighbours = true;
    Tempus startU;
    Tempus endU;
    double polygonU[4];
    double polygonV[4];
    static_cast<KFBezierInterpolator*>(getInterpolator(cache.type))
        ->getControlPoints(*this, store.at(start), store.at(end), kTempusZero, startU, endU, polygonU,
                           polygonV);
    takeCubic(polygonU, polygonV, cache);
    return true;
}
