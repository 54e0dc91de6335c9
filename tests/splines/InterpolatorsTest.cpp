// What the strategies do that need no tangents, besides drawing, which the frozen values hold.

#include "lumenkey/splines/KFBasicInterpolators.h"
#include "lumenkey/splines/KFSplineInterpolator.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

struct Segment : MuseumSpline {
    KFVertex* a;
    KFVertex* b;

    Segment(std::uint32_t type, Tempus const& u1, double valueA, Tempus const& u2, double valueB)
        : a(append(u1, valueA, type)), b(append(u2, valueB, type)) {}

    KFInterpolator& strategy() { return *spline->getInterpolator(a->getInterpolation()); }

    double value(Tempus const& u, bool slope = false) {
        return strategy().interpolate(*spline, kTempusZero, a, b, u, false, slope);
    }

    std::vector<Tempus> positionsOf(double value) {
        std::vector<Tempus> out;
        bool const isKnown =
            strategy().uForCurveValue(*spline, a, b, a->getValueU(), b->getValueU(), value, out);
        EXPECT_EQ(isKnown, !out.empty());
        return out;
    }

    template <class Strategy> std::pair<double, double> extremes(Tempus const& low, Tempus const& high) {
        double min = 0.0, max = 0.0;
        dynamic_cast<Strategy&>(strategy()).getMinMaxValues(*spline, a, b, low, high, &min, &max);
        return {min, max};
    }
};

/// A time that comes from a double is rounded to some timescale.
constexpr double kFinestTime = 1.0 / 2147483647.0;

} // namespace

TEST(BasicInterpolators, ExponentialStaysSoundWhereItsGrowthVanishesOrOverflows) {
    Segment still(13, TempusMake(0, 1), 0.0, TempusMake(1, 1), 0.0001);
    EXPECT_NEAR(still.value(TempusMake(1, 4)), 0.000025, 1e-18); // e^0 throughout: a line
    Segment far(13, TempusMake(0, 1), 0.0, TempusMake(1, 1), 1e308);
    EXPECT_EQ(far.value(TempusMake(0, 1)), 0.0);
    EXPECT_EQ(far.value(TempusMake(1, 1)), 1e308);
    EXPECT_GT(far.value(TempusMake(999, 1000)), 1e307);
}

TEST(BasicInterpolators, ASegmentOfNoLengthIsItsStart) {
    Tempus const u = TempusMake(7, 2);
    for (std::uint32_t type : {0u, 1u, 4u, 6u, 7u, 8u, 13u, 14u, 15u, 16u, 17u, 18u, 19u, 20u, 21u}) {
        Segment segment(type, u, 2.0, u, 7.0);
        EXPECT_EQ(segment.value(u), 2.0) << type;
        segment.positionsOf(2.0);
        if (dynamic_cast<KFBezierInterpolator*>(&segment.strategy()) != nullptr) {
            auto const [min, max] = segment.extremes<KFBezierInterpolator>(u, u);
            EXPECT_TRUE(std::isfinite(min) && std::isfinite(max)) << type;
        }
    }
    EXPECT_EQ(Segment(1, u, 2.0, u, 7.0).value(u, true), 0.0);
    EXPECT_TRUE(Segment(13, u, 2.0, u, 7.0).positionsOf(2.0).empty());
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
        EXPECT_TRUE(segment.positionsOf(4.5).empty()) << type;
    }
    Segment held(0, TempusMake(1, 1), 4.0, TempusMake(2, 1), 5.0);
    EXPECT_EQ(held.positionsOf(4.0), std::vector<Tempus>{TempusMake(1, 1)});
    EXPECT_TRUE(held.positionsOf(4.5).empty());
    // The trigonometric types know no positions.
    for (std::uint32_t type : {19u, 20u, 21u}) {
        EXPECT_TRUE(Segment(type, TempusMake(1, 1), 0.0, TempusMake(2, 1), 1.0).positionsOf(0.5).empty());
    }
}

TEST(BasicInterpolators, GiveTheExtremesBetweenTwoPositions) {
    Tempus const early = TempusMake(-5, 1), middle = TempusMake(2, 1), late = TempusMake(50, 1);
    Segment linear(1, TempusMake(1, 1), 8.0, TempusMake(3, 1), -2.0);
    EXPECT_EQ(linear.extremes<KFLinearInterpolator>(TempusMake(3, 2), middle), std::pair(3.0, 5.5));
    EXPECT_EQ(linear.extremes<KFLinearInterpolator>(early, late), std::pair(-2.0, 8.0));
    Segment growing(14, TempusMake(1, 1), 8.0, TempusMake(3, 1), -2.0);
    double const value = growing.value(middle);
    EXPECT_EQ(growing.extremes<KFMonotonicInterpolator>(early, middle), std::pair(value, 8.0));
    EXPECT_EQ(growing.extremes<KFMonotonicInterpolator>(middle, late), std::pair(-2.0, value));
}

TEST(BasicInterpolators, SubdivideOnTheCurve) {
    Tempus const t = kTempusZero;
    Segment held(0, TempusMake(1, 1), 8.0, TempusMake(3, 1), -2.0);
    held.strategy().subDivide(*held, t, held.a, held.b, nullptr);
    ASSERT_NE(held.vertexAt(TempusMake(2, 1)), nullptr);
    EXPECT_EQ(held.vertexAt(TempusMake(2, 1))->getValueV(t), 8.0);

    for (std::uint32_t type : {1u, 7u, 13u, 16u, 19u}) {
        Segment segment(type, TempusMake(1, 1), 8.0, TempusMake(3, 1), -2.0);
        KFStaticVertex added(TempusMake(5, 4), 0.0);
        segment.strategy().subDivide(*segment, t, segment.a, segment.b, &added);
        // A type that eases in time reads the spline, which eases again, at the eased time.
        Tempus const read = segment.strategy().easeTime(*segment, TempusMake(5, 4), segment.a, segment.b);
        EXPECT_EQ(added.getValueV(t), segment.at(read, false)) << type;
        EXPECT_NE(added.getValueV(t), 0.0);
    }
}
