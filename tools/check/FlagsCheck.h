#pragma once

#include "lumenkey/Channels/KFChannelBase.h"
#include "lumenkey/Channels/KFChannelFlags.h"
#include "tools/check/DocumentScanner.h"
#include "tools/check/Fault.h"

#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace lumenkey::tools {

/// The flags of a channel as a reader puts them together, of an attribute and of elements, each of which may
/// change what was before it.
class FlagsCheck {
public:
    /// `example` is what a reader makes for the channel; `place` is the channel's.
    FlagsCheck(KFChannelBase const& example, TextPlace const& place);

    void readAttribute(TextPlace const& place, KFChannelFlags flags);
    /// An element of the channel; others than those of flags don't matter. The text must be readable.
    void readElement(TextPlace const& place, std::string_view name, std::string_view text);

    /// Of what says something else than what the flags become.
    std::vector<std::pair<TextPlace, Fault>> faultsAtEnd() const;
    /// Whether the channel has one of the flags when it is read.
    bool has(KFChannelFlags mask) const { return (read() & mask) != 0; }
    /// What says of a flag last whether it is set; the channel's own where nothing does.
    TextPlace placeOf(KFChannelFlags flag) const;

private:
    /// What a place says: which bits are set, and which aren't.
    struct Source {
        TextPlace place;
        std::string what;
        KFChannelFlags set;
        KFChannelFlags clear;
    };

    void readFlags(TextPlace const& place, KFChannelFlags flags);
    void readBaseFlags(TextPlace const& place, KFChannelFlags flags);
    void add(TextPlace const& place, std::string_view name, KFChannelFlags number, KFChannelFlags set,
             KFChannelFlags clear);

    KFChannelFlags read() const { return _flags | (_isLockedAtEnd ? kChannelFlagLocked : 0); }
    KFChannelFlags kept() const;

    TextPlace _place;
    /// Those that it is made with.
    KFChannelFlags _own;
    KFChannelFlags _flags;
    bool _isLockedAtEnd = false;
    std::vector<Source> _sources;
};

/// Of the flags of a folder: a reader leaves some of them as the class has them.
Fault faultOfFoldFlags(KFChannelBase const& example, std::string_view text);

/// Of the `timing` of an object root: its extent is kept as a start and a duration, which don't give every
/// end back.
Fault faultOfTiming(KFChannelBase const& example, Attributes const& attributes);

} // namespace lumenkey::tools
