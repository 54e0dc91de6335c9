#include "tools/cli/EditReport.h"

#include "tools/output/JsonWriter.h"
#include "tools/output/Table.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <array>
#include <charconv>

namespace lumenkey::tools {

namespace {

struct KeypointTotals {
    std::size_t before = 0;
    std::size_t after = 0;

    bool areEqual() const { return before == after; }
    double ratio() const { return static_cast<double>(before) / static_cast<double>(after); }
};

KeypointTotals totalsOf(std::vector<EditedChannel> const& channels) {
    KeypointTotals totals;
    for (EditedChannel const& channel : channels) {
        totals.before += channel.keypointsBefore;
        totals.after += channel.keypointsAfter;
    }
    return totals;
}

std::string ratioText(KeypointTotals const& totals) {
    std::array<char, 400> buffer{};
    auto const result = std::to_chars(buffer.data(), buffer.data() + buffer.size(), totals.ratio(),
                                      std::chars_format::fixed, 2);
    return std::string(buffer.data(), result.ptr);
}

/// The channel of each unit that changed most, in the order in which units first occur.
std::vector<EditedChannel const*> mostChanged(std::vector<EditedChannel> const& channels) {
    std::vector<EditedChannel const*> most;
    for (EditedChannel const& channel : channels) {
        auto const place = std::find_if(most.begin(), most.end(), [&](EditedChannel const* other) {
            return other->unit == channel.unit;
        });
        if (place == most.end()) {
            most.push_back(&channel);
        } else if (channel.change.most > (*place)->change.most) {
            *place = &channel;
        }
    }
    return most;
}

std::string keypointsText(KeypointTotals const& totals) {
    std::string text = std::to_string(totals.before) + " before, " + std::to_string(totals.after) + " after";
    return totals.after == 0 || totals.areEqual() ? text : text + ", " + ratioText(totals) + " to 1";
}

std::string countedIn(ChannelFormat format) {
    return format == ChannelFormat::Motion     ? "frames"
           : format == ChannelFormat::Document ? "keypoints"
                                               : "rows";
}

void writeChannelJson(JsonWriter& json, EditedChannel const& channel, std::string const& difference) {
    json.beginObject(JsonLayout::Inline);
    json.key("channel");
    json.string(channel.channel);
    json.key("unit");
    json.string(channel.unit);
    json.key("keypointsBefore");
    json.integer(channel.keypointsBefore);
    json.key("keypointsAfter");
    json.integer(channel.keypointsAfter);
    json.key(difference);
    json.number(channel.change.most);
    json.key("at");
    json.string(timeText(channel.change.at));
    json.endObject();
}

} // namespace

std::string EditReport::summary() const {
    std::string text = "keypoints " + keypointsText(totalsOf(channels)) + "; " + words.difference();
    for (EditedChannel const* const channel : mostChanged(channels)) {
        text += (channel == mostChanged(channels).front() ? " " : ", ") + tableText(channel->change.most) +
                " " + channel->unit;
    }
    return text;
}

void EditReport::writeTable(OutputSink& out) const {
    std::size_t const width = words.difference().size() + 2;
    auto const line = [&](std::string label, std::string const& text) {
        label.resize(width, ' ');
        out.write(label + text + "\n");
    };
    line("keypoints", keypointsText(totalsOf(channels)));
    for (EditedChannel const* const channel : mostChanged(channels)) {
        line(words.difference(), tableText(channel->change.most) + " " + channel->unit + ", of " +
                                     printableText(channel->channel) + " at " +
                                     tableText(TempusGetSeconds(channel->change.at)) + " s");
    }
    line("stretch", timeText(span.from) + " s to " + timeText(span.to) + " s");
    line("written", printableText(output) + ", " + std::to_string(written.count) + " " + countedIn(format) +
                        " from " + timeText(written.start) + " s on\n");
    Table table;
    table.columns = {{"channel"},
                     {"unit"},
                     {"before", Align::Right},
                     {"after", Align::Right},
                     {words.difference(), Align::Right}};
    table.rowCount = channels.size();
    table.cell = [this](std::size_t row, std::size_t column) -> std::string {
        EditedChannel const& channel = channels[row];
        switch (column) {
        case 0:
            return channel.channel;
        case 1:
            return channel.unit;
        case 2:
            return std::to_string(channel.keypointsBefore);
        case 3:
            return std::to_string(channel.keypointsAfter);
        default:
            return tableText(channel.change.most);
        }
    };
    table.write(out);
}

void EditReport::writeJson(OutputSink& out) const {
    std::string const difference = words.keepsShape ? "worstError" : "largestChange";
    KeypointTotals const totals = totalsOf(channels);
    JsonWriter json(out);
    json.beginObject();
    json.key("verb");
    json.string(words.name);
    json.key("output");
    json.string(output);
    json.key(format == ChannelFormat::Document ? "written" : countedIn(format));
    json.integer(written.count);
    json.key("start");
    json.string(timeText(written.start));
    json.key("from");
    json.string(timeText(span.from));
    json.key("to");
    json.string(timeText(span.to));
    json.key("keypointsBefore");
    json.integer(totals.before);
    json.key("keypointsAfter");
    json.integer(totals.after);
    json.key("ratio");
    json.number(totals.ratio());
    json.key("channels");
    json.beginArray();
    for (EditedChannel const& channel : channels) {
        writeChannelJson(json, channel, difference);
    }
    json.endArray();
    json.endObject();
    json.finish();
}

} // namespace lumenkey::tools
