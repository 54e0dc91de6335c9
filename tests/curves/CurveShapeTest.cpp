// Baking, simplifying and smoothing of a stretch, and the operations on segments. How near a fit stays to the curve is
// measured over the museum.

#include "lumenkey/curves/KFTypedCurves.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineState.h"
#include "tests/curves/ChainNodes.h"

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <limits>
#include <memory>

namespace {

Tempus at(double t) { return KFChronoForChannelSeconds(t, 600); }
Tempus const frame = TempusMake(1, 30);

struct Keyed : KFCurveDouble {
    explicit Keyed(std::vector<double> const& values = {}, double spacing = 1.0) : KFCurveDouble(0.0) {
        setIsSpline(true, kTempusZero);
        for (std::size_t i = 0; i < values.size(); ++i)
            setKeypoint(at(spacing * static_cast<double>(i)), values[i], true);
    }
    double value(double t) { return getValue(KFChronoForChannelSeconds(t, 60000), 0.0); }
    std::vector<void*> handles() {
        std::vector<void*> all;
        getKeypointHandleList(all);
        return all;
    }
    /// Times and values, one behind the other.
    std::vector<double> keypoints() {
        std::vector<double> all;
        for (void* const handle : handles()) {
            Tempus t;
            double v = 0.0;
            getKeypoint(handle, &t, &v);
            all.insert(all.end(), {TempusGetSeconds(t), v});
        }
        return all;
    }
};

using Keys = std::vector<double>;

} // namespace

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

TEST(CurveShape, CollinearKeypointsGo) {
    Keyed ramp({0.0, 2.0, 4.0, 6.0, 8.0});
    ASSERT_TRUE(ramp.simplifyCurve(at(0.5), at(3.5), frame, 1.0, 1.0, 2, 0));
    EXPECT_EQ(ramp.keypoints(), (Keys{0, 0, 0.5, 1, 3.5, 7, 4, 8}));
    // Keypoints behind the end stay, though they are on the line.
    ASSERT_TRUE(ramp.simplifyCurve(at(1), at(2), frame, 1.0, 1.0, 2, 0));
    EXPECT_EQ(ramp.keypoints(), (Keys{0, 0, 0.5, 1, 1, 2, 2, 4, 3.5, 7, 4, 8}));
    Keyed bent({0.0, 1.0, 2.0, 2.0, 2.0});
    ASSERT_TRUE(bent.simplifyCurve(at(0), at(4), frame, 1.0, 1.0, 2, 0));
    EXPECT_EQ(bent.keypoints(), (Keys{0, 0, 2, 2, 4, 2}));
}

TEST(CurveShape, ThinningLeavesExtremes) {
    Keyed peak({0.0, 1.0, 2.0, 1.0, 0.0});
    ASSERT_TRUE(peak.simplifyCurve(at(0), at(4), frame, 1.0, 1.0, 4, 0));
    EXPECT_EQ(peak.keypoints(), (Keys{0, 0, 2, 2, 4, 0}));
    Keyed plateau({0.0, 1.0, 1.0, 0.0});
    ASSERT_TRUE(plateau.simplifyCurve(at(0), at(3), frame, 1.0, 1.0, 4, 0));
    EXPECT_EQ(plateau.keypoints(), (Keys{0, 0, 2, 1, 3, 0}));
    Keyed part({0.0, 1.0, 2.0, 3.0, 4.0, 5.0});
    part.lockKeypoint(part.handles()[3], true, true);
    ASSERT_TRUE(part.simplifyCurve(at(2), at(4), frame, 1.0, 1.0, 4, 0));
    EXPECT_EQ(part.keypoints(), (Keys{0, 0, 1, 1, 3, 3, 5, 5}));
}

TEST(CurveShape, SmoothingKeepsARampInside) {
    Keyed ramp({-5.0, 0.0, 10.0, 15.0});
    ASSERT_TRUE(ramp.moveKeypoint(ramp.handles()[3], at(4), true, false, false));
    ASSERT_TRUE(ramp.moveKeypoint(ramp.handles()[2], at(3), true, false, false)); // 5 per second from 1 to 3
    ASSERT_TRUE(ramp.smoothCurve(at(1), at(3), TempusMake(1, 5)));
    ASSERT_EQ(ramp.getNumberOfKeypoints(), 12U);
    std::vector<double> const keys = ramp.keypoints();
    EXPECT_EQ((Keys{keys[0], keys[1], keys[22], keys[23]}), (Keys{0, -5, 4, 15}));
    for (std::size_t i = 0; i < 10; ++i) {
        EXPECT_NEAR(keys[2 + 2 * i], 1.0 + 0.2 * static_cast<double>(i), 1e-9);
        double const rise = keys[3 + 2 * i] - static_cast<double>(i);
        EXPECT_NEAR(rise, 0.0, i >= 3 && i <= 6 ? 1e-9 : 0.5) << i;
        double du = 1.0, dv = 1.0;
        ramp.getKeypointOutputHandles(ramp.handles()[i + 1], &du, &dv);
        EXPECT_EQ(du, 0.0);
        EXPECT_EQ(dv, 0.0);
    }
    EXPECT_NEAR(keys[3], (6.0 * 1.0 + 3.0 * 2.0 - 2.0 * 3.0) / 21.0, 1e-9);
}

TEST(CurveShape, BakedChainReadsAsBefore) {
    Keyed curve({0.0, 8.0, -3.0, 5.0, 4.0, 0.0});
    curve.setCurveInterpolation(kKFInterpolationBezier);
    KFSplineState* const own = curve.getSplineState();
    curve.appendCurveProcessingNode(new Delay(0.5));
    auto* const gain = new Gain(3.0);
    curve.appendCurveProcessingNode(gain);
    std::unique_ptr<KFCurve> const before(static_cast<KFCurve*>(curve.getCurveWorkingCopy()));
    double const tolerance = 0.05, scale = 0.25;
    ASSERT_TRUE(curve.bakeCurve(gain, at(0), frame, at(5), tolerance * 100.0 * scale, scale));
    EXPECT_EQ(curve.getSplineState(), own);
    EXPECT_FALSE(own->sanitizeBezier);
    EXPECT_TRUE(before->settings().sanitizeBezier);
    for (int i = 0; i < 150; ++i) {
        Tempus const t = frame * i;
        EXPECT_NEAR(curve.getValue(t, static_cast<void*>(nullptr)), before->getValue(t, 0.0),
                    tolerance + 0.003)
            << i;
    }
}

// A frame is no tick of the timescale to which fitted times are rounded: the first keypoint must still meet the old one.
TEST(CurveShape, BakeReplacesAKeypointAtItsStart) {
    Keyed curve({0.0, 1.0, 4.0, 9.0, 16.0, 25.0, 36.0}, 1.0 / 30.0);
    auto* const gain = new Gain(3.0);
    curve.appendCurveProcessingNode(gain);
    ASSERT_TRUE(curve.bakeCurve(gain, frame, frame, frame * 6, 1.0, 1.0));
    EXPECT_EQ(curve.getValue(frame, static_cast<void*>(nullptr)), 3.0);
    EXPECT_NEAR(curve.getValue(frame * 1.5, static_cast<void*>(nullptr)), 7.5, 0.2);
    EXPECT_EQ(curve.value(0.0), 0.0);
}

TEST(CurveShape, BakeTakesWholeSteps) {
    Keyed curve;
    curve.setCurveInitialValue(2.0);
    KFSplineState* const shared = curve.getSplineState();
    ASSERT_TRUE(curve.bakeCurve(nullptr, at(1), at(1), at(3.5), 1.0, 4.0));
    EXPECT_EQ(curve.keypoints(), (Keys{1, 2, 2, 2}));
    EXPECT_TRUE(shared->sanitizeBezier);
    EXPECT_FALSE(curve.settings().sanitizeBezier);
    std::uint32_t type = 0;
    EXPECT_TRUE(curve.getCurveInterpolation(&type) && type == kKFInterpolationBezier);
    // Too short for a step: nothing fits.
    ASSERT_TRUE(curve.bakeCurve(nullptr, at(1.5), at(1), at(2), 1.0, 4.0));
    EXPECT_EQ(curve.keypoints(), (Keys{1, 2}));
}

TEST(CurveShape, RefusalsChangeNothing) {
    Gain foreign(2.0);
    Tempus const far = TempusMake(std::int64_t{1} << 40, 1), never = kTempusInvalid;
    double const nan = std::numeric_limits<double>::quiet_NaN();
    std::function<bool(Keyed&)> const keyed[] = {
        [&](Keyed& c) { return c.bakeCurve(&foreign, at(0), frame, at(2), 1.0, 1.0); },
        [&](Keyed& c) { return c.bakeCurve(nullptr, at(0), frame, far, 1.0, 1.0); },
        [&](Keyed& c) { return c.bakeCurve(nullptr, at(0), kTempusZero, at(2), 1.0, 1.0); },
        [&](Keyed& c) { return c.bakeCurve(nullptr, never, frame, at(2), 1.0, 1.0); },
        [&](Keyed& c) { return c.bakeCurve(nullptr, at(0), frame, at(2), 1.0, 0.0); },
        [&](Keyed& c) { return c.bakeCurve(nullptr, at(0), frame, at(2), 1.0, nan); },
        [&](Keyed& c) { return c.simplifyCurve(at(0), far, frame, 1.0, 1.0, 2, 1); },
        [&](Keyed& c) { return c.simplifyCurve(at(0), kTempusPositiveInfinity, frame, 1.0, 1.0, 2, 1); },
        [&](Keyed& c) { return c.simplifyCurve(at(2), at(0), frame, 1.0, 1.0, 2, 0); },
        [&](Keyed& c) { return c.smoothCurve(at(0), far, frame); },
        [&](Keyed& c) { return c.smoothCurve(at(2), at(0), frame); },
        [&](Keyed& c) { return c.smoothCurve(at(0), at(2), -frame); },
        [&](Keyed& c) { return c.generateKeypoints(0, 0xFFFFFFFF, true) != 0; },
        // True, yet nothing to do.
        [&](Keyed& c) { return !c.simplifyCurve(at(0), at(2), frame, 1.0, 1.0, 3, 1); }};
    for (std::size_t i = 0; i < std::size(keyed); ++i) {
        Keyed curve({1.0, 1.0, 3.0});
        std::unique_ptr<KFCurve> const before(static_cast<KFCurve*>(curve.cloneCurve()));
        EXPECT_FALSE(keyed[i](curve)) << i;
        EXPECT_TRUE(curve == *before) << i;
        curve.setIsSpline(false, kTempusZero);
        EXPECT_FALSE(i < 12 && keyed[i](curve)) << i;
        EXPECT_EQ(curve.getSpline()->getNumberOfVertices(), 3U) << i;
    }
    Keyed single({1.0});
    EXPECT_FALSE(single.smoothCurve(at(0), at(2), frame));
    EXPECT_FALSE(single.simplifyCurve(at(0), at(2), frame, 1.0, 1.0, 4, 0));
    EXPECT_EQ(single.getNumberOfKeypoints(), 1U);
}

TEST(CurveShape, Segments) {
    Keyed curve;
    EXPECT_TRUE(curve.setCurveSegmentValue(at(1), 4.0, false));
    EXPECT_EQ(curve.value(1), 0.0); // neither animated nor forced
    EXPECT_TRUE(curve.setCurveSegmentValue(at(1), 4.0, true));
    EXPECT_EQ(curve.value(1), 4.0);
    EXPECT_FALSE(curve.createCurveSegment(at(1), at(2), TempusMake(1, 2), false, false));
    EXPECT_EQ(curve.getSpline(), nullptr);
    EXPECT_TRUE(curve.createCurveSegment(at(1), at(2), TempusMake(1, 2), false, true));
    EXPECT_EQ(curve.keypoints(), (Keys{0.5, 4, 1, 4, 2, 4, 2.5, 4}));
    EXPECT_TRUE(curve.setCurveSegmentValue(at(1.5), 6.0, false));
    EXPECT_EQ(curve.keypoints(), (Keys{0.5, 4, 1, 6, 2, 6, 2.5, 4}));
    EXPECT_TRUE(curve.setCurveSegmentValueBounded(at(1.5), 20.0, 0.0, 8.0, false));
    EXPECT_EQ(curve.value(1.5), 8.0);
    curve.setCurveExtrapolation(kKFExtrapolationRepeat, 0);
    EXPECT_EQ(curve.generateKeypoints(0, 1, false), 1U);
    EXPECT_GT(curve.getNumberOfKeypoints(), 4U);
}
