// Operations of a whole curve that its root or its spline carries out.

#include "lumenkey/curves/KFCurve.h"

#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"

#include <algorithm>

namespace {

/// A document says how many keypoints follow, in each of its curves; room is made for at most so many before
/// they are seen, some 256 bytes.
constexpr std::uint32_t kMostKeypointsReserved = 1u << 12;

} // namespace

bool KFCurve::lockCurve(bool lock) {
    KFSpline* const spline = getSpline();
    if (spline == nullptr)
        return false;
    spline->lockSpline(lock);
    return true;
}

bool KFCurve::closeCurve() {
    KFSpline* const spline = getSpline();
    if (spline == nullptr)
        return false;
    spline->setClosed(true, nullptr);
    return true;
}

bool KFCurve::isClosedCurve(bool* out) {
    KFSpline const* const spline = getSpline();
    if (spline == nullptr)
        return false;
    if (out != nullptr)
        *out = spline->isClosed();
    return true;
}

bool KFCurve::hasInterpolation(std::uint32_t type, bool* out) {
    KFSpline* const spline = getSpline();
    if (spline == nullptr)
        return false;
    if (out != nullptr) {
        KFSplineAccess const access(*spline);
        *out = spline->hasInterpolation(type);
    }
    return true;
}

bool KFCurve::reparametrizeCurve() {
    KFSpline* const spline = getSpline();
    if (spline == nullptr)
        return false;
    KFSplineAccess const access(*spline);
    spline->reparametrize();
    return true;
}

bool KFCurve::purgeCurve() {
    KFSpline* const spline = getSpline();
    if (spline == nullptr)
        return false;
    spline->purge();
    return true;
}

bool KFCurve::setCustomInterpolator(KFCustomInterpolator* interpolator, BXSpinLock* lock) {
    _splineNode._customLock.store(lock, std::memory_order_release);
    _splineNode._customInterpolator.store(interpolator, std::memory_order_release);
    return true;
}

/// While loading, the spline doesn't renew its list of valid vertices at each keypoint; the end of it does
/// so once.
bool KFCurve::loadVertices(bool loading, std::uint32_t count) {
    if (count != 0 && getSpline() == nullptr)
        _splineNode.createSpline();
    _splineNode._suppressRefresh.store(loading, std::memory_order_relaxed);
    KFSpline* const spline = getSpline();
    if (spline == nullptr)
        return true;
    KFSplineAccess const access(*spline);
    if (loading)
        spline->reserveMemoryForKeypoints(static_cast<int>(std::min(count, kMostKeypointsReserved)));
    spline->setDirty(true);
    return true;
}

bool KFCurve::getSplineSamplesAndIgnoreLinear(Tempus const& start, Tempus const& end, Tempus const& step,
                                              std::vector<Tempus>* times, std::vector<double>* values) {
    KFSpline* const spline = getSpline();
    return spline != nullptr && times != nullptr && values != nullptr &&
           spline->sampleSplineSegments(start, end, step, times, values);
}

bool KFCurve::getCurveDerivativesSamples(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                         std::vector<Tempus>* times, std::vector<double>* values) {
    KFSpline* const spline = getSpline();
    return spline != nullptr &&
           spline->sampleSplineDerivatives(start, step, count, times, values, kTempusZero);
}

bool KFCurve::getUForValue(double value, std::vector<Tempus>& times, BXTimeRange& range,
                           Tempus& frameDuration, std::uint32_t flags) {
    return getRootNode()->getUForValue(value, times, range, frameDuration, flags);
}

bool KFCurve::warpCurveLinear(double factor, Tempus const& t, bool force) {
    KFSpline* const spline = modifiableSpline(force);
    if (spline == nullptr)
        return false;
    KFSplineAccess const access(*spline);
    spline->warpSplineLinear(factor, t, kTempusZero);
    return true;
}

bool KFCurve::forceRetimeCurve(Tempus const& scale, Tempus const& offset) {
    KFSpline* const spline = getSpline();
    if (spline == nullptr || !_keyframable)
        return false;
    KFSplineAccess const access(*spline);
    spline->forceWarpSplineLinear(scale, offset);
    return true;
}

bool KFCurve::scaleCurve(double factor) {
    for (KFConstantNode* const node : {&_constantNode, static_cast<KFConstantNode*>(&_splineNode)}) {
        node->setDefaultValue(clamped(node->getDefaultValue() * factor));
        node->storeValue(clamped(node->value() * factor));
    }
    if (KFSpline* const spline = getSpline())
        spline->scaleSpline(factor, _minValue, _maxValue, kTempusZero);
    return true;
}
