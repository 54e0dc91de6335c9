#include "tools/import/MotionTime.h"
#include "tools/output/TextForms.h"
#include "tools/time/ExactDecimal.h"

#include <gtest/gtest.h>

namespace lumenkey::tools {
namespace {

std::string durationOf(std::string_view text) {
    FrameDuration const frame = frameDurationFromText(text);
    return frame.fault.empty() ? timeText(frame.duration) : frame.fault;
}

TEST(MotionTime, FindsTheRateBehindAPrintedFrameTime) {
    struct {
        char const* text;
        char const* duration;
    } const cases[] = {
        // Each usual rate, printed as files print it.
        {".0083333", "1/120"},
        {"0.00833333333333333333333333333333", "1/120"},
        {"0.041708", "1001/24000"},
        {"0.041667", "1/24"},
        {"0.033367", "1001/30000"},
        {"0.033333", "1/30"},
        {"0.0208333", "1/48"},
        {"0.0166667", "1/60"},
        {"0.00416667", "1/240"},
        // Cut, rounded, or one unit beyond.
        {"0.008", "1/120"},
        {"0.008334", "1/120"},
        {"0.033", "1/30"},
        // Within 1e-5 of a usual rate, though printed with more digits.
        {"0.00833340", "1/120"},
        // Nothing usual: the decimal itself.
        {"0.00833500", "1667/200000"},
        {"0.0125", "1/80"},
        {"0.0335", "67/2000"},
        // One unit of these is larger than they are precise.
        {"0.1", "1/10"},
        {"1e1", "10/1"},
        {"86400", "86400/1"},
        // No exact form in 31 bits of timescale: the nearest at the finest.
        {"0.0123456789123", "26512144/2147483647~"},
    };
    for (auto const& each : cases) {
        EXPECT_EQ(durationOf(each.text), each.duration) << each.text;
    }
}

TEST(MotionTime, RefusesWhatIsNoDuration) {
    for (char const* const text : {"0", "0.000", "-0.04", "0e5"}) {
        EXPECT_EQ(durationOf(text), "a frame must last longer than 0 seconds") << text;
    }
    for (char const* const text :
         {"fast", "0.04s", "0,04", "nan", "inf", "1e", ".", "1e99999", "0x1", "1/25"}) {
        EXPECT_EQ(durationOf(text), "'" + std::string(text) + "' is not a number of seconds") << text;
    }
    for (char const* const text : {"86401", "1e300", "1e-10", "1e-300", "99999999999999999999999999999999"}) {
        EXPECT_EQ(durationOf(text), "a frame lasts at least a nanosecond and at most a day") << text;
    }
}

TEST(ExactDecimal, IsExactOrSaysThatItIsNot) {
    auto const timeOf = [](std::string_view text) { return timeText(ExactDecimal::parse(text)->toTempus()); };
    EXPECT_EQ(timeOf("0.5"), "1/2");
    EXPECT_EQ(timeOf("-0.125"), "-1/8");
    EXPECT_EQ(timeOf("0.000000001"), "1/1000000000");
    EXPECT_EQ(timeOf("0.0000000005"), "1/2000000000");
    EXPECT_EQ(timeOf("0.0000000001"), "invalid");
    EXPECT_EQ(timeOf("0.1234567890123"), "invalid");
    EXPECT_EQ(timeOf("9e18"), "9000000000000000000/1");
    EXPECT_EQ(timeOf("1e19"), "invalid");
    EXPECT_EQ(timeOf("1e-999"), "invalid");
    EXPECT_EQ(timeOf("1234567890123456789"), "invalid"); // one digit more than is kept
    EXPECT_EQ(timeOf("-0"), "0/1");
}

} // namespace
} // namespace lumenkey::tools
