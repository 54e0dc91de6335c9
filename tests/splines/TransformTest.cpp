#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFVertex.h"

#include <gtest/gtest.h>

#include <array>
#include <random>
#include <utility>
#include <vector>

namespace {

Tempus seconds(int n) { return TempusMake(n, 1); }

struct Curve {
    KFSplineState state;
    KFSpline spline{&state};

    Curve() { state.deriveTangents = false; }
    Curve(std::initializer_list<std::pair<int, double>> keys) : Curve() {
        for (auto const& [u, v] : keys) {
            append(seconds(u), v, 1);
        }
    }

    KFVertex* append(Tempus const& u, double value, std::uint32_t type) {
        void* const handle = spline.appendVertexNoTangents(u, value, kTempusZero);
        spline.setVertexInterpolation(handle, type);
        return static_cast<KFVertex*>(handle);
    }

    void fillWithBeziers(std::mt19937& random, int count) {
        auto const number = [&random](int high) {
            return static_cast<int>(random() % static_cast<unsigned>(high + 1));
        };
        int u = number(60) - 30;
        for (int i = 0; i < count; ++i) {
            KFVertex* const vertex = append(TempusMake(u, 30), number(18) - 9, number(3) == 0 ? 1 : 4);
            vertex->setInputTangents(-number(9) / 100.0, (number(18) - 9) / 30.0, kTempusZero);
            vertex->setOutputTangents(number(9) / 100.0, (number(18) - 9) / 30.0, kTempusZero);
            u += 10 + number(30);
        }
    }

    KFVertex* at(int index) {
        auto place = spline.beginVertices();
        while (index-- > 0) {
            place = spline.nextPlace(place);
        }
        return spline.vertexAt(place);
    }

    double value(Tempus const& u) { return spline.getVertexValue(u, kTempusZero, true); }
    std::vector<double> values() {
        std::vector<double> all;
        for (auto place = spline.beginVertices(); place != spline.endVertices();
             place = spline.nextPlace(place)) {
            all.push_back(spline.vertexAt(place)->getValueV(kTempusZero));
        }
        return all;
    }
    std::vector<double> positions() {
        std::vector<double> all;
        for (auto place = spline.beginVertices(); place != spline.endVertices();
             place = spline.nextPlace(place)) {
            all.push_back(TempusGetSeconds(spline.vertexAt(place)->getValueU()));
        }
        return all;
    }
    /// Searches find each vertex where it stands: the index of positions is up to date.
    void expectFindable() {
        for (auto place = spline.beginVertices(); place != spline.endVertices();
             place = spline.nextPlace(place)) {
            void* found = nullptr;
            Tempus const u = spline.vertexAt(place)->getValueU();
            ASSERT_TRUE(spline.getVertexHandle(u, &found, true));
            EXPECT_EQ(u, static_cast<KFVertex*>(found)->getValueU());
        }
    }
};

using Numbers = std::vector<double>;

TEST(KFSplineTransform, OffsetsWithinLimits) {
    auto const offset = [](Curve& curve, int u, double value, bool neighboursOnly, bool keepShape) {
        curve.spline.offsetSpline(seconds(u), value, 10.0, -10.0, neighboursOnly, keepShape, kTempusZero);
        return curve.values();
    };
    { // The one at the limit holds all back, or only itself.
        Curve curve{{0, 1.0}, {1, 9.0}, {2, 5.0}};
        EXPECT_EQ((Numbers{2.0, 10.0, 6.0}), offset(curve, 0, 4.0, false, true));
        Curve other{{0, 1.0}, {1, 9.0}, {2, 5.0}};
        EXPECT_EQ((Numbers{4.0, 10.0, 8.0}), offset(other, 0, 4.0, false, false));
        Curve downwards{{0, 1.0}, {1, -8.0}, {2, 5.0}};
        EXPECT_EQ((Numbers{-1.0, -10.0, 3.0}), offset(downwards, 0, -4.0, false, true));
    }
    { // Only the neighbours move, and of several at one place none that stands at u.
        Curve curve{{0, 1.0}, {1, 9.0}, {2, 5.0}, {3, 0.0}};
        EXPECT_EQ((Numbers{4.0, 9.0, 8.0, 0.0}), offset(curve, 1, 12.0, true, false));
        Curve held{{0, 1.0}, {1, 7.0}, {2, 9.0}, {3, 0.0}};
        EXPECT_EQ((Numbers{2.0, 7.0, 10.0, 0.0}), offset(held, 1, 10.0, true, true));
        Curve before{{1, 9.0}, {2, 5.0}};
        EXPECT_EQ((Numbers{10.0, 5.0}), offset(before, 0, 12.0, true, true));
    }
    { // A locked vertex stays.
        Curve curve{{0, 1.0}, {1, 2.0}};
        curve.at(0)->setFlag(kKFVertexFlagLocked);
        EXPECT_EQ((Numbers{1.0, 5.0}), offset(curve, 1, 5.0, false, false));
    }
}

TEST(KFSplineTransform, ScalesValuesAndTheEndsOfTangents) {
    Curve curve{{0, 1.0}, {1, -4.0}};
    curve.at(0)->setInputTangents(-0.5, 0.25, kTempusZero);
    curve.at(0)->setOutputTangents(0.5, 1.0, kTempusZero);
    curve.spline.scaleSpline(2.0, 0.0, 3.0, kTempusZero);
    EXPECT_EQ((Numbers{2.0, 0.0}), curve.values());
    double u = 0.0;
    double v = 0.0;
    curve.at(0)->getInputTangents(&u, &v, kTempusZero);
    EXPECT_EQ((std::pair{-0.5, 0.5}), (std::pair{u, v}));
    curve.at(0)->getOutputTangents(&u, &v, kTempusZero);
    EXPECT_EQ((std::pair{0.5, 1.0}), (std::pair{u, v})) << "its end stops at the limit";
}

TEST(KFSplineTransform, WarpsTheCurveWithItsTangents) {
    std::mt19937 random(1);
    for (int round = 0; round < 40; ++round) {
        Curve curve;
        curve.fillWithBeziers(random, 5);
        Tempus const offset = TempusMake(7, 24);
        curve.at(2)->setFlag(kKFVertexFlagLocked);
        double const lockedAt = TempusGetSeconds(curve.at(2)->getValueU());

        Curve warped;
        warped.spline = curve.spline;
        warped.spline.forceWarpSplineLinear(TempusMake(3, 2), offset);
        EXPECT_TRUE(warped.at(2)->testFlag(kKFVertexFlagLocked));
        warped.expectFindable();
        for (int i = -10; i < 200; ++i) {
            Tempus const u = TempusMake(i, 40);
            EXPECT_NEAR(curve.value(u), warped.value(u * 1.5 + offset), 1e-6);
        }
        warped.spline = curve.spline;
        warped.spline.warpSplineLinear(1.5, offset, kTempusZero);
        EXPECT_EQ(lockedAt, TempusGetSeconds(warped.at(2)->getValueU()));
        EXPECT_EQ(curve.at(1)->getValueU() * 1.5 + offset, warped.at(1)->getValueU());
    }
}

TEST(KFSplineReverseVertices, MirrorsTheCurve) {
    std::mt19937 random(2);
    for (int round = 0; round < 200; ++round) {
        Curve curve;
        int const count = 2 + static_cast<int>(random() % 6);
        curve.fillWithBeziers(random, count);
        Curve original;
        original.spline = curve.spline;
        int const first = static_cast<int>(random() % static_cast<unsigned>(count));
        int const last = first + static_cast<int>(random() % static_cast<unsigned>(count - first));
        Tempus const from = original.at(first)->getValueU();
        Tempus const to = original.at(last)->getValueU();
        curve.spline.reverseVertices(curve.at(first), curve.at(last));

        ASSERT_EQ(static_cast<std::size_t>(count), curve.spline.getNumberOfVertices());
        EXPECT_EQ(from, curve.at(first)->getValueU());
        EXPECT_EQ(to, curve.at(last)->getValueU());
        curve.expectFindable();
        for (int i = 0; i <= 100; ++i) {
            Tempus const u = from + (to - from) * TempusMake(i, 100);
            // Where a tangent was vertical the mirrored solution is rounded from the other side.
            ASSERT_NEAR(original.value(u), curve.value(to - (u - from)), 1e-6) << "round " << round;
        }
        // The segment that follows takes the type of the last.
        EXPECT_EQ(original.at(last)->getInterpolation(), curve.at(last)->getInterpolation());
        // An inner vertex has changed its two sides; what the first and last show outwards they keep.
        auto const sidesOf = [](KFVertex* vertex) {
            std::array<double, 4> sides{};
            vertex->getInputTangents(&sides[0], &sides[1], kTempusZero);
            vertex->getOutputTangents(&sides[2], &sides[3], kTempusZero);
            return sides;
        };
        for (int i = first; i <= last; ++i) {
            std::array<double, 4> const old = sidesOf(original.at(i));
            std::array<double, 4> expected{-old[2], old[3], -old[0], old[1]};
            if (i == first) {
                expected[2] = old[2];
                expected[3] = old[3];
            }
            if (i == last) {
                expected[0] = old[0];
                expected[1] = old[1];
            }
            EXPECT_EQ(expected, sidesOf(curve.at(first + last - i)));
        }
    }
}

TEST(KFSplineReverseVertices, KeepsWhatItMayNotTouch) {
    { // A closed spline stays closed though all its vertices are exchanged.
        Curve curve{{0, 1.0}, {1, 2.0}, {3, 5.0}};
        curve.spline.setClosed(true, nullptr);
        curve.spline.reverseVertices(curve.at(0), curve.at(2));
        EXPECT_TRUE(curve.spline.isClosed());
        EXPECT_EQ((Numbers{5.0, 2.0, 1.0}), curve.values());
        EXPECT_EQ((Numbers{0.0, 2.0, 3.0}), curve.positions());
        EXPECT_EQ(5.0, curve.value(seconds(0)));
    }
    { // A lock anywhere in the stretch, and a stretch that isn't one.
        Curve curve{{0, 1.0}, {1, 2.0}, {3, 5.0}};
        curve.at(1)->setFlag(kKFVertexFlagLocked);
        int foreign = 0;
        void* const handles[] = {curve.at(0), curve.at(2)};
        curve.spline.reverseVertices(handles[0], handles[1]);
        curve.spline.reverseVertices(handles[1], handles[0]);
        curve.spline.reverseVertices(nullptr, handles[1]);
        curve.spline.reverseVertices(handles[0], &foreign);
        EXPECT_EQ((Numbers{1.0, 2.0, 5.0}), curve.values());
        EXPECT_EQ(handles[0], curve.at(0)) << "the handles are still good";
    }
}

TEST(KFSplineTransform, CountsVerticesAsParameter) {
    { // A time curve becomes a path from value 0, tangents in fractions of a segment.
        Curve curve{{0, 5.0}, {2, 7.0}, {6, 4.0}};
        curve.at(1)->setFlag(kKFVertexFlagLocked);
        for (int i = 0; i < 3; ++i) {
            std::uint32_t const flags = curve.at(i)->getFlags();
            curve.at(i)->setFlags(0);
            curve.at(i)->setInputTangents(-0.5, 0.25, kTempusZero);
            curve.at(i)->setOutputTangents(0.5, 0.75, kTempusZero);
            curve.at(i)->setFlags(flags);
        }
        curve.spline.parametrizeSpline();
        EXPECT_EQ((Numbers{0.0, 7.0, -1.0}), curve.values()) << "a locked vertex keeps its value";
        EXPECT_EQ((Numbers{0.0, 1.0, 2.0}), curve.positions()) << "but is counted";
        EXPECT_TRUE(curve.at(1)->testFlag(kKFVertexFlagLocked));
        curve.expectFindable();
        double u = 0.0;
        double v = 0.0;
        curve.at(0)->getOutputTangents(&u, &v, kTempusZero);
        EXPECT_EQ((std::pair{0.25, 0.75}), (std::pair{u, v}));
        curve.at(2)->getInputTangents(&u, &v, kTempusZero);
        EXPECT_EQ((std::pair{-0.125, 0.25}), (std::pair{u, v}));
        curve.at(2)->getOutputTangents(&u, &v, kTempusZero);
        EXPECT_EQ((std::pair{0.125, -0.25}), (std::pair{u, v}));
    }
    Curve empty;
    empty.spline.parametrizeSpline();
    EXPECT_EQ(0u, empty.spline.getNumberOfVertices());
}

TEST(KFSplineTransform, OpensAtAVertex) {
    Curve curve{{0, 10.0}, {1, 11.0}, {2, 12.0}, {5, 15.0}};
    curve.spline.setClosed(false, curve.at(2));
    EXPECT_EQ((Numbers{10.0, 11.0, 12.0, 15.0}), curve.values()) << "it is open already";
    curve.spline.setClosed(true, curve.at(2));
    EXPECT_EQ((Numbers{0.0, 1.0, 2.0, 5.0}), curve.positions());
    curve.spline.setClosed(false, curve.at(2));
    EXPECT_FALSE(curve.spline.isClosed());
    EXPECT_EQ((Numbers{12.0, 15.0, 10.0, 11.0}), curve.values());
    EXPECT_EQ((Numbers{0.0, 1.0, 2.0, 3.0}), curve.positions());
    EXPECT_EQ(12.5, curve.value(seconds(2)) + 2.5);
    void* first = nullptr;
    EXPECT_TRUE(curve.spline.getFirstValidVertex(&first, kTempusZero));
    EXPECT_EQ(curve.at(0), first);
    EXPECT_TRUE(curve.spline.isDirty());
}

TEST(KFSplineTransform, PurgesAllButTheFirstAtAPlace) {
    Curve curve{{1, 1.0}, {1, 2.0}, {2, 3.0}, {2, 4.0}, {2, 5.0}, {3, 6.0}};
    curve.at(4)->setFlag(kKFVertexFlagLocked);
    curve.spline.purge();
    EXPECT_EQ((Numbers{1.0, 3.0, 5.0, 6.0}), curve.values());
    curve.at(2)->resetFlag(kKFVertexFlagLocked);
    curve.spline.purge();
    EXPECT_EQ((Numbers{1.0, 2.0, 3.0}), curve.positions());
    Curve empty;
    empty.spline.purge();
    EXPECT_EQ(0u, empty.spline.getNumberOfVertices());
}

TEST(KFSplineTransform, TakesSnapshotsOfValidVertices) {
    Curve source{{0, 1.0}, {1, 2.0}, {2, 3.0}};
    source.spline.setClosed(true, nullptr);
    source.at(0)->setInterpolation(4);
    source.at(0)->setBias(0.5, kTempusZero);
    source.at(0)->setFlag(kKFVertexFlagLocked);
    source.spline.disableVertex(source.at(1), kTempusZero);
    Curve curve{{7, 7.0}};
    curve.at(0)->setFlag(kKFVertexFlagLocked);
    curve.spline.generateSplineFromDynamicSpline(kTempusZero, &source.spline);
    EXPECT_EQ((Numbers{1.0, 3.0}), curve.values());
    EXPECT_TRUE(curve.spline.isClosed());
    EXPECT_EQ(0u, curve.at(0)->getFlags());
    EXPECT_EQ(4u, curve.at(0)->getInterpolation());
    EXPECT_EQ(0.5, curve.at(0)->getBias(kTempusZero));
    EXPECT_EQ(2u, curve.spline.getNumberOfValidVertices(kTempusZero));
    EXPECT_EQ(3u, source.spline.getNumberOfVertices());
}

} // namespace
