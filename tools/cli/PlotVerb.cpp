#include "tools/cli/Verbs.h"

#include "tools/cli/ChannelInput.h"
#include "tools/cli/PlotOptions.h"
#include "tools/cli/Progress.h"
#include "tools/cli/TimeArgument.h"
#include "tools/cli/UsageError.h"
#include "tools/edit/KeypointStretch.h"
#include "tools/output/TextForms.h"
#include "tools/plot/PlotChart.h"

#include <CLI/CLI.hpp>
#include <filesystem>
#include <memory>
#include <optional>

namespace lumenkey::tools {

namespace {

struct PlotOptions {
    InputOptions input;
    std::vector<std::string> channels;
    std::string output;
    std::string from;
    std::string to;
    int width = 960;
    int height = 480;
};

TimeSpan spanOf(std::optional<TimeArgument> const& from, std::optional<TimeArgument> const& to,
                ChannelFile const& file) {
    Tempus const frame = file.frameDuration;
    TimeSpan span{from ? from->resolve(frame) : file.firstTime, to ? to->resolve(frame) : file.lastTime};
    if (!to && span.to == span.from) {
        span.to = span.from + (TempusIsNumeric(frame) ? frame : TempusMake(1, 1));
    }
    if (span.to <= span.from) {
        throw UsageError{"--to must lie after --from"};
    }
    return span;
}

PlotChart chartOf(ChannelInput const& input, std::vector<ChannelTree::Node> const& channels,
                  TimeSpan const& span, double width, Progress& bar) {
    PlotChart chart;
    chart.title = std::filesystem::path(input.file().file).filename().string();
    chart.seconds = PlotRange::sound(TempusGetSeconds(span.from), TempusGetSeconds(span.to));
    std::size_t done = 0;
    for (ChannelTree::Node const channel : channels) {
        ChartPanel& panel = panelOfUnit(chart, input.tree().unit(channel));
        panel.curves.push_back(
            {input.tree().dottedName(channel),
             traceCurve(input.tree().curve(channel), span.from, span.to, widthOfCurves(width)),
             std::nullopt});
        bar.update(static_cast<double>(++done) / static_cast<double>(channels.size()));
    }
    CurvePicture const& first = chart.panels.front().curves.front().picture;
    bool const areMarked = marksFor(first, widthOfCurves(width)) != KeypointMarks::None;
    Tempus const frame = input.file().frameDuration;
    bool const standsOnFrames = TempusIsNumeric(frame) && input.file().format != ChannelFormat::Document;
    chart.subtitle = std::to_string(first.keypoints.size()) + " keypoints" +
                     (standsOnFrames ? ", " + timeText(frame) + " s apart" : "") +
                     (areMarked ? "" : ", too close to mark");
    return chart;
}

void runPlot(PlotOptions const& options) {
    PlotFormat const format = requirePlotFormat(options.output);
    std::optional<TimeArgument> const from = TimeArgument::parseIfGiven(options.from);
    std::optional<TimeArgument> const to = TimeArgument::parseIfGiven(options.to);
    ChannelInput const input(options.input);
    std::vector<ChannelTree::Node> const channels = input.channelsNamed(options.channels);
    if (channels.size() > kMostDistinctCurves) {
        throw UsageError{std::to_string(channels.size()) +
                         " channels are too many to tell apart in one picture; name " +
                         std::to_string(kMostDistinctCurves) + " at most, or a folder with no more"};
    }
    TimeSpan const span = spanOf(from, to, input.file());
    Progress bar("plotting");
    PlotChart const chart = chartOf(input, channels, span, options.width, bar);
    PlotCanvas canvas(format, options.width, options.height);
    chart.draw(canvas);
    canvas.save(options.output);
}

} // namespace

PlotFormat requirePlotFormat(std::string const& file) {
    if (std::optional<PlotFormat> const format = plotFormatOf(file)) {
        return *format;
    }
    throw UsageError{"'" + file + "' must end in .svg, .png or .pdf, which tells what to write"};
}

Verb declarePlot(CLI::App& program) {
    auto const options = std::make_shared<PlotOptions>();
    CLI::App* const verb = program.add_subcommand("plot", "Draw channels over time");
    options->input.add(*verb);
    verb->add_option("CHANNEL", options->channels, kChannelHelp)->option_text("...");
    verb->add_option("-o,--output", options->output, "The picture: OUT.svg, OUT.png or OUT.pdf")
        ->option_text("OUT")
        ->required();
    verb->add_option("--from", options->from, "The first time (else the first of the file)")
        ->option_text("T");
    verb->add_option("--to", options->to, "The last time (else the last of the file)")->option_text("T");
    verb->add_option("--width", options->width, "In pixels; in PDF, in points")
        ->check(CLI::Range(200, 10'000))
        ->option_text("N")
        ->capture_default_str();
    verb->add_option("--height", options->height, "Likewise")
        ->check(CLI::Range(150, 10'000))
        ->option_text("N")
        ->capture_default_str();
    verb->footer("A time is VALUE/TIMESCALE (1001/24000), seconds (0.5) or frames of the file (12f).\n"
                 "Rotations and other values get a panel each. What lies outside the keypoints is dashed.\n\n"
                 "Example: lumenkey plot walk.bvh LeftLeg.Xrotation RightLeg.Xrotation -o legs.svg");
    return {verb,
            "FILE [CHANNEL...] -o OUT.svg|png|pdf [--from T] [--to T] [--width N] [--height N] "
            "[--frame-rate R]",
            [options](OutputSink&) { runPlot(*options); }};
}

} // namespace lumenkey::tools
