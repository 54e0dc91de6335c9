// Internal: not installed.
#pragma once

#include "lumenkey/splines/KFSegmentCache.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFVertexStore.h"

inline KFCustomInterpolator* KFSpline::customInterpolator() const noexcept {
    KFSplineOwner const* const node = getNode();
    return node == nullptr ? nullptr : node->_customInterpolator.load(std::memory_order_acquire);
}

/// A segment that was prepared while the index served still stands, and the index still serves.
[[gnu::always_inline]] inline bool KFSpline::segmentStands(KFSegmentCache const& cache) const noexcept {
    KFSplineState const& state = *getState();
    return cache.kind != KFSegmentCache::Kind::None && cache.version == _store->version() &&
           cache.parametric == state.parametric && cache.sanitizeBezier == state.sanitizeBezier &&
           cache.defaultType == state.interpolation && customInterpolator() == nullptr &&
           cache.readingsStand();
}
