// What a channel does around its curve's operations on a stretch: lock, announcement, time, tolerance.

#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFSplineState.h"
#include "tests/Channels/AddingNode.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

namespace {

struct AffectedRoot : RecordingRoot {
    bool isChannelAffectedByBehaviors(KFChannelBase const*, bool selectedOnly) const override {
        return affected && selectedOnly;
    }
    bool affected = true;
};

struct ChannelShape : testing::Test {
    AffectedRoot root;
    KFChannelDouble channel{0.0, "Value", &root, 7, 0};
    BXTimeRange const range{s(10), s(2)};

    ChannelShape() {
        channel.createLocalChannelImplementation(); // the shared curve stays as it is
        root.setTimeOffset(s(10), true);
        for (int i = 0; i <= 4; ++i)
            curve().setKeypoint(s(i), i == 3 ? 9.0 : i, true);
        root.takeAnnounced();
    }
    KFCurve& curve() { return *channel.getCurveInterface(); }
};

} // namespace

TEST_F(ChannelShape, BakesTheNodesInTheRootsFrames) {
    channel.bake(range, s(1));
    EXPECT_TRUE(root.takeAnnounced().empty()); // no nodes
    auto* const node = new AddingNode(100.0);
    channel.appendCurveProcessingNode(node);
    root.affected = false;
    channel.bake(range, s(1));
    EXPECT_TRUE(root.takeAnnounced().empty());

    root.affected = true;
    root.frameDuration = TempusMake(1, 10);
    channel.bake(range, s(1));
    EXPECT_EQ(root.takeAnnounced().size(), 1U);
    EXPECT_FALSE(curve().getSplineState()->sanitizeBezier);
    channel.deleteCurveProcessingNode(node);
    for (double const t : {0.0, 0.7, 1.5, 1.9})
        EXPECT_NEAR(channel.getValueAsDouble(s(10 + t), 0.0), 100.0 + t, 0.02) << t;
    EXPECT_EQ(channel.getValueAsDouble(s(13), 0.0), 9.0);
    EXPECT_FALSE(channel.hasKeypointAt(s(12), 0)); // the last frame is the one before
}

TEST_F(ChannelShape, KnowsTheSlidersEndAndTheRootsFrame) {
    channel.setSliderMax(5.0);
    channel.setCurveSegmentValue(s(1.5), 50.0, true);
    EXPECT_NEAR(channel.getCurveValue(s(1.5), false), 4.5,
                1e-9); // the upper of the two is at the slider's end
    channel.setCurveSegmentValue(s(1.5), 50.0, false);
    EXPECT_NEAR(channel.getCurveValue(s(1.5), false), 50.0, 1e-9);
    root.frameDuration = TempusMake(1, 24);
    channel.setUseRetimingExtrapolation(true);
    EXPECT_EQ(curve().getFrameDuration(), root.frameDuration);
    channel.resetCurve();
    EXPECT_EQ(channel.getValueAsDouble(s(11), 0.0), 0.0);
}
