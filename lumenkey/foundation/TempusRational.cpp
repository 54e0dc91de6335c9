#include "lumenkey/foundation/TempusRational.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <limits>
#include <numeric>
#include <utility>

// A result is held as whole + rest / denominator, which keeps every later step within 128 bits: a timescale has 31
// bits, so rest * timescale stays below 2^126, and whole matters only while it fits into 64 bits.

namespace TempusDetail {
namespace {

constexpr UWide kLargestMagnitude = static_cast<UWide>(std::numeric_limits<int64_t>::max());
constexpr int32_t kLargestTimescale = std::numeric_limits<int32_t>::max();

struct Mixed {
    bool negative;
    UWide whole;
    UWide rest;
    UWide denominator;
};

int bitWidth(UWide n) noexcept {
    auto const high = static_cast<uint64_t>(n >> 64);
    return high != 0 ? 128 - std::countl_zero(high) : 64 - std::countl_zero(static_cast<uint64_t>(n));
}

int trailingZeros(UWide n) noexcept {
    auto const low = static_cast<uint64_t>(n);
    return low != 0 ? std::countr_zero(low) : 64 + std::countr_zero(static_cast<uint64_t>(n >> 64));
}

UWide greatestCommonDivisor(UWide a, UWide b) noexcept {
    while (b != 0) {
        if ((a >> 64) == 0 && (b >> 64) == 0) {
            return std::gcd(static_cast<uint64_t>(a), static_cast<uint64_t>(b));
        }
        a %= b;
        std::swap(a, b);
    }
    return a;
}

Tempus number(bool negative, UWide value, int32_t timescale, uint32_t flags, int64_t epoch) noexcept {
    auto const bits = static_cast<uint64_t>(value);
    return {static_cast<int64_t>(negative ? uint64_t{0} - bits : bits), timescale, flags, epoch};
}

bool fits(bool negative, UWide value) noexcept {
    return value <= kLargestMagnitude + static_cast<UWide>(negative);
}

UWide divideToNearestEven(UWide numerator, UWide denominator) noexcept {
    UWide const quotient = numerator / denominator;
    UWide const twice = (numerator % denominator) * 2;
    return quotient +
           static_cast<UWide>(twice > denominator || (twice == denominator && (quotient & 1) != 0));
}

/// The largest timescale at which `roundAt(timescale)` fits, with that value. `estimate` is the magnitude of the
/// time, near enough that the timescale guessed from it is off by a step or two.
template <class RoundAt>
Tempus roundAtLargestTimescale(bool negative, long double estimate, ResultTraits const& traits,
                               RoundAt const& roundAt) noexcept {
    auto const limit = static_cast<long double>(std::numeric_limits<int64_t>::max());
    int32_t timescale = kLargestTimescale;
    if (estimate * static_cast<long double>(kLargestTimescale) > limit) {
        timescale = static_cast<int32_t>(limit / estimate);
    }
    while (timescale > 0 && roundAt(timescale) > kLargestMagnitude) {
        --timescale;
    }
    while (timescale < kLargestTimescale && roundAt(timescale + 1) <= kLargestMagnitude) {
        ++timescale;
    }
    if (timescale == 0) {
        return infinityOfSign(negative);
    }
    return number(negative, roundAt(timescale), timescale, traits.flags | kTempusFlagHasBeenRounded,
                  traits.epoch);
}

Tempus fromMixed(Mixed const& m, ResultTraits const& traits) noexcept {
    if (m.whole > kLargestMagnitude + 1) {
        return infinityOfSign(m.negative);
    }
    if (traits.preferredTimescale > 0) {
        auto const timescale = static_cast<UWide>(traits.preferredTimescale);
        UWide const rest = m.rest * timescale;
        UWide const value = m.whole * timescale + rest / m.denominator;
        if (rest % m.denominator == 0 && fits(m.negative, value)) {
            return number(m.negative, value, traits.preferredTimescale, traits.flags, traits.epoch);
        }
    }
    UWide const divisor = greatestCommonDivisor(m.denominator, m.rest);
    UWide const timescale = m.denominator / divisor;
    if (timescale <= static_cast<UWide>(kLargestTimescale)) {
        UWide const value = m.whole * timescale + m.rest / divisor;
        if (fits(m.negative, value)) {
            return number(m.negative, value, static_cast<int32_t>(timescale), traits.flags, traits.epoch);
        }
    }
    long double const estimate = static_cast<long double>(m.whole) +
                                 static_cast<long double>(m.rest) / static_cast<long double>(m.denominator);
    return roundAtLargestTimescale(m.negative, estimate, traits, [&m](int32_t candidate) {
        UWide const scale = static_cast<UWide>(candidate);
        // Ties must look at the whole value's last bit, so the whole part joins before the rounding.
        UWide const rest = m.rest * scale;
        UWide const floor = m.whole * scale + rest / m.denominator;
        UWide const twice = (rest % m.denominator) * 2;
        bool const up = twice > m.denominator || (twice == m.denominator && (floor & 1) != 0);
        return floor + static_cast<UWide>(up);
    });
}

/// floor(a * b / 2^shift), doubled, with the lowest bit set if bits were lost: enough to round correctly later.
/// For a below 2^117, b below 2^31, shift above 0 and a result below 2^127.
UWide productShiftedDown(UWide a, uint32_t b, int shift) noexcept {
    UWide const low = static_cast<UWide>(static_cast<uint64_t>(a)) * b;
    UWide const high = (a >> 64) * b + (low >> 64);
    auto const lowWord = static_cast<uint64_t>(low);
    if (shift >= 192) {
        return static_cast<UWide>(high != 0 || lowWord != 0);
    }
    if (shift >= 64) {
        UWide const kept = high >> (shift - 64);
        bool const lost = (kept << (shift - 64)) != high || lowWord != 0;
        return kept * 2 + static_cast<UWide>(lost);
    }
    UWide const kept = (high << (64 - shift)) | (lowWord >> shift);
    return kept * 2 + static_cast<UWide>((lowWord & ((uint64_t{1} << shift) - 1)) != 0);
}

/// Rounds numerator / (denominator * 2^shift), a fraction in lowest terms with a denominator beyond 2^95.
Tempus fromTinyQuotient(bool negative, UWide numerator, UWide denominator, int shift,
                        ResultTraits const& traits) noexcept {
    long double const estimate =
        std::ldexp(static_cast<long double>(numerator) / static_cast<long double>(denominator), -shift);
    return roundAtLargestTimescale(negative, estimate, traits, [=](int32_t timescale) {
        // Half units of the quotient's numerator, then one bit more that stands for all below: ties are seen.
        UWide const halves = productShiftedDown(numerator, static_cast<uint32_t>(timescale), shift - 1);
        return divideToNearestEven(halves, denominator * 4);
    });
}

/// numerator / denominator * 2^exponent for an exponent above 0, by long division.
Tempus fromLargeQuotient(Mixed m, int exponent, ResultTraits const& traits) noexcept {
    for (; exponent > 0; --exponent) {
        if (m.whole > kLargestMagnitude + 1) {
            return infinityOfSign(m.negative);
        }
        m.rest *= 2;
        m.whole *= 2;
        if (m.rest >= m.denominator) {
            m.rest -= m.denominator;
            ++m.whole;
        }
    }
    return fromMixed(m, traits);
}

} // namespace

Tempus fromQuotient(bool negative, UWide numerator, UWide denominator, ResultTraits const& traits) noexcept {
    return fromMixed({negative, numerator / denominator, numerator % denominator, denominator}, traits);
}

Tempus fromScaledQuotient(bool negative, UWide numerator, UWide denominator, int exponent,
                          ResultTraits const& traits) noexcept {
    if (numerator == 0) {
        return fromQuotient(false, 0, 1, traits);
    }
    if (UWide const divisor = greatestCommonDivisor(numerator, denominator); divisor > 1) {
        numerator /= divisor;
        denominator /= divisor;
    }
    if (exponent < 0) {
        int const halvings = std::min(trailingZeros(numerator), -exponent);
        numerator >>= halvings;
        exponent += halvings;
    } else {
        int const halvings = std::min(trailingZeros(denominator), exponent);
        denominator >>= halvings;
        exponent -= halvings;
    }
    if (exponent >= 0) {
        return fromLargeQuotient({negative, numerator / denominator, numerator % denominator, denominator},
                                 exponent, traits);
    }
    if (bitWidth(denominator) - exponent <= 95) {
        return fromQuotient(negative, numerator, denominator << -exponent, traits);
    }
    return fromTinyQuotient(negative, numerator, denominator, -exponent, traits);
}

double toDouble(bool negative, UWide numerator, UWide denominator) noexcept {
    constexpr UWide exact = UWide{1} << 53;
    if (numerator <= exact && denominator <= exact) {
        double const quotient = static_cast<double>(numerator) / static_cast<double>(denominator);
        return negative ? -quotient : quotient;
    }
    // Quotient bits until there are more than the 54 that decide how to round; one bit more stands for all below.
    constexpr int enough = 55;
    int exponent = std::min(bitWidth(numerator) - bitWidth(denominator), 0);
    UWide rest = numerator << -exponent;
    UWide quotient = rest / denominator;
    rest %= denominator;
    while (rest != 0 && bitWidth(quotient) < enough) {
        int const bits = std::min(128 - bitWidth(denominator), enough - bitWidth(quotient));
        rest <<= bits;
        quotient = (quotient << bits) | (rest / denominator);
        rest %= denominator;
        exponent -= bits;
    }
    UWide lost = rest;
    if (int const surplus = bitWidth(quotient) - 62; surplus > 0) {
        lost |= quotient & ((UWide{1} << surplus) - 1);
        quotient >>= surplus;
        exponent += surplus;
    }
    auto const rounded =
        static_cast<double>(static_cast<uint64_t>(quotient * 2 + static_cast<UWide>(lost != 0)));
    return std::ldexp(negative ? -rounded : rounded, exponent - 1);
}

Dyadic toDyadic(double x) noexcept {
    if (x == 0.0) {
        return {};
    }
    int exponent = 0;
    double const fraction = std::frexp(std::fabs(x), &exponent);
    auto const mantissa = static_cast<uint64_t>(std::ldexp(fraction, 53));
    int const zeros = std::countr_zero(mantissa);
    return {std::signbit(x), mantissa >> zeros, exponent - 53 + zeros};
}

} // namespace TempusDetail
