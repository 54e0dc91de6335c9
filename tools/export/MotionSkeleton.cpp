#include "tools/export/MotionSkeleton.h"

#include "lumenkey/curves/KFCurve.h"
#include "tools/import/MotionTime.h"
#include "tools/import/MotionTree.h"
#include "tools/output/TextForms.h"
#include "tools/time/ExactDecimal.h"

#include <array>
#include <charconv>
#include <cmath>
#include <optional>

namespace lumenkey::tools {

namespace {

using Node = ChannelTree::Node;

std::optional<MotionChannelKind> kindNamed(std::string_view name) {
    for (MotionChannelKind const kind :
         {MotionChannelKind::Xposition, MotionChannelKind::Yposition, MotionChannelKind::Zposition,
          MotionChannelKind::Xrotation, MotionChannelKind::Yrotation, MotionChannelKind::Zrotation}) {
        if (sameWord(name, motionChannelKindName(kind))) {
            return kind;
        }
    }
    return std::nullopt;
}

/// A decimal, as short as can be, that is read as this duration and that other readers, which take it as it
/// stands, don't misread either: exact, or with at least seven decimals and within a millionth.
std::string frameTimeText(Tempus const& duration) {
    constexpr int mostDecimals = 17;
    constexpr int leastDecimals = 7;
    constexpr double nearness = 0.9e-6; // below a millionth however it is rounded
    double const seconds = TempusGetSeconds(duration);
    for (int decimals = 2; decimals <= mostDecimals; ++decimals) {
        std::array<char, 64> buffer{};
        auto const end = std::to_chars(buffer.data(), buffer.data() + buffer.size(), seconds,
                                       std::chars_format::fixed, decimals);
        std::string text(buffer.data(), end.ptr);
        double printed = 0;
        std::from_chars(text.data(), text.data() + text.size(), printed);
        bool const isNear = decimals >= leastDecimals && std::abs(printed - seconds) <= nearness * seconds;
        bool const isExact = ExactDecimal::parse(text)->toTempus() == duration;
        if ((isExact || isNear) && frameDurationFromText(text).duration == duration) {
            return text;
        }
    }
    return shortestText(seconds);
}

/// Walks the tree of a document in tree order, which is that of a motion's text.
class SkeletonReader {
public:
    SkeletonReader(ChannelTree const& tree, Tempus const& frameDuration) : _tree(tree) {
        _skeleton.motion.frameDuration = frameDuration;
        _skeleton.motion.frameTimeText = frameTimeText(frameDuration);
    }

    DocumentSkeleton read() {
        Node const top = ChannelTree::kTop;
        for (Node child = top + 1; child < _tree.end(top) && isSound(); child = _tree.end(child)) {
            if (isFrameTime(_tree, child)) {
                continue;
            }
            if (_tree.asFolder(child) == nullptr || isOffset(child)) {
                refuse(child, "stands in no joint");
            } else {
                readJoint(child, MotionJoint::kNoParent);
            }
        }
        if (isSound() && _skeleton.motion.joints.empty()) {
            _skeleton.fault = "it has no folders, which would be the joints";
        }
        return std::move(_skeleton);
    }

private:
    bool isSound() const { return _skeleton.fault.empty(); }
    void refuse(Node node, std::string const& why) {
        _skeleton.fault = "'" + _tree.dottedName(node) + "' " + why;
    }

    bool isOffset(Node node) const { return tools::isOffset(_tree, node); }

    std::array<double, 3> offsetAt(Node node) const {
        auto const& offset = static_cast<KFChannel3D const&>(_tree.base(node));
        std::array<double, 3> values{};
        offset.getValue(kTempusZero, &values[0], &values[1], &values[2], 0);
        return values;
    }

    void readJoint(Node folder, std::size_t parent) {
        Motion& motion = _skeleton.motion;
        std::size_t const index = motion.joints.size();
        MotionJoint joint;
        joint.name = _tree.base(folder).getName().str();
        joint.parent = parent;
        joint.firstChannel = motion.channels.size();
        bool const isName = !joint.name.empty() && joint.name.size() <= kMotionLongestName &&
                            joint.name.find_first_of("{}\n\r") == std::string::npos;
        if (!isName) {
            refuse(folder, "is no name for a joint");
            return;
        }
        motion.joints.push_back(std::move(joint));
        std::vector<Node> joints;
        for (Node child = folder + 1; child < _tree.end(folder) && isSound(); child = _tree.end(child)) {
            if (isOffset(child)) {
                motion.joints[index].offset = offsetAt(child);
            } else if (_tree.asFolder(child) == nullptr) {
                readChannel(child, index);
            } else if (_tree.base(child).getName().view() == kEndSiteName) {
                readEndSite(child, index);
            } else {
                joints.push_back(child);
            }
        }
        for (Node const child : joints) {
            if (isSound()) {
                readJoint(child, index);
            }
        }
    }

    void readChannel(Node node, std::size_t joint) {
        std::optional<MotionChannelKind> const kind = kindNamed(_tree.base(node).getName().view());
        if (!kind || !_tree.isChannel(node)) {
            refuse(node, "is no channel of a motion");
            return;
        }
        _skeleton.motion.channels.push_back({joint, *kind});
        ++_skeleton.motion.joints[joint].channelCount;
        _skeleton.columns.push_back(node);
    }

    void readEndSite(Node folder, std::size_t joint) {
        MotionEndSite site{joint, {}};
        for (Node child = folder + 1; child < _tree.end(folder); child = _tree.end(child)) {
            if (!isOffset(child)) {
                refuse(child, "stands in an end of a limb");
                return;
            }
            site.offset = offsetAt(child);
        }
        _skeleton.motion.endSites.push_back(site);
    }

    ChannelTree const& _tree;
    DocumentSkeleton _skeleton;
};

} // namespace

SkeletonChannels::SkeletonChannels(Motion const& motion, ChannelTree const& tree) {
    // The folders of a motion's tree are its joints, in their order.
    std::vector<KFChannelFolder*> joints;
    for (Node node = ChannelTree::kTop + 1; node < tree.count(); ++node) {
        if (KFChannelFolder* const folder = tree.asFolder(node)) {
            joints.push_back(folder);
        }
    }
    for (std::size_t i = 0; i < motion.joints.size(); ++i) {
        addOffset(*joints[i], motion.joints[i].offset);
    }
    for (MotionEndSite const& site : motion.endSites) {
        KFChannelFolder& joint = *joints[site.joint];
        _ends.push_back(std::make_unique<KFChannelFolder>(kEndSiteName, &joint, freeIDBelow(joint), 0, 0));
        addOffset(*_ends.back(), site.offset);
    }
    KFChannelFolder& top = *tree.asFolder(ChannelTree::kTop);
    _frameTime = std::make_unique<KFChannelDouble>(kFrameTimeName, &top, freeIDBelow(top), 0);
    storeConstant(*_frameTime, TempusGetSeconds(motion.frameDuration));
}

void SkeletonChannels::addOffset(KFChannelFolder& joint, std::array<double, 3> const& offset) {
    _offsets.push_back(std::make_unique<KFChannel3D>(kOffsetName, &joint, freeIDBelow(joint), 0));
    KFChannel3D& added = *_offsets.back();
    storeConstant(added.x, offset[0]);
    storeConstant(added.y, offset[1]);
    storeConstant(added.z, offset[2]);
}

SkeletonChannels::~SkeletonChannels() {
    for (std::unique_ptr<KFChannel3D> const& offset : _offsets) {
        offset->getParent()->removeDescendant(offset.get());
    }
    for (std::unique_ptr<KFChannelFolder> const& end : _ends) {
        end->getParent()->removeDescendant(end.get());
    }
    _frameTime->getParent()->removeDescendant(_frameTime.get());
}

DocumentSkeleton skeletonOf(ChannelTree const& tree, Tempus const& frameDuration) {
    return SkeletonReader(tree, frameDuration).read();
}

} // namespace lumenkey::tools
