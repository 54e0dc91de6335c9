#include "tools/plot/PlotShortening.h"

#include <cmath>
#include <gtest/gtest.h>
#include <limits>

namespace lumenkey::tools {
namespace {

TEST(PlotShortening, LeavesOutPointsThatNobodySees) {
    std::vector<PlotPoint> points;
    for (int i = 0; i <= 1'000; ++i) {
        points.push_back({i * 0.5, 50 * std::sin(i * 0.01) + (i > 700 ? 30 : 0)});
    }
    points[300].y = std::numeric_limits<double>::quiet_NaN();
    points.insert(points.begin() + 500, {400, points[499].y}); // there and back
    std::vector<PlotPoint> const kept = withoutStraightPoints(points);
    EXPECT_LT(kept.size(), 150U);
    std::size_t place = 0;
    for (std::size_t i = 0; i + 1 < kept.size(); ++i) {
        // All that lies between two points that stay lies on the line between them, and within its ends.
        PlotPoint const& a = kept[i];
        PlotPoint const& b = kept[i + 1];
        ASSERT_EQ(points[place].x, a.x);
        for (++place; points[place].x != b.x || (points[place].y != b.y && !std::isnan(b.y)); ++place) {
            double const share = (points[place].x - a.x) / (b.x - a.x);
            ASSERT_TRUE(share >= 0 && share <= 1) << place;
            ASSERT_NEAR(points[place].y, a.y + share * (b.y - a.y), 0.1) << place;
        }
    }
    EXPECT_EQ(place, points.size() - 1);
    EXPECT_TRUE(withoutStraightPoints({}).empty());
}

TEST(PlotShortening, ShortensNumbersAndNothingElse) {
    EXPECT_EQ(withShortNumbers(
                  "<?xml version=\"1.0\"?> d=\"M-3.8125 0.996 L10.126.5 7 1.500 12.000001\" g-0.1.2345"),
              "<?xml version=\"1.0\"?> d=\"M-3.81 1 L10.13.5 7 1.5 12\" g-0.1.2345");
    EXPECT_EQ(withShortNumbers("rgb(54.117647%,0.004%) 1."), "rgb(54.12%,0%) 1.");
}

} // namespace
} // namespace lumenkey::tools
