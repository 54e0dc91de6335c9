// Takes on a curve: what is read while values are recorded, and which keypoints are there afterwards.

#include "lumenkey/curves/KFTypedCurves.h"
#include "lumenkey/splines/KFCoreGlobals.h"
#include "lumenkey/splines/KFSpline.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cmath>
#include <locale>
#include <sstream>
#include <thread>

namespace {

Tempus at(double t) { return KFChronoForChannelSeconds(t, 600); }
constexpr double kStep = 0.5;

/// Keypoints with the value of their time at 0, 2, 4, 6, 8 and 10.
class Taken : public KFCurveDouble {
public:
    Taken() : KFCurveDouble(0.0) {
        setIsSpline(true, kTempusZero);
        for (int i = 0; i <= 10; i += 2)
            setKeypoint(at(i), i, true);
    }
    double value(double t) { return getValue(at(t), 0.0); }
    void begin(double t, std::uint32_t scope, std::uint32_t mode = 0) {
        ASSERT_TRUE(beginPlayback(at(t), scope, mode, at(kStep)));
        ASSERT_TRUE(beginRecording(at(t)));
    }
    void set(double t, double v) { setKeypoint(at(t), v, false); }
    void end(double t) {
        endRecording(at(t));
        endPlayback(at(t));
    }
    /// The lowest and the highest value.
    std::pair<double, double> extremes() {
        double low = 0, high = 0;
        getCurrentMinValueV(&low, false);
        getCurrentMaxValueV(&high, false);
        return {low, high};
    }
    /// Times and values.
    void expectValues(std::initializer_list<std::pair<double, double>> values) {
        for (auto const& [t, v] : values)
            EXPECT_EQ(value(t), v) << t;
    }
    /// `time value` of each keypoint, the linear ones' type left out.
    std::string keypoints() {
        std::ostringstream text;
        text.imbue(std::locale::classic());
        std::vector<std::pair<Tempus, std::pair<double, unsigned>>> keys;
        getKeypointsTimeAndValue({kTempusZero, at(1000)}, keys, nullptr, nullptr);
        for (auto const& [time, key] : keys)
            text << TempusGetSeconds(time) << ':' << key.first
                 << (key.second == kKFInterpolationLinear ? "" : "*") << ' ';
        return text.str();
    }
};

constexpr char const* kOld = "0:0 2:2 4:4 6:6 8:8 10:10 ";

TEST(Recording, JoinsTheKeypointsAroundATakeWithoutGuards) {
    Taken curve;
    curve.begin(3, kKFRecordingScopeJoin);
    EXPECT_TRUE(curve.isRecording());
    EXPECT_EQ(curve.value(5), 5) << "nothing is recorded yet";
    curve.set(3, 1);
    curve.set(5, 3);
    curve.set(4, 100); // back in time
    // From the keypoint at 2 to the first point, and from the last point to the keypoint at 6.
    curve.expectValues({{1, 1}, {2.5, 1.5}, {3, 1}, {4, 2}, {5.5, 4.5}, {7, 7}});
    curve.set(5, 4); // the same time again
    EXPECT_EQ(curve.value(5), 4);

    double row[3] = {};
    KFCurveNodeParam param;
    param.outputStart = at(2.5);
    param.outputStep = at(1);
    param.outputCount = 3;
    param.outputValues = row;
    curve.processCurve(param, nullptr);
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(row[i], curve.value(2.5 + i));

    EXPECT_EQ(curve.keypoints(), kOld);
    curve.updateCurrentRecordingTime(at(5.5)); // only with guards
    curve.endRecording(at(5.5));
    EXPECT_EQ(curve.keypoints(), "0:0 2:2 3:1 5:4 6:6 8:8 10:10 ");
    EXPECT_FALSE(curve.isRecording());
    EXPECT_TRUE(curve.isPlaying(nullptr, nullptr, nullptr));
    curve.endPlayback(at(6));
    EXPECT_FALSE(curve.isPlaying(nullptr, nullptr, nullptr));
}

TEST(Recording, GuardsATakeAndCommitsByItsScope) {
    // The take begins at 3, records 1 at 3.25, holds it to 5 and ends at 5.5; playback ends at 6.
    struct Case {
        std::uint32_t scope;
        char const* afterRecording;
        char const* afterPlayback;
    };
    char const* const committed = "0:0 2:2 2.5:2.5 3:3 3.25:1 5:1 5.5:1 6:6 8:8 10:10 ";
    Case const cases[] = {
        {kKFRecordingScopeTouch, committed, committed},
        {kKFRecordingScopeLatch, kOld, "0:0 2:2 2.5:2.5 3:3 3.25:1 5:1 6:1 6.5:6.5 8:8 10:10 "},
        {kKFRecordingScopeWrite, kOld, "0:0 2:2 2.5:2.5 3:3 3.25:1 5:1 6:1 6.5:6.5 8:8 10:10 "},
    };
    for (Case const& c : cases) {
        Taken curve;
        curve.begin(3, c.scope);
        EXPECT_EQ(curve.value(3), 3) << "its own first point";
        curve.set(3.25, 1);
        curve.updateCurrentRecordingTime(at(5));
        curve.updateCurrentRecordingTime(at(4)); // back in time
        // Held at 4, and half way to the guard at 5.5.
        curve.expectValues({{2.75, 2.75}, {4, 1}, {5.25, 3.25}, {7, 7}});
        EXPECT_EQ(curve.extremes(), std::pair(0.0, 10.0));
        curve.endRecording(at(5.5));
        EXPECT_EQ(curve.keypoints(), c.afterRecording) << c.scope;
        EXPECT_FALSE(curve.isRecording());
        curve.endPlayback(at(6));
        EXPECT_EQ(curve.keypoints(), c.afterPlayback) << c.scope;
    }
}

TEST(Recording, HoldsTheStartAndTheLastValueAndKeepsTheExtremes) {
    Taken curve;
    ASSERT_TRUE(curve.beginPlayback(at(1), kKFRecordingScopeWrite, 0, at(kStep)));
    curve.beginRecording(at(3));
    EXPECT_EQ(curve.value(3), 1) << "the value where playback began";
    curve.set(4, 50);
    curve.set(4, -50); // what is held from here on
    curve.updateCurrentRecordingTime(at(5));
    EXPECT_EQ(curve.value(5), -50);
    curve.set(6, 60);
    for (double const t : {7.0, 7.5, 8.0, 8.5})
        curve.set(t, 5);
    EXPECT_EQ(curve.extremes(), std::pair(-50.0, 60.0));
    curve.endRecording(at(9));

    // Begun anew before it became keypoints.
    curve.begin(3, kKFRecordingScopeJoin);
    EXPECT_EQ(curve.extremes(), std::pair(0.0, 10.0));
    curve.end(4);
    EXPECT_EQ(curve.keypoints(), kOld);
}

TEST(Recording, LeavesTheKeypointsOfATakeThatIsDropped) {
    for (std::uint32_t scope = 0; scope <= 3; ++scope) {
        Taken curve;
        curve.begin(1, scope, 1);
        curve.set(3, 50);
        curve.set(5, -50);
        EXPECT_EQ(curve.value(5), -50);
        EXPECT_EQ(curve.extremes(), std::pair(-50.0, 50.0));
        curve.end(7);
        EXPECT_EQ(curve.keypoints(), kOld) << scope;
        EXPECT_EQ(curve.value(5), 5);
    }
}

TEST(Recording, TakesOverlapAndReachBeyondTheKeypoints) {
    Taken curve;
    curve.begin(-3, kKFRecordingScopeJoin);
    curve.set(-3, 7);
    curve.set(1, 7);
    EXPECT_EQ(curve.value(-4), 0) << "no keypoint in front";
    curve.end(1);
    EXPECT_EQ(curve.value(-2), 7);
    curve.begin(0, kKFRecordingScopeJoin);
    curve.set(0, 1);
    curve.set(12, 1);
    EXPECT_EQ(curve.value(20), 10) << "no keypoint behind";
    curve.end(12);
    curve.begin(5, kKFRecordingScopeJoin); // empty
    curve.end(6);
    EXPECT_EQ(curve.getNumberOfKeypoints(), 3U);
    curve.expectValues({{-3, 7}, {0, 1}, {12, 1}});
}

TEST(Recording, RefusesWhatOpensNoTake) {
    KFCurveDouble constant(5.0);
    EXPECT_FALSE(constant.beginPlayback(kTempusZero, 1, 0, at(1))) << "no spline";
    Taken curve;
    EXPECT_FALSE(curve.beginRecording(kTempusZero));
    EXPECT_FALSE(curve.endRecording(kTempusZero));
    EXPECT_FALSE(curve.endPlayback(kTempusZero));
    EXPECT_FALSE(curve.updateCurrentRecordingTime(kTempusZero));
    EXPECT_FALSE(curve.isPlaying(nullptr, nullptr, nullptr));
    EXPECT_FALSE(curve.beginPlayback(kTempusZero, 4, 0, at(1)));
    EXPECT_FALSE(curve.beginPlayback(kTempusIndefinite, 1, 0, at(1)));
    EXPECT_FALSE(curve.beginPlayback(kTempusZero, 1, 0, at(-1)));
    EXPECT_FALSE(curve.beginRecording(kTempusZero)) << "what was refused opened nothing";
    EXPECT_FALSE(curve.isRecording());
    std::uint32_t scope = 9;
    EXPECT_FALSE(curve.isPlaying(&scope, nullptr, nullptr));
    EXPECT_EQ(scope, 9U);
    curve.begin(1, kKFRecordingScopeTouch);
    std::uint32_t mode = 9;
    Tempus resolution = kTempusZero;
    EXPECT_TRUE(curve.isPlaying(&scope, &mode, &resolution));
    EXPECT_EQ(scope, 1U);
    EXPECT_EQ(mode, 0U);
    EXPECT_EQ(resolution, at(kStep));
    curve.setKeypoint(kTempusPositiveInfinity, 3, false);
    curve.setCurveToDefault();
    curve.setIsSpline(false, kTempusZero);
    EXPECT_TRUE(curve.isRecording()) << "neither ends a take";
    curve.delAllKeypoints(kTempusZero, true); // the take outlives them
    curve.end(2);
    EXPECT_EQ(curve.getNumberOfKeypoints(), 4U) << "two guards, the first and the last value";
}

TEST(Recording, WritesByHandleAndWithoutValueToo) {
    Taken curve;
    void* at4 = nullptr;
    ASSERT_TRUE(curve.getKeypointHandle(at(4), &at4));
    curve.begin(3, kKFRecordingScopeJoin);
    curve.setKeypointValue(at4, 40, true); // at the keypoint's own time
    curve.setKeypoint(at4, at(5), 50, true);
    curve.setKeypoint(at(5.5), true); // the curve's own value there, which joins the keypoint at 6
    EXPECT_FALSE(curve.KFCurve::setKeyValue(&curve, 1.0)) << "no handle";
    EXPECT_EQ(curve.value(4), 40);
    EXPECT_EQ(curve.keypoints(), kOld);
    curve.end(6);
    EXPECT_EQ(curve.keypoints(), "0:0 2:2 4:40 5:50 5.5:28 6:6 8:8 10:10 ");
}

TEST(Recording, IsCopiedWithoutWhatWasRecordedButAssignedWithIt) {
    Taken curve;
    curve.begin(3, kKFRecordingScopeJoin);
    curve.set(3, 30);
    KFCurveDouble copy(curve, true);
    EXPECT_TRUE(copy.isRecording());
    EXPECT_FALSE(copy.isPlaying(nullptr, nullptr, nullptr));
    EXPECT_EQ(copy.getValue(at(3), 0.0), 3);
    EXPECT_FALSE(copy == curve);
    Taken assigned;
    assigned = curve;
    EXPECT_TRUE(assigned == curve);
    EXPECT_EQ(assigned.value(3), 30);
    assigned.endRecording(at(3));
    ASSERT_TRUE(assigned.beginPlayback(at(1), kKFRecordingScopeLatch, 0, at(kStep)));
    assigned = curve;
    EXPECT_TRUE(assigned.isPlaying(nullptr, nullptr, nullptr)) << "its own";
    EXPECT_TRUE(assigned == curve);
    assigned.set(4, 40);
    EXPECT_FALSE(assigned == curve);
    assigned = Taken();
    EXPECT_FALSE(assigned.isRecording());
    EXPECT_EQ(assigned.value(3), 3);
}

TEST(RecordingThreads, ReadersSeeATakeBeginGrowAndEnd) {
    // All that is ever written at a time is that time, so that whatever is read must be it.
    Taken curve;
    std::atomic<bool> isOver{false};
    std::atomic<int> wrong{0};
    std::thread reader([&] {
        for (int i = 0; !isOver; i = (i + 7) % 1000) {
            double const t = i / 100.0;
            if (std::fabs(curve.value(t) - t) > 1e-9)
                ++wrong;
        }
    });
    for (int take = 0; take < 4000; ++take) {
        curve.begin(1, static_cast<std::uint32_t>(take % 4), take % 5 == 0 ? 1 : 0);
        for (int i = take % 4 == 3 ? 101 : 100; i <= 900; i += 50)
            curve.set(i / 100.0, i / 100.0);
        curve.set(9, 9);
        curve.endRecording(at(9));
        curve.endPlayback(at(9));
    }
    isOver = true;
    reader.join();
    EXPECT_EQ(wrong, 0);
}

TEST(RecordingThreads, ATakeIsCopiedAndComparedWhileItGrows) {
    Taken curve;
    curve.begin(1, kKFRecordingScopeJoin);
    std::atomic<bool> isOver{false};
    std::thread copier([&] {
        Taken copy;
        do {
            copy = curve;
            // Either answer may be right by now; the copy itself is of one moment.
            static_cast<void>(copy == curve);
            EXPECT_NEAR(copy.value(3), 3, 1e-9);
        } while (!isOver);
    });
    for (int i = 100; i <= 900; ++i)
        curve.set(i / 100.0, i / 100.0);
    isOver = true;
    copier.join();
    curve.end(9);
}

} // namespace
