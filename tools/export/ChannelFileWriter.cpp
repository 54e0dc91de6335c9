#include "tools/export/ChannelFileWriter.h"

#include "tools/curve/Keypoint.h"
#include "tools/curve/SampleTimes.h"
#include "tools/export/MotionWriter.h"
#include "tools/import/MotionTree.h"
#include "tools/output/CsvWriter.h"
#include "tools/output/SafeOutputFile.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace lumenkey::tools {

namespace {

using Node = ChannelTree::Node;

constexpr double kNoValue = std::numeric_limits<double>::quiet_NaN();

void checkAmount(FileToWrite const& wanted, std::uint64_t rows, std::size_t columns) {
    if (rows > kMostWrittenValues / std::max<std::size_t>(columns, 1)) {
        throw OutputError{wanted.target,
                          "it would hold more than " + std::to_string(kMostWrittenValues) + " values"};
    }
}

// --- Motions ---

/// Whole frames, numbered from that at time zero.
struct FrameSpan {
    std::int64_t first = 0;
    std::uint64_t count = 0;
};

FrameSpan framesOver(ChannelFile const& file) {
    if (file.columns.empty()) {
        return {0, file.rows};
    }
    constexpr std::int64_t farthest = std::int64_t{1} << 52; // beyond what can be written
    std::int64_t begin = 0;
    std::int64_t end = 0;
    for (Node const channel : file.columns) {
        Tempus first{};
        Tempus last{};
        if (file.tree->channel(channel).getFirstKeyframe(&first, nullptr) &&
            file.tree->channel(channel).getLastKeyframe(&last, nullptr)) {
            std::int64_t const floor = TempusFloorQuotient(first, file.frameDuration);
            std::int64_t const ceiling = -std::max(TempusFloorQuotient(-last, file.frameDuration), -farthest);
            begin = std::min(begin, std::max(floor, -farthest));
            end = std::max(end, ceiling + 1);
        }
    }
    return {begin, static_cast<std::uint64_t>(end - begin)};
}

/// The number of degrees that was read as this many radians: of those that give the same bits the one with the
/// shortest text. The quotient alone may be a neighbour of it.
double degreesOf(double radians) {
    constexpr std::size_t shortText = 12;
    double const nearest = radians / kRadiansOfDegree;
    double best = nearest;
    std::size_t bestLength = nearest * kRadiansOfDegree == radians ? shortestText(nearest).size()
                                                                   : std::numeric_limits<std::size_t>::max();
    double const infinity = std::numeric_limits<double>::infinity();
    double candidate = std::nextafter(std::nextafter(nearest, -infinity), -infinity);
    for (int i = 0; i < 5 && bestLength > shortText; ++i) {
        if (candidate * kRadiansOfDegree == radians) {
            std::size_t const length = shortestText(candidate).size();
            best = length < bestLength ? candidate : best;
            bestLength = std::min(length, bestLength);
        }
        candidate = std::nextafter(candidate, infinity);
    }
    return best;
}

WrittenRows writeMotion(FileToWrite const& wanted, OutputSink& out, ReadingProgress const& progress) {
    ChannelFile const& file = wanted.file;
    FrameSpan const span = framesOver(file);
    std::size_t const width = file.columns.size();
    checkAmount(wanted, span.count, width);
    Tempus const start = file.frameDuration * TempusMake(span.first, 1);
    SampleTimes const times = SampleTimes::row(start, file.frameDuration, span.count);
    Motion motion = file.skeleton;
    motion.frameCount = span.count;
    motion.values.resize(width * span.count);
    for (std::size_t i = 0; i < width; ++i) {
        std::vector<double> const values = times.values(file.tree->curve(file.columns[i]));
        bool const turns = isRotation(motion.channels[i].kind);
        for (std::size_t frame = 0; frame < span.count; ++frame) {
            motion.values[frame * width + i] = turns ? degreesOf(values[frame]) : values[frame];
        }
    }
    writeMotionText(motion, out, progress);
    return {span.count, start};
}

// --- Tables ---

/// The keypoints of a channel, in the order of time.
struct KeypointColumn {
    std::vector<Tempus> times;
    std::vector<double> values;
};

KeypointColumn keypointsOf(KFSpline& spline) {
    KeypointColumn column;
    for (void* const handle : keypointHandles(spline)) {
        Keypoint const key = readKeypoint(spline, handle);
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
            if (std::isnan(column[row])) {
                csv.field("");
            } else {
                csv.number(column[row]);
            }
        }
        csv.endRow();
        if (progress) {
            progress(static_cast<double>(row) / static_cast<double>(times.size()));
        }
    }
}

WrittenRows writeTable(FileToWrite const& wanted, OutputSink& out, ReadingProgress const& progress) {
    ChannelTree& tree = *wanted.file.tree;
    std::vector<Node> const channels = tree.channelsBelow(ChannelTree::kTop);
    std::vector<KeypointColumn> keypoints;
    CsvWriter csv(out);
    csv.field("time");
    csv.field("seconds");
    for (Node const channel : channels) {
        keypoints.push_back(keypointsOf(tree.spline(channel)));
        csv.field(tree.dottedName(channel));
    }
    csv.endRow();
    bool const isByKeypoints = wanted.rows == RowsOf::Keypoints;
    std::vector<Tempus> const times = isByKeypoints ? timesOfKeypoints(keypoints) : timesOfInput(wanted.file);
    checkAmount(wanted, times.size(), channels.size());
    std::vector<bool> isEdited(tree.count());
    for (Node const channel : wanted.edited) {
        isEdited[channel] = true;
    }
    std::vector<std::vector<double>> columns;
    for (std::size_t i = 0; i < channels.size(); ++i) {
        columns.push_back(isByKeypoints || !isEdited[channels[i]]
                              ? cellsOfKeypoints(keypoints[i], times)
                              : cellsOfCurve(keypoints[i], tree.curve(channels[i]), times));
    }
    writeRows(columns, times, csv, progress);
    csv.finish();
    return {times.size(), times.empty() ? kTempusZero : times.front()};
}

} // namespace

WrittenRows writeChannelFile(FileToWrite const& wanted, ReadingProgress const& progress) {
    SafeOutputFile out(wanted.target);
    WrittenRows const rows = wanted.format == ChannelFormat::Motion ? writeMotion(wanted, out, progress)
                                                                    : writeTable(wanted, out, progress);
    out.close();
    return rows;
}

} // namespace lumenkey::tools
