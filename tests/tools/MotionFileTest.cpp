#include "tools/import/MotionFile.h"
#include "tests/tools/MotionSamples.h"
#include "tests/tools/TestFolder.h"

#include <gtest/gtest.h>
#include <random>

namespace lumenkey::tools {
namespace {

using samples::kSmallMotion;
using samples::replaced;

/// What the reader says about a text; `LINE:COLUMN: what`, or nothing when it takes it.
std::string faultOf(std::string_view text) {
    try {
        readMotionText(text, "f.bvh");
        return "";
    } catch (InputError const& error) {
        EXPECT_EQ(error.file, "f.bvh");
        return std::to_string(error.line) + ":" + std::to_string(error.column) + ": " + error.what;
    }
}

std::string faultWith(std::string_view what, std::string_view by) {
    return faultOf(replaced(kSmallMotion, what, by));
}

TEST(MotionFile, ReadsWhatStandsBesideTheChannels) {
    Motion const motion = readMotionText(kSmallMotion, "f.bvh");
    EXPECT_EQ(motion.joints[0].offset, (std::array{0.0, 1.5, -2.0}));
    ASSERT_EQ(motion.endSites.size(), 1U);
    EXPECT_EQ(motion.endSites[0].offset, (std::array{0.0, -10.0, 0.0}));
    EXPECT_EQ(motion.value(2, 8), 180);
}

TEST(MotionFile, TakesCommonDepartures) {
    std::string carriageReturns;
    for (char const c : kSmallMotion) {
        carriageReturns += c == '\n' ? "\r\n" : std::string(1, c);
    }
    struct {
        char const* what;
        std::string text;
    } const cases[] = {
        {"carriage returns", carriageReturns},
        {"byte-order mark", "\xEF\xBB\xBF" + std::string(kSmallMotion)},
        {"lower case", replaced(replaced(kSmallMotion, "HIERARCHY", "hierarchy"), "End Site", "end site")},
        {"kinds in another case", replaced(kSmallMotion, "Xposition", "XPOSITION")},
        {"brace behind the name", replaced(kSmallMotion, "ROOT Hips\n{", "ROOT Hips {")},
        {"no space before braces", replaced(kSmallMotion, "OFFSET 0 -10 0\n\t\t}", "OFFSET 0 -10 0}")},
        {"space before the colon", replaced(kSmallMotion, "Frames:", "frames :")},
        {"blank lines", replaced(kSmallMotion, "0 90", "\n \t\n0 90") + "\n \n"},
        {"plus signs", replaced(kSmallMotion, "1 91.5", "+1 +91.5")},
        {"exponents", replaced(kSmallMotion, "91.5", "9.15e1")},
        {"a second root", replaced(kSmallMotion, "MOTION", "ROOT Prop { OFFSET 0 0 0 }\nMOTION")},
    };
    Motion const plain = readMotionText(kSmallMotion, "f.bvh");
    for (auto const& each : cases) {
        SCOPED_TRACE(each.what);
        ASSERT_EQ(faultOf(each.text), "");
        Motion const motion = readMotionText(each.text, "f.bvh");
        EXPECT_EQ(motion.values, plain.values);
        EXPECT_EQ(motion.frameDuration, plain.frameDuration);
        EXPECT_EQ(motion.joints[1].name, "LeftLeg");
    }
    EXPECT_EQ(readMotionText(replaced(kSmallMotion, "ROOT Hips", "ROOT Bip 01 Pelvis "), "f").joints[0].name,
              "Bip 01 Pelvis");
}

TEST(MotionFile, TellsWhereAFileIsAtFault) {
    EXPECT_EQ(faultOf(""), "1:1: the file is empty");
    EXPECT_EQ(faultOf(" \n"), "2:1: the file ends where HIERARCHY belongs");
    EXPECT_EQ(faultOf("\x89PNG"), "1:1: '\x89PNG' stands where HIERARCHY belongs");
    EXPECT_EQ(faultOf(std::string("HIER\0ARCHY", 10)), "1:5: a zero byte: this is no text");
    EXPECT_EQ(faultOf(std::string(kSmallMotion) + "end\n"),
              "22:1: more stands here, after the last of 3 frames");
    for (char const* const text : {"nan", "-inf", "infinity", "0x10", "1e", "--1", "+-1", "-", "."}) {
        EXPECT_EQ(faultWith("91.5", text), "20:3: '" + std::string(text) + "' is not a number");
    }
    struct {
        char const *what, *by, *fault;
    } const cases[] = {
        {"ROOT Hips", "ROOT", "2:5: the name of the joint is missing"},
        {"LeftLeg\n\t{", "LeftLeg\n\t", "8:3: 'OFFSET' stands where { belongs"},
        {"\t\tOFFSET 3.5 0 0\n", "", "13:2: joint 'LeftLeg' has no OFFSET"},
        {"OFFSET 3.5 0 0", "OFFSET 3.5 0 0 0", "8:18: '0' is unknown inside joint 'LeftLeg' of line 6"},
        {"}\nMOTION", "MOTION", "15:1: MOTION comes before the brace that closes joint 'Hips' of line 2"},
        {"}\nMOTION", "}}\nMOTION", "15:2: this brace closes nothing"},
        {"CHANNELS 3", "CHANNELS 4", "10:3: CHANNELS says 4, but 3 names follow"},
        {"CHANNELS 3", "CHANNELS 2", "9:34: 'Yrotation' is one more channel than CHANNELS says"},
        {"CHANNELS 3", "CHANNELS 4000000000", "9:12: a joint has at most 6 channels"},
        {"Zposition", "Wposition", "5:33: 'Wposition' is no channel of a joint"},
        {"Zposition", "Xposition", "5:33: 'Xposition' stands twice in one joint"},
        {"1 91.5 2", "1 2", "20:22: frame 1 has 9 numbers, but 8 are there"},
        {"1 91.5 2", "1 91.5 2 2", "20:27: frame 1 has 9 numbers, but more stand here"},
        {"91.5", "1e400", "20:3: '1e400' is out of the range of numbers"},
        {"Frames: 3", "Frames: 4", "22:1: the file ends after 3 of 4 frames"},
        {"Frames: 3", "Frames: many", "17:9: 'many' is not a count of frames"},
        {"Frames: 3", "Frames: 3 4", "17:11: more stands here, after the count of frames"},
        {"Frames: 3", "Frames 3", "17:1: 'Frames' stands where 'Frames:' belongs"},
        {".0083333", "fast", "18:13: 'fast' is not a number of seconds"},
        {".0083333", "0.0", "18:13: a frame must last longer than 0 seconds"},
        {".0083333", "", "18:13: the time of a frame is missing"},
    };
    for (auto const& each : cases) {
        EXPECT_EQ(faultWith(each.what, each.by), each.fault);
    }
}

TEST(MotionFile, SurvivesCutsAndDamageAnywhere) {
    for (std::size_t length = 0; length < kSmallMotion.size(); ++length) {
        EXPECT_NE(faultOf(kSmallMotion.substr(0, length)), "") << "cut at byte " << length;
    }
    std::mt19937 random(7);
    std::string_view const spare = "{}0-.e \n\tX:JOINT\xFF";
    for (int i = 0; i < 20'000; ++i) {
        std::string text(kSmallMotion);
        for (int damage = 0; damage < 3; ++damage) {
            std::size_t const place = random() % text.size();
            char const other = spare[random() % spare.size()];
            text.replace(place, random() % 3 == 0 ? random() % 20 : random() % 2, 1, other);
        }
        try {
            Motion const motion = readMotionText(text, "f.bvh");
            ASSERT_EQ(motion.values.size(), motion.frameCount * motion.channels.size()) << text;
        } catch (InputError const& error) {
            ASSERT_LE(error.line, 40U) << text;
            ASSERT_FALSE(error.what.empty()) << text;
        }
    }
}

TEST(MotionFile, AsksForNoMemoryOrStackOnTheWordOfAFile) {
    for (char const* const count : {"1000000000", "18446744073709551615", "99999999999999999999", "300"}) {
        EXPECT_EQ(faultWith("Frames: 3", "Frames: " + std::string(count)),
                  "17:9: the file is too short for that many frames");
    }
    // Without channels a frame has no numbers, and so no size.
    EXPECT_EQ(faultOf("HIERARCHY ROOT A { OFFSET 0 0 0 } MOTION\nFrames: 1000000000\nFrame Time: 1\n"),
              "2:9: the file is too short for that many frames");

    std::string deep = "HIERARCHY\nROOT A {\n";
    for (int i = 0; i < 1'000'000; ++i) {
        deep += "JOINT A {\n";
    }
    EXPECT_EQ(faultOf(deep), "1002:1: joints stand more than 1000 deep");
    EXPECT_EQ(faultOf("HIERARCHY\nROOT " + std::string(256, 'x') + "\n{"),
              "2:6: the name of the joint has more than 255 bytes");
}

TEST(MotionFile, RefusesWhatIsNoReadableFile) {
    TestFolder const folder;
    auto const faultOfFile = [](std::string const& file) -> std::string {
        try {
            readMotionFile(file);
            return "";
        } catch (InputError const& error) {
            return error.text();
        }
    };
    EXPECT_EQ(faultOfFile(folder.path().string()), folder.path().string() + ":1:1: Is a directory");
    EXPECT_EQ(faultOfFile("/dev/zero"), "/dev/zero:1:1: a zero byte: this is no text");
    EXPECT_EQ(faultOfFile("a\nb"), "a\\x0ab:1:1: No such file or directory");
    EXPECT_EQ(faultOfFile(folder.write("whole.bvh", kSmallMotion)), "");
}

} // namespace
} // namespace lumenkey::tools
