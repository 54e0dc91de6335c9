// What Bezier segments do besides drawing: they are split, and asked for their extremes and their values.

#include "lumenkey/splines/KFSplineInterpolator.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace {

Tempus s(int value, int timescale = 1) { return TempusMake(value, timescale); }

/// From 2 at 1 s over values above 6 to 3 at 4 s.
struct Overshoot : MuseumSpline {
    KFVertex* a = append(s(1), 2.0, 0.1, 0.6);
    KFVertex* b = append(s(4), 3.0, -0.05, 0.5);
    KFBezierInterpolator& strategy = dynamic_cast<KFBezierInterpolator&>(*spline->getInterpolator(4));

    KFVertex* append(Tempus const& u, double value, double tangentU, double tangentV) {
        auto* const vertex = static_cast<KFVertex*>(spline->appendVertexNoTangents(u, value, kTempusZero));
        vertex->setInterpolation(4);
        // Each keeps the sign of its side.
        vertex->setInputTangents(tangentU, tangentV, kTempusZero);
        vertex->setOutputTangents(tangentU, tangentV, kTempusZero);
        return vertex;
    }
};

} // namespace

TEST(KFBezierInterpolator, SplitsACurveAndKeepsItsShape) {
    Overshoot curve;
    curve.a->setFlag(kKFVertexFlagLocked);
    auto const read = [&](KFVertex& from, KFVertex& to, double parameter) {
        return curve.strategy.eval(*curve, kTempusZero, &from, &to, parameter);
    };
    double const part = 0.3;
    KFStaticVertex middle(s(19, 10), 0.0);
    std::vector<double> before;
    for (int i = 0; i <= 20; ++i)
        before.push_back(read(*curve.a, *curve.b, i / 20.0));
    curve.strategy.subDivide(*curve, kTempusZero, curve.a, curve.b, &middle);
    for (std::size_t i = 0; i <= 20; ++i) {
        double const at = static_cast<double>(i) / 20.0;
        double const after = at <= part ? read(*curve.a, middle, at / part)
                                        : read(middle, *curve.b, (at - part) / (1.0 - part));
        EXPECT_NEAR(after, before[i], 1e-13) << i;
    }
    EXPECT_TRUE(curve.a->testFlag(kKFVertexFlagLocked)) << "a locked vertex is written and stays locked";
    EXPECT_FALSE(curve.b->testFlag(kKFVertexFlagLocked));
}

TEST(KFBezierInterpolator, GivesTheExtremesBetweenTwoPositions) {
    Overshoot curve;
    // Over the top, beyond both ends, rising only, falling only.
    for (auto const& [low, high] :
         {std::pair{s(1), s(4)}, std::pair{s(-9), s(99)}, std::pair{s(1), s(2)}, std::pair{s(7, 2), s(4)}}) {
        double lowest = 1e30;
        double highest = -1e30;
        for (int i = 0; i <= 3000; ++i) {
            double const value = curve.at(low + (high - low) * s(i, 3000));
            lowest = std::min(lowest, value);
            highest = std::max(highest, value);
        }
        double min = 0.0;
        double max = 0.0;
        curve.strategy.getMinMaxValues(*curve, curve.a, curve.b, low, high, &min, &max);
        EXPECT_NEAR(min, lowest, 1e-3);
        EXPECT_NEAR(max, highest, 1e-3);
    }
}

// An end whose time the timescale of answers can't express is met all the same, and not passed.
TEST(KFBezierInterpolator, FindsAnEndBetweenTwoOfItsTicks) {
    MuseumSpline curve;
    curve.state->interpolation = 4;
    void* const a = curve->appendVertexNoTangents(s(1, 3), 0.0, kTempusZero);
    void* const b = curve->appendVertexNoTangents(s(2, 3), 1.0, kTempusZero);
    std::vector<Tempus> found;
    EXPECT_TRUE(curve->getInterpolator(4)->uForCurveValue(*curve, a, b, s(1, 3), s(2, 3), 1.0, found));
    ASSERT_EQ(found.size(), 1u);
    EXPECT_LE(found[0], s(2, 3));
    EXPECT_NEAR(TempusGetSeconds(found[0]), 2.0 / 3.0, 4e-6);
}
