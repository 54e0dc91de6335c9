// Settings of a spline, attributes of its vertices, and what its owner decides.

#include "lumenkey/splines/KFBasicInterpolators.h"
#include "lumenkey/splines/KFSplineOwner.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "tests/splines/SlowCurve.h"
#include "tests/splines/slots.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

Tempus s(std::int64_t value, std::int32_t timescale = 1) { return TempusMake(value, timescale); }

class Owner : public KFSplineOwner {
public:
    double getInitialValue() const override { return 7.0; }
    Tempus getFrameDuration() const override { return s(1, 48); }
};

class KFSplineAccessTest : public testing::Test {
protected:
    /// Linear, at whole seconds.
    void add(std::initializer_list<double> values) {
        for (double const value : values) {
            keys.push_back(static_cast<KFVertex*>(
                curve->appendVertexNoTangents(s(static_cast<int>(keys.size())), value, kTempusZero)));
        }
    }
    std::uint32_t validCount() { return curve->getNumberOfValidVertices(kTempusZero); }

    Owner owner;
    MuseumSpline curve;
    std::vector<KFVertex*> keys;
};

} // namespace

TEST_F(KFSplineAccessTest, AnswersForNullAndEmpty) {
    EXPECT_EQ(curve->getMinValueU(kTempusZero, true), kTempusZero);
    EXPECT_EQ(curve->getMaxValueU(kTempusZero, true), kTempusZero);
    EXPECT_EQ(curve->getRangeU(kTempusZero), kTempusZero);
    EXPECT_EQ(curve->getFirstVertex(), nullptr);
    EXPECT_EQ(curve->getLastVertex(), nullptr);
    EXPECT_EQ(curve->getNextVertex(s(0)), nullptr);
    EXPECT_EQ(curve.at(s(1)), 0.0);
    curve->setNode(&owner);
    EXPECT_EQ(curve.at(s(1)), 7.0);
    curve.state->interpolation = 12;
    EXPECT_EQ(curve.at(s(1)), 7.0);
    curve.state->parametric = true;
    EXPECT_EQ(curve.at(s(1)), 7.0);
    curve.state->interpolation = 15;
    EXPECT_TRUE(curve->hasInterpolation(15));
    EXPECT_FALSE(curve->hasInterpolation(1));

    std::uint32_t number = 77;
    double value = 77.0;
    EXPECT_FALSE(curve->setVertexValue(nullptr, 1.0, kTempusZero));
    EXPECT_FALSE(curve->setVertexInterpolation(nullptr, 1));
    EXPECT_FALSE(curve->getVertexInterpolation(nullptr, &number, nullptr));
    EXPECT_FALSE(curve->setVertexFlag(nullptr, 1) || curve->resetVertexFlag(nullptr, 1) ||
                 curve->setVertexFlags(nullptr, 1));
    EXPECT_FALSE(curve->getVertexFlags(nullptr, &number));
    EXPECT_FALSE(curve->setVertexSpeed(nullptr, 1));
    EXPECT_FALSE(curve->getVertexSpeed(nullptr, &number));
    EXPECT_FALSE(curve->enableVertex(nullptr, kTempusZero) || curve->disableVertex(nullptr, kTempusZero));
    EXPECT_FALSE(curve->isEnabledVertex(nullptr, kTempusZero));
    EXPECT_FALSE(curve->getVertex(nullptr, nullptr, &value, kTempusZero));
    EXPECT_FALSE(curve->getVertexNormal(s(1), &value, kTempusZero));
    EXPECT_FALSE(curve->adjustVertexSpeed(nullptr, 1.0));
    curve->offsetVertexInTime(nullptr, s(1), kTempusZero);
    EXPECT_EQ(number, 77u);
    EXPECT_EQ(value, 77.0);
    add({1.0});
    EXPECT_FALSE(curve->getVertex(s(0), nullptr, kTempusZero));
}

TEST_F(KFSplineAccessTest, StepsAndRangesFollowTheState) {
    add({1.0, 2.0, 3.0});
    EXPECT_EQ(curve->getRangeU(kTempusZero), s(2));
    curve->setClosed(true, nullptr);
    EXPECT_EQ(curve->getRangeU(kTempusZero), s(61, 30));
    EXPECT_EQ(curve->getSmallDeltaU(), s(1, 100));
    curve.state->retimingExtrapolation = true;
    EXPECT_EQ(curve->getStep(), s(1, 30)); // nobody knows the frame
    curve->setNode(&owner);
    EXPECT_EQ(curve->getStep(), s(1, 48));
    EXPECT_EQ(curve->getRangeU(kTempusZero), s(97, 48));
    curve.state->parametric = true;
    EXPECT_EQ(curve->getStep(), s(1));
    EXPECT_EQ(curve->getSmallDeltaU(), s(1));
    curve->setInterpolation(12); // a whole curve counts its control points
    EXPECT_EQ(curve->getRangeU(kTempusZero), s(3));
    curve->setInterpolation(1);
    curve->offsetVertexInTime(keys[0], s(1), kTempusZero);
    curve->offsetVertexInTime(keys[2], s(1), kTempusZero);
    EXPECT_EQ(curve->getRangeU(kTempusZero), kTempusZero);
}

TEST_F(KFSplineAccessTest, TypesOfAllVertices) {
    add({1.0, 2.0, 3.0});
    std::uint32_t type = 0;
    bool usesTangents = false;
    bool isSpline = true;
    auto const ask = [&] { return curve->getInterpolation(&type, &usesTangents, &isSpline); };
    keys[1]->setFlag(kKFVertexFlagLocked);
    curve->setInterpolation(4);
    EXPECT_TRUE(ask());
    EXPECT_EQ(type, 100u); // the locked one keeps its type; what differs draws as Bezier
    EXPECT_TRUE(usesTangents);
    EXPECT_FALSE(isSpline);
    EXPECT_TRUE(curve->hasInterpolation(1));
    EXPECT_TRUE(curve->hasInterpolation(4));
    keys[0]->setInterpolation(7);
    EXPECT_FALSE(curve->hasInterpolation(7)); // the first one isn't looked at
    curve.state->parametric = true;
    curve->setInterpolation(10);
    ask();
    EXPECT_EQ(type, 10u);
    EXPECT_TRUE(isSpline);
    EXPECT_FALSE(usesTangents);
    curve->setInterpolation(100);
    ask();
    EXPECT_EQ(type, 10u);
    EXPECT_TRUE(curve->getVertexInterpolation(keys[1], &type, &usesTangents));
    EXPECT_EQ(type, 10u);

    curve->lockSpline(true);
    curve->setAllVerticesValues(9.0, kTempusZero);
    EXPECT_EQ(keys[0]->getValueV(kTempusZero), 1.0);
    curve->lockSpline(false);
    curve->setAllVerticesValues(9.0, kTempusZero);
    EXPECT_EQ(keys[2]->getValueV(kTempusZero), 9.0);
    curve->setExtrapolation(3, 0);
    curve->setExtrapolation(4, 8);
    EXPECT_EQ(curve.state->postExtrapolation, 3u);
    EXPECT_EQ(curve.state->preExtrapolation, 4u);
}

TEST_F(KFSplineAccessTest, SpeedsStandForTypes) {
    add({1.0, 2.0, 2.0});
    std::uint32_t const types[] = {1, 17, 16, 15};
    for (std::uint32_t speed = 0; speed < 4; ++speed) {
        keys[0]->setBias(0.5, kTempusZero);
        EXPECT_TRUE(curve->setVertexSpeed(keys[0], speed));
        EXPECT_EQ(keys[0]->getInterpolation(), types[speed]);
        EXPECT_EQ(keys[0]->getBias(kTempusZero), speed == 0 ? 0.5 : 1.0);
        std::uint32_t read = 9;
        EXPECT_TRUE(curve->getVertexSpeed(keys[0], &read));
        EXPECT_EQ(read, speed);
    }
    EXPECT_FALSE(curve->setVertexSpeed(keys[0], 4));
    EXPECT_EQ(keys[0]->getInterpolation(), 15u);
    keys[0]->setInterpolation(4);
    EXPECT_FALSE(curve->getVertexSpeed(keys[0], nullptr));

    struct Nudge {
        std::size_t key;
        std::uint32_t type;
        double bias, delta;
        std::uint32_t newType;
        double newBias;
    };
    // Linear becomes Ease at its neutral bias first; Decelerate turns the other way; level and last stay.
    Nudge const nudges[] = {{0, 1, 0.4, 1.5, 15, 1.5},   {0, 15, 1.0, 1.5, 15, 0.5},
                            {0, 16, 1.0, -1.5, 16, 1.5}, {0, 17, 1.0, 1.5, 17, 1.5},
                            {0, 15, 1.0, 9.0, 15, 0.0},  {0, 17, 1.0, 9.0, 17, 2.0},
                            {1, 1, 0.4, 1.5, 1, 0.4},    {1, 15, 1.0, 1.5, 15, 0.5},
                            {2, 15, 1.0, 1.5, 15, 1.0},  {0, 4, 1.0, 1.5, 4, 1.0}};
    for (Nudge const& nudge : nudges) {
        KFVertex& vertex = *keys[nudge.key];
        vertex.setInterpolation(nudge.type);
        vertex.setBias(nudge.bias, kTempusZero);
        EXPECT_FALSE(curve->adjustVertexSpeed(&vertex, nudge.delta));
        EXPECT_EQ(vertex.getInterpolation(), nudge.newType);
        EXPECT_DOUBLE_EQ(vertex.getBias(kTempusZero), nudge.newBias) << nudge.type << " by " << nudge.delta;
    }
}

TEST_F(KFSplineAccessTest, BiasesAndNormals) {
    add({1.0, 2.0, 3.0});
    double read = 0.0;
    EXPECT_TRUE(curve->setVertexBiasExp(keys[1], 0.5, kTempusZero));
    EXPECT_DOUBLE_EQ(keys[1]->getBias(kTempusZero), std::exp(0.5));
    EXPECT_TRUE(curve->getVertexBiasExp(keys[1], &read, kTempusZero));
    EXPECT_DOUBLE_EQ(read, 0.5);
    EXPECT_TRUE(curve->getVertexBiasLinear(keys[1], &read, kTempusZero));
    EXPECT_DOUBLE_EQ(read, std::exp(0.5));
    // An open spline without a valid vertex refuses, unless its owner is loading.
    for (KFVertex* const key : keys) {
        curve->disableVertex(key, kTempusZero);
    }
    EXPECT_FALSE(curve->setVertexBiasLinear(keys[1], 1.25, kTempusZero));
    curve->setNode(&owner);
    owner._suppressRefresh = true;
    EXPECT_TRUE(curve->setVertexBiasLinear(keys[1], 1.25, kTempusZero));
    owner._suppressRefresh = false;
    curve->setClosed(true, nullptr);
    EXPECT_TRUE(curve->setVertexBiasLinear(keys[1], 1.5, kTempusZero));
    EXPECT_EQ(keys[1]->getBias(kTempusZero), 1.5);

    // A normal belongs to the enabled vertex there, else to the last one before.
    curve->enableVertex(keys[0], kTempusZero);
    curve->enableVertex(keys[2], kTempusZero);
    EXPECT_TRUE(curve->setVertexNormal(s(1), 4.0, kTempusZero));
    EXPECT_EQ(keys[0]->getNormal(kTempusZero), 4.0);
    EXPECT_TRUE(curve->setVertexNormal(s(2), 5.0, kTempusZero));
    EXPECT_TRUE(curve->getVertexNormal(s(9), &read, kTempusZero));
    EXPECT_EQ(read, 5.0);
    EXPECT_TRUE(curve->getVertexNormal(keys[0], &read, kTempusZero));
    EXPECT_EQ(read, 4.0);
    EXPECT_FALSE(curve->setVertexNormal(s(-1), 6.0, kTempusZero));
}

// --- The owner ---

TEST_F(KFSplineAccessTest, SuppressedRefreshKeepsTheListOfValidVertices) {
    add({0.0, 10.0, 20.0, 30.0});
    curve->setNode(&owner);
    curve.at(s(3, 2));
    owner._suppressRefresh = true;
    curve->disableVertex(keys[3], kTempusZero);
    EXPECT_EQ(validCount(), 4u); // still listed
    EXPECT_FALSE(keys[3]->isEnabled(kTempusZero));
    auto* const added = static_cast<KFVertex*>(curve->addVertexNoTangents(s(1, 2), 50.0, kTempusZero, false));
    auto* const behind = static_cast<KFVertex*>(curve->addVertexNoTangents(s(9), 90.0, kTempusZero, false));
    EXPECT_EQ(validCount(), 4u); // not yet listed
    EXPECT_EQ(curve->getMaxValueU(kTempusZero, true), s(3));
    EXPECT_TRUE(curve->isValidHandle(behind));
    void* handle = nullptr;
    EXPECT_TRUE(curve->getVertexHandle(s(9), &handle, true));
    curve->setDirty(true);
    EXPECT_EQ(validCount(), 4u);
    curve->deleteVertex(keys[2], false, kTempusZero);
    EXPECT_EQ(validCount(), 3u); // what is gone can't stay

    // The first edit that isn't suppressed brings the list up to date, whatever it is.
    owner._suppressRefresh = false;
    EXPECT_EQ(validCount(), 3u);
    curve->enableVertex(keys[0], kTempusZero);
    EXPECT_EQ(validCount(), 4u);
    EXPECT_EQ(curve->getMaxValueU(kTempusZero, true), s(9));
    EXPECT_EQ(curve.at(s(1, 2)), 50.0);
    EXPECT_EQ(curve.at(s(1, 4)), 25.0);
    EXPECT_EQ(curve.at(s(5)), 50.0); // from 10 at 1 s to 90 at 9 s, past what was disabled

    owner._suppressRefresh = true;
    curve->disableVertex(added, kTempusZero);
    owner._suppressRefresh = false;
    curve->addVertexNoTangents(s(10), 90.0, kTempusZero, false);
    EXPECT_EQ(validCount(), 4u);
    EXPECT_EQ(curve.at(s(1, 2)), 5.0);
}

namespace {

/// Draws -1 from the vertices of one value on, and looks whether the spline's lock is held meanwhile.
class Custom : public KFCustomInterpolator {
public:
    bool isActive(KFSpline&, void* vA) override {
        return vA != nullptr && static_cast<KFVertex*>(vA)->getValueV(kTempusZero) == 10.0;
    }
    double interpolate(KFSpline&, Tempus const&, void*, void*, Tempus const& u, bool,
                       bool derivative) override {
        if (lock != nullptr && lock->tryLock()) {
            lock->unlock();
            drawnUnlocked = true;
        }
        return derivative ? -3.0 : -TempusGetSeconds(u);
    }
    void subDivide(KFSpline&, Tempus const&, void*, void*, void*) override {}
    bool useTangents() override { return true; }

    BXSpinLock* lock = nullptr;
    bool drawnUnlocked = false;
};

} // namespace

TEST_F(KFSplineAccessTest, ACustomInterpolatorDrawsWhereItIsActive) {
    add({0.0, 10.0, 20.0});
    curve->setNode(&owner);
    EXPECT_EQ(curve.at(s(3, 2)), 15.0);
    Custom custom;
    BXSpinLock shared;
    custom.lock = &shared;
    owner._customLock = &shared;
    owner._customInterpolator = &custom;
    EXPECT_EQ(curve.at(s(3, 2)), -1.5);
    EXPECT_EQ(curve.slopeAt(s(3, 2)), -3.0);
    EXPECT_EQ(curve.at(s(1, 2)), 5.0);
    EXPECT_EQ(curve.slopeAt(s(1, 2)), 10.0);
    EXPECT_EQ(curve.at(s(1)), 10.0);
    EXPECT_EQ(curve.at(s(2)), 20.0);
    bool usesTangents = false;
    curve->getVertexInterpolation(keys[1], nullptr, &usesTangents);
    EXPECT_TRUE(usesTangents);
    curve->getVertexInterpolation(keys[0], nullptr, &usesTangents);
    EXPECT_FALSE(usesTangents);
    std::uint32_t count = 3;
    double values[3] = {};
    curve->sampleSpline(s(1, 2), s(1, 2), count, nullptr, values, kTempusZero, false);
    EXPECT_EQ(values[0], 5.0);
    EXPECT_EQ(values[2], -1.5);
    EXPECT_FALSE(custom.drawnUnlocked);
    curve.at(s(3, 2), false);
    EXPECT_TRUE(custom.drawnUnlocked);
    owner._customInterpolator = nullptr;
    EXPECT_EQ(curve.at(s(3, 2)), 15.0);
    owner._customLock = nullptr; // the curve outlives it, and takes its lock at the end
}

// Each operation that locks takes the owner's lock and gives it back; a second taking on one thread would never end.
TEST_F(KFSplineAccessTest, TheOwnersLockIsTakenAndGivenBack) {
    add({0.0, 10.0, 20.0});
    curve->setNode(&owner);
    BXSpinLock shared;
    owner._customLock = &shared;
    auto const expectFree = [&](char const* after) {
        ASSERT_TRUE(shared.tryLock()) << after;
        shared.unlock();
    };
    curve->preSplineAccess(true);
    EXPECT_FALSE(shared.tryLock());
    curve->postSplineAccess(true);
    expectFree("access");
    curve->preSplineAccess(false);
    expectFree("no access");
    for (Tempus const& u : {s(-1), s(0), s(1, 2), s(9)}) {
        curve.at(u);
        expectFree("value");
        curve.slopeAt(u);
        expectFree("slope");
    }
    std::vector<void*> handles;
    std::vector<std::pair<Tempus, std::pair<double, unsigned>>> times;
    curve->getRangeU(kTempusZero);
    curve->getMinValueU(kTempusZero, true);
    curve->getMaxValueU(kTempusZero, true);
    curve->getVertexHandle(s(1), nullptr, true);
    curve->getAllVerticesHandles(handles);
    curve->getAllValidVerticesHandles(handles, kTempusZero);
    curve->getVerticesTimeAndValue({s(0), s(1)}, times, nullptr, nullptr);
    curve->isValidHandle(keys[0]);
    curve->setInterpolation(4);
    curve->setExtrapolation(1, 1);
    curve->setVertexValue(keys[0], 3.0, kTempusZero);
    curve->setAllVerticesValues(3.0, kTempusZero);
    curve->offsetVertexInTime(keys[2], s(3), kTempusZero);
    curve->disableVertex(keys[0], kTempusZero);
    expectFree("settings");
    {
        MuseumSpline const copy(curve);
        expectFree("copy");
        *curve.spline = *copy.spline;
        expectFree("assignment");
    }
    owner._customLock = nullptr; // the curve outlives it, and takes its lock at the end
}

#ifdef LUMENKEY_KNOWS_SLOTS
// Hosts derive from splines: the slots of the virtual operations are the interface. Two belong to the destructor.
TEST(KFSpline, KeepsTheSlotsOfItsOperations) {
    using S = KFSpline;
    using T = Tempus const&;
    using Count = std::uint32_t&;
    std::size_t const order[] = {
        slotOf(&S::getInterpolation),
        slotOf(&S::getAllVerticesHandles),
        slotOf(static_cast<bool (S::*)(void*, bool, T)>(&S::deleteVertex)),
        slotOf(static_cast<bool (S::*)(T, T, Count, Tempus*, double*, T, bool)>(&S::sampleSpline)),
        slotOf(static_cast<bool (S::*)(T, T, Count, std::vector<Tempus>*, std::vector<double>*, T, bool)>(
            &S::sampleSpline)),
        slotOf(static_cast<bool (S::*)(T, T, Count, Tempus*, double*, T)>(&S::sampleSplineDerivatives)),
        slotOf(static_cast<bool (S::*)(T, T, Count, std::vector<Tempus>*, std::vector<double>*, T)>(
            &S::sampleSplineDerivatives)),
        slotOf(&S::sampleSplineSegment),
        slotOf(&S::sampleSplineSegments),
        slotOf(&S::enableVertex),
        slotOf(&S::disableVertex),
        slotOf(&S::isEnabledVertex),
        slotOf(&S::setVertexInputHandles),
        slotOf(&S::setVertexOutputHandles),
        slotOf(&S::getVertexInputHandles),
        slotOf(&S::getVertexOutputHandles),
        slotOf(&S::flattenHandles),
        slotOf(&S::setVertexSmooth),
        slotOf(static_cast<bool (S::*)(void*, double, T)>(&S::setVertexNormal)),
        slotOf(static_cast<bool (S::*)(void*, double*, T)>(&S::getVertexNormal)),
        slotOf(static_cast<bool (S::*)(T, double, T)>(&S::setVertexNormal)),
        slotOf(static_cast<bool (S::*)(T, double*, T)>(&S::getVertexNormal)),
        slotOf(&S::addVertex),
        slotOf(&S::setVertex),
        slotOf(&S::setVertexValue),
        slotOf(&S::deriveVertex),
        slotOf(&S::getPointInputTangents),
        slotOf(&S::getPointOutputTangents),
        slotOf(&S::getVertexValue),
        slotOf(&S::getDerivativeValue),
        slotOf(static_cast<bool (S::*)(T, double*, T)>(&S::getVertex)),
        slotOf(static_cast<bool (S::*)(void*, Tempus*, double*, T)>(&S::getVertex)),
        slotOf(&S::setVertexBiasLinear),
        slotOf(&S::getVertexBiasLinear),
        slotOf(&S::setVertexBiasExp),
        slotOf(&S::getVertexBiasExp),
        slotOf(&S::deriveCurve)};
    std::size_t slot = 2;
    for (std::size_t const actual : order) {
        EXPECT_EQ(actual, slot);
        ++slot;
    }
}
#endif
