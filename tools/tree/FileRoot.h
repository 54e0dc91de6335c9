#pragma once

#include "lumenkey/Channels/KFChannelObjectRootBase.h"

#include <string>

namespace lumenkey::tools {

/// The object that a file is, with frames as long as those of the file.
class FileRoot : public KFChannelObjectRootBase {
public:
    /// With an invalid duration it answers the library's default.
    FileRoot(BXString const& name, unsigned int id, Tempus const& frameDuration)
        : KFChannelObjectRootBase(name, nullptr, id, 0, 0), _frameDuration(frameDuration) {}

    Tempus getFrameDuration() const override {
        return TempusIsNumeric(_frameDuration) ? _frameDuration : KFChannelObjectRootBase::getFrameDuration();
    }

private:
    Tempus _frameDuration;
};

} // namespace lumenkey::tools
