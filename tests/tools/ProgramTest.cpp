// The real program, from its arguments to its exit code.

#include "tests/tools/MotionSamples.h"
#include "tests/tools/RunProgram.h"
#include "tests/tools/TestFolder.h"

#include <algorithm>
#include <chrono>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <numbers>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

namespace lumenkey::tools {
namespace {

using samples::kSmallMotion;
using samples::replaced;

class ProgramTest : public ::testing::Test {
protected:
    TestFolder const _folder;
    std::string const _file = _folder.write("small.bvh", kSmallMotion);

    /// Exit code 2, the complaint, the usage of the verb, and nothing on standard output.
    static void expectWrongArguments(std::vector<std::string> const& arguments,
                                     std::string const& complaint) {
        std::string const said = complaintOf(arguments, 2);
        EXPECT_NE(said.find(complaint), std::string::npos) << said;
        EXPECT_NE(said.find("\nusage: lumenkey "), std::string::npos) << said;
    }
};

TEST_F(ProgramTest, InfoTellsWhatAFileHolds) {
    Json const info = jsonOf({"info", _file});
    EXPECT_EQ(info["format"], "BVH");
    EXPECT_EQ(info["channels"], 9);
    EXPECT_EQ(info["keypoints"], 27);
    EXPECT_EQ(info["start"], "0/1");
    EXPECT_EQ(info["duration"], "1/40");
    EXPECT_EQ(info["frameDuration"], "1/120");
    EXPECT_EQ(info["channelNames"][4], "Hips.Xrotation");

    std::string const table = outputOf({"info", _file});
    EXPECT_NE(table.find("\nHips.Yposition          units  90.000000  92.000000\n"), std::string::npos)
        << table;
}

TEST_F(ProgramTest, InfoTellsOfSeveralFilesInTheirOrder) {
    std::string const one = outputOf({"info", _file});
    EXPECT_EQ(outputOf({"info", _file, _file, _file}), one + "\n" + one + "\n" + one);
    Outcome const several = runLumenkey({"info", "none.bvh", _file, _file, "--json"});
    EXPECT_EQ(several.exit, 1);
    Json expected = jsonOf({"info", _file});
    expected["file"] = _file;
    EXPECT_EQ(Json::parse(several.out, nullptr, false), Json({expected, expected}));
}

TEST_F(ProgramTest, SeveralFilesAreOpenAtOnce) {
    if (std::thread::hardware_concurrency() < 2) {
        GTEST_SKIP() << "one processor takes one file at a time";
    }
    std::string const pipes[] = {_folder.file("first.bvh"), _folder.file("second.bvh")};
    for (std::string const& pipe : pipes) {
        ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    }
    auto const feed = [](std::string const& pipe) {
        for (int tries = 0; tries < 2000; ++tries) {
            // Without a reader there is nothing to open.
            if (int const descriptor = ::open(pipe.c_str(), O_WRONLY | O_NONBLOCK); descriptor >= 0) {
                EXPECT_GT(::write(descriptor, kSmallMotion.data(), kSmallMotion.size()), 0);
                ::close(descriptor);
                return true;
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        }
        return false;
    };
    std::jthread const feeder([&] {
        bool const wasOpen = feed(pipes[1]);
        EXPECT_TRUE(wasOpen) << "the second waits for the first";
        feed(pipes[0]);
        wasOpen || feed(pipes[1]);
    });
    EXPECT_EQ(jsonOf({"info", pipes[0], pipes[1]}).size(), 2U);
}

TEST_F(ProgramTest, AWrongArgumentForOneOfSeveralFilesLeavesTheOthers) {
    std::string const old =
        _folder.write("old.lumen", contentOf(LUMENKEY_TEST_SOURCE_DIR "/tests/data/version3.lumen"));
    Outcome const outcome = runLumenkey({"upgrade", _file, old, "--frame-rate", "24"});
    EXPECT_EQ(outcome.exit, 2);
    EXPECT_EQ(outcome.out, old + ": from version 3.1 to 5.13\n");
    EXPECT_EQ(outcome.err,
              "lumenkey: --frame-rate is for documents: '" + _file + "' has a rate of its own\n");
}

TEST_F(ProgramTest, TreeListsNodes) {
    std::string const table = outputOf({"tree", _file, "--depth", "2"});
    EXPECT_TRUE(table.starts_with("name           ID  type         default   at start  keypoints\n"
                                  "small           1  ObjectRoot\n"
                                  "  Hips          1  Folder\n"
                                  "    Xposition   1  Double      0.000000   0.000000          3\n"
                                  "    Yposition   2  Double      0.000000  90.000000          3\n"))
        << table;
    EXPECT_EQ(std::count(table.begin(), table.end(), '\n'), 10);

    Json const nodes = jsonOf({"tree", _file})["nodes"];
    ASSERT_EQ(nodes.size(), 12U);
    EXPECT_EQ(nodes[8],
              Json::parse(R"({"path": "./1/7", "depth": 2, "id": 7, "name": "LeftLeg", "type": "Folder",
                                        "class": "KFChannelFolder"})"));
    EXPECT_EQ(nodes[10]["start"].get<double>(), -45 * (std::numbers::pi / 180));
    EXPECT_EQ(nodes[10]["keypoints"], 3);
}

TEST_F(ProgramTest, NamesThatFitTwiceAreToldOfAndFoldersStandForTheirChannels) {
    Outcome const twice = runLumenkey({"keys", _file, "Xrotation", "--json"});
    EXPECT_EQ(twice.exit, 0);
    EXPECT_EQ(Json::parse(twice.out)["channel"], "Hips.Xrotation");
    EXPECT_EQ(twice.err, "lumenkey: warning: 'Xrotation' names ./1/5, which is taken, and also ./1/7/2\n");
    auto const channelsOf = [this](std::vector<std::string> const& named) {
        std::vector<std::string> arguments{"sample", _file, "--at", "0"};
        arguments.insert(arguments.begin() + 2, named.begin(), named.end());
        Json const sampled = jsonOf(arguments);
        std::string all;
        for (Json const& series : sampled["series"]) {
            all += series["channel"].get<std::string>() + " ";
        }
        return all;
    };
    EXPECT_EQ(channelsOf({"LeftLeg", "./1/2"}),
              "Hips.LeftLeg.Zrotation Hips.LeftLeg.Xrotation Hips.LeftLeg.Yrotation Hips.Yposition ");
    EXPECT_EQ(channelsOf({}), channelsOf({"./"}));
    EXPECT_EQ(channelsOf({}), channelsOf({"Hips"}));
    expectWrongArguments({"keys", _file, "LeftLeg"}, "'LeftLeg' is a folder");
    std::string const many = _folder.file("many.bvh");
    runProgramFile(LUMENKEY_MAKE_MOTION, {many, "--frames", "2", "--joints", "40"});
    expectWrongArguments({"plot", many, "-o", "p.svg"}, "too many to tell apart");
}

TEST_F(ProgramTest, ReadsTheTablesThatItWrites) {
    std::string const written = outputOf({"sample", _file, "--rate", "23.976", "--to", "10", "--csv"});
    std::string const table = _folder.write("table.csv", written);
    Json const info = jsonOf({"info", table});
    EXPECT_EQ(info["format"], "CSV");
    EXPECT_EQ(info["frameDuration"], "125/2997");
    EXPECT_EQ(info["rows"], 240);
    EXPECT_EQ(info["keypoints"], 240 * 9);
    EXPECT_EQ(info["channelNames"][6], "Hips.LeftLeg.Zrotation");
    EXPECT_EQ(outputOf({"sample", table, "--rate", "23.976", "--csv"}), written);
    EXPECT_EQ(outputOf({"sample", table, "--step", "1f", "--csv"}), written);

    // Told by its content where its name doesn't tell.
    std::string const gaps = _folder.write("gaps", "t,X,Y\n0.25,1,\n0.5,2,5\n1.5,,6\n");
    Json const points = jsonOf({"sample", gaps, "X", "--count", "3"})["series"][0]["points"];
    EXPECT_EQ(points[2]["time"], "3/2");
    EXPECT_EQ(points[2]["value"], 2.0);
    EXPECT_EQ(jsonOf({"info", gaps}).contains("frameDuration"), false);
    outputOf({"plot", gaps, "-o", _folder.file("gaps.svg")});
    expectWrongArguments({"sample", gaps, "--at", "1f"}, "aren't frames of one duration");
    std::string const faulty = _folder.write("faulty.csv", "t,X\n0,high\n");
    EXPECT_EQ(complaintOf({"tree", faulty}), "lumenkey: " + faulty + ":2:3: 'high' is not a number\n");
}

TEST_F(ProgramTest, KeysListsKeypoints) {
    Json const keys = jsonOf({"keys", _file, "LeftLeg.Xrotation"});
    EXPECT_EQ(keys["channel"], "Hips.LeftLeg.Xrotation");
    ASSERT_EQ(keys["keypoints"].size(), 3U);
    Json expected = Json::parse(R"({"time": "1/120", "seconds": 0.008333333333333333, "value": 0,
        "interpolation": 1, "in": [0.0, 0.0], "out": [0.0, 0.0], "flags": 0, "enabled": true})");
    expected["value"] = -40 * (std::numbers::pi / 180);
    EXPECT_EQ(keys["keypoints"][1], expected);
}

TEST_F(ProgramTest, SampleReadsAtExactTimes) {
    Json const at = jsonOf(
        {"sample", _file, "Hips.Xposition", "LeftLeg.Zrotation", "--at", "1/240,0.0125,2f", "--slope"});
    ASSERT_EQ(at["series"].size(), 2U);
    EXPECT_EQ(at["series"][1]["channel"], "Hips.LeftLeg.Zrotation");
    Json const& points = at["series"][0]["points"];
    ASSERT_EQ(points.size(), 3U);
    EXPECT_EQ(points[0]["time"], "1/240");
    EXPECT_EQ(points[1]["time"], "1/80");
    EXPECT_EQ(points[2]["time"], "1/60");
    EXPECT_DOUBLE_EQ(points[0]["value"].get<double>(), 0.5);
    EXPECT_DOUBLE_EQ(points[1]["value"].get<double>(), 2.5);
    EXPECT_EQ(points[2]["value"].get<double>(), 4);
    EXPECT_NEAR(points[1]["slope"].get<double>(), 360, 1e-6);

    auto const timesOf = [this](std::vector<std::string> arguments) {
        arguments.insert(arguments.begin(), {"sample", _file, "Hips.Xposition"});
        std::string all;
        Json const sampled = jsonOf(arguments);
        for (Json const& point : sampled["series"][0]["points"]) {
            all += point["time"].get<std::string>() + (point.contains("slope") ? "!" : " ");
        }
        return all;
    };
    EXPECT_EQ(timesOf({"--to", "0.1", "--step", "1/24"}), "0/1 1/24 1/12 ");
    EXPECT_EQ(timesOf({"--count", "3"}), "0/1 1/120 1/60 ");
    EXPECT_EQ(timesOf({"--from", "-1/2", "--count", "1"}), "-1/2 ");
}

TEST_F(ProgramTest, SampleWritesTheSameNumbersInEveryForm) {
    std::string const quoted = _folder.write("quoted.bvh", replaced(kSmallMotion, "Hips", "Hips, \"big\""));
    std::vector<std::string> arguments{
        "sample", quoted, "Hips, \"big\".Yposition", "LeftLeg.Yrotation", "--step", "1/600", "--slope"};
    Json const json = jsonOf(arguments);
    arguments.push_back("--csv");
    std::istringstream lines(outputOf(arguments));
    std::string line;
    std::getline(lines, line);
    EXPECT_EQ(line, "time,seconds,\"Hips, \"\"big\"\".Yposition\",\"Hips, \"\"big\"\".Yposition slope\","
                    "\"Hips, \"\"big\"\".LeftLeg.Yrotation\",\"Hips, \"\"big\"\".LeftLeg.Yrotation slope\"");
    for (std::size_t i = 0; i < 11; ++i) {
        Json const& first = json["series"][0]["points"][i];
        Json const& second = json["series"][1]["points"][i];
        std::getline(lines, line);
        EXPECT_EQ(Json::parse("[\"" + line.insert(line.find(','), "\"") + "]"),
                  (Json{first["time"], first["seconds"], first["value"], first["slope"], second["value"],
                        second["slope"]}));
    }
    EXPECT_FALSE(std::getline(lines, line));
}

TEST_F(ProgramTest, PlotAndGalleryWritePictures) {
    struct {
        char const* name;
        char const* start;
    } const pictures[] = {{"p.svg", "<?xml"}, {"p.png", "\x89PNG"}, {"p.pdf", "%PDF"}};
    for (auto const& picture : pictures) {
        std::string const file = _folder.file(picture.name);
        EXPECT_EQ(outputOf({"plot", _file, "Hips.Yposition", "Hips.Xrotation", "-o", file, "--from", "-0.01",
                            "--to", "6f"}),
                  "");
        EXPECT_TRUE(contentOf(file).starts_with(picture.start));
        outputOf({"gallery", "-o", file});
        EXPECT_TRUE(contentOf(file).starts_with(picture.start));
        EXPECT_GT(contentOf(file).size(), 10'000U);
    }
    EXPECT_EQ(_folder.entryCount(), 4U) << "a temporary was left behind";
}

TEST_F(ProgramTest, PlotDrawsAnySoundFile) {
    std::string const picture = _folder.file("p.svg");
    struct {
        char const* what;
        std::string text;
    } const cases[] = {
        {"no frames", std::string(kSmallMotion).substr(0, kSmallMotion.find("Frames: 3")) +
                          "Frames: 0\nFrame Time: 0.04\n"},
        {"one frame", replaced(std::string(kSmallMotion).substr(0, kSmallMotion.find("1 91.5")), "Frames: 3",
                               "Frames: 1")},
        {"huge numbers", replaced(replaced(kSmallMotion, "91.5", "1.7e308"), "92", "-1.7e308")},
        {"a name that is no UTF-8", replaced(kSmallMotion, "LeftLeg", "Left\xFFLeg\x01")},
    };
    for (auto const& each : cases) {
        SCOPED_TRACE(each.what);
        std::string const file = _folder.write("odd\xFF.bvh", each.text);
        outputOf({"plot", file, "Hips.Yposition", "-o", picture});
        Json const json = jsonOf({"sample", file, "Hips.Yposition", "--count", "7"});
        EXPECT_EQ(json["series"][0]["points"].size(), 7U);
    }
}

TEST_F(ProgramTest, FaultyFilesExitWithOneAndOneLine) {
    std::string const picture = _folder.file("p.svg");
    std::string const faulty = _folder.write("faulty.bvh", replaced(kSmallMotion, "91.5", "high"));
    std::string const line = "lumenkey: " + faulty + ":20:3: 'high' is not a number\n";
    EXPECT_EQ(complaintOf({"info", faulty, "--json"}), line);
    EXPECT_EQ(complaintOf({"sample", faulty, "Hips.Xposition", "--count", "2", "--csv"}), line);
    EXPECT_EQ(complaintOf({"plot", faulty, "Hips.Xposition", "-o", picture}), line);
    EXPECT_FALSE(std::filesystem::exists(picture));

    EXPECT_EQ(complaintOf({"info", _folder.file("none.bvh")}),
              "lumenkey: " + _folder.file("none.bvh") + ":1:1: No such file or directory\n");
}

TEST_F(ProgramTest, WrongArgumentsExitWithTwoAndTheUsage) {
    expectWrongArguments({}, "subcommand is required");
    expectWrongArguments({"dance"}, "there is no verb 'dance'");
    expectWrongArguments({"smaple", _file}, "did you mean 'sample'?");
    expectWrongArguments({"info"}, "FILE is required");
    expectWrongArguments({"info", _file, "--loud"}, "--loud");
    expectWrongArguments({"keys", _file, "hips.xposition"}, "there is no channel 'hips.xposition' in " +
                                                                _file + "; did you mean 'Hips.Xposition'?");
    expectWrongArguments({"tree", _file, "--depth", "-1"}, "must be a whole number from 0 on: '-1'");
    expectWrongArguments({"gallery"}, "--output is required");
    struct {
        std::vector<std::string> arguments;
        char const* complaint;
    } const cases[] = {
        {{"sample"}, "say at which times"},
        {{"sample", "--at", "soon"}, "'soon' is no time"},
        {{"sample", "--at", "0", "--step", "1"}, "--at"},
        {{"sample", "--rate", "0"}, "'0' is no rate"},
        {{"sample", "--rate", "24", "--step", "1"}, "--rate"},
        {{"sample", "--step", "-1/24"}, "--step must be above 0"},
        {{"sample", "--from", "2", "--to", "1", "--count", "2"}, "--to lies before --from"},
        {{"sample", "--step", "1/1000000000"}, "more than 10000000 values"},
        {{"sample", "--to", "9000000000000000000", "--step", "1/1000000000"}, "more than 10000000 values"},
        {{"sample", "--count", "18446744073709551615"}, "more than 10000000 values"},
        {{"sample", "--count", "0"}, "--count: must be a whole number from 1 on: '0'"},
        {{"sample", "--count", "2", "--csv", "--json"}, "--csv"},
        {{"plot", "-o", "p.bmp"}, "must end in .svg, .png or .pdf"},
        {{"plot", "-o", "p.svg", "--width", "1"}, "--width"},
        {{"plot", "-o", "p.svg", "--from", "1", "--to", "1"}, "--to must lie"},
    };
    for (auto const& each : cases) {
        std::vector<std::string> arguments = each.arguments;
        arguments.insert(arguments.begin() + 1, {_file, "Hips.Xposition"});
        expectWrongArguments(arguments, each.complaint);
    }
}

TEST_F(ProgramTest, FailuresToWriteExitWithOne) {
    Outcome const full = runLumenkey({"info", _file}, "/dev/full");
    EXPECT_EQ(full.exit, 1);
    EXPECT_EQ(full.err, "lumenkey: standard output: No space left on device\n");
    EXPECT_EQ(runLumenkey({"diff", _file, _folder.write("other.csv", "t,X\n")}, "/dev/full").exit, 2);

    std::string const nowhere = _folder.file("missing/p.svg");
    EXPECT_EQ(complaintOf({"gallery", "-o", nowhere}),
              "lumenkey: " + nowhere + ": No such file or directory\n");

    std::string const script = "'" + programPath() + "' info '" + _file + "'";
    Outcome const closed =
        runProgramFile("/bin/sh", {"-c", "(sleep 0.2; " + script + "; echo \"exit $?\" >&2) | true"});
    EXPECT_EQ(closed.err, "lumenkey: standard output: Broken pipe\nexit 1\n");
}

// A sanitizer takes more address space by itself than the limit leaves.
#ifndef __SANITIZE_ADDRESS__
TEST_F(ProgramTest, TellsWhereMemoryIsOut) {
    std::string const large = _folder.write("large.csv", "t,X\n");
    std::filesystem::resize_file(large, 1'500'000'000);
    auto const limited = [](std::vector<std::string> arguments) {
        arguments.insert(arguments.begin(), {"-c", "ulimit -v 1000000; exec \"$0\" \"$@\"", programPath()});
        return runProgramFile("/bin/sh", arguments);
    };
    Outcome const diff = limited({"diff", _file, large});
    EXPECT_EQ(diff.exit, 2) << "1 says that they differ";
    EXPECT_EQ(diff.err, "lumenkey: out of memory\n");
    EXPECT_EQ(limited({"info", _file, large}).err, "lumenkey: " + large + ": out of memory\n");
}
#endif

TEST_F(ProgramTest, EmptyTextsAreWrongArguments) {
    std::string const document = _folder.file("small.lumen");
    outputOf({"convert", _file, document});
    std::string const before = contentOf(document);
    for (std::vector<std::string> const& arguments :
         std::vector<std::vector<std::string>>{{"scale", document, "--in-place", "--factor", ""},
                                               {"scale", document, "--in-place", "--factor="},
                                               {"bake", document, "--in-place", "--from", ""},
                                               {"set", document, "Offset.X", "--value", "1", "-o", ""},
                                               {"upgrade", document, "-o", ""},
                                               {"add", document, "./", "Double", "", "--value", "1"},
                                               {"new", _folder.file("new.lumen"), "--name", ""},
                                               {"hash", document, ""},
                                               {"info", document, "--frame-rate", ""}}) {
        complaintOf(arguments, 2);
        EXPECT_EQ(contentOf(document), before) << Json(arguments);
    }
    expectWrongArguments({"scale", document, "--in-place", "--factor", ""}, "--factor: it is empty");
    EXPECT_FALSE(std::filesystem::exists(_folder.file("new.lumen")));
}

TEST_F(ProgramTest, EveryVerbHelpsWithAnExample) {
    // What the examples speak of.
    runProgramFile(LUMENKEY_MAKE_MOTION, {_folder.file("walk.bvh"), "--frames", "300"});
    _folder.write("old.lumen", contentOf(LUMENKEY_TEST_SOURCE_DIR "/tests/data/version3.lumen"));
    outputOf({"convert", _folder.file("walk.bvh"), _folder.file("walk.lumen")});
    outputOf({"convert", _folder.file("walk.bvh"), _folder.file("edited.lumen")});
    // In this order one makes what another takes: `add` makes the height that `set` keys.
    for (std::string const verb :
         {"info",    "tree",   "keys",  "sample",  "plot",    "gallery",    "simplify", "bake", "smooth",
          "reverse", "offset", "scale", "retime",  "convert", "new",        "add",      "set",  "hash",
          "remove",  "diff",   "check", "upgrade", "types",   "completion", "manual"}) {
        std::string const help = outputOf({verb, "--help"});
        EXPECT_NE(help.find("Usage: lumenkey " + verb), std::string::npos) << help;
        std::string const mark = "Example: lumenkey ";
        std::size_t const example = help.find(mark + verb);
        ASSERT_NE(example, std::string::npos) << help;
        std::string const command =
            help.substr(example + mark.size(), help.find('\n', example) - example - mark.size());
        Outcome const run = runProgramFile(
            "/bin/sh", {"-c",
                        "cd \"$1\"; export HOME=\"$1\"; mkdir -p .local/share/bash-completion/completions; "
                        "man() { cat; }; \"$0\" " +
                            command,
                        programPath(), _folder.path().string()});
        EXPECT_EQ(run.exit, 0) << command << "\n" << run.err;
        if (verb == "new") {
            outputOf({"add", _folder.file("ball.lumen"), "./", "Folder", "Body"});
            outputOf({"add", _folder.file("ball.lumen"), "./", "Folder", "Shadow"});
        }
    }
    EXPECT_NE(runLumenkey({"--help"}).out.find("sample"), std::string::npos);
    EXPECT_TRUE(runLumenkey({"--version"}).out.starts_with("lumenkey "));
}

TEST_F(ProgramTest, ManualAndCompletionAreMadeOfTheSameTexts) {
    std::string const manual = runLumenkey({"manual"}).out;
    std::string const script = _folder.write("completion", runLumenkey({"completion", "bash"}).out);
    EXPECT_TRUE(manual.starts_with(".TH LUMENKEY 1"));
    EXPECT_EQ(manual.find("\n'"), std::string::npos) << "a line that begins like a request of the formatter";
    for (char const* const word :
         {"Tell how two files differ", "\\-\\-in\\-place", "lumenkey diff A B", "\\-\\-version"}) {
        EXPECT_NE(manual.find(word), std::string::npos) << word;
    }
    auto const completionsOf = [&](std::string const& words, int count) {
        std::string const line = ". '" + script + "'; COMP_WORDS=(" + words +
                                 "); COMP_CWORD=" + std::to_string(count) +
                                 "; _lumenkey; echo \"${COMPREPLY[*]}\"";
        return runProgramFile("/bin/bash", {"-c", line}).out;
    };
    EXPECT_EQ(completionsOf("lumenkey sm", 1), "smooth\n");
    EXPECT_EQ(completionsOf("lumenkey set f.lumen --in", 3), "--interpolation --in-place\n");
    EXPECT_EQ(completionsOf("lumenkey set f.lumen X --interpolation ca", 5), "catmull-rom\n");
    EXPECT_EQ(completionsOf("lumenkey add f.lumen ./ Dou", 4), "Double\n");
    EXPECT_EQ(completionsOf("lumenkey info '" + _folder.file("sma") + "'", 2), _file + "\n");
}

TEST_F(ProgramTest, TypesListsAllClasses) {
    Json const types = jsonOf({"types"})["types"];
    auto const found =
        std::find_if(types.begin(), types.end(), [](Json const& type) { return type["name"] == "Percent"; });
    ASSERT_NE(found, types.end());
    EXPECT_EQ(*found, Json::parse(R"({"name": "Percent", "class": "KFChannelPercent",
        "uuid": "27F3EE8B-2292-11D7-925A-00039389B702", "superclass": "KFChannel", "least": 0.0, "greatest": 1.0})"));
    EXPECT_NE(runLumenkey({"types"}).out.find("\nAngle "), std::string::npos);
}

TEST_F(ProgramTest, WorksOnMotionThatItsGeneratorMakes) {
    auto const make = [this](std::string const& name, std::vector<std::string> arguments) {
        arguments.insert(arguments.begin(), _folder.file(name));
        Outcome const made = runProgramFile(LUMENKEY_MAKE_MOTION, arguments);
        EXPECT_EQ(made.exit, 0) << made.err;
        return arguments.front();
    };
    std::string const first = make("first.bvh", {"--frames", "60", "--seed", "3"});
    EXPECT_EQ(contentOf(make("second.bvh", {"--frames", "60", "--seed", "3"})), contentOf(first));
    Json const info = jsonOf({"info", first});
    EXPECT_EQ(info["frameDuration"], "1/120");
    EXPECT_EQ(info["channels"], 54);
    std::string const large = make("large.bvh", {"--frames", "30", "--joints", "200", "--rate", "25"});
    EXPECT_EQ(jsonOf({"info", large})["channels"], 603);
    // However many keypoints there are, a picture has only so many pixels.
    std::string const dense = make("dense.bvh", {"--frames", "30000", "--joints", "1"});
    outputOf({"plot", dense, "Hips.Yposition", "-o", _folder.file("dense.svg")});
    EXPECT_LT(std::filesystem::file_size(_folder.file("dense.svg")), 300'000U);
    EXPECT_EQ(runProgramFile(LUMENKEY_MAKE_MOTION, {"--frames"}).exit, 2);
    EXPECT_EQ(runProgramFile(LUMENKEY_MAKE_MOTION, {_folder.file("missing/m.bvh")}).exit, 1);
}

} // namespace
} // namespace lumenkey::tools
