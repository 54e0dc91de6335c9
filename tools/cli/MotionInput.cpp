#include "tools/cli/MotionInput.h"

#include "tools/cli/NearMatch.h"
#include "tools/cli/Progress.h"
#include "tools/cli/UsageError.h"

namespace lumenkey::tools {

namespace {

Motion readWithProgress(std::string const& file) {
    Progress bar("reading");
    return readMotionFile(file, [&bar](double share) { bar.update(share); });
}

} // namespace

MotionInput::MotionInput(std::string const& file) : _motion(readWithProgress(file)), _channels(_motion) {}

std::size_t MotionInput::channelNamed(std::string const& name) const {
    if (std::optional<std::size_t> const channel = _channels.find(name)) {
        return *channel;
    }
    NearMatch match(name);
    for (std::size_t i = 0; i < _channels.count() && match.wantsMore(); ++i) {
        match.offer(_channels.name(i));
    }
    std::string const meant = match.best().empty() ? "" : "; did you mean '" + match.best() + "'?";
    throw UsageError{"there is no channel '" + name + "' in " + _motion.file + meant};
}

std::vector<std::size_t> MotionInput::channelsNamed(std::vector<std::string> const& names) const {
    std::vector<std::size_t> channels;
    for (std::string const& name : names) {
        channels.push_back(channelNamed(name));
    }
    return channels;
}

Tempus MotionInput::lastKeypoint() const {
    return _motion.frameCount == 0 ? kTempusZero : _motion.timeOfFrame(_motion.frameCount - 1);
}

Tempus MotionInput::duration() const { return _motion.timeOfFrame(_motion.frameCount); }

} // namespace lumenkey::tools
