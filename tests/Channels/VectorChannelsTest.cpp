// The vector compounds: their components, copies, linked edits, the shape of keypoints, switches.

#include "lumenkey/Channels/KFVectorChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "tests/Channels/AddingNode.h"
#include "tests/Channels/Keypoints.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <array>
#include <memory>

namespace {

/// "name:id" of each child.
std::string children(KFChannelFolder const& folder) {
    std::string list;
    for (KFChannelBase const* child : *folder.getDescendants()) {
        EXPECT_EQ(child->getParent(), &folder);
        list += child->getName().str() + ":" + std::to_string(child->getID()) + " ";
    }
    return list;
}

std::array<double, 3> valuesAt(KFChannel3D const& point, std::int64_t t) {
    std::array<double, 3> values{};
    point.getValue(s(t), &values[0], &values[1], &values[2], 0.0);
    return values;
}

/// At a time, input and output.
std::array<Handle, 2> handlesAt(KFChannel& channel, std::int64_t t) {
    void* const keypoint = channel.getKeyframe(s(t));
    return {input(channel, keypoint, true), output(channel, keypoint, true)};
}

TEST(KFVectorChannels, ComponentsHaveTheirNamesAndIDs) {
    KFChannelFolder folder("f", nullptr, 1, 0, 0);
    KFChannel2D plane("p", &folder, 2, 0);
    EXPECT_EQ(children(plane), "X:1 Y:2 ");
    EXPECT_EQ(children(KFChannel2D("u", "v", "p", nullptr, 2, 0)), "u:1 v:2 ");
    EXPECT_EQ(children(KFChannel3D("s", nullptr, 3, 0)), "X:1 Y:2 Z:3 ");
    EXPECT_EQ(children(KFChannelBool3D(nullptr, "b", 4, 3)), "X:1 Y:2 Z:3 ");
    EXPECT_EQ(plane.getFoldFlags(), kFoldFlagsCompoundDefault);
}

TEST(KFVectorChannels, EachComponentGetsTheRecordsThatAreGiven) {
    KFChannelImpl* const shared = KFChannelPercent::createKFChannelPercent50Impl();
    KFChannel3D sharing("s", nullptr, 1, 0, 3, shared);
    EXPECT_TRUE(sharing.x.getImpl() == shared && sharing.y.getImpl() == shared &&
                sharing.z.getImpl() == shared);
    KFChannelImpl* const local = new KFChannelImpl(*shared);
    KFChannel3D owning("s", nullptr, 1, 0, 3, local, new KFChannelInfo(*sharing.x.getInfo()));
    EXPECT_EQ(owning.x.getImpl(), local);
    owning.x.setInitialValue(0.75, true);
    owning.x.setScale(2.0);
    EXPECT_EQ(valuesAt(owning, 0), (std::array{0.75, 0.5, 0.5}));
    EXPECT_TRUE(owning.y.getScale() == 1.0 && owning.z.getScale() == 1.0);
}

TEST(KFVectorChannels, CopiesHaveComponentsOfTheirOwn) {
    KFChannel3D point("s", nullptr, 1, 0), target("t", nullptr, 1, 0);
    point.setValue(s(0), 1.0, 2.0, 3.0);
    point.setFoldFlag(kFoldFlagLinked);
    KFChannelFolder folder("f", nullptr, 1, 0, 0);
    KFChannel3D const child(point, &folder);
    EXPECT_TRUE(child.getParent() == &folder && children(child) == "X:1 Y:2 Z:3 ");
    std::unique_ptr<KFChannelBase> const clone(point.clone());
    target.copy(&point, true);
    EXPECT_TRUE(target.testFoldFlag(kFoldFlagLinked));
    point.setValue(s(0), 4.0, 5.0, 6.0);
    double z = 0.0;
    point.getValue(s(0), nullptr, nullptr, &z, 0.0);
    EXPECT_EQ(z, 6.0);
    for (KFChannel3D const* copy :
         {&child, static_cast<KFChannel3D const*>(clone.get()), &std::as_const(target)}) {
        EXPECT_EQ(valuesAt(*copy, 0), (std::array{1.0, 2.0, 3.0}));
        EXPECT_EQ(children(*copy), "X:1 Y:2 Z:3 ");
    }
    KFChannel2D plane("p", nullptr, 1, 0);
    plane.setValue(s(0), 8.0, 9.0, false);
    point.copy(&plane, true); // has no z
    point.copy(nullptr, true);
    EXPECT_EQ(valuesAt(point, 0), (std::array{8.0, 9.0, 6.0}));
    folder.removeAllDescendants(false);
}

TEST(KFVectorChannels, OffsetsReadEverythingBeforeTheFirstWrite) {
    /// While x is written, y gets one more node, which a later read would take into account.
    struct Changing : RecordingRoot {
        void willModifyChannel(KFChannelBase* channel, unsigned int) override {
            if (watched != nullptr && channel == &watched->x) {
                std::exchange(watched, nullptr)->y.appendCurveProcessingNode(new AddingNode(100.0));
            }
        }
        KFChannel3D* watched = nullptr;
    } root;
    KFChannel3D point("s", &root, 1, 0);
    point.x.appendCurveProcessingNode(new AddingNode(10.0));
    point.y.appendCurveProcessingNode(new AddingNode(20.0));
    point.setValueOffsetByBehaviors(s(0), 1.0, 2.0, 3.0);
    EXPECT_EQ(valuesAt(point, 0), (std::array{1.0, 2.0, 3.0}));
    EXPECT_EQ(point.y.getInitialValue(), -18.0);
    root.watched = &point;
    point.setValueOffsetByBehaviors(s(0), 4.0, 5.0, 6.0);
    EXPECT_EQ(valuesAt(point, 0), (std::array{4.0, 105.0, 6.0}));
    root.watched = &point;
    point.KFChannel2D::setValueOffsetByBehaviors(s(0), 7.0, 8.0);
    EXPECT_EQ(valuesAt(point, 0), (std::array{7.0, 108.0, 6.0}));
}

TEST(KFVectorChannels, FlattensAndStraightensTheKeypointsOfXAndY) {
    RecordingRoot root;
    KFChannel3D point("s", &root, 1, 0);
    for (KFChannel* channel : {static_cast<KFChannel*>(&point.x), static_cast<KFChannel*>(&point.y),
                               static_cast<KFChannel*>(&point.z)}) {
        for (std::int64_t const t : {0, 1, 2}) {
            channel->setKeyframe(s(t), 0.0, true);
        }
        channel->setKeyframeTangentsBroken(channel->getKeyframe(s(1)), true);
        channel->setKeyframeOutputTangents(channel->getKeyframe(s(1)), 0.25, 3.0, true);
    }
    auto const isBroken = [](KFChannel& c) { return c.getKeyframeTangentsBroken(c.getKeyframe(s(1))); };
    auto const type = [](KFChannel& c) { return c.getKeyframeInterpolation(c.getKeyframe(s(1))); };
    auto const typeBefore = type(point.z);
    auto const before = handlesAt(point.z, 1);
    point.y.lock(true, false);
    point.flattenAtTime(s(1));
    EXPECT_EQ(handlesAt(point.y, 1), before);
    point.y.lock(false, false);
    root.takeAnnounced();
    point.flattenAtTime(s(1));
    point.flattenAtTime(s(7)); // no keypoint
    point.setLinearAtTime(s(7));
    EXPECT_TRUE(root.takeAnnounced().empty());
    EXPECT_EQ(handlesAt(point.x, 1), (std::array<Handle, 2>{}));
    EXPECT_EQ(handlesAt(point.y, 1), (std::array<Handle, 2>{}));
    EXPECT_TRUE(!isBroken(point.x) && isBroken(point.z));
    point.setLinearAtTime(s(1));
    EXPECT_FALSE(root.takeAnnounced().empty());
    EXPECT_TRUE(type(point.y) == kKFInterpolationLinear && type(point.z) == typeBefore);
    EXPECT_EQ(handlesAt(point.z, 1), before);
    EXPECT_EQ(timesOf(point.x), (std::vector{s(0), s(1), s(2)}));
}

TEST(KFVectorChannels, DerivesHandlesAlongThePath) {
    for (auto const& [hasPrevious, hasNext] : {std::pair{true, true}, {true, false}, {false, true}}) {
        KFChannel2D plane("p", nullptr, 1, 0);
        plane.setIsSpline(true);
        plane.y.setInitialValue(4.0, true);
        if (hasPrevious) {
            plane.x.setKeyframe(s(0), -6.0, true);
        }
        plane.x.setKeyframe(s(1), 3.0, true);
        if (hasNext) {
            plane.x.setKeyframe(s(3), 18.0, true);
        }
        plane.deriveChannel(s(1)); // keys y, which has no other keypoint
        EXPECT_EQ(plane.y.getCurveValue(s(1), true), 4.0);
        double const rise = hasPrevious && hasNext ? 4.0 : hasPrevious ? 3.0 : 5.0;
        ASSERT_EQ(timesOf(plane.y), std::vector{s(1)});
        auto const ofX = handlesAt(plane.x, 1);
        auto const ofY = handlesAt(plane.y, 1);
        EXPECT_NEAR(ofX[0].second, -rise, 1e-12);
        EXPECT_NEAR(ofX[1].second, rise, 1e-12);
        EXPECT_TRUE(ofY[0].second == 0.0 && ofY[1].second == 0.0);
    }
}

TEST(KFVectorChannels, SimplifyingKeepsTheKeypointsWhereThePathTurns) {
    for (bool const inRange : {true, false}) {
        RecordingRoot root;
        root.setTimeOffset(s(inRange ? 10 : 0), true); // which changes nothing
        KFChannel2D plane("p", &root, 1, 0);
        for (int t = 0; t < 7; ++t) {
            plane.x.setKeyframe(s(t), t, false);
            if (t != 5) { // which is keyed by the way
                plane.y.setKeyframe(s(t), t < 4 ? t : 6 - t, false);
            }
        }
        plane.y.setKeyframe(s(9), 0.0, false); // x is keyed there, too
        plane.simplify(inRange ? s(0) : s(3), s(4), s(1), 1.0, KFCurve::kSimplifyToExtremes, 0, false);
        // 1 goes, so 2 isn't looked at; 3 is where the path turns.
        std::vector expected{s(0), s(1), s(2), s(3), s(5), s(6), s(9)};
        if (inRange)
            expected.erase(expected.begin() + 1);
        EXPECT_EQ(timesOf(plane.x), expected);
        EXPECT_EQ(timesOf(plane.y), timesOf(plane.x));
    }
}

TEST(KFVectorChannels, SimplifyingLeavesBothComponentsWithTheSameKeypoints) {
    RecordingRoot root;
    root.setTimeOffset(s(10), true);
    KFChannel2D plane("p", &root, 1, 0);
    for (int const t : {0, 3, 6}) {
        plane.x.setKeyframe(s(t), t % 2, false);
    }
    for (int const t : {0, 2, 6}) {
        plane.y.setKeyframe(s(t), t % 4, false);
    }
    plane.simplify(s(0), s(6), s(1), 0.0, 0, 0, false); // none lies in this range of global time
    EXPECT_EQ(timesOf(plane.x), (std::vector{s(0), s(2), s(3), s(6)}));
    EXPECT_EQ(timesOf(plane.y), timesOf(plane.x));
}

TEST(KFVectorChannels, SwitchesReadBackAsTheyWereSet) {
    KFChannelBool3D axes("b", nullptr, 1, 0);
    for (unsigned int bits = 0; bits < 8; ++bits) {
        bool const wanted[] = {(bits & 1) != 0, (bits & 2) != 0, (bits & 4) != 0};
        axes.setValue(s(0), wanted[0], wanted[1], wanted[2]);
        bool x = !wanted[0], y = !wanted[1], z = !wanted[2];
        axes.getValue(s(0), &x, &y, &z, 0.0);
        EXPECT_TRUE(x == wanted[0] && y == wanted[1] && z == wanted[2]) << bits;
        BXVector3<double> vector;
        axes.getValue(s(0), &vector, 0.0);
        EXPECT_EQ(vector, (BXVector3<double>{x ? 1.0 : 0.0, y ? 1.0 : 0.0, z ? 1.0 : 0.0}));
    }
    axes.setValue(s(0), BXVector3<double>{0.25, 0.0, -1.0}); // any but 0 is on
    EXPECT_TRUE(axes.getX(s(0), 0.0) && !axes.getY(s(0), 0.0) && axes.getZ(s(0), 0.0));
    axes.setX(s(0), false), axes.setY(s(0), true), axes.setZ(s(0), false);
    EXPECT_TRUE(!axes.getX(s(0), 0.0) && axes.getY(s(0), 0.0) && !axes.getZ(s(0), 0.0));
    axes.setDefaultValue(true, false, true);
    KFChannelBool3D target("b", nullptr, 1, 0);
    target.copy(&axes, true);
    target.getValue(s(0), nullptr, nullptr, nullptr, 0.0);
    EXPECT_TRUE(target.getY(s(0), 0.0) && target.x.getDefaultValue() == 1.0 &&
                target.y.getDefaultValue() == 0.0);
    target.resetToDefault(true);
    EXPECT_TRUE(target.getX(s(0), 0.0) && !target.getY(s(0), 0.0) && target.getZ(s(0), 0.0));
}

} // namespace
