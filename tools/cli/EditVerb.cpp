#include "tools/cli/EditVerb.h"

#include "tools/cli/ChannelInput.h"
#include "tools/cli/EditReport.h"
#include "tools/cli/OutputOptions.h"
#include "tools/cli/PlotOptions.h"
#include "tools/cli/Progress.h"
#include "tools/cli/UsageError.h"
#include "tools/curve/Keypoint.h"
#include "tools/edit/CurveChange.h"
#include "tools/export/ChannelFileWriter.h"
#include "tools/output/SafeOutputFile.h"
#include "tools/plot/PlotChart.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <filesystem>

namespace lumenkey::tools {

namespace {

using Node = ChannelTree::Node;

constexpr int kPictureWidth = 960;
constexpr int kPictureHeight = 480;
/// A part of a file is drawn with so much of its own length on either side.
constexpr std::int32_t kShareBeside = 8;
/// Where the rows of a table aren't evenly spaced, this takes the place of a frame: a share of the stretch.
constexpr std::int32_t kStepsOfUnevenRows = 1'000;

struct EditOptions {
    InputOptions input;
    std::vector<std::string> channels;
    OutputOptions output;
    std::string from;
    std::string to;
    std::string rows;
    std::string plot;
    bool json = false;
};

/// One run of a verb.
class EditRun {
public:
    EditRun(EditVerb& verb, EditOptions const& options) : _verb(verb), _options(options) {}

    void run(OutputSink& out) {
        readOptions();
        ChannelInput const input(_options.input);
        _format = _options.output.formatFor(input.file().format);
        checkRows(_format);
        std::vector<Node> const channels = channelsOf(input);
        _span = spanOf(input.file());
        _verb.prepare(input.file(), _span);
        editAll(input, channels);

        EditReport report{_verb.words(), target(), _format, _span, {}, std::move(_edited)};
        // So that a picture which can't be written leaves FILE as it is.
        std::optional<SafeOutputFile> picture;
        if (_picture) {
            picture.emplace(_options.plot);
            drawPicture(report).writeTo(*picture);
        }
        report.written = writeFile(input, channels);
        if (picture) {
            picture->close();
        }
        _options.json ? report.writeJson(out) : report.writeTable(out);
    }

private:
    std::string const& target() const { return _options.output.target(_options.input.file); }

    void checkRows(std::optional<ChannelFormat> const& written) const {
        if (written && *written != ChannelFormat::Csv && !_options.rows.empty()) {
            throw UsageError{"--rows is for a table, and '" + target() + "' is none: -o OUT.csv makes one"};
        }
    }

    void readOptions() {
        checkRows(_options.output.check(_options.input.file));
        if (!_options.plot.empty()) {
            _picture = requirePlotFormat(_options.plot);
        }
        _from = TimeArgument::parseIfGiven(_options.from);
        _to = TimeArgument::parseIfGiven(_options.to);
        _verb.readOptions();
    }

    /// Each once, in tree order.
    std::vector<Node> channelsOf(ChannelInput const& input) const {
        std::vector<Node> channels = input.channelsNamed(_options.channels);
        std::sort(channels.begin(), channels.end());
        channels.erase(std::unique(channels.begin(), channels.end()), channels.end());
        if (_picture && channels.size() > kMostDistinctCurves) {
            throw UsageError{std::to_string(channels.size()) +
                             " channels are too many to tell apart in one picture; with --plot name " +
                             std::to_string(kMostDistinctCurves) + " at most, or a folder with no more"};
        }
        return channels;
    }

    TimeSpan spanOf(ChannelFile const& file) const {
        TimeSpan const span{_from ? _from->resolve(file.frameDuration) : file.firstTime,
                            _to ? _to->resolve(file.frameDuration) : file.lastTime};
        if (span.to < span.from) {
            throw UsageError{"--to lies before --from"};
        }
        return span;
    }

    void editAll(ChannelInput const& input, std::vector<Node> const& channels) {
        Progress bar("editing");
        Tempus const step = comparedStep(input.file(), _span, _verb.sampleStep());
        for (Node const node : channels) {
            _edited.push_back(edit(input.tree(), node, step));
            bar.update(static_cast<double>(_edited.size()) / static_cast<double>(channels.size()));
        }
    }

    /// That part of the stretch in which keypoints lie.
    TimeSpan keyedSpan(KFSpline const* spline) const {
        std::optional<KeypointEnds> const ends = keypointEnds(spline);
        return ends ? TimeSpan{TempusMaximum(_span.from, ends->first), TempusMinimum(_span.to, ends->last)}
                    : _span;
    }

    EditedChannel edit(ChannelTree const& tree, Node node, Tempus const& step) {
        KFChannel& channel = tree.channel(node);
        EditedChannel edited{tree.dottedName(node), std::string(tree.unit(node)),
                             channel.getNumberOfKeyframes()};
        std::unique_ptr<KFCurveInterface> const copy(tree.curve(node).cloneCurve());
        auto& before = static_cast<KFCurve&>(*copy);
        TimeSpan const keyed = keyedSpan(tree.spline(node));
        if (edited.keypointsBefore > 0 && !(keyed.to < keyed.from) && !channel.isLocked(true)) {
            _verb.apply(channel, keyed);
            std::string const fault = _verb.sampleStep() ? "" : faultOfTimes(before, tree.curve(node));
            if (!fault.empty()) {
                throw UsageError{"keypoints of '" + edited.channel + "' would come to " + fault};
            }
        }
        edited.keypointsAfter = channel.getNumberOfKeyframes();
        edited.change = changeBetween(before, tree.curve(node), _span, step);
        if (_picture) {
            addToPicture(tree, node, before, edited);
        }
        return edited;
    }

    WrittenRows writeFile(ChannelInput const& input, std::vector<Node> const& channels) const {
        bool const areKeypoints = _options.rows.empty() ? !_verb.sampleStep() : _options.rows == "keypoints";
        Progress bar("writing");
        return writeChannelFile({input.file(), _format, areKeypoints ? RowsOf::Keypoints : RowsOf::Input,
                                 channels, target(), _options.output.force},
                                bar.teller());
    }

    /// The stretch and where it comes to; around a part of the file, some of what lies beside it.
    TimeSpan shownSpan() const {
        TimeSpan const arrival = _verb.arrivalOf(_span);
        TimeSpan shown{TempusMinimum(_span.from, arrival.from), TempusMaximum(_span.to, arrival.to)};
        if (!(shown.from < shown.to)) {
            return {shown.from, shown.from + TempusMake(1, 1)};
        }
        Tempus const beside = (shown.to - shown.from) / kShareBeside;
        return {_from ? shown.from - beside : shown.from, _to ? shown.to + beside : shown.to};
    }

    void addToPicture(ChannelTree const& tree, Node node, KFCurve& before, EditedChannel const& edited) {
        TimeSpan const shown = shownSpan();
        double const pixels = widthOfCurves(kPictureWidth);
        _chart.seconds = PlotRange::sound(TempusGetSeconds(shown.from), TempusGetSeconds(shown.to));
        CurvePicture old = traceCurve(before, shown.from, shown.to, pixels);
        CurvePicture now = traceCurve(tree.curve(node), shown.from, shown.to, pixels);
        panelOfUnit(_chart, edited.unit).curves.push_back({edited.channel, std::move(now), std::move(old)});
    }

    PlotCanvas drawPicture(EditReport const& report) {
        _chart.title =
            _verb.words().name + " " + std::filesystem::path(_options.input.file).filename().string();
        _chart.subtitle = report.summary();
        PlotCanvas canvas(*_picture, kPictureWidth, kPictureHeight);
        _chart.draw(canvas);
        return canvas;
    }

    EditVerb& _verb;
    EditOptions const& _options;
    ChannelFormat _format{};
    std::optional<PlotFormat> _picture;
    std::optional<TimeArgument> _from;
    std::optional<TimeArgument> _to;
    TimeSpan _span;
    std::vector<EditedChannel> _edited;
    PlotChart _chart;
};

void addCommonOptions(CLI::App& verb, EditOptions& options) {
    options.input.add(verb);
    verb.add_option("CHANNEL", options.channels, kChannelHelp)->option_text("...");
    options.output.add(verb);
    verb.add_option("--from", options.from, "The first time that is edited (else the first of the file)")
        ->option_text("T");
    verb.add_option("--to", options.to, "The last time that is edited (else the last of the file)")
        ->option_text("T");
    verb.add_option("--rows", options.rows,
                    "Of a CSV: a row for each of the input, or for each keypoint after the edit")
        ->check(CLI::IsMember({"input", "keypoints"}))
        ->option_text("input|keypoints");
    verb.add_option("--plot", options.plot, "Draw before and after: PICTURE.svg, .png or .pdf")
        ->option_text("PICTURE");
    verb.add_flag("--json", options.json, "For programs: what changed, every number in full");
}

std::string footerOf(EditWords const& words, bool draws) {
    return words.notes +
           "A time is VALUE/TIMESCALE (1001/24000), seconds (0.5) or frames of the file (12f).\n"
           "Locked channels stay as they are. Without CHANNEL all channels are edited; the others are "
           "written as they are.\n"
           "A BVH has frames as long as those of FILE, from 0, or from the first keypoint before it, to "
           "the last.\n"
           "A document keeps all else that it holds. A CSV has " +
           (draws ? "the rows of the input" : "a row for each keypoint") +
           ", if --rows doesn't say otherwise.\n\nExample: " + words.example;
}

} // namespace

Tempus comparedStep(ChannelFile const& file, TimeSpan const& span, std::optional<Tempus> const& sampleStep) {
    Tempus step =
        TempusIsNumeric(file.frameDuration) ? file.frameDuration : (span.to - span.from) / kStepsOfUnevenRows;
    if (sampleStep) {
        step = TempusMinimum(step, *sampleStep);
    }
    step = step / kComparedPerStep;
    return step > kTempusZero ? step : TempusMake(1, 1);
}

Verb declareEdit(CLI::App& program, std::shared_ptr<EditVerb> const& verb) {
    auto const options = std::make_shared<EditOptions>();
    EditWords const words = verb->words();
    CLI::App* const arguments = program.add_subcommand(words.name, words.description);
    addCommonOptions(*arguments, *options);
    verb->addOptions(*arguments);
    arguments->footer(footerOf(words, verb->sampleStep().has_value()));
    return {arguments,
            "FILE [CHANNEL...] " + words.usage + (words.usage.empty() ? "" : " ") +
                "(-o OUT.lumen|csv|bvh | --in-place) [--force] [--from T] [--to T] [--rows input|keypoints] "
                "[--plot PICTURE.svg|png|pdf] [--frame-rate R] [--json]",
            [verb, options](OutputSink& out) { EditRun(*verb, *options).run(out); }};
}

void StepOption::add(CLI::App& verb, std::string const& help) {
    verb.add_option("--step", _text, help + " (else at every frame or row)")->option_text("T");
}

void StepOption::read() { _wanted = TimeArgument::parseIfGiven(_text); }

void StepOption::prepare(ChannelFile const& file, TimeSpan const& span) {
    _step = _wanted ? _wanted->resolve(file.frameDuration) : file.frameDuration;
    if (file.rows < 2 && !TempusIsNumeric(_step)) {
        _step = TempusMake(1, 1); // there is nothing to reshape
    }
    if (!TempusIsNumeric(_step)) {
        throw UsageError{"the rows of the file aren't evenly spaced: say --step"};
    }
    if (!(_step > kTempusZero)) {
        throw UsageError{"--step must be above 0"};
    }
    if (TempusFloorQuotient(span.to - span.from, _step) >= KFCurve::kMostShapeSamples) {
        throw UsageError{"the stretch has more than " + std::to_string(KFCurve::kMostShapeSamples) +
                         " steps; take longer ones"};
    }
}

} // namespace lumenkey::tools
