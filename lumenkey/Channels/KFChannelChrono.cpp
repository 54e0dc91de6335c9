// A time held as a number of units.

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFScalarChannels.h"

#include <cmath>
#include <limits>

namespace {

/// Truncated; limited to the range of the type, 0 for what is no number.
std::int64_t wholeUnits(double units) {
    constexpr double end = 9223372036854775808.0;
    if (std::isnan(units))
        return 0;
    if (units >= end)
        return std::numeric_limits<std::int64_t>::max();
    return units < -end ? std::numeric_limits<std::int64_t>::min() : static_cast<std::int64_t>(units);
}

} // namespace

KFChannelChrono::KFChannelChrono(BXString const& name, KFChannelFolder* parent, unsigned int id,
                                 unsigned int flags)
    : KFChannelDouble(getKFChannelChrono_FactoryBase(), name, parent, id, flags) {}
KFChannelChrono::KFChannelChrono(KFFactory* factory, BXString const& name, unsigned int id,
                                 KFChannelImpl* impl, KFChannelInfo* info)
    : KFChannelDouble(factory, name, id, impl, info) {}
KFChannelChrono::KFChannelChrono(KFFactory* factory, BXString const& name, KFChannelFolder* parent,
                                 unsigned int id, unsigned int flags, KFChannelImpl* impl,
                                 KFChannelInfo* info)
    : KFChannelDouble(factory, name, parent, id, flags, impl, info) {}
KFChannelChrono::KFChannelChrono(Tempus const& value, BXString const& name, KFChannelFolder* parent,
                                 unsigned int id, unsigned int flags, KFChannelImpl* impl,
                                 KFChannelInfo* info)
    : KFChannelChrono(value, getKFChannelChrono_FactoryBase(), name, parent, id, flags, impl, info) {}
KFChannelChrono::KFChannelChrono(Tempus const& value, KFFactory* factory, BXString const& name,
                                 KFChannelFolder* parent, unsigned int id, unsigned int flags,
                                 KFChannelImpl* impl, KFChannelInfo* info)
    : KFChannelDouble(factory, name, parent, id, flags, impl, info) {
    double const seconds = TempusGetSeconds(value);
    setDefaultValue(seconds);
    setInitialValue(seconds, false);
}
KFChannelChrono::KFChannelChrono(KFChannelChrono const& other)
    : KFChannelDouble(other), _timeScale(other._timeScale) {}
KFChannelChrono::KFChannelChrono(KFChannelChrono const& other, KFChannelFolder* parent)
    : KFChannelDouble(other, parent), _timeScale(other._timeScale) {}
KFChannelChrono& KFChannelChrono::operator=(KFChannelChrono const& other) {
    KFChannelBase::operator=(other);
    return *this;
}
KFChannelChrono::~KFChannelChrono() = default;

char const* KFChannelChrono::getFacadeWrapperName() { return "KWChannelChrono"; }
KFChannelBase* KFChannelChrono::clone() const { return new KFChannelChrono(*this, nullptr); }

void KFChannelChrono::copy(KFChannelBase const* other, bool silent) {
    KFChannelDouble::copy(other, silent);
    if (auto const* const chrono = dynamic_cast<KFChannelChrono const*>(other))
        _timeScale = chrono->_timeScale;
}

bool KFChannelChrono::compare(KFChannelBase const* other) const {
    auto const* const chrono = dynamic_cast<KFChannelChrono const*>(other);
    return chrono != nullptr && _timeScale == chrono->_timeScale && KFChannelDouble::compare(other);
}

void KFChannelChrono::setValueAsChrono(Tempus const& t, Tempus const& value, bool silent) {
    setValue(t, static_cast<double>(TempusFloorQuotient(value, TempusMake(1, _timeScale))), silent);
}

Tempus KFChannelChrono::getValueAsChrono(Tempus const& t, double input) const {
    return TempusMake(wholeUnits(getValueAsDouble(t, input)), _timeScale);
}
