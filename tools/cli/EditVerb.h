#pragma once

#include "tools/cli/TimeArgument.h"
#include "tools/cli/Verbs.h"
#include "tools/edit/KeypointStretch.h"
#include "tools/import/ChannelFile.h"

#include <memory>
#include <optional>
#include <string>

namespace lumenkey::tools {

/// What a verb that writes says of itself.
struct EditWords {
    std::string name;
    std::string description;
    /// Its own options in the usage.
    std::string usage;
    /// Its own part of what stands at the end of the help, and the example there.
    std::string notes;
    std::string example;
    /// Curves should stay as they are, so that any difference is an error.
    bool keepsShape = false;

    std::string difference() const { return keepsShape ? "worst error" : "largest change"; }
};

/// A verb that changes the curves of some channels in a stretch of time and writes the file anew. What is its
/// own is told here; all else stands once, in `declareEdit`.
class EditVerb {
public:
    EditVerb() = default;
    virtual ~EditVerb() = default;
    EditVerb(EditVerb const&) = delete;
    EditVerb& operator=(EditVerb const&) = delete;

    virtual EditWords words() const = 0;
    virtual void addOptions(CLI::App&) {}

    /// Reads the texts of its options, before any file is read. Throws `UsageError`, as does the next.
    virtual void readOptions() {}
    /// Once the file is open and the stretch known.
    virtual void prepare(ChannelFile const&, TimeSpan const&) {}
    /// For a channel with keypoints; the span is that part of the stretch in which they lie.
    virtual void apply(KFChannel& channel, TimeSpan const& span) = 0;

    /// The step at which it samples curves, to give them keypoints that draw them anew; nothing where it
    /// changes the keypoints that there are.
    virtual std::optional<Tempus> sampleStep() const { return std::nullopt; }
    /// Where the stretch comes to.
    virtual TimeSpan arrivalOf(TimeSpan const& span) const { return span; }
};

/// In steps of this length before and after are compared: ten in a frame, or in a sample step where that is
/// shorter.
Tempus comparedStep(ChannelFile const& file, TimeSpan const& span, std::optional<Tempus> const& sampleStep);

Verb declareEdit(CLI::App& program, std::shared_ptr<EditVerb> const& verb);

/// The option `--step` of a verb that samples.
class StepOption {
public:
    void add(CLI::App& verb, std::string const& help);
    /// Throws `UsageError`, as does the next.
    void read();
    /// As given, else a frame of the file.
    void prepare(ChannelFile const& file, TimeSpan const& span);

    Tempus const& step() const { return _step; }

private:
    std::string _text;
    std::optional<TimeArgument> _wanted;
    Tempus _step{};
};

} // namespace lumenkey::tools
