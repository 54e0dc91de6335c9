// The verbs that write, from their arguments to the file.

#include "tests/tools/MotionSamples.h"
#include "tests/tools/RunProgram.h"
#include "tests/tools/TestFolder.h"
#include "tools/import/CsvFile.h"
#include "tools/import/MotionFile.h"

#include <cmath>
#include <gtest/gtest.h>
#include <locale>

namespace lumenkey::tools {
namespace {

using samples::kSmallMotion;

class EditVerbsTest : public ::testing::Test {
protected:
    TestFolder const _folder;
    std::string const _out = _folder.file("out.csv");

    Outcome edit(std::string const& file, std::vector<std::string> arguments,
                 std::string const& target = "") const {
        arguments.insert(arguments.begin() + 1, {file, "-o", target.empty() ? _out : target});
        return runLumenkey(arguments);
    }

    Json editToJson(std::string const& file, std::vector<std::string> arguments) const {
        arguments.insert(arguments.begin() + 1, {file, "-o", _out});
        return jsonOf(arguments);
    }

    /// `time=values` for each row of the output, without what is empty.
    std::string rowsOfOutput() const {
        std::istringstream lines(contentOf(_out));
        std::string line;
        std::string rows;
        std::getline(lines, line);
        while (std::getline(lines, line)) {
            std::size_t const comma = line.find(',');
            rows += line.substr(0, comma) + "=" + line.substr(line.find(',', comma + 1) + 1) + " ";
        }
        return rows;
    }
};

TEST_F(EditVerbsTest, KeypointsMoveInTimeAndValue) {
    std::string const file = _folder.write("f.csv", "t,X,Y\n0,0,5\n1,2,\n2,4,7\n3,6,1\n4,8,\n");
    struct {
        std::vector<std::string> arguments;
        char const* rows;
    } const cases[] = {
        {{"offset", "--value", "1"}, "0/1=1,6 1/1=3, 2/1=5,8 3/1=7,2 4/1=9, "},
        {{"offset", "X", "--value", "-1", "--from", "1", "--to", "2"},
         "0/1=0,5 1/1=1, 2/1=3,7 3/1=6,1 4/1=8, "},
        {{"offset", "--by", "-1/3"}, "-1/3=0,5 2/3=2, 5/3=4,7 8/3=6,1 11/3=8, "},
        // What lies where the stretch comes to gives way, on either side.
        {{"offset", "X", "--by", "2", "--to", "1"}, "0/1=,5 2/1=0,7 3/1=2,1 4/1=8, "},
        {{"offset", "X", "--by", "-3/2", "--from", "3f"}, "0/1=0,5 1/1=2, 3/2=6, 2/1=,7 5/2=8, 3/1=,1 "},
        {{"scale", "--factor", "-0.5"}, "0/1=-0,-2.5 1/1=-1, 2/1=-2,-3.5 3/1=-3,-0.5 4/1=-4, "},
        {{"scale", "X", "--factor", "3", "--to", "2.5"}, "0/1=0,5 1/1=6, 2/1=12,7 3/1=6,1 4/1=8, "},
        {{"retime", "--factor", "1/3", "--about", "3"}, "2/1=0,5 7/3=2, 8/3=4,7 3/1=6,1 10/3=8, "},
        {{"retime", "X", "--factor", "2", "--from", "1", "--to", "2"},
         "0/1=0,5 1/1=2, 2/1=,7 3/1=4,1 4/1=8, "},
        // About the middle of the stretch, also where a channel doesn't fill it.
        {{"reverse"}, "0/1=8, 1/1=6,1 2/1=4,7 3/1=2, 4/1=0,5 "},
        {{"reverse", "--from", "1", "--to", "3.5"}, "0/1=0,5 3/2=6,1 5/2=4,7 7/2=2, 4/1=8, "},
    };
    for (auto const& each : cases) {
        EXPECT_EQ(edit(file, each.arguments).exit, 0);
        EXPECT_EQ(rowsOfOutput(), each.rows) << Json(each.arguments);
    }
}

TEST_F(EditVerbsTest, ReportsWhatChanged) {
    std::string const file = _folder.write("f.csv", "t,X,Y\n0,0,1\n1,2,1\n2,0,1\n");
    Json const json = editToJson(file, {"scale", "X", "--factor", "3", "--from", "1/2"});
    EXPECT_EQ(json["verb"], "scale");
    EXPECT_EQ(json["keypointsBefore"], 3);
    EXPECT_EQ(json["keypointsAfter"], 3);
    EXPECT_EQ(json["from"], "1/2");
    EXPECT_EQ(json["channels"], Json::parse(R"([{"channel": "X", "unit": "units", "keypointsBefore": 3,
        "keypointsAfter": 3, "largestChange": 4.0, "at": "1/1"}])"));

    // Pages show the rest of what is written without --json.
    std::string const picture = _folder.file("p.svg");
    Outcome const table = edit(file, {"simplify", "Y", "--tolerance", "0", "--plot", picture});
    EXPECT_EQ(table.exit, 0) << table.err;
    EXPECT_NE(table.out.find(_out + ", 3 rows from 0/1 s on\n"), std::string::npos) << table.out;
    std::string const drawn = contentOf(picture);
    ASSERT_EQ(edit(file, {"scale", "Y", "--factor", "1", "--plot", picture}).exit, 0);
    EXPECT_TRUE(drawn.starts_with("<?xml"));
    EXPECT_NE(contentOf(picture), drawn);
}

/// A line, a wave, a wave that jumps, and noise that nothing can draw with fewer keypoints; 30 rows a second.
std::string wavyTable() {
    std::ostringstream text;
    text.imbue(std::locale::classic());
    text.precision(17);
    text << "t,line,wave,jumps,noise\n";
    unsigned noise = 1;
    for (int i = 0; i <= 90; ++i) {
        double const wave = std::sin(i * 0.1);
        noise = noise * 1'103'515'245U + 12'345U;
        text << i << "/30," << 0.5 * i << "," << wave << "," << (i < 40 ? wave : wave + 3) << ","
             << noise / 4'294'967'296.0 << "\n";
    }
    return text.str();
}

TEST_F(EditVerbsTest, SimplifyKeepsToItsToleranceAndItsStretch) {
    std::string const file = _folder.write("f.csv", wavyTable());
    CsvFile const before = readCsvFile(file);
    double const tolerance = 0.01;
    auto const keypoints = [](Json const& json, std::size_t channel) {
        return json["channels"][channel]["keypointsAfter"].get<int>();
    };
    Json const whole = editToJson(file, {"simplify", "--tolerance", "0.01"});
    EXPECT_EQ(keypoints(whole, 0), 2);
    EXPECT_LT(keypoints(whole, 1), 12);
    EXPECT_LT(keypoints(whole, 2), 30);
    EXPECT_EQ(keypoints(whole, 3), 91);
    for (Json const& channel : whole["channels"]) {
        EXPECT_LE(channel["worstError"].get<double>(), tolerance);
    }
    CsvFile const after = readCsvFile(_out);
    ASSERT_EQ(after.times, before.times);
    for (std::size_t i = 0; i < before.values.size(); ++i) {
        EXPECT_NEAR(after.values[i], before.values[i], i % 4 == 3 ? 0 : tolerance);
    }

    // Nothing outside the stretch changes, not even a keypoint next to it.
    for (char const* const verb : {"simplify", "bake", "smooth"}) {
        SCOPED_TRACE(verb);
        std::vector<std::string> arguments{verb, "wave", "--from", "31f", "--to", "60f", "--step", "2f"};
        if (verb == std::string("simplify")) {
            arguments.insert(arguments.end(), {"--tolerance", "0.01"});
        }
        Json const part = editToJson(file, arguments);
        EXPECT_LT(part["keypointsAfter"], 91);
        EXPECT_GE(part["keypointsAfter"], 61);
        CsvFile const partly = readCsvFile(_out);
        for (std::size_t row = 0; row < before.times.size(); ++row) {
            // The last sample is frame 59; what the library replaces ends a step behind it.
            bool const isInside = row >= 31 && row <= 60;
            EXPECT_NEAR(partly.values[row * 4 + 1], before.values[row * 4 + 1], isInside ? 0.2 : 0) << row;
        }
    }
}

TEST_F(EditVerbsTest, BakeGoesThroughItsSamples) {
    std::string const file = _folder.write("f.csv", wavyTable());
    CsvFile const before = readCsvFile(file);
    Json const json = editToJson(file, {"bake", "noise", "--step", "3f"});
    EXPECT_LE(json["keypointsAfter"], 31);
    EXPECT_GE(json["keypointsAfter"], 25); // a cubic may happen to meet a sample between its ends
    EXPECT_GT(json["channels"][0]["worstError"], 0.1);
    CsvFile const after = readCsvFile(_out);
    for (std::size_t row = 0; row <= 90; ++row) {
        bool const isSample = row % 3 == 0;
        double const apart = std::abs(after.values[row * 4 + 3] - before.values[row * 4 + 3]);
        EXPECT_LE(apart, isSample ? 1e-5 : 1.5) << row; // baked times are rounded to a tick
    }
    EXPECT_LT(editToJson(file, {"bake", "wave", "--tolerance", "0.01"})["keypointsAfter"], 12);
}

TEST_F(EditVerbsTest, SmoothIsTheFilterItSays) {
    std::string text = "t,spike,parabola,late\n";
    for (int i = 0; i < 15; ++i) {
        text += std::to_string(i) + "/10," + (i == 7 ? "21" : "0") + "," + std::to_string(i * i) +
                (i < 2 ? ",\n" : ",4\n");
    }
    ASSERT_EQ(edit(_folder.write("f.csv", text), {"smooth"}).exit, 0);
    CsvFile const after = readCsvFile(_out);
    ASSERT_EQ(after.times.size(), 15U);
    double const kernel[] = {-2, 3, 6, 7, 6, 3, -2};
    for (int i = 0; i < 15; ++i) {
        double const* const row = after.values.data() + static_cast<std::size_t>(i) * 3;
        EXPECT_NEAR(row[0], i >= 4 && i <= 10 ? kernel[i - 4] : 0, 1e-12);
        EXPECT_NEAR(row[1], i * i, i >= 3 && i < 12 ? 1e-12 : 10) << "beyond the ends the end's value counts";
        EXPECT_EQ(std::isnan(row[2]), i < 2) << "a curve doesn't grow";
    }
}

TEST_F(EditVerbsTest, MotionsAreWrittenWithFramesOverTheirCurves) {
    std::string const file = _folder.write("small.bvh", kSmallMotion);
    std::string const out = _folder.file("out.bvh");
    Motion const before = readMotionFile(file);
    auto const columnOf = [&](std::vector<std::string> const& arguments, std::size_t column) {
        Outcome const outcome = edit(file, arguments, out);
        EXPECT_EQ(outcome.exit, 0) << outcome.err;
        Motion const motion = readMotionFile(out);
        EXPECT_EQ(motion.frameDuration, before.frameDuration);
        std::vector<double> values;
        for (std::size_t frame = 0; frame < motion.frameCount; ++frame) {
            values.push_back(motion.value(frame, column));
        }
        return values;
    };
    using Values = std::vector<double>;
    EXPECT_EQ(columnOf({"retime", "--factor", "2"}, 0), (Values{0, 0.5, 1, 2.5, 4}));
    EXPECT_EQ(columnOf({"retime", "Hips.Xposition", "--factor", "2"}, 8), (Values{90, 95, 180, 180, 180}));
    EXPECT_EQ(columnOf({"offset", "--by", "1f"}, 0), (Values{0, 0, 1, 4}));
    // The frames begin where the first keypoint before 0 lies.
    EXPECT_EQ(columnOf({"offset", "Hips.Xposition", "--by", "-2f"}, 0), (Values{0, 1, 4, 4, 4}));
    EXPECT_EQ(columnOf({"offset", "Hips.Xposition", "--by", "-2f"}, 1), (Values{90, 90, 90, 91.5, 92}));
    EXPECT_EQ(columnOf({"reverse"}, 6), (Values{10, 5, 0}));
    EXPECT_EQ(edit(file, {"reverse", "Hips.Yposition"}, _out).exit, 0);
    EXPECT_EQ(readCsvFile(_out).values[1], 92);
    EXPECT_EQ(
        edit(file, {"scale", "Hips.Zrotation", "--factor", "1e308"}, file).err,
        "lumenkey: " + file +
            ": a BVH can't hold the value of 'Hips.Zrotation', which isn't finite in degrees or units\n");
    EXPECT_EQ(edit(file, {"retime", "--factor", "99999999"}, out).err,
              "lumenkey: " + out + ": it would hold more than 200000000 values\n");
}

TEST_F(EditVerbsTest, TheOutputIsReplacedAsAWholeOrNotAtAll) {
    std::string const file = _folder.write("small.bvh", kSmallMotion);
    std::string const faulty = _folder.write("faulty.bvh", samples::replaced(kSmallMotion, "91.5", "high"));
    _folder.write("out.bvh", "old");
    EXPECT_EQ(complaintOf({"reverse", faulty, "-o", _folder.file("out.bvh")}),
              "lumenkey: " + faulty + ":20:3: 'high' is not a number\n");
    EXPECT_EQ(contentOf(_folder.file("out.bvh")), "old");
    std::string const nowhere = _folder.file("missing/out.bvh");
    EXPECT_EQ(complaintOf({"reverse", file, "-o", nowhere}),
              "lumenkey: " + nowhere + ": No such file or directory\n");
    std::string const noPicture = _folder.file("missing/p.svg");
    EXPECT_EQ(complaintOf({"reverse", file, "--in-place", "--plot", noPicture}),
              "lumenkey: " + noPicture + ": No such file or directory\n");
    EXPECT_EQ(contentOf(file), kSmallMotion);

    // In its own place, there and back.
    ASSERT_EQ(edit(file, {"reverse"}, file).exit, 0);
    EXPECT_NE(readMotionFile(file).values, readMotionText(kSmallMotion, "f").values);
    ASSERT_EQ(edit(file, {"reverse"}, file).exit, 0);
    EXPECT_EQ(readMotionFile(file).values, readMotionText(kSmallMotion, "f").values);
    EXPECT_EQ(_folder.entryCount(), 3U) << "a temporary was left behind";
}

TEST_F(EditVerbsTest, TablesWithoutRowsAndWithOneStayAsTheyAre) {
    for (std::string const rows : {"", "5,7\n"}) {
        std::string const file = _folder.write("f.csv", "t,\" X\"\n" + rows);
        for (std::vector<std::string> const& arguments :
             std::vector<std::vector<std::string>>{{"simplify", "--tolerance", "1"},
                                                   {"bake"},
                                                   {"smooth"},
                                                   {"reverse"},
                                                   {"retime", "--factor", "2"}}) {
            EXPECT_EQ(edit(file, arguments).exit, 0);
            EXPECT_EQ(contentOf(_out), "time,seconds,\" X\"\n" + (rows.empty() ? "" : "5/1," + rows));
        }
    }
}

TEST_F(EditVerbsTest, WrongArgumentsAreToldBeforeAnythingIsWritten) {
    std::string const table = _folder.write("f.csv", "t,X\n0,1\n1,2\n3,4\n");
    std::string const none = _folder.file("none.csv");
    struct {
        std::string file;
        std::vector<std::string> arguments;
        std::string target;
        char const* complaint;
    } const cases[] = {
        {none, {"reverse"}, "out.txt", "must end in .lumen, .csv or .bvh"},
        {none, {"reverse"}, "out.bvh", "a table (CSV) has no skeleton"},
        {_folder.write("table", "t,X\n0,1\n"), {"reverse"}, "out.bvh", "a table (CSV) has no skeleton"},
        {none, {"reverse", "--plot", "p.bmp"}, "out.csv", "must end in .svg, .png or .pdf"},
        {none, {"reverse", "--from", "soon"}, "out.csv", "'soon' is no time"},
        {none, {"reverse", "--rows", "all"}, "out.csv", "--rows"},
        {_folder.file("none.bvh"), {"reverse", "--rows", "input"}, "out.bvh", "--rows is for a table"},
        {none, {"simplify"}, "out.csv", "--tolerance is required"},
        {none, {"simplify", "--tolerance", "-1"}, "out.csv", "--tolerance must be 0 or above"},
        {none, {"bake", "--tolerance", "nan"}, "out.csv", "--tolerance must be 0 or above"},
        {none, {"offset"}, "out.csv", "say how far: --by, --value or both"},
        {none, {"scale", "--factor", "inf"}, "out.csv", "--factor must be a finite number"},
        {none, {"retime", "--factor", "0"}, "out.csv", "'0' is no factor of time"},
        {table, {"reverse", "--from", "2", "--to", "1"}, "out.csv", "--to lies before --from"},
        {table, {"smooth"}, "out.csv", "aren't evenly spaced: say --step"},
        {table, {"smooth", "--step", "0"}, "out.csv", "--step must be above 0"},
        {table, {"bake", "--step", "1/1000000000"}, "out.csv", "steps; take longer ones"},
        {table, {"reverse", "Y"}, "out.csv", "there is no channel 'Y'"},
    };
    for (auto const& each : cases) {
        std::vector<std::string> arguments = each.arguments;
        arguments.insert(arguments.begin() + 1, {each.file, "-o", _folder.file(each.target)});
        std::string const said = complaintOf(arguments, 2);
        EXPECT_NE(said.find(each.complaint), std::string::npos) << said;
        EXPECT_NE(said.find("\nusage: lumenkey " + each.arguments[0] + " FILE"), std::string::npos);
    }
    EXPECT_EQ(_folder.entryCount(), 2U);
    EXPECT_NE(complaintOf({"reverse", table}, 2).find("-o OUT, or --in-place"), std::string::npos);
    // Where only the content tells that it is no table.
    std::string const nameless = _folder.write("motion", kSmallMotion);
    std::string const rows = complaintOf({"reverse", nameless, "--in-place", "--rows", "input"}, 2);
    EXPECT_NE(rows.find("--rows is for a table, and '" + nameless + "' is none"), std::string::npos) << rows;
}

} // namespace
} // namespace lumenkey::tools
