// The strategies that draw Bezier curves in the plane of time and value.

#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineInterpolator.h"
#include "lumenkey/splines/KFStaticVertex.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

namespace {

struct Key {
    Tempus u;
    double v;
    double inU = 0.0, inV = 0.0, outU = 0.0, outV = 0.0;
};

struct Curve {
    KFSplineState state;
    KFSpline spline{&state};
    std::vector<KFVertex*> keys;

    Curve(std::uint32_t type, std::vector<Key> const& from, bool closed = false) {
        state.deriveTangents = false;
        state.interpolation = type;
        for (Key const& key : from) {
            keys.push_back(static_cast<KFVertex*>(spline.appendVertexNoTangents(key.u, key.v, kTempusZero)));
            keys.back()->setInputTangents(key.inU, key.inV, kTempusZero);
            keys.back()->setOutputTangents(key.outU, key.outV, kTempusZero);
        }
        if (closed)
            spline.setClosed(true, nullptr);
    }

    KFBezierInterpolator& strategy() {
        return dynamic_cast<KFBezierInterpolator&>(*spline.getInterpolator(keys[0]->getInterpolation()));
    }

    double at(Tempus const& u) { return spline.getVertexValue(u, kTempusZero, true); }
};

struct Polygons {
    Tempus start, end;
    double u[4], v[4];

    Polygons(Curve& curve, std::size_t from, std::size_t to) {
        curve.strategy().getControlPoints(curve.spline, curve.keys[from], curve.keys[to], kTempusZero, start,
                                          end, u, v);
    }
};

Tempus seconds(int numerator, int denominator = 1) { return TempusMake(numerator, denominator); }

long double casteljau(double const* p, long double t) {
    long double const s = 1.0L - t;
    return s * s * s * p[0] + 3.0L * s * s * t * p[1] + 3.0L * s * t * t * p[2] + t * t * t * p[3];
}

/// The value where the curve of two rising polygons passes a fraction of the segment, by bisection.
double valueByBisection(double const* u, double const* v, long double fraction) {
    long double low = 0.0L;
    long double high = 1.0L;
    for (int i = 0; i < 80; ++i) {
        long double const middle = (low + high) / 2.0L;
        (casteljau(u, middle) < fraction ? low : high) = middle;
    }
    return static_cast<double>(casteljau(v, low));
}

Curve overshooting() {
    return Curve(4, {{seconds(1), 2.0, 0.0, 0.0, 0.1, 0.6}, {seconds(4), 3.0, -0.05, 0.5, 0.0, 0.0}});
}

} // namespace

TEST(KFBezierInterpolator, DrawsFromHandlesOfTwelveTangents) {
    Curve curve(4, {{seconds(1), 2.0, 0.0, 0.0, 0.1, 0.6}, {seconds(4), 3.0, -0.05, 0.5, 0.0, 0.0}});
    double const u[4] = {0.0, 0.4, 0.8, 1.0};
    double const v[4] = {2.0, 9.2, 9.0, 3.0};
    Polygons const polygons(curve, 0, 1);
    for (int i = 0; i < 4; ++i) {
        EXPECT_NEAR(polygons.u[i], u[i], 1e-15);
        EXPECT_NEAR(polygons.v[i], v[i], 1e-14);
    }
    for (int i = 1; i < 30; ++i) {
        EXPECT_NEAR(curve.at(seconds(10 + i, 10)), valueByBisection(u, v, i / 30.0L), 1e-12) << i;
        EXPECT_EQ(curve.at(seconds(10 + i, 10)),
                  curve.strategy().interpolate(curve.spline, kTempusZero, curve.keys[0], curve.keys[1],
                                               seconds(10 + i, 10), false, false));
    }

    // Without tangents it eases; with a thirty-sixth of the segment it is straight.
    Curve flat(4, {{seconds(0), 0.0}, {seconds(1), 1.0}});
    EXPECT_NEAR(flat.at(seconds(1, 2)), 0.5, 1e-15);
    double const rest[4] = {0.0, 0.0, 1.0, 1.0};
    EXPECT_NEAR(flat.at(seconds(1, 4)), valueByBisection(rest, rest, 0.25L), 1e-12);
    Curve straight(4, {{seconds(0), 0.0, 0.0, 0.0, 1.0 / 36.0, 1.0 / 36.0},
                       {seconds(1), 1.0, -1.0 / 36.0, -1.0 / 36.0}});
    EXPECT_NEAR(straight.at(seconds(3, 10)), 0.3, 1e-14);
}

TEST(KFBezierInterpolator, TakesUAsTheParameterOfAParametricSpline) {
    Curve curve(4, {{seconds(0), 0.0, 0.0, 0.0, 0.9, 3.0}, {seconds(2), 6.0, -0.1, -1.0, 0.0, 0.0}});
    curve.state.parametric = true;
    double const v[4] = {0.0, 3.0, 5.0, 6.0}; // tangents as they stand
    EXPECT_NEAR(curve.at(seconds(1, 2)), static_cast<double>(casteljau(v, 0.25L)), 1e-14);
    double handle = 3.0;
    curve.strategy().convertTangentsToHandles(curve.spline, nullptr, &handle);
    EXPECT_NEAR(handle, 1.0, 1e-15);
    curve.state.parametric = false;
    curve.strategy().convertHandlesToTangents(curve.spline, &handle, nullptr);
    EXPECT_NEAR(handle, 1.0 / 12.0, 1e-15);
}

TEST(KFBezierInterpolator, IsKeptFromFoldingBackOnlyWhenAsked) {
    std::vector<Key> const folding{{seconds(0), 0.0, 0.0, 0.0, 0.2, 0.1}, {seconds(1), 1.0, -0.2, 0.1}};
    auto const turnsBack = [&](bool sanitize, bool parametric) {
        Curve curve(4, folding);
        curve.state.sanitizeBezier = sanitize;
        curve.state.parametric = parametric;
        Polygons const polygons(curve, 0, 1);
        for (int i = 1; i <= 100; ++i) {
            if (casteljau(polygons.u, i / 100.0L) < casteljau(polygons.u, (i - 1) / 100.0L) - 1e-14L)
                return true;
        }
        return false;
    };
    EXPECT_TRUE(turnsBack(false, false));
    EXPECT_FALSE(turnsBack(true, false));
    Curve parametric(4, folding);
    parametric.state.parametric = true;
    EXPECT_EQ(Polygons(parametric, 0, 1).u[1], 0.2);
}

TEST(KFBezierInterpolator, KnowsItsSlopeByDifferences) {
    Curve curve = overshooting();
    auto const slope = [&](Tempus const& u) { return curve.spline.getDerivativeValue(u, kTempusZero, true); };
    Tempus const d = seconds(1, 1000);
    EXPECT_EQ(slope(seconds(2)), (curve.at(seconds(2) + d) - curve.at(seconds(2) - d)) / 0.002);
    EXPECT_EQ(slope(seconds(1)), (curve.at(seconds(1) + d) - 2.0) / 0.001);
    EXPECT_EQ(slope(seconds(4)), (3.0 - curve.at(seconds(4) - d)) / 0.001);
    EXPECT_NEAR(slope(seconds(1)), 6.0, 0.02); // the direction of the handle
}

TEST(KFBezierInterpolator, SplitsACurveAndKeepsItsShape) {
    Curve curve = overshooting();
    KFVertex& a = *curve.keys[0];
    KFVertex& b = *curve.keys[1];
    a.setFlag(kKFVertexFlagLocked);
    KFBezierInterpolator& bezier = curve.strategy();
    auto const read = [&](KFVertex& from, KFVertex& to, double parameter) {
        return bezier.eval(curve.spline, kTempusZero, &from, &to, parameter);
    };
    double const s = 0.3;
    KFStaticVertex middle(seconds(19, 10), 0.0);
    std::vector<double> before;
    for (int i = 0; i <= 20; ++i)
        before.push_back(read(a, b, i / 20.0));
    bezier.subDivide(curve.spline, kTempusZero, &a, &b, &middle);
    for (int i = 0; i <= 20; ++i) {
        double const parameter = i / 20.0;
        double const after =
            parameter <= s ? read(a, middle, parameter / s) : read(middle, b, (parameter - s) / (1.0 - s));
        EXPECT_NEAR(after, before[static_cast<std::size_t>(i)], 1e-13) << i;
    }
    EXPECT_TRUE(a.testFlag(kKFVertexFlagLocked)) << "a locked vertex is written and stays locked";
    EXPECT_FALSE(b.testFlag(kKFVertexFlagLocked));
}

TEST(KFBezierInterpolator, GivesTheExtremesBetweenTwoPositions) {
    Curve curve = overshooting();
    auto const check = [&](Tempus const& low, Tempus const& high) {
        double lowest = 1e30;
        double highest = -1e30;
        for (int i = 0; i <= 3000; ++i) {
            Tempus const u = low + (high - low) * seconds(i, 3000);
            double const value = curve.at(u < seconds(1) ? seconds(1) : u > seconds(4) ? seconds(4) : u);
            lowest = std::min(lowest, value);
            highest = std::max(highest, value);
        }
        double min = 0.0;
        double max = 0.0;
        curve.strategy().getMinMaxValues(curve.spline, curve.keys[0], curve.keys[1], low, high, &min, &max);
        EXPECT_NEAR(min, lowest, 1e-5);
        EXPECT_NEAR(max, highest, 1e-5);
    };
    check(seconds(1), seconds(4)); // over the top
    check(seconds(-9), seconds(99));
    check(seconds(1), seconds(2)); // rising only
    check(seconds(7, 2), seconds(4));
}

TEST(KFBezierInterpolator, FindsEveryPositionOfAValue) {
    Curve curve = overshooting();
    auto const find = [&](double value, Tempus const& low, Tempus const& high) {
        std::vector<Tempus> out;
        bool const found = curve.strategy().uForCurveValue(curve.spline, curve.keys[0], curve.keys[1], low,
                                                           high, value, out);
        EXPECT_EQ(found, !out.empty());
        return out;
    };
    // Beyond both ends: the way up and the way down. Positions are rounded to the timescale of channels.
    std::vector<Tempus> const both = find(6.0, seconds(1), seconds(4));
    ASSERT_EQ(both.size(), 2u);
    for (Tempus const& u : both)
        EXPECT_NEAR(curve.at(u), 6.0, 1e-4);
    EXPECT_LT(both[0], both[1]);
    EXPECT_EQ(find(6.0, both[1], seconds(4)), std::vector<Tempus>{both[1]});
    EXPECT_TRUE(find(100.0, seconds(1), seconds(4)).empty());

    // An end whose time the timescale can't express is met all the same, and not passed.
    Curve thirds(4,
                 {{seconds(1, 3), 0.0, 0.0, 0.0, 0.01, 0.01}, {seconds(2, 3), 1.0, -0.01, -0.01, 0.0, 0.0}});
    std::vector<Tempus> out;
    KFBezierInterpolator& bezier = thirds.strategy();
    EXPECT_TRUE(bezier.uForCurveValue(thirds.spline, thirds.keys[0], thirds.keys[1], seconds(1, 3),
                                      seconds(2, 3), 1.0, out));
    EXPECT_EQ(out.size(), 1u);
    EXPECT_LE(out.at(0), seconds(2, 3));
    EXPECT_NEAR(TempusGetSeconds(out.at(0)), 2.0 / 3.0, 4e-6);
}

TEST(KFCatmullRom, PassesThroughEvenlySpacedKeysAsItsFormula) {
    double const p[5] = {1.0, 4.0, -2.0, 0.5, 3.0};
    Curve curve(
        6,
        {{seconds(0), p[0]}, {seconds(2), p[1]}, {seconds(4), p[2]}, {seconds(6), p[3]}, {seconds(8), p[4]}});
    for (int segment = 1; segment < 3; ++segment) {
        double const* const q = p + segment - 1;
        for (int i = 0; i <= 16; ++i) {
            double const t = i / 16.0;
            double const truth = 0.5 * (2.0 * q[1] + (q[2] - q[0]) * t +
                                        (2.0 * q[0] - 5.0 * q[1] + 4.0 * q[2] - q[3]) * t * t +
                                        (3.0 * q[1] - q[0] - 3.0 * q[2] + q[3]) * t * t * t);
            EXPECT_NEAR(curve.at(seconds(2 * segment) + seconds(i, 8)), truth, 1e-13) << segment << " " << i;
        }
    }
    EXPECT_FALSE(curve.strategy().useTangents());
    double handle = 5.0;
    curve.strategy().convertTangentsToHandles(curve.spline, &handle, &handle);
    EXPECT_EQ(handle, 5.0);
}

TEST(KFCatmullRom, EndsFlatWhereThereIsNoNeighbour) {
    Curve lone(6, {{seconds(1), 2.0}, {seconds(4), 8.0}});
    Polygons const polygons(lone, 0, 1);
    double const u[4] = {0.0, 1.0 / 3.0, 2.0 / 3.0, 1.0};
    double const v[4] = {2.0, 2.0, 8.0, 8.0};
    for (int i = 0; i < 4; ++i) {
        EXPECT_NEAR(polygons.u[i], u[i], 1e-15);
        EXPECT_EQ(polygons.v[i], v[i]);
    }
    EXPECT_NEAR(lone.at(seconds(7, 4)), static_cast<double>(casteljau(v, 0.25L)), 1e-13);
}

TEST(KFCatmullRom, TakesTheNeighboursOfAClosedSplineFromItsOtherEnd) {
    Curve closed(6, {{seconds(0), 1.0}, {seconds(1), 4.0}, {seconds(2), -2.0}}, true);
    double outU = 0.0, outV = 0.0, inU = 0.0, inV = 0.0;
    closed.strategy().computeTangents(closed.spline, closed.keys[0], closed.keys[1], kTempusZero, &outU,
                                      &outV, &inU, &inV);
    EXPECT_NEAR(outU, 0.5 * 1.01, 1e-15); // the last key stands the small delta before the first
    EXPECT_EQ(outV, 0.5 * (4.0 - -2.0));
    EXPECT_EQ(inU, 0.5 * -2.0);
    EXPECT_EQ(inV, 0.5 * (1.0 - -2.0));
    closed.strategy().computeTangents(closed.spline, closed.keys[1], closed.keys[2], kTempusZero, &outU,
                                      &outV, &inU, &inV);
    EXPECT_EQ(outU, 0.5 * 2.0);
    EXPECT_NEAR(inU, 0.5 * -1.01, 1e-15);
    EXPECT_EQ(inV, 0.5 * (4.0 - 1.0));
}
