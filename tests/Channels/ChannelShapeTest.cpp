// What a channel does around its curve's operations on a stretch: lock, announcement, time, tolerance.

#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "tests/Channels/AddingNode.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

namespace {

Tempus s(double t) { return KFChronoForChannelSeconds(t, 600); }

struct ChannelShape : testing::Test, RecordingRoot {
    KFChannelDouble channel{0.0, "Value", this, 7, 0};
    bool affected = false;

    ChannelShape() {
        setTimeOffset(s(10), true);
        for (int i = 0; i <= 4; ++i)
            channel.setKeyframe(s(i), i == 3 ? 9.0 : i, true);
        takeAnnounced();
    }
    bool isChannelAffectedByBehaviors(KFChannelBase const*, bool selectedOnly) const override {
        return affected && selectedOnly;
    }
    bool bakeAnnounces() {
        channel.bake({s(10), s(2)}, s(1));
        return !takeAnnounced().empty();
    }
};

} // namespace

TEST_F(ChannelShape, BakesTheNodesInTheRootsFrames) {
    auto* const node = new AddingNode(100.0);
    channel.appendCurveProcessingNode(node);
    EXPECT_FALSE(bakeAnnounces());
    affected = true;
    frameDuration = TempusMake(1, 10);
    EXPECT_TRUE(bakeAnnounces());
    channel.deleteCurveProcessingNode(node);
    for (double const t : {0.0, 0.7, 1.5, 1.9})
        EXPECT_NEAR(channel.getValueAsDouble(s(10 + t), 0.0), 100.0 + t, 0.02) << t;
    EXPECT_FALSE(channel.hasKeypointAt(s(12), 0)); // the last frame is the one before
    EXPECT_FALSE(bakeAnnounces());                 // no nodes
}

TEST_F(ChannelShape, SimplifiesInGlobalTime) {
    channel.simplify(s(10), s(14), s(1), 1.0, 4, 0, false);
    EXPECT_EQ(takeAnnounced().size(), 1U);
    EXPECT_EQ(channel.getNumberOfKeyframes(), 3U);
    channel.smoothKeyframes(s(0), s(4), TempusMake(1, 2));
    EXPECT_EQ(channel.getNumberOfKeyframes(), 8U);
    EXPECT_TRUE(takeAnnounced().empty());
    channel.lock(true, false);
    channel.simplify(s(10), s(14), s(1), 1.0, 4, 0, false);
    channel.reduceKeyframes(s(0), s(4), s(1), 1.0, 1.0, 4, 0);
    EXPECT_EQ(channel.getNumberOfKeyframes(), 8U);
}

TEST_F(ChannelShape, SegmentsAndTheWholeCurve) {
    KFCurve& curve = *channel.getCurveInterface();
    channel.setSliderMax(5.0);
    channel.setCurveSegmentValue(s(1.5), 50.0, true);
    EXPECT_NEAR(channel.getCurveValue(s(1.5), false), 4.5,
                1e-9); // the upper of both reaches the slider's end
    channel.setExtrapolation(3, 0);
    channel.generateKeys(0, 1);
    EXPECT_GT(channel.getNumberOfKeyframes(), 5U);
    frameDuration = TempusMake(1, 24);
    channel.setUseRetimingExtrapolation(true);
    EXPECT_TRUE(curve.getRetimingExtrapolation() && curve.getFrameDuration() == frameDuration);
    channel.closeParametricCurve();
    bool closed = false;
    EXPECT_TRUE(curve.isClosedCurve(&closed) && closed);
    channel.resetCurve();
    EXPECT_EQ(channel.getNumberOfKeyframes(), 0U);
    EXPECT_TRUE(channel.createCurveSegment(s(1), s(2), TempusMake(1, 2), false));
    channel.reparametrizeChannel();
    EXPECT_EQ(channel.getKeyframeMaxTime(), s(3)); // of the fourth keypoint
    channel.lock(true, false);
    EXPECT_FALSE(channel.createCurveSegment(s(11), s(12), TempusMake(1, 2), false));
}
