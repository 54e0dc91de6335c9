#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineOwner.h"
#include "lumenkey/splines/KFVertex.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>

namespace {

struct Owner : KFSplineOwner {
    double getInitialValue() const override { return 7.0; }
    Tempus getFrameDuration() const override { return frame; }
    Tempus frame = TempusMake(1, 32);
};

/// Positions of keys are in units of 1/128 s, so that doubles hold them exactly.
struct Key {
    int u;
    double v;
    bool isConstant = false;
    bool isEnabled = true;
};

struct Exhibit {
    char const* why;
    std::vector<Key> keys;
};

std::vector<Exhibit> const& museum() {
    static std::vector<Exhibit> const exhibits{
        {"empty", {}},
        {"one key", {{256, 5.0}}},
        {"one key, disabled", {{256, 5.0, false, false}}},
        {"a ramp", {{0, 0.0}, {256, 2.0}}},
        {"three uneven segments", {{-64, 3.0}, {32, -1.0}, {128, 4.0}, {192, 2.5}}},
        {"disabled at both ends and inside",
         {{-300, 9.0, false, false},
          {0, 1.0},
          {64, 8.0, false, false},
          {128, 2.0},
          {400, 9.0, false, false}}},
        {"all at one place", {{64, 1.0}, {64, 2.0}, {64, 3.0}}},
        {"two at the start and two at the end", {{0, 1.0}, {0, 2.0}, {128, 5.0}, {128, 6.0}}},
        {"constant at both ends", {{0, 1.0, true}, {64, 3.0}, {128, 2.0, true}}},
        {"shorter than the reach of a slope", {{0, 1.0}, {1, 2.0}}},
        {"exactly one frame", {{0, 1.0}, {4, 2.0}}},
        {"five quarters of a frame", {{0, 1.0}, {2, 4.0}, {5, 2.0}}},
        {"a quarter below two frames", {{8, 1.0}, {10, 4.0}, {15, 2.0}}},
        {"no whole number of frames", {{0, 1.0}, {6, 4.0}, {19, 2.0}}},
        {"thirty frames", {{-60, 1.0}, {0, 4.0}, {60, 2.0}}},
    };
    return exhibits;
}

/// The rules once more, in doubles and word for word: the truth that the engine is compared with.
class Model {
public:
    Model(std::vector<Key> const& keys, std::uint32_t pre, std::uint32_t post, bool retiming, double step)
        : _pre(pre), _post(post), _retiming(retiming), _step(step) {
        for (Key const& key : keys) {
            if (key.isEnabled) {
                _keys.push_back(key);
            }
        }
    }

    double value(double u, int depth = 0) const {
        EXPECT_LT(depth, 8) << "the rules themselves don't end";
        if (_keys.empty()) {
            return 7.0;
        }
        if (u < min()) {
            return before(u, depth + 1);
        }
        if (u > max() || (_retiming && u == max())) {
            return after(u, depth + 1);
        }
        std::size_t i = 0;
        while (at(i) < u) {
            ++i;
        }
        if (at(i) == u) {
            return _keys[i].v;
        }
        Key const& a = _keys[i - 1];
        double const fraction = (u - at(i - 1)) / (at(i) - at(i - 1));
        return a.isConstant ? a.v : a.v + (_keys[i].v - a.v) * fraction;
    }

private:
    double at(std::size_t i) const { return _keys[i].u / 128.0; }
    double min() const { return at(0); }
    double max() const { return at(_keys.size() - 1); }
    double range() const { return max() - min(); }
    bool preReadsEnd() const { return _pre == 4 || (_pre == 1 && min() + 0.01 >= max()); }
    double inRange(double x, int depth) const {
        return _retiming && x >= max() ? _keys.back().v : value(std::clamp(x, min(), max()), depth);
    }

    double after(double u, int depth) const {
        double const end = _keys.back().v;
        double const q = (u - min()) / range();
        double const n = std::trunc(q);
        double const f = q - std::floor(q);
        if (range() == 0.0) {
            return end;
        }
        switch (_post) {
        case 0:
            return !_retiming || range() < _step ? end : value(max() - _step, depth);
        case 1: {
            double const x = std::max(max() - 0.01, min());
            return _keys.back().isConstant ? end
                                           : (u - max()) * ((end - value(x, depth)) / (max() - x)) + end;
        }
        case 2: {
            if (!_retiming || range() < _step) {
                return inRange(std::fmod(n, 2.0) == 0.0 ? f * range() + min() : max() - f * range(), depth);
            }
            double w = 0.0;
            if (range() != _step) {
                double const r = range() - _step;
                double const m = std::fmod(u - max(), 2.0 * r);
                w = m >= r ? m - r + _step : m + (r - std::floor(m / _step) * _step * 2.0 - _step);
            }
            bool const endless = range() < 2.0 * _step && preReadsEnd();
            return w < 0.0 && endless ? value(min(), depth) : value(w + min(), depth);
        }
        case 3:
            return value(f * range() + min(), depth);
        case 4:
            return (end - value(min(), depth)) * n + value(f * range() + min(), depth);
        default:
            return 7.0;
        }
    }

    double before(double u, int depth) const {
        double const start = _keys.front().v;
        double const q = (min() - u) / range();
        double const n = std::trunc(q);
        double const f = q - std::floor(q);
        if (range() == 0.0) {
            return start;
        }
        switch (_pre) {
        case 0:
            return start;
        case 1: {
            double const x = std::min(min() + 0.01, max());
            return (u - min()) * ((value(x, depth) - start) / (x - min())) + start;
        }
        case 2:
            return value(std::fmod(n, 2.0) == 0.0 ? f * range() + min() : max() - f * range(), depth);
        case 3:
            return value(max() - f * range(), depth);
        case 4: {
            double const rise = value(max(), depth) - start;
            return value(max() - f * range(), depth) - (rise + rise * n);
        }
        default:
            return 7.0;
        }
    }

    std::vector<Key> _keys;
    std::uint32_t _pre;
    std::uint32_t _post;
    bool _retiming;
    double _step;
};

struct Curve {
    KFSplineState state;
    Owner owner;
    KFSpline spline{&state};

    explicit Curve(std::vector<Key> const& keys = {}) {
        state.deriveTangents = false;
        spline.setNode(&owner);
        for (Key const& key : keys) {
            void* const handle = spline.appendVertexNoTangents(TempusMake(key.u, 128), key.v, kTempusZero);
            spline.setVertexInterpolation(handle, key.isConstant ? 0 : 1);
            if (!key.isEnabled) {
                spline.disableVertex(handle, kTempusZero);
            }
        }
    }

    double value(Tempus const& u) { return spline.getVertexValue(u, kTempusZero, true); }
    void setModes(std::uint32_t pre, std::uint32_t post, bool retiming) {
        spline.setExtrapolation(pre, 1);
        spline.setExtrapolation(post, 0);
        state.retimingExtrapolation = retiming;
    }
};

template <class Body> void forAllModes(Body body) {
    for (std::uint32_t pre = 0; pre <= 5; ++pre) {
        for (std::uint32_t post = 0; post <= 5; ++post) {
            body(pre, post, false);
            body(pre, post, true);
        }
    }
}

std::string describe(char const* why, std::uint32_t pre, std::uint32_t post, bool retiming) {
    return std::string(why) + ", before " + std::to_string(pre) + ", after " + std::to_string(post) +
           (retiming ? ", retiming" : "");
}

TEST(KFSplineExtrapolate, FollowsTheRulesOnBothSidesOfEveryMuseumCurve) {
    for (Exhibit const& exhibit : museum()) {
        Curve curve(exhibit.keys);
        int const min = exhibit.keys.empty() ? 0 : exhibit.keys.front().u;
        int const length = exhibit.keys.empty() ? 16 : std::max(exhibit.keys.back().u - min, 1);
        forAllModes([&](std::uint32_t pre, std::uint32_t post, bool retiming) {
            SCOPED_TRACE(describe(exhibit.why, pre, post, retiming));
            curve.setModes(pre, post, retiming);
            Model const model(exhibit.keys, pre, post, retiming, 1.0 / 32.0);
            // Three and a half lengths on either side, sixteen positions a length.
            for (int i = 0; i <= 128; ++i) {
                int const u = 16 * min - 56 * length + i * length;
                double const expected = model.value(u / 2048.0);
                // A straight continuation is rounded to a time, to about 2^-31.
                ASSERT_NEAR(expected, curve.value(TempusMake(u, 2048)), 1e-8 * (1.0 + std::fabs(expected)))
                    << "at " << u << "/2048";
            }
        });
    }
}

TEST(KFSplineExtrapolate, GivesTheWorkedExamples) {
    struct {
        std::uint32_t mode;
        int u;
        double expected;
    } const rows[] = {{3, 5, 1.0}, {2, 3, 1.0},   {2, 5, 1.0}, {4, 5, 5.0}, {4, -1, -1.0},
                      {1, 3, 3.0}, {1, -1, -1.0}, {0, 9, 2.0}, {5, 9, 7.0}, {5, -9, 7.0}};
    Curve curve({{0, 0.0}, {256, 2.0}});
    for (auto const& row : rows) {
        curve.setModes(row.mode, row.mode, false);
        EXPECT_NEAR(row.expected, curve.value(TempusMake(row.u, 1)), 1e-9)
            << "mode " << row.mode << " at " << row.u;
    }
}

TEST(KFSplineExtrapolate, CountsCyclesExactlyHoweverFarAway) {
    Curve curve;
    curve.spline.appendVertexNoTangents(TempusMake(1, 30), 1.0, kTempusZero);
    curve.spline.appendVertexNoTangents(TempusMake(8, 30), 8.0, kTempusZero);
    // 7/30 s a cycle: as doubles, positions so far out are coarser than a frame.
    for (std::int64_t const cycles : {std::int64_t{1} << 40, (std::int64_t{1} << 58) + 1}) {
        curve.setModes(3, 3, false);
        EXPECT_NEAR(3.0, curve.value(TempusMake(7 * cycles + 3, 30)), 1e-12);
        EXPECT_NEAR(3.0, curve.value(TempusMake(3 - 7 * cycles, 30)), 1e-12);
        curve.setModes(2, 2, false);
        bool const isReversed = cycles % 2 != 0;
        EXPECT_NEAR(isReversed ? 6.0 : 3.0, curve.value(TempusMake(7 * cycles + 3, 30)), 1e-12);
        EXPECT_NEAR(isReversed ? 6.0 : 3.0, curve.value(TempusMake(-7 * cycles + 3, 30)), 1e-12);
    }
}

TEST(KFSplineExtrapolate, ComesToAnEndWhereverItIsAsked) {
    Tempus const positions[] = {kTempusPositiveInfinity,
                                kTempusNegativeInfinity,
                                kTempusIndefinite,
                                kTempusInvalid,
                                TempusMake(std::numeric_limits<std::int64_t>::max(), 1),
                                TempusMake(std::numeric_limits<std::int64_t>::min(), 1),
                                Tempus{5, 1, kTempusFlagValid, 3}};
    Tempus const frames[] = {kTempusZero, TempusMake(-1, 32), TempusMake(1, 120), kTempusPositiveInfinity,
                             kTempusInvalid};
    for (Exhibit const& exhibit : museum()) {
        Curve curve(exhibit.keys);
        double low = 7.0;
        double high = 7.0;
        for (Key const& key : exhibit.keys) {
            low = std::min(low, key.v);
            high = std::max(high, key.v);
        }
        for (Tempus const& frame : frames) {
            curve.owner.frame = frame;
            forAllModes([&](std::uint32_t pre, std::uint32_t post, bool retiming) {
                SCOPED_TRACE(describe(exhibit.why, pre, post, retiming));
                curve.setModes(pre, post, retiming);
                bool const staysBetweenKeys = pre != 1 && pre != 4 && post != 1 && post != 4;
                auto const check = [&](Tempus const& u) {
                    double const value = curve.value(u);
                    if (staysBetweenKeys) {
                        ASSERT_GE(value, low);
                        ASSERT_LE(value, high);
                    }
                };
                for (Tempus const& u : positions) {
                    check(u);
                }
                for (int u = -40; u <= 40; ++u) {
                    check(TempusMake(u, 256));
                }
            });
        }
    }

    // Ends of one function over the whole curve: the range is counted in vertices, away from where they stand.
    for (int mix = 0; mix < 16; ++mix) {
        Curve curve({{1280, 1.0}, {2560, 3.0}, {2561, 2.0}, {9000, 5.0}});
        curve.state.parametric = mix % 2 != 0;
        curve.spline.setClosed(mix / 2 % 2 != 0, nullptr);
        curve.spline.setVertexInterpolation(curve.spline.getFirstVertex(), mix / 4 % 2 != 0 ? 10 : 1);
        curve.spline.setVertexInterpolation(curve.spline.getLastVertex(), mix / 8 != 0 ? 12 : 1);
        curve.spline.setDirty(true);
        forAllModes([&](std::uint32_t pre, std::uint32_t post, bool retiming) {
            SCOPED_TRACE(describe("whole curve", pre, post, retiming));
            curve.setModes(pre, post, retiming);
            for (int u = -20; u <= 200; ++u) {
                curve.value(TempusMake(u, 2));
            }
            for (Tempus const& u : positions) {
                curve.value(u);
            }
        });
    }
}

TEST(KFSplineExtrapolate, LeavesAClosedSplineToWrap) {
    Curve curve({{0, 1.0}, {128, 2.0}, {256, 5.0}});
    curve.spline.setClosed(true, nullptr);
    curve.setModes(3, 3, false);
    // The closing segment leads from the last to the first within 1/100 s.
    EXPECT_NEAR(3.0, curve.value(TempusMake(401, 200)), 1e-9);
    // Before the first vertex the first segment goes on.
    EXPECT_NEAR(0.5, curve.value(TempusMake(-1, 2)), 1e-9);
    double extrapolated = 0.0;
    curve.spline.extrapolate(curve.spline.getLastVertex(), kTempusZero, TempusMake(5, 2), &extrapolated, 0);
    EXPECT_NEAR(1.5, extrapolated, 1e-9);
}

// --- Continuation as vertices ---

/// A curve of every kind of segment, with tangents that are unlike on the two sides of each vertex.
void fillAtRandom(Curve& curve, std::uint32_t seed, std::initializer_list<std::uint32_t> types) {
    std::mt19937 random(seed);
    auto const number = [&random](int low, int high) {
        return low + static_cast<int>(random() % static_cast<unsigned>(high - low + 1));
    };
    int u = number(-50, 50);
    int const count = number(2, 6);
    for (int i = 0; i < count; ++i) {
        void* const handle =
            curve.spline.appendVertexNoTangents(TempusMake(u, 30), number(-9, 9), kTempusZero);
        auto* const vertex = static_cast<KFVertex*>(handle);
        vertex->setInterpolation(types.begin()[random() % types.size()]);
        vertex->setInputTangents(-number(0, 9) / 100.0, number(-9, 9) / 30.0, kTempusZero);
        vertex->setOutputTangents(number(0, 9) / 100.0, number(-9, 9) / 30.0, kTempusZero);
        u += number(10, 40);
    }
}

TEST(KFSplineGenerateExtrapolatedVertices, DrawTheCurveThatWasExtrapolated) {
    constexpr std::uint32_t cycles = 3;
    for (std::uint32_t seed = 0; seed < 200; ++seed) {
        std::uint32_t const mode = seed % 5;
        std::uint32_t const side = seed / 5 % 2;
        SCOPED_TRACE("seed " + std::to_string(seed) + ", mode " + std::to_string(mode) + ", side " +
                     std::to_string(side));
        Curve curve;
        // Only types that look alike from both directions can run backwards. What is written holds what was read,
        // so jumps inside a segment must not fall on a rounded position.
        mode == 2 ? fillAtRandom(curve, seed, {1, 4}) : fillAtRandom(curve, seed, {0, 1, 4, 7, 15});
        curve.setModes(mode, mode, false);
        Tempus const min = curve.spline.getMinValueU(kTempusZero, true);
        Tempus const max = curve.spline.getMaxValueU(kTempusZero, true);
        Tempus const length = max - min;
        Tempus const start = side == 0 ? max : min - length * cycles;

        auto* const first = static_cast<KFVertex*>(curve.spline.getFirstVertex());
        auto* const last = static_cast<KFVertex*>(curve.spline.getLastVertex());
        auto* const beforeLast = static_cast<KFVertex*>(curve.spline.getPreviousVertex(last));
        Tempus const second = static_cast<KFVertex*>(curve.spline.getNextVertex(first))->getValueU();
        Tempus const secondLast = beforeLast->getValueU();
        if (side == 1) {
            // Before the start the copy of the last vertex gives its type, which drew nothing so far, to where two
            // cycles meet.
            last->setInterpolation((mode == 2 ? beforeLast : first)->getInterpolation());
        }

        std::vector<double> expected;
        constexpr int samples = 240;
        auto const position = [&](int i) {
            return start + length * cycles * TempusMake(2 * i + 1, 2 * samples);
        };
        for (int i = 0; i < samples; ++i) {
            expected.push_back(curve.value(position(i)));
        }
        ASSERT_TRUE(curve.spline.generateExtrapolatedVertices(side, cycles, kTempusZero));
        curve.setModes(5, 5, false);
        if (side == 0) {
            ASSERT_EQ(max + length * cycles, curve.spline.getMaxValueU(kTempusZero, true));
        } else {
            ASSERT_EQ(min - length * cycles, curve.spline.getMinValueU(kTempusZero, true));
        }
        for (int i = 0; i < samples; ++i) {
            // Repeated cycles begin 1/100 s beside each other, which bends the segment at the seam.
            Tempus const place = min + TempusModulo(position(i) - min, length);
            if (mode == 3 && (side == 0 ? place <= second : place >= secondLast)) {
                continue;
            }
            ASSERT_NEAR(expected[static_cast<std::size_t>(i)], curve.value(position(i)), 1e-6)
                << "at " << TempusGetSeconds(position(i));
        }
    }
}

TEST(KFSplineGenerateExtrapolatedVertices, KeepTheirSide) {
    { // A repeated cycle before the start joins what stands there; after the end it replaces.
        Curve curve({{0, 1.0}, {128, 2.0}});
        curve.setModes(3, 3, false);
        ASSERT_TRUE(curve.spline.generateExtrapolatedVertices(1, 1, kTempusZero));
        EXPECT_EQ(4u, curve.spline.getNumberOfVertices());
        ASSERT_TRUE(curve.spline.generateExtrapolatedVertices(0, 1, kTempusZero));
        EXPECT_EQ(8u, curve.spline.getNumberOfVertices());
        EXPECT_EQ(TempusMake(-1, 1), curve.spline.getMinValueU(kTempusZero, true));
    }
    { // A single vertex has no length: the copies before it pile up, those after it are one.
        Curve curve({{0, 1.0}});
        curve.setModes(3, 3, false);
        ASSERT_TRUE(curve.spline.generateExtrapolatedVertices(0, 3, kTempusZero));
        EXPECT_EQ(2u, curve.spline.getNumberOfVertices());
        Curve other({{0, 1.0}});
        other.setModes(3, 3, false);
        ASSERT_TRUE(other.spline.generateExtrapolatedVertices(1, 3, kTempusZero));
        EXPECT_EQ(4u, other.spline.getNumberOfVertices());
    }
    { // Without a valid vertex there is nothing to repeat; another side and another mode add nothing.
        Curve disabled({{0, 1.0, false, false}});
        EXPECT_FALSE(disabled.spline.generateExtrapolatedVertices(0, 2, kTempusZero));
        EXPECT_EQ(1u, disabled.spline.getNumberOfVertices());
        Curve curve({{0, 1.0}, {128, 2.0}});
        EXPECT_TRUE(curve.spline.generateExtrapolatedVertices(2, 2, kTempusZero));
        curve.setModes(5, 5, false);
        EXPECT_TRUE(curve.spline.generateExtrapolatedVertices(0, 2, kTempusZero));
        EXPECT_EQ(2u, curve.spline.getNumberOfVertices());
        EXPECT_EQ(1.5, curve.value(TempusMake(1, 2)));
    }
    { // A held continuation turns the end of the curve into a held one too, not the start.
        Curve curve({{0, 1.0}, {128, 2.0}});
        ASSERT_TRUE(curve.spline.generateExtrapolatedVertices(0, 1, kTempusZero));
        ASSERT_TRUE(curve.spline.generateExtrapolatedVertices(1, 1, kTempusZero));
        std::vector<std::uint32_t> types;
        for (auto place = curve.spline.beginVertices(); place != curve.spline.endVertices();
             place = curve.spline.nextPlace(place)) {
            types.push_back(curve.spline.vertexAt(place)->getInterpolation());
        }
        EXPECT_EQ((std::vector<std::uint32_t>{0, 0, 1, 0, 0}), types);
    }
}

} // namespace
