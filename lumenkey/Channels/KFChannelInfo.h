#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXString.h"

/// What a slider shows of a channel: its ends, steps and unit.
///
/// A record with `shared` set stands for a whole class and is never written once channels use it; a channel that
/// departs from it makes a local copy.
class LUMENKEY_API KFChannelInfo {
public:
    KFChannelInfo() noexcept = default;
    KFChannelInfo(double minimum, double maximum, double coarse, double fine, double scaleFactor,
                  char const* suffixText);
    KFChannelInfo(double minimum, double maximum, double coarse, double fine, double scaleFactor,
                  BXString const& suffixText);
    /// Everything; `shared` becomes false, also for the assignment.
    KFChannelInfo(KFChannelInfo const& other);
    KFChannelInfo& operator=(KFChannelInfo const& other);
    virtual ~KFChannelInfo();

    /// For one channel more: a shared record (or null) itself, of a local one, which has one owner, a copy.
    static KFChannelInfo* sharedOrCopied(KFChannelInfo* record);

    /// The six numbers exactly, the suffix and the transformer's name.
    bool operator==(KFChannelInfo const& other) const noexcept;

    double sliderMax = 0.0;
    double sliderMin = 0.0;
    double fineDelta = 0.0;
    double coarseDelta = 0.0;
    /// Unit factor: two channels hold the same quantity when value times scale is equal.
    double scale = 0.0;
    /// Display offset; carried, and not used by the value path.
    double offset = 0.0;
    /// Unit text behind the number.
    BXString suffix;
    /// The host's class that maps slider positions to values.
    BXString const* sliderTransformerName = defaultSliderTransformerName();
    bool shared = true;

    static BXString const* defaultSliderTransformerName();
};
