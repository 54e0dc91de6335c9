#pragma once

#include "lumenkey/Channels/KFChannelTimeConverter.h"

/// A host's converter: local time is `speed` times global time, and `shift` later. At no speed it stands still.
struct LinearConverter : KFChannelTimeConverter {
    explicit LinearConverter(Tempus const& speedIn, Tempus const& shiftIn = kTempusZero)
        : speed(speedIn), shift(shiftIn) {}
    Tempus globalToLocalTime(KFChannelBase const* channel, Tempus const& t) const override {
        asked = channel;
        return t * speed + shift;
    }
    Tempus localToGlobalTime(KFChannelBase const* channel, Tempus const& t) const override {
        asked = channel;
        return speed == kTempusZero ? TempusMake(1, 1) : (t - shift) / speed;
    }
    bool extentIsLocal() const override { return true; }

    Tempus speed, shift;
    mutable KFChannelBase const* asked = nullptr; // last
};
