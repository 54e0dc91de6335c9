// The spline as an object: construction, copying, its lock, and the list of what is dirty.

#include "lumenkey/splines/KFSpline.h"

#include "lumenkey/splines/KFSegmentCache.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineOwner.h"
#include "lumenkey/splines/KFVertex.h"
#include "lumenkey/splines/KFVertexStore.h"

KFSpline::KFSpline(KFSplineState* state) : KFSpline(state, true) {}

KFSpline::KFSpline(KFSplineState* state, bool staticVertices)
    : _store(std::make_unique<KFVertexStore>()), _interpolators(std::make_unique<KFInterpolators>()),
      _state(state), _segment(std::make_unique<KFSegmentCache>()), _staticVertices(staticVertices) {}

KFSpline::KFSpline(KFSpline const& other, KFSplineState* state) : KFSpline(state) {
    KFSplineAccess const access(other);
    _staticVertices = other._staticVertices;
    _closed = other._closed;
    _interpolators = std::make_unique<KFInterpolators>(*other._interpolators);
    _useValidList = other._useValidList.load(std::memory_order_relaxed);
    _store->reserve(other._store->size());
    for (auto place = other._store->begin(); place != other._store->end();
         place = other._store->next(place)) {
        _store->append(other._store->at(place)->clone(), false);
    }
    publishVertexCount();
}

KFSpline& KFSpline::operator=(KFSpline const& other) {
    if (this == &other)
        return *this;
    KFSplineAccess const access(other);
    copy(const_cast<KFSpline&>(other), other.getFirstVertex(), other.getLastVertex());
    return *this;
}

KFSpline::~KFSpline() {
    KFSplineAccess const access(*this);
    _store->clear();
    _interpolators.reset();
}

void KFSpline::copy(KFSpline& other, void* first, void* last) {
    if (this == &other)
        return;
    _closed = other._closed;
    _store->clear();
    _staticVertices = other._staticVertices;
    _useValidList = other._useValidList.load(std::memory_order_relaxed);
    if (first != nullptr && last != nullptr && !other._store->empty()) {
        KFVertexStore const& source = *other._store;
        bool const suppressed = suppressesRefresh();
        for (auto place = source.find(static_cast<KFVertex*>(first)); place != source.end();
             place = source.next(place)) {
            _store->append(source.at(place)->clone(), suppressed);
            if (source.at(place) == last)
                break;
        }
    }
    *_interpolators = *other._interpolators;
    markEdited();
    publishVertexCount();
}

bool KFSpline::operator==(KFSpline const& other) const {
    if (_store->size() != other._store->size())
        return false;
    auto place = _store->begin();
    auto otherPlace = other._store->begin();
    for (; place != _store->end(); place = _store->next(place), otherPlace = other._store->next(otherPlace)) {
        if (_store->at(place) != other._store->at(otherPlace))
            return false;
    }
    return _closed.get() == other._closed.get() && *_interpolators == *other._interpolators;
}

void KFSpline::reserveMemoryForKeypoints(int count) {
    if (count > 0)
        _store->reserve(static_cast<std::size_t>(count));
}

void KFSpline::preSplineAccess(bool lock) const {
    if (lock)
        guard().lock();
}

void KFSpline::postSplineAccess(bool lock) const {
    if (!lock)
        return;
    publishVertexCount();
    guard().unlock();
}

void KFSpline::publishVertexCount() const noexcept {
    std::size_t const count = _store->size();
    // Most who give the lock back have changed nothing, and others read on.
    if (_vertexCount.load(std::memory_order_relaxed) != count)
        _vertexCount.store(count, std::memory_order_release);
}

void KFSpline::setDirty(bool dirty) {
    _dirty = dirty;
    if (!dirty)
        return;
    _store->updateAllPositions();
    if (suppressesRefresh()) {
        _store->postponeValidity();
    } else if (_useValidList) {
        _store->refresh();
    }
}

/// Each edit tells the store itself what changed. Only what was added while the owner suppressed it is still to be
/// brought into the list of valid vertices, by the first edit afterwards.
void KFSpline::markEdited() {
    _dirty = true;
    _store->touch();
    if (_useValidList && !_store->validityIsCurrent() && !suppressesRefresh())
        _store->refresh();
}

bool KFSpline::suppressesRefresh() const noexcept {
    KFSplineOwner const* const node = getNode();
    return node != nullptr && node->_suppressRefresh.load(std::memory_order_relaxed);
}

std::size_t KFSpline::getStoreBytes() const noexcept { return _store->bytes(); }

Tempus KFSpline::getStep() {
    KFSplineState const& state = *getState();
    if (state.parametric)
        return TempusMake(1, 1);
    KFSplineOwner const* const node = getNode();
    if (node != nullptr && state.retimingExtrapolation)
        return node->getFrameDuration();
    return TempusMake(1, 30);
}

Tempus KFSpline::getSmallDeltaU() { return getState()->parametric ? TempusMake(1, 1) : TempusMake(1, 100); }
