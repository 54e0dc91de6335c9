#pragma once

#include "tools/import/MotionFile.h"
#include "tools/tree/ChannelTree.h"

#include <memory>
#include <numbers>
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

} // namespace lumenkey::tools
