#include "tools/import/MotionTree.h"

#include "lumenkey/Channels/KFVectorChannels.h"
#include "tools/import/MotionTime.h"

#include <algorithm>
#include <array>
#include <filesystem>
#include <utility>

namespace lumenkey::tools {

namespace {

/// So many neighbouring columns are gathered at once: a row of them is a line of the processor's cache.
constexpr std::size_t kColumnsAtOnce = 8;

/// Adds the joints and gives the nodes of all channels, in the order of the columns.
std::vector<ChannelTree::Node> addJoints(Motion const& motion, ChannelTree& tree) {
    std::vector<ChannelTree::Node> folders;
    std::vector<ChannelTree::Node> channels(motion.channels.size());
    for (MotionJoint const& joint : motion.joints) {
        bool const isRoot = joint.parent == MotionJoint::kNoParent;
        folders.push_back(tree.addFolder(isRoot ? ChannelTree::kTop : folders[joint.parent], joint.name));
        for (std::size_t i = joint.firstChannel; i < joint.firstChannel + joint.channelCount; ++i) {
            MotionChannelKind const kind = motion.channels[i].kind;
            channels[i] = tree.addChannel(folders.back(), std::string(motionChannelKindName(kind)),
                                          isRotation(kind) ? ValueType::Angle : ValueType::Double);
        }
    }
    return channels;
}

std::vector<Tempus> timesOfFrames(Motion const& motion) {
    std::vector<Tempus> times;
    times.reserve(motion.frameCount);
    for (std::size_t frame = 0; frame < motion.frameCount; ++frame) {
        times.push_back(motion.timeOfFrame(frame));
    }
    return times;
}

} // namespace

MotionTree treeOfMotion(Motion const& motion) {
    auto tree = std::make_unique<ChannelTree>(std::filesystem::path(motion.file).stem().string(),
                                              motion.frameDuration);
    std::vector<ChannelTree::Node> channels = addJoints(motion, *tree);
    std::vector<Tempus> const times = timesOfFrames(motion);
    std::array<std::vector<double>, kColumnsAtOnce> columns;
    for (std::size_t first = 0; first < channels.size(); first += kColumnsAtOnce) {
        std::size_t const width = std::min(kColumnsAtOnce, channels.size() - first);
        std::array<double, kColumnsAtOnce> scales{};
        for (std::size_t i = 0; i < width; ++i) {
            columns[i].resize(motion.frameCount);
            scales[i] = isRotation(motion.channels[first + i].kind) ? kRadiansOfDegree : 1;
        }
        for (std::size_t frame = 0; frame < motion.frameCount; ++frame) {
            for (std::size_t i = 0; i < width; ++i) {
                columns[i][frame] = motion.value(frame, first + i) * scales[i];
            }
        }
        for (std::size_t i = 0; i < width; ++i) {
            tree->setKeypoints(channels[first + i], times, columns[i]);
        }
    }
    tree->finish({kTempusZero, motion.timeOfFrame(motion.frameCount)});
    return {std::move(tree), std::move(channels)};
}

bool isOffset(ChannelTree const& tree, ChannelTree::Node node) {
    return tree.base(node).getName().view() == kOffsetName &&
           dynamic_cast<KFChannel3D*>(&tree.base(node)) != nullptr;
}

bool isFrameTime(ChannelTree const& tree, ChannelTree::Node node) {
    return tree.parent(node) == ChannelTree::kTop && tree.isChannel(node) &&
           tree.base(node).getName().view() == kFrameTimeName;
}

std::optional<Tempus> storedFrameDuration(ChannelTree const& tree) {
    bool hasOffset = false;
    Tempus duration = kTempusInvalid;
    for (ChannelTree::Node node = ChannelTree::kTop + 1; node < tree.count(); ++node) {
        hasOffset = hasOffset || isOffset(tree, node);
        if (isFrameTime(tree, node)) {
            duration = frameDurationFromSeconds(tree.channel(node).getInitialValue());
        }
    }
    return hasOffset && TempusIsNumeric(duration) ? std::optional(duration) : std::nullopt;
}

} // namespace lumenkey::tools
