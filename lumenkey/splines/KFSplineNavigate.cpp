// Finding vertices: the valid ones, all of them, and what they span.

#include "lumenkey/splines/KFInterpolator.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineIndex.h"
#include "lumenkey/splines/KFTangent.h"
#include "lumenkey/splines/KFVertex.h"
#include "lumenkey/splines/KFVertexStore.h"

#include <limits>

namespace {

using Place = KFVertexIterator;

bool give(void** out, KFVertex* vertex) noexcept {
    if (out != nullptr)
        *out = vertex;
    return vertex != nullptr;
}

bool sameU(KFVertex const& a, KFVertex const& b) noexcept {
    return TempusCompare(a.getValueU(), b.getValueU()) == 0;
}

KFVertex* vertexOrNull(KFVertexStore const& store, Place place) noexcept {
    return place == store.end() ? nullptr : store.at(place);
}

Place enabledFrom(KFVertexStore const& store, Place place, Tempus const& t) {
    while (place != store.end() && !store.at(place)->isEnabled(t))
        place = store.next(place);
    return place;
}

/// `end` when there is none.
Place enabledBefore(KFVertexStore const& store, Place place, Tempus const& t) {
    while (place != store.begin()) {
        place = store.previous(place);
        if (store.at(place)->isEnabled(t))
            return place;
    }
    return store.end();
}

} // namespace

// --- Valid vertices ---

bool KFSpline::getFirstValidVertex(void** out, Tempus const& t) {
    if (_useValidList)
        return give(out, _store->firstValid());
    return give(out, vertexOrNull(*_store, enabledFrom(*_store, _store->begin(), t)));
}

bool KFSpline::getLastValidVertex(void** out, Tempus const& t) {
    if (_useValidList)
        return give(out, _store->lastValid());
    return give(out, vertexOrNull(*_store, enabledBefore(*_store, _store->end(), t)));
}

bool KFSpline::getNextValidVertex(void* handle, void** out, Tempus const& t) {
    Place const place = _useValidList ? getValidVertexIter(handle) : getVertexIter(handle);
    return getNextValidVertex(place, out, t);
}

bool KFSpline::getPreviousValidVertex(void* handle, void** out, Tempus const& t) {
    if (_useValidList) {
        Place const place = getValidVertexIter(handle);
        return give(out, vertexOrNull(*_store, place == _store->end() ? place : _store->validBefore(place)));
    }
    return getPreviousValidVertex(getVertexIter(handle), out, t);
}

bool KFSpline::getNextValidVertex(KFVertexIterator const& place, void** out, Tempus const& t) {
    KFVertexStore const& store = *_store;
    if (place == store.end())
        return give(out, nullptr);
    if (_useValidList) {
        // One that isn't in the list counts as its first entry.
        Place const from = store.isValid(place) ? place : store.validFrom(store.begin());
        return give(out,
                    from == store.end() ? nullptr : vertexOrNull(store, store.validFrom(store.next(from))));
    }
    Place const next = enabledFrom(store, store.upperBound(store.at(place)->getValueU()), t);
    return give(out, vertexOrNull(store, next));
}

bool KFSpline::getPreviousValidVertex(KFVertexIterator const& place, void** out, Tempus const& t) {
    KFVertexStore const& store = *_store;
    if (store.empty() || place == store.begin())
        return give(out, nullptr);
    if (_useValidList) {
        if (place != store.end() && !store.isValid(place))
            return give(out, nullptr);
        return give(out, vertexOrNull(store, store.validBefore(place)));
    }
    Place const start = place == store.end() ? place : store.lowerBound(store.at(place)->getValueU());
    Place const nearest = enabledBefore(store, start, t);
    if (nearest == store.end())
        return give(out, nullptr);
    return give(out,
                vertexOrNull(store, enabledFrom(store, store.lowerBound(store.at(nearest)->getValueU()), t)));
}

bool KFSpline::getNextValidVertex(Tempus const& u, void** out, Tempus const& t, bool zeroTwice) {
    KFVertexStore const& store = *_store;
    bool const listed = listAnswers();
    auto const from = [&](Place place) {
        return listed ? store.validFrom(place) : enabledFrom(store, place, t);
    };
    if (zeroTwice && TempusCompare(u, kTempusZero) == 0) {
        Place const first = from(store.lowerBound(u));
        Place const second = first == store.end() ? first : from(store.next(first));
        if (second != store.end() && TempusCompare(store.at(second)->getValueU(), u) == 0) {
            return give(out, store.at(second));
        }
    }
    return give(out, vertexOrNull(store, from(store.upperBound(u))));
}

bool KFSpline::getPreviousValidVertex(Tempus const& u, void** out, Tempus const& t, bool) {
    KFVertexStore const& store = *_store;
    Place const bound = store.lowerBound(u);
    return give(
        out, vertexOrNull(store, listAnswers() ? store.validBefore(bound) : enabledBefore(store, bound, t)));
}

std::uint32_t KFSpline::getNumberOfValidVertices(Tempus const& t) {
    if (_useValidList)
        return static_cast<std::uint32_t>(_store->validCount());
    void* vertex = nullptr;
    std::uint32_t count = 0;
    for (bool found = getFirstValidVertex(&vertex, t); found;
         found = getNextValidVertex(vertex, &vertex, kTempusZero)) {
        count += 1;
    }
    return count;
}

std::uint32_t KFSpline::getNumberOfValidVerticesWithMultiplicity(Tempus const& t) {
    return getNumberOfValidVertices(t);
}

bool KFSpline::getFirstValidVertexWithLock(void** out, Tempus const& t) {
    KFSplineAccess const access(*this);
    return getFirstValidVertex(out, t);
}

bool KFSpline::getLastValidVertexWithLock(void** out, Tempus const& t) {
    KFSplineAccess const access(*this);
    return getLastValidVertex(out, t);
}

bool KFSpline::getNextValidVertexWithLock(void* handle, void** out, Tempus const& t) {
    KFSplineAccess const access(*this);
    return getNextValidVertex(handle, out, t);
}

bool KFSpline::getPreviousValidVertexWithLock(void* handle, void** out, Tempus const& t) {
    KFSplineAccess const access(*this);
    return getPreviousValidVertex(handle, out, t);
}

bool KFSpline::getNextValidVertexWithLock(KFVertexIterator const& place, void** out, Tempus const& t) {
    KFSplineAccess const access(*this);
    return getNextValidVertex(place, out, t);
}

bool KFSpline::getPreviousValidVertexWithLock(KFVertexIterator const& place, void** out, Tempus const& t) {
    KFSplineAccess const access(*this);
    return getPreviousValidVertex(place, out, t);
}

bool KFSpline::getNextValidVertexWithLock(Tempus const& u, void** out, Tempus const& t, bool zeroTwice) {
    KFSplineAccess const access(*this);
    return getNextValidVertex(u, out, t, zeroTwice);
}

bool KFSpline::getPreviousValidVertexWithLock(Tempus const& u, void** out, Tempus const& t, bool unused) {
    KFSplineAccess const access(*this);
    return getPreviousValidVertex(u, out, t, unused);
}

// --- All vertices ---

KFVertexIterator KFSpline::getVertexIter(void* handle) {
    if (handle == nullptr)
        return _store->begin();
    Place const place = _store->find(static_cast<KFVertex*>(handle));
    return place == _store->end() ? _store->begin() : place;
}

KFVertexIterator KFSpline::getValidVertexIter(void* handle) {
    if (handle != nullptr) {
        Place const place = _store->find(static_cast<KFVertex*>(handle));
        if (place != _store->end() && _store->isValid(place))
            return place;
    }
    return _store->validFrom(_store->begin());
}

KFVertexIterator KFSpline::beginVertices() const noexcept { return _store->begin(); }
KFVertexIterator KFSpline::endVertices() const noexcept { return _store->end(); }
KFVertexIterator KFSpline::nextPlace(KFVertexIterator place) const noexcept { return _store->next(place); }
KFVertexIterator KFSpline::previousPlace(KFVertexIterator place) const noexcept {
    return _store->previous(place);
}
KFVertexIterator KFSpline::placeAfter(Tempus const& u) const noexcept { return _store->upperBound(u); }
KFVertex* KFSpline::vertexAt(KFVertexIterator place) const noexcept { return _store->at(place); }
void* KFSpline::getFirstVertex() const noexcept { return _store->front(); }
void* KFSpline::getLastVertex() const noexcept { return _store->back(); }

void* KFSpline::getNextVertex(void* handle) {
    Place const place = getVertexIter(handle);
    return place == _store->end() ? nullptr : vertexOrNull(*_store, _store->next(place));
}

void* KFSpline::getPreviousVertex(void* handle) {
    Place const place = getVertexIter(handle);
    return place == _store->begin() ? nullptr : _store->at(_store->previous(place));
}

void* KFSpline::getNextVertex(Tempus const& u) {
    KFVertexStore const& store = *_store;
    if (TempusCompare(u, kTempusZero) == 0) {
        Place const first = store.lowerBound(u);
        Place const second = first == store.end() ? first : store.next(first);
        if (second != store.end() && TempusCompare(store.at(second)->getValueU(), u) == 0)
            return store.at(second);
    }
    return vertexOrNull(store, store.upperBound(u));
}

bool KFSpline::getVertexHandle(Tempus const& u, void** out, bool lock) {
    KFSplineAccess const access(*this, lock);
    Place const place = _store->lowerBound(u);
    bool const found = place != _store->end() && TempusCompare(_store->at(place)->getValueU(), u) == 0;
    return give(out, found ? _store->at(place) : nullptr);
}

bool KFSpline::isValidHandle(void* handle) {
    KFSplineAccess const access(*this);
    return _store->contains(handle);
}

bool KFSpline::findVertex(long first, long last, void* handle) {
    if (last < first || !_store->contains(handle))
        return false;
    auto const index = static_cast<long>(_store->indexOf(_store->find(static_cast<KFVertex*>(handle))));
    return first <= index && index <= last;
}

namespace {

template <class Takes> void collectOnePerU(KFVertexStore const& store, std::vector<void*>& out, Takes takes) {
    KFVertex const* appended = nullptr;
    for (Place place = store.begin(); place != store.end(); place = store.next(place)) {
        KFVertex* const vertex = store.at(place);
        if (!takes(*vertex) || (appended != nullptr && sameU(*vertex, *appended)))
            continue;
        out.push_back(vertex);
        appended = vertex;
    }
}

} // namespace

bool KFSpline::getAllVerticesHandles(std::vector<void*>& out) {
    KFSplineAccess const access(*this);
    collectOnePerU(*_store, out, [](KFVertex const&) { return true; });
    return true;
}

bool KFSpline::getAllValidVerticesHandles(std::vector<void*>& out, Tempus const& t) {
    KFSplineAccess const access(*this);
    collectOnePerU(*_store, out, [&](KFVertex const& vertex) { return vertex.isEnabled(t); });
    return true;
}

bool KFSpline::getVerticesTimeAndValue(TempusRange range,
                                       std::vector<std::pair<Tempus, std::pair<double, unsigned>>>& out,
                                       Tempus* first, Tempus* last) {
    KFSplineAccess const access(*this);
    KFVertexStore const& store = *_store;
    if (first != nullptr)
        *first = store.empty() ? kTempusInvalid : store.front()->getValueU();
    if (last != nullptr)
        *last = store.empty() ? kTempusInvalid : store.back()->getValueU();
    if (store.empty())
        return true;

    Place place = store.lowerBound(range.start);
    bool const startsLater =
        place == store.end() || TempusCompare(store.at(place)->getValueU(), range.start) > 0;
    if (startsLater && place != store.begin())
        place = store.previous(place);
    Tempus const end = TempusRangeGetEnd(range);
    for (; place != store.end(); place = store.next(place)) {
        KFVertex const& vertex = *store.at(place);
        Tempus const u = vertex.getValueU();
        out.emplace_back(
            u, std::pair<double, unsigned>(vertex.getValueV(kTempusZero), vertex.getInterpolation()));
        if (TempusCompare(u, end) >= 0)
            break;
    }
    return true;
}

// --- Ranges and extremes ---

Tempus KFSpline::getMinValueU(Tempus const& t, bool lock) {
    KFSplineAccess const access(*this, lock);
    void* handle = nullptr;
    if (!getFirstValidVertex(&handle, t))
        return kTempusZero;
    auto const& vertex = *static_cast<KFVertex*>(handle);
    std::uint32_t const type = vertex.getInterpolation();
    Tempus const u = vertex.getValueU();
    return isWholeCurve(type) ? getInterpolator(type)->getAdjustedMinU(*this, t, u) : u;
}

Tempus KFSpline::getMaxValueU(Tempus const& t, bool lock) {
    KFSplineAccess const access(*this, lock);
    void* handle = nullptr;
    if (!getLastValidVertex(&handle, t))
        return kTempusZero;
    auto const& vertex = *static_cast<KFVertex*>(handle);
    std::uint32_t const type = vertex.getInterpolation();
    Tempus const u = vertex.getValueU();
    return isWholeCurve(type) ? getInterpolator(type)->getAdjustedMaxU(*this, t, u) : u;
}

Tempus KFSpline::getRangeU(Tempus const& t) {
    KFSplineAccess const access(*this);
    Tempus const range = BX_TempusSaferSubtract(getMaxValueU(t, false), getMinValueU(t, false));
    if (!_closed || TempusCompare(range, kTempusZero) == 0)
        return range;
    std::uint32_t type = 0;
    getInterpolation(&type, nullptr, nullptr);
    return getInterpolator(type)->useKeypoints() ? BX_TempusSaferAdd(range, getStep()) : range;
}

/// Offers the candidates of each valid vertex to `better`, and keeps the first that reaches the extreme.
template <class Offers, class Better>
double KFSpline::extremeV(double start, Tempus const& t, Tempus* atU, Offers offers, Better better) {
    double best = start;
    auto const consider = [&](KFVertex const& vertex) {
        offers(vertex, vertex.getValueV(t), [&](double candidate) {
            if (!better(candidate, best))
                return;
            best = candidate;
            if (atU != nullptr)
                *atU = vertex.getValueU();
        });
    };
    KFVertexStore const& store = *_store;
    if (_useValidList) {
        // By place: of many vertices at one position a handle would have to be looked for among them all.
        for (Place place = store.validFrom(store.begin()); place != store.end();
             place = store.validFrom(store.next(place))) {
            consider(*store.at(place));
        }
        return best;
    }
    void* handle = nullptr;
    for (bool found = getFirstValidVertex(&handle, kTempusZero); found;
         found = getNextValidVertex(handle, &handle, kTempusZero)) {
        consider(*static_cast<KFVertex*>(handle));
    }
    return best;
}

namespace {

constexpr double kHighest = std::numeric_limits<double>::max();

auto const kAbove = [](double candidate, double best) { return candidate > best; };
auto const kBelow = [](double candidate, double best) { return candidate < best; };
auto const kValue = [](KFVertex const&, double value, auto offer) { offer(value); };

auto const kHandleEnds = [](KFVertex const& vertex, double value, auto offer) {
    double v = 0.0;
    vertex.getInputTangents(nullptr, &v, kTempusZero);
    offer(value + kKFHandlesPerTangent * v);
    vertex.getOutputTangents(nullptr, &v, kTempusZero);
    offer(value + kKFHandlesPerTangent * v);
};

} // namespace

double KFSpline::getMaxValueV(Tempus const& t, Tempus* atU) {
    return extremeV(-kHighest, t, atU, kValue, kAbove);
}

double KFSpline::getMinValueV(Tempus const& t, Tempus* atU) {
    return extremeV(kHighest, t, atU, kValue, kBelow);
}

double KFSpline::getMaxValueVWithTangents(Tempus const& t, Tempus* atU) {
    return extremeV(-kHighest, t, atU, kHandleEnds, kAbove);
}

double KFSpline::getMinValueVWithTangents(Tempus const& t, Tempus* atU) {
    return extremeV(kHighest, t, atU, kHandleEnds, kBelow);
}
