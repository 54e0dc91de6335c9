// What Bezier segments do besides drawing: they are split, and asked for their values.

#include "lumenkey/splines/KFBezierUtil.h"
#include "lumenkey/splines/KFSplineInterpolator.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "tests/splines/museum.h"

#include <gtest/gtest.h>

namespace {

Tempus s(int value, int timescale = 1) { return TempusMake(value, timescale); }

/// From 2 at 1 s over values above 6 to 3 at 4 s.
struct Overshoot : MuseumSpline {
    KFVertex* a = append(s(1), 2.0, 4);
    KFVertex* b = append(s(4), 3.0, 4);
    KFBezierInterpolator& strategy = dynamic_cast<KFBezierInterpolator&>(*spline->getInterpolator(4));

    Overshoot() {
        setSides(*a, {0.0, 0.6, 0.1, 0.6});
        setSides(*b, {-0.05, 0.5, 0.0, 0.5});
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

// No type stands for these two; hosts derive from them.
TEST(KFHermiteInterpolator, TakesAThirdOfADerivativeAsHandle) {
    Overshoot curve;
    double const at = 0.375;
    for (bool const parametric : {false, true}) {
        curve.state->parametric = parametric;
        double const part = (parametric ? 1.0 : 12.0) / 3.0;
        double const v[4] = {2.0, 2.0 + part * 0.6, 3.0 + part * 0.5, 3.0};
        KFHermiteInterpolator hermite;
        EXPECT_TRUE(hermite.useTangents());
        EXPECT_NEAR(hermite.eval(*curve, kTempusZero, curve.a, curve.b, at), KFBezierEval(v, at), 1e-14);
    }
}

TEST(KFCardinalInterpolator, TakesItsTangentsFromTheNeighboursLessTheTension) {
    Overshoot curve;
    auto* const before = curve->addVertexNoTangents(s(-1), 7.0, kTempusZero, false);
    auto* const after = curve->addVertexNoTangents(s(8), -4.0, kTempusZero, false);
    KFCardinalInterpolator cardinal(0.5);
    double const k = 0.25;
    struct {
        void *from, *to;
        double tangents[4];
    } const cases[] = {
        {curve.a, curve.b, {k * 5.0, k * (3.0 - 7.0), k * -7.0, k * (2.0 - -4.0)}},
        {before, curve.a, {k * 4.0, 0.0, k * -5.0, k * (7.0 - 3.0)}},
        {curve.b, after, {k * 7.0, k * (-4.0 - 2.0), k * -8.0, 0.0}},
    };
    for (auto const& each : cases) {
        double tangents[4] = {};
        cardinal.computeTangents(*curve, each.from, each.to, kTempusZero, &tangents[0], &tangents[1],
                                 &tangents[2], &tangents[3]);
        for (int i = 0; i < 4; ++i)
            EXPECT_NEAR(tangents[i], each.tangents[i], 1e-14) << &each - cases << " " << i;
    }
    Tempus from, to;
    double u[4];
    double v[4];
    cardinal.getControlPoints(*curve, curve.a, curve.b, kTempusZero, from, to, u, v);
    EXPECT_NEAR(u[1], k * 5.0 / 9.0, 1e-14);
    EXPECT_NEAR(v[1], 2.0 - 1.0 / 3.0, 1e-14);
    EXPECT_NEAR(v[2], 3.0 + 0.5, 1e-14);
    EXPECT_FALSE(cardinal.useTangents());
    double handle = 2.0;
    cardinal.convertTangentsToHandles(*curve, &handle, nullptr);
    cardinal.convertHandlesToTangents(*curve, nullptr, &handle);
    EXPECT_EQ(handle, 2.0) << "such handles follow from the neighbours";
}

// An end whose time the timescale of answers can't express is met all the same, and not passed.
TEST(KFBezierInterpolator, FindsAnEndBetweenTwoOfItsTicks) {
    MuseumSpline curve;
    KFVertex* const a = curve.append(s(1, 3), 0.0, 4);
    KFVertex* const b = curve.append(s(2, 3), 1.0, 4);
    std::vector<Tempus> found;
    EXPECT_TRUE(curve->getInterpolator(4)->uForCurveValue(*curve, a, b, s(1, 3), s(2, 3), 1.0, found));
    ASSERT_EQ(found.size(), 1u);
    EXPECT_LE(found[0], s(2, 3));
    EXPECT_NEAR(TempusGetSeconds(found[0]), 2.0 / 3.0, 4e-6);
}
