#pragma once

#include "tools/cli/ChannelInput.h"
#include "tools/cli/OutputOptions.h"

#include <string>

namespace lumenkey::tools {

/// What the verbs are told that change single channels of a file: it, and where to put it.
struct AuthorOptions {
    InputOptions input;
    /// Without one, the file itself.
    OutputOptions output;

    /// Declares FILE.
    void add(CLI::App& verb);
    /// Declares `-o`, `--in-place`, `--force` and `--frame-rate`; to be called behind the verb's arguments.
    void addRest(CLI::App& verb);

    /// Before the file is read. Throws `UsageError` for an output that can't be written.
    void check() const;
    /// The file as a document: only those hold channels of any class. Another file is made one where one is
    /// written; else throws `UsageError`.
    ChannelInput openAsDocument() const;
    /// Throws `OutputError`, or `UsageError` for an output that can't be written from this input.
    void write(ChannelInput const& input) const;
};

/// The value of a channel without keypoints. Throws `UsageError` where the channel doesn't take it.
void setConstant(KFChannel& channel, double value, std::string const& name);
/// Why a channel doesn't take a value.
std::string limitsText(KFChannel const& channel, double value);

} // namespace lumenkey::tools
