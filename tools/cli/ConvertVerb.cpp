#include "tools/cli/Verbs.h"

#include "tools/cli/ChannelInput.h"
#include "tools/cli/OutputOptions.h"
#include "tools/cli/Progress.h"
#include "tools/export/ChannelFileWriter.h"

#include <CLI/CLI.hpp>
#include <memory>

namespace lumenkey::tools {

namespace {

struct ConvertOptions {
    InputOptions input;
    std::string output;
    bool force = false;
};

void runConvert(ConvertOptions const& options) {
    requireOutputFormat(options.output, channelFormatNamed(options.input.file));
    ChannelInput const input(options.input);
    ChannelFormat const format = requireOutputFormat(options.output, input.file().format);
    Progress bar("writing");
    writeChannelFile({input.file(), format, RowsOf::Input, {}, options.output, options.force}, bar.teller());
}

} // namespace

Verb declareConvert(CLI::App& program) {
    auto const options = std::make_shared<ConvertOptions>();
    CLI::App* const verb = program.add_subcommand("convert", "Write a file in another format");
    verb->add_option("IN", options->input.file, kFileHelp)->option_text(" ")->required();
    verb->add_option("OUT", options->output, "What to write, as its ending says: .lumen, .csv or .bvh")
        ->option_text(" ")
        ->required();
    options->input.addFrameRate(*verb);
    addForceOption(*verb, options->force);
    verb->footer(
        "A document holds everything, the skeleton of a BVH too, which comes back from it with the same "
        "numbers.\nA CSV has the keypoints; a document has a BVH in it where its folders are joints and "
        "its channels positions and rotations.\n\n"
        "Example: lumenkey convert walk.bvh walk.lumen");
    return {verb, "IN OUT [--frame-rate R] [--force]", [options](OutputSink&) { runConvert(*options); }};
}

} // namespace lumenkey::tools
