#include "tools/cli/Verbs.h"

#include "lumenkey/Channels/KFChannelFlags.h"
#include "lumenkey/Channels/KFFactory.h"
#include "tools/cli/AuthorOptions.h"
#include "tools/cli/NearMatch.h"
#include "tools/cli/UsageError.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <memory>
#include <utility>

namespace lumenkey::tools {

namespace {

struct AddOptions {
    AuthorOptions author;
    std::string parent;
    std::string type;
    std::string name;
    double value = 0;
    CLI::Option* valueOption = nullptr;
};

/// Throws `UsageError`, with the class that was perhaps meant.
KFChannelFactory& requireMaker(std::string const& type) {
    if (auto* const maker = dynamic_cast<KFChannelFactory*>(factoryOfClass(type))) {
        return *maker;
    }
    NearMatch match(type);
    for (std::string const& name : storedClassNames()) {
        match.offer(name);
    }
    throw UsageError{"there is no class '" + type + "'" +
                     (match.best().empty() ? "; lumenkey types lists them all"
                                           : "; did you mean '" + match.best() + "'?")};
}

ChannelTree::Node requireParent(ChannelInput const& input, AddOptions const& options) {
    ChannelTree::Node const node = input.nodeNamed(options.parent);
    KFChannelFolder* const parent = input.tree().asFolder(node);
    if (parent == nullptr || parent->isCompoundChannel()) {
        throw UsageError{"'" + options.parent + "' is no folder"};
    }
    if (parent->isLocked(true)) {
        throw UsageError{"'" + options.parent + "' is locked"};
    }
    if (parent->getDescendants() != nullptr) {
        for (KFChannelBase const* const child : *parent->getDescendants()) {
            if (child->getName().view() == options.name) {
                throw UsageError{"'" + options.parent + "' has a channel '" + options.name + "' already"};
            }
        }
    }
    if (parent->testFoldFlag(kFoldFlagChildrenNotSaved)) {
        throw UsageError{"'" + options.parent + "' is a folder whose children documents leave out"};
    }
    return node;
}

void runAdd(AddOptions const& options, OutputSink& out) {
    options.author.check();
    KFChannelFactory& maker = requireMaker(options.type);
    ChannelInput const input = options.author.openAsDocument();
    ChannelTree::Node const parent = requireParent(input, options);
    std::unique_ptr<KFChannelBase> added(
        maker.createChannel(options.name, freeIDBelow(*input.tree().asFolder(parent))));
    if (added == nullptr) {
        throw UsageError{"'" + options.type + "' is a class without channels of its own"};
    }
    if (added->testFlag(kChannelFlagNotSaved)) {
        throw UsageError{"'" + options.type +
                         "' is a class that documents leave out: nothing would be stored"};
    }
    if (!options.valueOption->empty()) {
        if (!added->isValueChannel()) {
            throw UsageError{"--value is for one channel: '" + options.type + "' has none or several"};
        }
        setConstant(static_cast<KFChannel&>(*added), options.value, options.name);
    }
    ChannelTree::Node const node = input.file().tree->append(parent, std::move(added));
    input.tree().base(node).finishInitializing();
    options.author.write(input);
    out.write(input.tree().path(node) + "\n");
}

} // namespace

Verb declareAdd(CLI::App& program) {
    auto const options = std::make_shared<AddOptions>();
    CLI::App* const verb = program.add_subcommand("add", "Add a channel or a folder to a document");
    options->author.add(*verb);
    verb->add_option("PARENT", options->parent, "The folder it comes into: a name, or a path; ./ is the top")
        ->option_text(" ")
        ->required();
    verb->add_option("TYPE", options->type, "Its class, such as Double, Angle, Folder or 3D")
        ->option_text(" ")
        ->required();
    verb->add_option("NAME", options->name, "Its name")->option_text(" ")->required();
    options->valueOption =
        verb->add_option("--value", options->value, "Its value, in its unit (else that of its class)")
            ->option_text("V");
    options->author.addRest(*verb);
    verb->footer(
        "It comes behind the others; its path of IDs is printed. lumenkey types lists the classes.\n\n"
        "Example: lumenkey add ball.lumen ./ Double Height --value 1.5");
    return {verb, "FILE PARENT TYPE NAME [--value V] [-o OUT | --in-place] [--force] [--frame-rate R]",
            [options](OutputSink& out) { runAdd(*options, out); }};
}

} // namespace lumenkey::tools
