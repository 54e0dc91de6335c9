#pragma once

#include "lumenkey/foundation/Tempus.h"

#include <optional>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// A time as a user writes it: `VALUE/TIMESCALE`, seconds (`0.5`, taken as the exact decimal) or frames
/// (`12f`). What has no exact form as a time is refused.
class TimeArgument {
public:
    /// Throws `UsageError`.
    static TimeArgument parse(std::string_view text);
    /// Nothing for an empty text.
    static std::optional<TimeArgument> parseIfGiven(std::string_view text);
    /// Several, with commas between them.
    static std::vector<TimeArgument> parseList(std::string_view text);

    /// Where it lies when a frame lasts `frameDuration`. Throws `UsageError`, also for a number of frames
    /// where that is invalid.
    Tempus resolve(Tempus const& frameDuration) const;

private:
    /// Seconds, or a number of frames.
    Tempus _amount{};
    bool _countsFrames = false;
};

/// The exact time between two samples at a rate: a whole number, a decimal taken as it stands, or `N/D`.
/// Throws `UsageError`.
Tempus stepOfRate(std::string_view text);

} // namespace lumenkey::tools
