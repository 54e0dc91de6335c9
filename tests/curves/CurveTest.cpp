// A curve as a whole: its roots, its settings record, its chain and its copies; and the typed curves.

#include "lumenkey/curves/KFCurveOwner.h"
#include "lumenkey/curves/KFTypedCurves.h"
#include "lumenkey/splines/KFCoreGlobals.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFStaticVertex.h"
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

std::uint32_t lengthOf(KFCurve& curve) {
    std::uint32_t count = 99;
    curve.getNumCurveProcessingNodes(&count);
    return count;
}

void describeRow(KFCurveNodeParam& param, double start, double step, std::uint32_t count, double* values) {
    param.outputStart = at(start);
    param.outputStep = at(step);
    param.outputCount = count;
    param.outputValues = values;
}

class FilmOwner : public KFCurveOwner {
public:
    Tempus getFrameDurationForCurve() const override { return TempusMake(1, 24); }
};

// --- Roots and values ---

TEST(KFCurve, WritesAConstantToBothNodesAndClampsOnReading) {
    KFCurveDouble curve(5.0);
    std::uint32_t type = 9;
    EXPECT_TRUE(curve.getCurveType(&type));
    EXPECT_EQ(type, 0U);
    EXPECT_FALSE(curve.getCurveType(nullptr));
    EXPECT_EQ(valueAt(curve, -7), 5.0);

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
    EXPECT_FALSE(curve.setCurveType(2));
    EXPECT_FALSE(curve.setCurveType(4));
    EXPECT_TRUE(curve.isSpline());
    EXPECT_EQ(curve.getNumberOfKeypoints(), 0U);

    curve.setAbsoluteMinValueV(8.0); // crossed limits: the maximum is asked first
    EXPECT_EQ(valueAt(curve, 0), 6.0);
    curve.setCurveInitialValue(kNaN);
    EXPECT_TRUE(std::isnan(valueAt(curve, 0)));
    EXPECT_TRUE(curve.setCurveToDefault());
    curve.setAbsoluteMinValueV(0.0);
    EXPECT_EQ(valueAt(curve, 0), 4.0);
    curve.setIsSpline(false, at(0));
    EXPECT_EQ(valueAt(curve, 0), 4.0);
}

TEST(KFCurve, KeepsItsKeypointsUnreadBehindAConstantRoot) {
    KFCurveDouble curve(1.0);
    addRamp(curve);
    curve.setIsSpline(false, at(3));
    EXPECT_EQ(valueAt(curve, 8), 3.0);
    EXPECT_EQ(curve.getNumberOfKeypoints(), 0U);
    EXPECT_NE(curve.getSpline(), nullptr);
    curve.setIsSpline(true, at(0));
    EXPECT_EQ(valueAt(curve, 8), 8.0);

    Tempus u;
    double value = 0.0;
    EXPECT_TRUE(curve.getCurrentMaxValueU(&u) && u == at(10));
    EXPECT_TRUE(curve.getCurrentMinValueU(&u) && u == at(0));
    EXPECT_TRUE(curve.getCurrentRangeU(&u) && u == at(10));
    EXPECT_TRUE(curve.getCurrentMaxValueV(&value, false) && value == 10.0);
    EXPECT_TRUE(curve.getCurrentMinValueV(&value, false) && value == 0.0);
    curve.setCurveToDefault();
    EXPECT_EQ(curve.getSpline(), nullptr);
    EXPECT_TRUE(curve.getCurrentRangeU(&u) && u == kTempusZero);
}

TEST(KFCurve, TellsAnimatedFromKeyframable) {
    bool& animate = KFCoreGlobals::getInstance().animate;
    for (unsigned bits = 0; bits < 8; ++bits) {
        bool const keyframable = (bits & 1) != 0, keyed = (bits & 2) != 0, global = (bits & 4) != 0;
        KFCurveDouble curve(1.0);
        if (keyed)
            addRamp(curve);
        curve.setCurveKeyframable(keyframable);
        animate = global;
        bool out = !(keyed || global);
        bool const result = curve.isCurveAnimated(&out);
        bool const unforced = curve.canModifyCurve(false), forced = curve.canModifyCurve(true);
        animate = false;
        EXPECT_EQ(out, keyed || global) << bits;
        EXPECT_EQ(result, keyframable && (keyed || global)) << bits;
        EXPECT_EQ(unforced, result) << bits;
        EXPECT_EQ(forced, keyframable) << bits;
    }
}

// --- Settings ---

TEST(KFCurve, MakesItsSettingsLocalOnlyWhenOneChanges) {
    struct Row {
        void (*set)(KFCurve&, bool other);
        KFSplineState expected;
    };
    Row const rows[] = {
        {[](KFCurve& c, bool o) { c.setCurveParametric(o); }, {true, true, true, true, 1, 0, 0, false}},
        {[](KFCurve& c, bool o) { c.setRoundingInUSpace(!o); }, {false, false, true, true, 1, 0, 0, false}},
        {[](KFCurve& c, bool o) { c.setCurveDeriveTangents(!o); },
         {false, true, false, true, 1, 0, 0, false}},
        {[](KFCurve& c, bool o) { c.setCurveInterpolation(o ? 4 : 1); },
         {false, true, true, true, 4, 0, 0, false}},
        {[](KFCurve& c, bool o) { c.setCurveExtrapolation(o ? 2 : 0, 7); },
         {false, true, true, true, 1, 2, 0, false}},
        {[](KFCurve& c, bool o) { c.setCurveExtrapolation(o ? 2 : 0, 0); },
         {false, true, true, true, 1, 0, 2, false}},
        {[](KFCurve& c, bool o) { c.setRetimingExtrapolation(o); }, {false, true, true, true, 1, 0, 0, true}},
    };
    KFSplineState* const shared = KFCurveDouble(0.0).getSplineState();
    for (Row const& row : rows) {
        SCOPED_TRACE(&row - rows);
        KFCurveDouble curve(0.0);
        addRamp(curve);
        row.set(curve, false);
        EXPECT_EQ(curve.getSplineState(), shared);
        row.set(curve, true);
        KFSplineState* const local = curve.getSplineState();
        EXPECT_FALSE(local->shared);
        EXPECT_EQ(curve.getSpline()->getState(), local);
        EXPECT_TRUE(*local == row.expected);
        row.set(curve, false); // back again, and still its own
        EXPECT_EQ(curve.getSplineState(), local);
        EXPECT_TRUE(*shared == KFSplineState());
        EXPECT_TRUE(*local == *shared);
    }
}

TEST(KFCurve, GivesItsInterpolationToItsKeypoints) {
    KFCurveDouble curve(0.0);
    std::uint32_t type = 9;
    EXPECT_FALSE(curve.getCurveInterpolation(nullptr));
    addRamp(curve);
    EXPECT_TRUE(curve.setCurveInterpolation(0));
    EXPECT_EQ(valueAt(curve, 5), 0.0);
    EXPECT_TRUE(curve.getCurveInterpolation(nullptr));
    curve.getSpline()->setVertexInterpolation(curve.getSpline()->getFirstVertex(), 4);
    EXPECT_TRUE(curve.getCurveInterpolation(&type) && type == kKFInterpolationMixed);
    curve.setCurveKeyframable(false);
    EXPECT_FALSE(curve.setCurveInterpolation(1));
    EXPECT_EQ(curve.getSplineState()->interpolation, 0U);
}

/// A curve of a class that never got a settings record.
class BareCurve : public KFCurve {
public:
    BareCurve() : KFCurve(-kHighest, kHighest, 0.0) {}
    KFCurveInterface* cloneCurve() override { return nullptr; }
};

TEST(KFCurve, FallsBackOnTheDefaultsWithoutASettingsRecord) {
    BareCurve curve;
    curve.setRootNode(at(0), 2.0);
    curve.setKeyValue(at(0), 2.0, true);
    EXPECT_EQ(valueAt(curve, 1), 2.0);
    EXPECT_FALSE(curve.isCurveParametric());
    EXPECT_EQ(curve.getSplineState(), nullptr);
    curve.setCurveParametric(true);
    EXPECT_TRUE(curve.isCurveParametric());
    EXPECT_FALSE(BareCurve().isCurveParametric());
    curve.setSplineState(nullptr);
    EXPECT_FALSE(curve.getSpline()->getState()->parametric);
}

// --- The chain ---

TEST(KFCurve, KeepsItsChainInOrderAndOwnsIt) {
    std::string destroyed;
    auto curve = std::make_unique<KFCurveDouble>(1.0);
    auto* const a = new Gain(1.0, 'a', &destroyed);
    auto* const b = new Gain(2.0, 'b', &destroyed);
    auto* const c = new Gain(3.0, 'c', &destroyed);
    auto* const d = new Gain(4.0, 'd', &destroyed);
    Gain foreign(5.0, 'x', nullptr);
    KFCurveNode* previous = b;
    EXPECT_FALSE(curve->getPreviousProcessingNode(a, &previous));
    EXPECT_EQ(previous, nullptr);
    EXPECT_TRUE(curve->appendCurveProcessingNode(b));
    EXPECT_TRUE(curve->insertCurveProcessingNode(a, nullptr));
    EXPECT_TRUE(curve->insertCurveProcessingNode(d, &foreign));
    EXPECT_TRUE(curve->insertCurveProcessingNode(c, b));
    EXPECT_FALSE(curve->appendCurveProcessingNode(b));
    EXPECT_FALSE(curve->insertCurveProcessingNode(nullptr, b));
    std::vector<KFCurveNode*> nodes{nullptr};
    EXPECT_TRUE(curve->enumerateCurveProcessingNodes(nodes));
    EXPECT_EQ(nodes, (std::vector<KFCurveNode*>{a, b, c, d}));

    EXPECT_TRUE(curve->getPreviousProcessingNode(c, &previous) && previous == b);
    EXPECT_TRUE(curve->getPreviousProcessingNode(&foreign, &previous) && previous == d);
    EXPECT_FALSE(curve->getPreviousProcessingNode(a, nullptr));
    EXPECT_FALSE(curve->deleteCurveProcessingNode(&foreign));
    EXPECT_FALSE(curve->removeCurveProcessingNode(nullptr));
    EXPECT_TRUE(curve->removeCurveProcessingNode(a));
    EXPECT_TRUE(curve->appendCurveProcessingNode(a));
    EXPECT_EQ(destroyed, "");
    EXPECT_TRUE(curve->deleteCurveProcessingNode(c));
    EXPECT_EQ(destroyed, "c");
    curve.reset();
    EXPECT_EQ(destroyed, "cadb");
}

using Function = std::function<double(double)>;

/// A chain, and after each of its nodes what the value then is.
struct Chain {
    char const* what;
    std::vector<std::function<KFCurveNode*()>> nodes;
    std::vector<Function> values;
};

TEST(KFCurve, GivesTheSameAtOneTimeAndInARow) {
    auto const gain = [] { return new Gain(2.0); };
    auto const delay = [] { return new Delay(0.5); };
    auto const sum = [] { return new SumOfThree(); };
    Function const sums = [](double t) { return ramp(t - 1) + ramp(t) + ramp(t + 1); };
    Chain const chains[] = {
        {"gain", {gain}, {[](double t) { return 2 * ramp(t); }}},
        {"delay and gain",
         {delay, gain, delay},
         {[](double t) { return ramp(t - 0.5); }, [](double t) { return 2 * ramp(t - 0.5); },
          [](double t) { return 2 * ramp(t - 1); }}},
        {"sums",
         {gain, sum, delay, sum},
         {[](double t) { return 2 * ramp(t); }, [&](double t) { return 2 * sums(t); },
          [&](double t) { return 2 * sums(t - 0.5); },
          [&](double t) { return 2 * (sums(t - 1.5) + sums(t - 0.5) + sums(t + 0.5)); }}},
    };
    for (Chain const& chain : chains) {
        SCOPED_TRACE(chain.what);
        KFCurveDouble curve(0.0);
        addRamp(curve);
        for (auto const& make : chain.nodes)
            curve.appendCurveProcessingNode(make());
        std::vector<KFCurveNode*> nodes;
        curve.enumerateCurveProcessingNodes(nodes);
        for (std::size_t i = 0; i < nodes.size(); ++i) {
            double row[14], value = 0.0;
            KFCurveNodeParam param;
            describeRow(param, -1.25, 1, 14, row);
            ASSERT_TRUE(curve.processCurve(param, nodes[i]));
            for (int k = 0; k < 14; ++k) {
                double const t = -1.25 + k;
                EXPECT_NEAR(row[k], chain.values[i](t), 1e-12) << "node " << i << " at " << t;
                curve.getPointFromCurveNode(at(t), 7.0, &value, nodes[i]);
                EXPECT_NEAR(value, row[k], 1e-12) << "node " << i << " at " << t;
                if (i + 1 == nodes.size()) {
                    EXPECT_EQ(valueAt(curve, t), value);
                }
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
    auto* const half = new Gain(0.5);
    curve.appendCurveProcessingNode(half);
    EXPECT_EQ(valueAt(curve, 0), 5.0); // 6
    half->amount = 0.25;
    EXPECT_EQ(valueAt(curve, 0), 3.0); // by way of 12
    curve.insertCurveProcessingNode(new AddOperand(), nullptr);
    curve.appendCurveProcessingNode(new AddOperand());
    EXPECT_EQ(curve.getValue(at(0), 0.5), 4.0);
    EXPECT_EQ(curve.getValue(at(0), curve.getRootNode()), 1.0); // not in the chain: 0, clamped
    half->amount = 0.0;
    EXPECT_EQ(valueAt(curve, 0), 1.0);

    curve.appendCurveProcessingNode(new SumOfThree()); // from now on by rows, which have no operand
    half->amount = 0.25;
    curve.setAbsoluteMaxValueV(100.0);
    EXPECT_EQ(curve.getValue(at(0), 0.5), 9.0);
    Gain foreign(1.0);
    EXPECT_EQ(curve.getValue(at(0), &foreign), 1.0);
    KFCurveNodeParam untouched;
    EXPECT_FALSE(curve.processCurve(untouched, &foreign));
}

TEST(KFCurve, StopsARowAtAPassThroughAndBringsBackTheCount) {
    KFCurveDouble curve(3.0);
    curve.appendCurveProcessingNode(new Gain(10.0));
    curve.appendCurveProcessingNode(new PassingGain(2.0));
    auto* const two = new TwoAtMost();
    curve.appendCurveProcessingNode(two);
    auto* const two2 = new TwoAtMost();
    curve.appendCurveProcessingNode(two2);
    EXPECT_EQ(valueAt(curve, 0), 60.0);

    double values[4] = {-1, -1, -1, -1};
    Tempus times[4];
    Tempus* timesOut = times;
    for (double* buffer : {values, static_cast<double*>(nullptr)}) { // with null for the count and the times
        KFCurveNodeParam param;
        describeRow(param, 1, 0.5, 4, buffer);
        std::fill(std::begin(times), std::end(times), kTempusInvalid);
        EXPECT_TRUE(curve.processTree(param, &timesOut, nullptr));
        EXPECT_EQ(param.outputCount, 2U);
        EXPECT_EQ(two->given, 4U);
        EXPECT_EQ(two2->given, 2U);
        EXPECT_EQ(values[1], 6.0);
        EXPECT_TRUE(times[0] == at(1) && times[1] == at(1.5));
        EXPECT_EQ(times[2].flags, 0U);
    }
}

TEST(KFCurve, AllocatesNothingForAPointWithoutRemapping) {
    KFCurveDouble curve(0.0);
    addRamp(curve);
    for (int length = 0; length < 3; ++length) {
        std::size_t const before = allocationsOfThisThread();
        double const sum = valueAt(curve, 2) + valueAt(curve, 4) + curve.getValue(at(3), kRootAlone);
        EXPECT_EQ(allocationsOfThisThread(), before) << length;
        EXPECT_EQ(sum, 9.0);
        curve.appendCurveProcessingNode(new Gain(1.0));
    }
    auto* const delay = new Delay(1.0);
    curve.appendCurveProcessingNode(delay);
    EXPECT_EQ(valueAt(curve, 4), 3.0);
    curve.deleteCurveProcessingNode(delay);
    EXPECT_EQ(valueAt(curve, 4), 4.0);
}

// --- Copies ---

TEST(KFCurve, CopiesDeeply) {
    FilmOwner owner;
    auto source = std::make_unique<KFCurvePercent>(0.5);
    source->setAbsoluteMaxValueV(50.0);
    addRamp(*source);
    source->appendCurveProcessingNode(new Delay(1.0));
    source->appendCurveProcessingNode(new SumOfThree());
    source->setCurveExtrapolation(kKFExtrapolationLinear, 0);
    source->setOwnerChannel(&owner);
    EXPECT_TRUE(source->getFrameDuration() == TempusMake(1, 24));

    auto const working = owned<KFCurvePercent>(source->getCurveWorkingCopy());
    auto const clone = owned<KFCurvePercent>(source->cloneCurve());
    KFCurvePercent assigned(0.25);
    assigned.appendCurveProcessingNode(new Gain(1.0));
    assigned = *source; // takes a local record
    KFSplineState* const own = assigned.getSplineState();
    assigned = *source; // keeps it
    EXPECT_EQ(assigned.getSplineState(), own);
    EXPECT_EQ(lengthOf(*working), 2U);
    EXPECT_EQ(lengthOf(*clone), 0U);
    EXPECT_EQ(lengthOf(assigned), 1U);
    EXPECT_TRUE(source->compareTree(*working));
    EXPECT_FALSE(source->compareTree(*clone));
    EXPECT_EQ(valueAt(*source, 12), 3.0 * 11.0);

    for (KFCurve* copy : {static_cast<KFCurve*>(working.get()), static_cast<KFCurve*>(clone.get()),
                          static_cast<KFCurve*>(&assigned)}) {
        EXPECT_TRUE(*copy == *source);
        EXPECT_NE(copy->getSplineState(), source->getSplineState());
        EXPECT_EQ(copy->getSpline()->getState(), copy->getSplineState());
        EXPECT_NE(copy->getSpline(), source->getSpline());
        EXPECT_TRUE(copy->getFrameDuration() == TempusMake(1, 30));
    }
    source.reset();
    EXPECT_EQ(valueAt(*working, 12), 3.0 * 11.0);
    EXPECT_EQ(valueAt(*clone, 12), 12.0);
    clone->setKeypoint(at(5), 7.0, true);
    EXPECT_FALSE(*clone == *working);

    clone->cloneTree(*working);
    EXPECT_TRUE(clone->appendCurveProcessingNode(new Gain(1.0)));
    EXPECT_FALSE(clone->compareTree(*working));
    assigned = KFCurvePercent(0.75);
    EXPECT_EQ(assigned.getSplineState(), KFCurvePercent(0.0).getSplineState());
    EXPECT_EQ(assigned.getSpline(), nullptr);
    EXPECT_EQ(assigned.getValue(at(0), kRootAlone), 0.75);
}

KFVertex& lastKey(KFCurve& curve) { return *static_cast<KFVertex*>(curve.getSpline()->getLastVertex()); }

TEST(KFCurve, TellsUnequalCurvesApart) {
    void (*const changes[])(KFCurve&) = {
        [](KFCurve& c) { c.setAbsoluteMaxValueV(1.0); },
        [](KFCurve& c) { c.setAbsoluteMinValueV(1.0); },
        [](KFCurve& c) { c.setCurveInitialValue(1.0); },
        [](KFCurve& c) { c.setCurveDefaultValue(1.0); },
        [](KFCurve& c) { c.setCurveKeyframable(false); },
        [](KFCurve& c) { c.setCurveParametric(true); },
        [](KFCurve& c) { c.appendCurveProcessingNode(new Delay(1.0)); },
        [](KFCurve& c) { c.appendCurveProcessingNode(new SumOfThree()); },
        [](KFCurve& c) { c.setKeypoint(at(5), 5.0, true); },
        [](KFCurve& c) { c.closeCurve(); },
        [](KFCurve& c) { lastKey(c).setValueV(9.0, at(0)); },
        [](KFCurve& c) { lastKey(c).setBias(2.0, at(0)); },
        [](KFCurve& c) { lastKey(c).setNormal(2.0, at(0)); },
        [](KFCurve& c) { lastKey(c).setFlag(0x10); },
        [](KFCurve& c) { lastKey(c).setInterpolation(15); },
        [](KFCurve& c) { lastKey(c).setInputTangents(-1, 1, at(0)); },
        [](KFCurve& c) { c.getSpline()->disableVertex(c.getSpline()->getLastVertex(), at(0)); },
    };
    KFCurveDouble reference(0.0);
    addRamp(reference);
    std::size_t index = 0;
    for (auto const& change : changes) {
        KFCurveDouble curve(0.0);
        addRamp(curve);
        EXPECT_TRUE(curve == reference);
        change(curve);
        EXPECT_FALSE(curve == reference) << index;
        ++index;
    }
}

// --- Nodes ---

TEST(KFSplineNode, IsAConstantUntilItsFirstKeypoint) {
    KFSplineNode node(nullptr), emptied(nullptr);
    node.setDefaultValue(7.0);
    node.setInitialValue(3.0);
    emptied = node;
    EXPECT_TRUE(emptied.compare(&node));
    emptied.createSpline();
    EXPECT_FALSE(emptied.compare(&node));
    EXPECT_FALSE(node.compare(&emptied));
    KFConstantNode constant(7.0);
    constant.setValue(at(0), 3.0, true);
    EXPECT_TRUE(constant.compare(&node));
    EXPECT_FALSE(node.compare(&constant));
    EXPECT_FALSE(node.compare(nullptr));

    for (KFCurveNode* each : {static_cast<KFCurveNode*>(&node), static_cast<KFCurveNode*>(&emptied),
                              static_cast<KFCurveNode*>(&constant)}) {
        double row[3] = {};
        KFCurveNodeParam param;
        describeRow(param, 1, 1, 3, row);
        for (bool bySegment : {false, true}) {
            std::fill(std::begin(row), std::end(row), 0.0);
            param.segmentSampling = bySegment;
            each->solveNode(param);
            EXPECT_TRUE(row[0] == 3.0 && row[1] == 3.0 && row[2] == 3.0);
        }
        EXPECT_EQ(each->solveNode(at(4), 1.0, 2.0), 3.0);
        EXPECT_TRUE(each->getMaxValue(true) == 3.0 && each->getMinValue(false) == 3.0);
        EXPECT_TRUE(each->getCurrentRange() == kTempusZero);
        std::vector<Tempus> times;
        BXTimeRange range{at(2), at(5)};
        Tempus step = at(1);
        EXPECT_TRUE(each->getUForValue(3.0 + 0.9e-7, times, range, step, 0));
        EXPECT_FALSE(each->getUForValue(3.0 + 1.1e-7, times, range, step, 0));
        EXPECT_TRUE(times.size() == 1 && times[0] == at(2));
    }
    node.setValue(at(0), 2.0, true);
    node.storeValue(100.0);
    EXPECT_EQ(node.solveNode(at(9), 0.0, 0.0), 2.0);
    std::unique_ptr<KFCurveNode> const clone(node.cloneNode());
    EXPECT_TRUE(clone->compare(&node));
    EXPECT_TRUE(node.getFrameDuration() == TempusMake(1, 30));
    node.reset();
    EXPECT_EQ(node.getSpline(), nullptr);
    EXPECT_EQ(node.solveNode(at(0), 0.0, 0.0), 7.0);
    EXPECT_EQ(clone->solveNode(at(0), 0.0, 0.0), 2.0);
}

// --- Typed curves ---

template <class Curve>
void expectType(double minimum, double maximum, std::uint32_t interpolation, bool derive, bool keyframable) {
    SCOPED_TRACE(typeid(Curve).name());
    Curve first(0.0), second(1.0);
    EXPECT_EQ(first.getSplineState(), second.getSplineState());
    EXPECT_TRUE(first.getSplineState()->shared);
    double limit = 0.0;
    EXPECT_TRUE(first.getAbsoluteMinValueV(&limit) && limit == minimum);
    EXPECT_TRUE(first.getAbsoluteMaxValueV(&limit) && limit == maximum);
    EXPECT_EQ(first.isCurveKeyframable(), keyframable);
    first.setCurveKeyframable(true);
    first.setCurveInterpolation(4);
    first.setCurveDeriveTangents(!derive);
    Curve third(0.0);
    std::uint32_t type = 9;
    EXPECT_TRUE(third.getCurveInterpolation(&type) && type == interpolation);
    EXPECT_EQ(third.isCurveDeriveTangents(), derive);
    EXPECT_TRUE(first.getCurveInterpolation(&type) && type == 4);
    EXPECT_NE(owned<Curve>(second.cloneCurve()), nullptr);
    EXPECT_NE(owned<Curve>(second.getCurveWorkingCopy()), nullptr);
    EXPECT_EQ(second.isCurveBoolean(), typeid(Curve) == typeid(KFCurveBool));
    second.setCurveInitialValue(1e10);
    EXPECT_EQ(second.getValue(at(0), 0.0), std::min(1e10, maximum));
    second.setCurveInitialValue(-0.5);
    EXPECT_EQ(second.getValue(at(0), 0.0), std::max(-0.5, minimum));
}

TEST(KFTypedCurves, FixRangeSettingsAndClass) {
    expectType<KFCurveDouble>(-kHighest, kHighest, 1, true, true);
    expectType<KFCurveInt>(0.0, 4294967295.0, 1, true, true);
    expectType<KFCurveBool>(0.0, 1.0, 0, false, true);
    expectType<KFCurveAngle>(-kHighest, kHighest, 1, true, true);
    expectType<KFCurveEnum>(0.0, 4294967295.0, 0, false, false);
    expectType<KFCurvePercent>(0.0, 1.0, 1, true, true);
}

TEST(KFTypedCurves, BooleanAnswersZeroOrOne) {
    KFCurveBool curve(0.0);
    double raw = 0.0;
    for (auto [stored, expected] :
         {std::pair{5e-8, 0.0}, {2e-7, 1.0}, {0.5, 1.0}, {kNaN, 1.0}, {-3.0, 0.0}}) {
        curve.setCurveInitialValue(stored);
        EXPECT_EQ(curve.getValue(at(0), 0.0), expected) << stored;
        EXPECT_EQ(curve.getValue(at(0), kRootAlone), expected) << stored;
    }
    curve.setCurveInitialValue(0.5);
    EXPECT_TRUE(curve.getPointWithoutBehavior(at(0), 0.0, &raw) && raw == 0.5);
    curve.setCurveType(1);
    curve.setKeypoint(at(1), 0.0, true);
    curve.setKeypoint(at(2), 1.0, true);
    EXPECT_EQ(valueAt(curve, 1.999), 0.0);
    EXPECT_EQ(valueAt(curve, 2), 1.0);
}

TEST(KFCurveThreads, ReadWhileOneThreadEditsKeypoints) {
    KFCurveDouble curve(0.0);
    addRamp(curve);
    std::atomic<bool> done{false};
    std::thread editor([&] {
        for (int i = 0; i < 2000; ++i) {
            curve.setKeypoint(at(1 + i % 8), i % 10, true);
            curve.setAbsoluteMaxValueV(20.0 + i);
            curve.delKeypoints(at(0.5), at(4), true);
        }
        done = true;
    });
    while (!done) {
        double values[8], highest = 0.0;
        bool animated = false;
        KFCurveNodeParam param;
        describeRow(param, 0, 1, 8, values);
        curve.processCurve(param, nullptr);
        curve.getCurrentMaxValueV(&highest, true);
        EXPECT_TRUE(curve.isCurveAnimated(&animated));
        EXPECT_TRUE(valueAt(curve, 5) <= 20.0);
        auto const copy = owned<KFCurveDouble>(curve.getCurveWorkingCopy());
        EXPECT_GE(copy->getNumberOfKeypoints(), 2U);
    }
    editor.join();
}

} // namespace
