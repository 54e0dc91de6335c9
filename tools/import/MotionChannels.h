#pragma once

#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineState.h"
#include "tools/import/MotionFile.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// A spline with the settings it needs by its side.
struct ChannelSpline {
    KFSplineState state;
    KFSpline spline{&state};
};

/// The channels of a motion by name and as splines. Only what is asked for is made.
///
/// A channel is called `Joint.Xrotation`. Where several joints have one name, the path of joint names from
/// the root tells them apart: `Hips/LeftLeg.Xrotation`; of joints that share even that, all after the first
/// are numbered: `Hips/Leg#2.Xrotation`.
class MotionChannels {
public:
    /// Keeps a reference to the motion.
    explicit MotionChannels(Motion const& motion);

    std::size_t count() const { return _motion.channels.size(); }
    std::string name(std::size_t channel) const;
    /// By its name, or by the path where the joint's name alone would do. Case matters.
    std::optional<std::size_t> find(std::string_view name) const;

    /// `rad` or `units`.
    std::string_view unit(std::size_t channel) const;
    /// What the spline has at a frame: radians for a rotation, positions as they stand.
    double value(std::size_t frame, std::size_t channel) const;

    /// One linear keypoint for each frame.
    std::unique_ptr<ChannelSpline> makeSpline(std::size_t channel) const;

private:
    struct JointName {
        /// Another joint has the name too.
        bool repeats = false;
        /// Which of the joints with the same path it is, from 1.
        std::uint32_t ordinal = 1;
    };

    std::string path(std::size_t joint) const;
    bool isCalled(std::size_t joint, std::string_view name) const;

    Motion const& _motion;
    std::vector<JointName> _names;
    /// Of all frames, made when the first spline needs them.
    mutable std::vector<Tempus> _times;
};

} // namespace lumenkey::tools
