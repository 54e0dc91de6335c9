#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstdint>
#include <memory>

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

private:
    std::unique_ptr<KFCurve> _curve;
    std::unique_ptr<KFFadeBlock> _fades;
    bool _shared = false;
};
