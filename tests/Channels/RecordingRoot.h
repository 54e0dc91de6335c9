#pragma once

#include "lumenkey/Channels/KFChannelObjectRootBase.h"

#include <string>
#include <type_traits>
#include <utility>
#include <vector>

/// So many seconds, or parts of one; a fraction of a second in units of a 600th.
template <class Number> Tempus s(Number value, std::int32_t timescale = 1) {
    if constexpr (std::is_floating_point_v<Number>)
        return KFChronoForChannelSeconds(value, 600);
    else
        return TempusMake(value, timescale);
}

using Announced = std::vector<std::pair<KFChannelBase*, unsigned>>; // with the kind of change

/// A host's root that keeps what the channels below tell it, and answers as the test says.
class RecordingRoot : public KFChannelObjectRootBase {
public:
    explicit RecordingRoot(char const* name = "Root", unsigned int id = 1, KFChannelFolder* parent = nullptr)
        : KFChannelObjectRootBase(nullptr, name, parent, id, 0, 0) {}

    void willModifyChannel(KFChannelBase* channel, unsigned int kind) override {
        announced.emplace_back(channel, kind);
        nameWhenAnnounced = channel->getName().str();
        flagsWhenAnnounced = channel->getFlags();
    }
    bool checkSolo() override { return anySolo; }
    bool shouldAddKeypointAt0(Tempus const&) override { return addsKeypointAt0; }
    Tempus getFrameDuration() const override { return frameDuration; }

    /// What was announced since the last call.
    Announced takeAnnounced() { return std::exchange(announced, {}); }

    Announced announced;
    std::string nameWhenAnnounced; // of the channel, at the last announcement
    KFChannelFlags flagsWhenAnnounced = 0;
    bool anySolo = false;
    bool addsKeypointAt0 = false;
    Tempus frameDuration = TempusMake(1, 30);
};
