#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "tools/import/InputError.h"
#include "tools/import/InputText.h"

#include <array>
#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// What a channel of a joint moves; a position is in the units of the offsets, a rotation in degrees.
enum class MotionChannelKind { Xposition, Yposition, Zposition, Xrotation, Yrotation, Zrotation };

std::string_view motionChannelKindName(MotionChannelKind kind);
bool isRotation(MotionChannelKind kind);

struct MotionJoint {
    static constexpr std::size_t kNoParent = static_cast<std::size_t>(-1);

    std::string name;
    std::size_t parent = kNoParent;
    /// From the parent's origin.
    std::array<double, 3> offset{};
    /// The joint's channels are `channelCount` entries of `Motion::channels` from here.
    std::size_t firstChannel = 0;
    std::size_t channelCount = 0;
};

/// The free end of a limb; its offset is from the joint's origin.
struct MotionEndSite {
    std::size_t joint = 0;
    std::array<double, 3> offset{};
};

struct MotionChannel {
    std::size_t joint = 0;
    MotionChannelKind kind{};
};

/// A motion capture as its file has it: a forest of joints, parents before their children, and a row of
/// numbers for each frame.
struct Motion {
    std::string file;
    std::vector<MotionJoint> joints;
    std::vector<MotionEndSite> endSites;
    /// In the order of the columns.
    std::vector<MotionChannel> channels;
    std::size_t frameCount = 0;
    std::string frameTimeText;
    /// Exact, in lowest terms: see `frameDurationFromText`. Frame i stands at i times this; all of these fit.
    Tempus frameDuration{};
    /// Row by row: `values[frame * channels.size() + channel]`, every one finite.
    std::vector<double> values;

    double value(std::size_t frame, std::size_t channel) const {
        return values[frame * channels.size() + channel];
    }
    Tempus timeOfFrame(std::size_t frame) const {
        Tempus time = frameDuration;
        time.value *= static_cast<int64_t>(frame);
        return time;
    }
};

/// How deep joints may stand in each other, and how long the name of one may be.
inline constexpr std::size_t kMotionDeepestJoint = 1'000;
inline constexpr std::size_t kMotionLongestName = 255;
/// Reads a motion capture file (BVH): HIERARCHY, then MOTION. Throws `InputError` for a file that can't be
/// opened or is unsound anywhere; nothing is guessed, but these common departures are taken: a byte-order
/// mark, carriage returns, tabs and blank lines, keywords in any case, braces on any line, names with spaces,
/// several roots, a plus sign before a number.
///
/// A frame is one line. The last line must end with a line end: without it nobody can tell whether the last
/// number was cut off. Memory is at most the file, eight bytes for each number and some hundred for each
/// joint.
Motion readMotionFile(std::string const& file, ReadingProgress const& progress = {});

/// The same for the content of a file; `file` is only its name.
Motion readMotionText(std::string_view text, std::string const& file, ReadingProgress const& progress = {});

} // namespace lumenkey::tools
