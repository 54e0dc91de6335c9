// Keypoints of a curve: who is refused, what is written, what deleting leaves, and the forms of sampling.

#include "lumenkey/curves/KFTypedCurves.h"
#include "lumenkey/splines/KFCoreGlobals.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFVertex.h"

#include <gtest/gtest.h>

#include <functional>
#include <sstream>

namespace {

Tempus at(double t) { return KFChronoForChannelSeconds(t, 600); }

/// Sets a process-wide switch for a scope.
class Switched {
public:
    Switched(bool& field, bool value) : _field(field), _before(field) { field = value; }
    ~Switched() { _field = _before; }
    Switched(Switched const&) = delete;
    Switched& operator=(Switched const&) = delete;

private:
    bool& _field;
    bool const _before;
};

/// Everything that keypoint operations can change, read past the curve's own guards.
std::string stateOf(KFCurve& curve) {
    std::ostringstream text;
    text.precision(17);
    double initial = 0.0;
    curve.getCurveInitialValue(&initial);
    text << initial << ' ' << curve.isSpline();
    KFSpline* const spline = curve.getSpline();
    if (spline == nullptr)
        return text.str();
    text << " closed " << spline->isClosed();
    for (auto place = spline->beginVertices(); place != spline->endVertices();
         place = spline->nextPlace(place)) {
        KFVertex const& v = *spline->vertexAt(place);
        double inU = 0.0, inV = 0.0, outU = 0.0, outV = 0.0;
        v.getInputTangents(&inU, &inV, kTempusZero);
        v.getOutputTangents(&outU, &outV, kTempusZero);
        text << " | " << TempusGetSeconds(v.getValueU()) << ' ' << v.getValueV(kTempusZero) << ' ' << inU
             << ' ' << inV << ' ' << outU << ' ' << outV << ' ' << v.getFlags() << ' ' << v.getInterpolation()
             << ' ' << v.getBias(kTempusZero) << ' ' << v.getNormal(kTempusZero) << ' '
             << v.isEnabled(kTempusZero);
    }
    return text.str();
}

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
        getSpline()->getVertexHandle(at(t), &handle, true);
        return handle;
    }
    double value(double t) { return getValue(at(t), 0.0); }
};

// --- Guards ---

/// What an operation asks for, each a bit.
enum Need : unsigned { Spline = 1, Root = 2, Editable = 4, Handle = 8 };
constexpr unsigned S = Spline, K = Spline | Root, R = Spline | Handle, M = Spline | Editable;
constexpr unsigned E = Spline | Editable | Handle, ERoot = E | Root, MRoot = M | Root;

struct Operation {
    char const* name;
    unsigned needs;
    /// What an accepted call shows: a changed curve, a result of true, or both.
    bool changes;
    bool succeeds;
    std::function<bool(KFCurve& c, void* h, bool force)> run;
};

#define KF_OP(name, needs, changes, succeeds, call)                                                          \
    {                                                                                                        \
        name, needs, changes, succeeds,                                                                      \
            []([[maybe_unused]] KFCurve& c, [[maybe_unused]] void* h, [[maybe_unused]] bool force) -> bool { \
                return call;                                                                                 \
            }                                                                                                \
    }

void* out;
Tempus when;
double x, y;
bool flag;
std::uint32_t number;
std::vector<void*> handles;
std::vector<Tempus> times;
std::vector<double> values;
std::vector<std::pair<Tempus, std::pair<double, unsigned>>> keys;

// clang-format off
Operation const kOperations[] = {
    KF_OP("cloneKeypoint", E, true, true, c.cloneKeypoint(h, at(2.5), force)),
    KF_OP("moveKeypoint", E, true, true, c.moveKeypoint(h, at(2.5), force, false, false)),
    KF_OP("offsetKeypointInTime", E, true, true, c.offsetKeypointInTime(h, at(2.5), force)),
    KF_OP("delKeypoint", E, true, true, c.delKeypoint(h, force)),
    KF_OP("delKeypoints", M, true, true, c.delKeypoints(at(1), at(2), force)),
    KF_OP("delAllKeypoints", M, true, false, c.delAllKeypoints(at(1), force)),
    KF_OP("getKeypointHandle", K, false, true, c.getKeypointHandle(at(2), &out)),
    KF_OP("getNextValidKeypointHandle(handle)", S, false, true, c.getNextValidKeypointHandle(h, &out)),
    KF_OP("getNextValidKeypointHandle(when)", S, false, true, c.getNextValidKeypointHandle(at(1), &out)),
    KF_OP("getPreviousValidKeypointHandle", S, false, true, c.getPreviousValidKeypointHandle(at(2), &out)),
    KF_OP("getNextKeypoint", K, false, true, c.getNextKeypoint(at(1), &when, &x)),
    KF_OP("getPreviousKeypoint", K, false, true, c.getPreviousKeypoint(at(2), &when, &x)),
    KF_OP("getKeypoint", R, false, true, c.getKeypoint(h, &when, &x)),
    KF_OP("getFirstKeypoint", K, false, true, c.getFirstKeypoint(&when, &x)),
    KF_OP("getLastKeypoint", K, false, true, c.getLastKeypoint(&when, &x)),
    KF_OP("getFirstValidKeypointHandle", S, false, true, c.getFirstValidKeypointHandle(&out)),
    KF_OP("getLastValidKeypointHandle", S, false, true, c.getLastValidKeypointHandle(&out)),
    KF_OP("getKeypointHandleList", K, false, true, c.getKeypointHandleList(handles)),
    KF_OP("getKeypointValidHandleList", K, false, true, c.getKeypointValidHandleList(handles)),
    KF_OP("getKeypointsTimeAndValue", K, false, true,
          c.getKeypointsTimeAndValue({at(1), at(2)}, keys, &when, nullptr)),
    KF_OP("getNumberOfKeypoints", K, false, true, c.getNumberOfKeypoints() == 3),
    KF_OP("reverseKeypoints", M, true, true,
          c.reverseKeypoints(c.getSpline() ? c.getSpline()->getFirstVertex() : nullptr,
              c.getSpline() ? c.getSpline()->getLastVertex() : nullptr, force)),
    KF_OP("getKeypointFlags", R, false, true, c.getKeypointFlags(h, &number)),
    KF_OP("setKeypointFlags", ERoot, true, true, c.setKeypointFlags(h, 0x18, force)),
    KF_OP("enableKeypoint", E, true, true, c.enableKeypoint(h, false, force)),
    KF_OP("isEnabledKeypoint", R, false, true, c.isEnabledKeypoint(h, &flag) && flag),
    KF_OP("selectKeypoint", ERoot, true, true, c.selectKeypoint(h, true, force)),
    KF_OP("lockKeypoint", E, true, true, c.lockKeypoint(h, true, force)),
    KF_OP("isLockedKeypoint", R, false, true, c.isLockedKeypoint(h, &flag)),
    KF_OP("breakKeypointHandles", E, true, true, c.breakKeypointHandles(h, true, force)),
    KF_OP("areHandlesBroken", R, false, true, c.areHandlesBroken(h, &flag)),
    KF_OP("weightHandles", E, true, true, c.weightHandles(h, true, force)),
    KF_OP("areHandlesWeighted", R, false, true, c.areHandlesWeighted(h, &flag)),
    KF_OP("deriveKeypoint", R, true, true, c.deriveKeypoint(h)),
    KF_OP("setKeypointSmooth", E, true, true, c.setKeypointSmooth(h, true, force)),
    KF_OP("flattenHandles", E, true, true, c.flattenHandles(h, force)),
    KF_OP("getKeypointNormal", R, false, true, c.getKeypointNormal(h, &x)),
    KF_OP("setKeypointNormal", ERoot, true, true, c.setKeypointNormal(h, 0.5, force)),
    KF_OP("getKeypointNormal(when)", S, false, true, c.getKeypointNormal(at(2.5), &x)),
    KF_OP("setKeypointNormal(when)", MRoot, true, true, c.setKeypointNormal(at(2.5), 0.5, force)),
    KF_OP("setKeypointInputHandles", E, true, true, c.setKeypointInputHandles(h, -12, 6, force)),
    KF_OP("setKeypointOutputHandles", E, true, true, c.setKeypointOutputHandles(h, 12, 6, force)),
    KF_OP("getKeypointInputHandles", R, false, true, c.getKeypointInputHandles(h, &x, nullptr)),
    KF_OP("getKeypointOutputHandles", R, false, true, c.getKeypointOutputHandles(h, nullptr, &y)),
    KF_OP("setKeypointInputNormalizedTangents", E, true, true,
          c.setKeypointInputNormalizedTangents(h, -1, 6, force)),
    KF_OP("setKeypointOutputNormalizedTangents", E, true, true,
          c.setKeypointOutputNormalizedTangents(h, 1, 6, force)),
    KF_OP("getKeypointInputNormalizedTangents", R, false, true,
          c.getKeypointInputNormalizedTangents(h, &x, &y)),
    KF_OP("getKeypointOutputNormalizedTangents", R, false, true,
          c.getKeypointOutputNormalizedTangents(h, &x, &y)),
    KF_OP("setKeypointBiasLinear", R, true, true, c.setKeypointBiasLinear(h, 0.75)),
    KF_OP("getKeypointBiasLinear", R, false, true, c.getKeypointBiasLinear(h, &x)),
    KF_OP("setKeypointInterpolation", E, true, true, c.setKeypointInterpolation(h, 4, force)),
    KF_OP("getKeypointInterpolation", R, false, true, c.getKeypointInterpolation(h, &number, &flag)),
    KF_OP("setKeypointSpeed", E, true, true, c.setKeypointSpeed(h, kKFVertexSpeedEase, force)),
    KF_OP("getKeypointSpeed", R, false, true, c.getKeypointSpeed(h, &number)),
    KF_OP("adjustKeypointSpeed", E, true, false, c.adjustKeypointSpeed(h, 0.5, force)),
    KF_OP("lockCurve", S, true, true, c.lockCurve(true)),
    KF_OP("closeCurve", S, true, true, c.closeCurve()),
    KF_OP("isClosedCurve", S, false, true, c.isClosedCurve(&flag)),
    KF_OP("hasInterpolation", S, false, true, c.hasInterpolation(1, &flag)),
    KF_OP("reparametrizeCurve", S, true, true, c.reparametrizeCurve()),
    KF_OP("purgeCurve", S, false, true, c.purgeCurve()),
    KF_OP("getPointInputTangents", S, false, true, c.getPointInputTangents(at(1.5), &x, &y, true)),
    KF_OP("getPointOutputTangents", S, false, true, c.getPointOutputTangents(at(1.5), &x, nullptr, false)),
    KF_OP("getSplineSamplesAndIgnoreLinear", S, false, true,
          c.getSplineSamplesAndIgnoreLinear(at(1), at(3), at(0.5), &times, &values)),
    KF_OP("getCurveDerivativesSamples", S, false, true,
          c.getCurveDerivativesSamples(at(1), at(1), number = 2, &times, &values)),
    KF_OP("warpCurveLinear", M, true, true, c.warpCurveLinear(2.0, at(1), force)),
    KF_OP("forceRetimeCurve", M, true, true, c.forceRetimeCurve(at(2), at(1))),
};
// clang-format on

struct Situation {
    char const* name;
    unsigned missing;
    std::function<void*(Keyed& curve, Keyed& other)> prepare; ///< Answers the handle to use.
};

// clang-format off
Situation const kSituations[] = {
    {"plain", 0, [](Keyed& c, Keyed&) { return c.key(2); }},
    {"no spline", Spline | Handle, [](Keyed& c, Keyed& other) { c.delAllKeypoints(at(1), true); return other.key(2); }},
    {"constant root", Root, [](Keyed& c, Keyed&) { c.setIsSpline(false, at(1)); return c.key(2); }},
    {"not keyframable", Editable, [](Keyed& c, Keyed&) { c.setCurveKeyframable(false); return c.key(2); }},
    {"foreign handle", Handle, [](Keyed&, Keyed& other) { return other.key(2); }},
    {"null handle", Handle, [](Keyed&, Keyed&) { return static_cast<void*>(nullptr); }},
};
// clang-format on

} // namespace

TEST(CurveKeypoints, RefuseByTheirGuardsAndThenChangeNothing) {
    for (Situation const& situation : kSituations) {
        for (Operation const& operation : kOperations) {
            for (bool const force : {false, true}) {
                SCOPED_TRACE(std::string(operation.name) + ", " + situation.name + (force ? ", forced" : ""));
                Keyed curve;
                Keyed other;
                void* const handle = situation.prepare(curve, other);
                std::string const before = stateOf(curve);
                std::string const otherBefore = stateOf(other);
                bool const accepted = (operation.needs & situation.missing) == 0;
                EXPECT_EQ(operation.run(curve, handle, force), accepted && operation.succeeds);
                EXPECT_EQ(stateOf(curve) != before, accepted && operation.changes);
                EXPECT_EQ(stateOf(other), otherBefore);
            }
        }
    }
}

TEST(CurveKeypoints, EditAnUnanimatedCurveOnlyByForceOrSwitch) {
    for (int const way : {0, 1, 2}) {
        SCOPED_TRACE(way);
        Switched const animate(KFCoreGlobals::getInstance().animate, way == 2);
        KFCurveDouble curve(7.0);
        curve.setIsSpline(true, kTempusZero);
        curve.loadVertices(true, 4);
        curve.loadVertices(false, 0);
        ASSERT_NE(curve.getSpline(), nullptr);
        EXPECT_EQ(curve.reverseKeypoints(nullptr, nullptr, way == 1), way != 0);
        EXPECT_EQ(curve.warpCurveLinear(2.0, at(1), way == 1), way != 0);
        EXPECT_FALSE(curve.delAllKeypoints(at(1), way == 1));
        EXPECT_EQ(curve.getSpline() == nullptr, way != 0);
        EXPECT_EQ(curve.setKeypoint(at(1), way == 1), way != 0);
        EXPECT_EQ(curve.getNumberOfKeypoints(), way != 0 ? 1u : 0u);
        EXPECT_EQ(curve.getValue(at(4), 0.0), 7.0);
    }
}

TEST(CurveKeypoints, FailingReadersWriteWhatTheySay) {
    KFCurveDouble curve(7.0);
    Keyed foreign;
    when = at(9);
    x = 9.0;
    EXPECT_FALSE(curve.getFirstKeypoint(&when, &x));
    EXPECT_EQ(when, kTempusZero);
    EXPECT_EQ(x, 0.0);
    EXPECT_FALSE(curve.getLastKeypoint(nullptr, nullptr));
    keys.resize(3);
    Tempus last = at(9);
    EXPECT_FALSE(curve.getKeypointsTimeAndValue({at(0), at(9)}, keys, nullptr, &last));
    EXPECT_TRUE(keys.empty());
    EXPECT_FALSE(TempusIsValid(last));
    Keyed keyed;
    flag = true;
    EXPECT_FALSE(keyed.isLockedKeypoint(foreign.key(2), &flag));
    EXPECT_FALSE(flag);
    EXPECT_FALSE(keyed.getKeypointBiasLinear(keyed.key(2), nullptr));
    EXPECT_TRUE(keyed.isEnabledKeypoint(keyed.key(2), nullptr));
    EXPECT_TRUE(keyed.getKeypointHandle(at(2), nullptr));
}

TEST(CurveKeypoints, MovingTellsItsSwitchesApart) {
    struct Case {
        bool constrain, replace;
        double target;
        std::vector<double> expected;
    };
    double const beside = 3.0 - 1.0 / 30.0;
    for (Case const& c :
         {Case{true, false, 4.0, {1.0, beside, 3.0}}, Case{false, false, 4.0, {1.0, 3.0, 4.0}},
          Case{false, true, 3.0, {1.0, 3.0}}, Case{false, false, 3.0, {1.0, 3.0, 3.0}}}) {
        Keyed curve;
        ASSERT_TRUE(curve.moveKeypoint(curve.key(2), at(c.target), false, c.constrain, c.replace));
        std::vector<double> found;
        KFSpline const& spline = *curve.getSpline();
        for (auto place = spline.beginVertices(); place != spline.endVertices();
             place = spline.nextPlace(place))
            found.push_back(TempusGetSeconds(spline.vertexAt(place)->getValueU()));
        ASSERT_EQ(found.size(), c.expected.size());
        for (std::size_t i = 0; i < found.size(); ++i)
            EXPECT_NEAR(found[i], c.expected[i], 1e-9);
    }
    Keyed curve; // a copy passes its neighbours and joins what is there
    EXPECT_TRUE(curve.cloneKeypoint(curve.key(2), at(3), false));
    EXPECT_EQ(curve.getNumberOfKeypoints(), 4u);
}

TEST(CurveKeypoints, HandlesAreTwelveTangentsUnlessParametric) {
    for (bool const parametric : {false, true}) {
        Keyed curve;
        curve.setCurveParametric(parametric);
        double const scale = parametric ? 1.0 : 12.0;
        ASSERT_TRUE(curve.setKeypointInputHandles(curve.key(2), -12.0, 6.0, true));
        ASSERT_TRUE(curve.setKeypointOutputHandles(curve.key(2), 12.0, 3.0, true));
        curve.getKeypointInputHandles(curve.key(2), &x, &y);
        EXPECT_EQ(std::pair(x, y), std::pair(-12.0, 6.0));
        curve.getKeypointInputNormalizedTangents(curve.key(2), &x, &y);
        EXPECT_EQ(std::pair(x, y), std::pair(-12.0 / scale, 6.0 / scale));
        curve.getKeypointOutputHandles(curve.key(2), &x, &y);
        EXPECT_EQ(std::pair(x, y), std::pair(12.0, 3.0));
        curve.getKeypointOutputNormalizedTangents(curve.key(2), &x, &y);
        EXPECT_EQ(std::pair(x, y), std::pair(12.0 / scale, 3.0 / scale));
    }
}

TEST(CurveKeypoints, DeletingTheLastOneKeepsItsValueByHandleOnly) {
    Keyed byHandle;
    byHandle.delKeypoint(byHandle.key(1), false);
    byHandle.delKeypoint(byHandle.key(3), false);
    EXPECT_TRUE(byHandle.delKeypoint(byHandle.key(2), false));
    EXPECT_EQ(byHandle.getSpline(), nullptr);
    EXPECT_EQ(byHandle.value(9), 5.0);

    Keyed byRange;
    EXPECT_TRUE(byRange.delKeypoints(at(0), at(3), false));
    EXPECT_EQ(byRange.getSpline(), nullptr);
    EXPECT_EQ(byRange.value(1), 7.0);

    Keyed all;
    EXPECT_FALSE(all.delAllKeypoints(at(1.5), false));
    EXPECT_EQ(all.getSpline(), nullptr);
    EXPECT_EQ(all.value(9), 3.0);

    Keyed locked;
    locked.lockKeypoint(locked.key(2), true, false);
    EXPECT_FALSE(locked.delKeypoint(locked.key(2), true));
    EXPECT_EQ(locked.getNumberOfKeypoints(), 3u);

    for (bool const parametric : {false, true}) {
        Keyed path;
        path.setCurveParametric(parametric);
        EXPECT_TRUE(path.delKeypoints(at(1), at(2), false)); // leaves 1 and 3
        path.getLastKeypoint(&when, nullptr);
        EXPECT_EQ(when, parametric ? at(1) : at(3));
    }
}

TEST(CurveKeypoints, ValuesWithoutAnimationBecomeTheConstant) {
    KFCurveDouble constant(5.0);
    constant.setAbsoluteMaxValueV(9.0);
    EXPECT_TRUE(constant.setKeypoint(at(3), 20.0, false));
    EXPECT_EQ(constant.getNumberOfKeypoints(), 0u);
    EXPECT_EQ(constant.getValue(at(0), 0.0), 9.0);
    constant.setIsSpline(true, kTempusZero);
    EXPECT_EQ(constant.getValue(at(0), 0.0), 9.0);
    EXPECT_TRUE(constant.setKeypointsValue(4.0, false));
    EXPECT_TRUE(constant.setKeypointNoTangents(at(3), 3.0, false));
    EXPECT_EQ(constant.getValue(at(0), 0.0), 3.0);
    EXPECT_EQ(constant.getSpline(), nullptr);
    constant.loadVertices(true, 1); // a spline without keypoints is no obstacle
    EXPECT_TRUE(constant.setKeypoint(at(3), 2.0, false));
    EXPECT_EQ(constant.getValue(at(0), 0.0), 2.0);

    Keyed scaled;
    scaled.setCurveDefaultValue(4.0);
    scaled.setAbsoluteMaxValueV(6.0);
    EXPECT_TRUE(scaled.scaleCurve(2.0));
    EXPECT_EQ(scaled.value(1), 2.0);
    EXPECT_EQ(scaled.value(2), 6.0);
    scaled.getCurveDefaultValue(&x);
    EXPECT_EQ(x, 6.0);
    scaled.setRootNode(1.5);
    scaled.scaleCurve(2.0);
    EXPECT_EQ(scaled.value(1), 3.0);
}

TEST(CurveKeypoints, OffsetTheCurveWhereToldTo) {
    Switched const offset(KFCoreGlobals::getInstance().shouldOffset, true);
    struct Case {
        char const* name;
        std::function<void(Keyed&)> write;
        double first, middle;
        std::uint32_t count;
    };
    Tempus const u[] = {at(1), at(2)};
    double const v[] = {50.0, 8.0};
    // clang-format off
    Case const cases[] = {
        {"by time", [](Keyed& c) { c.setKeypoint(at(2), 6.0, false); }, 2.0, 6.0, 3},
        {"between keypoints", [](Keyed& c) { c.setKeypoint(at(1.5), 4.0, false); }, 2.0, 6.0, 3},
        {"by time, forced", [](Keyed& c) { c.setKeypoint(at(2), 6.0, true); }, 1.0, 6.0, 3},
        {"by handle", [](Keyed& c) { c.setKeypoint(c.key(2), at(2), 6.0, false); }, 2.0, 6.0, 3},
        {"by handle, forced", [](Keyed& c) { c.setKeypoint(c.key(2), at(2), 6.0, true); }, 1.0, 6.0, 3},
        {"value at zero", [](Keyed& c) { c.setKeypointValue(c.key(2), 3.0, false); }, 3.0, 7.0, 3},
        {"value, forced", [](Keyed& c) { c.setKeypointValue(c.key(2), 3.0, true); }, 1.0, 3.0, 3},
        {"without tangents", [](Keyed& c) { c.setKeypointNoTangents(at(1.5), 9.0, false); }, 1.0, 5.0, 4},
        {"not keyframable", [](Keyed& c) { c.setCurveKeyframable(false); c.setKeypointNoTangents(at(2), 7.0, false); },
         3.0, 7.0, 3},
        {"not keyframable, forced", [](Keyed& c) { c.setCurveKeyframable(false); c.setKeypoint(at(2), 7.0, true); },
         1.0, 7.0, 3},
        {"appending, not keyframable: the last one decides",
         [&](Keyed& c) { c.setCurveKeyframable(false); c.appendKeypointsNoTangents(2, u, v, true); }, 4.0, 8.0, 3},
    };
    // clang-format on
    for (Case const& c : cases) {
        SCOPED_TRACE(c.name);
        Keyed curve;
        c.write(curve);
        EXPECT_EQ(curve.value(1), c.first);
        EXPECT_EQ(curve.value(2), c.middle);
        EXPECT_EQ(curve.getNumberOfKeypoints(), c.count);
    }
    Keyed curve;
    EXPECT_FALSE(curve.setKeypointValue(nullptr, 3.0, true));
    EXPECT_FALSE(curve.setKeypoint(nullptr, at(1), 3.0, false));
    EXPECT_EQ(stateOf(curve), stateOf(*std::make_unique<Keyed>()));
}

TEST(CurveKeypoints, BulkLoadingEqualsAddingOneByOne) {
    constexpr std::uint32_t count = 500;
    std::vector<Tempus> u;
    std::vector<double> v;
    for (std::uint32_t i = 0; i < count; ++i) {
        u.push_back(TempusMake(i, 24));
        v.push_back(static_cast<double>(i * 37 % 101));
    }
    KFCurveDouble bulk(0.0), appended(0.0), added(0.0);
    for (KFCurve* const curve : {&bulk, &appended, &added})
        curve->setIsSpline(true, kTempusZero);
    EXPECT_TRUE(bulk.loadVertices(true, 4000000000u)); // what a document claims is a hint
    EXPECT_TRUE(bulk.getSplineState()->shared);
    EXPECT_TRUE(bulk.appendKeypointsNoTangents(count, u.data(), v.data(), true));
    EXPECT_TRUE(bulk.loadVertices(false, count));
    for (std::uint32_t i = 0; i < count; ++i) {
        appended.appendKeypointNoTangents(u[i], v[i], true);
        added.setKeypointNoTangents(u[i], v[i], true);
    }
    EXPECT_FALSE(appended.getSplineState()->shared);
    EXPECT_EQ(bulk.getNumberOfKeypoints(), count);
    EXPECT_EQ(stateOf(bulk), stateOf(added));
    EXPECT_EQ(stateOf(appended), stateOf(added));
    for (double t = -1.0; t < 22.0; t += 0.11)
        EXPECT_EQ(bulk.getValue(at(t), 0.0), added.getValue(at(t), 0.0));
    EXPECT_TRUE(bulk.getNextValidKeypointHandle(u[7], &out));
    EXPECT_EQ(static_cast<KFVertex*>(out)->getValueU(), u[8]);
}

namespace {

/// Adds its caller's number plus one to what comes in, and gives at most five samples.
class Shorten : public KFCurveNode {
public:
    double solveNode(Tempus const&, double operand, double input) override { return input + operand + 1.0; }
    void solveNode(KFCurveNodeParam& param) override {
        param.outputCount = std::min(param.outputCount, std::uint32_t{5});
        for (std::uint32_t i = 0; i < param.outputCount; ++i)
            param.outputValues[i] = param.inputValues[i] + param.operand + 1.0;
    }
    bool getUForValue(double, std::vector<Tempus>&, BXTimeRange&, Tempus&, std::uint32_t) override {
        return false;
    }
    void getNeededRange(KFCurveNodeParam* param) override { param->needSameRange(); }
    KFCurveNode* cloneNode() const override { return new Shorten; }
    bool compare(KFCurveNode const*) const override { return true; }
};

} // namespace

TEST(CurveSamples, FormsAgreeWithPoints) {
    for (bool const keyed : {true, false}) {
        SCOPED_TRACE(keyed);
        Keyed curve;
        if (!keyed)
            curve.setRootNode(4.0);
        KFCurveNode* const first = new Shorten;
        curve.appendCurveProcessingNode(first);
        curve.appendCurveProcessingNode(new Shorten);
        Tempus const start = TempusMake(1, 2);
        Tempus const step = TempusMake(3, 8);
        std::uint32_t count = 0;
        auto const expectRow = [&](Tempus const* t, double const* seconds, double const* v,
                                   auto const& point) {
            ASSERT_EQ(count, 5u);
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
        std::vector<double> v(2, -1.0), s;
        curve.getCurveSamples(start, step, count = 8, &t, &v); // both grow, by what the nodes left
        ASSERT_EQ(std::pair(t.size(), v.size()), std::pair(std::size_t{6}, std::size_t{7}));
        expectRow(&t[1], nullptr, &v[2], whole);
        EXPECT_EQ(v[1], -1.0);
        v.clear();
        curve.getCurveSamples(first, start, step, count = 8, nullptr, &v);
        expectRow(nullptr, nullptr, v.data(), upToFirst);
        v.clear();
        curve.getCurveSamples(0.5, 0.375, count = 8, &s, &v);
        expectRow(nullptr, s.data(), v.data(), whole);

        double numbers[8] = {}, moments[8] = {};
        Tempus marks[8];
        double *numberArray = numbers, *momentArray = moments;
        Tempus* markArray = marks;
        curve.getCurveSamples(0.5, 0.375, count = 8, &momentArray, &numberArray, 10.0);
        expectRow(nullptr, moments, numbers, withOperand);
        curve.getCurveSamples(first, start, step, count = 8, &markArray, &numberArray);
        expectRow(marks, nullptr, numbers, upToFirst);
        curve.getCurveSamples(start, step, count = 8, static_cast<Tempus**>(nullptr), &numberArray);
        expectRow(nullptr, nullptr, numbers, whole);

        EXPECT_TRUE(curve.getCurveSamples(start, step, count = 8, &t, nullptr));
        EXPECT_EQ(t.size(), 11u);
        EXPECT_TRUE(curve.getCurveSamples(start, step, count = 0, &t, &v));
        EXPECT_TRUE(curve.getCurveSamples(nullptr, start, step, count = 3, &markArray, &numberArray));
        EXPECT_EQ(numbers[2], curve.getValue(start + step * 2, static_cast<void*>(nullptr)));
    }
}
