#include "tools/cli/Verbs.h"

#include "tools/cli/ChannelInput.h"
#include "tools/cli/Progress.h"
#include "tools/cli/WholeNumber.h"
#include "tools/output/JsonWriter.h"
#include "tools/output/Table.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <limits>
#include <memory>

namespace lumenkey::tools {

namespace {

using Node = ChannelTree::Node;

struct TreeOptions {
    InputOptions input;
    std::size_t depth = std::numeric_limits<std::size_t>::max();
    bool json = false;
};

double startValue(ChannelInput const& input, Node node) {
    return input.tree().curve(node).getValue(input.file().firstTime, 0.0);
}

void writeNode(JsonWriter& json, ChannelInput const& input, Node node) {
    ChannelTree const& tree = input.tree();
    json.beginObject(JsonLayout::Inline);
    json.key("path");
    json.string(tree.path(node));
    json.key("depth");
    json.integer(tree.depth(node));
    json.key("id");
    json.integer(tree.base(node).getID());
    json.key("name");
    json.string(tree.base(node).getName().view());
    json.key("type");
    json.string(tree.typeName(node));
    json.key("class");
    json.string(tree.className(node));
    if (tree.isChannel(node)) {
        json.key("default");
        json.number(tree.channel(node).getDefaultValue());
        json.key("start");
        json.number(startValue(input, node));
        json.key("keypoints");
        json.integer(tree.channel(node).getNumberOfKeyframes());
    }
    json.endObject();
}

void writeJson(ChannelInput const& input, std::vector<Node> const& nodes, OutputSink& out) {
    Progress bar("writing", ProgressOf::Output);
    JsonWriter json(out);
    json.beginObject();
    json.key("nodes");
    json.beginArray();
    for (std::size_t i = 0; i < nodes.size(); ++i) {
        writeNode(json, input, nodes[i]);
        bar.update(static_cast<double>(i) / static_cast<double>(nodes.size()));
    }
    json.endArray();
    json.endObject();
    json.finish();
}

std::string cellOf(ChannelInput const& input, Node node, std::size_t column) {
    ChannelTree const& tree = input.tree();
    switch (column) {
    case 0:
        return std::string(2 * tree.depth(node), ' ') + tree.base(node).getName().str();
    case 1:
        return std::to_string(tree.base(node).getID());
    case 2:
        return tree.typeName(node);
    default:
        break;
    }
    if (!tree.isChannel(node)) {
        return "";
    }
    switch (column) {
    case 3:
        return tableText(tree.channel(node).getDefaultValue());
    case 4:
        return tableText(startValue(input, node));
    default:
        return std::to_string(tree.channel(node).getNumberOfKeyframes());
    }
}

void writeTable(ChannelInput const& input, std::vector<Node> const& nodes, OutputSink& out) {
    Table table;
    table.columns = {{"name"},
                     {"ID", Align::Right},
                     {"type"},
                     {"default", Align::Right},
                     {"at start", Align::Right},
                     {"keypoints", Align::Right}};
    table.rowCount = nodes.size();
    Progress bar("writing", ProgressOf::Output);
    table.progress = bar.teller();
    table.cell = [&](std::size_t row, std::size_t column) { return cellOf(input, nodes[row], column); };
    table.write(out);
}

void runTree(TreeOptions const& options, OutputSink& out) {
    ChannelInput const input(options.input);
    std::vector<Node> nodes;
    for (Node node = ChannelTree::kTop; node < input.tree().count(); ++node) {
        if (input.tree().depth(node) <= options.depth) {
            nodes.push_back(node);
        }
    }
    if (options.json) {
        writeJson(input, nodes, out);
    } else {
        writeTable(input, nodes, out);
    }
}

} // namespace

Verb declareTree(CLI::App& program) {
    auto const options = std::make_shared<TreeOptions>();
    CLI::App* const verb =
        program.add_subcommand("tree", "List the folders and channels of a file as the tree they are");
    options->input.add(*verb);
    verb->add_option("--depth", options->depth, "Only so many levels below the top")
        ->check(wholeNumberFrom(0))
        ->option_text("N");
    verb->add_flag("--json", options->json,
                   "For programs: a list in tree order, with the path of IDs and the class of each node");
    verb->footer("IDs are those of paths: ./1/3 is the node 3 below the node 1 below the top.\n\n"
                 "Example: lumenkey tree walk.bvh --depth 2");
    return {verb, "FILE [--depth N] [--frame-rate R] [--json]",
            [options](OutputSink& out) { runTree(*options, out); }};
}

} // namespace lumenkey::tools
