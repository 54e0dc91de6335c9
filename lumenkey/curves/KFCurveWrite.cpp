// What stores values in a curve and takes keypoints out of it. A value becomes a keypoint, the new value of
// one, an offset of the whole animation or the constant of the nodes.

#include "lumenkey/curves/KFCurve.h"

#include "lumenkey/splines/KFCoreGlobals.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineState.h"

/// Unforced writes offset the curve instead of inserting.
bool KFCurve::offsetsOnly(bool force) { return !force && KFCoreGlobals::getInstance().shouldOffset; }

/// Makes the spline if there is none. The settings become the curve's own first: a curve that takes
/// keypoints from a document or a generator is about to change them.
KFSpline* KFCurve::splineForNewKeypoints() {
    if (getSpline() == nullptr) {
        createLocalSplineState();
        _splineNode.createSpline();
    }
    return getSpline();
}

// --- By time ---

/// The root's own way of taking a value, with the spline node kept in step: it is what a later switch of
/// the root reads.
void KFCurve::writeConstant(Tempus const& t, double clampedValue) {
    getRootNode()->setValue(t, clampedValue, true);
    _splineNode.storeValue(clampedValue);
}

bool KFCurve::setKeyValue(Tempus const& t, double value, bool withTangents) {
    double const stored = clamped(value);
    getRootNode()->setValue(t, stored, withTangents);
    if (!isSpline())
        _splineNode.storeValue(stored);
    return true;
}

/// Changes the keypoint at `t`; where there is none, adds one if that is allowed, else offsets the curve.
void KFCurve::writeAt(Tempus const& t, double value, bool mayAdd, bool withTangents) {
    void* handle = nullptr;
    if (getKeypointHandle(t, &handle)) {
        setKeyValue(handle, t, value);
    } else if (mayAdd) {
        setKeyValue(t, value, withTangents);
    } else {
        setCurveOffset(t, value);
    }
}

bool KFCurve::setKeypoint(Tempus const& t, double value, bool force) {
    if (offsetsOnly(force)) {
        setCurveOffset(t, value);
    } else {
        writeAt(t, value, canModifyCurve(force), true);
    }
    return true;
}

/// A curve that may be edited takes the keypoint here even where writes are to offset.
bool KFCurve::setKeypointNoTangents(Tempus const& t, double value, bool force) {
    bool const mayAdd = canModifyCurve(force);
    if (!mayAdd && offsetsOnly(force)) {
        setCurveOffset(t, value);
    } else {
        writeAt(t, value, mayAdd, false);
    }
    return true;
}

bool KFCurve::setKeypoint(Tempus const& t, bool force) {
    if (!canModifyCurve(force))
        return false;
    setKeyAtCurrentValue(t);
    return true;
}

bool KFCurve::setKeyAtCurrentValue(Tempus const& t) {
    if (!isSpline())
        return false;
    getRootNode()->setValue(t, getValue(t, static_cast<void*>(nullptr)), true);
    return true;
}

bool KFCurve::appendKeypointNoTangents(Tempus const& t, double value, bool force) {
    if (canModifyCurve(force)) {
        splineForNewKeypoints()->appendVertexNoTangents(t, value, kTempusZero);
    } else {
        setCurveOffset(t, value);
    }
    return true;
}

bool KFCurve::appendKeypointsNoTangents(std::uint32_t count, Tempus const* times, double const* values,
                                        bool force) {
    if (canModifyCurve(force)) {
        splineForNewKeypoints()->appendVertexesNoTangents(count, times, values, kTempusZero);
        return true;
    }
    for (std::uint32_t i = 0; i < count; ++i)
        setCurveOffset(times[i], values[i]);
    return true;
}

// --- By handle ---

bool KFCurve::setKeyValue(void* handle, Tempus const& t, double value) {
    double const stored = clamped(value);
    if (KFSpline* const spline = rootSpline()) {
        if (!isRecording())
            return spline->isValidHandle(handle) && spline->setVertex(handle, t, stored, kTempusZero);
        _recordingNode->setValue(t, stored, true);
        return true;
    }
    writeConstant(t, stored);
    return true;
}

bool KFCurve::setKeyValue(void* handle, double value) {
    double const stored = clamped(value);
    if (KFSpline* const spline = rootSpline()) {
        if (!spline->isValidHandle(handle))
            return false;
        if (!isRecording())
            return spline->setVertexValue(handle, stored, kTempusZero);
        Tempus t = kTempusInvalid;
        spline->getVertex(handle, &t, nullptr, kTempusZero);
        _recordingNode->setValue(t, stored, true);
        return true;
    }
    writeConstant(kTempusZero, stored);
    return true;
}

bool KFCurve::setKeypoint(void* handle, Tempus const& t, double value, bool force) {
    if (handle == nullptr)
        return false;
    if (canModifyCurve(force) && !offsetsOnly(force)) {
        setKeyValue(handle, t, value);
    } else {
        setCurveOffset(t, value);
    }
    return true;
}

bool KFCurve::setKeypointValue(void* handle, double value, bool force) {
    if (handle == nullptr)
        return false;
    if (canModifyCurve(force) && !offsetsOnly(force)) {
        setKeyValue(handle, value);
    } else {
        setCurveOffset(kTempusZero, value);
    }
    return true;
}

// --- The whole curve ---

void KFCurve::offsetRoot(Tempus const& t, double value, double low, double high, bool neighboursOnly,
                         bool keepShape) {
    KFSpline* const spline = getSpline();
    if (!isSpline()) {
        writeConstant(kTempusZero, value);
    } else if (spline != nullptr && spline->getNumberOfVertices() > 0) {
        spline->offsetSpline(t, value, high, low, neighboursOnly, keepShape, kTempusZero);
    } else {
        // A spline without vertices has nothing to offset: it is the node's constant that is read.
        _splineNode.storeValue(value);
    }
}

bool KFCurve::setCurveOffset(Tempus const& t, double value) {
    offsetRoot(t, clamped(value), _minValue, _maxValue, false, false);
    return true;
}

bool KFCurve::setKeypointsValue(double value, bool) {
    double const stored = clamped(value);
    if (!isSpline()) {
        writeConstant(kTempusZero, stored);
        return true;
    }
    _splineNode.storeValue(stored);
    if (KFSpline* const spline = getSpline())
        spline->setAllVerticesValues(stored, kTempusZero);
    return true;
}

// --- Deleting ---

/// After vertices went: an empty spline goes too, and a parametric one counts its vertices anew. True when
/// the spline went.
bool KFCurve::settleAfterDeletion() {
    KFSpline* const spline = getSpline();
    if (spline->getNumberOfVertices() == 0) {
        _splineNode.destroySpline();
        return true;
    }
    if (settings().parametric)
        reparametrizeCurve();
    return false;
}

bool KFCurve::delKeypoint(void* handle, bool force) {
    KFSpline* const spline = splineToEdit(handle, force);
    if (spline == nullptr)
        return false;
    double value = 0.0;
    bool const hasValue = spline->getVertex(handle, nullptr, &value, kTempusZero);
    bool const deleted = spline->deleteVertex(handle, true, kTempusZero);
    if (settleAfterDeletion() && hasValue)
        setCurveInitialValue(value);
    return deleted;
}

bool KFCurve::delKeypoints(Tempus const& start, Tempus const& end, bool force) {
    KFSpline* const spline = modifiableSpline(force);
    if (spline == nullptr)
        return false;
    bool const deleted = spline->deleteVertices(start, end);
    settleAfterDeletion();
    return deleted;
}

bool KFCurve::delAllKeypoints(Tempus const& t, bool force) {
    KFSpline* const spline = modifiableSpline(force);
    if (spline == nullptr)
        return false;
    if (spline->getNumberOfVertices() > 0)
        setCurveInitialValue(spline->getVertexValue(t, kTempusZero, false));
    _splineNode.destroySpline();
    return false;
}
