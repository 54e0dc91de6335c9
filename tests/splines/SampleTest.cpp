#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineOwner.h"
#include "lumenkey/splines/KFVertex.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <random>

namespace {

struct Owner : KFSplineOwner {
    double getInitialValue() const override { return 7.0; }
    Tempus getFrameDuration() const override { return TempusMake(1, 30); }
};

/// A spline with its settings, filled at random: shared positions, disabled vertices and flat Bezier segments among
/// them.
struct Curve {
    KFSplineState state;
    KFSpline spline{&state};
    std::mt19937 random;

    explicit Curve(std::uint32_t seed = 0) : random(seed) { state.deriveTangents = false; }

    int number(int low, int high) {
        return low + static_cast<int>(random() % static_cast<unsigned>(high - low + 1));
    }

    KFVertex* append(Tempus const& u, double value, std::uint32_t type) {
        void* const handle = spline.appendVertexNoTangents(u, value, kTempusZero);
        spline.setVertexInterpolation(handle, type);
        return static_cast<KFVertex*>(handle);
    }

    void fill(std::vector<std::uint32_t> const& types, int count, bool mayShare) {
        int u = number(-60, 60);
        for (int i = 0; i < count; ++i) {
            KFVertex* const vertex = append(TempusMake(u, 60), number(-9, 9), types[random() % types.size()]);
            if (number(0, 2) > 0) {
                vertex->setInputTangents(-number(0, 9) / 100.0, number(-9, 9) / 30.0, kTempusZero);
                vertex->setOutputTangents(number(0, 9) / 100.0, number(-9, 9) / 30.0, kTempusZero);
            }
            u += mayShare && number(0, 4) == 0 ? 0 : number(1, 50);
            if (number(0, 4) == 0) {
                spline.disableVertex(vertex, kTempusZero);
            }
        }
        state.preExtrapolation = static_cast<std::uint32_t>(number(0, 4));
        state.postExtrapolation = static_cast<std::uint32_t>(number(0, 4));
    }

    double value(Tempus const& u) { return spline.getVertexValue(u, kTempusZero, true); }
    std::vector<double> valuesAt(std::vector<Tempus> const& times) {
        std::vector<double> values;
        for (Tempus const& u : times) {
            values.push_back(value(u));
        }
        return values;
    }
};

bool sameBits(std::vector<double> const& a, std::vector<double> const& b) {
    return a.size() == b.size() &&
           (a.empty() || std::memcmp(a.data(), b.data(), a.size() * sizeof(double)) == 0);
}

/// The adaptive walks once more, step by step over the plain list of vertices.
class LiteralWalk {
public:
    LiteralWalk(KFSpline& spline, Tempus const& step) : _spline(spline), _step(step) {
        for (auto place = spline.beginVertices(); place != spline.endVertices();
             place = spline.nextPlace(place)) {
            _vertices.push_back(spline.vertexAt(place));
        }
    }

    std::vector<Tempus> intoArrays(Tempus const& start, std::uint32_t count) {
        if (validCount() < 2) {
            return ends(start, count);
        }
        Tempus const end = start + _step * count;
        std::vector<Tempus> out;
        for (Tempus current = start, next = start; next < end; current = next) {
            KFVertex* const stop = nextValid(current);
            next = stop == nullptr ? end : stop->getValueU();
            if (next > end && next - end >= _step) {
                next = end;
            }
            bool const isFirst = out.empty();
            if (isStraight(current, stop, 12.0)) {
                if (isFirst) {
                    out.push_back(current);
                }
                out.push_back(next);
            } else {
                for (int i = isFirst ? 0 : 1; i < steps(current, next); ++i) {
                    out.push_back(current + _step * i);
                }
            }
        }
        return out;
    }

    std::vector<Tempus> intoVectors(Tempus const& start, std::uint32_t count) {
        if (validCount() < 2) {
            return ends(start, count);
        }
        Tempus const end = start + _step * (count - 1);
        std::vector<Tempus> out;
        for (Tempus current = start, next = start; next < end; current = next) {
            KFVertex* const stop = nextValid(current);
            next = stop == nullptr || stop->getValueU() > end ? end : stop->getValueU();
            if (isStraight(current, stop, 0.0)) {
                out.push_back(current);
                out.push_back(next);
            } else {
                for (int i = 0; i < steps(current, next); ++i) {
                    out.push_back(current + _step * i);
                }
            }
        }
        return out;
    }

    std::vector<Tempus> asPolyline(Tempus const& start, Tempus const& end) {
        if (validCount() < 2) {
            return {start, end};
        }
        std::vector<Tempus> out;
        auto const addUnlessLast = [&out](Tempus const& u) {
            if (out.empty() || out.back() != u) {
                out.push_back(u);
            }
        };
        for (Tempus current = start, next = start; next < end; current = next) {
            KFVertex* const stop = nextValid(current);
            next = stop == nullptr || stop->getValueU() > end ? end : stop->getValueU();
            if (isStraight(current, stop, 1.0)) {
                addUnlessLast(current);
                out.push_back(next);
            } else {
                addUnlessLast(current);
                for (int i = 1; i <= steps(current, next); ++i) {
                    out.push_back(current + _step * i);
                }
            }
        }
        addUnlessLast(end);
        return out;
    }

private:
    std::vector<Tempus> ends(Tempus const& start, std::uint32_t count) const {
        return count > 1 ? std::vector<Tempus>{start, start + _step * (count - 1)}
                         : std::vector<Tempus>{start};
    }
    long validCount() const {
        return std::count_if(_vertices.begin(), _vertices.end(),
                             [](KFVertex* v) { return v->isEnabled(kTempusZero); });
    }
    KFVertex* nextValid(Tempus const& u) const {
        for (KFVertex* const vertex : _vertices) {
            if (vertex->isEnabled(kTempusZero) && vertex->getValueU() > u) {
                return vertex;
            }
        }
        return nullptr;
    }
    KFVertex* startVertex(Tempus const& u) const {
        KFVertex* found = nullptr;
        for (KFVertex* const vertex : _vertices) {
            if (vertex->getValueU() == u) {
                return vertex;
            }
            if (vertex->isEnabled(kTempusZero) && vertex->getValueU() < u) {
                found = vertex;
            }
        }
        return found;
    }
    int steps(Tempus const& from, Tempus const& to) const {
        return static_cast<int>(TempusGetSeconds(to - from) / TempusGetSeconds(_step));
    }
    /// A Bezier segment is straight between tangents that, times `factor`, are below 1e-7; never for factor 0.
    bool isStraight(Tempus const& current, KFVertex* next, double factor) const {
        KFVertex* const start = startVertex(current);
        if (start == nullptr) {
            return next != nullptr && _spline.getState()->preExtrapolation < 2;
        }
        if (next == nullptr) {
            return _spline.getState()->postExtrapolation < 2;
        }
        if (start->getInterpolation() == 4 && factor > 0.0) {
            double numbers[4];
            next->getInputTangents(&numbers[0], &numbers[1], kTempusZero);
            start->getOutputTangents(&numbers[2], &numbers[3], kTempusZero);
            return std::all_of(std::begin(numbers), std::end(numbers),
                               [factor](double x) { return std::fabs(x * factor) < 1e-7; });
        }
        return start->getInterpolation() == 1;
    }

    KFSpline& _spline;
    Tempus _step;
    std::vector<KFVertex*> _vertices;
};

TEST(KFSplineSample, GivesARowWhatSinglePositionsGive) {
    for (std::uint32_t seed = 0; seed < 300; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        Curve curve(seed);
        curve.fill({0, 1, 4, 6, 7, 8, 13, 14, 15, 16, 17, 18, 19, 20, 21}, curve.number(0, 9), true);
        curve.state.retimingExtrapolation = seed % 3 == 0;
        curve.spline.setClosed(seed % 7 == 0, nullptr);
        Tempus const start = TempusMake(curve.number(-200, 200), 60);
        Tempus const step = TempusMake(curve.number(-3, 9), seed % 2 == 0 ? 60 : 100);
        std::uint32_t count = 97;

        std::vector<Tempus> expected;
        std::vector<double> slopes;
        for (std::uint32_t i = 0; i < count; ++i) {
            expected.push_back(start + step * i);
            slopes.push_back(curve.spline.getDerivativeValue(expected.back(), kTempusZero, true));
        }
        std::vector<Tempus> times(count);
        std::vector<double> values(count);
        ASSERT_TRUE(
            curve.spline.sampleSpline(start, step, count, times.data(), values.data(), kTempusZero, false));
        EXPECT_EQ(expected, times);
        EXPECT_TRUE(sameBits(curve.valuesAt(expected), values));
        ASSERT_TRUE(
            curve.spline.sampleSplineSegment(start, step, count, nullptr, values.data(), kTempusZero, true));
        EXPECT_TRUE(sameBits(curve.valuesAt(expected), values));
        ASSERT_TRUE(
            curve.spline.sampleSplineDerivatives(start, step, count, nullptr, values.data(), kTempusZero));
        EXPECT_TRUE(sameBits(slopes, values));

        // Vectors keep what they held; a null target is passed over.
        std::vector<double> appended{42.0};
        std::vector<Tempus>* const none = nullptr;
        ASSERT_TRUE(curve.spline.sampleSpline(start, step, count, none, &appended, kTempusZero, false));
        ASSERT_TRUE(curve.spline.sampleSplineDerivatives(start, step, count, none, &appended, kTempusZero));
        std::vector<double> both{42.0};
        std::vector<double> const row = curve.valuesAt(expected);
        both.insert(both.end(), row.begin(), row.end());
        both.insert(both.end(), slopes.begin(), slopes.end());
        EXPECT_TRUE(sameBits(both, appended));
        EXPECT_EQ(97u, count);
    }
}

TEST(KFSplineSample, WalksAdaptivelyStepByStep) {
    for (std::uint32_t seed = 0; seed < 2000; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        Curve curve(seed);
        curve.fill({0, 1, 1, 4, 4, 15, 18}, curve.number(0, 9), true);
        Tempus const start = TempusMake(curve.number(-100, 250), 60);
        Tempus const step = TempusMake(curve.number(1, 20), seed % 2 == 0 ? 60 : 100);
        auto const count = static_cast<std::uint32_t>(curve.number(seed % 5 == 0 ? 0 : 1, 40));
        LiteralWalk literal(curve.spline, step);

        std::vector<Tempus> const expected = literal.intoArrays(start, count);
        std::size_t const room = count + curve.spline.getNumberOfValidVertices(kTempusZero) + 2;
        Tempus const untouched = TempusMake(-77, 1);
        std::vector<Tempus> times(room + 1, untouched);
        std::vector<double> values(room + 1, -77.0);
        std::uint32_t written = count;
        ASSERT_TRUE(
            curve.spline.sampleSpline(start, step, written, times.data(), values.data(), kTempusZero, true));
        ASSERT_LE(expected.size(), room);
        ASSERT_EQ(count == 0 && expected.size() == 1 ? 0 : expected.size(), written);
        EXPECT_EQ(untouched, times[expected.size()]);
        EXPECT_EQ(-77.0, values[expected.size()]);
        times.resize(expected.size());
        values.resize(expected.size());
        EXPECT_EQ(expected, times);
        EXPECT_TRUE(sameBits(curve.valuesAt(expected), values));

        if (count > 0) {
            std::vector<Tempus> const stops = literal.intoVectors(start, count);
            times.clear();
            values.clear();
            written = count;
            ASSERT_TRUE(curve.spline.sampleSpline(start, step, written, &times, &values, kTempusZero, true));
            EXPECT_EQ(stops.size(), written);
            EXPECT_EQ(stops, times);
            EXPECT_TRUE(sameBits(curve.valuesAt(stops), values));
        }

        Tempus const end = start + step * (count + 1) + TempusMake(1, 1000);
        std::vector<Tempus> const polyline = literal.asPolyline(start, end);
        ASSERT_TRUE(curve.spline.sampleSplineSegments(start, end, step, &times, &values));
        EXPECT_EQ(polyline, times);
        EXPECT_TRUE(sameBits(curve.valuesAt(polyline), values));
        if (HasFailure()) {
            return;
        }
    }
}

TEST(KFSplineSample, KeepsToItsEndsWithoutARow) {
    Curve curve;
    Owner owner;
    curve.spline.setNode(&owner);
    std::vector<Tempus> times;
    std::vector<double> values;
    { // No vertex: the initial value at both ends of the row.
        std::uint32_t count = 5;
        ASSERT_TRUE(curve.spline.sampleSpline(kTempusZero, TempusMake(1, 1), count, &times, &values,
                                              kTempusZero, true));
        EXPECT_EQ(2u, count);
        EXPECT_EQ((std::vector<Tempus>{kTempusZero, TempusMake(4, 1)}), times);
        EXPECT_EQ((std::vector<double>{7.0, 7.0}), values);
    }
    curve.append(kTempusZero, 0.0, 1);
    curve.append(TempusMake(1, 1), 2.0, 1);
    { // A row of nothing is nothing, and doesn't wrap around.
        std::uint32_t count = 0;
        times.clear();
        ASSERT_TRUE(curve.spline.sampleSpline(kTempusZero, TempusMake(1, 10), count, &times, nullptr,
                                              kTempusZero, true));
        EXPECT_EQ(0u, count);
        EXPECT_TRUE(times.empty());
    }
    { // A polyline backwards is refused, one without a length or a step is one sample.
        EXPECT_FALSE(curve.spline.sampleSplineSegments(TempusMake(1, 1), kTempusZero, TempusMake(1, 10),
                                                       &times, &values));
        EXPECT_TRUE(times.empty() && values.empty());
        EXPECT_TRUE(
            curve.spline.sampleSplineSegments(kTempusZero, TempusMake(1, 1), kTempusZero, &times, &values));
        EXPECT_EQ((std::vector<double>{0.0}), values);
        EXPECT_TRUE(curve.spline.sampleSplineSegments(TempusMake(1, 2), TempusMake(1, 2), TempusMake(1, 10),
                                                      &times, &values));
        EXPECT_EQ((std::vector<double>{1.0}), values);
    }
    { // Times that are no numbers end too, within the room that was promised.
        std::vector<Tempus> arrayTimes(64);
        std::vector<double> arrayValues(64);
        for (Tempus const& odd :
             {kTempusPositiveInfinity, kTempusNegativeInfinity, kTempusIndefinite, kTempusInvalid}) {
            for (std::uint32_t const wanted : {0u, 1u, 60u}) {
                std::uint32_t count = wanted;
                curve.spline.sampleSpline(odd, TempusMake(1, 10), count, arrayTimes.data(),
                                          arrayValues.data(), kTempusZero, true);
                EXPECT_LE(count, wanted + 4);
                count = wanted;
                curve.spline.sampleSpline(kTempusZero, odd, count, arrayTimes.data(), arrayValues.data(),
                                          kTempusZero, true);
                EXPECT_LE(count, wanted + 4);
            }
            curve.spline.sampleSplineSegments(kTempusZero, odd, TempusMake(1, 10), &times, &values);
            curve.spline.sampleSplineSegments(kTempusZero, TempusMake(2, 1), odd, &times, &values);
            EXPECT_LE(times.size(), 40u);
        }
        curve.spline.setExtrapolation(3, 1);
        curve.spline.sampleSplineSegments(kTempusNegativeInfinity, TempusMake(1, 1), TempusMake(1, 10),
                                          &times, &values);
        EXPECT_LE(times.size(), 40u);
    }
}

TEST(KFSplineSample, StretchesACurveThatIsOneFunction) {
    for (std::uint32_t const type : {10u, 12u}) {
        Curve curve;
        curve.state.parametric = true;
        curve.state.interpolation = type;
        for (int i = 0; i < 6; ++i) {
            curve.append(TempusMake(i, 1), (i * 7) % 5, type);
        }
        curve.spline.setDirty(true);
        Tempus const max = curve.spline.getMaxValueU(kTempusZero, true);
        std::uint32_t count = 11;
        std::vector<Tempus> times;
        std::vector<double> values;
        ASSERT_TRUE(curve.spline.sampleSpline(TempusMake(2, 1), TempusMake(1, 100), count, &times, &values,
                                              kTempusZero, false));
        ASSERT_EQ(11u, times.size());
        EXPECT_EQ(kTempusZero, times.front());
        EXPECT_NEAR(TempusGetSeconds(max), TempusGetSeconds(times.back()), 1e-8);
        EXPECT_TRUE(sameBits(curve.valuesAt(times), values));
        // The polyline of such a curve is such a row, and leaves the spline's lock free.
        ASSERT_TRUE(curve.spline.sampleSplineSegments(kTempusZero, TempusMake(5, 1), TempusMake(1, 2), &times,
                                                      &values));
        EXPECT_EQ(10u, values.size());
        EXPECT_EQ(curve.value(kTempusZero), values.front());
        // A single sample stands at the start.
        count = 1;
        double value = -1.0;
        Tempus at;
        ASSERT_TRUE(
            curve.spline.sampleSpline(kTempusZero, TempusMake(1, 1), count, &at, &value, kTempusZero, false));
        EXPECT_EQ(curve.value(kTempusZero), value);
        EXPECT_EQ(kTempusZero, at);

        curve.spline.deleteAllVertices();
        ASSERT_TRUE(curve.spline.sampleSpline(kTempusZero, TempusMake(1, 1), count, nullptr, &(value = -1.0),
                                              kTempusZero, false));
        EXPECT_EQ(-1.0, value) << "an empty spline leaves an array alone";
        values.clear();
        times.clear();
        ASSERT_TRUE(curve.spline.sampleSpline(kTempusZero, TempusMake(1, 1), count, &times, &values,
                                              kTempusZero, false));
        EXPECT_EQ((std::vector<double>{0.0}), values);
    }
}

TEST(KFSplineSearch, FindsWhereTheCurveHasAValue) {
    for (std::uint32_t seed = 0; seed < 600; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        Curve curve(seed);
        // What eases in time is inverted without its easing, so it isn't among them.
        curve.fill({1, 4, 7, 8, 14}, curve.number(1, 9), false);
        double const value = curve.number(-900, 900) / 100.0;
        Tempus step = TempusMake(1, 30);
        BXTimeRange range{TempusMake(curve.number(-80, 200), 60), TempusMake(curve.number(3, 240), 60)};
        Tempus const min = curve.spline.getMinValueU(kTempusZero, true);
        Tempus const max = curve.spline.getMaxValueU(kTempusZero, true);
        Tempus const from = TempusMinimum(TempusMaximum(range.start, min), max);
        Tempus const to = TempusMaximum(TempusMinimum(TempusRangeGetEnd(range) - step, max), min);

        std::vector<Tempus> found;
        bool const any = curve.spline.getUForValue(value, found, range, step, 0);
        EXPECT_EQ(!found.empty(), any);
        // Answers are rounded to 1/262144 s.
        Tempus const near = TempusMake(1, 20000);
        for (Tempus const& u : found) {
            EXPECT_GE(u, from);
            EXPECT_LE(u, to);
            double low = curve.value(u - near);
            double high = curve.value(u + near);
            if (low > high) {
                std::swap(low, high);
            }
            EXPECT_GE(value, std::min(low, curve.value(u)) - 1e-6) << TempusGetSeconds(u);
            EXPECT_LE(value, std::max(high, curve.value(u)) + 1e-6) << TempusGetSeconds(u);
        }
        // Each change of side between neighbouring samples has an answer.
        for (int i = 0; i < 500 && from < to; ++i) {
            Tempus const a = from + (to - from) * TempusMake(i, 500);
            Tempus const b = from + (to - from) * TempusMake(i + 1, 500);
            double const before = curve.value(a) - value;
            double const after = curve.value(b) - value;
            if (before * after < 0.0) {
                EXPECT_TRUE(std::any_of(found.begin(), found.end(),
                                        [&](Tempus const& u) { return u >= a - near && u <= b + near; }))
                    << "none between " << TempusGetSeconds(a) << " and " << TempusGetSeconds(b);
            }
        }
        std::vector<Tempus> backwards{TempusMake(-99, 1)};
        EXPECT_TRUE(curve.spline.getUForValue(value, backwards, range, step, 1));
        found.insert(found.begin(), TempusMake(-99, 1));
        std::reverse(found.begin(), found.end());
        EXPECT_EQ(found, backwards);
        if (HasFailure()) {
            return;
        }
    }
}

TEST(KFSplineSearch, StaysWithinItsRange) {
    Curve curve;
    Tempus step = TempusMake(1, 10);
    std::vector<Tempus> found;
    BXTimeRange range{kTempusZero, TempusMake(4, 1)};
    EXPECT_FALSE(curve.spline.getUForValue(0.0, found, range, step, 0)) << "no vertex";
    curve.append(kTempusZero, 0.0, 1);
    KFVertex* const disabled = curve.append(TempusMake(1, 1), 50.0, 1);
    curve.append(TempusMake(2, 1), 2.0, 1);
    curve.append(TempusMake(3, 1), 0.0, 1);
    curve.spline.disableVertex(disabled, kTempusZero);
    auto const search = [&](double value, Tempus const& start, Tempus const& duration) {
        found.clear();
        range = {start, duration};
        curve.spline.getUForValue(value, found, range, step, 0);
        return found;
    };
    using Times = std::vector<Tempus>;
    EXPECT_EQ((Times{TempusMake(3, 2), TempusMake(9, 4)}), search(1.5, kTempusZero, TempusMake(4, 1)));
    // The last step is left out.
    EXPECT_EQ(Times{}, search(1.5, kTempusZero, TempusMake(155, 100)));
    // One step is one position, and less is none.
    EXPECT_EQ((Times{TempusMake(3, 2)}), search(1.5, TempusMake(3, 2), step));
    EXPECT_EQ(Times{}, search(1.75, TempusMake(3, 2), step));
    EXPECT_EQ(Times{}, search(1.5, TempusMake(3, 2), kTempusZero));
    // A disabled vertex at the start draws nothing.
    EXPECT_EQ((Times{TempusMake(3, 2)}), search(1.5, TempusMake(1, 1), TempusMake(1, 1)));
    // Two segments that share a vertex report it both; a range that is one vertex has no segment.
    EXPECT_EQ((Times{TempusMake(2, 1), TempusMake(2, 1)}), search(2.0, kTempusZero, TempusMake(4, 1)));
    EXPECT_EQ(Times{}, search(2.0, TempusMake(2, 1), step));
}

TEST(KFSplineCreateSegment, BoundsAnIntervalOnTheCurve) {
    Tempus const a = TempusMake(4, 1);
    Tempus const b = TempusMake(6, 1);
    Tempus const c = TempusMake(1, 2);
    auto const typeAt = [](Curve& curve, Tempus const& u) {
        void* handle = nullptr;
        return curve.spline.getVertexHandle(u, &handle, true)
                   ? static_cast<KFVertex*>(handle)->getInterpolation()
                   : 99u;
    };
    for (bool const eased : {false, true}) {
        Curve curve;
        curve.append(kTempusZero, 0.0, 0);
        curve.append(TempusMake(10, 1), 5.0, 0);
        ASSERT_TRUE(curve.spline.createSegment(a, b, c, eased));
        EXPECT_EQ(6u, curve.spline.getNumberOfVertices());
        std::uint32_t const ramp = eased ? 15 : 1;
        EXPECT_EQ(ramp, typeAt(curve, a - c));
        EXPECT_EQ(0u, typeAt(curve, a));
        EXPECT_EQ(ramp, typeAt(curve, b));
        // Only what leads into and out of the interval changes its type.
        EXPECT_EQ(0u, typeAt(curve, b + c));
        EXPECT_EQ(0.0, curve.value(TempusMake(5, 1)));
        EXPECT_FALSE(curve.spline.createSegment(a, b, c, eased)) << "all four stand";
    }
    { // Each new vertex takes the curve's value.
        Curve curve;
        curve.append(kTempusZero, 0.0, 1);
        curve.append(TempusMake(10, 1), 5.0, 1);
        ASSERT_TRUE(curve.spline.createSegment(a, b, c, false));
        for (int u = 0; u <= 40; ++u) {
            EXPECT_NEAR(u / 8.0, curve.value(TempusMake(u, 4)), 1e-12);
        }
    }
    { // An infinite end leaves out its side; both leave nothing to do.
        Curve curve;
        curve.append(kTempusZero, 0.0, 1);
        curve.append(TempusMake(10, 1), 5.0, 1);
        EXPECT_FALSE(curve.spline.createSegment(kTempusNegativeInfinity, kTempusPositiveInfinity, c, false));
        ASSERT_TRUE(curve.spline.createSegment(kTempusNegativeInfinity, b, c, false));
        EXPECT_EQ(4u, curve.spline.getNumberOfVertices());
        EXPECT_EQ(99u, typeAt(curve, a));
        EXPECT_EQ(1u, typeAt(curve, b + c));
        ASSERT_TRUE(curve.spline.createSegment(a, kTempusPositiveInfinity, c, false));
        EXPECT_EQ(6u, curve.spline.getNumberOfVertices());
    }
}

} // namespace
