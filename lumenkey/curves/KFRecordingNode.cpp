#include "lumenkey/curves/KFRecordingNode.h"

#include "lumenkey/curves/KFRecordedPoints.h"
#include "lumenkey/curves/KFSplineNode.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"

#include <algorithm>
#include <cmath>

using Sentry = BXLockSentry<BXSpinLock>;

namespace {

bool areClose(double a, double b) noexcept { return std::fabs(a - b) < 1e-7; }

} // namespace

KFRecordingNode::KFRecordingNode(KFSplineNode* splineNode)
    : _splineNode(splineNode), _points(std::make_unique<KFRecordedPoints>()) {}

KFRecordingNode::KFRecordingNode(KFRecordingNode const& other) : KFRecordingNode(other, other._splineNode) {}

KFRecordingNode::KFRecordingNode(KFRecordingNode const& other, KFSplineNode* splineNode)
    : KFRecordingNode(splineNode) {
    Sentry const sentry(other._lock);
    copyTake(other);
}

KFRecordingNode& KFRecordingNode::operator=(KFRecordingNode const& other) {
    if (this == &other)
        return *this;
    // The source's lock is given back before the own one is taken: two assignments may cross.
    KFRecordingNode taken(_splineNode);
    {
        Sentry const sentry(other._lock);
        taken.copyTake(other);
        *taken._points = *other._points;
    }
    Sentry const sentry(_lock);
    copyTake(taken);
    _points.swap(taken._points);
    return *this;
}

KFRecordingNode::~KFRecordingNode() = default;

void KFRecordingNode::copyTake(KFRecordingNode const& other) {
    _scope = other._scope;
    _mode = other._mode;
    _lastValue = other._lastValue;
    _startTime = other._startTime;
    _startValue = other._startValue;
    _resolution = other._resolution;
}

// --- Reading ---

double KFRecordingNode::splineValue(Tempus const& t) const { return _splineNode->solveNode(t, 0.0, 0.0); }

/// Outside a take without guards: on the line between its end and the keypoint that `t` lies in front of.
double KFRecordingNode::splineOrJoin(Tempus const& t, bool before) const {
    KFRecordedPoints::Point const end = before ? _points->first() : _points->last();
    if (KFSpline* const spline = _splineNode->getSpline(); spline != nullptr && !hasGuards()) {
        KFSplineAccess const access(*spline);
        void* handle = nullptr;
        KFRecordedPoints::Point vertex{kTempusInvalid, 0.0};
        bool const found = before ? spline->getPreviousValidVertex(end.time, &handle, kTempusZero, false)
                                  : spline->getNextValidVertex(end.time, &handle, kTempusZero, false);
        if (found && spline->getVertex(handle, &vertex.time, &vertex.value, kTempusZero)) {
            if (before && vertex.time < t)
                return KFRecordedPoints::between(vertex, end, t);
            if (!before && vertex.time > t)
                return KFRecordedPoints::between(end, vertex, t);
        }
    }
    return splineValue(t);
}

double KFRecordingNode::solveNode(Tempus const& t, double operand, double input) {
    Sentry const sentry(_lock);
    if (_points->empty() || !TempusIsNumeric(t))
        return _splineNode->solveNode(t, operand, input);
    if (t < _points->first().time)
        return splineOrJoin(t, true);
    return t > _points->last().time ? splineOrJoin(t, false) : _points->valueAt(t);
}

void KFRecordingNode::solveNode(KFCurveNodeParam& param) {
    if (param.outputValues == nullptr)
        return;
    Tempus t = param.outputStart;
    for (std::uint32_t i = 0; i < param.outputCount; ++i) {
        param.outputValues[i] = solveNode(t, 0.0, param.outputValues[i]);
        t = BX_TempusSaferAdd(t, param.outputStep);
    }
}

bool KFRecordingNode::getUForValue(double value, std::vector<Tempus>& times, BXTimeRange& range, Tempus& step,
                                   std::uint32_t flags) {
    return _splineNode->getUForValue(value, times, range, step, flags);
}

void KFRecordingNode::setDefaultValue(double value) { _splineNode->setDefaultValue(value); }
double KFRecordingNode::getDefaultValue() const { return _splineNode->getDefaultValue(); }
void KFRecordingNode::setInitialValue(double value) { _splineNode->setInitialValue(value); }
double KFRecordingNode::getInitialValue() const { return _splineNode->getInitialValue(); }
void KFRecordingNode::getNeededRange(KFCurveNodeParam* param) { param->needSameRange(); }
Tempus KFRecordingNode::getCurrentRange() { return _splineNode->getCurrentRange(); }
Tempus KFRecordingNode::getMaxValueU() { return _splineNode->getMaxValueU(); }
Tempus KFRecordingNode::getMinValueU() { return _splineNode->getMinValueU(); }

double KFRecordingNode::getMaxValue(bool withTangents) {
    Sentry const sentry(_lock);
    double const ofSpline = _splineNode->getMaxValue(withTangents);
    if (_points->empty())
        return ofSpline;
    return _splineNode->hasVertices() ? std::max(ofSpline, _points->highest()) : _points->highest();
}

double KFRecordingNode::getMinValue(bool withTangents) {
    Sentry const sentry(_lock);
    double const ofSpline = _splineNode->getMinValue(withTangents);
    if (_points->empty())
        return ofSpline;
    return _splineNode->hasVertices() ? std::min(ofSpline, _points->lowest()) : _points->lowest();
}

double KFRecordingNode::getLastValue() const {
    Sentry const sentry(_lock);
    return _lastValue;
}

void KFRecordingNode::getTake(std::uint32_t* scope, std::uint32_t* mode, Tempus* resolution) const {
    Sentry const sentry(_lock);
    if (scope != nullptr)
        *scope = _scope;
    if (mode != nullptr)
        *mode = _mode;
    if (resolution != nullptr)
        *resolution = _resolution;
}

KFCurveNode* KFRecordingNode::cloneNode() const { return new KFRecordingNode(*this); }

bool KFRecordingNode::compare(KFCurveNode const* other) const {
    auto const* const node = dynamic_cast<KFRecordingNode const*>(other);
    if (node == nullptr)
        return false;
    // A copy, so that the two locks are never held together.
    KFRecordingNode theirs(node->_splineNode);
    theirs = *node;
    Sentry const sentry(_lock);
    return _scope == theirs._scope && _mode == theirs._mode && *_points == *theirs._points &&
           _startTime == theirs._startTime && _resolution == theirs._resolution &&
           areClose(_startValue, theirs._startValue) && areClose(_lastValue, theirs._lastValue);
}

// --- Recording ---

bool KFRecordingNode::beginPlayback(Tempus const& t, std::uint32_t scope, std::uint32_t mode,
                                    Tempus const& resolution) {
    if (scope > kKFRecordingScopeWrite || !TempusIsNumeric(t) || !TempusIsNumeric(resolution) ||
        resolution < kTempusZero)
        return false;
    Sentry const sentry(_lock);
    _scope = scope;
    _mode = mode;
    _playing = true;
    _startTime = t;
    _startValue = splineValue(t);
    _lastValue = _startValue;
    _resolution = resolution;
    _points->clear();
    if (scope == kKFRecordingScopeWrite)
        record(t, _startValue);
    return true;
}

void KFRecordingNode::beginRecording(Tempus const& t) {
    Sentry const sentry(_lock);
    if (_scope == kKFRecordingScopeWrite) {
        record(t, _startValue);
    } else if (hasGuards()) {
        record(t, splineValue(t));
    }
}

void KFRecordingNode::setValue(Tempus const& t, double value, bool) {
    Sentry const sentry(_lock);
    record(t, value);
}

/// The last point that isn't a guard tells whether time moves forward.
void KFRecordingNode::record(Tempus const& t, double value) {
    if (!TempusIsNumeric(t))
        return;
    if (_points->empty()) {
        recordBehind(t, value);
        return;
    }
    std::size_t const latest = _points->size() - (hasGuards() ? 2 : 1);
    Tempus const& time = (*_points)[latest].time;
    if (t == time) {
        _points->setValue(latest, value);
        _lastValue = value;
    } else if (t > time) {
        recordBehind(t, value);
    }
}

void KFRecordingNode::recordBehind(Tempus const& t, double value) {
    KFRecordedPoints::Point const point{t, value};
    auto const guardAt = [this](Tempus const& u) { return KFRecordedPoints::Point{u, splineValue(u)}; };
    if (!hasGuards()) {
        _points->append(point);
    } else if (_points->empty()) {
        _points->append(guardAt(t - _resolution), point, guardAt(t + _resolution));
    } else {
        _points->replaceLast(point, guardAt(t + _resolution));
    }
    _lastValue = value;
}

void KFRecordingNode::updateCurrentTime(Tempus const& t) {
    Sentry const sentry(_lock);
    if (!_points->empty() && hasGuards())
        record(t, _lastValue);
}

// --- The end of a take ---

void KFRecordingNode::endRecording(Tempus const& t) {
    Sentry const sentry(_lock);
    if (_scope == kKFRecordingScopeTouch)
        record(t, _lastValue);
    if (_scope <= kKFRecordingScopeTouch)
        commitChanges();
}

void KFRecordingNode::endPlayback(Tempus const& t) {
    Sentry const sentry(_lock);
    _playing = false;
    if (_scope >= kKFRecordingScopeLatch) {
        record(t, _lastValue);
        commitChanges();
    }
}

/// The guards come first: what they mark off is the stretch whose old keypoints go.
void KFRecordingNode::commitChanges() {
    if (!_points->empty() && _mode == 0) {
        if (_splineNode->getSpline() == nullptr)
            _splineNode->createSpline(); // all keypoints were deleted during the take
        KFSpline& spline = *_splineNode->getSpline();
        auto const add = [&spline](KFRecordedPoints::Point const& point) {
            return spline.addVertex(point.time, point.value, kTempusZero, true);
        };
        if (hasGuards()) {
            add(_points->last());
            _points->removeLast();
            spline.setVertexInterpolation(add(_points->first()), kKFInterpolationLinear);
            _points->removeFirst();
        }
        spline.deleteVertices(_points->first().time, _points->last().time);
        for (std::size_t i = 0; i < _points->size(); ++i)
            add((*_points)[i]);
    }
    _points->clear();
}
