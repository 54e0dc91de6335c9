// Takes: what a channel adds to those of its curve (the lock, global time, the host's callbacks).

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/curves/KFCurve.h"

#include <algorithm>

// --- The record ---

bool KFChannelImpl::beginPlayback(Tempus const& t, std::uint32_t scope, std::uint32_t mode,
                                  Tempus const& resolution) {
    return _curve != nullptr && _curve->beginPlayback(t, scope, mode, resolution);
}

bool KFChannelImpl::endPlayback(Tempus const& t) { return _curve != nullptr && _curve->endPlayback(t); }

bool KFChannelImpl::beginRecording(Tempus const& t) {
    recordingCallbacks().clear();
    return _curve != nullptr && _curve->beginRecording(t);
}

bool KFChannelImpl::endRecording(Tempus const& t) { return _curve != nullptr && _curve->endRecording(t); }

bool KFChannelImpl::updateCurrentRecordingTime(Tempus const& t) {
    return _curve != nullptr && _curve->updateCurrentRecordingTime(t);
}

bool KFChannelImpl::isPlaying(std::uint32_t* scope, std::uint32_t* mode, Tempus* resolution) const {
    return _curve != nullptr && _curve->isPlaying(scope, mode, resolution);
}

bool KFChannelImpl::isRecording() const { return _curve != nullptr && _curve->isRecording(); }

/// Two threads may be the first at once: the loser drops its list.
KFChannelImpl::RecordingCallbacks& KFChannelImpl::recordingCallbacks() {
    RecordingCallbacks* present = _recordingCallbacks.load(std::memory_order_acquire);
    if (present != nullptr)
        return *present;
    auto made = std::make_unique<RecordingCallbacks>();
    if (_recordingCallbacks.compare_exchange_strong(present, made.get(), std::memory_order_acq_rel))
        return *made.release();
    return *present;
}

void KFChannelImpl::registerRecordingCallback(RecordingCallbackData const& callback) {
    if (callback.function != nullptr)
        recordingCallbacks().push_back(callback);
}

void KFChannelImpl::unregisterRecordingCallback(RecordingCallbackData const& callback) {
    RecordingCallbacks* const callbacks = _recordingCallbacks.load(std::memory_order_acquire);
    if (callbacks == nullptr)
        return;
    auto const found =
        std::find_if(callbacks->begin(), callbacks->end(), [&callback](RecordingCallbackData const& entry) {
            return entry.function == callback.function && entry.context == callback.context;
        });
    if (found != callbacks->end())
        callbacks->erase(found);
}

void KFChannelImpl::didRecordValue(KFChannel* channel, Tempus const& t) {
    RecordingCallbacks* const callbacks = _recordingCallbacks.load(std::memory_order_acquire);
    // By index and by copy: a callback may change the list.
    for (std::size_t i = 0; callbacks != nullptr && i < callbacks->size(); ++i) {
        RecordingCallbackData const entry = (*callbacks)[i];
        entry.function(channel, t, entry.context);
    }
}

// --- The channel ---

void KFChannel::beginPlayback(Tempus const& t, unsigned int scope, unsigned int mode,
                              Tempus const& resolution) {
    if (isLocked(false))
        return;
    createLocalChannelImplementation();
    _impl->beginPlayback(t, scope, mode, resolution);
}

void KFChannel::endPlayback(Tempus const& t) {
    if (_impl != nullptr)
        _impl->endPlayback(t);
}

void KFChannel::beginRecording(Tempus const& t) {
    if (isLocked(false))
        return;
    createLocalChannelImplementation();
    _impl->beginRecording(globalToLocalTime(t));
    if (KFChannelObjectRootBase* const root = getChannelRootBase())
        root->didBeginRecording(this, t);
}

void KFChannel::endRecording(Tempus const& t) {
    if (_impl != nullptr)
        _impl->endRecording(globalToLocalTime(t));
    if (KFChannelObjectRootBase* const root = getChannelRootBase())
        root->didEndRecording(this, t);
}

void KFChannel::updateCurrentRecordingTime(Tempus const& t) {
    if (_impl != nullptr)
        _impl->updateCurrentRecordingTime(globalToLocalTime(t));
}

bool KFChannel::isPlaying(unsigned int* scope, unsigned int* mode, Tempus* resolution) {
    return _impl != nullptr && _impl->isPlaying(scope, mode, resolution);
}

bool KFChannel::isRecording() { return _impl != nullptr && _impl->isRecording(); }

void KFChannel::registerRecordingCallback(RecordingCallback function, void* context, bool wantsWrapper) {
    if (isLocked(false))
        return;
    createLocalChannelImplementation();
    _impl->registerRecordingCallback({function, context, wantsWrapper});
}

void KFChannel::unregisterRecordingCallback(RecordingCallback function, void* context) {
    if (_impl != nullptr)
        _impl->unregisterRecordingCallback({function, context, false});
}

void KFChannel::didRecordValue(Tempus const& t) {
    if (_impl != nullptr)
        _impl->didRecordValue(this, t);
}
