#include "tools/check/FlagsCheck.h"

#include "lumenkey/Channels/KFChannelFolder.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/persistence/KFDocumentFlags.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/output/TextForms.h"

#include <optional>

namespace lumenkey::tools {

namespace {

/// Says nothing of a channel.
constexpr KFChannelFlags kUnstored = kChannelFlagNameUnset;

std::string saying(std::string_view name, std::string const& text) {
    return "'" + std::string(name) + "' is " + text;
}

} // namespace

FlagsCheck::FlagsCheck(KFChannelBase const& example, TextPlace const& place)
    : _place(place), _own(example.getFlags()), _flags(_own) {}

void FlagsCheck::add(TextPlace const& place, std::string_view name, KFChannelFlags number, KFChannelFlags set,
                     KFChannelFlags clear) {
    _sources.push_back({place, saying(name, std::to_string(number)), set, clear});
}

void FlagsCheck::readAttribute(TextPlace const& place, KFChannelFlags flags) {
    _flags = KFFlagsOfAttribute(_flags, flags);
    // Whoever reads the document initializes the channel.
    add(place, "flags", flags, flags & ~(kUnstored | kChannelFlagInitialized),
        ~(flags | kUnstored | kChannelParsePreservedFlags));
}

void FlagsCheck::readElement(TextPlace const& place, std::string_view name, std::string_view text) {
    if (name == "flags") {
        readFlags(place, readWhole(text).value_or(0));
    } else if (name == "baseFlags") {
        readBaseFlags(place, readWhole(text).value_or(0));
    } else if (name == "enabled") {
        bool const isOn = readBool(text).value_or(true);
        _flags = isOn ? _flags & ~kChannelFlagDisabled : _flags | kChannelFlagDisabled;
        add(place, name, isOn ? 1 : 0, isOn ? 0 : kChannelFlagDisabled, isOn ? kChannelFlagDisabled : 0);
    } else if (name == "locked") {
        bool const isOn = readBool(text).value_or(false);
        _isLockedAtEnd = isOn;
        add(place, name, isOn ? 1 : 0, isOn ? kChannelFlagLocked : 0, isOn ? 0 : kChannelFlagLocked);
    }
}

void FlagsCheck::readFlags(TextPlace const& place, KFChannelFlags flags) {
    _flags = KFFlagsOfElement(_flags, flags);
    add(place, "flags", flags, flags & ~kUnstored, ~(flags | kUnstored | kChannelClassFlags));
}

void FlagsCheck::readBaseFlags(TextPlace const& place, KFChannelFlags flags) {
    _flags = KFFlagsOfBaseFlags(_flags, flags);
    add(place, "baseFlags", flags, flags & ~(kUnstored | kChannelFlagInitialized),
        kLowWord & ~(flags | kNotOfBaseFlags | kChannelFlagNotSaved));
}

/// No flags aren't written: the channel has its own again when that is read.
KFChannelFlags FlagsCheck::kept() const { return (read() & ~kUnstored) == 0 ? _own : read(); }

TextPlace FlagsCheck::placeOf(KFChannelFlags flag) const {
    TextPlace place = _place;
    for (Source const& source : _sources) {
        place = ((source.set | source.clear) & flag) != 0 ? source.place : place;
    }
    return place;
}

std::vector<std::pair<TextPlace, Fault>> FlagsCheck::faultsAtEnd() const {
    KFChannelFlags const end = kept();
    std::vector<std::pair<TextPlace, Fault>> faults;
    for (Source const& source : _sources) {
        if ((source.set & ~end) != 0 || (source.clear & end) != 0) {
            faults.push_back({source.place,
                              {source.what + ", but the flags of the channel become " +
                               std::to_string(end & ~kUnstored)}});
        }
    }
    return faults;
}

Fault faultOfFoldFlags(KFChannelBase const& example, std::string_view text) {
    auto const* const folder = dynamic_cast<KFChannelFolder const*>(&example);
    auto const flags = static_cast<std::uint32_t>(readWhole(text).value_or(0));
    if (folder == nullptr || example.testFlag(kChannelFlagIsObjectRoot)) {
        return {};
    }
    std::uint32_t const kept = KFFoldFlagsOfElement(folder->getFoldFlags(), flags);
    return kept == flags ? Fault()
                         : Fault{saying("foldFlags", std::to_string(flags)) + ", but they become " +
                                 std::to_string(kept)};
}

Fault faultOfTiming(KFChannelBase const& example, Attributes const& attributes) {
    auto const* const root = dynamic_cast<KFChannelObjectRootBase const*>(&example);
    std::optional<Tempus> const out = readTime(attributeOf(attributes, "out"));
    if (root == nullptr || !out) {
        return {};
    }
    Tempus const start = readTime(attributeOf(attributes, "in")).value_or(kTempusZero);
    Tempus const frame = root->getFrameDuration();
    Tempus const duration = BX_TempusSaferAdd(BX_TempusSaferSubtract(*out, start), frame);
    Tempus const kept = BX_TempusSaferSubtract(BX_TempusSaferAdd(start, duration), frame);
    return kept == *out ? Fault()
                        : Fault{saying("out", timeText(*out)) + ", but it becomes " + timeText(kept)};
}

} // namespace lumenkey::tools
