#include "tools/cli/Verbs.h"

#include "tools/cli/MotionInput.h"
#include "tools/output/JsonWriter.h"
#include "tools/output/Table.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <memory>

namespace lumenkey::tools {

namespace {

struct InfoOptions {
    std::string file;
    bool json = false;
};

std::uint64_t keypointCount(Motion const& motion) {
    return std::uint64_t{motion.frameCount} * motion.channels.size();
}

void writeJson(MotionInput const& input, OutputSink& out) {
    Motion const& motion = input.motion();
    JsonWriter json(out);
    json.beginObject();
    json.key("format");
    json.string("BVH");
    json.key("channels");
    json.integer(motion.channels.size());
    json.key("keypoints");
    json.integer(keypointCount(motion));
    json.key("start");
    json.string(timeText(kTempusZero));
    json.key("duration");
    json.string(timeText(input.duration()));
    json.key("frameDuration");
    json.string(timeText(motion.frameDuration));
    json.key("joints");
    json.integer(motion.joints.size());
    json.key("frames");
    json.integer(motion.frameCount);
    json.key("channelNames");
    json.beginArray();
    for (std::size_t i = 0; i < input.channels().count(); ++i) {
        json.string(input.channels().name(i));
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

void writeSummary(MotionInput const& input, OutputSink& out) {
    Motion const& motion = input.motion();
    out.write("file       " + printableText(motion.file) + "\n");
    out.write("format     BVH (motion capture)\n");
    out.write("joints     " + std::to_string(motion.joints.size()) + "\n");
    out.write("channels   " + std::to_string(motion.channels.size()) + "\n");
    out.write("keypoints  " + std::to_string(keypointCount(motion)) + "\n");
    out.write("frames     " + std::to_string(motion.frameCount) + " at " + rateText(motion.frameDuration) +
              " frames a second, each " + timeText(motion.frameDuration) + " s\n");
    out.write("duration   " + tableText(TempusGetSeconds(input.duration())) + " s, exactly " +
              timeText(input.duration()) + " s\n\n");
}

struct Extent {
    double least = 0;
    double greatest = 0;
};

std::vector<Extent> extentsOf(MotionInput const& input) {
    std::vector<Extent> extents(input.channels().count());
    for (std::size_t frame = 0; frame < input.motion().frameCount; ++frame) {
        for (std::size_t i = 0; i < extents.size(); ++i) {
            double const value = input.channels().value(frame, i);
            extents[i].least = frame == 0 ? value : std::min(extents[i].least, value);
            extents[i].greatest = frame == 0 ? value : std::max(extents[i].greatest, value);
        }
    }
    return extents;
}

void writeChannels(MotionInput const& input, OutputSink& out) {
    std::vector<Extent> const extents = extentsOf(input);
    Table table;
    table.columns = {{"channel"}, {"unit"}, {"least", Align::Right}, {"greatest", Align::Right}};
    table.rowCount = extents.size();
    table.cell = [&](std::size_t row, std::size_t column) -> std::string {
        switch (column) {
        case 0:
            return input.channels().name(row);
        case 1:
            return std::string(input.channels().unit(row));
        default:
            return tableText(column == 2 ? extents[row].least : extents[row].greatest);
        }
    };
    table.write(out);
}

void runInfo(InfoOptions const& options, OutputSink& out) {
    MotionInput const input(options.file);
    if (options.json) {
        writeJson(input, out);
        return;
    }
    writeSummary(input, out);
    writeChannels(input, out);
}

} // namespace

Verb declareInfo(CLI::App& program) {
    auto const options = std::make_shared<InfoOptions>();
    CLI::App* const verb = program.add_subcommand("info", "Tell what a motion file holds");
    verb->add_option("FILE", options->file, "The motion capture file (BVH)")->option_text(" ")->required();
    verb->add_flag("--json", options->json,
                   "For programs: counts, exact times and the names of the channels");
    verb->footer("Example: lumenkey info walk.bvh");
    return {verb, "FILE [--json]", [options](OutputSink& out) { runInfo(*options, out); }};
}

} // namespace lumenkey::tools
