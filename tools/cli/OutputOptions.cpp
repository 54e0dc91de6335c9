#include "tools/cli/OutputOptions.h"

#include "tools/cli/UsageError.h"

#include <CLI/CLI.hpp>

namespace lumenkey::tools {

void OutputOptions::add(CLI::App& verb) {
    auto* const out =
        verb.add_option("-o,--output", output,
                        "The whole file anew: OUT.lumen, OUT.csv, or OUT.bvh where FILE is a BVH or a "
                        "document made from one")
            ->option_text("OUT");
    verb.add_flag("--in-place", inPlace, "The same, in the place of FILE")->excludes(out);
    addForceOption(verb, force);
}

void addForceOption(CLI::App& verb, bool& force) {
    verb.add_flag("--force", force,
                  "Write a document anew also without what lumenkey check says is passed over in it, and a "
                  "table also without the keypoints that it can't hold");
}

std::optional<ChannelFormat> OutputOptions::check(std::string const& file) const {
    if (output.empty() && !inPlace) {
        throw UsageError{"say where to write: -o OUT, or --in-place"};
    }
    std::optional<ChannelFormat> const input = channelFormatNamed(file);
    return output.empty() ? input : requireOutputFormat(output, input);
}

ChannelFormat OutputOptions::formatFor(ChannelFormat input) const {
    return output.empty() ? input : requireOutputFormat(output, input);
}

ChannelFormat requireOutputFormat(std::string const& output, std::optional<ChannelFormat> input) {
    std::optional<ChannelFormat> const format = channelFormatNamed(output);
    if (!format) {
        throw UsageError{"'" + output + "' must end in .lumen, .csv or .bvh, which tells what to write"};
    }
    if (format == ChannelFormat::Motion && input == ChannelFormat::Csv) {
        throw UsageError{"'" + output + "' can't be a BVH: a table (CSV) has no skeleton"};
    }
    return *format;
}

} // namespace lumenkey::tools
