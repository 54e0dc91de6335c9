// Values of a channel over time: reading, writing with its announcements, limits, units, and fades.

#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "tests/Channels/AddingNode.h"
#include "tests/Channels/Animating.h"
#include "tests/Channels/LinearConverter.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <limits>
#include <tuple>

namespace {

/// A root with an offset of 2 s, a compound below it, and a component.
struct Tree {
    RecordingRoot root;
    KFCompoundChannel compound{nullptr, "compound", &root, 2, 0, false, 0};
    KFChannelDouble component{"component", &compound, 3, 0};
    KFChannelBool single{"single", &root, 4, 0};
    Tree() {
        root.setTimeOffset(s(2), true);
        root.setTimeExtent({s(3), s(10)}, true);
        root.takeAnnounced();
    }
};

TEST(KFChannelValue, IsReadThroughTimeNodesAndFlags) {
    LinearConverter converter(s(1), s(1));
    KFChannelDouble channel(3.0, "", nullptr, 1, 0);
    channel.setTimeConverterDelegate(&converter);
    EXPECT_EQ(channel.getValueAsDouble(s(1), 100.0), 3.0);
    EXPECT_EQ(converter.asked, nullptr) << "a constant doesn't ask for the time";

    KFCurveNode* const node = new AddingNode(0.5);
    EXPECT_TRUE(channel.appendCurveProcessingNode(node));
    EXPECT_EQ(channel.getValueAsDouble(s(1), 100.0), 103.5);
    EXPECT_EQ(channel.getCurveValueForNode(s(1), node, 0.0), 3.5);
    channel.setValueOffsetByBehaviors(s(1), 10.0);
    EXPECT_EQ(channel.getInitialValue(), 9.5);
    channel.setFlag(kChannelFlagBehaviorsOff, false);
    EXPECT_EQ(channel.getValueAsDouble(s(1), 100.0), 9.5);
    EXPECT_TRUE(channel.removeCurveProcessingNode(node));
    EXPECT_TRUE(channel.insertCurveProcessingNode(node, nullptr));
    EXPECT_TRUE(channel.deleteCurveProcessingNode(node));
}

TEST(KFChannelValue, IsTruncatedWithinTheRangeOfIntegers) {
    double const infinity = std::numeric_limits<double>::infinity();
    std::tuple<double, int, unsigned> const cases[] = {{-2.9, -2, 0U},
                                                       {3e9, 2147483647, 3000000000U},
                                                       {-infinity, -2147483647 - 1, 0U},
                                                       {NAN, 0, 0U},
                                                       {infinity, 2147483647, 4294967295U}};
    for (auto const& [value, asInt, asUint] : cases) {
        KFChannelDouble const channel(value, "", nullptr, 1, 0);
        EXPECT_EQ(channel.getValueAsInt(kTempusZero, 0.0), asInt) << value;
        EXPECT_EQ(channel.getValueAsUint(kTempusZero, 0.0), asUint) << value;
    }
}

TEST(KFChannelValue, AnnouncesTheCompoundFirstAndConstantsAsState) {
    Tree tree;
    KFChannel& component = tree.component;
    Announced const data = {{&tree.compound, kModifyData}, {&component, kModifyData}};
    Announced const state = {{&tree.compound, kModifyState}, {&component, kModifyState}};
    Announced const twice = {state[0], state[1], state[0], state[1]};
    std::tuple<char const*, void (*)(KFChannel&), Announced> const cases[] = {
        {"set", [](KFChannel& c) { c.setValue(s(5), 4.0, false); }, data},
        {"set silently", [](KFChannel& c) { c.setValue(s(5), 6.0, true); }, {}},
        {"initial", [](KFChannel& c) { c.setInitialValue(7.0, false); }, data},
        {"fade", [](KFChannel& c) { c.setFadeInOffset(s(1), true); }, data},
        {"add", [](KFChannel& c) { c.addKeypointAt(s(5)); }, data},
        {"remove what isn't there", [](KFChannel& c) { EXPECT_FALSE(c.removeValue(s(7), true)); }, data},
        {"lock", [](KFChannel& c) { c.lock(true, false); }, twice},
        {"fade while locked", [](KFChannel& c) { c.setFadeInOffset(s(3), false); }, {}},
        {"reset while locked", [](KFChannel& c) { c.resetToDefault(false); }, data},
        {"unlock", [](KFChannel& c) { c.lock(false, false); }, twice},
        {"constant", [](KFChannel& c) { c.setIsSpline(false); }, {}},
        {"as a component", [](KFChannel& c) { c.parentWillBeModified(kModifyData); }, {state[1]}},
    };
    for (auto const& [name, edit, expected] : cases) {
        edit(component);
        EXPECT_EQ(tree.root.takeAnnounced(), expected) << name;
    }
    KFChannelImpl const* const record = tree.single.getImpl();
    tree.single.setValue(s(5), 5e-8, false);
    EXPECT_EQ(tree.root.takeAnnounced(), (Announced{{&tree.single, kModifyState}}));
    EXPECT_EQ(tree.single.getImpl(), record) << "announced, and nothing to change";
}

TEST(KFChannelValue, IsKeyedWhileAnimatedAndAConstantOtherwise) {
    Tree tree;
    KFChannel& channel = tree.component;
    tree.root.addsKeypointAt0 = true;
    channel.setValue(s(6), 1.0, false);
    {
        Animating const animating;
        channel.setValue(s(6), 9.0, false);
        channel.setValue(s(8));
    }
    // The old value at the start of the extent, all at the object's own time.
    EXPECT_EQ(channel.getNumberOfKeyframes(), 3U);
    for (auto const& [local, value] : {std::pair{1, 1.0}, std::pair{4, 9.0}, std::pair{6, 9.0}}) {
        EXPECT_TRUE(channel.hasKeypointAt(s(local + 2), 0)) << local;
        EXPECT_DOUBLE_EQ(channel.getCurveValue(s(local), true), value);
    }
    Tempus t = s(0);
    EXPECT_TRUE(channel.nextKeypoint(&t, 0));
    EXPECT_EQ(t, s(3));
    EXPECT_EQ(channel.moveKeypointTo(s(6), s(7), false, false), s(7));
    EXPECT_EQ(channel.moveKeypointTo(s(6), s(5), false, false), s(5)) << "none there";
    EXPECT_TRUE(channel.moveValue(s(7), s(6), true));
    EXPECT_TRUE(channel.removeValue(s(6), true));
    channel.lock(true, false);
    EXPECT_EQ(channel.moveKeypointTo(s(8), s(9), false, false), s(8));
    channel.deleteKeypoints(s(0), s(9));
    EXPECT_EQ(channel.getNumberOfKeyframes(), 2U);
    channel.lock(false, false);
    channel.removeAllValues(s(8), true);
    EXPECT_FALSE(channel.hasKeypoints(0));
}

TEST(KFChannelValue, KeepsItsLimitsAndUnitWhenItTakesAnother) {
    KFChannelDouble source(0.5, "", nullptr, 1, 0);
    source.setScale(100.0);
    source.addKeypointAt(s(1));
    KFChannelDouble target("", nullptr, 2, 0);
    target.setValue(source);
    EXPECT_DOUBLE_EQ(target.getValueAsDouble(s(1), 0.0), 50.0);
    target.setMax(40.0);
    EXPECT_EQ(target.getSliderMax(), 40.0);
    EXPECT_FALSE(target.allowsAssignment(&source));
    target.setValue(source);
    EXPECT_EQ(target.getMax(), 40.0);
    target.setMax(60.0);
    target.assign(&source);
    EXPECT_DOUBLE_EQ(target.getValueAsDouble(s(1), 0.0), 50.0);
    EXPECT_FALSE(KFChannelBool("", nullptr, 1, 0).allowsAssignment(&source)) << "keypoints";

    target.setMin(-5.0);
    EXPECT_EQ(target.getSliderMin(), 0.0);
    target.setMin(5.0);
    EXPECT_EQ(target.getSliderMin(), 5.0);
    target.setDefaultValue(5.0);
    EXPECT_FALSE(target.testFlag(kChannelFlagSaveWhenAtDefault));
    target.finishInitializing();
    target.setDefaultValue(6.0);
    EXPECT_TRUE(target.testFlag(kChannelFlagSaveWhenAtDefault));
}

TEST(KFChannelFades, StayWithinTheExtent) {
    RecordingRoot root;
    root.frameDuration = s(1);
    root.setTimeExtent({s(0), s(10)}, true);
    KFChannelDouble channel("", &root, 1, 0);
    channel.setFadeOutOffset(s(20), true);
    EXPECT_EQ(channel.getFadeOutOffset(), s(9));
    channel.setFadeOutOffset(s(3), true);
    channel.setFadeInOffset(s(8), true);
    EXPECT_EQ(channel.getFadeInOffset(), s(6));
    channel.setFadeOutOffset(s(5), true);
    EXPECT_EQ(channel.getFadeOutOffset(), s(3));
    channel.setFadeInOffset(s(8), false);
    channel.scaleFadeHandles(0.5);
    EXPECT_EQ(channel.getFadeInOffset(), s(4));
    channel.setFadeOutOffset(kTempusZero, false);
    EXPECT_TRUE(channel.isModified(false));
    channel.setFadeInOffset(s(-1), false);
    EXPECT_FALSE(channel.hasFadeHandles());
}

TEST(KFChannelFades, ScaleTheValueAtTheEndsOfTheExtent) {
    RecordingRoot root;
    root.frameDuration = s(1);
    root.setTimeExtent({s(1), s(10)}, true); // frames at 1 .. 10
    root.setTimeOffset(s(5), true);          // which the fade ratio, in local time, sees at -4 .. 5
    KFChannelDouble channel(2.0, "", &root, 1, 0);
    double const half = std::sqrt(0.5);
    std::pair<unsigned, double> const shapes[] = {{0, 0.5}, {1, half}, {2, 1.0 - half}, {3, 0.5}, {7, 0.5}};
    for (auto const& [shape, middle] : shapes) {
        channel.setFadeInOffset(s(2), true);
        channel.setFadeOutOffset(s(4), true);
        channel.setFadeInCurve(shape);
        channel.setFadeOutCurve(shape);
        std::pair<std::int64_t, double> const times[] = {{-3, 0.0}, {1, 0.0},    {2, middle}, {3, 1.0},
                                                         {6, 1.0},  {8, middle}, {10, 0.0},   {12, 0.0}};
        for (auto const& [global, ratio] : times) {
            EXPECT_NEAR(channel.getValueAsDouble(s(global), 0.0), 2.0 * ratio, 1e-12)
                << shape << " " << global;
        }
    }
    channel.setFlag(kChannelFlagFadesOff, true);
    EXPECT_EQ(channel.getValueAsDouble(s(1), 0.0), 2.0);
    channel.setFadeInOffset(s(20), false); // over the fade out, where it wins
    channel.setFadeInCurve(0);
    EXPECT_NEAR(channel.getFadeRatio(s(4)), 8.0 / 20.0, 1e-12);
    LinearConverter converter(s(1), s(1));
    channel.setTimeConverterDelegate(&converter); // with the extent in local time
    EXPECT_NEAR(channel.getFadeRatio(s(4)), 3.0 / 20.0, 1e-12);
    root.removeDescendant(&channel);
    EXPECT_EQ(channel.getFadeRatio(s(4)), 1.0);
}

} // namespace
