// What each operation on a channel's keyframes decides before it reaches the curve: in which time base its
// times are, whether a linked compound takes it over, whether and when the host hears of it, and whether the
// record becomes local.

#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFVectorChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFSplineState.h"
#include "lumenkey/splines/KFVertex.h"
#include "tests/Channels/AddingNode.h"
#include "tests/Channels/Animating.h"
#include "tests/Channels/Keypoints.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <functional>

namespace {

// The columns.
enum Time { kNone, kCurve, kGlobal };
enum Announced { kSilent, kFirst, kOnceLocal }; // kFirst: before the record is local
// Exceptions.
constexpr unsigned kIgnoresLock = 1;
constexpr unsigned kKeysTheEmpty = 2; // a curve without keypoints, while nothing is animated
constexpr unsigned kTakenOver = 4;    // by a linked compound
constexpr unsigned kFollow = 8;       // then the fellows go where the channel's keypoint came to stand
constexpr unsigned kStaysShared = 16; // the record, which else becomes local

double const kSeven = 7.0;

/// What an operation works on: a channel with keypoints 10, 20 and 40 at 1, 2 and 4 s, the handle of the
/// second, a node of its curve, another channel, and times in the operation's base.
struct Subject {
    KFChannel& c;
    void* h;
    KFCurveNode* node;
    KFChannel* other;
    Tempus shift;
    mutable Tempus last{};
    Tempus at(double t) const { return s(t) + shift; }
    Tempus const* time(double t) const { return &(last = at(t)); }
};

struct Edit {
    char const* name;
    std::function<void(Subject const&)> run;
    Time time;
    Announced announced;
    /// What it comes to, in curve time; null where nothing shows.
    std::function<bool(Subject const&)> worked;
    unsigned exceptions = 0;
};

// Reads for effects, in curve time ------------------------------------------------------------------------------

double valueAt(KFChannel const& c, double t) {
    double value = -1.0;
    c.getKeyframe(c.getKeyframe(s(t)), nullptr, &value);
    return value;
}

std::vector<_KFKeyframeInfo> oneKeyframe() {
    _KFKeyframeInfo info;
    info.time = s(5);
    info.value = 7.0;
    return {info};
}

#define WITH_SUBJECT(x)                                                                                      \
    [[maybe_unused]] KFChannel& c = x.c;                                                                     \
    [[maybe_unused]] void* const h = x.h;                                                                    \
    [[maybe_unused]] KFCurveNode* const node = x.node;                                                       \
    [[maybe_unused]] KFChannel* const other = x.other;                                                       \
    [[maybe_unused]] auto const at = [&x](double t) { return x.at(t); };
#define RUN(call) #call, [](Subject const& x) { WITH_SUBJECT(x)(void)(c.call); }
#define EFFECT(expression) [](Subject const& x) -> bool { WITH_SUBJECT(x) return expression; }

std::vector<Edit> const kEdits = {
    // operation, time, announced, effect, exceptions
    {RUN(setKeyframe(at(3), 7.0, true)), kCurve, kSilent,
     EFFECT(valueAt(c, 3) == 7.0 && input(c, c.getKeyframe(s(3)), false) != Handle()), kKeysTheEmpty},
    {RUN(setKeyframe(at(3), 7.0, false)), kCurve, kSilent,
     EFFECT(valueAt(c, 3) == 7.0 && input(c, c.getKeyframe(s(3)), false) == Handle()), kKeysTheEmpty},
    {RUN(setKeyframe(at(3))), kCurve, kSilent, EFFECT(valueAt(c, 3) > 20.0), kKeysTheEmpty},
    {RUN(setKeyframeIfRecording(at(3))), kCurve, kSilent, EFFECT(valueAt(c, 3) > 20.0)},
    {RUN(setKeyframe(h, at(3), 7.0)), kCurve, kSilent,
     EFFECT(valueAt(c, 3) == 7.0 && c.getNumberOfKeyframes() == 3)},
    {RUN(appendKeyframe(at(6), 7.0, true)), kCurve, kSilent, EFFECT(valueAt(c, 6) == 7.0), kKeysTheEmpty},
    {RUN(appendKeyframes(1, x.time(6), &kSeven, true)), kCurve, kSilent, EFFECT(valueAt(c, 6) == 7.0),
     kKeysTheEmpty},
    {RUN(cloneKeyframe(h, at(3))), kCurve, kSilent, EFFECT(valueAt(c, 3) == 20.0 && valueAt(c, 2) == 20.0)},
    {RUN(setKeyframeValue(h, 7.0)), kNone, kSilent, EFFECT(valueAt(c, 2) == 7.0 && valueAt(c, 1) == 10.0)},
    {RUN(setKeyframesValue(7.0)), kNone, kSilent,
     EFFECT(c.getKeyframeMinValue(false) == 7.0 && c.getKeyframeMaxValue(false) == 7.0)},
    {RUN(setKeyframeFlags(h, 0x19)), kNone, kSilent, EFFECT(c.getKeyframeFlags(h) == 0x19)},
    {RUN(deleteAllKeyframes(at(2))), kCurve, kSilent,
     EFFECT(!c.hasKeypoints(0) && c.getInitialValue() == 20.0)},
    {RUN(moveKeyframe(h, at(3), true, false)), kCurve, kSilent,
     EFFECT(valueAt(c, 3) == 20.0 && c.getNumberOfKeyframes() == 3)},
    {RUN(offsetKeyframe(h, at(3))), kCurve, kSilent,
     EFFECT(valueAt(c, 3) == 20.0 && c.getNumberOfKeyframes() == 3)},
    {RUN(generateKeyframesFromDynamicCurve(at(2), nullptr)), kNone, kSilent, nullptr},
    {RUN(willLoadKeyframes(false, 0)), kNone, kSilent, nullptr},
    {RUN(linearTimeWarp(2.0, at(1))), kCurve, kSilent, EFFECT(c.getKeyframeMaxTime() > s(4))},
    {RUN(reverseKeyframes(c.getKeyframe(s(1)), c.getKeyframe(s(4)))), kNone, kSilent,
     EFFECT(valueAt(c, 1) == 40.0)},
    {RUN(reduceKeyframes(at(1), at(4), s(1), 1.0, 1.0, 4, 0)), kCurve, kSilent,
     EFFECT(c.getNumberOfKeyframes() == 2)},
    {RUN(smoothKeyframes(at(1), at(4), s(1))), kCurve, kSilent, EFFECT(c.getKeyframe(s(3)) != nullptr)},
    {RUN(deriveKeyframe(h)), kNone, kSilent,
     EFFECT((c.getKeyframeFlags(h) & kKFVertexFlagHandlesEdited) == 0)},
    {RUN(smoothKeyframe(h, false)), kNone, kSilent,
     EFFECT(output(c, h, true) == Handle() && c.isSmoothKeyframe(h))},
    {RUN(setKeyframeInputTangents(h, -12.0, 6.0, true)), kNone, kSilent,
     EFFECT(input(c, h, false) == Handle(-1.0, 0.5))},
    {RUN(setKeyframeInputTangents(h, -1.0, 0.5, false)), kNone, kSilent,
     EFFECT(input(c, h, true) == Handle(-12.0, 6.0))},
    {RUN(setKeyframeOutputTangents(h, 12.0, 6.0, true)), kNone, kSilent,
     EFFECT(output(c, h, false) == Handle(1.0, 0.5))},
    {RUN(setKeyframeOutputTangents(h, 1.0, 0.5, false)), kNone, kSilent,
     EFFECT(output(c, h, true) == Handle(12.0, 6.0))},
    {RUN(setKeyframeBias(h, 0.25)), kNone, kSilent, EFFECT(c.getKeyframeBias(h) == 0.25)},
    {RUN(setKeyframeNormal(h, 0.5)), kNone, kSilent, EFFECT(c.getKeyframeNormal(h) == 0.5)},
    {RUN(setKeyframeNormal(at(2), 0.5)), kCurve, kSilent, EFFECT(c.getKeyframeNormal(h) == 0.5)},
    {RUN(setKeyframeEnabled(h, false)), kNone, kSilent,
     EFFECT(!c.getKeyframeEnabled(h) && c.getKeyframes(true).size() == 2)},
    {RUN(setKeyframeSelected(h, true)), kNone, kSilent,
     EFFECT((c.getKeyframeFlags(h) & kKFVertexFlagSelected) != 0)},
    {RUN(setKeyframeLocked(h, true)), kNone, kSilent, EFFECT(c.getKeyframeLocked(h))},
    {RUN(setKeyframeTangentsBroken(h, true)), kNone, kSilent, EFFECT(c.getKeyframeTangentsBroken(h))},
    {RUN(setKeyframeTangentsScaled(h, true)), kNone, kSilent, EFFECT(c.getKeyframeTangentsScaled(h))},
    {RUN(setKeyframeTangentsFlat(h)), kNone, kSilent, EFFECT(output(c, h, false).second == 0.0)},
    {RUN(deleteKeyframe(h)), kNone, kOnceLocal,
     EFFECT(c.getKeyframe(s(2)) == nullptr && c.getNumberOfKeyframes() == 2)},
    {RUN(setKeyframeInterpolation(h, 1)), kNone, kOnceLocal,
     EFFECT(c.getKeyframeInterpolation(h) == 1 && c.isSmoothKeyframe(h))},
    {RUN(setCurveSegmentSpeed(h, 3)), kNone, kFirst, EFFECT(c.getCurveSegmentSpeed(h) == 3)},
    {RUN(offsetCurveSegmentSpeed(h, 2.0)), kNone, kFirst, nullptr},
    {RUN(purgeKeyframes()), kNone, kSilent, nullptr, kIgnoresLock | kStaysShared},
    {RUN(appendCurveProcessingNode(new AddingNode(1.0))), kNone, kSilent,
     EFFECT(c.getNumberOfCurveProcessingNodes() == 2), kIgnoresLock},
    {RUN(insertCurveProcessingNode(new AddingNode(1.0), nullptr)), kNone, kSilent,
     EFFECT(c.getNumberOfCurveProcessingNodes() == 2), kIgnoresLock},
    {RUN(deleteCurveProcessingNode(node)), kNone, kSilent, EFFECT(c.getNumberOfCurveProcessingNodes() == 0),
     kIgnoresLock},
    {RUN(removeCurveProcessingNode(node) ? delete node : void()), kNone, kSilent,
     EFFECT(c.getNumberOfCurveProcessingNodes() == 0), kIgnoresLock},
    // The family in global time, which a folder passes on; and what works on the curve as a whole.
    {RUN(addKeypointAt(at(3))), kGlobal, kFirst, EFFECT(valueAt(c, 3) > 20.0), kKeysTheEmpty | kTakenOver},
    {RUN(deleteKeypointAt(at(2))), kGlobal, kFirst, EFFECT(c.getNumberOfKeyframes() == 2), kTakenOver},
    {RUN(moveKeypointTo(at(2), at(3), false, false)), kGlobal, kFirst,
     EFFECT(valueAt(c, 3) == 20.0 && c.getNumberOfKeyframes() == 3), kFollow | kTakenOver},
    {RUN(offsetKeyframesInRange(at(2), at(4), s(1), s(0), false, false)), kGlobal, kFirst,
     EFFECT(valueAt(c, 3) == 20.0 && valueAt(c, 5) == 40.0), kFollow | kTakenOver},
    {RUN(deleteKeypoints(at(1), at(2))), kCurve, kOnceLocal, EFFECT(c.getNumberOfKeyframes() == 2)},
    {RUN(retimeKeypoints(2.0, at(1))), kCurve, kFirst, EFFECT(c.getKeyframeMaxTime() > s(4))},
    {RUN(adjustToFrameDuration(s(2))), kNone, kSilent, EFFECT(valueAt(c, 4) == 20.0), kIgnoresLock},
    {RUN(setInterpolation(4)), kNone, kFirst, EFFECT(c.getInterpolation() == 4)},
    {RUN(setExtrapolation(2, 1)), kNone, kFirst, EFFECT(c.getExtrapolation(1) == 2)},
    {RUN(closeParametricCurve()), kNone, kSilent, EFFECT(c.isParametricCurveClosed())},
    {RUN(setUseRetimingExtrapolation(true)), kNone, kSilent, EFFECT(c.useRetimingExtrapolation())},
    {RUN(resetCurve()), kNone, kSilent, EFFECT(!c.hasKeypoints(0))},
    {RUN(generateKeys(0, 1)), kNone, kFirst, EFFECT(c.getNumberOfKeyframes() > 3)},
    {RUN(reparametrizeChannel()), kNone, kSilent, nullptr},
    {RUN(setCustomInterpolator(nullptr, nullptr)), kNone, kSilent, nullptr},
    {RUN(createCurveSegment(at(5), at(6), s(0.5), false)), kCurve, kFirst,
     EFFECT(c.getNumberOfKeyframes() == 7), kKeysTheEmpty},
    {RUN(setCurveSegmentValue(at(1.5), 50.0, false)), kCurve, kFirst,
     EFFECT(c.getCurveValue(s(1.5), false) > 49.0)},
    {RUN(setCurveSegmentValue(at(1.5), 15.5, true)), kCurve, kFirst, EFFECT(valueAt(c, 1) != 10.0)},
    {RUN(bake({at(1), s(2)}, s(1))), kGlobal, kFirst,
     EFFECT(!c.getCurveInterface()->getSplineState()->sanitizeBezier)},
    {RUN(simplify(at(1), at(4), s(1), 1.0, 4, 0, false)), kGlobal, kFirst,
     EFFECT(c.getNumberOfKeyframes() == 2)},
    {RUN(copyKeyframesFromChannel(at(6), other)), kGlobal, kSilent, EFFECT(valueAt(c, 6) == 5.0),
     kKeysTheEmpty},
    {RUN(offsetKeyframesValuesInRange(at(2), at(3), at(2), 7.0)), kGlobal, kSilent,
     EFFECT(valueAt(c, 2) == 7.0 && valueAt(c, 4) == 40.0)},
    {RUN(setKeyframesWithInfo(at(3), oneKeyframe())), kCurve, kSilent, EFFECT(valueAt(c, 3) == 7.0),
     kKeysTheEmpty},
    {RUN(setFadeInOffset(s(1), false)), kNone, kOnceLocal, EFFECT(c.getFadeInOffset() == s(1))},
    {RUN(setFadeOutOffset(s(1), false)), kNone, kOnceLocal, EFFECT(c.getFadeOutOffset() == s(1))},
    {RUN(setFadeInCurve(2)), kNone, kOnceLocal, EFFECT(c.getFadeInCurve() == 2)},
    {RUN(setFadeOutCurve(2)), kNone, kOnceLocal, EFFECT(c.getFadeOutCurve() == 2)},
};

// Reads: true in their own time base, and in no other.

struct Read {
    char const* name;
    Time time;
    std::function<bool(Subject const&)> holds;
};
#define READ(time, expression)                                                                               \
    { #expression, time, EFFECT(expression) }

/// Where a search for a keypoint ends.
template <class Search> Tempus found(Search search) {
    Tempus t;
    return search(&t) ? t : kTempusInvalid;
}
#define STEP(operation, from) found([&](Tempus* t) { return *t = from, c.operation(t, 0); })
#define FIND(operation, ...) found([&](Tempus* t) { return c.operation(__VA_ARGS__ t, nullptr); })

std::vector<double> samples(KFChannel const& c, Tempus const& start) {
    std::vector<double> values;
    unsigned int count = 2;
    c.getSamples(start, s(3), count, static_cast<std::vector<Tempus>*>(nullptr), &values);
    return values;
}

std::size_t gathered(KFChannel& c, Tempus const& start) {
    KFChannelBase::KeyframesByChannel all;
    c.keyframesWithChannels({start, s(2)}, all);
    return all.empty() ? 0 : all.front().second.size();
}

std::vector<Read> const kReads = {
    READ(kNone, c.hasKeypoints(0) && c.hasMoreThanOneKeypoint() && c.getNumberOfKeyframes() == 3),
    READ(kGlobal, c.hasKeypointAt(at(2), 0)),
    READ(kGlobal, c.allHaveKeypointsAt(at(2))),
    READ(kGlobal, c.numberOfKeypointsAt(at(2)) == 1),
    READ(kGlobal, STEP(previousKeypoint, at(2)) == at(1)),
    READ(kGlobal, STEP(nextKeypoint, at(2)) == at(4)),
    READ(kGlobal, c.keypoints({at(2), s(2)}, false, 0) == (std::vector{at(2), at(4)})),
    READ(kGlobal, c.keypoints({at(2), s(1)}, true, 0) == (std::vector{at(2), at(1), at(2), at(4)})),
    READ(kGlobal, c.visibleKeypoints({at(2), s(2)}, true, 0) == (std::vector{at(1), at(2), at(4)})),
    READ(kGlobal, gathered(c, at(2)) == 2),
    READ(kGlobal, c.getKeyframeMinValueInRange(at(2), at(5)) == 20.0),
    READ(kGlobal, c.getKeyframeMaxValueInRange(at(1), at(3)) == 20.0),
    READ(kGlobal, c.getKeyframeMinValueInRange(at(3), at(3)) == c.getCurveValue(s(3), true)),
    READ(kNone, c.getKeyframes(false).size() == 3 && c.getKeyframes(true)[1] == h),
    READ(kNone, FIND(getKeyframe, h, ) == s(2) && !c.getKeyframe(nullptr, nullptr, nullptr)),
    READ(kCurve, c.getKeyframe(at(2)) == h),
    READ(kCurve, FIND(getNextKeyframe, at(2), ) == at(4)),
    READ(kCurve, FIND(getPreviousKeyframe, at(2), ) == at(1)),
    READ(kNone, FIND(getFirstKeyframe, ) == s(1) && FIND(getLastKeyframe, ) == s(4)),
    READ(kCurve, c.getNextEnabledKeyframe(at(1)) == h),
    READ(kCurve, c.getPreviousEnabledKeyframe(at(4)) == h),
    READ(kNone, c.getNextEnabledKeyframe(c.getFirstEnabledKeyframe()) == h),
    READ(kNone, c.getPreviousEnabledKeyframe(c.getLastEnabledKeyframe()) == h),
    READ(kNone, c.getNextEnabledKeyframe(c.getLastEnabledKeyframe()) == nullptr),
    READ(kNone, c.getKeyframeEnabled(h) && !c.getKeyframeLocked(h) && !c.getKeyframeTangentsScaled(h)),
    READ(kCurve, c.getKeyframeNormal(at(2)) == 0.75),
    READ(kNone, c.getKeyframeMinTime() == s(1) && c.getKeyframeMaxTime() == s(4)),
    READ(kNone, c.getKeyframeTimeRange() == s(3) && c.getKeyframeParametricRange() == s(3)),
    READ(kNone, c.getKeyframeMinValue(false) == 10.0 && c.getKeyframeMaxValue(false) == 40.0),
    READ(kCurve, samples(c, at(1)) == (std::vector{10.0, 40.0})),
    READ(kNone, c.getPreviousProcessingNode(node) == nullptr && c.getNumberOfCurveProcessingNodes() == 1),
};

// What they work on ---------------------------------------------------------------------------------------------

struct NotingRoot : RecordingRoot {
    void willModifyChannel(KFChannelBase* channel, unsigned int kind) override {
        if (announced.empty() && watched != nullptr)
            wasLocalWhenAnnounced = !watched->getImpl()->isShared();
        RecordingRoot::willModifyChannel(channel, kind);
    }
    bool isChannelAffectedByBehaviors(KFChannelBase const*, bool) const override { return true; }
    KFChannel const* watched = nullptr;
    bool wasLocalWhenAnnounced = false;
};

KFCurve* keyedCurve() {
    KFCurve* const curve = KFChannelDouble::createKFChannelDoubleCurve(0.0);
    curve->setIsSpline(true, kTempusZero);
    for (auto const& [time, value] : {std::pair{1, 10.0}, {2, 20.0}, {4, 40.0}})
        curve->setKeypoint(s(time), value, true);
    void* h = nullptr;
    curve->getKeypointHandle(s(2), &h);
    curve->setKeypointInterpolation(h, kKFInterpolationBezier, true);
    curve->setKeypointOutputHandles(h, 6.0, 90.0, true);
    curve->setKeypointNormal(h, 0.75, true);
    curve->setCurveExtrapolation(kKFExtrapolationRepeat, 0);
    curve->appendCurveProcessingNode(new AddingNode(0.0));
    return curve;
}

/// x of a compound, which is linked or not; the others have the same keypoints. Or, alone, on a shared
/// record.
struct Fixture {
    NotingRoot root;
    KFChannelDouble other{"other", &root, 9, 0};
    KFChannelImpl shared{keyedCurve(), 0.0, 1, true};
    KFChannelDouble alone{"a", &root, 2, 0, &shared};
    KFChannel3D point{"c", &root, 3, 0, 3, &shared};

    explicit Fixture(double offset = 0.0) {
        root.setTimeOffset(s(offset), true);
        root.watched = &alone;
        other.setKeyframe(s(1), 5.0, true);
        for (KFChannel* const channel : {&point.x, &point.y, &point.z}) {
            channel->createLocalChannelImplementation();
            channel->appendCurveProcessingNode(new AddingNode(0.0));
        }
        root.takeAnnounced();
    }
    Subject subject(KFChannel& channel, double shift = 0.0) {
        auto const nodes = channel.enumerateCurveProcessingNodes();
        return {channel, channel.getKeyframe(s(2)), nodes.empty() ? nullptr : nodes.front(), &other,
                s(shift)};
    }
};

/// x, not linked, under a root with an offset, and what became of it.
struct Trial {
    Fixture f;
    Subject x;
    Trial(double offset, double shift) : f(offset), x(f.subject(f.point.x, shift)) {}
    explicit Trial(Edit const& edit, double offset = 0.0, double shift = 0.0) : Trial(offset, shift) {
        edit.run(x);
    }
};

} // namespace

TEST(KeyframeDecisions, TimesAreOfTheBaseThatTheTableNames) {
    for (Edit const& edit : kEdits) {
        SCOPED_TRACE(edit.name);
        Trial const before(0.0, 0.0), plain(edit);
        if (edit.worked != nullptr) {
            EXPECT_FALSE(edit.worked(before.x));
            EXPECT_TRUE(edit.worked(plain.x));
        }
        double const shift = edit.time == kGlobal ? 10.0 : 0.0;
        EXPECT_TRUE(Trial(edit, 10.0, shift).x.c.compare(&plain.x.c));
        EXPECT_TRUE(edit.time == kNone || !Trial(edit, 10.0, 10.0 - shift).x.c.compare(&plain.x.c));
    }
    for (Read const& read : kReads) {
        SCOPED_TRACE(read.name);
        double const shift = read.time == kGlobal ? 10.0 : 0.0;
        EXPECT_TRUE(read.holds(Trial(0.0, 0.0).x));
        EXPECT_TRUE(read.holds(Trial(10.0, shift).x));
        EXPECT_EQ(read.holds(Trial(10.0, 10.0 - shift).x), read.time == kNone);
    }
}

TEST(KeyframeDecisions, ALinkedCompoundTakesOverWhatTheTableNames) {
    for (Edit const& edit : kEdits) {
        SCOPED_TRACE(edit.name);
        Trial const plain(edit);
        for (bool const locked : {false, true}) {
            Fixture f;
            KFChannelDouble const before(f.point.y);
            f.point.setFoldFlag(kFoldFlagLinked);
            f.point.x.lock(locked, false);
            f.root.takeAnnounced();
            edit.run(f.subject(f.point.x));
            bool const obeys = (edit.exceptions & kIgnoresLock) == 0;
            EXPECT_EQ(f.point.x.compare(locked && obeys ? &before : &plain.x.c), true);
            // The lock of a component stops neither the compound nor its fellows.
            bool const isTakenOver = (edit.exceptions & kTakenOver) != 0;
            bool const stays = !isTakenOver || (locked && (edit.exceptions & kFollow) != 0);
            EXPECT_EQ(f.point.y.compare(&before), stays);
            EXPECT_EQ(f.point.z.compare(&f.point.y), true);
            EXPECT_TRUE(f.point.testFoldFlag(kFoldFlagLinked));
            auto const announced = f.root.takeAnnounced();
            if (!isTakenOver && (locked || edit.announced == kSilent)) {
                EXPECT_TRUE(announced.empty());
            } else {
                ASSERT_GE(announced.size(), 2U);
                EXPECT_EQ(announced[0].first, &f.point);
                EXPECT_EQ(announced[1].first, &f.point.x);
            }
        }
    }
}

TEST(KeyframeDecisions, TheRecordTurnsLocalAndTheHostHearsAsTheTableSays) {
    for (Edit const& edit : kEdits) {
        SCOPED_TRACE(edit.name);
        bool const obeys = (edit.exceptions & kIgnoresLock) == 0;
        for (bool const locked : {true, false}) {
            Fixture f;
            if (locked) // unlocking would make the record local
                f.alone.lock(true, false);
            f.root.takeAnnounced();
            edit.run(f.subject(f.alone));
            bool const acts = !(locked && obeys);
            EXPECT_EQ(f.alone.getImpl()->isShared(), !(acts && (edit.exceptions & kStaysShared) == 0));
            auto const announced = f.root.takeAnnounced();
            ASSERT_EQ(!announced.empty(), acts && edit.announced != kSilent);
            if (!announced.empty()) {
                EXPECT_EQ(announced.front(), std::pair(static_cast<KFChannelBase*>(&f.alone), kModifyData));
                EXPECT_EQ(f.root.wasLocalWhenAnnounced, edit.announced == kOnceLocal);
            }
            // Nothing is written to the record of the others.
            std::unique_ptr<KFCurve> const original(keyedCurve());
            EXPECT_TRUE(*f.shared.getCurve() == *original);
        }
    }
    for (Read const& read : kReads) {
        SCOPED_TRACE(read.name);
        Fixture f;
        f.alone.lock(true, false);
        f.root.takeAnnounced();
        EXPECT_TRUE(read.holds(f.subject(f.alone)));
        EXPECT_TRUE(f.alone.getImpl()->isShared() && f.root.takeAnnounced().empty());
    }
}

TEST(KeyframeDecisions, EditsAreForcedButWhenRecording) {
    for (bool const animate : {false, true}) {
        for (Edit const& edit : kEdits) {
            SCOPED_TRACE(edit.name);
            Fixture f;
            KFChannelDouble empty("e", &f.root, 20, 0);
            Animating const animating(animate);
            edit.run(f.subject(empty));
            bool const recording = animate && std::string(edit.name).starts_with("setKeyframeIfRecording");
            EXPECT_EQ(empty.hasKeypoints(0), (edit.exceptions & kKeysTheEmpty) != 0 || recording);
        }
    }
}

TEST(KeyframeDecisions, WhatChangesNothingStaysSilent) {
    Fixture f;
    f.alone.setInterpolation(f.alone.getInterpolation());
    f.alone.setExtrapolation(f.alone.getExtrapolation(0), 0);
    f.alone.setExtrapolation(f.alone.getExtrapolation(1), 1);
    f.alone.setFadeInOffset(s(0), false);
    f.alone.setFadeOutCurve(0);
    EXPECT_TRUE(f.root.takeAnnounced().empty() && f.alone.getImpl()->isShared());
    // But what isn't to be retimed is announced all the same.
    f.alone.setFlag(kChannelFlagNotRetimed, true);
    f.root.takeAnnounced();
    f.alone.retimeKeypoints(2.0, s(1));
    EXPECT_FALSE(f.root.takeAnnounced().empty() || f.alone.getImpl()->isShared());
    EXPECT_EQ(f.alone.getKeyframeMaxTime(), s(4));
}
