#pragma once

#include "tools/import/ChannelFile.h"
#include "tools/output/OutputSink.h"

#include <cstdint>
#include <string>
#include <vector>

namespace lumenkey::tools {

/// So many numbers at most: they are held in memory until all are written.
inline constexpr std::uint64_t kMostWrittenValues = 200'000'000;

/// Which times the rows of a table have.
enum class RowsOf {
    /// Those of the rows or frames of the file that was opened.
    Input,
    /// Those of the keypoints of all channels.
    Keypoints,
};

/// What is written of a file, and where to.
struct FileToWrite {
    ChannelFile const& file;
    /// A motion only where the file was opened from one, or is a document that holds one.
    ChannelFormat format{};
    /// Of a table.
    RowsOf rows{};
    /// The channels whose keypoints needn't be those of the file any more.
    std::vector<ChannelTree::Node> edited;
    std::string target;
    /// Write a document also without what the reader of another passed over, and a table without keypoints
    /// that have no place in it.
    bool acceptsLoss = false;
};

/// How a file came out.
struct WrittenRows {
    /// Frames of a motion, rows of a table, keypoints of a document.
    std::size_t count = 0;
    /// Of the first one; zero where there is none.
    Tempus start{};
};

/// Replaces the target, as a whole or not at all, by the file as its tree is now. Throws `OutputError`, also
/// for more than `kMostWrittenValues`, and `InputError` where a document can't be read once more.
///
/// The frames of a motion last as long as they did. They reach from time zero, or from before the first
/// keypoint of all channels where that lies before zero, to the last one.
///
/// A table has times, seconds, and a column for each channel. A cell is empty where its channel has nothing
/// to say: with the rows of the keypoints where it has no keypoint; with those of the input, for an edited
/// channel, outside its keypoints. Of a document only channels with keypoints that aren't disabled have
/// a column, and a row stands at each of these; where none has any, all have, and one row is for time zero.
///
/// A document holds the tree; that of a motion, its skeleton too (`SkeletonChannels`). One that comes from
/// another document, in which something was passed over, isn't written: see `FileToWrite::acceptsLoss`.
WrittenRows writeChannelFile(FileToWrite const& wanted, ReadingProgress const& progress = {});

/// The file as it is once it is written as a document. `name` is that of the document, which ends as such do;
/// its own name stays, by which people know it.
ChannelFile asDocument(ChannelFile const& file, std::string const& name);

/// Throws `OutputError` for more than `kMostWrittenValues`.
void checkWrittenValues(FileToWrite const& wanted, std::uint64_t rows, std::size_t columns);

} // namespace lumenkey::tools
