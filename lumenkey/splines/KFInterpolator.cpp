#include "lumenkey/splines/KFInterpolator.h"

KFInterpolator::~KFInterpolator() = default;

void KFInterpolator::init(KFSpline&, Tempus const&) {}

void KFInterpolator::convertHandlesToTangents(KFSpline&, double*, double*) {}

void KFInterpolator::convertTangentsToHandles(KFSpline&, double*, double*) {}

bool KFInterpolator::useTangents() { return false; }

bool KFInterpolator::useKeypoints() { return true; }

Tempus KFInterpolator::getAdjustedMaxU(KFSpline&, Tempus const&, Tempus const& u) { return u; }

Tempus KFInterpolator::getAdjustedMinU(KFSpline&, Tempus const&, Tempus const& u) { return u; }

bool KFInterpolator::needInit(KFSpline&) { return false; }

bool KFInterpolator::uForCurveValue(KFSpline&, void*, void*, Tempus const&, Tempus const&, double,
                                    std::vector<Tempus>&) {
    return false;
}

Tempus KFInterpolator::easeTime(KFSpline&, Tempus const& u, void*, void*) { return u; }
