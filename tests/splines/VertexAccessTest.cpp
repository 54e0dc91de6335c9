// Settings of a spline, attributes of its vertices, and what its owner decides.

#include "lumenkey/splines/KFBasicInterpolators.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "tests/splines/SlowCurve.h"
#include "tests/splines/slots.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <functional>

namespace {

Tempus s(std::int64_t value, std::int32_t timescale = 1) { return TempusMake(value, timescale); }

class KFSplineAccessTest : public testing::Test {
protected:
    /// Linear, at whole seconds.
    void add(std::initializer_list<double> values) {
        for (double const value : values) {
            keys.push_back(curve.append(s(static_cast<int>(keys.size())), value));
        }
    }
    std::uint32_t validCount() { return curve->getNumberOfValidVertices(kTempusZero); }

    TestOwner owner;
    MuseumSpline curve;
    std::vector<KFVertex*> keys;
};

} // namespace

TEST_F(KFSplineAccessTest, AnswersForNullAndEmpty) {
    EXPECT_EQ(curve->getRangeU(kTempusZero), kTempusZero);
    curve->setNode(&owner);
    owner.initialValue = 7.0;
    for (std::uint32_t const type : {1u, 12u}) {
        for (bool const parametric : {false, true}) {
            curve.state->interpolation = type;
            curve.state->parametric = parametric;
            EXPECT_EQ(curve.at(s(1)), 7.0) << "the initial value of type " << type;
        }
    }
    EXPECT_TRUE(curve->hasInterpolation(12));

    std::uint32_t number = 77;
    double value = 77.0;
    bool const accepted[] = {curve->setVertexValue(nullptr, 1.0, kTempusZero),
                             curve->setVertexInterpolation(nullptr, 1),
                             curve->getVertexInterpolation(nullptr, &number, nullptr),
                             curve->setVertexFlag(nullptr, 1),
                             curve->resetVertexFlag(nullptr, 1),
                             curve->setVertexFlags(nullptr, 1),
                             curve->getVertexFlags(nullptr, &number),
                             curve->setVertexSpeed(nullptr, 1),
                             curve->getVertexSpeed(nullptr, &number),
                             curve->enableVertex(nullptr, kTempusZero),
                             curve->disableVertex(nullptr, kTempusZero),
                             curve->isEnabledVertex(nullptr, kTempusZero),
                             curve->getVertex(nullptr, nullptr, &value, kTempusZero),
                             curve->adjustVertexSpeed(nullptr, 1.0),
                             curve->getVertexNormal(s(1), &value, kTempusZero),
                             curve->getVertex(s(0), nullptr, kTempusZero)};
    EXPECT_EQ(std::count(std::begin(accepted), std::end(accepted), true), 0);
    curve->offsetVertexInTime(nullptr, s(1), kTempusZero);
    EXPECT_EQ(number, 77u);
    EXPECT_EQ(value, 77.0);
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
    EXPECT_EQ(curve->getStep(), owner.frame);
    EXPECT_EQ(curve->getRangeU(kTempusZero), s(51, 25));
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
    keys[1]->setFlag(kKFVertexFlagLocked);
    curve->setInterpolation(4);
    EXPECT_EQ(curve.typeOfAll(), 100u) << "the locked one keeps its type";
    EXPECT_TRUE(curve->hasInterpolation(1));
    keys[0]->setInterpolation(7);
    EXPECT_FALSE(curve->hasInterpolation(7)) << "the first one isn't looked at";
    curve.state->parametric = true;
    curve->setInterpolation(10);
    EXPECT_EQ(curve.typeOfAll(), 10u) << "a parametric spline is of one type, locks or not";
    curve->setInterpolation(100);
    EXPECT_EQ(curve.typeOfAll(), 10u) << "mixed is no type to set";
    *static_cast<KFStaticVertex*>(keys[2]) = KFStaticVertex(s(2), 1.0);
    EXPECT_EQ(curve.typeOfAll(), 100u) << "a vertex that is assigned has another type";
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
    // A normal belongs to the enabled vertex there, else to the last one before.
    curve->disableVertex(keys[1], kTempusZero);
    EXPECT_TRUE(curve->setVertexNormal(s(1), 4.0, kTempusZero));
    EXPECT_EQ(keys[0]->getNormal(kTempusZero), 4.0);
    EXPECT_TRUE(curve->setVertexNormal(s(2), 5.0, kTempusZero));
    EXPECT_TRUE(curve->getVertexNormal(s(9), &read, kTempusZero));
    EXPECT_EQ(read, 5.0);
    EXPECT_FALSE(curve->setVertexNormal(s(-1), 6.0, kTempusZero));
    // An open spline without a valid vertex refuses a bias, unless its owner is loading.
    curve->disableVertex(keys[0], kTempusZero);
    curve->disableVertex(keys[2], kTempusZero);
    EXPECT_FALSE(curve->setVertexBiasLinear(keys[1], 1.25, kTempusZero));
    curve->setNode(&owner);
    owner._suppressRefresh = true;
    EXPECT_TRUE(curve->setVertexBiasLinear(keys[1], 1.25, kTempusZero));
    EXPECT_EQ(keys[1]->getBias(kTempusZero), 1.25);
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
    curve->addVertexNoTangents(s(1, 2), 50.0, kTempusZero, false);
    Tempus const end = s(9);
    double const valueThere = 90.0;
    void* const behind = curve->appendVertexesNoTangents(1, &end, &valueThere, kTempusZero).at(0);
    EXPECT_EQ(validCount(), 4u);              // not yet listed
    for (Tempus const& u : {s(1, 8), s(0)}) { // one that moves keeps its part, wherever it goes
        EXPECT_TRUE(curve->setVertex(keys[0], u, 0.0, kTempusZero));
        EXPECT_EQ(validCount(), 4u);
        EXPECT_EQ(curve->getMinValueU(kTempusZero, true), u);
    }
    EXPECT_EQ(curve->getMaxValueU(kTempusZero, true), s(3));
    EXPECT_TRUE(curve->isValidHandle(behind));
    EXPECT_NE(curve.vertexAt(s(9)), nullptr);
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
    for (int i = 0; i < 3; ++i) { // from what is kept of it, too
        EXPECT_EQ(curve.at(s(3, 2)), 15.0);
    }
    Custom custom;
    BXSpinLock shared;
    custom.lock = &shared;
    owner._customLock = &shared;
    owner._customInterpolator = &custom;
    EXPECT_EQ(curve.at(s(3, 2)), -1.5);
    EXPECT_EQ(curve.slopeAt(s(3, 2)), -3.0);
    EXPECT_EQ(curve.at(s(1, 2)), 5.0);
    EXPECT_EQ(curve.slopeAt(s(1, 2)), 10.0);
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
    curve->preSplineAccess(true);
    EXPECT_FALSE(shared.tryLock());
    curve->disableVertex(keys[0], kTempusZero); // by handle: for who holds it
    curve->enableVertex(keys[0], kTempusZero);
    curve->offsetVertexInTime(keys[2], s(3), kTempusZero);
    curve->postSplineAccess(true);
    std::vector<void*> handles;
    std::vector<std::pair<Tempus, std::pair<double, unsigned>>> times;
    std::function<void()> const operations[] = {
        [&] {
            for (Tempus const& u : {s(-1), s(0), s(1, 2), s(9)}) {
                curve.at(u);
                curve.slopeAt(u);
            }
        },
        [&] { curve->getRangeU(kTempusZero); },
        [&] { curve->getMinValueU(kTempusZero, true); },
        [&] { curve->getMaxValueU(kTempusZero, true); },
        [&] { curve->getVertexHandle(s(1), nullptr, true); },
        [&] { curve->getAllVerticesHandles(handles); },
        [&] { curve->getAllValidVerticesHandles(handles, kTempusZero); },
        [&] {
            curve->getVerticesTimeAndValue({s(0), s(1)}, times, nullptr, nullptr);
        },
        [&] { curve->isValidHandle(keys[0]); },
        [&] { curve->setInterpolation(4); },
        [&] { curve->setExtrapolation(1, 1); },
        [&] { curve->setVertexValue(keys[0], 3.0, kTempusZero); },
        [&] { curve->setAllVerticesValues(3.0, kTempusZero); },
        [&] { *curve.spline = *MuseumSpline(curve).spline; }};
    for (auto const& operation : operations) {
        operation();
        ASSERT_TRUE(shared.tryLock()) << &operation - operations;
        shared.unlock();
    }
    owner._customLock = nullptr; // the curve outlives it, and takes its lock at the end
}

#ifdef LUMENKEY_KNOWS_SLOTS
// Hosts derive from splines: the slots of the virtual operations are the interface.
TEST(KFSpline, KeepsTheSlotsOfItsOperations) {
    using S = KFSpline;
    using T = Tempus const&;
    using Count = std::uint32_t&;
    using Times = std::vector<Tempus>*;
    using Numbers = std::vector<double>*;
    expectSlots(&S::getInterpolation, &S::getAllVerticesHandles,
                static_cast<bool (S::*)(void*, bool, T)>(&S::deleteVertex),
                static_cast<bool (S::*)(T, T, Count, Tempus*, double*, T, bool)>(&S::sampleSpline),
                static_cast<bool (S::*)(T, T, Count, Times, Numbers, T, bool)>(&S::sampleSpline),
                static_cast<bool (S::*)(T, T, Count, Tempus*, double*, T)>(&S::sampleSplineDerivatives),
                static_cast<bool (S::*)(T, T, Count, Times, Numbers, T)>(&S::sampleSplineDerivatives),
                &S::sampleSplineSegment, &S::sampleSplineSegments, &S::enableVertex, &S::disableVertex,
                &S::isEnabledVertex, &S::setVertexInputHandles, &S::setVertexOutputHandles,
                &S::getVertexInputHandles, &S::getVertexOutputHandles, &S::flattenHandles,
                &S::setVertexSmooth, static_cast<bool (S::*)(void*, double, T)>(&S::setVertexNormal),
                static_cast<bool (S::*)(void*, double*, T)>(&S::getVertexNormal),
                static_cast<bool (S::*)(T, double, T)>(&S::setVertexNormal),
                static_cast<bool (S::*)(T, double*, T)>(&S::getVertexNormal), &S::addVertex, &S::setVertex,
                &S::setVertexValue, &S::deriveVertex, &S::getPointInputTangents, &S::getPointOutputTangents,
                &S::getVertexValue, &S::getDerivativeValue,
                static_cast<bool (S::*)(T, double*, T)>(&S::getVertex),
                static_cast<bool (S::*)(void*, Tempus*, double*, T)>(&S::getVertex), &S::setVertexBiasLinear,
                &S::getVertexBiasLinear, &S::setVertexBiasExp, &S::getVertexBiasExp, &S::deriveCurve);
}
#endif
