#include "tools/cli/Verbs.h"

#include "tools/cli/ChannelInput.h"
#include "tools/cli/OutputOptions.h"
#include "tools/cli/Progress.h"
#include "tools/cli/SeveralFiles.h"
#include "tools/cli/UsageError.h"
#include "tools/export/ChannelFileWriter.h"
#include "tools/export/DocumentWriter.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <memory>
#include <utility>

namespace lumenkey::tools {

namespace {

struct UpgradeOptions {
    std::vector<std::string> files;
    std::string frameRate;
    OutputOptions output;
};

/// With what the document says, where it is read as something else.
std::string versionOf(DocumentFile const& document) {
    std::string version = document.versionText();
    std::string const written = printableText(document.writtenVersion.view());
    if (written == version) {
        return version;
    }
    return (written.empty() ? "none" : "'" + written + "'") + ", read as " + version + ",";
}

int upgrade(std::string const& file, UpgradeOptions const& options, OutputSink& out) {
    ChannelInput const input(InputOptions{file, options.frameRate});
    if (input.file().format != ChannelFormat::Document) {
        throw InputError{file, 1, 1, "this is no document"};
    }
    DocumentFile const& document = input.file().document;
    std::string const current = std::to_string(kWrittenMajor) + "." + std::to_string(kWrittenMinor);
    if (std::pair(document.major, document.minor) > std::pair(kWrittenMajor, kWrittenMinor)) {
        throw InputError{file, 1, 1,
                         "version " + document.versionText() + " is newer than " + current +
                             ", the newest that is written here"};
    }
    std::string const version = versionOf(document);
    std::string const& target = options.output.target(file);
    if (version == current && options.output.output.empty()) {
        out.write(printableText(file) + ": version " + current + " already\n");
        return kExitDone;
    }
    Progress bar("writing");
    writeChannelFile(
        {input.file(), ChannelFormat::Document, RowsOf::Keypoints, {}, target, options.output.force},
        bar.teller());
    out.write(printableText(target) + ": from version " + version + " to " + current + "\n");
    return kExitDone;
}

int runUpgrade(UpgradeOptions const& options, OutputSink& out) {
    if (std::string const& output = options.output.output; !output.empty()) {
        if (options.files.size() != 1) {
            throw UsageError{"-o is for one FILE"};
        }
        if (requireOutputFormat(output, ChannelFormat::Document) != ChannelFormat::Document) {
            throw UsageError{"'" + output + "' must end in .lumen"};
        }
    }
    return forSeveralFiles(options.files, out, [&options](std::string const& file, OutputSink& text) {
        return upgrade(file, options, text);
    });
}

} // namespace

Verb declareUpgrade(CLI::App& program) {
    auto const options = std::make_shared<UpgradeOptions>();
    CLI::App* const verb = program.add_subcommand("upgrade", "Write old documents anew, in today's version");
    verb->add_option("FILE", options->files, "Documents of any version")->option_text("...")->required();
    auto* const output =
        verb->add_option("-o,--output", options->output.output, "Leave FILE as it is and write OUT.lumen")
            ->option_text("OUT");
    verb->add_flag("--in-place", options->output.inPlace, "Replace FILE, as is done without -o")
        ->excludes(output);
    addForceOption(*verb, options->output.force);
    verb->add_option(
            "--frame-rate", options->frameRate,
            "Frames a second of documents that count frames, those of version 4 and before (else 30)")
        ->option_text("R");
    verb->footer("Each is replaced as a whole or not at all; one of today's version stays as it is.\n\n"
                 "Example: lumenkey upgrade old.lumen --frame-rate 24");
    Verb declared{verb, "FILE... [-o OUT | --in-place] [--force] [--frame-rate R]", {}};
    declared.runForExit = [options](OutputSink& out) { return runUpgrade(*options, out); };
    return declared;
}

} // namespace lumenkey::tools
