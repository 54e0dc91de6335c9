// The curve as an object: its copies, its settings record, its roots, and the state of animation.

#include "lumenkey/curves/KFCurve.h"

#include "lumenkey/curves/KFCurveOwner.h"
#include "lumenkey/curves/KFCurveParseRecord.h"
#include "lumenkey/splines/KFCoreGlobals.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineState.h"

#include <array>
#include <cmath>

KFCurve::KFCurve(double minimum, double maximum, double initialValue)
    : _rootNode(&_constantNode), _constantNode(initialValue), _splineNode(this), _minValue(minimum),
      _maxValue(maximum) {}

KFCurve::KFCurve(KFCurve const& other, bool cloneChain) : KFCurve(other._minValue, other._maxValue, 0.0) {
    copySplineState(other);
    if (cloneChain)
        cloneTree(other);
    copyRoots(other, false);
    _pointToPoint = other._pointToPoint;
    _remapsTime = other._remapsTime;
    _keyframable = other._keyframable;
}

KFCurve& KFCurve::operator=(KFCurve const& other) {
    if (this == &other)
        return *this;
    copySplineState(other);
    copyRoots(other, true);
    _minValue = other._minValue;
    _maxValue = other._maxValue;
    _keyframable = other._keyframable;
    // How a chain is to be run follows from the nodes that stay, not from the other's.
    if (_processingNodes.empty()) {
        _pointToPoint = other._pointToPoint;
        _remapsTime = other._remapsTime;
    }
    return *this;
}

bool KFCurve::operator==(KFCurve const& other) const {
    return _minValue.get() == other._minValue.get() && _maxValue.get() == other._maxValue.get() &&
           _constantNode.compare(&other._constantNode) && _pointToPoint == other._pointToPoint &&
           _remapsTime == other._remapsTime && _keyframable.get() == other._keyframable.get() &&
           _splineNode.compare(&other._splineNode) && settings() == other.settings() && sameRoot(other);
}

bool KFCurve::hasSignsOf(KFCurve const& other) const {
    auto const signs = [](KFCurve const& curve) {
        return std::array{std::signbit(curve._minValue.get()),
                          std::signbit(curve._maxValue.get()),
                          std::signbit(curve._constantNode.getInitialValue()),
                          std::signbit(curve._constantNode.getDefaultValue()),
                          std::signbit(curve._splineNode.getInitialValue()),
                          std::signbit(curve._splineNode.getDefaultValue())};
    };
    return signs(*this) == signs(other);
}

/// The kinds too: a constant node takes a spline node for its equal, but not the other way round.
bool KFCurve::sameRoot(KFCurve const& other) const {
    return _rootKind.get() == other._rootKind.get() && getRootNode()->compare(other.getRootNode());
}

KFCurve::~KFCurve() {
    while (!_processingNodes.empty())
        _processingNodes.pop_back();
    _recordingNode.reset();
    // The spline refers to the settings, so it goes before they do.
    _splineNode.destroySpline();
    setSplineState(nullptr);
}

/// The settings are copied before, so that the copied spline refers to this curve's.
void KFCurve::copyRoots(KFCurve const& other, bool withRecorded) {
    _constantNode = other._constantNode;
    _splineNode = other._splineNode;
    // A take that the other has none of goes last: it may have been what is read.
    std::unique_ptr<KFRecordingNode> const givenUp =
        other._recordingNode == nullptr ? std::move(_recordingNode) : nullptr;
    if (other._recordingNode != nullptr) {
        if (_recordingNode == nullptr)
            _recordingNode = std::make_unique<KFRecordingNode>(*other._recordingNode, &_splineNode);
        if (withRecorded)
            *_recordingNode = *other._recordingNode; // whether this curve plays is its own
    }
    adoptRoot(other._rootKind);
}

// --- The settings record ---

KFSplineState const& KFCurve::settings() const {
    return _splineState == nullptr ? KFSplineNode::defaultSettings() : *_splineState;
}

void KFCurve::setSplineState(KFSplineState* state) {
    if (state == _splineState)
        return;
    KFSplineState* const previous = _splineState;
    _splineState = state;
    if (KFSpline* const spline = getSpline())
        spline->setState(state == nullptr ? &KFSplineNode::defaultSettings() : state);
    if (previous != nullptr && !previous->shared)
        delete previous;
}

KFSplineState* KFCurve::createLocalSplineState() {
    setSplineState(_splineState == nullptr ? KFSplineNode::defaultSettings().createLocalCopy()
                                           : _splineState->createLocalCopy());
    return _splineState;
}

void KFCurve::copySplineState(KFCurve const& other) {
    KFSplineState* const source = other._splineState;
    if (source == nullptr || source->shared) {
        setSplineState(source);
    } else if (_splineState != nullptr && !_splineState->shared) {
        *_splineState = *source;
    } else {
        setSplineState(new KFSplineState(*source));
    }
}

namespace {

/// Copy on write of one setting.
template <class Value> void change(KFCurve& curve, BXRelaxed<Value> KFSplineState::*setting, Value value) {
    if ((curve.settings().*setting).get() == value)
        return;
    if (KFSplineState* const local = curve.createLocalSplineState(); local != nullptr)
        local->*setting = value;
}

template <class Value> bool answer(Value* out, Value value) {
    if (out != nullptr)
        *out = value;
    return true;
}

BXRelaxed<std::uint32_t> KFSplineState::*extrapolationOfSide(std::uint32_t which) noexcept {
    return which == 0 ? &KFSplineState::postExtrapolation : &KFSplineState::preExtrapolation;
}

} // namespace

bool KFCurve::setCurveParametric(bool parametric) {
    change(*this, &KFSplineState::parametric, parametric);
    return true;
}

bool KFCurve::isCurveParametric() { return settings().parametric; }

bool KFCurve::setCurveDeriveTangents(bool derive) {
    change(*this, &KFSplineState::deriveTangents, derive);
    return true;
}

bool KFCurve::isCurveDeriveTangents() { return settings().deriveTangents; }

bool KFCurve::setRoundingInUSpace(bool inUSpace) {
    if (settings().roundingInUSpace.get() != inUSpace)
        createLocalSplineState()->setRoundingInUSpace(inUSpace);
    return true;
}

bool KFCurve::isRoundingInUSpace() { return settings().roundingInUSpace; }

bool KFCurve::setRetimingExtrapolation(bool retiming) {
    change(*this, &KFSplineState::retimingExtrapolation, retiming);
    return true;
}

bool KFCurve::getRetimingExtrapolation() { return settings().retimingExtrapolation; }

bool KFCurve::setCurveExtrapolation(std::uint32_t mode, std::uint32_t which) {
    change(*this, extrapolationOfSide(which), mode);
    return true;
}

bool KFCurve::getCurveExtrapolation(std::uint32_t* out, std::uint32_t which) {
    return answer(out, (settings().*extrapolationOfSide(which)).get());
}

bool KFCurve::setCurveInterpolation(std::uint32_t type) {
    if (!_keyframable)
        return false;
    if (settings().interpolation.get() == type)
        return true;
    createLocalSplineState()->interpolation = type;
    if (KFSpline* const spline = getSpline())
        spline->setInterpolation(type);
    return true;
}

bool KFCurve::getCurveInterpolation(std::uint32_t* out) {
    if (KFSpline* const spline = getSpline()) {
        KFSplineAccess const access(*spline);
        return spline->getInterpolation(out, nullptr, nullptr);
    }
    return out != nullptr && answer(out, settings().interpolation.get());
}

// --- The state of animation ---

bool KFCurve::setCurveKeyframable(bool keyframable) {
    _keyframable = keyframable;
    return true;
}

bool KFCurve::isCurveKeyframable() { return _keyframable; }

bool KFCurve::isAnimated() const {
    return _keyframable && (KFCoreGlobals::getInstance().animate || _splineNode.hasVertices());
}

bool KFCurve::isCurveAnimated(bool* out) {
    answer(out, KFCoreGlobals::getInstance().animate || _splineNode.hasVertices());
    return isAnimated();
}

bool KFCurve::canModifyCurve(bool force) const { return _keyframable && (force || isAnimated()); }

// --- Roots and what they hold ---

void KFCurve::adoptRoot(std::uint32_t kind) noexcept {
    KFCurveNode* node = &_constantNode;
    if (kind == kRootSpline)
        node = &_splineNode;
    if (kind == kRootRecording)
        node = _recordingNode.get();
    _rootKind = kind;
    _rootNode.store(node, std::memory_order_release);
}

void KFCurve::setRootNode(double value) {
    _constantNode.storeValue(value);
    _splineNode.storeValue(value);
    _constantNode.setDefaultValue(_splineNode.getDefaultValue());
    adoptRoot(kRootConstant);
}

void KFCurve::setRootNode(Tempus const&, double value) {
    adoptRoot(kRootSpline);
    _splineNode.setDefaultValue(_constantNode.getDefaultValue());
    _constantNode.storeValue(value);
    if (!_splineNode.hasVertices())
        _splineNode.storeValue(value);
}

void KFCurve::setIsSpline(bool spline, Tempus const& t) {
    if (!spline && _rootKind == kRootSpline) {
        setRootNode(_splineNode.solveNode(t, 0.0, 0.0));
    } else if (spline && _rootKind == kRootConstant) {
        setRootNode(t, _constantNode.solveNode(kTempusZero, 0.0, 0.0));
    }
}

bool KFCurve::getCurveType(std::uint32_t* out) {
    return out != nullptr && answer(out, _rootKind == kRootConstant ? 0U : 1U);
}

bool KFCurve::setCurveType(std::uint32_t type) {
    if (type == 2 || type > 3)
        return false;
    setIsSpline(type != 0, kTempusZero);
    return true;
}

bool KFCurve::setCurveToDefault() {
    if (isRecording())
        return true;
    _constantNode.reset();
    _splineNode.reset();
    return true;
}

bool KFCurve::getCurveDefaultValue(double* out) { return answer(out, getRootNode()->getDefaultValue()); }

bool KFCurve::setCurveDefaultValue(double value) {
    _constantNode.setDefaultValue(value);
    _splineNode.setDefaultValue(value);
    return true;
}

bool KFCurve::getCurveInitialValue(double* out) { return answer(out, clampedInitialValue()); }

bool KFCurve::setCurveInitialValue(double value) {
    _constantNode.setInitialValue(value);
    _splineNode.setInitialValue(value);
    return true;
}

bool KFCurve::getCurrentMaxValueU(Tempus* out) { return answer(out, getRootNode()->getMaxValueU()); }
bool KFCurve::getCurrentMinValueU(Tempus* out) { return answer(out, getRootNode()->getMinValueU()); }
bool KFCurve::getCurrentRangeU(Tempus* out) { return answer(out, getRootNode()->getCurrentRange()); }

bool KFCurve::getCurrentMaxValueV(double* out, bool withTangents) {
    return answer(out, getRootNode()->getMaxValue(withTangents));
}

bool KFCurve::getCurrentMinValueV(double* out, bool withTangents) {
    return answer(out, getRootNode()->getMinValue(withTangents));
}

bool KFCurve::getAbsoluteMaxValueV(double* out) { return answer(out, _maxValue.get()); }
bool KFCurve::getAbsoluteMinValueV(double* out) { return answer(out, _minValue.get()); }

bool KFCurve::setAbsoluteMaxValueV(double value) {
    _maxValue = value;
    return true;
}

bool KFCurve::setAbsoluteMinValueV(double value) {
    _minValue = value;
    return true;
}

Tempus KFCurve::getFrameDuration() const {
    return _ownerChannel == nullptr ? TempusMake(1, 30) : _ownerChannel->getFrameDurationForCurve();
}

KFCurveInterface* KFCurve::getCurveWorkingCopy() { return nullptr; }
bool KFCurve::supportsAssignmentOperator() { return true; }
bool KFCurve::isCurveBoolean() { return false; }
