// Properties of evaluation over the whole museum.

#include "tests/splines/museum.h"
#include "tests/splines/SlowCurve.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <numeric>
#include <random>

namespace {

/// Runs a property over each exhibit, and stops at the first that it doesn't hold for.
template <class Property> void overMuseum(Property property) {
    for (Exhibit const& exhibit : museum()) {
        SCOPED_TRACE(exhibit.name);
        MuseumSpline curve = exhibit.build();
        property(curve);
        if (testing::Test::HasFailure()) {
            return;
        }
    }
}

#define ASSERT_SAME(actual, expected, where)                                                                 \
    do {                                                                                                     \
        double const actualValue = (actual);                                                                 \
        double const expectedValue = (expected);                                                             \
        ASSERT_TRUE(isSameDouble(actualValue, expectedValue))                                                \
            << where << ": " << testing::PrintToString(actualValue) << ", not "                              \
            << testing::PrintToString(expectedValue);                                                        \
    } while (false)

bool drawsAsOneCurve(MuseumSpline const& curve) {
    return isWholeCurveType(curve.typeOfAll()) && curve.state->parametric;
}

/// The same instant in a timescale `factor` times as fine, where that can be written.
Tempus finer(Tempus const& u, std::int32_t factor) {
    std::int64_t value = 0;
    std::int32_t timescale = 0;
    bool const fits = TempusIsNumeric(u) && !__builtin_mul_overflow(u.value, factor, &value) &&
                      !__builtin_mul_overflow(u.timescale, factor, &timescale);
    return fits ? TempusMake(value, timescale) : u;
}

} // namespace

TEST(Museum, ReadsAsAPlainWalkWould) {
    overMuseum([](MuseumSpline& curve) {
        for (Tempus const& u : museumPositions(*curve)) {
            double const expected = walkedValue(*curve, u);
            ASSERT_SAME(curve.at(u), expected, museumText(u));
            ASSERT_SAME(curve.at(u, false), expected, museumText(u) << ", without the lock");
            ASSERT_SAME(curve.slopeAt(u), walkedSlope(*curve, u), museumText(u) << ", slope");
        }
    });
}

TEST(Museum, DrawsCubicSegmentsAsTheConstructionDoes) {
    overMuseum([](MuseumSpline& curve) {
        auto const positions = museumPositions(*curve);
        for (Segment const& segment : segmentsOf(*curve)) {
            bool const mayFold = !curve.state->sanitizeBezier && !curve.state->parametric;
            if (!isCubicType(segment.a->getInterpolation()) || mayFold) {
                continue;
            }
            LongCubic const truth(*curve, segment);
            auto const begin = std::upper_bound(positions.begin(), positions.end(), segment.a->getValueU());
            auto const end = std::lower_bound(positions.begin(), positions.end(), segment.b->getValueU());
            for (auto u = begin; u < end; ++u) {
                auto const [low, high] = truth.at(*u);
                double const value = curve.at(*u);
                ASSERT_TRUE(low <= value && value <= high)
                    << museumText(*u) << ": " << testing::PrintToString(value) << " outside "
                    << testing::PrintToString(low) << ".." << testing::PrintToString(high);
            }
        }
    });
}

TEST(Museum, DrawsOtherSegmentsByTheirFormulas) {
    std::size_t compared = 0;
    overMuseum([&](MuseumSpline& curve) {
        auto const positions = museumPositions(*curve);
        for (auto const& [a, b] : segmentsOf(*curve)) {
            std::uint32_t const type = a->getInterpolation();
            bool const rises = type < 15 || type > 17 || std::fabs(a->getBias(kTempusZero) - 1.0) <= 1.0;
            if (isCubicType(type) || isWholeCurveType(type) || drawsAsOneCurve(curve) || !rises) {
                continue;
            }
            double const tolerance = longShapeTolerance(*a, *b);
            auto const begin = std::upper_bound(positions.begin(), positions.end(), a->getValueU());
            auto const end = std::lower_bound(positions.begin(), positions.end(), b->getValueU());
            for (auto u = begin; u < end; ++u) {
                long double const fraction =
                    distanceInSeconds(a->getValueU(), *u) / distanceInSeconds(a->getValueU(), b->getValueU());
                ASSERT_NEAR(curve.at(*u), static_cast<double>(longShape(*a, *b, fraction)), tolerance)
                    << museumText(*u) << ", type " << type;
                ++compared;
            }
        }
    });
    EXPECT_GT(compared, 1000u);
}

TEST(Museum, CopiesReadAsTheirOriginal) {
    overMuseum([](MuseumSpline& curve) {
        auto const positions = museumPositions(*curve);
        auto const expectCopied = [&](MuseumSpline& copy, std::vector<KFVertex*> const& originals) {
            auto const copies = museumVertices(*copy);
            ASSERT_EQ(copies.size(), originals.size());
            for (std::size_t i = 0; i < copies.size(); ++i) {
                ASSERT_NE(copies[i], originals[i]);
                ASSERT_TRUE(*copies[i] == *originals[i]) << "vertex " << i;
            }
            ASSERT_EQ(copy->isClosed(), curve->isClosed());
        };
        auto const originals = museumVertices(*curve);
        MuseumSpline constructed(curve);
        MuseumSpline assigned;
        *assigned.state = *curve.state;
        assigned->addVertex(TempusMake(1, 2), 99.0, kTempusZero, true);
        assigned.at(TempusMake(1, 2));
        *assigned.spline = *curve.spline;
        for (MuseumSpline* copy : {&constructed, &assigned}) {
            ASSERT_NO_FATAL_FAILURE(expectCopied(*copy, originals));
            for (Tempus const& u : positions) {
                ASSERT_SAME(copy->at(u), curve.at(u), museumText(u));
            }
        }
        if (originals.size() < 3) {
            return;
        }
        std::vector<KFVertex*> const stretch(originals.begin() + 1, originals.end() - 1);
        assigned->copy(*curve, stretch.front(), stretch.back());
        ASSERT_NO_FATAL_FAILURE(expectCopied(assigned, stretch));
        for (std::size_t i = 0; i < positions.size(); i += 1 + positions.size() / 60) {
            ASSERT_SAME(assigned.at(positions[i]), MuseumSpline(assigned).at(positions[i]),
                        museumText(positions[i]) << ", of a stretch");
        }
        assigned->copy(*curve, stretch.front(), nullptr);
        ASSERT_EQ(assigned->getFirstVertex(), nullptr);
        ASSERT_SAME(assigned.at(kTempusZero), walkedValue(*assigned, kTempusZero), "of nothing");
    });
}

// What was asked before, and in which timescale, never changes an answer.
TEST(Museum, AnswersAlikeInAnyOrder) {
    std::mt19937 random(12);
    overMuseum([&](MuseumSpline& curve) {
        auto positions = museumPositions(*curve);
        std::vector<double> expected;
        for (Tempus const& u : positions) {
            expected.push_back(curve.at(u, false)); // keeps nothing
        }
        std::vector<std::size_t> order(positions.size());
        std::iota(order.begin(), order.end(), std::size_t{0});
        auto const ask = [&](char const* what) {
            int turn = 0;
            for (std::size_t const i : order) {
                std::int32_t const factor = turn % 5 == 1 ? 2 : turn % 5 == 3 ? 7 : 1;
                ASSERT_SAME(curve.at(finer(positions[i], factor), turn % 4 != 2), expected[i],
                            what << " " << museumText(positions[i]) << " in a timescale times " << factor);
                ++turn;
            }
        };
        ASSERT_NO_FATAL_FAILURE(ask("ascending"));
        std::reverse(order.begin(), order.end());
        ASSERT_NO_FATAL_FAILURE(ask("descending"));
        for (int round = 0; round < 3; ++round) {
            std::shuffle(order.begin(), order.end(), random);
            ASSERT_NO_FATAL_FAILURE(ask("random"));
        }
    });
}

TEST(Museum, SamplesReadAsSinglePositions) {
    overMuseum([](MuseumSpline& curve) {
        auto const vertices = museumVertices(*curve);
        if (vertices.empty() || (drawsAsOneCurve(curve) && !isWholeCurveType(curve.state->interpolation))) {
            return; // Such rows are drawn as one curve, single positions segment by segment.
        }
        Tempus const first = vertices.front()->getValueU();
        Tempus const length = vertices.back()->getValueU() - first;
        Tempus const fine = length / 60;
        // Starts and steps.
        std::pair<Tempus, Tempus> const rows[] = {
            {first, TempusMake(1, 24)},
            {first - length * 0.25, fine},
            {first + length * 1.25, -fine},
            {first + length, TempusMake(-1001, 30000)},
            {KFChronoForChannelSeconds(TempusGetSeconds(first), 48000), TempusMake(1, 262144)},
            {first - TempusMake(1, 7), KFChronoForChannelSeconds(TempusGetSeconds(fine), 90000)},
            {first + length * 0.5, kTempusZero}};
        for (auto const& [start, step] : rows) {
            std::uint32_t count = 90;
            std::vector<Tempus> times(count), moreTimes;
            std::vector<double> values(count), moreValues, slopes(count), moreSlopes;
            curve->sampleSpline(start, step, count, times.data(), values.data(), kTempusZero, false);
            curve->sampleSpline(start, step, count, &moreTimes, &moreValues, kTempusZero, false);
            ASSERT_EQ(count, 90u);
            ASSERT_EQ(moreTimes, times);
            ASSERT_EQ(moreValues.size(), count);
            for (std::uint32_t i = 0; i < count; ++i) {
                ASSERT_TRUE(drawsAsOneCurve(curve) || times[i] == start + step * i);
                ASSERT_SAME(values[i], curve.at(times[i]),
                            museumText(times[i]) << ", sample " << i << " by " << museumText(step));
                ASSERT_SAME(moreValues[i], values[i], museumText(times[i]) << " of a vector");
            }
            curve->sampleSplineDerivatives(start, step, count, times.data(), slopes.data(), kTempusZero);
            curve->sampleSplineDerivatives(start, step, count, &moreTimes, &moreSlopes, kTempusZero);
            ASSERT_EQ(moreTimes.size(), 180u) << "vectors keep what they held";
            curve->sampleSplineSegment(start, step, count, nullptr, values.data(), kTempusZero, true);
            for (std::uint32_t i = 0; i < count; ++i) {
                ASSERT_SAME(slopes[i], curve.slopeAt(times[i]), museumText(times[i]) << ", slope");
                ASSERT_SAME(moreSlopes[i], slopes[i], museumText(times[i]) << ", slope of a vector");
                ASSERT_SAME(values[i], curve.at(start + step * i), museumText(times[i]) << ", segment");
            }
        }
    });
}

// Types that promise a slope give that of the chord (Constant, and those linear in time or eased time) or of the curve;
// the others give the value.
TEST(Museum, SlopesFollowTheCurve) {
    overMuseum([](MuseumSpline& curve) {
        for (Segment const& segment : segmentsOf(*curve)) {
            Tempus const length = segment.b->getValueU() - segment.a->getValueU();
            Tempus const u = segment.a->getValueU() + length * 0.3;
            std::uint32_t const type = segment.a->getInterpolation();
            double const rise = segment.b->getValueV(kTempusZero) - segment.a->getValueV(kTempusZero);
            if (isWholeCurveType(type) || !(segment.a->getValueU() < u)) {
                continue;
            }
            if (type == 0 || type == 1 || (type >= 15 && type <= 18)) {
                ASSERT_DOUBLE_EQ(curve.slopeAt(u), type == 0 ? 0.0 : rise / TempusGetSeconds(length));
            } else if (!isCubicType(type)) {
                ASSERT_SAME(curve.slopeAt(u), curve.at(u), museumText(u));
            } else if (length > TempusMake(1, 10)) {
                Tempus const d = TempusMake(1, 1000);
                ASSERT_SAME(curve.slopeAt(u), (curve.at(u + d) - curve.at(u - d)) / 0.002, museumText(u));
            }
        }
    });
}

namespace {

using Curve = MuseumSpline&;
using Vertex = KFVertex*;

struct Edit {
    char const* what;
    void (*apply)(Curve curve, Vertex vertex);
};

/// Everything that changes what is read around a vertex, directly and through the spline. Those that may remove the
/// vertex stand last.
Edit const kEdits[] = {
    {"value on the vertex",
     [](Curve, Vertex v) { v->setValueV(v->getValueV(kTempusZero) + 0.75, kTempusZero); }},
    {"output tangent on the vertex", [](Curve, Vertex v) { v->setOutputTangents(0.02, 0.3, kTempusZero); }},
    {"input tangent on the vertex", [](Curve, Vertex v) { v->setInputTangents(-0.01, 0.4, kTempusZero); }},
    {"swapped tangents", [](Curve, Vertex v) { v->swapTangents(); }},
    {"flat tangents", [](Curve, Vertex v) { v->flattenTangents(kTempusZero); }},
    {"type on the vertex", [](Curve, Vertex v) { v->setInterpolation(15); }},
    {"bias on the vertex", [](Curve, Vertex v) { v->setBias(0.35, kTempusZero); }},
    {"type by the spline", [](Curve c, Vertex v) { c->setVertexInterpolation(v, 6); }},
    {"cubic by the spline", [](Curve c, Vertex v) { c->setVertexInterpolation(v, 4); }},
    {"output handle", [](Curve c, Vertex v) { c->setVertexOutputHandles(v, 0.3, 2.0, kTempusZero, true); }},
    {"input handle", [](Curve c, Vertex v) { c->setVertexInputHandles(v, -0.6, 2.0, kTempusZero, true); }},
    {"sanitizing", [](Curve c, Vertex) { c.state->sanitizeBezier = !c.state->sanitizeBezier; }},
    {"parametric", [](Curve c, Vertex) { c.state->parametric = !c.state->parametric; }},
    {"retiming", [](Curve c, Vertex) { c.state->retimingExtrapolation = !c.state->retimingExtrapolation; }},
    {"mode after", [](Curve c, Vertex) { c->setExtrapolation((c->getExtrapolation(0) + 1) % 5, 0); }},
    {"closing and opening", [](Curve c, Vertex) { c->setClosed(!c->isClosed(), nullptr); }},
    {"whole curve as state", [](Curve c, Vertex) { c.state->interpolation = 13 - c.state->interpolation; }},
    {"disabling", [](Curve c, Vertex v) { c->disableVertex(v, kTempusZero); }},
    {"enabling", [](Curve c, Vertex v) { c->enableVertex(v, kTempusZero); }},
    {"enabling on the vertex",
     [](Curve c, Vertex v) {
         v->setEnabled(!v->isEnabled(kTempusZero), kTempusZero);
         c->setDirty(true);
     }},
    {"position in place",
     [](Curve c, Vertex v) {
         Tempus const u = v->getValueU();
         auto* const next = static_cast<KFVertex*>(c->getNextVertex(v));
         c->offsetVertexInTime(v, next == nullptr ? u + TempusMake(1, 7) : u + (next->getValueU() - u) * 0.25,
                               kTempusZero);
     }},
    {"adding",
     [](Curve c, Vertex v) { c->addVertex(v->getValueU() + TempusMake(1, 97), 3.5, kTempusZero, false); }},
    {"adding at one place",
     [](Curve c, Vertex v) { c->addVertexNoTangents(v->getValueU(), 4.5, kTempusZero, false); }},
    {"adding behind",
     [](Curve c, Vertex v) {
         c->addVertexNoTangents(BX_TempusFloorToSampleDuration(v->getValueU(), TempusMake(1, 25)), 9.0,
                                kTempusZero, true);
     }},
    {"a whole type", [](Curve c, Vertex v) { v->setInterpolation(c->isClosed() ? 10 : 12); }},
    {"no whole type", [](Curve, Vertex v) { v->setInterpolation(8); }},
    {"moving",
     [](Curve c, Vertex v) {
         c->moveVertex(v, v->getValueU() + TempusMake(3, 25), kTempusZero, false, false, false);
     }},
    {"deleting", [](Curve c, Vertex v) { c->deleteVertex(v, true, kTempusZero); }},
};

} // namespace

TEST(Museum, EditsAreSeenByTheNextRead) {
    overMuseum([](MuseumSpline& curve) {
        std::size_t const size = museumVertices(*curve).size();
        if (size > 400) {
            return; // Plain walks after each edit take too long; 300 vertices stand in several blocks too.
        }
        for (std::size_t i = 0; i < size; i += 1 + size / 5) {
            for (Edit const& edit : kEdits) {
                auto const vertices = museumVertices(*curve);
                if (i >= vertices.size()) {
                    break;
                }
                // Warm each segment around the vertex, so that its next read could come from what was kept of it.
                std::size_t const low = i > 2 ? i - 2 : 0;
                std::size_t const high = std::min(i + 3, vertices.size() - 1);
                std::vector<Tempus> positions{vertices[i]->getValueU(),
                                              vertices.back()->getValueU() + TempusMake(1, 3)};
                for (std::size_t k = low; k < high; ++k) {
                    Tempus const u = vertices[k]->getValueU();
                    positions.push_back(u + (vertices[k + 1]->getValueU() - u) * 0.375);
                }
                auto const expectSeen = [&](Tempus const& u) {
                    ASSERT_SAME(curve.at(u), walkedValue(*curve, u),
                                museumText(u) << " after " << edit.what << " of vertex " << i);
                };
                for (std::size_t k = 0; k < positions.size(); ++k) {
                    curve.at(positions[k]);
                    if (k % 2 == 0 || &edit >= std::end(kEdits) - 2) {
                        continue;
                    }
                    // The segment that was just read is the one that must be noticed to have changed.
                    edit.apply(curve, vertices[i]);
                    ASSERT_NO_FATAL_FAILURE(expectSeen(positions[k]));
                }
                edit.apply(curve, museumVertices(*curve)[i]);
                for (Tempus const& u : positions) {
                    ASSERT_NO_FATAL_FAILURE(expectSeen(u));
                }
            }
        }
    });
}
