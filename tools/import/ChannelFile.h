#pragma once

#include "tools/import/DocumentFile.h"
#include "tools/import/InputText.h"
#include "tools/import/MotionFile.h"
#include "tools/tree/ChannelTree.h"

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

enum class ChannelFormat { Motion, Csv, Document };

/// `BVH`, `CSV` or `document`.
std::string_view channelFormatName(ChannelFormat format);

/// A file opened as a tree of channels, and what else there is to tell about it.
struct ChannelFile {
    std::string file;
    ChannelFormat format{};
    /// Of a motion.
    std::size_t joints = 0;
    /// Frames of a motion, rows of a table.
    std::size_t rows = 0;
    /// Invalid where the rows of a table aren't evenly spaced. Of a document: see `storedFrameDuration`, and
    /// `frameDurationOfKeypoints` where that says nothing.
    Tempus frameDuration{};
    /// Of a document, those of its first and last keypoint. Both zero without rows or keypoints.
    Tempus firstTime{};
    Tempus lastTime{};
    /// From the first time on: all frames of a motion, the last one to its end; of a table, to the last row;
    /// of a document, to its last keypoint.
    Tempus duration{};
    std::unique_ptr<ChannelTree> tree;
    /// Of a motion, what its file says beside the frames, which are left out here.
    Motion skeleton;
    /// Of a motion: the value channel of each column.
    std::vector<ChannelTree::Node> columns;
    /// Of a table.
    std::vector<Tempus> rowTimes;
    /// Of a document; its tree is the one above.
    DocumentFile document;
};

/// What the end of a name tells: `.csv`, `.bvh` or `.lumen`, in any case.
std::optional<ChannelFormat> channelFormatNamed(std::string_view file);

/// A name that ends in `.csv` is that of a table, one that ends in `.bvh` of a motion, one that ends in
/// `.lumen` of a document. Otherwise the content tells: a document begins with `<`, a table has a comma in
/// its first line.
ChannelFormat channelFormatOf(std::string_view text, std::string_view file);

/// Opens a file in the format that its name or its content tells. Throws `InputError`.
///
/// `frameDuration` is that of a document. Without one that of its skeleton or its keypoints is taken, and in
/// documents that count frames the default.
ChannelFile openChannelFile(std::string const& file, ReadingProgress const& progress = {},
                            std::optional<Tempus> const& frameDuration = std::nullopt);

/// The same for the content of a file; `file` is only its name.
ChannelFile openChannelText(std::string_view text, std::string const& file,
                            ReadingProgress const& progress = {},
                            std::optional<Tempus> const& frameDuration = std::nullopt);

} // namespace lumenkey::tools
