#include "tools/cli/Verbs.h"

#include "tools/cli/ChannelInput.h"
#include "tools/cli/SeveralFiles.h"
#include "tools/output/JsonWriter.h"
#include "tools/output/Table.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>

namespace lumenkey::tools {

namespace {

struct InfoOptions {
    std::vector<std::string> files;
    std::string frameRate;
    bool json = false;
};

bool isMotion(ChannelInput const& input) { return input.file().format == ChannelFormat::Motion; }

bool isDocument(ChannelInput const& input) { return input.file().format == ChannelFormat::Document; }

/// Nothing for what isn't a plain file.
std::optional<std::uintmax_t> sizeOf(std::string const& file) {
    std::error_code error;
    std::uintmax_t const size = std::filesystem::file_size(file, error);
    return error ? std::nullopt : std::optional(size);
}

void writeDocumentJson(DocumentFile const& document, JsonWriter& json) {
    json.key("version");
    json.string(document.versionText());
    json.key("factories");
    json.beginArray();
    for (DocumentFactory const& factory : document.factories) {
        json.beginObject(JsonLayout::Inline);
        json.key("id");
        json.integer(factory.number);
        json.key("uuid");
        json.string(factory.uuid.text());
        json.key("description");
        json.string(factory.description);
        json.key("class");
        json.string(factory.className);
        json.endObject();
    }
    json.endArray();
}

std::string nameOf(DocumentFactory const& factory) {
    if (!factory.className.empty()) {
        return shortClassName(factory.className);
    }
    return factory.description.empty() ? factory.uuid.text() : factory.description;
}

std::string factoriesText(DocumentFile const& document) {
    std::string text;
    std::size_t unknown = 0;
    for (DocumentFactory const& factory : document.factories) {
        text += (text.empty() ? ": " : ", ") + nameOf(factory);
        unknown += factory.isKnown() ? 0 : 1;
    }
    return std::to_string(document.factories.size()) + text +
           (unknown == 0 ? "" : "; " + std::to_string(unknown) + " unknown");
}

std::uint64_t keypointCount(ChannelInput const& input, std::vector<ChannelTree::Node> const& channels) {
    std::uint64_t count = 0;
    for (ChannelTree::Node const channel : channels) {
        count += input.tree().channel(channel).getNumberOfKeyframes();
    }
    return count;
}

void writeJson(ChannelInput const& input, std::vector<ChannelTree::Node> const& channels, bool isOneOfSeveral,
               OutputSink& out) {
    ChannelFile const& file = input.file();
    JsonWriter json(out);
    json.beginObject();
    if (isOneOfSeveral) {
        json.key("file");
        json.string(file.file);
    }
    json.key("format");
    json.string(channelFormatName(file.format));
    if (isDocument(input)) {
        writeDocumentJson(file.document, json);
    }
    if (std::optional<std::uintmax_t> const size = sizeOf(file.file)) {
        json.key("bytes");
        json.integer(*size);
    }
    json.key("channels");
    json.integer(channels.size());
    json.key("keypoints");
    json.integer(keypointCount(input, channels));
    json.key("start");
    json.string(timeText(file.firstTime));
    json.key("duration");
    json.string(timeText(file.duration));
    if (TempusIsNumeric(file.frameDuration)) {
        json.key("frameDuration");
        json.string(timeText(file.frameDuration));
    }
    if (isMotion(input)) {
        json.key("joints");
        json.integer(file.joints);
    }
    if (!isDocument(input)) {
        json.key(isMotion(input) ? "frames" : "rows");
        json.integer(file.rows);
    }
    json.key("channelNames");
    json.beginArray();
    for (ChannelTree::Node const channel : channels) {
        json.string(input.tree().dottedName(channel));
    }
    json.endArray();
    json.endObject();
    json.finish();
}

/// `120` or `29.97003`, in frames a second.
std::string rateText(Tempus const& frameDuration) {
    double const rate = TempusRatio(TempusMake(1, 1), frameDuration);
    std::string text = tableText(rate);
    while (text.find('.') != std::string::npos && (text.back() == '0' || text.back() == '.')) {
        bool const wasPoint = text.back() == '.';
        text.pop_back();
        if (wasPoint) {
            break;
        }
    }
    return text;
}

std::string rowsText(ChannelInput const& input) {
    ChannelFile const& file = input.file();
    std::string const count = std::to_string(file.rows);
    if (!TempusIsNumeric(file.frameDuration)) {
        return "rows       " + count + "\n";
    }
    return (isMotion(input) ? "frames     " : "rows       ") + count + " at " + rateText(file.frameDuration) +
           (isMotion(input) ? " frames" : " rows") + " a second, each " + timeText(file.frameDuration) +
           " s\n";
}

void writeSummary(ChannelInput const& input, std::vector<ChannelTree::Node> const& channels,
                  OutputSink& out) {
    ChannelFile const& file = input.file();
    out.write("file       " + printableText(file.file) + "\n");
    if (isDocument(input)) {
        out.write("format     document, version " + file.document.versionText() + "\n");
        out.write("factories  " + printableText(factoriesText(file.document)) + "\n");
    } else {
        out.write(isMotion(input) ? "format     BVH (motion capture)\n"
                                  : "format     CSV (values over time)\n");
    }
    if (std::optional<std::uintmax_t> const size = sizeOf(file.file)) {
        out.write("size       " + std::to_string(*size) + " bytes\n");
    }
    if (isMotion(input)) {
        out.write("joints     " + std::to_string(file.joints) + "\n");
    }
    out.write("channels   " + std::to_string(channels.size()) + "\n");
    out.write("keypoints  " + std::to_string(keypointCount(input, channels)) + "\n");
    if (!isDocument(input)) {
        out.write(rowsText(input));
    }
    if (!isMotion(input)) {
        out.write("start      " + tableText(TempusGetSeconds(file.firstTime)) + " s, exactly " +
                  timeText(file.firstTime) + " s\n");
    }
    out.write("duration   " + tableText(TempusGetSeconds(file.duration)) + " s, exactly " +
              timeText(file.duration) + " s\n\n");
}

std::string extremeText(ChannelTree const& tree, ChannelTree::Node channel, bool least) {
    // Without keypoints it is the same at all times.
    double value = tree.curve(channel).getValue(kTempusZero, 0.0);
    if (tree.channel(channel).getNumberOfKeyframes() > 0) {
        least ? tree.curve(channel).getCurrentMinValueV(&value, false)
              : tree.curve(channel).getCurrentMaxValueV(&value, false);
    }
    return tableText(value);
}

void writeChannels(ChannelTree const& tree, std::vector<ChannelTree::Node> const& channels, OutputSink& out) {
    Table table;
    table.columns = {{"channel"}, {"unit"}, {"least", Align::Right}, {"greatest", Align::Right}};
    table.rowCount = channels.size();
    table.cell = [&](std::size_t row, std::size_t column) -> std::string {
        switch (column) {
        case 0:
            return tree.dottedName(channels[row]);
        case 1:
            return std::string(tree.unit(channels[row]));
        default:
            return extremeText(tree, channels[row], column == 2);
        }
    };
    table.write(out);
}

int tellFile(std::string const& file, InfoOptions const& options, OutputSink& out) {
    ChannelInput const input(InputOptions{file, options.frameRate});
    std::vector<ChannelTree::Node> const channels = input.tree().channelsBelow(ChannelTree::kTop);
    if (options.json) {
        writeJson(input, channels, options.files.size() > 1, out);
        return kExitDone;
    }
    writeSummary(input, channels, out);
    writeChannels(input.tree(), channels, out);
    return kExitDone;
}

int runInfo(InfoOptions const& options, OutputSink& out) {
    auto const work = [&options](std::string const& file, OutputSink& text) {
        return tellFile(file, options, text);
    };
    SeveralTexts texts{"", "\n", ""};
    if (options.json) {
        texts = {"[\n", ",\n", "]\n"};
    }
    return forSeveralFiles(options.files, out, work, texts);
}

} // namespace

Verb declareInfo(CLI::App& program) {
    auto const options = std::make_shared<InfoOptions>();
    CLI::App* const verb = program.add_subcommand("info", "Tell what a file holds");
    verb->add_option("FILE", options->files, kFileHelp)->option_text("...")->required();
    addFrameRateOption(*verb, options->frameRate);
    verb->add_flag("--json", options->json,
                   "For programs: counts, exact times and the names of the channels");
    verb->footer(
        "With --json several FILEs make one array, in which each tells its name; one that is at fault "
        "is left out.\n\nExample: lumenkey info walk.bvh");
    Verb declared{verb, "FILE... [--frame-rate R] [--json]", {}};
    declared.runForExit = [options](OutputSink& out) { return runInfo(*options, out); };
    return declared;
}

} // namespace lumenkey::tools
