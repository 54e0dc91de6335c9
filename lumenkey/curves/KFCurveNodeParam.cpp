#include "lumenkey/curves/KFCurveNodeParam.h"

KFCurveNodeParam::KFCurveNodeParam(KFCurveNodeParam const& other) noexcept
    : active(other.active), segmentSampling(other.segmentSampling), operand(other.operand),
      inputStart(other.inputStart), inputStep(other.inputStep), inputCount(other.inputCount),
      inputValues(other.inputValues), outputStart(other.outputStart), outputStep(other.outputStep),
      outputCount(other.outputCount), outputValues(other.outputValues) {}

KFCurveNodeParam::~KFCurveNodeParam() {
    if (ownsInputValues)
        delete[] inputValues;
    if (ownsOutputValues)
        delete[] outputValues;
}

void KFCurveNodeParam::needSameRange() noexcept {
    inputStart = outputStart;
    inputStep = outputStep;
    inputCount = outputCount;
    inputValues = outputValues;
    ownsInputValues = false;
}
