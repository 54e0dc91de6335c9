#include "tools/check/ChannelCheck.h"

#include "lumenkey/Channels/KFChannelFolder.h"
#include "tools/check/ClassExamples.h"

namespace lumenkey::tools {

namespace {

/// Of one that lies in those that are open. Names of folders far above are left out.
std::string dottedName(OpenElement const& channel, std::vector<OpenElement> const& open) {
    constexpr std::size_t longest = 200;
    std::string name = nameOfChannel(channel, channel.attributeViews());
    for (std::size_t i = open.size() - 1; open[i - 1].name == "parameter"; --i) {
        std::string const above = nameOfChannel(open[i], open[i].attributeViews());
        if (name.size() + above.size() > longest) {
            return "..." + name;
        }
        name.insert(0, above + ".");
    }
    return name;
}

} // namespace

std::string nameOfChannel(OpenElement const& channel, Attributes const& attributes) {
    BXString const& made = channel.example->getName();
    return made.empty() ? std::string(attributeOf(attributes, "name")) : made.str();
}

void endChannel(OpenElement& channel, std::vector<OpenElement>& open, DocumentFindings& findings) {
    OpenElement& above = open.back();
    FlagsCheck const& flags = *channel.flags;
    bool const locks = flags.has(kChannelFlagIsObjectRoot) && flags.has(kChannelFlagLocked);
    findings.take(flags.faultsAtEnd());
    auto const* const folder = dynamic_cast<KFChannelFolder const*>(channel.example);
    bool const hasParts = folder != nullptr && folder->getNumberOfDescendants() > 0;
    findings.take(channel.folder.faultsAtEnd(locks, hasParts || !channel.children.empty()));
    if (flags.has(kChannelFlagNotSaved) && above.name == "parameter") {
        findings.lost(flags.placeOf(kChannelFlagNotSaved),
                      "documents leave out the channel '" + dottedName(channel, open) + "'");
    }
    if (flags.has(kChannelFlagHidden)) {
        return; // no lock from above reaches it
    }
    if (ownersOf(*channel.factory) == kOfValues && !flags.has(kChannelFlagLocked)) {
        above.folder.addUnlocked(flags.placeOf(kChannelFlagLocked));
    }
    above.folder.addUnlockedBelow(channel.folder);
}

} // namespace lumenkey::tools
