#include "tools/cli/Verbs.h"

#include "tools/cli/ChannelInput.h"
#include "tools/cli/Progress.h"
#include "tools/curve/Keypoint.h"
#include "tools/output/JsonWriter.h"
#include "tools/output/Table.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <memory>

namespace lumenkey::tools {

namespace {

struct KeysOptions {
    InputOptions input;
    std::string channel;
    bool json = false;
};

void writeHandle(JsonWriter& json, std::string_view name, KeypointHandle const& handle) {
    json.key(name);
    json.beginArray();
    json.number(handle.seconds);
    json.number(handle.value);
    json.endArray();
}

void writeKeypoint(JsonWriter& json, Keypoint const& key) {
    json.beginObject(JsonLayout::Inline);
    json.key("time");
    json.string(timeText(key.time));
    json.key("seconds");
    json.number(TempusGetSeconds(key.time));
    json.key("value");
    json.number(key.value);
    json.key("interpolation");
    json.integer(key.interpolation);
    writeHandle(json, "in", key.in);
    writeHandle(json, "out", key.out);
    json.key("enabled");
    json.boolean(key.enabled);
    json.key("flags");
    json.integer(key.flags);
    json.endObject();
}

/// Handles are those of curves and documents, whatever the interpolation makes of them.
Keypoint keypointOf(KFCurve& curve, void* handle) {
    Keypoint key = readKeypoint(*curve.getSpline(), handle);
    curve.getKeypointInputHandles(handle, &key.in.seconds, &key.in.value);
    curve.getKeypointOutputHandles(handle, &key.out.seconds, &key.out.value);
    return key;
}

std::vector<void*> handlesOf(KFCurve& curve) {
    KFSpline* const spline = curve.getSpline();
    return spline == nullptr ? std::vector<void*>() : everyKeypointHandle(*spline);
}

void writeJson(std::string const& channel, KFCurve& curve, OutputSink& out) {
    JsonWriter json(out);
    json.beginObject();
    json.key("channel");
    json.string(channel);
    json.key("keypoints");
    json.beginArray();
    Progress bar("writing", ProgressOf::Output);
    std::vector<void*> const handles = handlesOf(curve);
    for (std::size_t i = 0; i < handles.size(); ++i) {
        writeKeypoint(json, keypointOf(curve, handles[i]));
        bar.update(static_cast<double>(i) / static_cast<double>(handles.size()));
    }
    json.endArray();
    json.endObject();
    json.finish();
}

std::string handleText(KeypointHandle const& handle) {
    return handle.isFlat() ? "-" : tableText(handle.seconds) + ", " + tableText(handle.value);
}

std::string cellOf(Keypoint const& key, std::size_t column) {
    switch (column) {
    case 0:
        return timeText(key.time);
    case 1:
        return tableText(TempusGetSeconds(key.time));
    case 2:
        return tableText(key.value);
    case 3:
        return interpolationName(key.interpolation);
    case 4:
        return handleText(key.in);
    case 5:
        return handleText(key.out);
    case 6:
        return key.enabled ? "yes" : "no";
    default:
        return std::to_string(key.flags);
    }
}

void writeTable(KFCurve& curve, std::string_view unit, OutputSink& out) {
    std::vector<void*> const handles = handlesOf(curve);
    std::string const value = "value (" + std::string(unit) + ")";
    Table table;
    table.columns = {
        {"time", Align::Right}, {"seconds", Align::Right}, {value, Align::Right}, {"interpolation"},
        {"in", Align::Right},   {"out", Align::Right},     {"enabled"},           {"flags", Align::Right}};
    table.rowCount = handles.size();
    Progress bar("writing", ProgressOf::Output);
    table.progress = bar.teller();
    table.cell = [&](std::size_t row, std::size_t column) {
        return cellOf(keypointOf(curve, handles[row]), column);
    };
    table.write(out);
}

void runKeys(KeysOptions const& options, OutputSink& out) {
    ChannelInput const input(options.input);
    ChannelTree::Node const channel = input.channelNamed(options.channel);
    KFCurve& curve = input.tree().curve(channel);
    if (options.json) {
        writeJson(input.tree().dottedName(channel), curve, out);
    } else {
        writeTable(curve, input.tree().unit(channel), out);
    }
}

} // namespace

Verb declareKeys(CLI::App& program) {
    auto const options = std::make_shared<KeysOptions>();
    CLI::App* const verb = program.add_subcommand("keys", "List the keypoints of a channel");
    options->input.add(*verb);
    verb->add_option("CHANNEL", options->channel,
                     "Its name with dots, the end of that, or its path of IDs (./1/3)")
        ->option_text(" ")
        ->required();
    verb->add_flag("--json", options->json,
                   "For programs: every number in full, handles as [seconds, value]");
    verb->footer("Example: lumenkey keys walk.bvh Hips.Yposition");
    return {verb, "FILE CHANNEL [--frame-rate R] [--json]",
            [options](OutputSink& out) { runKeys(*options, out); }};
}

} // namespace lumenkey::tools
