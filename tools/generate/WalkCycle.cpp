#include "tools/generate/WalkCycle.h"

#include <algorithm>
#include <cmath>
#include <numbers>

namespace lumenkey::generate {

namespace {

constexpr double kStridesPerSecond = 0.95;
constexpr double kSpeed = 128;    // centimetres a second
constexpr double kHipHeight = 92; // centimetres
constexpr double kRight = std::numbers::pi;
/// Ribbons of so many joints each.
constexpr std::size_t kRibbonLength = 12;

double phaseAt(double seconds) { return 2 * std::numbers::pi * kStridesPerSecond * seconds; }

/// The pseudo-random generator SplitMix64 (Steele, Lea and Flood, "Fast splittable pseudorandom number
/// generators", 2014), read as numbers from -1 to 1.
class Whim {
public:
    explicit Whim(std::uint64_t seed) : _state(seed) {}
    double next() {
        std::uint64_t z = (_state += 0x9E3779B97F4A7C15U);
        z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9U;
        z = (z ^ (z >> 27)) * 0x94D049BB133111EBU;
        z ^= z >> 31;
        return static_cast<double>(z >> 11) * 0x1p-52 - 1;
    }

private:
    std::uint64_t _state;
};

/// Both legs and both arms move alike, half a stride apart.
std::array<Swing, kAxisCount> thigh(double side) {
    return {{{1, 1.5, side, 0, 0}, {-6, 25, side + kRight, 4, 0.6}, {0, 4, side, 0, 0}}};
}
std::array<Swing, kAxisCount> shin(double side) {
    return {{{0, 0, 0, 0, 0}, {30, 26, side - 0.5, 10, -1.2}, {0, 2, side, 0, 0}}};
}
std::array<Swing, kAxisCount> foot(double side) {
    return {{{0, 1, side, 0, 0}, {-3, 11, side + 0.9, 7, 0.4}, {2, 1, side, 0, 0}}};
}
std::array<Swing, kAxisCount> upperArm(double side, double outward) {
    return {{{outward * 68, 2, side, 0, 0}, {4, 20, side, 2, 0.3}, {0, 5, side, 0, 0}}};
}
std::array<Swing, kAxisCount> foreArm(double side) {
    return {{{0, 2, side, 0, 0}, {-22, 11, side + 0.5, 2, 0}, {0, 3, side, 0, 0}}};
}
std::array<Swing, kAxisCount> hand(double side) {
    return {{{0, 3, side, 1, 0.2}, {-4, 6, side + 0.9, 0, 0}, {0, 2, side, 0, 0}}};
}

std::vector<WalkingJoint> person() {
    return {
        {"Hips", -1, {0, 0, 0}, {{{0, 2.5, 0.4, 0, 0}, {3, 0.6, 0, 1.4, 0.8}, {0, 5, 0, 0, 0}}}, {0, 5, 0}},
        {"Spine", 0, {0, 11, 0}, {{{0, 2, 3.4, 0, 0}, {2, 0.4, 0, 1, 2.2}, {0, 3, 3.1, 0, 0}}}, {0, 5, 0}},
        {"Chest", 1, {0, 21, 0}, {{{0, 1.5, 3.3, 0, 0}, {2, 0, 0, 0.8, 2.4}, {0, 6, 3.1, 0, 0}}}, {0, 5, 0}},
        {"Neck", 2, {0, 22, 1}, {{{0, 0.6, 0.2, 0, 0}, {-4, 0, 0, 0.8, 0.7}, {0, 2, 0.1, 0, 0}}}, {0, 5, 0}},
        {"Head", 3, {0, 9, 1}, {{{0, 0.8, 0.3, 0, 0}, {-2, 0, 0, 1.1, 0.9}, {0, 2.5, 0, 0, 0}}}, {0, 18, 0}},
        {"LeftUpLeg", 0, {9.5, -4, 0}, thigh(0), {0, -5, 0}},
        {"LeftLeg", 5, {0, -42, 0}, shin(0), {0, -5, 0}},
        {"LeftFoot", 6, {0, -40, 0}, foot(0), {0, -5, 14}},
        {"RightUpLeg", 0, {-9.5, -4, 0}, thigh(kRight), {0, -5, 0}},
        {"RightLeg", 8, {0, -42, 0}, shin(kRight), {0, -5, 0}},
        {"RightFoot", 9, {0, -40, 0}, foot(kRight), {0, -5, 14}},
        {"LeftArm", 2, {17, 18, 0}, upperArm(0, -1), {5, 0, 0}},
        {"LeftForeArm", 11, {28, 0, 0}, foreArm(0), {5, 0, 0}},
        {"LeftHand", 12, {25, 0, 0}, hand(0), {9, 0, 0}},
        {"RightArm", 2, {-17, 18, 0}, upperArm(kRight, 1), {-5, 0, 0}},
        {"RightForeArm", 14, {-28, 0, 0}, foreArm(kRight), {-5, 0, 0}},
        {"RightHand", 15, {-25, 0, 0}, hand(kRight), {-9, 0, 0}},
    };
}

constexpr int kChest = 2;

WalkingJoint ribbonJoint(std::size_t index, std::size_t indexOfJoint) {
    std::size_t const place = index % kRibbonLength;
    WalkingJoint joint;
    joint.name = "Ribbon" + std::to_string(index / kRibbonLength + 1) + "Part" + std::to_string(place + 1);
    joint.parent = place == 0 ? kChest : static_cast<int>(indexOfJoint) - 1;
    joint.offset = {0, -4, place == 0 ? -9.0 : -1.0};
    double const lag = -0.4 * static_cast<double>(place);
    joint.rotation = {{{0, 6, lag, 2, lag}, {3, 4, lag + 1, 3, lag}, {0, 2, lag, 0, 0}}};
    joint.end = {0, -4, 0};
    return joint;
}

} // namespace

double Swing::at(double phase) const {
    return mean + once * std::sin(phase + oncePhase) + twice * std::sin(2 * phase + twicePhase);
}

WalkCycle::WalkCycle(std::size_t jointCount, std::uint64_t seed) : _joints(person()) {
    std::size_t const bodyCount = _joints.size();
    _joints.resize(std::min(jointCount, bodyCount));
    while (_joints.size() < jointCount) {
        _joints.push_back(ribbonJoint(_joints.size() - bodyCount, _joints.size()));
    }
    Whim whim(seed);
    for (WalkingJoint& joint : _joints) {
        for (Swing& swing : joint.rotation) {
            swing.once *= 1 + 0.08 * whim.next();
            swing.oncePhase += 0.1 * whim.next();
            swing.twice *= 1 + 0.15 * whim.next();
            swing.twicePhase += 0.2 * whim.next();
        }
    }
}

std::array<double, 3> WalkCycle::position(double seconds) const {
    double const phase = phaseAt(seconds);
    return {1.8 * std::sin(phase), kHipHeight + 1.6 * std::cos(2 * phase),
            kSpeed * seconds + 1.2 * std::sin(2 * phase)};
}

std::array<double, kAxisCount> WalkCycle::rotation(std::size_t joint, double seconds) const {
    std::array<double, kAxisCount> angles{};
    for (std::size_t axis = 0; axis < kAxisCount; ++axis) {
        angles[axis] = _joints[joint].rotation[axis].at(phaseAt(seconds));
    }
    return angles;
}

} // namespace lumenkey::generate
