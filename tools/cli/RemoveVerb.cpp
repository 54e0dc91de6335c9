#include "tools/cli/Verbs.h"

#include "tools/cli/AuthorOptions.h"
#include "tools/cli/UsageError.h"

#include <CLI/CLI.hpp>
#include <memory>

namespace lumenkey::tools {

namespace {

struct RemoveOptions {
    AuthorOptions author;
    std::string channel;
};

void runRemove(RemoveOptions const& options) {
    options.author.check();
    ChannelInput const input = options.author.openAsDocument();
    ChannelTree::Node const node = input.nodeNamed(options.channel);
    if (node == ChannelTree::kTop) {
        throw UsageError{"the top of a document stays"};
    }
    for (ChannelTree::Node below = node; below < input.tree().end(node); ++below) {
        if (input.tree().base(below).isLocked(true)) {
            throw UsageError{"'" + options.channel + "' is locked, or holds what is"};
        }
    }
    if (input.tree().isComponent(node)) {
        throw UsageError{"'" + options.channel + "' is a part of its compound, which can only go as a whole"};
    }
    input.file().tree->erase(node);
    options.author.write(input);
}

} // namespace

Verb declareRemove(CLI::App& program) {
    auto const options = std::make_shared<RemoveOptions>();
    CLI::App* const verb =
        program.add_subcommand("remove", "Take a channel, or a folder with all in it, out of a document");
    options->author.add(*verb);
    verb->add_option("CHANNEL", options->channel, "A name, the end of one, or a path of IDs")
        ->option_text(" ")
        ->required();
    options->author.addRest(*verb);
    verb->footer("Example: lumenkey remove ball.lumen Shadow");
    return {verb, "FILE CHANNEL [-o OUT | --in-place] [--force] [--frame-rate R]",
            [options](OutputSink&) { runRemove(*options); }};
}

} // namespace lumenkey::tools
