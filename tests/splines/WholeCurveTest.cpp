// The two strategies that draw a spline as one function, against their definitions over all control points.

#include "lumenkey/splines/KFBSplineInterpolator.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "lumenkey/splines/KFXSplineInterpolator.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <vector>

namespace {

struct Controls {
    std::vector<double> values;
    std::vector<double> biases;
};

/// Uneven values and biases; a bias below 0 makes an X-spline pass through the point.
Controls controlsOf(std::size_t count) {
    Controls controls;
    for (std::size_t i = 0; i < count; ++i) {
        controls.values.push_back(std::fmod(static_cast<double>(i) * 7.3 + 1.0, 5.0) - 1.7);
        controls.biases.push_back(std::fmod(static_cast<double>(i) * 0.83 + 1.0, 2.6) - 0.6);
    }
    return controls;
}

struct WholeCurve {
    KFSplineState state;
    KFSpline spline{&state};

    WholeCurve(std::uint32_t type, Controls const& controls, bool closed) {
        state.deriveTangents = false;
        state.parametric = true;
        state.interpolation = type;
        for (std::size_t i = 0; i < controls.values.size(); ++i) {
            Tempus const u = TempusMake(static_cast<std::int64_t>(i), 1);
            void* const handle = spline.appendVertexNoTangents(u, controls.values[i], kTempusZero);
            static_cast<KFVertex*>(handle)->setBias(controls.biases[i], kTempusZero);
        }
        if (closed)
            spline.setClosed(true, nullptr);
    }

    double at(double u) {
        return spline.getVertexValue(KFChronoForChannelSeconds(u, kKFChannelTimescale), kTempusZero, true);
    }
};

double weightOfBias(double bias) { return bias <= 1.0 ? 25.0 - 24.0 * bias : 1.9 - 0.9 * bias; }

/// The whole knot vector and the whole triangle of basis functions.
double bSplineByDefinition(Controls const& controls, bool closed, double u) {
    std::size_t const count = controls.values.size();
    std::vector<double> values = controls.values;
    std::vector<double> weights;
    for (double bias : controls.biases)
        weights.push_back(weightOfBias(bias));
    std::size_t const k = closed ? 4 : std::min<std::size_t>(count, 4);
    std::vector<double> knots;
    double x = u;
    if (closed) {
        for (std::vector<double>* list : {&values, &weights}) {
            std::vector<double> const once = *list;
            list->insert(list->begin(), once.back());
            list->push_back(once[0]);
            list->push_back(once[1 % count]);
        }
        for (std::size_t i = 0; i < count + 3 + k; ++i)
            knots.push_back(static_cast<double>(i));
    } else {
        knots.push_back(0.0);
        for (std::size_t i = 1; i < count + k; ++i) {
            knots.push_back(knots[i - 1] + (i < k || i + 1 >= count + 2 ? 0.0 : 1.0));
        }
        x = u / static_cast<double>(knots.size() - 1) * knots.back();
    }
    std::size_t const n = values.size();
    std::size_t const m = n + k;
    std::vector<double> entries(m, 0.0);
    for (std::size_t i = 0; i + 1 < m; ++i)
        entries[i] = x >= knots[i] && x < knots[i + 1] ? 1.0 : 0.0;
    for (std::size_t d = 2; d <= k; ++d) {
        for (std::size_t i = 0; i + d < m; ++i) {
            double a = 0.0;
            double b = 0.0;
            if (std::fabs(entries[i]) >= 1e-7)
                a = entries[i] * (x - knots[i]) / (knots[i + d - 1] - knots[i]);
            if (std::fabs(entries[i + 1]) >= 1e-7)
                b = entries[i + 1] * (knots[i + d] - x) / (knots[i + d] - knots[i + 1]);
            entries[i] = a + b;
        }
    }
    if (std::fabs(x - knots[m - 1]) < 1e-7)
        entries[n - 1] = 1.0;
    double sum = 0.0;
    for (std::size_t i = 0; i < n; ++i)
        sum += entries[i] * weights[i];
    double value = 0.0;
    for (std::size_t i = 0; i < n; ++i)
        value += std::fabs(sum) < 1e-7 ? 0.0 : values[i] * (entries[i] * weights[i] / sum);
    return value;
}

double g(double u, double q, double p) {
    return q * u + 2.0 * q * u * u + (10.0 - 12.0 * q - p) * u * u * u +
           (2.0 * p + 14.0 * q - 15.0) * std::pow(u, 4) + (6.0 - 5.0 * q - p) * std::pow(u, 5);
}

double h(double u, double q) {
    return q * u + 2.0 * q * u * u - 2.0 * q * std::pow(u, 4) - q * std::pow(u, 5);
}

/// The definition by lists: the vertices in order, and on an open spline the last one twice.
double xSplineByDefinition(Controls const& controls, bool closed, double x) {
    std::vector<double> values = controls.values;
    std::vector<double> shapes;
    for (std::size_t i = 0; i < values.size(); ++i) {
        bool const isEnd = !closed && (i == 0 || i + 1 == values.size());
        shapes.push_back(isEnd ? 1.0 : std::min(controls.biases[i], 1.0));
    }
    if (!closed) {
        values.push_back(values.back());
        shapes.push_back(1.0);
    }
    int const n = static_cast<int>(values.size());
    double const k = std::trunc(x) - 1.0;
    int const i = static_cast<int>(k);
    double s1 = 0.0;
    double s2 = 0.0;
    int points[4];
    if (closed) {
        if (i < -2)
            return 0.0;
        int const idx = i < 0 ? i + n : i;
        s1 = shapes[static_cast<std::size_t>((idx + 1) % n)];
        s2 = shapes[static_cast<std::size_t>((idx + 2) % n)];
        for (int j = 0; j < 4; ++j)
            points[j] = idx + j < 0 ? n - 1 : (idx + j) % n;
    } else {
        int const idx = std::max(i, -1);
        if (i >= 0 && idx < n - 1)
            s1 = shapes[static_cast<std::size_t>(idx + 1)];
        if (idx + 2 < n - 1)
            s2 = shapes[static_cast<std::size_t>(idx + 2)];
        for (int j = 0; j < 4; ++j)
            points[j] = std::clamp(idx + j, 0, n - 1);
    }
    double const p1 = std::max(s1, 0.0), p2 = std::max(s2, 0.0);
    double const q1 = s1 < 0.0 ? -0.5 * s1 : 0.0, q2 = s2 < 0.0 ? -0.5 * s2 : 0.0;
    double const t[4] = {k + 1.0 + p1, k + 2.0 + p2, k + 1.0 - p1, k + 2.0 - p2};
    double e[4], u[4], P[4];
    for (int j = 0; j < 4; ++j) {
        e[j] = k + j - t[j];
        u[j] = (x - t[j]) / e[j];
        P[j] = 2.0 * e[j] * e[j];
    }
    double const w[4] = {x <= t[0]  ? g(u[0], q1, P[0])
                         : q1 > 0.0 ? h(u[0], q1)
                                    : 0.0,
                         g(u[1], q2, P[1]), g(u[2], q1, P[2]),
                         x >= t[3]  ? g(u[3], q2, P[3])
                         : q2 > 0.0 ? h(u[3], q2)
                                    : 0.0};
    double above = 0.0;
    double below = 0.0;
    for (int j = 0; j < 4; ++j) {
        if (std::fabs(w[j]) >= 1e-7)
            above += w[j] * values[static_cast<std::size_t>(points[j])];
        below += w[j];
    }
    return below == 0.0 ? 0.0 : above / below;
}

} // namespace

TEST(KFBSplineInterpolator, IsTheSumOverAllControlPoints) {
    for (bool closed : {false, true}) {
        for (std::size_t count = 1; count <= 9; ++count) {
            Controls const controls = controlsOf(count);
            WholeCurve curve(10, controls, closed);
            double const end = TempusGetSeconds(curve.spline.getMaxValueU(kTempusZero, true));
            EXPECT_EQ(end,
                      static_cast<double>(closed ? count + 3 : count + std::min<std::size_t>(count, 4) - 1));
            EXPECT_EQ(TempusGetSeconds(curve.spline.getMinValueU(kTempusZero, true)), closed ? 3.0 : 0.0);
            // From before the start, through both ends, past the end and past the last knot.
            for (int i = -64; i <= static_cast<int>(end + 5.0) * 64; ++i) {
                double const u = i / 64.0;
                ASSERT_NEAR(curve.at(u), bSplineByDefinition(controls, closed, u), 1e-14)
                    << closed << count << " " << u;
            }
        }
    }
}

TEST(KFBSplineInterpolator, PassesThroughTheEndsOfAnOpenSpline) {
    Controls const controls = controlsOf(6);
    WholeCurve curve(10, controls, false);
    EXPECT_EQ(curve.at(0.0), controls.values.front());
    EXPECT_EQ(curve.at(9.0), controls.values.back());
    // Weight 1 everywhere: values within the hull, and a constant is reproduced.
    WholeCurve constant(10, {{4.0, 4.0, 4.0, 4.0, 4.0}, {1.0, 1.0, 1.0, 1.0, 1.0}}, false);
    EXPECT_NEAR(constant.at(3.3), 4.0, 1e-15);
    for (double bias : {0.0, 0.5, 1.0, 2.0}) {
        EXPECT_NEAR(KFBSplineInterpolator::convertBSplineBiasToLinear(weightOfBias(bias)), bias, 1e-15);
    }
    // The slope is one-sided where the other side would lie outside.
    Tempus const d = TempusMake(1, 1000);
    auto* const strategy = curve.spline.getInterpolator(10);
    auto const read = [&](Tempus const& u, bool slope) {
        return strategy->interpolate(curve.spline, kTempusZero, nullptr, nullptr, u, true, slope);
    };
    EXPECT_EQ(read(kTempusZero, true), (read(d, false) - read(kTempusZero, false)) / 0.001);
    EXPECT_EQ(read(TempusMake(5, 1), true),
              (read(TempusMake(5, 1) + d, false) - read(TempusMake(5, 1) - d, false)) / 0.002);
    EXPECT_EQ(strategy->interpolate(curve.spline, kTempusZero, nullptr, nullptr, d, false, false), 0.0);
}

TEST(KFXSplineInterpolator, IsTheBlendOfFourControlPoints) {
    for (bool closed : {false, true}) {
        for (std::size_t count = 1; count <= 9; ++count) {
            Controls const controls = controlsOf(count);
            WholeCurve curve(12, controls, closed);
            double const end = TempusGetSeconds(curve.spline.getMaxValueU(kTempusZero, true));
            EXPECT_EQ(end, static_cast<double>(count));
            for (int i = -200; i <= static_cast<int>(end + 3.0) * 64; ++i) {
                double const truth = xSplineByDefinition(controls, closed, i / 64.0);
                // Outside weights can all but vanish, and their quotient is then anything.
                double const tolerance = std::max(1e-12, 1e-12 * std::fabs(truth));
                if (i < 0 || i > static_cast<int>(end) * 64) {
                    ASSERT_TRUE(std::isfinite(curve.at(i / 64.0))) << closed << count << " " << i;
                } else {
                    ASSERT_NEAR(curve.at(i / 64.0), truth, tolerance) << closed << count << " " << i;
                }
            }
            for (double far : {-1e12, 1e12})
                EXPECT_TRUE(std::isfinite(curve.at(far))) << closed << count;
        }
    }
}

TEST(WholeCurves, FollowEditsWhicheverStrategyNoticedThem) {
    Controls const controls = controlsOf(7);
    WholeCurve curve(10, controls, false);
    auto const read = [](WholeCurve& from, std::uint32_t type, double u) {
        Tempus const at = KFChronoForChannelSeconds(u, kKFChannelTimescale);
        return from.spline.getInterpolator(type)->interpolate(from.spline, kTempusZero, nullptr, nullptr, at,
                                                              true, false);
    };
    curve.at(2.0);
    read(curve, 12, 2.0);

    void* third = nullptr;
    ASSERT_TRUE(curve.spline.getVertexHandle(TempusMake(2, 1), &third, true));
    curve.spline.deleteVertex(third, false, kTempusZero);
    Controls fewer = controls;
    fewer.values.erase(fewer.values.begin() + 2);
    fewer.biases.erase(fewer.biases.begin() + 2);
    // The X-spline strategy clears the spline's flag; the other one must see the deletion all the same.
    EXPECT_NEAR(read(curve, 12, 2.5), xSplineByDefinition(fewer, false, 2.5), 1e-12);
    WholeCurve fresh(10, fewer, false);
    EXPECT_EQ(read(curve, 10, 2.5), read(fresh, 10, 2.5));

    void* second = nullptr;
    ASSERT_TRUE(curve.spline.getVertexHandle(TempusMake(1, 1), &second, true));
    curve.spline.disableVertex(second, kTempusZero);
    fewer.values.erase(fewer.values.begin() + 1);
    fewer.biases.erase(fewer.biases.begin() + 1);
    EXPECT_NEAR(curve.at(2.5), bSplineByDefinition(fewer, false, 2.5), 1e-14);
    curve.spline.setClosed(true, nullptr);
    EXPECT_NEAR(curve.at(4.5), bSplineByDefinition(fewer, true, 4.5), 1e-14);

    // Values and biases are read at each evaluation.
    void* first = nullptr;
    ASSERT_TRUE(curve.spline.getFirstValidVertexWithLock(&first, kTempusZero));
    curve.spline.setVertexValue(first, 40.0, kTempusZero);
    fewer.values[0] = 40.0;
    EXPECT_NEAR(curve.at(4.5), bSplineByDefinition(fewer, true, 4.5), 1e-14);

    // A copy has a strategy of its own, which reads the vertices of the copy.
    KFSplineState state(curve.state);
    KFSpline copy(curve.spline, &state);
    curve.spline.setVertexValue(first, -40.0, kTempusZero);
    EXPECT_NEAR(copy.getVertexValue(TempusMake(9, 2), kTempusZero, true),
                bSplineByDefinition(fewer, true, 4.5), 1e-14);
}

// The type that all vertices share is kept between reads; it may be written past the spline.
TEST(WholeCurves, FollowTypesThatAreSetOnAVertexItself) {
    Controls const controls = controlsOf(9);
    WholeCurve curve(10, controls, false);
    auto const typeOfAll = [&curve] {
        std::uint32_t type = 0;
        curve.spline.getInterpolation(&type, nullptr, nullptr);
        return type;
    };
    EXPECT_NEAR(curve.at(3.5), bSplineByDefinition(controls, false, 3.5), 1e-14);
    auto* const last = static_cast<KFVertex*>(curve.spline.getLastVertex());
    for (int round = 0; round < 2; ++round) {
        last->setInterpolation(1);
        EXPECT_EQ(typeOfAll(), kKFInterpolationMixed);
        last->setInterpolation(10);
        EXPECT_EQ(typeOfAll(), kKFInterpolationBSpline);
    }
    for (void* handle = curve.spline.getFirstVertex(); handle != nullptr;
         handle = curve.spline.getNextVertex(handle)) {
        static_cast<KFVertex*>(handle)->setInterpolation(12);
        EXPECT_EQ(typeOfAll(), handle == last ? kKFInterpolationXSpline : kKFInterpolationMixed);
    }
    EXPECT_NEAR(curve.at(3.5), xSplineByDefinition(controls, false, 3.5), 1e-12);
    *static_cast<KFStaticVertex*>(curve.spline.getFirstVertex()) = KFStaticVertex(kTempusZero, 1.0);
    EXPECT_EQ(typeOfAll(), kKFInterpolationMixed);
}

TEST(KFBSplineInterpolator, IsEqualWithAllControlPointsAndTheSameLastPosition) {
    Controls controls = controlsOf(30);
    WholeCurve one(10, controls, false);
    WholeCurve other(10, controls, false);
    controls.values.front() += 1.0;
    WholeCurve apart(10, controls, false);
    auto const strategyOf = [](WholeCurve& curve) -> KFBSplineInterpolator& {
        return *static_cast<KFBSplineInterpolator*>(curve.spline.getInterpolator(10));
    };
    for (double const u : {5.5, 25.5}) {
        one.at(u);
        EXPECT_FALSE(strategyOf(one) == strategyOf(other));
        other.at(u);
        EXPECT_TRUE(strategyOf(one) == strategyOf(other));
        apart.at(u);
        EXPECT_FALSE(strategyOf(one) == strategyOf(apart)) << "a control point far from the position differs";
    }
}

TEST(WholeCurves, PutASubdividingVertexOnTheChord) {
    WholeCurve curve(12, {{2.0, 8.0}, {1.0, 1.0}}, false);
    void* a = curve.spline.getFirstVertex();
    void* b = curve.spline.getLastVertex();
    KFStaticVertex added(TempusMake(1, 4), 0.0);
    for (std::uint32_t type : {10u, 12u}) {
        added.setValueV(0.0, kTempusZero);
        curve.spline.getInterpolator(type)->subDivide(curve.spline, kTempusZero, a, b, &added);
        EXPECT_EQ(added.getValueV(kTempusZero), 3.5);
    }
}
