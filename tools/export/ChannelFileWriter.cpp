#include "tools/export/ChannelFileWriter.h"

#include "lumenkey/Channels/KFChannelFlags.h"
#include "tools/check/DocumentCheck.h"
#include "tools/curve/Keypoint.h"
#include "tools/export/DocumentWriter.h"
#include "tools/export/MotionFrames.h"
#include "tools/export/MotionSkeleton.h"
#include "tools/output/CsvWriter.h"
#include "tools/output/SafeOutputFile.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <limits>
#include <optional>
#include <utility>

namespace lumenkey::tools {

namespace {

using Node = ChannelTree::Node;

constexpr double kNoValue = std::numeric_limits<double>::quiet_NaN();

/// The keypoints of a channel that are seen, in the order of time, one at a time.
struct KeypointColumn {
    Node channel;
    std::vector<Tempus> times;
    std::vector<double> values;
    /// Those that have no place in a column: behind a later one, or at the time of another.
    std::vector<Tempus> others;
};

KeypointColumn keypointsOf(Node channel, KFSpline* spline) {
    KeypointColumn column{channel, {}, {}, {}};
    if (spline == nullptr) {
        return column;
    }
    for (void* const handle : everyKeypointHandle(*spline)) {
        Keypoint const key = readKeypoint(*spline, handle);
        if (!key.enabled) {
            continue;
        }
        if (!column.times.empty() && !(column.times.back() < key.time)) {
            column.others.push_back(key.time);
            continue;
        }
        column.times.push_back(key.time);
        column.values.push_back(key.value);
    }
    return column;
}

std::vector<Tempus> timesOfInput(ChannelFile const& file) {
    if (file.format == ChannelFormat::Csv) {
        return file.rowTimes;
    }
    std::vector<Tempus> times;
    times.reserve(file.rows);
    for (std::size_t frame = 0; frame < file.rows; ++frame) {
        times.push_back(file.skeleton.timeOfFrame(frame));
    }
    return times;
}

std::vector<Tempus> timesOfKeypoints(std::vector<KeypointColumn> const& columns) {
    std::vector<Tempus> times;
    for (KeypointColumn const& column : columns) {
        std::vector<Tempus> joined;
        joined.reserve(times.size() + column.times.size());
        std::set_union(times.begin(), times.end(), column.times.begin(), column.times.end(),
                       std::back_inserter(joined));
        times = std::move(joined);
    }
    return times;
}

/// At the times of rows, which ascend: the value of the keypoint there, or none.
std::vector<double> cellsOfKeypoints(KeypointColumn const& column, std::vector<Tempus> const& rows) {
    std::vector<double> cells(rows.size(), kNoValue);
    std::size_t key = 0;
    for (std::size_t row = 0; row < rows.size(); ++row) {
        while (key < column.times.size() && column.times[key] < rows[row]) {
            ++key;
        }
        if (key < column.times.size() && column.times[key] == rows[row]) {
            cells[row] = column.values[key];
        }
    }
    return cells;
}

/// The same, with the value of the curve between the keypoints.
std::vector<double> cellsOfCurve(KeypointColumn const& column, KFCurve& curve,
                                 std::vector<Tempus> const& rows) {
    std::vector<double> cells(rows.size(), kNoValue);
    for (std::size_t row = 0; row < rows.size() && !column.times.empty(); ++row) {
        if (!(rows[row] < column.times.front()) && !(column.times.back() < rows[row])) {
            cells[row] = curve.getValue(rows[row], 0.0);
        }
    }
    return cells;
}

void writeRows(std::vector<std::vector<double>> const& columns, std::vector<Tempus> const& times,
               CsvWriter& csv, ReadingProgress const& progress) {
    for (std::size_t row = 0; row < times.size(); ++row) {
        csv.field(timeText(times[row]));
        csv.number(TempusGetSeconds(times[row]));
        for (std::vector<double> const& column : columns) {
            csv.number(column[row]); // an empty cell where there is none
        }
        csv.endRow();
        if (progress) {
            progress(static_cast<double>(row) / static_cast<double>(times.size()));
        }
    }
}

/// All channels; of a document only those with keypoints that are seen: it has many others. If there are none,
/// all as they are at time zero.
std::vector<KeypointColumn> columnsOfTable(ChannelFile const& file) {
    std::vector<KeypointColumn> columns;
    for (Node const channel : file.tree->channelsBelow(ChannelTree::kTop)) {
        columns.push_back(keypointsOf(channel, file.tree->spline(channel)));
    }
    if (file.format != ChannelFormat::Document) {
        return columns;
    }
    auto const isEmpty = [](KeypointColumn const& column) { return column.times.empty(); };
    if (!std::all_of(columns.begin(), columns.end(), isEmpty)) {
        std::erase_if(columns, isEmpty);
        return columns;
    }
    for (KeypointColumn& column : columns) {
        column.times = {kTempusZero};
        column.values = {file.tree->curve(column.channel).getValue(kTempusZero, 0.0)};
    }
    return columns;
}

/// A table has times of one kind that ascend, and text.
void requireReadable(FileToWrite const& wanted, std::string const& name, KeypointColumn const& column) {
    auto const isInTable = [](Tempus const& time) { return TempusIsNumeric(time) && time.epoch == 0; };
    if (!std::all_of(column.times.begin(), column.times.end(), isInTable) ||
        !std::all_of(column.others.begin(), column.others.end(), isInTable)) {
        throw OutputError{wanted.target,
                          "a table can't hold the time of a keypoint of '" + printableText(name) + "'"};
    }
    if (!column.others.empty() && !wanted.acceptsLoss) {
        throw OutputError{wanted.target,
                          "a table holds one keypoint at a time, in the order of time: one of '" +
                              printableText(name) + "' at " + timeText(column.others.front()) +
                              " s has no place in it; --force writes it without"};
    }
    if (name.find('\0') != std::string::npos) {
        throw OutputError{wanted.target, "a table can't hold the name '" + printableText(name) + "'"};
    }
}

WrittenRows writeTable(FileToWrite const& wanted, OutputSink& out, ReadingProgress const& progress) {
    ChannelTree& tree = *wanted.file.tree;
    std::vector<KeypointColumn> const keypoints = columnsOfTable(wanted.file);
    if (keypoints.empty()) {
        throw OutputError{wanted.target, "it has no channels, of which a table must have one"};
    }
    CsvWriter csv(out);
    csv.field("time");
    csv.field("seconds");
    for (KeypointColumn const& column : keypoints) {
        std::string const name = tree.dottedName(column.channel);
        requireReadable(wanted, name, column);
        csv.name(name);
    }
    csv.endRow();
    bool const isByKeypoints =
        wanted.rows == RowsOf::Keypoints || wanted.file.format == ChannelFormat::Document;
    std::vector<Tempus> const times = isByKeypoints ? timesOfKeypoints(keypoints) : timesOfInput(wanted.file);
    checkWrittenValues(wanted, times.size(), keypoints.size());
    std::vector<bool> isEdited(tree.count());
    for (Node const channel : wanted.edited) {
        isEdited[channel] = true;
    }
    std::vector<std::vector<double>> columns;
    for (KeypointColumn const& column : keypoints) {
        columns.push_back(isByKeypoints || !isEdited[column.channel]
                              ? cellsOfKeypoints(column, times)
                              : cellsOfCurve(column, tree.curve(column.channel), times));
    }
    writeRows(columns, times, csv, progress);
    csv.finish();
    return {times.size(), times.empty() ? kTempusZero : times.front()};
}

/// What a reader passes over, and what a writer leaves out; empty for nothing.
std::string firstLossIn(ChannelFile const& document, ReadingProgress const& progress) {
    std::string const name = printableText(document.file);
    if (std::pair(document.document.major, document.document.minor) >
        std::pair(kWrittenMajor, kWrittenMinor)) {
        return name + ": version " + document.document.versionText() + " is newer than what is written";
    }
    for (DocumentFinding const& finding : document.document.text
                                              ? checkDocumentText(*document.document.text, progress)
                                              : checkDocument(document.file, progress)) {
        if (finding.isLoss) {
            return name + ":" + std::to_string(finding.place.line) + ":" +
                   std::to_string(finding.place.column) + ": " + printableText(finding.what);
        }
    }
    ChannelTree const& tree = *document.tree;
    for (Node node = ChannelTree::kTop + 1; node < tree.count(); ++node) {
        bool const isLeftOut = tree.base(node).testFlag(kChannelFlagNotSaved) ||
                               tree.asFolder(tree.parent(node))->testFoldFlag(kFoldFlagChildrenNotSaved);
        if (isLeftOut) {
            return name + ": documents leave out the channel '" + printableText(tree.dottedName(node)) + "'";
        }
    }
    return {};
}

bool isToBeLookedThrough(FileToWrite const& wanted) {
    return wanted.file.format == ChannelFormat::Document && !wanted.acceptsLoss;
}

/// Tells the share of a part of the work as that of the whole.
ReadingProgress partOf(ReadingProgress const& whole, double from, double to) {
    if (!whole) {
        return {};
    }
    return [&whole, from, to](double share) { whole(from + (to - from) * share); };
}

void checkNothingIsLost(FileToWrite const& wanted, ReadingProgress const& progress) {
    std::string const loss = firstLossIn(wanted.file, progress);
    if (!loss.empty()) {
        throw OutputError{wanted.target, "not written, since something would be lost: " + loss +
                                             "; --force writes it without"};
    }
}

WrittenRows writeWholeDocument(FileToWrite const& wanted, OutputSink& out, ReadingProgress const& progress) {
    bool const isLookedThrough = isToBeLookedThrough(wanted);
    if (isLookedThrough) {
        checkNothingIsLost(wanted, partOf(progress, 0, 0.5));
    }
    ChannelTree& tree = *wanted.file.tree;
    std::optional<SkeletonChannels> skeleton;
    if (wanted.file.format == ChannelFormat::Motion) {
        skeleton.emplace(wanted.file.skeleton, tree);
    }
    std::size_t keypoints = 0;
    for (Node const node : tree.channelsBelow(ChannelTree::kTop)) {
        keypoints += tree.curve(node).getNumberOfKeypoints();
    }
    writeDocument(tree.base(ChannelTree::kTop), out, tree.count() + keypoints,
                  isLookedThrough ? partOf(progress, 0.5, 1) : progress);
    std::optional<KeypointEnds> const keyed = tree.keyedRange();
    return {keypoints, keyed ? keyed->first : kTempusZero};
}

WrittenRows writeAs(FileToWrite const& wanted, OutputSink& out, ReadingProgress const& progress) {
    switch (wanted.format) {
    case ChannelFormat::Motion:
        return writeMotionOf(wanted, out, progress);
    case ChannelFormat::Document:
        return writeWholeDocument(wanted, out, progress);
    default:
        return writeTable(wanted, out, progress);
    }
}

} // namespace

void checkWrittenValues(FileToWrite const& wanted, std::uint64_t rows, std::size_t columns) {
    if (rows > kMostWrittenValues / std::max<std::size_t>(columns, 1)) {
        throw OutputError{wanted.target,
                          "it would hold more than " + std::to_string(kMostWrittenValues) + " values"};
    }
}

ChannelFile asDocument(ChannelFile const& file, std::string const& name) {
    StringSink document;
    writeWholeDocument({file, ChannelFormat::Document, RowsOf::Input, {}, name}, document, {});
    ChannelFile opened = openChannelText(document.text(), name);
    opened.document.text = document.text();
    opened.file = file.file;
    return opened;
}

WrittenRows writeChannelFile(FileToWrite const& wanted, ReadingProgress const& progress) {
    SafeOutputFile out(wanted.target);
    WrittenRows const rows = writeAs(wanted, out, progress);
    out.close();
    return rows;
}

} // namespace lumenkey::tools
