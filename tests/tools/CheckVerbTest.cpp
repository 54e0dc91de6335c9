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
    };
    for (auto const& each : cases) {
        EXPECT_EQ(findingsIn(documentOf("\n" + std::string(each.body))), each.findings);
    }
    EXPECT_EQ(findingsIn("<kfml/>"), "1:1: the document holds no channel\n");
    EXPECT_EQ(findingsIn("<kfml version=\"abc\"><parameter/></kfml>"),
              "1:1: 'abc' is no version, such as 5.13\n");
    EXPECT_EQ(findingsIn("<kfml version=\"99.1\"><parameter/></kfml>"),
              "1:1: the version 99.1 is newer than 5.13\n");
    EXPECT_EQ(findingsIn("<!DOCTYPE kfml><kfml/>"), "1:15: a document type declaration, which is refused\n");
    std::string deep;
    for (int i = 0; i < 1'001; ++i) {
        deep += "<parameter id=\"1\" factoryID=\"1\">";
    }
    std::string const found = findingsIn(documentOf(deep));
    EXPECT_LT(found.find("more than 990 elements deep"), found.find("mismatched tag"))
        << "not in the order of the text";
    EXPECT_EQ(findingsIn(contentOf(LUMENKEY_TEST_SOURCE_DIR "/tests/persistence/data/version2.lumen")), "");
    // Old also where spaces stand in front of the version.
    std::string const old = contentOf(LUMENKEY_TEST_SOURCE_DIR "/tests/persistence/data/version4.lumen");
    EXPECT_EQ(findingsIn(samples::replaced(old, "\"4.1\"", "\" 4.1\"")), "");
    EXPECT_EQ(jsonOf({"info", _folder.file("f.lumen")})["version"], "4.1");
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
        std::string const document = isFaulty ? "<kfml>" : "<kfml><parameter/></kfml>";
        arguments.push_back(_folder.write(name, i % 3 == 0 ? motion : document));
        if (isFaulty) {
            expected += arguments.back() +
                        (i % 3 == 0 ? ":20:3: 'high' is not a number\n" : ":1:7: no element found\n");
        }
    }
    Outcome const outcome = runLumenkey(arguments);
    EXPECT_EQ(outcome.exit, 1);
    EXPECT_EQ(outcome.out, expected);
    EXPECT_EQ(outcome.err, "");
}

} // namespace
} // namespace lumenkey::tools
