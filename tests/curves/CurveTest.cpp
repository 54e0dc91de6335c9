// A curve as a whole: its roots, its settings record, its chain and its copies; and the typed curves.

#include "lumenkey/curves/KFTypedCurves.h"
#include "lumenkey/splines/KFCoreGlobals.h"
#include "lumenkey/splines/KFSpline.h"
#include "tests/curves/ChainNodes.h"
#include "tests/curves/CountedMemory.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cmath>
#include <functional>
#include <limits>
#include <memory>
#include <thread>

namespace {

constexpr double kHighest = std::numeric_limits<double>::max();
constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
constexpr std::nullptr_t kRootAlone = nullptr;

Tempus at(double seconds) { return KFChronoForChannelSeconds(seconds, 1000); }

double valueAt(KFCurve& curve, double seconds) { return curve.getValue(at(seconds), 0.0); }

/// Keys that rise from 0 at 0 s to 10 at 10 s, with a constant continuation.
void addRamp(KFCurve& curve) {
    curve.setCurveType(1);
    curve.setKeypoint(at(0), 0.0, true);
    curve.setKeypoint(at(10), 10.0, true);
}
double ramp(double t) { return std::clamp(t, 0.0, 10.0); }

template <class Copy, class Curve> std::unique_ptr<Copy> owned(Curve* curve) {
    return std::unique_ptr<Copy>(dynamic_cast<Copy*>(curve));
}

void describeRow(KFCurveNodeParam& param, double start, double step, std::uint32_t count, double* values) {
    param.outputStart = at(start);
    param.outputStep = at(step);
    param.outputCount = count;
    param.outputValues = values;
}

// --- Roots, values and settings ---

TEST(KFCurve, WritesAConstantToBothNodesAndClampsOnReading) {
    KFCurveDouble curve(5.0);
    std::uint32_t type = 9;
    EXPECT_TRUE(curve.getCurveType(&type) && type == 0);
    curve.setCurveInitialValue(9.0);
    curve.setCurveDefaultValue(4.0);
    curve.setAbsoluteMaxValueV(6.0);
    double value = 0.0;
    for (std::uint32_t root : {0U, 3U}) { // both nodes, told apart by a switch of the root
        EXPECT_TRUE(curve.setCurveType(root));
        EXPECT_EQ(valueAt(curve, 1), 6.0);
        EXPECT_TRUE(curve.getCurveInitialValue(&value) && value == 6.0);
        EXPECT_TRUE(curve.getCurrentMaxValueV(&value, true) && value == 9.0); // not clamped
        EXPECT_TRUE(curve.getCurveDefaultValue(&value) && value == 4.0);
    }
    EXPECT_FALSE(curve.setCurveType(2) || curve.setCurveType(4));
    curve.setAbsoluteMinValueV(8.0); // crossed limits: the maximum is asked first
    EXPECT_EQ(valueAt(curve, 0), 6.0);
    curve.setCurveInitialValue(kNaN);
    EXPECT_TRUE(std::isnan(valueAt(curve, 0)));

    curve.setAbsoluteMaxValueV(100.0);
    curve.setAbsoluteMinValueV(0.0);
    addRamp(curve);
    curve.setIsSpline(false, at(3));
    EXPECT_EQ(valueAt(curve, 8), 3.0);
    EXPECT_EQ(curve.getNumberOfKeypoints(), 0U);
    curve.setIsSpline(true, at(0)); // the keypoints were only unread
    EXPECT_EQ(valueAt(curve, 8), 8.0);
    curve.setCurveToDefault();
    EXPECT_TRUE(curve.getSpline() == nullptr && valueAt(curve, 0) == 4.0);
    curve.setIsSpline(false, at(0));
    EXPECT_EQ(valueAt(curve, 0), 4.0);
}

TEST(KFCurve, TellsAnimatedFromKeyframable) {
    bool& animate = KFCoreGlobals::getInstance().animate;
    KFCurveDouble curve(1.0);
    bool out = true;
    EXPECT_FALSE(curve.isCurveAnimated(&out) || out || curve.canModifyCurve(false));
    EXPECT_TRUE(curve.canModifyCurve(true));
    animate = true;
    EXPECT_TRUE(curve.isCurveAnimated(&out) && out && curve.canModifyCurve(false));
    animate = false;
    addRamp(curve);
    EXPECT_TRUE(curve.isCurveAnimated(&out) && out && curve.canModifyCurve(false));
    curve.setCurveKeyframable(false);
    EXPECT_FALSE(curve.isCurveAnimated(&out) || !out || curve.canModifyCurve(true));
}

TEST(KFCurve, MakesItsSettingsLocalOnlyWhenOneChanges) {
    void (*const setters[])(KFCurve&, bool other) = {
        [](KFCurve& c, bool o) { c.setCurveParametric(o); },
        [](KFCurve& c, bool o) { c.setRoundingInUSpace(!o); },
        [](KFCurve& c, bool o) { c.setCurveDeriveTangents(!o); },
        [](KFCurve& c, bool o) { c.setCurveInterpolation(o ? 4 : 1); },
        [](KFCurve& c, bool o) { c.setCurveExtrapolation(o ? 3 : 0, 7); },
        [](KFCurve& c, bool o) { c.setCurveExtrapolation(o ? 2 : 0, 0); },
        [](KFCurve& c, bool o) { c.setRetimingExtrapolation(o); },
    };
    KFCurveDouble together(0.0);
    addRamp(together);
    KFSplineState* const shared = together.getSplineState();
    for (auto const set : setters) {
        KFCurveDouble curve(0.0);
        addRamp(curve);
        set(curve, false);
        EXPECT_EQ(curve.getSplineState(), shared);
        set(curve, true);
        set(together, true);
        KFSplineState* const local = curve.getSplineState();
        EXPECT_FALSE(local->shared || *local == *shared);
        set(curve, false); // back again, and still its own
        EXPECT_TRUE(curve.getSplineState() == local && curve.getSpline()->getState() == local);
        EXPECT_TRUE(*shared == KFSplineState() && *local == *shared);
    }
    EXPECT_TRUE(*together.getSplineState() == KFSplineState(true, false, false, true, 4, 3, 2, true));
    EXPECT_TRUE(together.getSpline()->hasInterpolation(4)); // the keypoints take it over
    together.setCurveKeyframable(false);
    EXPECT_FALSE(together.setCurveInterpolation(1));
}

// --- The chain ---

TEST(KFCurve, KeepsItsChainInOrderAndOwnsIt) {
    std::string destroyed;
    auto curve = std::make_unique<KFCurveDouble>(1.0);
    auto* const a = new Gain(1.0, 'a', &destroyed);
    auto* const b = new Gain(2.0, 'b', &destroyed);
    auto* const c = new Gain(3.0, 'c', &destroyed);
    auto* const d = new Gain(4.0, 'd', &destroyed);
    Gain foreign(5.0);
    KFCurveNode* previous = b;
    EXPECT_FALSE(curve->getPreviousProcessingNode(a, &previous) || previous != nullptr);
    EXPECT_TRUE(curve->appendCurveProcessingNode(b) && curve->insertCurveProcessingNode(a, nullptr));
    EXPECT_TRUE(curve->insertCurveProcessingNode(d, &foreign) && curve->insertCurveProcessingNode(c, b));
    EXPECT_FALSE(curve->appendCurveProcessingNode(b) || curve->insertCurveProcessingNode(nullptr, b));
    std::vector<KFCurveNode*> nodes{nullptr};
    curve->enumerateCurveProcessingNodes(nodes);
    EXPECT_EQ(nodes, (std::vector<KFCurveNode*>{a, b, c, d}));

    EXPECT_TRUE(curve->getPreviousProcessingNode(c, &previous) && previous == b);
    EXPECT_TRUE(curve->getPreviousProcessingNode(&foreign, &previous) && previous == d);
    EXPECT_FALSE(curve->deleteCurveProcessingNode(&foreign) || curve->removeCurveProcessingNode(nullptr));
    EXPECT_TRUE(curve->removeCurveProcessingNode(a) && curve->appendCurveProcessingNode(a));
    EXPECT_TRUE(destroyed.empty() && curve->deleteCurveProcessingNode(c) && destroyed == "c");
    curve.reset();
    EXPECT_EQ(destroyed, "cadb");
}

TEST(KFCurve, GivesTheSameAtOneTimeAndInARow) {
    using Function = std::function<double(double)>;
    Function const sums = [](double t) { return ramp(t - 1) + ramp(t) + ramp(t + 1); };
    struct Step {
        KFCurveNode* node;
        Function value; ///< Behind the node.
    };
    std::vector<Step> const chains[] = {
        {{new AddTime(3.0), [](double t) { return ramp(t) + 3 * t; }},
         {new Delay(0.5), [](double t) { return ramp(t - 0.5) + 3 * (t - 0.5); }},
         {new SumOfThree(), [&](double t) { return sums(t - 0.5) + 9 * (t - 0.5); }}},
        {{new Delay(0.5), [](double t) { return ramp(t - 0.5); }},
         {new Gain(2.0), [](double t) { return 2 * ramp(t - 0.5); }},
         {new Delay(0.5), [](double t) { return 2 * ramp(t - 1); }}},
        {{new Gain(2.0), [](double t) { return 2 * ramp(t); }},
         {new SumOfThree(), [&](double t) { return 2 * sums(t); }},
         {new Delay(0.5), [&](double t) { return 2 * sums(t - 0.5); }},
         {new SumOfThree(), [&](double t) { return 2 * (sums(t - 1.5) + sums(t - 0.5) + sums(t + 0.5)); }}},
    };
    for (auto const& chain : chains) {
        KFCurveDouble curve(0.0);
        addRamp(curve);
        for (Step const& step : chain)
            curve.appendCurveProcessingNode(step.node);
        for (Step const& step : chain) {
            double row[14], value = 0.0;
            KFCurveNodeParam param;
            describeRow(param, -1.25, 1, 14, row);
            ASSERT_TRUE(curve.processCurve(param, step.node));
            for (int k = 0; k < 14; ++k) {
                double const t = -1.25 + k;
                EXPECT_NEAR(row[k], step.value(t), 1e-12) << t;
                curve.getPointFromCurveNode(at(t), 7.0, &value, step.node);
                EXPECT_NEAR(value, row[k], 1e-12);
                EXPECT_TRUE(step.node != chain.back().node || valueAt(curve, t) == value);
                curve.getPointWithoutBehavior(at(t), 7.0, &value);
                EXPECT_NEAR(value, ramp(t), 1e-12);
            }
        }
    }
}

TEST(KFCurve, HandsTheOperandToAllNodesAndClampsTheLastValueOnly) {
    KFCurveDouble curve(3.0);
    curve.setAbsoluteMaxValueV(5.0);
    curve.setAbsoluteMinValueV(1.0);
    curve.appendCurveProcessingNode(new Gain(4.0));
    EXPECT_EQ(valueAt(curve, 0), 5.0); // 12
    curve.appendCurveProcessingNode(new Gain(0.25));
    std::size_t const allocations = allocationsOfThisThread();
    double const value = valueAt(curve, 0); // by way of 12
    EXPECT_TRUE(allocationsOfThisThread() == allocations && value == 3.0);
    curve.insertCurveProcessingNode(new AddOperand(), nullptr);
    curve.appendCurveProcessingNode(new AddOperand());
    EXPECT_EQ(curve.getValue(at(0), 0.5), 4.0);
    curve.appendCurveProcessingNode(new SumOfThree()); // from now on by rows, which have no operand
    curve.setAbsoluteMaxValueV(100.0);
    EXPECT_EQ(curve.getValue(at(0), 0.5), 9.0);
    Gain foreign(1.0);
    EXPECT_EQ(curve.getValue(at(0), &foreign), 1.0); // 0, clamped
    KFCurveNodeParam untouched;
    EXPECT_FALSE(curve.processCurve(untouched, &foreign));
}

TEST(KFCurve, StopsARowAtAPassThroughAndBringsBackTheCount) {
    KFCurveDouble curve(3.0);
    curve.appendCurveProcessingNode(new Gain(10.0));
    curve.appendCurveProcessingNode(new PassingGain(2.0));
    curve.appendCurveProcessingNode(new TwoAtMost());
    auto* const two = new TwoAtMost();
    curve.appendCurveProcessingNode(two);
    EXPECT_EQ(valueAt(curve, 0), 60.0);
    double values[4] = {-1, -1, -1, -1};
    Tempus times[4];
    Tempus* timesOut = times;
    KFCurveNodeParam param;
    describeRow(param, 1, 0.5, 4, values);
    EXPECT_TRUE(curve.processTree(param, &timesOut, nullptr));
    EXPECT_TRUE(param.outputCount == 2 && two->given == 2 && values[1] == 6.0);
    EXPECT_TRUE(times[0] == at(1) && times[1] == at(1.5) && times[2].flags == 0);
}

TEST(KFCurve, CopiesDeeply) {
    auto source = std::make_unique<KFCurvePercent>(0.5);
    source->setAbsoluteMaxValueV(50.0);
    addRamp(*source);
    source->appendCurveProcessingNode(new Delay(1.0));
    source->appendCurveProcessingNode(new SumOfThree());
    source->setCurveExtrapolation(kKFExtrapolationLinear, 0);

    auto const working = owned<KFCurvePercent>(source->getCurveWorkingCopy());
    auto const clone = owned<KFCurvePercent>(source->cloneCurve());
    KFCurvePercent assigned(0.25);
    assigned = *source; // takes a local record
    assigned = *source; // keeps it
    EXPECT_TRUE(source->compareTree(*working) && !source->compareTree(*clone));
    for (KFCurvePercent* copy : {working.get(), clone.get(), &assigned}) {
        EXPECT_TRUE(*copy == *source && copy->getSplineState() != source->getSplineState());
        EXPECT_EQ(copy->getSpline()->getState(), copy->getSplineState());
    }
    source.reset();
    EXPECT_TRUE(valueAt(*working, 12) == 3.0 * 11.0 && valueAt(*clone, 12) == 12.0);
    clone->cloneTree(*working);
    EXPECT_TRUE(clone->compareTree(*working));

    KFCurvePercent const plain(0.25);
    *working = plain; // its own chain goes on working as it did
    EXPECT_EQ(working->getValue(at(0), 0.0), 0.75);
    EXPECT_TRUE(working->getSplineState() == plain.getSplineState() && working->getSpline() == nullptr);
}

TEST(KFCurve, TellsUnequalCurvesApart) {
    void (*const changes[])(KFCurve&) = {
        [](KFCurve& c) { c.setAbsoluteMaxValueV(1.0); },
        [](KFCurve& c) { c.setAbsoluteMinValueV(1.0); },
        [](KFCurve& c) { c.setCurveKeyframable(false); },
        [](KFCurve& c) { c.setCurveDefaultValue(1.0); },
        [](KFCurve& c) { c.setCurveInitialValue(1.0); },
        [](KFCurve& c) { c.setCurveParametric(true); },
        [](KFCurve& c) { c.setCurveType(1); },
    };
    KFCurveDouble const reference(0.0);
    for (auto const& change : changes) {
        KFCurveDouble curve(0.0);
        EXPECT_TRUE(curve == reference);
        change(curve);
        EXPECT_FALSE(curve == reference || reference == curve) << &change - changes;
    }
}

TEST(KFSplineNode, IsAConstantUntilItsFirstKeypoint) {
    KFSplineNode node(nullptr), emptied(nullptr);
    node.setDefaultValue(7.0);
    node.setInitialValue(3.0);
    emptied = node;
    emptied.createSpline();
    EXPECT_FALSE(emptied.compare(&node) || node.compare(&emptied) || node.compare(nullptr));
    for (KFSplineNode* each : {&node, &emptied}) {
        double row[2] = {};
        KFCurveNodeParam param;
        describeRow(param, 1, 1, 2, row);
        each->solveNode(param);
        EXPECT_TRUE(row[0] == 3.0 && row[1] == 3.0 && each->solveNode(at(4), 1.0, 2.0) == 3.0);
        EXPECT_TRUE(each->getMaxValue(true) == 3.0 && each->getMinValue(false) == 3.0);
    }
    node.setValue(at(0), 2.0, true);
    node.storeValue(100.0);
    std::unique_ptr<KFCurveNode> const clone(node.cloneNode());
    EXPECT_TRUE(clone->compare(&node) && clone->solveNode(at(9), 0.0, 0.0) == 2.0);
    node.getSpline()->disableVertex(node.getSpline()->getFirstVertex(), at(0)); // leaves the constant alone
    EXPECT_TRUE(node.getMaxValue(false) == 100.0 && node.getMinValue(true) == 100.0);
    node.reset();
    EXPECT_TRUE(node.getSpline() == nullptr && node.solveNode(at(0), 0.0, 0.0) == 7.0);
}

template <class Curve>
void expectType(double minimum, double maximum, std::uint32_t interpolation, bool keyframable) {
    SCOPED_TRACE(typeid(Curve).name());
    Curve curve(0.0);
    EXPECT_EQ(curve.getSplineState(), Curve(1.0).getSplineState());
    double limit = 0.0;
    EXPECT_TRUE(curve.getAbsoluteMinValueV(&limit) && limit == minimum);
    EXPECT_TRUE(curve.getAbsoluteMaxValueV(&limit) && limit == maximum);
    EXPECT_EQ(curve.isCurveKeyframable(), keyframable);
    EXPECT_TRUE(*curve.getSplineState() ==
                KFSplineState(false, true, interpolation != 0, true, interpolation, 0, 0, false));
    EXPECT_TRUE(owned<Curve>(curve.cloneCurve()) && owned<Curve>(curve.getCurveWorkingCopy()));
    EXPECT_EQ(curve.isCurveBoolean(), typeid(Curve) == typeid(KFCurveBool));
}

TEST(KFTypedCurves, FixRangeSettingsAndClass) {
    expectType<KFCurveDouble>(-kHighest, kHighest, 1, true);
    expectType<KFCurveInt>(0.0, 4294967295.0, 1, true);
    expectType<KFCurveBool>(0.0, 1.0, 0, true);
    expectType<KFCurveAngle>(-kHighest, kHighest, 1, true);
    expectType<KFCurveEnum>(0.0, 4294967295.0, 0, false);
    expectType<KFCurvePercent>(0.0, 1.0, 1, true);
}

TEST(KFTypedCurves, BooleanAnswersZeroOrOne) {
    KFCurveBool curve(0.0);
    double raw = 0.0;
    for (auto [stored, expected] :
         {std::pair{5e-8, 0.0}, {2e-7, 1.0}, {kNaN, 1.0}, {-3.0, 0.0}, {0.5, 1.0}}) {
        curve.setCurveInitialValue(stored);
        EXPECT_TRUE(valueAt(curve, 0) == expected && curve.getValue(at(0), kRootAlone) == expected) << stored;
    }
    EXPECT_TRUE(curve.getPointWithoutBehavior(at(0), 0.0, &raw) && raw == 0.5);
}

/// Shows more under a sanitizer for threads or addresses.
TEST(KFCurveThreads, ReadWhileOneThreadEditsKeypoints) {
    for (std::uint32_t const type : {kKFInterpolationLinear, kKFInterpolationBSpline}) {
        KFCurveDouble curve(0.0);
        addRamp(curve);
        curve.setCurveInterpolation(type);
        std::atomic<bool> done{false};
        std::thread editor([&] {
            void* handle = nullptr;
            for (int i = 0; i < 1000; ++i) {
                curve.setKeypoint(at(1 + i % 8), i % 10, true);
                curve.getKeypointHandle(at(1 + i % 8), &handle);
                curve.deriveKeypoint(handle);
                curve.delKeypoints(at(0.5), at(4), true);
            }
            done = true;
        });
        while (!done) {
            double value = valueAt(curve, 2.5);
            Tempus u;
            curve.getCurrentMaxValueV(&value, true);
            EXPECT_TRUE(curve.getNextKeypoint(at(0.25), &u, &value) && u > at(0.25));
            EXPECT_TRUE(curve.getPreviousKeypoint(at(4.5), &u, &value) && u < at(4.5));
            EXPECT_GE(owned<KFCurveDouble>(curve.getCurveWorkingCopy())->getNumberOfKeypoints(), 2U);
        }
        editor.join();
    }
}

} // namespace
