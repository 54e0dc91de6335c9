// Values of every interpolation type at fixed positions, as the engine first gave them. A document holds
// keypoints and not pictures, so a change of any of these is a change of every document that was ever saved:
// when this test fails the code is at fault and never the table. Rows may be added, and none altered.

#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <charconv>
#include <cmath>
#include <cstdint>
#include <limits>
#include <string>

namespace {

enum class Scene { Open, Closed, Folding, Parametric, ParametricClosed };

struct FrozenValue {
    Scene scene;
    std::uint32_t type;
    std::int64_t value;
    std::int32_t timescale;
    double expected;
};

FrozenValue const kFrozenValues[] = {
#include "frozen_values.inc"
};

char const* nameOf(Scene scene) {
    constexpr char const* names[] = {"Open", "Closed", "Folding", "Parametric", "ParametricClosed"};
    return names[static_cast<int>(scene)];
}

struct Key {
    Tempus time;
    double value, bias;
    Sides sides;
};

// Times of several timescales, both directions, a handle of every length: U is inverted by each method there
// is.
Key const kKeys[] = {
    {TempusMake(0, 1), 1.5, 0.5, {0.0, 0.0, 0.03125, 0.25}},
    {TempusMake(1001, 1000), -2.25, 1.5, {-0.0625, 0.125, 0.0625, -0.5}},
    {TempusMake(5, 2), 7.0, 0.0, {-0.046875, 0.25, 0.125, 0.0}},
    {TempusMake(121, 30), 3.125, 1.25, {-0.03125, -0.375, 0.015625, 0.0}},
    {TempusMake(5, 1), 3.5, 1.0, {-0.02734375, 0.0, 0.02734375, 0.0}},
};

constexpr double kRangeOfValues = 9.25;

double valueNow(FrozenValue const& row) {
    MuseumSpline curve;
    curve.state->interpolation = row.type;
    curve.state->parametric = row.scene == Scene::Parametric || row.scene == Scene::ParametricClosed;
    for (std::int64_t index = 0; Key const& key : kKeys) {
        Tempus const u = curve.state->parametric ? TempusMake(index++, 1) : key.time;
        // Which takes its type from the state, or from the vertex in front of it.
        auto* const vertex = static_cast<KFVertex*>(curve->appendVertexNoTangents(u, key.value, kTempusZero));
        Sides sides = key.sides;
        for (double& side : sides) {
            side *= row.scene == Scene::Folding ? 3.0 : 1.0;
        }
        vertex->setBias(key.bias, kTempusZero);
        setSides(*vertex, sides);
    }
    curve->setClosed(row.scene == Scene::Closed || row.scene == Scene::ParametricClosed, nullptr);
    return curve.at(TempusMake(row.value, row.timescale));
}

/// What the mathematical functions of the platform may decide. The types that are products and sums are
/// exact. Sine, exponential and logarithm of double precision have another last bit on a processor without
/// fused operations, and those of single precision differ by their last bit, 6e-8, between libraries.
double toleranceOf(FrozenValue const& row) {
    constexpr double ulps = 8.0 * std::numeric_limits<double>::epsilon();
    switch (row.type) {
    case 7:
    case 8:
    case 13:
    case 14:
        return ulps * kRangeOfValues;
    case 19:
    case 20:
    case 21:
        return 1e-7 * kRangeOfValues;
    default:
        return 0.0;
    }
}

std::string hexadecimal(double value) {
    char text[64];
    char* const digits =
        std::to_chars(text, text + sizeof text, std::fabs(value), std::chars_format::hex).ptr;
    return (value < 0.0 ? "-0x" : "0x") + std::string(text, digits);
}

} // namespace

TEST(FrozenValues, StayAsTheyAre) {
    for (FrozenValue const& row : kFrozenValues) {
        double const now = valueNow(row);
        EXPECT_LE(std::fabs(now - row.expected), toleranceOf(row))
            << "now {Scene::" << nameOf(row.scene) << ", " << row.type << ", " << row.value << ", "
            << row.timescale << ", " << hexadecimal(now) << "},";
    }
}
