#include "tools/import/MotionChannels.h"

#include <map>
#include <numbers>
#include <unordered_map>
#include <utility>

namespace lumenkey::tools {

MotionChannels::MotionChannels(Motion const& motion) : _motion(motion), _names(motion.joints.size()) {
    // A path is the number of its parent's path and a name: no path is ever spelled out, which would cost the
    // square of the depth.
    std::map<std::pair<std::size_t, std::string_view>, std::size_t> numberOfPath;
    std::vector<std::uint32_t> jointsWithPath;
    std::vector<std::size_t> pathOfJoint(motion.joints.size());
    std::unordered_map<std::string_view, std::uint32_t> jointsWithName;
    for (std::size_t i = 0; i < motion.joints.size(); ++i) {
        MotionJoint const& joint = motion.joints[i];
        bool const isRoot = joint.parent == MotionJoint::kNoParent;
        std::size_t const parentPath = isRoot ? MotionJoint::kNoParent : pathOfJoint[joint.parent];
        auto const [place, isNew] = numberOfPath.try_emplace({parentPath, joint.name}, numberOfPath.size());
        if (isNew) {
            jointsWithPath.push_back(0);
        }
        pathOfJoint[i] = place->second;
        _names[i].ordinal = ++jointsWithPath[place->second];
        ++jointsWithName[joint.name];
    }
    for (std::size_t i = 0; i < motion.joints.size(); ++i) {
        _names[i].repeats = jointsWithName[motion.joints[i].name] > 1;
    }
}

std::string MotionChannels::path(std::size_t joint) const {
    std::vector<std::size_t> fromJoint;
    for (; joint != MotionJoint::kNoParent; joint = _motion.joints[joint].parent) {
        fromJoint.push_back(joint);
    }
    std::string text;
    for (auto place = fromJoint.rbegin(); place != fromJoint.rend(); ++place) {
        text += text.empty() ? "" : "/";
        text += _motion.joints[*place].name;
    }
    return text;
}

std::string MotionChannels::name(std::size_t channel) const {
    std::size_t const joint = _motion.channels[channel].joint;
    std::string text = _names[joint].repeats ? path(joint) : _motion.joints[joint].name;
    if (_names[joint].ordinal > 1) {
        text += "#" + std::to_string(_names[joint].ordinal);
    }
    text += ".";
    text += motionChannelKindName(_motion.channels[channel].kind);
    return text;
}

bool MotionChannels::isCalled(std::size_t joint, std::string_view name) const {
    if (_names[joint].ordinal > 1) {
        std::string const suffix = "#" + std::to_string(_names[joint].ordinal);
        if (!name.ends_with(suffix)) {
            return false;
        }
        name.remove_suffix(suffix.size());
    }
    if (!_names[joint].repeats && name == _motion.joints[joint].name) {
        return true;
    }
    // From the joint up to its root, taking names off the end of the text.
    for (;;) {
        std::string_view const step = _motion.joints[joint].name;
        if (!name.ends_with(step)) {
            return false;
        }
        name.remove_suffix(step.size());
        joint = _motion.joints[joint].parent;
        if (joint == MotionJoint::kNoParent) {
            return name.empty();
        }
        if (!name.ends_with('/')) {
            return false;
        }
        name.remove_suffix(1);
    }
}

std::optional<std::size_t> MotionChannels::find(std::string_view name) const {
    std::size_t const dot = name.rfind('.');
    if (dot == std::string_view::npos) {
        return std::nullopt;
    }
    std::string_view const kind = name.substr(dot + 1);
    for (std::size_t i = 0; i < _motion.channels.size(); ++i) {
        MotionChannel const& channel = _motion.channels[i];
        if (motionChannelKindName(channel.kind) == kind && isCalled(channel.joint, name.substr(0, dot))) {
            return i;
        }
    }
    return std::nullopt;
}

std::string_view MotionChannels::unit(std::size_t channel) const {
    return isRotation(_motion.channels[channel].kind) ? "rad" : "units";
}

double MotionChannels::value(std::size_t frame, std::size_t channel) const {
    double const stored = _motion.value(frame, channel);
    return isRotation(_motion.channels[channel].kind) ? stored * (std::numbers::pi / 180) : stored;
}

std::unique_ptr<ChannelSpline> MotionChannels::makeSpline(std::size_t channel) const {
    std::size_t const count = _motion.frameCount;
    if (_times.size() != count) {
        _times.reserve(count);
        for (std::size_t i = 0; i < count; ++i) {
            _times.push_back(_motion.timeOfFrame(i));
        }
    }
    std::vector<double> values(count);
    for (std::size_t i = 0; i < count; ++i) {
        values[i] = value(i, channel);
    }
    auto made = std::make_unique<ChannelSpline>();
    made->state.interpolation = kKFInterpolationLinear;
    if (count != 0) {
        made->spline.reserveMemoryForKeypoints(static_cast<int>(count));
        made->spline.appendVertexesNoTangents(static_cast<unsigned>(count), _times.data(), values.data(),
                                              kTempusZero);
    }
    return made;
}

} // namespace lumenkey::tools
