#include "lumenkey/foundation/Tempus.h"

#include <bit>
#include <cassert>
#include <cmath>
#include <limits>
#include <numeric>

#include "lumenkey/foundation/TempusRational.h"

using TempusDetail::Dyadic;
using TempusDetail::fromQuotient;
using TempusDetail::fromScaledQuotient;
using TempusDetail::infinityOfSign;
using TempusDetail::magnitude;
using TempusDetail::ResultTraits;
using TempusDetail::toDouble;
using TempusDetail::toDyadic;
using TempusDetail::UWide;
using TempusDetail::Wide;

namespace {

bool isInfinite(Tempus const& t) noexcept {
    return TempusIsPositiveInfinity(t) || TempusIsNegativeInfinity(t);
}

/// -1, 0 or 1; only for numbers and infinities.
int signOf(Tempus const& t) noexcept {
    if (TempusIsNumeric(t)) {
        return (t.value > 0) - (t.value < 0);
    }
    return TempusIsPositiveInfinity(t) ? 1 : -1;
}

/// Whether the later of the two kinds decides alone; then it is the result.
bool isUndefined(Tempus const& a, Tempus const& b, Tempus& result) noexcept {
    if (!TempusIsValid(a) || !TempusIsValid(b)) {
        result = kTempusInvalid;
        return true;
    }
    result = kTempusIndefinite;
    return TempusIsIndefinite(a) || TempusIsIndefinite(b);
}

uint32_t commonFlags(Tempus const& a, Tempus const& b) noexcept {
    return kTempusFlagValid | ((a.flags | b.flags) & kTempusFlagHasBeenRounded);
}

bool sumEpochs(Tempus const& a, Tempus const& b, int64_t& epoch) noexcept {
    epoch = a.epoch != 0 ? a.epoch : b.epoch;
    return a.epoch == 0 || b.epoch == 0;
}

bool subtractEpochs(Tempus const& a, Tempus const& b, int64_t& epoch) noexcept {
    epoch = a.epoch == b.epoch ? 0 : a.epoch;
    return a.epoch == b.epoch || b.epoch == 0;
}

Tempus fromSigned(Wide numerator, UWide denominator, ResultTraits const& traits) noexcept {
    return fromQuotient(numerator < 0, magnitude(numerator), denominator, traits);
}

/// The two numbers over the least common multiple of their timescales.
struct CommonScale {
    CommonScale(Tempus const& a, Tempus const& b) noexcept {
        auto const scaleA = static_cast<uint32_t>(a.timescale);
        auto const scaleB = static_cast<uint32_t>(b.timescale);
        uint32_t const divisor = std::gcd(scaleA, scaleB);
        left = Wide{a.value} * (scaleB / divisor);
        right = Wide{b.value} * (scaleA / divisor);
        timescale = int64_t{scaleA / divisor} * scaleB;
    }
    Tempus make(Wide numerator, uint32_t flags, int64_t epoch) const noexcept {
        bool const fits = timescale <= std::numeric_limits<int32_t>::max();
        // Without a division of wide numbers.
        if (constexpr Wide most = std::numeric_limits<int64_t>::max();
            fits && numerator <= most && numerator >= -most) {
            return {static_cast<int64_t>(numerator), static_cast<int32_t>(timescale), flags, epoch};
        }
        return fromSigned(numerator, static_cast<UWide>(timescale),
                          {flags, epoch, fits ? static_cast<int32_t>(timescale) : 0});
    }

    Wide left;
    Wide right;
    int64_t timescale;
};

/// The usual sum of two timescales, in 64 bits: one divides the other, and nothing overflows. `sign` is 1 or
/// -1. False, with `result` as it was, for any other.
bool sumOverOneTimescale(Tempus const& a, Tempus const& b, int64_t sign, Tempus& result) noexcept {
    if (!TempusIsNumeric(a) || !TempusIsNumeric(b) || (a.epoch | b.epoch) != 0) {
        return false;
    }
    assert(a.timescale > 0 && b.timescale > 0); // they are numbers
    bool const isOverA = a.timescale % b.timescale == 0;
    if (!isOverA && b.timescale % a.timescale != 0) {
        return false;
    }
    int64_t left = a.value;
    int64_t right = 0;
    int64_t sum = 0;
    if (__builtin_mul_overflow(b.value, sign * (isOverA ? a.timescale / b.timescale : 1), &right) ||
        (!isOverA && __builtin_mul_overflow(left, int64_t{b.timescale / a.timescale}, &left)) ||
        __builtin_add_overflow(left, right, &sum) || sum == std::numeric_limits<int64_t>::min()) {
        return false;
    }
    result = {sum, isOverA ? a.timescale : b.timescale, commonFlags(a, b), 0};
    return true;
}

Tempus sumOfNumbers(Tempus const& a, Tempus const& b, bool subtract, int64_t epoch) noexcept {
    CommonScale const common(a, b);
    return common.make(subtract ? common.left - common.right : common.left + common.right, commonFlags(a, b),
                       epoch);
}

/// A product or quotient in which an operand is infinite or the divisor is zero, neither being indefinite.
Tempus productOfKinds(Tempus const& a, int signOfB) noexcept {
    int const sign = signOf(a) * signOfB;
    return sign == 0 ? kTempusIndefinite : infinityOfSign(sign < 0);
}

Tempus quotientOfKinds(Tempus const& a, bool infiniteB, int signOfB) noexcept {
    if (infiniteB) {
        return isInfinite(a) ? kTempusIndefinite : kTempusZero;
    }
    return productOfKinds(a, signOfB == 0 ? 1 : signOfB);
}

/// What an operation with a plain number leaves to do: false if `result` is settled.
bool needsArithmetic(Tempus const& a, int signOfB, bool dividing, Tempus& result) noexcept {
    if (isUndefined(a, kTempusZero, result)) {
        return false;
    }
    if (isInfinite(a) || (dividing && signOfB == 0)) {
        result = dividing ? quotientOfKinds(a, false, signOfB) : productOfKinds(a, signOfB);
        return false;
    }
    return true;
}

ResultTraits traitsOf(Tempus const& a) noexcept { return {a.flags, a.epoch, a.timescale}; }

Tempus timesInteger(Tempus const& a, int64_t b) noexcept {
    Tempus result;
    if (!needsArithmetic(a, (b > 0) - (b < 0), false, result)) {
        return result;
    }
    return fromSigned(Wide{a.value} * b, static_cast<UWide>(a.timescale), traitsOf(a));
}

Tempus dividedByInteger(Tempus const& a, int64_t b) noexcept {
    Tempus result;
    if (!needsArithmetic(a, (b > 0) - (b < 0), true, result)) {
        return result;
    }
    return fromQuotient((a.value < 0) != (b < 0), magnitude(a.value),
                        static_cast<UWide>(a.timescale) * magnitude(b), traitsOf(a));
}

/// floor(n / d) for d other than 0.
Wide floorDivide(Wide n, Wide d) noexcept {
    if (static_cast<int64_t>(n) == n && static_cast<int64_t>(d) == d && d != -1) {
        auto const n64 = static_cast<int64_t>(n);
        auto const d64 = static_cast<int64_t>(d);
        int64_t const quotient = n64 / d64;
        int64_t const rest = n64 % d64;
        return quotient - static_cast<int64_t>(rest != 0 && (rest < 0) != (d64 < 0));
    }
    Wide const quotient = n / d;
    Wide const rest = n % d;
    return quotient - static_cast<Wide>(rest != 0 && (rest < 0) != (d < 0));
}

} // namespace

// Doubles ---------------------------------------------------------------------------------------------------

double TempusDetail::seconds(Tempus const& t) noexcept {
    switch (TempusGetKind(t)) {
    case TempusKind::Number:
        return toDouble(t.value < 0, magnitude(t.value), static_cast<UWide>(t.timescale));
    case TempusKind::NegativeInfinity:
        return -std::numeric_limits<double>::infinity();
    case TempusKind::PositiveInfinity:
        return std::numeric_limits<double>::infinity();
    default:
        return std::numeric_limits<double>::quiet_NaN();
    }
}

double TempusDetail::ratio(Tempus const& a, Tempus const& b) noexcept {
    int64_t epoch = 0;
    if (!TempusIsNumeric(a) || !TempusIsNumeric(b) || b.value == 0 || !subtractEpochs(a, b, epoch)) {
        return TempusGetSeconds(a / b);
    }
    bool const sameTimescale = a.timescale == b.timescale;
    Wide const n = sameTimescale ? Wide{a.value} : Wide{a.value} * b.timescale;
    Wide const d = sameTimescale ? Wide{b.value} : Wide{b.value} * a.timescale;
    return toDouble((n < 0) != (d < 0), magnitude(n), magnitude(d));
}

double TempusSecondsBetween(Tempus const& from, Tempus const& to) noexcept {
    int64_t epoch = 0;
    if (!TempusIsNumeric(from) || !TempusIsNumeric(to) || !subtractEpochs(to, from, epoch)) {
        return TempusGetSeconds(BX_TempusSaferSubtract(to, from));
    }
    bool const sameTimescale = from.timescale == to.timescale;
    Wide const n = sameTimescale ? Wide{to.value} - from.value
                                 : Wide{to.value} * from.timescale - Wide{from.value} * to.timescale;
    Wide const d = sameTimescale ? Wide{from.timescale} : Wide{from.timescale} * to.timescale;
    return toDouble(n < 0, magnitude(n), static_cast<UWide>(d));
}

double TempusDetail::fraction(Tempus const& u, Tempus const& from, Tempus const& to) noexcept {
    bool const numbers = TempusIsNumeric(u) && TempusIsNumeric(from) && TempusIsNumeric(to) &&
                         u.epoch == from.epoch && to.epoch == from.epoch;
    if (!numbers || TempusCompare(from, to) == 0) {
        return TempusRatio(BX_TempusSaferSubtract(u, from), BX_TempusSaferSubtract(to, from));
    }
    // Both differences times the timescales that they don't share: below 2^126 at most.
    Wide part = u.timescale == from.timescale
                    ? Wide{u.value} - from.value
                    : Wide{u.value} * from.timescale - Wide{from.value} * u.timescale;
    Wide whole = to.timescale == from.timescale
                     ? Wide{to.value} - from.value
                     : Wide{to.value} * from.timescale - Wide{from.value} * to.timescale;
    if (u.timescale != to.timescale) {
        part *= to.timescale != from.timescale ? to.timescale : 1;
        whole *= u.timescale != from.timescale ? u.timescale : 1;
    }
    bool const negative = part != 0 && (part < 0) != (whole < 0);
    return toDouble(negative, magnitude(part), magnitude(whole));
}

Tempus KFChronoForChannelSeconds(double seconds, uint32_t timescale) noexcept {
    if (std::isnan(seconds) || timescale == 0 || timescale > uint32_t{std::numeric_limits<int32_t>::max()}) {
        return kTempusInvalid;
    }
    if (std::isinf(seconds)) {
        return infinityOfSign(seconds < 0.0);
    }
    // mantissa * timescale has at most 84 bits, so the product with the power of two is exact either way.
    Dyadic const dyadic = toDyadic(seconds);
    UWide value = static_cast<UWide>(dyadic.mantissa) * timescale;
    uint32_t flags = kTempusFlagValid;
    if (dyadic.exponent > 63) {
        return infinityOfSign(dyadic.negative);
    }
    if (dyadic.exponent >= 0) {
        constexpr UWide limit = static_cast<UWide>(std::numeric_limits<int64_t>::max());
        if (value > limit >> dyadic.exponent) {
            return infinityOfSign(dyadic.negative);
        }
        value <<= dyadic.exponent;
    } else {
        int const shift = -dyadic.exponent < 100 ? -dyadic.exponent : 100;
        UWide const floor = value >> shift;
        UWide const rest = value - (floor << shift);
        UWide const half = UWide{1} << (shift - 1);
        flags |= rest != 0 ? kTempusFlagHasBeenRounded : 0;
        value = floor + static_cast<UWide>(rest > half || (rest == half && (floor & 1) != 0));
        if (value > static_cast<UWide>(std::numeric_limits<int64_t>::max())) {
            return infinityOfSign(dyadic.negative);
        }
    }
    auto const magnitude64 = static_cast<int64_t>(value);
    return {dyadic.negative ? -magnitude64 : magnitude64, static_cast<int32_t>(timescale), flags, 0};
}

// Sums ------------------------------------------------------------------------------------------------------

Tempus TempusDetail::add(Tempus const& a, Tempus const& b) noexcept {
    Tempus result;
    if (sumOverOneTimescale(a, b, 1, result)) {
        return result;
    }
    if (isUndefined(a, b, result)) {
        return result;
    }
    if (isInfinite(a) || isInfinite(b)) {
        bool const opposite = isInfinite(a) && isInfinite(b) && signOf(a) != signOf(b);
        return opposite ? kTempusIndefinite : infinityOfSign(signOf(isInfinite(a) ? a : b) < 0);
    }
    int64_t epoch = 0;
    return sumEpochs(a, b, epoch) ? sumOfNumbers(a, b, false, epoch) : kTempusInvalid;
}

Tempus TempusDetail::subtract(Tempus const& a, Tempus const& b) noexcept {
    if (Tempus result; sumOverOneTimescale(a, b, -1, result)) {
        return result;
    }
    int64_t epoch = 0;
    if (TempusIsNumeric(a) && TempusIsNumeric(b)) {
        return subtractEpochs(a, b, epoch) ? sumOfNumbers(a, b, true, epoch) : kTempusInvalid;
    }
    return add(a, -b);
}

Tempus operator-(Tempus const& t) noexcept {
    if (TempusIsNumeric(t)) {
        return fromSigned(-Wide{t.value}, static_cast<UWide>(t.timescale), traitsOf(t));
    }
    return isInfinite(t) ? infinityOfSign(TempusIsPositiveInfinity(t)) : t;
}

Tempus TempusAbsoluteValue(Tempus const& t) noexcept {
    bool const negative = TempusIsNegativeInfinity(t) || (TempusIsNumeric(t) && t.value < 0);
    return negative ? -t : t;
}

Tempus TempusReduced(Tempus const& t) noexcept {
    if (!TempusIsNumeric(t)) {
        return t;
    }
    return fromSigned(t.value, static_cast<UWide>(t.timescale), {t.flags, t.epoch, 0});
}

// Products and quotients ------------------------------------------------------------------------------------

Tempus operator*(Tempus const& a, Tempus const& b) noexcept {
    Tempus result;
    if (isUndefined(a, b, result)) {
        return result;
    }
    if (isInfinite(a) || isInfinite(b)) {
        return productOfKinds(a, signOf(b));
    }
    int64_t epoch = 0;
    if (!sumEpochs(a, b, epoch)) {
        return kTempusInvalid;
    }
    return fromSigned(Wide{a.value} * b.value,
                      static_cast<UWide>(a.timescale) * static_cast<UWide>(b.timescale),
                      {commonFlags(a, b), epoch, a.timescale});
}

Tempus operator/(Tempus const& a, Tempus const& b) noexcept {
    Tempus result;
    if (isUndefined(a, b, result)) {
        return result;
    }
    if (isInfinite(a) || isInfinite(b)) {
        return quotientOfKinds(a, isInfinite(b), signOf(b));
    }
    int64_t epoch = 0;
    if (!subtractEpochs(a, b, epoch)) {
        return kTempusInvalid;
    }
    if (b.value == 0) {
        return quotientOfKinds(a, false, 0);
    }
    return fromQuotient((a.value < 0) != (b.value < 0), magnitude(a.value) * static_cast<UWide>(b.timescale),
                        magnitude(b.value) * static_cast<UWide>(a.timescale), {commonFlags(a, b), epoch, 0});
}

Tempus operator*(Tempus const& a, double b) noexcept {
    Tempus result = TempusIsValid(a) ? kTempusIndefinite : kTempusInvalid;
    if (!std::isfinite(b) || !needsArithmetic(a, (b > 0.0) - (b < 0.0), false, result)) {
        return result;
    }
    Dyadic const ratio = toDyadic(b);
    return fromScaledQuotient((a.value < 0) != ratio.negative,
                              magnitude(a.value) * static_cast<UWide>(ratio.mantissa),
                              static_cast<UWide>(a.timescale), ratio.exponent, traitsOf(a));
}

Tempus operator/(Tempus const& a, double b) noexcept {
    Tempus result = TempusIsValid(a) ? kTempusIndefinite : kTempusInvalid;
    if (!std::isfinite(b) || !needsArithmetic(a, (b > 0.0) - (b < 0.0), true, result)) {
        return result;
    }
    Dyadic const ratio = toDyadic(b);
    return fromScaledQuotient((a.value < 0) != ratio.negative, magnitude(a.value),
                              static_cast<UWide>(a.timescale) * static_cast<UWide>(ratio.mantissa),
                              -ratio.exponent, traitsOf(a));
}

Tempus operator*(Tempus const& a, int32_t b) noexcept { return timesInteger(a, b); }
Tempus operator/(Tempus const& a, int32_t b) noexcept { return dividedByInteger(a, b); }
Tempus operator*(Tempus const& a, uint32_t b) noexcept { return timesInteger(a, b); }
Tempus operator/(Tempus const& a, uint32_t b) noexcept { return dividedByInteger(a, b); }

// Cycles ----------------------------------------------------------------------------------------------------

Tempus BX_TempusFloorToSampleDuration(Tempus const& t, Tempus const& d) noexcept {
    if (!TempusIsNumeric(t) || !TempusIsNumeric(d) || d.value <= 0 || d.epoch != 0) {
        return t;
    }
    CommonScale const common(t, d);
    Wide const multiple = floorDivide(common.left, common.right) * d.value;
    return fromSigned(multiple, static_cast<UWide>(d.timescale), {commonFlags(t, d), t.epoch, d.timescale});
}

Tempus TempusModulo(Tempus const& t, Tempus const& d) noexcept {
    Tempus result;
    if (isUndefined(t, d, result)) {
        return result;
    }
    int64_t epoch = 0;
    if (isInfinite(t) || isInfinite(d)) {
        return kTempusIndefinite;
    }
    if (!subtractEpochs(t, d, epoch)) {
        return kTempusInvalid;
    }
    if (d.value == 0) {
        return kTempusIndefinite;
    }
    CommonScale const common(t, d);
    Wide const rest = common.left - floorDivide(common.left, common.right) * common.right;
    return common.make(rest, commonFlags(t, d), 0);
}

int64_t TempusFloorQuotient(Tempus const& t, Tempus const& d) noexcept {
    Tempus settled;
    if (isUndefined(t, d, settled) || isInfinite(d)) {
        return 0;
    }
    constexpr int64_t lowest = std::numeric_limits<int64_t>::min();
    constexpr int64_t highest = std::numeric_limits<int64_t>::max();
    if (isInfinite(t) || d.value == 0) {
        int const sign = signOf(t) * (d.value < 0 ? -1 : 1);
        return sign == 0 ? 0 : sign < 0 ? lowest : highest;
    }
    CommonScale const common(t, d);
    Wide const quotient = floorDivide(common.left, common.right);
    return quotient < lowest ? lowest : quotient > highest ? highest : static_cast<int64_t>(quotient);
}
