#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <random>
#include <utility>

namespace {

using Numbers = std::vector<double>;
Tempus seconds(int n) { return TempusMake(n, 1); }

struct Curve : MuseumSpline {
    Curve(std::initializer_list<std::pair<int, double>> keys = {}) {
        for (auto const& [u, v] : keys) {
            append(seconds(u), v);
        }
    }
    void fillWithBeziers(std::mt19937& random, int count) { appendAtRandom(random, count, {4, 4, 4, 1}); }
    KFVertex* key(int index) { return museumVertices(*spline)[static_cast<std::size_t>(index)]; }
    void lock(int index) { key(index)->setFlag(kKFVertexFlagLocked); }
    void expect(Numbers const& positions, Numbers const& values) {
        auto const vertices = museumVertices(*spline);
        ASSERT_EQ(values.size(), vertices.size());
        for (std::size_t i = 0; i < values.size(); ++i) {
            EXPECT_EQ(positions[i], TempusGetSeconds(vertices[i]->getValueU()));
            EXPECT_EQ(values[i], vertices[i]->getValueV(kTempusZero)) << i;
        }
        expectFindable();
    }
    /// Searches find each vertex where it stands: the index of positions is up to date.
    void expectFindable() {
        for (KFVertex const* vertex : museumVertices(*spline)) {
            KFVertex const* const found = vertexAt(vertex->getValueU());
            ASSERT_NE(nullptr, found);
            EXPECT_EQ(vertex->getValueU(), found->getValueU());
        }
    }
};

TEST(KFSplineTransform, OffsetsWithinLimits) {
    struct {
        Numbers values; // at 1, 2, ... s
        int u;
        double offset;
        bool neighboursOnly, keepShape;
        Numbers expected;
    } const rows[] = {
        // The one at the limit holds all back, or only itself.
        {{1, 9, 5}, 1, 4, false, true, {2, 10, 6}},
        {{1, 9, 5}, 1, 4, false, false, {4, 10, 8}},
        {{1, -8, 5}, 1, -4, false, true, {-1, -10, 3}},
        // Only the neighbours move, and none that stands at u.
        {{1, 9, 5, 0}, 2, 12, true, false, {4, 9, 8, 0}},
        {{1, 7, 9, 0}, 2, 10, true, true, {2, 7, 10, 0}},
        {{9, 5}, 0, 12, true, true, {10, 5}},
    };
    for (auto const& row : rows) {
        for (bool const locked : {false, true}) {
            Curve curve;
            Numbers positions;
            for (double const value : row.values) {
                positions.push_back(static_cast<double>(positions.size() + 1));
                curve.append(seconds(static_cast<int>(positions.size())), value);
            }
            Numbers expected = row.expected;
            if (locked && !row.keepShape) {
                curve.lock(0);
                expected[0] = row.values[0];
            }
            curve->offsetSpline(seconds(row.u), row.offset, 10, -10, row.neighboursOnly, row.keepShape,
                                kTempusZero);
            SCOPED_TRACE(testing::Message() << "row " << &row - rows << ", locked " << locked);
            curve.expect(positions, expected);
        }
    }
}

TEST(KFSplineTransform, ScalesValuesAndTheEndsOfTangents) {
    Curve curve{{0, 1.0}, {1, -4.0}};
    setSides(*curve.key(0), {-0.5, 0.25, 0.5, 1.0});
    curve->scaleSpline(2.0, 0.0, 3.0, kTempusZero);
    curve.expect({0, 1}, {2.0, 0.0});
    EXPECT_EQ((Sides{-0.5, 0.5, 0.5, 1.0}), sidesOf(*curve.key(0)))
        << "the end of the last stops at the limit";
}

TEST(KFSplineTransform, WarpsTheCurveWithItsTangents) {
    std::mt19937 random(1);
    for (int round = 0; round < 40; ++round) {
        Curve curve;
        curve.fillWithBeziers(random, 5);
        Tempus const offset = TempusMake(7, 24);
        curve.lock(2);
        Curve warped;
        *warped = *curve;
        warped->forceWarpSplineLinear(TempusMake(3, 2), offset);
        EXPECT_TRUE(warped.key(2)->testFlag(kKFVertexFlagLocked));
        warped.expectFindable();
        for (int i = -10; i < 200; ++i) {
            Tempus const u = TempusMake(i, 40);
            EXPECT_NEAR(curve.at(u), warped.at(u * 1.5 + offset), 1e-6);
        }
        *warped = *curve;
        warped->warpSplineLinear(1.5, offset, kTempusZero);
        EXPECT_EQ(curve.key(2)->getValueU(), warped.key(2)->getValueU());
        EXPECT_EQ(curve.key(1)->getValueU() * 1.5 + offset, warped.key(1)->getValueU());
    }
}

TEST(KFSplineReverseVertices, MirrorsTheCurve) {
    std::mt19937 random(2);
    for (int round = 0; round < 200; ++round) {
        SCOPED_TRACE(round);
        Curve curve, original;
        int const count = 2 + static_cast<int>(random() % 6);
        curve.fillWithBeziers(random, count);
        *original = *curve;
        int const first = static_cast<int>(random() % static_cast<unsigned>(count));
        int const last = first + static_cast<int>(random() % static_cast<unsigned>(count - first));
        Tempus const from = original.key(first)->getValueU();
        Tempus const to = original.key(last)->getValueU();
        curve->reverseVertices(curve.key(first), curve.key(last));

        ASSERT_EQ(static_cast<std::size_t>(count), curve->getNumberOfVertices());
        EXPECT_EQ(from, curve.key(first)->getValueU());
        EXPECT_EQ(to, curve.key(last)->getValueU());
        curve.expectFindable();
        for (int i = 0; i <= 100; ++i) {
            Tempus const u = from + (to - from) * TempusMake(i, 100);
            // Where a tangent was vertical the mirrored solution is rounded from the other side.
            ASSERT_NEAR(original.at(u), curve.at(to - (u - from)), 1e-6);
        }
        // The segment that follows takes the type of the last.
        EXPECT_EQ(original.key(last)->getInterpolation(), curve.key(last)->getInterpolation());
        // An inner vertex has changed its two sides; what the first and last show outwards they keep.
        for (int i = first; i <= last; ++i) {
            Sides const old = sidesOf(*original.key(i));
            Sides const expected{i == last ? old[0] : -old[2], i == last ? old[1] : old[3],
                                 i == first ? old[2] : -old[0], i == first ? old[3] : old[1]};
            EXPECT_EQ(expected, sidesOf(*curve.key(first + last - i)));
        }
    }
}

TEST(KFSplineReverseVertices, KeepsWhatItMayNotTouch) {
    Curve curve{{0, 1.0}, {1, 2.0}, {3, 5.0}};
    curve->setClosed(true, nullptr);
    curve->reverseVertices(curve.key(0), curve.key(2));
    EXPECT_TRUE(curve->isClosed()) << "though all its vertices are exchanged";
    // A lock anywhere in the stretch, and a stretch that isn't one.
    curve.lock(1);
    int foreign = 0;
    curve->reverseVertices(curve.key(0), curve.key(2));
    curve->reverseVertices(curve.key(2), curve.key(0));
    curve->reverseVertices(nullptr, curve.key(2));
    curve->reverseVertices(curve.key(0), &foreign);
    curve.expect({0, 2, 3}, {5.0, 2.0, 1.0});
}

TEST(KFSplineReverseVertices, KeepsTheOrderAtOnePosition) {
    Curve curve{{0, 1.0}, {0, 2.0}, {0, 3.0}, {1, 5.0}};
    curve->reverseVertices(curve.key(1), curve.key(1));
    curve.expect({0, 0, 0, 1}, {1.0, 2.0, 3.0, 5.0});
    curve->reverseVertices(curve.key(0), curve.key(0));
    curve.expect({0, 0, 0, 1}, {1.0, 2.0, 3.0, 5.0});
    curve->reverseVertices(curve.key(1), curve.key(2));
    curve.expect({0, 0, 0, 1}, {1.0, 3.0, 2.0, 5.0});
    curve->reverseVertices(curve.key(2), curve.key(3));
    curve.expect({0, 0, 0, 1}, {1.0, 3.0, 5.0, 2.0});
}

TEST(KFSplineTransform, CountsVerticesAsParameter) {
    // A time curve becomes a path from value 0, tangents in fractions of a segment.
    Curve curve{{0, 5.0}, {2, 7.0}, {6, 4.0}};
    for (KFVertex* const vertex : museumVertices(*curve)) {
        setSides(*vertex, {-0.5, 0.25, 0.5, 0.75});
    }
    curve.lock(1);
    curve->parametrizeSpline();
    curve.expect({0, 1, 2}, {0.0, 7.0, -1.0}); // a locked vertex keeps its value but is counted
    EXPECT_TRUE(curve.key(1)->testFlag(kKFVertexFlagLocked));
    EXPECT_EQ((std::pair{0.25, 0.75}), (std::pair{sidesOf(*curve.key(0))[2], sidesOf(*curve.key(0))[3]}));
    EXPECT_EQ((Sides{-0.125, 0.25, 0.125, -0.25}), sidesOf(*curve.key(2)));
}

TEST(KFSplineTransform, OpensAtAVertex) {
    Curve curve{{0, 10.0}, {1, 11.0}, {2, 12.0}, {5, 15.0}};
    curve->setClosed(false, curve.key(2)); // it is open already
    curve->setClosed(true, curve.key(2));
    curve.expect({0, 1, 2, 5}, {10.0, 11.0, 12.0, 15.0});
    curve->setClosed(false, curve.key(2));
    EXPECT_FALSE(curve->isClosed());
    curve.expect({0, 1, 2, 3}, {12.0, 15.0, 10.0, 11.0});
    EXPECT_EQ(10.0, curve.at(seconds(2)));
}

TEST(KFSplineTransform, PurgesAllButTheFirstAtAPlace) {
    Curve curve{{1, 1.0}, {1, 2.0}, {2, 3.0}, {2, 4.0}, {2, 5.0}, {3, 6.0}};
    curve.lock(4);
    curve->purge();
    curve.expect({1, 2, 2, 3}, {1.0, 3.0, 5.0, 6.0});
}

TEST(KFSplineTransform, TakesSnapshotsOfValidVertices) {
    Curve source{{0, 1.0}, {1, 2.0}, {2, 3.0}};
    source->setClosed(true, nullptr);
    source.key(0)->setInterpolation(4);
    source.key(0)->setBias(0.5, kTempusZero);
    source.lock(0);
    source->disableVertex(source.key(1), kTempusZero);
    Curve curve{{7, 7.0}};
    curve.lock(0);
    curve->generateSplineFromDynamicSpline(kTempusZero, source.spline.get());
    curve.expect({0, 2}, {1.0, 3.0});
    EXPECT_TRUE(curve->isClosed());
    EXPECT_EQ(0u, curve.key(0)->getFlags());
    EXPECT_EQ(4u, curve.key(0)->getInterpolation());
    EXPECT_EQ(0.5, curve.key(0)->getBias(kTempusZero));
    EXPECT_EQ(3u, source->getNumberOfVertices());
}

} // namespace
