#pragma once

#include "tools/import/ChannelFile.h"

#include <string>
#include <utility>
#include <vector>

namespace CLI {
class App;
}

namespace lumenkey::tools {

/// What the help of verbs says of their input.
inline constexpr char const* kFileHelp =
    "A document (.lumen), a motion capture (BVH), or a table of values over time (CSV)";
inline constexpr char const* kChannelHelp = "Channels or folders: names with dots (Hips.Spine.Xrotation), "
                                            "the ends of such (Spine.Xrotation), or paths of "
                                            "IDs (./1/3). A folder stands for all channels below it";

/// What a verb is told about the file that it opens.
struct InputOptions {
    std::string file;
    std::string frameRate;
    /// Whether a file of another kind than a document passes over the rate.
    bool isRateForDocumentsAlone = false;

    /// Declares FILE and `--frame-rate`.
    void add(CLI::App& verb);
    /// Only the latter.
    void addFrameRate(CLI::App& verb);
};

void addFrameRateOption(CLI::App& verb, std::string& rate);

/// The file that a verb works on, opened as a tree of channels with a progress bar, and the channels that its
/// user names.
class ChannelInput {
public:
    /// Throws `InputError`, and `UsageError` for a rate that is none or that the file has no use for.
    explicit ChannelInput(InputOptions const& options);
    /// Of a file that is open.
    explicit ChannelInput(ChannelFile file) : _file(std::move(file)) {}

    ChannelFile const& file() const { return _file; }
    ChannelTree const& tree() const { return *_file.tree; }

    /// A value channel. Throws `UsageError`, with the name that was perhaps meant. Says on standard error if
    /// the text could name another one too.
    ChannelTree::Node channelNamed(std::string const& text) const;
    /// Likewise any node.
    ChannelTree::Node nodeNamed(std::string const& text) const;
    /// Likewise, for each text in turn, all value channels at the node or below it; all of the file for no
    /// text. Throws `UsageError` also where there are none.
    std::vector<ChannelTree::Node> channelsNamed(std::vector<std::string> const& texts) const;

private:
    [[noreturn]] void failForName(std::string const& text) const;

    ChannelFile _file;
};

} // namespace lumenkey::tools
