#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>

namespace {

/// Positions of keys are in units of 1/128 s, so that doubles hold them exactly.
struct Key {
    int u;
    double v;
    bool isConstant = false;
    bool isEnabled = true;
};
using Keys = std::vector<Key>;

Keys const kCurves[] = {
    {},
    {{256, 5.0}},
    {{256, 5.0, false, false}},
    {{0, 0.0}, {256, 2.0}},
    {{-64, 3.0}, {32, -1.0}, {128, 4.0}, {192, 2.5}},
    {{-300, 9.0, false, false}, {0, 1.0}, {64, 8.0, false, false}, {128, 2.0}, {400, 9.0, false, false}},
    {{64, 1.0}, {64, 2.0}, {64, 3.0}},
    {{0, 1.0}, {0, 2.0}, {128, 5.0}, {128, 6.0}},
    {{0, 1.0, true}, {64, 3.0}, {128, 2.0, true}},
    {{0, 1.0}, {1, 2.0}}, // shorter than the reach of a slope
    // Beside whole numbers of frames, which are 4 long.
    {{0, 1.0}, {4, 2.0}},
    {{0, 1.0}, {2, 4.0}, {5, 2.0}},
    {{8, 1.0}, {10, 4.0}, {15, 2.0}},
    {{0, 1.0}, {6, 4.0}, {19, 2.0}},
    {{-60, 1.0}, {0, 4.0}, {60, 2.0}},
};

/// The rules once more, in doubles and word for word: the truth that the engine is compared with.
struct Model {
    Keys keys; // the enabled ones
    std::uint32_t pre, post;
    bool retiming;
    double step = 1.0 / 32.0;

    double value(double u, int depth = 0) const {
        EXPECT_LT(depth, 8) << "the rules themselves don't end";
        if (keys.empty()) {
            return 7.0;
        }
        if (u < min()) {
            return range() == 0.0 ? keys.front().v : before(u, depth + 1);
        }
        if (u > max() || (retiming && u == max())) {
            return range() == 0.0 ? keys.back().v : after(u, depth + 1);
        }
        std::size_t i = 0;
        while (at(i) < u) {
            ++i;
        }
        if (at(i) == u) {
            return keys[i].v;
        }
        Key const& a = keys[i - 1];
        return a.isConstant ? a.v : a.v + (keys[i].v - a.v) * (u - at(i - 1)) / (at(i) - at(i - 1));
    }

    double at(std::size_t i) const { return keys[i].u / 128.0; }
    double min() const { return at(0); }
    double max() const { return at(keys.size() - 1); }
    double range() const { return max() - min(); }
    bool preReadsEnd() const { return pre == 4 || (pre == 1 && min() + 0.01 >= max()); }

    double after(double u, int depth) const {
        double const end = keys.back().v;
        double const q = (u - min()) / range(), n = std::trunc(q), f = q - std::floor(q);
        switch (post) {
        case 0:
            return !retiming || range() < step ? end : value(max() - step, depth);
        case 1: {
            double const x = std::max(max() - 0.01, min());
            return keys.back().isConstant ? end : (u - max()) * ((end - value(x, depth)) / (max() - x)) + end;
        }
        case 2: {
            if (!retiming || range() < step) {
                double const x = std::fmod(n, 2.0) == 0.0 ? f * range() + min() : max() - f * range();
                return retiming && x >= max() ? end : value(std::clamp(x, min(), max()), depth);
            }
            double w = 0.0;
            if (range() != step) {
                double const r = range() - step;
                double const m = std::fmod(u - max(), 2.0 * r);
                w = m >= r ? m - r + step : m + (r - std::floor(m / step) * step * 2.0 - step);
            }
            bool const endless = range() < 2.0 * step && preReadsEnd();
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
        double const start = keys.front().v;
        double const q = (min() - u) / range(), n = std::trunc(q), f = q - std::floor(q);
        switch (pre) {
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
        case 4:
            return value(max() - f * range(), depth) - (value(max(), depth) - start) * (1.0 + n);
        default:
            return 7.0;
        }
    }
};

struct Curve : MuseumSpline {
    TestOwner owner;

    explicit Curve(Keys const& keys = {}) {
        owner.initialValue = 7.0;
        owner.frame = TempusMake(1, 32);
        spline->setNode(&owner);
        for (Key const& key : keys) {
            KFVertex* const vertex = append(TempusMake(key.u, 128), key.v, key.isConstant ? 0 : 1);
            if (!key.isEnabled) {
                spline->disableVertex(vertex, kTempusZero);
            }
        }
    }
    void setModes(std::uint32_t pre, std::uint32_t post, bool retiming = false) {
        spline->setExtrapolation(pre, 1);
        spline->setExtrapolation(post, 0);
        state->retimingExtrapolation = retiming;
    }
    template <class Body> void forAllModes(Body body) {
        for (std::uint32_t mix = 0; mix < 72; ++mix) {
            std::uint32_t const pre = mix / 12, post = mix / 2 % 6;
            bool const retiming = mix % 2 != 0;
            SCOPED_TRACE(testing::Message()
                         << "before " << pre << ", after " << post << ", retiming " << retiming);
            setModes(pre, post, retiming);
            body(pre, post, retiming);
        }
    }
};

TEST(KFSplineExtrapolate, FollowsTheRulesOnBothSidesOfEveryCurve) {
    for (Keys const& keys : kCurves) {
        SCOPED_TRACE(testing::Message() << "curve " << &keys - kCurves);
        Curve curve(keys);
        int const min = keys.empty() ? 0 : keys.front().u;
        int const length = keys.empty() ? 16 : std::max(keys.back().u - min, 1);
        Keys enabled = keys;
        std::erase_if(enabled, [](Key const& key) { return !key.isEnabled; });
        curve.forAllModes([&](std::uint32_t pre, std::uint32_t post, bool retiming) {
            Model const model{enabled, pre, post, retiming};
            // Three and a half lengths on either side, sixteen positions a length.
            for (int i = 0; i <= 128; ++i) {
                int const u = 16 * min - 56 * length + i * length;
                double const expected = model.value(u / 2048.0);
                // A straight continuation is rounded to a time, to about 2^-31.
                ASSERT_NEAR(expected, curve.at(TempusMake(u, 2048)), 1e-8 * (1.0 + std::fabs(expected))) << u;
            }
        });
    }
}

TEST(KFSplineExtrapolate, CountsCyclesExactlyHoweverFarAway) {
    Curve curve;
    curve.append(TempusMake(1, 30), 1.0);
    curve.append(TempusMake(8, 30), 8.0);
    // 7/30 s a cycle: as doubles, positions so far out are coarser than a frame.
    for (std::int64_t const cycles : {std::int64_t{1} << 40, (std::int64_t{1} << 58) + 1}) {
        for (std::uint32_t const mode : {2u, 3u}) {
            curve.setModes(mode, mode);
            for (std::int64_t const away : {7 * cycles, -7 * cycles}) {
                double const expected = mode == 2 && cycles % 2 != 0 ? 6.0 : 3.0;
                EXPECT_NEAR(expected, curve.at(TempusMake(away + 3, 30)), 1e-12) << mode;
            }
        }
    }
}

TEST(KFSplineExtrapolate, ComesToAnEndWhereverItIsAsked) {
    std::vector<Tempus> positions{kTempusPositiveInfinity,
                                  kTempusNegativeInfinity,
                                  kTempusIndefinite,
                                  kTempusInvalid,
                                  TempusMake(std::numeric_limits<std::int64_t>::max(), 1),
                                  TempusMake(std::numeric_limits<std::int64_t>::min(), 1),
                                  Tempus{5, 1, kTempusFlagValid, 3}};
    for (int i = -40; i <= 200; ++i) {
        positions.push_back(i <= 40 ? TempusMake(i, 256) : TempusMake(i - 60, 2));
    }
    for (Keys const& keys : kCurves) {
        SCOPED_TRACE(testing::Message() << "curve " << &keys - kCurves);
        Curve curve(keys);
        for (Tempus const& frame :
             {kTempusZero, TempusMake(-1, 32), TempusMake(1, 120), kTempusPositiveInfinity, kTempusInvalid}) {
            curve.owner.frame = frame;
            curve.forAllModes([&](std::uint32_t pre, std::uint32_t post, bool) {
                bool const staysBetweenKeys = pre != 1 && pre != 4 && post != 1 && post != 4;
                for (Tempus const& u : positions) {
                    double const value = curve.at(u);
                    ASSERT_TRUE(!staysBetweenKeys || (-1.0 <= value && value <= 9.0)) << museumText(u);
                }
            });
        }
    }
}

// --- Continuation as vertices ---

TEST(KFSplineGenerateExtrapolatedVertices, DrawTheCurveThatWasExtrapolated) {
    constexpr int cycles = 3;
    constexpr int samples = 240;
    for (std::uint32_t seed = 0; seed < 200; ++seed) {
        std::uint32_t const mode = seed % 5;
        bool const after = seed / 5 % 2 == 0;
        SCOPED_TRACE(testing::Message() << "seed " << seed << ", mode " << mode << ", after " << after);
        Curve curve;
        // Only types that look alike from both directions can run backwards. What is written holds what was read,
        // so jumps inside a segment must not fall on a rounded position.
        using Types = std::vector<std::uint32_t>;
        std::mt19937 random(seed);
        curve.appendAtRandom(random, 2 + static_cast<int>(random() % 5),
                             mode == 2 ? Types{1, 4} : Types{0, 1, 4, 7, 15});
        curve.setModes(mode, mode);
        auto const vertices = museumVertices(*curve);
        KFVertex& beforeLast = *vertices[vertices.size() - 2];
        Tempus const min = vertices.front()->getValueU(), second = vertices[1]->getValueU();
        Tempus const max = vertices.back()->getValueU(), secondLast = beforeLast.getValueU();
        Tempus const length = max - min;
        Tempus const start = after ? max : min - length * cycles;
        if (!after) {
            // The copy of the last vertex gives its type, which drew nothing so far, to where two cycles meet.
            vertices.back()->setInterpolation(
                (mode == 2 ? beforeLast : *vertices.front()).getInterpolation());
        }
        auto const position = [&](int i) {
            return start + length * cycles * TempusMake(2 * i + 1, 2 * samples);
        };
        std::vector<double> expected;
        for (int i = 0; i < samples; ++i) {
            expected.push_back(curve.at(position(i)));
        }
        ASSERT_TRUE(curve->generateExtrapolatedVertices(after ? 0 : 1, cycles, kTempusZero));
        curve.setModes(5, 5);
        ASSERT_EQ(after ? max + length * cycles : max, curve->getMaxValueU(kTempusZero, true));
        ASSERT_EQ(after ? min : start, curve->getMinValueU(kTempusZero, true));
        for (int i = 0; i < samples; ++i) {
            // Repeated cycles begin 1/100 s beside each other, which bends the segment at the seam.
            Tempus const place = min + TempusModulo(position(i) - min, length);
            if (mode != 3 || (after ? place > second : place < secondLast)) {
                ASSERT_NEAR(expected[static_cast<std::size_t>(i)], curve.at(position(i)), 1e-6) << i;
            }
        }
    }
}

TEST(KFSplineGenerateExtrapolatedVertices, KeepTheirSide) {
    Keys const ramp{{0, 1.0}, {128, 2.0}};
    struct {
        Keys keys;
        std::uint32_t mode, side, cycles;
        bool isDone;
        std::size_t count;
    } const rows[] = {
        // A repeated cycle before the start joins what stands there; after the end it replaces.
        {ramp, 3, 1, 1, true, 4},
        {ramp, 3, 0, 1, true, 4},
        // A single vertex has no length: the copies before it pile up, those after it are one.
        {{{0, 1.0}}, 3, 0, 3, true, 2},
        {{{0, 1.0}}, 3, 1, 3, true, 4},
        // Without a valid vertex there is nothing to repeat; another side and another mode add nothing.
        {{{0, 1.0, false, false}}, 0, 0, 2, false, 1},
        {ramp, 0, 2, 2, true, 2},
        {ramp, 5, 0, 2, true, 2},
    };
    for (auto const& row : rows) {
        Curve curve(row.keys);
        curve.setModes(row.mode, row.mode);
        EXPECT_EQ(row.isDone, curve->generateExtrapolatedVertices(row.side, row.cycles, kTempusZero));
        EXPECT_EQ(row.count, curve->getNumberOfVertices()) << &row - rows;
    }
}

} // namespace
