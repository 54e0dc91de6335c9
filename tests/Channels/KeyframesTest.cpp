// Keyframes of a channel: walks and edits of ranges, gathering and pasting.

#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "tests/Channels/Keypoints.h"
#include "tests/Channels/LinearConverter.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>

namespace {

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

TEST(KFChannelKeyframes, AreFoundAgainWhereConvertingTheirTimesRounds) {
    Fixture f(s(1'234'567'891, 1'000'000'007)); // no timescale holds the sums
    KFChannel& c = f.channel;
    std::vector<Tempus> times;
    for (std::int64_t i = 1; i <= 50; ++i) {
        c.setKeyframe(s(100'003 * i, 262'144), static_cast<double>(i), true);
        times.push_back(c.localToGlobalTime(s(100'003 * i, 262'144)));
    }
    EXPECT_EQ(f.root.keypoints({times.front(), s(60)}, false, 0), times);
    std::vector<Tempus> backward{times.back()};
    for (Tempus t = times.back(); f.root.previousKeypoint(&t, 0);)
        backward.push_back(t);
    EXPECT_TRUE(std::equal(times.rbegin(), times.rend(), backward.begin(), backward.end()));
    for (std::size_t i = 0; i < times.size(); i += 2) {
        EXPECT_TRUE(c.hasKeypointAt(times[i], 0));
        c.addKeypointAt(times[i]);
        c.setValue(times[i], -1.0, true);
        c.deleteKeypointAt(times[i]);
    }
    EXPECT_EQ(c.getNumberOfKeyframes(), 25u);
    EXPECT_EQ(c.getKeyframeMinValue(false), 2.0);
}

TEST(KFChannelKeyframes, AreWalkedToAnEndWhateverTheConverterDoes) {
    for (int const speed : {0, -1}) {
        Fixture f;
        KFChannelDouble forward("forward", &f.root, 3, 0);
        f.key({{1, 1.0}, {2, 2.0}, {3, 3.0}});
        forward.setKeyframe(s(2), 0.0, true);
        LinearConverter converter(s(speed)); // stands still, or runs backward
        f.channel.setTimeConverterDelegate(&converter);
        EXPECT_LE(f.root.keypoints({s(-4), s(9)}, true, 0).size(), 4u);
        EXPECT_LE(f.channel.keypoints({s(1), s(9)}, true, 0).size(), 4u);
        EXPECT_EQ(f.root.offsetKeyframesInRange(s(2), s(2), s(1), s(0), false, false), s(1));
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
        EXPECT_EQ(f.channel.getCurveValue(s(4), true), 4.0);
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
    EXPECT_EQ(keypointsOf(f.channel),
              (std::vector{std::pair{s(5), 5.0}, {s(6), 10.0}, {s(7), -1.0}, {s(8), 20.0}}));
    EXPECT_EQ(output(f.channel, f.channel.getKeyframe(s(6)), false), Handle(0.25, 1.5));
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
    EXPECT_EQ(output(f.channel, f.channel.getKeyframe(s(1)), false), Handle());
    EXPECT_EQ(output(f.channel, f.channel.getKeyframe(s(2)), false), Handle());
    info.value = 6.0;
    f.channel.setKeyframesWithInfo(s(2), {info});
    EXPECT_EQ(output(f.channel, f.channel.getKeyframe(s(2)), true), Handle(12.0, 12.0));
}

TEST(KFChannelKeyframes, ArePastedAtATimeOverWhatIsThereOrInItsPlace) {
    for (int const offset : {0, 10}) {
        Fixture f(s(offset));
        KFChannelDouble other("other", &f.root, 3, 0);
        f.key({{2, 1.0}, {3, 9.0}, {5, 2.0}});
        other.setKeyframe(s(4), 4.0, true);
        KFChannel& c = f.channel;
        KFChannelBase::KeyframesByRef gathered;
        f.root.keyframesWithChannelRef({s(2 + offset), s(3)}, gathered);
        ASSERT_EQ(gathered.size(), 2u);
        EXPECT_EQ(gathered.count("./2"), 1u);

        gathered["./77"] = gathered["./2"]; // no such channel
        c.deleteKeypoints(s(0), s(9));
        ASSERT_FALSE(c.hasKeypoints(0));
        f.root.setKeyframesWithChannelRef(s(2), s(0), gathered, false);
        EXPECT_EQ(timesOf(c), (std::vector<Tempus>{s(2), s(3), s(5)}));
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

/// Two channels in a folder, under a root with an offset.
struct Tree {
    RecordingRoot root;
    KFChannelFolder folder{"folder", &root, 1, 0, 2};
    KFChannelDouble a{"a", &folder, 1, 0}, b{"b", &folder, 2, 0};
    explicit Tree(Tempus const& offset) { root.setTimeOffset(offset, true); }
    KFChannelBase::KeyframesByRef gather() {
        KFChannelBase::KeyframesByRef gathered;
        root.keyframesWithChannelRef({root.localToGlobalTime(s(1)), s(99)}, gathered);
        return gathered;
    }
};

/// All but the times, one after the other.
std::vector<double> attributesOf(KFChannel const& c) {
    std::vector<double> all;
    for (void* const h : c.getKeyframes(false)) {
        double value = 0.0;
        c.getKeyframe(h, nullptr, &value);
        auto const [inU, inV] = input(c, h, true);
        auto const [outU, outV] = output(c, h, true);
        for (double const number : {value, inU, inV, outU, outV, c.getKeyframeBias(h), c.getKeyframeNormal(h),
                                    double(c.getKeyframeFlags(h)), double(c.getKeyframeInterpolation(h)),
                                    double(c.getKeyframeEnabled(h))})
            all.push_back(number);
    }
    return all;
}

void expectKeyframes(KFChannel const& is, KFChannel const& was, Tempus const& later = kTempusZero) {
    ASSERT_EQ(timesOf(is), timesOf(was, later));
    auto const now = attributesOf(is), then = attributesOf(was);
    for (std::size_t i = 0; i < then.size(); ++i)
        EXPECT_NEAR(now[i], then[i], 1e-12) << i;
}

/// Keypoints with attributes at random: the first, at 1 s, may be disabled (of the others only enabled ones
/// are gathered); any may be locked, or have handles that its flags don't allow.
void keyAtRandom(KFChannel& channel, std::mt19937_64& random) {
    std::uniform_real_distribution<double> number(-5.0, 5.0), some(0.0, 1.0);
    std::uint32_t const types[] = {0, 1, 4, 6, 7, 8, 13, 14, 15, 16, 17, 19, 20, 21};
    Tempus t = s(1);
    for (int left = 2 + static_cast<int>(random() % 5); left > 0; --left) {
        channel.setKeyframe(t, number(random), some(random) < 0.5);
        void* const h = channel.getKeyframe(t);
        if (some(random) < 0.7) {
            channel.setKeyframeTangentsBroken(h, true);
            channel.setKeyframeInputTangents(h, -some(random), number(random), true);
            channel.setKeyframeOutputTangents(h, some(random), number(random), true);
        }
        channel.setKeyframeBias(h, 2.0 * some(random));
        channel.setKeyframeNormal(h, number(random));
        channel.setKeyframeInterpolation(h, types[random() % std::size(types)]);
        channel.setKeyframeEnabled(h, t > s(1) || some(random) < 0.8);
        channel.setKeyframeFlags(h, static_cast<unsigned>(random()) & 0x39B);
        t = t + s(1 + static_cast<int>(random() % 90), 24);
    }
}

TEST(KFChannelKeyframes, WhateverIsGatheredIsRestoredByPasting) {
    std::mt19937_64 random(7);
    for (int round = 0; round < 500; ++round) {
        SCOPED_TRACE(round);
        Tree tree(s(round % 3, 25)), target(s(-5));
        keyAtRandom(tree.a, random);
        keyAtRandom(tree.b, random);
        KFChannelDouble const a(tree.a), b(tree.b);
        auto const gathered = tree.gather();
        tree.a.deleteAllKeyframes(s(0));
        tree.b.deleteAllKeyframes(s(0));
        tree.root.setKeyframesWithChannelRef(s(1), s(0), gathered, round % 2 == 0);
        tree.root.setKeyframesWithChannelRef(s(1), s(0), gathered, false); // onto themselves
        expectKeyframes(tree.a, a);
        expectKeyframes(tree.b, b);

        target.root.setKeyframesWithChannelRef(s(3), s(0), gathered, true);
        expectKeyframes(target.a, a, s(2));
        expectKeyframes(target.b, b, s(2));
    }
}

} // namespace
