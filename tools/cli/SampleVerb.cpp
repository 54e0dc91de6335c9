#include "tools/cli/Verbs.h"

#include "tools/cli/MotionInput.h"
#include "tools/cli/Progress.h"
#include "tools/cli/TimeArgument.h"
#include "tools/cli/UsageError.h"
#include "tools/curve/SampleTimes.h"
#include "tools/output/CsvWriter.h"
#include "tools/output/JsonWriter.h"
#include "tools/output/Table.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <cstdint>
#include <memory>
#include <optional>

namespace lumenkey::tools {

namespace {

/// Values and slopes are held in memory until they are written: eight bytes for each.
constexpr std::uint64_t kMostValues = 10'000'000;

struct SampleOptions {
    std::string file;
    std::vector<std::string> channels;
    std::string at;
    std::string from;
    std::string to;
    std::string step;
    std::uint64_t count = 0;
    bool slope = false;
    bool json = false;
    bool csv = false;
};

/// The options about times once their texts are read, which is before any file is.
struct TimeWishes {
    explicit TimeWishes(SampleOptions const& options) : count(options.count) {
        auto const read = [](std::string const& text) {
            return text.empty() ? std::nullopt : std::optional(TimeArgument::parse(text));
        };
        if (!options.at.empty()) {
            at = TimeArgument::parseList(options.at);
        }
        from = read(options.from);
        to = read(options.to);
        step = read(options.step);
        if (at.empty() && !step && count == 0) {
            throw UsageError{"say at which times: --at, --step or --count"};
        }
    }

    std::vector<TimeArgument> at;
    std::optional<TimeArgument> from;
    std::optional<TimeArgument> to;
    std::optional<TimeArgument> step;
    std::uint64_t count;
};

void checkAmount(std::uint64_t times, std::uint64_t columns) {
    if (times > kMostValues / columns) {
        throw UsageError{"that is more than " + std::to_string(kMostValues) +
                         " values, all channels taken together; take fewer times or channels"};
    }
}

SampleTimes timesBetween(TimeWishes const& wishes, MotionInput const& input, std::uint64_t columns) {
    Tempus const frame = input.motion().frameDuration;
    Tempus const from = wishes.from ? wishes.from->resolve(frame) : kTempusZero;
    Tempus const to = wishes.to ? wishes.to->resolve(frame) : input.lastKeypoint();
    if (to < from) {
        throw UsageError{"--to lies before --from"};
    }
    if (!wishes.step) {
        checkAmount(wishes.count, columns);
        return SampleTimes::spread(from, to, wishes.count);
    }
    Tempus const step = wishes.step->resolve(frame);
    if (step <= kTempusZero) {
        throw UsageError{"--step must be above 0"};
    }
    auto const steps = static_cast<std::uint64_t>(TempusFloorQuotient(to - from, step));
    checkAmount(steps, columns); // without the one more, which could overflow
    checkAmount(steps + 1, columns);
    return SampleTimes::row(from, step, steps + 1);
}

SampleTimes timesFor(TimeWishes const& wishes, MotionInput const& input, std::uint64_t columns) {
    if (wishes.at.empty()) {
        return timesBetween(wishes, input, columns);
    }
    std::vector<Tempus> times;
    for (TimeArgument const& time : wishes.at) {
        times.push_back(time.resolve(input.motion().frameDuration));
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

std::vector<Series> readSeries(MotionInput const& input, std::vector<std::size_t> const& channels,
                               SampleTimes const& times, bool slope) {
    Progress bar("sampling");
    std::vector<Series> all;
    for (std::size_t const channel : channels) {
        auto const made = input.channels().makeSpline(channel);
        Series series{input.channels().name(channel),
                      std::string(input.channels().unit(channel)),
                      times.values(made->spline),
                      {}};
        if (slope) {
            series.slopes = times.slopes(made->spline);
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

std::vector<NumberColumn> columnsOf(std::vector<Series> const& all, bool withUnits) {
    std::vector<NumberColumn> columns;
    for (Series const& series : all) {
        columns.push_back({series.channel + (withUnits ? " (" + series.unit + ")" : ""), series.values});
        if (!series.slopes.empty()) {
            columns.push_back(
                {withUnits ? "slope (" + series.unit + "/s)" : series.channel + " slope", series.slopes});
        }
    }
    return columns;
}

void writeCsv(std::vector<Series> const& all, SampleTimes const& times, OutputSink& out) {
    std::vector<NumberColumn> const columns = columnsOf(all, false);
    Progress bar("writing", ProgressOf::Output);
    CsvWriter csv(out);
    csv.field("time");
    csv.field("seconds");
    for (NumberColumn const& column : columns) {
        csv.field(column.title);
    }
    csv.endRow();
    for (std::size_t i = 0; i < times.count(); ++i) {
        csv.field(timeText(times.at(i)));
        csv.field(shortestText(TempusGetSeconds(times.at(i))));
        for (NumberColumn const& column : columns) {
            csv.field(shortestText(column.numbers[i]));
        }
        csv.endRow();
        bar.update(static_cast<double>(i) / static_cast<double>(times.count()));
    }
}

void writeTable(std::vector<Series> const& all, SampleTimes const& times, OutputSink& out) {
    std::vector<NumberColumn> const columns = columnsOf(all, true);
    Table table;
    table.columns = {{"time", Align::Right}, {"seconds", Align::Right}};
    for (NumberColumn const& column : columns) {
        table.columns.push_back({column.title, Align::Right});
    }
    table.rowCount = times.count();
    Progress bar("writing", ProgressOf::Output);
    double asked = 0;
    table.cell = [&](std::size_t row, std::size_t column) {
        switch (column) {
        case 0:
            bar.update(++asked / (2 * static_cast<double>(times.count()))); // a table is asked for twice
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
    MotionInput const input(options.file);
    std::vector<std::size_t> const channels = input.channelsNamed(options.channels);
    SampleTimes const times = timesFor(wishes, input, channels.size() * (options.slope ? 2 : 1));
    std::vector<Series> const all = readSeries(input, channels, times, options.slope);
    if (options.json) {
        writeJson(all, times, out);
    } else if (options.csv) {
        writeCsv(all, times, out);
    } else {
        writeTable(all, times, out);
    }
}

} // namespace

Verb declareSample(CLI::App& program) {
    auto const options = std::make_shared<SampleOptions>();
    CLI::App* const verb = program.add_subcommand("sample", "Read channels at any times");
    verb->add_option("FILE", options->file, "The motion capture file (BVH)")->option_text(" ")->required();
    verb->add_option("CHANNEL", options->channels, "Names of channels, as info lists them")
        ->option_text("...")
        ->required();
    auto* const at =
        verb->add_option("--at", options->at, "Times, with commas between them")->option_text("T[,T...]");
    auto* const from = verb->add_option("--from", options->from, "The first time (else 0)")->option_text("T");
    auto* const to = verb->add_option("--to", options->to, "The last time (else that of the last keypoint)")
                         ->option_text("T");
    auto* const step = verb->add_option("--step", options->step, "Read at every step from the first time on")
                           ->option_text("T");
    auto* const count = verb->add_option("--count", options->count, "Read so many times, evenly spread")
                            ->check(CLI::PositiveNumber)
                            ->option_text("N");
    for (CLI::Option* const other : {from, to, step, count}) {
        at->excludes(other);
    }
    step->excludes(count);
    verb->add_flag("--slope", options->slope, "Tell the slope too, by the second");
    auto* const json = verb->add_flag("--json", options->json, "For programs: every number in full");
    verb->add_flag("--csv", options->csv, "A row for each time, a column for each channel")->excludes(json);
    verb->footer("A time is VALUE/TIMESCALE (1001/24000), seconds (0.5) or frames of the file (12f).\n"
                 "At most 10000000 values are read at once.\n\n"
                 "Example: lumenkey sample walk.bvh Hips.Yposition --step 1/24 --csv");
    return {verb,
            "FILE CHANNEL... (--at T[,T...] | [--from T] [--to T] (--step T | --count N)) [--slope] [--json "
            "| --csv]",
            [options](OutputSink& out) { runSample(*options, out); }};
}

} // namespace lumenkey::tools
