#include "lumenkey/Channels/KFChannelObjectRootBase.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/splines/KFCoreGlobals.h"

#include <cmath>

namespace {

/// Of an object that the host hasn't said anything about.
constexpr unsigned int kUnspecifiedColorSpaceID = 3;
constexpr KFChannelFlags kRootFlags = kChannelFlagIsObjectRoot | kChannelFlagNameUnset;

} // namespace

KFChannelObjectRootBase::KFChannelObjectRootBase(KFFactory* factory, BXString const& name,
                                                 KFChannelFolder* parent, unsigned int id, unsigned int flags,
                                                 unsigned int capacity)
    : KFChannelFolder(factory, name, parent, id, flags, capacity) {
    storeFlags(getFlags() | kRootFlags);
}

KFChannelObjectRootBase::KFChannelObjectRootBase(KFFactory* factory, BXString const& name, unsigned int id,
                                                 unsigned int capacity)
    : KFChannelFolder(factory, name, id, capacity) {
    storeFlags(getFlags() | kRootFlags);
}

KFChannelObjectRootBase::KFChannelObjectRootBase(BXString const& name, KFChannelFolder* parent,
                                                 unsigned int id, unsigned int flags, unsigned int capacity)
    : KFChannelObjectRootBase(getKFChannelObjectRootBase_FactoryBase(), name, parent, id, flags, capacity) {}

KFChannelObjectRootBase::KFChannelObjectRootBase(KFChannelObjectRootBase const& other)
    : KFChannelObjectRootBase(other, nullptr) {}

KFChannelObjectRootBase::KFChannelObjectRootBase(KFChannelObjectRootBase const& other,
                                                 KFChannelFolder* parent)
    : KFChannelFolder(other, parent), _timeOffset(other._timeOffset), _timeExtent(other._timeExtent),
      _writesTimeRange(other._writesTimeRange) {
    storeFlags(getFlags() | kRootFlags);
}

KFChannelObjectRootBase::~KFChannelObjectRootBase() = default;

char const* KFChannelObjectRootBase::getFacadeWrapperName() { return "KWChannelObjectRootBase"; }

// Copies ----------------------------------------------------------------------------------------------------

void KFChannelObjectRootBase::copy(KFChannelBase const* other, bool silent) {
    if (other == nullptr) {
        return;
    }
    KFChannelFolder::copy(other, silent);
    if (other->testFlag(kChannelFlagIsObjectRoot)) {
        auto const& root = static_cast<KFChannelObjectRootBase const&>(*other);
        _timeOffset = root._timeOffset;
        _timeExtent = root._timeExtent;
        _writesTimeRange = root._writesTimeRange;
    }
}

void KFChannelObjectRootBase::assign(KFChannelBase const* other) {
    if (other == nullptr) {
        return;
    }
    KFChannelFolder::assign(other);
    setName(other->getName(), true);
    storeInternalName(other->getInternalName() != nullptr ? *other->getInternalName() : other->getName());
}

bool KFChannelObjectRootBase::compare(KFChannelBase const* other) const {
    if (other == nullptr || !other->testFlag(kChannelFlagIsObjectRoot) || !KFChannelFolder::compare(other)) {
        return false;
    }
    auto const& root = static_cast<KFChannelObjectRootBase const&>(*other);
    return _timeOffset == root._timeOffset && _timeExtent.start == root._timeExtent.start &&
           _timeExtent.duration == root._timeExtent.duration;
}

KFChannelBase* KFChannelObjectRootBase::clone() const { return new KFChannelObjectRootBase(*this, nullptr); }

KFChannelObjectRootBase& KFChannelObjectRootBase::operator=(KFChannelObjectRootBase const& other) {
    assign(&other);
    return *this;
}

// Time ------------------------------------------------------------------------------------------------------

Tempus KFChannelObjectRootBase::getTimeOffset() const { return _timeOffset; }

Tempus KFChannelObjectRootBase::globalToLocalTime(Tempus const& t) const {
    return BX_TempusSaferSubtract(t, _timeOffset);
}

Tempus KFChannelObjectRootBase::localToGlobalTime(Tempus const& t) const {
    return BX_TempusSaferAdd(t, _timeOffset);
}

void KFChannelObjectRootBase::setTimeOffset(Tempus const& offset, bool silent) {
    if (!silent) {
        willBeModified(kModifyData);
    }
    _timeOffset = offset;
}

void KFChannelObjectRootBase::setTimeExtent(BXTimeRange const& range, bool silent) {
    if (!silent) {
        willBeModified(kModifyData);
    }
    if (TempusIsNumeric(_timeExtent.duration) &&
        hasFadeHandles()) { // nothing is a share of an endless extent
        double const factor = TempusRatio(range.duration, _timeExtent.duration);
        if (std::isfinite(factor)) {
            scaleFadeHandles(factor);
        }
    }
    _timeExtent = range;
}

void KFChannelObjectRootBase::adjustToFrameDuration(Tempus const& frameDuration) {
    KFChannelFolder::adjustToFrameDuration(frameDuration);
    _timeExtent.start = _timeExtent.start * frameDuration;
    _timeExtent.duration = _timeExtent.duration * frameDuration;
}

// What the host overrides -----------------------------------------------------------------------------------

BXTimeRange KFChannelObjectRootBase::getTimeExtent() const { return _timeExtent; }

BXTimeRange KFChannelObjectRootBase::getTimeExtentForChannel(KFChannelBase const*) const {
    return getTimeExtent();
}

void KFChannelObjectRootBase::channelValueWillBeSet(KFChannel*, Tempus const&, double) {}
void KFChannelObjectRootBase::didBeginRecording(KFChannelBase*, Tempus const&) {}
void KFChannelObjectRootBase::didEndRecording(KFChannelBase*, Tempus const&) {}
void KFChannelObjectRootBase::addToUndo(KFChannelBase const*, BXString const&) const {}
void KFChannelObjectRootBase::rootUndoDidReplace(KFChannelBase*) {}
void KFChannelObjectRootBase::rootUndoWillReplace(KFChannelBase*) {}
void KFChannelObjectRootBase::willModifyChannel(KFChannelBase*, unsigned int) {}
bool KFChannelObjectRootBase::wasChannelModified(KFChannelBase*, bool*) { return true; }
bool KFChannelObjectRootBase::checkSolo() { return false; }
bool KFChannelObjectRootBase::shouldAddKeypointAt0(Tempus const&) { return false; }
bool KFChannelObjectRootBase::isChannelAffectedByBehaviors(KFChannelBase const*, bool) const { return false; }
bool KFChannelObjectRootBase::isChannelAffectedBySelectedBehaviors(KFChannelBase const*) const {
    return false;
}
bool KFChannelObjectRootBase::isChannelRigged(KFChannelBase const*) { return false; }
bool KFChannelObjectRootBase::isObjectSelected() { return testFlag(kChannelFlagObjectSelected); }
void* KFChannelObjectRootBase::getManipulator() const { return nullptr; }
Tempus KFChannelObjectRootBase::getCurrentTime(bool) { return KFCoreGlobals::getInstance().currentTime; }
BXTimeRange KFChannelObjectRootBase::getGlobalTimeRange() { return getTimeExtent(); }
unsigned int KFChannelObjectRootBase::getDefaultParameterColorSpaceID() const {
    return kUnspecifiedColorSpaceID;
}
unsigned int KFChannelObjectRootBase::getWorkingGamut() const { return 0; }
Tempus KFChannelObjectRootBase::getFrameDuration() const { return TempusMake(1, 30); }
