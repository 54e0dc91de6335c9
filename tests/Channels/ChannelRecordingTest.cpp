// What a channel adds to the takes of its curve: lock, local record, global time, callbacks, the object root.

#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

namespace {

struct TakeRoot : RecordingRoot {
    void didBeginRecording(KFChannelBase* channel, Tempus const& t) override { log(channel, "begin", t); }
    void didEndRecording(KFChannelBase* channel, Tempus const& t) override { log(channel, "end", t); }
    void log(KFChannelBase* channel, char const* what, Tempus const& t) {
        heard += channel->getName().str() + " " + what + " " +
                 std::to_string(static_cast<int>(TempusGetSeconds(t))) + "; ";
    }
    std::string heard;
};

/// A host's log of callbacks, one of which takes itself out.
struct Host {
    std::string heard;
    static void first(KFChannelBase* channel, Tempus const& t, void* context) {
        static_cast<Host*>(context)->note("first", channel, t);
        channel->unregisterRecordingCallback(first, context);
    }
    static void second(KFChannelBase* channel, Tempus const& t, void* context) {
        static_cast<Host*>(context)->note("second", channel, t);
    }
    void note(char const* who, KFChannelBase* channel, Tempus const& t) {
        heard += std::string(who) + " " + channel->getName().str() + " " +
                 std::to_string(static_cast<int>(TempusGetSeconds(t))) + "; ";
    }
};

struct ChannelRecording : testing::Test {
    TakeRoot root;
    KFChannelFolder folder{"Folder", &root, 1, 0, 0};
    KFChannelDouble channel{0.0, "Value", &folder, 7, 0};
    Host host;

    ChannelRecording() {
        root.setTimeOffset(s(10), true); // curve time 0 is global 10
        channel.setKeyframe(s(0), 0.0, true);
        channel.setKeyframe(s(9), 9.0, true);
        root.takeAnnounced();
    }
};

TEST_F(ChannelRecording, RecordsInGlobalTimeThroughFoldersAndTellsTheHost) {
    channel.registerRecordingCallback(Host::first, &host, false);
    folder.beginPlayback(s(2), kKFRecordingScopeJoin, 0, s(1));
    EXPECT_TRUE(channel.isPlaying(nullptr, nullptr, nullptr));
    folder.beginRecording(s(12));
    EXPECT_EQ(root.heard, "Value begin 12; ");
    EXPECT_TRUE(channel.isRecording());
    folder.registerRecordingCallback(Host::first, &host, false);
    folder.registerRecordingCallback(Host::second, &host, true);
    folder.registerRecordingCallback(nullptr, &host, false);
    channel.setValue(s(12), 20.0, false);
    channel.setValue(s(14), 40.0, false);
    // The one from before the take is gone; the first took itself out, so the second moved to its place.
    EXPECT_EQ(host.heard, "first Value 12; second Value 14; ");
    folder.unregisterRecordingCallback(Host::second, &host);
    channel.setValue(s(15), 50.0, false);
    EXPECT_EQ(host.heard, "first Value 12; second Value 14; ");
    EXPECT_EQ(channel.getValueAsDouble(s(13), 0.0), 30.0);
    channel.resetToDefault(false);
    EXPECT_EQ(channel.getValueAsDouble(s(13), 0.0), 30.0) << "a take stands against a reset";
    EXPECT_EQ(channel.getNumberOfKeyframes(), 2U);
    folder.endRecording(s(15));
    EXPECT_EQ(root.heard, "Value begin 12; Value end 15; ");
    folder.endPlayback(s(5));
    EXPECT_EQ(channel.getNumberOfKeyframes(), 5U);
    EXPECT_TRUE(channel.hasKeypointAt(s(14), 0));
}

TEST_F(ChannelRecording, IsNotBegunOnALockedChannelButEndedThere) {
    channel.lock(true, false);
    channel.beginPlayback(s(2), kKFRecordingScopeJoin, 0, s(1));
    channel.beginRecording(s(12));
    EXPECT_FALSE(channel.isPlaying(nullptr, nullptr, nullptr));
    EXPECT_EQ(root.heard, "");
    channel.lock(false, false);
    channel.beginPlayback(s(2), kKFRecordingScopeTouch, 0, s(1));
    channel.beginRecording(s(12));
    channel.registerRecordingCallback(Host::second, &host, false);
    channel.lock(true, false);
    channel.setValue(s(13), 5.0, false);
    EXPECT_EQ(host.heard, "");
    channel.updateCurrentRecordingTime(s(13));
    channel.endRecording(s(14));
    channel.endPlayback(s(4));
    EXPECT_EQ(channel.getNumberOfKeyframes(), 7U);
    EXPECT_EQ(channel.getValueAsDouble(s(14), 0.0), 2.0);
}

TEST_F(ChannelRecording, StaysOutOfTheSharedRecordWithoutKeypoints) {
    KFChannelDouble plain(0.0, "Plain", &root, 8, 0);
    KFChannelDouble other(0.0, "Other", &root, 9, 0);
    plain.endRecording(s(12));
    plain.endPlayback(s(12));
    plain.updateCurrentRecordingTime(s(12));
    EXPECT_EQ(plain.getImpl(), other.getImpl());
    plain.beginPlayback(s(2), kKFRecordingScopeJoin, 0, s(1));
    plain.beginRecording(s(12));
    EXPECT_FALSE(plain.isRecording());
    plain.setKeyframeIfRecording(s(12));
    EXPECT_EQ(plain.getNumberOfKeyframes(), 0U);
    EXPECT_NE(plain.getImpl(), other.getImpl());
}

} // namespace
