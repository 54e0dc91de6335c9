#include "lumenkey/splines/KFControlVertices.h"

#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFVertex.h"
#include "lumenkey/splines/KFVertexStore.h"

KFControlVertices& KFControlVertices::operator=(KFControlVertices const&) noexcept {
    _vertices.clear();
    _spline = nullptr;
    return *this;
}

std::vector<KFVertex*> const& KFControlVertices::of(KFSpline& spline, Tempus const& t, bool* listedAnew) {
    std::uint64_t const version = spline.store().version();
    bool const stands = _spline == &spline && _version == version && spline._useValidList;
    if (listedAnew != nullptr) {
        *listedAnew = !stands;
    }
    if (stands) {
        return _vertices;
    }
    _vertices.clear();
    void* handle = nullptr;
    for (bool found = spline.getFirstValidVertex(&handle, t); found;
         found = spline.getNextValidVertex(handle, &handle, t)) {
        _vertices.push_back(static_cast<KFVertex*>(handle));
    }
    _spline = &spline;
    _version = version;
    return _vertices;
}
