// The two records of a channel: sharing them, departing from them, returning to them, and who frees what.

#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/curves/KFTypedCurves.h"
#include "tests/Channels/AddingNode.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <tuple>

namespace {

KFChannelImpl* shared() { return KFChannelDouble::createKFChannelDoubleImpl(); }
KFChannelInfo* sharedInfo() { return KFChannelDouble::createKFChannelDoubleInfo(); }

struct Double : KFChannelDouble {
    Double() : KFChannelDouble("", nullptr, 1, 0) {}
};

TEST(KFChannelRecords, DepartAtTheFirstDifferenceAndReturnOnReset) {
    std::tuple<char const*, void (*)(KFChannel&), bool> const edits[] = {
        {"value", [](KFChannel& c) { c.setValue(kTempusZero, 5.0, false); }, true},
        {"keypoint", [](KFChannel& c) { c.addKeypointAt(s(1)); }, true},
        {"fade", [](KFChannel& c) { c.setFadeInOffset(s(1), false); }, true},
        {"default", [](KFChannel& c) { c.setDefaultValue(5.0); }, false},
        {"limit", [](KFChannel& c) { c.setMin(-1.0); }, false},
        {"constant", [](KFChannel& c) { c.setKeyframable(false, false); }, false},
        {"node", [](KFChannel& c) { c.appendCurveProcessingNode(new AddingNode(1.0)); }, false},
    };
    for (auto const& [name, edit, returns] : edits) {
        SCOPED_TRACE(name);
        Double channel;
        edit(channel);
        EXPECT_FALSE(channel.getImpl()->isShared());
        EXPECT_EQ(Double().getInitialValue(), 0.0);
        channel.resetToDefault(false);
        EXPECT_EQ(channel.getImpl() == shared(), returns);
    }
    Double untouched; // what changes nothing allocates nothing
    untouched.setInitialValue(5e-8, false);
    untouched.setDefaultValue(-5e-8);
    untouched.setKeyframable(true, false);
    untouched.setFadeOutCurve(0);
    EXPECT_EQ(untouched.getImpl(), shared());
}

TEST(KFChannelRecords, FollowCopiesAndAssignments) {
    Double local;
    local.setValue(kTempusZero, 5.0, false);
    local.setSliderMax(7.0);
    Double target;
    target.copy(&local, false);
    EXPECT_TRUE(target.compare(&local));
    EXPECT_EQ(target.getSliderMax(), 7.0);
    Double const atClassState;
    target.copy(&atClassState, false);
    EXPECT_EQ(target.getImpl(), shared());
    target.assign(&local);
    EXPECT_EQ(target.getInitialValue(), 5.0);
    EXPECT_EQ(target.getInfo(), sharedInfo());
    KFChannelImpl const* const record = target.getImpl();
    target.setOwnerChannel(&target);
    target.assign(&atClassState);
    EXPECT_EQ(target.getImpl(), record) << "a curve that knows its owner is written in place";
    EXPECT_EQ(target.getInitialValue(), 0.0);
    local.setName("local", false);
    KFChannelDouble const blank(local);
    EXPECT_EQ(blank.getID(), local.getID());
    EXPECT_TRUE(blank.getName().empty());
    EXPECT_TRUE(blank.compare(&local));
    EXPECT_FALSE(blank.compare(&atClassState));
}

TEST(KFChannelRecords, AreReplacedAndFreedByTheirOwner) {
    auto* const record = new KFChannelImpl(new KFCurveDouble(2.0), 2.0, 1, false);
    std::unique_ptr<KFChannelBase> clone;
    {
        KFChannelDouble given("", nullptr, 1, 0, record, new KFChannelInfo(*sharedInfo()));
        given.setValue(kTempusZero, 3.0, false);
        given.resetToDefault(false);
        given.resetLocalChannelInfo();
        EXPECT_EQ(given.getInitialValue(), 2.0);
        clone.reset(given.clone());
        Double const atClassState;
        given.copy(&atClassState, false);
        given.setSliderMin(1.0);
        given.resetToDefault(false);
        EXPECT_EQ(given.getImpl(), shared());
    }
    clone->resetToDefault(false);
    EXPECT_EQ(dynamic_cast<KFChannel&>(*clone).getInitialValue(), 2.0);

    KFChannelInfo own(0.0, 1.0, 0.1, 0.01, 2.0, "px");
    Double channel;
    channel.setInfo(channel.getInfo());
    EXPECT_FALSE(channel.getInfo()->shared) << "also from the record in use";
    channel.replaceInfo(&own); // shared: now the class's record of this channel
    channel.setSuffix("em");
    EXPECT_EQ(channel.getScale(), 2.0);
    EXPECT_EQ(own.suffix, BXString("px"));
    channel.setSuffix("px");
    channel.resetLocalChannelInfo();
    EXPECT_EQ(channel.getInfo(), &own);
}

TEST(KFChannelRecords, TakeAndGiveCurves) {
    RecordingRoot root;
    root.frameDuration = TempusMake(1, 24);
    KFChannelDouble channel("", &root, 2, 0);
    auto* const prototype = new KFCurveDouble(4.0);
    channel.lock(true, false);
    channel.setCurveInterface(prototype);
    EXPECT_EQ(channel.releaseCurveInterface(), nullptr);
    channel.lock(false, false);
    channel.setCurveInterface(channel.getCurveInterface());
    EXPECT_EQ(channel.getImpl(), shared());
    channel.setCurveInterface(prototype);
    EXPECT_EQ(channel.getCurveInterface()->getFrameDuration(), TempusMake(1, 24));
    channel.resetToDefault(false);
    EXPECT_FALSE(channel.getImpl()->isShared());

    std::unique_ptr<KFCurveInterface> const released(channel.releaseCurveInterface());
    EXPECT_EQ(dynamic_cast<KFCurve&>(*released).getOwnerChannel(), nullptr);
    EXPECT_EQ(channel.getValueAsDouble(kTempusZero, 0.0), 0.0);
    channel.setCurveInterface(new KFCurveDouble(6.0));
    EXPECT_EQ(channel.getInitialValue(), 6.0);
}

} // namespace
