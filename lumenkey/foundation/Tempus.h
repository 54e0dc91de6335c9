#pragma once

#include <cmath>
#include <cstdint>
#include <limits>

#include "lumenkey/foundation/BXExport.h"

/// Exact time: the rational `value / timescale` in seconds, in one of any number of unconnected time lines
/// (`epoch`; nearly always 0). A default Tempus is invalid.
///
/// A time is of one of five kinds: a number, an infinity of either sign, indefinite (a result that has no one
/// answer, such as infinity minus infinity) or invalid. A "number" has the valid flag, none of the flags of the
/// other kinds, and a timescale above 0; bits that fit no kind count as invalid.
///
/// All operations are exact wherever the result can be written as int64 / int32, and never overflow. Where it
/// cannot, they take the largest timescale at which the magnitude stays within INT64_MAX, round to nearest (ties
/// to even) and set the has-been-rounded flag, which every result computed from such a time inherits. What does
/// not fit even at timescale 1 is the infinity of its sign. Comparison disregards the flag.
struct Tempus {
    int64_t value = 0;
    int32_t timescale = 0;
    uint32_t flags = 0;
    int64_t epoch = 0;
};
static_assert(sizeof(Tempus) == 24);

inline constexpr uint32_t kTempusFlagValid = 1;
inline constexpr uint32_t kTempusFlagHasBeenRounded = 2;
inline constexpr uint32_t kTempusFlagPositiveInfinity = 4;
inline constexpr uint32_t kTempusFlagNegativeInfinity = 8;
inline constexpr uint32_t kTempusFlagIndefinite = 16;

inline constexpr Tempus kTempusInvalid{};
inline constexpr Tempus kTempusZero{0, 1, kTempusFlagValid, 0};
inline constexpr Tempus kTempusIndefinite{0, 0, kTempusFlagValid | kTempusFlagIndefinite, 0};
inline constexpr Tempus kTempusPositiveInfinity{0, 0, kTempusFlagValid | kTempusFlagPositiveInfinity, 0};
inline constexpr Tempus kTempusNegativeInfinity{0, 0, kTempusFlagValid | kTempusFlagNegativeInfinity, 0};

/// The timescale to which seconds given as doubles are rounded (262144, so that the step is a power of two).
inline constexpr uint32_t kKFChannelTimescale = 0x40000;

/// `value / timescale` seconds in epoch 0; invalid for a timescale of 0 or below.
constexpr Tempus TempusMake(int64_t value, int32_t timescale) noexcept {
    return timescale > 0 ? Tempus{value, timescale, kTempusFlagValid, 0} : kTempusInvalid;
}

/// The kinds in the order in which they compare.
enum class TempusKind { NegativeInfinity, Number, PositiveInfinity, Indefinite, Invalid };

constexpr TempusKind TempusGetKind(Tempus const& t) noexcept {
    switch (t.flags & ~kTempusFlagHasBeenRounded) {
    case kTempusFlagValid:
        return t.timescale > 0 ? TempusKind::Number : TempusKind::Invalid;
    case kTempusFlagValid | kTempusFlagPositiveInfinity:
        return TempusKind::PositiveInfinity;
    case kTempusFlagValid | kTempusFlagNegativeInfinity:
        return TempusKind::NegativeInfinity;
    case kTempusFlagValid | kTempusFlagIndefinite:
        return TempusKind::Indefinite;
    default:
        return TempusKind::Invalid;
    }
}

constexpr bool TempusIsNumeric(Tempus const& t) noexcept {
    return (t.flags & ~kTempusFlagHasBeenRounded) == kTempusFlagValid && t.timescale > 0;
}
constexpr bool TempusIsValid(Tempus const& t) noexcept { return TempusGetKind(t) != TempusKind::Invalid; }
constexpr bool TempusIsIndefinite(Tempus const& t) noexcept {
    return TempusGetKind(t) == TempusKind::Indefinite;
}
constexpr bool TempusIsPositiveInfinity(Tempus const& t) noexcept {
    return TempusGetKind(t) == TempusKind::PositiveInfinity;
}
constexpr bool TempusIsNegativeInfinity(Tempus const& t) noexcept {
    return TempusGetKind(t) == TempusKind::NegativeInfinity;
}
constexpr bool TempusHasBeenRounded(Tempus const& t) noexcept {
    return (t.flags & kTempusFlagHasBeenRounded) != 0;
}

/// What the inline operations below leave to the library; not for callers.
namespace TempusDetail {
__extension__ typedef __int128 Wide;

/// Numbers of one timescale and epoch 0: nearly all operands of sums.
constexpr bool haveCommonTimescale(Tempus const& a, Tempus const& b) noexcept {
    return (((a.flags ^ kTempusFlagValid) | (b.flags ^ kTempusFlagValid)) & ~kTempusFlagHasBeenRounded) ==
               0 &&
           a.timescale == b.timescale && a.timescale > 0 && (a.epoch | b.epoch) == 0;
}
LUMENKEY_API Tempus add(Tempus const& a, Tempus const& b) noexcept;
LUMENKEY_API Tempus subtract(Tempus const& a, Tempus const& b) noexcept;
LUMENKEY_API double ratio(Tempus const& a, Tempus const& b) noexcept;
LUMENKEY_API double seconds(Tempus const& t) noexcept;
LUMENKEY_API double fraction(Tempus const& u, Tempus const& from, Tempus const& to) noexcept;
} // namespace TempusDetail

// Order ------------------------------------------------------------------------------------------------------

/// Negative, 0 or positive as a is before, at or after b. Exact, and a total order over all operands:
///
///     -infinity < numbers, by epoch, then by seconds < +infinity < indefinite < invalid
///
/// Times of one kind that is no number are equal, and so are 1/2 and 2/4.
inline int TempusCompare(Tempus const& a, Tempus const& b) noexcept {
    if (TempusIsNumeric(a) && TempusIsNumeric(b)) {
        if (a.epoch != b.epoch) {
            return a.epoch < b.epoch ? -1 : 1;
        }
        if (a.timescale == b.timescale) {
            return (a.value > b.value) - (a.value < b.value);
        }
        TempusDetail::Wide const left = TempusDetail::Wide{a.value} * b.timescale;
        TempusDetail::Wide const right = TempusDetail::Wide{b.value} * a.timescale;
        return (left > right) - (left < right);
    }
    return static_cast<int>(TempusGetKind(a)) - static_cast<int>(TempusGetKind(b));
}

inline bool operator==(Tempus const& a, Tempus const& b) noexcept { return TempusCompare(a, b) == 0; }
inline bool operator!=(Tempus const& a, Tempus const& b) noexcept { return TempusCompare(a, b) != 0; }
inline bool operator<(Tempus const& a, Tempus const& b) noexcept { return TempusCompare(a, b) < 0; }
inline bool operator<=(Tempus const& a, Tempus const& b) noexcept { return TempusCompare(a, b) <= 0; }
inline bool operator>(Tempus const& a, Tempus const& b) noexcept { return TempusCompare(a, b) > 0; }
inline bool operator>=(Tempus const& a, Tempus const& b) noexcept { return TempusCompare(a, b) >= 0; }

/// The first argument where the two are equal.
inline Tempus TempusMinimum(Tempus const& a, Tempus const& b) noexcept { return b < a ? b : a; }
inline Tempus TempusMaximum(Tempus const& a, Tempus const& b) noexcept { return b > a ? b : a; }

// Doubles ----------------------------------------------------------------------------------------------------

/// The seconds, correctly rounded; infinities as such, NaN for indefinite and invalid times. The epoch is left out.
inline double TempusGetSeconds(Tempus const& t) noexcept {
    constexpr int64_t limit = int64_t{1} << 53;
    if (TempusIsNumeric(t) && t.value < limit && t.value > -limit) {
        return static_cast<double>(t.value) / static_cast<double>(t.timescale);
    }
    return TempusDetail::seconds(t);
}

/// a / b as a double, correctly rounded, without the rounded rational that `TempusGetSeconds(a / b)` goes through.
/// The kinds follow the table of `operator/` (NaN where that gives indefinite or invalid).
inline double TempusRatio(Tempus const& a, Tempus const& b) noexcept {
    constexpr int64_t limit = int64_t{1} << 53;
    if (TempusDetail::haveCommonTimescale(a, b) && b.value != 0 && a.value < limit && a.value > -limit &&
        b.value < limit && b.value > -limit) {
        return static_cast<double>(a.value) / static_cast<double>(b.value);
    }
    return TempusDetail::ratio(a, b);
}

/// `TempusGetSeconds(to - from)`, but of the exact difference, which may have no Tempus: rounded once.
LUMENKEY_API double TempusSecondsBetween(Tempus const& from, Tempus const& to) noexcept;

/// `TempusRatio(u - from, to - from)`, but of the exact differences: the part of the way between two times that lies
/// before `u`, correctly rounded whatever the timescales. So whole numbers of a common timescale, where they are
/// exact as doubles, give the same bits when they are subtracted and divided.
inline double TempusFraction(Tempus const& u, Tempus const& from, Tempus const& to) noexcept {
    constexpr int64_t limit = int64_t{1} << 53;
    int64_t part = 0;
    int64_t whole = 0;
    if (TempusDetail::haveCommonTimescale(u, from) && TempusDetail::haveCommonTimescale(to, from) &&
        !__builtin_sub_overflow(u.value, from.value, &part) &&
        !__builtin_sub_overflow(to.value, from.value, &whole) && whole > 0 && whole < limit && part < limit &&
        part > -limit) {
        return static_cast<double>(part) / static_cast<double>(whole);
    }
    return TempusDetail::fraction(u, from, to);
}

/// The time nearest to `seconds` at `timescale`, ties to even, with the has-been-rounded flag unless it is exact.
/// Not-a-number, and a timescale of 0 or above INT32_MAX, give invalid; infinities and what does not fit give the
/// infinity of the sign.
LUMENKEY_API Tempus KFChronoForChannelSeconds(double seconds, uint32_t timescale) noexcept;

// Arithmetic -------------------------------------------------------------------------------------------------
//
// One table for what is no number (n a number, i an infinity, signs multiply as usual):
//
//     any operand invalid       invalid          any other indefinite      indefinite
//     i + n, i - n, n + i       i                i - i, i + (-i)           indefinite
//     n - i                     -i               i + i                     i
//     i * n, i * i, i / n       i by sign        i * 0, i / i              indefinite
//     n / i                     0                0 / 0                     indefinite
//     n / 0, i / 0              infinity with the sign of the left operand (a zero has no sign here)
//     a double that is not finite counts as indefinite
//
// Epochs: a sum or product needs one of the two epochs to be 0 and has the other; a difference or quotient has
// epoch 0 if the two agree, and the left one's if the right one's is 0. Any other pair of epochs is invalid.
//
// Timescales: a sum or difference has the least common multiple of the two (1/24 + 1/24 is 2/24, 1/24 + 1/30 is
// 9/120). A product, and a quotient by a number, stays at the left operand's timescale if it is exact there
// (48/24 * 1/2 is 24/24), else it is in lowest terms. A quotient of two times is in lowest terms. Where that does
// not fit, lowest terms are tried before anything is rounded.

inline Tempus BX_TempusSaferAdd(Tempus const& a, Tempus const& b) noexcept {
    int64_t sum = 0;
    if (TempusDetail::haveCommonTimescale(a, b) && !__builtin_add_overflow(a.value, b.value, &sum)) {
        return {sum, a.timescale, a.flags | b.flags, 0};
    }
    return TempusDetail::add(a, b);
}

inline Tempus BX_TempusSaferSubtract(Tempus const& a, Tempus const& b) noexcept {
    int64_t difference = 0;
    if (TempusDetail::haveCommonTimescale(a, b) && !__builtin_sub_overflow(a.value, b.value, &difference)) {
        return {difference, a.timescale, a.flags | b.flags, 0};
    }
    return TempusDetail::subtract(a, b);
}

inline Tempus operator+(Tempus const& a, Tempus const& b) noexcept { return BX_TempusSaferAdd(a, b); }
inline Tempus operator-(Tempus const& a, Tempus const& b) noexcept { return BX_TempusSaferSubtract(a, b); }
inline Tempus& operator+=(Tempus& a, Tempus const& b) noexcept { return a = BX_TempusSaferAdd(a, b); }
inline Tempus& operator-=(Tempus& a, Tempus const& b) noexcept { return a = BX_TempusSaferSubtract(a, b); }

/// The opposite, in the same epoch.
LUMENKEY_API Tempus operator-(Tempus const& t) noexcept;

/// The product and quotient of two rationals; one of the two is read as a plain ratio (5 s / 2 s is 5/2).
LUMENKEY_API Tempus operator*(Tempus const& a, Tempus const& b) noexcept;
LUMENKEY_API Tempus operator/(Tempus const& a, Tempus const& b) noexcept;

/// A double is taken as the exact dyadic rational that it is.
LUMENKEY_API Tempus operator*(Tempus const& a, double b) noexcept;
LUMENKEY_API Tempus operator/(Tempus const& a, double b) noexcept;

LUMENKEY_API Tempus operator*(Tempus const& a, int32_t b) noexcept;
LUMENKEY_API Tempus operator/(Tempus const& a, int32_t b) noexcept;
LUMENKEY_API Tempus operator*(Tempus const& a, uint32_t b) noexcept;
LUMENKEY_API Tempus operator/(Tempus const& a, uint32_t b) noexcept;

/// The magnitude, in the same epoch; indefinite and invalid stay what they are.
LUMENKEY_API Tempus TempusAbsoluteValue(Tempus const& t) noexcept;

/// The same number in lowest terms (zero as 0/1), epoch and flags kept; what is no number as it is.
LUMENKEY_API Tempus TempusReduced(Tempus const& t) noexcept;

// Cycles -----------------------------------------------------------------------------------------------------
//
// With k = floor(t / d), computed exactly, toward minus infinity.

/// The multiple k * d at or before `t`, at d's timescale and in t's epoch. `t` as it is where there is nothing to
/// round to (d is 0, negative or no number, or has an epoch) and where `t` is no number.
LUMENKEY_API Tempus BX_TempusFloorToSampleDuration(Tempus const& t, Tempus const& d) noexcept;

/// The remainder t - k * d, in epoch 0: within 0 .. d without d for a positive d, within d .. 0 without d for a
/// negative one. Indefinite when d is 0 or when one of the two is no number, invalid when one is invalid or their
/// epochs form no difference.
LUMENKEY_API Tempus TempusModulo(Tempus const& t, Tempus const& d) noexcept;

/// k, limited to the range of int64_t. An infinite or zero-divided quotient gives the limit of its sign; where
/// `operator/` gives indefinite or invalid, and for an infinite d, the answer is 0. Epochs are left out.
LUMENKEY_API int64_t TempusFloorQuotient(Tempus const& t, Tempus const& d) noexcept;

// Ranges -----------------------------------------------------------------------------------------------------

struct TempusRange {
    Tempus start;
    Tempus duration;
};
using BXTimeRange = TempusRange;

/// Start plus duration: the first time after the range.
inline Tempus TempusRangeGetEnd(TempusRange const& range) noexcept {
    return BX_TempusSaferAdd(range.start, range.duration);
}
