#include "lumenkey/splines/KFCoreGlobals.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "lumenkey/splines/KFTangent.h"
#include "lumenkey/splines/KFVertexStore.h"

namespace {

bool standsAt(KFVertexStore const& vertices, KFVertexIterator place, Tempus const& u) {
    return place != vertices.end() && vertices.at(place)->getValueU() == u;
}

/// A merge gives its value to the vertex that stays, unless that one is locked.
void mergeValue(KFVertex& vertex, double value, Tempus const& t) {
    if (!vertex.testFlag(kKFVertexFlagLocked))
        vertex.setValueV(value, t);
}

} // namespace

// --- Places ---

std::uint32_t KFSpline::interpolationInFrontOf(KFVertexIterator place) const {
    if (place == _store->begin())
        return getState()->interpolation;
    return _store->at(_store->previous(place))->getInterpolation();
}

std::unique_ptr<KFVertex> KFSpline::takeOut(KFVertexIterator place, bool* wasValid) {
    *wasValid = store().isValid(place);
    std::unique_ptr<KFVertex> vertex(store().at(place));
    store().remove(place);
    return vertex;
}

KFVertexIterator KFSpline::putIn(KFVertexIterator place, std::unique_ptr<KFVertex> vertex, bool wasValid) {
    // While the list of valid vertices isn't renewed, a new vertex stays out of it, and one that moves keeps
    // its part.
    KFVertexIterator const placed = store().insert(place, vertex.get(), suppressesRefresh() && !wasValid);
    (void)vertex.release(); // the store owns it now
    return placed;
}

/// Puts a new vertex in front of those at its U, or with `replace` gives its value to the first of them. The
/// place of the vertex that stands there then; `added` tells which it is.
KFVertexIterator KFSpline::placeNewVertex(std::unique_ptr<KFVertex> vertex, bool replace, bool* added) {
    Tempus const u = vertex->getValueU();
    KFVertexIterator const place = store().lowerBound(u);
    bool const taken = standsAt(store(), place, u);
    *added = !(taken && replace);
    if (!*added) {
        mergeValue(*store().at(place), vertex->getValueV(kTempusZero), kTempusZero);
        return place;
    }
    vertex->setInterpolation(taken ? store().at(place)->getInterpolation() : interpolationInFrontOf(place));
    return putIn(place, std::move(vertex), false);
}

// --- Adding ---

void* KFSpline::addVertex(Tempus const& u, double value, Tempus const& t, bool replace) {
    KFSplineAccess const access(*this);
    auto vertex = std::make_unique<KFStaticVertex>(u, value);
    bool atEnd = false;
    bool added = true;
    KFVertexIterator place;
    if (store().empty()) {
        if (KFCoreGlobals::getInstance().animate)
            deriveCurve(*vertex, kTempusZero, false);
        place = placeNewVertex(std::move(vertex), replace, &added);
    } else if (u < getMinValueU(t, false)) {
        atEnd = true;
        place = placeNewVertex(std::move(vertex), replace, &added);
    } else if (u > getMaxValueU(t, false)) {
        atEnd = true;
        if (store().lowerBound(u) == store().end()) {
            vertex->setInterpolation(getState()->interpolation);
            place = putIn(store().end(), std::move(vertex), false);
        } else {
            // Disabled vertices stand further on: behind them it would be out of order.
            place = placeNewVertex(std::move(vertex), replace, &added);
        }
    } else {
        // Reads the curve before the vertex changes it, and shortens the neighbours' handles.
        deriveCurve(*vertex, kTempusZero, false);
        place = placeNewVertex(std::move(vertex), replace, &added);
    }
    markEdited();
    KFVertex* const result = store().at(place);
    if (added && getState()->deriveTangents) {
        deriveAroundNewVertex(place, atEnd, t);
        markEdited();
    }
    return result;
}

/// Tangents of a vertex that was just added, and of its neighbours where it stands at an end of the spline.
/// `atEnd`: it was added outside the valid vertices.
void KFSpline::deriveAroundNewVertex(KFVertexIterator place, bool atEnd, Tempus const& t) {
    KFVertex& added = *store().at(place);
    void* previousHandle = nullptr;
    void* nextHandle = nullptr;
    void* firstHandle = nullptr;
    void* lastHandle = nullptr;
    getPreviousValidVertex(place, &previousHandle, kTempusZero);
    getNextValidVertex(place, &nextHandle, kTempusZero);
    getFirstValidVertex(&firstHandle, kTempusZero);
    getLastValidVertex(&lastHandle, kTempusZero);
    auto* const previous = static_cast<KFVertex*>(previousHandle);
    auto* const next = static_cast<KFVertex*>(nextHandle);
    auto* const first = static_cast<KFVertex*>(firstHandle);
    auto* const last = static_cast<KFVertex*>(lastHandle);
    auto const isFree = [](KFVertex const& vertex) { return !vertex.testFlag(kKFVertexFlagHandlesEdited); };

    if (previous != nullptr && previous == first && getNumberOfValidVertices(kTempusZero) == 2) {
        if (isFree(*first)) {
            KFTangentWrite(*first, KFTangentSide::Output, KFTangentAlongLine(*first, added), kTempusZero);
        }
        if (isFree(added))
            deriveCurve(added, kTempusZero, false);
    } else if (&added == first && next != nullptr && isFree(*next)) {
        KFTangentStraightenSegment(added, *next);
        KFTangentFlattenFacing(*next, KFTangentSide::Input, added, t);
    }
    if (next != nullptr && next == last && getNumberOfValidVertices(kTempusZero) == 2) {
        if (isFree(*last)) {
            KFTangentWrite(*last, KFTangentSide::Input, -KFTangentAlongLine(added, *last), kTempusZero);
        }
    } else if (&added == last && previous != nullptr && isFree(*previous)) {
        KFTangentStraightenSegment(*previous, added);
        KFTangentFlattenFacing(*previous, KFTangentSide::Output, added, t);
    }
    if (atEnd || store().size() == 1)
        deriveCurve(added, kTempusZero, false);
}

void* KFSpline::addVertexNoTangents(Tempus const& u, double value, Tempus const&, bool replace) {
    KFSplineAccess const access(*this);
    bool added = true;
    KFVertexIterator const place =
        placeNewVertex(std::make_unique<KFStaticVertex>(u, value), replace, &added);
    markEdited();
    return store().at(place);
}

KFVertex* KFSpline::append(Tempus const& u, double value) {
    auto vertex = std::make_unique<KFStaticVertex>(u, value);
    vertex->setInterpolation(interpolationInFrontOf(store().end()));
    return store().at(putIn(store().end(), std::move(vertex), false));
}

void* KFSpline::appendVertexNoTangents(Tempus const& u, double value, Tempus const&) {
    KFSplineAccess const access(*this);
    KFVertex* const vertex = append(u, value);
    markEdited();
    return vertex;
}

std::vector<void*> KFSpline::appendVertexesNoTangents(unsigned count, Tempus const* u, double const* values,
                                                      Tempus const&) {
    std::vector<void*> handles;
    handles.reserve(count);
    KFSplineAccess const access(*this);
    store().reserve(store().size() + count);
    for (unsigned i = 0; i < count; ++i) {
        handles.push_back(append(u[i], values[i]));
    }
    markEdited();
    return handles;
}

// --- Setting and moving ---

bool KFSpline::setVertex(void* handle, Tempus const& u, double value, Tempus const& t) {
    if (handle == nullptr)
        return false;
    KFSplineAccess const access(*this);
    KFVertex& vertex = *static_cast<KFVertex*>(handle);
    if (u == vertex.getValueU()) {
        vertex.setValueV(value, t);
        markEdited();
        return true;
    }
    if (!placeAgain(vertex, u, value, t))
        return false;
    if (store().size() == 1)
        deriveCurve(vertex, kTempusZero, false);
    return true;
}

bool KFSpline::setVertexNoTangents(void* handle, Tempus const& u, double value, Tempus const&) {
    if (handle == nullptr)
        return false;
    KFSplineAccess const access(*this);
    return placeAgain(*static_cast<KFVertex*>(handle), u, value, kTempusZero);
}

/// Moves a vertex to `u` with a value, or merges it into the first vertex there: then false, and it is
/// destroyed. A locked vertex stays as and where it is.
bool KFSpline::placeAgain(KFVertex& vertex, Tempus const& u, double value, Tempus const& t) {
    KFVertexIterator const oldPlace = store().find(&vertex);
    if (oldPlace == store().end())
        return false;
    if (vertex.testFlag(kKFVertexFlagLocked)) {
        markEdited();
        return true;
    }
    bool wasValid = false;
    std::unique_ptr<KFVertex> moved = takeOut(oldPlace, &wasValid);
    moved->setValueU(u);
    moved->setValueV(value, t);
    Tempus const newU = moved->getValueU();
    KFVertexIterator const place = store().lowerBound(newU);
    bool const merges = standsAt(store(), place, newU);
    if (merges) {
        mergeValue(*store().at(place), value, t);
    } else {
        putIn(place, std::move(moved), wasValid);
    }
    markEdited();
    return !merges;
}

void* KFSpline::moveVertex(void* handle, Tempus const& newU, Tempus const& t, bool clone, bool replace,
                           bool constrain) {
    if (handle == nullptr)
        return nullptr;
    KFSplineAccess const access(*this);
    KFVertex const& source = *static_cast<KFVertex*>(handle);
    if (source.testFlag(kKFVertexFlagLocked) || newU == source.getValueU() || !source.isEnabled(t))
        return nullptr;
    KFVertexIterator const oldPlace = store().find(&source);
    if (oldPlace == store().end())
        return nullptr;

    std::unique_ptr<KFVertex> moved;
    Tempus targetU = newU;
    Tempus oldU = kTempusZero;
    bool wasValid = false;
    if (clone) {
        moved.reset(source.clone());
        moved->setValueU(newU);
    } else {
        oldU = source.getValueU();
        moved = takeOutToMove(oldPlace, &targetU, constrain, &wasValid);
    }
    return placeMoved(std::move(moved), targetU, oldU, t, replace, wasValid);
}

/// Takes out a vertex and gives it the new U: `targetU`, or what becomes of it with `constrain` when a
/// neighbour is in the way.
std::unique_ptr<KFVertex> KFSpline::takeOutToMove(KFVertexIterator place, Tempus* targetU, bool constrain,
                                                  bool* wasValid) {
    void* previous = nullptr;
    void* next = nullptr;
    getPreviousValidVertex(place, &previous, kTempusZero);
    getNextValidVertex(place, &next, kTempusZero);
    std::unique_ptr<KFVertex> moved = takeOut(place, wasValid);
    markEdited();
    bool const crossesPrevious =
        previous != nullptr && *targetU <= static_cast<KFVertex*>(previous)->getValueU();
    bool const crossesNext = next != nullptr && *targetU >= static_cast<KFVertex*>(next)->getValueU();
    if (constrain && crossesPrevious) {
        *targetU = static_cast<KFVertex*>(previous)->getValueU() + getState()->roundingDelta;
    } else if (constrain && crossesNext) {
        *targetU = static_cast<KFVertex*>(next)->getValueU() - getState()->roundingDelta;
    } else if (crossesPrevious || crossesNext) {
        moved->setFlag(kKFVertexFlagCrossedNeighbour);
    }
    moved->setValueU(*targetU);
    return moved;
}

/// Puts a moved vertex, which is in no store, into the order and rescales tangents at both places.
void* KFSpline::placeMoved(std::unique_ptr<KFVertex> moved, Tempus const& newU, Tempus const& oldU,
                           Tempus const& t, bool replace, bool wasValid) {
    KFVertexIterator const place = store().lowerBound(moved->getValueU());
    bool const taken = standsAt(store(), place, moved->getValueU());
    if (taken && replace) {
        markEdited();
        return store().at(place);
    }
    if (taken)
        store().at(place)->setFlag(kKFVertexFlagCrossedNeighbour);
    if (newU != oldU)
        scaleTangentsAroundPoint(newU, oldU, t);
    KFVertex* const vertex = store().at(putIn(place, std::move(moved), wasValid));
    markEdited();
    if (!taken)
        scaleTangentsAfterInsertion(vertex, newU - oldU, t);
    return vertex;
}
