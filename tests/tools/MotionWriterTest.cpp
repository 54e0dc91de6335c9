#include "tools/export/MotionWriter.h"
#include "tests/tools/MotionSamples.h"
#include "tests/tools/TestFolder.h"
#include "tools/export/ChannelFileWriter.h"

#include <charconv>
#include <gtest/gtest.h>
#include <random>

namespace lumenkey::tools {
namespace {

using samples::described;
using samples::kSmallMotion;

TEST(MotionWriter, WritesWhatReadsBackTheSame) {
    std::string const end = "End Site { OFFSET 0 1e-300 -0 } ";
    std::string const turns = "CHANNELS 1 Xrotation ";
    struct {
        char const* what;
        std::string text;
    } const cases[] = {
        {"all there is", std::string(kSmallMotion)},
        {"no frames, several roots, a joint without channels, names with spaces",
         "HIERARCHY\nROOT A b\n{ OFFSET 0.1 1e22 -7 JOINT C d\n{ OFFSET 1 2 3 " + end +
             "} }\nROOT E\n{ OFFSET 0 0 0 " + turns + "}\nMOTION\nFrames: 0\nFrame Time: 0.0333333\n"},
        {"channels named behind children, in between and in front; ends beside children",
         "HIERARCHY\nROOT A\n{ OFFSET 0 0 0 JOINT B\n{ OFFSET 0 0 0 JOINT C\n{ OFFSET 0 0 0 " + turns + end +
             "} CHANNELS 2 Zposition Yrotation " + end + "}\n" + turns + "JOINT D\n{ OFFSET 0 0 0 " + turns +
             "} JOINT E\n{ OFFSET 0 0 0 } }\nMOTION\nFrames: 2\nFrame Time: 0.0123\n"
             "1 -0 3e-9 0.1 123456789.123\n0 0 1e300 5e-324 -1.5\n"},
    };
    for (auto const& each : cases) {
        SCOPED_TRACE(each.what);
        Motion const motion = readMotionText(each.text, "f");
        StringSink out;
        writeMotionText(motion, out);
        EXPECT_EQ(described(readMotionText(out.text(), "f")), described(motion)) << out.text();
    }
}

TEST(MotionWriter, DegreesComeBackThroughRadians) {
    TestFolder const folder;
    std::mt19937_64 random(7);
    std::uniform_real_distribution<double> angle(-400, 400);
    std::string frames;
    for (int i = 0; i < 3'000; ++i) {
        double const degrees = angle(random);
        int const decimals = i % 18;
        std::array<char, 64> buffer{};
        char* const last = std::to_chars(buffer.data(), buffer.data() + buffer.size(), degrees,
                                         std::chars_format::fixed, decimals)
                               .ptr;
        frames.append(buffer.data(), last).append("\n");
    }
    std::string const file =
        folder.write("f.bvh", "HIERARCHY\nROOT A\n{ OFFSET 0 0 0 CHANNELS 1 Xrotation }\n"
                              "MOTION\nFrames: 3000\nFrame Time: 0.01\n" +
                                  frames);
    ChannelFile const opened = openChannelFile(file);
    WrittenRows const rows =
        writeChannelFile({opened, ChannelFormat::Motion, RowsOf::Input, {}, folder.file("out.bvh")});
    EXPECT_EQ(rows.count, 3'000U);
    Motion const before = readMotionFile(file);
    Motion const after = readMotionFile(folder.file("out.bvh"));
    ASSERT_EQ(after.values.size(), before.values.size());
    for (std::size_t i = 0; i < before.values.size(); ++i) {
        // Up to fourteen decimals there is no shorter number that reads as the same radians.
        ASSERT_NEAR(after.values[i], before.values[i], i % 18 < 12 ? 0 : 1e-13) << i;
    }
}

} // namespace
} // namespace lumenkey::tools
