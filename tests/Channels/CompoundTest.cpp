// The compound: linked edits, values by index, one keypoint for all, copies.

#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "tests/Channels/Animating.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <memory>

namespace {

struct Point : KFCompoundChannel {
    explicit Point(KFChannelFolder* parent = nullptr, bool linked = false)
        : KFCompoundChannel(nullptr, "c", parent, 5, 0, false, 3) {
        if (linked) {
            setFoldFlag(kFoldFlagLinked);
        }
    }
    bool isLinked() const { return testFoldFlag(kFoldFlagLinked); }
    /// Which components have a keypoint at `t`.
    std::string keyed(Tempus const& t) const {
        std::string names;
        for (KFChannel const* channel : {&x, &y, &z}) {
            names += channel->hasKeypointAt(t, 0) ? channel->getName().str() : "";
        }
        return names;
    }
    KFChannelDouble x{"x", this, 1, 0}, y{"y", this, 2, 0}, z{"z", this, 3, 0};
};

TEST(KFCompoundChannel, EditsLinkedComponentsTogether) {
    for (auto const& [linked, force] : {std::pair{false, false}, {true, false}, {false, true}}) {
        bool const all = linked || force;
        Point point(nullptr, linked);
        auto const expectKeyed = [&point, all, was = point.getFoldFlags()](Tempus const& t,
                                                                           char const* names) {
            EXPECT_EQ(point.keyed(t), names);
            EXPECT_EQ(point.isLinked(), all); // also afterwards, also by force
            point.setFoldFlags(was);
        };
        point.compoundAddKeypointAt(&point.y, s(1), force);
        expectKeyed(s(1), all ? "xyz" : "y");
        EXPECT_EQ(point.compoundMoveKeypointTo(&point.y, s(1), s(2), false, false, force), s(2));
        expectKeyed(s(2), all ? "xyz" : "y");
        point.compoundDeleteKeypointAt(&point.y, s(2), force);
        expectKeyed(s(2), "");
        bool const wasSpline = point.y.isSpline();
        point.compoundSetIsSpline(&point.y, !wasSpline, force);
        EXPECT_TRUE(point.y.isSpline() != wasSpline && (point.x.isSpline() != wasSpline) == all);
        expectKeyed(s(1), "");
        point.y.setInitialValue(3.0, true), point.z.setInitialValue(3.0, true);
        point.compoundReset(&point.y, force);
        EXPECT_TRUE(point.y.getInitialValue() == 0.0 && point.z.getInitialValue() == (all ? 0.0 : 3.0));
        expectKeyed(s(2), "");
    }
    Point point;
    point.compoundAddKeypointAt(nullptr, s(1), false);
    EXPECT_EQ(point.compoundMoveKeypointTo(nullptr, s(1), s(2), false, false, true), s(2));
}

TEST(KFCompoundChannel, TakesOverTheEditsOfLinkedComponents) {
    Animating const animating;
    RecordingRoot root;
    Point point(&root, true);
    auto const announced = [&root] {
        std::string names;
        for (auto const& [channel, kind] : root.takeAnnounced()) {
            names += channel->getName().str();
        }
        return names;
    };
    announced();
    point.willBeModified(kModifyState);
    EXPECT_EQ(announced(), "cxyz");
    // The link goes, each component edits (a component announces its compound first), the link comes back.
    point.x.addKeypointAt(s(2));
    EXPECT_EQ(announced(), "cxyzcxcyczcxyz");
    EXPECT_EQ(point.keyed(s(2)), "xyz");
    point.y.moveKeypointTo(s(2), s(3), false, false);
    EXPECT_EQ(announced(), "cxyzcycxczcxyz"); // the moved one first
    EXPECT_EQ(point.keyed(s(3)), "xyz");
    point.y.setValue(s(1), 5.0, false);
    EXPECT_EQ(point.keyed(s(1)), "xyz");
    EXPECT_TRUE(point.y.getValueAsDouble(s(1), 0.0) == 5.0 && point.x.getValueAsDouble(s(1), 0.0) == 0.0);
    point.z.deleteKeypointAt(s(3));
    EXPECT_EQ(point.keyed(s(3)), "");
}

TEST(KFCompoundChannel, SetsAndRemovesValuesByIndex) {
    Animating const animating;
    for (bool const linked : {false, true}) {
        Point point(nullptr, linked);
        std::string const one = linked ? "xyz" : "y";
        point.setValue(1U, s(1), 5.0);
        EXPECT_EQ(point.y.getValueAsDouble(s(1), 0.0), 5.0);
        EXPECT_EQ(point.keyed(s(1)), one);
        point.setValue(1U, s(2)), point.setValue(&point.y, s(3), 6.0);
        EXPECT_EQ(point.keyed(s(2)) + point.keyed(s(3)), one + one);
        point.setValue(9U, s(4), 1.0); // behind the end
        EXPECT_FALSE(point.hasKeypointAt(s(4), 0) || point.removeValue(9U, s(1)));
        EXPECT_TRUE(point.removeValue(1U, s(1)) && !point.removeValue(1U, s(1)) && point.keyed(s(1)).empty());
        EXPECT_TRUE(point.removeValue(s(2)) && !point.removeValue(s(2)));
        point.removeAllValues(s(0), 1U);
        EXPECT_FALSE(point.hasKeypoints(0));
        EXPECT_EQ(point.isLinked(), linked);
    }
    // A compound among the components answers for its own.
    Point outer, inner(&outer);
    inner.x.addKeypointAt(s(1));
    inner.x.addKeypointAt(s(2));
    EXPECT_TRUE(outer.removeValue(3U, s(1)) && inner.keyed(s(1)).empty());
    outer.removeAllValues(s(0));
    EXPECT_FALSE(inner.hasKeypoints(0));
}

TEST(KFCompoundChannel, CountsAsOneKeypoint) {
    Point point;
    EXPECT_TRUE(!point.hasOnlyOneKeypointAt(s(1)) && point.numberOfKeypointsAt(s(1)) == 0);
    point.x.addKeypointAt(s(1));
    point.y.addKeypointAt(s(1));
    EXPECT_TRUE(point.hasOnlyOneKeypointAt(s(1)) && point.numberOfKeypointsAt(s(1)) == 1);
}

TEST(KFCompoundChannel, CopiesTheLinkButNeverClearsIt) {
    Point linked(nullptr, true), plain;
    EXPECT_FALSE(linked == plain || plain == linked);
    std::unique_ptr<KFChannelBase> const copy(linked.clone());
    ASSERT_TRUE(copy->isCompoundChannel());
    auto const& compound = static_cast<KFCompoundChannel&>(*copy);
    EXPECT_EQ(compound.getFoldFlags(), kFoldFlagLinked | kFoldFlagsCompoundDefault);
    EXPECT_EQ(compound.getDescendants(), nullptr);
    linked.copy(&plain, true);
    EXPECT_TRUE(linked.isLinked());
    plain.copy(&linked, true);
    EXPECT_TRUE(plain.isLinked() && plain == linked);
    KFChannelFolder folder("c", nullptr, 5, 0, 0);
    EXPECT_FALSE(plain.compare(&folder) || plain.compare(nullptr));
    EXPECT_EQ(KFCompoundChannel(nullptr, "short", 1, 0).getFoldFlags(), 0U);
}

} // namespace
