#include "lumenkey/Channels/KFChannelImpl.h"

#include "lumenkey/curves/KFCurve.h"

KFChannelImpl::KFChannelImpl(KFCurve* curve, double value, unsigned int curveType, bool shared)
    : _curve(curve), _shared(shared) {
    bool const spline = curveType == 1;
    _curve->setIsSpline(spline, kTempusZero);
    _curve->setCurveKeyframable(spline);
    _curve->setCurveDefaultValue(value);
    _curve->setCurveInitialValue(value);
}

KFChannelImpl::KFChannelImpl(KFChannelImpl const& other) { *this = other; }

KFChannelImpl& KFChannelImpl::operator=(KFChannelImpl const& other) {
    if (this == &other)
        return *this;
    _fades = other._fades == nullptr ? nullptr : std::make_unique<KFFadeBlock>(*other._fades);
    copyCurveInterface(other.getCurve());
    _shared = false;
    return *this;
}

KFChannelImpl::~KFChannelImpl() { delete _recordingCallbacks.load(std::memory_order_acquire); }

bool KFChannelImpl::operator==(KFChannelImpl const& other) const {
    if (this == &other)
        return true;
    if ((_fades == nullptr) != (other._fades == nullptr) || (_curve == nullptr) != (other._curve == nullptr))
        return false;
    return (_fades == nullptr || *_fades == *other._fades) && (_curve == nullptr || *_curve == *other._curve);
}

KFChannelImpl* KFChannelImpl::createLocalCopy() { return _shared ? new KFChannelImpl(*this) : this; }

KFChannelImpl* KFChannelImpl::sharedOrCopied(KFChannelImpl* record) {
    return record == nullptr || record->isShared() ? record : new KFChannelImpl(*record);
}

bool KFChannelImpl::shouldKeepLocalCopy() const {
    if (_shared || _curve == nullptr)
        return false;
    std::uint32_t nodes = 0;
    return (_curve->getNumCurveProcessingNodes(&nodes) && nodes > 0) || _curve->getOwnerChannel() != nullptr;
}

void KFChannelImpl::copyCurveInterface(KFCurve const* source) {
    if (source == _curve.get())
        return;
    // The interface's questions and `cloneCurve` aren't const, though neither changes the source.
    auto* const original = const_cast<KFCurve*>(source);
    if (original == nullptr) {
        _curve.reset();
    } else if (_curve != nullptr && _curve->supportsAssignmentOperator() &&
               original->supportsAssignmentOperator()) {
        *_curve = *original;
    } else {
        // What `KFCurve` and its classes clone is a `KFCurve` again.
        _curve.reset(static_cast<KFCurve*>(original->cloneCurve()));
    }
}

void KFChannelImpl::setCurve(std::unique_ptr<KFCurve> curve) noexcept { _curve = std::move(curve); }
std::unique_ptr<KFCurve> KFChannelImpl::releaseCurve() noexcept { return std::move(_curve); }

KFFadeBlock& KFChannelImpl::createFades() {
    if (_fades == nullptr)
        _fades = std::make_unique<KFFadeBlock>();
    return *_fades;
}

bool KFChannelImpl::hasFadeHandles() const noexcept {
    return _fades != nullptr && (_fades->fadeInOffset != kTempusZero || _fades->fadeOutOffset != kTempusZero);
}
