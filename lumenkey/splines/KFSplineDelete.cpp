#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFVertex.h"
#include "lumenkey/splines/KFVertexStore.h"

/// Deletes the vertex at a place, unless it is locked, and moves `place` on to the one behind it. True when
/// it went.
bool KFSpline::deleteAt(KFVertexIterator* place, bool scale, Tempus const& t) {
    KFVertex* const vertex = store().at(*place);
    if (vertex->testFlag(kKFVertexFlagLocked)) {
        *place = store().next(*place);
        return false;
    }
    if (scale)
        scaleTangentsBeforeDeletion(vertex, t);
    *place = store().remove(*place);
    delete vertex;
    if (store().empty())
        _closed = false;
    markEdited();
    return true;
}

bool KFSpline::deleteVertex(void* handle, bool scale, Tempus const& t) {
    if (handle == nullptr)
        return false;
    KFSplineAccess const access(*this);
    KFVertexIterator place = store().find(static_cast<KFVertex*>(handle));
    return place != store().end() && deleteAt(&place, scale, t);
}

bool KFSpline::deleteVertex(Tempus const& u, bool scale, Tempus const& t) {
    KFSplineAccess const access(*this);
    bool deleted = false;
    KFVertexIterator place = store().lowerBound(u);
    while (place != store().end() && store().at(place)->getValueU() == u) {
        if (deleteAt(&place, scale, t))
            deleted = true;
    }
    if (store().empty())
        _closed = false;
    markEdited();
    return deleted;
}

bool KFSpline::deleteVertices(Tempus const& from, Tempus const& to) {
    KFSplineAccess const access(*this);
    auto const* const first = static_cast<KFVertex*>(getNextVertex(from));
    if (first == nullptr)
        return false;
    bool deleted = false;
    KFVertexIterator place = store().find(first);
    while (place != store().end() && store().at(place)->getValueU() <= to) {
        if (deleteAt(&place, true, kTempusZero))
            deleted = true;
    }
    return deleted;
}

bool KFSpline::deleteAllVertices() {
    KFSplineAccess const access(*this);
    bool const deleted = !store().empty();
    store().clear();
    _closed = false;
    markEdited();
    return deleted;
}
