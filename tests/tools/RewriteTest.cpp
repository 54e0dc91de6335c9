// What a document keeps when the program writes it anew.

#include "tests/tools/DocumentSamples.h"
#include "tests/tools/MotionSamples.h"
#include "tests/tools/RunProgram.h"
#include "tests/tools/TestFolder.h"

#include <gtest/gtest.h>

namespace lumenkey::tools {
namespace {

/// Unknown, and unused.
std::string const kClass6 = "<factory id=\"6\" uuid=\"00000000-0000-0000-0000-000000000001\"/>";

/// A number with a curve, in its own line.
std::string curved(std::string const& attributes, std::string const& inside) {
    return "<parameter name=\"C\" id=\"2\" factoryID=\"3\"><curve " + attributes + ">" + inside +
           "</curve></parameter>";
}

std::string keypoint(char const* time, char const* value, char const* attributes = "") {
    return std::string("<keypoint interpolation=\"1\" ") + attributes + "><time>" + time + "</time><value>" +
           value +
           "</value><outputTangentTime>0.1</outputTangentTime><outputTangentValue>0</outputTangentValue></"
           "keypoint>";
}

class RewriteTest : public ::testing::Test {
protected:
    TestFolder const _folder;
    std::string const _file = _folder.file("f.lumen");

    void write(std::string const& body, char const* version = "5.13") const {
        _folder.write("f.lumen", samples::documentOf(kClass6 + body, version));
    }
    /// `time value` of each keypoint, with `off` where it is disabled.
    std::string keypointsOf(std::string const& channel) const {
        Json const keys = jsonOf({"keys", _file, channel});
        std::string all;
        for (Json const& key : keys["keypoints"]) {
            all += key["time"].get<std::string>() + " " + key["value"].dump() +
                   (key["enabled"].get<bool>() ? "; " : " off; ");
        }
        return all;
    }
    struct Edit {
        std::vector<std::string> arguments;
        std::string keypoints;
    };
    /// Each on a curve with these keypoints.
    void expectKeypointsAfter(std::vector<Edit> const& edits, std::string const& before) const {
        for (Edit const& each : edits) {
            write("<parameter name=\"X\" id=\"1\" factoryID=\"3\"><curve type=\"1\">" + before +
                  "</curve></parameter>");
            std::vector<std::string> arguments = each.arguments;
            arguments.insert(arguments.begin() + 1, {_file, "--in-place"});
            outputOf(arguments);
            EXPECT_EQ(keypointsOf("./"), each.keypoints) << Json(arguments);
        }
    }
};

TEST_F(RewriteTest, LosesNothingUnlessForced) {
    std::string const two = "<parameter name=\"R\" id=\"1\" factoryID=\"1\">\n"
                            "<parameter name=\"X\" id=\"1\" factoryID=\"3\"/>";
    struct {
        std::string inside;
        char const* loss; // empty for none
    } const cases[] = {
        {"", ""},
        {"\n<parameter name=\"Y\" id=\"2\" factoryID=\"6\"/>", "5:1: the channel 'Y' is of factory 6"},
        {"\n<parameter name=\"Y\" id=\"2\"/>", "5:1: the channel 'Y' names no class"},
        {"\n<parameter name=\"Y\" id=\"1\" factoryID=\"3\"/>", "5:1: the channel 'Y' has the ID 1"},
        {"\n<shiny/>", "5:1: the element 'shiny'"},
        {"\n<parameter id=\"2\" factoryID=\"3\"><curve "
         "type=\"1\"><keypoint>\n<time>0/1</time><value>high</value>"
         "</keypoint></curve></parameter>",
         "6:17: 'high' is no number"},
        {"\n<parameter name=\"Y\" id=\"2\" factoryID=\"4\"/>", "documents leave out the channel 'Y'"},
        {curved("", keypoint("0/1", "1")), ": the curve is a constant"},
        {curved("type=\"1\"", "<keypoint><time>0/1</time><value>1</value></keypoint>\n"
                              "<numberOfKeypoints>1</numberOfKeypoints>"),
         "5:1: the number stands behind keypoints"},
        {curved("type=\"1\"", "<keypoint><time>0/1</time>\n<bias>2</bias><value>1</value></keypoint>"),
         "5:1: 'bias' stands in front of the value"},
        {curved("type=\"1\"", "\n<keypoint enabled=\" 0 \"><time>0/1</time><value>1</value></keypoint>"),
         "5:1: the keypoint is disabled but has no output handle"},
        {curved("type=\"1\"", "\n<keypoint interpolation=\"x\"><time>0/1</time><value>1</value></keypoint>"),
         "5:1: the interpolation 'x' is unknown"},
        {curved("type=\"1\"", "\n<keypoint foo=\"3\"><time>0/1</time><value>1</value></keypoint>"),
         "5:1: the attribute 'foo' is unknown"},
        {curved("type=\"1\"", "\n<closed>1</closed>" + keypoint("0/1", "1")),
         "5:1: there are no keypoints yet that it would close"},
        {curved("type=\"1\"", "<numberOfKeypoints>0</numberOfKeypoints>\n<closed>1</closed>"),
         "5:1: there are no keypoints that it would close"},
        {"<parameter name=\"P\" id=\"2\" factoryID=\"5\"><foldFlags>16777216</foldFlags></parameter>",
         "by which documents leave out the channels of the folder"},
        {"<parameter name=\"P\" id=\"2\" factoryID=\"5\"><parameter name=\"X\" id=\"1\" "
         "factoryID=\"3\"><flags>8</flags></parameter></parameter>",
         "documents leave out the channel 'P.X'"},
        {"\nlost", "5:1: text stands in the element 'parameter'"},
        {curved("type=\"1\"", keypoint("0/1", "1") + "\n<closed>1</closed><closed>1</closed>"),
         "5:19: the element 'closed' is here for the second time"},
        {"\n<parameter id=\"2\" factoryID=\"3\" flags=\"2\"><flags>16</flags></parameter>",
         "5:1: 'flags' is 2, but the flags of the channel become 16"},
        {"\n<parameter id=\"2\" factoryID=\"3\"><fadeInOffset>-infinity</fadeInOffset></parameter>",
         "5:33: the fade is below 0"},
        // Odd, but it stays.
        {"<parameter id=\"2\" factoryID=\"2\"><curve type=\"1\" default=\"3\" "
         "value=\"2\"><keypoint><time>0/1</time>"
         "<value>1.5</value></keypoint></curve></parameter>",
         ""},
        {"<parameter id=\"2\" factoryID=\"3\"><curve type=\"1\"><keypoint "
         "interpolation=\"99\"><time>1/1</time>"
         "<value>5</value></keypoint><keypoint><time>0/1</time><value>6</value></keypoint></curve></"
         "parameter>",
         ""},
    };
    std::string const out = _folder.file("out.lumen");
    for (auto const& each : cases) {
        SCOPED_TRACE(each.inside);
        write(two + each.inside + "</parameter>", "5.12");
        std::string const before = contentOf(_file);
        for (std::vector<std::string> arguments :
             std::vector<std::vector<std::string>>{{"upgrade", _file, "-o", out},
                                                   {"convert", _file, out},
                                                   {"add", _file, "./", "Double", "Z", "-o", out},
                                                   {"set", _file, "X", "--value", "1", "-o", out}}) {
            bool const isRefused = *each.loss != '\0';
            Outcome const outcome = runLumenkey(arguments);
            EXPECT_EQ(outcome.exit, isRefused ? 1 : 0) << Json(arguments) << outcome.err;
            EXPECT_NE(outcome.err.find(isRefused ? each.loss : ""), std::string::npos) << outcome.err;
            if (isRefused) {
                EXPECT_FALSE(std::filesystem::exists(out));
                arguments.push_back("--force");
                EXPECT_EQ(runLumenkey(arguments).exit, 0);
            }
            std::filesystem::remove(out);
        }
        EXPECT_EQ(contentOf(_file), before);
    }
    EXPECT_EQ(runLumenkey({"upgrade", _file}).exit, 0);
    EXPECT_EQ(keypointsOf("./2"), "1/1 5; 0/1 6; ");
    EXPECT_NE(contentOf(_file).find("interpolation=\"99\""), std::string::npos);

    write(two + "</parameter>", "6.0");
    EXPECT_NE(runLumenkey({"set", _file, "X", "--value", "1"}).err.find("version 6.0 is newer"),
              std::string::npos);

    // From a pipe, which can be read only once.
    std::string const script = "cat '" +
                               _folder.write("odd", samples::documentOf(two + "<shiny/></parameter>")) +
                               "' | '" + programPath() + "' convert /dev/stdin '" + out + "'";
    Outcome const piped = runProgramFile("/bin/sh", {"-c", script});
    EXPECT_EQ(piped.exit, 1);
    EXPECT_NE(piped.err.find("/dev/stdin:4:43: the element 'shiny'"), std::string::npos) << piped.err;
}

TEST_F(RewriteTest, TablesMissNoKeypointThatIsSeen) {
    std::string const table = _folder.file("out.csv");
    std::string const first = keypoint("0/1", "1");
    std::string const disabled = keypoint("1/1", "99", "enabled=\"0\"");
    struct {
        std::string keypoints;
        char const* missed;
        char const* rows;
    } const cases[] = {{first + disabled + keypoint("2/1", "3") + "<shiny/>", "", "0/1,0,1\n2/1,2,3\n"},
                       {first + keypoint("1/1", "2") + keypoint("2/2", "3"), "1/1", "0/1,0,1\n1/1,1,2\n"},
                       {keypoint("1/1", "2") + first, "0/1", "1/1,1,2\n"}};
    for (auto const& each : cases) {
        write("<parameter id=\"1\"><parameter name=\"X\" id=\"1\" factoryID=\"3\"><curve type=\"1\">" +
              each.keypoints +
              "</curve></parameter><parameter name=\"Y\" id=\"2\" factoryID=\"3\"><curve "
              "type=\"1\">" +
              disabled + "</curve></parameter></parameter>");
        if (*each.missed != '\0') {
            EXPECT_NE(complaintOf({"convert", _file, table})
                          .find(std::string("one of 'X' at ") + each.missed + " s has no place"),
                      std::string::npos);
        }
        outputOf({"convert", _file, table, *each.missed != '\0' ? "--force" : "--frame-rate=30"});
        EXPECT_EQ(contentOf(table), std::string("time,seconds,X\n") + each.rows);
    }
    // Where it isn't in a table at all, that matters also of one that would be missed.
    write("<parameter id=\"1\"><parameter name=\"X\" id=\"1\" factoryID=\"3\"><curve type=\"1\">" + first +
          keypoint("-infinity", "2") + "</curve></parameter></parameter>");
    EXPECT_NE(complaintOf({"convert", _file, table, "--force"}).find("can't hold the time"),
              std::string::npos);
}

TEST_F(RewriteTest, SimplifyKeepsToItsToleranceBesideTheKeypoints) {
    // The last of several at one time shows behind them alone.
    expectKeypointsAfter({{{"simplify", "--tolerance", "0.01"}, "0/1 0; 1/1 10; 1/1 20; "}},
                         keypoint("0/1", "0") + keypoint("1/1", "10") + keypoint("1/1", "20"));
    // No distance is within it beside what is no number.
    expectKeypointsAfter({{{"simplify", "--tolerance", "9", "--force"}, "0/1 0; 1/1 null; 2/1 1; "}},
                         keypoint("0/1", "0") + keypoint("1/1", "nan") + keypoint("2/1", "1"));

    auto const frames = [](int first, int (*value)(int)) {
        std::string all;
        for (int i = first; i <= first + 30; ++i) {
            all += keypoint((std::to_string(i) + "/30").c_str(), std::to_string(value(i)).c_str());
        }
        return all;
    };
    // A curve goes on as it ends, to both ends of the stretch that another has.
    for (auto const& [bow, end] : {std::pair(frames(0, [](int i) { return i * (60 - i); }), "20/1"),
                                   std::pair(frames(-30, [](int i) { return i * (60 + i); }), "-20/1")}) {
        write("<parameter id=\"1\"><parameter id=\"1\" factoryID=\"3\"><curve type=\"1\">"
              "<preExtrapolation>1</preExtrapolation><postExtrapolation>1</postExtrapolation>" +
              bow + "</curve></parameter><parameter id=\"2\" factoryID=\"3\"><curve type=\"1\">" +
              keypoint(end, "0") + "</curve></parameter></parameter>");
        Json const edited = jsonOf({"simplify", _file, "./1", "--tolerance", "5", "--in-place"});
        EXPECT_LE(edited["channels"][0]["worstError"], 5) << end;
    }

    // A peak between the ten times in a frame.
    auto const zero = [](int) { return 0; };
    write("<parameter id=\"1\" factoryID=\"3\"><curve type=\"1\">" + frames(-30, zero) +
          keypoint("1/1000", "50") + keypoint("2/1000", "0") + frames(1, zero) + "</curve></parameter>");
    outputOf({"simplify", _file, "--tolerance", "0.01", "--in-place"});
    EXPECT_NE(keypointsOf("./").find("1/1000 50; "), std::string::npos);
}

TEST_F(RewriteTest, OddTextsStayWithoutForce) {
    write("<parameter name=\"R\" id=\"1\" factoryID=\"1\">" +
          curved("type=\"1\" value=\"nan\" default=\"nan\"",
                 "<min>5</min><max>3</max><preExtrapolation>5</preExtrapolation>"
                 "<keypoint enabled=\" 1 \"><time> 1/2 </time><value>nan</value></keypoint>"
                 "<keypoint><inputTangentTime>-0.5</inputTangentTime><value>1</value>"
                 "<inputTangentValue>3</inputTangentValue><outputTangentTime>1</outputTangentTime>"
                 "<outputTangentValue>nan</outputTangentValue></keypoint>"
                 "<keypoint><time>invalid~</time><value>1</value></keypoint>"
                 "<keypoint><time>5/0@2#0</time><value>1</value></keypoint><closed>2</closed>") +
          "</parameter>");
    std::string const out = _folder.file("out.lumen");
    outputOf({"convert", _file, out});
    std::string const text = contentOf(out);
    for (char const* const kept :
         {"default=\"nan\" value=\"nan\"", "<min>5</min>", "<max>3</max>",
          "<preExtrapolation>5</preExtrapolation>", "<closed>1</closed>", "<value>nan</value>",
          "<time>1/2</time>", "<time>0/1</time>", "<time>invalid~</time>", "<time>5/0@2#0</time>",
          "<inputTangentTime>-0.5</inputTangentTime>", "<outputTangentValue>nan</outputTangentValue>"}) {
        EXPECT_NE(text.find(kept), std::string::npos) << kept << text;
    }
}

TEST_F(RewriteTest, TheTopHasItsAttributesToo) {
    write("<parameter name=\"P\" id=\"1\" factoryID=\"2\" default=\"1e-9\" value=\"0.5\" flags=\"2\"/>");
    outputOf({"convert", _file, _file});
    EXPECT_NE(contentOf(_file).find("<flags>18</flags>"), std::string::npos) << contentOf(_file);
    Json const top = jsonOf({"tree", _file})["nodes"][0];
    EXPECT_EQ(top["default"], 1e-9);
    EXPECT_EQ(top["start"], 0.5);
    EXPECT_EQ(jsonOf({"info", _file})["channelNames"][0], "P");
    EXPECT_EQ(jsonOf({"sample", _file, "P", "--count", "1"})["series"][0]["channel"], "P");
    std::string const other =
        _folder.write("other.lumen", samples::replaced(contentOf(_file), "\"P\"", "\"Q\""));
    EXPECT_EQ(outputOf({"diff", _file, other}, 1), "changed ./: name P became Q\n");
    // A folder's name isn't that of a channel.
    write("<parameter name=\"X\" id=\"1\" flags=\"4\"><parameter name=\"X\" id=\"1\" factoryID=\"3\" "
          "value=\"7\"/></parameter>");
    EXPECT_EQ(jsonOf({"tree", _file})["nodes"][1]["start"], 7.0);
    EXPECT_NE(runLumenkey({"set", _file, "X", "--value", "1"}).err.find("is locked"), std::string::npos);
    write("<parameter id=\"1\" factoryID=\"3\"/>");
    EXPECT_EQ(jsonOf({"info", _file})["channelNames"][0], "./");
}

TEST_F(RewriteTest, EveryKeypointCounts) {
    std::string const body = keypoint("0/1", "1", "enabled=\"0\"") + keypoint("1/1", "2") +
                             keypoint("1/1", "3") + keypoint("2/1", "4") +
                             keypoint("4/1", "5", "enabled=\"0\"");
    expectKeypointsAfter(
        {{{"scale", "--factor", "1"}, "0/1 1 off; 1/1 2; 1/1 3; 2/1 4; 4/1 5 off; "},
         {{"offset", "--by", "10"}, "10/1 1 off; 11/1 2; 11/1 3; 12/1 4; 14/1 5 off; "},
         {{"offset", "--value", "1"}, "0/1 2 off; 1/1 3; 1/1 4; 2/1 5; 4/1 6 off; "},
         {{"offset", "--by", "10", "--from", "2"}, "0/1 1 off; 1/1 2; 1/1 3; 12/1 4; 14/1 5 off; "},
         {{"reverse"}, "0/1 5 off; 2/1 4; 3/1 3; 3/1 2; 4/1 1 off; "},
         {{"retime", "--factor", "2"}, "0/1 1 off; 2/1 2; 2/1 3; 4/1 4; 8/1 5 off; "},
         {{"offset", "--by", "1/2", "--from", "1", "--to", "2"},
          "0/1 1 off; 3/2 2; 3/2 3; 5/2 4; 4/1 5 off; "},
         {{"reverse", "--from", "1", "--to", "2"}, "0/1 1 off; 1/1 4; 2/1 3; 2/1 2; 4/1 5 off; "},
         {{"retime", "--factor", "2", "--to", "1"}, "0/1 1 off; 2/1 2; 2/1 3; 4/1 5 off; "}},
        body);
    write("<parameter name=\"X\" id=\"1\" factoryID=\"3\"><curve type=\"1\">" +
          keypoint("1/2147483647", "0") + keypoint("1/2", "1") + "</curve></parameter>");
    EXPECT_NE(
        complaintOf({"offset", _file, "--by", "9223372036854775807/1", "--in-place"}, 2).find("no place"),
        std::string::npos);
    EXPECT_NE(complaintOf({"retime", _file, "--factor", "1/2147483647", "--in-place"}, 2).find("to one time"),
              std::string::npos);
    EXPECT_EQ(keypointsOf("./"), "1/2147483647 0; 1/2 1; ");
    // What was sampled is seen, and nothing in front of it changes, whatever the handles of what wasn't seen.
    expectKeypointsAfter({{{"bake", "--step", "1"}, "0/1 1; 1/1 1; 2/1 3; "}},
                         keypoint("0/1", "5", "enabled=\"0\"") + keypoint("1/1", "1") + keypoint("2/1", "3"));
    write("<parameter name=\"X\" id=\"1\" factoryID=\"3\"><curve type=\"1\">" + keypoint("0/1", "0") +
          "<keypoint enabled=\"0\"><time>1/1</time><value>5</value><inputTangentTime>-0.3</inputTangentTime>"
          "<inputTangentValue>80</inputTangentValue><outputTangentTime>0.3</outputTangentTime>"
          "<outputTangentValue>100</outputTangentValue></keypoint><keypoint><time>2/1</time><value>1</value>"
          "<inputTangentTime>-0.5</inputTangentTime><inputTangentValue>-3</inputTangentValue></keypoint>"
          "</curve></parameter>");
    std::string const before = outputOf({"sample", _file, "--at", "1/4,1/2,3/4"});
    Json const baked = jsonOf({"bake", _file, "--step", "1/10", "--from", "1", "--in-place"});
    EXPECT_LT(baked["channels"][0]["worstError"], 0.1);
    EXPECT_EQ(outputOf({"sample", _file, "--at", "1/4,1/2,3/4"}), before);
    // Of those that stand out of order too.
    expectKeypointsAfter({{{"offset", "--by", "1/2", "--from", "1", "--to", "2"},
                           "0/1 0; 3/2 2; 3/2 4; 5/2 1; 5/2 3; 4/1 5; "}},
                         keypoint("0/1", "0") + keypoint("2/1", "1") + keypoint("1/1", "2") +
                             keypoint("2/1", "3") + keypoint("1/1", "4") + keypoint("4/1", "5"));
    // Disabled ones too, each with all that it has.
    std::string const several = keypoint("1/1", "1", "enabled=\"0\"") +
                                "<keypoint interpolation=\"18\" flags=\"8\"><time>1/1</time><value>2</value>"
                                "<bias>3</bias><normal>4</normal><inputTangentTime>-0.5</inputTangentTime>"
                                "<inputTangentValue>5</inputTangentValue></keypoint>" +
                                keypoint("1/1", "3") + keypoint("1/1", "4", "enabled=\"0\"");
    expectKeypointsAfter({{{"offset", "--by", "1", "--from", "1", "--to", "1"},
                           "0/1 0; 2/1 1 off; 2/1 2; 2/1 3; 2/1 4 off; 3/1 5; "}},
                         "<max>1</max>" + keypoint("0/1", "0") + several + keypoint("3/1", "5"));
    std::string const text = contentOf(_file);
    for (char const* const part :
         {"<keypoint interpolation=\"18\" flags=\"8\">", "<bias>3</bias>", "<normal>4</normal>",
          "<inputTangentTime>-0.5</inputTangentTime>", "<inputTangentValue>5</inputTangentValue>"}) {
        EXPECT_NE(text.find(part), std::string::npos) << part << text;
    }

    // Those beside them have theirs as before.
    expectKeypointsAfter(
        {{{"scale", "--factor", "2", "--from", "1", "--to", "1"}, "0/1 1; 1/1 4; 8/1 3; "}},
        "<keypoint><time>0/1</time><value>1</value><outputTangentTime>0.25</outputTangentTime>"
        "<outputTangentValue>2</outputTangentValue></keypoint>" +
            keypoint("1/1", "2") +
            "<keypoint><time>8/1</time><value>3</value><inputTangentTime>-0.5</inputTangentTime>"
            "<inputTangentValue>5</inputTangentValue></keypoint>");
    for (char const* const part :
         {"<outputTangentTime>0.25</outputTangentTime>", "<outputTangentValue>2</outputTangentValue>",
          "<inputTangentTime>-0.5</inputTangentTime>", "<inputTangentValue>5</inputTangentValue>"}) {
        EXPECT_NE(contentOf(_file).find(part), std::string::npos) << part << contentOf(_file);
    }
}

TEST_F(RewriteTest, LockedKeypointsStay) {
    // At 0 to 7 s, with the time as value; those at 0 and 3 s are locked.
    std::string body;
    for (std::string const at : {"0", "1", "2", "3", "4", "5", "6", "7"}) {
        body += keypoint((at + "/1").c_str(), at.c_str(), at == "0" || at == "3" ? "flags=\"2\"" : "");
    }
    expectKeypointsAfter({{{"reverse", "--from", "4", "--to", "6"},
                           "0/1 0; 1/1 1; 2/1 2; 3/1 3; 4/1 6; 5/1 5; 6/1 4; 7/1 7; "},
                          {{"offset", "--by", "10", "--from", "4", "--to", "6"},
                           "0/1 0; 1/1 1; 2/1 2; 3/1 3; 7/1 7; 14/1 4; 15/1 5; 16/1 6; "},
                          {{"retime", "--factor", "2", "--from", "2", "--to", "5"},
                           "0/1 0; 1/1 1; 2/1 2; 3/1 3; 6/1 4; 8/1 5; "},
                          // What comes to where one stands gives way to it.
                          {{"offset", "--by", "1"}, "0/1 0; 2/1 1; 3/1 3; 5/1 4; 6/1 5; 7/1 6; 8/1 7; "},
                          {{"offset", "--by", "-1", "--from", "3", "--to", "4"},
                           "0/1 0; 1/1 1; 2/1 2; 3/1 3; 5/1 5; 6/1 6; 7/1 7; "},
                          {{"offset", "--by", "1", "--from", "3", "--to", "3"},
                           "0/1 0; 1/1 1; 2/1 2; 3/1 3; 4/1 4; 5/1 5; 6/1 6; 7/1 7; "}},
                         body);
}

} // namespace
} // namespace lumenkey::tools
