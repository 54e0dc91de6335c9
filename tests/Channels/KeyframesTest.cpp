// Keyframes of a channel: the setters and reads by handle, edits of ranges, gathering and pasting.

#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "lumenkey/splines/KFVertex.h"
#include "tests/Channels/AddingNode.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <functional>
#include <tuple>

namespace {

Tempus s(std::int64_t value, std::int32_t timescale = 1) { return TempusMake(value, timescale); }

/// A channel with a root that may have an offset; keypoints in curve time.
struct Fixture {
    RecordingRoot root;
    KFChannelDouble channel{"channel", &root, 2, 0};
    explicit Fixture(Tempus const& offset = kTempusZero) { root.setTimeOffset(offset, true); }
    void key(std::vector<std::pair<int, double>> const& keypoints) {
        for (auto const& [time, value] : keypoints)
            channel.setKeyframe(s(time), value, true);
        root.takeAnnounced();
    }
};

/// What there is to each keypoint.
std::vector<std::tuple<Tempus, double>> keypointsOf(KFChannel const& channel) {
    std::vector<std::tuple<Tempus, double>> all;
    for (void* const handle : channel.getKeyframes(false)) {
        Tempus time;
        double value = 0.0;
        channel.getKeyframe(handle, &time, &value);
        all.emplace_back(time, value);
    }
    return all;
}

std::vector<Tempus> timesOf(KFChannel const& channel) {
    std::vector<Tempus> times;
    for (auto const& keypoint : keypointsOf(channel))
        times.push_back(std::get<0>(keypoint));
    return times;
}

double valueAt(KFChannel const& c, Tempus const& t) {
    double value = -1.0;
    c.getKeyframe(c.getKeyframe(t), nullptr, &value);
    return value;
}

using Pair = std::pair<double, double>;

Pair input(KFChannel const& c, void* h, bool handles) {
    Pair p;
    c.getKeyframeInputTangents(h, &p.first, &p.second, handles);
    return p;
}

Pair output(KFChannel const& c, void* h, bool handles) {
    Pair p;
    c.getKeyframeOutputTangents(h, &p.first, &p.second, handles);
    return p;
}

/// An edit of a channel with keypoints 10, 20 and 40 at 1, 2 and 4 s, by the handle of the second; and its effect.
struct Edit {
    char const* name;
    unsigned int announcements;
    std::function<void(KFChannel&, void*)> run;
    std::function<bool(KFChannel&, void*)> worked;
    Edit(char const* n, unsigned int count, decltype(run) r, decltype(worked) w)
        : name(n), announcements(count), run(std::move(r)), worked(std::move(w)) {}
};

#define EDIT(announcements, edit, effect)                                                                    \
    Edit(                                                                                                    \
        #edit, announcements, [](KFChannel& c, void* h) { (void)h, c.edit; },                                \
        [](KFChannel& c, void* h) { return (void)h, (void)c, (effect); })

std::vector<Edit> const kEdits = {
    EDIT(0, setKeyframe(s(3), 7.0, true),
         valueAt(c, s(3)) == 7.0 && input(c, c.getKeyframe(s(3)), false) != Pair()),
    EDIT(0, setKeyframe(s(3), 7.0, false),
         valueAt(c, s(3)) == 7.0 && input(c, c.getKeyframe(s(3)), false) == Pair()),
    EDIT(0, setKeyframe(s(3)), valueAt(c, s(3)) > 20.0),
    EDIT(0, setKeyframeIfRecording(s(3)), valueAt(c, s(3)) > 20.0),
    EDIT(0, setKeyframe(h, s(3), 7.0), valueAt(c, s(3)) == 7.0 && c.getNumberOfKeyframes() == 3),
    EDIT(0, appendKeyframe(s(6), 7.0, true), valueAt(c, s(6)) == 7.0),
    EDIT(0, cloneKeyframe(h, s(3)), valueAt(c, s(3)) == 20.0 && valueAt(c, s(2)) == 20.0),
    EDIT(0, setKeyframeValue(h, 7.0), valueAt(c, s(2)) == 7.0 && valueAt(c, s(1)) == 10.0),
    EDIT(0, setKeyframesValue(7.0),
         c.getKeyframeMinValue(false) == 7.0 && c.getKeyframeMaxValue(false) == 7.0),
    EDIT(0, setKeyframeFlags(h, 0x19), c.getKeyframeFlags(h) == 0x19),
    EDIT(0, deleteAllKeyframes(s(2)), !c.hasKeypoints(0) && c.getInitialValue() == 20.0),
    EDIT(0, moveKeyframe(h, s(3), true, false), valueAt(c, s(3)) == 20.0 && c.getNumberOfKeyframes() == 3),
    EDIT(0, offsetKeyframe(h, s(3)), valueAt(c, s(3)) == 20.0 && c.getNumberOfKeyframes() == 3),
    EDIT(0, linearTimeWarp(2.0, s(0)), c.getKeyframeMaxTime() > s(4)),
    EDIT(0, reverseKeyframes(c.getKeyframe(s(1)), c.getKeyframe(s(4))), valueAt(c, s(1)) == 40.0),
    EDIT(0, smoothKeyframe(h, false), output(c, h, true) == Pair() && c.isSmoothKeyframe(h)),
    EDIT(0, setKeyframeInputTangents(h, -12.0, 6.0, true), input(c, h, false) == Pair(-1.0, 0.5)),
    EDIT(0, setKeyframeOutputTangents(h, 1.0, 0.5, false), output(c, h, true) == Pair(12.0, 6.0)),
    EDIT(0, setKeyframeBias(h, 0.25), c.getKeyframeBias(h) == 0.25),
    EDIT(0, setKeyframeNormal(h, 0.5), c.getKeyframeNormal(h) == 0.5),
    EDIT(0, setKeyframeNormal(s(2), 0.5), c.getKeyframeNormal(s(2)) == 0.5),
    EDIT(0, setKeyframeEnabled(h, false), !c.getKeyframeEnabled(h) && c.getKeyframes(true).size() == 2),
    EDIT(0, setKeyframeSelected(h, true), (c.getKeyframeFlags(h) & kKFVertexFlagSelected) != 0),
    EDIT(0, setKeyframeLocked(h, true), c.getKeyframeLocked(h)),
    EDIT(0, setKeyframeTangentsBroken(h, true), c.getKeyframeTangentsBroken(h)),
    EDIT(0, setKeyframeTangentsScaled(h, true), c.getKeyframeTangentsScaled(h)),
    EDIT(0, setKeyframeTangentsFlat(h), output(c, h, false).second == 0.0),
    EDIT(1, deleteKeyframe(h), c.getKeyframe(s(2)) == nullptr && c.getNumberOfKeyframes() == 2),
    EDIT(1, setKeyframeInterpolation(h, kKFInterpolationBezier),
         c.getKeyframeInterpolation(h) == kKFInterpolationBezier && !c.isSmoothKeyframe(h)),
    EDIT(1, setCurveSegmentSpeed(h, 3), c.getCurveSegmentSpeed(h) == 3),
};

TEST(KFChannelKeyframes, SettersCheckTheLockMakeTheRecordLocalAndAnnounceOnlyWhereSaid) {
    for (Tempus const& offset : {kTempusZero, s(10)}) {
        for (Edit const& edit : kEdits) {
            SCOPED_TRACE(edit.name);
            Fixture shared(offset);
            shared.channel.lock(true, false);
            edit.run(shared.channel, nullptr);
            EXPECT_TRUE(shared.channel.getImpl()->isShared());
            shared.channel.lock(false, false);
            edit.run(shared.channel, nullptr);
            EXPECT_FALSE(shared.channel.getImpl()->isShared());

            Fixture f(offset);
            f.key({{1, 10.0}, {2, 20.0}, {4, 40.0}});
            void* const handle = f.channel.getKeyframe(s(2));
            KFChannelDouble const before(f.channel);
            f.channel.lock(true, false);
            f.root.takeAnnounced();
            edit.run(f.channel, handle);
            EXPECT_TRUE(f.channel.compare(&before));
            EXPECT_FALSE(edit.worked(f.channel, handle));
            EXPECT_TRUE(f.root.takeAnnounced().empty());
            f.channel.lock(false, false);
            f.root.takeAnnounced();
            edit.run(f.channel, handle);
            EXPECT_TRUE(edit.worked(f.channel, handle));
            EXPECT_EQ(f.root.takeAnnounced().size(), edit.announcements);
        }
    }
}

TEST(KFChannelKeyframes, AreReadInCurveTime) {
    Fixture f(s(10));
    f.key({{1, 10.0}, {2, 20.0}, {4, 40.0}});
    KFChannel& c = f.channel;
    void* const middle = c.getKeyframe(s(2));
    Tempus time;
    double value = 0.0;
    EXPECT_TRUE(c.getNextKeyframe(s(2), &time, &value) && time == s(4) && value == 40.0);
    EXPECT_TRUE(c.getPreviousKeyframe(s(2), &time, &value) && time == s(1) && value == 10.0);
    EXPECT_TRUE(c.getFirstKeyframe(&time, nullptr) && time == s(1));
    EXPECT_TRUE(c.getLastKeyframe(&time, nullptr) && time == s(4));
    EXPECT_EQ(c.getNextEnabledKeyframe(s(1)), middle);
    EXPECT_EQ(c.getPreviousEnabledKeyframe(c.getLastEnabledKeyframe()), middle);
    EXPECT_EQ(c.getNextEnabledKeyframe(c.getLastEnabledKeyframe()), nullptr);
    EXPECT_EQ(c.getKeyframe(s(3)), nullptr);
    EXPECT_FALSE(c.getKeyframe(nullptr, &time, &value));
    EXPECT_EQ(c.getKeyframeMinTime(), s(1));
    EXPECT_EQ(c.getKeyframeTimeRange(), s(3));
    EXPECT_EQ(c.getKeyframeParametricRange(), s(3));
    std::vector<double> values;
    unsigned int count = 2;
    EXPECT_TRUE(c.getSamples(s(1), s(3), count, static_cast<std::vector<Tempus>*>(nullptr), &values));
    EXPECT_EQ(values, (std::vector<double>{10.0, 40.0}));
    auto* const first = new AddingNode(1.0);
    auto* const second = new AddingNode(2.0);
    c.appendCurveProcessingNode(first);
    c.appendCurveProcessingNode(second);
    EXPECT_EQ(c.getPreviousProcessingNode(second), first);
    EXPECT_EQ(c.getPreviousProcessingNode(first), nullptr);
    c.setInterpolation(kKFInterpolationLinear);
    EXPECT_TRUE(c.hasInterpolation(kKFInterpolationLinear));
    EXPECT_EQ(c.getInterpolation(), kKFInterpolationLinear);
    c.purgeKeyframes();
    EXPECT_EQ(c.getNumberOfKeyframes(), 3u);
}

TEST(KFChannelKeyframes, RangesAreOfGlobalTime) {
    for (int const offset : {0, 10}) {
        Fixture f(s(offset));
        f.key({{1, 5.0}, {2, -3.0}, {4, 8.0}, {6, 100.0}});
        auto const at = [&](int time) { return s(time + offset); };
        EXPECT_EQ(f.channel.getKeyframeMinValueInRange(at(1), at(4)), -3.0);
        EXPECT_EQ(f.channel.getKeyframeMaxValueInRange(at(1), at(4)), 8.0);
        EXPECT_EQ(f.channel.getKeyframeMinValueInRange(at(3), at(3)), f.channel.getCurveValue(s(3), true));
        EXPECT_EQ(f.channel.getKeyframeMaxValueInRange(at(7), at(9)), 100.0);
        f.channel.offsetKeyframesValuesInRange(at(2), at(5), at(2), 7.0);
        EXPECT_EQ(keypointsOf(f.channel), (std::vector<std::tuple<Tempus, double>>{
                                              {s(1), 5.0}, {s(2), 7.0}, {s(4), 18.0}, {s(6), 100.0}}));
        KFChannelBase::KeyframesByChannel gathered;
        f.root.keyframesWithChannels({at(2), s(2)}, gathered);
        ASSERT_EQ(gathered.size(), 1u);
        ASSERT_EQ(gathered[0].second.size(), 2u);
        EXPECT_EQ(gathered[0].second[1].time, s(4));
        f.root.keyframesWithChannels({at(7), s(2)}, gathered);
        EXPECT_EQ(gathered.size(), 1u);

        using Times = std::vector<Tempus>;
        EXPECT_EQ(f.root.keypoints({at(2), s(2)}, false, 0), (Times{at(2), at(4)}));
        EXPECT_EQ(f.root.keypoints({at(2), s(2)}, true, 0), (Times{at(2), at(1), at(2), at(4), at(6)}));
        EXPECT_EQ(f.root.visibleKeypoints({at(7), s(2)}, false, 0), Times{});
        EXPECT_EQ(f.channel.visibleKeypoints({at(2), s(2)}, true, 0), (Times{at(1), at(2), at(4), at(6)}));
    }
}

TEST(KFChannelKeyframes, MoveInARangeAsFarAsTheNeighboursAllow) {
    for (int const offset : {0, 10}) {
        Fixture f(s(offset));
        f.key({{1, 1.0}, {3, 3.0}, {4, 4.0}, {8, 8.0}});
        auto const move = [&](int from, int to, int by, bool constrain) {
            return f.root.offsetKeyframesInRange(s(from + offset), s(to + offset), s(by), s(1), false,
                                                 constrain);
        };
        using Times = std::vector<Tempus>;
        EXPECT_EQ(move(3, 5, 10, true), s(3));
        EXPECT_EQ(timesOf(f.channel), (Times{s(1), s(6), s(7), s(8)}));
        EXPECT_EQ(move(5, 7, -10, true), s(-4));
        EXPECT_EQ(timesOf(f.channel), (Times{s(1), s(2), s(3), s(8)}));
        EXPECT_EQ(move(2, 3, 1, false), s(1)) << "the later one moves first";
        EXPECT_EQ(timesOf(f.channel), (Times{s(1), s(3), s(4), s(8)}));
        EXPECT_EQ(valueAt(f.channel, s(4)), 4.0);
        EXPECT_EQ(move(3, 4, 0, true), kTempusZero);
        EXPECT_EQ(move(5, 7, 2, true), kTempusZero);
        EXPECT_EQ(timesOf(f.channel), (Times{s(1), s(3), s(4), s(8)}));
    }
}

TEST(KFChannelKeyframes, ArePastedFromAChannelOfAnotherScale) {
    Fixture source;
    source.channel.setScale(2.0);
    source.key({{1, 10.0}, {2, 20.0}, {4, 40.0}});
    void* const h = source.channel.getKeyframe(s(2));
    source.channel.setKeyframeOutputTangents(h, 0.25, 3.0, false);
    source.channel.setKeyframeInterpolation(source.channel.getKeyframe(s(4)), kKFInterpolationLinear);

    Fixture f(s(10));
    f.channel.setScale(4.0);
    f.key({{7, -1.0}});
    f.channel.setKeyframeLocked(f.channel.getKeyframe(s(7)), true);
    f.channel.copyKeyframesFromChannel(s(15), &source.channel); // curve time 5
    EXPECT_TRUE(f.root.takeAnnounced().empty());
    f.channel.copyKeyframesFromChannel(s(0), nullptr);
    f.channel.copyKeyframesFromChannel(s(0), &source.root);
    EXPECT_EQ(keypointsOf(f.channel), (std::vector<std::tuple<Tempus, double>>{
                                          {s(5), 5.0}, {s(6), 10.0}, {s(7), -1.0}, {s(8), 20.0}}));
    EXPECT_EQ(output(f.channel, f.channel.getKeyframe(s(6)), false), Pair(0.25, 1.5));
    EXPECT_EQ(f.channel.getKeyframeInterpolation(f.channel.getKeyframe(s(8))), kKFInterpolationLinear);
    EXPECT_EQ(keypointsOf(source.channel).size(), 3u);

    Fixture constant;
    constant.channel.setScale(8.0);
    constant.channel.setInitialValue(3.0, true);
    f.channel.copyKeyframesFromChannel(s(0), &constant.channel);
    EXPECT_FALSE(f.channel.hasKeypoints(0));
    EXPECT_EQ(f.channel.getInitialValue(), 6.0);
}

TEST(KFChannelKeyframes, ASinglePastedOneLeavesALevelCurveLevel) {
    Fixture f;
    f.key({{1, 5.0}, {3, 5.0}});
    f.channel.setKeyframeOutputTangents(f.channel.getKeyframe(s(1)), 0.1, 2.0, false);
    _KFKeyframeInfo info;
    info.time = s(7);
    info.value = 5.0;
    info.interpolation = kKFInterpolationBezier;
    info.outputTangentX = info.outputTangentY = 12.0;
    f.channel.setKeyframesWithInfo(s(2), {info});
    EXPECT_EQ(output(f.channel, f.channel.getKeyframe(s(1)), false), Pair());
    EXPECT_EQ(output(f.channel, f.channel.getKeyframe(s(2)), false), Pair());
    info.value = 6.0;
    f.channel.setKeyframesWithInfo(s(2), {info});
    EXPECT_EQ(output(f.channel, f.channel.getKeyframe(s(2)), true), Pair(12.0, 12.0));
}

TEST(KFChannelKeyframes, GatheredAndPastedAgainKeepAllAttributes) {
    for (int const offset : {0, 10}) {
        Fixture f(s(offset));
        KFChannelDouble other("other", &f.root, 3, 0);
        f.key({{2, 1.0}, {3, 9.0}, {5, 2.0}});
        other.setKeyframe(s(4), 4.0, true);
        KFChannel& c = f.channel;
        for (void* const h : c.getKeyframes(false)) {
            c.setKeyframeTangentsBroken(h, true);
            c.setKeyframeInputTangents(h, -3.0, 6.0, true);
            c.setKeyframeOutputTangents(h, 6.0, 1.5, true);
            c.setKeyframeBias(h, 0.25);
            c.setKeyframeNormal(h, 0.5);
            c.setKeyframeSelected(h, true);
        }
        c.setKeyframeInterpolation(c.getKeyframe(s(3)), kKFInterpolationEase);
        KFChannelDouble const before(f.channel);
        KFChannelBase::KeyframesByRef gathered;
        f.root.keyframesWithChannelRef({s(2 + offset), s(3)}, gathered);
        ASSERT_EQ(gathered.size(), 2u);
        EXPECT_EQ(gathered.count("./2"), 1u);

        gathered["./77"] = gathered["./2"]; // no such channel
        c.deleteKeypoints(s(0), s(9));
        ASSERT_FALSE(c.hasKeypoints(0));
        f.root.setKeyframesWithChannelRef(s(2), s(0), gathered, false);
        EXPECT_TRUE(c.compare(&before));
        EXPECT_EQ(timesOf(other), std::vector<Tempus>{s(4)});

        c.setKeyframe(s(13), 7.0, true);
        other.setKeyframe(s(13), 7.0, true);
        f.root.setKeyframesWithChannelRef(s(12), s(0), gathered, false);
        EXPECT_EQ(timesOf(other), (std::vector<Tempus>{s(4), s(13), s(14)}));
        f.root.setKeyframesWithChannelRef(s(12), s(0), gathered, true);
        EXPECT_EQ(timesOf(other), (std::vector<Tempus>{s(4), s(14)}));
        EXPECT_EQ(timesOf(c), (std::vector<Tempus>{s(2), s(3), s(5), s(12), s(13), s(15)}));
    }
}

} // namespace
