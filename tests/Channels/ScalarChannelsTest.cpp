// The scalar types: the constants of each class, and which of its records a form starts with.

#include "lumenkey/Channels/KFChanObjectRef.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFChannelSegmentVisitor.h"
#include "lumenkey/curves/KFCurveNode.h"
#include "lumenkey/curves/KFTypedCurves.h"
#include "tests/splines/slots.h"

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <cstdlib>
#include <thread>
#include <tuple>
#include <typeinfo>
#include <vector>

namespace {

constexpr double kLargestFloat = 340282346638528859811704183484516925440.0;
constexpr double kPi = 3.14159265358979323846;
constexpr double kMost = 4294967295.0;

template <class Channel> std::unique_ptr<KFChannel> make() {
    return std::make_unique<Channel>(static_cast<KFFactory*>(nullptr), "channel", 7U);
}

struct Row {
    std::unique_ptr<KFChannel> (*make)();
    char const* wrapper;
    std::type_info const& curve;
    bool keyframable;
    double value;
    std::array<double, 5> slider; // lowest, highest, coarse, fine, scale
    char const* suffix;
};

// clang-format off
Row const kRows[] = {
    {make<KFChannelDouble>, "KWChannelDouble", typeid(KFCurveDouble), true, 0, {0, 100, 1, 0.01, 1}, ""},
    {make<KFChannelAngle>, "KWChannelAngle", typeid(KFCurveAngle), true, 0, {-kLargestFloat, kLargestFloat, kPi / 180, kPi / 18000, 180 / kPi}, "°"},
    {make<KFChannelShearAngle>, "KWChannelShearAngle", typeid(KFCurveAngle), true, 0, {-kPi / 2, kPi / 2, kPi / 180, kPi / 18000, 180 / kPi}, "°"},
    {make<KFChannelPercent>, "KWChannelPercent", typeid(KFCurvePercent), true, 0, {0, 1, 0.01, 0.0001, 100}, "%"},
    {make<KFChannelUint32>, "KWChannelUint32", typeid(KFCurveInt), true, 0, {0, kMost, 1, 1, 1}, ""},
    {make<KFChannelUint16>, "KWChannelUint16", typeid(KFCurveInt), true, 0, {0, 65535, 1, 1, 1}, ""},
    {make<KFChannelBool>, "KWChannelBool", typeid(KFCurveBool), false, 0, {0, 1, 1, 1, 1}, ""},
    {make<KFChannelSeed>, "KWChannelSeed", typeid(KFCurveEnum), false, 0, {0, kMost, 1, 1, 1}, ""},
    {make<KFChannelDecibel>, "KWChannelDecibel", typeid(KFCurveDouble), true, 0, {0, 4, 1, 0.1, 1}, "dB"},
    {make<KFChannelFrame>, "KWChannelFrame", typeid(KFCurveDouble), true, 0, {0, 100, 1, 0.01, 1}, ""},
    {make<KFChannelTimecode>, "KWChannelTimecode", typeid(KFCurveDouble), true, 0, {0, 100, 1, 0.01, 1}, ""},
    {make<KFChannelAspectRatio>, "KWChannelAspectRatio", typeid(KFCurveDouble), false, 1, {0, 3, 0.0001, 0.1, 1}, ""},
    {make<KFChannelAspectRatioFootage>, "KWChannelAspectRatioFootage", typeid(KFCurveDouble), false, 1, {0, 3, 0.0001, 0.1, 1}, ""},
    {make<KFChannelGammaFootage>, "KWChannelGammaFootage", typeid(KFCurveDouble), false, 0, {0, 3, 0.0001, 0.1, 1}, ""},
    {make<KFChannelProgress>, "KWChannelProgress", typeid(KFCurveDouble), false, 0, {0, 0, 1, 1, 1}, ""},
    {make<KFChannelChrono>, "KWChannelChrono", typeid(KFCurveDouble), true, 0, {0, 100, 1, 0.01, 1}, ""},
    {make<KFChanObjectRef>, "KWChannel", typeid(KFCurveEnum), false, 0, {0, kMost, 1, 1, 1}, ""},
};
// clang-format on

TEST(ScalarChannels, StartWithTheConstantsOfTheirClass) {
    for (Row const& expected : kRows) {
        std::unique_ptr<KFChannel> const channel = expected.make();
        SCOPED_TRACE(expected.wrapper);
        EXPECT_STREQ(channel->getFacadeWrapperName(), expected.wrapper);
        KFCurve const& curve = *channel->getCurveInterface();
        EXPECT_EQ(typeid(curve), expected.curve);
        EXPECT_EQ(channel->isSpline(), expected.keyframable);
        EXPECT_EQ(channel->isKeyframable(), expected.keyframable);
        EXPECT_EQ(channel->getInitialValue(), expected.value);
        EXPECT_EQ(channel->getDefaultValue(), expected.value);
        std::array const slider = {channel->getSliderMin(), channel->getSliderMax(),
                                   channel->getCoarseDelta(), channel->getFineDelta(), channel->getScale()};
        for (std::size_t i = 0; i < slider.size(); ++i)
            EXPECT_DOUBLE_EQ(slider[i], expected.slider[i]) << i;
        EXPECT_STREQ(channel->getSuffix().c_str(), expected.suffix);
        EXPECT_STREQ(channel->getSliderTransformerName(), "UQSliderTransformer");
        std::unique_ptr<KFChannelBase> const clone(channel->clone());
        EXPECT_STREQ(clone->getFacadeWrapperName(), expected.wrapper);
        EXPECT_EQ(clone->getFlags(), channel->getFlags());
        EXPECT_EQ(dynamic_cast<KFChannel&>(*clone).getImpl(), channel->getImpl());
    }
}

TEST(ScalarChannels, ChooseTheRecordThatHoldsTheirValue) {
    EXPECT_EQ(KFChannelBool(1, "", nullptr, 1, 0).getImpl(), KFChannelBool::createKFChannelBoolTrueImpl());
    EXPECT_EQ(KFChannelBool(0, "", nullptr, 1, 0).getImpl(), KFChannelBool::createKFChannelBoolFalseImpl());
    std::tuple<double, KFChannelImpl*, bool> const cases[] = {
        {1.0 - 5e-8, KFChannelPercent::createKFChannelPercent100Impl(), false},
        {5e-8, KFChannelPercent::createKFChannelPercent0Impl(), false},
        {0.5, KFChannelPercent::createKFChannelPercent50Impl(), false},
        {0.75, KFChannelPercent::createKFChannelPercent50Impl(), true},
    };
    for (auto const& [value, record, local] : cases) {
        KFChannelPercent percent(value, "", nullptr, 1, 0);
        percent.resetToDefault(false);
        EXPECT_EQ(percent.getImpl() != record, local);
        EXPECT_NEAR(percent.getValueAsDouble(kTempusZero, 0.0), value, 1e-7);
    }
    EXPECT_EQ(KFChannelPercent("", nullptr, 1, 0).getDefaultValue(), 1.0);
}

TEST(ScalarChannels, CarryTheirOwnFlagsAndFields) {
    KFChannelProgress progress(9.0, "", nullptr, 1, kChannelFlagHidden);
    progress.setHostOption(1, true);
    KFChannelProgress const blank(progress);
    EXPECT_EQ(blank.getFlags(), kChannelFlagNotSaved | kChannelFlagHostOption4);
    EXPECT_TRUE(blank.getHostOption(1) && !blank.getHostOption(0));
    KFChanObjectRef const reference("", nullptr, 1, 0);
    EXPECT_EQ(reference.getFlags(), 0x1000010010U);
    EXPECT_EQ(KFChanObjectRef(reference).getFlags(), 0x1000010010U) << "a blank copy too";
}

#ifdef LUMENKEY_KNOWS_SLOTS
/// A slot that moves is noticed by the ones at the beginning, in the middle and at the end of each table.
TEST(ChannelSlots, AreWhereSubclassesInHostsHaveThem) {
    using Root = KFChannelObjectRootBase;
    using Node = KFCurveNode;
    using Visitor = KFChannelSegmentVisitor;
    double (Node::*const solvesOne)(Tempus const&, double, double) = &Node::solveNode;
    std::pair<std::size_t, std::size_t> const slots[] = {
        {slotOf(&Root::getInstanceID), 7},
        {slotOf(&Root::finishInitializing), 10},
        {slotOf(&Root::copy), 29},
        {slotOf(&Root::getTimeOffset), 40},
        {slotOf(&KFChannel::willBeModified), 58},
        {slotOf(&Root::hasBeenModified), 59},
        {slotOf(&Root::hasKeypoints), 69},
        {slotOf(&Root::shouldIgnoreDynamicIDs), 87},
        {slotOf(&Root::resetTimeIndependentFlagIfNeeded), 88},
        {slotOf(&Root::getTimeExtent), 89},
        {slotOf(&Root::willModifyChannel), 97},
        {slotOf(&Root::checkSolo), 99},
        {slotOf(&Root::getFrameDuration), 110},
        {slotOf(&KFChannel::parentWillBeModified), 88},
        {slotOf(&KFChannel::getSliderMax), 101},
        {slotOf(&KFChannel::getNumberOfKeyframes), 104},
        {slotOf(&KFChannel::moveKeyframe), 105},
        {slotOf(&KFChanObjectRef::getObjectRef), 106},
        {slotOf(solvesOne), 2},
        {slotOf(&Node::getUForValue), 4},
        {slotOf(&Node::compare), 17},
        {slotOf(&Node::isPointToPoint), 22},
        {slotOf(&Node::reset), 25},
        {slotOf(&Visitor::visitConstant), 2},
        {slotOf(&Visitor::visitEase), 8},
        {slotOf(&Visitor::visitLogarithmic), 12},
    };
    for (auto const& [slot, expected] : slots)
        EXPECT_EQ(slot, expected);
}
#endif

TEST(ScalarChannels, ChronoCountsUnitsDownward) {
    std::tuple<Tempus, int, std::int64_t> const cases[] = {
        {TempusMake(1, 601), 600, 0}, {TempusMake(-1, 601), 600, -1}, {TempusMake(-1, 2), 600, -300},
        {TempusMake(7, 10), 24, 16},  {TempusMake(-7, 10), 24, -17},  {kTempusInvalid, 600, 0},
    };
    for (auto const& [value, timeScale, units] : cases) {
        KFChannelChrono chrono("", nullptr, 1, 0);
        EXPECT_EQ(chrono.getTimeScale(), 600);
        chrono.setTimeScale(timeScale);
        chrono.setValueAsChrono(kTempusZero, value, false);
        EXPECT_EQ(chrono.getValueAsChrono(kTempusZero, 0.0).value, units);
        std::unique_ptr<KFChannelBase> const clone(chrono.clone());
        EXPECT_TRUE(chrono.compare(clone.get()));
        dynamic_cast<KFChannelChrono&>(*clone).setTimeScale(25);
        EXPECT_FALSE(chrono.compare(clone.get()));
        chrono.copy(clone.get(), false);
        EXPECT_EQ(chrono.getTimeScale(), 25);
    }
    KFChannelChrono const five(TempusMake(5, 1), "", nullptr, 1, 0);
    EXPECT_EQ(five.getDefaultValue(), 5.0);
    EXPECT_FALSE(five.compare(make<KFChannelDouble>().get()));
}

/// Both threads make the first channel of every class at once, in a process that has made none.
[[noreturn]] void makeFirstChannelsOnTwoThreads() {
    std::atomic<int> waiting{2};
    std::array<std::vector<std::unique_ptr<KFChannel>>, 2> made;
    auto const work = [&](std::size_t thread) {
        for (--waiting; waiting != 0;) {
        }
        for (auto const makeOne :
             {make<KFChannelDouble>, make<KFChannelAngle>, make<KFChannelPercent>, make<KFChannelBool>,
              make<KFChannelSeed>, make<KFChannelUint32>, make<KFChannelAspectRatio>})
            made[thread].push_back(makeOne());
    };
    std::thread other(work, 1);
    work(0);
    other.join();
    bool alike = true;
    for (std::size_t i = 0; i < made[0].size(); ++i) {
        alike &=
            made[0][i]->getImpl() == made[1][i]->getImpl() && made[0][i]->getInfo() == made[1][i]->getInfo();
        alike &= made[0][i]->getImpl()->isShared();
    }
    made = {};
    std::exit(alike ? 0 : 1);
}

TEST(ScalarChannelsThreadsDeathTest, ShareTheRecordsThatTheFirstOfTwoThreadsMakes) {
    testing::GTEST_FLAG(death_test_style) = "threadsafe"; // starts anew, without any records
    EXPECT_EXIT(makeFirstChannelsOnTwoThreads(), testing::ExitedWithCode(0), "^$");
}

} // namespace
