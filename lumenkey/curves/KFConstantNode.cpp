#include "lumenkey/curves/KFConstantNode.h"

#include <algorithm>
#include <cmath>

namespace {

/// Values that are closer count as the same when a time is looked for.
constexpr double kValueTolerance = 1e-7;

} // namespace

KFConstantNode::~KFConstantNode() = default;

double KFConstantNode::solveNode(Tempus const&, double, double) { return _value; }

void KFConstantNode::solveNode(KFCurveNodeParam& param) {
    if (param.outputValues != nullptr)
        std::fill_n(param.outputValues, param.outputCount, _value.get());
}

bool KFConstantNode::getUForValue(double value, std::vector<Tempus>& times, BXTimeRange& range, Tempus&,
                                  std::uint32_t) {
    if (!(std::fabs(_value - value) < kValueTolerance))
        return false;
    times.push_back(range.start);
    return true;
}

void KFConstantNode::setValue(Tempus const&, double value, bool) { _value = value; }
void KFConstantNode::setDefaultValue(double value) { _defaultValue = value; }
double KFConstantNode::getDefaultValue() const { return _defaultValue; }
void KFConstantNode::setInitialValue(double value) { _value = value; }
double KFConstantNode::getInitialValue() const { return _value; }

void KFConstantNode::getNeededRange(KFCurveNodeParam* param) { param->needSameRange(); }

KFCurveNode* KFConstantNode::cloneNode() const { return new KFConstantNode(*this); }

bool KFConstantNode::compare(KFCurveNode const* other) const {
    auto const* const constant = dynamic_cast<KFConstantNode const*>(other);
    return constant != nullptr && _value.get() == constant->_value.get() &&
           _defaultValue.get() == constant->_defaultValue.get();
}

double KFConstantNode::getMaxValue(bool) { return _value; }
double KFConstantNode::getMinValue(bool) { return _value; }

void KFConstantNode::reset() { _value = _defaultValue; }
