#include "lumenkey/curves/KFSplineNode.h"

#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFVertex.h"

namespace {

bool sameVertices(KFSpline const& a, KFSpline const& b) {
    if (a.getNumberOfVertices() != b.getNumberOfVertices() || a.isClosed() != b.isClosed())
        return false;
    auto placeB = b.beginVertices();
    for (auto placeA = a.beginVertices(); placeA != a.endVertices(); placeA = a.nextPlace(placeA)) {
        if (!(*a.vertexAt(placeA) == *b.vertexAt(placeB)))
            return false;
        placeB = b.nextPlace(placeB);
    }
    return true;
}

} // namespace

KFSplineNode::KFSplineNode(KFCurve* curve) noexcept : KFConstantNode(0.0), _curve(curve) {}

KFSplineNode::KFSplineNode(KFSpline* spline, KFCurve* curve) : KFSplineNode(curve) {
    if (spline != nullptr)
        allocKFSpline(spline);
}

KFSplineNode::KFSplineNode(KFSplineNode const& other, KFCurve* curve) : KFConstantNode(other), _curve(curve) {
    if (other._spline != nullptr)
        allocKFSpline(other._spline);
}

KFSplineNode::KFSplineNode(KFSplineNode const& other) : KFSplineNode(other, nullptr) {}

KFSplineNode& KFSplineNode::operator=(KFSplineNode const& other) {
    if (this == &other)
        return *this;
    KFConstantNode::operator=(other);
    destroySpline();
    _customInterpolator.store(other._customInterpolator.load());
    if (other._spline != nullptr)
        allocKFSpline(other._spline);
    return *this;
}

KFSplineNode::~KFSplineNode() { destroySpline(); }

KFSplineState& KFSplineNode::defaultSettings() {
    static KFSplineState settings;
    return settings;
}

double KFSplineNode::solveNode(Tempus const& t, double operand, double input) {
    // A spline without a vertex asks this node for its value, so that one lock guards both questions.
    return _spline == nullptr ? KFConstantNode::solveNode(t, operand, input)
                              : _spline->getVertexValue(t, kTempusZero, true);
}

void KFSplineNode::solveNode(KFCurveNodeParam& param) {
    if (!hasVertices()) {
        KFConstantNode::solveNode(param);
    } else if (param.segmentSampling) {
        _spline->sampleSplineSegment(param.outputStart, param.outputStep, param.outputCount, nullptr,
                                     param.outputValues, kTempusZero, true);
    } else {
        _spline->sampleSpline(param.outputStart, param.outputStep, param.outputCount,
                              static_cast<Tempus*>(nullptr), param.outputValues, kTempusZero, false);
    }
}

bool KFSplineNode::getUForValue(double value, std::vector<Tempus>& times, BXTimeRange& range, Tempus& step,
                                std::uint32_t flags) {
    return hasVertices() ? _spline->getUForValue(value, times, range, step, flags)
                         : KFConstantNode::getUForValue(value, times, range, step, flags);
}

void KFSplineNode::setValue(Tempus const& t, double value, bool withTangents) {
    if (_spline == nullptr)
        createSpline();
    if (withTangents) {
        _spline->addVertex(t, value, kTempusZero, true);
    } else {
        _spline->addVertexNoTangents(t, value, kTempusZero, true);
    }
}

void KFSplineNode::getNeededRange(KFCurveNodeParam* param) { param->needSameRange(); }

Tempus KFSplineNode::getCurrentRange() {
    return _spline == nullptr ? kTempusZero : _spline->getRangeU(kTempusZero);
}

KFCurveNode* KFSplineNode::cloneNode() const { return new KFSplineNode(*this, nullptr); }

bool KFSplineNode::compare(KFCurveNode const* other) const {
    auto const* const node = dynamic_cast<KFSplineNode const*>(other);
    if (node == nullptr || !KFConstantNode::compare(other))
        return false;
    if (_spline == nullptr || node->_spline == nullptr)
        return _spline == node->_spline;
    return sameVertices(*_spline, *node->_spline);
}

double KFSplineNode::getMaxValue(bool withTangents) {
    if (_spline == nullptr)
        return _value;
    KFSplineAccess const access(*_spline);
    if (_spline->getNumberOfValidVertices(kTempusZero) == 0)
        return _value;
    return withTangents ? _spline->getMaxValueVWithTangents(kTempusZero, nullptr)
                        : _spline->getMaxValueV(kTempusZero, nullptr);
}

double KFSplineNode::getMinValue(bool withTangents) {
    if (_spline == nullptr)
        return _value;
    KFSplineAccess const access(*_spline);
    if (_spline->getNumberOfValidVertices(kTempusZero) == 0)
        return _value;
    return withTangents ? _spline->getMinValueVWithTangents(kTempusZero, nullptr)
                        : _spline->getMinValueV(kTempusZero, nullptr);
}

Tempus KFSplineNode::getMaxValueU() {
    return _spline == nullptr ? kTempusZero : _spline->getMaxValueU(kTempusZero, true);
}

Tempus KFSplineNode::getMinValueU() {
    return _spline == nullptr ? kTempusZero : _spline->getMinValueU(kTempusZero, true);
}

void KFSplineNode::reset() {
    destroySpline();
    KFConstantNode::reset();
}

Tempus KFSplineNode::getFrameDuration() const {
    return _curve == nullptr ? TempusMake(1, 30) : _curve->getFrameDuration();
}

bool KFSplineNode::hasVertices() const { return _spline != nullptr && _spline->getNumberOfVertices() != 0; }

void KFSplineNode::createSpline() { allocKFSpline(nullptr); }

void KFSplineNode::allocKFSpline(KFSpline* from) {
    KFSplineState* const own = _curve == nullptr ? nullptr : _curve->getSplineState();
    KFSplineState* const settings = own == nullptr ? &defaultSettings() : own;
    _spline = from == nullptr ? new KFSpline(settings) : new KFSpline(*from, settings);
    _spline->setNode(this);
}

void KFSplineNode::destroySpline() noexcept {
    delete _spline;
    _spline = nullptr;
}
