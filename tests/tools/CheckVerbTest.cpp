// What `lumenkey check` finds in documents.

#include "tests/tools/DocumentSamples.h"
#include "tests/tools/MotionSamples.h"
#include "tests/tools/RunProgram.h"
#include "tests/tools/TestFolder.h"

#include <gtest/gtest.h>

namespace lumenkey::tools {
namespace {

using samples::documentOf;

class CheckVerbTest : public ::testing::Test {
protected:
    TestFolder const _folder;

    /// Without the file's name in front of each line.
    std::string findingsIn(std::string const& text) const {
        std::string const file = _folder.write("f.lumen", text);
        Outcome const outcome = runLumenkey({"check", file});
        EXPECT_EQ(outcome.exit, outcome.out.empty() ? 0 : 1);
        EXPECT_EQ(outcome.err, "");
        EXPECT_EQ(contentOf(file), text);
        std::string findings = outcome.out;
        for (std::size_t at = 0; (at = findings.find(file + ":")) != std::string::npos;) {
            findings.erase(at, file.size() + 1);
        }
        return findings;
    }
};

TEST_F(CheckVerbTest, FindsWhatIsOddWithItsPlace) {
    struct {
        char const* body;
        char const* findings;
    } const cases[] = {
        {"<parameter id=\"1\" factoryID=\"1\"/>", ""},
        {"<parameter id=\"1\" factoryID=\"1\">\n <shiny><curve/></shiny>\n</parameter>",
         "5:2: the element 'shiny' is unknown here: it is passed over\n"},
        {"<factory id=\"6\" uuid=\"00000000-0000-0000-0000-000000000001\"/>\n<parameter id=\"1\" "
         "factoryID=\"1\">\n"
         "<parameter name=\"P\" id=\"4\" factoryID=\"6\"><odd/></parameter></parameter>",
         "4:1: the class 00000000-0000-0000-0000-000000000001 is unknown: its channels are passed over\n"
         "6:1: the channel 'P' is of factory 6, which is unknown: it is passed over\n"},
        {"<parameter id=\"1\" factoryID=\"1\">\n<parameter id=\"4\" factoryID=\"9\"/>\n<parameter "
         "id=\"5\"/>\n"
         "<parameter name=\"Q\" id=\"4\" factoryID=\"2\"/></parameter>",
         "5:1: the channel '' is of factory 9, which isn't listed: it is passed over\n"
         "6:1: the channel '' names no class: it is passed over\n"},
        // Whatever class another one of the same ID names, or none.
        {"<parameter id=\"1\" factoryID=\"1\">\n<parameter id=\"4\" factoryID=\"2\"/>\n<parameter "
         "name=\"Q\" id=\"4\" factoryID=\"1\">\n<foldFlags>1</foldFlags></parameter>\n"
         "<parameter id=\"4\"/></parameter>",
         "6:1: the channel 'Q' has the ID 4 of one before it: it is read into that one\n"
         "7:1: the element 'foldFlags' is none of a channel of the class Percent: it is passed over\n"
         "8:1: the channel '' has the ID 4 of one before it: it is read into that one\n"},
        {"<parameter id=\"1\" factoryID=\"3\"><curve type=\"1\">\n<keypoint><time>1/1</time><value>1</value>"
         "</keypoint>\n<keypoint><time>indefinite</time><value>1</value></keypoint>\n<keypoint><time>0/1</"
         "time>"
         "<value>1</value></keypoint></curve></parameter>",
         "6:11: the time of the keypoint is 'indefinite', which is no place in time\n"
         "7:11: the keypoint lies before the one in front of it\n"},
        {"<parameter id=\"1\" "
         "factoryID=\"2\">\n<foldFlags>1</foldFlags>\n<fadeInCurve>4</fadeInCurve>\n<curve "
         "type=\"1\" value=\"3\">\n<preExtrapolation>-1</preExtrapolation>\n<keypoint interpolation=\"99\">\n"
         "<time>1/2</time>\n<value>0.5</value></keypoint>\n<keypoint><time>1/3</time>\n<value>1.5</"
         "value>\n<bias>"
         "big</bias></keypoint><max>2</max>\n<keypoint><time>3/4@x</time>\n<value>1.5</value></keypoint>\n"
         "</curve></parameter>",
         "5:1: the element 'foldFlags' is none of a channel of the class Percent: it is passed over\n"
         "6:1: the number 4 is out of the limits of 'fadeInCurve', 0 to 3\n"
         "7:1: the value 3 is out of the limits of its curve, 0 to 2\n"
         "8:1: '-1' is no whole number\n"
         "9:1: the interpolation '99' is unknown: it counts as Bezier\n"
         "12:11: the keypoint lies before the one in front of it\n"
         "13:1: the value 1.5 is out of the limits of its curve, 0 to 1\n"
         "14:1: 'big' is no number\n"
         "15:11: '3/4@x' is no time\n"},
        {"<parameter id=\"1\" factoryID=\"1\">\n<flags></wrong>", "5:10: mismatched tag\n"},
        {"<factory id=\"2\" uuid=\"F9D8D555-F368-43E8-8960-02C38CEFF6DF\"/>\n"
         "<parameter id=\"abc\" factoryID=\"2\">\n<timing in=\"x\" out=\"1/24\"/>\n"
         "<parameter id=\"4294967296\" factoryID=\"1\" flags=\"-1\"/></parameter>",
         "4:1: the factory has the id 2 of one before it, whose place it takes\n"
         "5:1: the attribute 'id' is 'abc', which is no whole number\n"
         "6:1: the attribute 'in' is 'x', which is no time\n"
         "7:1: the attribute 'id' is 4294967296, which is out of the limits, 0 to 4294967295\n"
         "7:1: the attribute 'flags' is '-1', which is no whole number\n"},
        {"<parameter id=\"1\" factoryID=\"1\">\n<parameter id=\"1\" factoryID=\"2\" value=\"7\" "
         "default=\"0.5\"/>\n<parameter id=\"2\" factoryID=\"2\">\n"
         "<curve type=\"7\" round=\"no\" value=\"2\">\n<min>5</min>\n<max>3</max>\n"
         "<keypoint flags=\"4294967296\" enabled=\"maybe\"><value>4</value>\n<time>1/2</time></keypoint>\n"
         "<keypoint/>\n<keypoint><value>nan</value></keypoint></curve></parameter></parameter>",
         "5:1: the value 7 is out of the limits of its curve, 0 to 1\n"
         "7:1: the attribute 'type' is 7, which is out of the limits, 0 to 1\n"
         "7:1: the value 2 is out of the limits of its curve, 5 to 3\n"
         "7:1: the attribute 'round' is 'no', which is neither 1 nor 0\n"
         "9:1: the least value, 5, is above the greatest, 3\n"
         "10:1: the attribute 'enabled' is 'maybe', which is neither 1 nor 0\n"
         "10:1: the attribute 'flags' is 4294967296, which is out of the limits, 0 to 4294967295\n"
         "10:46: the value 4 is out of the limits of its curve, 5 to 3\n"
         "11:1: the time stands behind the value, where it comes too late\n"
         "12:1: the keypoint has no value: it is passed over\n"
         "13:1: the keypoint has no time: it counts as 0\n"
         "13:11: 'nan' is no number\n"},
        // What a reader takes no notice of, or can't keep.
        {"<parameter id=\"1\" factoryID=\"1\" default=\"3\">\nlost <![CDATA[too]]>\n<parameter id=\"2\" "
         "factoryID=\"3\">\n<curve type=\"1\">\n  here<keypoint>\n&amp;<time>1/1</time><value>2</value>\n"
         "</keypoint></curve>\n<curve/></parameter>\n<foldFlags>131073</foldFlags></parameter>and here",
         "4:1: the attribute 'default' is none of a channel of the class Folder: it is passed over\n"
         "5:1: text stands in the element 'parameter': it is passed over\n"
         "8:3: text stands in the element 'curve': it is passed over\n"
         "9:1: text stands in the element 'keypoint': it is passed over\n"
         "11:1: the element 'curve' is here for the second time, where only one is kept\n"
         "12:1: 'foldFlags' is 131073, but they become 1\n"
         "12:42: text stands in the element 'kfml': it is passed over\n"},
        {"<parameter id=\"1\" factoryID=\"3\" default=\"1\" value=\"2\" flags=\"6\">\n<flags>4160</flags>\n"
         "<fadeInOffset>-1/2</fadeInOffset><fadeOutOffset>indefinite</fadeOutOffset>\n"
         "<curve type=\"1\" default=\"1.0\" value=\"3\">\n<max>inf</max></curve></parameter>",
         "4:1: 'flags' is 6, but the flags of the channel become 16\n"
         "5:1: 'flags' is 4160, but the flags of the channel become 16\n"
         "6:1: the fade is below 0: it counts as 0\n"
         "7:1: the attribute 'value' is 3, which takes the place of that of the channel, 2\n"
         "8:1: 'max' is inf, which isn't kept: it becomes that of the class, 1.7976931348623157e+308\n"},
        {"<parameter id=\"1\" factoryID=\"3\"><curve "
         "type=\"1\">\n<preExtrapolation>4294967297</preExtrapolation>"
         "<keypoint interpolation=\"4294967297\">\n<time>1/1</time><time>2/1</time><value>2</value>\n"
         "<value>3</value><bias>1.00000001</bias>\n<outputTangentTime>-1</outputTangentTime>"
         "<outputTangentValue>1</outputTangentValue>\n<outputTangentTime>1</outputTangentTime></keypoint>\n"
         "<keypoint enabled=\"0\"><time>3/1</time><value>1</value>"
         "<inputTangentTime>nan</inputTangentTime><inputTangentValue>nan</inputTangentValue>"
         "<outputTangentTime>0</outputTangentTime>\n<outputTangentValue>1e-9</outputTangentValue>"
         "<normal>3</normal>\n<bias>2</bias></keypoint></curve></parameter>",
         "5:1: the number 4294967297 is out of the limits of 'preExtrapolation', 0 to 4\n"
         "5:48: the attribute 'interpolation' is 4294967297, which is out of the limits, 0 to 4294967295\n"
         "6:17: the element 'time' is here for the second time, where only one is kept\n"
         "7:1: a second value makes another keypoint\n"
         "7:17: 'bias' is 1.00000001, which is kept as 1\n"
         "8:1: the handle reaches to the wrong side of its keypoint: its time counts as 0\n"
         "9:1: the element 'outputTangentTime' is here for the second time, where only one is kept\n"
         "9:1: no 'outputTangentValue' stands behind 'outputTangentTime': it is passed over\n"
         "10:1: the keypoint is disabled but keeps no output handle: it comes back enabled\n"
         "10:55: 'nan' is no number\n"
         "10:95: 'nan' is no number\n"
         "10:95: 'inputTangentValue' is nan, which is kept as no handle\n"
         "11:1: 'outputTangentValue' is 1e-09, which is kept as no handle\n"},
        {"<parameter id=\"1\" factoryID=\"3\"><curve type=\"1\">\n<keypoint enabled=\"0\"><time>0/1</time>"
         "<value>1</value><outputTangentValue>2</outputTangentValue>\n<bias>2</bias></keypoint>\n"
         "<numberOfKeypoints>99999999999</numberOfKeypoints></curve></parameter>",
         "6:1: 'bias' stands behind the output handle, which disables the keypoint: it is passed over\n"
         "7:1: the number 99999999999 is out of the limits of 'numberOfKeypoints', 0 to 4294967295\n"
         "7:1: the number stands behind keypoints, which it clears\n"},
        {"<parameter id=\"1\" factoryID=\"4294967299\">\n<curve type=\"1\">\n<min>3<shiny/></min>\n<value>5"
         "</value>\n<numberOfKeypoints>few</numberOfKeypoints></curve></parameter>",
         "4:1: the attribute 'factoryID' is 4294967299, which is out of the limits, 0 to 4294967295\n"
         "6:1: another element stands in 'min': its text is passed over\n"
         "6:7: the element 'shiny' is unknown here: it is passed over\n"
         "7:1: the element 'value' doesn't belong here: what is in it isn't looked at\n"
         "8:1: 'few' is no whole number\n"},
        {"<factory id=\"0\" uuid=\" FDC1944B-2291-11D7-B1C3-00039389B702 \"/>\n"
         "<factory id=\"6\" uuid=\"F112CFDE-0D76-11D7-83C8-000393670732\"/>\n"
         "<factory id=\"7\" uuid=\"4B723EA5-2443-11D7-9C75-00039366FB58\"/>"
         "<factory id=\"8\" uuid=\"0B00DE81-2292-11D7-AC3D-00039389B702\"/>\n<parameter id=\"1\">\n"
         "<timing in=\"1/30@2\" out=\"5/30@1\"/><enabled>0</enabled>\n<baseFlags>36</baseFlags>"
         "<flags>16</flags>\n<parameter name=\"A\" id=\"2\" factoryID=\"0\"/>\n"
         "<parameter name=\"B\" id=\"3\" factoryID=\"6\"/>\n<parameter id=\"4\" factoryID=\"7\" value=\"3\">"
         "<curve/></parameter>\n<parameter id=\"5\" factoryID=\"5\">\n"
         "<parameter name=\"Width\" id=\"1\"/><parameter name=\"Y\" id=\"2\" factoryID=\"2\"/></parameter>\n"
         "<parameter id=\"6\" factoryID=\"8\" value=\"1e-9\"><curve "
         "type=\"1\">\n<min>-5</min><keypoint><value>1</value>"
         "<inputTangentValue>1</inputTangentValue></keypoint></curve></parameter></parameter>\n<parameter/>",
         "8:1: 'out' is 1/6@1, but it becomes invalid\n"
         "8:35: 'enabled' is 0, but the flags of the channel become 12304\n"
         "9:1: 'baseFlags' is 36, but the flags of the channel become 12304\n"
         "10:1: the channel 'A' is of factory 0, which stands for none: it is passed over\n"
         "11:1: the channel 'B' is of factory 6, which makes no channels: it is passed over\n"
         "12:1: the attribute 'value' is none of a channel of the class Base: it is passed over\n"
         "12:43: the element 'curve' is none of a channel of the class Base: it is passed over\n"
         "14:1: the channel 'X' is a part of its folder, which makes it: the name 'Width' is passed over\n"
         "14:33: the channel 'Y' is a part of its folder, which makes it: the class Percent is passed over\n"
         "15:1: the attribute 'value' is 1e-09, which is kept as 0\n"
         "16:1: 'min' is -5, which isn't kept: it becomes that of the class, 0\n"
         "16:14: the keypoint has no time: it counts as 0\n"
         "16:40: curves of this class have no handles: 'inputTangentValue' is passed over\n"
         "17:1: a second channel: a document holds one, with all others inside it\n"},
    };
    for (auto const& each : cases) {
        EXPECT_EQ(findingsIn(documentOf("\n" + std::string(each.body))), each.findings);
    }
    EXPECT_EQ(findingsIn("<kfml version=\"5.13\"/>"), "1:1: the document holds no channel\n");
    EXPECT_EQ(findingsIn("\xEF\xBB\xBF<kfml version=\"\\x35.13\"><parameter/><shiny/></kfml>"),
              "1:37: the element 'shiny' is unknown here: it is passed over\n");
    EXPECT_EQ(findingsIn("<kfml version=\"abc\"><parameter/></kfml>"),
              "1:1: 'abc' is no version, such as 5.13: it is read as 5.13\n");
    EXPECT_EQ(findingsIn("<kfml><parameter/></kfml>"),
              "1:1: the document says no version: it is read as 5.13\n");
    EXPECT_EQ(findingsIn("<kfml version=\"1.9\"><parameter/></kfml>"),
              "1:1: the version 1.9 is older than 2.0: it is read as those of versions 2 to 4, with times in "
              "frames\n");
    EXPECT_EQ(findingsIn("<kfml version=\"99.1\"><parameter/></kfml>"),
              "1:1: the version 99.1 is newer than 5.13\n");
    EXPECT_EQ(findingsIn("<!DOCTYPE kfml><kfml/>"), "1:15: a document type declaration, which is refused\n");
    std::string deep;
    for (int i = 0; i < 1'001; ++i) {
        deep += "<parameter id=\"1\" factoryID=\"1\">\n";
    }
    EXPECT_EQ(findingsIn(documentOf(deep)), "993:1: nodes lie more than 990 elements deep in each other\n"
                                            "1002:1: elements lie more than 1000 deep in each other\n");
    EXPECT_EQ(findingsIn(contentOf(LUMENKEY_TEST_SOURCE_DIR "/tests/data/version2.lumen")), "");
    EXPECT_EQ(
        findingsIn(documentOf("<parameter factoryID=\"3\"><fadeInOffset>1/2</fadeInOffset>\n"
                              "<fadeOutOffset>3</fadeOutOffset><curve type=\"1\"><keypoint><time>1</time>\n"
                              "<value>1</value><inputTangentValue>nan</inputTangentValue></keypoint>"
                              "</curve></parameter>",
                              "4.1")),
        "4:1: '3' is no time\n"
        "5:17: 'nan' is no number\n"
        "5:17: 'inputTangentValue' is nan, which is kept as no handle\n");
    // Old also where spaces stand in front of the version.
    std::string const old = contentOf(LUMENKEY_TEST_SOURCE_DIR "/tests/data/version4.lumen");
    EXPECT_EQ(findingsIn(samples::replaced(old, "\"4.1\"", "\" 4.1\"")), "");
    EXPECT_EQ(jsonOf({"info", _folder.file("f.lumen")})["version"], "4.1");
}

TEST_F(CheckVerbTest, TellsWhatBecomesOfChannelsAsAWhole) {
    struct {
        char const* body;
        char const* findings;
    } const cases[] = {
        // An object root that is locked locks the values below it, but for what is hidden, and no folders.
        {"<parameter id=\"1\">\n<parameter name=\"A\" id=\"1\" factoryID=\"3\"/><locked>1</locked>\n"
         "<parameter name=\"F\" id=\"2\" factoryID=\"1\"><parameter name=\"B\" id=\"1\" factoryID=\"3\">\n"
         "<flags>16</flags></parameter></parameter><parameter name=\"C\" id=\"3\" factoryID=\"3\">"
         "<flags>20</flags></parameter><parameter name=\"H\" id=\"4\" factoryID=\"1\"><flags>4114</flags>"
         "<parameter name=\"D\" id=\"1\" factoryID=\"3\"/></parameter>\n"
         "<parameter name=\"P\" id=\"5\" factoryID=\"5\"><parameter name=\"X\" "
         "id=\"1\"/></parameter></parameter>",
         "5:1: the channel isn't locked: the object root above it locks it\n"
         "7:1: the channel isn't locked: the object root above it locks it\n"
         "8:42: the channel isn't locked: the object root above it locks it\n"},
        // A folder that is locked locks nothing below it. Of no flags nothing is written.
        {"<parameter id=\"1\" factoryID=\"1\"><flags>4116</flags><parameter name=\"F\" id=\"1\" "
         "factoryID=\"1\">"
         "\n<foldFlags>16777216</foldFlags>\n<parameter name=\"A\" id=\"1\" factoryID=\"3\"><flags>24</flags>"
         "</parameter></parameter>\n<parameter name=\"P\" id=\"2\" factoryID=\"4\"/>\n"
         "<parameter name=\"Z\" id=\"3\" factoryID=\"3\"><flags>0</flags></parameter>"
         "<parameter name=\"Y\" id=\"4\" factoryID=\"3\" flags=\"0\"/></parameter>",
         "5:1: 'foldFlags' is 16777216, by which documents leave out the channels of the folder\n"
         "6:42: documents leave out the channel 'F.A'\n"
         "7:1: documents leave out the channel 'P'\n"
         "8:42: 'flags' is 0, but the flags of the channel become 16\n"},
        {"<parameter id=\"1\" factoryID=\"3\"><flags>24</flags></parameter>", ""},
        {"<parameter id=\"1\" factoryID=\"5\">\n<parameter name=\"E\" id=\"9\" factoryID=\"3\"/>\n"
         "<parameter name=\"Y\" id=\"2\"/>\n<parameter name=\"X\" id=\"1\"/></parameter>",
         "5:1: the channel 'E' is put behind 'X', which its folder has in front of it\n"},
        // By the name that the class gives.
        {"<parameter id=\"1\" factoryID=\"5\">\n<parameter name=\"E\" id=\"9\" factoryID=\"3\"/>\n"
         "<parameter name=\"Odd\" id=\"1\"/></parameter>",
         "5:1: the channel 'E' is put behind 'X', which its folder has in front of it\n"
         "6:1: the channel 'X' is a part of its folder, which makes it: the name 'Odd' is passed over\n"},
        {"<parameter id=\"1\" factoryID=\"5\"><parameter name=\"Y\" id=\"2\"/>"
         "<parameter name=\"E\" id=\"9\" factoryID=\"3\"/><parameter name=\"F\" id=\"10\" factoryID=\"3\"/>\n"
         "<parameter name=\"Y\" id=\"2\"/></parameter>",
         "5:1: the channel 'Y' has the ID 2 of one before it: it is read into that one\n"},
        // Two roots lock it, and the place is that of what says it.
        {"<factory id=\"6\" uuid=\"F9D8D555-F368-43E8-8960-02C38CEFF6DF\"/><parameter id=\"1\">\n"
         "<locked>1</locked><parameter name=\"R\" id=\"1\" factoryID=\"6\"><flags>28</flags>\n"
         "<enabled>1</enabled><locked>1</locked>\n<parameter name=\"A\" id=\"1\" factoryID=\"3\"/>"
         "</parameter></parameter>",
         "5:60: documents leave out the channel 'R'\n"
         "7:1: the channel isn't locked: the object root above it locks it\n"},
    };
    std::string const rewritten = _folder.file("rewritten.lumen");
    for (auto const& each : cases) {
        EXPECT_EQ(findingsIn(documentOf("\n" + std::string(each.body))), each.findings);
        outputOf({"upgrade", _folder.file("f.lumen"), "-o", rewritten, "--force"});
        EXPECT_EQ(outputOf({"check", rewritten}), "") << contentOf(rewritten);
    }
    // A lock by an attribute reaches them when the rewritten document is read.
    EXPECT_EQ(findingsIn(documentOf("\n<parameter id=\"1\" flags=\"4\">\n<parameter id=\"1\" "
                                    "factoryID=\"3\"/></parameter>")),
              "5:1: the channel isn't locked: the object root above it locks it\n");
    // The order is no loss, and what is put behind stays of its class.
    std::string const odd = _folder.write(
        "f.lumen", documentOf("<parameter id=\"1\" factoryID=\"5\"><parameter name=\"E\" id=\"9\" "
                              "factoryID=\"3\"/><parameter name=\"X\" id=\"1\"/></parameter>"));
    outputOf({"upgrade", odd, "-o", rewritten});
    EXPECT_EQ(outputOf({"diff", odd, rewritten}), "");
}

TEST_F(CheckVerbTest, EndsAtAnEndlessTag) {
    std::string const name(std::size_t{65} << 20, 'a');
    EXPECT_EQ(findingsIn("<kfml version=\"5.13\"><parameter id=\"1\" name=\"" + name + "\"/></kfml>"),
              "1:22: a tag or comment is longer than 67108864 bytes\n");
}

TEST_F(CheckVerbTest, ReadsAPipeOnce) {
    std::string const odd =
        _folder.write("odd.lumen", documentOf("<parameter id=\"1\" factoryID=\"1\">\n<odd/></parameter>"));
    // Its blocks hold zero bytes.
    std::string wide = "\xFF\xFE";
    for (char const c : samples::replaced(contentOf(odd), "<odd/>", "<odd/>" + std::string(200'000, '\n'))) {
        wide += {c, '\0'};
    }
    _folder.write("wide.lumen", wide);
    struct {
        char const* script;
        std::string name;
    } const cases[] = {
        {"cat \"${2%odd.lumen}wide.lumen\" | timeout 20 \"$0\" check /dev/stdin", "/dev/stdin"},
        {"cat \"$2\" | timeout 20 \"$0\" check /dev/stdin", "/dev/stdin"},
        {"mkfifo \"$1\"; cat \"$2\" >\"$1\" & exec timeout 20 \"$0\" check \"$1\"", _folder.file("p.lumen")},
    };
    for (auto const& each : cases) {
        Outcome const outcome = runProgramFile("/bin/sh", {"-c", each.script, programPath(), each.name, odd});
        EXPECT_EQ(outcome.exit, 1) << outcome.err;
        EXPECT_EQ(outcome.out, each.name + ":4:1: the element 'odd' is unknown here: it is passed over\n");
    }
}

TEST_F(CheckVerbTest, ChecksManyFilesInTheirOrder) {
    std::vector<std::string> arguments{"check"};
    std::string expected;
    for (int i = 0; i < 24; ++i) {
        std::string const name = "f" + std::to_string(i) + (i % 3 == 0 ? ".bvh" : ".lumen");
        bool const isFaulty = i % 4 == 0;
        std::string const sound(samples::kSmallMotion);
        std::string const motion = isFaulty ? samples::replaced(sound, "91.5", "high") : sound;
        std::string const document =
            isFaulty ? "<kfml version=\"5.13\">" : "<kfml version=\"5.13\"><parameter/></kfml>";
        arguments.push_back(_folder.write(name, i % 3 == 0 ? motion : document));
        if (isFaulty) {
            expected += arguments.back() +
                        (i % 3 == 0 ? ":20:3: 'high' is not a number\n" : ":1:22: no element found\n");
        }
    }
    Outcome const outcome = runLumenkey(arguments);
    EXPECT_EQ(outcome.exit, 1);
    EXPECT_EQ(outcome.out, expected);
    EXPECT_EQ(outcome.err, "");
}

} // namespace
} // namespace lumenkey::tools
