#pragma once

#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/Channels/KFVectorChannels.h"
#include "tools/import/MotionFile.h"
#include "tools/tree/ChannelTree.h"

#include <memory>
#include <string>
#include <vector>

namespace lumenkey::tools {

/// While it lives, a tree that was made from a motion has its skeleton too (`MotionTree.h`).
class SkeletonChannels {
public:
    SkeletonChannels(Motion const& motion, ChannelTree const& tree);
    ~SkeletonChannels();
    SkeletonChannels(SkeletonChannels const&) = delete;
    SkeletonChannels& operator=(SkeletonChannels const&) = delete;

private:
    void addOffset(KFChannelFolder& joint, std::array<double, 3> const& offset);

    /// Ends of limbs, then the offsets in them and in joints.
    std::vector<std::unique_ptr<KFChannelFolder>> _ends;
    std::vector<std::unique_ptr<KFChannel3D>> _offsets;
    std::unique_ptr<KFChannelDouble> _frameTime;
};

/// The skeleton that a document holds, without frames, and the value channel of each of its columns.
struct DocumentSkeleton {
    Motion motion;
    std::vector<ChannelTree::Node> columns;
    /// Why the document can't be a motion; empty where it can.
    std::string fault;
};

/// A folder is a joint; where it has no `Offset` it stands in its parent's origin. Value channels in it must
/// have the names of a motion's: positions, and rotations in radians.
DocumentSkeleton skeletonOf(ChannelTree const& tree, Tempus const& frameDuration);

} // namespace lumenkey::tools
