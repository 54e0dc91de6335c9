#include "tools/export/MotionFrames.h"

#include "tools/curve/SampleTimes.h"
#include "tools/export/MotionSkeleton.h"
#include "tools/export/MotionWriter.h"
#include "tools/import/MotionTree.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

namespace lumenkey::tools {

namespace {

using Node = ChannelTree::Node;

/// Whole frames, numbered from that at time zero.
struct FrameSpan {
    std::int64_t first = 0;
    std::uint64_t count = 0;
};

/// Whether a document without keypoints is a pose, which is one frame, and not the skeleton of a motion that
/// has none.
bool isPose(ChannelFile const& file, std::vector<Node> const& columns) {
    return file.format == ChannelFormat::Document &&
           (!storedFrameDuration(*file.tree) ||
            std::any_of(columns.begin(), columns.end(), [&](Node channel) {
                return file.tree->curve(channel).getValue(kTempusZero, 0.0) != 0;
            }));
}

FrameSpan framesOver(ChannelFile const& file, std::vector<Node> const& columns) {
    if (columns.empty()) {
        return {0, file.rows};
    }
    constexpr std::int64_t farthest = std::int64_t{1} << 52; // beyond what can be written
    std::int64_t begin = 0;
    std::int64_t end = isPose(file, columns) ? 1 : 0;
    for (Node const channel : columns) {
        KFCurve& curve = file.tree->curve(channel);
        Tempus first{};
        Tempus last{};
        if (curve.getNumberOfKeypoints() > 0 && curve.getFirstKeypoint(&first, nullptr) &&
            curve.getLastKeypoint(&last, nullptr)) {
            std::int64_t const floor = TempusFloorQuotient(first, file.frameDuration);
            std::int64_t const ceiling = -std::max(TempusFloorQuotient(-last, file.frameDuration), -farthest);
            begin = std::min(begin, std::max(floor, -farthest));
            end = std::max(end, ceiling + 1);
        }
    }
    return {begin, static_cast<std::uint64_t>(end - begin)};
}

/// The number of degrees that was read as this many radians: of those that give the same bits the one with
/// the shortest text. The quotient alone may be a neighbour of it.
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

DocumentSkeleton skeletonOf(ChannelFile const& file) {
    if (file.format == ChannelFormat::Document) {
        return skeletonOf(*file.tree, file.frameDuration);
    }
    return {file.skeleton, file.columns, {}};
}

} // namespace

WrittenRows writeMotionOf(FileToWrite const& wanted, OutputSink& out, ReadingProgress const& progress) {
    ChannelFile const& file = wanted.file;
    auto [motion, columns, fault] = skeletonOf(file);
    if (!fault.empty()) {
        throw OutputError{wanted.target, "the document is no motion: " + printableText(fault)};
    }
    FrameSpan const span = framesOver(file, columns);
    std::size_t const width = columns.size();
    checkWrittenValues(wanted, span.count, width);
    Tempus const start = file.frameDuration * TempusMake(span.first, 1);
    SampleTimes const times = SampleTimes::row(start, file.frameDuration, span.count);
    motion.frameCount = span.count;
    motion.values.resize(width * span.count);
    for (std::size_t i = 0; i < width; ++i) {
        std::vector<double> const values = times.values(file.tree->curve(columns[i]));
        bool const turns = isRotation(motion.channels[i].kind);
        for (std::size_t frame = 0; frame < span.count; ++frame) {
            double const value = turns ? degreesOf(values[frame]) : values[frame];
            if (!std::isfinite(value)) {
                throw OutputError{wanted.target, "a BVH can't hold the value of '" +
                                                     printableText(file.tree->dottedName(columns[i])) +
                                                     "', which isn't finite in degrees or units"};
            }
            motion.values[frame * width + i] = value;
        }
    }
    writeMotionText(motion, out, progress);
    return {span.count, start};
}

} // namespace lumenkey::tools
