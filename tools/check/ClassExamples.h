#pragma once

#include "lumenkey/Channels/KFChannelBase.h"
#include "lumenkey/Channels/KFFactory.h"

#include <cstdint>
#include <map>
#include <memory>
#include <optional>

namespace lumenkey::tools {

/// Which elements channels of a class have, as the bits of `DocumentWord::classes`.
unsigned ownersOf(KFFactory& factory);

/// A channel of each class that was asked for, to learn what the class is like.
class ClassExamples {
public:
    /// It lives as long as this; null for a class that makes none, and for null.
    KFChannelBase* of(KFFactory* factory);
    /// The child with that ID which a class makes for itself; null for none.
    KFChannelBase* componentOf(KFFactory* factory, std::uint64_t id);
    /// The place of the child with that ID among those, behind which all others stand; nothing for a class that
    /// makes none.
    std::optional<std::size_t> placeOf(KFFactory* factory, std::uint64_t id);

private:
    std::map<KFFactory*, std::unique_ptr<KFChannelBase>> _examples;
};

} // namespace lumenkey::tools
