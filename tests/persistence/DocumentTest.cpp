// What documents look like, to the letter.

#include "lumenkey/Channels/KFChannelFactoryTable.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFFactory.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/Channels/KFVectorChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/foundation/BXHashWriteStream.h"
#include "lumenkey/foundation/BXStream.h"
#include "lumenkey/foundation/BXXMLWriteStream.h"
#include "tests/persistence/RandomTree.h"

#include <gtest/gtest.h>

#include <functional>
#include <limits>
#include <regex>
#include <thread>

namespace {

Tempus s(double t) { return KFChronoForChannelSeconds(t, 600); }

/// The text of each description replaced by three dots.
std::string withoutDescriptions(std::string const& document) {
    return std::regex_replace(document, std::regex("<description>[^<]*</description>"),
                              "<description>...</description>");
}

/// As a host writes a node into a document of its own.
std::string inHostsDocument(KFChannelBase& channel, bool full, bool children, bool all) {
    BXBufferWriteStream buffer(1024, 1024);
    BXXMLWriteStream stream(buffer, 5, 13);
    channel.writeHeader(stream, full);
    channel.writeBody(stream, full, children, all);
    stream.endElement();
    stream.close();
    BXData const data = buffer.copyData();
    std::string const text(data.begin(), data.end());
    std::size_t const start = text.find("  <parameter");
    std::size_t const end = text.rfind("</kfml>");
    return start == std::string::npos ? text : text.substr(start, end - start);
}

} // namespace

TEST(Document, StandsAlone) {
    KFChannelFolder folder("Group", nullptr, 7, 0, 0);
    KFChannelDouble size(0.0, "Size", &folder, 1, 0);
    KFChannelDouble blur(0.0, "Blur", &folder, 2, 0);
    for (double const t : {0.0, 1.0}) {
        blur.setKeyframe(s(t), 10 * t, false);
        blur.setKeyframeInterpolation(blur.getKeyframe(s(t)), kKFInterpolationBezier);
    }
    folder.finishInitializing();
    EXPECT_EQ(withoutDescriptions(documentOf(folder)),
              R"(<?xml version="1.0" encoding="UTF-8"?>
<kfml version="5.13">
  <factory id="1" uuid="E7BF3809-2290-11D7-98E5-00039389B702">
    <description>...</description>
    <manufacturer>Arbor</manufacturer>
    <version>1</version>
  </factory>
  <factory id="2" uuid="FDC1944B-2291-11D7-B1C3-00039389B702">
    <description>...</description>
    <manufacturer>Arbor</manufacturer>
    <version>1</version>
  </factory>
  <parameter name="Group" id="7" factoryID="1">
    <flags>8589938704</flags>
    <parameter name="Size" id="1" factoryID="2">
      <flags>8589934608</flags>
      <curve type="1" default="0" value="0"/>
    </parameter>
    <parameter name="Blur" id="2" factoryID="2">
      <flags>8589934608</flags>
      <curve type="1" default="0" value="0">
        <numberOfKeypoints>2</numberOfKeypoints>
        <keypoint flags="0">
          <time>0/600</time>
          <value>0</value>
        </keypoint>
        <keypoint flags="0">
          <time>600/600</time>
          <value>10</value>
        </keypoint>
      </curve>
    </parameter>
  </parameter>
</kfml>
)");
    std::string const self = documentOf(folder, false, false);
    EXPECT_EQ(self.find("Size"), std::string::npos);
    EXPECT_NE(self.find("<flags>8589938704</flags>"), std::string::npos);
}

TEST(Document, IsNoDeeperThanDocumentsAreRead) {
    for (int const depth : {988, 989}) {
        OwnedTree const top(new KFChannelFolder("Top", nullptr, 9, 0, 0));
        KFChannelFolder* last = top.get();
        for (int i = 0; i < depth; ++i)
            last = new KFChannelFolder("Deep", last, 9, 0, 0);
        OwnedTree const read(new KFChannelFolder("Top", nullptr, 9, 0, 0));
        EXPECT_TRUE(readDocument(*read, documentOf(*top)));
        int found = 0;
        for (auto const* folder = read.get(); folder->getNumberOfDescendants() != 0; ++found)
            folder = static_cast<KFChannelFolder const*>((*folder->getDescendants())[0]);
        EXPECT_EQ(found, 988);
    }
}

TEST(Document, KeepsWhatCompoundsHaveBesideTheirParts) {
    OwnedTree const top(new KFChannelFolder("Top", nullptr, 9, 0, 0));
    auto* const place = new KFChannel2D("Place", top.get(), 1, 0);
    KFChannelPercent more(0.5, "More", nullptr, 7, 0);
    place->insertDescendantBefore((*place->getDescendants())[0], &more);
    BXData const state = top->createChannelState(true, true);
    OwnedTree const read(new KFChannelFolder("Top", nullptr, 9, 0, 0));
    ASSERT_TRUE(read->configureWithState(state));
    auto const* const placeRead = static_cast<KFChannelFolder*>(read->getDescendant(1));
    std::unique_ptr<KFChannelBase> const moreRead(placeRead->getDescendant(7));
    ASSERT_EQ(placeRead->getNumberOfDescendants(), 3U);
    EXPECT_EQ(static_cast<KFChannel*>(moreRead.get())->getInitialValue(), 0.5);
    // No class is told that makes only what its compound makes.
    EXPECT_EQ(documentOf(*top).find("FDC1944B-2291-11D7-B1C3-00039389B702"), std::string::npos);
}

TEST(Document, WritesOfAChannelWhatIsNotAsUsual) {
    struct Case {
        std::string expected;
        std::function<void(KFChannelDouble&, KFCurve&)> change;
    };
    std::string const head = "  <parameter name=\"V\" id=\"1\" flags=\"16\"";
    // The handle of a keypoint of this type.
    auto const bend = [](KFCurve& curve, unsigned type, bool derives) {
        curve.appendKeypointNoTangents(s(1), 2.0, true);
        void* const handle = curve.getSpline()->getLastVertex();
        curve.setKeypointInterpolation(handle, type, true);
        curve.setKeypointOutputNormalizedTangents(handle, 0, 0.5, true);
        curve.setKeypointBiasLinear(handle, 1.0000000001);
        curve.setCurveDeriveTangents(derives);
    };
    auto const keyed = [](std::string const& type, std::string const& handle) {
        return R"(>
    <curve type="1" default="0" value="0">
      <numberOfKeypoints>1</numberOfKeypoints>
      <keypoint)" +
               type + R"( flags="128">
        <time>600/600</time>
        <value>2</value>
)" + handle + R"(      </keypoint>
    </curve>
  </parameter>
)";
    };
    std::string const outputHandle = "        <outputTangentTime>0</outputTangentTime>\n"
                                     "        <outputTangentValue>6</outputTangentValue>\n";
    Case const cases[] = {
        {" default=\"1\" value=\"2\"/>\n",
         [](auto&, KFCurve& curve) {
             curve.setCurveDefaultValue(1);
             curve.setCurveInitialValue(2);
         }},
        // A fade without a length is no reason for a curve, but its shape is kept.
        {" default=\"0\" value=\"0\">\n    <fadeInCurve>2</fadeInCurve>\n  </parameter>\n",
         [](KFChannelDouble& channel, auto&) { channel.setFadeInCurve(2); }},
        // So are limits that have crossed.
        {">\n    <fadeOutOffset>1200/600</fadeOutOffset>\n    <curve type=\"1\" default=\"0\" "
         "value=\"inf\">\n"
         "      <min>5</min>\n      <max>3</max>\n    </curve>\n  </parameter>\n",
         [](KFChannelDouble& channel, KFCurve& curve) {
             channel.setFadeOutOffset(s(2), false);
             curve.setCurveInitialValue(std::numeric_limits<double>::infinity());
             curve.setAbsoluteMinValueV(5);
             curve.setAbsoluteMaxValueV(3);
         }},
        {R"(>
    <curve type="1" default="0" value="0" parametric="1" round="0" retimingExtrapolation="1">
      <numberOfKeypoints>1</numberOfKeypoints>
      <min>-5</min>
      <max>5</max>
      <preExtrapolation>3</preExtrapolation>
      <postExtrapolation>2</postExtrapolation>
      <closed>1</closed>
      <keypoint interpolation="1" enabled="0" flags="17">
        <time>600/600</time>
        <value>2</value>
        <bias>0.5</bias>
        <normal>3</normal>
      </keypoint>
    </curve>
  </parameter>
)",
         [](auto&, KFCurve& curve) {
             curve.appendKeypointNoTangents(s(1), 2.0, true);
             void* const handle = curve.getSpline()->getLastVertex();
             curve.setKeypointInterpolation(handle, 1, true);
             curve.setKeypointBiasLinear(handle, 0.5);
             curve.setKeypointNormal(handle, 3, true);
             curve.setKeypointFlags(handle, 17, true);
             curve.enableKeypoint(handle, false, true);
             curve.closeCurve();
             curve.setCurveParametric(true);
             curve.setRoundingInUSpace(false);
             curve.setRetimingExtrapolation(true);
             curve.setAbsoluteMinValueV(-5);
             curve.setAbsoluteMaxValueV(5);
             curve.setCurveExtrapolation(3, 1);
             curve.setCurveExtrapolation(2, 0);
         }},
        // Nothing of keypoints that aren't seen, nor that they are closed.
        {R"(>
    <fadeOutOffset>1200/600</fadeOutOffset>
    <curve type="0" default="0" value="2"/>
  </parameter>
)",
         [](KFChannelDouble& channel, KFCurve& curve) {
             channel.setFadeOutOffset(s(2), false);
             curve.appendKeypointNoTangents(s(1), 2.0, true);
             curve.closeCurve();
             curve.setCurveType(0);
         }},
        // Handles are twelve times what is stored; both parts of one, and only where tangents count.
        {keyed("", outputHandle), [&](auto&, KFCurve& curve) { bend(curve, 4, true); }},
        {keyed("", ""), [&](auto&, KFCurve& curve) { bend(curve, 4, false); }},
        {keyed(" interpolation=\"18\"", outputHandle),
         [&](auto&, KFCurve& curve) { bend(curve, 18, false); }},
        // The value isn't what the limits let be seen of it.
        {" default=\"0\" value=\"500\"/>\n",
         [](auto&, KFCurve& curve) {
             curve.setCurveInitialValue(500);
             curve.setAbsoluteMaxValueV(100);
         }},
    };
    for (Case const& c : cases) {
        KFChannelDouble channel(0.0, "V", nullptr, 1, 0);
        c.change(channel, *channel.createLocalChannelImplementation()->getCurve());
        EXPECT_EQ(inHostsDocument(channel, false, true, true), head + c.expected);
    }
}

TEST(Document, LeavesOutWhatNobodyChanged) {
    KFChannelFolder folder("Folder", nullptr, 1, 0, 0);
    KFChannelDouble plain(0.0, "Plain", &folder, 1, 0);
    KFChannelDouble kept(0.0, "Kept", &folder, 2, 0);
    KFChannelDouble notSaved(0.0, "NotSaved", &folder, 3, kChannelFlagNotSaved);
    KFChannelDouble disabled(0.0, "Disabled", &folder, 4, 0);
    KFChannel3D linked("Linked", &folder, 5, 0);
    for (KFChannelBase* const node : *folder.getDescendants())
        node->saveStateAsDefault();
    kept.setFlag(kChannelFlagSaveWhenAtDefault, true);
    kept.saveStateAsDefault();
    notSaved.setInitialValue(5, true);
    notSaved.setFlag(kChannelFlagSaveWhenAtDefault, true); // counts in a digest only
    disabled.enable(false, true);
    std::string const text = inHostsDocument(folder, false, true, false);
    for (auto const& [name, is] : {std::pair{"Plain", false},
                                   {"Kept", true},
                                   {"NotSaved", false},
                                   {"Disabled", true},
                                   {"Linked", false}})
        EXPECT_EQ(text.find(name) != std::string::npos, is) << text;
    std::string const all = inHostsDocument(folder, false, true, true);
    EXPECT_NE(all.find("Plain"), std::string::npos);
    EXPECT_EQ(all.find("NotSaved"), std::string::npos);
    folder.setFoldFlag(kFoldFlagChildrenNotSaved);
    std::string const alone = inHostsDocument(folder, false, true, true);
    EXPECT_EQ(alone.find("Plain"), std::string::npos);
    EXPECT_NE(alone.find("<foldFlags>16777216</foldFlags>"), std::string::npos);
}

TEST(Document, TellsOfARootItself) {
    KFChannelObjectRootBase root("Root", nullptr, 1, 0, 0);
    KFChannelDouble value(0.0, "Value", &root, 1, 0);
    root.setTimeExtent({s(1), s(2)}, true);
    root.setTimeOffset(s(3), true);
    root.setFoldFlags(0x11);
    root.setFlags(root.getFlags() | kChannelFlagHidden | kChannelFlagSaveWhenAtDefault | kChannelFlagSolo);
    root.lock(true, false);
    auto const write = [&](BXSerializerWriteStream& stream) { root.serializeSelfOnly(stream, true, true); };
    auto const text = [&] {
        BXBufferWriteStream buffer(1024, 1024);
        BXXMLWriteStream stream(buffer, 5, 13);
        write(stream);
        EXPECT_TRUE(stream.close());
        BXData const data = buffer.copyData();
        return std::string(data.begin(), data.end());
    };
    auto const digest = [&] {
        BXHashWriteStream stream;
        write(stream);
        return stream.getHash();
    };
    auto const before = digest();
    EXPECT_NE(text().find("  <timing in=\"600/600\" out=\"1780/600\" offset=\"1800/600\"/>\n"
                          "  <foldFlags>17</foldFlags>\n"
                          "  <baseFlags>262162</baseFlags>\n"
                          "  <locked>1</locked>\n"),
              std::string::npos)
        << text();
    root.setWritesTimeRange(false);
    EXPECT_NE(text().find("  <timing offset=\"1800/600\"/>\n"), std::string::npos) << text();
    EXPECT_NE(documentOf(root).find("    <timing offset=\"1800/600\"/>\n    <baseFlags>"), std::string::npos);
    root.setWritesTimeRange(true);
    root.resetFlag(kChannelFlagHidden, true);
    EXPECT_EQ(digest(), before) << "of the flags only the soloed one";
    root.resetFlag(kChannelFlagSolo, true);
    EXPECT_NE(digest(), before);
}

TEST(Document, MarksWhatAReaderCanNotMakeUp) {
    // In a thread of its own, which nothing has been marked in.
    std::thread([] {
        struct VaryingFactory : KFChannelFactory {
            VaryingFactory() : KFChannelFactory(KFChannelFactoryUUID("KFChannelVaryingFolder"), {}, 1) {}
        } varying;
        KFChannelObjectRootBase root("Root", nullptr, 1, 0, 0);
        KFChannelFolder plain("Plain", &root, 1, 0, 0);
        KFChannelBool on(false, "On", &plain, 1, 0);
        KFChannelFolder list(&varying, "List", &plain, 2, 0, 0);
        KFChannelDouble value(0.0, "Value", &list, 1, 0);
        KFChannelObjectRootBase inner("Inner", &root, 2, 0, 0);
        KFChannelFolder other(&varying, "Other", &inner, 1, 0, 0);
        KFChannelAngle angle(0.0, "Angle", &other, 1, 0);
        BXHashWriteStream stream;
        root.markChannelFactoriesForSerialization(stream);
        for (auto const& [channel, is] : {std::pair<KFChannelBase*, bool>{&root, false},
                                          {&plain, false},
                                          {&on, false},
                                          {&list, true},
                                          {&value, true},
                                          {&angle, false}})
            EXPECT_EQ(channel->getFactory()->needsSaving(), is) << channel->getName().str();
    }).join();
}
