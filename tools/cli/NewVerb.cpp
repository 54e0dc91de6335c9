#include "tools/cli/Verbs.h"

#include "tools/cli/UsageError.h"
#include "tools/export/DocumentWriter.h"
#include "tools/import/ChannelFile.h"
#include "tools/output/SafeOutputFile.h"
#include "tools/tree/FileRoot.h"

#include <CLI/CLI.hpp>
#include <filesystem>
#include <memory>

namespace lumenkey::tools {

namespace {

struct NewOptions {
    std::string file;
    std::string name;
    bool force = false;
};

void runNew(NewOptions const& options) {
    if (channelFormatNamed(options.file) != ChannelFormat::Document) {
        throw UsageError{"'" + options.file + "' must end in .lumen: a new file is a document"};
    }
    std::error_code none;
    if (!options.force && std::filesystem::exists(options.file, none)) {
        throw OutputError{options.file, "it is there already; --force puts an empty document in its place"};
    }
    std::string const stem = std::filesystem::path(options.file).stem().string();
    FileRoot root(options.name.empty() ? stem : options.name, 1, kTempusInvalid);
    root.finishInitializing();
    SafeOutputFile out(options.file);
    writeDocument(root, out);
    out.close();
}

} // namespace

Verb declareNew(CLI::App& program) {
    auto const options = std::make_shared<NewOptions>();
    CLI::App* const verb = program.add_subcommand("new", "Make an empty document");
    verb->add_option("FILE", options->file, "The document: its name ends in .lumen")
        ->option_text(" ")
        ->required();
    verb->add_option("--name", options->name, "Of its root (else that of the file)")->option_text("NAME");
    verb->add_flag("--force", options->force, "Also where there is such a file already");
    verb->footer("Channels come into it with lumenkey add, values and keypoints with lumenkey set.\n\n"
                 "Example: lumenkey new ball.lumen");
    return {verb, "FILE [--name NAME] [--force]", [options](OutputSink&) { runNew(*options); }};
}

} // namespace lumenkey::tools
