#include "lumenkey/foundation/Tempus.h"

#include <array>
#include <bit>
#include <cmath>
#include <limits>
#include <ostream>
#include <random>
#include <string>
#include <type_traits>

#include <gtest/gtest.h>

#include "tests/foundation/SlowRational.h"

static_assert(std::is_trivially_copyable_v<Tempus>);

void PrintTo(Tempus const& t, std::ostream* out) {
    *out << t.value << '/' << t.timescale << " flags " << t.flags << " epoch " << t.epoch;
}

namespace {

constexpr int64_t kLowest = std::numeric_limits<int64_t>::min();
constexpr int64_t kHighest = std::numeric_limits<int64_t>::max();
constexpr int32_t kLargestTimescale = std::numeric_limits<int32_t>::max();

/// Same bits, not only the same time.
bool identical(Tempus const& a, Tempus const& b) {
    return a.value == b.value && a.timescale == b.timescale && a.flags == b.flags && a.epoch == b.epoch;
}

Tempus rounded(int64_t value, int32_t timescale) {
    Tempus t = TempusMake(value, timescale);
    t.flags |= kTempusFlagHasBeenRounded;
    return t;
}

/// Numbers of all sizes, with a liking for timescales in use and for the borders of the types.
class Operands {
public:
    explicit Operands(unsigned seed) : _engine(seed) {}

    int64_t value() {
        uint64_t const bits = _engine() >> (_engine() % 64);
        switch (_engine() % 12) {
        case 0:
            return kHighest - static_cast<int64_t>(_engine() % 3);
        case 1:
            return kLowest + static_cast<int64_t>(_engine() % 3);
        default:
            return static_cast<int64_t>(_engine() % 2 != 0 ? bits : ~bits + 1);
        }
    }
    int32_t timescale() {
        constexpr std::array common{1, 24, 25, 30, 600, 30000, 44100, 48000, 90000, 0x40000, 1000000000};
        switch (_engine() % 8) {
        case 0:
            return kLargestTimescale - static_cast<int32_t>(_engine() % 3);
        case 1:
        case 2:
            return static_cast<int32_t>((_engine() & 0x7fffffff) >> (_engine() % 31)) | 1;
        default:
            return common[_engine() % common.size()];
        }
    }
    Tempus time() { return TempusMake(value(), timescale()); }
    /// Every exponent that a double has, the subnormal ones included.
    double number() {
        double const fraction = static_cast<double>(_engine() >> (11 + _engine() % 53)) + 1.0;
        int const exponent = static_cast<int>(_engine() % 4 == 0 ? _engine() % 1900 : _engine() % 160);
        int const middle = exponent >= 160 ? 1000 : 80;
        return std::ldexp(_engine() % 2 != 0 ? fraction : -fraction, exponent - middle - 26);
    }
    int32_t integer() { return static_cast<int32_t>(value() >> (_engine() % 2 != 0 ? 0 : 32)); }

private:
    std::mt19937_64 _engine;
};

/// Twice the magnitude of r at this timescale, against which rounding and overflow are judged.
Natural twiceAt(SlowRational const& r, int64_t timescale) {
    return r.numerator * Natural(static_cast<uint64_t>(timescale) * 2);
}

/// Whether r can be written as int64 / int32 exactly.
bool isRepresentable(SlowRational const& r) {
    Natural const divisor = greatestCommonDivisor(r.numerator, r.denominator);
    Natural const valueLimit(static_cast<uint64_t>(kHighest) + (r.negative ? 1 : 0));
    return compare(r.denominator, divisor * Natural(static_cast<uint64_t>(kLargestTimescale))) <= 0 &&
           compare(r.numerator, divisor * valueLimit) <= 0;
}

/// Whether `result` is what the promise of exact or nearest arithmetic makes of `truth`.
::testing::AssertionResult isBestFor(Tempus const& result, SlowRational const& truth) {
    // Half a unit below 2^63 is a tie, which goes to the even 2^63 and so does not fit.
    Natural const overflow = Natural(~uint64_t{0}) * truth.denominator;
    if (!TempusIsNumeric(result)) {
        bool const rightSign =
            truth.negative ? TempusIsNegativeInfinity(result) : TempusIsPositiveInfinity(result);
        bool const tooLarge = compare(twiceAt(truth, 1), overflow) >= 0;
        if (rightSign && tooLarge && !isRepresentable(truth)) {
            return ::testing::AssertionSuccess();
        }
        return ::testing::AssertionFailure() << "no number, though one would do";
    }
    SlowRational const error = SlowRational::of(result) - truth;
    if (!TempusHasBeenRounded(result)) {
        return error.numerator.isZero() ? ::testing::AssertionSuccess()
                                        : ::testing::AssertionFailure() << "inexact without the flag";
    }
    if (isRepresentable(truth)) {
        return ::testing::AssertionFailure() << "rounded, though an exact result fits";
    }
    if (result.timescale < kLargestTimescale &&
        compare(twiceAt(truth, int64_t{result.timescale} + 1), overflow) < 0) {
        return ::testing::AssertionFailure() << "a larger timescale fits";
    }
    int const side = compare(twiceAt(error, result.timescale), error.denominator);
    if (side > 0 || (side == 0 && result.value % 2 != 0)) {
        return ::testing::AssertionFailure() << "not the nearest, or a tie that is odd";
    }
    return ::testing::AssertionSuccess();
}

std::string caseText(int index, Tempus const& a, Tempus const& b) {
    return "case " + std::to_string(index) + ": " + ::testing::PrintToString(a) + ", " +
           ::testing::PrintToString(b);
}

char letterOf(Tempus const& t) {
    switch (TempusGetKind(t)) {
    case TempusKind::Number:
        return t.value > 0 ? 'p' : t.value < 0 ? 'n' : '0';
    case TempusKind::PositiveInfinity:
        return '+';
    case TempusKind::NegativeInfinity:
        return '-';
    case TempusKind::Indefinite:
        return 'u';
    default:
        return 'x';
    }
}

} // namespace

TEST(Tempus, SumsAreExactOrNearest) {
    Operands operands(20240611);
    for (int i = 0; i < 20000; ++i) {
        Tempus const a = operands.time();
        Tempus const b = operands.time();
        SCOPED_TRACE(caseText(i, a, b));
        SlowRational const x = SlowRational::of(a);
        SlowRational const y = SlowRational::of(b);
        ASSERT_TRUE(isBestFor(a + b, x + y));
        ASSERT_TRUE(isBestFor(a - b, x - y));
        ASSERT_TRUE(isBestFor(-a, SlowRational{} - x));
        ASSERT_EQ(TempusCompare(a, b), compare(x, y));
        ASSERT_EQ(TempusCompare(b, a), -compare(x, y));
        ASSERT_TRUE(identical(BX_TempusSaferAdd(b, a), a + b));
    }
}

TEST(Tempus, ProductsAndQuotientsAreExactOrNearest) {
    Operands operands(20240612);
    for (int i = 0; i < 8000; ++i) {
        Tempus const a = operands.time();
        Tempus const b = operands.time();
        double const number = operands.number();
        int32_t const integer = operands.integer();
        auto const natural = static_cast<uint32_t>(operands.integer());
        SCOPED_TRACE(caseText(i, a, b) + ", " + ::testing::PrintToString(number) + ", " +
                     std::to_string(integer));
        SlowRational const x = SlowRational::of(a);
        ASSERT_TRUE(isBestFor(a * b, x * SlowRational::of(b)));
        ASSERT_TRUE(isBestFor(a * number, x * SlowRational::of(number)));
        ASSERT_TRUE(isBestFor(a * integer, x * SlowRational::of(int64_t{integer})));
        ASSERT_TRUE(isBestFor(a * natural, x * SlowRational::of(int64_t{natural})));
        ASSERT_TRUE(isBestFor(a / number, x / SlowRational::of(number)));
        if (b.value != 0) {
            ASSERT_TRUE(isBestFor(a / b, x / SlowRational::of(b)));
        }
        if (integer != 0 && natural != 0) {
            ASSERT_TRUE(isBestFor(a / integer, x / SlowRational::of(int64_t{integer})));
            ASSERT_TRUE(isBestFor(a / natural, x / SlowRational::of(int64_t{natural})));
        }
    }
}

TEST(Tempus, DoublesAreTheNearest) {
    Operands operands(20240613);
    constexpr double infinity = std::numeric_limits<double>::infinity();
    // Between the middles of the ways to both neighbours; on one of them where the last bit is 0.
    auto const isNearest = [](double result, SlowRational const& truth) {
        SlowRational const here = SlowRational::of(result);
        int const above = compare(truth + truth, here + SlowRational::of(std::nextafter(result, -infinity)));
        int const below = compare(truth + truth, here + SlowRational::of(std::nextafter(result, infinity)));
        bool const even = std::bit_cast<uint64_t>(result) % 2 == 0;
        return even ? above >= 0 && below <= 0 : above > 0 && below < 0;
    };
    for (int i = 0; i < 5000; ++i) {
        Tempus const a = operands.time();
        Tempus const b = operands.time();
        SCOPED_TRACE(caseText(i, a, b));
        SlowRational const x = SlowRational::of(a);
        ASSERT_TRUE(isNearest(TempusGetSeconds(a), x));
        if (b.value != 0) {
            ASSERT_TRUE(isNearest(TempusRatio(a, b), x / SlowRational::of(b)));
        }
        Tempus c = operands.time();
        c.timescale = i % 4 == 0 ? a.timescale : i % 4 == 1 ? b.timescale : c.timescale;
        SlowRational const whole = SlowRational::of(c) - SlowRational::of(b);
        ASSERT_TRUE(isNearest(TempusSecondsBetween(b, c), whole));
        if (b != c) {
            ASSERT_TRUE(isNearest(TempusFraction(a, b, c), (x - SlowRational::of(b)) / whole));
            ASSERT_EQ(TempusFraction(b, b, c), 0.0);
            ASSERT_FALSE(std::signbit(TempusFraction(b, b, c)));
            ASSERT_EQ(TempusFraction(c, b, c), 1.0);
        }
        double const seconds = operands.number();
        int32_t const timescale = operands.timescale();
        Tempus const t = KFChronoForChannelSeconds(seconds, static_cast<uint32_t>(timescale));
        SlowRational const scaled = SlowRational::of(seconds) * SlowRational::of(int64_t{timescale});
        Natural const doubled = scaled.numerator + scaled.numerator;
        if (TempusIsNumeric(t)) {
            ASSERT_EQ(t.timescale, timescale);
            SlowRational const error = SlowRational::of(t.value) - scaled;
            int const side = compare(error.numerator + error.numerator, error.denominator);
            ASSERT_TRUE(side < 0 || (side == 0 && t.value % 2 == 0)) << seconds;
            ASSERT_EQ(TempusHasBeenRounded(t), !error.numerator.isZero());
        } else {
            ASSERT_GE(compare(doubled, Natural(~uint64_t{0}) * scaled.denominator), 0) << seconds;
        }
    }
    EXPECT_EQ(TempusGetSeconds(kTempusNegativeInfinity), -infinity);
    EXPECT_TRUE(std::isnan(TempusGetSeconds(kTempusIndefinite)));
    EXPECT_EQ(TempusRatio(TempusMake(-1, 2), kTempusZero), -infinity);
    EXPECT_EQ(TempusRatio(TempusMake(1, 2), kTempusPositiveInfinity), 0.0);
    EXPECT_TRUE(std::isnan(TempusRatio(kTempusZero, kTempusZero)));
    EXPECT_EQ(TempusFraction(kTempusPositiveInfinity, kTempusZero, TempusMake(1, 2)), infinity);
    EXPECT_TRUE(std::isnan(TempusFraction(kTempusInvalid, kTempusZero, TempusMake(1, 2))));
    EXPECT_TRUE(std::isnan(TempusFraction(kTempusZero, kTempusZero, kTempusZero)));
    EXPECT_EQ(TempusSecondsBetween(kTempusPositiveInfinity, kTempusZero), -infinity);
    EXPECT_FALSE(TempusIsValid(KFChronoForChannelSeconds(std::nan(""), kKFChannelTimescale)));
    EXPECT_FALSE(TempusIsValid(KFChronoForChannelSeconds(1.0, 0x80000000)));
    EXPECT_TRUE(TempusIsNegativeInfinity(KFChronoForChannelSeconds(-infinity, kKFChannelTimescale)));
}

TEST(Tempus, CyclesAreExact) {
    Operands operands(20240614);
    int exact = 0;
    for (int i = 0; i < 10000; ++i) {
        Tempus const t = operands.time();
        Tempus const d = operands.time();
        if (d.value == 0) {
            continue;
        }
        SCOPED_TRACE(caseText(i, t, d));
        int64_t const k = TempusFloorQuotient(t, d);
        SlowRational const quotient = SlowRational::of(t) / SlowRational::of(d);
        SlowRational const cycles = SlowRational::of(k);
        ASSERT_TRUE(k == kLowest || compare(cycles, quotient) <= 0);
        ASSERT_TRUE(k == kHighest || compare(quotient, cycles + SlowRational::of(int64_t{1})) < 0);
        if (k == kLowest || k == kHighest) {
            continue;
        }
        SlowRational const start = cycles * SlowRational::of(d);
        ASSERT_TRUE(isBestFor(TempusModulo(t, d), SlowRational::of(t) - start));
        if (d.value > 0) {
            ASSERT_TRUE(isBestFor(BX_TempusFloorToSampleDuration(t, d), start));
            ++exact;
        } else {
            ASSERT_TRUE(identical(BX_TempusFloorToSampleDuration(t, d), t));
        }
    }
    EXPECT_GT(exact, 2000);
    EXPECT_TRUE(
        identical(BX_TempusFloorToSampleDuration(TempusMake(-1, 48), TempusMake(1, 24)), TempusMake(-1, 24)));
    EXPECT_TRUE(identical(BX_TempusFloorToSampleDuration(kTempusPositiveInfinity, kTempusZero),
                          kTempusPositiveInfinity));
    EXPECT_TRUE(TempusIsIndefinite(TempusModulo(TempusMake(1, 1), kTempusZero)));
    EXPECT_TRUE(TempusIsIndefinite(TempusModulo(kTempusPositiveInfinity, TempusMake(1, 1))));
    EXPECT_EQ(TempusFloorQuotient(kTempusPositiveInfinity, TempusMake(-1, 3)), kLowest);
    EXPECT_EQ(TempusFloorQuotient(TempusMake(1, 3), kTempusZero), kHighest);
    EXPECT_EQ(TempusFloorQuotient(kTempusZero, kTempusZero), 0);
}

TEST(Tempus, KeepsTimescalesNatural) {
    struct Case {
        Tempus result;
        Tempus expected;
    };
    Tempus const frame = TempusMake(1, 24);
    Case const cases[] = {
        {frame + frame, TempusMake(2, 24)},
        {frame + TempusMake(1, 30), TempusMake(9, 120)},
        {TempusMake(48, 24) * TempusMake(1, 2), TempusMake(24, 24)},
        {TempusMake(48, 24) / TempusMake(24, 24), TempusMake(2, 1)},
        {frame * 3, TempusMake(3, 24)},
        {frame * 0.5, TempusMake(1, 48)},
        {TempusMake(6, 24) / 3u, TempusMake(2, 24)},
        {TempusReduced(TempusMake(-36, 24)), TempusMake(-3, 2)},
        {TempusReduced(TempusMake(0, 24)), kTempusZero},
    };
    for (Case const& c : cases) {
        EXPECT_TRUE(identical(c.result, c.expected))
            << ::testing::PrintToString(c.result) << " expected " << ::testing::PrintToString(c.expected);
    }
    for (Tempus const& t : {rounded(1, 24) + frame, frame + rounded(1, 24), frame - rounded(1, 24)}) {
        EXPECT_TRUE(TempusHasBeenRounded(t)) << "the fast path hands the flag on";
    }
    EXPECT_TRUE(TempusHasBeenRounded(frame * rounded(1, 30)));
    EXPECT_TRUE(TempusHasBeenRounded(-rounded(1, 24)));
    EXPECT_TRUE(identical(TempusMake(1, 0), kTempusInvalid));
}

TEST(Tempus, OneTableOfKinds) {
    Tempus const kinds[] = {TempusMake(5, 24),       TempusMake(-5, 24),      kTempusZero,
                            kTempusPositiveInfinity, kTempusNegativeInfinity, kTempusIndefinite,
                            kTempusInvalid};
    struct Operation {
        char const* name;
        Tempus (*apply)(Tempus const&, Tempus const&);
        char const* rows[7]; // a row for each left operand: p n 0 + - u x
    };
    Operation const operations[] = {
        {"+",
         [](Tempus const& a, Tempus const& b) { return a + b; },
         {"p0p+-ux", "0nn+-ux", "pn0+-ux", "++++uux", "---u-ux", "uuuuuux", "xxxxxxx"}},
        {"-",
         [](Tempus const& a, Tempus const& b) { return a - b; },
         {"0pp-+ux", "n0n-+ux", "np0-+ux", "+++u+ux", "----uux", "uuuuuux", "xxxxxxx"}},
        {"*",
         [](Tempus const& a, Tempus const& b) { return a * b; },
         {"pn0+-ux", "np0-+ux", "000uuux", "+-u+-ux", "-+u-+ux", "uuuuuux", "xxxxxxx"}},
        {"/",
         [](Tempus const& a, Tempus const& b) { return a / b; },
         {"pn+00ux", "np-00ux", "00u00ux", "+-+uuux", "-+-uuux", "uuuuuux", "xxxxxxx"}},
    };
    for (Operation const& operation : operations) {
        for (std::size_t left = 0; left < 7; ++left) {
            std::string row;
            for (Tempus const& right : kinds) {
                row += letterOf(operation.apply(kinds[left], right));
            }
            EXPECT_EQ(row, operation.rows[left]) << letterOf(kinds[left]) << ' ' << operation.name;
        }
    }
    std::string doubles;
    for (Tempus const& t : kinds) {
        doubles += letterOf(t * -2.0);
        doubles += letterOf(t / 0.0);
        doubles += letterOf(t * std::numeric_limits<double>::infinity());
        doubles += letterOf(t / std::nan(""));
    }
    EXPECT_EQ(doubles, "n+uup-uu0uuu-+uu+-uuuuuuxxxx");
    EXPECT_TRUE(TempusIsNegativeInfinity(TempusMake(-1, 3) / 0));
    EXPECT_TRUE(TempusIsPositiveInfinity(TempusAbsoluteValue(kTempusNegativeInfinity)));
}

TEST(Tempus, OrdersEverything) {
    Tempus later = TempusMake(-100, 1);
    later.epoch = 1;
    Tempus const ascending[] = {kTempusNegativeInfinity, TempusMake(-1, 3), kTempusZero,
                                TempusMake(1, 3),        TempusMake(1, 2),  later,
                                kTempusPositiveInfinity, kTempusIndefinite, kTempusInvalid};
    for (Tempus const& a : ascending) {
        for (Tempus const& b : ascending) {
            int const sign = (&a > &b) - (&a < &b);
            int const order = TempusCompare(a, b);
            EXPECT_EQ((order > 0) - (order < 0), sign)
                << ::testing::PrintToString(a) << ::testing::PrintToString(b);
            EXPECT_TRUE((a <= b) == (sign <= 0) && (a != b) == (sign != 0));
        }
    }
    EXPECT_EQ(rounded(1, 2), TempusMake(1, 2));
    Tempus const broken{1, -24, kTempusFlagValid, 0};
    EXPECT_FALSE(TempusIsValid(broken));
    EXPECT_FALSE(TempusIsValid(broken + broken)) << "bits that fit no kind are invalid on the fast path too";
    EXPECT_EQ(TempusMinimum(kTempusInvalid, later).epoch, 1);
}

TEST(Tempus, EpochsAddAndCancel) {
    auto const in = [](int64_t epoch) { return Tempus{3, 1, kTempusFlagValid, epoch}; };
    EXPECT_EQ((in(0) + in(7)).epoch, 7);
    EXPECT_EQ((in(7) + in(0)).epoch, 7);
    EXPECT_FALSE(TempusIsValid(in(7) + in(7)));
    EXPECT_TRUE(identical(in(7) - in(7), TempusMake(0, 1)));
    EXPECT_FALSE(TempusIsValid(in(0) - in(7)));
    EXPECT_EQ((in(7) * 2.0).epoch, 7);
    EXPECT_EQ(TempusRatio(in(7), in(7)), 1.0);
    EXPECT_TRUE(std::isnan(TempusRatio(in(7), in(6))));
    EXPECT_EQ(BX_TempusFloorToSampleDuration(in(7), TempusMake(2, 1)).epoch, 7);
    EXPECT_TRUE(identical(TempusModulo(in(7), TempusMake(2, 1)), TempusMake(1, 1)));
    EXPECT_EQ(TempusRangeGetEnd({in(7), TempusMake(1, 2)}).epoch, 7);
}
