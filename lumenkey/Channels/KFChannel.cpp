// The channel as an object: its two records, its copies, and what it announces.

#include "lumenkey/Channels/KFChannel.h"

#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFChannelInfo.h"
#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/curves/KFCurveOwner.h"

#include <algorithm>

namespace {

/// What a limit must lie within to count as one.
constexpr double kUnlimited = 3.4028234663852886e38;

std::unique_ptr<KFCurve> cloneOf(KFCurve* curve) {
    // What `KFCurve` and its classes clone is a `KFCurve` again.
    return std::unique_ptr<KFCurve>(curve == nullptr ? nullptr : static_cast<KFCurve*>(curve->cloneCurve()));
}

} // namespace

class KFChannel::CurveOwner final : public KFCurveOwner {
public:
    explicit CurveOwner(KFChannel const& channel) noexcept : _channel(channel) {}
    Tempus getFrameDurationForCurve() const override { return _channel.getFrameDuration(); }

private:
    KFChannel const& _channel;
};

// --- Construction ---

KFChannel::KFChannel(KFFactory* factory, BXString const& name, KFChannelFolder* parent, unsigned int id,
                     unsigned int flags, KFChannelImpl* impl, KFChannelInfo* info)
    : KFChannelBase(factory, name, parent, id, flags), _impl(impl), _prototypeImpl(impl), _info(info),
      _prototypeInfo(info) {
    setValueChannel(true);
}

KFChannel::KFChannel(KFFactory* factory, BXString const& name, unsigned int id, KFChannelImpl* impl,
                     KFChannelInfo* info)
    : KFChannel(factory, name, nullptr, id, 0, impl, info) {}

// A source's own local record isn't a prototype for the copy: it goes with the source.
KFChannel::KFChannel(KFChannel const& other)
    : KFChannelBase(nullptr, BXString(), nullptr, other.getID(), 0),
      _impl(KFChannelImpl::sharedOrCopied(other._impl)),
      _prototypeImpl(other._prototypeImpl == other._impl ? _impl : other._prototypeImpl),
      _info(KFChannelInfo::sharedOrCopied(other._info)),
      _prototypeInfo(other._prototypeInfo == other._info ? _info : other._prototypeInfo),
      _prototypeCurve(cloneOf(other._prototypeCurve.get())) {
    setValueChannel(true);
}

KFChannel::KFChannel(KFChannel const& other, KFChannelFolder* parent)
    : KFChannelBase(other, parent), _impl(KFChannelImpl::sharedOrCopied(other._impl)),
      _prototypeImpl(other._prototypeImpl == other._impl ? _impl : other._prototypeImpl),
      _info(KFChannelInfo::sharedOrCopied(other._info)),
      _prototypeInfo(other._prototypeInfo == other._info ? _info : other._prototypeInfo),
      _prototypeCurve(cloneOf(other._prototypeCurve.get())) {
    setValueChannel(true);
}

KFChannel::~KFChannel() {
    setValueChannel(false);
    freeLocalImpl();
    freeLocalInfo();
}

void KFChannel::usePrototypes(KFChannelImpl* impl, KFChannelInfo* info) noexcept {
    if (_impl == nullptr)
        _impl = _prototypeImpl = impl;
    if (_info == nullptr)
        _info = _prototypeInfo = info;
}

char const* KFChannel::getFacadeWrapperName() { return "KWChannel"; }
KFChannelBase* KFChannel::clone() const { return nullptr; }

// --- The record of the curve ---

void KFChannel::freeLocalImpl() noexcept {
    if (_impl == nullptr || _impl->isShared())
        return;
    if (_prototypeImpl == _impl)
        _prototypeImpl = nullptr;
    delete _impl;
    _impl = nullptr;
}

KFChannelImpl* KFChannel::createLocalChannelImplementation() {
    // The pointer is written only when the record changes: others may be reading through a local one.
    if (_impl != nullptr && _impl->isShared())
        _impl = _impl->createLocalCopy();
    return _impl;
}

void KFChannel::resetLocalChannelImplementation() {
    if (_impl == nullptr || _impl->isShared() || _impl->shouldKeepLocalCopy())
        return;
    if (_prototypeImpl == nullptr || _prototypeImpl == _impl || !(*_impl == *_prototypeImpl))
        return;
    if (_impl->getCurve() != nullptr && !_impl->getCurve()->hasSignsOf(*_prototypeImpl->getCurve()))
        return;
    freeLocalImpl();
    _impl = _prototypeImpl;
    installPrototypeCurveInterface();
}

void KFChannel::takeImplOf(KFChannel const& other) {
    KFChannelImpl* const source = other._impl;
    if (source == _impl)
        return;
    if (source == nullptr) {
        freeLocalImpl();
        _impl = nullptr;
    } else if (_impl == nullptr) {
        _impl = KFChannelImpl::sharedOrCopied(source);
    } else if (source->isShared() && !_impl->shouldKeepLocalCopy()) {
        freeLocalImpl();
        _impl = source;
    } else if (!_impl->isShared()) {
        *_impl = *source;
    } else {
        _impl = new KFChannelImpl(*source);
    }
}

KFCurve* KFChannel::getCurveInterface() noexcept { return _impl == nullptr ? nullptr : _impl->getCurve(); }

KFCurve const* KFChannel::getCurveInterface() const noexcept {
    return _impl == nullptr ? nullptr : _impl->getCurve();
}

KFCurve& KFChannel::curve() const noexcept { return *_impl->getCurve(); }
KFCurve& KFChannel::curveToWrite() { return *createLocalChannelImplementation()->getCurve(); }

void KFChannel::installPrototypeCurveInterface() {
    if (_prototypeCurve == nullptr || createLocalChannelImplementation() == nullptr)
        return;
    _impl->setCurve(cloneOf(_prototypeCurve.get()));
    curve().setOwnerChannel(curveOwner());
}

void KFChannel::setCurveInterface(KFCurveInterface* curve) {
    auto* const prototype = dynamic_cast<KFCurve*>(curve);
    if (prototype == nullptr || prototype == getCurveInterface() || prototype == _prototypeCurve.get() ||
        isLocked(false))
        return;
    _prototypeCurve.reset(prototype);
    installPrototypeCurveInterface();
}

KFCurveInterface* KFChannel::releaseCurveInterface() {
    if (isLocked(false) || createLocalChannelImplementation() == nullptr)
        return nullptr;
    KFCurve* const released = _impl->releaseCurve().release();
    if (released != nullptr && released->getOwnerChannel() == _curveOwner.get())
        released->setOwnerChannel(nullptr);
    return released;
}

void KFChannel::setOwnerChannel(KFChannel* owner) {
    KFCurveOwner* const wanted = owner == nullptr ? nullptr : owner->curveOwner();
    if (curve().getOwnerChannel() != wanted)
        curveToWrite().setOwnerChannel(wanted);
}

KFCurveOwner* KFChannel::curveOwner() {
    if (_curveOwner == nullptr)
        _curveOwner = std::make_unique<CurveOwner>(*this);
    return _curveOwner.get();
}

// --- The record of the slider ---

void KFChannel::freeLocalInfo() noexcept {
    if (_info == nullptr || _info->shared)
        return;
    if (_prototypeInfo == _info)
        _prototypeInfo = nullptr;
    delete _info;
    _info = nullptr;
}

KFChannelInfo* KFChannel::createLocalChannelInfo() {
    if (_info != nullptr && _info->shared)
        _info = new KFChannelInfo(_prototypeInfo == nullptr ? *_info : *_prototypeInfo);
    return _info;
}

void KFChannel::resetLocalChannelInfo() {
    if (_info == nullptr || _info->shared || _prototypeInfo == nullptr || _prototypeInfo == _info ||
        !(*_info == *_prototypeInfo))
        return;
    freeLocalInfo();
    _info = _prototypeInfo;
}

void KFChannel::setInfo(KFChannelInfo const* source) {
    if (source == nullptr)
        return;
    if (_info == nullptr || _info->shared) {
        _info = new KFChannelInfo(*source);
    } else if (source != _info) {
        *_info = *source;
    }
}

void KFChannel::replaceInfo(KFChannelInfo* info) {
    if (info == nullptr || info == _info)
        return;
    freeLocalInfo();
    _info = info;
    if (info->shared)
        _prototypeInfo = info;
}

void KFChannel::takeInfoOf(KFChannel const& other) {
    KFChannelInfo* const source = other._info;
    if (source == _info || source == nullptr)
        return;
    if (source->shared) {
        freeLocalInfo();
        _info = source;
    } else {
        setInfo(source);
    }
}

// --- Copies ---

double KFChannel::unitFactor(KFChannel const& other) const {
    double const scale = getScale();
    return scale == 0.0 || isSame(other.getScale(), scale) ? 1.0 : other.getScale() / scale;
}

void KFChannel::copy(KFChannelBase const* other, bool silent) {
    if (other == nullptr)
        return;
    if (!silent)
        willBeModified(kModifyData);
    KFChannelBase::copy(other, silent);
    if (auto const* const channel = dynamic_cast<KFChannel const*>(other)) {
        takeInfoOf(*channel);
        takeImplOf(*channel);
    }
}

void KFChannel::assign(KFChannelBase const* other) {
    if (!allowsAssignment(other))
        return;
    willBeModified(kModifyData);
    KFChannelBase::assign(other);
    auto const* const channel = dynamic_cast<KFChannel const*>(other);
    if (channel == nullptr)
        return;
    takeImplOf(*channel);
    double const factor = unitFactor(*channel);
    if (factor != 1.0 && getCurveInterface() != nullptr)
        curveToWrite().scaleCurve(factor);
}

KFChannel& KFChannel::operator=(KFChannel const& other) {
    KFChannelBase::operator=(other);
    return *this;
}

bool KFChannel::compare(KFChannelBase const* other) const {
    auto const* const channel = dynamic_cast<KFChannel const*>(other);
    return channel != nullptr && _impl != nullptr && channel->_impl != nullptr && *_impl == *channel->_impl;
}

bool KFChannel::allowsAssignment(KFChannelBase const* other) {
    auto const* const channel = dynamic_cast<KFChannel const*>(other);
    if (channel == nullptr || channel == this || (channel->hasKeypoints(0) && !isKeyframable()))
        return false;
    if (getCurveInterface() == nullptr || channel->getCurveInterface() == nullptr)
        return true;
    double lowest = 0.0;
    double highest = 0.0;
    channel->curve().getCurrentMinValueV(&lowest, false);
    channel->curve().getCurrentMaxValueV(&highest, false);
    double const factor = unitFactor(*channel);
    lowest *= factor;
    highest *= factor;
    double const minimum = getMin();
    double const maximum = getMax();
    return !(minimum > -kUnlimited && std::min(lowest, highest) < minimum) &&
           !(maximum < kUnlimited && std::max(lowest, highest) > maximum);
}

void KFChannel::setValue(KFChannelBase const& other) {
    auto const* const channel = dynamic_cast<KFChannel const*>(&other);
    if (isLocked(false) || channel == nullptr || channel == this || channel->getCurveInterface() == nullptr)
        return;
    double const minimum = getMin();
    double const maximum = getMax();
    createLocalChannelImplementation()->copyCurveInterface(channel->getCurveInterface());
    curve().setAbsoluteMinValueV(minimum);
    curve().setAbsoluteMaxValueV(maximum);
    double const factor = unitFactor(*channel);
    if (factor != 1.0)
        curve().scaleCurve(factor);
}

// --- Announcements ---

unsigned int KFChannel::kindAsAnnounced(unsigned int kind) const {
    return (kind & kModifyData) != 0 && !(isKeyframable() && isSpline()) ? kModifyState : kind;
}

void KFChannel::willBeModified(unsigned int kind) {
    unsigned int const announced = kindAsAnnounced(kind);
    // Not the compound's own operation: that one would announce its children too.
    if (KFChannelFolder* const parent = getParent(); parent != nullptr && parent->isCompoundChannel())
        parent->KFChannelBase::willBeModified(announced);
    KFChannelBase::willBeModified(announced);
}

void KFChannel::parentWillBeModified(unsigned int kind) {
    KFChannelBase::willBeModified(kindAsAnnounced(kind));
}

KFCompoundChannel* KFChannel::linkedCompound() const {
    KFChannelFolder* const parent = getParent();
    if (parent == nullptr || !parent->testFoldFlag(kFoldFlagLinked) || !parent->isCompoundChannel())
        return nullptr;
    return dynamic_cast<KFCompoundChannel*>(parent);
}

bool KFChannel::beginEdit() {
    if (isLocked(false))
        return false;
    willBeModified(kModifyData);
    return true;
}
