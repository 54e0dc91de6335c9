#pragma once

#include "tools/import/ChannelFile.h"

#include <optional>
#include <string>

namespace CLI {
class App;
}

namespace lumenkey::tools {

/// Where a verb that changes a file puts it.
struct OutputOptions {
    std::string output;
    bool inPlace = false;
    bool force = false;

    /// Declares `-o`, `--in-place` and `--force`.
    void add(CLI::App& verb);
    /// Before the file is read: the format that the names tell, or nothing. Throws `UsageError` where none is
    /// asked for, or one that can't be written.
    std::optional<ChannelFormat> check(std::string const& file) const;
    /// Once the file is open, whose format is `input`. Throws `UsageError` where it can't be written.
    ChannelFormat formatFor(ChannelFormat input) const;
    /// What is written.
    std::string const& target(std::string const& file) const { return output.empty() ? file : output; }
};

void addForceOption(CLI::App& verb, bool& force);

/// What the name of an output asks for. Throws `UsageError` for what can't be written from this input; of an
/// unknown input it says nothing.
ChannelFormat requireOutputFormat(std::string const& output, std::optional<ChannelFormat> input);

} // namespace lumenkey::tools
