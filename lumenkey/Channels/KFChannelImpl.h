#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <vector>

class KFChannel;
class KFChannelBase;
class KFCurve;

/// A channel's fades: lengths at the start and the end of its extent (zero means none) and their shapes (0 linear,
/// 1 fast at the outer end, 2 fast at the inner end, 3 slow at both).
struct KFFadeBlock {
    Tempus fadeInOffset = kTempusZero;
    Tempus fadeOutOffset = kTempusZero;
    std::uint32_t fadeInCurve = 0;
    std::uint32_t fadeOutCurve = 0;

    bool operator==(KFFadeBlock const& other) const noexcept {
        return fadeInOffset == other.fadeInOffset && fadeOutOffset == other.fadeOutOffset &&
               fadeInCurve == other.fadeInCurve && fadeOutCurve == other.fadeOutCurve;
    }
};

/// Whom to tell of each value that is recorded: with the channel, or its facade wrapper, and the context.
struct RecordingCallbackData {
    void (*function)(KFChannelBase*, Tempus const&, void*);
    void* context;
    bool wantsWrapper;
};

/// Holds a channel's curve and fades: shared by all channels of a class until one of them differs.
///
/// A shared record is made once for a class, lives for the process and isn't written once channels use it (but for
/// `KFChannel::setDiscrete` in place).
class LUMENKEY_API KFChannelImpl {
public:
    /// No curve, not shared.
    KFChannelImpl() noexcept = default;
    /// Takes the curve, which may not be null, and makes it a spline that takes keypoints (`curveType` 1) or a
    /// constant that takes none, with `value` as default and initial value.
    KFChannelImpl(KFCurve* curve, double value, unsigned int curveType, bool shared);
    KFChannelImpl(KFChannelImpl const& other);
    /// Fades and curve; not shared afterwards.
    KFChannelImpl& operator=(KFChannelImpl const& other);
    virtual ~KFChannelImpl();

    /// Fades, then curves.
    bool operator==(KFChannelImpl const& other) const;

    /// This record when it isn't shared, else a new local copy, which the caller owns.
    KFChannelImpl* createLocalCopy();
    /// For one channel more: a shared record (or null) itself, of a local one, which has one owner, a copy.
    static KFChannelImpl* sharedOrCopied(KFChannelImpl* record);
    /// A local record whose curve holds processing nodes or knows its owner can't be given up for the shared one.
    bool shouldKeepLocalCopy() const;
    /// Assigns the source's curve to the one in use where both allow it, else takes a clone of it. Null frees the
    /// curve in use.
    void copyCurveInterface(KFCurve const* source);

    KFCurve* getCurve() const noexcept { return _curve.get(); }
    void setCurve(std::unique_ptr<KFCurve> curve) noexcept;
    std::unique_ptr<KFCurve> releaseCurve() noexcept;

    KFFadeBlock* getFades() const noexcept { return _fades.get(); }
    /// Makes an empty block if there is none.
    KFFadeBlock& createFades();
    void freeFades() noexcept { _fades.reset(); }
    bool hasFadeHandles() const noexcept;

    bool isShared() const noexcept { return _shared; }

    // Takes, in curve time. Each does nothing without a curve, and is false where the curve refuses.

    bool beginPlayback(Tempus const& t, std::uint32_t scope, std::uint32_t mode, Tempus const& resolution);
    bool endPlayback(Tempus const& t);
    /// Forgets the callbacks first: they are registered for one take.
    bool beginRecording(Tempus const& t);
    bool endRecording(Tempus const& t);
    bool updateCurrentRecordingTime(Tempus const& t);
    bool isPlaying(std::uint32_t* scope, std::uint32_t* mode, Tempus* resolution) const;
    bool isRecording() const;

    // Callbacks aren't copied, assigned or compared. A null function is ignored. Not guarded: register, unregister and
    // record on one thread at a time. A callback may register and unregister, itself too; one that comes in is called
    // for this value already.

    void registerRecordingCallback(RecordingCallbackData const& callback);
    /// The first with this function and context.
    void unregisterRecordingCallback(RecordingCallbackData const& callback);
    /// Calls each in the order of registration.
    void didRecordValue(KFChannel* channel, Tempus const& t);

private:
    using RecordingCallbacks = std::vector<RecordingCallbackData>;
    RecordingCallbacks& recordingCallbacks();

    std::unique_ptr<KFCurve> _curve;
    std::unique_ptr<KFFadeBlock> _fades;
    std::atomic<RecordingCallbacks*> _recordingCallbacks{nullptr}; // owned, made on first use
    bool _shared = false;
};
