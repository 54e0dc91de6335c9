#pragma once

#include "lumenkey/foundation/Tempus.h"

#include <string>
#include <string_view>

namespace lumenkey::tools {

/// The exact duration of a frame that a motion file prints as a rounded decimal, such as `.0083333` for
/// 1/120.
struct FrameDuration {
    /// In lowest terms; invalid when the text is no duration.
    Tempus duration;
    /// Why, when it is invalid.
    std::string fault;
};

/// The text of a Frame Time line is taken as the nearest of the usual rates
///
///     24000/1001, 24, 25, 30000/1001, 30, 48, 50, 60000/1001, 60, 90, 100, 120, 240 frames a second
///
/// when it agrees with that to within one unit of its last printed digit or to 1e-5 relative, else as the
/// decimal that it is. A unit that is large beside the number itself says nothing (`0.1` and `1` are within
/// one unit of 24 frames a second), so the number must also agree to within an eighth of itself.
///
/// A decimal with no exact form as a time is rounded at the finest timescale and carries the has-been-rounded
/// flag. Durations are at least a nanosecond and at most a day.
FrameDuration frameDurationFromText(std::string_view text);

/// The duration that `TempusGetSeconds` turned into this number: that of a usual rate where it gives the same
/// bits, else the decimal that the number is, at its shortest. Invalid beyond the limits above.
Tempus frameDurationFromSeconds(double seconds);

} // namespace lumenkey::tools
