#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"

class KFChannelBase;

/// A host's own route from global to local time, for the channel or folder on which it is set and what lies
/// below.
class LUMENKEY_API KFChannelTimeConverter {
public:
    virtual ~KFChannelTimeConverter();
    virtual Tempus globalToLocalTime(KFChannelBase const* channel, Tempus const& t) const = 0;
    virtual Tempus localToGlobalTime(KFChannelBase const* channel, Tempus const& t) const = 0;
    /// Whether the extent of the object is local time already, as fades then take it.
    virtual bool extentIsLocal() const = 0;

    /// False between construction and destruction of a sentry on this thread. For the host's converter; the
    /// library doesn't ask.
    static bool IsEnabledForCurrentThread() noexcept;
};

/// Switches time converters off on this thread for its scope; sentries nest.
class LUMENKEY_API KFChannelTimeConverterDisableSentry {
public:
    KFChannelTimeConverterDisableSentry() noexcept;
    ~KFChannelTimeConverterDisableSentry();
    KFChannelTimeConverterDisableSentry(KFChannelTimeConverterDisableSentry const&) = delete;
    KFChannelTimeConverterDisableSentry& operator=(KFChannelTimeConverterDisableSentry const&) = delete;
};
