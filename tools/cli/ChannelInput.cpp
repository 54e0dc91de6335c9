#include "tools/cli/ChannelInput.h"

#include "tools/cli/NearMatch.h"
#include "tools/cli/Progress.h"
#include "tools/cli/TimeArgument.h"
#include "tools/cli/UsageError.h"
#include "tools/output/StandardOutput.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <unistd.h>

namespace lumenkey::tools {

namespace {

/// Names that are longer aren't compared with what may have been meant.
constexpr std::size_t kLongestNearName = 300;

ChannelFile openWithProgress(InputOptions const& options) {
    std::optional<Tempus> frameDuration;
    if (!options.frameRate.empty()) {
        frameDuration = stepOfRate(options.frameRate);
    }
    Progress bar("reading");
    ChannelFile opened = openChannelFile(options.file, bar.teller(), frameDuration);
    if (frameDuration && opened.format != ChannelFormat::Document && !options.isRateForDocumentsAlone) {
        throw UsageError{"--frame-rate is for documents: '" + options.file + "' has a rate of its own"};
    }
    return opened;
}

} // namespace

void InputOptions::add(CLI::App& verb) {
    verb.add_option("FILE", file, kFileHelp)->option_text(" ")->required();
    addFrameRate(verb);
}

void InputOptions::addFrameRate(CLI::App& verb) { addFrameRateOption(verb, frameRate); }

void addFrameRateOption(CLI::App& verb, std::string& rate) {
    verb.add_option(
            "--frame-rate", rate,
            "Of a document: frames a second, where times are given in frames (else as it says "
            "itself, or as its keypoints stand), or where it is an old one that counts frames (else 30)")
        ->option_text("R");
}

ChannelInput::ChannelInput(InputOptions const& options) : _file(openWithProgress(options)) {}

void ChannelInput::failForName(std::string const& text) const {
    // As much of each name is compared as the text has of its own.
    auto const parts = static_cast<std::size_t>(std::count(text.begin(), text.end(), '.')) + 1;
    NearMatch match(text);
    if (tree().isChannel(ChannelTree::kTop)) {
        match.offer(tree().dottedName(ChannelTree::kTop));
    }
    for (ChannelTree::Node node = ChannelTree::kTop + 1; node < tree().count() && match.wantsMore(); ++node) {
        match.offer(tree().trailingName(node, parts, kLongestNearName));
    }
    std::string const meant = match.best().empty() ? "" : "; did you mean '" + match.best() + "'?";
    throw UsageError{"there is no channel '" + text + "' in " + _file.file + meant};
}

ChannelTree::Node ChannelInput::nodeNamed(std::string const& text) const {
    ChannelTree::Match const match = tree().find(text);
    if (!match.first) {
        failForName(text);
    }
    if (match.second) {
        std::string const warning = "lumenkey: warning: '" + text + "' names " + tree().path(*match.first) +
                                    ", which is taken, and also " + tree().path(*match.second);
        writeFully(STDERR_FILENO, printableText(warning) + "\n");
    }
    return *match.first;
}

ChannelTree::Node ChannelInput::channelNamed(std::string const& text) const {
    ChannelTree::Node const node = nodeNamed(text);
    if (!tree().isChannel(node)) {
        throw UsageError{"'" + text + "' is a folder: name one channel"};
    }
    return node;
}

std::vector<ChannelTree::Node> ChannelInput::channelsNamed(std::vector<std::string> const& texts) const {
    if (texts.empty()) {
        std::vector<ChannelTree::Node> all = tree().channelsBelow(ChannelTree::kTop);
        if (all.empty()) {
            throw UsageError{"there are no channels in " + _file.file};
        }
        return all;
    }
    std::vector<ChannelTree::Node> channels;
    for (std::string const& text : texts) {
        std::vector<ChannelTree::Node> const below = tree().channelsBelow(nodeNamed(text));
        if (below.empty()) {
            throw UsageError{"there are no channels below '" + text + "' in " + _file.file};
        }
        channels.insert(channels.end(), below.begin(), below.end());
    }
    return channels;
}

} // namespace lumenkey::tools
