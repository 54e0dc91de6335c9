// The compound: linked edits, values by index, one keypoint for all, copies.

#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/splines/KFCoreGlobals.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <memory>

namespace {

Tempus s(std::int64_t value, std::int32_t timescale = 1) { return TempusMake(value, timescale); }

/// While one exists, a value that is set is keyed, also on a curve without keypoints.
struct Animating {
    Animating() { KFCoreGlobals::getInstance().animate = true; }
    ~Animating() { KFCoreGlobals::getInstance().animate = false; }
};

struct Point : KFCompoundChannel {
    explicit Point(KFChannelFolder* parent = nullptr, bool linked = false, char const* name = "c")
        : KFCompoundChannel(nullptr, name, parent, 5, 0, false, 3) {
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

std::string namesOf(std::vector<std::pair<KFChannelBase*, unsigned>> const& announced) {
    std::string names;
    for (auto const& [channel, kind] : announced) {
        names += channel->getName().str();
    }
    return names;
}

TEST(KFCompoundChannel, EditsLinkedComponentsTogether) {
    struct {
        bool linked, force;
        char const* reached;
    } const cases[] = {{false, false, "y"}, {true, false, "xyz"}, {false, true, "xyz"}};
    for (auto const& [linked, force, reached] : cases) {
        Point point(nullptr, linked);
        point.compoundAddKeypointAt(&point.y, s(1), force);
        EXPECT_EQ(point.keyed(s(1)), reached);
        EXPECT_EQ(point.isLinked(), linked || force);
        point.setFoldFlags(linked ? kFoldFlagLinked : 0);

        // The answer is the target of a linked move, wherever the keypoint came to stand.
        EXPECT_EQ(point.compoundMoveKeypointTo(&point.y, s(1), s(2), false, false, force), s(2));
        EXPECT_EQ(point.keyed(s(2)), reached);
        EXPECT_EQ(point.keyed(s(1)), "");
        EXPECT_EQ(point.isLinked(), linked || force);
        point.setFoldFlags(linked ? kFoldFlagLinked : 0);

        point.compoundDeleteKeypointAt(&point.y, s(2), force);
        EXPECT_EQ(point.keyed(s(2)), "");
        EXPECT_EQ(point.isLinked(), linked || force);
        point.setFoldFlags(linked ? kFoldFlagLinked : 0);

        bool const wasSpline = point.y.isSpline();
        point.compoundSetIsSpline(&point.y, !wasSpline, force);
        EXPECT_NE(point.y.isSpline(), wasSpline);
        EXPECT_EQ(point.x.isSpline() != wasSpline, linked || force);
        point.setFoldFlags(linked ? kFoldFlagLinked : 0);

        for (KFChannel* channel : {&point.x, &point.y, &point.z}) {
            channel->setInitialValue(3.0, true);
        }
        point.compoundReset(&point.y, force);
        EXPECT_EQ(point.y.getInitialValue(), 0.0);
        EXPECT_EQ(point.z.getInitialValue(), linked || force ? 0.0 : 3.0);
    }
    Point point;
    point.compoundAddKeypointAt(nullptr, s(1), false);
    point.compoundMoveKeypointTo(nullptr, s(1), s(2), false, false, true);
    EXPECT_EQ(point.keyed(s(1)), "");
}

TEST(KFCompoundChannel, TakesOverTheEditsOfLinkedComponents) {
    Animating const animating;
    Point point(nullptr, true);
    point.y.setValue(s(1), 5.0, false);
    EXPECT_EQ(point.keyed(s(1)), "xyz");
    EXPECT_EQ(point.y.getValueAsDouble(s(1), 0.0), 5.0);
    EXPECT_EQ(point.x.getValueAsDouble(s(1), 0.0), 0.0);
    point.x.addKeypointAt(s(2));
    EXPECT_EQ(point.keyed(s(2)), "xyz");
    point.z.moveKeypointTo(s(2), s(3), false, false);
    EXPECT_EQ(point.keyed(s(3)), "xyz");
    point.z.deleteKeypointAt(s(3));
    EXPECT_EQ(point.keyed(s(3)), "");
    EXPECT_EQ(point.keyed(s(1)), "xyz");
    EXPECT_TRUE(point.isLinked());
}

TEST(KFCompoundChannel, AnnouncesItselfAroundALinkedEdit) {
    RecordingRoot root;
    Point point(&root, true);
    root.takeAnnounced();
    point.willBeModified(kModifyState);
    EXPECT_EQ(namesOf(root.takeAnnounced()), "cxyz");
    point.x.addKeypointAt(s(1));
    // The link goes, each component edits (a component announces its compound first), the link comes back.
    EXPECT_EQ(namesOf(root.takeAnnounced()), "cxyz"
                                             "cxcycz"
                                             "cxyz");
    point.compoundMoveKeypointTo(&point.y, s(1), s(2), false, false, false);
    EXPECT_EQ(namesOf(root.takeAnnounced()), "cxyz"
                                             "cycxcz"
                                             "cxyz"); // the moved one first
}

TEST(KFCompoundChannel, SetsAndRemovesValuesByIndex) {
    Animating const animating;
    for (bool const linked : {false, true}) {
        Point point(nullptr, linked);
        std::string const one = linked ? "xyz" : "y";
        point.setValue(1U, s(1), 5.0);
        EXPECT_EQ(point.y.getValueAsDouble(s(1), 0.0), 5.0);
        EXPECT_EQ(point.keyed(s(1)), one);
        point.setValue(1U, s(2));
        EXPECT_EQ(point.keyed(s(2)), one);
        point.setValue(&point.y, s(3), 6.0);
        EXPECT_EQ(point.keyed(s(3)), one);
        point.setValue(9U, s(4), 1.0); // behind the end
        EXPECT_EQ(point.keyed(s(4)), "");
        EXPECT_FALSE(point.removeValue(9U, s(1)));
        EXPECT_TRUE(point.removeValue(1U, s(1)));
        EXPECT_EQ(point.keyed(s(1)), "");
        EXPECT_FALSE(point.removeValue(1U, s(1)));
        EXPECT_TRUE(point.removeValue(s(2)));
        EXPECT_FALSE(point.removeValue(s(2)));
        point.removeAllValues(s(0), 1U);
        EXPECT_FALSE(point.hasKeypoints(0));
        EXPECT_EQ(point.isLinked(), linked);
    }
    // A compound among the components answers for its own.
    Point outer;
    Point inner(&outer, false, "inner");
    inner.x.addKeypointAt(s(1));
    inner.x.addKeypointAt(s(2));
    EXPECT_TRUE(outer.removeValue(3U, s(1)));
    EXPECT_EQ(inner.keyed(s(1)), "");
    outer.removeAllValues(s(0));
    EXPECT_FALSE(inner.hasKeypoints(0));
}

TEST(KFCompoundChannel, CountsAsOneKeypoint) {
    Point point;
    EXPECT_FALSE(point.hasOnlyOneKeypointAt(s(1)));
    EXPECT_EQ(point.numberOfKeypointsAt(s(1)), 0U);
    point.x.addKeypointAt(s(1));
    point.y.addKeypointAt(s(1));
    EXPECT_EQ(point.numberOfKeypointsAt(s(1)), 1U);
    EXPECT_TRUE(point.hasOnlyOneKeypointAt(s(1)));
}

TEST(KFCompoundChannel, CopiesTheLinkButNeverClearsIt) {
    Point linked(nullptr, true), plain;
    EXPECT_FALSE(linked == plain || plain == linked);
    std::unique_ptr<KFChannelBase> const copy(linked.clone());
    EXPECT_TRUE(copy->isCompoundChannel());
    EXPECT_EQ(static_cast<KFCompoundChannel&>(*copy).getFoldFlags(),
              kFoldFlagLinked | kFoldFlagsCompoundDefault);
    EXPECT_EQ(static_cast<KFCompoundChannel&>(*copy).getDescendants(), nullptr);
    linked.copy(&plain, true);
    EXPECT_TRUE(linked.isLinked());
    plain.copy(&linked, true);
    EXPECT_TRUE(plain.isLinked());
    EXPECT_TRUE(plain == linked);
    KFChannelFolder folder("c", nullptr, 5, 0, 0);
    EXPECT_FALSE(plain.compare(&folder) || plain.compare(nullptr));
    KFCompoundChannel bare(nullptr, "short", 1, 0);
    EXPECT_EQ(bare.getFoldFlags(), 0U);
    EXPECT_EQ(bare.getDescendants(), nullptr);
}

} // namespace
