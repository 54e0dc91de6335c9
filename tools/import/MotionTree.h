#pragma once

#include "tools/import/MotionFile.h"
#include "tools/tree/ChannelTree.h"

#include <memory>
#include <numbers>
#include <optional>
#include <vector>

namespace lumenkey::tools {

/// A rotation in degrees times this is the value of its channel.
inline constexpr double kRadiansOfDegree = std::numbers::pi / 180;

struct MotionTree {
    std::unique_ptr<ChannelTree> tree;
    /// The value channel of each of the motion's, in the order of the columns.
    std::vector<ChannelTree::Node> columns;
};

/// A folder for each joint, with its channels first and then its child joints, each in the order of the file.
/// Positions are `KFChannelDouble`, rotations `KFChannelAngle` in radians, with a linear keypoint for each
/// frame.
MotionTree treeOfMotion(Motion const& motion);

// In a document, the skeleton of a motion capture stands beside its channels: in the folder of each joint a
// `KFChannel3D` called `Offset`, for each free end a folder called `End Site` with one of its own, and at the
// top a `KFChannelDouble` called `Frame Time`, the seconds that a frame lasts.

inline constexpr char const* kOffsetName = "Offset";
inline constexpr char const* kEndSiteName = "End Site";
inline constexpr char const* kFrameTimeName = "Frame Time";

bool isOffset(ChannelTree const& tree, ChannelTree::Node node);
bool isFrameTime(ChannelTree const& tree, ChannelTree::Node node);

/// What frames last in a document that holds a skeleton; nothing where it holds none, or doesn't say it.
std::optional<Tempus> storedFrameDuration(ChannelTree const& tree);

} // namespace lumenkey::tools
