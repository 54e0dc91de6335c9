// Properties of evaluation over the whole museum.

#include "tests/splines/museum.h"
#include "lumenkey/splines/KFBezierUtil.h"
#include "lumenkey/splines/KFCubic.h"
#include "lumenkey/splines/KFSplineInterpolator.h"
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
        SCOPED_TRACE(exhibit.name + ": " + exhibit.why);
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
    std::uint32_t type = 0;
    curve->getInterpolation(&type, nullptr, nullptr);
    return isWholeCurveType(type) && curve.state->parametric;
}

/// One instant of a segment in its finest usual timescale, so that a part of it stays inside.
Tempus inside(Segment const& segment, double part) {
    return segment.a->getValueU() + (segment.b->getValueU() - segment.a->getValueU()) * part;
}

bool isInside(Segment const& segment, Tempus const& u) {
    return segment.a->getValueU() < u && u < segment.b->getValueU();
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

TEST(Museum, GivesAtAVertexTheFirstEnabledOneThere) {
    overMuseum([](MuseumSpline& curve) {
        auto const vertices = museumVertices(*curve);
        KFVertex const* before = nullptr;
        KFVertex const* counted = nullptr;
        for (KFVertex const* vertex : vertices) {
            Tempus const u = vertex->getValueU();
            bool const isFirstThere =
                vertex->isEnabled(kTempusZero) && (counted == nullptr || counted->getValueU() != u);
            // Whole curves don't pass through their control points, and a retimed curve doesn't reach its end.
            bool const passes = !drawsAsOneCurve(curve) &&
                                !isWholeCurveType(vertices.front()->getInterpolation()) &&
                                (before == nullptr || !isWholeCurveType(before->getInterpolation())) &&
                                !(curve.state->retimingExtrapolation && u == vertices.back()->getValueU());
            if (isFirstThere && passes) {
                ASSERT_SAME(curve.at(u), vertex->getValueV(kTempusZero), museumText(u));
            }
            counted = isFirstThere ? vertex : counted;
            before = vertex;
        }
    });
}

// Just beside its ends a segment has nearly their values. How nearly, a millionth and a billionth of the segment away:
// the steepest starts, of the cubic with a vertical handle, grow with the cube root of the distance.
TEST(Museum, IsContinuousAtVertices) {
    overMuseum([](MuseumSpline& curve) {
        for (Segment const& segment : segmentsOf(*curve)) {
            std::uint32_t const type = segment.a->getInterpolation();
            double const span = TempusGetSeconds(segment.b->getValueU() - segment.a->getValueU());
            bool const reachesEnd =
                type != 0 && !isWholeCurveType(type) && !(isCubicType(type) && span < 1e-5);
            if (isWholeCurveType(type) || (isCubicType(type) && LongCubic(*curve, segment).folds())) {
                continue;
            }
            double const a = segment.a->getValueV(kTempusZero);
            double const b = segment.b->getValueV(kTempusZero);
            double size = std::max({std::fabs(a), std::fabs(b), 1e-12});
            for (double const part : {0.1, 0.5, 0.9}) {
                size = std::max(size, std::fabs(curve.at(inside(segment, part))));
            }
            for (double const part : {1e-6, 1e-9}) {
                // Where the timescales don't let a position that near be written, it is the end or further off.
                double const bound = 8.0 * size * std::cbrt(std::max(part, 1e-9 / span));
                Tempus const first = inside(segment, part);
                Tempus const last = inside(segment, 1.0 - part);
                if (isInside(segment, first)) {
                    ASSERT_NEAR(curve.at(first), a, bound) << "behind " << museumText(segment.a->getValueU());
                }
                if (reachesEnd && isInside(segment, last)) {
                    ASSERT_NEAR(curve.at(last), b, bound) << "before " << museumText(segment.b->getValueU());
                }
            }
        }
    });
}

TEST(Museum, DrawsCubicSegmentsAsTheConstructionDoes) {
    overMuseum([](MuseumSpline& curve) {
        auto const positions = museumPositions(*curve);
        for (Segment const& segment : segmentsOf(*curve)) {
            if (!isCubicType(segment.a->getInterpolation())) {
                continue;
            }
            LongCubic const truth(*curve, segment);
            auto const begin = std::upper_bound(positions.begin(), positions.end(), segment.a->getValueU());
            auto const end = std::lower_bound(positions.begin(), positions.end(), segment.b->getValueU());
            for (auto u = begin; u < end; ++u) {
                if (truth.folds() && truth.isAtTurn(*u)) {
                    continue;
                }
                auto const [low, high] = truth.at(*u);
                double const value = curve.at(*u);
                ASSERT_TRUE(low <= value && value <= high)
                    << museumText(*u) << ": " << testing::PrintToString(value) << " outside "
                    << testing::PrintToString(low) << ".." << testing::PrintToString(high);
            }
        }
    });
}

// The fast inverse iterates only where U rises with a slope of a third at least, so that a rounding of U is one of the
// parameter: no tolerance for steepness is needed. Elsewhere both are one function.
TEST(Museum, FindsTheParameterAsTheCubicFormulaDoes) {
    double worst = 0.0;
    auto const compare = [&](double const* polygon) {
        KFCubicInverse inverse;
        inverse.prepare(polygon);
        for (int i = 0; i <= 100; ++i) {
            double const p = i / 100.0;
            double const parameter = KFBezierFindParameter(polygon, p);
            worst = std::max(worst, std::fabs(inverse(p) - parameter));
            ASSERT_NEAR(inverse(p), parameter, 1e-12) << p << " of 0, " << testing::PrintToString(polygon[1])
                                                      << ", " << testing::PrintToString(polygon[2]) << ", 1";
        }
    };
    overMuseum([&](MuseumSpline& curve) {
        for (Segment const& segment : segmentsOf(*curve)) {
            if (!isCubicType(segment.a->getInterpolation())) {
                continue;
            }
            auto& strategy =
                dynamic_cast<KFBezierInterpolator&>(*curve->getInterpolator(segment.a->getInterpolation()));
            Tempus start;
            Tempus end;
            double u[4];
            double v[4];
            strategy.getControlPoints(*curve, segment.a, segment.b, kTempusZero, start, end, u, v);
            ASSERT_NO_FATAL_FAILURE(compare(u));
        }
    });
    std::mt19937 random(11);
    std::uniform_real_distribution<double> place(-0.5, 1.5);
    std::uniform_real_distribution<double> exponent(-12.0, -1.0);
    for (int i = 0; i < 4000; ++i) {
        // Half of them nearly straight, where the leading coefficients vanish.
        double const near = std::pow(10.0, exponent(random));
        double const u1 = i % 2 == 0 ? place(random) : 1.0 / 3.0 + near * place(random);
        double const u2 = i % 2 == 0 ? place(random) : 2.0 / 3.0 - near * place(random);
        double const polygon[4] = {0.0, u1, u2, 1.0};
        ASSERT_NO_FATAL_FAILURE(compare(polygon));
    }
    RecordProperty("worst", testing::PrintToString(worst));
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
        if (drawsAsOneCurve(curve) && !isWholeCurveType(curve.state->interpolation)) {
            return; // Rows are drawn as one curve, single positions segment by segment.
        }
        auto const vertices = museumVertices(*curve);
        Tempus const first = vertices.empty() ? kTempusZero : vertices.front()->getValueU();
        Tempus const length = vertices.empty() ? TempusMake(1, 1) : vertices.back()->getValueU() - first;
        Tempus const fine = length / 60;
        struct Row {
            Tempus start, step;
        };
        Row const rows[] = {
            {first, TempusMake(1, 24)},
            {first - length * 0.25, fine},
            {first + length * 1.25, -fine},
            {first + length, TempusMake(-1001, 30000)},
            {KFChronoForChannelSeconds(TempusGetSeconds(first), 48000), TempusMake(1, 262144)},
            {first - TempusMake(1, 7), KFChronoForChannelSeconds(TempusGetSeconds(fine), 90000)},
            {first + length * 0.5, kTempusZero},
            {first, length}};
        for (Row const& row : rows) {
            std::uint32_t count = 90;
            std::vector<Tempus> times(count);
            std::vector<double> values(count);
            curve->sampleSpline(row.start, row.step, count, times.data(), values.data(), kTempusZero, false);
            ASSERT_EQ(count, 90u);
            std::vector<Tempus> moreTimes;
            std::vector<double> moreValues;
            curve->sampleSpline(row.start, row.step, count, &moreTimes, &moreValues, kTempusZero, false);
            ASSERT_EQ(moreValues.size(), count);
            for (std::uint32_t i = 0; i < count; ++i) {
                if (!drawsAsOneCurve(curve)) {
                    ASSERT_EQ(times[i], row.start + row.step * i);
                }
                ASSERT_EQ(times[i], moreTimes[i]);
                // An empty whole curve leaves an array as it was.
                double const expected = curve.at(times[i]);
                ASSERT_SAME(moreValues[i], expected,
                            museumText(times[i]) << ", sample " << i << " of a vector");
                if (!vertices.empty()) {
                    ASSERT_SAME(values[i], expected,
                                museumText(times[i]) << ", sample " << i << " by " << museumText(row.step));
                }
            }
        }
    });
}

// Types that promise a slope give that of the chord (Constant, and those linear in time or eased time) or of the curve;
// the others give the value.
TEST(Museum, SlopesFollowTheCurve) {
    overMuseum([](MuseumSpline& curve) {
        auto const segments = segmentsOf(*curve);
        for (std::size_t i = 0; i < segments.size(); i += 1 + segments.size() / 100) {
            Segment const& segment = segments[i];
            Tempus const from = segment.a->getValueU();
            Tempus const to = segment.b->getValueU();
            std::uint32_t const type = segment.a->getInterpolation();
            double const rise = segment.b->getValueV(kTempusZero) - segment.a->getValueV(kTempusZero);
            bool const isChord = type == 1 || (type >= 15 && type <= 18);
            double const chord = isChord ? rise / TempusGetSeconds(to - from) : 0.0;
            for (double const part : {0.2, 0.5, 0.8}) {
                Tempus const u = inside(segment, part);
                if (!isInside(segment, u)) {
                    continue;
                }
                double const slope = curve.slopeAt(u);
                if (isChord || type == 0) {
                    ASSERT_DOUBLE_EQ(slope, chord) << museumText(u);
                } else if (!isCubicType(type) && !isWholeCurveType(type)) {
                    ASSERT_SAME(slope, curve.at(u), museumText(u));
                } else if (isCubicType(type) && to - from > TempusMake(1, 10)) {
                    Tempus const d = TempusMake(1, 1000);
                    ASSERT_SAME(slope, (curve.at(u + d) - curve.at(u - d)) / 0.002, museumText(u));
                }
                if (type == 1 && !std::isnan(chord) && std::fabs(chord) < 1e100) {
                    double const numeric =
                        (curve.at(inside(segment, part + 0.1)) - curve.at(inside(segment, part - 0.1))) /
                        TempusGetSeconds(inside(segment, part + 0.1) - inside(segment, part - 0.1));
                    double const size = std::fabs(rise) / TempusGetSeconds(to - from);
                    ASSERT_NEAR(slope, numeric, 1e-6 * size) << museumText(u);
                }
            }
        }
    });
}

namespace {

struct Edit {
    char const* what;
    void (*apply)(MuseumSpline& curve, KFVertex* vertex);
};

/// Everything that changes what is read around a vertex, directly and through the spline. Those that may remove the
/// vertex stand last.
Edit const kEdits[] = {
    {"value on the vertex",
     [](MuseumSpline&, KFVertex* v) { v->setValueV(v->getValueV(kTempusZero) + 0.75, kTempusZero); }},
    {"output tangent on the vertex",
     [](MuseumSpline&, KFVertex* v) { v->setOutputTangents(0.02, 0.3, kTempusZero); }},
    {"input tangent on the vertex",
     [](MuseumSpline&, KFVertex* v) { v->setInputTangents(-0.01, 0.4, kTempusZero); }},
    {"swapped tangents", [](MuseumSpline&, KFVertex* v) { v->swapTangents(); }},
    {"flat tangents", [](MuseumSpline&, KFVertex* v) { v->flattenTangents(kTempusZero); }},
    {"type on the vertex", [](MuseumSpline&, KFVertex* v) { v->setInterpolation(15); }},
    {"bias on the vertex", [](MuseumSpline&, KFVertex* v) { v->setBias(0.35, kTempusZero); }},
    {"type by the spline", [](MuseumSpline& c, KFVertex* v) { c->setVertexInterpolation(v, 6); }},
    {"value by the spline", [](MuseumSpline& c, KFVertex* v) { c->setVertexValue(v, -1.25, kTempusZero); }},
    {"cubic by the spline", [](MuseumSpline& c, KFVertex* v) { c->setVertexInterpolation(v, 4); }},
    {"output handle",
     [](MuseumSpline& c, KFVertex* v) { c->setVertexOutputHandles(v, 0.3, 2.0, kTempusZero, true); }},
    {"input handle",
     [](MuseumSpline& c, KFVertex* v) { c->setVertexInputHandles(v, -0.6, 2.0, kTempusZero, true); }},
    {"sanitizing", [](MuseumSpline& c, KFVertex*) { c.state->sanitizeBezier = !c.state->sanitizeBezier; }},
    {"parametric", [](MuseumSpline& c, KFVertex*) { c.state->parametric = !c.state->parametric; }},
    {"retiming",
     [](MuseumSpline& c, KFVertex*) { c.state->retimingExtrapolation = !c.state->retimingExtrapolation; }},
    {"mode after",
     [](MuseumSpline& c, KFVertex*) { c->setExtrapolation((c->getExtrapolation(0) + 1) % 5, 0); }},
    {"closing and opening", [](MuseumSpline& c, KFVertex*) { c->setClosed(!c->isClosed(), nullptr); }},
    {"whole curve as state",
     [](MuseumSpline& c, KFVertex*) { c.state->interpolation = 13 - c.state->interpolation; }},
    {"disabling", [](MuseumSpline& c, KFVertex* v) { c->disableVertex(v, kTempusZero); }},
    {"enabling", [](MuseumSpline& c, KFVertex* v) { c->enableVertex(v, kTempusZero); }},
    {"enabling on the vertex",
     [](MuseumSpline& c, KFVertex* v) {
         v->setEnabled(!v->isEnabled(kTempusZero), kTempusZero);
         c->setDirty(true);
     }},
    {"position in place",
     [](MuseumSpline& c, KFVertex* v) {
         Tempus const u = v->getValueU();
         auto* const next = static_cast<KFVertex*>(c->getNextVertex(v));
         c->offsetVertexInTime(v, next == nullptr ? u + TempusMake(1, 7) : u + (next->getValueU() - u) * 0.25,
                               kTempusZero);
     }},
    {"adding",
     [](MuseumSpline& c, KFVertex* v) {
         c->addVertex(v->getValueU() + TempusMake(1, 97), 3.5, kTempusZero, false);
     }},
    {"adding at one place",
     [](MuseumSpline& c, KFVertex* v) { c->addVertexNoTangents(v->getValueU(), 4.5, kTempusZero, false); }},
    {"adding behind",
     [](MuseumSpline& c, KFVertex* v) {
         c->addVertexNoTangents(BX_TempusFloorToSampleDuration(v->getValueU(), TempusMake(1, 25)), 9.0,
                                kTempusZero, true);
     }},
    {"a whole type", [](MuseumSpline& c, KFVertex* v) { v->setInterpolation(c->isClosed() ? 10 : 12); }},
    {"no whole type", [](MuseumSpline&, KFVertex* v) { v->setInterpolation(8); }},
    {"moving",
     [](MuseumSpline& c, KFVertex* v) {
         c->moveVertex(v, v->getValueU() + TempusMake(3, 25), kTempusZero, false, false, false);
     }},
    {"deleting", [](MuseumSpline& c, KFVertex* v) { c->deleteVertex(v, true, kTempusZero); }},
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
