#include "lumenkey/splines/KFVertex.h"

#include "lumenkey/splines/KFInterpolation.h"

KFVertex::KFVertex(Tempus const& u) noexcept
    : _valueUValue(u.value), _valueUTimescale(u.timescale), _valueUFlags(u.flags), _valueUEpoch(u.epoch),
      _normal(0.0), _flags(0), _interpolation(kKFInterpolationLinear) {}

KFVertex::KFVertex(KFVertex const& other) noexcept = default;
KFVertex& KFVertex::operator=(KFVertex const& other) noexcept = default;
KFVertex::~KFVertex() = default;

void KFVertex::storeValueU(Tempus const& u) noexcept {
    _valueUValue = u.value;
    _valueUTimescale = u.timescale;
    _valueUFlags = u.flags;
    _valueUEpoch = u.epoch;
}

void KFVertex::setValueU(Tempus const& u) {
    if ((_flags & kKFVertexFlagLocked) != 0)
        return;
    if (TempusCompare(u, getValueU()) != 0)
        storeValueU(u);
}

void KFVertex::setNormal(double normal, Tempus const&) { _normal = normal; }

double KFVertex::getNormal(Tempus const&) const { return _normal; }

void KFVertex::setFlag(std::uint32_t mask) { _flags = _flags | mask; }

void KFVertex::resetFlag(std::uint32_t mask) { _flags = _flags & ~mask; }

std::uint32_t KFVertex::getFlags() const { return _flags; }

void KFVertex::setFlags(std::uint32_t flags) { _flags = flags; }

bool KFVertex::testFlag(std::uint32_t mask) const { return (_flags & mask) != 0; }

void KFVertex::setDefaultAtCurrentTime(Tempus const&) {}

void KFVertex::setInterpolation(std::uint32_t type) { _interpolation = type; }

void KFVertex::updateBias() {}

void KFVertex::enableBehavior(bool) {}

bool KFVertex::enabledBehavior() const { return false; }

bool KFVertex::isEqual(KFVertex const* other) const {
    return TempusCompare(getValueU(), other->getValueU()) == 0 &&
           _interpolation.get() == other->_interpolation.get() && _flags.get() == other->_flags.get() &&
           _normal.get() == other->_normal.get();
}
