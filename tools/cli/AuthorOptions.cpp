#include "tools/cli/AuthorOptions.h"

#include "tools/cli/Progress.h"
#include "tools/cli/UsageError.h"
#include "tools/export/ChannelFileWriter.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>

namespace lumenkey::tools {

void AuthorOptions::add(CLI::App& verb) {
    verb.add_option("FILE", input.file, kFileHelp)->option_text(" ")->required();
}

void AuthorOptions::addRest(CLI::App& verb) {
    auto* const out =
        verb.add_option("-o,--output", output.output, "Leave FILE as it is and write OUT.lumen, .csv or .bvh")
            ->option_text("OUT");
    verb.add_flag("--in-place", output.inPlace, "Change FILE, as is done without -o")->excludes(out);
    addForceOption(verb, output.force);
    input.addFrameRate(verb);
}

void AuthorOptions::check() const {
    if (!output.output.empty()) {
        requireOutputFormat(output.output, channelFormatNamed(input.file));
    }
}

ChannelInput AuthorOptions::openAsDocument() const {
    ChannelInput opened(input);
    if (opened.file().format == ChannelFormat::Document) {
        return opened;
    }
    if (output.formatFor(opened.file().format) != ChannelFormat::Document) {
        throw UsageError{"'" + input.file + "' is no document: write one with -o OUT.lumen"};
    }
    return ChannelInput(asDocument(opened.file(), output.target(input.file)));
}

void AuthorOptions::write(ChannelInput const& opened) const {
    ChannelFormat const format = output.formatFor(opened.file().format);
    Progress bar("writing");
    writeChannelFile({opened.file(), format, RowsOf::Keypoints, {}, output.target(input.file), output.force},
                     bar.teller());
}

std::string limitsText(KFChannel const& channel, double value) {
    return "doesn't take " + shortestText(value) + ", but values from " + shortestText(channel.getMin()) +
           " to " + shortestText(channel.getMax());
}

void setConstant(KFChannel& channel, double value, std::string const& name) {
    storeConstant(channel, value);
    if (channel.getInitialValue() != value) {
        throw UsageError{"'" + name + "' " + limitsText(channel, value)};
    }
}

} // namespace lumenkey::tools
