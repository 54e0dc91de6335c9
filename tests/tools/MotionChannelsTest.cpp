#include "tools/import/MotionChannels.h"
#include "tests/tools/MotionSamples.h"
#include "tools/curve/Keypoint.h"
#include "tools/curve/SampleTimes.h"

#include <cmath>
#include <gtest/gtest.h>
#include <numbers>

namespace lumenkey::tools {
namespace {

using samples::kSmallMotion;

/// A file with a joint for each name; children are what stands between braces.
Motion motionOfJoints(std::string const& joints) {
    std::string text = "HIERARCHY\nROOT " + joints + "MOTION\nFrames: 0\nFrame Time: 0.04\n";
    return readMotionText(text, "f.bvh");
}

std::string const kJoint = "{ OFFSET 0 0 0 CHANNELS 1 Xrotation ";

TEST(MotionChannels, TellsJointsOfOneNameApart) {
    Motion const motion = motionOfJoints("Hips" + kJoint + "JOINT Left" + kJoint + "JOINT Toe" + kJoint +
                                         "}} JOINT Right" + kJoint + "JOINT Toe" + kJoint + "} JOINT Toe" +
                                         kJoint + "}} JOINT To" + kJoint + "}}\n");
    MotionChannels const channels(motion);
    std::vector<std::string> const expected{
        "Hips.Xrotation",  "Left.Xrotation",           "Hips/Left/Toe.Xrotation",
        "Right.Xrotation", "Hips/Right/Toe.Xrotation", "Hips/Right/Toe#2.Xrotation",
        "To.Xrotation"};
    ASSERT_EQ(channels.count(), expected.size());
    for (std::size_t i = 0; i < expected.size(); ++i) {
        EXPECT_EQ(channels.name(i), expected[i]);
        EXPECT_EQ(channels.find(expected[i]), i);
    }
    EXPECT_EQ(channels.find("Hips/Left.Xrotation"), 1U) << "a path where the name would do";
    for (char const* const unknown :
         {"Toe.Xrotation", "Left/Toe.Xrotation", "/Hips.Xrotation", "xHips.Xrotation", "Hips.Yrotation",
          "Hips.xrotation", "Hips", ".Xrotation", "", "Hips/Left/Toe#1.Xrotation", "HipsLeft.Xrotation"}) {
        EXPECT_EQ(channels.find(unknown), std::nullopt) << unknown;
    }
}

TEST(MotionChannels, MakesOneLinearKeypointForEachFrame) {
    Motion const motion = readMotionText(kSmallMotion, "f.bvh");
    MotionChannels const channels(motion);
    auto const made = channels.makeSpline(*channels.find("LeftLeg.Yrotation"));
    std::vector<void*> const handles = keypointHandles(made->spline);
    ASSERT_EQ(handles.size(), 3U);
    double const degrees[] = {90, 95, 180};
    for (int i = 0; i < 3; ++i) {
        Keypoint const key = readKeypoint(made->spline, handles[static_cast<std::size_t>(i)]);
        EXPECT_EQ(key.time, TempusMake(i, 120));
        EXPECT_DOUBLE_EQ(key.value, degrees[i] * std::numbers::pi / 180);
        EXPECT_EQ(key.interpolation, 1U);
        EXPECT_TRUE(key.enabled);
        EXPECT_TRUE(key.in.isFlat() && key.out.isFlat());
    }
    auto const position = channels.makeSpline(*channels.find("Hips.Yposition"));
    EXPECT_EQ(position->spline.getVertexValue(TempusMake(1, 120), kTempusZero, true), 91.5);
    EXPECT_EQ(channels.unit(1), "units");
    EXPECT_EQ(channels.unit(8), "rad");
}

/// Linear interpolation between frames in long doubles, held at both ends.
double interpolated(MotionChannels const& channels, Motion const& motion, std::size_t channel, int64_t value,
                    int64_t timescale) {
    // value / timescale seconds, in frames of frameDuration.
    long double const place =
        static_cast<long double>(value) * motion.frameDuration.timescale /
        (static_cast<long double>(timescale) * static_cast<long double>(motion.frameDuration.value));
    long double const last = static_cast<long double>(motion.frameCount - 1);
    long double const held = std::min(std::max(place, 0.0L), last);
    auto const frame = static_cast<std::size_t>(held);
    std::size_t const next = std::min(frame + 1, motion.frameCount - 1);
    long double const share = held - static_cast<long double>(frame);
    return static_cast<double>(channels.value(frame, channel) * (1 - share) +
                               channels.value(next, channel) * share);
}

TEST(SampleTimes, ReadsCurvesAtExactTimes) {
    Motion const motion = readMotionText(kSmallMotion, "f.bvh");
    MotionChannels const channels(motion);
    struct {
        char const* what;
        SampleTimes times;
    } const cases[] = {
        {"a row", SampleTimes::row(TempusMake(-1, 120), TempusMake(1, 1'000), 40)},
        {"a spread", SampleTimes::spread(kTempusZero, TempusMake(1, 60), 12)},
        {"a spread that no step serves",
         SampleTimes::spread(TempusMake(1, 2'147'483'647), TempusMake(1, 60), 1'000)},
        {"a list", SampleTimes::list({TempusMake(1, 240), TempusMake(7, 1'000), kTempusZero})},
    };
    for (auto const& each : cases) {
        SCOPED_TRACE(each.what);
        for (std::size_t channel = 0; channel < channels.count(); ++channel) {
            auto const made = channels.makeSpline(channel);
            std::vector<double> const values = each.times.values(made->spline);
            ASSERT_EQ(values.size(), each.times.count());
            for (std::size_t i = 0; i < values.size(); ++i) {
                Tempus const time = each.times.at(i);
                double const expected = interpolated(channels, motion, channel, time.value, time.timescale);
                EXPECT_NEAR(values[i], expected, 1e-12 * std::max(1.0, std::abs(expected)));
            }
        }
    }
    EXPECT_EQ(cases[1].times.at(11), TempusMake(1, 60));
    EXPECT_EQ(cases[2].times.at(999), TempusMake(1, 60));
    EXPECT_EQ(SampleTimes::spread(TempusMake(1, 3), TempusMake(1, 2), 1).at(0), TempusMake(1, 3));
}

TEST(SampleTimes, ReadsSlopesBetweenKeypoints) {
    Motion const motion = readMotionText(kSmallMotion, "f.bvh");
    MotionChannels const channels(motion);
    auto const made = channels.makeSpline(0); // 0, 1, 4 at 120 frames a second
    std::vector<double> const slopes =
        SampleTimes::list({TempusMake(1, 240), TempusMake(3, 240), TempusMake(1, 1)}).slopes(made->spline);
    EXPECT_NEAR(slopes[0], 120, 1e-6);
    EXPECT_NEAR(slopes[1], 360, 1e-6);
    EXPECT_EQ(slopes[2], 0);
}

} // namespace
} // namespace lumenkey::tools
