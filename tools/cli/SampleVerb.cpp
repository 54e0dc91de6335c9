#include "tools/cli/Verbs.h"

#include "tools/cli/ChannelInput.h"
#include "tools/cli/Progress.h"
#include "tools/cli/Stretches.h"
#include "tools/cli/TimeArgument.h"
#include "tools/cli/UsageError.h"
#include "tools/cli/WholeNumber.h"
#include "tools/curve/SampleTimes.h"
#include "tools/output/CsvWriter.h"
#include "tools/output/JsonWriter.h"
#include "tools/output/Table.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdint>
#include <memory>
#include <optional>

namespace lumenkey::tools {

namespace {

/// Values and slopes are held in memory until they are written: eight bytes for each. CSV goes out in blocks
/// of times, so there this many times are taken, whatever the number of channels.
constexpr std::uint64_t kMostValues = 10'000'000;
constexpr std::size_t kValuesInBlock = 65'536;

struct SampleOptions {
    InputOptions input;
    std::vector<std::string> channels;
    std::string at;
    std::string from;
    std::string to;
    std::string step;
    std::string rate;
    std::uint64_t count = 0;
    bool slope = false;
    bool json = false;
    bool csv = false;
};

/// The options about times once their texts are read, which is before any file is.
struct TimeWishes {
    explicit TimeWishes(SampleOptions const& options) : count(options.count) {
        if (!options.at.empty()) {
            at = TimeArgument::parseList(options.at);
        }
        from = TimeArgument::parseIfGiven(options.from);
        to = TimeArgument::parseIfGiven(options.to);
        step = TimeArgument::parseIfGiven(options.step);
        if (!options.rate.empty()) {
            rateStep = stepOfRate(options.rate);
        }
        if (at.empty() && !step && !rateStep && count == 0) {
            throw UsageError{"say at which times: --at, --step, --rate or --count"};
        }
    }

    std::vector<TimeArgument> at;
    std::optional<TimeArgument> from;
    std::optional<TimeArgument> to;
    std::optional<TimeArgument> step;
    /// The step that a rate makes.
    std::optional<Tempus> rateStep;
    std::uint64_t count;
};

void checkAmount(std::uint64_t times, std::uint64_t columns) {
    if (times > kMostValues / columns) {
        throw UsageError{"that is more than " + std::to_string(kMostValues) +
                         " values, all channels taken together (as CSV, times); take fewer"};
    }
}

SampleTimes timesBetween(TimeWishes const& wishes, ChannelFile const& file, std::uint64_t columns) {
    Tempus const frame = file.frameDuration;
    Tempus const from = wishes.from ? wishes.from->resolve(frame) : file.firstTime;
    Tempus const to = wishes.to ? wishes.to->resolve(frame) : file.lastTime;
    if (to < from) {
        throw UsageError{"--to lies before --from"};
    }
    if (!wishes.step && !wishes.rateStep) {
        checkAmount(wishes.count, columns);
        return SampleTimes::spread(from, to, wishes.count);
    }
    Tempus const step = wishes.step ? wishes.step->resolve(frame) : *wishes.rateStep;
    if (step <= kTempusZero) {
        throw UsageError{"--step must be above 0"};
    }
    auto const steps = static_cast<std::uint64_t>(TempusFloorQuotient(to - from, step));
    checkAmount(steps, columns); // without the one more, which could overflow
    checkAmount(steps + 1, columns);
    return SampleTimes::row(from, step, steps + 1);
}

SampleTimes timesFor(TimeWishes const& wishes, ChannelFile const& file, std::uint64_t columns) {
    if (wishes.at.empty()) {
        return timesBetween(wishes, file, columns);
    }
    std::vector<Tempus> times;
    for (TimeArgument const& time : wishes.at) {
        times.push_back(time.resolve(file.frameDuration));
    }
    checkAmount(times.size(), columns);
    return SampleTimes::list(std::move(times));
}

/// One channel, read at all times.
struct Series {
    std::string channel;
    std::string unit;
    std::vector<double> values;
    /// Empty unless asked for.
    std::vector<double> slopes;
};

std::vector<Series> readSeries(ChannelTree const& tree, std::vector<ChannelTree::Node> const& channels,
                               SampleTimes const& times, bool slope) {
    Progress bar("sampling");
    std::vector<Series> all;
    for (ChannelTree::Node const channel : channels) {
        Series series{
            tree.dottedName(channel), std::string(tree.unit(channel)), times.values(tree.curve(channel)), {}};
        if (slope) {
            series.slopes = times.slopes(tree.spline(channel));
        }
        all.push_back(std::move(series));
        bar.update(static_cast<double>(all.size()) / static_cast<double>(channels.size()));
    }
    return all;
}

void writePoint(JsonWriter& json, Tempus const& time, Series const& series, std::size_t i) {
    json.beginObject(JsonLayout::Inline);
    json.key("time");
    json.string(timeText(time));
    json.key("seconds");
    json.number(TempusGetSeconds(time));
    json.key("value");
    json.number(series.values[i]);
    if (!series.slopes.empty()) {
        json.key("slope");
        json.number(series.slopes[i]);
    }
    json.endObject();
}

void writeJson(std::vector<Series> const& all, SampleTimes const& times, OutputSink& out) {
    Progress bar("writing", ProgressOf::Output);
    double const total = static_cast<double>(all.size()) * static_cast<double>(times.count());
    double written = 0;
    JsonWriter json(out);
    json.beginObject();
    json.key("series");
    json.beginArray();
    for (Series const& series : all) {
        json.beginObject();
        json.key("channel");
        json.string(series.channel);
        json.key("points");
        json.beginArray();
        for (std::size_t i = 0; i < times.count(); ++i) {
            writePoint(json, times.at(i), series, i);
            bar.update(++written / total);
        }
        json.endArray();
        json.endObject();
    }
    json.endArray();
    json.endObject();
    json.finish();
}

/// A column of values or slopes, for tables.
struct NumberColumn {
    std::string title;
    std::vector<double> const& numbers;
};

std::vector<NumberColumn> columnsOf(std::vector<Series> const& all) {
    std::vector<NumberColumn> columns;
    for (Series const& series : all) {
        columns.push_back({series.channel + " (" + series.unit + ")", series.values});
        if (!series.slopes.empty()) {
            columns.push_back({"slope (" + series.unit + "/s)", series.slopes});
        }
    }
    return columns;
}

void writeCsvTitles(CsvWriter& csv, ChannelTree const& tree, std::vector<ChannelTree::Node> const& channels,
                    bool slope) {
    csv.field("time");
    csv.field("seconds");
    for (ChannelTree::Node const channel : channels) {
        std::string const name = tree.dottedName(channel);
        csv.name(name);
        if (slope) {
            csv.field(name + " slope");
        }
    }
    csv.endRow();
    csv.finish();
}

/// A stretch of the times, all columns: `values[column * height + row]`.
struct CsvBlock {
    std::size_t first = 0;
    std::size_t rows = 0;
    std::size_t height = 0;
    std::size_t columns = 0;
    std::vector<double> values;
    /// The rows as text, a stretch of them for each thread.
    std::vector<StringSink> texts;
};

/// Fewer values than these aren't worth a thread.
constexpr std::size_t kValuesForAThread = 4'096;

void readBlock(CsvBlock& block, ChannelTree const& tree, std::vector<ChannelTree::Node> const& channels,
               SampleTimes const& times, bool slope) {
    std::size_t const each = block.columns / channels.size();
    std::size_t const least = kValuesForAThread / (block.rows * each) + 1;
    auto const readChannels = [&](std::size_t, std::size_t begin, std::size_t end) {
        for (std::size_t i = begin; i < end; ++i) {
            double* const column = block.values.data() + i * each * block.height;
            times.readValues(tree.curve(channels[i]), block.first, block.rows, column);
            if (slope) {
                times.readSlopes(tree.spline(channels[i]), block.first, block.rows, column + block.height);
            }
        }
    };
    forStretches(channels.size(), stretchesFor(channels.size(), least), readChannels);
}

void writeBlock(CsvBlock& block, SampleTimes const& times, OutputSink& out) {
    constexpr std::size_t usualBytes = 20; // of a number
    std::size_t const stretches = stretchesFor(block.rows, kValuesForAThread / block.columns + 1);
    block.texts.resize(stretches);
    for (StringSink& text : block.texts) {
        text.clear();
        text.reserve((block.rows / stretches + 1) * (block.columns + 2) * usualBytes);
    }
    forStretches(block.rows, stretches, [&](std::size_t stretch, std::size_t begin, std::size_t end) {
        CsvWriter csv(block.texts[stretch]);
        for (std::size_t row = begin; row < end; ++row) {
            Tempus const time = times.at(block.first + row);
            csv.field(timeText(time));
            csv.number(TempusGetSeconds(time));
            for (std::size_t i = 0; i < block.columns; ++i) {
                csv.number(block.values[i * block.height + row]);
            }
            csv.endRow();
        }
        csv.finish();
    });
    for (StringSink const& text : block.texts) {
        out.write(text.text());
    }
}

/// Reads block by block, column by column, and writes row by row, on all processors.
void writeCsv(ChannelTree const& tree, std::vector<ChannelTree::Node> const& channels,
              SampleTimes const& times, bool slope, OutputSink& out) {
    Progress bar("writing", ProgressOf::Output);
    CsvWriter titles(out);
    writeCsvTitles(titles, tree, channels, slope);
    CsvBlock block;
    block.columns = channels.size() * (slope ? 2 : 1);
    block.height = std::min(std::max<std::size_t>(kValuesInBlock / block.columns, 16), times.count());
    block.values.resize(block.height * block.columns);
    for (; block.first < times.count(); block.first += block.height) {
        block.rows = std::min(block.height, times.count() - block.first);
        readBlock(block, tree, channels, times, slope);
        writeBlock(block, times, out);
        bar.update(static_cast<double>(block.first + block.rows) / static_cast<double>(times.count()));
    }
}

void writeTable(std::vector<Series> const& all, SampleTimes const& times, OutputSink& out) {
    std::vector<NumberColumn> const columns = columnsOf(all);
    Table table;
    table.columns = {{"time", Align::Right}, {"seconds", Align::Right}};
    for (NumberColumn const& column : columns) {
        table.columns.push_back({column.title, Align::Right});
    }
    table.rowCount = times.count();
    Progress bar("writing", ProgressOf::Output);
    table.progress = bar.teller();
    table.cell = [&](std::size_t row, std::size_t column) {
        switch (column) {
        case 0:
            return timeText(times.at(row));
        case 1:
            return tableText(TempusGetSeconds(times.at(row)));
        default:
            return tableText(columns[column - 2].numbers[row]);
        }
    };
    table.write(out);
}

void runSample(SampleOptions const& options, OutputSink& out) {
    TimeWishes const wishes(options);
    ChannelInput const input(options.input);
    std::vector<ChannelTree::Node> const channels = input.channelsNamed(options.channels);
    std::uint64_t const columns = channels.size() * (options.slope ? 2 : 1);
    SampleTimes const times = timesFor(wishes, input.file(), options.csv ? 1 : columns);
    if (options.csv) {
        writeCsv(input.tree(), channels, times, options.slope, out);
        return;
    }
    std::vector<Series> const all = readSeries(input.tree(), channels, times, options.slope);
    if (options.json) {
        writeJson(all, times, out);
    } else {
        writeTable(all, times, out);
    }
}

} // namespace

Verb declareSample(CLI::App& program) {
    auto const options = std::make_shared<SampleOptions>();
    CLI::App* const verb = program.add_subcommand("sample", "Read channels at any times");
    options->input.add(*verb);
    verb->add_option("CHANNEL", options->channels, kChannelHelp)->option_text("...");
    auto* const at =
        verb->add_option("--at", options->at, "Times, with commas between them")->option_text("T[,T...]");
    auto* const from =
        verb->add_option("--from", options->from, "The first time (else the first of the file)")
            ->option_text("T");
    auto* const to =
        verb->add_option("--to", options->to, "The last time (else the last of the file)")->option_text("T");
    auto* const step = verb->add_option("--step", options->step, "Read at every step from the first time on")
                           ->option_text("T");
    auto* const rate =
        verb->add_option("--rate", options->rate, "Likewise, so many times a second: 24, 23.976, 24000/1001")
            ->option_text("R");
    auto* const count = verb->add_option("--count", options->count, "Read so many times, evenly spread")
                            ->check(wholeNumberFrom(1))
                            ->option_text("N");
    for (CLI::Option* const other : {from, to, step, rate, count}) {
        at->excludes(other);
    }
    step->excludes(count);
    step->excludes(rate);
    rate->excludes(count);
    verb->add_flag("--slope", options->slope, "Tell the slope too, by the second");
    auto* const json = verb->add_flag("--json", options->json, "For programs: every number in full");
    verb->add_flag("--csv", options->csv, "A row for each time, a column for each channel")->excludes(json);
    verb->footer(
        "A time is VALUE/TIMESCALE (1001/24000), seconds (0.5) or frames of the file (12f).\n"
        "Without CHANNEL all channels are read: at most 10000000 values, as CSV so many times.\n"
        "What --csv writes of ascending times can be read as a FILE; a value that isn't finite is an "
        "empty cell.\n\n"
        "Example: lumenkey sample walk.bvh Hips.Yposition --rate 24 --csv");
    return {
        verb,
        "FILE [CHANNEL...] (--at T[,T...] | [--from T] [--to T] (--step T | --rate R | --count N)) [--slope] "
        "[--frame-rate R] [--json | --csv]",
        [options](OutputSink& out) { runSample(*options, out); }};
}

} // namespace lumenkey::tools
