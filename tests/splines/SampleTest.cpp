// Rows of samples beyond what the museum compares, the search for a value, and intervals set off on a curve.

#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>

namespace {

using Times = std::vector<Tempus>;
using Numbers = std::vector<double>;

Tempus s(int value, int timescale = 1) { return TempusMake(value, timescale); }

/// Filled at random: shared positions, disabled vertices and flat Bezier segments among them.
struct Curve : MuseumSpline {
    std::mt19937 random;

    explicit Curve(std::uint32_t seed = 0) : random(seed) {}
    int number(int low, int high) {
        return low + static_cast<int>(random() % static_cast<unsigned>(high - low + 1));
    }
    void fill(std::vector<std::uint32_t> const& types, int count, bool mayShare) {
        int u = number(-60, 60);
        for (int i = 0; i < count; ++i) {
            KFVertex* const vertex = append(s(u, 60), number(-9, 9), types[random() % types.size()]);
            if (number(0, 2) > 0) {
                double const size = number(0, 3) == 0 ? 1e-4 : 1.0; // almost flat is curved too
                setSides(*vertex, {-number(0, 9) * size / 100.0, number(-9, 9) * size / 30.0,
                                   number(0, 9) * size / 100.0, number(-9, 9) * size / 30.0});
            }
            u += mayShare && number(0, 4) == 0 ? 0 : number(1, 50);
            if (number(0, 4) == 0) {
                spline->disableVertex(vertex, kTempusZero);
            }
        }
        state->preExtrapolation = static_cast<std::uint32_t>(number(0, 4));
        state->postExtrapolation = static_cast<std::uint32_t>(number(0, 4));
    }
    void expectValues(Times const& times, Numbers const& values) const {
        EXPECT_TRUE(std::equal(times.begin(), times.end(), values.begin(), values.end(),
                               [this](Tempus const& u, double value) { return isSameDouble(at(u), value); }));
    }
};

enum class Into { Arrays, Vectors, Polyline };

/// The adaptive walks once more, step by step over the plain list of vertices.
struct LiteralWalk {
    Curve& curve;
    Tempus step;
    std::vector<KFVertex*> vertices = museumVertices(*curve);

    Times walk(Into into, Tempus const& start, Tempus const& end) const {
        Times out;
        for (Tempus current = start, next = start; next < end; current = next) {
            KFVertex* const stop = nextValid(current);
            next = stop == nullptr ? end : stop->getValueU();
            if (next > end && (into != Into::Arrays || next - end >= step)) {
                next = end;
            }
            // Arrays and polylines go on from the sample before; vectors hold both ends of each part.
            bool const opens =
                into == Into::Vectors || out.empty() || (into == Into::Polyline && out.back() != current);
            if (isStraight(into, current, stop)) {
                out.insert(out.end(), opens ? 1 : 0, current);
                out.push_back(next);
                continue;
            }
            int const steps = static_cast<int>(TempusGetSeconds(next - current) / TempusGetSeconds(step));
            for (int i = opens ? 0 : 1; i < steps + (into == Into::Polyline ? 1 : 0); ++i) {
                out.push_back(current + step * i);
            }
        }
        if (into == Into::Polyline && (out.empty() || out.back() != end)) {
            out.push_back(end);
        }
        return out;
    }

    KFVertex* nextValid(Tempus const& u) const {
        auto const next = std::find_if(vertices.begin(), vertices.end(), [&](KFVertex const* v) {
            return v->isEnabled(kTempusZero) && v->getValueU() > u;
        });
        return next == vertices.end() ? nullptr : *next;
    }
    /// A Bezier segment is straight between tangents that, times a factor, are below 1e-7; into vectors never.
    bool isStraight(Into into, Tempus const& current, KFVertex* next) const {
        KFVertex* start = nullptr;
        for (KFVertex* const vertex : vertices) {
            if (vertex->getValueU() == current) {
                start = vertex;
                break;
            }
            start = vertex->isEnabled(kTempusZero) && vertex->getValueU() < current ? vertex : start;
        }
        if (start == nullptr) {
            return next != nullptr && curve.state->preExtrapolation < 2;
        }
        if (next == nullptr) {
            return curve.state->postExtrapolation < 2;
        }
        if (start->getInterpolation() == 4 && into != Into::Vectors) {
            Sides const in = sidesOf(*next), out = sidesOf(*start);
            auto const isFlat = [into](double x) {
                return std::fabs(x * (into == Into::Arrays ? 12.0 : 1.0)) < 1e-7;
            };
            return isFlat(in[0]) && isFlat(in[1]) && isFlat(out[2]) && isFlat(out[3]);
        }
        return start->getInterpolation() == 1;
    }
};

TEST(KFSplineSample, WalksAdaptivelyStepByStep) {
    for (std::uint32_t seed = 0; seed < 2000 && !HasFailure(); ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        Curve curve(seed);
        curve.fill({0, 1, 1, 4, 4, 15, 18}, curve.number(0, 9), true);
        Tempus const start = s(curve.number(-100, 250), 60);
        Tempus const step = s(curve.number(1, 20), seed % 2 == 0 ? 60 : 100);
        auto const count = static_cast<std::uint32_t>(curve.number(seed % 5 == 0 ? 0 : 1, 40));
        auto const valid = curve->getNumberOfValidVertices(kTempusZero);
        LiteralWalk const literal{curve, step};
        // Without a segment there are the two ends of the row, or the one sample.
        Times ends(count > 1 ? 2 : 1, start);
        ends.back() = count > 1 ? start + step * (count - 1) : start;

        Times const expected = valid < 2 ? ends : literal.walk(Into::Arrays, start, start + step * count);
        std::size_t const room = count + valid + 2;
        ASSERT_LE(expected.size(), room);
        Times times(room + 1, s(-77));
        Numbers values(room + 1, -77.0);
        std::uint32_t written = count;
        ASSERT_TRUE(
            curve->sampleSpline(start, step, written, times.data(), values.data(), kTempusZero, true));
        ASSERT_EQ(count == 0 && expected.size() == 1 ? 0 : expected.size(), written);
        EXPECT_EQ(s(-77), times[expected.size()]);
        EXPECT_EQ(-77.0, values[expected.size()]);
        times.resize(expected.size());
        values.resize(expected.size());
        EXPECT_EQ(expected, times);
        curve.expectValues(expected, values);

        if (count > 0) {
            Times const stops =
                valid < 2 ? ends : literal.walk(Into::Vectors, start, start + step * (count - 1));
            times.clear();
            values.clear();
            written = count;
            ASSERT_TRUE(curve->sampleSpline(start, step, written, &times, &values, kTempusZero, true));
            EXPECT_EQ(stops.size(), written);
            EXPECT_EQ(stops, times);
            curve.expectValues(stops, values);
        }
        Tempus const end = start + step * (count + 1) + s(1, 1000);
        Times const polyline = valid < 2 ? Times{start, end} : literal.walk(Into::Polyline, start, end);
        ASSERT_TRUE(curve->sampleSplineSegments(start, end, step, &times, &values));
        EXPECT_EQ(polyline, times);
        curve.expectValues(polyline, values);
    }
}

TEST(KFSplineSample, KeepsToItsEndsWithoutARow) {
    Curve curve;
    curve.append(s(0), 0.0, 1);
    curve.append(s(1), 2.0, 1);
    Times times(64);
    Numbers values(64);
    // Times that are no numbers end, within the room that was promised.
    for (Tempus const& odd :
         {kTempusPositiveInfinity, kTempusNegativeInfinity, kTempusIndefinite, kTempusInvalid}) {
        for (auto const& [start, step] : {std::pair{odd, s(1, 10)}, std::pair{s(0), odd}}) {
            for (std::uint32_t const wanted : {0u, 1u, 60u}) {
                std::uint32_t count = wanted;
                curve->sampleSpline(start, step, count, times.data(), values.data(), kTempusZero, true);
                EXPECT_LE(count, wanted + 4);
            }
        }
        curve->sampleSplineSegments(s(0), odd, s(1, 10), &times, &values);
        curve->sampleSplineSegments(s(0), s(2), odd, &times, &values);
        EXPECT_LE(times.size(), 40u);
        times.resize(64);
        values.resize(64);
    }
    EXPECT_FALSE(curve->sampleSplineSegments(s(1), s(0), s(1, 10), &times, &values)) << "backwards";
    EXPECT_TRUE(times.empty() && values.empty());
    std::uint32_t count = 0;
    ASSERT_TRUE(curve->sampleSpline(s(0), s(1, 10), count, &times, nullptr, kTempusZero, true));
    EXPECT_TRUE(count == 0 && times.empty()) << "a row of nothing doesn't wrap around";
    // Without a step or a length it is one sample.
    EXPECT_TRUE(curve->sampleSplineSegments(s(0), s(1), kTempusZero, &times, &values));
    EXPECT_EQ(Numbers{0.0}, values);
    EXPECT_TRUE(curve->sampleSplineSegments(s(1, 2), s(1, 2), s(1, 10), &times, &values));
    EXPECT_EQ(Numbers{1.0}, values);
}

TEST(KFSplineSample, StretchesACurveThatIsOneFunction) {
    for (std::uint32_t const type : {10u, 12u}) {
        Curve curve;
        curve.state->parametric = true;
        curve.state->interpolation = type;
        for (int i = 0; i < 6; ++i) {
            curve.append(s(i), (i * 7) % 5, type);
        }
        curve->setDirty(true);
        std::uint32_t count = 11;
        Times times;
        Numbers values;
        ASSERT_TRUE(curve->sampleSpline(s(2), s(1, 100), count, &times, &values, kTempusZero, false));
        ASSERT_EQ(11u, times.size());
        EXPECT_EQ(kTempusZero, times.front());
        EXPECT_NEAR(TempusGetSeconds(curve->getMaxValueU(kTempusZero, true)), TempusGetSeconds(times.back()),
                    1e-8);
        // The polyline of such a curve is such a row, and leaves the spline's lock free.
        ASSERT_TRUE(curve->sampleSplineSegments(s(0), s(5), s(1, 2), &times, &values));
        EXPECT_EQ(10u, values.size());
        EXPECT_EQ(curve.at(s(0)), values.front());
    }
}

TEST(KFSplineSearch, FindsWhereTheCurveHasAValue) {
    for (std::uint32_t seed = 0; seed < 600 && !HasFailure(); ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        Curve curve(seed);
        // What eases in time is inverted without its easing, so it isn't among them.
        curve.fill({1, 4, 7, 8, 14}, curve.number(1, 9), false);
        double const value = curve.number(-900, 900) / 100.0;
        Tempus step = s(1, 30);
        BXTimeRange range{s(curve.number(-80, 200), 60), s(curve.number(3, 240), 60)};
        Tempus const min = curve->getMinValueU(kTempusZero, true);
        Tempus const max = curve->getMaxValueU(kTempusZero, true);
        Tempus const from = TempusMinimum(TempusMaximum(range.start, min), max);
        Tempus const to = TempusMaximum(TempusMinimum(TempusRangeGetEnd(range) - step, max), min);

        Times found;
        bool const any = curve->getUForValue(value, found, range, step, 0);
        EXPECT_EQ(!found.empty(), any);
        Tempus const near = s(1, 20000); // Answers are rounded to 1/262144 s.
        for (Tempus const& u : found) {
            EXPECT_TRUE(from <= u && u <= to) << museumText(u);
            auto const [low, high] = std::minmax({curve.at(u - near), curve.at(u), curve.at(u + near)});
            EXPECT_TRUE(low - 1e-6 <= value && value <= high + 1e-6) << museumText(u);
        }
        // Each change of side between neighbouring samples has an answer.
        for (int i = 0; i < 500 && from < to; ++i) {
            Tempus const a = from + (to - from) * s(i, 500);
            Tempus const b = from + (to - from) * s(i + 1, 500);
            if ((curve.at(a) - value) * (curve.at(b) - value) < 0.0) {
                EXPECT_TRUE(std::any_of(found.begin(), found.end(),
                                        [&](Tempus const& u) { return u >= a - near && u <= b + near; }))
                    << "none between " << museumText(a) << " and " << museumText(b);
            }
        }
        Times backwards{s(-99)};
        EXPECT_TRUE(curve->getUForValue(value, backwards, range, step, 1));
        found.insert(found.begin(), s(-99));
        std::reverse(found.begin(), found.end());
        EXPECT_EQ(found, backwards);
    }
}

TEST(KFSplineSearch, StaysWithinItsRange) {
    Curve curve;
    Tempus step = s(1, 10);
    auto const search = [&](double value, Tempus const& start, Tempus const& duration) {
        Times found;
        BXTimeRange range{start, duration};
        curve->getUForValue(value, found, range, step, 0);
        return found;
    };
    EXPECT_EQ(Times{}, search(0.0, s(0), s(4))) << "no vertex";
    curve.append(s(0), 0.0, 1);
    curve->disableVertex(curve.append(s(1), 50.0, 1), kTempusZero);
    curve.append(s(2), 2.0, 1);
    curve.append(s(3), 0.0, 1);
    EXPECT_EQ((Times{s(3, 2), s(9, 4)}), search(1.5, s(0), s(4)));
    EXPECT_EQ(Times{}, search(1.5, s(0), s(155, 100))) << "the last step is left out";
    EXPECT_EQ(Times{s(3, 2)}, search(1.5, s(3, 2), step)) << "one step is one position";
    EXPECT_EQ(Times{}, search(1.5, s(3, 2), kTempusZero));
    EXPECT_EQ(Times{s(3, 2)}, search(1.5, s(1), s(1))) << "a disabled vertex at the start draws nothing";
    // Two segments that share a vertex report it both; a range that is one vertex has no segment.
    EXPECT_EQ((Times{s(2), s(2)}), search(2.0, s(0), s(4)));
    EXPECT_EQ(Times{}, search(2.0, s(2), step));
}

TEST(KFSplineCreateSegment, BoundsAnIntervalOnTheCurve) {
    Tempus const a = s(4), b = s(6), c = s(1, 2);
    using Types = std::vector<std::uint32_t>;
    // A curve of this type from 0 to 10 s; then the types of all its vertices.
    auto const start = [](Curve& curve, std::uint32_t type) {
        curve.append(s(0), 0.0, type);
        curve.append(s(10), 5.0, type);
    };
    auto const typesOf = [](Curve& curve) {
        Types types;
        for (KFVertex const* vertex : museumVertices(*curve)) {
            types.push_back(vertex->getInterpolation());
        }
        return types;
    };
    for (bool const eased : {false, true}) {
        Curve curve;
        start(curve, 0);
        ASSERT_TRUE(curve->createSegment(a, b, c, eased));
        // Only what leads into and out of the interval changes its type.
        std::uint32_t const ramp = eased ? 15 : 1;
        EXPECT_EQ((Types{0, ramp, 0, ramp, 0, 0}), typesOf(curve));
        EXPECT_EQ(0.0, curve.at(s(5)));
        EXPECT_FALSE(curve->createSegment(a, b, c, eased)) << "all four stand";
    }
    // An infinite end leaves out its side; both leave nothing to do.
    Curve half;
    start(half, 1);
    EXPECT_FALSE(half->createSegment(kTempusNegativeInfinity, kTempusPositiveInfinity, c, false));
    ASSERT_TRUE(half->createSegment(kTempusNegativeInfinity, b, c, false));
    EXPECT_EQ(4u, half->getNumberOfVertices());
    EXPECT_EQ(b, museumVertices(*half)[1]->getValueU());
    ASSERT_TRUE(half->createSegment(a, kTempusPositiveInfinity, c, false));
    EXPECT_EQ(6u, half->getNumberOfVertices());
    for (int u = 0; u <= 40; ++u) {
        EXPECT_NEAR(u / 8.0, half.at(s(u, 4)), 1e-12) << "each new vertex takes the curve's value";
    }
}

} // namespace
