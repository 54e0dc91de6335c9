// Documents made and changed from a shell, and what tells them apart.

#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/foundation/BXURL.h"
#include "tests/tools/DocumentSamples.h"
#include "tests/tools/MotionSamples.h"
#include "tests/tools/RunProgram.h"
#include "tests/tools/TestFolder.h"
#include "tools/tree/ChannelTree.h"

#include <gtest/gtest.h>

namespace lumenkey::tools {
namespace {

using samples::documentOf;

class AuthorVerbsTest : public ::testing::Test {
protected:
    TestFolder const _folder;
    std::string const _file = _folder.file("ball.lumen");

    void expectRefused(std::vector<std::string> arguments, std::string const& complaint, int exit = 2) const {
        std::string const before = contentOf(_file);
        arguments.insert(arguments.begin() + 1, _file);
        std::string const said = complaintOf(arguments, exit);
        EXPECT_NE(said.find(complaint), std::string::npos) << said;
        EXPECT_EQ(contentOf(_file), before);
    }
    void makeBall() const {
        outputOf({"new", _file});
        EXPECT_EQ(outputOf({"add", _file, "./", "Double", "Height", "--value", "1.5"}), "./1\n");
        EXPECT_EQ(outputOf({"add", _file, "./", "folder", "Body"}), "./2\n");
        EXPECT_EQ(outputOf({"add", _file, "Body", "KFChannel3D", "Place"}), "./2/1\n");
        EXPECT_EQ(outputOf({"add", _file, "./2", "Bool", "On", "--value", "1"}), "./2/2\n");
        outputOf({"set", _file, "Height", "--at", "1/2", "--value", "0", "--interpolation", "Catmull Rom"});
        outputOf({"set", _file, "Height", "--at", "0", "--value", "3", "--interpolation", "constant"});
        outputOf({"set", _file, "Height", "--at", "1", "--value", "2"});
        outputOf({"set", _file, "Place.Y", "--value", "-5"});
    }
};

TEST_F(AuthorVerbsTest, MakesADocumentFromNothing) {
    makeBall();
    Json const nodes = jsonOf({"tree", _file})["nodes"];
    std::string all;
    for (Json const& node : nodes) {
        all += node["path"].get<std::string>() + " " + node["name"].get<std::string>() + " " +
               node["class"].get<std::string>() +
               (node.contains("start") ? " " + node["start"].dump() : std::string()) + "\n";
    }
    EXPECT_EQ(all, "./ ball KFChannelObjectRootBase\n"
                   "./1 Height KFChannelDouble 3\n"
                   "./2 Body KFChannelFolder\n"
                   "./2/1 Place KFChannel3D\n"
                   "./2/1/1 X KFChannelDouble 0\n"
                   "./2/1/2 Y KFChannelDouble -5\n"
                   "./2/1/3 Z KFChannelDouble 0\n"
                   "./2/2 On KFChannelBool 1\n");
    Json const keys = jsonOf({"keys", _file, "Height"})["keypoints"];
    ASSERT_EQ(keys.size(), 3U);
    EXPECT_EQ(keys[0]["interpolation"], 0);
    EXPECT_EQ(keys[1]["time"], "1/2");
    EXPECT_EQ(keys[1]["interpolation"], 6);
    EXPECT_EQ(keys[2]["value"], 2.0);

    for (std::string const value : {"1e-09", "0"}) {
        outputOf({"set", _file, "Place.X", "--value", value});
        EXPECT_EQ(jsonOf({"tree", _file})["nodes"][4]["start"], std::stod(value));
    }
    outputOf({"set", _file, "Height", "--at", "1", "--delete"});
    outputOf({"set", _file, "Height", "--at", "0", "--value", "4", "--in-place"});
    std::string const copy = _folder.file("copy.lumen");
    outputOf({"remove", _file, "Place", "-o", copy});
    EXPECT_EQ(jsonOf({"tree", copy})["nodes"].size(), 4U);
    EXPECT_EQ(jsonOf({"tree", _file})["nodes"].size(), 8U);
    outputOf({"set", copy, "Height", "--at", "0", "--value", "4.0000000001"});
    outputOf({"set", copy, "Height", "--at", "0", "--value", "4"});
    Json const left = jsonOf({"keys", copy, "Height"})["keypoints"];
    ASSERT_EQ(left.size(), 2U);
    EXPECT_EQ(left[0]["value"], 4.0);
    EXPECT_EQ(left[0]["interpolation"], 0) << "a new value leaves the rest of its keypoint";
}

TEST_F(AuthorVerbsTest, OtherFormatsGetWhatWasAddedAndNotWhatWasRemoved) {
    makeBall();
    std::string const table = _folder.file("t.csv");
    outputOf({"set", _file, "Place.X", "--at", "0", "--value", "7"});
    outputOf({"remove", _file, "Body", "-o", table});
    EXPECT_TRUE(contentOf(table).starts_with("time,seconds,Height\n")) << contentOf(table);
    std::string const motion = _folder.write("m.bvh", samples::kSmallMotion);
    outputOf({"convert", motion, _file});
    EXPECT_EQ(outputOf({"add", _file, "LeftLeg", "Double", "Yposition", "--value", "2.5", "-o", motion}),
              "./1/7/6\n");
    EXPECT_NE(contentOf(motion).find("CHANNELS 4 Zrotation Xrotation Yrotation Yposition\n"),
              std::string::npos);
    EXPECT_NE(contentOf(motion).find(" 90 2.5\n"), std::string::npos) << contentOf(motion);
}

TEST_F(AuthorVerbsTest, RefusesWhatChannelsDoNotTake) {
    makeBall();
    expectRefused({"add", "./", "Dubble", "X"}, "did you mean 'Double'?");
    expectRefused({"add", "Height", "Double", "X"}, "is no folder");
    expectRefused({"add", "Place", "Double", "W"}, "is no folder");
    expectRefused({"add", "Body", "Double", "On"}, "has a channel 'On' already");
    expectRefused({"add", "Body", "3D", "P", "--value", "1"}, "none or several");
    expectRefused({"add", "Body", "Percent", "P", "--value", "50"}, "values from 0 to 1");
    expectRefused({"add", "Body", "Progress", "P"}, "documents leave out");
    std::string const completion = outputOf({"completion", "bash"});
    EXPECT_NE(completion.find(" Percent "), std::string::npos);
    EXPECT_EQ(completion.find(" Progress "), std::string::npos) << "it is offered";
    expectRefused({"set", "Height", "--value", "1"}, "say which with --at");
    expectRefused({"set", "Height", "--at", "1/3", "--delete"}, "has no keypoint at 1/3 s");
    expectRefused({"set", "Height", "--at", "0", "--value", "1", "--interpolation", "wavy"},
                  "there are constant");
    expectRefused({"set", "On", "--at", "0", "--value", "0"}, "takes no keypoints");
    expectRefused({"set", "Body", "--value", "0"}, "is a folder");
    expectRefused({"remove", "./"}, "the top");
    expectRefused({"remove", "Place.X"}, "only go as a whole");
    expectRefused({"new"}, "it is there already", 1);
}

TEST_F(AuthorVerbsTest, SetRefusesWhatTheFileCanNotHold) {
    makeBall();
    outputOf({"convert", _folder.write("m.bvh", samples::kSmallMotion), _folder.file("m.lumen")});
    _folder.write("t.csv", "t,X,Y\n0,1,\n1,2,\n");
    _folder.write("k.lumen",
                  documentOf("<parameter id=\"1\"><parameter name=\"X\" id=\"1\" factoryID=\"3\">"
                             "<curve type=\"1\"><keypoint flags=\"2\"><time>0/1</time><value>1"
                             "</value></keypoint><keypoint enabled=\"0\"><time>2/1</time><value>1"
                             "</value><outputTangentTime>1</outputTangentTime><outputTangentValue>0"
                             "</outputTangentValue></keypoint></curve></parameter></parameter>"));
    std::string const convert = "make a document of it with lumenkey convert";
    struct {
        std::string file;
        std::vector<std::string> arguments;
        std::string complaint; // empty for none
    } const cases[] = {
        {"m.bvh", {"Hips.Xposition", "--at", "1/240", "--value", "1"}, "which are 1/120 s apart; " + convert},
        {"m.bvh", {"Hips.Xposition", "--at", "0", "--delete"}, "a value in every frame; " + convert},
        {"m.bvh", {"Hips.Xposition", "--at", "0", "--interpolation", "ease"}, "holds no interpolations"},
        {"m.bvh", {"Hips.Xposition", "--at", "2f", "--value", "1", "-o", _folder.file("o.bvh")}, ""},
        {"m.bvh", {"Hips.Xposition", "--at", "0.1f", "--value", "1", "-o", _folder.file("o.lumen")}, ""},
        {"m.lumen",
         {"Hips.Xposition", "--at", "0.1f", "--value", "1", "-o", _folder.file("o.bvh")},
         "apart; write a document"},
        {"m.lumen", {"Frame Time", "--value", "0.1", "-o", _folder.file("o.bvh")}, "last as long as those"},
        {"m.lumen",
         {"Hips.Offset.X", "--at", "2f", "--value", "9", "-o", _folder.file("o.bvh")},
         "an offset is the same in every frame; write a document"},
        {"m.lumen", {"Hips.Offset.X", "--value", "9", "-o", _folder.file("o.bvh")}, ""},
        {"t.csv", {"X", "--at", "0", "--interpolation", "ease"}, "a CSV holds no interpolations; " + convert},
        {"t.csv", {"Y", "--value", "3"}, "a CSV holds no values without a time; " + convert},
        {"t.csv", {"Y", "--at", "1/3", "--value", "3", "-o", _folder.file("o.csv")}, ""},
        {"t.csv", {"X", "--at", "0", "--delete", "-o", _folder.file("o.csv")}, ""},
        {"k.lumen", {"X", "--at", "0", "--delete"}, "the keypoint at 0/1 s is locked"},
        {"k.lumen", {"X", "--at", "0", "--value", "2"}, "the keypoint at 0/1 s is locked"},
        {"k.lumen", {"X", "--at", "1", "--value", "2", "-o", _folder.file("o.lumen")}, ""},
        {"k.lumen", {"X", "--at", "2", "--value", "2", "-o", _folder.file("o.csv")}, "keypoint is disabled"},
    };
    for (auto const& each : cases) {
        std::string const file = _folder.file(each.file);
        std::string const before = contentOf(file);
        std::vector<std::string> arguments{"set", file};
        arguments.insert(arguments.end(), each.arguments.begin(), each.arguments.end());
        Outcome const outcome = runLumenkey(arguments);
        EXPECT_EQ(outcome.exit, each.complaint.empty() ? 0 : 2) << Json(arguments) << outcome.err;
        EXPECT_NE(outcome.err.find(each.complaint), std::string::npos) << outcome.err;
        EXPECT_EQ(contentOf(file), before);
    }
}

TEST_F(AuthorVerbsTest, WritesNothingThatItCouldNotRead) {
    KFChannelObjectRootBase top("Top", nullptr, 0, 0, 0);
    std::vector<std::unique_ptr<KFChannelFolder>> folders;
    KFChannelFolder* last = &top;
    std::string path = ".";
    for (int i = 0; i < 988; ++i) {
        last = folders.emplace_back(new KFChannelFolder("F", last, 9, 0, 0)).get();
        path += "/9";
    }
    BXData const deepest = top.createChannelState(true, true);
    _folder.write("ball.lumen", std::string(deepest.begin(), deepest.end()));
    expectRefused({"add", path, "Folder", "g", "--in-place"}, "more than 990 elements deep", 1);
    outputOf({"add", _file, path.substr(0, path.size() - 2), "Folder", "g", "--in-place"});
}

TEST_F(AuthorVerbsTest, HashIsThatOfTheLibrary) {
    makeBall();
    KFChannelObjectRootBase root("ball", nullptr, 1, 0, 0);
    ASSERT_TRUE(root.configureWithURL(BXURL(_file)));
    std::string expected;
    for (unsigned const byte : root.getHash()) {
        expected += "0123456789abcdef"[byte / 16];
        expected += "0123456789abcdef"[byte % 16];
    }
    for (KFChannelBase* const child : std::vector<KFChannelBase*>(*root.getDescendants())) {
        root.removeDescendant(child);
        ChannelTree const owner{std::unique_ptr<KFChannelBase>(child)};
    }
    EXPECT_EQ(outputOf({"hash", _file}), expected + "\n");
    std::string const early = outputOf({"hash", _file, "Height", "--at", "0"});
    EXPECT_EQ(outputOf({"hash", _file, "Height", "--at", "1/4"}), early) << "the value is held";
    EXPECT_NE(outputOf({"hash", _file, "Height", "--at", "3/4"}), early);
    std::string const body = outputOf({"hash", _file, "Body"});
    outputOf({"set", _file, "Height", "--at", "1/4", "--value", "3"});
    EXPECT_EQ(outputOf({"hash", _file, "Body"}), body);
    EXPECT_NE(outputOf({"hash", _file}), expected + "\n");
}

TEST_F(AuthorVerbsTest, DiffTellsWhatDiffersAndByItsExitCode) {
    makeBall();
    std::string const other = _folder.file("other.lumen");
    std::filesystem::copy_file(_file, other);
    EXPECT_EQ(outputOf({"diff", _file, other}), "");
    outputOf({"set", other, "Height", "--at", "1/4", "--value", "9"});
    outputOf({"add", other, "Body", "Angle", "Turn"});
    outputOf({"remove", other, "On"});
    outputOf({"set", other, "Place.X", "--value", "0.25"});
    EXPECT_EQ(outputOf({"diff", _file, other}, 1),
              "changed Height: by up to 6.000000 units, at 1/4 s; number of keypoints 3 became 4\n"
              "changed Body.Place.X: by up to 0.250000 units, at 0/1 s\n"
              "added   Body.Turn\n"
              "removed Body.On\n");
    Json const json = jsonOf({"diff", other, _file}, 1)["differences"];
    ASSERT_EQ(json.size(), 4U);
    EXPECT_EQ(json[0]["worst"], 6.0);
    EXPECT_EQ(json[2]["kind"], "added");
    // What draws the same curve may still be another one.
    std::filesystem::copy_file(_file, other, std::filesystem::copy_options::overwrite_existing);
    outputOf({"set", other, "Height", "--at", "1", "--interpolation", "ease"});
    EXPECT_EQ(outputOf({"diff", _file, other}, 1),
              "changed Height: keypoints or settings of a curve with the same values\n");
    EXPECT_EQ(runLumenkey({"diff", _file, _folder.file("none")}).exit, 2);
    EXPECT_EQ(runLumenkey({"diff", _file}).exit, 2);
}

TEST_F(AuthorVerbsTest, DiffSeesPeaksOfAMomentOrderAndNames) {
    std::string const table = "t,X\n0,0\n0.50101,0\n0.50102,0\n0.50103,0\n1,0\n";
    std::string const flat = _folder.write("flat.csv", table);
    std::string const peak = _folder.write("peak.csv", samples::replaced(table, "0.50102,0", "0.50102,1000"));
    EXPECT_EQ(outputOf({"diff", flat, peak}, 1), "changed X: by up to 1000.000000 units, at 25051/50000 s\n");
    std::string const linear = _folder.file("peak.lumen");
    std::string const steps = _folder.file("steps.lumen");
    outputOf({"convert", peak, linear});
    outputOf({"set", linear, "X", "--at", "0.50101", "--interpolation", "constant", "-o", steps});
    EXPECT_TRUE(
        outputOf({"diff", linear, steps}, 1).starts_with("changed X: by up to 999.000000 units, at "));

    std::string const nan = _folder.write(
        "nan.lumen", samples::replaced(contentOf(linear), "<value>1000</value>", "<value>nan</value>"));
    EXPECT_TRUE(outputOf({"diff", linear, nan}, 1).starts_with("changed X: by up to inf units, at "));

    std::vector<std::string> ages{"15", programPath(), "diff"};
    for (char const* const last : {"1", "2"}) {
        ages.push_back(_folder.write(
            last + std::string(".lumen"),
            samples::documentOf("<parameter factoryID=\"3\"><curve type=\"1\">"
                                "<keypoint><time>0/1</time><value>0</value></keypoint>"
                                "<keypoint><time>9000000000000000000/1</time><value>" +
                                std::string(last) + "</value></keypoint></curve></parameter>")));
    }
    Outcome const farApart = runProgramFile("/usr/bin/timeout", ages);
    EXPECT_EQ(farApart.exit, 1) << "too long";
    EXPECT_EQ(farApart.out, "changed ./: by up to 1.000000 units, at 9000000000000000000/1 s\n");

    std::string const x = "<parameter name=\"X\" id=\"1\" factoryID=\"3\"/>";
    std::string const y = "<parameter name=\"Y\" id=\"2\" factoryID=\"3\"/>";
    std::string const added = "<parameter name=\"New\" id=\"3\" factoryID=\"3\"/>";
    std::string const before =
        _folder.write("1.lumen", documentOf("<parameter name=\"A\">" + x + y + "</parameter>"));
    std::string const after = _folder.write(
        "2.lumen", documentOf("<parameter name=\"\u009B\u202EB\">" + added + y + x + "</parameter>"));
    EXPECT_EQ(outputOf({"diff", before, after}, 1), "changed ./: name A became \\xc2\\x9b\\xe2\\x80\\xaeB\n"
                                                    "added   New\n"
                                                    "changed Y: place among its siblings 2 became 1\n"
                                                    "changed X: place among its siblings 1 became 2\n");
}

TEST_F(AuthorVerbsTest, OtherFilesBecomeDocuments) {
    std::string const motion = _folder.write("m.bvh", samples::kSmallMotion);
    std::string const out = _folder.file("out.lumen");
    std::string const converted = _folder.file("converted.lumen");
    outputOf({"convert", motion, converted});
    EXPECT_EQ(outputOf({"diff", motion, converted}), "") << "with the skeleton, which a motion's tree hasn't";
    EXPECT_EQ(outputOf({"diff", converted, motion}), "");
    outputOf({"add", motion, "Hips", "Double", "Weight", "--value", "2", "-o", out});
    EXPECT_EQ(outputOf({"diff", converted, out}, 1), "added   Hips.Weight\n");
    std::string const table = _folder.write("t.csv", "time,X,Y\n0,1,2\n1,3,4\n");
    outputOf({"remove", table, "Y", "-o", out});
    EXPECT_EQ(outputOf({"diff", table, out}, 1), "removed Y\n");
    EXPECT_NE(complaintOf({"remove", table, "Z", "-o", out}, 2).find("in " + table), std::string::npos);
    std::string const frames = _folder.write(
        "frames.lumen",
        documentOf("<parameter id=\"1\"><parameter name=\"X\" id=\"1\" factoryID=\"3\"><curve type=\"1\">"
                   "<keypoint interpolation=\"1\"><time>0</time><value>1</value></keypoint>"
                   "<keypoint interpolation=\"1\"><time>24</time><value>3</value></keypoint>"
                   "</curve></parameter></parameter>",
                   "4.1"));
    EXPECT_EQ(outputOf({"diff", frames, table, "--frame-rate", "24"}, 1).find("by up to"), std::string::npos);
    EXPECT_NE(complaintOf({"diff", table, motion, "--frame-rate", "24"}, 2).find("neither file is one"),
              std::string::npos);
    for (std::string const& file : {motion, table}) {
        EXPECT_NE(complaintOf({"remove", file, "./1", "--in-place"}, 2).find("write one with -o OUT.lumen"),
                  std::string::npos);
    }
}

TEST_F(AuthorVerbsTest, LockedChannelsStayAsTheyAre) {
    _folder.write("ball.lumen",
                  documentOf("<parameter id=\"1\" factoryID=\"1\"><parameter name=\"Above\" id=\"1\" "
                             "factoryID=\"1\"><parameter name=\"Held\" id=\"1\" factoryID=\"3\">"
                             "<flags>4</flags></parameter></parameter><parameter name=\"Body\" id=\"2\" "
                             "factoryID=\"1\"><flags>4</flags><parameter name=\"X\" id=\"3\" "
                             "factoryID=\"3\"/></parameter></parameter>"));
    expectRefused({"set", "X", "--value", "1"}, "'X' is locked");
    expectRefused({"add", "Body", "Double", "Y"}, "'Body' is locked");
    expectRefused({"remove", "X"}, "'X' is locked");
    expectRefused({"remove", "Body"}, "'Body' is locked");
    expectRefused({"remove", "Above"}, "'Above' is locked, or holds what is");
}

TEST_F(AuthorVerbsTest, UpgradeWritesOldDocumentsInTodaysVersion) {
    std::vector<std::string> files;
    std::string const data = LUMENKEY_TEST_SOURCE_DIR "/tests/data/";
    for (char const* const name : {"version2.lumen", "version3.lumen", "version4.lumen"}) {
        files.push_back(_folder.write(name, contentOf(data + name)));
    }
    std::vector<std::string> arguments{"upgrade", "--frame-rate", "24"};
    arguments.insert(arguments.end(), files.begin(), files.end());
    EXPECT_EQ(outputOf(arguments), files[0] + ": from version 2.1 to 5.13\n" + files[1] +
                                       ": from version 3.1 to 5.13\n" + files[2] +
                                       ": from version 4.1 to 5.13\n");
    for (std::string const& file : files) {
        std::string const text = contentOf(file);
        EXPECT_NE(text.find("<timing in=\"10/24\" out=\"100/24\" offset=\"30/24\"/>"), std::string::npos)
            << text;
        EXPECT_NE(text.find("<time>30/24</time>"), std::string::npos) << text;
        EXPECT_EQ(outputOf({"diff", file, files[0]}), "");
        EXPECT_EQ(outputOf({"upgrade", file}), file + ": version 5.13 already\n");
        EXPECT_EQ(contentOf(file), text);
    }
    arguments.push_back(_folder.file("none.lumen"));
    EXPECT_EQ(runLumenkey(arguments).exit, 1);

    struct {
        char const* version;
        char const* said;
        int exit;
    } const versions[] = {
        {" version=\"abc\"", "F: from version 'abc', read as 5.13, to 5.13\n", 0},
        {" version=\"4\"", "F: from version '4', read as 4.13, to 5.13\n", 0},
        {"", "F: from version none, read as 5.13, to 5.13\n", 0},
        {" version=\"99.1\"",
         "lumenkey: F:1:1: version 99.1 is newer than 5.13, the newest that is written here\n", 1},
    };
    for (auto const& each : versions) {
        std::string const file =
            _folder.write("v.lumen", "<kfml" + std::string(each.version) + "><parameter id=\"1\"/></kfml>");
        Outcome const outcome = runLumenkey({"upgrade", file});
        EXPECT_EQ(outcome.exit, each.exit);
        std::string said = outcome.out + outcome.err;
        EXPECT_EQ(said.replace(said.find(file), file.size(), "F"), each.said);
    }

    // A document that would lose channels stays.
    std::string const before =
        documentOf("<parameter><parameter id=\"1\" factoryID=\"9\"/></parameter>", "4.0");
    std::string const unknown = _folder.write("unknown.lumen", before);
    EXPECT_NE(complaintOf({"upgrade", unknown}).find("would be lost"), std::string::npos);
    EXPECT_EQ(contentOf(unknown), before);
}

} // namespace
} // namespace lumenkey::tools
