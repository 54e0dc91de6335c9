#include "tools/cli/NearMatch.h"
#include "tools/cli/TimeArgument.h"
#include "tools/cli/UsageError.h"
#include "tools/output/TextForms.h"
#include "tools/plot/PlotAxis.h"

#include <cmath>
#include <gtest/gtest.h>
#include <limits>

namespace lumenkey::tools {
namespace {

std::string resolved(std::string_view text, Tempus const& frame = TempusMake(1, 120)) {
    try {
        return timeText(TimeArgument::parse(text).resolve(frame));
    } catch (UsageError const&) {
        return "refused";
    }
}

TEST(TimeArgument, ReadsFractionsSecondsAndFrames) {
    EXPECT_EQ(resolved("1001/24000"), "1001/24000");
    EXPECT_EQ(resolved("-6/12"), "-1/2");
    EXPECT_EQ(resolved("0.1"), "1/10");
    EXPECT_EQ(resolved("-0.5"), "-1/2");
    EXPECT_EQ(resolved("2"), "2/1");
    EXPECT_EQ(resolved("12f"), "1/10");
    EXPECT_EQ(resolved("-1.5f"), "-1/80");
    EXPECT_EQ(resolved("12f", TempusMake(1001, 30000)), "1001/2500");
    for (char const* const text :
         {"", "f", "x", "1/0", "1/-2", "1/2/3", "1/2f", "1.5/2", "0.5s", " 1", "1 ", "nan",
          "9223372036854775808/1", "1/2147483648", "0.12345678901", "1e18f/1", "1e400"}) {
        EXPECT_EQ(resolved(text), "refused") << text;
    }
    EXPECT_EQ(resolved("9e18f", TempusMake(1001, 24)), "refused");
    EXPECT_EQ(resolved("1f", kTempusInvalid), "refused");
    EXPECT_EQ(TimeArgument::parseList("0,1/2,3f").size(), 3U);
    EXPECT_THROW(TimeArgument::parseList("0,,1"), UsageError);
    EXPECT_THROW(TimeArgument::parseList("0,1,"), UsageError);
}

TEST(StepOfRate, IsExact) {
    auto const step = [](std::string_view rate) {
        try {
            return timeText(stepOfRate(rate));
        } catch (UsageError const&) {
            return std::string("refused");
        }
    };
    EXPECT_EQ(step("24"), "1/24");
    EXPECT_EQ(step("23.976"), "125/2997");
    EXPECT_EQ(step("30000/1001"), "1001/30000");
    EXPECT_EQ(step("0.5"), "2/1");
    for (char const* const rate : {"", "0", "-24", "24f", "1/0", "fast", "2147483648", "0.00000000001"}) {
        EXPECT_EQ(step(rate), "refused") << rate;
    }
}

TEST(NearMatch, FindsWhatWasMeant) {
    auto const meant = [](std::string_view wanted) {
        NearMatch match(wanted);
        for (char const* const name :
             {"Hips.Xposition", "Hips.Xrotation", "Hips.LeftLeg.Xrotation", "Head.Zrotation"}) {
            match.offer(name);
        }
        return match.best();
    };
    EXPECT_EQ(meant("hips.xrotation"), "Hips.Xrotation");
    EXPECT_EQ(meant("Hisp.Xrotation"), "Hips.Xrotation");
    EXPECT_EQ(meant("Hips.Xrot"), "Hips.Xrotation");
    EXPECT_EQ(meant("LeftLeg.Xrotation"), "Hips.LeftLeg.Xrotation");
    EXPECT_EQ(meant("Head"), "Head.Zrotation");
    EXPECT_EQ(meant("nothing like it at all"), "");
    EXPECT_EQ(meant(""), "");
}

TEST(PlotAxis, PutsTicksAtRoundNumbersOfAnyRange) {
    auto const labels = [](double low, double high, int most) {
        std::string all;
        for (PlotTick const& tick : ticksWithin(PlotRange::sound(low, high), most)) {
            all += tick.label + " ";
        }
        return all;
    };
    EXPECT_EQ(labels(0, 1, 5), "0.0 0.2 0.4 0.6 0.8 1.0 ");
    EXPECT_EQ(labels(-20, 35, 6), "\u221220 \u221210 0 10 20 30 ");
    EXPECT_EQ(labels(0, 1e9, 2), "0 5e+08 1e+09 ");

    double const infinity = std::numeric_limits<double>::infinity();
    double const ends[] = {-infinity, -1e308,    -1,   -5e-324,  0,           1e-300,
                           1,         1 + 1e-15, 1e17, infinity, std::nan("")};
    for (double const low : ends) {
        for (double const high : ends) {
            PlotRange const range = PlotRange::sound(low, high);
            EXPECT_TRUE(range.low < range.high && std::isfinite(range.high - range.low))
                << low << " " << high;
            EXPECT_LE(ticksWithin(range, 8).size(), 9U);
        }
    }
}

} // namespace
} // namespace lumenkey::tools
