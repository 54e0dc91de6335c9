// The object root: what it answers where the host says nothing, its copies, and its extent in time.

#include "lumenkey/splines/KFCoreGlobals.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <memory>

namespace {

Tempus s(std::int64_t value, std::int32_t timescale = 1) { return TempusMake(value, timescale); }

class Faded : public KFChannelBase {
public:
    explicit Faded(KFChannelFolder* parent) : KFChannelBase(nullptr, "faded", parent, 2, 0) {}
    bool hasFadeHandles() const override { return true; }
    void scaleFadeHandles(double factor) override { length *= factor; }
    double length = 1.0;
};

TEST(KFChannelObjectRootBase, KeepsTheShareOfFadesInItsExtent) {
    RecordingRoot root;
    Faded faded(&root);
    struct {
        BXTimeRange extent;
        double length;
    } const cases[] = {
        {{s(0), s(10)}, 1.0}, // the first extent: there was none to have a share of
        {{s(5), s(20)}, 2.0},          {{s(0), s(20)}, 2.0},
        {{s(0), s(1, 3)}, 2.0 / 60.0}, {{s(0), kTempusPositiveInfinity}, 2.0 / 60.0},
    };
    for (auto const& row : cases) {
        root.setTimeExtent(row.extent, false);
        EXPECT_DOUBLE_EQ(faded.length, row.length);
        EXPECT_EQ(root.getTimeExtentForChannel(&faded).duration, row.extent.duration);
    }
    EXPECT_EQ(root.takeAnnounced().size(), 5U);
    root.setTimeExtent({s(1), s(6)}, true);
    root.setTimeOffset(s(2), true);
    EXPECT_TRUE(root.takeAnnounced().empty());
    root.adjustToFrameDuration(s(1, 24));
    EXPECT_EQ(root.getGlobalTimeRange().start, s(1, 24));
    EXPECT_EQ(root.getGlobalTimeRange().duration, s(1, 4));
    root.setTimeOffset(s(3), false);
    EXPECT_EQ(root.takeAnnounced().size(), 1U);
}

TEST(KFChannelObjectRootBase, AnswersForTheHost) {
    KFChannelObjectRootBase root("Object", nullptr, 1, 0, 0);
    EXPECT_EQ(root.getFlags() & 0x3040, 0x3040U);
    EXPECT_EQ(root.getFrameDuration(), s(1, 30));
    EXPECT_EQ(root.getDefaultParameterColorSpaceID(), 3U);
    EXPECT_TRUE(root.wasChannelModified(&root, nullptr));
    EXPECT_FALSE(root.isObjectSelected());
    root.setFlag(kChannelFlagObjectSelected, false);
    EXPECT_TRUE(root.isObjectSelected());
    KFCoreGlobals::getInstance().currentTime = s(7);
    EXPECT_EQ(root.getCurrentTime(false), s(7));
    KFCoreGlobals::getInstance().currentTime = kTempusZero;

    RecordingRoot host;
    KFChannelBase leaf(nullptr, "leaf", &host, 2, 0);
    host.frameDuration = s(1, 25);
    EXPECT_EQ(leaf.getFrameDuration(), s(1, 25));
}

TEST(KFChannelObjectRootBase, CopiesItsTimesAndAssignsItsName) {
    RecordingRoot source("Source", 5);
    source.setTimeOffset(s(3), true);
    source.setTimeExtent({s(1), s(2)}, true);
    source.setWritesTimeRange(false);
    source.allocateDescendants();

    std::unique_ptr<KFChannelBase> const clone(source.clone());
    auto& cloned = static_cast<KFChannelObjectRootBase&>(*clone);
    EXPECT_EQ(clone->getParent(), nullptr);
    EXPECT_EQ(clone->getChannelRootBase(), &cloned);
    EXPECT_FALSE(cloned.writesTimeRange());
    cloned.allocateDescendants();
    EXPECT_TRUE(cloned == source);

    RecordingRoot target("Target", 6);
    target.allocateDescendants();
    EXPECT_FALSE(target.compare(&source));
    target.copy(&source, true);
    EXPECT_TRUE(target.compare(&source));
    for (BXTimeRange const other : {BXTimeRange{s(0), s(2)}, BXTimeRange{s(1), s(3)}}) {
        target.setTimeExtent(other, true);
        EXPECT_FALSE(target.compare(&source));
    }
    target.setTimeExtent({s(2, 2), s(4, 2)}, true);
    EXPECT_TRUE(target.compare(&source));
    target.setTimeOffset(s(4), true);
    EXPECT_FALSE(target.compare(&source));
    KFChannelFolder folder(nullptr, "Source", nullptr, 5, kChannelFlagNameUnset, 1);
    EXPECT_FALSE(source.compare(&folder));
    EXPECT_FALSE(source.compare(nullptr));

    RecordingRoot assigned("Assigned", 7);
    assigned.assign(&source);
    EXPECT_EQ(assigned.getID(), 7U);
    EXPECT_EQ(assigned.getName(), BXString("Source"));
    EXPECT_EQ(*assigned.getInternalName(), BXString("Source"));
    EXPECT_EQ(assigned.getTimeOffset(), kTempusZero);
    source.setInternalName("inner");
    assigned.assign(&source);
    EXPECT_EQ(*assigned.getInternalName(), BXString("inner"));
    EXPECT_TRUE(assigned.takeAnnounced().empty());
}

} // namespace
