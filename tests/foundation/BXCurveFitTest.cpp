#include "lumenkey/foundation/BXCurveFit.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <numbers>
#include <random>
#include <vector>

#include <gtest/gtest.h>

namespace {

using Point = BXVector2<double>;
using Points = std::vector<Point>;

Points fitted(Points const& points, double tolerance) {
    Points result{{1.0, 2.0}};
    BXCurveFit::getInstance().FitCurve(points, result, tolerance);
    return result;
}

Point at(Point const* p, double t) {
    Point const a = p[0] + (p[1] - p[0]) * t, b = p[1] + (p[2] - p[1]) * t, c = p[2] + (p[3] - p[2]) * t;
    Point const ab = a + (b - a) * t, bc = b + (c - b) * t;
    return ab + (bc - ab) * t;
}

/// |y(x) - y| by bisection: no Newton, no parameters.
double verticalMiss(Point const* piece, Point const& point) {
    double low = 0.0, high = 1.0;
    for (int i = 0; i < 80; ++i) {
        double const middle = 0.5 * (low + high);
        (at(piece, middle).x < point.x ? low : high) = middle;
    }
    return std::fabs(at(piece, high).y - point.y);
}

/// The distance from the piece, by sampling it and looking closer around the best sample.
double distance(Point const* piece, Point const& point) {
    double best = 0.0;
    double radius = 1.0;
    double nearest = std::numeric_limits<double>::infinity();
    for (int round = 0; round < 8; ++round, radius *= 0.02) {
        double const middle = best;
        for (int i = -100; i <= 100; ++i) {
            double const t = std::clamp(middle + radius * i / 100.0, 0.0, 1.0);
            double const d = (at(piece, t) - point).length();
            if (d < nearest) {
                nearest = d;
                best = t;
            }
        }
    }
    return nearest;
}

/// Checks all that is promised for any points; gives the number of pieces.
std::size_t expectGoodFit(Points const& points, double tolerance) {
    Points const result = fitted(points, tolerance);
    EXPECT_EQ(result.size() % 3, 1U);
    EXPECT_EQ(result.front(), points.front());
    EXPECT_EQ(result.back(), points.back());
    bool const ordered = std::adjacent_find(points.begin(), points.end(), [](Point const& a, Point const& b) {
                             return !(a.x < b.x);
                         }) == points.end();
    double largest = 0.0;
    for (Point const& p : points) {
        largest = std::max({largest, std::fabs(p.y), ordered ? 0.0 : std::fabs(p.x)});
    }
    double const rounding = 1e-13 * largest; // of the evaluation here, not of the fit
    std::size_t next = 0;
    for (std::size_t k = 0; k + 3 < result.size(); k += 3) {
        Point const* piece = &result[k];
        EXPECT_TRUE(std::all_of(piece, piece + 4, [](Point const& p) { return std::isfinite(p.x + p.y); }));
        if (ordered) {
            EXPECT_TRUE(piece[0].x <= piece[1].x && piece[1].x <= piece[3].x && piece[0].x <= piece[2].x &&
                        piece[2].x <= piece[3].x);
        }
        // Keypoints are given points, in order; those between belong to the piece.
        std::size_t const first = next;
        for (++next; next < points.size() && points[next] != piece[3]; ++next) {
        }
        if (next == points.size()) {
            ADD_FAILURE() << "a keypoint that is none of the points";
            return 0;
        }
        for (std::size_t i = first; i <= next; ++i) {
            double const miss = ordered ? verticalMiss(piece, points[i]) : distance(piece, points[i]);
            EXPECT_LE(miss, tolerance * (1.0 + 1e-6) + rounding) << "point " << i;
        }
    }
    EXPECT_EQ(next + 1, points.size());
    return result.size() / 3;
}

template <class Value> Points sampled(int count, double step, Value const& value) {
    Points points;
    for (int i = 0; i < count; ++i) {
        points.push_back({i * step, static_cast<double>(value(i))});
    }
    return points;
}

} // namespace

TEST(BXCurveFit, SmallestInputs) {
    EXPECT_TRUE(fitted({}, 0.1).empty());
    EXPECT_EQ(fitted({{3.0, 4.0}}, 0.1), (Points{{3.0, 4.0}}));
    Points const line = fitted({{0.0, 0.0}, {3.0, 6.0}}, 0.1);
    ASSERT_EQ(line.size(), 4U);
    EXPECT_NEAR(line[1].x, 1.0, 1e-15);
    EXPECT_NEAR(line[2].y, 4.0, 1e-15);
    Points same{{0.0, 0.0}, {1.0, 1.0}, {2.0, 0.0}};
    BXCurveFit::getInstance().FitCurve(same, same, 0.1);
    EXPECT_EQ(same.size() % 3, 1U) << "the result may take the place of the points";
    double const nan = std::nan("");
    EXPECT_EQ(fitted({{0.0, 0.0}, {nan, 1.0}, {1.0, nan}, {3.0, 6.0}}, 0.1), line);
}

TEST(BXCurveFit, HoldsTheToleranceOverTime) {
    std::mt19937 engine(8101);
    std::normal_distribution<double> normal;
    double walk = 0.0;
    Points const museum[] = {
        sampled(200, 1.0 / 24, [](int i) { return 10.0 * std::sin(i * 0.1); }),
        sampled(100, 1.0 / 24, [&](int) { return normal(engine); }),
        sampled(300, 1.0 / 30, [&](int) { return walk += normal(engine); }),
        sampled(60, 1.0 / 24, [](int i) { return i < 30 ? 0.0 : 1.0; }),
        sampled(61, 1.0 / 24, [](int i) { return i == 30 ? 1000.0 : 0.0; }),
        sampled(50, 1e-6, [](int i) { return 1e6 * std::cos(i * 0.3); }),
        sampled(40, 1.0, [](int i) { return std::exp2(i); }),
    };
    for (std::size_t exhibit = 0; exhibit < std::size(museum); ++exhibit) {
        for (double const tolerance : {0.0, 1e-9, 1e-3, 0.1, 10.0, -1.0, std::nan("")}) {
            SCOPED_TRACE(::testing::Message() << "exhibit " << exhibit << " tolerance " << tolerance);
            expectGoodFit(museum[exhibit], tolerance > 0.0 ? tolerance : 0.0);
        }
    }
}

TEST(BXCurveFit, FitsLongRowsAlikeWhereverTheyStand) {
    std::mt19937 engine(8103);
    std::uniform_real_distribution<double> noise(-0.002, 0.002);
    Points const row = sampled(5000, 1.0, [&](int i) { return std::sin(i * 0.05) + noise(engine); });
    Points farAway = row;
    for (Point& point : farAway)
        point.x += 1e7;
    std::size_t const pieces = expectGoodFit(row, 0.01);
    EXPECT_EQ(expectGoodFit(farAway, 0.01), pieces);
    // Cut where a few of its points are worst, it needs hardly more than its parts do.
    std::size_t ofParts = 0;
    for (auto part = row.begin(); part != row.end(); part += 250)
        ofParts += fitted({part, part + 250}, 0.01).size() / 3;
    EXPECT_LE(pieces, ofParts + ofParts / 10);
}

TEST(BXCurveFit, HoldsTheToleranceInThePlane) {
    std::mt19937 engine(8102);
    std::normal_distribution<double> normal;
    Points circle, spiral, cloud, doubled;
    for (int i = 0; i <= 100; ++i) {
        double const angle = i * 2.0 * std::numbers::pi / 100;
        circle.push_back({std::cos(angle), std::sin(angle)});
        spiral.push_back(Point{std::cos(angle * 4), std::sin(angle * 4)} * angle);
        cloud.push_back({normal(engine), normal(engine)});
        int const half = i / 2; // each twice
        doubled.push_back({static_cast<double>(half), std::sin(half)});
    }
    Points const still(20, Point{1.0, 1.0});
    Points const museum[] = {circle, spiral, cloud, doubled};
    for (std::size_t exhibit = 0; exhibit < std::size(museum); ++exhibit) {
        for (double const tolerance : {1e-9, 1e-3, 0.1}) {
            SCOPED_TRACE(::testing::Message() << "exhibit " << exhibit << " tolerance " << tolerance);
            expectGoodFit(museum[exhibit], tolerance);
        }
    }
    EXPECT_EQ(fitted(still, 1e-9), Points(4, still[0]));
}

TEST(BXCurveFit, NeedsFewPieces) {
    EXPECT_EQ(expectGoodFit(sampled(500, 0.1, [](int i) { return 3.0 * i - 7.0; }), 1e-9), 1U);
    EXPECT_EQ(expectGoodFit(sampled(100, 0.01, [](int i) { return std::pow(i * 0.01, 3) - i * 0.01; }), 1e-2),
              1U);
    double const turn = 2.0 * std::numbers::pi;
    EXPECT_LE(expectGoodFit(sampled(241, 1.0 / 24, [=](int i) { return std::sin(turn * i / 240.0); }), 1e-3),
              8U);
    EXPECT_LE(expectGoodFit(sampled(1001, 1.0 / 24, [](int i) { return i < 500 ? 0.0 : 1.0; }), 1e-3), 10U);
}

TEST(BXCurveFit, LongAndAwkwardInputsStayAffordable) {
    // Growth so steep that the worst point is always next to the end: a cut there gains a single point.
    Points const steep = sampled(20000, 1.0, [](int i) { return std::exp(i * 0.03); });
    EXPECT_EQ(fitted(steep, 1e-12).size() % 3, 1U);
    std::mt19937 engine(8103);
    std::uniform_real_distribution<double> noise(-1.0, 1.0);
    Points const noisy = sampled(100000, 1.0 / 24, [&](int) { return noise(engine); });
    EXPECT_EQ(fitted(noisy, 1e-6).back(), noisy.back());
}
