#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace lumenkey::generate {

/// An angle in degrees that swings once and twice in a stride: `mean + once sin(p + oncePhase) + twice sin(2
/// p + twicePhase)`, with p the phase of the stride in radians.
struct Swing {
    double mean = 0;
    double once = 0;
    double oncePhase = 0;
    double twice = 0;
    double twicePhase = 0;

    double at(double phase) const;
};

/// The order in which rotations are written.
enum Axis : std::size_t { kAxisZ, kAxisX, kAxisY, kAxisCount };

struct WalkingJoint {
    std::string name;
    /// Index of the parent, which stands before; -1 for the root.
    int parent = -1;
    /// From the parent, in centimetres.
    std::array<double, 3> offset{};
    std::array<Swing, kAxisCount> rotation{};
    /// Where the limb ends, for joints without children.
    std::array<double, 3> end{0, 5, 0};
};

/// A person who walks ahead at a steady pace, made of smooth formulae.
class WalkCycle {
public:
    /// The first `jointCount` joints of a person of 17; more joints make up ribbons that wave from the chest.
    /// The seed gives the walk its manner: the same seed, the same walk.
    WalkCycle(std::size_t jointCount, std::uint64_t seed);

    std::vector<WalkingJoint> const& joints() const { return _joints; }

    /// Position of the hips and rotation of a joint, `seconds` after the start.
    std::array<double, 3> position(double seconds) const;
    std::array<double, kAxisCount> rotation(std::size_t joint, double seconds) const;

private:
    std::vector<WalkingJoint> _joints;
};

} // namespace lumenkey::generate
