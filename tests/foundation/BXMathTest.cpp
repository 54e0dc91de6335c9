#include "lumenkey/foundation/BXMath.h"

#include <algorithm>
#include <cmath>
#include <initializer_list>
#include <random>
#include <set>
#include <vector>

#include <gtest/gtest.h>

#include "lumenkey/foundation/BXAlgorithm.h"

namespace {

std::vector<double> quadraticRoots(double a, double b, double c, double tolerance = 0.0) {
    double r[2] = {};
    int const count = BXMath::quadratic(a, b, c, r[0], r[1], tolerance);
    return {r, r + count};
}

std::vector<double> cubicRoots(double a, double b, double c) {
    double r[3] = {};
    int const count = BXMath::cubic(a, b, c, r[0], r[1], r[2]);
    return {r, r + count};
}

/// How far x^3 + a x^2 + b x + c is from 0 at x, in units of the rounding of its terms; in higher precision.
double cubicResidual(double a, double b, double c, double x) {
    long double const at = ((static_cast<long double>(x) + a) * x + b) * x + c;
    double const size = std::fabs(x);
    double const terms = ((size + std::fabs(a)) * size + std::fabs(b)) * size + std::fabs(c);
    return terms == 0.0 ? 0.0 : static_cast<double>(std::fabs(at)) / (terms * 0x1p-53);
}

void expectAscending(std::vector<double> const& roots) {
    EXPECT_TRUE(std::is_sorted(roots.begin(), roots.end(), std::less_equal<>{}));
}

using Roots = std::vector<double>;

} // namespace

TEST(BXMath, QuadraticCountsRootsExactly) {
    // Integers whose products a double holds exactly: one, two or no root is then a fact, however close they lie.
    std::mt19937 engine(7001);
    std::uniform_int_distribution<int> integers(-(1 << 25), 1 << 25);
    for (int i = 0; i < 20000; ++i) {
        double const p = integers(engine) >> (engine() % 24);
        double const q = i % 3 == 0 ? p : i % 3 == 1 ? p + 1.0 : integers(engine) >> (engine() % 24);
        double const a = std::ldexp(i % 2 != 0 ? 1.0 : -1.0, static_cast<int>(engine() % 40) - 20);
        SCOPED_TRACE(::testing::Message() << a << " (x - " << p << ") (x - " << q << ")");
        std::set<double> const expected{p, q};
        EXPECT_EQ(quadraticRoots(a, -a * (p + q), a * (p * q)), Roots(expected.begin(), expected.end()));
        if (p == q) {
            EXPECT_TRUE(quadraticRoots(a, -a * (p + q), a * (p * q + 1.0)).empty());
        }
    }
}

TEST(BXMath, QuadraticSpecialForms) {
    constexpr double huge = 1e300;
    constexpr double tiny = 1e-300;
    EXPECT_EQ(quadraticRoots(1e-8, 2.0, -3.0, 1e-7), Roots{1.5}) << "a within the tolerance counts as 0";
    EXPECT_EQ(quadraticRoots(0.0, 0.0, 0.0), Roots{});
    EXPECT_EQ(quadraticRoots(tiny, 0.0, 0.0), Roots{0.0});
    EXPECT_EQ(quadraticRoots(std::nan(""), 1.0, 1.0), Roots{});
    EXPECT_EQ(quadraticRoots(tiny, 1e20, -1.0), Roots{1e-20}) << "the other root is beyond the range";
    // The small root keeps all its digits beside a large one.
    EXPECT_EQ(quadraticRoots(1.0, -1e12, 1.0), (Roots{1e-12, 1e12}));
    struct Extreme {
        double a, b, c;
        Roots roots;
    };
    for (Extreme const& e : {Extreme{huge, -3 * huge, 2 * huge, {1.0, 2.0}},
                             {tiny, 0.0, -huge, {-1e300, 1e300}},
                             {tiny, -3 * tiny, 2 * tiny, {1.0, 2.0}},
                             {huge, -2 * huge, huge, {1.0}},
                             {1e-200, -1e-40, 1e100, {1e140, 1e160}}}) {
        Roots const roots = quadraticRoots(e.a, e.b, e.c);
        ASSERT_EQ(roots.size(), e.roots.size()) << e.a << ' ' << e.b << ' ' << e.c;
        for (std::size_t i = 0; i < roots.size(); ++i) {
            EXPECT_DOUBLE_EQ(roots[i], e.roots[i]);
        }
    }
}

TEST(BXMath, PowersOfTwoScaleRoots) {
    // x = 2^s y turns the coefficients by powers of two, exactly; the paths for extreme coefficients must agree.
    std::mt19937 engine(7002);
    std::uniform_real_distribution<double> reals(-3.0, 3.0);
    for (int i = 0; i < 3000; ++i) {
        double const a = reals(engine), b = reals(engine), c = reals(engine);
        for (int const s : {-300, -180, -60, 60, 180, 300}) {
            SCOPED_TRACE(::testing::Message() << "case " << i << " shift " << s);
            for (bool const cubic : {false, true}) {
                Roots const plain = cubic ? cubicRoots(a, b, c) : quadraticRoots(a, b, c);
                Roots const scaled =
                    cubic ? cubicRoots(std::ldexp(a, s), std::ldexp(b, 2 * s), std::ldexp(c, 3 * s))
                          : quadraticRoots(std::ldexp(a, -s), b, std::ldexp(c, s));
                ASSERT_EQ(scaled.size(), plain.size());
                for (std::size_t k = 0; k < plain.size(); ++k) {
                    ASSERT_DOUBLE_EQ(std::ldexp(scaled[k], -s), plain[k]);
                }
            }
        }
    }
}

TEST(BXMath, CubicResidualsAreOfTheOrderOfRounding) {
    std::mt19937_64 engine(7004);
    std::normal_distribution<double> normal;
    double worst = 0.0;
    for (int i = 0; i < 100000; ++i) {
        auto const real = [&] {
            return normal(engine) * std::exp2(static_cast<double>(engine() % 81) - 40.0);
        };
        double a = real(), b = real(), c = real();
        if (i % 3 == 0) { // pairs as close as rounding tells apart
            double const p = real(), r = real();
            double const q = p * (1.0 + std::exp2(-static_cast<double>(engine() % 54)));
            a = -(p + q + r);
            b = p * q + (p + q) * r;
            c = -p * q * r;
        }
        Roots const roots = cubicRoots(a, b, c);
        SCOPED_TRACE(::testing::Message() << "case " << i << ": " << a << ' ' << b << ' ' << c);
        ASSERT_FALSE(roots.empty());
        expectAscending(roots);
        for (double const root : roots) {
            worst = std::max(worst, cubicResidual(a, b, c, root));
        }
        ASSERT_LE(worst, 16.0);
    }
}

TEST(BXMath, CubicSpecialForms) {
    EXPECT_EQ(cubicRoots(0.0, 0.0, -8.0), Roots{2.0});
    double r[3];
    EXPECT_EQ(BXMath::cubic(std::nan(""), 0.0, 0.0, r[0], r[1], r[2]), 1);
    EXPECT_TRUE(std::isnan(r[0]));
    // Never none, whatever the sizes.
    constexpr double sizes[] = {0.0, 5e-324, 1e-300, 1e-150, 1e-50, 1.0, 1e50, 1e100, 1e150, 1e308};
    for (double const a : sizes) {
        for (double const b : sizes) {
            for (double const c : sizes) {
                for (int signs = 0; signs < 8; ++signs) {
                    Roots const roots =
                        cubicRoots(signs & 1 ? -a : a, signs & 2 ? -b : b, signs & 4 ? -c : c);
                    EXPECT_FALSE(roots.empty());
                    expectAscending(roots);
                    EXPECT_TRUE(
                        std::all_of(roots.begin(), roots.end(), [](double x) { return std::isfinite(x); }))
                        << a << ' ' << b << ' ' << c << ' ' << signs;
                }
            }
        }
    }
}

TEST(BXMath, CubicDoesNotMissATouch) {
    // The end of an eased segment, 3 t^2 - 2 t^3 = v with v a few roundings off 1: t = 1 may not get lost.
    double v = 1.0 - 8 * 0x1p-53;
    for (int i = 0; i <= 16; ++i, v = std::nextafter(v, 2.0)) {
        Roots const roots = cubicRoots(-1.5, 0.0, 0.5 * v);
        ASSERT_GE(roots.size(), v < 1.0 + 0x1p-51 ? 2U : 1U) << v - 1.0;
        if (v < 1.0 + 0x1p-51) {
            EXPECT_NEAR(roots.back(), 1.0, 1e-7);
        }
    }
    EXPECT_EQ(cubicRoots(-1.5, 0.0, 0.5 + 1e-12).size(), 1U) << "a clear miss is one";
}

TEST(BXMath, EaseInOutKeepsItsPromises) {
    auto const ease = [](double p, double in, double out) {
        double q = -1.0;
        BXMath::easeInOut(p, in, out, 0.0, 1.0, &q, nullptr);
        return q;
    };
    constexpr double ramps[] = {0.0, 1e-9, 0.05, 0.1, 0.25, 1.0 / 3.0, 0.5, 0.7, 1.0, 3.0};
    for (double const in : ramps) {
        for (double const out : ramps) {
            SCOPED_TRACE(::testing::Message() << in << " and " << out);
            EXPECT_EQ(ease(0.0, in, out), 0.0);
            EXPECT_EQ(ease(1.0, in, out), 1.0);
            std::vector<double> places(1001);
            std::generate(places.begin(), places.end(), [i = 0]() mutable { return i++ / 1000.0; });
            for (double const seam : {in, 1.0 - out}) {
                double place = seam - 4e-16;
                for (int i = 0; i < 40; ++i, place = std::nextafter(place, 2.0)) {
                    places.push_back(std::clamp(place, 0.0, 1.0));
                }
            }
            std::sort(places.begin(), places.end());
            double previous = 0.0;
            for (double const p : places) {
                double q = 0.0;
                double speed = 0.0;
                BXMath::easeInOut(p, in, out, 0.0, 1.0, &q, &speed);
                ASSERT_GE(q, previous) << p;
                ASSERT_LE(q, 1.0);
                previous = q;
                constexpr double step = 1e-6;
                if (in >= 0.05 && out >= 0.05 && p >= step && p <= 1.0 - step) {
                    double const slope = (ease(p + step, in, out) - ease(p - step, in, out)) / (2.0 * step);
                    ASSERT_NEAR(speed, slope, 1e-4) << p;
                }
            }
            EXPECT_NEAR(ease(0.3, in, out), 1.0 - ease(0.7, out, in), 1e-15) << "the ramps mirror each other";
        }
    }
    double place = 0.0;
    BXMath::easeInOut(1.0, 0.3, 0.3, 0.1, 0.7, &place, nullptr);
    EXPECT_EQ(place, 0.7);
}

TEST(BXMath, TimesWithinATolerance) {
    Tempus const tolerance = TempusMake(1, 100);
    EXPECT_TRUE(BXMath::equal(TempusMake(1, 3), TempusMake(103, 300), tolerance));
    EXPECT_FALSE(BXMath::equal(TempusMake(1, 3), TempusMake(104, 300), tolerance));
    EXPECT_TRUE(BXMath::equal(kTempusPositiveInfinity, kTempusPositiveInfinity, kTempusZero));
    EXPECT_FALSE(BXMath::equal(kTempusPositiveInfinity, kTempusZero, kTempusPositiveInfinity));
    EXPECT_FALSE(BXMath::equal(kTempusInvalid, kTempusZero, tolerance));
    EXPECT_FALSE(BXMath::equal(std::nan(""), 0.0));
    EXPECT_TRUE(BXMath::equal(HUGE_VAL, HUGE_VAL));
    EXPECT_EQ(BXMath::mod(TempusMake(-1, 3), TempusMake(1, 2)), TempusMake(1, 6));
    EXPECT_EQ(BXMath::mod(TempusMake(1, 3), TempusMake(-1, 2)), TempusMake(-1, 6));
    EXPECT_EQ(BXMath::clamp(TempusMake(5, 2), kTempusZero, TempusMake(2, 1)), TempusMake(2, 1));
    EXPECT_EQ(BXMath::clamp(kTempusNegativeInfinity, kTempusZero, TempusMake(2, 1)), kTempusZero);
}

TEST(BXAlgorithm, SubdivisionKeepsTheCurve) {
    auto const at = [](double const* p, double t) {
        double const s = 1.0 - t;
        return s * s * s * p[0] + 3 * s * s * t * p[1] + 3 * s * t * t * p[2] + t * t * t * p[3];
    };
    double const x[4] = {0.0, 1.0, 4.0, -2.0};
    double const z[4] = {5.0, 5.0, 7.0, 6.0};
    double leftX[4], rightX[4], rightZ[4];
    BXAlgorithm::DeCasteljauSubdivide(10.0, 30.0, 16.0, x, nullptr, z, leftX, nullptr, nullptr, rightX, leftX,
                                      rightZ);
    EXPECT_EQ(leftX[0], x[0]);
    EXPECT_EQ(rightX[3], x[3]);
    EXPECT_EQ(leftX[3], rightX[0]);
    for (int eighth = 0; eighth <= 8; ++eighth) {
        double const t = eighth / 8.0;
        EXPECT_NEAR(at(leftX, t), at(x, 0.3 * t), 1e-14);
        EXPECT_NEAR(at(rightX, t), at(x, 0.3 + 0.7 * t), 1e-14);
        EXPECT_NEAR(at(rightZ, t), at(z, 0.3 + 0.7 * t), 1e-14);
    }
    double own[4] = {0.0, 1.0, 4.0, -2.0};
    BXAlgorithm::DeCasteljauSubdivide(1.0, 1.0, 1.0, own, nullptr, nullptr, leftX, nullptr, nullptr, own,
                                      nullptr, nullptr);
    EXPECT_EQ(leftX[3], 0.0);
    EXPECT_TRUE(std::equal(own, own + 4, x)) << "an empty range cuts at the start, in place";
}
