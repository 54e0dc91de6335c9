// The two strategies that draw a spline as one function of all control points.

#include "lumenkey/splines/KFBSplineInterpolator.h"
#include "lumenkey/splines/KFInterpolator.h"
#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

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

struct WholeCurve : MuseumSpline {
    WholeCurve(std::uint32_t type, Controls const& controls, bool closed) {
        state->parametric = true;
        state->interpolation = type;
        for (std::size_t i = 0; i < controls.values.size(); ++i) {
            Tempus const u = TempusMake(static_cast<std::int64_t>(i), 1);
            append(u, controls.values[i], type)->setBias(controls.biases[i], kTempusZero);
        }
        spline->setClosed(closed, nullptr);
    }

    using MuseumSpline::at;
    double at(double u) const { return at(KFChronoForChannelSeconds(u, kKFChannelTimescale)); }
    /// As the strategy of a type draws it.
    double read(Tempus const& u, bool slope = false, std::uint32_t type = 10) const {
        KFInterpolator& strategy = *spline->getInterpolator(type);
        return strategy.interpolate(*spline, kTempusZero, nullptr, nullptr, u, true, slope);
    }
};

} // namespace

// The values themselves are frozen. These hold for any number of control points, and tell where a curve begins
// and ends.
TEST(WholeCurves, AreSymmetric) {
    for (std::uint32_t const type : {10u, 12u}) {
        for (std::size_t count = 1; count <= 9; ++count) {
            SCOPED_TRACE(testing::Message() << "type " << type << ", " << count << " control points");
            Controls const controls = controlsOf(count);
            Controls reversed = controls, rotated = controls;
            for (std::vector<double>* list : {&reversed.values, &reversed.biases}) {
                std::reverse(list->begin(), list->end());
            }
            for (std::vector<double>* list : {&rotated.values, &rotated.biases}) {
                std::rotate(list->begin(), list->begin() + 1, list->end());
            }
            // An open curve looks alike from both ends, and starts and ends in its end points.
            WholeCurve open(type, controls, false), back(type, reversed, false);
            double const end = TempusGetSeconds(open->getMaxValueU(kTempusZero, true));
            EXPECT_EQ(end,
                      static_cast<double>(type == 12 ? count : count + std::min<std::size_t>(count, 4) - 1));
            EXPECT_NEAR(open.at(0.0), controls.values.front(), 1e-12);
            EXPECT_NEAR(open.at(end), controls.values.back(), 1e-12);
            for (int i = 0; i <= 64 && type == 10; ++i) {
                EXPECT_NEAR(open.at(end * i / 64.0), back.at(end - end * i / 64.0), 1e-12) << i;
            }
            // A closed one looks alike from each control point, and goes on evenly past its end.
            WholeCurve closed(type, controls, true), next(type, rotated, true);
            double const start = TempusGetSeconds(closed->getMinValueU(kTempusZero, true));
            EXPECT_EQ(start, type == 12 ? 0.0 : 3.0);
            EXPECT_EQ(TempusGetSeconds(closed->getMaxValueU(kTempusZero, true)),
                      static_cast<double>(type == 12 ? count : count + 3));
            for (int i = 0; i < 64 * (static_cast<int>(count) - 1); ++i) {
                double const u = start + i / 64.0;
                EXPECT_NEAR(closed.at(u + 1.0), next.at(u), 1e-12) << u;
            }
            for (double const far : {-1e12, -3.5, end + 2.5, 1e12}) {
                EXPECT_TRUE(std::isfinite(open.at(far)) && std::isfinite(closed.at(far))) << far;
            }
        }
    }
}

TEST(WholeCurves, KnowTheirSlopes) {
    // One-sided where the other side would lie outside.
    WholeCurve curve(10, controlsOf(6), false);
    Tempus const d = TempusMake(1, 1000), u = TempusMake(5, 1);
    EXPECT_EQ(curve.read(kTempusZero, true), (curve.read(d) - curve.read(kTempusZero)) / 0.001);
    EXPECT_EQ(curve.read(u, true), (curve.read(u + d) - curve.read(u - d)) / 0.002);
}

TEST(WholeCurves, FollowEditsWhicheverStrategyNoticedThem) {
    Controls controls = controlsOf(7);
    WholeCurve curve(10, controls, false);
    Tempus const u = TempusMake(9, 2);
    // A curve made anew of the same control points is the truth. They stand where those of the edited one do.
    auto const expectLikeNew = [&](char const* after) {
        WholeCurve const fresh(10, controls, curve->isClosed());
        // The X-spline strategy clears the spline's flag; the other one must see the edit all the same.
        for (std::uint32_t const type : {12u, 10u}) {
            EXPECT_EQ(curve.read(u, false, type), fresh.read(u, false, type)) << after << ", type " << type;
        }
    };
    auto const erase = [&](std::ptrdiff_t index) {
        controls.values.erase(controls.values.begin() + index);
        controls.biases.erase(controls.biases.begin() + index);
    };
    expectLikeNew("nothing");
    curve->deleteVertex(curve.vertexAt(TempusMake(2, 1)), false, kTempusZero);
    erase(2);
    expectLikeNew("a deletion");
    curve->disableVertex(curve.vertexAt(TempusMake(1, 1)), kTempusZero);
    erase(1);
    expectLikeNew("a vertex was disabled");
    curve->setClosed(true, nullptr);
    expectLikeNew("it was closed");
    // Values and biases are read at each evaluation.
    void* const first = curve->getFirstVertex();
    curve->setVertexValue(first, 40.0, kTempusZero);
    controls.values[0] = 40.0;
    expectLikeNew("a value was set");

    // A copy has a strategy of its own, which reads the vertices of the copy.
    MuseumSpline const copy(curve);
    double const before = curve.read(u);
    curve->setVertexValue(first, -40.0, kTempusZero);
    EXPECT_EQ(copy.at(u), before);
}

TEST(KFBSplineInterpolator, IsEqualWithAllControlPointsAndTheSameLastPosition) {
    Controls controls = controlsOf(30);
    WholeCurve one(10, controls, false);
    WholeCurve other(10, controls, false);
    controls.values.front() += 1.0;
    WholeCurve apart(10, controls, false);
    auto const strategyOf = [](WholeCurve& curve) -> KFBSplineInterpolator& {
        return *static_cast<KFBSplineInterpolator*>(curve->getInterpolator(10));
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
