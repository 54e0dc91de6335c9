// Internal: not installed.
#pragma once

#include "lumenkey/splines/KFSegmentCache.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFVertexStore.h"

inline KFCustomInterpolator* KFSpline::customInterpolator() const noexcept {
    KFSplineOwner const* const node = getNode();
    return node == nullptr ? nullptr : node->_customInterpolator.load(std::memory_order_acquire);
}

/// While the list of valid vertices holds all enabled ones, at any time, it answers for them; else each is asked.
inline bool KFSpline::listAnswers() const noexcept {
    return _staticVertices && _useValidList && _store->validityIsCurrent();
}

[[gnu::always_inline]] inline bool KFSpline::settingsStand(KFSegmentCache const& cache) const noexcept {
    KFSplineState const& state = *getState();
    return cache.parametric == state.parametric && cache.sanitizeBezier == state.sanitizeBezier &&
           cache.defaultType == state.interpolation && _useValidList.load(std::memory_order_relaxed);
}

/// A segment that was prepared while the index served still stands, and the index still serves. Under the lock.
[[gnu::always_inline]] inline bool KFSpline::segmentStands(KFSegmentCache const& cache) const noexcept {
    return cache.kind != KFSegmentCache::Kind::None && cache.version == _store->version() &&
           settingsStand(cache) && customInterpolator() == nullptr && cache.readingsStand();
}

/// The same of a segment that the thread keeps; `version` is the store's, acquired.
[[gnu::always_inline]] inline bool KFSpline::segmentStandsWithoutLock(KFSegmentCache const& cache,
                                                                      std::uint64_t version) const noexcept {
    if (cache.version != version || cache.watchedChanges != KFStaticVertex::getWatchedChanges() ||
        !settingsStand(cache)) {
        return false;
    }
    KFSplineOwner const* const node = getNode();
    return node == nullptr || (node->_customLock.load(std::memory_order_acquire) == nullptr &&
                               node->_customInterpolator.load(std::memory_order_acquire) == nullptr);
}
