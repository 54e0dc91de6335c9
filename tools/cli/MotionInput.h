#pragma once

#include "tools/import/MotionChannels.h"
#include "tools/import/MotionFile.h"

#include <cstddef>
#include <string>
#include <vector>

namespace lumenkey::tools {

/// The motion that a verb works on, read with a progress bar.
class MotionInput {
public:
    /// Throws `InputError`.
    explicit MotionInput(std::string const& file);
    MotionInput(MotionInput const&) = delete;
    MotionInput& operator=(MotionInput const&) = delete;

    Motion const& motion() const { return _motion; }
    MotionChannels const& channels() const { return _channels; }

    /// Throws `UsageError`, with the name that was perhaps meant.
    std::size_t channelNamed(std::string const& name) const;
    std::vector<std::size_t> channelsNamed(std::vector<std::string> const& names) const;

    /// The time of the last keypoint; zero without frames.
    Tempus lastKeypoint() const;
    /// All frames, the last one to its end.
    Tempus duration() const;

private:
    Motion _motion;
    MotionChannels _channels;
};

} // namespace lumenkey::tools
