#pragma once

#include "lumenkey/foundation/Tempus.h"

#include <optional>
#include <string_view>

namespace lumenkey::tools {

__extension__ typedef __int128 Wide;

/// A decimal number as it was written: `digits * 10^exponent`, negative or not. Nothing is rounded to binary.
struct ExactDecimal {
    /// At most this many significant digits are kept; `cut` tells of others that weren't 0.
    static constexpr int kMostDigits = 18;

    bool negative = false;
    Wide digits = 0;
    int exponent = 0;
    bool cut = false;
    /// One unit of the last printed digit is `10^lastDigit`.
    int lastDigit = 0;

    /// Reads `12`, `.5`, `-0.0333`, `8.3e-3`, as a whole; nothing for any other text and for exponents beyond
    /// 999.
    static std::optional<ExactDecimal> parse(std::string_view text);

    bool isZero() const { return digits == 0 && !cut; }

    /// The number of seconds in lowest terms, or invalid where it has no exact form in 64 and 32 bits.
    Tempus toTempus() const;

    /// The nearest time at the finest timescale, with the has-been-rounded flag. For magnitudes of at least a
    /// nanosecond and at most 10^9 seconds; otherwise invalid.
    Tempus toNearestTempus() const;
};

/// 10^n for n within 0 .. 38.
Wide powerOfTen(int n);

} // namespace lumenkey::tools
