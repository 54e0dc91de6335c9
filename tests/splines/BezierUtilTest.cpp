// Cubics with Bezier control values, against de Casteljau's construction and bisection.

#include "lumenkey/splines/KFBezierUtil.h"
#include "lumenkey/splines/KFCubic.h"
#include "tests/splines/SlowCurve.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <random>

namespace {

using Polygon = std::array<double, 4>;

/// Control values of (t - r0) (t - r1) (t - r2).
Polygon withRoots(double r0, double r1, double r2) {
    double const c0 = -r0 * r1 * r2;
    double const c1 = r0 * r1 + r0 * r2 + r1 * r2;
    double const c2 = -(r0 + r1 + r2);
    return {c0, c0 + c1 / 3.0, c0 + 2.0 * c1 / 3.0 + c2 / 3.0, c0 + c1 + c2 + 1.0};
}

bool isMonotonic(Polygon const& p) {
    long double highest = -1e30L;
    for (int i = 0; i <= 4000; ++i) {
        long double const u = casteljau(p.data(), i / 4000.0L);
        if (u < highest - 1e-13L)
            return false;
        highest = std::max(highest, u);
    }
    return true;
}

} // namespace

TEST(KFBezierUtil, FindsAllRootsInAscendingOrder) {
    double roots[3] = {};
    for (auto const& [r0, r1, r2] :
         {std::array{0.2, 0.5, 0.9}, std::array{-3.0, 0.25, 7.0}, std::array{-2.0, -1.0, 0.5}}) {
        Polygon const p = withRoots(r0, r1, r2);
        ASSERT_EQ(KFBezierGetRoots(p.data(), 0.0, roots), 3);
        EXPECT_NEAR(roots[0], r0, 1e-13);
        EXPECT_NEAR(roots[1], r1, 1e-13);
        EXPECT_NEAR(roots[2], r2, 1e-13);
    }
    Polygon const parabola{0.0, 1.0, 1.0, 0.0}; // 3t - 3t^2
    ASSERT_EQ(KFBezierGetRoots(parabola.data(), 0.5625, roots), 2);
    EXPECT_NEAR(roots[0], 0.25, 1e-15);
    EXPECT_NEAR(roots[1], 0.75, 1e-15);
    Polygon const line{1.0, 2.0, 3.0, 4.0};
    ASSERT_EQ(KFBezierGetRoots(line.data(), 2.5, roots), 1);
    EXPECT_EQ(roots[0], 0.5);
    Polygon const flat{2.0, 2.0, 2.0, 2.0};
    EXPECT_EQ(KFBezierGetRoots(flat.data(), 2.5, roots), 0);
    // Below 1e-7 the cubic term is left out: the answer is that of the line.
    Polygon const nearlyLine{0.0, 1.0 / 3.0, 2.0 / 3.0, 1.0 + 0.9e-7};
    ASSERT_EQ(KFBezierGetRoots(nearlyLine.data(), 0.5, roots), 1);
    EXPECT_NEAR(roots[0], 0.5, 1e-15);
}

TEST(KFBezierUtil, TakesTheRootNearestToTheSegment) {
    auto const find = [](Polygon const& p) { return KFBezierFindParameter(p.data(), 0.0); };
    EXPECT_NEAR(find(withRoots(-3.0, 0.25, 7.0)), 0.25, 1e-13);
    EXPECT_NEAR(find(withRoots(-3.0, -1.0, 0.25)), 0.25, 1e-13);
    EXPECT_NEAR(find(withRoots(0.25, 1.5, 7.0)), 0.25, 1e-13);
    // Of several inside, the latest.
    EXPECT_NEAR(find(withRoots(0.2, 0.5, 0.9)), 0.9, 1e-13);
    EXPECT_NEAR(find(withRoots(0.2, 0.5, 1.1)), 0.5, 1e-13);
    // Outside only: clamped to the nearer end.
    EXPECT_EQ(find(withRoots(-0.5, 2.0, 3.0)), 0.0);
    EXPECT_EQ(find(withRoots(-0.5, 1.25, 3.0)), 1.0);
}

TEST(KFBezierUtil, WithoutARootAnswersWithinTheSegment) {
    Polygon const parabola{0.0, 1.0, 1.0, 0.5};
    double const above = KFBezierFindParameter(parabola.data(), 5.0);
    EXPECT_GE(above, 0.0);
    EXPECT_LE(above, 1.0);
    EXPECT_EQ(KFBezierFindParameter(Polygon{2.0, 2.0, 2.0, 2.0}.data(), 2.0), 0.0);
    EXPECT_EQ(KFBezierFindParameter(Polygon{0.0, NAN, 1.0, 1.0}.data(), 0.5), 0.0);
}

TEST(KFBezierUtil, InvertsRisingPolygonsAlikeByBothWays) {
    std::mt19937 random(2);
    std::uniform_real_distribution<double> unit(0.0, 1.0);
    std::uniform_real_distribution<double> exponent(-12.0, -1.0);
    KFCubicInverse inverse;
    for (int i = 0; i < 3000; ++i) {
        // Half of them nearly straight, where the leading coefficients vanish.
        double const near = std::pow(10.0, exponent(random));
        Polygon const p{0.0, i % 2 == 0 ? unit(random) : 1.0 / 3.0 + near * unit(random),
                        i % 2 == 0 ? unit(random) : 2.0 / 3.0 - near * unit(random), 1.0};
        inverse.prepare(p.data());
        for (double value : {0.0, 1e-9, 0.1, unit(random), 0.5, 1.0 - 1e-9, 1.0}) {
            double const found = KFBezierFindParameter(p.data(), value);
            ASSERT_NEAR(inverse(value), found, 1e-12) << p[1] << " " << p[2] << " " << value;
            // Near a vertical tangent a value says little of its parameter, so U is compared there.
            double const tolerance = i % 2 == 0 ? 1e-13 : 1e-7;
            ASSERT_NEAR(static_cast<double>(casteljau(p.data(), found)), value, tolerance)
                << p[1] << " " << p[2];
        }
    }
}

TEST(KFBezierSanitize, ShortensHandlesUntilTheyDontFold) {
    std::mt19937 random(3);
    std::uniform_real_distribution<double> length(0.0, 4.0);
    int folded = 0;
    for (int i = 0; i < 600; ++i) {
        double const d1 = length(random);
        double const d2 = i % 5 == 0 ? d1 : length(random);
        Polygon const before{0.0, d1, 1.0 - d2, 1.0};
        Polygon u = before;
        Polygon v{2.0, 2.0 + 5.0 * d1, -3.0 - 4.0 * d2, -3.0};
        KFBezierSanitizeControlPolygon(u.data(), v.data());
        ASSERT_TRUE(isMonotonic(u)) << d1 << " " << d2;
        ASSERT_EQ(u == before, isMonotonic(before)) << d1 << " " << d2;
        if (u == before)
            continue;
        folded += 1;
        double const shortening = d2 <= d1 ? u[1] / d1 : (1.0 - u[2]) / d2;
        ASSERT_GT(shortening, 0.0);
        ASSERT_LT(shortening, 1.0);
        // The proportion of the handles stays, and with it the direction of both.
        EXPECT_NEAR(u[1] * d2, (1.0 - u[2]) * d1, 1e-12);
        EXPECT_NEAR(v[1], 2.0 + 5.0 * u[1], 1e-11);
        EXPECT_NEAR(v[2], -3.0 - 4.0 * (1.0 - u[2]), 1e-11);
        // Just so far: handles a hundredth longer fold.
        EXPECT_FALSE(isMonotonic({0.0, u[1] * 1.01, 1.0 - (1.0 - u[2]) * 1.01, 1.0})) << d1 << " " << d2;
    }
    EXPECT_GT(folded, 150);
}

TEST(KFBezierSanitize, SurvivesHandlesThatPointAway) {
    for (double d1 : {-3.0, -0.1, 2.0, 5.0}) {
        for (double d2 : {-3.0, -0.1, 2.0, 5.0}) {
            Polygon u{0.0, d1, 1.0 - d2, 1.0};
            Polygon v{0.0, 1.0, 1.0, 0.0};
            KFBezierSanitizeControlPolygon(u.data(), v.data());
            for (double x : {u[1], u[2], v[1], v[2]})
                EXPECT_TRUE(std::isfinite(x)) << d1 << " " << d2;
        }
    }
}
