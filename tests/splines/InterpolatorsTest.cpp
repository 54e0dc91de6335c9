// The strategies that need no tangents, against their formulas written out in long double and in seconds.

#include "lumenkey/splines/KFBasicInterpolators.h"
#include "lumenkey/splines/KFInterpolators.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineInterpolator.h"
#include "lumenkey/splines/KFStaticVertex.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <string>
#include <thread>

namespace {

constexpr std::uint32_t kBasicTypes[] = {0, 1, 7, 8, 13, 14, 15, 16, 17, 18, 19, 20, 21};

bool isSinglePrecision(std::uint32_t type) { return type >= 19 && type <= 21; }

/// One segment, of a spline that leaves tangents alone.
struct Segment {
    KFSplineState state;
    KFSpline spline{&state};
    KFVertex* a = nullptr;
    KFVertex* b = nullptr;

    Segment(std::uint32_t type, Tempus const& u1, double valueA, Tempus const& u2, double valueB,
            double bias = 1.0) {
        state.deriveTangents = false;
        state.interpolation = type;
        a = static_cast<KFVertex*>(spline.appendVertexNoTangents(u1, valueA, kTempusZero));
        b = static_cast<KFVertex*>(spline.appendVertexNoTangents(u2, valueB, kTempusZero));
        a->setBias(bias, kTempusZero);
    }

    KFInterpolator& strategy() { return *spline.getInterpolator(a->getInterpolation()); }

    double value(Tempus const& u) {
        return strategy().interpolate(spline, kTempusZero, a, b, u, false, false);
    }
    double slope(Tempus const& u) {
        return strategy().interpolate(spline, kTempusZero, a, b, u, false, true);
    }

    std::vector<Tempus> positionsOf(double value, bool* known = nullptr) {
        std::vector<Tempus> out;
        bool const answer =
            strategy().uForCurveValue(spline, a, b, a->getValueU(), b->getValueU(), value, out);
        if (known != nullptr)
            *known = answer;
        return out;
    }
};

/// The distance gone after a part p of a move that gains speed over `in` and loses it over `out`, from its
/// speed.
long double easedLong(long double p, long double in, long double out) {
    long double const speed = 2.0L / (2.0L - in - out);
    if (p < in)
        return speed * p * p / (2.0L * in);
    if (p > 1.0L - out)
        return 1.0L - speed * (1.0L - p) * (1.0L - p) / (2.0L * out);
    return speed * (p - in / 2.0L);
}

long double valueLong(std::uint32_t type, long double tau, long double a, long double b, long double bias) {
    long double const pi = 3.14159265358979323846264338327950288L;
    auto const linear = [&](long double q) { return (1.0L - q) * a + q * b; };
    auto const angle = [&](long double full) { return static_cast<float>(static_cast<double>(tau * full)); };
    long double const ramp = 2.0L - bias;
    switch (type) {
    case 0:
        return a;
    case 7:
        return a + (b - a) * (1.0L - std::cos(pi * tau / 2.0L));
    case 8:
        return a + (b - a) * std::sin(pi * tau / 2.0L);
    case 13: {
        if (a == b)
            return a;
        long double const K = std::log(10000.0L);
        long double const L = std::log(std::fabs(b - a));
        long double const C = std::exp(-K);
        return a + (b - a) * (std::exp((L + K) * tau - K) - C) / (std::exp(L) - C);
    }
    case 14:
        return a + (b - a) / std::log(1000.0L) * std::log(tau * 999.0L + 1.0L);
    case 15:
        return linear(easedLong(tau, ramp / 4.0L, ramp / 4.0L));
    case 16:
        return linear(easedLong(tau, ramp / 2.0L, 0.0L));
    case 17:
        return linear(easedLong(tau, 0.0L, ramp / 2.0L));
    case 19: {
        long double const x = angle(pi / 2.0L);
        return a >= b ? a * std::cos(x) + b * (1.0L - std::cos(x))
                      : a * (1.0L - std::sin(x)) + b * std::sin(x);
    }
    case 20: {
        long double const x = angle(pi / 2.0L);
        return a >= b ? a * (1.0L - std::sin(x)) + b * std::sin(x)
                      : a * std::cos(x) + b * (1.0L - std::cos(x));
    }
    case 21: {
        long double const s = (1.0L - std::cos(static_cast<long double>(angle(pi)))) / 2.0L;
        return b * s + a * (1.0L - s);
    }
    default:
        return linear(tau);
    }
}

/// Single precision has 24 bits, and one double less of the angle may round it to the neighbour.
double toleranceOf(std::uint32_t type, double a, double b) {
    double const scale = std::fabs(a) + std::fabs(b);
    return isSinglePrecision(type) ? 3e-7 * std::fabs(b - a) + 1e-15 * scale : 4e-15 * scale + 1e-18;
}

/// A time that comes from a double is rounded to some timescale.
constexpr double kFinestTime = 1.0 / 2147483647.0;

struct Ends {
    Tempus u1;
    double a;
    Tempus u2;
    double b;
};

Ends const kEnds[] = {
    {TempusMake(1, 1), 10.0, TempusMake(3, 1), 20.0},
    {TempusMake(-1, 3), 5.0, TempusMake(22, 7), -2.5},
    {TempusMake(1001, 30000), -3.0, TempusMake(2002, 30000), -3.0},
    {TempusMake(0, 1), 0.0, TempusMake(100000, 1), 1e9},
    {TempusMake(123456789012345, 90000), 1.0, TempusMake(123456789112345, 90000), 1.5},
    // on either side of e^-K, where the growth of Exponential turns into decay
    {TempusMake(0, 1), 0.0, TempusMake(1, 1), 0.00009},
    {TempusMake(0, 1), 2.0, TempusMake(1, 1), 2.00011},
};

} // namespace

TEST(BasicInterpolators, FollowTheirFormulas) {
    for (Ends const& ends : kEnds) {
        for (std::uint32_t type : kBasicTypes) {
            for (double bias : {1.0, 0.0, 0.37, 2.0}) {
                Segment segment(type, ends.u1, ends.a, ends.u2, ends.b, bias);
                Tempus const span = ends.u2 - ends.u1;
                for (int i = 0; i <= 60; ++i) {
                    Tempus const u = ends.u1 + span * TempusMake(i, 60);
                    double const truth =
                        static_cast<double>(valueLong(type, i / 60.0L, ends.a, ends.b, bias));
                    double const value = segment.value(u);
                    ASSERT_NEAR(value, truth, toleranceOf(type, ends.a, ends.b))
                        << "type " << type << ", bias " << bias << ", " << i << "/60, a " << ends.a;
                    // What the spline answers inside is the strategy's value to the last bit, at an end the
                    // vertex's.
                    double const expected = i == 0 ? ends.a : i == 60 ? ends.b : value;
                    ASSERT_EQ(segment.spline.getVertexValue(u, kTempusZero, true), expected)
                        << "type " << type << ", bias " << bias << ", " << i << "/60, a " << ends.a;
                }
            }
        }
    }
}

TEST(BasicInterpolators, ExponentialStaysSoundWhereItsGrowthVanishesOrOverflows) {
    Segment still(13, TempusMake(0, 1), 0.0, TempusMake(1, 1), 0.0001);
    EXPECT_NEAR(still.value(TempusMake(1, 4)), 0.000025, 1e-18); // e^0 throughout: a line
    Segment far(13, TempusMake(0, 1), 0.0, TempusMake(1, 1), 1e308);
    EXPECT_EQ(far.value(TempusMake(0, 1)), 0.0);
    EXPECT_EQ(far.value(TempusMake(1, 1)), 1e308);
    EXPECT_GT(far.value(TempusMake(999, 1000)), 1e307);
}

TEST(BasicInterpolators, LinearIsExactAtItsEndsAndKnowsItsSlope) {
    // 0.1 + (0.7 - 0.1) isn't 0.7: both ends come out only as sums of two products.
    Segment segment(1, TempusMake(1, 3), 0.1, TempusMake(5, 7), 0.7);
    EXPECT_EQ(segment.value(TempusMake(1, 3)), 0.1);
    EXPECT_EQ(segment.value(TempusMake(5, 7)), 0.7);

    Segment other(18, TempusMake(1, 1), 10.0, TempusMake(3, 1), 20.0);
    EXPECT_EQ(other.slope(TempusMake(2, 1)), 5.0);
    EXPECT_EQ(other.value(TempusMake(5, 1)), 30.0);
    Segment held(0, TempusMake(1, 1), 10.0, TempusMake(3, 1), 20.0);
    EXPECT_EQ(held.slope(TempusMake(2, 1)), 0.0);
    // Only Constant, Linear and the cubic types know a slope: the others answer with the value.
    Segment easeIn(7, TempusMake(1, 1), 10.0, TempusMake(3, 1), 20.0);
    EXPECT_EQ(easeIn.slope(TempusMake(2, 1)), easeIn.value(TempusMake(2, 1)));
}

TEST(BasicInterpolators, EaseInTime) {
    struct Case {
        std::uint32_t type;
        double bias, in, out;
    };
    for (Case const& c : {Case{15, 1.0, 0.25, 0.25}, Case{15, 0.0, 0.5, 0.5}, Case{15, 2.0, 0.0, 0.0},
                          Case{16, 1.0, 0.5, 0.0}, Case{17, 1.0, 0.0, 0.5}, Case{17, 0.5, 0.0, 0.75}}) {
        Segment segment(c.type, TempusMake(2, 1), 0.0, TempusMake(10, 1), 1.0, c.bias);
        for (int i = 0; i <= 32; ++i) {
            Tempus const u = TempusMake(2 * 4 + i, 4);
            Tempus const eased = segment.strategy().easeTime(segment.spline, u, segment.a, segment.b);
            long double const q = easedLong(i / 32.0L, c.in, c.out);
            EXPECT_NEAR(TempusGetSeconds(eased), static_cast<double>(2.0L + 8.0L * q), kFinestTime)
                << c.type << " " << i;
        }
    }
    // On the segment that closes a spline the ramps belong to its short span.
    Segment closing(16, TempusMake(4, 1), 0.0, TempusMake(1, 1), 1.0);
    Tempus const u = TempusMake(4, 1) + TempusMake(1, 200);
    long double const q = easedLong(0.5L, 0.5L, 0.0L);
    EXPECT_NEAR(TempusGetSeconds(closing.strategy().easeTime(closing.spline, u, closing.a, closing.b)),
                static_cast<double>(4.0L + 0.01L * q), kFinestTime);
    EXPECT_NEAR(closing.value(u), static_cast<double>(q), 1e-14);
}

TEST(BasicInterpolators, TheClosingSegmentIsShort) {
    for (std::uint32_t type : kBasicTypes) {
        Segment segment(type, TempusMake(9, 1), 2.0, TempusMake(1, 1), 7.0);
        Tempus const u = TempusMake(9, 1) + TempusMake(1, 400);
        EXPECT_NEAR(segment.value(u), static_cast<double>(valueLong(type, 0.25L, 2.0L, 7.0L, 1.0L)),
                    toleranceOf(type, 2.0, 7.0))
            << type;
    }
    Segment parametric(1, TempusMake(9, 1), 2.0, TempusMake(1, 1), 7.0);
    parametric.state.parametric = true;
    EXPECT_EQ(parametric.value(TempusMake(37, 4)), 3.25);
}

TEST(BasicInterpolators, ASegmentOfNoLengthIsItsStart) {
    Tempus const u = TempusMake(7, 2);
    for (std::uint32_t type : {0u, 1u, 4u, 6u, 7u, 8u, 13u, 14u, 15u, 16u, 17u, 18u, 19u, 20u, 21u}) {
        Segment segment(type, u, 2.0, u, 7.0);
        EXPECT_EQ(segment.value(u), 2.0) << type;
        double min = 0.0;
        double max = 0.0;
        segment.positionsOf(2.0);
        if (auto* const bezier = dynamic_cast<KFBezierInterpolator*>(&segment.strategy())) {
            bezier->getMinMaxValues(segment.spline, segment.a, segment.b, u, u, &min, &max);
            EXPECT_TRUE(std::isfinite(min) && std::isfinite(max)) << type;
        }
    }
    Segment linear(1, u, 2.0, u, 7.0);
    EXPECT_EQ(linear.slope(u), 0.0);
    EXPECT_TRUE(Segment(13, u, 2.0, u, 7.0).positionsOf(2.0).empty());
}

TEST(BasicInterpolators, FindTheirValuesAgain) {
    Tempus const u1 = TempusMake(1, 3);
    Tempus const u2 = TempusMake(17, 5);
    Tempus const span = u2 - u1;
    for (auto const& [a, b] : {std::pair{2.0, 9.0}, std::pair{4.0, -1.5}}) {
        for (std::uint32_t type : {1u, 7u, 8u, 14u, 18u}) {
            Segment segment(type, u1, a, u2, b);
            for (int i = 0; i <= 20; ++i) {
                Tempus const u = u1 + span * TempusMake(i, 20);
                bool known = false;
                std::vector<Tempus> const found =
                    segment.positionsOf(segment.spline.getVertexValue(u, kTempusZero, false), &known);
                ASSERT_TRUE(known) << type << " " << i;
                ASSERT_EQ(found.size(), 1u);
                // EaseIn starts and EaseOut ends flat, where a value says little of its position.
                EXPECT_NEAR(TempusRatio(found[0] - u1, span), i / 20.0, 1e-7) << type << " " << i;
            }
            for (double outside : {10.0, -2.0, std::numeric_limits<double>::quiet_NaN()}) {
                bool known = true;
                EXPECT_TRUE(segment.positionsOf(outside, &known).empty());
                EXPECT_FALSE(known);
            }
        }
    }
    // Types that ease in time answer as Linear does.
    EXPECT_EQ(Segment(15, u1, 0.0, u2, 1.0).positionsOf(0.25),
              Segment(1, u1, 0.0, u2, 1.0).positionsOf(0.25));
    // The trigonometric types know no positions.
    for (std::uint32_t type : {19u, 20u, 21u}) {
        bool known = true;
        EXPECT_TRUE(Segment(type, u1, 0.0, u2, 1.0).positionsOf(0.5, &known).empty());
        EXPECT_FALSE(known);
    }
}

TEST(BasicInterpolators, ExponentialFindsPositionsButForTheStartOfItsGrowth) {
    Segment segment(13, TempusMake(0, 1), 1.0, TempusMake(2, 1), 101.0);
    long double const K = std::log(10000.0L);
    long double const L = std::log(100.0L);
    for (double value : {1.5, 20.0, 99.0}) {
        long double const grown = (value - 1.0L) * (100.0L - std::exp(-K)) / 100.0L;
        std::vector<Tempus> const found = segment.positionsOf(value);
        ASSERT_EQ(found.size(), 1u);
        EXPECT_NEAR(TempusGetSeconds(found[0]), static_cast<double>(2.0L * (std::log(grown) + K) / (L + K)),
                    kFinestTime);
    }
    // At a itself, where that form knows no number, the position is the start.
    EXPECT_EQ(segment.positionsOf(1.0), std::vector<Tempus>{TempusMake(0, 1)});
}

TEST(BasicInterpolators, FlatSegmentsHaveTheirValueAtTheStart) {
    for (std::uint32_t type : {1u, 7u, 8u, 13u, 14u, 16u}) {
        Segment segment(type, TempusMake(1, 1), 4.0, TempusMake(2, 1), 4.0);
        EXPECT_EQ(segment.positionsOf(4.0), std::vector<Tempus>{TempusMake(1, 1)}) << type;
    }
    Segment held(0, TempusMake(1, 1), 4.0, TempusMake(2, 1), 5.0);
    std::vector<Tempus> out;
    Tempus const low = TempusMake(5, 4);
    EXPECT_TRUE(held.strategy().uForCurveValue(held.spline, held.a, held.b, low, TempusMake(2, 1), 4.0, out));
    EXPECT_EQ(out, std::vector<Tempus>{low});
    EXPECT_FALSE(
        held.strategy().uForCurveValue(held.spline, held.a, held.b, low, TempusMake(2, 1), 4.5, out));
    EXPECT_EQ(out.size(), 1u);
}

TEST(BasicInterpolators, GiveTheExtremesBetweenTwoPositions) {
    double min = 0.0;
    double max = 0.0;
    Tempus const early = TempusMake(-5, 1);
    Tempus const late = TempusMake(50, 1);
    Segment linear(1, TempusMake(1, 1), 8.0, TempusMake(3, 1), -2.0);
    auto& linearStrategy = dynamic_cast<KFLinearInterpolator&>(linear.strategy());
    linearStrategy.getMinMaxValues(linear.spline, linear.a, linear.b, TempusMake(3, 2), TempusMake(2, 1),
                                   &min, &max);
    EXPECT_EQ(min, 3.0);
    EXPECT_EQ(max, 5.5);
    linearStrategy.getMinMaxValues(linear.spline, linear.a, linear.b, early, late, &min, &max);
    EXPECT_EQ(min, -2.0);
    EXPECT_EQ(max, 8.0);

    Segment growing(14, TempusMake(1, 1), 8.0, TempusMake(3, 1), -2.0);
    auto& monotonic = dynamic_cast<KFMonotonicInterpolator&>(growing.strategy());
    monotonic.getMinMaxValues(growing.spline, growing.a, growing.b, early, TempusMake(2, 1), &min, &max);
    EXPECT_EQ(min, growing.value(TempusMake(2, 1)));
    EXPECT_EQ(max, 8.0);

    Segment held(0, TempusMake(1, 1), 8.0, TempusMake(3, 1), -2.0);
    dynamic_cast<KFConstantInterpolator&>(held.strategy())
        .getMinMaxValues(held.spline, held.a, held.b, 0.0, 9.0, &min, &max);
    EXPECT_EQ(min, 8.0);
    EXPECT_EQ(max, 8.0);
}

TEST(BasicInterpolators, SubdivideOnTheCurve) {
    Tempus const t = kTempusZero;
    Segment held(0, TempusMake(1, 1), 8.0, TempusMake(3, 1), -2.0);
    held.strategy().subDivide(held.spline, t, held.a, held.b, nullptr);
    void* middle = nullptr;
    ASSERT_TRUE(held.spline.getVertexHandle(TempusMake(2, 1), &middle, false));
    EXPECT_EQ(static_cast<KFVertex*>(middle)->getValueV(t), 8.0);

    for (std::uint32_t type : {1u, 7u, 13u, 16u, 19u}) {
        Segment segment(type, TempusMake(1, 1), 8.0, TempusMake(3, 1), -2.0);
        KFStaticVertex added(TempusMake(5, 4), 0.0);
        segment.strategy().subDivide(segment.spline, t, segment.a, segment.b, &added);
        // A type that eases in time reads the spline, which eases again, at the eased time.
        Tempus const read =
            segment.strategy().easeTime(segment.spline, TempusMake(5, 4), segment.a, segment.b);
        EXPECT_EQ(added.getValueV(t), segment.spline.getVertexValue(read, t, false)) << type;
        EXPECT_NE(added.getValueV(t), 0.0);
    }
}

TEST(Interpolators, StandUnderTheirNumbers) {
    KFInterpolatorStrategies& shared = KFInterpolatorStrategies::getInstance();
    auto const name = [&](std::uint32_t type) {
        return std::string(typeid(*shared.getInterpolator(type)).name());
    };
    EXPECT_EQ(name(0), typeid(KFConstantInterpolator).name());
    EXPECT_EQ(name(1), typeid(KFLinearInterpolator).name());
    EXPECT_EQ(name(6), typeid(KFCatmullRomInterpolator).name());
    EXPECT_EQ(name(7), typeid(KFEaseInInterpolator).name());
    EXPECT_EQ(name(8), typeid(KFEaseOutInterpolator).name());
    EXPECT_EQ(name(13), typeid(KFExponentialInterpolator).name());
    EXPECT_EQ(name(14), typeid(KFLogarithmicInterpolator).name());
    EXPECT_EQ(name(15), typeid(KFEaseInterpolator).name());
    EXPECT_EQ(name(16), typeid(KFAccelerateInterpolator).name());
    EXPECT_EQ(name(17), typeid(KFDecelerateInterpolator).name());
    EXPECT_EQ(name(19), typeid(KFConvexInterpolator).name());
    EXPECT_EQ(name(20), typeid(KFConcaveInterpolator).name());
    EXPECT_EQ(name(21), typeid(KFSCurveInterpolator).name());
    EXPECT_EQ(shared.getInterpolator(18), shared.getInterpolator(1));
    for (std::uint32_t type : {2u, 3u, 5u, 9u, 10u, 11u, 12u, 22u, 99u, 100u, 0xffffffffu}) {
        EXPECT_EQ(shared.getInterpolator(type), shared.getInterpolator(4)) << type;
    }
    EXPECT_EQ(name(4), typeid(KFBezierInterpolator).name());
}

TEST(Interpolators, OfOneSplineBelongToIt) {
    KFInterpolators one;
    KFInterpolators other;
    EXPECT_TRUE(one == other);
    KFInterpolator* const own = one.getInterpolator(10);
    EXPECT_EQ(one.getInterpolator(10), own);
    EXPECT_FALSE(one == other) << "only one of them has a BSpline strategy";
    EXPECT_NE(other.getInterpolator(10), own);
    EXPECT_TRUE(one == other);
    one.getInterpolator(12);
    KFInterpolators const copy(one);
    EXPECT_TRUE(copy == one);
    EXPECT_FALSE(copy == other);
    other = one;
    EXPECT_TRUE(other == one);
    EXPECT_NE(other.getInterpolator(12), one.getInterpolator(12));
    other = KFInterpolators();
    EXPECT_FALSE(other == one);
    EXPECT_EQ(one.getInterpolator(15), other.getInterpolator(15));
}

TEST(InterpolatorsThreads, MakeOneStrategyOfThoseAskedForAtOnce) {
    for (int round = 0; round < 50; ++round) {
        KFInterpolators interpolators;
        KFInterpolator* found[4] = {};
        std::vector<std::thread> threads;
        for (KFInterpolator*& slot : found) {
            threads.emplace_back([&] { slot = interpolators.getInterpolator(10); });
        }
        for (std::thread& thread : threads) {
            thread.join();
        }
        for (KFInterpolator* strategy : found) {
            ASSERT_EQ(strategy, found[0]);
        }
    }
}
