// Baking, simplifying and smoothing of a stretch, and the operations on segments.

#include "lumenkey/curves/KFTypedCurves.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineState.h"
#include "tests/curves/ChainNodes.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <memory>

namespace {

using Keys = std::vector<double>;

Tempus at(double t) { return KFChronoForChannelSeconds(t, 600); }
Tempus const frame = TempusMake(1, 30);
double wave(double t) { return 3.0 * std::sin(1.7 * t); }

struct Keyed : KFCurveDouble {
    explicit Keyed(Keys const& values = {}, Tempus spacing = at(1)) : KFCurveDouble(0.0) {
        setIsSpline(true, kTempusZero);
        for (std::size_t i = 0; i < values.size(); ++i)
            setKeypoint(spacing * static_cast<std::uint32_t>(i), values[i], true);
    }
    double value(double t) { return KFCurve::getValue(at(t), nullptr); }
    /// Times and values, one behind the other.
    Keys keypoints() {
        std::vector<void*> handles;
        getKeypointHandleList(handles);
        Keys all;
        for (void* const handle : handles) {
            Tempus t;
            double v = 0.0;
            getKeypoint(handle, &t, &v);
            all.insert(all.end(), {TempusGetSeconds(t), v});
        }
        return all;
    }
    bool simplify(double start, double end, std::uint32_t mode) {
        return simplifyCurve(at(start), at(end), frame, 1.0, 1.0, mode, 0);
    }
};

/// Keypoints of six seconds.
Keys sampled(double (*shape)(double)) {
    Keys values;
    for (int i = 0; i <= 180; ++i)
        values.push_back(shape(i / 30.0));
    return values;
}

double worstDifference(Keyed& curve, KFCurveInterface& other, double from, double to) {
    double worst = 0.0;
    for (Tempus t = at(from); t < at(to); t = t + TempusMake(1, 300))
        worst = std::max(worst, std::fabs(curve.KFCurve::getValue(t, nullptr) - other.getValue(t, 0.0)));
    return worst;
}

} // namespace

TEST(CurveShape, FitStaysWithinToleranceBetweenItsSamples) {
    double (*const shapes[])(double) = {wave, [](double t) { return std::fabs(t - 3.0); },
                                        [](double t) { return 10.0 / (1.0 + std::exp(9.0 - 3.0 * t)); }};
    for (auto const shape : shapes) {
        for (double const tolerance : {0.3, 0.02}) {
            Keyed curve(sampled(shape), frame);
            // A linear curve is fitted where a radius is given, and the fit is no less Bezier.
            bool const isLinear = tolerance > 0.1;
            curve.setCurveInterpolation(isLinear ? kKFInterpolationLinear : kKFInterpolationBezier);
            std::unique_ptr<KFCurveInterface> const before(curve.cloneCurve());
            // The tolerance comes in hundredths of `range`'s inverse.
            curve.simplifyCurve(at(1), at(5), frame, tolerance * 200.0, 2.0, 2, isLinear ? -1 : 0);
            EXPECT_LT(curve.getNumberOfKeypoints(), 60U + 60U);
            // The last sample stands a frame before the end. Between samples both curves bow by up to 0.0015.
            EXPECT_LE(worstDifference(curve, *before, 1.0, 4.968), tolerance * 1.05 + 0.003);
            EXPECT_EQ(worstDifference(curve, *before, 0.0, 0.96), 0.0);
            EXPECT_EQ(worstDifference(curve, *before, 5.04, 6.0), 0.0);
        }
    }
}

TEST(CurveShape, RadiusAveragesOverAWindow) {
    Keyed curve({0.0, 9.0, 0.0, 0.0, 3.0, 6.0, 0.0});
    ASSERT_TRUE(curve.simplifyCurve(at(0), at(6), at(1), 0.0, 1.0, 2, 1));
    double const means[] = {3.0, 3.0, 3.0, 1.0, 3.0, 5.0};
    for (int i = 0; i < 6; ++i)
        EXPECT_NEAR(curve.value(i), means[i], 1e-9) << i;
    Keyed flat({0.0, 9.0, 0.0});
    ASSERT_TRUE(flat.simplifyCurve(at(0), at(2), at(1), 0.0, 1.0, 2, std::numeric_limits<int>::max()));
    EXPECT_NEAR(flat.value(0.5), 4.5, 1e-6); // half of it reads the first sample, half the last
}

TEST(CurveShape, KeypointsOnLinesGoAndExtremesStay) {
    Keyed ramp({0.0, 2.0, 4.0, 6.0, 6.0});
    ASSERT_TRUE(ramp.simplify(0.5, 4, 2));
    EXPECT_EQ(ramp.keypoints(), (Keys{0, 0, 0.5, 1, 3, 6, 4, 6}));
    // Keypoints behind the end stay, though they are on the line.
    Keyed straight({0.0, 2.0, 4.0, 6.0, 8.0});
    ASSERT_TRUE(straight.simplify(0.5, 1.5, 2) && straight.simplify(0.5, 0.75, 2));
    EXPECT_EQ(straight.keypoints(), (Keys{0, 0, 0.5, 1, 0.75, 1.5, 1.5, 3, 2, 4, 3, 6, 4, 8}));
    Keyed plateau({0.0, 1.0, 1.0, 0.0});
    ASSERT_TRUE(plateau.simplify(0, 3, 4));
    EXPECT_EQ(plateau.keypoints(), (Keys{0, 0, 2, 1, 3, 0}));
    Keyed part({0.0, 1.0, 2.0, 3.0, 4.0});
    ASSERT_TRUE(part.simplify(2, 3, 4));
    EXPECT_EQ(part.keypoints(), (Keys{0, 0, 1, 1, 4, 4}));
}

TEST(CurveShape, SmoothingKeepsARampInside) {
    Keyed ramp({-1.0, 0.0, 5.0, 10.0, 15.0, 0.0});
    ASSERT_TRUE(ramp.smoothCurve(at(1), at(3), TempusMake(1, 5)));
    Keys const keys = ramp.keypoints();
    ASSERT_EQ(keys.size(), 26U);
    for (std::size_t i = 0; i < 10; ++i)
        EXPECT_NEAR(keys[3 + 2 * i], static_cast<double>(i), i >= 3 && i <= 6 ? 1e-9 : 0.5) << i;
    EXPECT_NEAR(keys[3], (6.0 * 1.0 + 3.0 * 2.0 - 2.0 * 3.0) / 21.0, 1e-9);
    EXPECT_EQ((Keys{keys[0], keys[22], keys[24]}), (Keys{0, 4, 5}));
}

TEST(CurveShape, BakedChainReadsAsBefore) {
    Keyed curve(sampled(wave), frame);
    curve.appendCurveProcessingNode(new Delay(0.5));
    auto* const gain = new Gain(3.0);
    curve.appendCurveProcessingNode(gain);
    std::unique_ptr<KFCurve> const before(static_cast<KFCurve*>(curve.getCurveWorkingCopy()));
    double const tolerance = 0.05, scale = 0.25;
    // A keypoint stands at the start, which is no tick of the timescale to which fitted times are rounded.
    ASSERT_TRUE(curve.bakeCurve(gain, frame, frame, at(5), tolerance * 100.0 * scale, scale));
    // Between samples the kink where the delayed curve begins is round.
    EXPECT_LE(worstDifference(curve, *before, 1.0 / 30.0, 4.968), tolerance + 0.03);
    EXPECT_FALSE(curve.settings().sanitizeBezier);
    EXPECT_TRUE(before->settings().sanitizeBezier);
}

TEST(CurveShape, RefusalsChangeNothing) {
    Gain foreign(2.0);
    Tempus const far = TempusMake(std::int64_t{1} << 40, 1);
    Keyed curve({1.0, 1.0, 3.0});
    std::unique_ptr<KFCurve> const before(static_cast<KFCurve*>(curve.cloneCurve()));
    EXPECT_FALSE(curve.bakeCurve(&foreign, at(0), frame, at(2), 1.0, 1.0));
    EXPECT_FALSE(curve.bakeCurve(nullptr, at(0), frame, far, 1.0, 1.0));
    EXPECT_FALSE(curve.bakeCurve(nullptr, at(0), kTempusZero, at(2), 1.0, 1.0));
    EXPECT_FALSE(curve.bakeCurve(nullptr, at(0), frame, at(2), 1.0, 0.0));
    EXPECT_FALSE(curve.simplify(2, 0, 2) || curve.smoothCurve(at(2), at(0), frame));
    EXPECT_EQ(curve.generateKeypoints(0, 0xFFFFFFFF, true), 0U);
    EXPECT_TRUE(curve.simplify(0, 2, 3)); // yet nothing to do
    EXPECT_TRUE(curve == *before);
    EXPECT_FALSE(Keyed(Keys{1.0}).smoothCurve(at(0), at(2), frame));
}

TEST(CurveShape, Segments) {
    Keyed curve;
    EXPECT_TRUE(curve.setCurveSegmentValue(at(1), 4.0, false)); // neither animated nor forced
    EXPECT_EQ(curve.value(1), 0.0);
    EXPECT_TRUE(curve.setCurveSegmentValue(at(1), 4.0, true));
    EXPECT_FALSE(curve.createCurveSegment(at(1), at(2), TempusMake(1, 2), false, false));
    EXPECT_TRUE(curve.createCurveSegment(at(1), at(2), TempusMake(1, 2), false, true));
    EXPECT_TRUE(curve.setCurveSegmentValue(at(1.5), 6.0, false));
    EXPECT_EQ(curve.keypoints(), (Keys{0.5, 4, 1, 6, 2, 6, 2.5, 4}));
    EXPECT_TRUE(curve.setCurveSegmentValueBounded(at(1.5), 20.0, 0.0, 8.0, false));
    EXPECT_EQ(curve.value(1.5), 8.0);
}
