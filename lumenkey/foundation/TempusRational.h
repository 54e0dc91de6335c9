// Internal: not installed.
// The exact rational between two operands, and the Tempus that comes of it.
#pragma once

#include <cstdint>

#include "lumenkey/foundation/Tempus.h"

namespace TempusDetail {

__extension__ typedef unsigned __int128 UWide;

/// What a result takes over from its operands.
struct ResultTraits {
    uint32_t flags = kTempusFlagValid;
    int64_t epoch = 0;
    int32_t preferredTimescale = 0; // kept where the result is exact at it; 0 for lowest terms
};

constexpr UWide magnitude(Wide n) noexcept {
    return n < 0 ? UWide{0} - static_cast<UWide>(n) : static_cast<UWide>(n);
}
constexpr Tempus infinityOfSign(bool negative) noexcept {
    return negative ? kTempusNegativeInfinity : kTempusPositiveInfinity;
}

/// +-numerator / denominator, for a denominator from 1 to below 2^95: at the preferred timescale, else in lowest
/// terms, else rounded at the largest timescale that fits, else infinite.
Tempus fromQuotient(bool negative, UWide numerator, UWide denominator, ResultTraits const& traits) noexcept;

/// The same for +-numerator * 2^exponent / denominator, for a numerator below 2^117, a denominator from 1 to below
/// 2^85 and any exponent.
Tempus fromScaledQuotient(bool negative, UWide numerator, UWide denominator, int exponent,
                          ResultTraits const& traits) noexcept;

/// +-numerator / denominator as the nearest double, ties to even; of 0 the zero of the sign. For a numerator below 2^127
/// and a denominator from 1 to below 2^127.
double toDouble(bool negative, UWide numerator, UWide denominator) noexcept;

/// A finite double as +-mantissa * 2^exponent with an odd mantissa below 2^53, or 0.
struct Dyadic {
    bool negative = false;
    uint64_t mantissa = 0;
    int exponent = 0;
};
Dyadic toDyadic(double x) noexcept;

} // namespace TempusDetail
