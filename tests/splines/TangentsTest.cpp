#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <vector>

namespace {

using Pair = std::array<double, 2>;

void expectSides(KFVertex const* vertex, Sides const& expected) {
    for (std::size_t i = 0; i < 4; ++i) {
        EXPECT_NEAR(expected[i], sidesOf(*vertex)[i], 1e-12) << i;
    }
}

class KFSplineTangents : public testing::Test {
protected:
    KFVertex* add(Tempus const& u, double value) {
        return static_cast<KFVertex*>(spline.addVertex(u, value, kTempusZero, false));
    }
    KFVertex* add(int seconds, double value) { return add(TempusMake(seconds, 1), value); }
    double valueAt(Tempus const& u) { return spline.getVertexValue(u, kTempusZero, false); }

    KFSplineState state;
    KFSpline spline{&state};
};

// --- What an insertion leaves of the curve ---

class KFSplineInsertion : public KFSplineTangents {
protected:
    static constexpr int kCount = 5;
    static constexpr int kThirds[kCount] = {0, 4, 6, 11, 15};
    static constexpr double kValues[kCount] = {1.0, 4.0, -2.0, 3.0, 3.5};
    static constexpr double kSlopes[kCount] = {2.0, -3.0, 0.5, 4.0, -1.0};

    static double distance(int i) { return (kThirds[i + 1] - kThirds[i]) / 3.0; }

    /// Handles as long as `reach` of the segment, with the slopes above on both sides of each vertex.
    void makeCurve(std::uint32_t type, double reach) {
        spline.deleteAllVertices();
        for (int i = 0; i < kCount; ++i) {
            auto* const vertex = static_cast<KFVertex*>(
                spline.appendVertexNoTangents(TempusMake(kThirds[i], 3), kValues[i], kTempusZero));
            double const in = i > 0 ? distance(i - 1) * reach / 12.0 : 0.0;
            double const out = i + 1 < kCount ? distance(i) * reach / 12.0 : 0.0;
            vertex->setInterpolation(type);
            setSides(*vertex, {-in, -in * kSlopes[i], out, out * kSlopes[i]});
        }
    }

    /// The curve every 1/120 s.
    std::vector<double> sample() {
        std::vector<double> values;
        for (int i = -60; i <= 660; ++i) {
            values.push_back(valueAt(TempusMake(i, 120)));
        }
        return values;
    }

    /// Puts a vertex onto the curve, at each of 196 places in turn. The largest deviation of the curve, and
    /// of that part of it that is more than `neighbours` segments away from the one that was divided.
    Pair deviation(std::uint32_t type, double reach, int neighbours) {
        Pair largest{};
        for (int i = 1; i < 200; ++i) {
            Tempus const u = TempusMake(i, 40);
            int const thirdAt = 3 * i / 40;
            if (3 * i % 40 == 0 && std::find(kThirds, kThirds + kCount, thirdAt) != kThirds + kCount) {
                continue;
            }
            makeCurve(type, reach);
            double const value = valueAt(u);
            auto const before = sample();
            add(u, value);
            EXPECT_EQ(valueAt(u), value) << i;
            auto const after = sample();
            auto const segment = std::upper_bound(kThirds, kThirds + kCount, thirdAt) - kThirds - 1;
            int const low = kThirds[std::max<long>(segment - neighbours, 0)] * 40;
            int const high = kThirds[std::min<long>(segment + 1 + neighbours, kCount - 1)] * 40;
            for (std::size_t k = 0; k < before.size(); ++k) {
                double const difference = std::fabs(before[k] - after[k]);
                int const place = static_cast<int>(k) - 60;
                largest[0] = std::max(largest[0], difference);
                largest[1] = std::max(largest[1], place < low || place > high ? difference : 0.0);
            }
        }
        return largest;
    }
};

// Handles of a third make U a linear function of the parameter. Shortening the neighbours' handles and giving the new
// vertex the curve's slope with handles of a third is then the subdivision of de Casteljau, but for the slope, which is
// a difference over `roundingDelta`. A line stays but for the roundings of its two terms. Where the curve itself must
// give way, the value at the new vertex (see `deviation`) and all but the segments that hang on it stay as they were.
// Measured on values from -2 to 4: 0.107, 1.11e-6, 1.10 and 1.92.
TEST_F(KFSplineInsertion, KeepsTheCurve) {
    EXPECT_LE(deviation(kKFInterpolationLinear, 1.0 / 3.0, 0)[0], 4e-15);
    for (bool const inUSpace : {true, false}) {
        state.setRoundingInUSpace(inUSpace);
        Pair const seen = deviation(kKFInterpolationBezier, 1.0 / 3.0, 0);
        EXPECT_LE(seen[0], inUSpace ? 0.11 : 1.2e-6);
        EXPECT_EQ(seen[1], 0.0);
    }
    state.setRoundingInUSpace(true);
    Pair const bezier = deviation(kKFInterpolationBezier, 0.6, 0);
    EXPECT_LT(bezier[0], 1.15);
    EXPECT_EQ(bezier[1], 0.0);
    Pair const catmullRom = deviation(kKFInterpolationCatmullRom, 0.6, 1);
    EXPECT_LT(catmullRom[0], 2.0);
    EXPECT_EQ(catmullRom[1], 0.0);
}

// --- Derivation ---

TEST_F(KFSplineTangents, ReadsDirectionsWithoutTouchingTheCurve) {
    KFVertex* const ends[] = {add(0, 0.0), add(4, 3.0)};
    Sides const before[] = {sidesOf(*ends[0]), sidesOf(*ends[1])};
    Tempus const u = TempusMake(1, 1);
    double x[4] = {}, y[4] = {};
    EXPECT_TRUE(spline.getPointInputTangents(u, &x[0], &y[0], kTempusZero));
    EXPECT_TRUE(spline.getPointOutputTangents(u, &x[1], nullptr, kTempusZero));
    EXPECT_TRUE(spline.getPointOutputTangents(u, nullptr, &y[1], kTempusZero));
    spline.getNormals(u, &x[2], &y[2], kTempusZero);
    spline.derivePoint(u, nullptr, nullptr, &x[3], nullptr, kTempusZero, true);
    double const expectedX[] = {-0.8, 0.8, -0.6, 3.0 / 36.0}, expectedY[] = {-0.6, 0.6, 0.8, 0.0};
    for (int i = 0; i < 4; ++i) {
        EXPECT_NEAR(expectedX[i], x[i], 1e-12) << i;
        EXPECT_NEAR(expectedY[i], y[i], 1e-12) << i;
        EXPECT_EQ(before[i / 2], sidesOf(*ends[i / 2]));
    }

    // Without derivation nothing is written, and no tangent follows.
    state.deriveTangents = false;
    double untouched = 42.0;
    spline.derivePoint(TempusMake(1, 1), &untouched, &untouched, &untouched, &untouched, kTempusZero, false);
    EXPECT_FALSE(spline.getPointInputTangents(TempusMake(1, 1), &untouched, &untouched, kTempusZero));
    EXPECT_FALSE(spline.getPointOutputTangents(TempusMake(1, 1), &untouched, &untouched, kTempusZero));
    EXPECT_EQ(untouched, 42.0);
}

// --- Handles ---

TEST_F(KFSplineTangents, HandlesAreConvertedByTheirType) {
    for (auto const& [type, parametric, factor] : {std::tuple{kKFInterpolationBezier, false, 1.0 / 12.0},
                                                   {kKFInterpolationBezier, true, 3.0},
                                                   {kKFInterpolationCatmullRom, false, 1.0},
                                                   {kKFInterpolationCatmullRom, true, 1.0}}) {
        SCOPED_TRACE(testing::Message() << "type " << type << (parametric ? ", parametric" : ""));
        state.parametric = parametric;
        spline.deleteAllVertices();
        KFVertex* const vertex = add(0, 0.0);
        vertex->setInterpolation(type);
        vertex->setFlag(kKFVertexFlagCrossedNeighbour);
        EXPECT_TRUE(spline.setVertexInputHandles(vertex, -1.5, 6.0, kTempusZero, true));
        EXPECT_EQ(vertex->getFlags(), kKFVertexFlagHandlesEdited);
        vertex->setFlags(kKFVertexFlagCrossedNeighbour);
        EXPECT_TRUE(spline.setVertexOutputHandles(vertex, 2.0, -4.0, kTempusZero, true));
        EXPECT_EQ(vertex->getFlags(), kKFVertexFlagHandlesEdited);
        expectSides(vertex, {-1.5 * factor, 6.0 * factor, 2.0 * factor, -4.0 * factor});
        double u = 0.0, v = 0.0;
        EXPECT_TRUE(spline.getVertexInputHandles(vertex, &u, nullptr, kTempusZero, true));
        EXPECT_TRUE(spline.getVertexInputHandles(vertex, nullptr, &v, kTempusZero, true));
        EXPECT_NEAR(-1.5, u, 1e-12);
        EXPECT_NEAR(6.0, v, 1e-12);
        EXPECT_TRUE(spline.getVertexOutputHandles(vertex, &u, &v, kTempusZero, false));
        expectSides(vertex, {-1.5 * factor, 6.0 * factor, u, v});
    }
}

TEST_F(KFSplineTangents, SmoothAndFlatVertices) {
    add(0, 0.0);
    KFVertex* const middle = add(1, 1.0);
    add(2, 2.0);
    EXPECT_TRUE(spline.setVertexSmooth(middle, false, kTempusZero));
    EXPECT_EQ(middle->getInterpolation(), kKFInterpolationLinear);
    EXPECT_TRUE(middle->isFlat());
    EXPECT_TRUE(spline.setVertexSmooth(middle, true, kTempusZero));
    EXPECT_EQ(middle->getInterpolation(), kKFInterpolationBezier);
    EXPECT_NEAR(sidesOf(*middle)[2], 1.0 / 36.0, 1e-12);

    EXPECT_FALSE(spline.flattenHandles(nullptr, kTempusZero));
    middle->setFlag(kKFVertexFlagHandlesBroken);
    EXPECT_TRUE(spline.flattenHandles(middle, kTempusZero));
    EXPECT_TRUE(middle->isFlat());
    EXPECT_EQ(middle->getFlags(), kKFVertexFlagHandlesEdited);
}

} // namespace
