// What a document does to the tree that reads it: what comes in, what stays, what is passed over.

#include "lumenkey/Channels/KFChannelFactoryTable.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/Channels/KFFactory.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/foundation/BXURL.h"
#include "lumenkey/foundation/BXXMLReadStream.h"
#include "lumenkey/persistence/ChannelParser.h"
#include "tests/Channels/Keypoints.h"
#include "tests/persistence/Victim.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace {

/// Around what stands in its node. Nobody knows class 3.
std::string documentWith(std::string const& body, std::string const& attributes = "") {
    return kDocumentFactories +
           "<factory id='3' uuid='00000000-0000-0000-0000-000000000001'/>"
           "<parameter name='Other' id='7' factoryID='2' " +
           attributes + ">" + body + kDocumentTail;
}

/// A host's class, which reading must not replace.
struct HostChannel : KFChannelDouble {
    using KFChannelDouble::KFChannelDouble;
};

struct Reading : testing::Test {
    OwnedTree top{new KFChannelFolder("Top", nullptr, 5, 0, 0)};
    KFChannelFolder& folder() { return *top; }
    KFChannel& child(unsigned id) { return dynamic_cast<KFChannel&>(*top->getDescendant(id)); }
    void read(std::string const& body, std::string const& attributes = "") {
        EXPECT_TRUE(readDocument(folder(), documentWith(body, attributes)));
    }
};

std::string curve(std::string const& keypoints, std::string const& attributes = "type='1'") {
    return "<parameter id='1' name='C' factoryID='2'><curve " + attributes + ">" + keypoints +
           "</curve></parameter>";
}

std::string keypoints(std::string const& number, std::string const& elements) {
    return "<numberOfKeypoints>" + number + "</numberOfKeypoints>" + elements;
}

/// The output of a keypoint by its number, as it is stored.
Handle out(KFChannel& channel, std::size_t i) {
    return output(channel, channel.getKeyframes(false).at(i), false);
}

} // namespace

TEST_F(Reading, FindsOrMakesChildren) {
    auto* const host = new HostChannel(0.0, "Mine", &folder(), 1, 0);
    host->setFlag(kChannelFlagHostOption11 | kChannelFlagSoloable, true);
    host->resetFlag(kChannelFlagHostOption4, true);
    new KFChannelDouble(4.0, "NotMentioned", &folder(), 9, 0);
    read("<parameter id='1' name='Theirs' factoryID='1' flags='18446744073709551615' default='2' value='3'/>"
         "<parameter id='2' name='New' factoryID='2' value='8'/>"
         "<parameter id='3' name='Unknown' factoryID='3'><parameter id='1' factoryID='2'/></parameter>"
         "<parameter id='4' name='None'><unknown><parameter id='6' factoryID='2'/></unknown></parameter>"
         "<unknown><parameter id='6' factoryID='2'/></unknown>"
         "<parameter id='2' value='9'/>",
         "flags='0'");
    EXPECT_EQ(folder().getDescendant(1), host);
    EXPECT_EQ(host->getName().str(), "Mine");
    EXPECT_EQ(host->getInitialValue(), 3);
    EXPECT_EQ(host->getDefaultValue(), 2);
    EXPECT_EQ(host->getFlags(), (~KFChannelFlags{0} & ~kChannelParsePreservedFlags) |
                                    kChannelFlagHostOption11 | kChannelFlagSoloable);
    EXPECT_EQ(folder().getNumberOfDescendants(), 3U);
    EXPECT_EQ(child(2).getName().str(), "New");
    EXPECT_EQ(child(2).getInitialValue(), 9) << "the second element of that ID finds the first";
    EXPECT_EQ(child(9).getInitialValue(), 4);
    EXPECT_EQ(folder().getID(), 7U);
    EXPECT_EQ(folder().getName().str(), "Top");
}

TEST_F(Reading, TakesKeypointsAsTheyStand) {
    auto const handle = [](std::string const& time, std::string const& value) {
        return "<outputTangentTime>" + time + "</outputTangentTime><outputTangentValue>" + value +
               "</outputTangentValue>";
    };
    std::string const disabled = "enabled='0' interpolation='1'";
    read(curve(keypoints("4294967295", keypointElement("2/1", "1", handle("12", "24"), "flags='34'") +
                                           keypointElement("1/1", "5", "", disabled) +
                                           keypointElement("3/1", "6", handle("0", "0"), disabled))));
    EXPECT_EQ(timesOf(child(1)), (std::vector{TempusMake(2, 1), TempusMake(1, 1), TempusMake(3, 1)}));
    auto const keys = child(1).getKeyframes(false);
    ASSERT_EQ(keys.size(), 3U);
    EXPECT_EQ(child(1).getKeyframeFlags(keys[0]) & 0x22, 2U)
        << "without the obsolete bit; set behind all else, or the handle would be refused";
    EXPECT_EQ(out(child(1), 0), Handle(1.0, 2.0));
    EXPECT_EQ(child(1).getKeyframeInterpolation(keys[0]), 4U);
    EXPECT_TRUE(child(1).getKeyframeEnabled(keys[1])) << "without output handle";
    EXPECT_FALSE(child(1).getKeyframeEnabled(keys[2]));

    // Once more, with two lists: the second clears the first.
    read(curve(keypoints("1", keypointElement("1/1", "5")) + keypoints("1", keypointElement("4/1", "7"))));
    EXPECT_EQ(timesOf(child(1)), std::vector{TempusMake(4, 1)});

    // Where tangents don't count, only one type takes handles.
    child(1).getCurveInterface()->setCurveDeriveTangents(false);
    read(curve(keypoints("2", keypointElement("1/1", "5", handle("12", "24"), "interpolation='18'") +
                                  keypointElement("2/1", "5", handle("12", "24")))));
    ASSERT_EQ(child(1).getNumberOfKeyframes(), 2U);
    EXPECT_EQ(out(child(1), 0), Handle(1.0, 2.0));
    EXPECT_EQ(out(child(1), 1), Handle());
}

TEST_F(Reading, TakesAConstantAsItIs) {
    read(curve("", "type='0' value='3' default='4'"));
    EXPECT_FALSE(child(1).isSpline());
    EXPECT_EQ(child(1).getInitialValue(), 3);
    EXPECT_EQ(child(1).getDefaultValue(), 4);
    EXPECT_EQ(child(1).getCurveInterface()->getSpline(), nullptr);
    // What can't be read leaves things as they are.
    read(curve("<min>low</min><preExtrapolation>-1</preExtrapolation>", "type='0' value='x' default=''"));
    EXPECT_EQ(child(1).getInitialValue(), 3);
    EXPECT_EQ(child(1).getDefaultValue(), 4);
}

TEST_F(Reading, IsNotStoppedByALock) {
    read("<parameter id='1' name='C' factoryID='2'><flags>4</flags>"
         "<fadeInOffset>3/1</fadeInOffset><fadeOutOffset>-3/1</fadeOutOffset>"
         "<fadeInCurve>3</fadeInCurve><fadeOutCurve>4</fadeOutCurve></parameter>");
    EXPECT_TRUE(child(1).isLocked(false));
    EXPECT_EQ(child(1).getFlags(), kChannelFlagLocked) << "this form replaces the whole word";
    EXPECT_EQ(child(1).getFadeInOffset(), TempusMake(3, 1));
    EXPECT_EQ(child(1).getFadeOutOffset(), kTempusZero);
    EXPECT_EQ(child(1).getFadeInCurve(), 3U);
    EXPECT_EQ(child(1).getFadeOutCurve(), 0U);
    // A document without fades takes them away, and gives the channel back to its class's record.
    read("<parameter id='1'/>");
    EXPECT_FALSE(child(1).hasFadeHandles());
    EXPECT_TRUE(child(1).getImpl()->isShared());
}

TEST_F(Reading, KeepsAWritersFolderOutOfAValue) {
    auto* const mine = new KFChannelDouble(4.0, "Mine", &folder(), 1, 0);
    KFChannelFlags const flags = mine->getFlags();
    read("<parameter id='1'><parameter id='1' factoryID='2'><flags>4</flags><fadeInOffset>3/1</fadeInOffset>"
         "<curve type='1' value='9'>" +
         keypoints("1", keypointElement("0/1", "9")) +
         "</curve></parameter><fadeOutOffset>3/1</fadeOutOffset></parameter>");
    EXPECT_EQ(mine->getFlags(), flags);
    EXPECT_EQ(mine->getInitialValue(), 4);
    EXPECT_EQ(mine->getNumberOfKeyframes(), 0U);
    EXPECT_EQ(mine->getFadeInOffset(), kTempusZero);
    EXPECT_EQ(mine->getFadeOutOffset(), TempusMake(3, 1)) << "what follows is its own again";
}

namespace {

/// A host's own class of channels, made in the one way that a factory has to know.
struct HostFactory : KFChannelFactory {
    HostFactory() : KFChannelFactory({{1, 2, 3, 6}}, KFChannelFactoryUUID("KFChannelDouble"), 1) {}
    KFFactoryBase* create(BXString const& name, unsigned int id) override {
        return new HostChannel(this, name, id, nullptr, nullptr);
    }
};

struct HostRoot : KFChannelObjectRootBase {
    using KFChannelObjectRootBase::KFChannelObjectRootBase;
    void willModifyChannel(KFChannelBase* channel, unsigned int kind) override {
        announced += channel->getName().str() + (kind == kModifyData ? " data, " : " state, ");
    }
    std::string announced;
};

} // namespace

TEST(ReadingOfHosts, MakesTheirClassesAndTellsThem) {
    static HostFactory factory;
    KFFactories::getInstance().addFactory(&factory);
    OwnedTree const top(new HostRoot("Root", nullptr, 1, 0, 0));
    ASSERT_TRUE(readDocument(
        *top, "<kfml version='5.13'><factory id='1' uuid='00000001-0000-0002-0000-000300000006'/>"
              "<factory uuid='FDC1944B-2291-11D7-B1C3-00039389B702'/>"
              "<parameter><parameter id='1' name='Host' factoryID='1' value='3'>"
              "<fadeInOffset>1/1</fadeInOffset><fadeInCurve>2</fadeInCurve></parameter>"
              "<parameter id='2' factoryID='0'/></parameter></kfml>"));
    EXPECT_NE(dynamic_cast<HostChannel*>(top->getDescendant(1)), nullptr);
    EXPECT_EQ(top->getDescendant(2), nullptr) << "0 is no factory";
    EXPECT_EQ(static_cast<HostRoot&>(*top).announced, "Root data, Host data, Host data, Host data, ");
}

TEST_F(Reading, KeepsWhatStandsInDataOutOfTheFolder) {
    // A class of data without numbers that is not the library's own.
    struct DataFactory : KFChannelFactory {
        DataFactory() : KFChannelFactory(KFChannelFactoryUUID("KFChannelBlindData"), {}, 1) {}
    } factory;
    auto* const data = new HostChannel(&factory, "Data", 1, nullptr, nullptr);
    folder().push_back(data);
    KFChannelFlags const flags = folder().getFlags();
    read("<parameter id='1' value='5'><flags>2</flags><foldFlags>16</foldFlags>"
         "<parameter id='2' factoryID='2'/></parameter>");
    EXPECT_EQ(folder().getFlags(), flags);
    EXPECT_EQ(folder().getNumberOfDescendants(), 1U);
    EXPECT_EQ(data->getInitialValue(), 0);
}

TEST_F(Reading, LocksARootBehindItsChildren) {
    OwnedTree const root(new KFChannelObjectRootBase("Root", nullptr, 1, 0, 0));
    root->setFlags(0);
    ASSERT_TRUE(readDocument(
        *root, documentWith("<timing in='1/1' out='2/1' offset='3/1'/><baseFlags>4294967295</baseFlags>"
                            "<enabled>0</enabled><locked>1</locked><foldFlags>131072</foldFlags>"
                            "<parameter id='1' name='C' factoryID='2' value='3'/>")));
    auto& read = static_cast<KFChannelObjectRootBase&>(*root);
    EXPECT_TRUE(root->isLocked(false));
    EXPECT_TRUE(root->getDescendant(1)->isLocked(false));
    EXPECT_FALSE(root->isEnabled(false, false));
    EXPECT_EQ(root->getFoldFlags(), 131072U) << "a root takes the class's bits too";
    EXPECT_EQ(root->getFlags() >> 32, 0U);
    EXPECT_TRUE(root->testFlag(kChannelFlagIsObjectRoot)) << "whatever its flags were";
    EXPECT_EQ(read.getTimeExtent().start, TempusMake(1, 1));
    EXPECT_EQ(read.getTimeExtent().duration, TempusMake(31, 30)) << "the last frame is one more";
    EXPECT_EQ(read.getTimeOffset(), TempusMake(3, 1));
}

TEST_F(Reading, FindsTheVersionBehindSpaces) {
    struct {
        char const* text;
        std::uint32_t major;
        std::uint32_t minor;
    } const rows[] = {{"4.2", 4, 2},   {" 4.0", 4, 0},  {"4.&#9;7b", 4, 7}, {"+4.+1", 4, 1}, {"4", 4, 13},
                      {"4 .2", 4, 13}, {"x4.2", 5, 13}, {".2", 5, 13},      {"", 5, 13}};
    for (auto const& row : rows) {
        std::string const text = "<kfml version='" + std::string(row.text) + "'/>";
        BXData const document(text.begin(), text.end());
        BXXMLReadStream stream(document);
        ChannelParser parser(&folder());
        stream.pushHandler(&parser);
        EXPECT_TRUE(stream.parse());
        EXPECT_EQ(std::pair(stream.major, stream.minor), std::pair(row.major, row.minor)) << row.text;
    }
}

TEST_F(Reading, GivesFailureForWhatIsNoDocumentOfAChannel) {
    EXPECT_FALSE(readDocument(folder(), "<kfml version=\"5.13\"/>"));
    EXPECT_FALSE(readDocument(folder(), ""));
    std::string const document = documentWith("");
    EXPECT_FALSE(readDocument(folder(), document.substr(0, document.size() - 1)));
    EXPECT_TRUE(readDocument(folder(), document));
    EXPECT_FALSE(folder().configureWithURL(BXURL("/no/such/file")));
}

namespace {

std::string pathOfData(std::string const& name) { return std::string(LUMENKEY_TEST_DATA_DIR) + "/" + name; }

/// As a host reads that knows how long frames are. The version that was found; 0 for a refusal.
std::uint32_t readFile(std::string const& name, KFChannelBase& top, Tempus const& frame) {
    BXURL const url(BXString{pathOfData(name)});
    BXXMLReadStream stream(url);
    stream.frameDuration = frame;
    stream.frameSeconds = TempusGetSeconds(frame);
    stream.useStreamFrameDuration = true;
    KFFactories::getInstance().clearFactoryLoadIDs();
    ChannelParser parser(&top);
    stream.pushHandler(&parser);
    return stream.parse() && parser.hasFoundChannel() ? stream.major : 0;
}

} // namespace

/// Documents of earlier versions stay readable for ever.
struct OldDocuments : testing::Test {
    OwnedTree top{new KFChannelObjectRootBase("Root", nullptr, 1, 0, 0)};
    KFChannelObjectRootBase& root = static_cast<KFChannelObjectRootBase&>(*top);
    KFChannel& child(unsigned id) { return dynamic_cast<KFChannel&>(*top->getDescendant(id)); }

    void expectTiming(Tempus const& frame) {
        EXPECT_EQ(root.getTimeExtent().start, frame * 10);
        EXPECT_EQ(root.getTimeExtent().duration, frame * 91);
        EXPECT_EQ(root.getTimeOffset(), frame * 30);
    }
};

TEST_F(OldDocuments, CountFrames) {
    Tempus const frame = TempusMake(1001, 30000);
    for (std::uint32_t version = 2; version < 5; ++version) {
        SCOPED_TRACE(version);
        EXPECT_EQ(readFile("version" + std::to_string(version) + ".lumen", root, frame), version);
        expectTiming(frame);
        ASSERT_EQ(child(1).getNumberOfKeyframes(), 2U);
        EXPECT_EQ(timesOf(child(1))[1], frame * 30);
        EXPECT_NEAR(out(child(1), 0).first, 10 * 1001.0 / 30000.0 / 12, 1e-15);
        EXPECT_NEAR(out(child(1), 0).second, 0.25, 1e-15);
    }
}

TEST_F(OldDocuments, HaveTimesFromVersion5On) {
    // Inside a host's document nodes name no class: the host has made them.
    for (char const* const file : {"version5.lumen", "version5-inside.lumen"}) {
        SCOPED_TRACE(file);
        Tempus const frame = TempusMake(1, 24);
        EXPECT_EQ(readFile(file, root, frame), 5U);
        EXPECT_EQ(root.getID(), 12U);
        expectTiming(frame);
        KFChannel& opacity = child(1);
        ASSERT_EQ(opacity.getNumberOfKeyframes(), 2U);
        EXPECT_EQ(timesOf(opacity)[1], frame * 30);
        EXPECT_EQ(out(opacity, 0), Handle(0.5, 0.25));
        EXPECT_EQ(opacity.getInitialValue(), 0.5);
        EXPECT_EQ(opacity.getFadeInOffset(), TempusMake(1, 2));
        EXPECT_EQ(opacity.getFadeInCurve(), 2U);
        KFChannel& amount = child(2);
        EXPECT_EQ(amount.getInitialValue(), 4);
        EXPECT_EQ(amount.getDefaultValue(), 3);
        EXPECT_TRUE(amount.testFlag(kChannelFlagHidden));

        root.setID(1);
        root.setTimeExtent({}, true);
        EXPECT_TRUE(root.configureWithURL(BXURL(BXString{pathOfData(file)})));
        EXPECT_EQ(root.getID(), 1U) << "of a file only the contents count";
        EXPECT_EQ(root.getTimeExtent().duration, TempusMake(90, 24) + TempusMake(1, 30)) << "its own frame";
        amount.setInitialValue(0, true);
        opacity.setFadeInCurve(0);
    }
}

TEST_F(OldDocuments, MayBeOdd) {
    EXPECT_EQ(readFile("odd.lumen", root, TempusMake(1, 24)), 5U) << "without a version, today's";
    EXPECT_EQ(root.getID(), 12U);
    ASSERT_EQ(root.getNumberOfDescendants(), 2U);
    // The time of the first comes behind its value, too late, and its handle too early.
    ASSERT_EQ(timesOf(child(1)), (std::vector{kTempusZero, TempusMake(1, 1)}));
    EXPECT_EQ(out(child(1), 0), Handle());
    KFChannel& constant = child(2);
    EXPECT_FALSE(constant.isSpline()) << "without a type";
    EXPECT_EQ(constant.getInitialValue(), 7);
    EXPECT_EQ(constant.getDefaultValue(), 8);
}

TEST(Documents, KeepEveryFrameOfTenHours) {
    for (auto const& [value, timescale] : {std::pair{1001, 24000}, {1001, 30000}, {1001, 60000}}) {
        KFChannelDouble channel(0.0, "V", nullptr, 1, 0);
        std::vector<Tempus> times;
        std::vector<double> values;
        std::int64_t const stride = std::getenv("LUMENKEY_TEST_LONG") != nullptr ? 1 : 97;
        for (std::int64_t frame = 0; frame * value < std::int64_t{36000} * timescale; frame += stride) {
            times.push_back(TempusMake(frame * value, timescale));
            values.push_back(static_cast<double>(frame));
        }
        channel.appendKeyframes(static_cast<unsigned>(times.size()), times.data(), values.data(), true);
        KFChannelDouble read(0.0, "V", nullptr, 1, 0);
        ASSERT_TRUE(readDocument(read, documentOf(channel)));
        ASSERT_EQ(read.getNumberOfKeyframes(), times.size());
        for (std::size_t i = 0; i < times.size(); ++i)
            ASSERT_EQ(read.getValueAsDouble(times[i], 0.0), values[i]);
    }
}
