// Keypoints of a curve: who is refused, what is written, what deleting leaves, and the forms of sampling.

#include "lumenkey/curves/KFTypedCurves.h"
#include "lumenkey/splines/KFCoreGlobals.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFVertex.h"
#include "tests/curves/ChainNodes.h"

#include <gtest/gtest.h>

#include <functional>
#include <memory>

namespace {

Tempus at(double t) { return KFChronoForChannelSeconds(t, 600); }

/// A spline root that held 7 before its three keypoints.
class Keyed : public KFCurveDouble {
public:
    Keyed() : KFCurveDouble(7.0) {
        setIsSpline(true, kTempusZero);
        setKeypoint(at(1), 1.0, true);
        setKeypoint(at(2), 5.0, true);
        setKeypoint(at(3), 2.0, true);
        setKeypointInputNormalizedTangents(key(2), -0.1, 0.25, true);
        setKeypointOutputNormalizedTangents(key(2), 0.1, -0.25, true);
    }
    void* key(double t) {
        void* handle = nullptr;
        if (getSpline() != nullptr)
            getSpline()->getVertexHandle(at(t), &handle, true);
        return handle;
    }
    double value(double t) { return getValue(at(t), 0.0); }
};

/// What an operation asks for, each a bit.
enum Need : unsigned { Spline = 1, Root = 2, Editable = 4, Handle = 8 };
constexpr unsigned S = Spline, K = Spline | Root, R = Spline | Handle, M = Spline | Editable;
constexpr unsigned E = Spline | Editable | Handle, ERoot = E | Root, MRoot = M | Root;

struct Operation {
    char const* call;
    unsigned needs;
    bool changes;
    /// Not so for the two that answer false whatever they do.
    bool succeeds;
    std::function<bool(Keyed& c, void* h, bool force)> run;
};

// clang-format off
#define KF_OP(needs, changes, succeeds, call) \
    {#call, needs, changes, succeeds, \
     []([[maybe_unused]] Keyed& c, [[maybe_unused]] void* h, [[maybe_unused]] bool force) -> bool { return call; }}
#define KF_READ(needs, call) KF_OP(needs, false, true, call)
#define KF_EDIT(needs, call) KF_OP(needs, true, true, call)

void* out;
Tempus when;
double x, y;
bool flag;
std::uint32_t number;
std::vector<void*> handles;
std::vector<Tempus> times;
std::vector<double> values;
std::vector<std::pair<Tempus, std::pair<double, unsigned>>> keys;

Operation const kOperations[] = {
    KF_EDIT(E, c.cloneKeypoint(h, at(2.5), force)), KF_EDIT(E, c.moveKeypoint(h, at(2.5), force, false, false)),
    KF_EDIT(E, c.offsetKeypointInTime(h, at(2.5), force)), KF_EDIT(E, c.delKeypoint(h, force)),
    KF_EDIT(M, c.delKeypoints(at(1), at(2), force)), KF_OP(M, true, false, c.delAllKeypoints(at(1), force)),
    KF_READ(K, c.getKeypointHandle(at(2), &out)), KF_READ(S, c.getNextValidKeypointHandle(h, &out)),
    KF_READ(S, c.getNextValidKeypointHandle(at(1), &out)), KF_READ(S, c.getPreviousValidKeypointHandle(at(2), &out)),
    KF_READ(K, c.getNextKeypoint(at(1), &when, &x)), KF_READ(K, c.getPreviousKeypoint(at(2), &when, &x)),
    KF_READ(R, c.getKeypoint(h, &when, &x)), KF_READ(K, c.getFirstKeypoint(&when, &x)),
    KF_READ(K, c.getLastKeypoint(&when, &x)), KF_READ(S, c.getFirstValidKeypointHandle(&out)),
    KF_READ(S, c.getLastValidKeypointHandle(&out)), KF_READ(K, c.getKeypointHandleList(handles)),
    KF_READ(K, c.getKeypointValidHandleList(handles)),
    KF_READ(K, c.getKeypointsTimeAndValue({at(1), at(2)}, keys, &when, nullptr)),
    KF_READ(K, c.getNumberOfKeypoints() == 3), KF_EDIT(M, c.reverseKeypoints(c.key(1), c.key(3), force)),
    KF_READ(R, c.getKeypointFlags(h, &number)), KF_EDIT(ERoot, c.setKeypointFlags(h, 0x18, force)),
    KF_EDIT(E, c.enableKeypoint(h, false, force)), KF_READ(R, c.isEnabledKeypoint(h, &flag) && flag),
    KF_EDIT(ERoot, c.selectKeypoint(h, true, force)), KF_EDIT(E, c.lockKeypoint(h, true, force)),
    KF_READ(R, c.isLockedKeypoint(h, &flag)), KF_EDIT(E, c.breakKeypointHandles(h, true, force)),
    KF_READ(R, c.areHandlesBroken(h, &flag)), KF_EDIT(E, c.weightHandles(h, true, force)),
    KF_READ(R, c.areHandlesWeighted(h, &flag)), KF_EDIT(R, c.deriveKeypoint(h)),
    KF_EDIT(E, c.setKeypointSmooth(h, true, force)), KF_EDIT(E, c.flattenHandles(h, force)),
    KF_READ(R, c.getKeypointNormal(h, &x)), KF_EDIT(ERoot, c.setKeypointNormal(h, 0.5, force)),
    KF_READ(S, c.getKeypointNormal(at(2.5), &x)), KF_EDIT(MRoot, c.setKeypointNormal(at(2.5), 0.5, force)),
    KF_EDIT(E, c.setKeypointInputHandles(h, -12, 6, force)), KF_EDIT(E, c.setKeypointOutputHandles(h, 12, 6, force)),
    KF_READ(R, c.getKeypointInputHandles(h, &x, nullptr)), KF_READ(R, c.getKeypointOutputHandles(h, nullptr, &y)),
    KF_EDIT(E, c.setKeypointInputNormalizedTangents(h, -1, 6, force)),
    KF_EDIT(E, c.setKeypointOutputNormalizedTangents(h, 1, 6, force)),
    KF_READ(R, c.getKeypointInputNormalizedTangents(h, &x, &y)),
    KF_READ(R, c.getKeypointOutputNormalizedTangents(h, &x, &y)), KF_EDIT(R, c.setKeypointBiasLinear(h, 0.75)),
    KF_READ(R, c.getKeypointBiasLinear(h, &x)), KF_EDIT(E, c.setKeypointInterpolation(h, 4, force)),
    KF_READ(R, c.getKeypointInterpolation(h, &number, &flag)),
    KF_EDIT(E, c.setKeypointSpeed(h, kKFVertexSpeedEase, force)), KF_READ(R, c.getKeypointSpeed(h, &number)),
    KF_OP(E, true, false, c.adjustKeypointSpeed(h, 0.5, force)), KF_EDIT(S, c.lockCurve(true)),
    KF_EDIT(S, c.closeCurve()), KF_READ(S, c.isClosedCurve(&flag)), KF_READ(S, c.hasInterpolation(1, &flag)),
    KF_EDIT(S, c.reparametrizeCurve()), KF_READ(S, c.purgeCurve()),
    KF_READ(S, c.getPointInputTangents(at(1.5), &x, &y, true)),
    KF_READ(S, c.getPointOutputTangents(at(1.5), &x, nullptr, false)),
    KF_READ(S, c.getSplineSamplesAndIgnoreLinear(at(1), at(3), at(0.5), &times, &values)),
    KF_READ(S, c.getCurveDerivativesSamples(at(1), at(1), number = 2, &times, &values)),
    KF_EDIT(M, c.warpCurveLinear(2.0, at(1), force)), KF_EDIT(M, c.forceRetimeCurve(at(2), at(1))),
};

struct Situation {
    char const* name;
    unsigned missing;
    std::function<void*(Keyed& curve, Keyed& other)> prepare; ///< Answers the handle to use.
};

Situation const kSituations[] = {
    {"plain", 0, [](Keyed& c, Keyed&) { return c.key(2); }},
    {"no spline", Spline | Handle, [](Keyed& c, Keyed& other) { c.delAllKeypoints(at(1), true); return other.key(2); }},
    {"constant root", Root, [](Keyed& c, Keyed&) { c.setIsSpline(false, at(1)); return c.key(2); }},
    {"not keyframable", Editable, [](Keyed& c, Keyed&) { c.setCurveKeyframable(false); return c.key(2); }},
    {"foreign handle", Handle, [](Keyed&, Keyed& other) { return other.key(2); }},
    {"null handle", Handle, [](Keyed&, Keyed&) { return static_cast<void*>(nullptr); }},
};
// clang-format on

TEST(CurveKeypoints, RefuseByTheirGuardsAndThenChangeNothing) {
    for (Situation const& situation : kSituations) {
        for (Operation const& operation : kOperations) {
            for (bool const force : {false, true}) {
                SCOPED_TRACE(std::string(operation.call) + ", " + situation.name + (force ? ", forced" : ""));
                Keyed curve, other;
                Keyed const untouched;
                void* const handle = situation.prepare(curve, other);
                std::unique_ptr<KFCurveInterface> const before(curve.cloneCurve());
                bool const accepted = (operation.needs & situation.missing) == 0;
                EXPECT_EQ(operation.run(curve, handle, force), accepted && operation.succeeds);
                EXPECT_EQ(!(curve == dynamic_cast<KFCurve&>(*before)), accepted && operation.changes);
                EXPECT_TRUE(other == untouched);
            }
        }
    }
}

TEST(CurveKeypoints, FailingReadersWriteWhatTheySay) {
    KFCurveDouble curve(7.0);
    Keyed foreign, keyed;
    when = at(x = 9.0);
    EXPECT_FALSE(curve.getFirstKeypoint(&when, &x) || curve.getLastKeypoint(nullptr, nullptr));
    EXPECT_TRUE(when == kTempusZero && x == 0.0);
    keys.resize(3);
    Tempus last = at(9);
    EXPECT_FALSE(curve.getKeypointsTimeAndValue({at(0), at(9)}, keys, nullptr, &last));
    EXPECT_TRUE(keys.empty() && !TempusIsValid(last));
    flag = true;
    EXPECT_FALSE(keyed.isLockedKeypoint(foreign.key(2), &flag) || flag);
    EXPECT_FALSE(keyed.getKeypointBiasLinear(keyed.key(2), nullptr));
}

TEST(CurveKeypoints, MovingTellsItsSwitchesApart) {
    struct Case {
        bool constrain, replace;
        double target;
        std::vector<double> expected;
    };
    for (Case const& c :
         {Case{true, false, 4.0, {1.0, 3.0 - 1.0 / 30.0, 3.0}}, Case{false, false, 4.0, {1.0, 3.0, 4.0}},
          Case{false, true, 3.0, {1.0, 3.0}}, Case{false, false, 3.0, {1.0, 3.0, 3.0}}}) {
        Keyed curve;
        ASSERT_TRUE(curve.moveKeypoint(curve.key(2), at(c.target), false, c.constrain, c.replace));
        keys.clear();
        curve.getKeypointsTimeAndValue({at(0), at(9)}, keys, nullptr, nullptr);
        ASSERT_EQ(keys.size(), c.expected.size());
        for (std::size_t i = 0; i < keys.size(); ++i)
            EXPECT_NEAR(TempusGetSeconds(keys[i].first), c.expected[i], 1e-9);
    }
}

TEST(CurveKeypoints, HandlesAreTwelveTangentsUnlessParametric) {
    for (bool const parametric : {false, true}) {
        Keyed curve;
        curve.setCurveParametric(parametric);
        double const scale = parametric ? 1.0 : 12.0;
        curve.setKeypointInputHandles(curve.key(2), -12.0, 6.0, true);
        curve.setKeypointOutputHandles(curve.key(2), 12.0, 3.0, true);
        EXPECT_TRUE(curve.getKeypointInputHandles(curve.key(2), &x, &y) && x == -12.0 && y == 6.0);
        curve.getKeypointInputNormalizedTangents(curve.key(2), &x, &y);
        EXPECT_TRUE(x == -12.0 / scale && y == 6.0 / scale);
        EXPECT_TRUE(curve.getKeypointOutputHandles(curve.key(2), &x, &y) && x == 12.0 && y == 3.0);
        curve.getKeypointOutputNormalizedTangents(curve.key(2), &x, &y);
        EXPECT_TRUE(x == 12.0 / scale && y == 3.0 / scale);
    }
}

TEST(CurveKeypoints, DeletingTheLastOneKeepsItsValueByHandleOnly) {
    Keyed byHandle, byRange, all;
    byHandle.delKeypoint(byHandle.key(1), false);
    byHandle.delKeypoint(byHandle.key(3), false);
    EXPECT_TRUE(byHandle.delKeypoint(byHandle.key(2), false));
    EXPECT_TRUE(byHandle.getSpline() == nullptr && byHandle.value(9) == 5.0);
    EXPECT_TRUE(byRange.delKeypoints(at(0), at(3), false));
    EXPECT_TRUE(byRange.getSpline() == nullptr && byRange.value(1) == 7.0);
    EXPECT_FALSE(all.delAllKeypoints(at(1.5), false));
    EXPECT_TRUE(all.getSpline() == nullptr && all.value(9) == 3.0);
    for (bool const parametric : {false, true}) {
        Keyed path;
        path.setCurveParametric(parametric);
        EXPECT_TRUE(path.delKeypoints(at(1), at(2), false)); // leaves 1 and 3
        EXPECT_TRUE(path.getLastKeypoint(&when, nullptr) && when == (parametric ? at(1) : at(3)));
    }
}

TEST(CurveKeypoints, ValuesWithoutAnimationBecomeTheConstant) {
    KFCurveDouble constant(5.0);
    constant.setAbsoluteMaxValueV(9.0);
    EXPECT_TRUE(constant.setKeypoint(at(3), 20.0, false) && constant.getValue(at(0), 0.0) == 9.0);
    constant.setIsSpline(true, kTempusZero);
    EXPECT_TRUE(constant.setKeypointNoTangents(at(3), 3.0, false) && constant.getValue(at(0), 0.0) == 3.0);
    constant.loadVertices(true, 1); // a spline without keypoints is no obstacle
    EXPECT_TRUE(constant.setKeypoint(at(3), 2.0, false) && constant.getValue(at(0), 0.0) == 2.0);
    Keyed scaled;
    scaled.setCurveDefaultValue(4.0);
    scaled.setAbsoluteMaxValueV(6.0);
    EXPECT_TRUE(scaled.scaleCurve(2.0) && scaled.value(1) == 2.0 && scaled.value(2) == 6.0);
    EXPECT_TRUE(scaled.getCurveDefaultValue(&x) && x == 6.0);
    scaled.setRootNode(1.5);
    EXPECT_TRUE(scaled.scaleCurve(2.0) && scaled.value(1) == 3.0);
}

TEST(CurveKeypoints, OffsetTheCurveWhereToldTo) {
    KFCoreGlobals::getInstance().shouldOffset = true;
    struct Case {
        std::function<void(Keyed&)> write;
        double first, middle;
        std::uint32_t count;
    };
    // clang-format off
    Case const cases[] = {
        {[](Keyed& c) { c.setKeypoint(at(2), 6.0, false); }, 2.0, 6.0, 3},
        {[](Keyed& c) { c.setKeypoint(at(2), 6.0, true); }, 1.0, 6.0, 3},
        {[](Keyed& c) { c.setKeypoint(c.key(2), at(2), 6.0, false); }, 2.0, 6.0, 3},
        {[](Keyed& c) { c.setKeypoint(c.key(2), at(2), 6.0, true); }, 1.0, 6.0, 3},
        {[](Keyed& c) { c.setKeypointValue(c.key(2), 3.0, false); }, 3.0, 7.0, 3},
        {[](Keyed& c) { c.setKeypointValue(c.key(2), 3.0, true); }, 1.0, 3.0, 3},
        {[](Keyed& c) { c.setKeypointNoTangents(at(1.5), 9.0, false); }, 1.0, 5.0, 4},
        {[](Keyed& c) { c.setCurveKeyframable(false); c.setKeypointNoTangents(at(2), 7.0, false); }, 3.0, 7.0, 3},
        {[](Keyed& c) { c.setCurveKeyframable(false); c.setKeypoint(at(2), 7.0, true); }, 1.0, 7.0, 3},
        {[](Keyed& c) { c.setCurveKeyframable(false); c.appendKeypointNoTangents(at(2), 8.0, true); }, 4.0, 8.0, 3},
    };
    // clang-format on
    for (Case const& c : cases) {
        Keyed curve;
        c.write(curve);
        EXPECT_TRUE(curve.value(1) == c.first && curve.value(2) == c.middle) << &c - cases;
        EXPECT_EQ(curve.getNumberOfKeypoints(), c.count) << &c - cases;
    }
    Keyed curve;
    EXPECT_FALSE(curve.setKeypointValue(nullptr, 3.0, true) || curve.setKeypoint(nullptr, at(1), 3.0, false));
    EXPECT_TRUE(curve == Keyed());
    KFCoreGlobals::getInstance().shouldOffset = false;
}

TEST(CurveKeypoints, BulkLoadingEqualsAddingOneByOne) {
    constexpr std::uint32_t count = 500;
    std::vector<Tempus> u(count);
    std::vector<double> v(count);
    KFCurveDouble bulk(0.0), appended(0.0), added(0.0);
    for (KFCurve* const curve : {&bulk, &appended, &added})
        curve->setIsSpline(true, kTempusZero);
    for (std::uint32_t i = 0; i < count; ++i) {
        u[i] = TempusMake(i, 24);
        v[i] = i * 37 % 101;
        appended.appendKeypointNoTangents(u[i], v[i], true);
        added.setKeypointNoTangents(u[i], v[i], true);
    }
    EXPECT_TRUE(bulk.loadVertices(true, 4000000000u)); // what a document claims is a hint
    EXPECT_TRUE(bulk.appendKeypointsNoTangents(count, u.data(), v.data(), true));
    EXPECT_TRUE(bulk.loadVertices(false, count) && bulk.getSplineState()->shared);
    EXPECT_FALSE(appended.getSplineState()->shared);
    EXPECT_TRUE(appended == added && bulk == added);
    EXPECT_TRUE(bulk.getNextKeypoint(u[7], &when, nullptr) && when == u[8]);
}

TEST(CurveSamples, FormsAgreeWithPoints) {
    Keyed curve;
    KFCurveNode* const first = new TwoAtMost;
    curve.appendCurveProcessingNode(first);
    curve.appendCurveProcessingNode(new Gain(2.0));
    curve.appendCurveProcessingNode(new AddOperand);
    curve.appendCurveProcessingNode(new TwoAtMost);
    Tempus const start = TempusMake(1, 2), step = TempusMake(3, 8);
    std::uint32_t count = 0;
    auto const expectRow = [&](Tempus const* t, double const* seconds, double const* v, auto const& point) {
        ASSERT_EQ(count, 2u);
        for (std::uint32_t i = 0; i < count; ++i) {
            Tempus const u = start + step * i;
            EXPECT_EQ(v[i], point(u));
            EXPECT_TRUE(t == nullptr || t[i] == u);
            EXPECT_TRUE(seconds == nullptr || seconds[i] == TempusGetSeconds(u));
        }
    };
    auto const whole = [&](Tempus const& u) { return curve.getValue(u, 0.0); };
    auto const withOperand = [&](Tempus const& u) { return curve.getValue(u, 10.0); };
    auto const upToFirst = [&](Tempus const& u) { return curve.getValue(u, static_cast<void*>(first)); };
    std::vector<Tempus> t(1, kTempusZero);
    std::vector<double> v(2, -1.0), s, w;
    curve.getCurveSamples(start, step, count = 8, &t, &v); // both grow, by what the nodes left
    ASSERT_EQ(std::pair(t.size(), v.size()), std::pair(std::size_t{3}, std::size_t{4}));
    expectRow(&t[1], nullptr, &v[2], whole);
    EXPECT_EQ(v[1], -1.0);
    curve.getCurveSamples(first, start, step, count = 8, nullptr, &w);
    expectRow(nullptr, nullptr, w.data(), upToFirst);
    curve.getCurveSamples(0.5, 0.375, count = 8, &s, nullptr);
    expectRow(nullptr, s.data(), &v[2], whole);
    double numbers[8] = {}, moments[8] = {}, *numberArray = numbers, *momentArray = moments;
    Tempus marks[8], *markArray = marks;
    curve.getCurveSamples(0.5, 0.375, count = 8, &momentArray, &numberArray, 10.0);
    expectRow(nullptr, moments, numbers, withOperand);
    curve.getCurveSamples(first, start, step, count = 8, &markArray, &numberArray);
    expectRow(marks, nullptr, numbers, upToFirst);
    curve.getCurveSamples(start, step, count = 8, static_cast<Tempus**>(nullptr), &numberArray);
    expectRow(nullptr, nullptr, numbers, whole);
}

} // namespace
