#pragma once

#include "lumenkey/Channels/KFChannelBase.h"

#include <memory>
#include <string>
#include <string_view>
#include <vector>

class KFFactory;

namespace lumenkey::tools {

/// The library's name of the class that a factory stands for, such as `KFChannelDouble`.
std::string classNameOf(KFFactory const& factory);
/// The same for a channel: that of its factory, or of its own class where it has none.
std::string classNameOf(KFChannelBase const& channel);

/// A class's name as people write it: `Double` for `KFChannelDouble`, `ObjectRoot` for
/// `KFChannelObjectRootBase`.
std::string shortClassName(std::string_view className);

/// The registered factory of a class by its short or long name, regardless of case; null for none.
KFFactory* factoryOfClass(std::string_view name);

/// The short names of the classes of which documents hold channels.
std::vector<std::string> storedClassNames();

/// A new channel of a class, to ask it what the class is like; null for a class that makes none, and for
/// null.
std::unique_ptr<KFChannelBase> exampleOf(KFFactory* factory);

/// `rad` for angles, else `units`.
std::string_view unitOf(KFChannelBase const& channel);

} // namespace lumenkey::tools
