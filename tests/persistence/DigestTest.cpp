// Digests: equal for equal state, another for each change of it, and blind for what isn't state.

#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/foundation/BXHashWriteStream.h"
#include "tests/curves/CountedMemory.h"
#include "tests/persistence/RandomTree.h"

#include <gtest/gtest.h>

#include <functional>
#include <limits>
#include <set>

namespace {

using Digest = std::array<std::uint8_t, 16>;
Tempus s(double t) { return KFChronoForChannelSeconds(t, 600); }

struct Subject {
    KFChannelObjectRootBase root{"Root", nullptr, 1, 0, 0};
    KFChannelFolder folder{"Folder", &root, 2, 0, 0};
    KFChannelDouble channel{0.0, "Value", &folder, 3, 0};
    KFChannelDouble plain{0.0, "Plain", &folder, 4, 0};
    KFCurve* curve = channel.createLocalChannelImplementation()->getCurve();
    void* key = nullptr;

    Subject() {
        for (int i = 0; i < 3; ++i)
            curve->appendKeypointNoTangents(s(i), i, true);
        curve->getKeypointHandle(s(1), &key);
        curve->setKeypointInterpolation(key, kKFInterpolationBezier, true);
        channel.setFadeInOffset(s(1), false);
    }
    Digest at(Tempus const& t) {
        BXHashWriteStream stream;
        root.calcHashForState(stream, t);
        return stream.getHash();
    }
};

using Change = std::function<void(Subject&)>;

} // namespace

TEST(Digest, TellsEachChangeOfState) {
    Change const changes[] = {
        [](Subject&) {},
        [](Subject& x) { x.root.setName("Other", true); },
        [](Subject& x) { x.root.setID(8); },
        [](Subject& x) { x.root.setTimeOffset(s(1), true); },
        [](Subject& x) {
            x.root.setTimeExtent({s(1), s(0)}, true);
        },
        [](Subject& x) {
            x.root.setTimeExtent({s(0), s(1)}, true);
        },
        [](Subject& x) { x.root.enable(false, true); },
        [](Subject& x) { x.root.lock(true, false); },
        [](Subject& x) { x.root.setFlag(kChannelFlagSolo, true); },
        [](Subject& x) { x.folder.setFoldFlag(kFoldFlagLinked); },
        [](Subject& x) { x.folder.setFlag(kChannelFlagHidden, true); },
        [](Subject& x) { x.channel.setFlag(kChannelFlagLocked, true); },
        [](Subject& x) { x.channel.setFlag(kChannelFlagBehaviorsOff, true); },
        [](Subject& x) { x.channel.setFlag(kChannelFlagKeepOnFolderReset, true); },
        [](Subject& x) { x.channel.setFadeInOffset(s(2), false); },
        // Documents keep the terms of a time.
        [](Subject& x) { x.channel.setFadeInOffset(TempusMake(2, 1), false); },
        [](Subject& x) { x.channel.setFadeOutOffset(s(1), false); },
        [](Subject& x) { x.channel.setFadeInCurve(1); },
        [](Subject& x) { x.channel.setFadeOutCurve(1); },
        [](Subject& x) { x.plain.setInitialValue(1, true); },
        // Seen through limits, which the short form hasn't.
        [](Subject& x) {
            x.plain.setInitialValue(1, true);
            x.plain.createLocalChannelImplementation()->getCurve()->setAbsoluteMaxValueV(0.5);
        },
        [](Subject& x) { x.curve->setCurveInitialValue(1); },
        [](Subject& x) { x.curve->setCurveType(0); },
        [](Subject& x) { x.curve->setCurveParametric(true); },
        [](Subject& x) { x.curve->setRoundingInUSpace(false); },
        [](Subject& x) { x.curve->setRetimingExtrapolation(true); },
        [](Subject& x) { x.curve->setCurveExtrapolation(1, 0); },
        [](Subject& x) { x.curve->setCurveExtrapolation(1, 1); },
        [](Subject& x) { x.curve->setAbsoluteMinValueV(-10); },
        [](Subject& x) { x.curve->setAbsoluteMaxValueV(10); },
        [](Subject& x) { x.curve->closeCurve(); },
        [](Subject& x) { x.curve->appendKeypointNoTangents(s(3), 0, true); },
        [](Subject& x) { x.curve->moveKeypoint(x.key, s(1.5), true, false, false); },
        [](Subject& x) { x.curve->setKeypointValue(x.key, 1.0000000000000002, true); },
        [](Subject& x) { x.curve->setKeypointInterpolation(x.key, 1, true); },
        [](Subject& x) { x.curve->setKeypointFlags(x.key, 16, true); },
        [](Subject& x) { x.curve->enableKeypoint(x.key, false, true); },
        [](Subject& x) { x.curve->setKeypointBiasLinear(x.key, 0.5); },
        [](Subject& x) { x.curve->setKeypointNormal(x.key, 0.5, true); },
        [](Subject& x) { x.curve->setKeypointInputNormalizedTangents(x.key, -0.1, 0, true); },
        [](Subject& x) { x.curve->setKeypointInputNormalizedTangents(x.key, 0, 0.1, true); },
        [](Subject& x) { x.curve->setKeypointOutputNormalizedTangents(x.key, 0.1, 0, true); },
        [](Subject& x) { x.curve->setKeypointOutputNormalizedTangents(x.key, 0, 0.1, true); },
    };
    std::set<Digest> digests;
    for (std::size_t i = 0; i < std::size(changes); ++i) {
        Subject changed;
        changes[i](changed);
        EXPECT_TRUE(digests.insert(changed.root.getHash()).second) << "change " << i;
        Subject again;
        changes[i](again);
        EXPECT_EQ(again.root.getHash(), changed.root.getHash()) << "change " << i;
    }
}

TEST(Digest, TellsEachBitOfState) {
    // Not the class's, nor what leaves a channel out.
    constexpr KFChannelFlags kLeft = kChannelClassFlags | kChannelFlagExcludedFromHash | kChannelFlagNotSaved;
    std::set<Digest> digests{Subject().root.getHash()};
    for (KFChannelFlags bit = 1; bit != 0; bit <<= 1) {
        Subject changed;
        changed.plain.setFlags(changed.plain.getFlags() ^ (bit & ~kLeft));
        EXPECT_EQ(digests.insert(changed.root.getHash()).second, (bit & ~kLeft & ~kChannelNonStateFlags) != 0)
            << std::hex << bit;
    }
}

TEST(Digest, IsBlindForWhatIsNotState) {
    Change const changes[] = {
        [](Subject& x) { x.channel.setFlag(kChannelFlagObjectSelected, true); },
        [](Subject& x) { x.folder.setNameUnset(true); },
        [](Subject& x) { x.folder.setFoldFlag(kFoldFlagModifiedIsEnabled); },
        [](Subject& x) { x.plain.setDefaultValue(5); },
        [](Subject& x) { x.curve->setCurveDefaultValue(5); },
        [](Subject& x) { x.channel.setSliderMax(5); },
    };
    Digest const before = Subject().root.getHash();
    for (std::size_t i = 0; i < std::size(changes); ++i) {
        Subject changed;
        changes[i](changed);
        EXPECT_EQ(changed.root.getHash(), before) << "change " << i;
    }
}

TEST(Digest, IsBlindForLimitsThatDocumentsDoNotKeep) {
    constexpr double infinite = std::numeric_limits<double>::infinity();
    KFChannelBool boolean(false, "Boolean", nullptr, 1, 0);
    KFChannelDouble endless(0.0, "Endless", nullptr, 1, 0);
    std::tuple<KFChannel*, double, double> const cases[] = {{&boolean, 1, 0}, {&endless, infinite, infinite}};
    for (auto const& [channel, value, most] : cases) {
        channel->setInitialValue(value, false);
        Digest const before = channel->getHash();
        channel->createLocalChannelImplementation()->getCurve()->setAbsoluteMaxValueV(most);
        EXPECT_EQ(channel->getHash(), before) << value;
    }
}

TEST(Digest, LeavesOutNodesThatAreExcluded) {
    Subject plainly;
    plainly.channel.setFlag(kChannelFlagExcludedFromHash, true);
    Digest const excluded = plainly.root.getHash();
    plainly.curve->setKeypointValue(plainly.key, 77, true);
    plainly.channel.setID(50);
    EXPECT_EQ(plainly.root.getHash(), excluded);
    plainly.channel.setFlag(kChannelFlagNotSaved, true);
    EXPECT_EQ(plainly.root.getHash(), excluded) << "no trace at all";
    plainly.folder.setFlag(kChannelFlagExcludedFromHash, true);
    Digest const withoutID = plainly.root.getHash();
    EXPECT_NE(withoutID, excluded) << "of a folder only the ID stays out";
    plainly.folder.setID(60);
    EXPECT_EQ(plainly.root.getHash(), withoutID);

    Subject unsaved;
    unsaved.channel.setFlag(kChannelFlagNotSaved, true);
    Digest const leftOut = unsaved.root.getHash();
    EXPECT_NE(leftOut, Subject().root.getHash());
    unsaved.curve->setKeypointValue(unsaved.key, 77, true);
    EXPECT_EQ(unsaved.root.getHash(), leftOut);
    unsaved.channel.setFlag(kChannelFlagSaveWhenAtDefault, true);
    EXPECT_NE(unsaved.root.getHash(), leftOut) << "a digest takes in what would be saved at its default";
}

TEST(Digest, AsksForTheSameMemoryWhateverTheTree) {
    auto const allocationsFor = [](int keypoints) {
        KFChannelObjectRootBase root("Root", nullptr, 1, 0, 0);
        KFChannelDouble one(0.0, "One", &root, 1, 0);
        KFChannelDouble other(0.0, "Other", &root, 2, 0);
        for (KFChannelDouble* const channel : {&one, &other}) {
            for (int i = 0; i < keypoints; ++i)
                channel->appendKeyframe(s(i), i, true);
        }
        std::size_t const before = allocationsOfThisThread();
        root.getHash();
        return allocationsOfThisThread() - before;
    };
    EXPECT_EQ(allocationsFor(2000), allocationsFor(0));
}

TEST(Digest, OfOneMomentKnowsWhatIsSeenOnly) {
    Subject subject;
    subject.channel.setFadeInOffset(kTempusZero, false);
    subject.curve->setKeypointValue(subject.key, 0, true);
    EXPECT_EQ(subject.at(s(0)), subject.at(s(1))) << "the same value, whatever the keypoints";
    EXPECT_NE(subject.at(s(0)), subject.at(s(2)));
    Digest const before = subject.at(s(0));
    subject.channel.setName("Other", true);
    subject.channel.setID(99);
    subject.channel.setFlag(kChannelFlagHidden, true);
    EXPECT_EQ(subject.at(s(0)), before);
    subject.folder.enable(false, true);
    EXPECT_NE(subject.at(s(0)), before);

    auto const ofRoot = [](Subject& x) {
        BXHashWriteStream stream;
        x.root.calcHashForStateSelfOnly(stream, kTempusZero);
        return stream.getHash();
    };
    std::set<Digest> digests{ofRoot(subject)};
    subject.root.setTimeOffset(s(1), true);
    EXPECT_TRUE(digests.insert(ofRoot(subject)).second);
    subject.root.setFoldFlag(kFoldFlagLinked);
    EXPECT_TRUE(digests.insert(ofRoot(subject)).second);
    subject.root.setFlag(kChannelFlagSolo, true);
    EXPECT_TRUE(digests.insert(ofRoot(subject)).second);
    subject.root.setFlag(kChannelFlagHidden, true);
    EXPECT_FALSE(digests.insert(ofRoot(subject)).second);
}
