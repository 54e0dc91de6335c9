// Keypoints by handle: guards, then the spline's operation. Handles are those of the spline's vertices.

#include "lumenkey/curves/KFCurve.h"

#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineState.h"
#include "lumenkey/splines/KFTangent.h"
#include "lumenkey/splines/KFVertex.h"

namespace {

bool writeFlag(KFSpline* spline, void* handle, std::uint32_t flag, bool on) {
    return spline != nullptr &&
           (on ? spline->setVertexFlag(handle, flag) : spline->resetVertexFlag(handle, flag));
}

/// Runs under the lock an operation that doesn't take it itself: false without a spline.
template <class Operation> bool underLock(KFSpline* spline, Operation operation) {
    if (spline == nullptr)
        return false;
    KFSplineAccess const access(*spline);
    return operation(*spline);
}

/// Finds a keypoint and reads it in one step, between whose halves another thread could delete it.
template <class Find> bool giveFound(KFSpline* spline, Find find, Tempus* outTime, double* outValue) {
    return underLock(spline, [&](KFSpline& s) {
        void* found = nullptr;
        return find(s, &found) && s.getVertex(found, outTime, outValue, kTempusZero);
    });
}

/// An end of the curve: zero at zero where there is no keypoint.
bool endOrZero(bool found, Tempus* outTime, double* outValue) {
    if (found)
        return true;
    if (outTime != nullptr)
        *outTime = kTempusZero;
    if (outValue != nullptr)
        *outValue = 0.0;
    return false;
}

void multiply(double* value, double factor) {
    if (value != nullptr)
        *value *= factor;
}

using PointTangents = bool (KFSpline::*)(Tempus const& u, double* x, double* y, Tempus const& t);

bool givePointTangents(KFSpline* spline, PointTangents tangents, Tempus const& t, double* dt, double* dv,
                       bool scaled) {
    if (!underLock(spline, [&](KFSpline& s) { return (s.*tangents)(t, dt, dv, kTempusZero); }))
        return false;
    multiply(dt, scaled ? KFCurve::kHandleScale : 1.0);
    multiply(dv, scaled ? KFCurve::kHandleScale : 1.0);
    return true;
}

} // namespace

// --- Guards: the spline to work on, or null to refuse ---

KFSpline* KFCurve::splineToRead(void* handle) const {
    KFSpline* const spline = getSpline();
    return handle != nullptr && spline != nullptr && spline->isValidHandle(handle) ? spline : nullptr;
}

KFSpline* KFCurve::modifiableSpline(bool force) const {
    return getSpline() != nullptr && canModifyCurve(force) ? getSpline() : nullptr;
}

KFSpline* KFCurve::splineToEdit(void* handle, bool force) const {
    return handle != nullptr && modifiableSpline(force) != nullptr ? splineToRead(handle) : nullptr;
}

KFSpline* KFCurve::rootSpline() const { return isSpline() ? getSpline() : nullptr; }

KFSpline* KFCurve::rootSplineToEdit(void* handle, bool force) const {
    return isSpline() ? splineToEdit(handle, force) : nullptr;
}

static_assert(KFCurve::kHandleScale == kKFHandlesPerTangent);

double KFCurve::handleScale() const { return settings().parametric ? 1.0 : kHandleScale; }

// --- Moving ---

bool KFCurve::cloneKeypoint(void* handle, Tempus const& t, bool force) {
    KFSpline* const spline = splineToEdit(handle, force);
    return spline != nullptr && spline->moveVertex(handle, t, kTempusZero, true, false, false) != nullptr;
}

bool KFCurve::moveKeypoint(void* handle, Tempus const& t, bool force, bool constrain, bool replace) {
    KFSpline* const spline = splineToEdit(handle, force);
    return spline != nullptr &&
           spline->moveVertex(handle, t, kTempusZero, false, replace, constrain) != nullptr;
}

bool KFCurve::offsetKeypointInTime(void* handle, Tempus const& t, bool force) {
    KFSpline* const spline = splineToEdit(handle, force);
    if (spline == nullptr)
        return false;
    KFSplineAccess const access(*spline);
    spline->offsetVertexInTime(handle, t, kTempusZero);
    return true;
}

bool KFCurve::reverseKeypoints(void* first, void* last, bool force) {
    KFSpline* const spline = modifiableSpline(force);
    if (spline == nullptr)
        return false;
    spline->reverseVertices(first, last);
    return true;
}

// --- Finding ---

bool KFCurve::getKeypointHandle(Tempus const& t, void** out) {
    KFSpline* const spline = rootSpline();
    return spline != nullptr && spline->getVertexHandle(t, out, true);
}

bool KFCurve::getPreviousValidKeypointHandle(void* handle, void** out) {
    KFSpline* const spline = getSpline();
    return spline != nullptr && spline->getPreviousValidVertexWithLock(handle, out, kTempusZero);
}

bool KFCurve::getNextValidKeypointHandle(void* handle, void** out) {
    KFSpline* const spline = getSpline();
    return spline != nullptr && spline->getNextValidVertexWithLock(handle, out, kTempusZero);
}

bool KFCurve::getPreviousValidKeypointHandle(Tempus const& t, void** out) {
    KFSpline* const spline = getSpline();
    return spline != nullptr && spline->getPreviousValidVertexWithLock(t, out, kTempusZero, false);
}

bool KFCurve::getNextValidKeypointHandle(Tempus const& t, void** out) {
    KFSpline* const spline = getSpline();
    return spline != nullptr && spline->getNextValidVertexWithLock(t, out, kTempusZero, false);
}

bool KFCurve::getFirstValidKeypointHandle(void** out) {
    KFSpline* const spline = getSpline();
    return spline != nullptr && spline->getFirstValidVertexWithLock(out, kTempusZero);
}

bool KFCurve::getLastValidKeypointHandle(void** out) {
    KFSpline* const spline = getSpline();
    return spline != nullptr && spline->getLastValidVertexWithLock(out, kTempusZero);
}

bool KFCurve::getKeypointHandleList(std::vector<void*>& out) {
    KFSpline* const spline = rootSpline();
    return spline != nullptr && spline->getAllVerticesHandles(out);
}

bool KFCurve::getKeypointValidHandleList(std::vector<void*>& out) {
    KFSpline* const spline = rootSpline();
    return spline != nullptr && spline->getAllValidVerticesHandles(out, kTempusZero);
}

std::uint32_t KFCurve::getNumberOfKeypoints() { return keypointCount(); }

// --- Time and value ---

bool KFCurve::getKeypoint(void* handle, Tempus* outTime, double* outValue) {
    return underLock(splineToRead(handle),
                     [&](KFSpline& s) { return s.getVertex(handle, outTime, outValue, kTempusZero); });
}

bool KFCurve::getNextKeypoint(Tempus const& t, Tempus* outTime, double* outValue) {
    auto const find = [&](KFSpline& s, void** found) {
        return s.getNextValidVertex(t, found, kTempusZero, false);
    };
    return giveFound(rootSpline(), find, outTime, outValue);
}

bool KFCurve::getPreviousKeypoint(Tempus const& t, Tempus* outTime, double* outValue) {
    auto const find = [&](KFSpline& s, void** found) {
        return s.getPreviousValidVertex(t, found, kTempusZero, false);
    };
    return giveFound(rootSpline(), find, outTime, outValue);
}

bool KFCurve::getFirstKeypoint(Tempus* outTime, double* outValue) {
    auto const find = [](KFSpline& s, void** found) { return s.getFirstValidVertex(found, kTempusZero); };
    return endOrZero(giveFound(rootSpline(), find, outTime, outValue), outTime, outValue);
}

bool KFCurve::getLastKeypoint(Tempus* outTime, double* outValue) {
    auto const find = [](KFSpline& s, void** found) { return s.getLastValidVertex(found, kTempusZero); };
    return endOrZero(giveFound(rootSpline(), find, outTime, outValue), outTime, outValue);
}

bool KFCurve::getKeypointsTimeAndValue(TempusRange range,
                                       std::vector<std::pair<Tempus, std::pair<double, unsigned>>>& out,
                                       Tempus* first, Tempus* last) {
    KFSpline* const spline = rootSpline();
    if (spline != nullptr)
        return spline->getVerticesTimeAndValue(range, out, first, last);
    out.clear();
    if (first != nullptr)
        *first = kTempusInvalid;
    if (last != nullptr)
        *last = kTempusInvalid;
    return false;
}

// --- Flags ---

bool KFCurve::getKeypointFlags(void* handle, std::uint32_t* out) {
    KFSpline* const spline = splineToRead(handle);
    return spline != nullptr && spline->getVertexFlags(handle, out);
}

bool KFCurve::setKeypointFlags(void* handle, std::uint32_t flags, bool force) {
    KFSpline* const spline = rootSplineToEdit(handle, force);
    return spline != nullptr && spline->setVertexFlags(handle, flags);
}

bool KFCurve::enableKeypoint(void* handle, bool enable, bool force) {
    KFSpline* const spline = splineToEdit(handle, force);
    if (spline == nullptr)
        return false;
    // Others walk the list of valid vertices.
    KFSplineAccess const access(*spline);
    return enable ? spline->enableVertex(handle, kTempusZero) : spline->disableVertex(handle, kTempusZero);
}

bool KFCurve::isEnabledKeypoint(void* handle, bool* out) {
    KFSpline* const spline = splineToRead(handle);
    if (spline == nullptr)
        return false;
    if (out != nullptr)
        *out = spline->isEnabledVertex(handle, kTempusZero);
    return true;
}

/// Unlike the other readers it answers "not set" for a handle of another spline.
bool KFCurve::readFlag(void* handle, std::uint32_t flag, bool* out) const {
    if (handle == nullptr || getSpline() == nullptr)
        return false;
    KFSpline* const spline = splineToRead(handle);
    std::uint32_t flags = 0;
    bool const known = spline != nullptr && spline->getVertexFlags(handle, &flags);
    if (out != nullptr)
        *out = (flags & flag) != 0;
    return known;
}

bool KFCurve::selectKeypoint(void* handle, bool select, bool force) {
    return writeFlag(rootSplineToEdit(handle, force), handle, kKFVertexFlagSelected, select);
}

bool KFCurve::lockKeypoint(void* handle, bool lock, bool force) {
    return writeFlag(splineToEdit(handle, force), handle, kKFVertexFlagLocked, lock);
}

bool KFCurve::isLockedKeypoint(void* handle, bool* out) { return readFlag(handle, kKFVertexFlagLocked, out); }

bool KFCurve::breakKeypointHandles(void* handle, bool broken, bool force) {
    return writeFlag(splineToEdit(handle, force), handle, kKFVertexFlagHandlesBroken, broken);
}

bool KFCurve::areHandlesBroken(void* handle, bool* out) {
    return readFlag(handle, kKFVertexFlagHandlesBroken, out);
}

bool KFCurve::weightHandles(void* handle, bool weighted, bool force) {
    return writeFlag(splineToEdit(handle, force), handle, kKFVertexFlagHandlesWeighted, weighted);
}

bool KFCurve::areHandlesWeighted(void* handle, bool* out) {
    return readFlag(handle, kKFVertexFlagHandlesWeighted, out);
}

// --- Shape ---

bool KFCurve::deriveKeypoint(void* handle) {
    return underLock(splineToRead(handle), [&](KFSpline& s) {
        s.deriveVertex(handle, kTempusZero);
        return s.resetVertexFlag(handle, kKFVertexFlagHandlesEdited);
    });
}

bool KFCurve::setKeypointSmooth(void* handle, bool smooth, bool force) {
    return underLock(splineToEdit(handle, force),
                     [&](KFSpline& s) { return s.setVertexSmooth(handle, smooth, kTempusZero); });
}

bool KFCurve::flattenHandles(void* handle, bool force) {
    return underLock(splineToEdit(handle, force),
                     [&](KFSpline& s) { return s.flattenHandles(handle, kTempusZero); });
}

bool KFCurve::getKeypointNormal(void* handle, double* out) {
    KFSpline* const spline = splineToRead(handle);
    return spline != nullptr && spline->getVertexNormal(handle, out, kTempusZero);
}

bool KFCurve::setKeypointNormal(void* handle, double normal, bool force) {
    KFSpline* const spline = rootSplineToEdit(handle, force);
    return spline != nullptr && spline->setVertexNormal(handle, normal, kTempusZero);
}

bool KFCurve::getKeypointNormal(Tempus const& t, double* out) {
    return underLock(getSpline(), [&](KFSpline& s) { return s.getVertexNormal(t, out, kTempusZero); });
}

bool KFCurve::setKeypointNormal(Tempus const& t, double normal, bool force) {
    KFSpline* const spline = isSpline() ? modifiableSpline(force) : nullptr;
    return spline != nullptr && spline->setVertexNormal(t, normal, kTempusZero);
}

// --- Handles, which are scaled, and tangents, which are what is stored ---

bool KFCurve::setKeypointInputHandles(void* handle, double dt, double dv, bool force) {
    double const scale = handleScale();
    return setKeypointInputNormalizedTangents(handle, dt / scale, dv / scale, force);
}

bool KFCurve::setKeypointOutputHandles(void* handle, double dt, double dv, bool force) {
    double const scale = handleScale();
    return setKeypointOutputNormalizedTangents(handle, dt / scale, dv / scale, force);
}

bool KFCurve::getKeypointInputHandles(void* handle, double* dt, double* dv) {
    if (!getKeypointInputNormalizedTangents(handle, dt, dv))
        return false;
    multiply(dt, handleScale());
    multiply(dv, handleScale());
    return true;
}

bool KFCurve::getKeypointOutputHandles(void* handle, double* dt, double* dv) {
    if (!getKeypointOutputNormalizedTangents(handle, dt, dv))
        return false;
    multiply(dt, handleScale());
    multiply(dv, handleScale());
    return true;
}

bool KFCurve::setKeypointInputNormalizedTangents(void* handle, double dt, double dv, bool force) {
    return underLock(splineToEdit(handle, force), [&](KFSpline& s) {
        return s.setVertexInputHandles(handle, dt, dv, kTempusZero, false);
    });
}

bool KFCurve::setKeypointOutputNormalizedTangents(void* handle, double dt, double dv, bool force) {
    return underLock(splineToEdit(handle, force), [&](KFSpline& s) {
        return s.setVertexOutputHandles(handle, dt, dv, kTempusZero, false);
    });
}

bool KFCurve::getKeypointInputNormalizedTangents(void* handle, double* dt, double* dv) {
    return underLock(splineToRead(handle), [&](KFSpline& s) {
        return s.getVertexInputHandles(handle, dt, dv, kTempusZero, false);
    });
}

bool KFCurve::getKeypointOutputNormalizedTangents(void* handle, double* dt, double* dv) {
    return underLock(splineToRead(handle), [&](KFSpline& s) {
        return s.getVertexOutputHandles(handle, dt, dv, kTempusZero, false);
    });
}

bool KFCurve::getPointInputTangents(Tempus const& t, double* dt, double* dv, bool scaled) {
    return givePointTangents(getSpline(), &KFSpline::getPointInputTangents, t, dt, dv, scaled);
}

bool KFCurve::getPointOutputTangents(Tempus const& t, double* dt, double* dv, bool scaled) {
    return givePointTangents(getSpline(), &KFSpline::getPointOutputTangents, t, dt, dv, scaled);
}

// --- How the segment behind a keypoint is drawn ---

bool KFCurve::setKeypointBiasLinear(void* handle, double bias) {
    KFSpline* const spline = splineToRead(handle);
    return spline != nullptr && spline->setVertexBiasLinear(handle, bias, kTempusZero);
}

bool KFCurve::getKeypointBiasLinear(void* handle, double* out) {
    KFSpline* const spline = splineToRead(handle);
    return out != nullptr && spline != nullptr && spline->getVertexBiasLinear(handle, out, kTempusZero);
}

bool KFCurve::setKeypointInterpolation(void* handle, std::uint32_t type, bool force) {
    KFSpline* const spline = splineToEdit(handle, force);
    return spline != nullptr && spline->setVertexInterpolation(handle, type);
}

bool KFCurve::getKeypointInterpolation(void* handle, std::uint32_t* outType, bool* outUsesTangents) {
    KFSpline* const spline = splineToRead(handle);
    return spline != nullptr && spline->getVertexInterpolation(handle, outType, outUsesTangents);
}

bool KFCurve::setKeypointSpeed(void* handle, std::uint32_t speed, bool force) {
    return underLock(splineToEdit(handle, force),
                     [&](KFSpline& s) { return s.setVertexSpeed(handle, speed); });
}

bool KFCurve::getKeypointSpeed(void* handle, std::uint32_t* out) {
    KFSpline* const spline = splineToRead(handle);
    return spline != nullptr && spline->getVertexSpeed(handle, out);
}

bool KFCurve::adjustKeypointSpeed(void* handle, double delta, bool force) {
    return underLock(splineToEdit(handle, force),
                     [&](KFSpline& s) { return s.adjustVertexSpeed(handle, delta); });
}
