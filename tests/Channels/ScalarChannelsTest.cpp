// The scalar types: the constants of each class, which of its records a form starts with, and concurrent first use.

#include "lumenkey/Channels/KFChanObjectRef.h"
#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/curves/KFTypedCurves.h"

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <thread>
#include <typeinfo>

namespace {

constexpr double kLargestFloat = 340282346638528859811704183484516925440.0;
constexpr double kLargestDouble = 1.7976931348623157e308;
constexpr double kPi = 3.14159265358979323846;

using Maker = std::unique_ptr<KFChannel> (*)();

template <class Channel> std::unique_ptr<KFChannel> make() {
    return std::make_unique<Channel>(static_cast<KFFactory*>(nullptr), "channel", 7U);
}

struct Row {
    Maker make;
    char const* wrapper;
    std::type_info const& curve;
    bool keyframable;
    double value, sliderMin, sliderMax, coarse, fine, scale;
    char const* suffix;
    double minimum, maximum;
};

template <class Channel, class Curve>
Row row(char const* wrapper, bool keyframable, double value, double sliderMin, double sliderMax,
        double coarse, double fine, double scale, char const* suffix, double minimum, double maximum) {
    return {&make<Channel>, wrapper, typeid(Curve), keyframable, value,   sliderMin, sliderMax,
            coarse,         fine,    scale,         suffix,      minimum, maximum};
}

std::vector<Row> const& rows() {
    double const any = kLargestDouble;
    double const most = 4294967295.0;
    // clang-format off
    static std::vector<Row> const all = {
        row<KFChannelDouble, KFCurveDouble>("KWChannelDouble", true, 0, 0, 100, 1, 0.01, 1, "", -any, any),
        row<KFChannelAngle, KFCurveAngle>("KWChannelAngle", true, 0, -kLargestFloat, kLargestFloat, kPi / 180, kPi / 18000, 180 / kPi, "°", -any, any),
        row<KFChannelShearAngle, KFCurveAngle>("KWChannelShearAngle", true, 0, -kPi / 2, kPi / 2, kPi / 180, kPi / 18000, 180 / kPi, "°", -any, any),
        row<KFChannelPercent, KFCurvePercent>("KWChannelPercent", true, 0, 0, 1, 0.01, 0.0001, 100, "%", 0, 1),
        row<KFChannelUint32, KFCurveInt>("KWChannelUint32", true, 0, 0, most, 1, 1, 1, "", 0, most),
        row<KFChannelUint16, KFCurveInt>("KWChannelUint16", true, 0, 0, 65535, 1, 1, 1, "", 0, most),
        row<KFChannelBool, KFCurveBool>("KWChannelBool", false, 0, 0, 1, 1, 1, 1, "", 0, 1),
        row<KFChannelSeed, KFCurveEnum>("KWChannelSeed", false, 0, 0, most, 1, 1, 1, "", 0, most),
        row<KFChannelDecibel, KFCurveDouble>("KWChannelDecibel", true, 0, 0, 4, 1, 0.1, 1, "dB", -any, any),
        row<KFChannelFrame, KFCurveDouble>("KWChannelFrame", true, 0, 0, 100, 1, 0.01, 1, "", -any, any),
        row<KFChannelTimecode, KFCurveDouble>("KWChannelTimecode", true, 0, 0, 100, 1, 0.01, 1, "", -any, any),
        row<KFChannelAspectRatio, KFCurveDouble>("KWChannelAspectRatio", false, 1, 0, 3, 0.0001, 0.1, 1, "", -any, any),
        row<KFChannelAspectRatioFootage, KFCurveDouble>("KWChannelAspectRatioFootage", false, 1, 0, 3, 0.0001, 0.1, 1, "", -any, any),
        row<KFChannelGammaFootage, KFCurveDouble>("KWChannelGammaFootage", false, 0, 0, 3, 0.0001, 0.1, 1, "", -any, any),
        row<KFChannelProgress, KFCurveDouble>("KWChannelProgress", false, 0, 0, 0, 1, 1, 1, "", -any, any),
        row<KFChannelChrono, KFCurveDouble>("KWChannelChrono", true, 0, 0, 100, 1, 0.01, 1, "", -any, any),
        row<KFChanObjectRef, KFCurveEnum>("KWChannel", false, 0, 0, most, 1, 1, 1, "", 0, most),
    };
    // clang-format on
    return all;
}

TEST(ScalarChannels, StartWithTheConstantsOfTheirClass) {
    for (Row const& expected : rows()) {
        std::unique_ptr<KFChannel> const channel = expected.make();
        SCOPED_TRACE(expected.wrapper);
        EXPECT_STREQ(channel->getFacadeWrapperName(), expected.wrapper);
        KFCurve const& curve = *channel->getCurveInterface();
        EXPECT_EQ(typeid(curve), expected.curve);
        EXPECT_EQ(channel->isSpline(), expected.keyframable);
        EXPECT_EQ(channel->isKeyframable(), expected.keyframable);
        EXPECT_EQ(channel->getValueAsDouble(TempusMake(3, 1), 5.0), expected.value);
        EXPECT_EQ(channel->getDefaultValue(), expected.value);
        EXPECT_EQ(channel->getSliderMin(), expected.sliderMin);
        EXPECT_EQ(channel->getSliderMax(), expected.sliderMax);
        EXPECT_DOUBLE_EQ(channel->getCoarseDelta(), expected.coarse);
        EXPECT_DOUBLE_EQ(channel->getFineDelta(), expected.fine);
        EXPECT_DOUBLE_EQ(channel->getScale(), expected.scale);
        EXPECT_EQ(channel->getOffset(), 0.0);
        EXPECT_STREQ(channel->getSuffix().c_str(), expected.suffix);
        EXPECT_STREQ(channel->getSliderTransformerName(), "UQSliderTransformer");
        EXPECT_EQ(channel->getMin(), expected.minimum);
        EXPECT_EQ(channel->getMax(), expected.maximum);
        EXPECT_FALSE(channel->isModified(false));

        std::unique_ptr<KFChannelBase> const clone(channel->clone());
        KFChannelBase const& original = *channel;
        KFChannelBase const& copy = *clone;
        EXPECT_EQ(typeid(copy), typeid(original));
        EXPECT_STREQ(clone->getName().c_str(), "channel");
        EXPECT_TRUE(clone->compare(channel.get()));
        EXPECT_EQ(dynamic_cast<KFChannel&>(*clone).getImpl(), channel->getImpl());
    }
}

TEST(ScalarChannels, ChooseTheRecordThatHoldsTheirValue) {
    KFChannelBool const yes(1, "", nullptr, 1, 0);
    KFChannelBool const no(0, "", nullptr, 1, 0);
    KFChannelBool const named("", nullptr, 1, 0);
    EXPECT_EQ(yes.getImpl(), KFChannelBool::createKFChannelBoolTrueImpl());
    EXPECT_EQ(no.getImpl(), KFChannelBool::createKFChannelBoolFalseImpl());
    EXPECT_EQ(named.getImpl(), no.getImpl());
    EXPECT_EQ(yes.getValueAsInt(kTempusZero, 0.0), 1);

    struct {
        double value;
        KFChannelImpl* record;
        bool local;
    } const cases[] = {
        {1.0 - 5e-8, KFChannelPercent::createKFChannelPercent100Impl(), false},
        {5e-8, KFChannelPercent::createKFChannelPercent0Impl(), false},
        {0.5, KFChannelPercent::createKFChannelPercent50Impl(), false},
        {0.75, KFChannelPercent::createKFChannelPercent50Impl(), true},
    };
    for (auto const& [value, record, local] : cases) {
        KFChannelPercent percent(value, "", nullptr, 1, 0);
        EXPECT_EQ(percent.getImpl() != record, local);
        EXPECT_NEAR(percent.getDefaultValue(), value, 1e-7);
        percent.resetToDefault(false);
        EXPECT_EQ(percent.getImpl() != record, local);
        EXPECT_NEAR(percent.getValueAsDouble(kTempusZero, 0.0), value, 1e-7);
    }
    EXPECT_EQ(KFChannelPercent("", nullptr, 1, 0).getDefaultValue(), 1.0);
    EXPECT_EQ(KFChannelDouble(-3.0, "", nullptr, 1, 0).getInitialValue(), -3.0);
}

TEST(ScalarChannels, CarryTheirOwnFlagsAndFields) {
    KFChannelProgress progress(9.0, "", nullptr, 1, kChannelFlagHidden);
    EXPECT_EQ(progress.getFlags(), kChannelFlagHidden | kChannelFlagNotSaved | kChannelFlagHostOption4);
    EXPECT_EQ(progress.getDefaultValue(), 0.0);
    progress.setHostOption(1, true);
    std::unique_ptr<KFChannelBase> const clone(progress.clone());
    EXPECT_TRUE(dynamic_cast<KFChannelProgress&>(*clone).getHostOption(1));
    EXPECT_FALSE(dynamic_cast<KFChannelProgress&>(*clone).getHostOption(0));

    KFChanObjectRef const reference("", nullptr, 1, 0);
    EXPECT_EQ(reference.getFlags(), 0x1000010010U);
    EXPECT_TRUE(reference.isObjectRef());
    EXPECT_EQ(reference.getObjectRef(), nullptr);
}

TEST(ScalarChannels, ChronoCountsUnitsDownward) {
    struct {
        Tempus value;
        int timeScale;
        std::int64_t units;
    } const cases[] = {
        {TempusMake(1, 1), 600, 600},   {TempusMake(1, 601), 600, 0}, {TempusMake(-1, 601), 600, -1},
        {TempusMake(-1, 2), 600, -300}, {TempusMake(7, 10), 24, 16},  {TempusMake(-7, 10), 24, -17},
        {kTempusInvalid, 600, 0},
    };
    for (auto const& [value, timeScale, units] : cases) {
        KFChannelChrono chrono("", nullptr, 1, 0);
        EXPECT_EQ(chrono.getTimeScale(), 600);
        chrono.setTimeScale(timeScale);
        chrono.setValueAsChrono(kTempusZero, value, false);
        Tempus const read = chrono.getValueAsChrono(kTempusZero, 0.0);
        EXPECT_EQ(read.value, units);
        EXPECT_EQ(read.timescale, timeScale);

        std::unique_ptr<KFChannelBase> const clone(chrono.clone());
        EXPECT_TRUE(chrono.compare(clone.get()));
        dynamic_cast<KFChannelChrono&>(*clone).setTimeScale(25);
        EXPECT_FALSE(chrono.compare(clone.get()));
        chrono.copy(clone.get(), false);
        EXPECT_EQ(chrono.getTimeScale(), 25);
    }
    KFChannelChrono const five(TempusMake(5, 1), "", nullptr, 1, 0);
    EXPECT_EQ(five.getDefaultValue(), 5.0);
    KFChannelDouble const plain("", nullptr, 1, 0);
    EXPECT_FALSE(five.compare(&plain));
}

TEST(ScalarChannelsThreads, MakeTheFirstOfAClassAtOnce) {
    constexpr std::size_t kThreads = 4;
    std::array<std::vector<std::pair<void const*, void const*>>, kThreads> records;
    std::atomic<std::size_t> waiting{0};
    std::vector<std::thread> threads;
    std::size_t const classes = rows().size();
    for (std::size_t i = 0; i < kThreads; ++i) {
        threads.emplace_back([&, i] {
            for (std::size_t c = 0; c < classes; ++c) {
                ++waiting;
                while (waiting < kThreads * (c + 1)) {
                }
                std::unique_ptr<KFChannel> const channel = rows()[c].make();
                records[i].emplace_back(channel->getImpl(), channel->getInfo());
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    for (auto const& others : records)
        EXPECT_EQ(others, records[0]);
}

} // namespace
