#include "tools/cli/Verbs.h"

#include "lumenkey/foundation/BXHashWriteStream.h"
#include "tools/cli/ChannelInput.h"
#include "tools/cli/Progress.h"
#include "tools/cli/TimeArgument.h"

#include <CLI/CLI.hpp>
#include <array>
#include <memory>
#include <optional>

namespace lumenkey::tools {

namespace {

struct HashOptions {
    InputOptions input;
    std::string channel;
    std::string at;
};

std::string hexadecimal(std::array<std::uint8_t, 16> const& hash) {
    constexpr std::string_view digits = "0123456789abcdef";
    std::string text;
    for (std::uint8_t const byte : hash) {
        text += digits[byte >> 4];
        text += digits[byte & 0xF];
    }
    return text;
}

/// Of all that it is, or of what is seen at a time of the curves below.
std::array<std::uint8_t, 16> hashOf(KFChannelBase& channel, std::optional<TimeArgument> const& at,
                                    Tempus const& frameDuration) {
    Progress const bar("hashing");
    if (!at) {
        return channel.getHash();
    }
    BXHashWriteStream stream;
    channel.calcHashForState(stream, channel.localToGlobalTime(at->resolve(frameDuration)));
    return stream.getHash();
}

void runHash(HashOptions const& options, OutputSink& out) {
    std::optional<TimeArgument> const at = TimeArgument::parseIfGiven(options.at);
    ChannelInput const input(options.input);
    ChannelTree::Node const node =
        options.channel.empty() ? ChannelTree::kTop : input.nodeNamed(options.channel);
    KFChannelBase& channel = input.tree().base(node);
    out.write(hexadecimal(hashOf(channel, at, input.file().frameDuration)) + "\n");
}

} // namespace

Verb declareHash(CLI::App& program) {
    auto const options = std::make_shared<HashOptions>();
    CLI::App* const verb = program.add_subcommand("hash", "Tell states apart by a digest");
    verb->add_option("FILE", options->input.file, kFileHelp)->option_text(" ")->required();
    verb->add_option("CHANNEL", options->channel,
                     "A channel, or a folder with all in it (else all of the file)")
        ->option_text(" ");
    verb->add_option("--at", options->at, "Only of the values at that time")->option_text("T");
    options->input.addFrameRate(*verb);
    verb->footer(
        "32 hexadecimal digits, the same for the same names, IDs, values and keypoints, with times in the "
        "same terms\n(2/4 isn't 1/2 here); with --at for the same values, whatever the keypoints are. "
        "Defaults don't enter. It is no\nproof against forgery.\n\n"
        "Example: lumenkey hash ball.lumen Body --at 1/2");
    return {verb, "FILE [CHANNEL] [--at T] [--frame-rate R]",
            [options](OutputSink& out) { runHash(*options, out); }};
}

} // namespace lumenkey::tools
