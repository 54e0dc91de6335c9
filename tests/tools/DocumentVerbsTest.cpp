// The program on channel documents: reading them, and converting to them and back.

#include "tests/tools/DocumentSamples.h"
#include "tests/tools/MotionSamples.h"
#include "tests/tools/RunProgram.h"
#include "tests/tools/TestFolder.h"
#include "tools/import/MotionFile.h"

#include <gtest/gtest.h>

namespace lumenkey::tools {
namespace {

using samples::documentOf;
using samples::kSmallMotion;

constexpr char const* kOldDocument = LUMENKEY_TEST_SOURCE_DIR "/tests/data/version3.lumen";

class DocumentVerbsTest : public ::testing::Test {
protected:
    TestFolder const _folder;
    std::string const _motion = _folder.write("small.bvh", kSmallMotion);
    std::string const _document = _folder.file("small.lumen");
};

TEST_F(DocumentVerbsTest, MotionsAndTablesComeBackFromDocuments) {
    outputOf({"convert", _motion, _document});
    std::string const back = _folder.file("back.bvh");
    outputOf({"convert", _document, back});
    EXPECT_EQ(samples::described(readMotionFile(back)), samples::described(readMotionFile(_motion)));

    // The same keypoints as a table, whichever way; and a document is written as it was read.
    std::string const direct = _folder.file("direct.csv");
    std::string const around = _folder.file("around.csv");
    outputOf({"convert", _motion, direct});
    outputOf({"convert", _document, around});
    EXPECT_EQ(contentOf(around), contentOf(direct));
    std::string const table =
        _folder.write("t.csv", "time,seconds,A,B\n0/1,0,1,\n1/3,0.3333333333333333,,2\n");
    outputOf({"convert", table, _folder.file("t.lumen")});
    outputOf({"convert", _folder.file("t.lumen"), _folder.file("t2.lumen")});
    outputOf({"convert", _folder.file("t2.lumen"), _folder.file("t3.lumen")});
    EXPECT_EQ(contentOf(_folder.file("t3.lumen")), contentOf(_folder.file("t2.lumen")));
    outputOf({"convert", _folder.file("t3.lumen"), _folder.file("t2.csv")});
    EXPECT_EQ(contentOf(_folder.file("t2.csv")), contentOf(table));
    EXPECT_NE(complaintOf({"convert", _folder.file("t.lumen"), back}).find("'A' stands in no joint"),
              std::string::npos);
    EXPECT_EQ(readMotionFile(back).values, readMotionFile(_motion).values)
        << "a failure has replaced the file";
}

TEST_F(DocumentVerbsTest, ZerosKeepTheirSigns) {
    std::string const zeros =
        _folder.write("zeros.lumen", documentOf("<parameter id=\"1\" factoryID=\"1\"><parameter id=\"2\" "
                                                "factoryID=\"3\"><curve type=\"1\" value=\"-0\"/>"
                                                "</parameter><parameter id=\"3\" factoryID=\"3\"><curve "
                                                "type=\"1\" default=\"-0\"/></parameter></parameter>"));
    outputOf({"convert", zeros, _document});
    std::string const once = contentOf(_document);
    EXPECT_NE(once.find("default=\"0\" value=\"-0\""), std::string::npos) << once;
    EXPECT_NE(once.find("default=\"-0\" value=\"0\""), std::string::npos) << once;
    outputOf({"convert", _document, _document});
    EXPECT_EQ(contentOf(_document), once);
}

TEST_F(DocumentVerbsTest, MotionsOfAnyFrameTimeComeBackFromDocuments) {
    struct {
        char const* frameTime;
        std::size_t frames;
        char const* written;
    } const cases[] = {
        {".0083333", 3, "0.00833333"},
        {"0.008", 3, "0.00833333"},
        {"0.0333333", 2, "0.03333333"},
        {"0.041708", 3, "0.0417083"},
        {"0.1", 3, "0.10"},
        {"0.0005", 3, "0.0005"},
        {"2.5", 2, "2.50"},
        {"0.03300", 1, "0.0330"},
        {"0.0123456789123", 3, "0.0123456791"},
        {"0.02", 1, "0.02"},
        {"0.00000002", 3, "0.00000002"},
        {"0.04", 0, "0.04"},
    };
    std::string const back = _folder.file("back.bvh");
    for (auto const& each : cases) {
        SCOPED_TRACE(each.frameTime);
        std::string text = samples::replaced(kSmallMotion, ".0083333", each.frameTime);
        text = samples::replaced(text, "OFFSET 3.5 0 0", "OFFSET 3.5 1e-9 0");
        text = samples::replaced(text, "Frames: 3", "Frames: " + std::to_string(each.frames));
        for (std::size_t lines = 3; lines > each.frames; --lines) {
            text.erase(text.rfind('\n', text.size() - 2) + 1);
        }
        std::string const motion = _folder.write("any.bvh", text);
        outputOf({"convert", motion, _document});
        outputOf({"convert", _document, back});
        EXPECT_EQ(samples::described(readMotionFile(back)), samples::described(readMotionFile(motion)));
        EXPECT_NE(contentOf(back).find("Frame Time: " + std::string(each.written) + "\n"), std::string::npos)
            << contentOf(back);
    }
    // Without frames, but with a pose.
    outputOf({"set", _document, "Hips.Xposition", "--value", "5"});
    outputOf({"convert", _document, back});
    EXPECT_EQ(jsonOf({"info", back})["frames"], 1);
    // Frames last as long when few keypoints are left, and as long as a user says.
    outputOf({"convert", _motion, _document});
    outputOf({"simplify", _document, "--tolerance", "1000", "--in-place"});
    EXPECT_EQ(jsonOf({"info", _document})["frameDuration"], "1/120");
    outputOf({"set", _document, "Frame Time", "--value", "0.5"});
    EXPECT_EQ(jsonOf({"info", _document})["frameDuration"], "1/2");
}

TEST_F(DocumentVerbsTest, AnyDocumentMakesATableThatCanBeRead) {
    std::string const odd = _folder.write(
        "odd.lumen",
        documentOf(
            "<parameter id=\"1\" factoryID=\"1\"><parameter id=\"2\" factoryID=\"3\"><curve "
            "type=\"1\"><keypoint interpolation=\"1\"><time>0/1</time><value>2</value></keypoint>"
            "<keypoint><time>1/1</time><value>inf</value></keypoint></curve></parameter></parameter>"));
    std::string const table = _folder.file("odd.csv");
    outputOf({"convert", odd, table});
    EXPECT_EQ(contentOf(table), "time,seconds,\"\"\n0/1,0,2\n1/1,1,\n");
    EXPECT_EQ(jsonOf({"info", table})["channelNames"], Json({""}));
    std::string const sampled = outputOf({"sample", odd, "--at", "0,1", "--csv"});
    EXPECT_EQ(outputOf({"sample", _folder.write("sampled.csv", sampled), "--at", "0", "--csv"}),
              "time,seconds,\"\"\n0/1,0,2\n");
}

TEST_F(DocumentVerbsTest, NoTableIsWrittenThatCanNotBeRead) {
    auto const keypointAt = [](std::string const& time) {
        return "<parameter name=\"X\" id=\"2\" factoryID=\"3\"><curve type=\"1\"><keypoint><time>" + time +
               "</time><value>1</value></keypoint></curve></parameter>";
    };
    struct {
        std::string children;
        char const* complaint;
    } const cases[] = {
        {"", "it has no channels"},
        {keypointAt("indefinite"), "a table can't hold the time of a keypoint of 'X'"},
        {keypointAt("1/2@3"), "a table can't hold the time of a keypoint of 'X'"},
        {"<parameter name=\"\\x00\" id=\"2\" factoryID=\"3\"/>", "a table can't hold the name"},
    };
    std::string const table = _folder.write("t.csv", "old");
    for (auto const& each : cases) {
        std::string const document = _folder.write(
            "odd.lumen", documentOf("<parameter name=\"R\" id=\"1\">" + each.children + "</parameter>"));
        EXPECT_NE(complaintOf({"convert", document, table}).find(each.complaint), std::string::npos)
            << each.complaint;
        EXPECT_EQ(contentOf(table), "old");
    }
}

TEST_F(DocumentVerbsTest, ReadingVerbsTakeDocuments) {
    outputOf({"convert", _motion, _document});
    Json const info = jsonOf({"info", _document});
    EXPECT_EQ(info["format"], "document");
    EXPECT_EQ(info["version"], "5.13");
    EXPECT_EQ(info["keypoints"], 27);
    EXPECT_EQ(info["frameDuration"], "1/120");
    EXPECT_EQ(info["bytes"], std::filesystem::file_size(_document));
    std::string classes;
    for (Json const& factory : info["factories"]) {
        classes += factory["class"].get<std::string>() + " ";
    }
    EXPECT_EQ(classes, "KFChannelAngle KFChannel3D KFChannelFolder KFChannelObjectRootBase KFChannelDouble ");
    for (std::vector<std::string> const& verb : {std::vector<std::string>{"keys", "LeftLeg.Xrotation"},
                                                 {"keys", "./1/2"},
                                                 {"sample", "--rate", "500"},
                                                 {"sample", "Hips", "--at", "1f,0.0125", "--slope"}}) {
        // Offsets come last in a document, and then its frame time.
        std::vector<std::string> arguments{verb[0], _motion};
        arguments.insert(arguments.end(), verb.begin() + 1, verb.end());
        Json const ofMotion = jsonOf(arguments);
        arguments[1] = _document;
        Json ofDocument = jsonOf(arguments);
        if (verb[0] == "sample") {
            Json& series = ofDocument["series"];
            std::erase_if(series.get_ref<Json::array_t&>(), [](Json const& one) {
                std::string const channel = one["channel"];
                return channel == "Frame Time" || channel.find("Offset") != std::string::npos;
            });
        }
        EXPECT_EQ(ofDocument, ofMotion) << Json(verb);
    }
    EXPECT_EQ(jsonOf({"keys", _document, "./1/7/4/1"})["keypoints"].size(), 0U);
    outputOf({"plot", _document, "Hips.Offset", "Hips.Yposition", "-o", _folder.file("p.svg")});

    // Told by its content; old ones count frames.
    std::string const nameless = _folder.write("nameless", "\xEF\xBB\xBF" + contentOf(kOldDocument));
    EXPECT_EQ(jsonOf({"keys", nameless, "Opacity"})["keypoints"][1]["time"], "1/1");
    EXPECT_EQ(jsonOf({"keys", kOldDocument, "Opacity", "--frame-rate", "24"})["keypoints"][1]["time"], "5/4");
    EXPECT_NE(complaintOf({"info", _motion, "--frame-rate", "24"}, 2).find("has a rate of its own"),
              std::string::npos);
}

TEST_F(DocumentVerbsTest, FaultyDocumentsAreToldWithTheirPlace) {
    struct {
        std::string text;
        char const* complaint;
    } const cases[] = {
        {"<kfml>\n <parameter></kfml>", ":2:15: mismatched tag"},
        {"", ":1:1: no element found"},
        {"<kfml><factory id=\"1\" uuid=\"00000000-0000-0000-0000-000000000001\"><description>Odd"
         "</description></factory><parameter name=\"X\" factoryID=\"1\"/></kfml>",
         "the class of the channel 'X' is unknown: factory 1, 00000000-0000-0000-0000-000000000001 ('Odd')"},
        {"<kfml><parameter factoryID=\"7\"/></kfml>", "factory 7, which the document doesn't list"},
        {"<kfml><parameter/><parameter/></kfml>", "a second channel"},
        {"<!DOCTYPE kfml><kfml/>", "document type"},
    };
    for (auto const& each : cases) {
        std::string const file = _folder.write("faulty.lumen", each.text);
        std::string const complaint = complaintOf({"tree", file});
        EXPECT_TRUE(complaint.starts_with("lumenkey: " + file + ":")) << complaint;
        EXPECT_NE(complaint.find(each.complaint), std::string::npos) << complaint;
    }
}

} // namespace
} // namespace lumenkey::tools
