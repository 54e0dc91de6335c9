// The object root: its copies, and its extent in time.

#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <memory>

namespace {

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
        {{s(5), s(20)}, 2.0},
        {{s(0), s(1, 3)}, 2.0 / 60.0},
        {{s(0), kTempusPositiveInfinity}, 2.0 / 60.0},
        {{s(0), s(10)}, 2.0 / 60.0}, // nor was there an end
    };
    for (auto const& row : cases) {
        root.setTimeExtent(row.extent, false);
        EXPECT_DOUBLE_EQ(faded.length, row.length);
        EXPECT_EQ(root.getTimeExtentForChannel(&faded).duration, row.extent.duration);
    }
    EXPECT_EQ(root.takeAnnounced().size(), 5U);
    root.setTimeExtent({s(1), s(6)}, true);
    EXPECT_TRUE(root.takeAnnounced().empty());
    root.adjustToFrameDuration(s(1, 24));
    EXPECT_EQ(root.getGlobalTimeRange().start, s(1, 24));
    EXPECT_EQ(root.getGlobalTimeRange().duration, s(1, 4));
}

TEST(KFChannelObjectRootBase, CopiesItsTimesAndAssignsItsName) {
    RecordingRoot source("Source", 5);
    source.setTimeOffset(s(3), true);
    source.setTimeExtent({s(1), s(2)}, true);
    source.setWritesTimeRange(false);
    source.allocateDescendants();

    std::unique_ptr<KFChannelBase> const clone(source.clone());
    auto& cloned = static_cast<KFChannelObjectRootBase&>(*clone);
    EXPECT_EQ(clone->getChannelRootBase(), &cloned);
    EXPECT_FALSE(cloned.writesTimeRange());
    cloned.allocateDescendants();
    EXPECT_TRUE(cloned == source);

    RecordingRoot target("Target", 6);
    target.allocateDescendants();
    target.copy(&source, true);
    EXPECT_TRUE(target.compare(&source));
    target.setTimeExtent({s(2, 2), s(4, 2)}, true);
    EXPECT_TRUE(target.compare(&source));
    target.setTimeExtent({s(1), s(3)}, true);
    EXPECT_FALSE(target.compare(&source));
    EXPECT_FALSE(source.compare(nullptr));

    RecordingRoot assigned("Assigned", 7);
    assigned.assign(&source);
    EXPECT_EQ(assigned.getName(), BXString("Source"));
    EXPECT_EQ(*assigned.getInternalName(), BXString("Source"));
    EXPECT_EQ(assigned.getTimeOffset(), kTempusZero);
    source.setInternalName("inner");
    assigned.assign(&source);
    EXPECT_EQ(*assigned.getInternalName(), BXString("inner"));
    EXPECT_TRUE(assigned.takeAnnounced().empty());
}

} // namespace
