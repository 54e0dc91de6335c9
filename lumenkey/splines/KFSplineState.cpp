#include "lumenkey/splines/KFSplineState.h"

#include "lumenkey/foundation/BXMath.h"

namespace {

Tempus roundingDeltaFor(bool inUSpace) noexcept {
    return inUSpace ? TempusMake(1, 30) : TempusMake(1, 3000000);
}

} // namespace

KFSplineState::KFSplineState(bool parametricIn, bool roundingInUSpaceIn, bool deriveTangentsIn,
                             bool sanitizeBezierIn, std::uint32_t interpolationIn,
                             std::uint32_t preExtrapolationIn, std::uint32_t postExtrapolationIn,
                             bool retimingExtrapolationIn) noexcept
    : parametric(parametricIn), roundingInUSpace(roundingInUSpaceIn), deriveTangents(deriveTangentsIn),
      sanitizeBezier(sanitizeBezierIn), retimingExtrapolation(retimingExtrapolationIn),
      roundingDelta(roundingDeltaFor(roundingInUSpaceIn)), interpolation(interpolationIn),
      postExtrapolation(postExtrapolationIn), preExtrapolation(preExtrapolationIn), shared(true) {}

KFSplineState::KFSplineState(KFSplineState const& other) noexcept
    : parametric(other.parametric), roundingInUSpace(other.roundingInUSpace),
      deriveTangents(other.deriveTangents), sanitizeBezier(other.sanitizeBezier),
      retimingExtrapolation(other.retimingExtrapolation),
      roundingDelta(roundingDeltaFor(other.roundingInUSpace)), interpolation(other.interpolation),
      postExtrapolation(other.postExtrapolation), preExtrapolation(other.preExtrapolation), shared(false) {}

KFSplineState& KFSplineState::operator=(KFSplineState const& other) noexcept {
    parametric = other.parametric;
    roundingInUSpace = other.roundingInUSpace;
    deriveTangents = other.deriveTangents;
    sanitizeBezier = other.sanitizeBezier;
    retimingExtrapolation = other.retimingExtrapolation;
    roundingDelta = roundingDeltaFor(other.roundingInUSpace);
    interpolation = other.interpolation;
    postExtrapolation = other.postExtrapolation;
    preExtrapolation = other.preExtrapolation;
    return *this;
}

KFSplineState::~KFSplineState() = default;

bool KFSplineState::operator==(KFSplineState const& other) const noexcept {
    return parametric.get() == other.parametric.get() &&
           roundingInUSpace.get() == other.roundingInUSpace.get() &&
           deriveTangents.get() == other.deriveTangents.get() &&
           sanitizeBezier.get() == other.sanitizeBezier.get() &&
           retimingExtrapolation.get() == other.retimingExtrapolation.get() &&
           interpolation.get() == other.interpolation.get() &&
           postExtrapolation.get() == other.postExtrapolation.get() &&
           preExtrapolation.get() == other.preExtrapolation.get() &&
           BXMath::equal(roundingDelta, other.roundingDelta, kTempusZero);
}

KFSplineState* KFSplineState::createLocalCopy() { return shared ? new KFSplineState(*this) : this; }

void KFSplineState::setRoundingInUSpace(bool inUSpace) noexcept {
    roundingInUSpace = inUSpace;
    roundingDelta = roundingDeltaFor(inUSpace);
}
