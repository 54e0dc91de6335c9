#include "lumenkey/curves/KFCurveNode.h"

KFCurveNode::~KFCurveNode() = default;

double KFCurveNode::solveNode(Tempus const&, double, double input) { return input; }

bool KFCurveNode::getTimeAndDistanceAlongCurve(Tempus const&, Tempus*, double*) { return false; }

bool KFCurveNode::getTimeAndDistanceAlongCurve(Tempus const&, unsigned int, Tempus*, double*) {
    return false;
}

bool KFCurveNode::getParametricValueAndDoubleValueForTime(Tempus const&, Tempus*, double*) { return false; }

void KFCurveNode::setValue(Tempus const&, double, bool) {}
void KFCurveNode::setDefaultValue(double) {}
double KFCurveNode::getDefaultValue() const { return 0.0; }
void KFCurveNode::setInitialValue(double) {}
double KFCurveNode::getInitialValue() const { return 0.0; }

Tempus KFCurveNode::getCurrentRange() { return kTempusZero; }
Tempus KFCurveNode::getNeededTime(Tempus const& t) { return t; }

double KFCurveNode::getMaxValue(bool) { return 0.0; }
double KFCurveNode::getMinValue(bool) { return 0.0; }
Tempus KFCurveNode::getMaxValueU() { return kTempusZero; }
Tempus KFCurveNode::getMinValueU() { return kTempusZero; }

bool KFCurveNode::isPointToPoint() const { return true; }
bool KFCurveNode::isRemappingTime() const { return false; }
bool KFCurveNode::isPassThrough() const { return false; }

void KFCurveNode::reset() {}
