#pragma once

#include "tools/import/MotionFile.h"
#include "tools/tree/ChannelTree.h"

#include <memory>

namespace lumenkey::tools {

/// A folder for each joint, with its channels first and then its child joints, each in the order of the file.
/// Positions are `KFChannelDouble`, rotations `KFChannelAngle` in radians, with a linear keypoint for each frame.
std::unique_ptr<ChannelTree> treeOfMotion(Motion const& motion);

} // namespace lumenkey::tools
