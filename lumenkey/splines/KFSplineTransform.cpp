#include "lumenkey/splines/KFSpline.h"

#include "lumenkey/foundation/BXMath.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineOwner.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "lumenkey/splines/KFVertexStore.h"

#include <cmath>
#include <deque>

namespace {

struct Limits {
    double min;
    double max;

    /// The upper limit is applied first: where the two cross, the lower one holds.
    double capped(double x) const {
        double const below = x > max ? max : x;
        return below < min ? min : below;
    }
};

/// Writes to a vertex whether it is locked or not, while this lives.
class Unlocked {
public:
    explicit Unlocked(KFVertex& vertex) : _vertex(vertex), _flags(vertex.getFlags()) {
        vertex.resetFlag(kKFVertexFlagLocked);
    }
    ~Unlocked() { _vertex.setFlags(_flags); }
    Unlocked(Unlocked const&) = delete;
    Unlocked& operator=(Unlocked const&) = delete;

private:
    KFVertex& _vertex;
    std::uint32_t const _flags;
};

/// The largest part of `delta` by which all vertices can move within the limits.
double sharedDelta(KFVertexStore const& store, double delta, Limits const& limits, Tempus const& t) {
    for (auto place = store.begin(); place != store.end(); place = store.next(place)) {
        double const v = store.at(place)->getValueV(t);
        double const moved = v + delta;
        if (moved > limits.max && std::fabs(delta) > std::fabs(limits.max - v)) {
            delta = limits.max - v;
        }
        if (moved < limits.min && std::fabs(delta) > std::fabs(v - limits.min)) {
            delta = limits.min - v;
        }
    }
    return delta;
}

/// The part of `delta` by which one vertex can move within the limits; all of it for null.
double ownDelta(KFVertex const* vertex, double delta, Limits const& limits, Tempus const& t) {
    if (vertex == nullptr) {
        return delta;
    }
    double const moved = delta + vertex->getValueV(t);
    if (moved < limits.min) {
        return delta + (limits.min - moved);
    }
    return moved > limits.max ? delta + (limits.max - moved) : delta;
}

void moveInValue(KFVertex& vertex, double delta, Limits const& limits, Tempus const& t) {
    vertex.setValueV(limits.capped(vertex.getValueV(t) + delta), t);
}

void scaleInU(KFVertex& vertex, double factor, Tempus const& t) {
    double u = 0.0;
    double v = 0.0;
    vertex.getInputTangents(&u, &v, t);
    vertex.setInputTangents(u * factor, v, t);
    vertex.getOutputTangents(&u, &v, t);
    vertex.setOutputTangents(u * factor, v, t);
}

void scaleInV(KFVertex& vertex, double factor, Limits const& limits, Tempus const& t) {
    double const v = vertex.getValueV(t);
    double inU = 0.0, inV = 0.0, outU = 0.0, outV = 0.0;
    vertex.getInputTangents(&inU, &inV, t);
    vertex.getOutputTangents(&outU, &outV, t);
    double const newV = limits.capped(v * factor);
    vertex.setInputTangents(inU, limits.capped((v + inV) * factor) - newV, t);
    vertex.setOutputTangents(outU, limits.capped((v + outV) * factor) - newV, t);
    vertex.setValueV(newV, t);
}

/// Measures the two tangents of a segment, or the last one's output, in fractions of a segment.
void parametrizeTangents(KFVertex& w, KFVertex* next) {
    double u = 0.0;
    double v = 0.0;
    if (next == nullptr) {
        w.getInputTangents(&u, &v, kTempusZero);
        w.setOutputTangents(0.0 - u, 0.0 - v, kTempusZero); // no zero gets a sign
        return;
    }
    double const span = TempusGetSeconds(next->getValueU() - w.getValueU());
    w.getOutputTangents(&u, &v, kTempusZero);
    w.setOutputTangents(u / span, v, kTempusZero);
    next->getInputTangents(&u, &v, kTempusZero);
    next->setInputTangents(u / span, v, kTempusZero);
}

/// A stretch of vertices, first to last. Empty when one of them isn't in the store, when they stand the other way
/// round, or when a vertex between them is locked.
std::vector<KFVertex*> changeableStretch(KFVertexStore& store, KFVertex* first, KFVertex* last) {
    std::vector<KFVertex*> stretch;
    if (!store.contains(first) || !store.contains(last)) {
        return stretch;
    }
    for (auto place = store.find(first); place != store.end(); place = store.next(place)) {
        KFVertex* const w = store.at(place);
        if (w->testFlag(kKFVertexFlagLocked)) {
            break;
        }
        stretch.push_back(w);
        if (w == last) {
            return stretch;
        }
    }
    return {};
}

} // namespace

void KFSpline::offsetSpline(Tempus const& u, double value, double maxV, double minV, bool neighboursOnly,
                            bool keepShape, Tempus const& t) {
    KFSplineAccess access(*this);
    Limits const limits{minV, maxV};
    double delta = value - getVertexValue(u, kTempusZero, false);
    KFVertexStore& vertices = store();
    if (!neighboursOnly) {
        if (keepShape) {
            delta = sharedDelta(vertices, delta, limits, t);
        }
        for (auto place = vertices.begin(); place != vertices.end(); place = vertices.next(place)) {
            moveInValue(*vertices.at(place), delta, limits, t);
        }
        return;
    }

    void* handles[2] = {nullptr, nullptr};
    getPreviousValidVertex(u, &handles[0], kTempusZero, false);
    getNextValidVertex(u, &handles[1], kTempusZero, false);
    double const wanted = delta;
    for (void* const handle : handles) {
        double const own = ownDelta(static_cast<KFVertex*>(handle), wanted, limits, t);
        if (keepShape && std::fabs(own) < std::fabs(delta)) {
            delta = own;
        }
    }
    for (void* const handle : handles) {
        if (handle != nullptr) {
            moveInValue(*static_cast<KFVertex*>(handle), delta, limits, t);
        }
    }
}

void KFSpline::scaleSpline(double factor, double minV, double maxV, Tempus const& t) {
    KFSplineAccess access(*this);
    KFVertexStore& vertices = store();
    for (auto place = vertices.begin(); place != vertices.end(); place = vertices.next(place)) {
        scaleInV(*vertices.at(place), factor, Limits{minV, maxV}, t);
    }
}

void KFSpline::warpSplineLinear(double factor, Tempus const& offset, Tempus const& t) {
    KFVertexStore& vertices = store();
    for (auto place = vertices.begin(); place != vertices.end(); place = vertices.next(place)) {
        KFVertex& vertex = *vertices.at(place);
        scaleInU(vertex, factor, t);
        vertex.setValueU(BX_TempusSaferAdd(vertex.getValueU() * factor, offset));
    }
    vertices.updateAllPositions();
}

void KFSpline::forceWarpSplineLinear(Tempus const& scale, Tempus const& offset) {
    double const factor = TempusGetSeconds(scale);
    KFVertexStore& vertices = store();
    for (auto place = vertices.begin(); place != vertices.end(); place = vertices.next(place)) {
        KFVertex& vertex = *vertices.at(place);
        Unlocked const unlocked(vertex);
        scaleInU(vertex, factor, kTempusZero);
        vertex.setValueU(vertex.getValueU() * scale + offset);
    }
    vertices.updateAllPositions();
}

void KFSpline::reverseVertices(void* first, void* last) {
    std::vector<KFVertex*> stretch;
    std::deque<std::unique_ptr<KFVertex>> mirrored;
    bool wasClosed = false;
    std::size_t sharersInFront = 0;
    {
        KFSplineAccess access(*this);
        stretch = changeableStretch(store(), static_cast<KFVertex*>(first), static_cast<KFVertex*>(last));
        if (stretch.empty()) {
            return;
        }
        wasClosed = _closed;
        Tempus const firstU = stretch.front()->getValueU();
        Tempus const lastU = stretch.back()->getValueU();
        for (auto place = store().lowerBound(firstU); place != store().end() && store().at(place) != first;
             place = store().next(place)) {
            sharersInFront += 1;
        }
        // A type belongs to the segment behind its vertex, so it goes to the vertex that the segment now starts at.
        std::uint32_t type = stretch.back()->getInterpolation();
        // A tangent that is mirrored in time changes its side and the sign of its U part; its end stays at its value.
        for (KFVertex* const w : stretch) {
            std::unique_ptr<KFVertex> copy(w->clone());
            double a = 0.0;
            double b = 0.0;
            if (w != first) {
                getVertexInputHandles(w, &a, &b, kTempusZero, false);
                setVertexOutputHandles(copy.get(), 0.0 - a, b, kTempusZero, false);
            }
            if (w != last) {
                getVertexOutputHandles(w, &a, &b, kTempusZero, false);
                setVertexInputHandles(copy.get(), 0.0 - a, b, kTempusZero, false);
            }
            copy->setValueU(lastU - (w->getValueU() - firstU));
            copy->setInterpolation(type);
            type = w->getInterpolation();
            mirrored.push_front(std::move(copy));
        }
    }

    // `deleteVertex` takes the lock itself, and opens a spline that it empties.
    for (KFVertex* const w : stretch) {
        deleteVertex(w, false, kTempusZero);
    }

    KFSplineAccess access(*this);
    KFVertexStore& vertices = store();
    // Where the stretch stood: behind those at its first position that stood in front of it.
    Tempus const lowU = mirrored.front()->getValueU();
    auto place = vertices.lowerBound(lowU);
    for (std::size_t i = 0;
         i < sharersInFront && place != vertices.end() && vertices.at(place)->getValueU() == lowU; ++i) {
        place = vertices.next(place);
    }
    for (auto& vertex : mirrored) {
        place = vertices.next(vertices.insert(place, vertex.release(), suppressesRefresh()));
    }
    _closed = wasClosed;
    markEdited();
}

void KFSpline::reparametrize() {
    KFVertexStore& vertices = store();
    double index = 0.0;
    for (auto place = vertices.begin(); place != vertices.end(); place = vertices.next(place)) {
        KFVertex& vertex = *vertices.at(place);
        Unlocked const unlocked(vertex);
        vertex.setValueU(KFChronoForChannelSeconds(index, kKFChannelTimescale));
        index += 1.0;
    }
    vertices.updateAllPositions();
}

void KFSpline::parametrizeSpline() {
    KFSplineAccess access(*this);
    KFVertexStore& vertices = store();
    if (vertices.empty()) {
        return;
    }
    double const firstValue = vertices.front()->getValueV(kTempusZero);
    for (auto place = vertices.begin(); place != vertices.end();) {
        KFVertex& w = *vertices.at(place);
        double const value = w.getValueV(kTempusZero);
        place = vertices.next(place);
        parametrizeTangents(w, place == vertices.end() ? nullptr : vertices.at(place));
        w.setValueV(value - firstValue, kTempusZero);
    }
    reparametrize();
}

void KFSpline::setClosed(bool closed, void* handle) {
    KFSplineAccess access(*this);
    if (!closed && handle != nullptr && _closed) {
        store().rotate(getVertexIter(handle));
        reparametrize();
    }
    _closed = closed;
    markEdited();
}

void KFSpline::purge() {
    std::vector<KFVertex*> repeated;
    {
        KFSplineAccess access(*this);
        KFVertexStore const& vertices = store();
        Tempus kept;
        for (auto place = vertices.begin(); place != vertices.end(); place = vertices.next(place)) {
            KFVertex* const vertex = vertices.at(place);
            if (place != vertices.begin() && vertex->getValueU() == kept) {
                repeated.push_back(vertex);
            } else {
                kept = vertex->getValueU();
            }
        }
    }
    // `deleteVertex` takes the lock itself, and refuses locked vertices.
    for (KFVertex* const vertex : repeated) {
        deleteVertex(vertex, false, kTempusZero);
    }
}

void KFSpline::generateSplineFromDynamicSpline(Tempus const& t, KFSpline* source) {
    deleteAllVertices();
    KFSplineAccess access(*this);
    store().reserve(source->getNumberOfValidVertices(t));
    void* handle = nullptr;
    for (bool found = source->getFirstValidVertex(&handle, t); found;
         found = source->getNextValidVertex(handle, &handle, t)) {
        store().append(new KFStaticVertex(static_cast<KFVertex*>(handle), t), suppressesRefresh());
    }
    _closed = source->isClosed();
    markEdited();
}
